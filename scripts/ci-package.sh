#!/usr/bin/env bash
# The Linux packaging job: makes the Debian package from the Linux build, checks its contents
# and dependencies, installs it with dpkg, uses the installed programs as a user would (the
# command line from the PATH on the demo installation, the window from its desktop entry),
# validates the desktop entry, the AppStream metadata and the manual pages, then removes the
# package and checks that nothing of it is left.
#
#   VTR_BUILD_DIR   the Linux build, default build (made when missing)
#
# Installing needs root (or sudo). A vantori-verifier package that is installed already is
# left alone: the job stops instead of replacing it.
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_BUILD_DIR:-$root/build}
jobs=${VTR_JOBS:-2}
package=vantori-verifier

start=$(date +%s)
step() { echo; echo "=== package: $1 ($(($(date +%s) - start))s)"; }
fail() { echo "package: $*" >&2; exit 1; }

if [ "$(id -u)" -eq 0 ]; then as_root=(); else as_root=(sudo); fi
work=$(mktemp -d)
installed_here=0
cleanup() {
    if [ "$installed_here" -eq 1 ]; then
        "${as_root[@]}" dpkg -r "$package" >/dev/null 2>&1 || true
    fi
    rm -rf "$work"
}
trap cleanup EXIT

step "packages"
"$root/scripts/setup-deps.sh" dpkg-dev desktop-file-utils appstream man-db qt6-qpa-plugins \
    xvfb xauth xdotool jq
if dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q "install ok installed"; then
    fail "$package is installed on this machine already; the job would replace it"
fi

step "build"
if [ ! -f "$build/CMakeCache.txt" ]; then
    cmake -S "$root" -B "$build" -G Ninja >/dev/null
fi
cmake --build "$build" -j "$jobs"

step "the Debian package"
rm -f "$build"/"$package"_*.deb
(cd "$build" && cpack -G DEB >"$work/cpack.log" 2>&1) || { cat "$work/cpack.log" >&2; exit 1; }
deb=$(ls "$build"/"$package"_*.deb)
dpkg-deb --info "$deb"
# The packages depended on, by name: the libraries the programs link, the platform plugins the
# window loads, and no development package.
depends=$(dpkg-deb --field "$deb" Depends | tr ',|' '\n\n' | awk 'NF {print $1}')
for needed in libc6 libstdc++6 libqt6core6 libqt6gui6 libqt6widgets6 libpugixml1v5 libchm1 zlib1g \
    qt6-qpa-plugins; do
    grep -qxF "$needed" <<<"$depends" || fail "the package does not depend on $needed"
done
if grep -q -- '-dev$' <<<"$depends"; then fail "the package depends on a -dev package"; fi
dpkg-deb --contents "$deb" | awk '{print $6}' | sed 's|^\./|/|' | sort >"$work/contents"
for path in /usr/bin/vantori-verify /usr/bin/vantori-verifier \
    /usr/share/applications/vantori-verifier.desktop \
    /usr/share/metainfo/org.vantori.verifier.metainfo.xml \
    /usr/share/icons/hicolor/scalable/apps/vantori-verifier.svg \
    /usr/share/icons/hicolor/48x48/apps/vantori-verifier.png \
    /usr/share/man/man1/vantori-verify.1.gz /usr/share/man/man1/vantori-verifier.1.gz \
    /usr/share/doc/vantori-verifier/README.md /usr/share/doc/vantori-verifier/copyright; do
    grep -qx "$path" "$work/contents" || fail "the package lacks $path"
done

step "the metadata, the desktop entry and the manual pages"
mkdir "$work/tree"
dpkg-deb -x "$deb" "$work/tree"
desktop-file-validate "$work/tree/usr/share/applications/vantori-verifier.desktop"
appstreamcli validate --no-net --pedantic --explain \
    "$work/tree/usr/share/metainfo/org.vantori.verifier.metainfo.xml"
# The metadata as software centres read it: its desktop entry and icon found in the tree.
appstreamcli validate-tree --no-net "$work/tree"
for page in vantori-verify vantori-verifier; do
    file=$work/tree/usr/share/man/man1/$page.1.gz
    warnings=$(LC_ALL=C.UTF-8 MANROFFSEQ='' MANWIDTH=80 man --warnings -E UTF-8 -l -Tutf8 -Z \
        "$file" 2>&1 >/dev/null)
    [ -z "$warnings" ] || fail "the manual page of $page has faults: $warnings"
done
# Every option and command the program's help names is in its manual page.
manual=$(zcat "$work/tree/usr/share/man/man1/vantori-verify.1.gz" | sed 's/\\-/-/g')
help=$("$work/tree/usr/bin/vantori-verify" --help)
for option in $(grep -oE -- '--[a-z][a-z-]*' <<<"$help" | sort -u); do
    grep -qF -- "$option" <<<"$manual" ||
        fail "the manual page of vantori-verify does not describe $option"
done
for command in $(sed -nE '/^(Sub)?[Cc]ommands:/,/^$/p' <<<"$help" | awk 'NR > 1 && NF {print $1}'); do
    grep -qE "^\.B $command( |$)" <<<"$manual" ||
        fail "the manual page of vantori-verify does not describe the command $command"
done

step "installing with dpkg"
"${as_root[@]}" dpkg -i "$deb"
installed_here=1
dpkg-query -L "$package" | sort >"$work/installed"

step "the installed programs"
[ "$(command -v vantori-verify)" = /usr/bin/vantori-verify ] ||
    fail "vantori-verify is not found on the PATH as /usr/bin/vantori-verify"
expected="vantori-verify $(sed -n 's/^CMAKE_PROJECT_VERSION:STATIC=//p' "$build/CMakeCache.txt")"
[ "$(vantori-verify --version)" = "$expected" ] ||
    fail "vantori-verify --version says \"$(vantori-verify --version)\", not \"$expected\""
# Answered without a display, as from a terminal on a remote machine.
env -u DISPLAY -u WAYLAND_DISPLAY vantori-verifier --version >"$work/window-version" 2>&1 ||
    { cat "$work/window-version" >&2; fail "vantori-verifier --version failed without a display"; }
man -w vantori-verify >/dev/null || fail "man does not find the page of vantori-verify"

# The demo installation of the build, verified from a copy of its settings by the installed
# program and by the build's: the same results.
[ -f "$build/demo/registry.reg" ] || fail "no demo installation in $build/demo"
cp "$build/demo/registry.reg" "$work/registry.reg"
set +e
(cd "$work" && vantori-verify --registry registry.reg --schedule --format json --quiet) \
    >"$work/installed.json"
installed_status=$?
"$build/src/cli/vantori-verify" --registry "$work/registry.reg" --schedule --format json \
    --quiet >"$work/build.json"
build_status=$?
set -e
echo "exit status: installed $installed_status, build $build_status"
[ "$installed_status" -eq "$build_status" ] || fail "the exit statuses differ"
[ "$installed_status" -eq 2 ] || fail "the demo should give errors (status 2)"
diff -u <(jq -f "$root/scripts/findings.jq" "$work/build.json") \
    <(jq -f "$root/scripts/findings.jq" "$work/installed.json") ||
    fail "the installed program's results differ from the build's"
cmp -s "$build/demo/registry.reg" "$work/registry.reg" ||
    fail "the verification changed the settings store"

# The window, started as the desktop entry starts it, on an X display of its own.
exec_line=$(sed -n 's/^Exec=//p' /usr/share/applications/vantori-verifier.desktop)
[ "${exec_line%% *}" = vantori-verifier ] || fail "the desktop entry starts \"$exec_line\""
cat >"$work/window.sh" <<'EOF'
#!/usr/bin/env bash
# Starts the window and waits for it to be shown; prints its title.
set -u
env -u XDG_CONFIG_HOME HOME="$1" vantori-verifier --registry "$1/registry.reg" &
pid=$!
for _ in $(seq 1 30); do
    if title=$(xdotool search --onlyvisible --name 'Vantori Verifier' getwindowname 2>/dev/null); then
        echo "$title"
        kill "$pid"
        wait "$pid" 2>/dev/null
        exit 0
    fi
    kill -0 "$pid" 2>/dev/null || { echo "the window ended early" >&2; exit 1; }
    sleep 1
done
kill "$pid"
echo "no window was shown in 30 s" >&2
exit 1
EOF
chmod +x "$work/window.sh"
mkdir -p "$work/home"
cp "$work/registry.reg" "$work/home/registry.reg"
title=$(xvfb-run -a -s "-screen 0 1280x900x24" "$work/window.sh" "$work/home") ||
    fail "the installed window did not start"
echo "the window: $title"

step "removing the package"
"${as_root[@]}" dpkg -r "$package"
installed_here=0
if dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q "install ok installed"; then
    fail "$package is still installed"
fi
left=()
while read -r path; do
    # Folders the package shares with others (/usr/share/man/man1, say) stay.
    if [ -e "$path" ] && [ ! -d "$path" ]; then left+=("$path"); fi
done <"$work/installed"
[ -d /usr/share/doc/$package ] && left+=(/usr/share/doc/$package)
[ ${#left[@]} -eq 0 ] || fail "removing the package left: ${left[*]}"
if command -v vantori-verify >/dev/null; then fail "vantori-verify is still on the PATH"; fi
step "done"
