#pragma once

namespace vtr::cli {

// Ctrl-C (SIGINT) and SIGTERM during a run: while an InterruptGuard lives, the signals only
// raise a flag, which the event pump turns into a clean cancellation between two steps of
// the run. The handlers that were in place come back when the guard ends.
class InterruptGuard {
  public:
    InterruptGuard();
    ~InterruptGuard();
    InterruptGuard(const InterruptGuard&) = delete;
    InterruptGuard& operator=(const InterruptGuard&) = delete;

    // True once a signal arrived since the guard was made.
    static bool Requested();

  private:
    using Handler = void (*)(int);
    Handler previousInterrupt_;
    Handler previousTerminate_;
};

}  // namespace vtr::cli
