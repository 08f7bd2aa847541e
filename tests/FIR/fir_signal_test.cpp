// Signal quality: a windowed-sinc lowpass run through the FIR filter passes a
// low tone and attenuates a tone above the cutoff by what its frequency
// response predicts.

#include <kestaccel/FIR.h>

#include <cmath>
#include <complex>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace kf = kestaccel::filter;

const double kPi = 3.14159265358979323846;

// Blackman-windowed sinc with cutoff fc (cycles per sample), unit DC gain.
std::vector<double> BlackmanLowpass(unsigned int tapCount, double fc)
{
    std::vector<double> taps(tapCount);
    const double centre = 0.5 * (tapCount - 1);
    double sum = 0.0;
    for (unsigned int n = 0; n < tapCount; ++n) {
        const double t = n - centre;
        const double ideal = t == 0.0 ? 2.0 * fc : std::sin(2.0 * kPi * fc * t) / (kPi * t);
        const double phase = 2.0 * kPi * n / (tapCount - 1);
        const double window = 0.42 - 0.5 * std::cos(phase) + 0.08 * std::cos(2.0 * phase);
        taps[n] = ideal * window;
        sum += taps[n];
    }
    for (double& tap : taps) tap /= sum;
    return taps;
}

// |H(f)| of the float taps, evaluated in double.
double ResponseMagnitude(const std::vector<float>& taps, double f)
{
    std::complex<double> h = 0.0;
    for (std::size_t k = 0; k < taps.size(); ++k) h += double(taps[k]) * std::polar(1.0, -2.0 * kPi * f * double(k));
    return std::abs(h);
}

// Amplitude of the component at f over a span of whole periods.
double ToneAmplitude(const float* y, std::size_t length, double f)
{
    std::complex<double> acc = 0.0;
    for (std::size_t n = 0; n < length; ++n) acc += double(y[n]) * std::polar(1.0, -2.0 * kPi * f * double(n));
    return 2.0 * std::abs(acc) / double(length);
}

double Decibels(double ratio) { return 20.0 * std::log10(ratio); }

TEST(FIRSignal, LowpassPassesLowToneAndAttenuatesHighTone)
{
    const unsigned int tapCount = 101;
    const auto design = BlackmanLowpass(tapCount, 0.1);
    const std::vector<float> taps(design.begin(), design.end());
    kestaccel::FIRState_Float* state = nullptr;
    kf::FIRInit(&state, taps.data(), tapCount, nullptr);

    struct Tone {
        double f;            // cycles per sample
        std::size_t period;  // samples per whole number of cycles
    };
    for (const Tone tone : {Tone{0.02, 50}, Tone{0.25, 4}, Tone{0.3, 10}}) {
        SCOPED_TRACE(tone.f);
        const std::size_t settle = tapCount, span = 60 * tone.period * (tone.period < 10 ? 10 : 1);
        std::vector<float> signal(settle + span);
        for (std::size_t n = 0; n < signal.size(); ++n) signal[n] = float(std::sin(2.0 * kPi * tone.f * double(n)));
        std::vector<float> out(signal.size());
        kf::FIRSetDlyLine(state, nullptr);
        kf::FIR(state, static_cast<unsigned int>(signal.size()), signal.data(), out.data());

        const double measured = Decibels(ToneAmplitude(out.data() + settle, span, tone.f));
        const double predicted = Decibels(ResponseMagnitude(taps, tone.f));
        if (tone.f < 0.1) {
            EXPECT_NEAR(0.0, predicted, 0.01);
            EXPECT_NEAR(predicted, measured, 0.001);
        } else {
            // The Blackman window's stopband lies below -70 dB.
            EXPECT_LT(predicted, -70.0);
            EXPECT_NEAR(predicted, measured, 0.5);
        }
    }
    kf::FIRFree(state);
}

}  // namespace
