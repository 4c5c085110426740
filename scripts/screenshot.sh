#!/usr/bin/env bash
# Takes the README's pictures of the window: the real program in a virtual X display (Xvfb),
# driven from the keyboard with xdotool as a user drives it, each window captured with
# ImageMagick's import.
#
#   docs/verifier-window.png   the demo installation verified: its results, one selected
#   docs/verifier-log.png      its output log
#   docs/verifier-help.png     the help viewer, opened on that result
#   docs/verifier-details.png  a generated installation of thousands of results, errors first,
#                              the first error whole in the details pane
#   docs/verifier-groups.png   the same grouped by sequence pair, one pair opened
#
# Needs Xvfb, xdotool and ImageMagick (apt-get install xvfb xdotool imagemagick). Uses the
# build folder build/ (or $VTR_BUILD_DIR). Nothing of the build's demo or of the user's
# settings is changed: the stores are copies and the window's own settings go to a
# temporary folder.
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_BUILD_DIR:-$root/build}
for tool in Xvfb xdotool import; do
    if ! command -v "$tool" >/dev/null 2>&1; then
        echo "screenshot: $tool is missing (apt-get install xvfb xdotool imagemagick)" >&2
        exit 1
    fi
done
cmake --build "$build" --target vantori-verifier vantori-make-installation demo-help

# (Its name shows in the pictures, in the paths the results name.)
work=$(mktemp -d -t Vantori-XXXXXX)
xvfb=""
windows=()
cleanup() {
    for pid in "${windows[@]}"; do kill "$pid" 2>/dev/null || true; done
    [ -n "$xvfb" ] && kill "$xvfb" 2>/dev/null || true
    rm -rf "$work"
}
trap cleanup EXIT

# A display of our own; Xvfb writes its number once it is ready.
Xvfb -displayfd 3 -screen 0 1400x1000x24 -nolisten tcp 3>"$work/display" 2>/dev/null &
xvfb=$!
for _ in $(seq 50); do [ -s "$work/display" ] && break; sleep 0.1; done
export DISPLAY=":$(cat "$work/display")"
export QT_QPA_PLATFORM=xcb
export TMPDIR="$work"

# Waits until a process has stopped working: its processor time unchanged for a second.
wait_idle() {
    local pid=$1 before="" now
    while true; do
        now=$(awk '{print $14 + $15}' "/proc/$pid/stat")
        [ "$now" = "$before" ] && return
        before=$now
        sleep 1
    done
}

# Starts the window on a store, at a size; sets $window (its X window) and $pid.
start_window() {
    local store=$1 width=$2 height=$3
    XDG_CONFIG_HOME="$work/config-$RANDOM" "$build/src/ui/vantori-verifier" --registry "$store" &
    pid=$!
    windows+=("$pid")
    window=$(xdotool search --sync --onlyvisible --pid "$pid" --name '^Vantori Verifier$' | head -1)
    xdotool windowsize --sync "$window" "$width" "$height"
    xdotool windowfocus --sync "$window"
    wait_idle "$pid"
}

# Presses keys in the window, one after the other, and waits for what they started.
keys() {
    xdotool windowfocus --sync "$window"
    xdotool key --delay 150 "$@"
    sleep 0.5
    wait_idle "$pid"
}

# Closes the window (and whatever else the program showed).
stop_window() {
    kill "$pid"
    wait "$pid" 2>/dev/null || true
}

shot() {
    import -window "$1" "$root/docs/$2.png"
    echo "screenshot: docs/$2.png"
}

# --- The demo installation --------------------------------------------------------------
cp "$build/demo/registry.reg" "$work/demo.reg"
start_window "$work/demo.reg" 1040 740
keys F5                  # Verify: the Results tab follows
keys alt+g Tab Tab Down  # Group by, the tabs, the list: its second result
shot "$window" verifier-window
keys alt+g Tab Left      # the tabs: the Output Log
shot "$window" verifier-log
keys Right Tab F1        # back to the list: help on the selected result
help=$(xdotool search --sync --onlyvisible --pid "$pid" --name '^Vantori Verifier Help$|\.htm' |
    grep -v "^$window\$" | head -1)
xdotool windowsize --sync "$help" 640 420
sleep 0.5
shot "$help" verifier-help
stop_window

# --- A generated installation of thousands of results -----------------------------------
"$build/tools/vantori-make-installation" --shows 61 --sequences-per-show 10 --faults \
    "$work/Lights" >/dev/null
start_window "$work/Lights/registry.reg" 1200 800
keys F5
keys ctrl+e alt+g Tab Tab  # errors first; the list: the first error
shot "$window" verifier-details
keys ctrl+e alt+g Down Down Down Down  # back to the order found; group by sequence pair
keys Tab Tab Home Right Down           # the list: the first pair opened, its first result
shot "$window" verifier-groups
stop_window
