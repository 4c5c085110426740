#include "Interrupt.h"

#include <csignal>
#include <cstdlib>
#include <exception>

#include "environment/LibFile.h"

#ifdef _WIN32
#include <windows.h>
#else
#include <cerrno>
#endif

namespace vtr::cli {
namespace {

// The Interruption asked for first, as a number a signal handler can set.
volatile std::sig_atomic_t requested = 0;

#ifdef _WIN32

// The first Ctrl-C asks for a cancellation; the second removes the temporary files and ends
// the program at once.
void OnCtrlC() {
    if (requested != 0) {
        LibFile::RemoveRegisteredTempFiles();
        ExitProcess(130);
    }
    requested = static_cast<int>(Interruption::CtrlC);
}

// SIGINT raised inside the program (the C library resets the handler at each delivery).
extern "C" void OnSignal(int signalNumber) {
    std::signal(signalNumber, OnSignal);
    OnCtrlC();
}

using SignalHandler = void (*)(int);
SignalHandler previousInterrupt = SIG_DFL;

// Runs on a thread of its own that the system starts for each event.
BOOL WINAPI OnConsoleEvent(DWORD event) {
    switch (event) {
        case CTRL_C_EVENT:
        case CTRL_BREAK_EVENT:
            OnCtrlC();
            return TRUE;
        case CTRL_CLOSE_EVENT:
        case CTRL_LOGOFF_EVENT:
        case CTRL_SHUTDOWN_EVENT:
            // The system ends the program as soon as this returns, or a few seconds later.
            requested = static_cast<int>(Interruption::HangUp);
            LibFile::RemoveRegisteredTempFiles();
            ExitProcess(130);
        default:
            return FALSE;
    }
}

#else

constexpr int kHandled[] = {SIGINT, SIGTERM, SIGHUP, SIGPIPE};
struct sigaction previous[sizeof kHandled / sizeof kHandled[0]];
volatile std::sig_atomic_t outputClosed = 0;

Interruption CauseOf(int signalNumber) {
    switch (signalNumber) {
        case SIGINT:
            return Interruption::CtrlC;
        case SIGTERM:
            return Interruption::Terminate;
        case SIGHUP:
            return Interruption::HangUp;
        default:
            return Interruption::OutputClosed;
    }
}

void SetDisposition(int signalNumber, void (*handler)(int)) {
    struct sigaction action = {};
    action.sa_handler = handler;
    sigemptyset(&action.sa_mask);
    ::sigaction(signalNumber, &action, nullptr);
}

// Only async-signal-safe calls: sigaction, unlink (through LibFile), raise.
extern "C" void OnSignal(int signalNumber) {
    const int savedErrno = errno;
    if (signalNumber == SIGPIPE) {
        outputClosed = 1;
        SetDisposition(SIGPIPE, SIG_IGN);
        if (requested == 0)
            requested = static_cast<int>(Interruption::OutputClosed);
    } else if (requested != 0) {
        LibFile::RemoveRegisteredTempFiles();
        SetDisposition(signalNumber, SIG_DFL);
        // Blocked until this handler returns; then it ends the process as it would have.
        std::raise(signalNumber);
    } else {
        requested = static_cast<int>(CauseOf(signalNumber));
    }
    errno = savedErrno;
}

#endif

}  // namespace

InterruptGuard::InterruptGuard() {
    requested = 0;
#ifdef _WIN32
    previousInterrupt = std::signal(SIGINT, OnSignal);
    SetConsoleCtrlHandler(OnConsoleEvent, TRUE);
#else
    outputClosed = 0;
    struct sigaction action = {};
    action.sa_handler = OnSignal;
    // Interrupted reads and writes carry on; one handler runs at a time.
    action.sa_flags = SA_RESTART;
    sigemptyset(&action.sa_mask);
    for (int signalNumber : kHandled)
        sigaddset(&action.sa_mask, signalNumber);
    for (std::size_t i = 0; i < sizeof kHandled / sizeof kHandled[0]; ++i)
        ::sigaction(kHandled[i], &action, &previous[i]);
#endif
}

InterruptGuard::~InterruptGuard() {
#ifdef _WIN32
    SetConsoleCtrlHandler(OnConsoleEvent, FALSE);
    std::signal(SIGINT, previousInterrupt == SIG_ERR ? SIG_DFL : previousInterrupt);
#else
    for (std::size_t i = 0; i < sizeof kHandled / sizeof kHandled[0]; ++i) {
        if (kHandled[i] == SIGPIPE && outputClosed != 0)
            SetDisposition(SIGPIPE, SIG_IGN);
        else
            ::sigaction(kHandled[i], &previous[i], nullptr);
    }
#endif
    requested = 0;
}

Interruption InterruptGuard::Requested() {
    return static_cast<Interruption>(static_cast<int>(requested));
}

namespace {

std::terminate_handler previousTerminate = nullptr;

[[noreturn]] void RemoveTempFilesAndTerminate() {
    LibFile::RemoveRegisteredTempFiles();
    if (previousTerminate != nullptr)
        previousTerminate();  // says what escaped, and aborts
    std::abort();
}

}  // namespace

void InstallLastResortCleanUp() {
    if (std::get_terminate() != RemoveTempFilesAndTerminate)
        previousTerminate = std::set_terminate(RemoveTempFilesAndTerminate);
#ifdef SIGXFSZ
    std::signal(SIGXFSZ, SIG_IGN);
#endif
}

const char* CancellingNotice(Interruption interruption) {
    switch (interruption) {
        case Interruption::None:
            break;
        case Interruption::CtrlC:
            return "Ctrl-C: cancelling. The check that is running finishes first; press Ctrl-C "
                   "again to stop at once.";
        case Interruption::Terminate:
            return "terminated (SIGTERM): cancelling the verification.";
        case Interruption::HangUp:
            return "hang-up (SIGHUP): cancelling the verification.";
        case Interruption::OutputClosed:
            return "output closed (SIGPIPE): cancelling the verification.";
    }
    return "";
}

}  // namespace vtr::cli
