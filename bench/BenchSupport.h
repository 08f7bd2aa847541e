#pragma once

// Conventions of the benchmark programs. A benchmark is named
// "<kernel>/<implementation>/<size>": "kestaccel" for ours, a peer's name
// (volk, fftw, kissfft, liquid, eigen) or "memcpy" for a copy of the same
// bytes, which stands for the memory-bandwidth limit. bench/report.py
// divides our median time by each other implementation's median in the same
// run, so noisy machines still give comparable figures.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <cstring>
#include <random>
#include <string>
#include <vector>

namespace kestaccel_bench {

template <class T>
std::vector<T> RandomData(std::size_t count, std::uint32_t seed, T low = T(-1), T high = T(1))
{
    std::mt19937 engine(seed);
    std::uniform_real_distribution<T> dist(low, high);
    std::vector<T> values(count);
    for (auto& v : values) v = dist(engine);
    return values;
}

// A memcpy of `bytes` bytes per iteration: the bandwidth reference.
inline void CopyReference(benchmark::State& state, std::size_t bytes)
{
    std::vector<unsigned char> src(bytes, 1), dst(bytes);
    for (auto _ : state) {
        std::memcpy(dst.data(), src.data(), bytes);
        benchmark::DoNotOptimize(dst.data());
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * static_cast<std::int64_t>(bytes));
}

inline std::string Name(const std::string& kernel, const std::string& impl) { return kernel + "/" + impl; }

}  // namespace kestaccel_bench
