#!/usr/bin/env bash
# Renders docs/html-report.png, README's picture of the demo's HTML report: makes an instance
# of the demo installation in a temporary folder (its name shows in the paths the results
# name), verifies its schedule into an HTML report and has headless chromium take a picture
# of the page's top (apt-get install chromium). Uses the build folder build/ (or
# $VTR_BUILD_DIR); nothing of the build's demo is changed.
# Usage: scripts/report-screenshot.sh [OUTPUT.png] [WIDTHxHEIGHT]
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_BUILD_DIR:-$root/build}
out=${1:-$root/docs/html-report.png}
size=${2:-1200x1500}
browser=${VTR_CHROMIUM:-$(command -v chromium || command -v chromium-browser || true)}
[ -n "$browser" ] || { echo "report-screenshot: chromium is not installed" >&2; exit 1; }

cmake --build "$build" --target vantori-verify vtr-demo-instantiate
work=$(mktemp -d -t Vantori-XXXXXX)
trap 'rm -rf "$work"' EXIT
"$build/examples/vtr-demo-instantiate" "$root/examples/demo" "$work/demo" >/dev/null
status=0
"$build/src/cli/vantori-verify" --registry "$work/demo/registry.reg" --schedule \
    --quiet --output "$work/report.html" >/dev/null || status=$?
# 1 and 2 say what was found; anything else is a failure to verify.
[ "$status" -le 2 ] || { echo "report-screenshot: the verification failed ($status)" >&2; exit 1; }
"$browser" --headless --no-sandbox --disable-gpu --disable-dev-shm-usage --hide-scrollbars \
    --no-first-run --user-data-dir="$work/profile" --window-size="${size/x/,}" \
    --screenshot="$out" "file://$work/report.html" 2>"$work/browser.log" ||
    { cat "$work/browser.log" >&2; exit 1; }
echo "report-screenshot: wrote $out"
