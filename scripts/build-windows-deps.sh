#!/usr/bin/env bash
# Builds, for 64-bit Windows, the libraries Debian has no Windows build of, into a prefix
# that cmake/mingw-w64-x86_64.cmake reads (VTR_WINDOWS_DEPS):
#   build-windows-deps.sh PREFIX
#   - pugixml from Debian's source package (apt-get source, with the machine's own package
#     sources turned into source entries in a private apt configuration under PREFIX);
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
want=$(cat "$0" "$toolchain" | sha256sum | cut -d' ' -f1)
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
apt=$work/apt
mkdir -p "$apt/lists/partial" "$apt/sources.list.d" "$apt/cache/archives/partial"
found_source=0
for file in /etc/apt/sources.list.d/*.sources; do
    [ -f "$file" ] || continue
    sed -E 's/^Types:.*/Types: deb-src/' "$file" >"$apt/sources.list.d/$(basename "$file")"
    found_source=1
done
for file in /etc/apt/sources.list /etc/apt/sources.list.d/*.list; do
    [ -f "$file" ] || continue
    sed -nE 's/^[[:space:]]*deb[[:space:]]/deb-src /p' "$file" \
        >"$apt/sources.list.d/$(basename "$file" .list)-src.list"
    found_source=1
done
if [ "$found_source" -eq 0 ]; then
    echo "build-windows-deps: no apt package sources are configured" >&2
    exit 1
fi
apt_options=(
    -o "Dir::Etc::SourceList=/dev/null" -o "Dir::Etc::SourceParts=$apt/sources.list.d"
    -o "Dir::State::Lists=$apt/lists" -o "Dir::Cache=$apt/cache"
    -o "APT::Sandbox::User=root" -q
)
echo "build-windows-deps: fetching pugixml's source package"
apt-get "${apt_options[@]}" update >"$work/apt.log" 2>&1 || { cat "$work/apt.log" >&2; exit 1; }
(cd "$work" && apt-get "${apt_options[@]}" source pugixml >>"$work/apt.log" 2>&1) ||
    { cat "$work/apt.log" >&2; exit 1; }
pugixml_source=$(find "$work" -maxdepth 1 -type d -name 'pugixml-*' | head -n 1)
[ -n "$pugixml_source" ] || { echo "build-windows-deps: no pugixml source unpacked" >&2; exit 1; }
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
