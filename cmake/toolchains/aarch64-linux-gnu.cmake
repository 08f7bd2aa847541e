# Cross build for 64-bit ARM Linux with Debian's g++-aarch64-linux-gnu; the
# tests run under qemu-user. Every AArch64 compiler fuses multiply-adds by
# default, so the -ffp-contract=off of cmake/FloatingPoint.cmake matters most
# here (the package test no_fused_multiply_add checks the library's code).
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR aarch64)

set(KESTACCEL_AARCH64_PREFIX aarch64-linux-gnu)
set(CMAKE_C_COMPILER ${KESTACCEL_AARCH64_PREFIX}-gcc)
set(CMAKE_CXX_COMPILER ${KESTACCEL_AARCH64_PREFIX}-g++)

set(CMAKE_FIND_ROOT_PATH /usr/${KESTACCEL_AARCH64_PREFIX})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# Eigen is header-only and portable: take the distribution's copy from
# outside the cross root.
if(NOT Eigen3_DIR AND EXISTS /usr/share/eigen3/cmake/Eigen3Config.cmake)
    set(Eigen3_DIR /usr/share/eigen3/cmake CACHE PATH "Eigen's CMake package")
endif()

# The target's loader and libraries live under the cross root.
if(NOT CMAKE_CROSSCOMPILING_EMULATOR)
    find_program(KESTACCEL_QEMU qemu-aarch64)
    if(KESTACCEL_QEMU)
        set(CMAKE_CROSSCOMPILING_EMULATOR ${KESTACCEL_QEMU} -L /usr/${KESTACCEL_AARCH64_PREFIX})
    endif()
endif()
