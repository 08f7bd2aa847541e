// Convolve against the one-output-at-a-time loop written here, bit for bit;
// UpSample and DownSample against their plain loops and hand-worked blocks,
// and DownSample streamed over blocks of varying length.

#include <kestaccel/DSP.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <type_traits>
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
    std::vector<T> out(countA - 1u + countB);
    for (unsigned int k = 0; k < out.size(); ++k) {
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

// Every pair of counts up to 19 (below, at and just past any grouping of
// terms, every remainder, both orders), then larger shapes; both overloads.
// Magnitudes are spread widely so that any other order of a sum shows:
// swapping the arrays, the same sums in another order, changes the bits of
// most shapes. The guarded, NaN-filled output pins the length: 5 and 2
// give 6, 4 and 5 give 8.
TYPED_TEST(ConvolveTyped, MatchesOneOutputAtATimeBitForBit)
{
    using T = TypeParam;
    std::vector<std::pair<unsigned int, unsigned int>> shapes = {
        {64, 63}, {63, 64}, {100, 3}, {3, 100}, {1024, 64}, {64, 1024}, {333, 257}, {257, 333}, {4096, 256}};
    for (unsigned int countA = 1; countA <= 19; ++countA)
        for (unsigned int countB = 1; countB <= 19; ++countB) shapes.push_back({countA, countB});
    std::size_t swapDiffers = 0;
    for (const auto& shape : shapes) {
        const std::uint32_t seed = 2000 + 1000 * shape.first + shape.second;
        SCOPED_TRACE(SeedTrace(seed) + ", " + std::to_string(shape.first) + " by " + std::to_string(shape.second));
        auto a = RandomReals<T>(shape.first, seed);
        const auto b = RandomReals<T>(shape.second, seed + 1);
        for (std::size_t i = 0; i < a.size(); i += 2) a[i] *= T(4096);
        const auto expected = PlainConvolve(a, b);
        swapDiffers += !SameBitsArray(expected, PlainConvolve(b, a));
        GuardedBuffer<T> dst(expected.size(), std::numeric_limits<T>::quiet_NaN());
        ku::Convolve(shape.first, a.data(), shape.second, b.data(), dst.data());
        ASSERT_TRUE(SameBitsArray(expected, dst.values()));
        ASSERT_TRUE(dst.Intact());
        // The six-argument form leaves its work buffer alone.
        std::vector<T> work(8, T(42));
        GuardedBuffer<T> dst6(expected.size(), std::numeric_limits<T>::quiet_NaN());
        ku::Convolve(shape.first, a.data(), shape.second, b.data(), dst6.data(), work.data());
        ASSERT_TRUE(SameBitsArray(expected, dst6.values()));
        ASSERT_TRUE(dst6.Intact());
        ASSERT_TRUE(SameBitsArray(std::vector<T>(8, T(42)), work));
    }
    EXPECT_GT(swapDiffers, shapes.size() / 2);
}

// The worked example; 1, 1e8, -1e8 against three ones, whose middle output
// (1 + 1e8) - 1e8 is 0 in float, which sums in float in ascending order,
// and 1 in double; sums start from +0, so sums of -2 * 0 give +0; one
// empty array against one element writes nothing; no work area is needed.
TYPED_TEST(ConvolveTyped, WorkedValuesAndEdges)
{
    using T = TypeParam;
    const T a[] = {1, 2, 4, 3, 1}, b[] = {3, 2, 1}, expected[] = {3, 8, 17, 19, 13, 5, 1};
    GuardedBuffer<T> dst(7);
    ku::Convolve(5, a, 3, b, dst.data());
    EXPECT_TRUE(SameBitsArray(expected, dst.data(), 7));
    EXPECT_TRUE(dst.Intact());

    const T big[] = {T(1), T(1e8), T(-1e8)}, ones[] = {1, 1, 1};
    ku::Convolve(3, big, 3, ones, dst.data());
    EXPECT_TRUE(SameBits(std::is_same<T, float>::value ? T(0) : T(1), dst[2]));

    const T minusTwo[] = {T(-2), T(-2)}, zeros[] = {0, 0, 0};
    ku::Convolve(2, minusTwo, 3, zeros, dst.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>(4, T(0)).data(), dst.data(), 4));

    GuardedBuffer<T> none(0);
    ku::Convolve(0u, static_cast<const T*>(nullptr), 1u, ones, none.data());
    ku::Convolve(1u, ones, 0u, static_cast<const T*>(nullptr), none.data(), static_cast<T*>(nullptr));
    EXPECT_TRUE(none.Intact());
    EXPECT_EQ(0ull, ku::ConvolutionWorkBufferSize(0, 0));
    EXPECT_EQ(0ull, ku::ConvolutionWorkBufferSize(4294967295u, 4294967295u));
}

template <class T>
class RateChange : public ::testing::Test {};
TYPED_TEST_SUITE(RateChange, ElementTypes);

// Every output written, the source at the phase and zeros elsewhere (only
// zeros for a phase at or above the factor; a copy for factor 1), -0 kept,
// the phase unchanged. With nothing to write the phase is not even read.
TYPED_TEST(RateChange, UpSample)
{
    using T = TypeParam;
    for (unsigned int factor = 1; factor <= 5; ++factor) {
        for (unsigned int phase = 0; phase <= factor + 1; ++phase) {
            const std::uint32_t seed = 4000 + 10 * factor + phase;
            SCOPED_TRACE(SeedTrace(seed));
            auto src = RandomReals<T>(37, seed);
            src[4] = -T(0);
            std::vector<T> expected(37 * factor, T(0));
            for (std::size_t i = 0; i < 37 && phase < factor; ++i) expected[i * factor + phase] = src[i];
            GuardedBuffer<T> dst(37 * factor, std::numeric_limits<T>::quiet_NaN());
            unsigned int p = phase;
            ku::UpSample(37, src.data(), dst.data(), factor, &p);
            EXPECT_TRUE(SameBitsArray(expected, dst.values())) << "factor " << factor << " phase " << phase;
            EXPECT_TRUE(dst.Intact());
            EXPECT_EQ(phase, p);
        }
    }
    const T three[] = {1, 2, 3};
    GuardedBuffer<T> dst(0);
    ku::UpSample(3, three, dst.data(), 0, nullptr);
    ku::UpSample(0, three, dst.data(), 4, nullptr);
    EXPECT_TRUE(dst.Intact());
}

// src[i] = 100 + i: blocks of 16 and 10 at phase 1, one with no grid point,
// an empty one, and a phase past the factor, which still starts there and
// comes back below it.
TYPED_TEST(RateChange, DownSampleWorkedBlocks)
{
    using T = TypeParam;
    struct Case {
        unsigned int n, phase, nextPhase;
        std::vector<T> kept;
    };
    // n = 10 from phase 1: the next grid point is element 13, three into the next block.
    const Case cases[] = {{16, 1, 1, {101, 105, 109, 113}}, {10, 1, 3, {101, 105, 109}}, {2, 3, 1, {}},
                          {0, 2, 2, {}}, {10, 5, 3, {105, 109}}};
    std::vector<T> src(16);
    for (unsigned int i = 0; i < 16; ++i) src[i] = T(100 + i);
    for (const auto& c : cases) {
        GuardedBuffer<T> dst(c.kept.size());
        unsigned int p = c.phase;
        ku::DownSample(c.n, src.data(), dst.data(), 4, &p);
        EXPECT_TRUE(SameBitsArray(c.kept, dst.values())) << "n " << c.n << " phase " << c.phase;
        EXPECT_TRUE(dst.Intact());
        EXPECT_EQ(c.nextPhase, p) << "n " << c.n << " phase " << c.phase;
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
            std::vector<T> expected;
            for (std::size_t i = start; i < length; i += factor) expected.push_back(src[i]);

            GuardedBuffer<T> whole(expected.size());
            unsigned int wholePhase = start;
            ku::DownSample(length, src.data(), whole.data(), factor, &wholePhase);
            EXPECT_TRUE(SameBitsArray(expected, whole.values()));
            EXPECT_TRUE(whole.Intact());
            EXPECT_EQ(start + expected.size() * factor - length, wholePhase);

            std::mt19937 engine(seed);
            std::uniform_int_distribution<unsigned int> blockLength(0, 3 * factor + 5);
            std::vector<T> streamed;
            unsigned int phase = start;
            for (unsigned int at = 0, n = 0; at < length; at += n) {
                n = std::min(blockLength(engine), length - at);
                GuardedBuffer<T> dst((n - phase + factor - 1) / factor);
                ku::DownSample(n, src.data() + at, dst.data(), factor, &phase);
                ASSERT_TRUE(dst.Intact());
                ASSERT_LT(phase, factor);
                const auto values = dst.values();
                streamed.insert(streamed.end(), values.begin(), values.end());
            }
            EXPECT_TRUE(SameBitsArray(expected, streamed));
            EXPECT_EQ(wholePhase, phase);
        }
    }
}

// In place is safe; samples are copied as bit patterns (a signalling NaN
// stays signalling, -0 stays -0).
TYPED_TEST(RateChange, DownSampleInPlaceCopiesBitPatterns)
{
    using T = TypeParam;
    auto data = RandomReals<T>(101, 6001);
    data[2] = std::numeric_limits<T>::signaling_NaN();
    data[5] = -T(0);
    const auto original = data;
    unsigned int phase = 2;
    ku::DownSample(101, data.data(), data.data(), 3, &phase);
    for (unsigned int i = 0; i < 33; ++i) ASSERT_TRUE(SameBits(original[2 + 3 * i], data[i])) << "at " << i;
    EXPECT_EQ(0u, phase);  // the last kept is 98; the next grid point, 101, opens the next block
}

}  // namespace
