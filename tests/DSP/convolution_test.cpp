// Convolve against the one-output-at-a-time loop written here, bit for bit;
// UpSample and DownSample against their plain loops and hand-worked blocks,
// and DownSample streamed over blocks of varying length.

#include <kestaccel/DSP.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

// Index limits once per output, then the sum from +0 in ascending order of
// the index into the first array.
template <class T>
std::vector<T> PlainConvolve(const std::vector<T>& a, const std::vector<T>& b)
{
    const auto countA = static_cast<unsigned int>(a.size()), countB = static_cast<unsigned int>(b.size());
    const unsigned int total = countA - 1u + countB;
    std::vector<T> out(total);
    for (unsigned int k = 0; k < total; ++k) {
        const unsigned int lo = k >= countB - 1u ? k - countB + 1u : 0u;
        const unsigned int hi = k < countA - 1u ? k : countA - 1u;
        T acc = T(0);
        for (unsigned int j = lo; j <= hi; ++j) acc = acc + b[k - j] * a[j];
        out[k] = acc;
    }
    return out;
}

template <class T>
class ConvolveTyped : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(ConvolveTyped, ElementTypes);

TYPED_TEST(ConvolveTyped, MatchesOneOutputAtATimeBitForBit)
{
    using T = TypeParam;
    const std::pair<unsigned int, unsigned int> shapes[] = {
        {1, 1},   {1, 9},   {9, 1},    {2, 2},   {3, 7},    {7, 3},     {16, 16},   {17, 5},
        {5, 17},  {64, 63}, {63, 64},  {100, 3}, {3, 100},  {1024, 64}, {64, 1024}, {333, 257},
        {257, 333}, {4096, 256}};
    std::uint32_t seed = 2000;
    for (const auto& shape : shapes) {
        ++seed;
        SCOPED_TRACE(SeedTrace(seed));
        SCOPED_TRACE(std::to_string(shape.first) + " by " + std::to_string(shape.second));
        const auto a = RandomReals<T>(shape.first, seed);
        const auto b = RandomReals<T>(shape.second, seed + 7777);
        const auto expected = PlainConvolve(a, b);
        GuardedBuffer<T> dst(expected.size(), std::numeric_limits<T>::quiet_NaN());
        ku::Convolve(shape.first, a.data(), shape.second, b.data(), dst.data());
        EXPECT_TRUE(SameBitsArray(expected, dst.values()));
        EXPECT_TRUE(dst.Intact());

        // The six-argument form is the same operation and leaves its work
        // buffer alone.
        std::vector<T> work(8, T(42));
        GuardedBuffer<T> dst6(expected.size(), std::numeric_limits<T>::quiet_NaN());
        ku::Convolve(shape.first, a.data(), shape.second, b.data(), dst6.data(), work.data());
        EXPECT_TRUE(SameBitsArray(expected, dst6.values()));
        EXPECT_TRUE(dst6.Intact());
        for (T w : work) EXPECT_TRUE(SameBits(T(42), w));
    }
}

// Every pair of small counts: both array orders, counts below, at and
// just past any grouping of terms, and every remainder.
TYPED_TEST(ConvolveTyped, SmallCountsMatchBitForBit)
{
    using T = TypeParam;
    for (unsigned int countA = 1; countA <= 19; ++countA) {
        for (unsigned int countB = 1; countB <= 19; ++countB) {
            const std::uint32_t seed = 2500 + 100 * countA + countB;
            SCOPED_TRACE(SeedTrace(seed));
            // Magnitudes spread widely, so that any other order of a sum
            // shows in its rounding.
            auto a = RandomReals<T>(countA, seed);
            auto b = RandomReals<T>(countB, seed + 1);
            for (std::size_t i = 0; i < a.size(); i += 2) a[i] *= T(4096);
            const auto expected = PlainConvolve(a, b);
            GuardedBuffer<T> dst(expected.size(), std::numeric_limits<T>::quiet_NaN());
            ku::Convolve(countA, a.data(), countB, b.data(), dst.data());
            ASSERT_TRUE(SameBitsArray(expected, dst.values())) << countA << " by " << countB;
            ASSERT_TRUE(dst.Intact()) << countA << " by " << countB;
        }
    }
}

// Operands spread over many magnitudes make the rounding depend on the
// order of summation, so swapping the arrays changes the bits while the
// library still matches the loop over the first array.
TYPED_TEST(ConvolveTyped, OrderFollowsTheFirstArray)
{
    using T = TypeParam;
    const std::uint32_t seed = 3001;
    SCOPED_TRACE(SeedTrace(seed));
    auto a = RandomReals<T>(200, seed, T(-1), T(1));
    auto b = RandomReals<T>(150, seed + 1, T(-1), T(1));
    for (std::size_t i = 0; i < a.size(); i += 3) a[i] *= T(1e6);
    for (std::size_t i = 0; i < b.size(); i += 5) b[i] *= T(1e-6);
    std::vector<T> ab(349), ba(349);
    ku::Convolve(200, a.data(), 150, b.data(), ab.data());
    ku::Convolve(150, b.data(), 200, a.data(), ba.data());
    EXPECT_TRUE(SameBitsArray(PlainConvolve(a, b), ab));
    EXPECT_TRUE(SameBitsArray(PlainConvolve(b, a), ba));
    EXPECT_FALSE(SameBitsArray(ab, ba));
}

TYPED_TEST(ConvolveTyped, WorkedExample)
{
    using T = TypeParam;
    const T a[] = {1, 2, 4, 3, 1};
    const T b[] = {3, 2, 1};
    const T expected[] = {3, 8, 17, 19, 13, 5, 1};
    GuardedBuffer<T> dst(7);
    ku::Convolve(5, a, 3, b, dst.data());
    EXPECT_TRUE(SameBitsArray(expected, dst.data(), 7));
    EXPECT_TRUE(dst.Intact());
}

// 1, 1e8, -1e8 against three ones: the middle output in ascending order is
// (1 + 1e8) - 1e8 = 0 in float (1 is lost against 1e8); the other order
// would give 1. In double both orders keep the 1.
TEST(Convolve, FloatSumsInFloatInAscendingOrder)
{
    const float a[] = {1.0f, 1e8f, -1e8f};
    const float b[] = {1.0f, 1.0f, 1.0f};
    float dst[5];
    ku::Convolve(3, a, 3, b, dst);
    EXPECT_TRUE(SameBits(0.0f, dst[2]));
    const double ad[] = {1.0, 1e8, -1e8};
    const double bd[] = {1.0, 1.0, 1.0};
    double dstd[5];
    ku::Convolve(3, ad, 3, bd, dstd);
    EXPECT_TRUE(SameBits(1.0, dstd[2]));
}

TYPED_TEST(ConvolveTyped, ResultLengths)
{
    using T = TypeParam;
    const std::pair<unsigned int, unsigned int> shapes[] = {{5, 2}, {5, 5}, {5, 3}, {4, 5}};
    const std::size_t lengths[] = {6, 9, 7, 8};
    for (int s = 0; s < 4; ++s) {
        const std::vector<T> a(shapes[s].first, T(1)), b(shapes[s].second, T(1));
        GuardedBuffer<T> dst(lengths[s], std::numeric_limits<T>::quiet_NaN());
        ku::Convolve(shapes[s].first, a.data(), shapes[s].second, b.data(), dst.data());
        for (std::size_t k = 0; k < lengths[s]; ++k) EXPECT_FALSE(std::isnan(dst[k])) << "at " << k;
        EXPECT_TRUE(dst.Intact());
    }
}

// Every sum starts from +0, so a single product of -0 comes out as +0.
TYPED_TEST(ConvolveTyped, SumStartsFromPositiveZero)
{
    using T = TypeParam;
    const T a[] = {T(-2)};
    const T b[] = {T(0)};
    T dst[1] = {T(7)};
    ku::Convolve(1, a, 1, b, dst);
    EXPECT_TRUE(SameBits(T(0), dst[0]));
    const T a2[] = {T(-1), T(-1)};
    const T b2[] = {T(0), T(0), T(0)};
    T dst2[4];
    ku::Convolve(2, a2, 3, b2, dst2);
    for (T v : dst2) EXPECT_TRUE(SameBits(T(0), v));
}

TYPED_TEST(ConvolveTyped, EmptyAgainstSingleWritesNothing)
{
    using T = TypeParam;
    const T one[] = {T(1)};
    GuardedBuffer<T> dst(0);
    ku::Convolve(0u, static_cast<const T*>(nullptr), 1u, one, dst.data());
    ku::Convolve(1u, one, 0u, static_cast<const T*>(nullptr), dst.data(), static_cast<T*>(nullptr));
    EXPECT_TRUE(dst.Intact());
}

TEST(Convolve, WorkBufferSizeIsZero)
{
    EXPECT_EQ(0ull, ku::ConvolutionWorkBufferSize(0, 0));
    EXPECT_EQ(0ull, ku::ConvolutionWorkBufferSize(1024, 64));
    EXPECT_EQ(0ull, ku::ConvolutionWorkBufferSize(4294967295u, 4294967295u));
}

// ---------------------------------------------------------------------------

template <class T>
std::vector<T> PlainUpSample(const std::vector<T>& src, unsigned int factor, unsigned int phase)
{
    std::vector<T> out(src.size() * factor);
    for (std::size_t i = 0; i < src.size(); ++i)
        for (unsigned int j = 0; j < factor; ++j) out[i * factor + j] = j == phase ? src[i] : T(0);
    return out;
}

template <class T>
class RateChange : public ::testing::Test {};
TYPED_TEST_SUITE(RateChange, ElementTypes);

TYPED_TEST(RateChange, UpSampleWritesEveryOutput)
{
    using T = TypeParam;
    for (unsigned int factor = 1; factor <= 5; ++factor) {
        for (unsigned int phase = 0; phase <= factor + 1; ++phase) {
            const std::uint32_t seed = 4000 + 10 * factor + phase;
            SCOPED_TRACE(SeedTrace(seed));
            auto src = RandomReals<T>(37, seed);
            src[4] = -T(0);
            GuardedBuffer<T> dst(37 * factor, std::numeric_limits<T>::quiet_NaN());
            unsigned int p = phase;
            ku::UpSample(37, src.data(), dst.data(), factor, &p);
            EXPECT_TRUE(SameBitsArray(PlainUpSample(src, factor, phase), dst.values()))
                << "factor " << factor << " phase " << phase;
            EXPECT_TRUE(dst.Intact());
            EXPECT_EQ(phase, p);
        }
    }
}

TYPED_TEST(RateChange, UpSampleByOneCopies)
{
    using T = TypeParam;
    auto src = RandomReals<T>(64, 4100);
    src[3] = -T(0);
    std::vector<T> dst(64);
    unsigned int phase = 0;
    ku::UpSample(64, src.data(), dst.data(), 1, &phase);
    EXPECT_TRUE(SameBitsArray(src, dst));
}

// With nothing to write the phase is not even read.
TYPED_TEST(RateChange, UpSampleWithNothingToWrite)
{
    using T = TypeParam;
    const T src[3] = {T(1), T(2), T(3)};
    GuardedBuffer<T> dst(0);
    ku::UpSample(3, src, dst.data(), 0, nullptr);
    ku::UpSample(0, src, dst.data(), 4, nullptr);
    EXPECT_TRUE(dst.Intact());
}

TYPED_TEST(RateChange, DownSampleWorkedBlocks)
{
    using T = TypeParam;
    std::vector<T> src(16);
    for (unsigned int i = 0; i < 16; ++i) src[i] = T(100 + i);
    {
        GuardedBuffer<T> dst(4);
        unsigned int p = 1;
        ku::DownSample(16, src.data(), dst.data(), 4, &p);
        const T expected[] = {101, 105, 109, 113};
        EXPECT_TRUE(SameBitsArray(expected, dst.data(), 4));
        EXPECT_TRUE(dst.Intact());
        EXPECT_EQ(1u, p);
    }
    {
        GuardedBuffer<T> dst(3);
        unsigned int p = 1;
        ku::DownSample(10, src.data(), dst.data(), 4, &p);
        const T expected[] = {101, 105, 109};
        EXPECT_TRUE(SameBitsArray(expected, dst.data(), 3));
        EXPECT_TRUE(dst.Intact());
        EXPECT_EQ(3u, p);  // the next grid point is element 13, three into the next block
    }
    {
        // No grid point in this block.
        GuardedBuffer<T> dst(0);
        unsigned int p = 3;
        ku::DownSample(2, src.data(), dst.data(), 4, &p);
        EXPECT_TRUE(dst.Intact());
        EXPECT_EQ(1u, p);
    }
    {
        GuardedBuffer<T> dst(0);
        unsigned int p = 2;
        ku::DownSample(0, src.data(), dst.data(), 4, &p);
        EXPECT_TRUE(dst.Intact());
        EXPECT_EQ(2u, p);
    }
    {
        // A phase past the factor still starts there, and comes back below it.
        GuardedBuffer<T> dst(2);
        unsigned int p = 5;
        ku::DownSample(10, src.data(), dst.data(), 4, &p);
        const T expected[] = {105, 109};
        EXPECT_TRUE(SameBitsArray(expected, dst.data(), 2));
        EXPECT_TRUE(dst.Intact());
        EXPECT_EQ(3u, p);
    }
}

// Blocks of random lengths, some shorter than the factor and some empty,
// give the same samples and the same final phase as one call over the
// whole signal, and those are src[p0], src[p0 + factor], ...
TYPED_TEST(RateChange, DownSampleStreamsOverBlocks)
{
    using T = TypeParam;
    const unsigned int length = 1000;
    for (unsigned int factor = 1; factor <= 7; ++factor) {
        for (unsigned int start = 0; start < factor; ++start) {
            const std::uint32_t seed = 5000 + 10 * factor + start;
            SCOPED_TRACE(SeedTrace(seed));
            SCOPED_TRACE("factor " + std::to_string(factor) + " phase " + std::to_string(start));
            const auto src = RandomReals<T>(length, seed);

            std::vector<T> whole(length, std::numeric_limits<T>::quiet_NaN());
            unsigned int wholePhase = start;
            ku::DownSample(length, src.data(), whole.data(), factor, &wholePhase);
            const std::size_t kept = (length - start + factor - 1) / factor;
            std::vector<T> expected;
            for (std::size_t i = start; i < length; i += factor) expected.push_back(src[i]);
            ASSERT_EQ(kept, expected.size());
            whole.resize(kept);
            EXPECT_TRUE(SameBitsArray(expected, whole));
            EXPECT_EQ((start + kept * factor) - length, wholePhase);

            std::mt19937 engine(seed);
            std::uniform_int_distribution<unsigned int> blockLength(0, 3 * factor + 5);
            std::vector<T> streamed;
            unsigned int phase = start;
            for (unsigned int at = 0; at < length;) {
                const unsigned int n = std::min(blockLength(engine), length - at);
                const unsigned int count = (n - phase + factor - 1) / factor;
                GuardedBuffer<T> dst(count);
                ku::DownSample(n, src.data() + at, dst.data(), factor, &phase);
                ASSERT_TRUE(dst.Intact());
                ASSERT_LT(phase, factor);
                const auto values = dst.values();
                streamed.insert(streamed.end(), values.begin(), values.end());
                at += n;
            }
            EXPECT_TRUE(SameBitsArray(expected, streamed));
            EXPECT_EQ(wholePhase, phase);
        }
    }
}

TYPED_TEST(RateChange, DownSampleInPlace)
{
    using T = TypeParam;
    auto data = RandomReals<T>(101, 6001);
    const auto original = data;
    unsigned int phase = 2;
    ku::DownSample(101, data.data(), data.data(), 3, &phase);
    for (unsigned int i = 0; i < 33; ++i) ASSERT_TRUE(SameBits(original[2 + 3 * i], data[i])) << "at " << i;
    EXPECT_EQ(0u, phase);  // the last kept is 98; the next grid point, 101, opens the next block
}

TEST(RateChange, DownSampleCopiesBitPatterns)
{
    const float src[4] = {FromBits<float>(0x7FA00001u), -0.0f, FromBits<float>(0xFFC12345u), 1.0f};
    float dst[2];
    unsigned int phase = 0;
    ku::DownSample(4, src, dst, 2, &phase);
    EXPECT_TRUE(SameBits(src[0], dst[0]));
    EXPECT_TRUE(SameBits(src[2], dst[1]));
}

}  // namespace
