// Convolve against a one-output-at-a-time loop, bit for bit; UpSample and
// DownSample against their plain loops, hand-worked blocks and streaming.

#include <kestaccel/DSP.h>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

// Each output summed from +0 in ascending order of the index into a.
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
class DSP : public ::testing::Test {};
TYPED_TEST_SUITE(DSP, FloatingTypes);

// Every pair of counts up to 19 and larger shapes, both overloads; widely
// spread magnitudes make any other order of a sum show.
TYPED_TEST(DSP, MatchesOneOutputAtATimeBitForBit)
{
    using T = TypeParam;
    std::vector<std::pair<unsigned int, unsigned int>> shapes = {
        {64, 63}, {63, 64}, {100, 3}, {3, 100}, {1024, 64}, {64, 1024}, {333, 257}, {257, 333}, {4096, 256}};
    for (unsigned int countA = 1; countA <= 19; ++countA)
        for (unsigned int countB = 1; countB <= 19; ++countB) shapes.push_back({countA, countB});
    for (const auto& shape : shapes) {
        const std::uint32_t seed = 2000 + 1000 * shape.first + shape.second;
        SCOPED_TRACE(SeedTrace(seed) + ", " + std::to_string(shape.first) + " by " + std::to_string(shape.second));
        auto a = RandomReals<T>(shape.first, seed);
        const auto b = RandomReals<T>(shape.second, seed + 1);
        for (std::size_t i = 0; i < a.size(); i += 2) a[i] *= T(4096);
        const auto expected = PlainConvolve(a, b);
        std::vector<T> work(8, T(42));
        for (bool withWork : {false, true}) {
            GuardedBuffer<T> dst(expected.size(), std::numeric_limits<T>::quiet_NaN());
            if (withWork) {
                ku::Convolve(shape.first, a.data(), shape.second, b.data(), dst.data(), work.data());
            } else {
                ku::Convolve(shape.first, a.data(), shape.second, b.data(), dst.data());
            }
            ASSERT_TRUE(SameBitsArray(expected, dst.values()) && dst.Intact());
        }
        ASSERT_TRUE(SameBitsArray(std::vector<T>(8, T(42)), work));
    }
}

// (1 + 1e8) - 1e8 is 0 summed in float, 1 in double; sums start from +0, so
// products of -0 give +0; an empty array writes nothing.
TYPED_TEST(DSP, WorkedValuesAndEdges)
{
    using T = TypeParam;
    const T a[] = {1, 2, 4, 3, 1}, b[] = {3, 2, 1}, expected[] = {3, 8, 17, 19, 13, 5, 1};
    GuardedBuffer<T> dst(7);
    ku::Convolve(5, a, 3, b, dst.data());
    EXPECT_TRUE(SameBitsArray(expected, dst.data(), 7) && dst.Intact());

    const T big[] = {T(1), T(1e8), T(-1e8)}, ones[] = {1, 1, 1};
    GuardedBuffer<T> five(5);
    ku::Convolve(3, big, 3, ones, five.data());
    EXPECT_TRUE(SameBits(std::is_same<T, float>::value ? T(0) : T(1), five[2]));
    EXPECT_TRUE(five.Intact());

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

// The source at the phase, zeros elsewhere (everywhere for a phase at or
// above the factor), -0 kept; with nothing to write the phase is not read.
TYPED_TEST(DSP, UpSample)
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
            EXPECT_TRUE(SameBitsArray(expected, dst.values()) && dst.Intact()) << factor << " " << phase;
            EXPECT_EQ(phase, p);
        }
    }
    const T three[] = {1, 2, 3};
    GuardedBuffer<T> dst(0);
    ku::UpSample(3, three, dst.data(), 0, nullptr);
    ku::UpSample(0, three, dst.data(), 4, nullptr);
    EXPECT_TRUE(dst.Intact());
}

// One call keeps the bits of src[p0], src[p0 + factor], ..., also in place and
// from a phase past the factor; blocks of random lengths give the same.
TYPED_TEST(DSP, DownSampleOneCallAndStreams)
{
    using T = TypeParam;
    const unsigned int length = 1000;
    for (unsigned int factor = 1; factor <= 7; ++factor) {
        for (unsigned int start = 0; start < factor + 2; ++start) {
            const std::uint32_t seed = 5000 + 10 * factor + start;
            SCOPED_TRACE(SeedTrace(seed) + ", factor " + std::to_string(factor) + " phase " + std::to_string(start));
            auto src = RandomReals<T>(length, seed);
            src[start] = std::numeric_limits<T>::signaling_NaN();
            src[start + factor] = -T(0);
            std::vector<T> expected;
            for (std::size_t i = start; i < length; i += factor) expected.push_back(src[i]);

            GuardedBuffer<T> whole(expected.size());
            unsigned int wholePhase = start;
            ku::DownSample(length, src.data(), whole.data(), factor, &wholePhase);
            EXPECT_TRUE(SameBitsArray(expected, whole.values()) && whole.Intact());
            EXPECT_EQ(start + expected.size() * factor - length, wholePhase);
            auto inPlace = src;
            unsigned int inPlacePhase = start;
            ku::DownSample(length, inPlace.data(), inPlace.data(), factor, &inPlacePhase);
            EXPECT_TRUE(SameBitsArray(expected.data(), inPlace.data(), expected.size()));
            if (start >= factor) continue;

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

}  // namespace
