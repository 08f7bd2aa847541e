#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

// Half-precision packing by moving bit fields, with integer operations only,
// so neither the floating-point mode nor a trap can affect the result. This
// is not an IEEE conversion: the fraction is truncated, the exponent is
// rebiased modulo 32 (so large, tiny, infinite and NaN floats wrap to
// ordinary half values), and the only special case either way is the word
// or pattern zero. The single test is a select, so the loops vectorise.
namespace kestaccel {
namespace utility {
namespace cpp {

inline unsigned short FloatBitsToHalf(std::uint32_t u)
{
    const std::uint32_t sign = (u >> 16) & 0x8000u;
    const std::uint32_t exponent = (((u >> 23) & 0xFFu) + 48u) & 0x1Fu;  // (e - 112) mod 32
    const std::uint32_t fraction = (u >> 13) & 0x3FFu;
    const std::uint32_t half = sign | (exponent << 10) | fraction;
    return static_cast<unsigned short>(u == 0 ? 0u : half);
}

inline std::uint32_t HalfToFloatBits(unsigned short h)
{
    const std::uint32_t word = h;
    const std::uint32_t sign = (word & 0x8000u) << 16;
    const std::uint32_t exponent = ((word >> 10) & 0x1Fu) + 112u;
    const std::uint32_t fraction = (word & 0x3FFu) << 13;
    const std::uint32_t bits = sign | (exponent << 23) | fraction;
    return word == 0 ? 0u : bits;
}

// The source is not const in the interface; neither kernel writes through it.
inline void ConvertFloat2Half(float* src, unsigned short* dst, unsigned int count)
{
    for (std::size_t i = 0; i < count; ++i) {
        std::uint32_t u;
        std::memcpy(&u, &src[i], sizeof u);
        dst[i] = FloatBitsToHalf(u);
    }
}

inline void ConvertHalf2Float(unsigned short* src, float* dst, unsigned int count)
{
    for (std::size_t i = 0; i < count; ++i) {
        const std::uint32_t bits = HalfToFloatBits(src[i]);
        std::memcpy(&dst[i], &bits, sizeof bits);
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
