#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Loads a sequence (through the run's cache) and, when it loads, queues the checks of its
// content, of its media file, of the subsequences it plays and of its shell command.
// Reports message 24 when it cannot be loaded.
class CheckSequenceLoads : public ICheck {
  public:
    CheckSequenceLoads() = default;
    explicit CheckSequenceLoads(std::string filename) : filename_(std::move(filename)) {}

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
