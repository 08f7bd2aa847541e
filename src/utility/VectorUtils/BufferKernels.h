#pragma once

#include <complex>
#include <cstring>

namespace kestaccel {
namespace utility {
namespace cpp {

// Plain heap blocks: new T[count] and nothing more. The real forms leave the
// memory untouched; std::complex's default constructor writes (0, 0) into
// each element of the complex forms.
inline unsigned char* Malloc_Byte(unsigned int count) { return new unsigned char[count]; }
inline short* Malloc_Int16(unsigned int count) { return new short[count]; }
inline float* Malloc_Float(unsigned int count) { return new float[count]; }
inline double* Malloc_Double(unsigned int count) { return new double[count]; }
inline std::complex<float>* Malloc_Complex_Float(unsigned int count) { return new std::complex<float>[count]; }
inline std::complex<double>* Malloc_Complex_Double(unsigned int count) { return new std::complex<double>[count]; }

// Every element type is trivially destructible, so all overloads come to the
// same release and a block may go back through an overload of another type.
template <class T>
void Free(T* buffer)
{
    delete[] buffer;
}

// The byte count of Copy, Move and Zero is formed in 32 bits on purpose: a
// buffer of 4 GiB or more wraps, and that limit is part of these operations.
template <class T>
unsigned int ByteCount32(unsigned int count)
{
    return count * static_cast<unsigned int>(sizeof(T));
}

// Whether ByteCount32 has wrapped, so that a block operation moves less than
// `count` elements (at 4 GiB exactly, nothing).
template <class T>
bool ByteCountWraps(unsigned int count)
{
    return static_cast<unsigned long long>(count) * sizeof(T) != ByteCount32<T>(count);
}

template <class T>
void Copy(unsigned int count, const T* src, T* dst)
{
    const unsigned int bytes = ByteCount32<T>(count);
    if (bytes != 0) {
        std::memcpy(dst, src, bytes);
    }
}

template <class T>
void Move(unsigned int count, const T* src, T* dst)
{
    const unsigned int bytes = ByteCount32<T>(count);
    if (bytes != 0) {
        std::memmove(dst, src, bytes);
    }
}

template <class T>
void Zero(unsigned int count, T* dst)
{
    const unsigned int bytes = ByteCount32<T>(count);
    if (bytes != 0) {
        std::memset(dst, 0, bytes);
    }
}

// A value equal to zero takes the block-clear path (so -0.0 stores +0.0, with
// Zero's 32-bit byte count); any other value is stored element by element in
// full width. The two paths differ for 4 GiB buffers, and that is kept.
template <class T>
void Set(unsigned int count, T* dst, T value)
{
    if (count == 0) {
        return;
    }
    if (value == T(0)) {
        Zero(count, dst);
        return;
    }
    for (std::size_t i = 0; i < count; ++i) {
        dst[i] = value;
    }
}

inline void Set(unsigned int count, unsigned char* dst, unsigned char value)
{
    if (count != 0) {
        std::memset(dst, value, count);
    }
}

inline bool Equal(unsigned int count, const unsigned char* a, const unsigned char* b)
{
    return std::memcmp(a, b, count) == 0;
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
