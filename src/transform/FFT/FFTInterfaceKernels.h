#pragma once

// The state-level operations behind the public FFT entry points: creating
// and releasing states, and routing each transform to the real or complex
// kernels of the state's plan.

#include <complex>
#include <cstddef>
#include <cstdint>

#include "transform/FFT/ComplexKernels.h"
#include "transform/FFT/FFTStates.h"
#include "transform/FFT/PlanKernels.h"
#include "transform/FFT/RealKernels.h"
#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace transform {
namespace cpp {
inline namespace KESTACCEL_FFT_WIDTH_NAMESPACE {

template <class State>
void FreeState(State* state)
{
    if (state == nullptr) return;
    DestroyFFTPlan(state->plan);
    delete state;
}

// The argument is an order, not a length. A null pointer or order 0 leaves
// the caller's variable as it was; orders act through their low five bits.
// The plan builder's result is dropped: sizes 1 and 2 simply have no tables.
// An allocation that fails part way releases what was built before the
// exception goes on to the caller, whose variable is only written at the end.
template <class State>
void InitState(State** state, unsigned int order, unsigned int kind)
{
    if (state == nullptr || order == 0) return;
    State* created = new State{};
    created->order = order;
    created->size = 1u << (order & 31u);
    try {
        BuildFFTPlan(created->plan, kind, created->size);
    } catch (...) {
        FreeState(created);
        throw;
    }
    *state = created;
}

inline void FFTInit(FFTState_Float** state, unsigned int order) { InitState(state, order, kRealPlan); }
inline void FFTInit(FFTState_Double** state, unsigned int order) { InitState(state, order, kRealPlan); }
inline void FFTInit(FFTState_Complex_Float_Interleaved** state, unsigned int order) { InitState(state, order, kComplexPlan); }
inline void FFTInit(FFTState_Complex_Double_Interleaved** state, unsigned int order) { InitState(state, order, kComplexPlan); }
inline void FFTInit(FFTState_Complex_Float_Deinterleaved** state, unsigned int order) { InitState(state, order, kComplexPlan); }
inline void FFTInit(FFTState_Complex_Double_Deinterleaved** state, unsigned int order) { InitState(state, order, kComplexPlan); }

inline void FFTFree(FFTState_Float* state) { FreeState(state); }
inline void FFTFree(FFTState_Double* state) { FreeState(state); }
inline void FFTFree(FFTState_Complex_Float_Interleaved* state) { FreeState(state); }
inline void FFTFree(FFTState_Complex_Double_Interleaved* state) { FreeState(state); }
inline void FFTFree(FFTState_Complex_Float_Deinterleaved* state) { FreeState(state); }
inline void FFTFree(FFTState_Complex_Double_Deinterleaved* state) { FreeState(state); }

// The work lives in the plan's scratch vectors; no caller buffer is needed.
template <class State>
void GetBufSize(const State*, unsigned int* bufSize)
{
    *bufSize = 0;
}

inline void FFTGetBufSize(const FFTState_Float* state, unsigned int* bufSize) { GetBufSize(state, bufSize); }
inline void FFTGetBufSize(const FFTState_Double* state, unsigned int* bufSize) { GetBufSize(state, bufSize); }
inline void FFTGetBufSize(const FFTState_Complex_Float_Interleaved* state, unsigned int* bufSize) { GetBufSize(state, bufSize); }
inline void FFTGetBufSize(const FFTState_Complex_Double_Interleaved* state, unsigned int* bufSize) { GetBufSize(state, bufSize); }
inline void FFTGetBufSize(const FFTState_Complex_Float_Deinterleaved* state, unsigned int* bufSize) { GetBufSize(state, bufSize); }
inline void FFTGetBufSize(const FFTState_Complex_Double_Deinterleaved* state, unsigned int* bufSize) { GetBufSize(state, bufSize); }

// Whether two arrays of `count` elements share any element. Compared as
// integers: the arrays may be unrelated objects.
template <class E>
bool Overlap(const E* a, const E* b, std::size_t count)
{
    const auto x = reinterpret_cast<std::uintptr_t>(a), y = reinterpret_cast<std::uintptr_t>(b);
    const std::uintptr_t bytes = count * sizeof(E);
    return x < y + bytes && y < x + bytes;
}

// The staging moves and the real transforms' final copy form their byte
// count in 32 bits, as Move and Copy do. From 4 GiB of data on, the count
// wraps and they move too little or nothing: the paths that skip the staging
// for distinct buffers then give way to the literal steps, which keep that.
template <class E>
bool InterleavedMoveWraps(unsigned int size) { return utility::cpp::ByteCountWraps<E>(2 * size); }
template <class E>
bool DeinterleavedMoveWraps(unsigned int size) { return utility::cpp::ByteCountWraps<E>(size); }

// Interleaved complex: the result is that of moving the data into the
// destination (src == dst is fine) and transforming it there, so the state
// is only read and two threads may share it. Distinct arrays take the
// permuted copy instead of the move and the exchanges.
template <class State, class E>
void ComplexInterleaved(const std::complex<E>* src, std::complex<E>* dst, const State* state, bool inverse)
{
    const FFTPlan<E>& plan = state->plan;
    const E* from = reinterpret_cast<const E*>(src);
    E* to = reinterpret_cast<E*>(dst);
    const unsigned int count = 2 * state->size;
    if (!Overlap(from, to, count) && !InterleavedMoveWraps<E>(state->size)) {
        if (inverse) {
            PairsInto<E, true>(plan, from, to);
        } else {
            PairsInto<E, false>(plan, from, to);
        }
        return;
    }
    utility::cpp::Move(count, from, to);
    if (inverse) {
        ComplexFFTInverse(plan, to);
    } else {
        ComplexFFTForward(plan, to);
    }
}

// Deinterleaved complex: the result is that of staging the input in the
// destinations (which makes srcReal == dstReal and srcImag == dstImag
// work) and transforming it there. The stages run in the plan's interleave
// scratch, between the permutation that reads the source and the last
// stages that write the destinations; the staging copies are needed only
// when a source overlaps a destination.
template <class State, class E>
void ComplexDeinterleaved(const E* srcReal, const E* srcImag, E* dstReal, E* dstImag, State* state, bool inverse)
{
    FFTPlan<E>& plan = state->plan;
    const unsigned int n = plan.size;
    const bool distinct = !Overlap(srcReal, dstReal, n) && !Overlap(srcReal, dstImag, n) &&
                          !Overlap(srcImag, dstReal, n) && !Overlap(srcImag, dstImag, n);
    if (!distinct || DeinterleavedMoveWraps<E>(n)) {
        utility::cpp::Move(n, srcReal, dstReal);
        utility::cpp::Move(n, srcImag, dstImag);
        srcReal = dstReal;
        srcImag = dstImag;
    }
    plan.interleaveScratch.Resize(2 * n);
    E* work = plan.interleaveScratch.data();
    if (inverse) {
        SplitVia<E, true>(plan, srcReal, srcImag, work, dstReal, dstImag);
    } else {
        SplitVia<E, false>(plan, srcReal, srcImag, work, dstReal, dstImag);
    }
}

inline void FFTFwd(const float* src, float* dst, FFTState_Float* state, unsigned char*)
{
    RealFFTForward(state->plan, src, dst);
}
inline void FFTFwd(const double* src, double* dst, FFTState_Double* state, unsigned char*)
{
    RealFFTForward(state->plan, src, dst);
}
inline void FFTFwd(const std::complex<float>* src, std::complex<float>* dst, FFTState_Complex_Float_Interleaved* state, unsigned char*)
{
    ComplexInterleaved(src, dst, state, false);
}
inline void FFTFwd(const std::complex<double>* src, std::complex<double>* dst, FFTState_Complex_Double_Interleaved* state, unsigned char*)
{
    ComplexInterleaved(src, dst, state, false);
}
inline void FFTFwd(const float* srcReal, const float* srcImag, float* dstReal, float* dstImag, FFTState_Complex_Float_Deinterleaved* state, unsigned char*)
{
    ComplexDeinterleaved(srcReal, srcImag, dstReal, dstImag, state, false);
}
inline void FFTFwd(const double* srcReal, const double* srcImag, double* dstReal, double* dstImag, FFTState_Complex_Double_Deinterleaved* state, unsigned char*)
{
    ComplexDeinterleaved(srcReal, srcImag, dstReal, dstImag, state, false);
}

inline void FFTInv(const float* src, float* dst, FFTState_Float* state, unsigned char*)
{
    RealFFTInverse(src, dst, state);
}
inline void FFTInv(const double* src, double* dst, FFTState_Double* state, unsigned char*)
{
    RealFFTInverse(src, dst, state);
}
inline void FFTInv(const std::complex<float>* src, std::complex<float>* dst, FFTState_Complex_Float_Interleaved* state, unsigned char*)
{
    ComplexInterleaved(src, dst, state, true);
}
inline void FFTInv(const std::complex<double>* src, std::complex<double>* dst, FFTState_Complex_Double_Interleaved* state, unsigned char*)
{
    ComplexInterleaved(src, dst, state, true);
}
inline void FFTInv(const float* srcReal, const float* srcImag, float* dstReal, float* dstImag, FFTState_Complex_Float_Deinterleaved* state, unsigned char*)
{
    ComplexDeinterleaved(srcReal, srcImag, dstReal, dstImag, state, true);
}
inline void FFTInv(const double* srcReal, const double* srcImag, double* dstReal, double* dstImag, FFTState_Complex_Double_Deinterleaved* state, unsigned char*)
{
    ComplexDeinterleaved(srcReal, srcImag, dstReal, dstImag, state, true);
}

}  // namespace KESTACCEL_FFT_WIDTH_NAMESPACE
}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
