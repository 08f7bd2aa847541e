#pragma once

#include <cstdint>
#include <cstring>

#include "common/DivideFault.h"
#include "filter/MultiRate/MultiRateState.h"
#include "filter/MultiRate/PolyphaseKernels.h"
#include "filter/MultiRate/PoolVectorGrowth.h"

namespace kestaccel {
namespace filter {
namespace cpp {

// Callers' counts and positions are 32-bit; the arithmetic on them wraps as
// 32-bit arithmetic does and is then read as signed.
inline std::int32_t WrapToInt32(std::uint32_t value) { return static_cast<std::int32_t>(value); }
inline std::int32_t WrapToInt32(std::int64_t value) { return WrapToInt32(static_cast<std::uint32_t>(value)); }

template <class Vector>
void ReleaseStorage(Vector& vector)
{
    Vector().swap(vector);
}

// The record is handed to the caller before anything else is built, so an
// allocation failure further on leaves it where MRFFree can release it.
template <class T, class State>
void MRFInit(State** state, unsigned int upFactor, unsigned int downFactor, const T* taps, unsigned int tapCount,
             const PoolVector<T>& /*reservedVector*/, unsigned int referencePosition, unsigned int startPosition)
{
    State* filter = new State();
    *state = filter;
    filter->upFactor = upFactor;
    filter->downFactor = downFactor;
    if (upFactor == 0) {
        detail::RaiseIntegerDivideFault();  // the first division by U below
        return;
    }

    // Branch p takes taps p, p + U, ... up to the last whole group of U taps,
    // stored from the highest index down. The T % U taps past the last whole
    // group take no part; below U taps every branch is empty.
    PoolVectorGrowTo(filter->phaseFilters, upFactor);
    const std::uint32_t lastGroupStart = tapCount - tapCount % upFactor - upFactor;
    for (std::uint32_t p = 0; p < upFactor; ++p) {
        auto& branch = filter->phaseFilters[p];
        for (std::int64_t index = WrapToInt32(lastGroupStart + p); index >= 0; index -= upFactor) {
            PoolVectorAppend(branch, taps[index]);
        }
    }

    PoolVectorGrowTo(filter->history, (tapCount + 1u + upFactor) / upFactor);

    // The first output's position, split into a phase in [0, U) and a
    // (floored) input index.
    const std::int64_t position = WrapToInt32(startPosition - referencePosition);
    std::int64_t inputIndex = position / std::int64_t(upFactor);
    std::int64_t phase = position % std::int64_t(upFactor);
    if (phase < 0) {
        phase += upFactor;
        inputIndex -= 1;
    }
    filter->phase = WrapToInt32(phase);
    filter->inputIndex = WrapToInt32(inputIndex);
}

// history[i] takes the sample i + 1 places before the next block. Filled from
// the highest index down, so the older samples it moves back are read before
// they are overwritten.
template <class T>
void ShiftHistory(const T* src, std::uint32_t consumed, PoolVector<T>& history)
{
    T* h = history.data();
    for (std::int64_t i = std::int64_t(history.size()) - 1; i >= 0; --i) {
        const std::int64_t e = std::int64_t(consumed) - i - 1;
        h[i] = e >= 0 ? src[e] : h[i - std::int64_t(consumed)];
    }
}

// inputIndex is rebased by cycleCount, not by the cycleCount * D samples
// consumed: streaming is seamless at D of 1 and drifts by cycleCount * (D - 1)
// samples a call above that. A call whose source is its destination computes
// into scratch and then copies the untouched buffer over it, so the caller's
// buffer keeps its input and only history and position move on.
template <class T, class State>
void MRFProcess(const T* src, T* dst, unsigned int cycleCount, State* state)
{
    const std::int32_t outputs = WrapToInt32(state->upFactor * cycleCount);
    const std::uint32_t consumed = state->downFactor * cycleCount;
    const bool sameBuffer = src == dst;

    T* out = dst;
    if (sameBuffer) {
        PoolVectorGrowTo(state->scratch, outputs > 0 ? std::size_t(outputs) : 0);
        out = state->scratch.data();
    }
    if (outputs > 0) {
        polyphase::Position position{static_cast<std::uint32_t>(state->phase), state->inputIndex};
        polyphase::ComputeOutputs<T>(*state, src, out, outputs, position);
        state->phase = WrapToInt32(position.phase);
        state->inputIndex = WrapToInt32(position.inputIndex);
    }
    ShiftHistory(src, consumed, state->history);
    state->inputIndex = WrapToInt32(static_cast<std::uint32_t>(state->inputIndex) - cycleCount);
    if (sameBuffer && outputs > 0) {
        std::memcpy(state->scratch.data(), dst, std::size_t(outputs) * sizeof(T));
    }
}

// Storage goes back in a fixed order: scratch, history, each branch, then the
// branch table, and last the record.
template <class State>
void MRFFree(State* state)
{
    if (state == nullptr) {
        return;
    }
    ReleaseStorage(state->scratch);
    ReleaseStorage(state->history);
    for (auto& branch : state->phaseFilters) ReleaseStorage(branch);
    ReleaseStorage(state->phaseFilters);
    delete state;
}

}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
