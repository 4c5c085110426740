#pragma once

#include <string>

#include "checks/CheckAppFileExists.h"
#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// One application file carries the expected version (exact text comparison with what its
// version resource says; a file without one reads as "").
class CheckAppFileVersion : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Application file version: " + filename_; }

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
