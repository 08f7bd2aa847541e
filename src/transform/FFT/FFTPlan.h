#pragma once

// The plan record embedded in every FFT state, and the growable scratch
// arrays it owns. A plan is built once (PlanKernels.h); afterwards the
// transforms only read its tables, and the real and deinterleaved ones
// resize and write its scratch vectors.

#include <cstdint>

#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace transform {
namespace cpp {

inline float* AllocateScratch(unsigned int count, float*) { return utility::cpp::Malloc_Float(count); }
inline double* AllocateScratch(unsigned int count, double*) { return utility::cpp::Malloc_Double(count); }

// Begin, end and end of capacity, like a vector, but its storage comes from
// Malloc_Float / Malloc_Double and goes back through Free. The plan reserves
// the capacity a transform needs, so the transform's Resize never allocates.
template <class E>
struct ScratchVector {
    E* begin = nullptr;
    E* end = nullptr;
    E* capacityEnd = nullptr;

    E* data() const { return begin; }
    unsigned int size() const { return static_cast<unsigned int>(end - begin); }
    unsigned int capacity() const { return static_cast<unsigned int>(capacityEnd - begin); }

    // Capacity becomes exactly n; the elements that fit are kept.
    void Reserve(unsigned int n)
    {
        E* block = AllocateScratch(n, static_cast<E*>(nullptr));
        const unsigned int kept = size() < n ? size() : n;
        for (unsigned int i = 0; i < kept; ++i) block[i] = begin[i];
        Release();
        begin = block;
        end = block + kept;
        capacityEnd = block + n;
    }

    // Grows the capacity only when n exceeds it; a longer array gets a
    // zero-filled tail, a shorter one is cut.
    void Resize(unsigned int n)
    {
        if (n > capacity()) Reserve(n);
        for (E* p = end; p < begin + n; ++p) *p = E(0);
        end = begin + n;
    }

    void Release()
    {
        if (begin != nullptr) utility::cpp::Free(begin);
        begin = end = capacityEnd = nullptr;
    }
};

// kind of BuildFFTPlan: 1 builds a complex plan, anything else a real one.
constexpr unsigned int kComplexPlan = 1;
constexpr unsigned int kRealPlan = 0;

// A complex plan of `size` points carries the bit-reversal swap table, size/2
// twiddle pairs and the interleave scratch. A real plan of `size` samples
// carries a complex half plan, size/2 - 1 twiddle pairs and the forward and
// inverse scratch. Value-initialise (FFTPlan<E>{}) before building.
template <class E>
struct FFTPlan {
    std::uint32_t size;
    std::uint32_t order;
    std::uint32_t* swapTable;
    E* twiddles;  // interleaved (re, im) pairs
    FFTPlan* halfPlan;
    ScratchVector<E> forwardScratch;
    ScratchVector<E> inverseScratch;
    ScratchVector<E> interleaveScratch;
};

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
