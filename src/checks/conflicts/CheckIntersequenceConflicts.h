#pragma once

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "checks/common/FileCheck.h"

namespace vtr {

class Show;

// Finds channels and intensity-file circuits used by sequences of two sections of a show
// that can play at the same time (messages 43, 47 and 48). The show player runs the
// background under everything; the animation section with the musical and the interactive
// ones (and its own sequences together when its AnimationType is 2); startup and shutdown
// only over the background. Every sequence is walked once per time it is listed, in the
// order Background, Startup, Animation, Musical, Shutdown, Interactive, each channel being
// compared with the sequences walked before it.
class CheckIntersequenceConflicts : public FileCheck {
  public:
    explicit CheckIntersequenceConflicts(std::string showFilename = {});
    // The file of the check, by the name its creator knows it.
    const std::string& ShowFilename() const { return Filename(); }
    void SetShowFilename(std::string showFilename) { SetFilename(std::move(showFilename)); }

    void Check() override;
    // The sequence files the check loads for that show, in the order it walks them (the
    // driver has them loaded ahead on other threads).
    std::vector<std::string> SequenceFiles(const Show& show) const;

    // The name of a section flag in results: 1 "Background", 2 "Startup", 4 "Animation",
    // 8 "Musical", 16 "Interactive", 32 "Shutdown"; any other "(" + the number + ")".
    static std::string SectionName(int32_t flag);
};

}  // namespace vtr
