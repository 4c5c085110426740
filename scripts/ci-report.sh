#!/usr/bin/env bash
# CI job: the HTML report in a real browser. Installs Debian's chromium, builds the tests
# (in build/, or $VTR_BUILD_DIR, reusing what scripts/test.sh built) and runs the browser
# test: headless chromium loads the demo's report from a file, with its scripts, and the
# counts and result rows of the page it ends up with must be those of the JSON of the same
# run. VTR_REQUIRE_BROWSER=1 makes a missing browser a failure instead of a skip.
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_BUILD_DIR:-$root/build}
start=$(date +%s)

"$root/scripts/setup-deps.sh" chromium
if [ ! -f "$build/build.ninja" ]; then
    cmake -S "$root" -B "$build" -G Ninja -DVTR_BUILD_TESTS=ON
fi
cmake --build "$build" --target vtr_tests

export VTR_REQUIRE_BROWSER=1
"$build/tests/vtr_tests" --gtest_filter='BrowserTest.*'
echo "ci-report: the browser test passed in $(( $(date +%s) - start ))s"
