# Cross build for 64-bit Windows with Debian's mingw-w64 toolchain (posix threads variant).
#
#   cmake -S . -B build-windows -G Ninja -DVTR_BUILD_UI=OFF \
#         -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64-x86_64.cmake -DVTR_WINDOWS_DEPS=/path/to/deps
#
# VTR_WINDOWS_DEPS (a cache variable, or the environment variable of that name) is the prefix
# that scripts/build-windows-deps.sh fills with the libraries Debian has no Windows build of
# (pugixml, GoogleTest) and the header-only ones (CLI11, nlohmann-json). zlib comes from
# Debian's own mingw-w64 package. The programs are linked statically, so they need no DLL
# beside them. Programs that the build itself runs (the demo installation, the listing of
# the tests) and the tests that ctest runs go through scripts/wine-run.sh, in a Wine prefix inside the build
# folder, when Wine is there.

set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(VTR_MINGW_TRIPLE x86_64-w64-mingw32)
find_program(CMAKE_C_COMPILER NAMES ${VTR_MINGW_TRIPLE}-gcc-posix ${VTR_MINGW_TRIPLE}-gcc REQUIRED)
find_program(CMAKE_CXX_COMPILER NAMES ${VTR_MINGW_TRIPLE}-g++-posix ${VTR_MINGW_TRIPLE}-g++
             REQUIRED)
find_program(CMAKE_RC_COMPILER NAMES ${VTR_MINGW_TRIPLE}-windres)

# The prefix of the target's libraries; try_compile projects read this file again, so the
# value is handed on to them.
if(NOT VTR_WINDOWS_DEPS AND DEFINED ENV{VTR_WINDOWS_DEPS})
    set(VTR_WINDOWS_DEPS "$ENV{VTR_WINDOWS_DEPS}")
endif()
set(VTR_WINDOWS_DEPS "${VTR_WINDOWS_DEPS}" CACHE PATH
    "Prefix of the Windows builds of pugixml, GoogleTest, CLI11 and nlohmann-json")
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES VTR_WINDOWS_DEPS)

set(CMAKE_FIND_ROOT_PATH /usr/${VTR_MINGW_TRIPLE})
if(VTR_WINDOWS_DEPS)
    list(PREPEND CMAKE_FIND_ROOT_PATH "${VTR_WINDOWS_DEPS}")
endif()
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# Self-contained programs: the C and C++ runtimes, the threads library and zlib linked in.
set(ZLIB_USE_STATIC_LIBS ON)
set(CMAKE_EXE_LINKER_FLAGS_INIT "-static")

find_program(VTR_WINE NAMES wine wine64)
if(VTR_WINE)
    get_filename_component(VTR_TOOLCHAIN_ROOT "${CMAKE_CURRENT_LIST_DIR}/.." ABSOLUTE)
    # A Wine prefix of the build's own, never the user's ~/.wine.
    set(CMAKE_CROSSCOMPILING_EMULATOR
        "${VTR_TOOLCHAIN_ROOT}/scripts/wine-run.sh;--prefix;${CMAKE_BINARY_DIR}/wineprefix")
endif()
