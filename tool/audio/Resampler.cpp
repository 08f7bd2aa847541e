#include "audio/Resampler.h"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <stdexcept>

#include <kestaccel/BasicMath.h>
#include <kestaccel/MultiRate.h>
#include <kestaccel/VectorUtils.h>

#include "audio/FilterDesign.h"

namespace kestaudio {

namespace ku = kestaccel::utility;
namespace kf = kestaccel::filter;

// fast and default filter in float, best in double. default trades some
// bandwidth for speed: the polyphase filter's cost is L products per output,
// and L grows as the inverse of the transition band.
const std::vector<ResamplePreset>& ResamplePresets()
{
    static const std::vector<ResamplePreset> presets = {
        {Quality::Fast, "fast", 0.80, 1.0, 80, false},
        {Quality::Default, "default", 0.85, 1.0, 100, false},
        {Quality::Best, "best", 0.95, 1.0, 175, true},
    };
    return presets;
}

const ResamplePreset& PresetFor(Quality quality)
{
    for (const ResamplePreset& p : ResamplePresets()) {
        if (p.quality == quality) return p;
    }
    return ResamplePresets()[1];
}

bool ParseQuality(const std::string& name, Quality* quality)
{
    for (const ResamplePreset& p : ResamplePresets()) {
        if (name == p.name) {
            *quality = p.quality;
            return true;
        }
    }
    return false;
}

RatePlan PlanResampling(std::uint32_t inRate, std::uint32_t outRate, const ResamplePreset& preset)
{
    if (inRate == 0 || outRate == 0 || inRate > kMaxRate || outRate > kMaxRate) {
        throw std::invalid_argument("sample rates must lie between 1 and " + std::to_string(kMaxRate) + " Hz");
    }
    RatePlan plan;
    plan.inRate = inRate;
    plan.outRate = outRate;
    const std::uint32_t g = std::gcd(inRate, outRate);
    plan.up = outRate / g;
    plan.down = inRate / g;
    plan.doublePrecision = preset.doublePrecision;

    // Kaiser's estimate of the length for the transition band, counted in
    // input samples per output (taps per phase).
    const double lowerNyquist = std::min(inRate, outRate) / 2.0;
    const double transition = (preset.stopbandStart - preset.passbandEnd) * lowerNyquist / inRate;
    const double perPhase = std::ceil((preset.attenuationDb - 7.95) / (14.36 * transition));
    const double total = perPhase * plan.up;
    if (total > double(kMaxTaps)) {
        throw std::length_error("the ratio " + std::to_string(plan.up) + "/" + std::to_string(plan.down) +
                                " needs a filter of " + std::to_string(std::uint64_t(total)) +
                                " taps, more than the limit of " + std::to_string(kMaxTaps));
    }
    plan.tapsPerPhase = std::uint32_t(std::max(1.0, perPhase));
    const std::uint32_t taps = plan.tapsPerPhase * plan.up;
    // An odd length puts the centre on a tap, so the delay is a whole number
    // of high-rate samples and the output lines up with the input exactly.
    plan.designTaps = taps % 2 == 1 ? taps : taps - 1;
    plan.delay = (plan.designTaps - 1) / 2;
    plan.cutoff = (preset.passbandEnd + preset.stopbandStart) / 2 * lowerNyquist / (double(plan.up) * inRate);
    plan.kaiserBeta = KaiserBeta(preset.attenuationDb);
    return plan;
}

std::vector<double> DesignResamplingFilter(const RatePlan& plan)
{
    std::vector<double> taps = DesignLowpass(plan.cutoff, plan.designTaps, plan.kaiserBeta, plan.up);
    taps.resize(std::size_t(plan.tapsPerPhase) * plan.up, 0.0);
    return taps;
}

std::uint64_t ResampledLength(std::uint64_t inFrames, const RatePlan& plan)
{
    return (inFrames * plan.up + plan.down - 1) / plan.down;
}

namespace {

template <class T>
using PoolVector = std::vector<T, kestcore::allocator::STLAllocator<T>>;
template <class T>
struct MRFStateOf;
template <>
struct MRFStateOf<float> {
    using type = kestaccel::MRFState_Float;
};
template <>
struct MRFStateOf<double> {
    using type = kestaccel::MRFState_Double;
};

void ToElement(std::size_t n, const float* src, float* dst) { std::copy(src, src + n, dst); }
void ToElement(std::size_t n, const float* src, double* dst) { ku::Convert(unsigned(n), src, dst); }
void ToFloat(std::size_t n, const float* src, float* dst) { std::copy(src, src + n, dst); }
void ToFloat(std::size_t n, const double* src, float* dst) { ku::Convert(unsigned(n), src, dst); }

// Output n lies at the high-rate position n * D + delay; a fresh filter whose
// first output is at position p, with src at input index b, is initialised
// with the start position p - b * U.
template <class T>
void RunOneCall(const RatePlan& plan, const T* taps, std::int64_t startPosition, const T* src, T* dst,
                unsigned int cycles)
{
    typename MRFStateOf<T>::type* state = nullptr;
    const PoolVector<T> unused;
    try {
        kf::MRFInit(&state, plan.up, plan.down, taps, plan.tapsPerPhase * plan.up, unused, 0,
                    std::uint32_t(startPosition));
        kf::MRFProcess(src, dst, cycles, state);
    } catch (...) {
        kf::MRFFree(state);
        throw;
    }
    kf::MRFFree(state);
}

}  // namespace

// Streaming with the polyphase filter. One call is exact at any D, but a
// state carried across calls drifts by cycleCount * (D - 1) input samples
// per call, and its history is then the wrong samples. So every block is one
// call on a fresh state, given a pointer into a sliding window of the input
// (zeros before the first sample) such that its first output's oldest
// sample is src[0]: no read reaches the history, every read is the same
// sample as in the one call over the whole signal, and the sums are the same
// bits. A state costs up * L copied taps against the up * L * cycles
// products of a block.
struct StreamingResampler::Impl {
    RatePlan plan;
    unsigned int channels;
    std::vector<double> taps;
    std::vector<float> tapsFloat;
    unsigned int blockCycles;
    std::uint64_t received = 0;  // input frames
    std::uint64_t produced = 0;  // output frames
    std::int64_t windowStart;    // the input index of window[c][0]
    std::vector<std::vector<float>> windowFloat;
    std::vector<std::vector<double>> windowDouble;
    std::vector<float> staging;
    std::vector<float> outFloat;
    std::vector<double> outDouble;
    std::vector<float> outChannels;

    // The input index of the oldest sample the output n reads.
    std::int64_t FirstRead(std::uint64_t n) const
    {
        return std::int64_t((n * plan.down + plan.delay) / plan.up) - std::int64_t(plan.tapsPerPhase - 1);
    }

    template <class T>
    void Append(std::vector<std::vector<T>>& window, const float* in, std::size_t frames)
    {
        staging.resize(frames * channels);
        std::vector<float*> dests(channels);
        for (unsigned int c = 0; c < channels; ++c) dests[c] = staging.data() + c * frames;
        ku::Deinterleave(channels, unsigned(frames), in, dests.data());
        for (unsigned int c = 0; c < channels; ++c) {
            const std::size_t old = window[c].size();
            window[c].resize(old + frames);
            ToElement(frames, dests[c], window[c].data() + old);
        }
    }

    const float* TapsOf(float*) const { return tapsFloat.data(); }
    const double* TapsOf(double*) const { return taps.data(); }

    template <class T>
    void Run(std::vector<std::vector<T>>& window, std::vector<T>& outT, bool finished, std::vector<float>& out)
    {
        const std::uint64_t total = finished ? ResampledLength(received, plan) : 0;
        const T* tapsT = TapsOf(static_cast<T*>(nullptr));
        while (true) {
            unsigned int cycles = blockCycles;
            if (finished) {
                if (produced >= total) break;
                const std::uint64_t remaining = total - produced;
                cycles = unsigned(std::min<std::uint64_t>(cycles, (remaining + plan.up - 1) / plan.up));
            }
            const std::uint64_t outputs = std::uint64_t(cycles) * plan.up;
            const std::int64_t base = FirstRead(produced);
            const std::int64_t lastRead = std::int64_t(((produced + outputs - 1) * plan.down + plan.delay) / plan.up);
            // The call also reads its cycles * D samples into the history.
            const std::int64_t needed = std::max(lastRead, base + std::int64_t(cycles) * plan.down - 1);
            if (!finished && needed >= std::int64_t(received)) break;
            const std::size_t have = std::size_t(needed - windowStart + 1);
            for (auto& w : window) {
                if (w.size() < have) w.resize(have, T(0));
            }
            const std::int64_t start = std::int64_t(produced * plan.down + plan.delay) - base * plan.up;
            const std::size_t emit = std::size_t(finished ? std::min<std::uint64_t>(outputs, total - produced) : outputs);
            outT.resize(outputs);
            outChannels.resize(std::size_t(outputs) * channels);
            const std::size_t old = out.size();
            out.resize(old + emit * channels);
            for (unsigned int c = 0; c < channels; ++c) {
                RunOneCall<T>(plan, tapsT, start, window[c].data() + (base - windowStart), outT.data(), cycles);
                ToFloat(emit, outT.data(), outChannels.data() + std::size_t(c) * outputs);
            }
            std::vector<const float*> sources(channels);
            for (unsigned int c = 0; c < channels; ++c) sources[c] = outChannels.data() + std::size_t(c) * outputs;
            ku::Interleave(channels, unsigned(emit), sources.data(), out.data() + old);
            produced += emit;
            // Drop what no later block reads.
            const std::int64_t next = FirstRead(produced);
            if (next > windowStart) {
                const std::size_t drop = std::size_t(next - windowStart);
                for (auto& w : window) w.erase(w.begin(), w.begin() + std::min(drop, w.size()));
                windowStart = next;
            }
        }
    }

    void Run(bool finished, std::vector<float>& out)
    {
        if (plan.doublePrecision) {
            Run(windowDouble, outDouble, finished, out);
        } else {
            Run(windowFloat, outFloat, finished, out);
        }
    }
};

StreamingResampler::StreamingResampler(const RatePlan& plan, unsigned int channels) : impl(new Impl)
{
    if (channels == 0) throw std::invalid_argument("no channels");
    impl->plan = plan;
    impl->channels = channels;
    impl->taps = DesignResamplingFilter(plan);
    impl->tapsFloat.assign(impl->taps.begin(), impl->taps.end());
    // About 32768 output frames a block, each with a state of its own, in
    // groups of eight cycles: the filter computes eight cycles side by side.
    impl->blockCycles = std::max(8u, 32768u / plan.up / 8 * 8);
    impl->windowStart = std::min<std::int64_t>(0, impl->FirstRead(0));
    const std::size_t zeros = std::size_t(-impl->windowStart);
    if (plan.doublePrecision) {
        impl->windowDouble.assign(channels, std::vector<double>(zeros, 0.0));
    } else {
        impl->windowFloat.assign(channels, std::vector<float>(zeros, 0.0f));
    }
}

StreamingResampler::~StreamingResampler() = default;

void StreamingResampler::Process(const float* in, std::size_t frames, std::vector<float>& out)
{
    if (impl->plan.doublePrecision) {
        impl->Append(impl->windowDouble, in, frames);
    } else {
        impl->Append(impl->windowFloat, in, frames);
    }
    impl->received += frames;
    impl->Run(false, out);
}

void StreamingResampler::Finish(std::vector<float>& out) { impl->Run(true, out); }

const RatePlan& StreamingResampler::Plan() const { return impl->plan; }
const std::vector<double>& StreamingResampler::Taps() const { return impl->taps; }

namespace {
template <class T>
std::vector<float> OneCall(const float* in, std::size_t frames, const RatePlan& plan)
{
    const std::uint64_t total = ResampledLength(frames, plan);
    const unsigned int cycles = unsigned((total + plan.up - 1) / plan.up);
    const std::vector<double> design = DesignResamplingFilter(plan);
    const std::vector<T> taps(design.begin(), design.end());
    // Zeros after the signal: the reads of the last outputs and of the call's
    // own cycles * D samples.
    std::vector<T> src(std::max<std::uint64_t>(frames, std::uint64_t(cycles) * plan.down) + plan.tapsPerPhase +
                       plan.delay / plan.up + 1, T(0));
    ToElement(frames, in, src.data());
    std::vector<T> dst(std::size_t(cycles) * plan.up);
    RunOneCall<T>(plan, taps.data(), std::int64_t(plan.delay), src.data(), dst.data(), cycles);
    std::vector<float> out(total);
    ToFloat(total, dst.data(), out.data());
    return out;
}
}  // namespace

std::vector<float> ResampleOneCall(const float* in, std::size_t frames, const RatePlan& plan)
{
    return plan.doublePrecision ? OneCall<double>(in, frames, plan) : OneCall<float>(in, frames, plan);
}

}  // namespace kestaudio
