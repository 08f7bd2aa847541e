// The library's transform kernels against the reference loop nests of
// FFTReference.h, bit for bit, for every order from 1 to 16.

#include <cstdint>
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

template <class E>
struct RealStateOf;
template <>
struct RealStateOf<float> {
    using Type = kestaccel::FFTState_Float;
};
template <>
struct RealStateOf<double> {
    using Type = kestaccel::FFTState_Double;
};

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

        auto expected = input, actual = input;
        fft_reference::Forward(plan, expected.data());
        ComplexFFTForward(plan, actual.data());
        ASSERT_TRUE(SameBitsArray(expected, actual)) << "forward";

        auto expectedInverse = input;
        actual = input;
        fft_reference::Inverse(plan, expectedInverse.data());
        ComplexFFTInverse(plan, actual.data());
        ASSERT_TRUE(SameBitsArray(expectedInverse, actual)) << "inverse";

        // From a distinct source array, interleaved.
        std::vector<E> into(2 * n);
        ForwardInto<E, true>(plan, input.data(), input.data() + 1, into.data(), into.data() + 1);
        ASSERT_TRUE(SameBitsArray(expected, into)) << "forward into";
        InverseInto<E, true>(plan, input.data(), input.data() + 1, into.data(), into.data() + 1);
        ASSERT_TRUE(SameBitsArray(expectedInverse, into)) << "inverse into";

        // Split arrays through a work array of pairs.
        std::vector<E> re(n), im(n), outRe(n), outIm(n), work(2 * n);
        for (unsigned int i = 0; i < n; ++i) {
            re[i] = input[2 * i];
            im[i] = input[2 * i + 1];
        }
        const auto expectSplit = [&](const std::vector<E>& pairs, const char* what) {
            for (unsigned int i = 0; i < n; ++i) {
                ASSERT_TRUE(kestaccel_test::SameBits(pairs[2 * i], outRe[i])) << what << ", real part " << i;
                ASSERT_TRUE(kestaccel_test::SameBits(pairs[2 * i + 1], outIm[i])) << what << ", imaginary part " << i;
            }
        };
        SplitForwardVia(plan, re.data(), im.data(), work.data(), outRe.data(), outIm.data());
        expectSplit(expected, "split forward");
        SplitInverseVia(plan, re.data(), im.data(), work.data(), outRe.data(), outIm.data());
        expectSplit(expectedInverse, "split inverse");
        DestroyFFTPlan(plan);
    }
}

TYPED_TEST(FFTKernelTyped, RealMatchesReferenceEveryOrder)
{
    using E = TypeParam;
    using State = typename RealStateOf<E>::Type;
    for (unsigned int order = 1; order <= 16; ++order) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 200 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        State state{};
        state.order = order;
        state.size = n;
        BuildFFTPlan(state.plan, 0, n);
        const auto input = RandomReals<E>(n, seed);

        std::vector<E> expected(n + 2), actual(n + 2);
        fft_reference::RealForward(state.plan, input.data(), expected.data());
        RealFFTForward(state.plan, input.data(), actual.data());
        ASSERT_TRUE(SameBitsArray(expected, actual)) << "forward";

        // A spectrum with nonzero DC and Nyquist imaginary parts: the inverse
        // must read them.
        const auto spectrum = RandomReals<E>(n + 2, seed + 1000);
        std::vector<E> expectedTime(n), actualTime(n);
        fft_reference::RealInverse(state.plan, spectrum.data(), expectedTime.data());
        RealFFTInverse(spectrum.data(), actualTime.data(), &state);
        ASSERT_TRUE(SameBitsArray(expectedTime, actualTime)) << "inverse";
        DestroyFFTPlan(state.plan);
    }
}

// The source is copied before anything is written, so a buffer of N + 2
// elements can be transformed in place.
TYPED_TEST(FFTKernelTyped, RealForwardInPlace)
{
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 10u}) {
        const unsigned int n = 1u << order;
        SCOPED_TRACE(SeedTrace(7) + ", order " + std::to_string(order));
        FFTPlan<E> plan{};
        BuildFFTPlan(plan, 0, n);
        auto buffer = RandomReals<E>(n + 2, 7);
        std::vector<E> expected(n + 2);
        fft_reference::RealForward(plan, buffer.data(), expected.data());
        RealFFTForward(plan, buffer.data(), buffer.data());
        EXPECT_TRUE(SameBitsArray(expected, buffer));
        DestroyFFTPlan(plan);
    }
}

}  // namespace
