# Cross build for 64-bit Windows with MinGW-w64 (Debian: g++-mingw-w64-x86-64).
# The -posix compilers are used because GoogleTest needs std::mutex, which
# the win32-thread compilers lack. Everything links statically against the
# GCC runtime, so the DLLs and executables import only system DLLs and the
# C runtime.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(KESTACCEL_MINGW_PREFIX x86_64-w64-mingw32)
set(CMAKE_C_COMPILER ${KESTACCEL_MINGW_PREFIX}-gcc-posix)
set(CMAKE_CXX_COMPILER ${KESTACCEL_MINGW_PREFIX}-g++-posix)
set(CMAKE_RC_COMPILER ${KESTACCEL_MINGW_PREFIX}-windres)

set(CMAKE_FIND_ROOT_PATH /usr/${KESTACCEL_MINGW_PREFIX})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

set(CMAKE_EXE_LINKER_FLAGS_INIT "-static")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-static")

# Eigen is header-only and portable: take the distribution's copy from
# outside the cross root.
if(NOT Eigen3_DIR AND EXISTS /usr/share/eigen3/cmake/Eigen3Config.cmake)
    set(Eigen3_DIR /usr/share/eigen3/cmake CACHE PATH "Eigen's CMake package")
endif()

# Tests run under Wine. /usr/lib/wine/wine64 works as an emulator where a
# bare "wine64" does not.
if(NOT CMAKE_CROSSCOMPILING_EMULATOR)
    if(EXISTS /usr/lib/wine/wine64)
        set(CMAKE_CROSSCOMPILING_EMULATOR /usr/lib/wine/wine64)
    else()
        find_program(KESTACCEL_WINE wine)
        if(KESTACCEL_WINE)
            set(CMAKE_CROSSCOMPILING_EMULATOR ${KESTACCEL_WINE})
        endif()
    endif()
endif()
