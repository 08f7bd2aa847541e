#include "audio/Spectrum.h"

#include <algorithm>
#include <cmath>

#include <kestaccel/BasicMath.h>
#include <kestaccel/FFT.h>
#include <kestaccel/Window.h>

namespace kestaudio {

namespace kt = kestaccel::transform;

namespace {
double ToDb(double power) { return 10 * std::log10(std::max(power, 1e-30)); }

unsigned int OrderOf(std::size_t n)
{
    unsigned int order = 0;
    while ((std::size_t(1) << order) < n) ++order;
    return order;
}
}  // namespace

SpectrumAnalyzer::SpectrumAnalyzer(unsigned int channels_, double rate_, std::uint64_t expectedFrames,
                                   unsigned int order, unsigned int columns_)
    : channels(channels_), size(1u << order), columns(columns_), rate(rate_), expected(expectedFrames)
{
    kestaccel::FFTState_Float* state = nullptr;
    kt::FFTInit(&state, order);
    fft = state;
    // beta 14: sidelobes near -100 dB, below 16-bit quantisation noise
    // spread over a frame; the library's window takes beta per half-length.
    window.assign(size, 1.0f);
    kestaccel::utility::WindowKaiser(size, window.data(), window.data(), float(2 * 14.0 / (size - 1)));
    frame.resize(size);
    spectrum.resize(size + 2);
    pending.resize(channels);
    power.assign(channels, std::vector<double>(size / 2 + 1, 0.0));
    frameCount.assign(channels, 0);
    slices.assign(columns, std::vector<double>(size / 2 + 1, 0.0));
    sliceCount.assign(columns, 0);
}

SpectrumAnalyzer::~SpectrumAnalyzer() { kt::FFTFree(static_cast<kestaccel::FFTState_Float*>(fft)); }

void SpectrumAnalyzer::Add(const float* interleaved, std::size_t frames)
{
    for (unsigned int c = 0; c < channels; ++c) {
        std::vector<float>& p = pending[c];
        for (std::size_t f = 0; f < frames; ++f) p.push_back(interleaved[f * channels + c]);
    }
    seen += frames;
    while (pending[0].size() >= size) {
        for (unsigned int c = 0; c < channels; ++c) {
            Transform(c);
            pending[c].erase(pending[c].begin(), pending[c].begin() + size / 2);
        }
    }
}

void SpectrumAnalyzer::Transform(unsigned int c)
{
    kestaccel::utility::Mul(size, window.data(), pending[c].data(), frame.data());
    kt::FFTFwd(frame.data(), spectrum.data(), static_cast<kestaccel::FFTState_Float*>(fft), nullptr);
    // The frame's centre decides its time slice.
    const std::uint64_t centre = seen - pending[c].size() + size / 2;
    const std::size_t slice = std::size_t(std::min<std::uint64_t>(columns - 1, centre * columns / std::max<std::uint64_t>(expected, 1)));
    for (unsigned int k = 0; k <= size / 2; ++k) {
        const double re = spectrum[2 * k], im = spectrum[2 * k + 1];
        power[c][k] += re * re + im * im;
        slices[slice][k] += re * re + im * im;
    }
    ++frameCount[c];
    ++sliceCount[slice];
}

std::vector<std::vector<double>> SpectrumAnalyzer::AverageDb() const
{
    // A full-scale sine gives a peak of sum(w) / 2.
    double sum = 0;
    for (float w : window) sum += w;
    const double full = (sum / 2) * (sum / 2);
    std::vector<std::vector<double>> db(channels, std::vector<double>(size / 2 + 1));
    for (unsigned int c = 0; c < channels; ++c) {
        for (unsigned int k = 0; k <= size / 2; ++k) {
            db[c][k] = ToDb(power[c][k] / std::max<std::uint64_t>(frameCount[c], 1) / full);
        }
    }
    return db;
}

std::vector<std::vector<double>> SpectrumAnalyzer::SpectrogramDb() const
{
    double sum = 0;
    for (float w : window) sum += w;
    const double full = (sum / 2) * (sum / 2);
    std::vector<std::vector<double>> db;
    for (unsigned int s = 0; s < columns; ++s) {
        if (sliceCount[s] == 0) continue;
        db.emplace_back(size / 2 + 1);
        for (unsigned int k = 0; k <= size / 2; ++k) db.back()[k] = ToDb(slices[s][k] / sliceCount[s] / full);
    }
    return db;
}

ToneFigures MeasureTone(const double* x, std::size_t n, double rate, double frequency, double amplitude,
                        double bandFrom)
{
    // Kaiser beta 28, computed here in double: the library's window is
    // accurate to a beta of about 15, not enough for 200 dB.
    const double beta = 28;
    const double pi = 3.14159265358979323846;
    // The window of the last length asked for is kept: measurements come in
    // long runs of one length.
    static std::vector<double> w;
    static double w2 = 0;
    if (w.size() != n) {
        w.resize(n);
        w2 = 0;
        for (std::size_t i = 0; i < n; ++i) {
            const double r = (2.0 * i) / double(n - 1) - 1;
            w[i] = std::cyl_bessel_i(0.0, beta * std::sqrt(std::max(0.0, 1 - r * r))) / std::cyl_bessel_i(0.0, beta);
            w2 += w[i] * w[i];
        }
    }
    std::vector<double> buf(n + 2);
    for (std::size_t i = 0; i < n; ++i) buf[i] = x[i] * w[i];
    kestaccel::FFTState_Double* state = nullptr;
    kt::FFTInit(&state, OrderOf(n));
    kt::FFTFwd(buf.data(), buf.data(), state, nullptr);
    kt::FFTFree(state);
    // A sine of amplitude A away from DC and Nyquist puts n A^2 / 4 sum(w^2)
    // into the bins 0 .. n/2 (Parseval).
    const double reference = double(n) * amplitude * amplitude / 4 * w2;
    const double halfWidth = std::sqrt(1 + (beta / pi) * (beta / pi)) + 2;  // the main lobe, in bins
    const double toneBin = frequency * n / rate;
    double tone = 0, rest = 0, above = 0;
    for (std::size_t k = 0; k <= n / 2; ++k) {
        const double p = buf[2 * k] * buf[2 * k] + buf[2 * k + 1] * buf[2 * k + 1];
        const bool inTone = frequency < rate / 2 && std::fabs(double(k) - toneBin) <= halfWidth;
        (inTone ? tone : rest) += p;
        if (!inTone && k * rate / n >= bandFrom) above += p;
    }
    ToneFigures t;
    t.gainDb = ToDb(tone / reference);
    t.snrDb = ToDb(tone) - ToDb(rest);
    t.aboveDb = ToDb(reference) - ToDb(above);
    t.totalDb = ToDb(reference) - ToDb(tone + rest);
    return t;
}

}  // namespace kestaudio
