#pragma once

#include <cstdint>
#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Finds channels and intensity-file circuits used by sequences of two sections of a show
// that can play at the same time (messages 43, 47 and 48). The show player runs the
// background under everything; the animation section with the musical and the interactive
// ones (and its own sequences together when its AnimationType is 2); startup and shutdown
// only over the background. Every sequence is walked once per time it is listed, in the
// order Background, Startup, Animation, Musical, Shutdown, Interactive, each channel being
// compared with the sequences walked before it.
class CheckIntersequenceConflicts : public ICheck {
  public:
    CheckIntersequenceConflicts() = default;
    explicit CheckIntersequenceConflicts(std::string showFilename)
        : showFilename_(std::move(showFilename)) {}

    const std::string& ShowFilename() const { return showFilename_; }
    void SetShowFilename(std::string showFilename) {
        showFilename_ = std::move(showFilename);
        identifier_ = {};
    }

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

    // The name of a section flag in results: 1 "Background", 2 "Startup", 4 "Animation",
    // 8 "Musical", 16 "Interactive", 32 "Shutdown"; any other "(" + the number + ")".
    static std::string SectionName(int32_t flag);

  private:
    std::string showFilename_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
