# The compilers of the cross build for 64-bit Windows: Debian's mingw-w64 toolchain in its
# posix threads variant. Read by the project's toolchain (mingw-w64-x86_64.cmake) and, on its
# own, by the build of Qt for Windows (scripts/build-windows-qt.sh), so that both use the same
# compilers and find the target's system libraries in the same place.

set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(VTR_MINGW_TRIPLE x86_64-w64-mingw32)
find_program(CMAKE_C_COMPILER NAMES ${VTR_MINGW_TRIPLE}-gcc-posix ${VTR_MINGW_TRIPLE}-gcc REQUIRED)
find_program(CMAKE_CXX_COMPILER NAMES ${VTR_MINGW_TRIPLE}-g++-posix ${VTR_MINGW_TRIPLE}-g++
             REQUIRED)
find_program(CMAKE_RC_COMPILER NAMES ${VTR_MINGW_TRIPLE}-windres)

set(CMAKE_FIND_ROOT_PATH /usr/${VTR_MINGW_TRIPLE})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
