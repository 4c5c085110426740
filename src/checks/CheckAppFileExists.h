#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The version an application file is expected to carry when its list entry names none:
// the verifier's own, as major "." minor ".0." revision.
std::string DefaultExpectedVersion();

// One application file exists in the application folder; queues its version check. The
// version check has the same identifier (type 4 and the file name): it still runs because
// it is queued from inside this check, while this one is neither queued nor done.
class CheckAppFileExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Application file existence: " + filename_; }

    // The file name, relative to the application folder.
    const std::string& Filename() const { return filename_; }
    void SetFilename(const std::string& filename);
    const std::string& ExpectedVersion() const { return expectedVersion_; }
    void SetExpectedVersion(const std::string& version);

  private:
    std::string filename_;
    std::string expectedVersion_ = DefaultExpectedVersion();
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
