// ConvertFloat2Half and ConvertHalf2Float: the documented table rows both
// ways bit for bit, the nineteen-value vector, every half word against its
// value computed with ldexp, random floats against a field formula and a
// value-based accuracy bound, and count-exact writes.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <cstdint>
#include <cstdlib>
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

// The listed words are within 1 of the truncated words made here and read
// back within 0.0001; the words made here (truncated, so at most one below)
// read back within their spacing, 2^-12 under 0.5 and 2^-10 at 1.0. A word
// before the first and after the last stay as they were.
TEST(HalfPrecision, NineteenSamples)
{
    float samples[] = {0.14476f, 0.12001f, 0.10041f, 1.0f, 0.17767f, 0.12368f, 0.10062f, 1.0f, 0.23952f, 0.13134f,
                       0.10078f, 1.0f, 0.30731f, 0.13901f, 0.10020f, 1.0f, 0.17767f, 0.12368f, 0.10062f};
    unsigned short listed[] = {0x30A2, 0x2FAE, 0x2E6D, 0x3C00, 0x31AF, 0x2FEA, 0x2E71, 0x3C00, 0x33AA, 0x3034,
                               0x2E73, 0x3C00, 0x34EB, 0x3073, 0x2E6A, 0x3C00, 0x31AF, 0x2FEA, 0x2E71};
    GuardedBuffer<unsigned short> words(20, 0x5A5A);
    GuardedBuffer<float> back(20, -7.0f), listedBack(19);
    ku::ConvertFloat2Half(samples, words.data() + 1, 19);
    ku::ConvertHalf2Float(words.data() + 1, back.data() + 1, 19);
    ku::ConvertHalf2Float(listed, listedBack.data(), 19);
    EXPECT_EQ(0x5A5A, words[0]);
    EXPECT_TRUE(SameBits(-7.0f, back[0]));
    EXPECT_TRUE(words.Intact() && back.Intact() && listedBack.Intact());
    for (int i = 0; i < 19; ++i) {
        SCOPED_TRACE(::testing::Message() << "element " << i);
        EXPECT_LE(std::abs(static_cast<int>(words[i + 1]) - static_cast<int>(listed[i])), 1);
        EXPECT_NEAR(samples[i], listedBack[i], 0.0001f);
        EXPECT_LE(back[i + 1], samples[i]);
        EXPECT_LT(samples[i] - back[i + 1], samples[i] < 0.5f ? std::ldexp(1.0f, -12) : std::ldexp(1.0f, -10));
    }
}

// Every half word against its value: sign * (1 + f/1024) * 2^(E - 15) for
// every word but 0, whatever E is (0 and 31 included); and back, every word
// but 0 survives the round trip unchanged.
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

// Random floats, count 0 included: half of them bit patterns of every kind,
// against the fields written with the subtraction form of the exponent wrap;
// half of them of ordinary magnitude, for which a word of normal half range
// is the correctly rounded value or the one below it in magnitude, so within
// one ulp under |x|, with x's sign.
TEST(HalfPrecision, RandomFloatsMatchFieldFormula)
{
    std::vector<unsigned int> sizes = InterestingSizes();
    sizes.push_back(0);
    for (unsigned int n : sizes) {
        SCOPED_TRACE(SeedTrace(600 + n));
        std::mt19937 engine(600 + n);
        std::vector<float> src(n + 1, -0.0f);
        for (std::size_t i = 1; i < n; ++i) {
            const std::uint32_t u = static_cast<std::uint32_t>(engine());
            const float scaled = static_cast<float>(static_cast<std::int32_t>(u)) * std::ldexp(1.0f, -16 - static_cast<int>(u % 24));
            src[i] = i % 2 ? FromBits<float>(u) : scaled;
        }
        GuardedBuffer<unsigned short> dst(n);
        GuardedBuffer<float> back(n);
        ku::ConvertFloat2Half(src.data(), dst.data(), n);
        ku::ConvertHalf2Float(dst.data(), back.data(), n);
        EXPECT_TRUE(dst.Intact() && back.Intact());
        for (std::size_t i = 0; i < n; ++i) {
            const std::uint32_t u = Bits(src[i]);
            const int wrapped = ((static_cast<int>((u >> 23) & 0xFF) - 112) % 32 + 32) % 32;
            const unsigned int expected = u == 0 ? 0u : ((u >> 31) << 15) | (wrapped << 10) | ((u & 0x7FFFFF) >> 13);
            ASSERT_EQ(expected, dst[i]) << std::hex << "float 0x" << u;
            const float x = std::fabs(src[i]);
            if (!(x >= std::ldexp(1.0f, -14) && x <= 65504.0f)) continue;
            int exponent;
            std::frexp(x, &exponent);
            ASSERT_TRUE(std::fabs(back[i]) <= x && x - std::fabs(back[i]) < std::ldexp(1.0f, exponent - 11)) << x;
            ASSERT_EQ(std::signbit(src[i]), std::signbit(back[i])) << x;
        }
    }
    ku::ConvertFloat2Half(nullptr, nullptr, 0);
    ku::ConvertHalf2Float(nullptr, nullptr, 0);
}

}  // namespace
