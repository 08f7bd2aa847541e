#include "audio/FilterDesign.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <stdexcept>

#include <kestaccel/FIR.h>
#include <kestaccel/Window.h>

namespace kestaudio {

namespace {
const double kPi = 3.14159265358979323846;
}

double KaiserBeta(double a)
{
    if (a > 50) return 0.1102 * (a - 8.7);
    if (a > 21) return 0.5842 * std::pow(a - 21, 0.4) + 0.07886 * (a - 21);
    return 0;
}

std::vector<double> DesignLowpass(double cutoff, unsigned int taps, double beta, double gain)
{
    std::vector<double> h(taps);
    // No window from the design itself (type 1 applies none): the Kaiser
    // window reaches attenuations that Hann and Hamming do not.
    kestaccel::filter::GenerateLowpassFIRCoefficients(cutoff, taps, h.data(),
                                                      kestaccel::utility::DSPWindowType(1), false, nullptr);
    if (taps > 1) {
        // The library's alpha scales the distance from the centre.
        kestaccel::utility::WindowKaiser(taps, h.data(), h.data(), 2.0 * beta / double(taps - 1));
    }
    double sum = 0;
    for (double v : h) sum += v;
    for (double& v : h) v *= gain / sum;
    return h;
}

std::vector<double> DesignFir(Band band, double f1, double f2, double rate, unsigned int taps)
{
    taps |= 1u;
    const double beta = KaiserBeta(90);
    if (band == Band::Lowpass) return DesignLowpass(f1 / rate, taps, beta, 1);
    std::vector<double> h = DesignLowpass(f1 / rate, taps, beta, 1);
    for (double& v : h) v = -v;
    if (band == Band::Highpass) {
        h[taps / 2] += 1;
    } else {
        const std::vector<double> upper = DesignLowpass(f2 / rate, taps, beta, 1);
        for (unsigned int i = 0; i < taps; ++i) h[i] += upper[i];
    }
    return h;
}

std::vector<double> DesignButterworth(Band band, double f1, double f2, double rate, unsigned int sections)
{
    // A Butterworth response of order 2K is K biquads with the quality
    // factors 1 / (2 cos(pi (2k + 1) / 4K)); each biquad by the bilinear
    // transform (the audio cookbook's forms).
    auto cascade = [&](bool highpass, double f, unsigned int count, std::vector<double>& out) {
        const double w0 = 2 * kPi * f / rate, c = std::cos(w0), s = std::sin(w0);
        for (unsigned int k = 0; k < count; ++k) {
            const double q = 1 / (2 * std::cos(kPi * (2 * k + 1) / (4.0 * count)));
            const double alpha = s / (2 * q), a0 = 1 + alpha;
            const double b1 = highpass ? -(1 + c) : 1 - c, b0 = std::fabs(b1) / 2;
            const double t[6] = {b0, b1, b0, a0, -2 * c, 1 - alpha};
            for (int i = 0; i < 6; ++i) out.push_back(t[i] / a0);
        }
    };
    std::vector<double> taps;
    if (band == Band::Bandpass) {
        cascade(true, f1, (sections + 1) / 2, taps);
        cascade(false, f2, sections / 2, taps);
    } else {
        cascade(band == Band::Highpass, f1, sections, taps);
    }
    return taps;
}

double FirResponseDb(const std::vector<double>& taps, double frequency)
{
    // A phasor advanced by multiplication, renormalised now and then: the
    // cosines of every tap without a cosine per tap.
    const std::complex<double> step = std::polar(1.0, -2 * kPi * frequency);
    std::complex<double> phasor = 1, sum = 0;
    for (std::size_t k = 0; k < taps.size(); ++k) {
        sum += taps[k] * phasor;
        phasor *= step;
        if ((k & 1023) == 1023) phasor = std::polar(1.0, -2 * kPi * frequency * double(k + 1));
    }
    return 20 * std::log10(std::max(std::abs(sum), 1e-300));
}

ResponseFigures FirResponseFigures(const std::vector<double>& taps, double passEnd, double stopStart)
{
    const int points = 400;
    double lo = 1e300, hi = -1e300, mean = 0;
    for (int i = 0; i <= points; ++i) {
        const double db = FirResponseDb(taps, passEnd * i / points);
        lo = std::min(lo, db);
        hi = std::max(hi, db);
        mean += db / (points + 1);
    }
    // The worst sidelobes lie next to the transition: a fine grid there
    // (a quarter of the main lobe's spacing), a coarse one beyond.
    double worst = -1e300;
    const double fine = 0.25 / double(taps.size());
    double f = stopStart;
    for (int i = 0; i < 4000 && f <= 0.5; ++i, f += fine) worst = std::max(worst, FirResponseDb(taps, f));
    for (int i = 0; i <= points; ++i) worst = std::max(worst, FirResponseDb(taps, f + (0.5 - f) * i / points));
    return {hi - lo, mean - worst};
}

}  // namespace kestaudio
