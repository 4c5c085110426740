#pragma once

#include <cstdint>
#include <string>

namespace vtr {

// Reports percent progress of a long check (the channel-conflict checks) as transient
// messages, at most once per percent, and lets the user interface process its events after
// each change so that a Cancel click is seen during the check.
class ProgressHandler {
  public:
    void SetDescription(const std::string& description) { description_ = description; }
    // Adds parts to the work done; when the percent changes, posts
    // "Channel conflict check progress: <n>%" and runs the event pump.
    void MakeProgress(int32_t parts);
    int32_t ProgressParts() const { return totalParts_; }
    void SetProgressParts(int32_t total) { totalParts_ = total; }

  private:
    // Kept for callers that name their work; the posted text does not use it.
    std::string description_ = "Progress";
    int32_t totalParts_ = 0;
    int32_t partsDone_ = 0;
    int32_t lastPercent_ = 0;
};

}  // namespace vtr
