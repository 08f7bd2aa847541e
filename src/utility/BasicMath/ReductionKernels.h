#pragma once

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

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
