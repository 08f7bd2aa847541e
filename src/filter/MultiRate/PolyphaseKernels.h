#pragma once

#include <cstddef>
#include <cstdint>

#include "filter/MultiRate/MultiRateState.h"

// The outputs of the polyphase filter. Every output is one sum, started at
// +0 in the element type, over the L taps of its branch and the L samples
// that end at its newest input, from the oldest sample to the newest, each
// product rounded on its own. The faster paths below compute several outputs
// at once, each with its own accumulator running in that same order, so they
// give the bits of the plain loop.
namespace kestaccel {
namespace filter {
namespace cpp {
namespace polyphase {

// Outputs computed side by side on the vector path: one from each of eight
// consecutive rate-change cycles. Outputs U apart use the same branch and
// samples D apart, so the eight sums share every tap.
constexpr std::size_t kLanes = 8;

// Rows of the stack tile that holds, for eight cycles side by side, the
// samples of one cycle: it bounds L + D on the vector path. The same memory
// stages the samples of a run of outputs that reaches into history.
constexpr std::int64_t kTileRows = 512;

// A position on the high-rate axis, stepped by D from one output to the next.
struct Position {
    std::uint32_t phase;
    std::int64_t inputIndex;
};

struct Step {
    std::uint32_t up;
    std::uint32_t downQuotient;   // D / U
    std::uint32_t downRemainder;  // D % U
};

inline Step MakeStep(std::uint32_t up, std::uint32_t down) { return {up, down / up, down % up}; }

// Adds D to the phase and carries whole multiples of U into inputIndex.
inline void Advance(Position& position, const Step& step)
{
    std::uint64_t phase = std::uint64_t(position.phase) + step.downRemainder;
    position.inputIndex += step.downQuotient;
    if (phase >= step.up) {
        phase -= step.up;
        position.inputIndex += 1;
    }
    position.phase = static_cast<std::uint32_t>(phase);
}

// An output whose window may begin before the block: sample s < 0 is
// history[-s - 1]. The window is split where it enters the block, so neither
// part tests each sample; the order of the sum is unchanged.
template <class T>
T OutputReachingHistory(const T* branch, std::int64_t length, std::int64_t newest, const T* src, const T* history)
{
    const std::int64_t oldest = newest - length + 1;
    std::int64_t fromHistory = -oldest;
    if (fromHistory > length) fromHistory = length;
    T sum = T(0);
    std::int64_t j = 0;
    for (; j < fromHistory; ++j) sum += history[-(oldest + j) - 1] * branch[j];
    for (; j < length; ++j) sum += src[oldest + j] * branch[j];
    return sum;
}

// An output whose window lies wholly in the block, starting at `window`.
template <class T>
T OutputFromBlock(const T* branch, std::size_t length, const T* window)
{
    T sum = T(0);
    for (std::size_t j = 0; j < length; ++j) sum += window[j] * branch[j];
    return sum;
}

// Four consecutive outputs, four independent sums: the additions of one sum
// no longer wait on each other's latency.
template <class T>
void FourOutputsFromBlock(const T* const* branches, const T* const* windows, std::size_t length, T* dst)
{
    T sum0 = T(0), sum1 = T(0), sum2 = T(0), sum3 = T(0);
    for (std::size_t j = 0; j < length; ++j) {
        sum0 += windows[0][j] * branches[0][j];
        sum1 += windows[1][j] * branches[1][j];
        sum2 += windows[2][j] * branches[2][j];
        sum3 += windows[3][j] * branches[3][j];
    }
    dst[0] = sum0;
    dst[1] = sum1;
    dst[2] = sum2;
    dst[3] = sum3;
}

// kLanes sums over one branch: lane k reads rows[j * rowStride + k]. The lane
// loop is the vector; each lane still adds its products in ascending j.
template <class T>
void LaneSums(const T* rows, std::size_t rowStride, const T* branch, std::size_t length, T* sums)
{
    T acc[kLanes] = {};
    for (std::size_t j = 0; j < length; ++j) {
        const T tap = branch[j];
        const T* row = rows + j * rowStride;
        for (std::size_t k = 0; k < kLanes; ++k) acc[k] += row[k] * tap;
    }
    for (std::size_t k = 0; k < kLanes; ++k) sums[k] = acc[k];
}

// The next four outputs, or the next one, from `position`, whose windows lie
// in `samples`, which begins at sample index `first`.
template <class T>
void NextFourOutputs(const PoolVector<PoolVector<T>>& branches, std::int64_t length, const Step& step,
                     const T* samples, std::int64_t first, T* dst, Position& position)
{
    const T* groupBranches[4];
    const T* groupWindows[4];
    for (int k = 0; k < 4; ++k) {
        groupBranches[k] = branches[position.phase].data();
        groupWindows[k] = samples + (position.inputIndex - length + 1 - first);
        Advance(position, step);
    }
    FourOutputsFromBlock(groupBranches, groupWindows, std::size_t(length), dst);
}

template <class T>
void NextOutput(const PoolVector<PoolVector<T>>& branches, std::int64_t length, const Step& step, const T* samples,
                std::int64_t first, T* dst, Position& position)
{
    *dst = OutputFromBlock(branches[position.phase].data(), std::size_t(length),
                           samples + (position.inputIndex - length + 1 - first));
    Advance(position, step);
}

// kLanes whole cycles from `position`. Lane k is the cycle k further on:
// same branches, samples k * D later. When those samples already stand side
// by side in src (D of 1, window inside the block) the lanes read src;
// otherwise they are first gathered into `tile`, one row per sample offset of
// the cycle, with samples before the block taken from history.
template <class T>
void CycleLanes(const MultiRateRecord<T>& filter, std::size_t length, const Step& step, const T* src, T* dst,
                Position& position, T* tile)
{
    const std::uint32_t down = filter.downFactor;
    const std::int64_t first = position.inputIndex - std::int64_t(length) + 1;
    const T* rows = src + first;
    std::size_t rowStride = 1;
    if (down != 1 || first < 0) {
        const std::uint64_t reach = (std::uint64_t(position.phase) + std::uint64_t(step.up - 1) * down) / step.up;
        const std::int64_t rowCount = std::int64_t(length) + std::int64_t(reach);
        const T* history = filter.history.data();
        for (std::int64_t r = 0; r < rowCount; ++r) {
            T* row = tile + r * std::int64_t(kLanes);
            const std::int64_t s0 = first + r;
            if (s0 >= 0) {
                for (std::size_t k = 0; k < kLanes; ++k) row[k] = src[s0 + std::int64_t(k * down)];
            } else {
                for (std::size_t k = 0; k < kLanes; ++k) {
                    const std::int64_t s = s0 + std::int64_t(k * down);
                    row[k] = s >= 0 ? src[s] : history[-s - 1];
                }
            }
        }
        rows = tile;
        rowStride = kLanes;
    }
    T sums[kLanes];
    for (std::uint32_t t = 0; t < step.up; ++t) {
        const std::int64_t offset = position.inputIndex - std::int64_t(length) + 1 - first;
        LaneSums(rows + offset * std::int64_t(rowStride), rowStride, filter.phaseFilters[position.phase].data(), length,
                 sums);
        for (std::size_t k = 0; k < kLanes; ++k) dst[k * step.up + t] = sums[k];
        Advance(position, step);
    }
    // The walk above covered one cycle; the lanes covered kLanes.
    position.inputIndex += std::int64_t(kLanes - 1) * down;
}

// The run of outputs, at most `count`, whose windows reach into history. The
// samples they read, from history and from the start of the block, are
// staged side by side in `staging` (room for `stagingSize`), so that the run
// goes four at a time like the outputs inside the block; a run too long to
// stage goes one output at a time. Returns the length of the run.
template <class T>
std::int64_t HistoryRun(const MultiRateRecord<T>& filter, std::int64_t length, const Step& step, const T* src,
                        T* dst, std::int64_t count, Position& position, T* staging, std::int64_t stagingSize)
{
    const auto& branches = filter.phaseFilters;
    const T* history = filter.history.data();
    std::int64_t run = 0;
    std::int64_t newest = position.inputIndex;
    for (Position p = position; run < count && p.inputIndex < length - 1; Advance(p, step)) {
        newest = p.inputIndex;
        ++run;
    }
    const std::int64_t first = position.inputIndex - length + 1;
    const std::int64_t span = newest - first + 1;
    if (span > stagingSize) {
        for (std::int64_t n = 0; n < run; ++n) {
            dst[n] = OutputReachingHistory(branches[position.phase].data(), length, position.inputIndex, src, history);
            Advance(position, step);
        }
        return run;
    }
    for (std::int64_t i = 0; i < span; ++i) {
        const std::int64_t s = first + i;
        staging[i] = s >= 0 ? src[s] : history[-s - 1];
    }
    std::int64_t n = 0;
    for (; run - n >= 4; n += 4) NextFourOutputs(branches, length, step, staging, first, dst + n, position);
    for (; n < run; ++n) NextOutput(branches, length, step, staging, first, dst + n, position);
    return run;
}

// One output at a time, each stored before the next is computed: the plain
// loop, for a destination that overlaps samples still to be read, and for
// empty branches, whose outputs read nothing at all.
template <class T>
void OutputsOneByOne(const MultiRateRecord<T>& filter, const T* src, T* dst, std::int64_t count, Position& position)
{
    const Step step = MakeStep(filter.upFactor, filter.downFactor);
    const std::int64_t length = std::int64_t(filter.phaseFilters[0].size());
    const T* history = filter.history.data();
    for (std::int64_t n = 0; n < count; ++n) {
        dst[n] = OutputReachingHistory(filter.phaseFilters[position.phase].data(), length, position.inputIndex, src,
                                       history);
        Advance(position, step);
    }
}

// Whether the `count` outputs from `position` would be written over source
// samples that a later output still reads. Compared as integers: the arrays
// may be unrelated objects.
template <class T>
bool OutputsOverlapSource(const MultiRateRecord<T>& filter, const T* src, const T* dst, std::int64_t count,
                          const Position& position)
{
    const std::int64_t lastNewest =
        position.inputIndex +
        std::int64_t((std::uint64_t(position.phase) + std::uint64_t(count - 1) * filter.downFactor) / filter.upFactor);
    if (lastNewest < 0) return false;
    const auto s = reinterpret_cast<std::uintptr_t>(src), d = reinterpret_cast<std::uintptr_t>(dst);
    return d < s + std::uintptr_t(lastNewest + 1) * sizeof(T) && s < d + std::uintptr_t(count) * sizeof(T);
}

// Writes `count` outputs from `position` on, and leaves `position` after them.
// Whole groups of kLanes cycles go side by side where that pays; the other
// outputs go four at a time, or one at a time, those whose window reaches
// into history from a staged copy. The position never moves back within a
// call, so once a window lies in the block all later ones do.
template <class T>
void ComputeOutputs(const MultiRateRecord<T>& filter, const T* src, T* dst, std::int64_t count, Position& position)
{
    const std::uint32_t up = filter.upFactor;
    const std::uint32_t down = filter.downFactor;
    const Step step = MakeStep(up, down);
    const auto& branches = filter.phaseFilters;
    const std::size_t length = branches[0].size();
    const std::int64_t lengthSigned = std::int64_t(length);
    if (length == 0 || OutputsOverlapSource(filter, src, dst, count, position)) {
        OutputsOneByOne(filter, src, dst, count, position);
        return;
    }

    // A tile costs (L + D) * kLanes copies against U * L * kLanes products.
    // At D of 1 it is needed only while windows reach into history, and pays
    // there anyway; above, it is used only when it costs less than it saves.
    const std::int64_t cycleOutputs = std::int64_t(kLanes) * up;
    const std::int64_t tileRows = lengthSigned + std::int64_t(down);
    const bool tileAllowed = tileRows <= kTileRows && (down == 1 || tileRows <= std::int64_t(up) * lengthSigned);
    T tile[kTileRows * kLanes];

    std::int64_t n = 0;
    while (n < count) {
        const bool inBlock = position.inputIndex >= lengthSigned - 1;
        if (length > 0 && count - n >= cycleOutputs && (tileAllowed || (down == 1 && inBlock))) {
            CycleLanes(filter, length, step, src, dst + n, position, tile);
            n += cycleOutputs;
        } else if (!inBlock) {
            n += HistoryRun(filter, lengthSigned, step, src, dst + n, count - n, position, tile, kTileRows * kLanes);
        } else if (count - n >= 4) {
            NextFourOutputs(branches, lengthSigned, step, src, 0, dst + n, position);
            n += 4;
        } else {
            NextOutput(branches, lengthSigned, step, src, 0, dst + n, position);
            n += 1;
        }
    }
}

}  // namespace polyphase
}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
