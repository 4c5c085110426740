# Cross build for 64-bit Windows with Debian's mingw-w64 toolchain (posix threads variant).
#
#   cmake -S . -B build-windows -G Ninja -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64-x86_64.cmake \
#         -DVTR_WINDOWS_DEPS=/path/to/deps -DVTR_WINDOWS_QT=/path/to/qt
#
# VTR_WINDOWS_DEPS (a cache variable, or the environment variable of that name) is the prefix
# that scripts/build-windows-deps.sh fills with the libraries Debian has no Windows build of
# (pugixml, GoogleTest) and the header-only ones (CLI11, nlohmann-json). VTR_WINDOWS_QT is
# the prefix of Qt for Windows that scripts/build-windows-qt.sh builds; without it, build with
# -DVTR_BUILD_UI=OFF. zlib comes from Debian's own mingw-w64 package.
#
# Programs are linked statically (the C and C++ runtimes, the threads library, zlib), so that
# the command line needs no DLL beside it; programs that use Qt's DLLs use the compiler's
# runtime DLLs as Qt does (see the top-level CMakeLists.txt). Programs that the build itself
# runs (the demo installation, the listing of the tests) and the tests that ctest runs go
# through scripts/wine-run.sh, in a Wine prefix inside the build folder, when Wine is there;
# it finds Qt's and the runtime's DLLs through Wine's search path.

include(${CMAKE_CURRENT_LIST_DIR}/mingw-w64-x86_64-compilers.cmake)

# The prefixes of the target's libraries; try_compile projects read this file again, so the
# values are handed on to them.
foreach(prefix VTR_WINDOWS_DEPS VTR_WINDOWS_QT)
    if(NOT ${prefix} AND DEFINED ENV{${prefix}})
        set(${prefix} "$ENV{${prefix}}")
    endif()
endforeach()
set(VTR_WINDOWS_DEPS "${VTR_WINDOWS_DEPS}" CACHE PATH
    "Prefix of the Windows builds of pugixml, GoogleTest, CLI11 and nlohmann-json")
set(VTR_WINDOWS_QT "${VTR_WINDOWS_QT}" CACHE PATH "Prefix of Qt built for Windows")
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES VTR_WINDOWS_DEPS VTR_WINDOWS_QT)

foreach(prefix "${VTR_WINDOWS_QT}" "${VTR_WINDOWS_DEPS}")
    if(prefix)
        list(PREPEND CMAKE_FIND_ROOT_PATH "${prefix}")
    endif()
endforeach()
if(VTR_WINDOWS_QT)
    # A cross-built Qt runs the host's moc, rcc and uic (Debian's, of the same version).
    set(QT_HOST_PATH /usr)
    execute_process(COMMAND gcc -print-multiarch OUTPUT_VARIABLE VTR_HOST_MULTIARCH
                    OUTPUT_STRIP_TRAILING_WHITESPACE)
    set(QT_HOST_PATH_CMAKE_DIR /usr/lib/${VTR_HOST_MULTIARCH}/cmake)
endif()

set(ZLIB_USE_STATIC_LIBS ON)

# The compiler's runtime DLLs, for the programs that use them (Qt's and the window).
execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=libstdc++-6.dll
                OUTPUT_VARIABLE VTR_MINGW_LIBSTDCXX OUTPUT_STRIP_TRAILING_WHITESPACE)
execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=libwinpthread-1.dll
                OUTPUT_VARIABLE VTR_MINGW_WINPTHREAD OUTPUT_STRIP_TRAILING_WHITESPACE)
get_filename_component(VTR_MINGW_RUNTIME_DIR "${VTR_MINGW_LIBSTDCXX}" DIRECTORY)
get_filename_component(VTR_MINGW_WINPTHREAD_DIR "${VTR_MINGW_WINPTHREAD}" DIRECTORY)

find_program(VTR_WINE NAMES wine wine64)
if(VTR_WINE)
    get_filename_component(VTR_TOOLCHAIN_ROOT "${CMAKE_CURRENT_LIST_DIR}/.." ABSOLUTE)
    # A Wine prefix of the build's own, never the user's ~/.wine; Qt's DLLs and the runtime's
    # found on Wine's search path, as they would be beside an installed program.
    set(CMAKE_CROSSCOMPILING_EMULATOR
        "${VTR_TOOLCHAIN_ROOT}/scripts/wine-run.sh;--prefix;${CMAKE_BINARY_DIR}/wineprefix")
    foreach(dir "${VTR_MINGW_RUNTIME_DIR}" "${VTR_MINGW_WINPTHREAD_DIR}" "${VTR_WINDOWS_QT}/bin")
        if(IS_DIRECTORY "${dir}")
            list(APPEND CMAKE_CROSSCOMPILING_EMULATOR --path "${dir}")
        endif()
    endforeach()
endif()
