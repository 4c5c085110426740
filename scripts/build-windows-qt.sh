#!/usr/bin/env bash
# Builds Qt for 64-bit Windows, for the window's cross build, into a prefix that
# cmake/mingw-w64-x86_64.cmake reads (VTR_WINDOWS_QT):
#   build-windows-qt.sh PREFIX
# The source is Debian's qt6-base source package of the very version the machine's own Qt
# tools have (moc, rcc and uic of the host are used: a cross-built Qt has none of its own),
# cross-compiled with the mingw-w64 compilers of cmake/mingw-w64-x86_64-compilers.cmake.
# Only what the window and its tests use is built: Core, Gui, Widgets, Test, the Windows,
# offscreen and minimal platform plugins and the Windows styles; zlib, PCRE2, libpng,
# HarfBuzz and FreeType are Qt's bundled copies. Qt's libraries are DLLs that use the
# compiler's runtime DLLs (libstdc++, libgcc, winpthread). The licence texts of Qt and of
# what it bundles (the source's LICENSES and Debian's copyright file) go to PREFIX/licenses.
#
# Nothing is kept in the repository: the prefix belongs in a cache outside the clone (CI uses
# ~/.cache/vantori-verifier/windows-qt). A finished prefix is recognised by its stamp (the
# configuration below, the compilers and the host's Qt version) and left as it is. The build
# folder stays in PREFIX/work until the prefix is finished: a build of the same stamp that
# was interrupted (a machine stopped, a job cancelled) carries on where it stopped the next
# time instead of starting over. It takes about half an hour on two processors; VTR_JOBS sets
# the parallel jobs (default 2). Two runs on one prefix take turns (a lock beside it).
set -euo pipefail

if [ $# -ne 1 ]; then
    echo "usage: build-windows-qt.sh PREFIX" >&2
    exit 2
fi
root=$(cd "$(dirname "$0")/.." && pwd)
mkdir -p "$1"
prefix=$(cd "$1" && pwd)
compilers=$root/cmake/mingw-w64-x86_64-compilers.cmake
stamp=$prefix/.vtr-windows-qt
work=$prefix/work
build=$work/build
log=$work/build.log
jobs=${VTR_JOBS:-2}

exec 8>"$prefix.lock"
if ! flock -n 8; then
    echo "build-windows-qt: another build of $prefix is running; waiting for it"
    flock 8
fi

host_qt=$(dpkg-query -W -f='${Version}' qt6-base-dev-tools 2>/dev/null || true)
if [ -z "$host_qt" ]; then
    echo "build-windows-qt: the host's Qt tools are missing (package qt6-base-dev-tools)" >&2
    exit 1
fi
host_cmake=/usr/lib/$(gcc -print-multiarch)/cmake
if [ ! -d "$host_cmake/Qt6CoreTools" ] || [ ! -d "$host_cmake/Qt6WidgetsTools" ]; then
    echo "build-windows-qt: no CMake packages of the host's Qt tools in $host_cmake" >&2
    exit 1
fi
compiler=$(x86_64-w64-mingw32-g++-posix --version | head -n 1)

features=(
    # What the window does not use.
    sql network dbus printsupport concurrent xml opengl dynamicgl vulkan direct2d
    jpeg gif icu zstd
    # Without direct2d, Gui leaves out the DirectWrite 3 font database that the Windows
    # platform plugin would still ask for (it then fails to link); the plugin uses FreeType.
    directwrite3
    # Debian's source has no tablet headers of Windows.
    tabletevent
)
bundled=(zlib pcre2 png harfbuzz freetype doubleconversion)
options=(
    -DCMAKE_BUILD_TYPE=Release
    -DQT_BUILD_EXAMPLES=OFF -DQT_BUILD_TESTS=OFF -DQT_BUILD_BENCHMARKS=OFF
    -DFEATURE_testlib=ON -DFEATURE_widgets=ON -DFEATURE_freetype=ON -DFEATURE_harfbuzz=ON
)
for feature in "${features[@]}"; do options+=("-DFEATURE_$feature=OFF"); done
for library in "${bundled[@]}"; do options+=("-DFEATURE_system_$library=OFF"); done

# Qt's configuration, the compilers and the host's Qt make the stamp; a change of any of them
# makes the prefix again (and a build folder of another stamp is not carried on).
want=$({ printf '%s\n' "${options[@]}"; cat "$compilers"; echo "$compiler"; echo "$host_qt"; } |
    sha256sum | cut -d' ' -f1)
if [ -f "$stamp" ] && [ "$(cat "$stamp")" = "$want" ]; then
    echo "build-windows-qt: $prefix is up to date"
    exit 0
fi
fail() {
    echo "build-windows-qt: $1 failed; the end of $log:" >&2
    tail -n 60 "$log" >&2
    exit 1
}

start=$(date +%s)
source=
if [ -f "$work/.stamp" ] && [ "$(cat "$work/.stamp")" = "$want" ] && [ -f "$build/build.ninja" ]; then
    source=$(find "$work" -mindepth 1 -maxdepth 1 -type d -name 'qt6-base-*' | head -n 1)
fi
if [ -n "$source" ]; then
    echo "build-windows-qt: carrying on with the interrupted build in $build"
    echo "=== carried on $(date -u '+%F %T')" >>"$log"
else
    find "$prefix" -mindepth 1 -maxdepth 1 -exec rm -rf {} +
    mkdir -p "$work"
    source=$("$root/scripts/debian-source.sh" "$work" "qt6-base=$host_qt")
    echo "build-windows-qt: configuring $(basename "$source") for Windows"
    cmake -S "$source" -B "$build" -G Ninja -Wno-dev \
        -DCMAKE_TOOLCHAIN_FILE="$compilers" -DCMAKE_INSTALL_PREFIX="$prefix" \
        -DQT_HOST_PATH=/usr -DQT_HOST_PATH_CMAKE_DIR="$host_cmake" \
        "${options[@]}" >"$log" 2>&1 || fail "configuring Qt"
    # From here on, an interrupted build is carried on.
    echo "$want" >"$work/.stamp"
fi
echo "build-windows-qt: building (log in $log)"
cmake --build "$build" -j "$jobs" >>"$log" 2>&1 || fail "building Qt"
cmake --install "$build" --prefix "$prefix" >>"$log" 2>&1 || fail "installing Qt"

for file in bin/Qt6Core.dll bin/Qt6Gui.dll bin/Qt6Widgets.dll bin/Qt6Test.dll \
    plugins/platforms/qwindows.dll plugins/styles/qwindowsvistastyle.dll; do
    [ -f "$prefix/$file" ] || { echo "build-windows-qt: $file was not built" >&2; exit 1; }
done
# The licences of Qt and of the libraries it bundles, shipped with the programs.
mkdir -p "$prefix/licenses"
cp "$source"/LICENSES/*.txt "$source/debian/copyright" "$prefix/licenses/"
rm -rf "$work"
echo "$want" >"$stamp"
echo "build-windows-qt: done in $prefix ($(du -sm "$prefix" | cut -f1) MB, $(( ($(date +%s) - start) / 60 )) min)"
