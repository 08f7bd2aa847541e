#pragma once

#include <cstddef>

// Clipping and ramps. Each element is tested once, strictly, and passes
// through unchanged when the test is false: an element equal to the level,
// a NaN element and a NaN level all leave the element's own bits in place.
// The loops have independent elements and vectorise as compare-and-blend.
namespace kestaccel {
namespace utility {
namespace cpp {

template <class T>
void Threshold_LT_InPlace(unsigned int count, T* srcDst, T level)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = level > srcDst[i] ? level : srcDst[i];
}

template <class T>
void Threshold_GT_InPlace(unsigned int count, T* srcDst, T level)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = level < srcDst[i] ? level : srcDst[i];
}

// `value` goes in as given, whichever side of the level it lies on.
template <class T>
void Threshold_LTVal(unsigned int count, const T* src, T* dst, T level, T value)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = level > src[i] ? value : src[i];
}

template <class T>
void Threshold_LTVal_InPlace(unsigned int count, T* srcDst, T level, T value)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = level > srcDst[i] ? value : srcDst[i];
}

template <class T>
void Threshold_GTVal(unsigned int count, const T* src, T* dst, T level, T value)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = src[i] > level ? value : src[i];
}

template <class T>
void Threshold_GTVal_InPlace(unsigned int count, T* srcDst, T level, T value)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] > level ? value : srcDst[i];
}

// The low side is tested first and wins, so with low above high every
// element below low becomes low and every other one becomes high.
inline void Trim(unsigned int count, float* srcDst, float low, float high)
{
    for (std::size_t i = 0; i < count; ++i) {
        const float x = srcDst[i];
        srcDst[i] = low > x ? low : (high < x ? high : x);
    }
}

// Each element comes from its own index, never from a running sum, so there
// is no drift. The index is converted from its unsigned 32-bit value (for
// float it rounds to 24 bits above 2^24); the product and the sum are
// rounded separately.
template <class T>
void VectorSlope(unsigned int count, T* dst, T offset, T slope)
{
    for (unsigned int i = 0; i < count; ++i) dst[i] = static_cast<T>(i) * slope + offset;
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
