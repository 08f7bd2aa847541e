// Plan tables, and the transform kernels against the reference loop nests
// of FFTReference.h bit for bit, for every order from 1 to 16.

#include "FFTReference.h"
#include "support/TestSupport.h"
#include "transform/FFT/ComplexKernels.h"
#include "transform/FFT/FFTStates.h"
#include "transform/FFT/PlanKernels.h"
#include "transform/FFT/RealKernels.h"

namespace {

using namespace kestaccel::transform::cpp;
using kestaccel_test::FloatingTypes;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

template <class E>
class FFTKernelTyped : public ::testing::Test {};
TYPED_TEST_SUITE(FFTKernelTyped, FloatingTypes);

// The rotation recurrence in double, each product and sum rounded on its
// own, rounded to E only when stored.
template <class E>
std::vector<E> RecurrenceTable(double theta, double wr, double wi, unsigned int pairs)
{
    const double c = std::cos(theta), s = std::sin(theta);
    std::vector<E> table;
    for (unsigned int t = 0; t < pairs; ++t) {
        table.push_back(static_cast<E>(wr));
        table.push_back(static_cast<E>(wi));
        const double r = wr * c - (-s) * wi;
        wi = wr * (-s) + c * wi;
        wr = r;
    }
    return table;
}

// Swap entry i is max(i, bit reversal of i) (sizes 8 and 16 by hand); the
// twiddles of both plan kinds follow the recurrence bit for bit.
TYPED_TEST(FFTKernelTyped, PlanTablesEveryOrder)
{
    using E = TypeParam;
    const double twoPi = 6.283185307179586;
    const std::vector<std::uint32_t> worked[] = {{0, 4, 2, 6, 4, 5, 6},
                                                 {0, 8, 4, 12, 4, 10, 6, 14, 8, 9, 10, 13, 12, 13, 14}};
    for (unsigned int order = 1; order <= 16; ++order) {
        SCOPED_TRACE("order " + std::to_string(order));
        const unsigned int size = 1u << order;
        FFTPlan<E> plan{};
        ASSERT_TRUE(BuildFFTPlan(plan, 1, size));
        const std::vector<std::uint32_t> swaps(plan.swapTable, plan.swapTable + size - 1);
        for (unsigned int i = 0; i + 1 < size; ++i) {
            unsigned int reversed = 0;
            for (unsigned int bit = 0; bit < order; ++bit) reversed |= ((i >> bit) & 1u) << (order - 1 - bit);
            ASSERT_EQ(swaps[i], std::max(i, reversed)) << "swap entry " << i;
        }
        if (order == 3 || order == 4) {
            EXPECT_EQ(swaps, worked[order - 3]);
        }
        const auto twiddles = RecurrenceTable<E>(twoPi / size, 1.0, 0.0, size / 2);
        EXPECT_TRUE(SameBitsArray(twiddles.data(), plan.twiddles, size));
        DestroyFFTPlan(plan);
        if (order == 1) continue;  // two real samples need no tables
        FFTPlan<E> real{};
        ASSERT_TRUE(BuildFFTPlan(real, 0, size));
        const double theta = twoPi / size;
        const auto combine = RecurrenceTable<E>(theta, std::cos(theta), -std::sin(theta), size / 2 - 1);
        EXPECT_TRUE(SameBitsArray(combine.data(), real.twiddles, size - 2));
        DestroyFFTPlan(real);
    }
}

// Element `which` (0 real, 1 imaginary) of each interleaved pair.
template <class E>
std::vector<E> Part(const std::vector<E>& pairs, unsigned int which)
{
    std::vector<E> part(pairs.size() / 2);
    for (std::size_t i = 0; i < part.size(); ++i) part[i] = pairs[2 * i + which];
    return part;
}

// In place, from a distinct interleaved source, and split arrays through a
// work array: every entry point of one direction against the reference.
template <class E, bool kInverse>
void ExpectComplexKernelsMatch(const FFTPlan<E>& plan, const std::vector<E>& input)
{
    SCOPED_TRACE(kInverse ? "inverse" : "forward");
    const unsigned int n = plan.size;
    const auto re = Part(input, 0), im = Part(input, 1);
    auto expected = input, inPlace = input;
    std::vector<E> into(2 * n), outRe(n), outIm(n), work(2 * n);
    if (kInverse) {
        fft_reference::Inverse(plan, expected.data());
        ComplexFFTInverse(plan, inPlace.data());
    } else {
        fft_reference::Forward(plan, expected.data());
        ComplexFFTForward(plan, inPlace.data());
    }
    PairsInto<E, kInverse>(plan, input.data(), into.data());
    SplitVia<E, kInverse>(plan, re.data(), im.data(), work.data(), outRe.data(), outIm.data());
    ASSERT_TRUE(SameBitsArray(expected, inPlace)) << "in place";
    ASSERT_TRUE(SameBitsArray(expected, into)) << "into";
    ASSERT_TRUE(SameBitsArray(Part(expected, 0), outRe)) << "split, real parts";
    ASSERT_TRUE(SameBitsArray(Part(expected, 1), outIm)) << "split, imaginary parts";
}

TYPED_TEST(FFTKernelTyped, ComplexMatchesReferenceEveryOrder)
{
    using E = TypeParam;
    for (unsigned int order = 1; order <= 16; ++order) {
        const std::uint32_t seed = 100 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        FFTPlan<E> plan{};
        ASSERT_TRUE(BuildFFTPlan(plan, 1, 1u << order));
        const auto input = RandomReals<E>(2 * plan.size, seed);
        ExpectComplexKernelsMatch<E, false>(plan, input);
        ExpectComplexKernelsMatch<E, true>(plan, input);
        DestroyFFTPlan(plan);
    }
}

// Forward out of place and in place in a buffer of N + 2; the inverse of a
// spectrum with nonzero DC and Nyquist imaginary parts.
TYPED_TEST(FFTKernelTyped, RealMatchesReferenceEveryOrder)
{
    using E = TypeParam;
    using State = std::conditional_t<sizeof(E) == 4, kestaccel::FFTState_Float, kestaccel::FFTState_Double>;
    for (unsigned int order = 1; order <= 16; ++order) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 200 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        State state{};
        state.order = order;
        state.size = n;
        BuildFFTPlan(state.plan, 0, n);
        auto buffer = RandomReals<E>(n + 2, seed);
        std::vector<E> expected(n + 2), actual(n + 2);
        fft_reference::RealForward(state.plan, buffer.data(), expected.data());
        RealFFTForward(state.plan, buffer.data(), actual.data());
        ASSERT_TRUE(SameBitsArray(expected, actual)) << "forward";
        RealFFTForward(state.plan, buffer.data(), buffer.data());
        ASSERT_TRUE(SameBitsArray(expected, buffer)) << "forward in place";

        const auto spectrum = RandomReals<E>(n + 2, seed + 1000);
        std::vector<E> expectedTime(n), actualTime(n);
        fft_reference::RealInverse(state.plan, spectrum.data(), expectedTime.data());
        RealFFTInverse(spectrum.data(), actualTime.data(), &state);
        ASSERT_TRUE(SameBitsArray(expectedTime, actualTime)) << "inverse";
        DestroyFFTPlan(state.plan);
    }
}

}  // namespace
