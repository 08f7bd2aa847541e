#pragma once

// The bit-reversal permutation, fused with the first two or three stages,
// which need no table factors beyond four constants. The pass leaves the
// points in a working form (split or blocked) for the stages that follow.

#include <cstddef>
#include <cstdint>

#include "transform/FFT/Butterflies.h"

namespace kestaccel {
namespace transform {
namespace cpp {

// The exchanges of the swap table on pairs, in place, walked upwards. An
// entry equal to its index exchanges the point with itself, which changes
// nothing; doing so unconditionally saves a branch that mispredicts half
// the time.
template <class E>
[[gnu::noinline]] void SwapByTable(std::size_t n, const std::uint32_t* __restrict table, E* __restrict pairs)
{
    for (std::size_t i = 0; i + 1 < n; ++i) {
        const std::size_t p = table[i];
        const E r = pairs[2 * i], m = pairs[2 * i + 1];
        pairs[2 * i] = pairs[2 * p];
        pairs[2 * i + 1] = pairs[2 * p + 1];
        pairs[2 * p] = r;
        pairs[2 * p + 1] = m;
    }
}

// Each byte with its bits reversed.
struct ReversedBytes {
    std::uint8_t value[256];
};

constexpr ReversedBytes MakeReversedBytes()
{
    ReversedBytes table{};
    for (unsigned int b = 0; b < 256; ++b) {
        unsigned int r = 0;
        for (unsigned int bit = 0; bit < 8; ++bit) r |= ((b >> bit) & 1u) << (7 - bit);
        table.value[b] = static_cast<std::uint8_t>(r);
    }
    return table;
}

inline constexpr ReversedBytes kReversedBytes = MakeReversedBytes();

// The low `bits` bits of x in reverse order (bits up to 32).
inline std::size_t ReverseBits(std::size_t x, unsigned int bits)
{
    const std::uint32_t v = static_cast<std::uint32_t>(x);
    const std::uint32_t r = (std::uint32_t(kReversedBytes.value[v & 0xffu]) << 24) |
                            (std::uint32_t(kReversedBytes.value[(v >> 8) & 0xffu]) << 16) |
                            (std::uint32_t(kReversedBytes.value[(v >> 16) & 0xffu]) << 8) |
                            std::uint32_t(kReversedBytes.value[v >> 24]);
    return bits == 0 ? 0 : r >> (32 - bits);
}

// Groups of 4 points take stages 1 and 2, groups of 8 stages 1 to 3 (with
// the factors w), so that an even number of stages remains for the pairs.
template <class E, std::size_t kGroup>
inline void FirstStages(E* r, E* m, const E* w)
{
    if constexpr (kGroup == 4) {
        StagesOneTwo(r, m);
    } else {
        StagesOneToThree(r, m, w);
    }
}

// Point t of a group in bit-reversed order sits reverse(t) quarters or
// eighths of the transform away from the group's first point.
template <std::size_t kGroup>
constexpr std::size_t ReversedPosition(std::size_t t)
{
    static_assert(kGroup == 4 || kGroup == 8, "groups of 4 or 8 points");
    return kReversedBytes.value[t] >> (kGroup == 4 ? 6 : 5);
}

// Group g of the destination: points kGroup g onwards, in the destination's
// form.
template <class E, Form kDst, std::size_t kGroup>
inline void StoreGroup(E* dstRe, E* dstIm, std::size_t g, const E* r, const E* m)
{
    using D = Points<E, kDst>;
    constexpr std::size_t lanes = kDst == Form::kBlocked ? kLanes<E> : kGroup;
    for (std::size_t t = 0; t < kGroup; ++t) {
        D::Re(dstRe, dstIm, kGroup * g + t - t % lanes, t % lanes) = r[t];
        D::Im(dstRe, dstIm, kGroup * g + t - t % lanes, t % lanes) = m[t];
    }
}

constexpr std::size_t kRun = 4;

// The groups of a run are held point by point: values[t * kRun + l] is
// point t of the run's group l. Each part (real or imaginary) of kCount
// points of every group goes to to + groupStride * groups[l] onwards. The
// loop runs over the points with the run innermost, one part at a time, so
// that g++ reads a point's kRun values as one group and transposes them
// with shuffles (unrolled first, or with both parts in one loop, it stores
// element by element).
template <class E, std::size_t kCount>
inline void ScatterRunPart(E* __restrict to, std::size_t groupStride, const std::size_t* groups,
                           const E* __restrict values)
{
#if defined(__GNUC__)
#pragma GCC unroll 1
#endif
    for (std::size_t t = 0; t < kCount; ++t)
        for (std::size_t l = 0; l < kRun; ++l) to[groupStride * groups[l] + t] = values[t * kRun + l];
}

// The kRun groups of a run, each stored whole in the destination's form.
template <class E, Form kDst, std::size_t kGroup>
inline void StoreRunOfGroups(E* dstRe, E* dstIm, const std::size_t* groups, const E* re, const E* im)
{
    if constexpr (kDst == Form::kBlocked) {
        constexpr std::size_t lanes = kLanes<E>;
        for (std::size_t b = 0; b < kGroup / lanes; ++b) {
            ScatterRunPart<E, lanes>(dstRe + 2 * lanes * b, 2 * kGroup, groups, re + lanes * b * kRun);
            ScatterRunPart<E, lanes>(dstRe + 2 * lanes * b + lanes, 2 * kGroup, groups, im + lanes * b * kRun);
        }
    } else {
        ScatterRunPart<E, kGroup>(dstRe, kGroup, groups, re);
        ScatterRunPart<E, kGroup>(dstIm, kGroup, groups, im);
    }
}

// The permuted copy from a distinct source, for a transform of kGroup
// points (orders 2 and 3): its one group gathers the points at the
// bit-reversed positions and takes the first stages. kConjugate negates
// the imaginary parts on the way, as the inverse needs.
template <class E, Form kSrc, Form kDst, bool kConjugate, std::size_t kGroup>
[[gnu::noinline]] void GatherOneGroup(const E* __restrict srcRe, const E* __restrict srcIm, E* __restrict dstRe,
                                      E* __restrict dstIm, const E* __restrict w)
{
    using S = Points<E, kSrc>;
    E r[kGroup], m[kGroup];
    for (std::size_t t = 0; t < kGroup; ++t) {
        const std::size_t p = ReversedPosition<kGroup>(t);
        r[t] = S::Re(srcRe, srcIm, p, 0);
        m[t] = kConjugate ? -S::Im(srcRe, srcIm, p, 0) : S::Im(srcRe, srcIm, p, 0);
    }
    FirstStages<E, kGroup>(r, m, w);
    StoreGroup<E, kDst, kGroup>(dstRe, dstIm, 0, r, m);
}

// The permuted copy from a distinct source with the first stages, for
// transforms of at least four groups: group g of the destination holds the
// points at the bit-reversed positions of kGroup g onwards, which lie at
// reverse(g) plus reversed quarters (or eighths) of the transform. This
// gives the same points as the swap-table exchanges followed by those
// stages. Runs of kRun consecutive source positions are read together, so
// the loads are contiguous and the first stages run on vectors across the
// run; the kRun groups of a run lie spread through the destination
// (bit-reversed run positions apart), each stored whole.
template <class E, Form kSrc, Form kDst, bool kConjugate, std::size_t kGroup>
[[gnu::noinline]] void GatherFirstStagesByRuns(std::uint32_t order, const E* __restrict srcRe,
                                               const E* __restrict srcIm, E* __restrict dstRe, E* __restrict dstIm,
                                               const E* __restrict w)
{
    using S = Points<E, kSrc>;
    constexpr unsigned int groupBits = kGroup == 4 ? 2 : 3;
    const unsigned int bits = order - groupBits;
    const std::size_t quarter = std::size_t(1) << bits;  // n / kGroup
    const std::size_t spread = quarter / kRun;
    for (std::size_t r0 = 0; r0 < quarter; r0 += kRun) {
        const std::size_t g0 = ReverseBits(r0, bits);
        E re[kGroup * kRun], im[kGroup * kRun];
        // Unrolled whole, so that each point's position is a constant and
        // its run is read as vectors (g++ leaves the loop of 8 rolled).
#if defined(__GNUC__)
#pragma GCC unroll 8
#endif
        for (std::size_t t = 0; t < kGroup; ++t) {
            for (std::size_t l = 0; l < kRun; ++l) {
                const std::size_t p = r0 + l + ReversedPosition<kGroup>(t) * quarter;
                re[t * kRun + l] = S::Re(srcRe, srcIm, p, 0);
                im[t * kRun + l] = kConjugate ? -S::Im(srcRe, srcIm, p, 0) : S::Im(srcRe, srcIm, p, 0);
            }
        }
        // Kept a loop so that g++ vectorises it across the run rather than
        // unrolling it first.
#if defined(__GNUC__)
#pragma GCC unroll 1
#endif
        for (std::size_t l = 0; l < kRun; ++l) {
            E r[kGroup], m[kGroup];
            for (std::size_t t = 0; t < kGroup; ++t) {
                r[t] = re[t * kRun + l];
                m[t] = im[t * kRun + l];
            }
            FirstStages<E, kGroup>(r, m, w);
            for (std::size_t t = 0; t < kGroup; ++t) {
                re[t * kRun + l] = r[t];
                im[t * kRun + l] = m[t];
            }
        }
        std::size_t groups[kRun];
        for (std::size_t l = 0; l < kRun; ++l) groups[l] = g0 + ReversedPosition<kRun>(l) * spread;
        StoreRunOfGroups<E, kDst, kGroup>(dstRe, dstIm, groups, re, im);
    }
}

// The permuted copy with the first stages, by runs where there are at least
// kRun groups.
template <class E, Form kSrc, Form kDst, bool kConjugate, std::size_t kGroup>
void FirstPass(std::uint32_t order, const E* srcRe, const E* srcIm, E* dstRe, E* dstIm, const E* w)
{
    if ((std::size_t(1) << order) == kGroup) {
        GatherOneGroup<E, kSrc, kDst, kConjugate, kGroup>(srcRe, srcIm, dstRe, dstIm, w);
    } else {
        GatherFirstStagesByRuns<E, kSrc, kDst, kConjugate, kGroup>(order, srcRe, srcIm, dstRe, dstIm, w);
    }
}

// The same stages on pairs already exchanged in place, each group rewritten
// in the blocked form over its own bytes.
template <class E, bool kConjugate, std::size_t kGroup>
[[gnu::noinline]] void FirstStagesInPlace(std::size_t groups, E* __restrict data, const E* __restrict w)
{
    for (std::size_t g = 0; g < groups; ++g) {
        E r[kGroup], m[kGroup];
        for (std::size_t t = 0; t < kGroup; ++t) {
            r[t] = data[2 * (kGroup * g + t)];
            m[t] = kConjugate ? -data[2 * (kGroup * g + t) + 1] : data[2 * (kGroup * g + t) + 1];
        }
        FirstStages<E, kGroup>(r, m, w);
        StoreGroup<E, Form::kBlocked, kGroup>(data, data, g, r, m);
    }
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
