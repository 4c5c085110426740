#pragma once

#include <chrono>
#include <functional>

namespace vtr::seqlib::detail {

// The processor time the calling thread has used: the work done, which a busy machine does
// not stretch the way it stretches the time on the wall.
std::chrono::nanoseconds ThreadWorkTime();

// Keeps a load's promise to ask its caller whether to go on: after each percent told and
// whenever `interval` of the load's work has passed since the last question. A "no" raises
// LoadStopped. The clock is looked at on every tick, the work time at most every few
// milliseconds on the wall (it is the dearer of the two).
class LoadClock {
  public:
    LoadClock(const std::function<bool()>& keepGoing, std::chrono::nanoseconds interval);

    // A step of the load is done.
    void Tick();
    // Asks now.
    void Ask();

  private:
    const std::function<bool()>& keepGoing_;
    std::chrono::nanoseconds interval_;
    std::chrono::steady_clock::duration lookEvery_;
    std::chrono::steady_clock::time_point lastLook_;
    std::chrono::nanoseconds lastAsk_;
};

}  // namespace vtr::seqlib::detail
