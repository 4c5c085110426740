#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Reports message 30 for every channel (per track that lists it) without physical settings,
// with the same "c0" exemption as CheckChannelsHaveEvents.
class CheckChannelsHaveSettings : public ICheck {
  public:
    CheckChannelsHaveSettings() = default;
    explicit CheckChannelsHaveSettings(std::string filename) : filename_(std::move(filename)) {}

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
