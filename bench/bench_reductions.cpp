// Sum, DotProduct, MinMaxIndex and Threshold_LT_InPlace beside a memcpy of
// the bytes each one reads. The sums and the scan are serial by contract;
// the threshold is element-wise and vectorised.

#include <kestaccel/BasicMath.h>
#include <kestaccel/DSP.h>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_VOLK
#include <volk/volk.h>
#endif

namespace {

using namespace kestaccel_bench;

const std::vector<long> kSizes = {1024, 65536};

void SumOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto src = RandomData<float>(n, 11);
    for (auto _ : state) benchmark::DoNotOptimize(kestaccel::utility::Sum(n, src.data()));
    state.SetItemsProcessed(state.iterations() * n);
}

void DotProductOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto a = RandomData<float>(n, 12), b = RandomData<float>(n, 13);
    for (auto _ : state) benchmark::DoNotOptimize(kestaccel::utility::DotProduct(n, a.data(), b.data()));
    state.SetItemsProcessed(state.iterations() * n);
}

void MinMaxIndexOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto src = RandomData<float>(n, 14);
    float minimum = 0, maximum = 0;
    unsigned int minimumIndex = 0, maximumIndex = 0;
    for (auto _ : state) {
        kestaccel::utility::MinMaxIndex(n, src.data(), minimum, maximum, minimumIndex, maximumIndex);
        benchmark::DoNotOptimize(minimumIndex);
        benchmark::DoNotOptimize(maximumIndex);
    }
    state.SetItemsProcessed(state.iterations() * n);
}

// Each pass clips the same buffer again; the loop has no data-dependent
// branch, so later passes cost what the first does.
void ThresholdLTOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto data = RandomData<float>(n, 15);
    for (auto _ : state) {
        kestaccel::utility::Threshold_LT_InPlace(n, data.data(), 0.0f);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

#ifdef KESTACCEL_BENCH_HAVE_VOLK
void SumVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto src = RandomData<float>(n, 11);
    float result = 0;
    for (auto _ : state) {
        volk_32f_accumulator_s32f(&result, src.data(), n);
        benchmark::DoNotOptimize(result);
    }
    state.SetItemsProcessed(state.iterations() * n);
}

void DotProductVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto a = RandomData<float>(n, 12), b = RandomData<float>(n, 13);
    float result = 0;
    for (auto _ : state) {
        volk_32f_x2_dot_prod_32f(&result, a.data(), b.data(), n);
        benchmark::DoNotOptimize(result);
    }
    state.SetItemsProcessed(state.iterations() * n);
}
#endif

// The references copy as many bytes as the kernel reads.
void OneVectorCopy(benchmark::State& state) { CopyReference(state, sizeof(float) * state.range(0)); }
void TwoVectorCopy(benchmark::State& state) { CopyReference(state, 2 * sizeof(float) * state.range(0)); }

const bool registered = [] {
    for (long n : kSizes) {
        benchmark::RegisterBenchmark(Name("Sum_f32", "kestaccel").c_str(), SumOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("Sum_f32", "memcpy").c_str(), OneVectorCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("DotProduct_f32", "kestaccel").c_str(), DotProductOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("DotProduct_f32", "memcpy").c_str(), TwoVectorCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("MinMaxIndex_f32", "kestaccel").c_str(), MinMaxIndexOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("MinMaxIndex_f32", "memcpy").c_str(), OneVectorCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("Threshold_LT_InPlace_f32", "kestaccel").c_str(), ThresholdLTOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("Threshold_LT_InPlace_f32", "memcpy").c_str(), OneVectorCopy)->Arg(n);
#ifdef KESTACCEL_BENCH_HAVE_VOLK
        benchmark::RegisterBenchmark(Name("Sum_f32", "volk").c_str(), SumVolk)->Arg(n);
        benchmark::RegisterBenchmark(Name("DotProduct_f32", "volk").c_str(), DotProductVolk)->Arg(n);
#endif
    }
    return true;
}();

}  // namespace
