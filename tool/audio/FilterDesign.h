#pragma once

// Filter design for the tool: window-method FIR filters on the library's
// lowpass design and Kaiser window, Butterworth biquad cascades, and the
// response figures the tool reports.

#include <vector>

namespace kestaudio {

// Kaiser's shape parameter for a stopband attenuation in dB.
double KaiserBeta(double attenuationDb);

// `taps` taps of a linear-phase lowpass with its -6 dB point at `cutoff`
// (a fraction of the sampling rate), Kaiser window `beta`, DC gain `gain`.
std::vector<double> DesignLowpass(double cutoff, unsigned int taps, double beta, double gain);

enum class Band { Lowpass, Highpass, Bandpass };

// Odd-length FIR filters (a highpass is a delayed impulse minus a lowpass,
// a bandpass the difference of two lowpasses). Frequencies in Hz.
std::vector<double> DesignFir(Band band, double f1, double f2, double rate, unsigned int taps);

// `sections` biquads of a Butterworth response (a bandpass splits them
// between a highpass at f1 and a lowpass at f2), six taps each, b0 b1 b2 a0
// a1 a2 with a0 = 1: the library scales every section by the first one's a0.
std::vector<double> DesignButterworth(Band band, double f1, double f2, double rate, unsigned int sections);

// |H| in dB of an FIR filter at `frequency`, a fraction of its rate.
double FirResponseDb(const std::vector<double>& taps, double frequency);

struct ResponseFigures {
    double passbandRippleDb;     // peak-to-peak over the passband
    double stopbandAttenuationDb;  // below the passband's mean gain, at the worst stopband frequency
};
// Over [0, passEnd] and [stopStart, 0.5], fractions of the rate.
ResponseFigures FirResponseFigures(const std::vector<double>& taps, double passEnd, double stopStart);

}  // namespace kestaudio
