#pragma once

// Spectra on the library's real FFT: an averaged magnitude spectrum with a
// coarse spectrogram beside it for the tool, and the measurement of one tone
// (its gain, what else the signal holds) for the reports.

#include <cstddef>
#include <cstdint>
#include <vector>

namespace kestaudio {

class SpectrumAnalyzer {
public:
    // Frames of 2^order samples, half overlapping, Kaiser-windowed. The
    // spectrogram has up to `columns` time slices over expectedFrames.
    SpectrumAnalyzer(unsigned int channels, double rate, std::uint64_t expectedFrames, unsigned int order = 13,
                     unsigned int columns = 160);
    ~SpectrumAnalyzer();
    SpectrumAnalyzer(const SpectrumAnalyzer&) = delete;
    SpectrumAnalyzer& operator=(const SpectrumAnalyzer&) = delete;

    void Add(const float* interleaved, std::size_t frames);

    unsigned int Size() const { return size; }
    double Rate() const { return rate; }
    // Per channel, bins 0 .. Size()/2, in dB relative to a full-scale sine.
    std::vector<std::vector<double>> AverageDb() const;
    // Per time slice, bins 0 .. Size()/2 averaged over the channels, in dB.
    std::vector<std::vector<double>> SpectrogramDb() const;

private:
    void Transform(unsigned int channel);

    unsigned int channels, size, columns;
    double rate;
    std::uint64_t expected, seen = 0;
    void* fft = nullptr;
    std::vector<float> window, frame, spectrum;
    std::vector<std::vector<float>> pending;  // per channel, the unprocessed tail
    std::vector<std::vector<double>> power;
    std::vector<std::uint64_t> frameCount;
    std::vector<std::vector<double>> slices;
    std::vector<std::uint64_t> sliceCount;
};

struct ToneFigures {
    double gainDb;      // the tone's amplitude over `amplitude`
    double snrDb;       // the tone over everything else
    double aboveDb;     // what lies at `bandFrom` Hz and above, below a sine of `amplitude`
    double totalDb;     // all of the signal, below a sine of `amplitude`
};
// Measures a sine of `frequency` Hz expected at `amplitude` in x (n a power
// of two), with a Kaiser window whose sidelobes lie below -220 dB.
ToneFigures MeasureTone(const double* x, std::size_t n, double rate, double frequency, double amplitude,
                        double bandFrom);

}  // namespace kestaudio
