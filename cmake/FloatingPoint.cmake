# Flags that decide floating-point results. Every target whose arithmetic is
# compared bit for bit (the library, the tests, the benchmarks) links this
# interface target privately, so a consumer's own flags are never touched.
#
# -ffp-contract=off: GCC fuses a*b+c into one rounding by default wherever the
#   target has FMA; every product and sum here is rounded on its own.
# -mno-fma: with -march=x86-64-v3 GCC 12 still emits fused vfmaddsub for
#   complex multiply loops at -O3, even under -ffp-contract=off.
# Never fast-math in any form: reassociation would change the order of sums.
add_library(kestaccel_fp_flags INTERFACE)
if(MSVC)
    target_compile_options(kestaccel_fp_flags INTERFACE /fp:precise)
else()
    target_compile_options(kestaccel_fp_flags INTERFACE -ffp-contract=off -fno-fast-math)
    if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(x86_64|AMD64|amd64|i.86)$")
        target_compile_options(kestaccel_fp_flags INTERFACE -mno-fma)
    endif()
endif()

# KESTACCEL_ISA widens the library alone; the tests and benchmarks stay at the
# baseline, so that a wider build is checked against loops compiled without
# it. src/ puts -march on the library's own options, which come before the
# -mno-fma above on the command line: a -march after it would switch FMA
# back on.
set(KESTACCEL_ISA_FLAGS "")
if(KESTACCEL_ISA AND NOT MSVC)
    set(KESTACCEL_ISA_FLAGS -march=${KESTACCEL_ISA})
endif()

# The kernels are written as loops the compiler can vectorise without
# changing a bit; g++ 12 at -O2 leaves almost all of them scalar. A Debug
# build keeps its -O0 for the kernels too: it is one of the builds whose bits
# are checked.
set(KESTACCEL_KERNEL_OPT_FLAGS "")
if(NOT MSVC AND NOT CMAKE_BUILD_TYPE STREQUAL "Debug")
    set(KESTACCEL_KERNEL_OPT_FLAGS -O3)
endif()

# MinGW's <cmath> hides M_PI and friends in strict C++ mode; glibc shows them.
if(WIN32)
    target_compile_definitions(kestaccel_fp_flags INTERFACE _USE_MATH_DEFINES)
endif()
