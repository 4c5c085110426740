#!/usr/bin/env bash
# Tries the Windows installer and the portable zip under Wine as a user would, in a fresh Wine
# prefix:
#   windows-installer-test.sh --prefix DIR --installer SETUP.exe --zip PORTABLE.zip
#       --registry STORE.reg --expect RESULTS.json --expect-status STATUS --screenshot WINDOW.png
# The prefix DIR is made anew (anything in it is deleted). STORE.reg, the settings of an
# installation to verify as Windows names its folders, is imported into the prefix's registry;
# RESULTS.json is the JSON output of the Linux build's verification of the same installation's
# schedule and STATUS its exit status, which the installed command line must give.
#
# In order: the installer runs silently; the program folder must hold what the zip holds,
# every DLL a program or library loads must be in it or be a system DLL, and the Start menu
# must have "Vantori Verifier"; the installed vantori-verify.exe verifies the schedule; the
# window is started from its Start-menu entry under Xvfb, verifies (F5), is photographed into
# WINDOW.png once its picture has settled, and is closed; the uninstaller runs silently, and
# then no file, folder or registry key of the Verifier may be left, and the suite's settings
# must be as they were. Last, the zip's programs run from a folder of their own.
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)

prefix= installer= zip= registry= expect= expect_status= screenshot=
while [ $# -gt 0 ]; do
    case $1 in
        --prefix) prefix=$2 ;;
        --installer) installer=$2 ;;
        --zip) zip=$2 ;;
        --registry) registry=$2 ;;
        --expect) expect=$2 ;;
        --expect-status) expect_status=$2 ;;
        --screenshot) screenshot=$2 ;;
        *) echo "windows-installer-test: unknown argument $1" >&2; exit 2 ;;
    esac
    shift 2
done
for value in "$prefix" "$installer" "$zip" "$registry" "$expect" "$expect_status" "$screenshot"; do
    if [ -z "$value" ]; then
        echo "usage: windows-installer-test.sh --prefix DIR --installer SETUP.exe --zip PORTABLE.zip" \
            "--registry STORE.reg --expect RESULTS.json --expect-status STATUS" \
            "--screenshot WINDOW.png" >&2
        exit 2
    fi
done

start=$(date +%s)
step() { echo; echo "=== installer: $1 ($(($(date +%s) - start))s)"; }
fail() { echo "windows-installer-test: $*" >&2; exit 1; }

rm -rf "$prefix"
mkdir -p "$prefix"
prefix=$(cd "$prefix" && pwd)
wine_run=("$root/scripts/wine-run.sh" --prefix "$prefix")
work=$(mktemp -d)
xvfb_pid=
cleanup() {
    [ -z "$xvfb_pid" ] || kill "$xvfb_pid" 2>/dev/null || true
    "${wine_run[@]}" --stop
    rm -rf "$work"
}
trap cleanup EXIT

drive=$prefix/drive_c
program_dir='C:\Program Files\Vantori Verifier'
program_unix=$drive/Program\ Files/Vantori\ Verifier
menu_unix=$drive/ProgramData/Microsoft/Windows/Start\ Menu/Programs/Vantori\ Verifier
uninstall_key='HKLM\Software\Microsoft\Windows\CurrentVersion\Uninstall\Vantori Verifier'

# What the prefix holds, to compare before the installation and after the uninstallation:
# every file and folder of drive C (but Wine's own temporary and cache files, which any
# program run changes), and every registry key.
files_of_prefix() {
    (cd "$drive" && find . -mindepth 1 \
        -not -path './users/*/AppData/Local/Temp*' -not -path './users/*/Temp*' \
        -not -path './windows/temp*' -not -path './windows/Installer*' | LC_ALL=C sort)
}
keys_of_prefix() {
    # Wine's registry files list every key as [path] time; the times change on reading.
    for file in system.reg user.reg; do
        sed -n 's/^\[\(.*\)\] [0-9]*$/\1/p' "$prefix/$file"
    done | grep -v -E '^(Software\\\\Wine|Software\\\\Microsoft\\\\Windows\\\\CurrentVersion\\\\Explorer|Software\\\\Microsoft\\\\Windows NT\\\\CurrentVersion\\\\Fonts|System\\\\CurrentControlSet\\\\Control\\\\Session Manager)' |
        LC_ALL=C sort
}
suite_settings() {
    "${wine_run[@]}" reg export 'HKCU\Software\Vantori' "$(to_windows "$1")" /y >/dev/null
}
to_windows() { "${wine_run[@]}" winepath -w "$1"; }
wait_for_wine() { timeout 120 env WINEPREFIX="$prefix" wineserver -w || true; }

step "a fresh Wine prefix with the installation's settings"
"${wine_run[@]}" cmd /c ver
"${wine_run[@]}" reg import "$(to_windows "$registry")"
suite_settings "$work/suite-before.reg"
"${wine_run[@]}" --stop
files_of_prefix >"$work/files-before"
keys_of_prefix >"$work/keys-before"

step "silent installation"
"${wine_run[@]}" "$installer" /S
wait_for_wine
[ -d "$program_unix" ] || fail "nothing was installed in $program_dir"
(cd "$program_unix" && find . -type f | sed 's|^\./||' | LC_ALL=C sort) >"$work/installed"
cat "$work/installed"
unzip -qq "$zip" -d "$work/zip"
zip_root=$(find "$work/zip" -mindepth 1 -maxdepth 1 -type d)
(cd "$zip_root" && find . -type f | sed 's|^\./||' | LC_ALL=C sort) >"$work/zipped"
diff -u "$work/zipped" <(grep -vx 'Uninstall.exe' "$work/installed") ||
    fail "the program folder and the portable zip differ"
for file in vantori-verifier.exe vantori-verify.exe Qt6Core.dll platforms/qwindows.dll \
    styles/qwindowsvistastyle.dll libstdc++-6.dll VantoriVerifier.chm Uninstall.exe; do
    grep -qxF "$file" "$work/installed" || fail "the program folder lacks $file"
done
for link in "Vantori Verifier.lnk" "Vantori Verifier Help.lnk" "Uninstall.lnk"; do
    [ -f "$menu_unix/$link" ] || fail "the Start menu lacks $link"
done
"${wine_run[@]}" reg query "$uninstall_key" /v DisplayName | grep -q "Vantori Verifier" ||
    fail "the Verifier is not registered for uninstallation"

# Every DLL a program or a library of the folder loads is in the folder (by name, as Windows
# looks) or is part of the system: in Wine's system folder, or an API set (api-ms-win-*,
# ext-ms-win-*), which Windows resolves to its own DLLs without a file of that name.
system32=$drive/windows/system32
missing=()
while IFS= read -r -d '' binary; do
    while read -r dll; do
        lower=${dll,,}
        case $lower in api-ms-win-* | ext-ms-win-*) continue ;; esac
        if ! grep -qixF "$lower" <(sed 's|.*/||' "$work/installed") &&
            [ ! -e "$system32/$lower" ] && [ ! -e "$system32/$dll" ]; then
            missing+=("$(basename "$binary") needs $dll")
        fi
    done < <(x86_64-w64-mingw32-objdump -p "$binary" | sed -n 's/^\s*DLL Name: //p')
done < <(find "$program_unix" -type f \( -iname '*.exe' -o -iname '*.dll' \) -print0)
[ ${#missing[@]} -eq 0 ] || fail "DLLs that are nowhere: ${missing[*]}"

step "the installed command line verifies the schedule"
set +e
"${wine_run[@]}" "$program_dir\\vantori-verify.exe" --schedule --format json --quiet \
    >"$work/installed.json"
status=$?
set -e
echo "exit status $status (Linux: $expect_status)"
[ "$status" -eq "$expect_status" ] || fail "the exit status differs from Linux"
diff -u <(jq -f "$root/scripts/findings.jq" "$expect") \
    <(jq -f "$root/scripts/findings.jq" "$work/installed.json") ||
    fail "the installed program's results differ from those on Linux"

step "the window, from the Start menu"
display=
for number in $(seq 90 120); do
    if [ ! -e "/tmp/.X11-unix/X$number" ] && [ ! -e "/tmp/.X$number-lock" ]; then
        display=:$number
        break
    fi
done
[ -n "$display" ] || fail "no free X display"
Xvfb "$display" -screen 0 1280x900x24 -nolisten tcp >/dev/null 2>&1 &
xvfb_pid=$!
export DISPLAY=$display
for _ in $(seq 1 50); do xdpyinfo >/dev/null 2>&1 && break; sleep 0.2; done
# Wine's desktop process, which every window of the prefix goes through, takes the display
# it was started with: the Wine of the steps above (started without one) is stopped first.
# The window keeps the output of the program that started it open, so that program is left
# to run on (it ends with the window).
"${wine_run[@]}" --stop
"${wine_run[@]}" --display start /unix "$menu_unix/Vantori Verifier.lnk" >"$work/window.log" 2>&1 &
window=
for _ in $(seq 1 240); do
    window=$(xdotool search --onlyvisible --name '^Vantori Verifier$' 2>/dev/null | head -n 1 || true)
    [ -n "$window" ] && break
    sleep 1
done
[ -n "$window" ] || fail "the window did not appear within four minutes"
sleep 2
# Keys as a user types them (through XTEST), to the window given the focus: there is no
# window manager to activate it.
xdotool windowfocus --sync "$window"
xdotool key F5
# The verification is over when the window's picture stops changing.
previous=
for _ in $(seq 1 60); do
    sleep 2
    import -window "$window" "$work/window.png"
    current=$(convert "$work/window.png" rgb:- | sha256sum)
    [ "$current" = "$previous" ] && break
    previous=$current
done
mkdir -p "$(dirname "$screenshot")"
cp "$work/window.png" "$screenshot"
echo "the window: $screenshot ($(identify -format '%wx%h' "$screenshot"))"
# Closed as a user closes it, so that it keeps its settings as it does on closing.
xdotool windowfocus --sync "$window"
xdotool key alt+F4
for _ in $(seq 1 30); do
    xdotool search --onlyvisible --name '^Vantori Verifier$' >/dev/null 2>&1 || break
    sleep 1
done
if xdotool search --onlyvisible --name '^Vantori Verifier$' >/dev/null 2>&1; then
    fail "the window did not close"
fi
wait_for_wine
settings_file=$(find "$drive/users" -path '*/AppData/Roaming/Vantori/vantori-verifier.ini' | head -n 1)
[ -n "$settings_file" ] || fail "the window kept no settings file"
kill "$xvfb_pid" 2>/dev/null || true
xvfb_pid=
unset DISPLAY

step "silent uninstallation"
"${wine_run[@]}" "$program_dir\\Uninstall.exe" /S
# The uninstaller runs on from a copy of itself; it has finished when the folder is gone.
for _ in $(seq 1 120); do
    [ -e "$program_unix" ] || break
    sleep 1
done
wait_for_wine
"${wine_run[@]}" --stop
[ ! -e "$program_unix" ] || fail "the program folder is still there: $(ls -A "$program_unix")"

step "nothing of the Verifier is left"
suite_settings "$work/suite-after.reg"
"${wine_run[@]}" --stop
cmp -s "$work/suite-before.reg" "$work/suite-after.reg" ||
    fail "the suite's settings changed: $(diff "$work/suite-before.reg" "$work/suite-after.reg")"
files_of_prefix >"$work/files-after"
keys_of_prefix >"$work/keys-after"
left=0
if ! diff -u "$work/files-before" "$work/files-after"; then
    echo "windows-installer-test: files or folders changed (above)" >&2
    left=1
fi
if ! diff -u "$work/keys-before" "$work/keys-after"; then
    echo "windows-installer-test: registry keys changed (above)" >&2
    left=1
fi
[ "$left" -eq 0 ] || exit 1

step "the portable zip"
# Unpacked anywhere (here: a folder of the prefix's user), it runs as it is.
portable=$drive/users/Public/vantori-verifier-portable
rm -rf "$portable"
cp -r "$zip_root" "$portable"
version=$("${wine_run[@]}" "$(to_windows "$portable")\\vantori-verify.exe" --version)
echo "$version"
[[ "$version" == "vantori-verify "* ]] || fail "the portable vantori-verify.exe did not answer"
rm -rf "$portable"
step "done"
