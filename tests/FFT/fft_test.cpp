// Transforms through the public interface: spectra at size 8, zeros, round
// trips, layouts, small orders, accuracy, allocation, FFTImpl, state life cycle.

#include <kestaccel/FFT.h>

#include <cstdio>

#include "support/AllocationCount.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel::transform;
using namespace kestaccel_test;

// Within t eps, absolutely or relative to the larger magnitude.
template <class E>
::testing::AssertionResult Agrees(long double expected, E actual, double t)
{
    const long double eps = std::numeric_limits<E>::epsilon(), diff = std::fabs(actual - expected);
    if (diff <= t * eps * std::fmax(1.0L, std::fmax(std::fabs(expected), std::fabs(actual))))
        return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << "expected " << double(expected) << ", got " << actual << " (off by "
                                         << double(diff / eps) << " eps)";
}

// X[k] = sum x[n] exp(-2 pi i k n / N) in long double, ascending n.
std::vector<std::complex<long double>> DirectDFT(const std::vector<std::complex<long double>>& x)
{
    const std::size_t n = x.size();
    const long double pi = 3.141592653589793238462643383279502884L;
    std::vector<std::complex<long double>> factor(n), result(n);
    for (std::size_t m = 0; m < n; ++m) factor[m] = std::polar(1.0L, -2.0L * pi * m / n);
    for (std::size_t k = 0; k < n; ++k) {
        for (std::size_t i = 0; i < n; ++i) result[k] += x[i] * factor[(k * i) % n];
    }
    return result;
}

// exp(-2 pi i j / 8); the quarter turns are exact.
std::complex<long double> EighthRoot(unsigned int j)
{
    const long double h = 0.7071067811865476;  // the double nearest to sqrt(1/2)
    const std::complex<long double> roots[8] = {{1, 0}, {h, -h}, {0, -1}, {-h, -h}, {-1, 0}, {-h, h}, {0, 1}, {h, h}};
    return roots[j % 8];
}

// Owns a state for the length of a test.
template <class State>
struct StateHolder {
    State* state = nullptr;
    explicit StateHolder(unsigned int order) { FFTInit(&state, order); }
    StateHolder(const StateHolder&) = delete;
    ~StateHolder() { FFTFree(state); }
    State* get() const { return state; }
};

// FFTFwd or FFTInv on any layout.
template <class State, class... Arrays>
void Transform(bool inverse, State* state, Arrays... arrays)
{
    if (inverse) {
        FFTInv(arrays..., state, nullptr);
    } else {
        FFTFwd(arrays..., state, nullptr);
    }
}

template <class E>
std::vector<std::complex<E>> Pairs(const E* re, const E* im, std::size_t n)
{
    std::vector<std::complex<E>> pairs(n);
    for (std::size_t i = 0; i < n; ++i) pairs[i] = {re[i], im[i]};
    return pairs;
}

template <class E>
class FFT : public ::testing::Test {
protected:
    static constexpr bool kFloat = sizeof(E) == 4;
    using Real = std::conditional_t<kFloat, kestaccel::FFTState_Float, kestaccel::FFTState_Double>;
    using Interleaved = std::conditional_t<kFloat, kestaccel::FFTState_Complex_Float_Interleaved,
                                           kestaccel::FFTState_Complex_Double_Interleaved>;
    using Deinterleaved = std::conditional_t<kFloat, kestaccel::FFTState_Complex_Float_Deinterleaved,
                                             kestaccel::FFTState_Complex_Double_Deinterleaved>;

    // Out of place into a guarded buffer, on a state of its own.
    static std::vector<std::complex<E>> Complex(unsigned int order, const std::vector<std::complex<E>>& x,
                                                bool inverse = false)
    {
        StateHolder<Interleaved> state(order);
        GuardedBuffer<std::complex<E>> out(x.size());
        Transform(inverse, state.get(), x.data(), out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }

    // N samples in, N + 2 out (the inverse the other way).
    static std::vector<E> RealRun(unsigned int order, const std::vector<E>& x, bool inverse = false,
                                  Real* shared = nullptr)
    {
        StateHolder<Real> own(order);
        GuardedBuffer<E> out(inverse ? x.size() - 2 : x.size() + 2);
        Transform(inverse, shared != nullptr ? shared : own.get(), x.data(), out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};
TYPED_TEST_SUITE(FFT, FloatingTypes);

// Impulses within 1 eps (the real spectrum exactly real at DC and Nyquist)
// and a step within 2 eps, complex and real.
TYPED_TEST(FFT, KnownSpectraOfSizeEight)
{
    using E = TypeParam;
    const auto expectSpectrum = [](const std::vector<E>& x, auto expected, double t) {
        const auto spectrum = TestFixture::Complex(3, {x.begin(), x.end()});
        const auto real = TestFixture::RealRun(3, x);
        for (unsigned int k = 0; k < 8; ++k) {
            const std::complex<long double> e = expected(k);
            EXPECT_TRUE(Agrees<E>(e.real(), spectrum[k].real(), t) && Agrees<E>(e.imag(), spectrum[k].imag(), t)) << k;
            if (k <= 4) {
                EXPECT_TRUE(Agrees<E>(e.real(), real[2 * k], t) && Agrees<E>(e.imag(), real[2 * k + 1], t)) << k;
            }
        }
        EXPECT_TRUE(SameBits(E(0), real[1]) && SameBits(E(0), real[9]));
    };
    for (unsigned int m = 0; m < 8; ++m) {
        SCOPED_TRACE("impulse at " + std::to_string(m));
        std::vector<E> x(8);
        x[m] = E(1);
        expectSpectrum(x, [m](unsigned int k) { return EighthRoot(k * m); }, 1);
    }
    const long double r2 = 2.414213562373095, r0 = 0.41421356237309515;
    const long double re[8] = {4, -1, 0, -1, 0, -1, 0, -1}, im[8] = {0, r2, 0, r0, 0, -r0, 0, -r2};
    const auto stepSpectrum = [&](unsigned int k) { return std::complex<long double>(re[k], im[k]); };
    expectSpectrum({0, 0, 0, 0, 1, 1, 1, 1}, stepSpectrum, 2);
}

// Compared by value: a zero may come out as -0.
TYPED_TEST(FFT, ZerosStayExactlyZero)
{
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 8u}) {
        const std::vector<E> zeros(1u << order);
        for (const auto& v : TestFixture::Complex(order, {zeros.begin(), zeros.end()})) EXPECT_EQ(v, E(0));
        for (const auto& v : TestFixture::Complex(order, {zeros.begin(), zeros.end()}, true)) EXPECT_EQ(v, E(0));
        const auto spectrum = TestFixture::RealRun(order, zeros);
        for (E v : spectrum) EXPECT_EQ(v, E(0));
        for (E v : TestFixture::RealRun(order, spectrum, true)) EXPECT_EQ(v, E(0));
    }
}

// On data in [0, 1), where the relative form of the rule means something.
// The real state is reused: its scratch keeps nothing between calls.
TYPED_TEST(FFT, ForwardThenInverseAtOrderEight)
{
    using E = TypeParam;
    const std::uint32_t seed = 31;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = RandomComplex<E>(256, seed, E(0), E(1));
    const auto back = TestFixture::Complex(8, TestFixture::Complex(8, x), true);
    const auto samples = RandomReals<E>(256, seed + 1, E(0), E(1));
    StateHolder<typename TestFixture::Real> state(8);
    const auto spectrum = TestFixture::RealRun(8, samples, false, state.get());
    const auto realBack = TestFixture::RealRun(8, spectrum, true, state.get());
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_TRUE(Agrees<E>(x[i].real(), back[i].real(), 100) && Agrees<E>(x[i].imag(), back[i].imag(), 100)) << i;
        EXPECT_TRUE(Agrees<E>(samples[i], realBack[i], 100)) << i;
    }
    EXPECT_TRUE(SameBitsArray(spectrum, TestFixture::RealRun(8, samples, false, state.get())));
}

// The DC and Nyquist imaginary entries p and q add (p + q (-1)^n) / N.
TYPED_TEST(FFT, RealInverseReadsDcAndNyquistImaginaryParts)
{
    using E = TypeParam;
    const auto x = TestFixture::RealRun(3, {1, 1, 1, 0, 1, 0, 1, 0, 1, E(0.5)}, true);
    for (unsigned int n = 0; n < 8; ++n) {
        const long double expected = (n == 0 ? 1.0L : 0.0L) + (1.0L + 0.5L * (n % 2 ? -1 : 1)) / 8;
        EXPECT_TRUE(Agrees<E>(expected, x[n], 1)) << n;
    }
}

// Every placement, interleaved or split, overlapping or not, gives the bits
// of the interleaved transform in place.
TYPED_TEST(FFT, LayoutsAndPlacementsAgreeBitForBit)
{
    using E = TypeParam;
    for (unsigned int order = 1; order <= 12; ++order) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 40 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        const auto re = RandomReals<E>(n, seed), im = RandomReals<E>(n, seed + 500);
        const auto pairs = Pairs(re.data(), im.data(), n);
        StateHolder<typename TestFixture::Interleaved> inter(order);
        StateHolder<typename TestFixture::Deinterleaved> split(order);
        for (bool inverse : {false, true}) {
            SCOPED_TRACE(inverse ? "inverse" : "forward");
            auto expected = pairs;
            Transform(inverse, inter.get(), expected.data(), expected.data());
            ASSERT_TRUE(SameBitsArray(expected, TestFixture::Complex(order, pairs, inverse))) << "out of place";
            std::vector<std::complex<E>> shifted(n + 3);
            std::copy(pairs.begin(), pairs.end(), shifted.begin() + 3);
            Transform(inverse, inter.get(), shifted.data() + 3, shifted.data() + 1);
            ASSERT_TRUE(SameBitsArray(expected.data(), shifted.data() + 1, n)) << "overlapping";

            GuardedBuffer<E> outRe(n), outIm(n);
            Transform(inverse, split.get(), re.data(), im.data(), outRe.data(), outIm.data());
            EXPECT_TRUE(outRe.Intact() && outIm.Intact());
            ASSERT_TRUE(SameBitsArray(expected, Pairs(outRe.data(), outIm.data(), n))) << "split";
            auto inPlaceRe = re, inPlaceIm = im;
            Transform(inverse, split.get(), inPlaceRe.data(), inPlaceIm.data(), inPlaceRe.data(), inPlaceIm.data());
            ASSERT_TRUE(SameBitsArray(expected, Pairs(inPlaceRe.data(), inPlaceIm.data(), n))) << "split in place";
            std::vector<E> storage(3 * n), overRe(n);
            std::copy(re.begin(), re.end(), storage.begin() + n / 2);
            std::copy(im.begin(), im.end(), storage.begin() + 2 * n);
            Transform(inverse, split.get(), storage.data() + n / 2, storage.data() + 2 * n, overRe.data(), storage.data());
            ASSERT_TRUE(SameBitsArray(expected, Pairs(overRe.data(), storage.data(), n))) << "split overlapping";
        }
    }
}

// Only the low five bits of the order count: 32 copies one point unscaled;
// 33 is order 1, a sum and a difference in that operand order.
TYPED_TEST(FFT, OrdersOneThirtyTwoAndThirtyThree)
{
    using E = TypeParam;
    const std::complex<E> one(E(-0.0), E(3.5));
    EXPECT_TRUE(SameBits(one, TestFixture::Complex(32, {one})[0]));
    EXPECT_TRUE(SameBits(one, TestFixture::Complex(32, {one}, true)[0]));
    StateHolder<typename TestFixture::Deinterleaved> state(32);
    E outRe = E(9), outIm = E(9);
    const E* parts = reinterpret_cast<const E*>(&one);
    Transform(true, state.get(), parts, parts + 1, &outRe, &outIm);
    EXPECT_TRUE(SameBits(one, std::complex<E>(outRe, outIm)));
    const auto real = TestFixture::RealRun(32, {E(-0.0)});
    EXPECT_TRUE(SameBits(E(-0.0), real[0]) && SameBits(E(0), real[1]));
    EXPECT_TRUE(SameBits(E(-2.5), TestFixture::RealRun(32, {E(-2.5), E(7), E(9)}, true)[0]));

    const E a = E(0.1), b = E(0.7), nan = std::numeric_limits<E>::quiet_NaN();
    const std::vector<std::complex<E>> two = {{E(1.25), E(-2)}, {E(0.5), E(7)}};
    for (unsigned int order : {1u, 33u}) {
        SCOPED_TRACE("order " + std::to_string(order));
        EXPECT_TRUE(SameBitsArray({{E(1.25) + E(0.5), E(-2) + E(7)}, {E(1.25) - E(0.5), E(-2) - E(7)}},
                                  TestFixture::Complex(order, two)));
        EXPECT_TRUE(SameBitsArray(TestFixture::Complex(1, two, true), TestFixture::Complex(order, two, true)));
        EXPECT_TRUE(SameBitsArray({E(b + a), E(0), E(a - b), E(0)}, TestFixture::RealRun(order, {a, b})));
        EXPECT_TRUE(SameBitsArray({E((b + a) * E(0.5)), E((a - b) * E(0.5))},
                                  TestFixture::RealRun(order, {a, nan, b, nan}, true)));
    }
}

// RMS and worst error relative to the oracle's RMS: bounds a few times above
// what the method reaches (twiddle drift in double), far below a wrong factor.
TYPED_TEST(FFT, AccuracyAgainstDirectDFT)
{
    using E = TypeParam;
    const double rmsBound = sizeof(E) == 4 ? 4e-7 : 5e-13, maxBound = sizeof(E) == 4 ? 1.5e-6 : 2e-12;
    for (bool real : {false, true}) {
        for (unsigned int order : {10u, 12u}) {
            const unsigned int n = 1u << order, bins = real ? n / 2 + 1 : n;
            const std::uint32_t seed = (real ? 2000 : 1000) + order;
            SCOPED_TRACE(SeedTrace(seed) + ", N " + std::to_string(n) + (real ? ", real" : ", complex"));
            std::vector<std::complex<E>> x(n), spectrum(bins);
            if (real) {
                const auto samples = RandomReals<E>(n, seed);
                std::copy(samples.begin(), samples.end(), x.begin());
                StateHolder<typename TestFixture::Real> state(order);
                Transform(false, state.get(), samples.data(), reinterpret_cast<E*>(spectrum.data()));
            } else {
                x = RandomComplex<E>(n, seed);
                StateHolder<typename TestFixture::Interleaved> state(order);
                Transform(false, state.get(), x.data(), spectrum.data());
            }
            const auto oracle = DirectDFT(std::vector<std::complex<long double>>(x.begin(), x.end()));
            long double errSquares = 0, refSquares = 0, worst = 0;
            for (unsigned int k = 0; k < bins; ++k) {
                const long double err = std::abs(std::complex<long double>(spectrum[k]) - oracle[k]);
                errSquares += err * err;
                refSquares += std::norm(oracle[k]);
                worst = std::fmax(worst, err);
            }
            const long double refRms = std::sqrt(refSquares / bins);
            const double rms = double(std::sqrt(errSquares / bins) / refRms), max = double(worst / refRms);
            std::printf("%s %s N=%u: rms %.3g, max %.3g\n", real ? "real" : "complex",
                        sizeof(E) == 4 ? "float" : "double", n, rms, max);
            EXPECT_LT(rms, rmsBound);
            EXPECT_LT(max, maxBound);
        }
    }
}

// The plan holds every table and scratch buffer: no transform allocates.
TYPED_TEST(FFT, TransformsAllocateNothing)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 10u}) {
        const unsigned int n = 1u << order;
        StateHolder<typename TestFixture::Real> real(order);
        StateHolder<typename TestFixture::Interleaved> inter(order);
        StateHolder<typename TestFixture::Deinterleaved> split(order);
        std::vector<E> a(2 * n + 2, E(0.5)), b(2 * n + 2);
        ResetAllocationTally();
        for (bool inverse : {false, true}) {
            Transform(inverse, real.get(), a.data(), b.data());
            Transform(inverse, inter.get(), reinterpret_cast<std::complex<E>*>(a.data()),
                      reinterpret_cast<std::complex<E>*>(a.data()));
            Transform(inverse, split.get(), a.data(), a.data() + n, b.data(), b.data() + n);
        }
        EXPECT_EQ(0u, CurrentAllocationTally().news) << "order " << order;
    }
}

// FFTImpl rounds the length on a log scale, a nonzero one winning over the
// order; its transforms are a deinterleaved state's, after any rebuild.
TYPED_TEST(FFT, ImplLengthsAndTransforms)
{
    using E = TypeParam;
    using Impl = FFTImpl<typename TestFixture::Deinterleaved, std::complex<E>>;
    Impl impl;
    EXPECT_EQ(impl.GetOrder(), 0u);
    EXPECT_EQ(impl.GetFFTSize(), 0u);
    EXPECT_EQ(impl.GetBlockSize(), 1u);
    const struct {
        unsigned int length, order, block;
    } table[] = {{2, 1, 2},        {3, 2, 4},         {724, 9, 512},     {725, 10, 1024}, {1, 0, 1},
                 {1000, 10, 1024}, {1024, 10, 1024}, {1024, 10, 1024}, {0, 0, 1},       {1, 0, 1}};
    for (const auto& row : table) {
        SCOPED_TRACE("length " + std::to_string(row.length));
        impl.SetFFTSize(row.length);
        EXPECT_EQ(impl.GetOrder(), row.order);
        EXPECT_EQ(impl.GetBlockSize(), row.block);
        EXPECT_EQ(impl.GetFFTSize(), row.length);
        Impl constructed(7, row.length);
        EXPECT_EQ(constructed.GetOrder(), row.length == 0 ? 7u : row.order);
        EXPECT_EQ(constructed.GetBlockSize(), row.length == 0 ? 128u : row.block);
        EXPECT_EQ(constructed.GetFFTSize(), row.length);
        if (row.order == 0) continue;
        const unsigned int n = row.block;
        const auto re = RandomReals<E>(n, 90 + row.length), im = RandomReals<E>(n, 91 + row.length);
        StateHolder<typename TestFixture::Deinterleaved> state(row.order);
        for (bool inverse : {false, true}) {
            std::vector<E> outRe(n), outIm(n), expectRe(n), expectIm(n);
            if (inverse) {
                impl.ProcessInv(re.data(), im.data(), outRe.data(), outIm.data());
            } else {
                impl.ProcessFwd(re.data(), im.data(), outRe.data(), outIm.data());
            }
            Transform(inverse, state.get(), re.data(), im.data(), expectRe.data(), expectIm.data());
            EXPECT_TRUE(SameBitsArray(expectRe, outRe) && SameBitsArray(expectIm, outIm)) << inverse;
        }
    }
}

// Order 0 and null are refused; the work-buffer query says 0; Free gives
// back every block Init took.
template <class State>
void ExpectStateLifeCycle()
{
    State* const marker = reinterpret_cast<State*>(std::uintptr_t(0x1234560));
    State* state = marker;
    FFTInit(&state, 0);
    EXPECT_EQ(state, marker);
    FFTInit(static_cast<State**>(nullptr), 5);
    state = nullptr;
    ResetAllocationTally();
    FFTInit(&state, 10);
    ASSERT_NE(state, nullptr);
    unsigned int size = 123, none = 123;
    FFTGetBufSize(state, &size);
    FFTGetBufSize(static_cast<const State*>(nullptr), &none);
    EXPECT_EQ(0u, size + none);
    FFTFree(state);
    FFTFree(static_cast<State*>(nullptr));
    const auto tally = CurrentAllocationTally();
    EXPECT_TRUE(!LibraryAllocationsAreCounted() || tally.news == tally.deletes);
}

TYPED_TEST(FFT, StatesLifeCycle)
{
    ExpectStateLifeCycle<typename TestFixture::Real>();
    ExpectStateLifeCycle<typename TestFixture::Interleaved>();
    ExpectStateLifeCycle<typename TestFixture::Deinterleaved>();
}

}  // namespace
