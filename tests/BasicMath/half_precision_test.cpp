// ConvertFloat2Half and ConvertHalf2Float: the documented table rows both
// ways bit for bit, the nineteen-value vector, every half word against its
// value computed with ldexp, random floats against a field formula and a
// value-based accuracy bound, and count-exact writes.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

unsigned short ToHalf(float value)
{
    unsigned short word = 0xDEAD;
    ku::ConvertFloat2Half(&value, &word, 1);
    return word;
}

std::uint32_t ToFloatBits(unsigned short word)
{
    float value = -123.0f;
    ku::ConvertHalf2Float(&word, &value, 1);
    return Bits(value);
}

struct FloatRow {
    std::uint32_t floatBits;
    unsigned short half;
};

// Float patterns and the words they must give.
const FloatRow kFloatToHalf[] = {
    {0x3F800000u, 0x3C00},  // 1.0
    {0xBF800000u, 0xBC00},  // -1.0
    {0x3F000000u, 0x3800},  // 0.5
    {0x477FE000u, 0x7BFF},  // 65504.0, the largest value that survives
    {0x47800000u, 0x7C00},  // 65536.0: exponent field 31, not infinity
    {0x48000000u, 0x0000},  // 131072.0: exponent wraps to 0
    {0x7F800000u, 0x3C00},  // +infinity wraps to 1.0
    {0x7FC00000u, 0x3E00},  // quiet NaN becomes 1.5
    {0x80000000u, 0xC000},  // -0.0 is not zero here: -2.0
    {0x000116C2u, 0x4008},  // 1e-40, a float subnormal
    {0x38800000u, 0x0400},  // 2^-14
    {0x38000000u, 0x0000},  // 2^-15 is lost as a zero word
    {0x37800000u, 0x7C00},  // 2^-16 wraps to exponent 31
    {0x00000000u, 0x0000},  // +0.0, the only special case
};

struct HalfRow {
    unsigned short half;
    std::uint32_t floatBits;
};

const HalfRow kHalfToFloat[] = {
    {0x0000, 0x00000000u},  // +0.0
    {0x8000, 0xB8000000u},  // -2^-15: no negative zero
    {0x0001, 0x38002000u},  // subnormal read as if normal
    {0x0400, 0x38800000u},  // 2^-14
    {0x3C00, 0x3F800000u},  // 1.0
    {0x7BFF, 0x477FE000u},  // 65504.0
    {0x7C00, 0x47800000u},  // 65536.0: no infinity
    {0x7E00, 0x47C00000u},  // 98304.0: no NaN
    {0xFC00, 0xC7800000u},  // -65536.0
};

TEST(HalfPrecisionTable, FloatToHalfRows)
{
    for (const auto& row : kFloatToHalf)
        EXPECT_EQ(row.half, ToHalf(FromBits<float>(row.floatBits))) << std::hex << "float 0x" << row.floatBits;
    // The patterns of the table are the values they name.
    EXPECT_EQ(Bits(1e-40f), 0x000116C2u);
    EXPECT_EQ(Bits(65504.0f), 0x477FE000u);
    EXPECT_EQ(Bits(std::ldexp(1.0f, -16)), 0x37800000u);
}

TEST(HalfPrecisionTable, HalfToFloatRows)
{
    for (const auto& row : kHalfToFloat)
        EXPECT_EQ(row.floatBits, ToFloatBits(row.half)) << std::hex << "half 0x" << row.half;
    EXPECT_TRUE(SameBits(98304.0f, FromBits<float>(ToFloatBits(0x7E00))));
    EXPECT_TRUE(SameBits(-std::ldexp(1.0f, -15), FromBits<float>(ToFloatBits(0x8000))));
}

// The words of the float table that are not zero come back as the float they
// were made from whenever that float survives the truncation; checked both
// ways for the rows that are exact.
TEST(HalfPrecisionTable, ExactRowsBothWays)
{
    const float exact[] = {1.0f, -1.0f, 0.5f, 65504.0f, 65536.0f, std::ldexp(1.0f, -14), -65536.0f, 98304.0f};
    for (float x : exact) EXPECT_TRUE(SameBits(x, FromBits<float>(ToFloatBits(ToHalf(x))))) << x;
}

TEST(HalfPrecisionVector, NineteenSamples)
{
    float samples[] = {0.14476f, 0.12001f, 0.10041f, 1.0f, 0.17767f, 0.12368f, 0.10062f, 1.0f, 0.23952f, 0.13134f,
                       0.10078f, 1.0f, 0.30731f, 0.13901f, 0.10020f, 1.0f, 0.17767f, 0.12368f, 0.10062f};
    const unsigned short expectedWords[] = {0x30A2, 0x2FAE, 0x2E6D, 0x3C00, 0x31AF, 0x2FEA, 0x2E71, 0x3C00, 0x33AA, 0x3034,
                                            0x2E73, 0x3C00, 0x34EB, 0x3073, 0x2E6A, 0x3C00, 0x31AF, 0x2FEA, 0x2E71};
    // One guard word before the first element and the sentinel after the last.
    GuardedBuffer<unsigned short> words(20, 0x5A5A);
    ku::ConvertFloat2Half(samples, words.data() + 1, 19);
    EXPECT_EQ(0x5A5A, words[0]);
    EXPECT_TRUE(words.Intact());
    for (int i = 0; i < 19; ++i) {
        EXPECT_LE(std::abs(static_cast<int>(words[i + 1]) - static_cast<int>(expectedWords[i])), 1) << "element " << i;
    }

    // The listed words read back within 0.0001 of the samples; the words made
    // here (truncated, so possibly one below) within their spacing, 2^-12 for
    // values under 0.5 and 2^-10 at 1.0.
    unsigned short listed[19];
    std::memcpy(listed, expectedWords, sizeof listed);
    GuardedBuffer<float> listedBack(19);
    ku::ConvertHalf2Float(listed, listedBack.data(), 19);
    EXPECT_TRUE(listedBack.Intact());
    GuardedBuffer<float> back(20, -7.0f);
    ku::ConvertHalf2Float(words.data() + 1, back.data() + 1, 19);
    EXPECT_TRUE(SameBits(-7.0f, back[0]));
    EXPECT_TRUE(back.Intact());
    for (int i = 0; i < 19; ++i) {
        EXPECT_NEAR(samples[i], listedBack[i], 0.0001f) << "element " << i;
        const float spacing = samples[i] < 0.5f ? std::ldexp(1.0f, -12) : std::ldexp(1.0f, -10);
        EXPECT_LE(back[i + 1], samples[i]) << "element " << i;
        EXPECT_LT(samples[i] - back[i + 1], spacing) << "element " << i;
    }
}

// Every half word against its value: sign * (1 + f/1024) * 2^(E - 15) for
// every word but 0, whatever E is (0 and 31 included).
TEST(HalfPrecisionAllWords, HalfToFloatIsTheNormalReading)
{
    std::vector<unsigned short> words(65536);
    for (int h = 0; h < 65536; ++h) words[h] = static_cast<unsigned short>(h);
    GuardedBuffer<float> values(65536);
    ku::ConvertHalf2Float(words.data(), values.data(), 65536);
    EXPECT_TRUE(values.Intact());
    EXPECT_TRUE(SameBits(0.0f, values[0]));
    for (int h = 1; h < 65536; ++h) {
        const int exponent = (h >> 10) & 31;
        const float magnitude = std::ldexp(1.0f + static_cast<float>(h & 0x3FF) / 1024.0f, exponent - 15);
        ASSERT_TRUE(SameBits((h & 0x8000) ? -magnitude : magnitude, values[h])) << std::hex << "word 0x" << h;
    }

    // And back: every word but 0 survives the round trip unchanged.
    GuardedBuffer<unsigned short> again(65536);
    ku::ConvertFloat2Half(values.data(), again.data(), 65536);
    EXPECT_TRUE(again.Intact());
    for (int h = 0; h < 65536; ++h) ASSERT_EQ(h, again[h]) << std::hex << "word 0x" << h;
}

// Random bit patterns of every kind against the fields written with the
// subtraction form of the exponent wrap.
TEST(HalfPrecisionRandom, FloatToHalfMatchesFieldFormula)
{
    for (unsigned int n : InterestingSizes()) {
        const std::uint32_t seed = 600 + n;
        SCOPED_TRACE(SeedTrace(seed));
        std::mt19937 engine(seed);
        std::vector<float> src(n);
        for (auto& x : src) x = FromBits<float>(static_cast<std::uint32_t>(engine()));
        src[0] = -0.0f;
        GuardedBuffer<unsigned short> dst(n);
        ku::ConvertFloat2Half(src.data(), dst.data(), n);
        EXPECT_TRUE(dst.Intact());
        for (std::size_t i = 0; i < n; ++i) {
            const std::uint32_t u = Bits(src[i]);
            const int e = static_cast<int>((u >> 23) & 0xFF);
            const int wrapped = ((e - 112) % 32 + 32) % 32;
            const unsigned int expected = u == 0 ? 0u : ((u >> 31) << 15) | (wrapped << 10) | ((u & 0x7FFFFF) >> 13);
            ASSERT_EQ(expected, dst[i]) << std::hex << "float 0x" << u;
        }
    }
}

// For normal half range the word is the correctly rounded value or the one
// below it in magnitude: its value is within one half ulp under |x|.
TEST(HalfPrecisionRandom, AccuracyOnNormalRange)
{
    auto src = RandomReals<float>(4099, 700, -65504.0f, 65504.0f);
    const auto small = RandomReals<float>(4099, 701, -1.0f, 1.0f);
    for (std::size_t i = 0; i < src.size(); i += 2) src[i] = small[i];
    std::vector<unsigned short> words(src.size());
    ku::ConvertFloat2Half(src.data(), words.data(), static_cast<unsigned int>(src.size()));
    std::vector<float> back(src.size());
    ku::ConvertHalf2Float(words.data(), back.data(), static_cast<unsigned int>(src.size()));
    for (std::size_t i = 0; i < src.size(); ++i) {
        const float x = src[i];
        if (std::fabs(x) < std::ldexp(1.0f, -14)) continue;  // below normal half range
        int exponent;
        std::frexp(x, &exponent);
        const float ulp = std::ldexp(1.0f, exponent - 11);
        ASSERT_LE(std::fabs(back[i]), std::fabs(x)) << x;
        ASSERT_LT(std::fabs(x) - std::fabs(back[i]), ulp) << x;
        ASSERT_EQ(std::signbit(x), std::signbit(back[i])) << x;
    }
}

TEST(HalfPrecisionEdges, LowFractionBitsAreDropped)
{
    const float base = 0.7f;
    const float other = FromBits<float>(Bits(base) ^ 0x1FFFu);
    ASSERT_NE(Bits(base), Bits(other));
    EXPECT_EQ(ToHalf(base), ToHalf(other));
    // The fourteenth bit does count.
    EXPECT_NE(ToHalf(base), ToHalf(FromBits<float>(Bits(base) ^ 0x2000u)));
}

TEST(HalfPrecisionEdges, EmptyCallsTouchNothing)
{
    ku::ConvertFloat2Half(nullptr, nullptr, 0);
    ku::ConvertHalf2Float(nullptr, nullptr, 0);
    GuardedBuffer<unsigned short> words(0);
    float one = 1.0f;
    ku::ConvertFloat2Half(&one, words.data(), 0);
    EXPECT_TRUE(words.Intact());
}

}  // namespace
