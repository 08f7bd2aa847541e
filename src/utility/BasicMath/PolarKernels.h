#pragma once

#include <complex>
#include <cstddef>

#include <math.h>

#include "utility/BasicMath/RuntimeMath.h"

// Conversions between complex values and their size and angle. Magnitude goes
// through the runtime's hypotenuse and cannot overflow in between; the power
// spectrum and CartToPolar form re * re + im * im in the element's type and
// overflow above about 1.8e19 in float. The two are kept apart on purpose.
namespace kestaccel {
namespace utility {
namespace cpp {

template <class T>
void Magnitude(unsigned int count, const T* re, const T* im, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Hypot(re[i], im[i]);
}

template <class T>
void Magnitude(unsigned int count, const std::complex<T>* src, T* dst)
{
    const T* parts = reinterpret_cast<const T*>(src);
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Hypot(parts[2 * i], parts[2 * i + 1]);
}

template <class T>
void PowerSpectr(unsigned int count, const std::complex<T>* src, T* dst)
{
    const T* parts = reinterpret_cast<const T*>(src);
    for (std::size_t i = 0; i < count; ++i) {
        const T re = parts[2 * i], im = parts[2 * i + 1];
        dst[i] = re * re + im * im;
    }
}

// src holds (re, im) pairs. The magnitude is stored before src is read again
// for the phase, as the plain loop does, so magnitude must not overlap src.
inline void CartToPolar(unsigned int count, const float* src, float* magnitude, float* phase)
{
    for (std::size_t i = 0; i < count; ++i) {
        const float re = src[2 * i], im = src[2 * i + 1];
        magnitude[i] = ::sqrtf(re * re + im * im);
        phase[i] = ::atan2f(src[2 * i + 1], src[2 * i]);
    }
}

// dst receives 2 * count floats as (re, im) pairs.
inline void PolarToCart(unsigned int count, const float* magnitude, const float* phase, float* dst)
{
    for (std::size_t i = 0; i < count; ++i) {
        dst[2 * i] = ::cosf(phase[i]) * magnitude[i];
        dst[2 * i + 1] = ::sinf(phase[i]) * magnitude[i];
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
