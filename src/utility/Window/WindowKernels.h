#pragma once

#include <cmath>

#include "utility/Window/BesselI0.h"

// Windows multiplied into a source. Only the first half of each window is
// evaluated: every factor serves sample i and its mirror n - 1 - i, so the
// two halves agree bit for bit. The windows are symmetric (denominator
// n - 1), not periodic. For odd n the cosine windows write the centre twice
// from the same factor, which in place multiplies it twice; Kaiser writes
// it once.
namespace kestaccel {
namespace utility {
namespace cpp {

// Constants of each element type. The float values are the float nearest to
// each decimal, not the double values narrowed in a wider computation.
template <class T>
struct WindowConstants;

template <>
struct WindowConstants<float> {
    static constexpr float kTwoPi = 6.2831855f;  // 0x40C90FDB
    static constexpr float kHalf = 0.5f;
    static constexpr float kHamming0 = 0.54f;  // 0x3F0A3D71
    static constexpr float kHamming1 = 0.46f;  // 0x3EEB851F
};

template <>
struct WindowConstants<double> {
    static constexpr double kTwoPi = 6.283185307179586;  // 0x401921FB54442D18
    static constexpr double kHalf = 0.5;
    static constexpr double kHamming0 = 0.54;
    static constexpr double kHamming1 = 0.46;
};

// Half the samples rounded up: the pairs (i, n - 1 - i) the loop visits.
inline unsigned int WindowHalf(unsigned int n) { return (n >> 1) + (n & 1u); }

// x = i * 2pi / (n - 1), multiplied first and divided second. For n = 1 this
// is 0/0, and the NaN reaches every cosine window's only sample.
template <class T>
T WindowAngle(unsigned int i, unsigned int n)
{
    return static_cast<T>(i) * WindowConstants<T>::kTwoPi / static_cast<T>(n - 1u);
}

// The mirrored store reads src after dst[i] is written, so in place the
// centre of an odd window is multiplied by its own (near 1) factor twice.
template <class T, class Factor>
void ApplySymmetricWindow(unsigned int n, const T* src, T* dst, Factor factor)
{
    const unsigned int half = WindowHalf(n);
    for (unsigned int i = 0; i < half; ++i) {
        const T w = factor(i);
        dst[i] = w * src[i];
        const unsigned int mirror = n - 1u - i;
        dst[mirror] = w * src[mirror];
    }
}

// Triangle: 2i / (n - 1), exactly 0 at i = 0 and 1 at the centre.
template <class T>
void WindowBartlett(unsigned int n, const T* src, T* dst)
{
    const T denominator = static_cast<T>(n - 1u);
    ApplySymmetricWindow(n, src, dst, [denominator](unsigned int i) {
        const T t = static_cast<T>(i);
        return (t + t) / denominator;
    });
}

template <class T>
void WindowHann(unsigned int n, const T* src, T* dst)
{
    using K = WindowConstants<T>;
    ApplySymmetricWindow(n, src, dst, [n](unsigned int i) {
        return K::kHalf - std::cos(WindowAngle<T>(i, n)) * K::kHalf;
    });
}

template <class T>
void WindowHamming(unsigned int n, const T* src, T* dst)
{
    using K = WindowConstants<T>;
    ApplySymmetricWindow(n, src, dst, [n](unsigned int i) {
        return K::kHamming0 - std::cos(WindowAngle<T>(i, n)) * K::kHamming1;
    });
}

// (alpha + 1)/2 - cos(x)/2 - (alpha/2) cos(2x); alpha = -0.16 is the classic
// Blackman window.
inline void WindowBlackman(unsigned int n, const float* src, float* dst, float alpha)
{
    ApplySymmetricWindow(n, src, dst, [n, alpha](unsigned int i) {
        const float x = WindowAngle<float>(i, n);
        return (alpha + 1.0f) * 0.5f - std::cos(x) * 0.5f - std::cos(x + x) * (alpha * 0.5f);
    });
}

// The double member takes both cosines in single precision (the angle
// narrowed to float, the cosine widened back), so it is only about as
// accurate as the float member; all the rest is double.
inline void WindowBlackman(unsigned int n, const double* src, double* dst, double alpha)
{
    ApplySymmetricWindow(n, src, dst, [n, alpha](unsigned int i) {
        const double x = WindowAngle<double>(i, n);
        const double cos1 = static_cast<double>(std::cos(static_cast<float>(x)));
        const double cos2 = static_cast<double>(std::cos(static_cast<float>(x + x)));
        return (alpha + 1.0) * 0.5 - cos1 * 0.5 - cos2 * (alpha * 0.5);
    });
}

// Kaiser window with alpha as the factor on the distance from the centre:
// the usual shape parameter is alpha * (n - 1) / 2. Every step is double;
// the float member rounds each factor to float before multiplying. The
// centre of an odd window is written once.
template <class T>
void WindowKaiser(unsigned int n, const T* src, T* dst, T alpha)
{
    const double a = static_cast<double>(alpha);
    const double m = static_cast<double>(n - 1u) * 0.5;
    const double m2 = m * m;
    const double inv = 1.0 / BesselI0(a * m);
    const unsigned int half = (n + 1u) >> 1;
    const unsigned int pairs = n >> 1;
    for (unsigned int i = 0; i < half; ++i) {
        const double d = static_cast<double>(i) - m;
        const double r = std::sqrt(m2 - d * d);
        const T w = static_cast<T>(BesselI0(r * a) * inv);
        dst[i] = w * src[i];
        if (i < pairs) {
            const unsigned int mirror = n - 1u - i;
            dst[mirror] = w * src[mirror];
        }
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
