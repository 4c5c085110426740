#!/usr/bin/env bash
# Renders the window after verifying the demo installation, under a virtual X display, and
# saves the pictures the README shows (docs/verifier-window.png, verifier-log.png and
# verifier-help.png).
# Needs xvfb (apt-get install xvfb). Uses the build folder build/ (or $VTR_BUILD_DIR).
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_BUILD_DIR:-$root/build}
if ! command -v xvfb-run >/dev/null 2>&1; then
    echo "screenshot: xvfb-run is missing (apt-get install xvfb)" >&2
    exit 1
fi
cmake --build "$build" --target vtr-window-screenshot demo-help
tool="$build/tests/ui/vtr-window-screenshot"
# The demo's store is copied, so that nothing reaches the instance in the build folder.
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cp "$build/demo/registry.reg" "$work/registry.reg"
export TMPDIR="$work"
for shot in results:verifier-window log:verifier-log help:verifier-help; do
    QT_QPA_PLATFORM=xcb xvfb-run -a -s "-screen 0 1280x900x24" \
        "$tool" --registry "$work/registry.reg" --tab "${shot%%:*}" "$root/docs/${shot#*:}.png"
    echo "screenshot: docs/${shot#*:}.png"
done
