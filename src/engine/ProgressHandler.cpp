#include "engine/ProgressHandler.h"

#include "engine/LibVerify.h"

namespace vtr {

void ProgressHandler::MakeProgress(int32_t parts) {
    partsDone_ += parts;
    // Widened so that a large part count cannot overflow the percent computation; C++
    // division truncates toward zero.
    const int32_t percent =
        totalParts_ != 0
            ? static_cast<int32_t>(static_cast<int64_t>(partsDone_) * 100 / totalParts_)
            : 100;
    if (percent == lastPercent_)
        return;
    lastPercent_ = percent;
    LibVerify::PostTransientMessage("Channel conflict check progress: " + std::to_string(percent) +
                                    "%");
    LibVerify::ProcessPendingEvents();
}

}  // namespace vtr
