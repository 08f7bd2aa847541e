#pragma once

#include <climits>

namespace kestaccel {
namespace detail {

// Truncation toward zero to a 32-bit integer, with the result that x86
// conversion instructions give where C++ leaves the conversion undefined:
// a value outside the range of int, and a NaN, become -2147483648 (the
// integer indefinite value). Written as two selects so that loops that use
// it still vectorise, and so that no out-of-range value reaches the cast.
inline int TruncateToInt32(float value)
{
    const bool inRange = value >= -2147483648.0f && value < 2147483648.0f;
    const int truncated = static_cast<int>(inRange ? value : 0.0f);
    return inRange ? truncated : INT_MIN;
}

inline int TruncateToInt32(double value)
{
    const bool inRange = value > -2147483649.0 && value < 2147483648.0;
    const int truncated = static_cast<int>(inRange ? value : 0.0);
    return inRange ? truncated : INT_MIN;
}

}  // namespace detail
}  // namespace kestaccel
