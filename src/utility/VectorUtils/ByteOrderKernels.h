#pragma once

#include <cstddef>

#include <kestcore/utility/int24_t.h>

// Byte reversal of 16-, 24-, 32- and 64-bit words. The shift-and-mask forms
// are what compilers recognise as byte-swap instructions, with no intrinsic
// and no dependence on the host's byte order. Each element is read whole
// before it is written, in ascending order, so the out-of-place form with
// src == dst gives the in-place result.
namespace kestaccel {
namespace utility {
namespace cpp {

inline unsigned short ReverseBytes(unsigned short word)
{
    return static_cast<unsigned short>((word >> 8) | (word << 8));
}

inline unsigned int ReverseBytes(unsigned int word)
{
    return (word >> 24) | ((word >> 8) & 0x0000FF00u) | ((word << 8) & 0x00FF0000u) | (word << 24);
}

inline unsigned long long ReverseBytes(unsigned long long word)
{
    const unsigned long long low = ReverseBytes(static_cast<unsigned int>(word));
    const unsigned long long high = ReverseBytes(static_cast<unsigned int>(word >> 32));
    return (low << 32) | high;
}

// The middle byte of a packed 24-bit word stays where it is.
inline kestcore::utility::int24_t ReverseBytes(kestcore::utility::int24_t word)
{
    kestcore::utility::int24_t reversed;
    reversed.bytes[0] = word.bytes[2];
    reversed.bytes[1] = word.bytes[1];
    reversed.bytes[2] = word.bytes[0];
    return reversed;
}

template <class Word>
void SwapBytes(unsigned int count, Word* data)
{
    for (std::size_t i = 0; i < count; ++i) data[i] = ReverseBytes(data[i]);
}

template <class Word>
void SwapBytes(unsigned int count, const Word* src, Word* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = ReverseBytes(src[i]);
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
