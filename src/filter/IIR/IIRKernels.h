#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "filter/IIR/IIRState.h"
#include "utility/VectorUtils/BufferKernels.h"

// Transposed direct form II. Every step has a fixed association, each product
// and sum rounded to the element type: y = b0 * x + d[0]; then, ascending,
// d[i] = (b[i+1] * x + d[i+1]) - a[i+1] * y; last d[order-1] = b[order] * x -
// a[order] * y. a0 is taken as 1 and never read. The block paths repeat these
// steps exactly, so they give the bits of the single-sample form.
namespace kestaccel {
namespace filter {
namespace cpp {

// One section on one sample: taps points at its b0, d at its first state.
template <class T>
T IIRSection(T x, const T* taps, T* d, std::size_t order)
{
    const T* b = taps;
    const T* a = taps + order + 1;
    const T y = b[0] * x + d[0];
    for (std::size_t i = 0; i + 1 < order; ++i) d[i] = b[i + 1] * x + d[i + 1] - a[i + 1] * y;
    d[order - 1] = b[order] * x - a[order] * y;
    return y;
}

template <class State>
typename State::Value IIR(typename State::Value sample, State* state)
{
    const std::size_t order = state->order;
    const std::size_t stride = 2 * order + 2;
    const auto* taps = state->taps.data();
    auto* delay = state->delayLine.data();
    auto y = sample;
    for (std::size_t s = 0; s < state->sectionCount; ++s) {
        y = IIRSection(y, taps + s * stride, delay + s * order, order);
    }
    return y;
}

// A second-order section over a whole block, its taps and states held in
// locals and the states written back once at the end.
template <class T>
void IIRBiquadSectionBlock(unsigned int count, const T* src, T* dst, const T* taps, T* state)
{
    const T b0 = taps[0], b1 = taps[1], b2 = taps[2], a1 = taps[4], a2 = taps[5];
    T d0 = state[0], d1 = state[1];
    for (std::size_t i = 0; i < count; ++i) {
        const T x = src[i];
        const T y = b0 * x + d0;
        d0 = b1 * x + d1 - a1 * y;
        d1 = b2 * x - a2 * y;
        dst[i] = y;
    }
    state[0] = d0;
    state[1] = d1;
}

// Exactly two sections: one pass, both sections per sample.
template <class T>
void IIRBiquadPairBlock(unsigned int count, const T* src, T* dst, const T* taps, T* state)
{
    const T b0 = taps[0], b1 = taps[1], b2 = taps[2], a1 = taps[4], a2 = taps[5];
    const T c0 = taps[6], c1 = taps[7], c2 = taps[8], e1 = taps[10], e2 = taps[11];
    T d0 = state[0], d1 = state[1], f0 = state[2], f1 = state[3];
    for (std::size_t i = 0; i < count; ++i) {
        const T x = src[i];
        const T y = b0 * x + d0;
        d0 = b1 * x + d1 - a1 * y;
        d1 = b2 * x - a2 * y;
        const T z = c0 * y + f0;
        f0 = c1 * y + f1 - e1 * z;
        f1 = c2 * y - e2 * z;
        dst[i] = z;
    }
    state[0] = d0;
    state[1] = d1;
    state[2] = f0;
    state[3] = f1;
}

template <class State>
void IIRBiquadBlock(unsigned int count, const typename State::Value* src, typename State::Value* dst, State* state)
{
    const auto* taps = state->taps.data();
    auto* delay = state->delayLine.data();
    if (state->sectionCount == 2) {
        IIRBiquadPairBlock(count, src, dst, taps, delay);
        return;
    }
    IIRBiquadSectionBlock(count, src, dst, taps, delay);
    for (std::size_t s = 1; s < state->sectionCount; ++s) {
        IIRBiquadSectionBlock(count, dst, dst, taps + 6 * s, delay + 2 * s);
    }
}

// Every element is read before the element of the same index is written, so
// src may equal dst.
template <class State>
void IIR(unsigned int count, const typename State::Value* src, typename State::Value* dst, State* state)
{
    if (state->order == 2) {
        IIRBiquadBlock(count, src, dst, state);
        return;
    }
    for (std::size_t i = 0; i < count; ++i) dst[i] = IIR(src[i], state);
}

template <class State>
void IIR_InPlace(unsigned int count, typename State::Value* srcDst, State* state)
{
    IIR(count, srcDst, srcDst, state);
}

// Every tap, a0 included, is multiplied by the reciprocal of the one
// normalising tap; the states are taken unscaled.
template <class State>
void IIRInitScaled(State** state, const typename State::Value* taps, std::uint32_t order, std::uint32_t sections,
                   typename State::Value leading, const typename State::Value* delayLine)
{
    using T = typename State::Value;
    auto record = std::make_unique<State>(order, sections);
    const T r = T(1) / leading;
    const std::uint32_t tapCount = static_cast<std::uint32_t>(record->taps.size());
    for (std::uint32_t i = 0; i < tapCount; ++i) record->taps[i] = r * taps[i];
    if (delayLine != nullptr) {
        utility::cpp::Copy(order * sections, delayLine, record->delayLine.data());
    }
    *state = record.release();
}

template <class State>
void IIRInit(State** state, const typename State::Value* taps, unsigned int order,
             const typename State::Value* delayLine)
{
    if (state == nullptr || taps == nullptr || order == 0) {
        return;
    }
    IIRInitScaled(state, taps, order, 1u, taps[order + 1u], delayLine);
}

// Every section is scaled by the first section's a0, whatever its own.
template <class State>
void IIRInit_BiQuad(State** state, const typename State::Value* taps, unsigned int sectionCount,
                    const typename State::Value* delayLine)
{
    if (state == nullptr || taps == nullptr || sectionCount == 0) {
        return;
    }
    IIRInitScaled(state, taps, 2u, sectionCount, taps[3], delayLine);
}

// Stored as given: a0 is not divided out here.
template <class State>
void IIRSetTaps(State* state, const typename State::Value* taps)
{
    if (state == nullptr || taps == nullptr) {
        return;
    }
    utility::cpp::Copy(static_cast<unsigned int>(state->taps.size()), taps, state->taps.data());
}

// A null delayLine clears the first section's states only; later sections of
// a cascade keep theirs.
template <class State>
void IIRSetDlyLine(State* state, const typename State::Value* delayLine)
{
    if (state == nullptr) {
        return;
    }
    if (delayLine != nullptr) {
        utility::cpp::Copy(state->order * state->sectionCount, delayLine, state->delayLine.data());
    } else {
        utility::cpp::Zero(state->order, state->delayLine.data());
    }
}

template <class State>
void IIRGetDlyLine(const State* state, typename State::Value* delayLine)
{
    if (state == nullptr || delayLine == nullptr) {
        return;
    }
    utility::cpp::Copy(state->order * state->sectionCount, state->delayLine.data(), delayLine);
}

template <class State>
void IIRFree(State* state)
{
    delete state;
}

}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
