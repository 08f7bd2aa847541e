# Per-file compile flags for kernels that need other optimisation settings
# than the library's default (-O3). Each entry says why. The flags are GCC's
# and Clang's; MSVC builds keep the defaults, and Debug builds their -O0.
function(kestaccel_kernel_flags file)
    set(flags ${ARGN})
    if(CMAKE_BUILD_TYPE STREQUAL "Debug")
        list(FILTER flags EXCLUDE REGEX "^-O")
    endif()
    if(NOT MSVC)
        set_source_files_properties(${CMAKE_CURRENT_SOURCE_DIR}/${file} PROPERTIES COMPILE_OPTIONS "${flags}")
    endif()
endfunction()

# FIR: the kernel forms eight outputs at once, and -O2 turns those eight lanes
# into two vector multiplies and two vector adds per tap. At -O3 the loop
# vectoriser also works on the tap loop around them and fills it with
# shuffles: 2-3x slower, same bits. The later -O2 overrides the target's -O3
# for this file only.
kestaccel_kernel_flags(filter/FIR/FIR.cpp -O2)

# Sample conversion: the limit, rounding and range tests are selects, and
# under the default trapping-math rules g++ keeps them as branches (a
# comparison or product of a NaN might raise a flag the source would not
# have raised), so the loops stay scalar. No flag is read and no trap is
# enabled here, so -fno-trapping-math changes no bit; the conversion tests
# compare every path with a plain loop around the runtime's lroundf.
# -funroll-loops: the vector bodies are short (about 15 instructions for 8
# shorts to floats) and bound by their loads and stores, so the counter and
# branch of each iteration cost a few percent; unrolled, 4% less time for
# float to short at 4096 elements.
# -fno-strict-aliasing: a conversion between overlapping buffers of different
# element types (an int read where a float was just written) must give the
# ascending loop's result; under the type-based rules g++ may assume a short
# and a float never share memory and reorder the loads and stores. Without
# them the vectorised loops are versioned on a run-time overlap test, as the
# loops between buffers of one type already are.
kestaccel_kernel_flags(utility/VectorUtils/Conversion.cpp -fno-trapping-math -funroll-loops -fno-strict-aliasing)

# Multi-rate filter: the same shape as the FIR kernel (eight cycles side by
# side, one sum each), and the same story: -O2 makes each tap two vector
# multiplies and adds, -O3 vectorises the tap loop with transposes instead
# and leaves the lanes scalar. Same bits either way.
kestaccel_kernel_flags(filter/MultiRate/MultiRate.cpp -O2)

# Complex arithmetic: the quotient computes both forms of Smith's method and
# selects one, so that the divide loops can run several elements at once.
# Under the default trapping-math rules g++ sinks each form's divisions back
# into a branch (a division might raise a flag the other form would not
# have) and the loops stay scalar. No flag is read and no trap is enabled
# here, so -fno-trapping-math changes no bit; the complex tests compare the
# divide members with the plain steps of the method, element by element.
kestaccel_kernel_flags(utility/BasicMath/ComplexArithmetic.cpp -fno-trapping-math)

# Matrix product: Eigen refuses AVX-512 without FMA, and the library builds
# with -mno-fma. The product is the one operation whose bits are not fixed
# across builds (Eigen's summation order follows the vector width; its
# results agree within a tolerance), so on an AVX-512 build this one file
# may fuse. The later -mfma overrides the target's -mno-fma for it alone.
#
# With AVX-512, g++ 12 turns a pair of lanes that add and subtract products,
# the (re, im) of a complex product, into vfmaddsub/vfmsubadd even under
# -ffp-contract=off and -mno-fma: the AVX-512 forms of those instructions do
# not depend on the FMA flag. The complex products' loops stay at 256-bit
# AVX2, where -mno-fma holds. The FFT kernels need no flag: their loops run
# across points, so a vector holds real parts or imaginary parts, never the
# (re, im) pair the pattern needs. A package test scans the library for
# fused instructions outside the matrix product.
if(KESTACCEL_ISA MATCHES "v4|avx512")
    # Eigen's AVX-512 headers trip g++ 12's -Wmaybe-uninitialized (clang has
    # no such warning).
    set(quiet "")
    if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
        set(quiet -Wno-maybe-uninitialized)
    endif()
    kestaccel_kernel_flags(utility/MatrixUtils/Multiply.cpp -mfma ${quiet})
    kestaccel_kernel_flags(utility/BasicMath/ComplexArithmetic.cpp -fno-trapping-math -mno-avx512f)
endif()
