// Accuracy of the transforms against a long-double direct DFT at N = 1024
// and 4096, on fixed random data in [-1, 1). Errors are relative to the RMS
// magnitude of the oracle's spectrum; the figures are printed and bounded.

#include <cmath>
#include <complex>
#include <cstdint>
#include <cstdio>
#include <vector>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel::transform;
using fft_test::StateHolder;
using kestaccel_test::RandomReals;
using kestaccel_test::SeedTrace;

struct ErrorFigures {
    double rms;
    double max;
};

template <class E>
ErrorFigures Compare(const std::vector<std::complex<long double>>& oracle, const std::vector<std::complex<E>>& actual)
{
    long double errSquares = 0, refSquares = 0, worst = 0;
    for (std::size_t k = 0; k < actual.size(); ++k) {
        const std::complex<long double> got(actual[k].real(), actual[k].imag());
        const long double err = std::abs(got - oracle[k]);
        errSquares += err * err;
        refSquares += std::norm(oracle[k]);
        worst = std::fmax(worst, err);
    }
    const long double refRms = std::sqrt(refSquares / actual.size());
    return {static_cast<double>(std::sqrt(errSquares / actual.size()) / refRms), static_cast<double>(worst / refRms)};
}

template <class E>
class FFTAccuracy : public ::testing::Test {};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTAccuracy, Elements);

// The bounds sit a few times above what the method reaches, far below what
// a wrong factor, a wrong sign or a missing stage would give. In double the
// drift of the twiddle recurrence dominates (about 1e-13 RMS at N = 4096);
// float rounding hides it (about 1.4e-7).
template <class E>
constexpr double RmsBound()
{
    return sizeof(E) == 4 ? 4e-7 : 5e-13;
}
template <class E>
constexpr double MaxBound()
{
    return sizeof(E) == 4 ? 1.5e-6 : 2e-12;
}

TYPED_TEST(FFTAccuracy, ComplexAgainstDirectDFT)
{
    using E = TypeParam;
    for (unsigned int order : {10u, 12u}) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 1000 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", N " + std::to_string(n));
        const auto x = kestaccel_test::RandomComplex<E>(n, seed);
        std::vector<std::complex<long double>> wide(x.begin(), x.end());
        const auto oracle = fft_test::DirectDFT(wide);
        StateHolder<typename fft_test::States<E>::Interleaved> state(order);
        std::vector<std::complex<E>> spectrum(n);
        FFTFwd(x.data(), spectrum.data(), state.get(), nullptr);
        const auto figures = Compare(oracle, spectrum);
        std::printf("complex %s N=%u: rms %.3g, max %.3g\n", sizeof(E) == 4 ? "float" : "double", n, figures.rms, figures.max);
        EXPECT_LT(figures.rms, RmsBound<E>());
        EXPECT_LT(figures.max, MaxBound<E>());
    }
}

TYPED_TEST(FFTAccuracy, RealAgainstDirectDFT)
{
    using E = TypeParam;
    for (unsigned int order : {10u, 12u}) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 2000 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", N " + std::to_string(n));
        const auto x = RandomReals<E>(n, seed);
        std::vector<std::complex<long double>> wide(x.begin(), x.end());
        auto oracle = fft_test::DirectDFT(wide);
        oracle.resize(n / 2 + 1);
        StateHolder<typename fft_test::States<E>::Real> state(order);
        std::vector<E> packed(n + 2);
        FFTFwd(x.data(), packed.data(), state.get(), nullptr);
        std::vector<std::complex<E>> spectrum(n / 2 + 1);
        for (unsigned int k = 0; k <= n / 2; ++k) spectrum[k] = {packed[2 * k], packed[2 * k + 1]};
        const auto figures = Compare(oracle, spectrum);
        std::printf("real %s N=%u: rms %.3g, max %.3g\n", sizeof(E) == 4 ? "float" : "double", n, figures.rms, figures.max);
        EXPECT_LT(figures.rms, RmsBound<E>());
        EXPECT_LT(figures.max, MaxBound<E>());
    }
}

}  // namespace
