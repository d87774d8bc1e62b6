# Cross-builds for 64-bit Windows with Debian's mingw-w64 (posix threads), and runs what
# it builds under Wine. The C++ runtime is linked into every binary, so a module copied
# elsewhere needs only the system's libraries and the platform's runtime beside it.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(CMAKE_C_COMPILER x86_64-w64-mingw32-gcc-posix)
set(CMAKE_CXX_COMPILER x86_64-w64-mingw32-g++-posix)
set(CMAKE_RC_COMPILER x86_64-w64-mingw32-windres)

set(CMAKE_FIND_ROOT_PATH /usr/x86_64-w64-mingw32)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

set(CMAKE_EXE_LINKER_FLAGS_INIT "-static")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-static")
set(CMAKE_MODULE_LINKER_FLAGS_INIT "-static")

# Quiet, and without the .NET and HTML runtimes Wine would offer to install. Address-space
# randomisation off (children inherit it): with it, Wine now and then finds the fixed address
# it needs for a new process taken, and the process dies before it starts ("failed to map
# the shared user data"), which fails whichever test was starting it.
find_program(STEAMEXT_WINE NAMES wine wine64 REQUIRED)
find_program(STEAMEXT_SETARCH NAMES setarch REQUIRED)
set(CMAKE_CROSSCOMPILING_EMULATOR ${STEAMEXT_SETARCH} x86_64 -R /usr/bin/env WINEDEBUG=-all
                                  WINEDLLOVERRIDES=mscoree,mshtml= ${STEAMEXT_WINE})
