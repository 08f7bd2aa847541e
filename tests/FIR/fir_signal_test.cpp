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

// |sum of v[n] e^(-2 pi i f n)|, in double.
double Dtft(const float* v, std::size_t length, double f)
{
    std::complex<double> acc = 0.0;
    for (std::size_t n = 0; n < length; ++n) acc += double(v[n]) * std::polar(1.0, -2.0 * kPi * f * double(n));
    return std::abs(acc);
}

TEST(FIRSignal, LowpassPassesLowToneAndAttenuatesHighTone)
{
    const unsigned int tapCount = 101;
    std::vector<double> design(tapCount);
    kf::GenerateLowpassFIRCoefficients(0.1, tapCount, design.data(), kestaccel::utility::kDSPWindowHamming, true,
                                       nullptr);
    const std::vector<float> taps(design.begin(), design.end());
    kestaccel::FIRState_Float* state = nullptr;
    kf::FIRInit(&state, taps.data(), tapCount, nullptr);

    // Whole numbers of cycles in the measured span, after the filter settles.
    const std::size_t settle = tapCount, span = 3000;
    for (double f : {0.02, 0.25, 0.3}) {
        SCOPED_TRACE(f);
        std::vector<float> signal(settle + span), out(settle + span);
        for (std::size_t n = 0; n < signal.size(); ++n) signal[n] = float(std::sin(2.0 * kPi * f * double(n)));
        kf::FIRSetDlyLine(state, nullptr);
        kf::FIR(state, static_cast<unsigned int>(signal.size()), signal.data(), out.data());

        const double measured = 20.0 * std::log10(2.0 * Dtft(out.data() + settle, span, f) / double(span));
        const double predicted = 20.0 * std::log10(Dtft(taps.data(), tapCount, f));
        if (f < 0.1) {
            EXPECT_NEAR(0.0, predicted, 0.01);
            EXPECT_NEAR(predicted, measured, 0.001);
        } else {
            // Well inside the Hamming design's stopband: below -60 dB.
            EXPECT_LT(predicted, -60.0);
            EXPECT_NEAR(predicted, measured, 0.5);
        }
    }
    kf::FIRFree(state);
}

}  // namespace
