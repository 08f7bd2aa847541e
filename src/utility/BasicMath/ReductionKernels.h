#pragma once

#include <cmath>
#include <cstddef>

// Reductions over real vectors. Every sum runs strictly from the first
// element to the last, starting at +0, in one accumulator: splitting it into
// partial sums, pairing or compensating would change the rounded result, and
// callers rely on the exact bits (the lowpass design normalises by this sum).
namespace kestaccel {
namespace utility {
namespace cpp {

template <class T>
T Sum(unsigned int count, const T* src)
{
    T acc = T(0);
    for (std::size_t i = 0; i < count; ++i) acc += src[i];
    return acc;
}

// The count is converted from its unsigned value, so counts above 2^31 are
// not taken as negative. An empty vector has mean 0, not 0/0.
template <class T>
T Mean(unsigned int count, const T* src)
{
    if (count == 0) return T(0);
    return Sum(count, src) / static_cast<T>(count);
}

template <class T>
T NormL1(unsigned int count, const T* src)
{
    T acc = T(0);
    for (std::size_t i = 0; i < count; ++i) acc += std::fabs(src[i]);
    return acc;
}

inline double NormL2(unsigned int count, const double* src)
{
    double acc = 0.0;
    for (std::size_t i = 0; i < count; ++i) acc += src[i] * src[i];
    return std::sqrt(acc);
}

// Each square is rounded to float first, so it overflows and underflows as a
// float would; only the running sum is kept in double, which holds the
// accuracy of long vectors of small elements.
inline float NormL2(unsigned int count, const float* src)
{
    double acc = 0.0;
    for (std::size_t i = 0; i < count; ++i) {
        const float square = src[i] * src[i];
        acc += static_cast<double>(square);
    }
    return static_cast<float>(std::sqrt(acc));
}

// Sample standard deviation in two passes: the mean first, then the squared
// deviations from it, divided by count - 1. A one-pass formula loses the
// result when the mean is large. Fewer than two elements leave `result`
// untouched.
template <class T>
void StandardDeviation(unsigned int count, const T* src, T& result)
{
    if (count < 2) return;
    const T mean = Sum(count, src) / static_cast<T>(count);
    T acc = T(0);
    for (std::size_t i = 0; i < count; ++i) {
        const T deviation = mean - src[i];
        acc += deviation * deviation;
    }
    result = std::sqrt(acc / static_cast<T>(count - 1));
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
