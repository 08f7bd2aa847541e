// The arithmetic bound of the FFT tables: how many independent vector adds
// and multiplies of the library's width this machine completes per second,
// three adds to two multiplies as in a radix-2 butterfly. This file alone
// is compiled with the library's ISA flags (bench/CMakeLists.txt), so its
// vectors are those of the library's kernels; the loop is a plain one that
// the compiler vectorises, like the kernels'.

#include <cstddef>
#include <string>
#include <vector>

#include "BenchSupport.h"

#if defined(__AVX512F__)
#define KESTACCEL_BENCH_VECTOR_BYTES 64
#elif defined(__AVX__)
#define KESTACCEL_BENCH_VECTOR_BYTES 32
#else
#define KESTACCEL_BENCH_VECTOR_BYTES 16
#endif

namespace {

using namespace kestaccel_bench;

// Elements of each array: 256 vectors, which stay in the first-level cache.
template <class E>
constexpr std::size_t kCount = 256 * KESTACCEL_BENCH_VECTOR_BYTES / sizeof(E);

// Each element takes six dependent adds and four dependent multiplies; the
// elements are independent, so the loop vectorises and the processor
// overlaps the chains of successive vectors, which leaves the adders and
// multipliers as the limit (two loads and two stores per ten operations).
// Adding 0 and multiplying by 1, both hidden from the compiler, keeps the
// values where they started: no overflow, no subnormals.
template <class E>
[[gnu::noinline]] void AddMulRound(E* __restrict sums, E* __restrict products, E step, E factor)
{
    for (std::size_t i = 0; i < kCount<E>; ++i) {
        E s = sums[i], p = products[i];
        s = s + step;
        p = p * factor;
        s = s + step;
        p = p * factor;
        s = s + step;
        s = s + step;
        p = p * factor;
        s = s + step;
        p = p * factor;
        s = s + step;
        sums[i] = s;
        products[i] = p;
    }
}

template <class E>
void AddMulPeak(benchmark::State& state)
{
    std::vector<E> sums(kCount<E>, E(1)), products(kCount<E>, E(1));
    E step = E(0), factor = E(1);
    benchmark::DoNotOptimize(step);
    benchmark::DoNotOptimize(factor);
    for (auto _ : state) {
        AddMulRound(sums.data(), products.data(), step, factor);
        benchmark::ClobberMemory();
    }
    // Operations per iteration: report.py divides them by the median time.
    state.counters["ops"] = 10.0 * kCount<E>;
    state.counters["lanes"] = double(KESTACCEL_BENCH_VECTOR_BYTES / sizeof(E));
}

const bool registered = [] {
    // Named <kernel>/<type>/<vector bytes>.
    const std::string bytes = std::to_string(KESTACCEL_BENCH_VECTOR_BYTES);
    benchmark::RegisterBenchmark(("AddMulPeak/f32/" + bytes).c_str(), AddMulPeak<float>);
    benchmark::RegisterBenchmark(("AddMulPeak/f64/" + bytes).c_str(), AddMulPeak<double>);
    return true;
}();

}  // namespace
