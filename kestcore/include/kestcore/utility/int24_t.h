#pragma once

#include <cstdint>

namespace kestcore {
namespace utility {

// A packed 24-bit sample: three bytes, little-endian two's complement,
// alignment 1, so an array has a stride of 3 bytes and an element may start
// at any address. Conversion from int saturates to [-8388608, 8388607];
// conversion to int sign-extends bit 23. Equality compares the three bytes.
struct int24_t {
    std::uint8_t bytes[3];

    static constexpr int kMax = 8388607;
    static constexpr int kMin = -8388608;

    int24_t() = default;

    constexpr int24_t(int value) noexcept
        : bytes{static_cast<std::uint8_t>(Saturate(value)),
                static_cast<std::uint8_t>(Saturate(value) >> 8),
                static_cast<std::uint8_t>(Saturate(value) >> 16)}
    {
    }

    constexpr operator int() const noexcept
    {
        return static_cast<int>(static_cast<std::int8_t>(bytes[2])) * 65536
             + (static_cast<int>(bytes[1]) << 8) + static_cast<int>(bytes[0]);
    }

    friend constexpr bool operator==(const int24_t& a, const int24_t& b) noexcept
    {
        return a.bytes[0] == b.bytes[0] && a.bytes[1] == b.bytes[1] && a.bytes[2] == b.bytes[2];
    }
    friend constexpr bool operator!=(const int24_t& a, const int24_t& b) noexcept { return !(a == b); }

private:
    static constexpr int Saturate(int value) noexcept
    {
        return value > kMax ? kMax : (value < kMin ? kMin : value);
    }
};

static_assert(sizeof(int24_t) == 3, "int24_t must be three bytes");
static_assert(alignof(int24_t) == 1, "int24_t must have no alignment");

}  // namespace utility
}  // namespace kestcore
