#include "Interrupt.h"

#include <csignal>

namespace vtr::cli {
namespace {

volatile std::sig_atomic_t interruptRequested = 0;

extern "C" void OnInterrupt(int signalNumber) {
    interruptRequested = 1;
    // Some platforms reset the handler after each delivery; put it back for a second Ctrl-C.
    std::signal(signalNumber, OnInterrupt);
}

}  // namespace

InterruptGuard::InterruptGuard() {
    interruptRequested = 0;
    previousInterrupt_ = std::signal(SIGINT, OnInterrupt);
    previousTerminate_ = std::signal(SIGTERM, OnInterrupt);
}

InterruptGuard::~InterruptGuard() {
    std::signal(SIGINT, previousInterrupt_ == SIG_ERR ? SIG_DFL : previousInterrupt_);
    std::signal(SIGTERM, previousTerminate_ == SIG_ERR ? SIG_DFL : previousTerminate_);
    interruptRequested = 0;
}

bool InterruptGuard::Requested() {
    return interruptRequested != 0;
}

}  // namespace vtr::cli
