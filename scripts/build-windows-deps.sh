#!/usr/bin/env bash
# Builds, for 64-bit Windows, the libraries Debian has no Windows build of, into a prefix
# that cmake/mingw-w64-x86_64.cmake reads (VTR_WINDOWS_DEPS):
#   build-windows-deps.sh PREFIX
#   - pugixml from Debian's source package (scripts/debian-source.sh: apt-get source, with the
#     machine's own package sources turned into source entries in a private configuration);
#   - GoogleTest and GoogleMock from /usr/src/googletest (Debian's googletest package);
#   - CLI11 and nlohmann-json, header-only, copied from Debian's -dev packages with their
#     CMake package files.
# zlib needs nothing here: Debian's libz-mingw-w64-dev is the target's zlib. Nothing is kept
# in the repository; a finished prefix is recognised by its stamp and left as it is.
set -euo pipefail

if [ $# -ne 1 ]; then
    echo "usage: build-windows-deps.sh PREFIX" >&2
    exit 2
fi
root=$(cd "$(dirname "$0")/.." && pwd)
mkdir -p "$1"
prefix=$(cd "$1" && pwd)
toolchain=$root/cmake/mingw-w64-x86_64.cmake
stamp=$prefix/.vtr-windows-deps
# A change of this script, or of the toolchain, makes the prefix again.
want=$(cat "$0" "$toolchain" "$root/cmake/mingw-w64-x86_64-compilers.cmake" | sha256sum | cut -d' ' -f1)
if [ -f "$stamp" ] && [ "$(cat "$stamp")" = "$want" ]; then
    echo "build-windows-deps: $prefix is up to date"
    exit 0
fi

work=$prefix/work
rm -rf "$work" "$prefix/include" "$prefix/lib" "$prefix/share" "$stamp"
mkdir -p "$work"
jobs=${VTR_JOBS:-2}

configure_and_install() {  # source folder, build folder, extra cmake arguments...
    local source=$1 build=$2
    shift 2
    cmake -S "$source" -B "$build" -G Ninja -Wno-dev \
        -DCMAKE_TOOLCHAIN_FILE="$toolchain" -DCMAKE_BUILD_TYPE=Release \
        -DCMAKE_INSTALL_PREFIX="$prefix" -DBUILD_SHARED_LIBS=OFF "$@" >"$build.log" 2>&1 ||
        { cat "$build.log" >&2; return 1; }
    cmake --build "$build" -j "$jobs" >>"$build.log" 2>&1 || { cat "$build.log" >&2; return 1; }
    cmake --install "$build" >>"$build.log" 2>&1 || { cat "$build.log" >&2; return 1; }
}

# --- pugixml, from Debian's source package -------------------------------------------------
pugixml_source=$("$root/scripts/debian-source.sh" "$work" pugixml)
echo "build-windows-deps: building $(basename "$pugixml_source")"
configure_and_install "$pugixml_source" "$work/pugixml-build" -DPUGIXML_BUILD_TESTS=OFF

# --- GoogleTest and GoogleMock, from Debian's googletest package ----------------------------
[ -f /usr/src/googletest/CMakeLists.txt ] ||
    { echo "build-windows-deps: /usr/src/googletest is missing (package googletest)" >&2; exit 1; }
echo "build-windows-deps: building GoogleTest"
configure_and_install /usr/src/googletest "$work/googletest-build" -DBUILD_GMOCK=ON \
    -DINSTALL_GTEST=ON

# --- header-only libraries -----------------------------------------------------------------
echo "build-windows-deps: copying CLI11 and nlohmann-json"
mkdir -p "$prefix/include" "$prefix/share/cmake"
cp -r /usr/include/CLI /usr/include/nlohmann "$prefix/include/"
cp -r /usr/share/cmake/CLI11 /usr/share/cmake/nlohmann_json "$prefix/share/cmake/"

rm -rf "$work"
echo "$want" >"$stamp"
echo "build-windows-deps: done in $prefix"
