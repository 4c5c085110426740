#!/usr/bin/env bash
# Runs a Windows program under Wine, headless and with bounded time:
#   wine-run.sh [--prefix DIR] [--path DIR]... [--display] PROGRAM.exe [ARGUMENTS...]
#   wine-run.sh [--prefix DIR] --stop          (ends the prefix's Wine server and helpers)
# The Wine prefix is DIR, else $WINEPREFIX; the user's own ~/.wine is never used. A missing
# prefix is made first (once, under a lock, so parallel build steps can share it). No X
# display is needed: the programs are console programs or run on Qt's offscreen platform,
# and the parts of Wine that would download or show something (its .NET and HTML engines,
# the menu builder) are turned off. --display keeps $DISPLAY, for a window that is to be
# seen (under Xvfb, say). Each --path folder of the host is searched for DLLs, as the
# program's own folder would be (Qt's and the compiler's runtime DLLs of a build tree).
# Wine's runtime files go into the prefix, not the system's temporary folder.
#
# Wine's server and its background processes (services, the desktop) outlive the program
# and keep the standard streams they were started with, so a caller reading the program's
# output through a pipe (ctest) would wait for them: they are started here first, detached.
# The program's text output ends its lines with CR LF, as on Windows; they reach the host
# with LF only, so that tools reading it (ctest's listing of the tests, say) see plain lines.
# VTR_WINE_TIMEOUT (seconds, default 1200) bounds one program's run; the exit status is the
# program's own (124 after a time-out). The server stays VTR_WINESERVER_PERSIST seconds
# (default 30) after the last program, so that a series of runs shares it.
set -euo pipefail

prefix=${WINEPREFIX:-}
search_path=()
keep_display=0
while [ $# -gt 0 ]; do
    case $1 in
        --prefix) prefix=$2; shift 2 ;;
        --path) search_path+=("Z:$(cd "$2" && pwd | tr / '\\')"); shift 2 ;;
        --display) keep_display=1; shift ;;
        *) break ;;
    esac
done
if [ -z "$prefix" ] || [ $# -eq 0 ]; then
    echo "usage: wine-run.sh [--prefix DIR] [--path DIR]... [--display] PROGRAM [ARGUMENTS...] | --stop" >&2
    exit 2
fi
mkdir -p "$prefix"
prefix=$(cd "$prefix" && pwd)

wine=$(command -v wine || command -v wine64 || true)
server=$(command -v wineserver || true)
if [ -z "$wine" ] || [ -z "$server" ]; then
    echo "wine-run.sh: Wine is not installed" >&2
    exit 127
fi

export WINEPREFIX=$prefix
export WINEDEBUG=${WINEDEBUG:--all}
export WINEDLLOVERRIDES="mscoree=d;mshtml=d;winemenubuilder.exe=d"
export WINEARCH=win64
export TMPDIR=$prefix/.runtime
mkdir -p "$TMPDIR"
unset WAYLAND_DISPLAY
[ "$keep_display" -eq 1 ] || unset DISPLAY
# Wine keeps the host's QT_ variables from Windows programs (they are meant for a Qt of the
# host) and hands one on under its own name only when it comes with WINE before it. The
# window and its tests are Qt programs of Windows: QT_QPA_PLATFORM, QT_QPA_FONTDIR and the
# others set for them reach them.
for name in $(compgen -e); do
    case $name in
        QT_*) export "WINE$name=${!name}" ;;
    esac
done
if [ ${#search_path[@]} -gt 0 ]; then
    WINEPATH=$(IFS=';'; echo "${search_path[*]}")${WINEPATH:+;$WINEPATH}
    export WINEPATH
fi

if [ "$1" = "--stop" ]; then
    timeout 30 "$server" -k </dev/null >/dev/null 2>&1 || true
    timeout 30 "$server" -w </dev/null >/dev/null 2>&1 || true
    exit 0
fi

limit=${VTR_WINE_TIMEOUT:-1200}
persist=${VTR_WINESERVER_PERSIST:-30}

(
    flock 9
    # The prefix, made once.
    if [ ! -f "$prefix/system.reg" ]; then
        timeout --kill-after=10 "$limit" "$wine" wineboot --init </dev/null >/dev/null 2>&1 9>&- ||
            true
        timeout --kill-after=10 "$limit" "$server" -w </dev/null >/dev/null 2>&1 9>&- || true
        if [ ! -f "$prefix/system.reg" ]; then
            echo "wine-run.sh: could not make the Wine prefix $prefix" >&2
            exit 1
        fi
    fi
    # A server that was not running yet (status 0): it and the helpers, detached. (None of
    # them may keep the lock's descriptor, or the lock would last as long as they do.)
    if "$server" -p"$persist" </dev/null >/dev/null 2>&1 9>&-; then
        timeout --kill-after=10 120 "$wine" rundll32.exe user32.dll,GetDesktopWindow \
            </dev/null >/dev/null 2>&1 9>&- || true
    fi
) 9>"$prefix.lock"

set +e
timeout --kill-after=10 "$limit" "$wine" "$@" | tr -d '\r'
status=${PIPESTATUS[0]}
exit "$status"
