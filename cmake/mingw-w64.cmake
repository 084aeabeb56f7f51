# 64-bit Windows 10 and later, by the cross compiler with POSIX threads. The libraries come from script/bootstrap
# --windows.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)
set(CMAKE_SYSTEM_VERSION 10.0)
set(CMAKE_C_COMPILER x86_64-w64-mingw32-gcc-posix)
set(CMAKE_CXX_COMPILER x86_64-w64-mingw32-g++-posix)
set(CMAKE_RC_COMPILER x86_64-w64-mingw32-windres)

# A program needs no other file: the runtime libraries stand in it, and all system calls exist since Windows 10.
set(CMAKE_C_FLAGS_INIT "-D_WIN32_WINNT=0x0A00 -fstack-protector-strong")
set(CMAKE_CXX_FLAGS_INIT "-D_WIN32_WINNT=0x0A00 -fstack-protector-strong")
set(CMAKE_EXE_LINKER_FLAGS_INIT "-static -fstack-protector-strong -Wl,--dynamicbase,--high-entropy-va,--nxcompat")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-static -fstack-protector-strong -Wl,--dynamicbase,--high-entropy-va,--nxcompat")

set(VEXA_WINDOWS_PREFIX ${CMAKE_CURRENT_LIST_DIR}/../build/windows-deps/prefix)
set(CMAKE_FIND_ROOT_PATH ${VEXA_WINDOWS_PREFIX} /usr/x86_64-w64-mingw32)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
set(ENV{PKG_CONFIG_LIBDIR} ${VEXA_WINDOWS_PREFIX}/lib/pkgconfig:${VEXA_WINDOWS_PREFIX}/share/pkgconfig)

set(CMAKE_CROSSCOMPILING_EMULATOR wine)

# Boost's own CMake files name the host's folders.
set(Boost_NO_BOOST_CMAKE ON)
