// Signal quality: a second-order lowpass section, alone and as a cascade of
// two, attenuates a tone above its cutoff by what its frequency response
// predicts, in float and double.

#include <kestaccel/IIR.h>

#include <cmath>
#include <complex>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace kf = kestaccel::filter;

const double kPi = 3.14159265358979323846;

template <class T>
struct StateOf;
template <>
struct StateOf<float> {
    using type = kestaccel::IIRState_Float;
};
template <>
struct StateOf<double> {
    using type = kestaccel::IIRState_Double;
};

// Butterworth-like lowpass biquad (Q = 1/sqrt 2) by the bilinear transform:
// b0 b1 b2 a0 a1 a2, not normalised, so that the init call divides a0 out.
std::vector<double> LowpassSection(double sampleRate, double cutoff)
{
    const double w0 = 2.0 * kPi * cutoff / sampleRate;
    const double alpha = std::sin(w0) / (2.0 * std::sqrt(0.5));
    const double c = std::cos(w0);
    return {(1.0 - c) / 2.0, 1.0 - c, (1.0 - c) / 2.0, 1.0 + alpha, -2.0 * c, 1.0 - alpha};
}

// |H(f)| of one section with the taps as the filter holds them (divided by
// a0 in T), evaluated in double.
template <class T>
double SectionMagnitude(const std::vector<T>& taps, double f)
{
    const T r = T(1) / taps[3];
    const std::complex<double> z1 = std::polar(1.0, -2.0 * kPi * f), z2 = z1 * z1;
    const std::complex<double> num = double(r * taps[0]) + double(r * taps[1]) * z1 + double(r * taps[2]) * z2;
    const std::complex<double> den = 1.0 + double(r * taps[4]) * z1 + double(r * taps[5]) * z2;
    return std::abs(num / den);
}

template <class T>
double ToneAmplitude(const T* y, std::size_t length, double f)
{
    std::complex<double> acc = 0.0;
    for (std::size_t n = 0; n < length; ++n) acc += double(y[n]) * std::polar(1.0, -2.0 * kPi * f * double(n));
    return 2.0 * std::abs(acc) / double(length);
}

template <class T>
class IIRSignal : public ::testing::Test {};
using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(IIRSignal, Precisions);

TYPED_TEST(IIRSignal, BiquadLowpassAttenuatesAToneAboveTheCutoff)
{
    using T = TypeParam;
    const double rate = 48000.0, cutoff = 1000.0, tone = 8000.0;
    const auto design = LowpassSection(rate, cutoff);
    const std::vector<T> section(design.begin(), design.end());
    const double f = tone / rate;  // six samples per period
    const double perSection = 20.0 * std::log10(SectionMagnitude(section, f));
    // Two poles: about 12 dB per octave, three octaves above the cutoff.
    EXPECT_LT(perSection, -33.0);
    EXPECT_GT(perSection, -39.0);

    for (unsigned int sections : {1u, 2u}) {
        SCOPED_TRACE(sections);
        std::vector<T> taps;
        for (unsigned int s = 0; s < sections; ++s) taps.insert(taps.end(), section.begin(), section.end());
        typename StateOf<T>::type* state = nullptr;
        kf::IIRInit_BiQuad(&state, taps.data(), sections, nullptr);
        ASSERT_NE(nullptr, state);

        const std::size_t settle = 4800, span = 4800;
        std::vector<T> signal(settle + span);
        for (std::size_t n = 0; n < signal.size(); ++n) signal[n] = T(std::sin(2.0 * kPi * f * double(n)));
        kf::IIR_InPlace(static_cast<unsigned int>(signal.size()), signal.data(), state);
        kf::IIRFree(state);

        const double measured = 20.0 * std::log10(ToneAmplitude(signal.data() + settle, span, f));
        EXPECT_NEAR(sections * perSection, measured, 0.05);
    }
}

}  // namespace
