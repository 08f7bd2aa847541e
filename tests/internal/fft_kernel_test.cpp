// The library's transform kernels against the reference loop nests of
// FFTReference.h, bit for bit, for every order from 1 to 16.

#include <cstdint>
#include <type_traits>
#include <vector>

#include "FFTReference.h"
#include "support/TestSupport.h"
#include "transform/FFT/ComplexKernels.h"
#include "transform/FFT/FFTStates.h"
#include "transform/FFT/PlanKernels.h"
#include "transform/FFT/RealKernels.h"

namespace {

using namespace kestaccel::transform::cpp;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

template <class E>
class FFTKernelTyped : public ::testing::Test {};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTKernelTyped, Elements);

// Element `which` (0 real, 1 imaginary) of each interleaved pair.
template <class E>
std::vector<E> Part(const std::vector<E>& pairs, unsigned int which)
{
    std::vector<E> part(pairs.size() / 2);
    for (std::size_t i = 0; i < part.size(); ++i) part[i] = pairs[2 * i + which];
    return part;
}

// In place, from a distinct interleaved source, and split arrays through a
// work array.
TYPED_TEST(FFTKernelTyped, ComplexMatchesReferenceEveryOrder)
{
    using E = TypeParam;
    for (unsigned int order = 1; order <= 16; ++order) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 100 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        FFTPlan<E> plan{};
        ASSERT_TRUE(BuildFFTPlan(plan, 1, n));
        const auto input = RandomReals<E>(2 * n, seed);
        const auto re = Part(input, 0), im = Part(input, 1);
        for (bool inverse : {false, true}) {
            SCOPED_TRACE(inverse ? "inverse" : "forward");
            auto expected = input, inPlace = input;
            std::vector<E> into(2 * n), outRe(n), outIm(n), work(2 * n);
            if (inverse) {
                fft_reference::Inverse(plan, expected.data());
                ComplexFFTInverse(plan, inPlace.data());
                PairsInto<E, true>(plan, input.data(), into.data());
                SplitVia<E, true>(plan, re.data(), im.data(), work.data(), outRe.data(), outIm.data());
            } else {
                fft_reference::Forward(plan, expected.data());
                ComplexFFTForward(plan, inPlace.data());
                PairsInto<E, false>(plan, input.data(), into.data());
                SplitVia<E, false>(plan, re.data(), im.data(), work.data(), outRe.data(), outIm.data());
            }
            ASSERT_TRUE(SameBitsArray(expected, inPlace)) << "in place";
            ASSERT_TRUE(SameBitsArray(expected, into)) << "into";
            ASSERT_TRUE(SameBitsArray(Part(expected, 0), outRe)) << "split, real parts";
            ASSERT_TRUE(SameBitsArray(Part(expected, 1), outIm)) << "split, imaginary parts";
        }
        DestroyFFTPlan(plan);
    }
}

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
        // The source is copied before anything is written, so a buffer of
        // N + 2 elements can be transformed in place.
        RealFFTForward(state.plan, buffer.data(), buffer.data());
        ASSERT_TRUE(SameBitsArray(expected, buffer)) << "forward in place";

        // Nonzero DC and Nyquist imaginary parts: the inverse must read them.
        const auto spectrum = RandomReals<E>(n + 2, seed + 1000);
        std::vector<E> expectedTime(n), actualTime(n);
        fft_reference::RealInverse(state.plan, spectrum.data(), expectedTime.data());
        RealFFTInverse(spectrum.data(), actualTime.data(), &state);
        ASSERT_TRUE(SameBitsArray(expectedTime, actualTime)) << "inverse";
        DestroyFFTPlan(state.plan);
    }
}

}  // namespace
