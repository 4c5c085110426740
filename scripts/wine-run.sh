#!/usr/bin/env bash
# Runs a Windows program under Wine, headless and with bounded time:
#   wine-run.sh [--prefix DIR] PROGRAM.exe [ARGUMENTS...]
# The Wine prefix is DIR, else $WINEPREFIX; the user's own ~/.wine is never used. A missing
# prefix is made first (once, under a lock, so parallel build steps can share it). No X
# display is needed: the programs are console programs, and the parts of Wine that would
# download or show something (its .NET and HTML engines, the menu builder) are turned off.
# The program's text output ends its lines with CR LF, as on Windows; they reach the host
# with LF only, so that tools reading it (ctest's listing of the tests, say) see plain lines.
# VTR_WINE_TIMEOUT (seconds, default 1200) bounds one program's run; the exit status is the
# program's own (124 after a time-out).
set -euo pipefail

prefix=${WINEPREFIX:-}
if [ "${1:-}" = "--prefix" ]; then
    prefix=$2
    shift 2
fi
if [ -z "$prefix" ] || [ $# -eq 0 ]; then
    echo "usage: wine-run.sh [--prefix DIR] PROGRAM [ARGUMENTS...] (or set WINEPREFIX)" >&2
    exit 2
fi

wine=$(command -v wine || command -v wine64 || true)
if [ -z "$wine" ]; then
    echo "wine-run.sh: Wine is not installed" >&2
    exit 127
fi

export WINEPREFIX=$prefix
export WINEDEBUG=${WINEDEBUG:--all}
export WINEDLLOVERRIDES="mscoree=d;mshtml=d;winemenubuilder.exe=d"
export WINEARCH=win64
unset DISPLAY WAYLAND_DISPLAY

limit=${VTR_WINE_TIMEOUT:-1200}

# wineboot makes the prefix and leaves a wineserver that lingers a few seconds; the lock
# keeps a second caller waiting until the prefix is whole.
if [ ! -f "$prefix/system.reg" ]; then
    mkdir -p "$(dirname "$prefix")"
    (
        flock 9
        if [ ! -f "$prefix/system.reg" ]; then
            timeout --kill-after=10 "$limit" "$wine" wineboot --init >/dev/null 2>&1 || true
            timeout --kill-after=10 "$limit" wineserver -w 2>/dev/null || true
            if [ ! -f "$prefix/system.reg" ]; then
                echo "wine-run.sh: could not make the Wine prefix $prefix" >&2
                exit 1
            fi
        fi
    ) 9>"$prefix.lock"
fi

set +e
timeout --kill-after=10 "$limit" "$wine" "$@" | tr -d '\r'
status=${PIPESTATUS[0]}
exit "$status"
