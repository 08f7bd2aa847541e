// The polyphase multi-rate filter from 48000 Hz to 44100 Hz (U = 147,
// D = 160) and back (U = 160, D = 147), 32 taps per branch, beside
// liquid-dsp's rresamp_rrrf with the same taps. The size is the number of
// rate-change cycles per call; items are input samples.
//
// A call leaves the filter's position cycleCount * (D - 1) samples further on
// than a seamless stream would, so each call on one filter reads further into
// its source. One filter therefore serves calls over a long source buffer
// until the next call would read past it, and is then made anew outside the
// timed region; only the calls are timed.

#include <kestaccel/MultiRate.h>

#include <chrono>
#include <cmath>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_LIQUID
#include <liquid/liquid.h>
#endif

namespace {

using namespace kestaccel_bench;

constexpr unsigned int kTapsPerBranch = 32;

// A Hann-windowed sinc at the lower Nyquist frequency, gain `up`.
std::vector<float> ResamplingTaps(unsigned int up, unsigned int down)
{
    const std::size_t count = std::size_t(up) * kTapsPerBranch;
    const double pi = 3.14159265358979323846;
    const double fc = 0.45 / double(up > down ? up : down);
    const double centre = 0.5 * double(count - 1);
    std::vector<float> taps(count);
    for (std::size_t k = 0; k < count; ++k) {
        const double t = double(k) - centre;
        const double sinc = t == 0.0 ? 2.0 * fc : std::sin(2.0 * pi * fc * t) / (pi * t);
        const double hann = 0.5 - 0.5 * std::cos(2.0 * pi * (double(k) + 0.5) / double(count));
        taps[k] = float(double(up) * sinc * hann);
    }
    return taps;
}

void MultiRateOurs(benchmark::State& state, unsigned int up, unsigned int down)
{
    const auto cycles = static_cast<unsigned int>(state.range(0));
    const auto taps = ResamplingTaps(up, down);
    const std::size_t sourceLength = std::size_t(1) << 20;
    const auto src = RandomData<float>(sourceLength, 11);
    std::vector<float> dst(std::size_t(up) * cycles);
    const std::vector<float, kestcore::allocator::STLAllocator<float>> reserved;
    const std::size_t drift = std::size_t(cycles) * (down - 1);
    const std::size_t reach = std::size_t(cycles) * down + kTapsPerBranch;
    kestaccel::MRFState_Float* filter = nullptr;
    std::size_t calls = 0;
    for (auto _ : state) {
        if (filter == nullptr || (calls + 1) * drift + reach > sourceLength) {
            kestaccel::filter::MRFFree(filter);
            kestaccel::filter::MRFInit(&filter, up, down, taps.data(), static_cast<unsigned int>(taps.size()), reserved,
                                       0, 0);
            calls = 0;
        }
        const auto start = std::chrono::steady_clock::now();
        kestaccel::filter::MRFProcess(src.data(), dst.data(), cycles, filter);
        benchmark::ClobberMemory();
        const auto stop = std::chrono::steady_clock::now();
        state.SetIterationTime(std::chrono::duration<double>(stop - start).count());
        ++calls;
    }
    kestaccel::filter::MRFFree(filter);
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()) * down * cycles);
}

#ifdef KESTACCEL_BENCH_HAVE_LIQUID
// liquid keeps a seamless stream, so one resampler serves every iteration.
void MultiRateLiquid(benchmark::State& state, unsigned int up, unsigned int down)
{
    const auto cycles = static_cast<unsigned int>(state.range(0));
    auto taps = ResamplingTaps(up, down);
    auto src = RandomData<float>(std::size_t(down) * cycles, 11);
    std::vector<float> dst(std::size_t(up) * cycles);
    rresamp_rrrf resampler = rresamp_rrrf_create(up, down, kTapsPerBranch / 2, taps.data());
    for (auto _ : state) {
        const auto start = std::chrono::steady_clock::now();
        rresamp_rrrf_execute_block(resampler, src.data(), cycles, dst.data());
        benchmark::ClobberMemory();
        const auto stop = std::chrono::steady_clock::now();
        state.SetIterationTime(std::chrono::duration<double>(stop - start).count());
    }
    rresamp_rrrf_destroy(resampler);
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()) * down * cycles);
}
#endif

struct Conversion {
    const char* name;
    unsigned int up;
    unsigned int down;
};

const bool registered = [] {
    const Conversion conversions[] = {{"MRF_48000to44100_f32", 147, 160}, {"MRF_44100to48000_f32", 160, 147}};
    for (const Conversion& c : conversions) {
        for (long cycles : {1L, 8L, 64L}) {
            const unsigned int up = c.up, down = c.down;
            benchmark::RegisterBenchmark(Name(c.name, "kestaccel").c_str(),
                                         [up, down](benchmark::State& s) { MultiRateOurs(s, up, down); })
                ->Arg(cycles)
                ->UseManualTime();
#ifdef KESTACCEL_BENCH_HAVE_LIQUID
            benchmark::RegisterBenchmark(Name(c.name, "liquid").c_str(),
                                         [up, down](benchmark::State& s) { MultiRateLiquid(s, up, down); })
                ->Arg(cycles)
                ->UseManualTime();
#endif
        }
    }
    return true;
}();

}  // namespace
