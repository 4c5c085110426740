#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Reports message 28 for every channel (per track that lists it) that is never on, except a
// channel named "c0" that is the first channel of the first track: the placeholder channel of
// an empty sequence.
class CheckChannelsHaveEvents : public ICheck {
  public:
    CheckChannelsHaveEvents() = default;
    explicit CheckChannelsHaveEvents(std::string filename) : filename_(std::move(filename)) {}

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
