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
// @@section sample-conversion

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
