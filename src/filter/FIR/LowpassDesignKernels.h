#pragma once

#include <cmath>

#include "kestaccel/Common.h"
#include "utility/BasicMath/ReductionKernels.h"
#include "utility/Window/WindowKernels.h"

// Lowpass taps by the window method: an ideal lowpass impulse response
// sampled around the array's centre, windowed in place, and optionally
// scaled to unit gain at zero frequency. Everything is double.
namespace kestaccel {
namespace filter {
namespace cpp {

// The abscissa advances by repeated addition of pi, not by i * pi: its
// rounding is part of the taps. Each value is written to both sides, so the
// sinc is exactly symmetric before the window.
inline void WriteSinc(double c, unsigned int tapCount, double* taps)
{
    const double kPi = 3.141592653589793;
    const unsigned int h = tapCount >> 1;
    if (tapCount & 1u) {
        taps[h] = c;
        double x = kPi;
        for (unsigned int i = 1; i <= h; ++i) {
            const double value = std::sin(x * c) / x;
            x += kPi;
            taps[h + i] = value;
            taps[h - i] = value;
        }
    } else {
        double x = 1.5707963267948966;
        for (unsigned int i = 0; i < h; ++i) {
            const double value = std::sin(x * c) / x;
            x += kPi;
            taps[h + i] = value;
            taps[h - 1 - i] = value;
        }
    }
}

// Values other than the three named windows, 1 included, apply none.
inline void ApplyDesignWindow(utility::DSPWindowType windowType, unsigned int tapCount, double* taps)
{
    switch (windowType) {
    case utility::kDSPWindowBartlett: utility::cpp::WindowBartlett(tapCount, taps, taps); break;
    case utility::kDSPWindowHamming: utility::cpp::WindowHamming(tapCount, taps, taps); break;
    case utility::kDSPWindowHann: utility::cpp::WindowHann(tapCount, taps, taps); break;
    default: break;
    }
}

// Only the left half is summed and counted twice; the windows are exactly
// symmetric, so the right half would add the same. The gain divides by the
// size of the whole sum, so a negative sum keeps its sign and scales to -1.
// One division in all.
inline void NormaliseToUnitSum(unsigned int tapCount, double* taps)
{
    const unsigned int h = tapCount >> 1;
    const double centre = (tapCount & 1u) ? taps[h] : 0.0;
    const double leftHalf = utility::cpp::Sum(h, static_cast<const double*>(taps));
    const double gain = 1.0 / std::fabs(leftHalf * 2.0 + centre);
    for (unsigned int i = 0; i < tapCount; ++i) taps[i] = taps[i] * gain;
}

// The work buffer exists for the interface only and is never touched.
inline void GenerateLowpassFIRCoefficients(double cutoff, unsigned int tapCount, double* taps,
                                           utility::DSPWindowType windowType, bool normalize,
                                           unsigned char* /*workBuffer*/)
{
    WriteSinc(cutoff + cutoff, tapCount, taps);
    ApplyDesignWindow(windowType, tapCount, taps);
    if (normalize) NormaliseToUnitSum(tapCount, taps);
}

}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
