#pragma once

#include <cstddef>
#include <cstdint>

#include <kestcore/utility/int24_t.h>

// g++ vectorises no load or store of three-byte elements, so a loop that
// reads or writes packed 24-bit samples runs scalar from end to end. These
// helpers cut such a loop in two over blocks of a few hundred elements: the
// arithmetic runs vectorised on plain ints held on the stack, and only the
// byte moves stay scalar. Splitting changes the order of reads and writes,
// which can only show when the buffers overlap; then the single element
// loop is kept.
namespace kestaccel {
namespace utility {
namespace cpp {

constexpr std::size_t kPackedBlock = 256;

inline bool Disjoint(const void* a, std::size_t aBytes, const void* b, std::size_t bBytes)
{
    const auto x = reinterpret_cast<std::uintptr_t>(a);
    const auto y = reinterpret_cast<std::uintptr_t>(b);
    return x + aBytes <= y || y + bBytes <= x;
}

// dst[i] = int24_t(toInt(src[i])), saturated by the type's conversion.
template <class Src, class ToInt>
void PackInBlocks(unsigned int count, const Src* src, kestcore::utility::int24_t* dst, ToInt toInt)
{
    using kestcore::utility::int24_t;
    if (!Disjoint(src, sizeof(Src) * count, dst, sizeof(int24_t) * count)) {
        for (std::size_t i = 0; i < count; ++i) dst[i] = int24_t(toInt(src[i]));
        return;
    }
    int block[kPackedBlock];
    for (std::size_t start = 0; start < count; start += kPackedBlock) {
        const std::size_t n = count - start < kPackedBlock ? count - start : kPackedBlock;
        for (std::size_t i = 0; i < n; ++i) block[i] = toInt(src[start + i]);
        for (std::size_t i = 0; i < n; ++i) dst[start + i] = int24_t(block[i]);
    }
}

// dst[i] = fromInt(the sign-extended value of src[i]).
template <class Dst, class FromInt>
void UnpackInBlocks(unsigned int count, const kestcore::utility::int24_t* src, Dst* dst, FromInt fromInt)
{
    using kestcore::utility::int24_t;
    if (!Disjoint(src, sizeof(int24_t) * count, dst, sizeof(Dst) * count)) {
        for (std::size_t i = 0; i < count; ++i) dst[i] = fromInt(static_cast<int>(src[i]));
        return;
    }
    int block[kPackedBlock];
    for (std::size_t start = 0; start < count; start += kPackedBlock) {
        const std::size_t n = count - start < kPackedBlock ? count - start : kPackedBlock;
        for (std::size_t i = 0; i < n; ++i) block[i] = static_cast<int>(src[start + i]);
        for (std::size_t i = 0; i < n; ++i) dst[start + i] = fromInt(block[i]);
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
