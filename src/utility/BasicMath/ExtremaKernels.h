#pragma once

#include <cstddef>

// Extrema of one vector, and the element-wise maximum and minimum of two.
// The scans keep positions, not values, and each comparison is strict, so a
// NaN never wins a comparison: which of several equal (or unordered)
// elements is reported follows from the exact form of each test, and the
// forms below differ on purpose.
namespace kestaccel {
namespace utility {
namespace cpp {

// First of the largest elements; a NaN at position 0 is never displaced.
template <class T>
std::size_t FirstMaxPosition(unsigned int count, const T* src)
{
    std::size_t best = 0;
    for (std::size_t i = 1; i < count; ++i)
        if (src[i] > src[best]) best = i;
    return best;
}

template <class T>
std::size_t FirstMinPosition(unsigned int count, const T* src)
{
    std::size_t best = 0;
    for (std::size_t i = 1; i < count; ++i)
        if (src[best] > src[i]) best = i;
    return best;
}

// Max and Min read element 0 even for count 0.
template <class T>
T Max(unsigned int count, const T* src)
{
    return src[FirstMaxPosition(count, src)];
}

template <class T>
T Min(unsigned int count, const T* src)
{
    return src[FirstMinPosition(count, src)];
}

inline unsigned int MaxIndex(unsigned int count, const float* src, float* value)
{
    const std::size_t best = FirstMaxPosition(count, src);
    if (value != nullptr) *value = src[best];
    return static_cast<unsigned int>(best);
}

inline unsigned int MinIndex(unsigned int count, const float* src, float* value)
{
    const std::size_t best = FirstMinPosition(count, src);
    if (value != nullptr) *value = src[best];
    return static_cast<unsigned int>(best);
}

// The paired scan: elements are taken two at a time from `start`; the smaller
// of a pair is tested against the minimum and the larger against the
// maximum. The maximum test is inverted ("not current > candidate"), so an
// element equal to the maximum moves it on: `lo` ends at the first of the
// smallest elements and `hi` at the last of the largest.
//
// The order within a pair is random on real data, so it becomes an index
// offset rather than a branch; the tests against the running extremes
// rarely fire and stay branches. The extremes' values are kept beside their
// positions; they are copies of src[lo] and src[hi], so every comparison is
// the one made on the elements themselves.
inline void PairedScan(unsigned int count, const float* src, std::size_t start, std::size_t& lo, std::size_t& hi)
{
    float loValue = src[lo];
    float hiValue = src[hi];
    std::size_t i = start;
    for (; i + 1 < count; i += 2) {
        const std::size_t smaller = i + (src[i] > src[i + 1] ? 1 : 0);
        const std::size_t larger = (2 * i + 1) - smaller;
        if (loValue > src[smaller]) {
            lo = smaller;
            loValue = src[smaller];
        }
        if (!(hiValue > src[larger])) {
            hi = larger;
            hiValue = src[larger];
        }
    }
    // A last single element: the maximum is tested only when the minimum
    // test fails.
    if (i + 1 == count) {
        if (loValue > src[i])
            lo = i;
        else if (!(hiValue > src[i]))
            hi = i;
    }
}

// Count 0 still reads element 0, as count 1 does.
inline void MinMaxIndex(unsigned int count, const float* src, float& minimum, float& maximum,
                        unsigned int& minimumIndex, unsigned int& maximumIndex)
{
    std::size_t lo = 0;
    std::size_t hi = 0;
    PairedScan(count, src, 1, lo, hi);
    minimum = src[lo];
    maximum = src[hi];
    minimumIndex = static_cast<unsigned int>(lo);
    maximumIndex = static_cast<unsigned int>(hi);
}

inline void MinMax(unsigned int count, const float* src, float& minimum, float& maximum)
{
    std::size_t lo = 0;
    std::size_t hi = 0;
    PairedScan(count, src, 1, lo, hi);
    minimum = src[lo];
    maximum = src[hi];
}

// Peak magnitude: the larger of -minimum and maximum, found without a pass
// of absolute values. Elements 0 and 1 form the first pair here, which only
// matters when NaNs are present. A NaN on either side yields src[hi].
inline float MinMax(const float* src, unsigned int count)
{
    if (count == 0) return 0.0f;
    std::size_t lo = 0;
    std::size_t hi = 0;
    if (count > 1) {
        if (src[0] > src[1])
            lo = 1;
        else
            hi = 1;
    }
    PairedScan(count, src, 2, lo, hi);
    const float negatedMinimum = -src[lo];
    return negatedMinimum > src[hi] ? negatedMinimum : src[hi];
}

// Element-wise selection copies the chosen operand unchanged. When the test
// is false (equal values, +0 against -0, or a NaN on either side) the first
// vector's element is taken. The loops have no order-dependent result and
// vectorise as compare-and-blend.
inline void MaxEvery(unsigned int count, const float* a, const float* b, float* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = b[i] > a[i] ? b[i] : a[i];
}

inline void MaxEvery_InPlace(unsigned int count, const float* src, float* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] > src[i] ? srcDst[i] : src[i];
}

inline void MinEvery(unsigned int count, const float* a, const float* b, float* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = a[i] > b[i] ? b[i] : a[i];
}

inline void MinEvery_InPlace(unsigned int count, const float* src, float* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = src[i] > srcDst[i] ? srcDst[i] : src[i];
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
