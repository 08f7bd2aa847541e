#pragma once

#include <cstddef>

namespace kestaccel {
namespace utility {
namespace cpp {

// Each product is rounded to T before it is added, and the sum runs from +0
// in ascending index order in one accumulator: no fused multiply-add and no
// partial sums, so the result has the bits of the plain loop.
template <class T>
T DotProduct(unsigned int count, const T* a, const T* b)
{
    T acc = T(0);
    for (std::size_t i = 0; i < count; ++i) {
        const T product = a[i] * b[i];
        acc += product;
    }
    return acc;
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
