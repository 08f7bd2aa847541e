// Add and MulConstant against VOLK's kernels and a memcpy of the same bytes.

#include <kestaccel/BasicMath.h>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_VOLK
#include <volk/volk.h>
#endif

namespace {

using namespace kestaccel_bench;

const std::vector<long> kSizes = {1024, 1048576};

void AddOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto a = RandomData<float>(n, 1), b = RandomData<float>(n, 2);
    std::vector<float> dst(n);
    for (auto _ : state) {
        kestaccel::utility::Add(n, a.data(), b.data(), dst.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

void MulConstantOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto src = RandomData<float>(n, 3);
    std::vector<float> dst(n);
    for (auto _ : state) {
        kestaccel::utility::MulConstant(n, src.data(), dst.data(), 0.7f);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

#ifdef KESTACCEL_BENCH_HAVE_VOLK
void AddVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto a = RandomData<float>(n, 1), b = RandomData<float>(n, 2);
    std::vector<float> dst(n);
    for (auto _ : state) {
        volk_32f_x2_add_32f(dst.data(), a.data(), b.data(), n);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

void MulConstantVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto src = RandomData<float>(n, 3);
    std::vector<float> dst(n);
    for (auto _ : state) {
        volk_32f_s32f_multiply_32f(dst.data(), src.data(), 0.7f, n);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}
#endif

// The reference copies as many bytes as the kernel writes.
void AddCopy(benchmark::State& state) { CopyReference(state, sizeof(float) * state.range(0)); }
void MulConstantCopy(benchmark::State& state) { CopyReference(state, sizeof(float) * state.range(0)); }

const bool registered = [] {
    for (long n : kSizes) {
        benchmark::RegisterBenchmark(Name("Add_f32", "kestaccel").c_str(), AddOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("Add_f32", "memcpy").c_str(), AddCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("MulConstant_f32", "kestaccel").c_str(), MulConstantOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("MulConstant_f32", "memcpy").c_str(), MulConstantCopy)->Arg(n);
#ifdef KESTACCEL_BENCH_HAVE_VOLK
        benchmark::RegisterBenchmark(Name("Add_f32", "volk").c_str(), AddVolk)->Arg(n);
        benchmark::RegisterBenchmark(Name("MulConstant_f32", "volk").c_str(), MulConstantVolk)->Arg(n);
#endif
    }
    return true;
}();

}  // namespace
