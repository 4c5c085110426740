#pragma once

namespace vtr::cli {

// What asked a run to stop.
enum class Interruption { None, CtrlC, Terminate, HangUp, OutputClosed };

// Signals during a run. While an InterruptGuard lives, Ctrl-C (SIGINT), SIGTERM, a hang-up
// (SIGHUP) and output that can no longer be written (SIGPIPE) only note what happened; the
// event pump turns that into a clean cancellation: the check that is running finishes, the
// temporary files are removed as at any other end, the program exits 130.
//
// Asked again (a second Ctrl-C, SIGTERM or hang-up), the program ends at once: the handler
// itself removes the registered temporary files (LibFile) and lets the signal end the
// process as usual. SIGPIPE counts once; after it, writes fail quietly instead, and stay so
// when the guard ends, since the output is gone.
//
// On Windows the console's control handler (and a SIGINT handler, for SIGINT raised inside
// the program) does the same for Ctrl-C and Ctrl-Break; the console closing, a log-off or a
// shutdown removes the temporary files and ends at once.
//
// The handlers that were in place come back when the guard ends.
class InterruptGuard {
  public:
    InterruptGuard();
    ~InterruptGuard();
    InterruptGuard(const InterruptGuard&) = delete;
    InterruptGuard& operator=(const InterruptGuard&) = delete;

    // The first request since the guard was made; None when there was none.
    static Interruption Requested();
};

// For the rest of the program: an error that ends it through std::terminate (one that
// escaped a destructor, say) removes the registered temporary files first, and a limit on the
// size of files (SIGXFSZ) makes the write fail with its reason instead of killing the program.
void InstallLastResortCleanUp();

// What the program says when it starts cancelling for that reason, e.g. "Ctrl-C: cancelling
// ...".
const char* CancellingNotice(Interruption interruption);

}  // namespace vtr::cli
