#!/usr/bin/env bash
# Sets up the packages, configures and builds into build/ (or $VTR_BUILD_DIR).
# Extra arguments go to cmake's configure step.
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_BUILD_DIR:-$root/build}
"$root/scripts/setup-deps.sh"
cmake -S "$root" -B "$build" -G Ninja "$@"
cmake --build "$build"
