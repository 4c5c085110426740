#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Reports message 32 for a channel object listed by two tracks of different lengths (the
// later track against the first that listed it).
class CheckChannelLengthConflicts : public ICheck {
  public:
    CheckChannelLengthConflicts() = default;
    explicit CheckChannelLengthConflicts(std::string filename) : filename_(std::move(filename)) {}

    const std::string& Filename() const { return filename_; }
    void SetFilename(std::string filename) {
        filename_ = std::move(filename);
        identifier_ = {};
    }

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

  private:
    std::string filename_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
