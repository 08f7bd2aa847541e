#pragma once

#include <cstddef>

// Moves between one interleaved buffer of frames and one buffer per channel.
// Element c of frame f sits at index f * channels + c of the interleaved
// buffer. The loops walk the interleaved buffer in memory order (frames
// outer, channels inner) and keep the ascending order of the scalar loop, so
// overlapping buffers see the values already written.
namespace kestaccel {
namespace utility {
namespace cpp {

template <class T>
void Interleave(unsigned int count, const T* a, const T* b, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) {
        dst[2 * i] = a[i];
        dst[2 * i + 1] = b[i];
    }
}

template <class T>
void Deinterleave(unsigned int count, const T* src, T* a, T* b)
{
    for (std::size_t i = 0; i < count; ++i) {
        a[i] = src[2 * i];
        b[i] = src[2 * i + 1];
    }
}

// The pointer array is read for every element, not cached: the caller keeps
// it valid and unchanged for the whole call.
template <class T>
void Interleave(unsigned int channels, unsigned int frames, const T* const* sources, T* dst)
{
    std::size_t next = 0;
    for (std::size_t f = 0; f < frames; ++f) {
        for (std::size_t c = 0; c < channels; ++c) dst[next++] = sources[c][f];
    }
}

template <class T>
void Deinterleave(unsigned int channels, unsigned int frames, const T* src, T* const* destinations)
{
    std::size_t next = 0;
    for (std::size_t f = 0; f < frames; ++f) {
        for (std::size_t c = 0; c < channels; ++c) destinations[c][f] = src[next++];
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
