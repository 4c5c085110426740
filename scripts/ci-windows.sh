#!/usr/bin/env bash
# The Windows job: builds the window, the command line, their tests and the demo installation
# for 64-bit Windows with mingw-w64 (the window against Qt built for Windows), runs the tests
# under Wine, then verifies the demo installation under Wine with its settings imported into
# Wine's registry, and checks that the results are those of the Linux build, paths aside.
# Last, it makes the installer and the portable zip and tries them under Wine in a fresh
# prefix as a user would (scripts/windows-installer-test.sh).
#
# Folders (each may be set from outside):
#   VTR_WINDOWS_BUILD_DIR  the Windows build, default build-windows; its Wine prefix is
#                          build-windows/wineprefix, never the user's ~/.wine
#   VTR_WINDOWS_DEPS       pugixml and GoogleTest built for Windows, default build-windows-deps
#   VTR_WINDOWS_QT         Qt built for Windows, default ~/.cache/vantori-verifier/windows-qt
#                          (made by scripts/build-windows-qt.sh when missing or out of date:
#                          about 25 minutes on two processors)
#   VTR_BUILD_DIR          the Linux build to compare with, default build (made when missing)
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_WINDOWS_BUILD_DIR:-$root/build-windows}
deps=${VTR_WINDOWS_DEPS:-$root/build-windows-deps}
linux=${VTR_BUILD_DIR:-$root/build}
qt=${VTR_WINDOWS_QT:-$HOME/.cache/vantori-verifier/windows-qt}
prefix=$build/wineprefix
wine_run=("$root/scripts/wine-run.sh" --prefix "$prefix")
jobs=${VTR_JOBS:-2}

start=$(date +%s)
step() { echo; echo "=== windows: $1 ($(($(date +%s) - start))s)"; }

# Wine's server outlives the programs for a while; the job leaves none behind.
stop_wine() {
    if [ -f "$prefix/system.reg" ]; then
        "${wine_run[@]}" --stop
    fi
}
trap stop_wine EXIT

step "packages"
# Qt's cross build needs the host's Qt tools (of qt6-base-dev) and Debian's source tools; the
# window's tests a font (Qt's offscreen platform on Windows reads fonts from a folder); the
# installer NSIS; its test a virtual display to show the window on, and tools to drive it.
"$root/scripts/setup-deps.sh" g++-mingw-w64-x86-64-posix libz-mingw-w64-dev wine wine64 jq \
    dpkg-dev fonts-dejavu-core nsis unzip xvfb xdotool x11-utils imagemagick

step "libraries for Windows"
VTR_JOBS=$jobs "$root/scripts/build-windows-deps.sh" "$deps"

step "Qt for Windows"
VTR_JOBS=$jobs "$root/scripts/build-windows-qt.sh" "$qt"

step "Wine prefix"
# Made before the build, whose steps under Wine (the listing of the tests) have short limits.
"${wine_run[@]}" cmd /c ver

step "cross build"
cmake -S "$root" -B "$build" -G Ninja -DCMAKE_TOOLCHAIN_FILE="$root/cmake/mingw-w64-x86_64.cmake" \
    -DVTR_WINDOWS_DEPS="$deps" -DVTR_WINDOWS_QT="$qt" -DVTR_BUILD_UI=ON -DVTR_BUILD_TESTS=ON -DVTR_TEST_TIMEOUT=120 >/dev/null
# The build runs programs under Wine (making the demo, listing the tests).
cmake --build "$build" -j "$jobs" 2>&1 | tee "$build/build.log"
if grep -q "warning:" "$build/build.log"; then
    echo "windows: the cross build has warnings:" >&2
    grep "warning:" "$build/build.log" >&2
    exit 1
fi

step "tests under Wine"
# A test that hangs under Wine is stopped after two minutes (VTR_TEST_TIMEOUT above; the
# slowest take about 16 s) and run once more: a test program that has created the media
# player control has, now and then, finished its tests and then never ended under Wine. A
# test that fails twice fails the job.
ctest --test-dir "$build" --output-on-failure -j "$jobs" --repeat until-pass:2

step "the demo installation under Wine"
demo=$build/demo
[ -f "$demo/registry.reg" ] || { echo "windows: no demo installation in $demo" >&2; exit 1; }
if [ ! -x "$linux/src/cli/vantori-verify" ] || [ ! -f "$linux/demo/registry.reg" ]; then
    cmake -S "$root" -B "$linux" -G Ninja -DVTR_BUILD_UI=OFF >/dev/null
    cmake --build "$linux" -j "$jobs" --target vantori-verify demo
fi

# The Windows build made its demo under Wine, so the demo's settings name its folders as
# Windows sees them; a folder still named as the host names it becomes the Z: path.
demo_unix=$(cd "$demo" && pwd)
demo_windows=$("${wine_run[@]}" winepath -w "$demo_unix")
work=$(mktemp -d)
trap 'rm -rf "$work"; stop_wine' EXIT
sed -e "s|$demo_unix|$(printf '%s' "$demo_windows" | sed 's/\\/\\\\\\\\/g')|g" \
    "$demo/registry.reg" >"$work/registry.reg"
if ! grep -qF 'Z:\\' "$work/registry.reg"; then
    echo "windows: the demo's settings name no Wine path:" >&2
    cat "$work/registry.reg" >&2
    exit 1
fi
"${wine_run[@]}" reg delete 'HKCU\Software\Vantori' /f >/dev/null 2>&1 || true
"${wine_run[@]}" reg import "$("${wine_run[@]}" winepath -w "$work/registry.reg")"

snapshot() { (cd "$1" && find . -type f -print0 | sort -z | xargs -0 sha256sum); }
snapshot "$demo" >"$work/demo-before"
temp_windows=$("${wine_run[@]}" cmd /c echo %TEMP%)
temp_unix=$("${wine_run[@]}" winepath -u "$temp_windows")
ls -A "$temp_unix" >"$work/temp-before" 2>/dev/null || true

set +e
env -u VANTORI_REGISTRY "${wine_run[@]}" "$build/src/cli/vantori-verify.exe" --schedule \
    --format json --quiet >"$work/windows.json"
windows_status=$?
"$linux/src/cli/vantori-verify" --schedule --format json --quiet \
    --registry "$linux/demo/registry.reg" >"$work/linux.json"
linux_status=$?
set -e

# Message numbers, severities, summaries, ignored flags and the counts; the details hold the
# installation's paths, which differ.
findings() { jq -f "$root/scripts/findings.jq" "$1"; }
findings "$work/windows.json" >"$work/windows.findings"
findings "$work/linux.json" >"$work/linux.findings"
echo "Linux exit status $linux_status, Windows exit status $windows_status"
jq -r '.results[] | "\(.severityText) \(.messageNumber): \(.summary)\(if .ignored then " (ignored)" else "" end)"' \
    "$work/windows.json"
failed=0
if [ "$windows_status" -ne "$linux_status" ]; then
    echo "windows: the exit statuses differ" >&2
    failed=1
fi
if ! diff -u "$work/linux.findings" "$work/windows.findings"; then
    echo "windows: the results under Wine differ from those on Linux" >&2
    failed=1
fi
if [ "$(jq '.results | length' "$work/windows.json")" -lt 5 ]; then
    echo "windows: the demo gave too few results to compare" >&2
    failed=1
fi
snapshot "$demo" >"$work/demo-after"
if ! diff -q "$work/demo-before" "$work/demo-after" >/dev/null; then
    echo "windows: the verification changed the demo installation" >&2
    failed=1
fi
ls -A "$temp_unix" >"$work/temp-after" 2>/dev/null || true
if ! diff "$work/temp-before" "$work/temp-after"; then
    echo "windows: the verification left temporary files behind" >&2
    failed=1
fi
[ "$failed" -eq 0 ] || exit 1

step "installer and portable zip"
# From what the build made (cpack installs the build, stripped, into a folder of its own).
rm -f "$build"/vantori-verifier-*-win64.exe "$build"/vantori-verifier-*-win64.zip
(cd "$build" && cpack -G "NSIS64;ZIP" >"$build/cpack.log" 2>&1) || {
    echo "windows: cpack failed:" >&2
    tail -n 40 "$build/cpack.log" >&2
    exit 1
}
installer=$(find "$build" -maxdepth 1 -name 'vantori-verifier-*-win64.exe')
portable=$(find "$build" -maxdepth 1 -name 'vantori-verifier-*-win64.zip')
ls -l "$installer" "$portable"

step "the installer under Wine, in a fresh prefix"
# The same settings as above (the demo's folders as Windows names them), and the Linux
# results to compare with.
stop_wine
"$root/scripts/windows-installer-test.sh" --prefix "$build/installer-prefix" \
    --installer "$installer" --zip "$portable" --registry "$work/registry.reg" \
    --expect "$work/linux.json" --expect-status "$linux_status" \
    --screenshot "$build/verifier-window-wine.png"
step "done"
