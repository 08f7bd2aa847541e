#pragma once

// Building and destroying plans. Everything a transform needs, the swap
// table, the twiddle factors and the scratch capacity, is made here, so that
// no transform allocates or calls a trigonometric function.

#include <cmath>
#include <cstdint>
#include <cstring>

#include "transform/FFT/FFTPlan.h"

namespace kestaccel {
namespace transform {
namespace cpp {

// Entry i of the table is max(i, bit-reverse(i)), found by a running
// bit-reversed counter; walking the table upwards and exchanging where the
// entry differs from i swaps every pair exactly once. The comparisons are
// signed 32-bit, as the counter is.
inline void FillSwapTable(std::uint32_t size, std::uint32_t* table)
{
    const std::int32_t signedSize = static_cast<std::int32_t>(size);
    std::int32_t j = 0;
    for (std::uint32_t i = 0; i + 1 < size; ++i) {
        const std::int32_t index = static_cast<std::int32_t>(i);
        table[i] = static_cast<std::uint32_t>(index > j ? index : j);
        std::int32_t k = static_cast<std::int32_t>(size >> 1);
        while ((j & k) != 0) k >>= 1;
        j += k;
        // m is kept in 64 bits so that doubling past 2^30 cannot overflow.
        for (std::int64_t m = 2 * static_cast<std::int64_t>(k); m < signedSize; m *= 2) {
            j -= static_cast<std::int32_t>(m);
        }
    }
}

// The rotation recurrence: one cos and one sin per table, the running value
// kept in double for both element types and rounded only when stored.
struct Rotation {
    double wr, wi;
    double c, s;

    void Step()
    {
        const double nextWr = wr * c - (-s) * wi;
        const double nextWi = wr * (-s) + c * wi;
        wr = nextWr;
        wi = nextWi;
    }
};

inline double DoubleFromBits(std::uint64_t bits)
{
    double value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

// Pair t = exp(-2 pi i t / N), t = 0 .. N/2 - 1, with N = 1 << order.
template <class E>
void FillComplexTwiddles(std::uint32_t order, E* twiddles)
{
    const std::uint32_t h = (1u << order) >> 1;
    const double theta = DoubleFromBits(0x400921FB54442D18ull) / static_cast<double>(h);
    Rotation r{1.0, 0.0, std::cos(theta), std::sin(theta)};
    for (std::uint32_t t = 0; t < h; ++t) {
        twiddles[2 * std::size_t(t)] = static_cast<E>(r.wr);
        twiddles[2 * std::size_t(t) + 1] = static_cast<E>(r.wi);
        r.Step();
    }
}

// Pair t - 1 = exp(-2 pi i t / N), t = 1 .. N/2 - 1: the factors of the
// combine step of the real transform.
template <class E>
void FillRealTwiddles(std::uint32_t size, E* twiddles)
{
    const double theta = DoubleFromBits(0x401921FB54442D18ull) / static_cast<double>(size);
    const double c = std::cos(theta), s = std::sin(theta);
    Rotation r{c, -s, c, s};
    for (std::uint32_t t = 1; t < size / 2; ++t) {
        twiddles[2 * std::size_t(t - 1)] = static_cast<E>(r.wr);
        twiddles[2 * std::size_t(t - 1) + 1] = static_cast<E>(r.wi);
        r.Step();
    }
}

// Fills a plan whose fields are all zero. kind 1 asks for a complex plan of
// `size` points, anything else for a real plan of `size` samples. Returns
// false when a complex plan below 2 points was asked for, directly or as the
// half plan of a real one (the normal outcome for a real plan of 2 samples,
// which needs no tables).
template <class E>
bool BuildFFTPlan(FFTPlan<E>& plan, unsigned int kind, unsigned int size)
{
    plan.size = size;
    plan.order = 0;
    if (size > 1) {
        std::uint32_t k = 1;
        while ((1u << k) < size) ++k;
        plan.order = k;
    }
    if (kind == kComplexPlan) {
        if (size < 2) return false;
        plan.swapTable = new std::uint32_t[size - 1]();
        FillSwapTable(size, plan.swapTable);
        plan.twiddles = new E[size];
        FillComplexTwiddles(plan.order, plan.twiddles);
        plan.interleaveScratch.Reserve(2 * size);
        return true;
    }
    if (size < 2) return true;
    // The general allocator throws on failure; the null test stays all the
    // same, as in every allocation of a plan record.
    plan.halfPlan = new FFTPlan<E>{};
    if (plan.halfPlan == nullptr) return false;
    if (!BuildFFTPlan(*plan.halfPlan, kComplexPlan, size >> 1)) return false;
    plan.twiddles = new E[size - 2];
    FillRealTwiddles(size, plan.twiddles);
    plan.forwardScratch.Reserve(2 * size + 2);
    plan.inverseScratch.Reserve(2 * size + 2);
    return true;
}

// Releases what the plan owns; the record itself belongs to its holder.
template <class E>
void DestroyFFTPlan(FFTPlan<E>& plan)
{
    if (plan.halfPlan != nullptr) {
        DestroyFFTPlan(*plan.halfPlan);
        delete plan.halfPlan;
        plan.halfPlan = nullptr;
    }
    if (plan.swapTable != nullptr && plan.size >= 2) delete[] plan.swapTable;
    plan.swapTable = nullptr;
    plan.interleaveScratch.Release();
    plan.inverseScratch.Release();
    plan.forwardScratch.Release();
    delete[] plan.twiddles;
    plan.twiddles = nullptr;
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
