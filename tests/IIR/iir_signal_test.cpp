// Signal quality: a second-order lowpass section, alone and as a cascade of
// two, attenuates a tone above its cutoff by what its frequency response
// predicts, in float and double.

#include <kestaccel/IIR.h>

#include <cmath>
#include <complex>
#include <type_traits>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace kf = kestaccel::filter;

const double kPi = 3.14159265358979323846;

template <class T>
class IIRSignal : public ::testing::Test {
};
using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(IIRSignal, Precisions);

TYPED_TEST(IIRSignal, BiquadLowpassAttenuatesAToneAboveTheCutoff)
{
    using T = TypeParam;
    using State = std::conditional_t<sizeof(T) == 4, kestaccel::IIRState_Float, kestaccel::IIRState_Double>;
    // Butterworth-like lowpass (Q = 1/sqrt 2) by the bilinear transform, a
    // cutoff of 1 kHz at 48 kHz, not normalised: the init call divides a0 out.
    const double w0 = 2.0 * kPi * 1000.0 / 48000.0, alpha = std::sin(w0) / std::sqrt(2.0), c = std::cos(w0);
    const std::vector<T> section = {T((1 - c) / 2), T(1 - c), T((1 - c) / 2), T(1 + alpha), T(-2 * c), T(1 - alpha)};
    const double f = 8000.0 / 48000.0;  // six samples per period
    // |H(f)| with the taps as the filter holds them, divided by a0 in T.
    const T r = T(1) / section[3];
    const std::complex<double> z1 = std::polar(1.0, -2.0 * kPi * f), z2 = z1 * z1;
    const auto num = double(r * section[0]) + double(r * section[1]) * z1 + double(r * section[2]) * z2;
    const auto den = 1.0 + double(r * section[4]) * z1 + double(r * section[5]) * z2;
    const double perSection = 20.0 * std::log10(std::abs(num / den));
    // Two poles: about 12 dB per octave, three octaves above the cutoff.
    EXPECT_LT(perSection, -33.0);
    EXPECT_GT(perSection, -39.0);

    for (unsigned int sections : {1u, 2u}) {
        SCOPED_TRACE(sections);
        std::vector<T> taps(section);
        if (sections == 2) taps.insert(taps.end(), section.begin(), section.end());
        State* state = nullptr;
        kf::IIRInit_BiQuad(&state, taps.data(), sections, nullptr);
        ASSERT_NE(nullptr, state);
        // Settle for 4800 samples, then measure the tone over the next 4800.
        std::vector<T> signal(9600);
        for (std::size_t n = 0; n < signal.size(); ++n) signal[n] = T(std::sin(2.0 * kPi * f * double(n)));
        kf::IIR_InPlace(9600u, signal.data(), state);
        kf::IIRFree(state);
        std::complex<double> acc = 0.0;
        for (std::size_t n = 4800; n < 9600; ++n)
            acc += double(signal[n]) * std::polar(1.0, -2.0 * kPi * f * double(n));
        EXPECT_NEAR(sections * perSection, 20.0 * std::log10(2.0 * std::abs(acc) / 4800.0), 0.05);
    }
}

}  // namespace
