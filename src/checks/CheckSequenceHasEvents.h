#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Reports message 29 when no channel of any track is ever on and the sequence has no
// Gridcraft intensity file with a device.
class CheckSequenceHasEvents : public ICheck {
  public:
    CheckSequenceHasEvents() = default;
    explicit CheckSequenceHasEvents(std::string filename) : filename_(std::move(filename)) {}

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
