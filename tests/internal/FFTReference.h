#pragma once

// The plain loop nests the kernels must reproduce bit for bit, sharing only
// the plan's tables with the library. Sizes start at 2.

#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

#include "transform/FFT/FFTPlan.h"

namespace fft_reference {

using kestaccel::transform::cpp::FFTPlan;

template <class E>
struct Pair {
    E re, im;
};

template <class E>
void Forward(const FFTPlan<E>& plan, E* data)
{
    Pair<E>* a = reinterpret_cast<Pair<E>*>(data);
    const std::uint32_t n = plan.size;
    for (std::uint32_t i = 0; i <= n - 2; ++i) {
        const std::uint32_t p = plan.swapTable[i];
        if (p != i) std::swap(a[i], a[p]);
    }
    for (std::uint32_t i = 0; i < n; i += 2) {
        const Pair<E> x = a[i], y = a[i + 1];
        a[i] = {x.re + y.re, x.im + y.im};
        a[i + 1] = {x.re - y.re, x.im - y.im};
    }
    if (plan.order > 1) {
        for (std::uint32_t b = 0; b < n; b += 4) {
            const Pair<E> u = a[b], v = a[b + 2];
            a[b] = {u.re + v.re, u.im + v.im};
            a[b + 2] = {u.re - v.re, u.im - v.im};
            const Pair<E> x = a[b + 1], y = a[b + 3];
            a[b + 1] = {x.re + y.im, x.im - y.re};
            a[b + 3] = {x.re - y.im, x.im + y.re};
        }
    }
    for (std::uint32_t s = 3; s <= plan.order; ++s) {
        const std::uint32_t half = 1u << (s - 1), span = 1u << s, stride = 1u << (plan.order - s);
        for (std::uint32_t j = 0; j < half; ++j) {
            const E wr = plan.twiddles[2 * (std::size_t(j) * stride)];
            const E wi = plan.twiddles[2 * (std::size_t(j) * stride) + 1];
            for (std::uint32_t i = j; i < n; i += span) {
                const std::uint32_t p = i + half;
                const E tr = a[p].re * wr - a[p].im * wi;
                const E ti = a[p].re * wi + a[p].im * wr;
                a[p] = {a[i].re - tr, a[i].im - ti};
                a[i] = {a[i].re + tr, a[i].im + ti};
            }
        }
    }
}

template <class E>
void Inverse(const FFTPlan<E>& plan, E* data)
{
    Pair<E>* a = reinterpret_cast<Pair<E>*>(data);
    const std::uint32_t n = plan.size;
    const E scale = E(1) / static_cast<E>(n);
    for (std::uint32_t i = 0; i < n; ++i) a[i].im = -a[i].im;
    Forward(plan, data);
    for (std::uint32_t i = 0; i < n; ++i) {
        a[i].re = a[i].re * scale;
        a[i].im = a[i].im * -scale;
    }
}

// Real forward of plan.size samples into size + 2 elements, with a work
// array of its own instead of the plan's scratch.
template <class E>
void RealForward(const FFTPlan<E>& plan, const E* src, E* dst)
{
    const std::uint32_t n = plan.size;
    if (n == 2) {
        dst[0] = src[1] + src[0];
        dst[1] = 0;
        dst[2] = src[0] - src[1];
        dst[3] = 0;
        return;
    }
    const std::uint32_t h = n / 2, q = n / 4;
    std::vector<Pair<E>> s(n + 1);
    for (std::uint32_t i = 0; i < h; ++i) s[i] = {src[2 * i], src[2 * i + 1]};
    Forward(*plan.halfPlan, &s[0].re);
    for (std::uint32_t k = 1; k <= q - 1; ++k) {
        const std::uint32_t j = h - k;
        const Pair<E> a = s[k], b = s[j];
        const Pair<E> o = {(a.im + b.im) * E(0.5), (a.re - b.re) * E(-0.5)};
        const Pair<E> e = {(b.re + a.re) * E(0.5), (a.im - b.im) * E(0.5)};
        s[h + k] = o;
        s[2 * h - k] = {o.re, -o.im};
        s[k] = e;
        s[j] = {e.re, -e.im};
    }
    const Pair<E> zq = s[q];
    s[h + q] = {zq.im, 0};
    s[q] = {zq.re, 0};
    const Pair<E> z0 = s[0];
    s[h] = {z0.re - z0.im, 0};
    s[0] = {z0.re + z0.im, 0};
    for (std::uint32_t k = 1; k <= h - 1; ++k) {
        const E wr = plan.twiddles[2 * (k - 1)], wi = plan.twiddles[2 * (k - 1) + 1];
        const Pair<E> o = s[h + k], e = s[k];
        s[k].re = (wr * o.re + e.re) - o.im * wi;
        s[k].im = (o.re * wi + e.im) + wr * o.im;
    }
    for (std::uint32_t i = 0; i < n + 2; ++i) dst[i] = (&s[0].re)[i];
}

template <class E>
void RealInverse(const FFTPlan<E>& plan, const E* src, E* dst)
{
    const std::uint32_t n = plan.size, h = n / 2;
    const E scale = E(1) / static_cast<E>(n);
    if (n == 2) {
        dst[0] = (src[2] + src[0]) * scale;
        dst[1] = (src[0] - src[2]) * scale;
        return;
    }
    for (std::uint32_t k = 0; k <= h; ++k) dst[k] = src[2 * k + 1] + src[2 * k];
    for (std::uint32_t k = h + 1; k <= n - 1; ++k) dst[k] = src[2 * (n - k)] - src[2 * (n - k) + 1];
    std::vector<E> y(n + 2);
    RealForward(plan, dst, y.data());
    for (std::uint32_t k = 0; k <= h; ++k) dst[k] = (y[2 * k + 1] + y[2 * k]) * scale;
    for (std::uint32_t k = h + 1; k <= n - 1; ++k) dst[k] = (y[2 * (n - k)] - y[2 * (n - k) + 1]) * scale;
}

}  // namespace fft_reference
