#pragma once

// The bit-reversal permutation, fused with the first stages, which need no
// more factors than the few of stages 3 and 4. The pass leaves the points
// in a working form (split or blocked) for the stages that follow.

#include <cstddef>
#include <cstdint>

#include "transform/FFT/Butterflies.h"

namespace kestaccel {
namespace transform {
namespace cpp {
inline namespace KESTACCEL_FFT_WIDTH_NAMESPACE {

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
[[gnu::always_inline]] inline std::size_t ReverseBits(std::size_t x, unsigned int bits)
{
    const std::uint32_t v = static_cast<std::uint32_t>(x);
    const std::uint32_t r = (std::uint32_t(kReversedBytes.value[v & 0xffu]) << 24) |
                            (std::uint32_t(kReversedBytes.value[(v >> 8) & 0xffu]) << 16) |
                            (std::uint32_t(kReversedBytes.value[(v >> 16) & 0xffu]) << 8) |
                            std::uint32_t(kReversedBytes.value[v >> 24]);
    return bits == 0 ? 0 : r >> (32 - bits);
}

constexpr unsigned int Log2(std::size_t n) { return n <= 1 ? 0 : 1 + Log2(n / 2); }

// t (below kCount, a power of two up to 256) with its log2(kCount) bits
// reversed: point t of a group in bit-reversed order sits that many
// kCount-ths of the transform away from the group's first point.
template <std::size_t kCount>
constexpr std::size_t ReversedPosition(std::size_t t)
{
    static_assert(kCount >= 2 && kCount <= 256 && (kCount & (kCount - 1)) == 0, "a power of two up to 256");
    return kReversedBytes.value[t] >> (8 - Log2(kCount));
}

// Group g of the destination: points kGroup g onwards, in the destination's
// form (in blocks of kLanes when blocked).
template <class E, Form kDst, std::size_t kGroup, std::size_t kLanes>
inline void StoreGroup(E* dstRe, E* dstIm, std::size_t g, const E* r, const E* m)
{
    if constexpr (kDst == Form::kBlocked) {
        for (std::size_t b = 0; b < kGroup; b += kLanes) {
            E* const block = dstRe + 2 * (kGroup * g + b);
            for (std::size_t u = 0; u < kLanes; ++u) block[u] = r[b + u];
            for (std::size_t u = 0; u < kLanes; ++u) block[kLanes + u] = m[b + u];
        }
    } else {
        using D = Points<E, kDst, kLanes>;
        for (std::size_t t = 0; t < kGroup; ++t) {
            D::Re(dstRe, dstIm, kGroup * g, t) = r[t];
            D::Im(dstRe, dstIm, kGroup * g, t) = m[t];
        }
    }
}

// values[t * kRun + l] to rows[l * kGroup + t]. g++ finds the fewer
// shuffles with the shorter side innermost, and with the groups innermost
// when the sides are equal.
template <class E, std::size_t kGroup, std::size_t kRun>
inline void TransposeRun(const E* __restrict values, E* __restrict rows)
{
    if constexpr (kRun < kGroup) {
        for (std::size_t t = 0; t < kGroup; ++t)
            for (std::size_t l = 0; l < kRun; ++l) rows[l * kGroup + t] = values[t * kRun + l];
    } else {
        for (std::size_t l = 0; l < kRun; ++l)
            for (std::size_t t = 0; t < kGroup; ++t) rows[l * kGroup + t] = values[t * kRun + l];
    }
}

// The groups of a run are held point by point: values[t * kRun + l] is
// point t of the run's group l. The kRun groups are each stored whole in
// the destination's form, group l as group groups[l]. The points are
// transposed in locals first, one part at a time, a plain loop that g++
// turns into shuffles. Kept out of line: inlined after the stages, or
// stored group by group straight from values, g++ builds the groups from
// single elements.
template <class E, Form kDst, std::size_t kGroup, std::size_t kLanes, std::size_t kRun>
[[gnu::noinline]] void StoreRunOfGroups(E* __restrict dstRe, E* __restrict dstIm, const std::size_t* groups,
                                        const E* __restrict re, const E* __restrict im)
{
    E rowsRe[kRun * kGroup], rowsIm[kRun * kGroup];
    TransposeRun<E, kGroup, kRun>(re, rowsRe);
    TransposeRun<E, kGroup, kRun>(im, rowsIm);
    for (std::size_t l = 0; l < kRun; ++l)
        StoreGroup<E, kDst, kGroup, kLanes>(dstRe, dstIm, groups[l], rowsRe + l * kGroup, rowsIm + l * kGroup);
}

// The permuted copy from a distinct source with the first stages: group g
// of the destination holds the points at the bit-reversed positions of
// kGroup g onwards, which lie at reverse(g) plus reversed kGroup-ths of the
// transform. This gives the same points as the swap-table exchanges
// followed by those stages. kConjugate negates the imaginary parts on the
// way, as the inverse needs.
//
// Runs of kRun consecutive source positions are read together, so the
// loads are contiguous and the first stages run on vectors across the run;
// the kRun groups of a run lie spread through the destination
// (bit-reversed run positions apart), each stored whole: with 8 points or
// more, a group covers a cache line, which is written once.
template <class E, Form kSrc, Form kDst, bool kConjugate, std::size_t kGroup, std::size_t kSpan, std::size_t kLanes,
          std::size_t kRun>
[[gnu::noinline]] void GatherFirstStagesByRuns(std::uint32_t order, const E* __restrict srcRe,
                                               const E* __restrict srcIm, E* __restrict dstRe, E* __restrict dstIm,
                                               const E* __restrict w)
{
    using S = Points<E, kSrc, kLanes>;
    const unsigned int bits = order - Log2(kGroup);
    const std::size_t groupCount = std::size_t(1) << bits;  // n / kGroup
    const std::size_t spread = groupCount / kRun;
    for (std::size_t r0 = 0; r0 < groupCount; r0 += kRun) {
        const std::size_t g0 = ReverseBits(r0, bits);
        E re[kGroup * kRun], im[kGroup * kRun];
        // One loop over the run, vectorised across it, with the points of
        // a group unrolled so that each one's position is a constant.
        KESTACCEL_FFT_INDEPENDENT_LANES
        for (std::size_t l = 0; l < kRun; ++l) {
            E r[kGroup], m[kGroup];
            KESTACCEL_FFT_UNROLL(16)
            for (std::size_t t = 0; t < kGroup; ++t) {
                const std::size_t p = r0 + l + ReversedPosition<kGroup>(t) * groupCount;
                r[t] = S::Re(srcRe, srcIm, p, 0);
                m[t] = kConjugate ? -S::Im(srcRe, srcIm, p, 0) : S::Im(srcRe, srcIm, p, 0);
            }
            FirstStages<E, kGroup, kSpan>(r, m, w);
            KESTACCEL_FFT_UNROLL(16)
            for (std::size_t t = 0; t < kGroup; ++t) {
                re[t * kRun + l] = r[t];
                im[t * kRun + l] = m[t];
            }
        }
        std::size_t groups[kRun];
        for (std::size_t l = 0; l < kRun; ++l) groups[l] = g0 + ReversedPosition<kRun>(l) * spread;
        StoreRunOfGroups<E, kDst, kGroup, kLanes, kRun>(dstRe, dstIm, groups, re, im);
    }
}

// The same, a group at a time, for transforms of fewer than kRun groups.
template <class E, Form kSrc, Form kDst, bool kConjugate, std::size_t kGroup, std::size_t kSpan, std::size_t kLanes>
[[gnu::noinline]] void GatherFirstStagesByGroups(std::uint32_t order, const E* __restrict srcRe,
                                                 const E* __restrict srcIm, E* __restrict dstRe,
                                                 E* __restrict dstIm, const E* __restrict w)
{
    using S = Points<E, kSrc, kLanes>;
    const unsigned int bits = order - Log2(kGroup);
    const std::size_t groupCount = std::size_t(1) << bits;
    for (std::size_t g = 0; g < groupCount; ++g) {
        const std::size_t first = ReverseBits(g, bits);
        E r[kGroup], m[kGroup];
        for (std::size_t t = 0; t < kGroup; ++t) {
            const std::size_t p = first + ReversedPosition<kGroup>(t) * groupCount;
            r[t] = S::Re(srcRe, srcIm, p, 0);
            m[t] = kConjugate ? -S::Im(srcRe, srcIm, p, 0) : S::Im(srcRe, srcIm, p, 0);
        }
        FirstStages<E, kGroup, kSpan>(r, m, w);
        StoreGroup<E, kDst, kGroup, kLanes>(dstRe, dstIm, g, r, m);
    }
}

// The permuted copy with the first stages, by runs where there are at
// least kRun groups.
template <class E, Form kSrc, Form kDst, bool kConjugate, std::size_t kGroup, std::size_t kSpan, std::size_t kLanes,
          std::size_t kRun>
void FirstPass(std::uint32_t order, const E* srcRe, const E* srcIm, E* dstRe, E* dstIm, const E* w)
{
    if ((std::size_t(1) << order) >= kGroup * kRun) {
        GatherFirstStagesByRuns<E, kSrc, kDst, kConjugate, kGroup, kSpan, kLanes, kRun>(order, srcRe, srcIm, dstRe, dstIm,
                                                                                 w);
    } else {
        GatherFirstStagesByGroups<E, kSrc, kDst, kConjugate, kGroup, kSpan, kLanes>(order, srcRe, srcIm, dstRe, dstIm, w);
    }
}

// The same stages on pairs already exchanged in place, each group rewritten
// in the blocked form over its own bytes.
template <class E, bool kConjugate, std::size_t kGroup, std::size_t kSpan, std::size_t kLanes>
[[gnu::noinline]] void FirstStagesInPlace(std::size_t groups, E* __restrict data, const E* __restrict w)
{
    for (std::size_t g = 0; g < groups; ++g) {
        E r[kGroup], m[kGroup];
        for (std::size_t t = 0; t < kGroup; ++t) {
            r[t] = data[2 * (kGroup * g + t)];
            m[t] = kConjugate ? -data[2 * (kGroup * g + t) + 1] : data[2 * (kGroup * g + t) + 1];
        }
        FirstStages<E, kGroup, kSpan>(r, m, w);
        StoreGroup<E, Form::kBlocked, kGroup, kLanes>(data, data, g, r, m);
    }
}

}  // namespace KESTACCEL_FFT_WIDTH_NAMESPACE
}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
