#!/usr/bin/env bash
# CI job: builds the whole test suite under AddressSanitizer and UndefinedBehaviorSanitizer in
# a build folder of its own (build-sanitize, or $VTR_SANITIZE_BUILD_DIR) and runs it with
# ctest. Any report of either sanitizer fails the test that caused it, and so the job.
# The window's tests run too, on Qt's offscreen platform (VTR_SANITIZE_UI=OFF leaves the
# window out).
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_SANITIZE_BUILD_DIR:-$root/build-sanitize}
ui=${VTR_SANITIZE_UI:-ON}

"$root/scripts/setup-deps.sh"
cmake -S "$root" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DVTR_SANITIZE=ON -DVTR_BUILD_TESTS=ON -DVTR_BUILD_BENCH=OFF -DVTR_BUILD_FUZZ=OFF \
    -DVTR_BUILD_UI="$ui"
cmake --build "$build"

# Leaks are errors; the first report of either sanitizer ends the program with a stack.
export ASAN_OPTIONS=detect_leaks=1:abort_on_error=0:halt_on_error=1:strict_string_checks=1:detect_stack_use_after_return=1:check_initialization_order=1
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1
export QT_QPA_PLATFORM=offscreen
ctest --test-dir "$build" --output-on-failure -j "$(nproc)"
