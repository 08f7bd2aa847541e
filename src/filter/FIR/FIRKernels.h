#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "filter/FIR/FIROutputKernels.h"
#include "filter/FIR/FIRState.h"
#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace filter {
namespace cpp {

// Filters count samples of src into out, then moves the delay line on from
// src. out must not overlap src; it may be the state's scratch.
inline void FIRKernel(FIRState_Float* state, unsigned int count, const float* src, float* out)
{
    float* delay = state->delayLine.data();
    const unsigned int d = state->delayLine.size();
    FIROutputs(state->taps.data(), state->tapCount - 1u, delay, src, count, out);
    if (d == 0) {
        return;
    }
    if (count < d) {
        utility::cpp::Move(d - count, delay + count, delay);
        utility::cpp::Copy(count, src, delay + (d - count));
    } else {
        utility::cpp::Copy(d, src + (count - d), delay);
    }
}

// The sum over the delay line as the block form forms it, and the newest
// product added last, so both forms agree bit for bit. Nothing is stored.
inline float FIR(FIRState_Float* state, float sample)
{
    const float* taps = state->taps.data();
    const float* delay = state->delayLine.data();
    const std::size_t m = state->tapCount - 1u;
    float sum = 0.0f;
    for (std::size_t j = 0; j < m; ++j) sum += taps[m - j] * delay[j];
    return sum + sample * taps[0];
}

// Overlapping ranges (equal pointers included) go through scratch one chunk
// at a time; the kernel has read the chunk and moved the delay line on before
// the chunk's results reach dst, so the next chunk sees the right history.
inline void FIR(FIRState_Float* state, unsigned int count, const float* src, float* dst)
{
    const auto srcBegin = reinterpret_cast<std::uintptr_t>(src);
    const auto dstBegin = reinterpret_cast<std::uintptr_t>(dst);
    const std::uintptr_t bytes = std::uintptr_t(count) * sizeof(float);
    const bool overlap = srcBegin < dstBegin + bytes && dstBegin < srcBegin + bytes;
    if (!overlap) {
        FIRKernel(state, count, src, dst);
        return;
    }
    float* scratch = state->scratch.data();
    while (count != 0) {
        const unsigned int chunk = count < FIRChunkSize ? count : FIRChunkSize;
        FIRKernel(state, chunk, src, scratch);
        utility::cpp::Copy(chunk, scratch, dst);
        src += chunk;
        dst += chunk;
        count -= chunk;
    }
}

// The record is stored in *state last, so a failed call leaves it as it was.
inline void FIRInit(FIRState_Float** state, const float* taps, unsigned int tapCount, const float* delayLine)
{
    auto record = std::make_unique<FIRState_Float>(tapCount);
    if (taps != nullptr) {
        utility::cpp::Copy(tapCount, taps, record->taps.data());
    }
    if (delayLine != nullptr) {
        utility::cpp::Copy(record->delayLine.size(), delayLine, record->delayLine.data());
    } else {
        utility::cpp::Zero(record->delayLine.size(), record->delayLine.data());
    }
    *state = record.release();
}

inline void FIRSetTaps(FIRState_Float* state, const float* taps)
{
    utility::cpp::Copy(state->tapCount, taps, state->taps.data());
}

inline void FIRSetDlyLine(FIRState_Float* state, const float* delayLine)
{
    if (delayLine != nullptr) {
        utility::cpp::Copy(state->delayLine.size(), delayLine, state->delayLine.data());
    } else {
        utility::cpp::Zero(state->delayLine.size(), state->delayLine.data());
    }
}

inline void FIRGetDlyLine(const FIRState_Float* state, float* delayLine)
{
    utility::cpp::Copy(state->delayLine.size(), state->delayLine.data(), delayLine);
}

inline unsigned int FIRGetWorkBufferSize(unsigned int /*tapCount*/) { return 0; }

inline void FIRFree(FIRState_Float* state) { delete state; }

}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
