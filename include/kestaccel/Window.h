#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// ---------------------------------------------------------------------------
// Window functions, float and double.
//
// Each call multiplies src by a symmetric window of n samples (denominator
// n - 1, not the periodic form) and writes dst; pass ones to get the window
// itself. Only the first half of the window is evaluated and each factor is
// used for sample i and its mirror n - 1 - i, so both halves agree bit for
// bit. src may equal dst. A count of 0 writes nothing.
//
//   WindowBartlett   2i / (n - 1)
//   WindowHann       0.5 - cos(x) * 0.5
//   WindowHamming    0.54 - cos(x) * 0.46        (0.54f and 0.46f for float)
//   WindowBlackman   (alpha + 1) * 0.5 - cos(x) * 0.5 - cos(x + x) * (alpha * 0.5)
//   WindowKaiser     I0(alpha * sqrt(m^2 - (i - m)^2)) / I0(alpha * m), m = (n - 1) / 2
//
// with x = i * 2pi / (n - 1) in the element type (2pi = 6.2831855f for
// float). Cosines are evaluated directly for each sample, with one
// exception: the double WindowBlackman takes both cosines in single
// precision, so its factors are only about float-accurate. The classic
// Blackman window is alpha = -0.16. The cosines are the runtime's (cosf,
// cos): Hann, Hamming and Blackman give the same bits wherever the runtimes
// agree, Bartlett and Kaiser on every build.
//
// WindowKaiser's alpha multiplies the distance from the centre; the usual
// shape parameter is alpha * (n - 1) / 2, so one alpha narrows as n grows.
// Its arithmetic is double in both members (the float member rounds each
// factor to float), with a fixed rational approximation of I0 that is
// accurate up to an argument of about 15 and meaningless beyond 33.5.
//
// n = 1: the four cosine-type windows divide 0 by 0 and write NaN whatever
// src holds; WindowKaiser writes src[0]. For odd n in place, the cosine
// windows multiply the centre by its factor twice (the factor is 1 up to
// rounding); WindowKaiser writes the centre once.
// ---------------------------------------------------------------------------
KESTACCEL_API void WindowBartlett(unsigned int n, const float* src, float* dst);
KESTACCEL_API void WindowBartlett(unsigned int n, const double* src, double* dst);
KESTACCEL_API void WindowHann(unsigned int n, const float* src, float* dst);
KESTACCEL_API void WindowHann(unsigned int n, const double* src, double* dst);
KESTACCEL_API void WindowHamming(unsigned int n, const float* src, float* dst);
KESTACCEL_API void WindowHamming(unsigned int n, const double* src, double* dst);
KESTACCEL_API void WindowBlackman(unsigned int n, const float* src, float* dst, float alpha);
KESTACCEL_API void WindowBlackman(unsigned int n, const double* src, double* dst, double alpha);
KESTACCEL_API void WindowKaiser(unsigned int n, const float* src, float* dst, float alpha);
KESTACCEL_API void WindowKaiser(unsigned int n, const double* src, double* dst, double alpha);

}  // namespace utility
}  // namespace kestaccel
