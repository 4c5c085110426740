#pragma once

#include <string>
#include <utility>

#include "checks/common/FileCheck.h"

namespace vtr {

// The version an application file is expected to carry when its list entry names none:
// the verifier's own, as major "." minor ".0." revision.
std::string DefaultExpectedVersion();

// The checks about one application file (a name relative to the application folder) and
// the version it is expected to carry. Both have type 4 and the file as identifier.
class AppFileCheck : public FileCheck {
  public:
    const std::string& ExpectedVersion() const { return expectedVersion_; }
    void SetExpectedVersion(std::string version) { expectedVersion_ = std::move(version); }

  protected:
    AppFileCheck(int32_t checkType, const char* descriptionPrefix, std::string filename)
        : FileCheck(checkType, descriptionPrefix, std::move(filename)) {}

    std::string expectedVersion_ = DefaultExpectedVersion();
};

}  // namespace vtr
