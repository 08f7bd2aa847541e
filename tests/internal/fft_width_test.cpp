// The block of the FFT kernels follows the build's vectors (16, 32 or 64
// bytes). Every width, compiled here for the baseline, and the library's
// own entry points, compiled for the build's ISA, against the reference
// loop nests of FFTReference.h bit for bit, orders 1 to 14: one to three
// stages per pass, one factor chunk or several.

#include <kestaccel/FFT.h>

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

constexpr unsigned int kLastOrder = 14;

template <class E>
using RealState = std::conditional_t<sizeof(E) == 4, kestaccel::FFTState_Float, kestaccel::FFTState_Double>;

// Element `which` (0 real, 1 imaginary) of each interleaved pair.
template <class E>
std::vector<E> Part(const std::vector<E>& pairs, unsigned int which)
{
    std::vector<E> part(pairs.size() / 2);
    for (std::size_t i = 0; i < part.size(); ++i) part[i] = pairs[2 * i + which];
    return part;
}

// The reference results of one order: complex forward and inverse of
// `pairs`, real forward of the first N values and real inverse of N + 2.
template <class E>
struct Expected {
    std::vector<E> forward, inverse, realForward, realInverse;

    Expected(const FFTPlan<E>& complexPlan, const FFTPlan<E>& realPlan, const std::vector<E>& pairs)
        : forward(pairs), inverse(pairs), realForward(realPlan.size + 2), realInverse(realPlan.size)
    {
        fft_reference::Forward(complexPlan, forward.data());
        fft_reference::Inverse(complexPlan, inverse.data());
        fft_reference::RealForward(realPlan, pairs.data(), realForward.data());
        fft_reference::RealInverse(realPlan, pairs.data(), realInverse.data());
    }
};

template <class E, std::size_t kBytes>
struct Width {
    using Element = E;
    static constexpr std::size_t kLanes = kBytes / sizeof(E);
};

template <class W>
class FFTWidth : public ::testing::Test {};
using Widths = ::testing::Types<Width<float, 16>, Width<float, 32>, Width<float, 64>, Width<double, 16>,
                                Width<double, 32>, Width<double, 64>>;
TYPED_TEST_SUITE(FFTWidth, Widths);

// One direction of every complex entry point: in place, into a distinct
// array, split arrays through a work array.
template <class E, bool kInverse, std::size_t kLanes>
void ExpectComplexMatch(const FFTPlan<E>& plan, const std::vector<E>& input, const std::vector<E>& expected)
{
    SCOPED_TRACE(kInverse ? "inverse" : "forward");
    auto inPlace = input;
    std::vector<E> into(input.size()), outRe(plan.size), outIm(plan.size), work(input.size());
    PairsInPlace<E, kInverse, kLanes>(plan, inPlace.data());
    PairsInto<E, kInverse, kLanes>(plan, input.data(), into.data());
    SplitVia<E, kInverse, kLanes>(plan, Part(input, 0).data(), Part(input, 1).data(), work.data(), outRe.data(),
                                  outIm.data());
    EXPECT_TRUE(SameBitsArray(expected, inPlace)) << "in place";
    EXPECT_TRUE(SameBitsArray(expected, into)) << "into";
    EXPECT_TRUE(SameBitsArray(Part(expected, 0), outRe)) << "split, real parts";
    EXPECT_TRUE(SameBitsArray(Part(expected, 1), outIm)) << "split, imaginary parts";
}

TYPED_TEST(FFTWidth, KernelsMatchReferenceEveryOrder)
{
    using E = typename TypeParam::Element;
    constexpr std::size_t kLanes = TypeParam::kLanes;
    for (unsigned int order = 1; order <= kLastOrder; ++order) {
        const std::uint32_t seed = 300 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        FFTPlan<E> plan{};
        RealState<E> real{};
        ASSERT_TRUE(BuildFFTPlan(plan, kComplexPlan, 1u << order));
        BuildFFTPlan(real.plan, kRealPlan, 1u << order);
        const auto input = RandomReals<E>(2 * plan.size + 2, seed);
        const Expected<E> expected(plan, real.plan, input);
        const std::vector<E> pairs(input.begin(), input.end() - 2);
        ExpectComplexMatch<E, false, kLanes>(plan, pairs, {expected.forward.begin(), expected.forward.end() - 2});
        ExpectComplexMatch<E, true, kLanes>(plan, pairs, {expected.inverse.begin(), expected.inverse.end() - 2});
        std::vector<E> spectrum(plan.size + 2), time(plan.size);
        RealFFTForward<E, kLanes>(real.plan, input.data(), spectrum.data());
        RealFFTInverse<RealState<E>, E, kLanes>(input.data(), time.data(), &real);
        EXPECT_TRUE(SameBitsArray(expected.realForward, spectrum)) << "real forward";
        EXPECT_TRUE(SameBitsArray(expected.realInverse, time)) << "real inverse";
        DestroyFFTPlan(plan);
        DestroyFFTPlan(real.plan);
    }
}

template <class E>
class FFTBuildWidth : public ::testing::Test {};
TYPED_TEST_SUITE(FFTBuildWidth, kestaccel_test::FloatingTypes);

// The exported functions run the kernels of the library's objects, which
// an ISA build compiles for its own vectors: every state type, both
// directions, the interleaved ones also in place.
TYPED_TEST(FFTBuildWidth, LibraryMatchesReferenceEveryOrder)
{
    using E = TypeParam;
    using Complex = std::complex<E>;
    using Interleaved = std::conditional_t<sizeof(E) == 4, kestaccel::FFTState_Complex_Float_Interleaved,
                                           kestaccel::FFTState_Complex_Double_Interleaved>;
    using Split = std::conditional_t<sizeof(E) == 4, kestaccel::FFTState_Complex_Float_Deinterleaved,
                                     kestaccel::FFTState_Complex_Double_Deinterleaved>;
    namespace api = kestaccel::transform;
    for (unsigned int order = 1; order <= kLastOrder; ++order) {
        const std::uint32_t seed = 400 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        Interleaved* pairsState = nullptr;
        Split* splitState = nullptr;
        RealState<E>* realState = nullptr;
        api::FFTInit(&pairsState, order);
        api::FFTInit(&splitState, order);
        api::FFTInit(&realState, order);
        const std::size_t n = pairsState->size;
        const auto input = RandomReals<E>(2 * n + 2, seed);
        const Expected<E> expected(pairsState->plan, realState->plan, input);
        const Complex* src = reinterpret_cast<const Complex*>(input.data());
        const std::vector<E> re = Part(input, 0), im = Part(input, 1);
        for (const bool inverse : {false, true}) {
            SCOPED_TRACE(inverse ? "inverse" : "forward");
            const auto& want = inverse ? expected.inverse : expected.forward;
            std::vector<Complex> into(n), inPlace(src, src + n);
            std::vector<E> outRe(n), outIm(n), real(inverse ? n : n + 2);
            const auto run = [&](auto... args) {
                inverse ? api::FFTInv(args..., nullptr) : api::FFTFwd(args..., nullptr);
            };
            run(src, into.data(), pairsState);
            run(inPlace.data(), inPlace.data(), pairsState);
            run(re.data(), im.data(), outRe.data(), outIm.data(), splitState);
            run(input.data(), real.data(), realState);
            EXPECT_TRUE(SameBitsArray(want.data(), reinterpret_cast<const E*>(into.data()), 2 * n)) << "into";
            EXPECT_TRUE(SameBitsArray(want.data(), reinterpret_cast<const E*>(inPlace.data()), 2 * n)) << "in place";
            EXPECT_TRUE(SameBitsArray(Part(want, 0).data(), outRe.data(), n)) << "split, real parts";
            EXPECT_TRUE(SameBitsArray(Part(want, 1).data(), outIm.data(), n)) << "split, imaginary parts";
            EXPECT_TRUE(SameBitsArray(inverse ? expected.realInverse : expected.realForward, real)) << "real";
        }
        api::FFTFree(pairsState);
        api::FFTFree(splitState);
        api::FFTFree(realState);
    }
}

}  // namespace
