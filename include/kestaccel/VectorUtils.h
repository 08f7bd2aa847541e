#pragma once

// Buffer primitives, floating-point mode controls, sample conversion and
// byte order.
//
// Counts are numbers of elements, never bytes. Sources and destinations
// belong to the caller; a count of 0 touches no pointer.

#include <complex>

#include <kestcore/utility/int24_t.h>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// ---------------------------------------------------------------------------
// Buffer allocation.
//
// Malloc_* returns a plain heap block of count elements (never null; throws
// std::bad_alloc when memory runs out). Only the complex forms initialise
// their elements, to (0, 0). Every block goes back through Free, and Free of
// any overload accepts a block of any other type and a null pointer.
// ---------------------------------------------------------------------------
KESTACCEL_API unsigned char* Malloc_Byte(unsigned int count);
KESTACCEL_API short* Malloc_Int16(unsigned int count);
KESTACCEL_API float* Malloc_Float(unsigned int count);
KESTACCEL_API double* Malloc_Double(unsigned int count);
KESTACCEL_API std::complex<float>* Malloc_Complex_Float(unsigned int count);
KESTACCEL_API std::complex<double>* Malloc_Complex_Double(unsigned int count);

KESTACCEL_API void Free(unsigned char* buffer);
KESTACCEL_API void Free(short* buffer);
KESTACCEL_API void Free(float* buffer);
KESTACCEL_API void Free(double* buffer);
KESTACCEL_API void Free(std::complex<float>* buffer);
KESTACCEL_API void Free(std::complex<double>* buffer);

// ---------------------------------------------------------------------------
// Copy, Move, Zero: block copy (no overlap), block move (overlap allowed),
// clear to all-zero bytes. The byte count count * sizeof(T) is formed in
// 32-bit unsigned arithmetic and wraps at 4 GiB: Copy of 1073741824 floats
// copies nothing, of 1073741825 floats one. The byte overloads do not wrap.
// The overload sets are deliberately uneven (no Move of int or signed char).
// ---------------------------------------------------------------------------
KESTACCEL_API void Copy(unsigned int count, const unsigned char* src, unsigned char* dst);
KESTACCEL_API void Copy(unsigned int count, const signed char* src, signed char* dst);
KESTACCEL_API void Copy(unsigned int count, const short* src, short* dst);
KESTACCEL_API void Copy(unsigned int count, const int* src, int* dst);
KESTACCEL_API void Copy(unsigned int count, const unsigned int* src, unsigned int* dst);
KESTACCEL_API void Copy(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Copy(unsigned int count, const double* src, double* dst);

KESTACCEL_API void Move(unsigned int count, const unsigned char* src, unsigned char* dst);
KESTACCEL_API void Move(unsigned int count, const short* src, short* dst);
KESTACCEL_API void Move(unsigned int count, const unsigned int* src, unsigned int* dst);
KESTACCEL_API void Move(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Move(unsigned int count, const double* src, double* dst);

KESTACCEL_API void Zero(unsigned int count, unsigned char* dst);
KESTACCEL_API void Zero(unsigned int count, short* dst);
KESTACCEL_API void Zero(unsigned int count, int* dst);
KESTACCEL_API void Zero(unsigned int count, unsigned int* dst);
KESTACCEL_API void Zero(unsigned int count, float* dst);
KESTACCEL_API void Zero(unsigned int count, double* dst);

// Set: every element becomes value. A value that compares equal to zero
// (-0.0 included) clears the buffer as Zero does, 32-bit byte count and all,
// so -0.0 stores +0.0; any other value (NaN included) is stored as it is,
// element by element, with no 4 GiB wrap.
KESTACCEL_API void Set(unsigned int count, unsigned char* dst, unsigned char value);
KESTACCEL_API void Set(unsigned int count, short* dst, short value);
KESTACCEL_API void Set(unsigned int count, int* dst, int value);
KESTACCEL_API void Set(unsigned int count, unsigned int* dst, unsigned int value);
KESTACCEL_API void Set(unsigned int count, float* dst, float value);
KESTACCEL_API void Set(unsigned int count, double* dst, double value);

// Equal: true when the count bytes are the same (true for count 0).
KESTACCEL_API bool Equal(unsigned int count, const unsigned char* a, const unsigned char* b);

// ---------------------------------------------------------------------------
// Floating-point mode controls. Placeholders: every Get answers false and
// every Set does nothing. The library never reads or changes the processor's
// floating-point control state; denormals behave as the caller's thread has
// set them up.
// ---------------------------------------------------------------------------
KESTACCEL_API bool GetDenormalsAreZero();
KESTACCEL_API void SetDenormalsAreZero(bool enable);
KESTACCEL_API bool GetFlushDenormalsToZero();
KESTACCEL_API void SetFlushDenormalsToZero(bool enable);
KESTACCEL_API bool GetDenormalExceptionsEnabled();
KESTACCEL_API void SetDenormalExceptionsEnabled(bool enable);

// ---------------------------------------------------------------------------
// Sample conversion (Convert).
// ---------------------------------------------------------------------------
//
// Full scale goes through a binary exponent `scale`: the multiplier is
// 2^-scale in both directions, so 15, 23 and 31 bring short, 24-bit and int
// samples to +-1, and -15, -23, -31 take floating samples back. scale 0
// means no multiplier (and, from floating data, no source limit).
//
// Integer to floating: the multiplier is pow(2.0, -scale) in double, narrowed
// to float for a float destination, then one multiplication in the
// destination's type. 8-bit samples are unsigned, taken by value (0 to 255),
// with no scale at all.
//
// Floating to integer: the multiplier m is powf(2.0f, -scale) in float. Each
// source x becomes m if x >= 1, -m if x <= -1, otherwise x * m (a NaN lands
// there), then round == true rounds halfway cases away from zero (lroundf,
// independent of the rounding mode), round == false truncates toward zero.
// NaN and results outside int give -2147483648. The 32-bit result is stored
// as is in int, wrapped to the low 8 or 16 bits (no limit: at scale -15 a
// source of +1.0 gives 32768, stored as -32768; at scale -7 both +1.0 and
// -1.0 give 128 in 8 bits), and saturated only for int24_t.
//
// double to int: the same with lround, comparisons against the doubles +-1,
// m still the float from powf; limited elements are the integers of the
// float +-m, the others of (double)m * x.
//
// int to int24_t: an arithmetic right shift by the low five bits of scale
// (the opposite sign of the floating exponents), then saturation.
// int24_t to int: sign extension of bit 23, no shift.
// float <-> double: plain IEEE conversions, no limit, no scale; a NaN gives
// a NaN, its payload not promised.
//
// These fifteen overloads are the whole set: there is no double to 8, 16 or
// 24 bits, no 8- or 24-bit to double, and no short <-> int.
// ---------------------------------------------------------------------------
KESTACCEL_API void Convert(unsigned int count, const unsigned char* src, float* dst);
KESTACCEL_API void Convert(unsigned int count, const short* src, float* dst, int scale);
KESTACCEL_API void Convert(unsigned int count, const short* src, double* dst, int scale);
KESTACCEL_API void Convert(unsigned int count, const int* src, float* dst, int scale);
KESTACCEL_API void Convert(unsigned int count, const int* src, double* dst, int scale);
KESTACCEL_API void Convert(unsigned int count, const int* src, kestcore::utility::int24_t* dst, int scale);
KESTACCEL_API void Convert(unsigned int count, const float* src, unsigned char* dst, int scale, bool round);
KESTACCEL_API void Convert(unsigned int count, const float* src, short* dst, int scale, bool round);
KESTACCEL_API void Convert(unsigned int count, const float* src, int* dst, int scale, bool round);
KESTACCEL_API void Convert(unsigned int count, const float* src, double* dst);
KESTACCEL_API void Convert(unsigned int count, const float* src, kestcore::utility::int24_t* dst, int scale, bool round);
KESTACCEL_API void Convert(unsigned int count, const double* src, int* dst, int scale, bool round);
KESTACCEL_API void Convert(unsigned int count, const double* src, float* dst);
KESTACCEL_API void Convert(unsigned int count, const kestcore::utility::int24_t* src, int* dst);
KESTACCEL_API void Convert(unsigned int count, const kestcore::utility::int24_t* src, float* dst, int scale);

// ---------------------------------------------------------------------------
// Byte order (SwapBytes).
// ---------------------------------------------------------------------------
//
// Reverses the bytes of each word: 16-bit words exchange their two bytes,
// 32- and 64-bit words are reversed in full, and a packed 24-bit word
// exchanges bytes 0 and 2 and keeps byte 1. The in-place form takes
// (count, data); the other writes to dst and leaves src untouched, and with
// src == dst it gives the in-place result. Elements go in ascending order;
// swapping twice gives the data back. There is no SwapBytes of floats.
// ---------------------------------------------------------------------------
KESTACCEL_API void SwapBytes(unsigned int count, unsigned short* data);
KESTACCEL_API void SwapBytes(unsigned int count, unsigned int* data);
KESTACCEL_API void SwapBytes(unsigned int count, kestcore::utility::int24_t* data);
KESTACCEL_API void SwapBytes(unsigned int count, unsigned long long* data);
KESTACCEL_API void SwapBytes(unsigned int count, const unsigned short* src, unsigned short* dst);
KESTACCEL_API void SwapBytes(unsigned int count, const unsigned int* src, unsigned int* dst);
KESTACCEL_API void SwapBytes(unsigned int count, const kestcore::utility::int24_t* src, kestcore::utility::int24_t* dst);
KESTACCEL_API void SwapBytes(unsigned int count, const unsigned long long* src, unsigned long long* dst);

}  // namespace utility
}  // namespace kestaccel
