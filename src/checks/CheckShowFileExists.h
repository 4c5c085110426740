#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// A scheduled show file exists (and is not a folder); queues the show's load check.
class CheckShowFileExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Show file existence: " + filename_; }

    const std::string& Filename() const { return filename_; }
    void SetFilename(const std::string& filename);

  private:
    std::string filename_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
