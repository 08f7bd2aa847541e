#pragma once

#include <cmath>
#include <complex>
#include <cstddef>
#include <limits>

#include "utility/BasicMath/RuntimeMath.h"

// In-place inversion with the size of each result limited to 1 / threshold.
namespace kestaccel {
namespace utility {
namespace cpp {

// Real elements. Below a threshold of epsilon the near-zero test is on x
// itself, not on its size, so every negative element becomes +infinity along
// with the zeros; above it, a small element gives 1 / threshold with its sign
// told apart by s - x, and a NaN falls through every test to -1 / threshold.
template <class T>
void Invert_Threshold_InPlace(unsigned int count, T* srcDst, T threshold)
{
    if (T(0) >= threshold) return;
    const T epsilon = std::numeric_limits<T>::epsilon();
    if (threshold <= epsilon) {
        for (std::size_t i = 0; i < count; ++i) {
            const T x = srcDst[i];
            srcDst[i] = x <= epsilon ? std::numeric_limits<T>::infinity() : T(1) / x;
        }
        return;
    }
    // -1 / threshold is a division of its own: read through a volatile, the
    // -1 cannot be folded into -(1 / threshold), which differs for a NaN
    // threshold (the division passes the NaN's sign on, the negation flips it).
    const volatile T minusOne = T(-1);
    const T top = T(1) / threshold;
    const T negativeTop = minusOne / threshold;
    for (std::size_t i = 0; i < count; ++i) {
        const T x = srcDst[i];
        const T s = std::fabs(x);
        if (s >= threshold) srcDst[i] = T(1) / x;
        else if (s <= epsilon) srcDst[i] = top;
        else if (s - x <= epsilon) srcDst[i] = top;
        else srcDst[i] = negativeTop;
    }
}

// Complex elements: the near-zero test is on the squared size p, widened to
// double for the comparison in the float member. A tiny element in any
// direction becomes (1 / threshold, +0); a small one keeps its phase at size
// 1 / threshold; a NaN fails both tests and stays NaN.
template <class T>
void Invert_Threshold_InPlace(unsigned int count, std::complex<T>* srcDst, T threshold)
{
    if (T(0) >= threshold) return;
    const double epsilon = static_cast<double>(std::numeric_limits<T>::epsilon());
    const T limit = threshold * threshold;
    const T top = T(1) / threshold;
    T* parts = reinterpret_cast<T*>(srcDst);
    for (std::size_t i = 0; i < count; ++i) {
        const T re = parts[2 * i], im = parts[2 * i + 1];
        const T p = im * im + re * re;
        T outRe, outIm;
        if (static_cast<double>(p) <= epsilon) {
            outRe = top;
            outIm = T(0);
        } else if (limit > p) {
            const T m = runtime::Sqrt(p) * threshold;
            outRe = re / m;
            outIm = -im / m;
        } else {
            outRe = re / p;
            outIm = -im / p;
        }
        parts[2 * i] = outRe;
        parts[2 * i + 1] = outIm;
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
