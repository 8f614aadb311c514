# Cross-build for Windows x86-64 with Debian's MinGW-w64 (the POSIX thread
# model: g++-mingw-w64-x86-64-posix), and the test programs run under Wine.
#
#   cmake --workflow --preset windows
#   cmake -S . -B build/win -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64-x86_64.cmake
#
# The compiler's own runtime (libgcc, libstdc++, winpthread) is linked
# statically into oxbase.dll and into every program, so that nothing but
# the system's DLLs (msvcrt.dll, kernel32.dll) is needed to run them.
#
# Wine: CTest starts every test program through CMAKE_CROSSCOMPILING_EMULATOR,
# cmake/wine-run: the wine64 loader with WINEDEBUG=-all and a throwaway
# prefix inside the build directory (OXBASE_WINEPREFIX), made on first use.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(OXBASE_MINGW_PREFIX x86_64-w64-mingw32)
set(CMAKE_C_COMPILER ${OXBASE_MINGW_PREFIX}-gcc-posix)
set(CMAKE_CXX_COMPILER ${OXBASE_MINGW_PREFIX}-g++-posix)
set(CMAKE_RC_COMPILER ${OXBASE_MINGW_PREFIX}-windres)

# Headers and libraries come from the MinGW tree only; programs run here.
set(CMAKE_FIND_ROOT_PATH /usr/${OXBASE_MINGW_PREFIX})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# The compiler's runtime inside each module: -static takes winpthread's
# static archive too.
set(CMAKE_EXE_LINKER_FLAGS_INIT "-static-libgcc -static-libstdc++ -static")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-static-libgcc -static-libstdc++ -static")

# Wine runs the programs that the build makes (tests, test discovery),
# through cmake/wine-run. Debian's wine64 package installs its loader below
# /usr/lib/wine; the wine package adds the `wine` command.
find_program(OXBASE_WINE NAMES wine64 wine PATHS /usr/lib/wine NO_CMAKE_FIND_ROOT_PATH)
if(OXBASE_WINE)
    set(OXBASE_WINEPREFIX "${CMAKE_BINARY_DIR}/wineprefix" CACHE PATH
        "Throwaway Wine prefix in which the test programs run")
    set(CMAKE_CROSSCOMPILING_EMULATOR
        "/bin/sh;${CMAKE_CURRENT_LIST_DIR}/wine-run;${OXBASE_WINE};${OXBASE_WINEPREFIX}")
endif()
