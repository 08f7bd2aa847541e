#pragma once

#include <math.h>

#if defined(_WIN64)
// The single-precision hypotenuse of the Windows runtime. Its header declares
// it for 32-bit x86 only; the 64-bit runtime exports it all the same, while
// the header's hypotf there is an inline that widens to double.
extern "C" float __cdecl _hypotf(float x, float y);
#endif

// The mathematical runtime in the element's own precision. A float member
// must call the single-precision function (expf, not exp on a widened value),
// because the two round differently; these overloads make the choice by the
// argument type, so a kernel template can never widen by accident.
namespace kestaccel {
namespace utility {
namespace cpp {
namespace runtime {

inline float Exp(float x) { return ::expf(x); }
inline double Exp(double x) { return ::exp(x); }

inline float Log(float x) { return ::logf(x); }
inline double Log(double x) { return ::log(x); }

inline float Pow(float x, float y) { return ::powf(x, y); }
inline double Pow(double x, double y) { return ::pow(x, y); }

inline float Sqrt(float x) { return ::sqrtf(x); }
inline double Sqrt(double x) { return ::sqrt(x); }

inline float Round(float x) { return ::roundf(x); }
inline double Round(double x) { return ::round(x); }

// The hypotenuse without overflow in the intermediate squares.
#if defined(_WIN32)
inline float Hypot(float x, float y) { return ::_hypotf(x, y); }
#else
inline float Hypot(float x, float y) { return ::hypotf(x, y); }
#endif
inline double Hypot(double x, double y) { return ::hypot(x, y); }

}  // namespace runtime
}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
