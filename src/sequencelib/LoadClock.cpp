#include "sequencelib/LoadClock.h"

#include <algorithm>

#include "sequencelib/LoadFailure.h"

#ifdef _WIN32
#include <windows.h>
#else
#include <ctime>  // clock_gettime, a POSIX addition to it
#endif

namespace vtr::seqlib::detail {

std::chrono::nanoseconds ThreadWorkTime() {
#ifdef _WIN32
    FILETIME created, exited, kernel, user;
    if (GetThreadTimes(GetCurrentThread(), &created, &exited, &kernel, &user)) {
        const auto hundreds = [](const FILETIME& t) {
            return (static_cast<unsigned long long>(t.dwHighDateTime) << 32) | t.dwLowDateTime;
        };
        return std::chrono::nanoseconds((hundreds(kernel) + hundreds(user)) * 100);
    }
#else
    timespec now{};
    if (clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now) == 0)
        return std::chrono::seconds(now.tv_sec) + std::chrono::nanoseconds(now.tv_nsec);
#endif
    return std::chrono::steady_clock::now().time_since_epoch();
}

LoadClock::LoadClock(const std::function<bool()>& keepGoing, std::chrono::nanoseconds interval)
    : keepGoing_(keepGoing),
      interval_(interval),
      lookEvery_(
          std::min<std::chrono::steady_clock::duration>(interval, std::chrono::milliseconds(5))),
      lastLook_(std::chrono::steady_clock::now()),
      lastAsk_(ThreadWorkTime()) {}

void LoadClock::Tick() {
    if (!keepGoing_)
        return;
    const auto now = std::chrono::steady_clock::now();
    if (now - lastLook_ < lookEvery_)
        return;
    lastLook_ = now;
    if (ThreadWorkTime() - lastAsk_ >= interval_)
        Ask();
}

void LoadClock::Ask() {
    if (!keepGoing_)
        return;
    lastAsk_ = ThreadWorkTime();
    lastLook_ = std::chrono::steady_clock::now();
    if (!keepGoing_())
        throw LoadStopped{};
}

}  // namespace vtr::seqlib::detail
