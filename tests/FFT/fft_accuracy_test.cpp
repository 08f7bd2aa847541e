// Accuracy of the transforms against a long-double direct DFT at N = 1024
// and 4096, on fixed random data in [-1, 1). Errors are relative to the RMS
// magnitude of the oracle's spectrum; the figures are printed and bounded.

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <cstdio>
#include <vector>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel::transform;
using fft_test::StateHolder;

template <class E>
class FFTAccuracy : public ::testing::Test {};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTAccuracy, Elements);

// The bounds sit a few times above what the method reaches, far below what
// a wrong factor, a wrong sign or a missing stage would give. In double the
// drift of the twiddle recurrence dominates (about 1e-13 RMS at N = 4096);
// float rounding hides it (about 1.4e-7).
TYPED_TEST(FFTAccuracy, AgainstDirectDFT)
{
    using E = TypeParam;
    const double rmsBound = sizeof(E) == 4 ? 4e-7 : 5e-13, maxBound = sizeof(E) == 4 ? 1.5e-6 : 2e-12;
    for (bool real : {false, true}) {
        for (unsigned int order : {10u, 12u}) {
            const unsigned int n = 1u << order, bins = real ? n / 2 + 1 : n;
            const std::uint32_t seed = (real ? 2000 : 1000) + order;
            SCOPED_TRACE(kestaccel_test::SeedTrace(seed) + ", N " + std::to_string(n) + (real ? ", real" : ", complex"));
            std::vector<std::complex<E>> x(n), spectrum(bins);
            if (real) {
                const auto samples = kestaccel_test::RandomReals<E>(n, seed);
                std::copy(samples.begin(), samples.end(), x.begin());
                StateHolder<typename fft_test::States<E>::Real> state(order);
                FFTFwd(samples.data(), reinterpret_cast<E*>(spectrum.data()), state.get(), nullptr);
            } else {
                x = kestaccel_test::RandomComplex<E>(n, seed);
                StateHolder<typename fft_test::States<E>::Interleaved> state(order);
                FFTFwd(x.data(), spectrum.data(), state.get(), nullptr);
            }
            const auto oracle = fft_test::DirectDFT(std::vector<std::complex<long double>>(x.begin(), x.end()));
            long double errSquares = 0, refSquares = 0, worst = 0;
            for (unsigned int k = 0; k < bins; ++k) {
                const long double err = std::abs(std::complex<long double>(spectrum[k]) - oracle[k]);
                errSquares += err * err;
                refSquares += std::norm(oracle[k]);
                worst = std::fmax(worst, err);
            }
            const long double refRms = std::sqrt(refSquares / bins);
            const double rms = static_cast<double>(std::sqrt(errSquares / bins) / refRms);
            const double max = static_cast<double>(worst / refRms);
            std::printf("%s %s N=%u: rms %.3g, max %.3g\n", real ? "real" : "complex", sizeof(E) == 4 ? "float" : "double", n, rms, max);
            EXPECT_LT(rms, rmsBound);
            EXPECT_LT(max, maxBound);
        }
    }
}

}  // namespace
