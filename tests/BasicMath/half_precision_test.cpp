// ConvertFloat2Half and ConvertHalf2Float: field-moving packing, bit for bit.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <cstdint>
#include <random>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

// Float patterns and half words, each checked in the directions it holds.
TEST(HalfPrecision, TableRows)
{
    enum { kToHalf = 1, kToFloat = 2, kBoth = 3 };
    const struct { std::uint32_t floatBits; unsigned short half; int ways; } rows[] = {
        {0x3F800000u, 0x3C00, kBoth},    // 1.0
        {0xBF800000u, 0xBC00, kBoth},    // -1.0
        {0x3F000000u, 0x3800, kBoth},    // 0.5
        {0x477FE000u, 0x7BFF, kBoth},    // 65504.0, the largest value that survives
        {0x47800000u, 0x7C00, kBoth},    // 65536.0: exponent field 31, not infinity
        {0x48000000u, 0x0000, kToHalf},  // 131072.0: exponent wraps to 0
        {0x7F800000u, 0x3C00, kToHalf},  // +infinity wraps to 1.0
        {0x7FC00000u, 0x3E00, kToHalf},  // quiet NaN becomes 1.5
        {0x80000000u, 0xC000, kToHalf},  // -0.0 is not zero here: -2.0
        {0x000116C2u, 0x4008, kToHalf},  // 1e-40, a float subnormal
        {0x38800000u, 0x0400, kBoth},    // 2^-14
        {0x38000000u, 0x0000, kToHalf},  // 2^-15 is lost as a zero word
        {0x37800000u, 0x7C00, kToHalf},  // 2^-16 wraps to exponent 31
        {0x00000000u, 0x0000, kBoth},    // +0.0, the only special case
        {0xB8000000u, 0x8000, kBoth},    // -2^-15: no negative zero
        {0x38002000u, 0x0001, kBoth},    // subnormal read as if normal
        {0x47C00000u, 0x7E00, kBoth},    // 98304.0: no NaN
        {0xC7800000u, 0xFC00, kBoth},    // -65536.0
        {0x3F333333u, 0x3999, kToHalf},  // 0.7f: the low 13 fraction bits are dropped,
        {0x3F332CCCu, 0x3999, kToHalf},  // so flipping them changes nothing,
        {0x3F331333u, 0x3998, kToHalf},  // and the fourteenth counts
    };
    for (auto row : rows) {
        SCOPED_TRACE(::testing::Message() << std::hex << "float 0x" << row.floatBits << " half 0x" << row.half);
        float x = FromBits<float>(row.floatBits), back = -123.0f;
        unsigned short word = 0xDEAD;
        ku::ConvertFloat2Half(&x, &word, 1);
        ku::ConvertHalf2Float(&row.half, &back, 1);
        if (row.ways & kToHalf) { EXPECT_EQ(row.half, word) << "float to half"; }
        if (row.ways & kToFloat) { EXPECT_EQ(row.floatBits, Bits(back)) << "half to float"; }
    }
}

// Every word but 0 is sign * (1 + f/1024) * 2^(E - 15), E = 0 and 31 included,
// and comes back unchanged.
TEST(HalfPrecision, AllWords)
{
    std::vector<unsigned short> words(65536);
    for (int h = 0; h < 65536; ++h) words[h] = static_cast<unsigned short>(h);
    GuardedBuffer<float> values(65536);
    GuardedBuffer<unsigned short> again(65536);
    ku::ConvertHalf2Float(words.data(), values.data(), 65536);
    ku::ConvertFloat2Half(values.data(), again.data(), 65536);
    EXPECT_TRUE(values.Intact() && again.Intact());
    EXPECT_TRUE(SameBits(0.0f, values[0]));
    for (int h = 1; h < 65536; ++h) {
        const float magnitude = std::ldexp(1.0f + static_cast<float>(h & 0x3FF) / 1024.0f, ((h >> 10) & 31) - 15);
        ASSERT_TRUE(SameBits((h & 0x8000) ? -magnitude : magnitude, values[h])) << std::hex << "word 0x" << h;
    }
    EXPECT_EQ(words, again.values());
}

// Random bit patterns and floats of ordinary size against the fields moved by
// hand, the exponent wrap written as a subtraction.
TEST(HalfPrecision, RandomFloatsMatchFieldFormula)
{
    for (unsigned int n : SizesWithZero()) {
        SCOPED_TRACE(SeedTrace(600 + n));
        std::mt19937 engine(600 + n);
        std::vector<float> src(n + 1, -0.0f);
        for (std::size_t i = 1; i < n; ++i) {
            const std::uint32_t u = static_cast<std::uint32_t>(engine());
            const float scaled = static_cast<float>(static_cast<std::int32_t>(u)) * std::ldexp(1.0f, -16 - static_cast<int>(u % 24));
            src[i] = i % 2 ? FromBits<float>(u) : scaled;
        }
        GuardedBuffer<unsigned short> dst(n);
        ku::ConvertFloat2Half(src.data(), dst.data(), n);
        EXPECT_TRUE(dst.Intact());
        for (std::size_t i = 0; i < n; ++i) {
            const std::uint32_t u = Bits(src[i]);
            const int wrapped = ((static_cast<int>((u >> 23) & 0xFF) - 112) % 32 + 32) % 32;
            const unsigned int expected = u == 0 ? 0u : ((u >> 31) << 15) | (wrapped << 10) | ((u & 0x7FFFFF) >> 13);
            ASSERT_EQ(expected, dst[i]) << std::hex << "float 0x" << u;
        }
    }
    ku::ConvertFloat2Half(nullptr, nullptr, 0);
    ku::ConvertHalf2Float(nullptr, nullptr, 0);
}

}  // namespace
