#pragma once

// Sample-rate conversion on the library's polyphase filter: the preset table,
// the plan a preset gives for a pair of rates, the filter design, and a
// streaming resampler whose output is bit for bit that of one MRFProcess call
// over the whole signal.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace kestaudio {

enum class Quality { Fast, Default, Best };

// Frequencies are fractions of the lower of the two Nyquist frequencies.
struct ResamplePreset {
    Quality quality;
    const char* name;
    double passbandEnd;    // the response is flat up to here
    double stopbandStart;  // and attenuated by attenuationDb from here on
    double attenuationDb;  // the Kaiser design's target
    bool doublePrecision;  // filter arithmetic in double rather than float
};

// fast, default, best, in that order.
const std::vector<ResamplePreset>& ResamplePresets();
const ResamplePreset& PresetFor(Quality quality);
// Accepts a preset's name; false for any other text.
bool ParseQuality(const std::string& name, Quality* quality);

// Rates are accepted from 1 Hz to this.
constexpr std::uint32_t kMaxRate = 2000000;
// The high-rate filter may have at most this many taps (64 MiB of floats).
constexpr std::uint64_t kMaxTaps = std::uint64_t(1) << 24;

struct RatePlan {
    std::uint32_t inRate = 0, outRate = 0;
    std::uint32_t up = 1, down = 1;   // outRate / inRate reduced
    std::uint32_t tapsPerPhase = 1;   // L: taps per output
    std::uint32_t designTaps = 1;     // odd, at most up * L; the rest of the up * L taps are 0
    double cutoff = 0.5;              // fraction of the high rate up * inRate
    double kaiserBeta = 0;
    std::uint64_t delay = 0;          // (designTaps - 1) / 2: the filter's delay at the high rate
    bool doublePrecision = false;
};

// Throws std::invalid_argument for a rate of 0 or above kMaxRate, and
// std::length_error when the filter would need more than kMaxTaps taps.
RatePlan PlanResampling(std::uint32_t inRate, std::uint32_t outRate, const ResamplePreset& preset);

// up * L taps, gain up (the zeros inserted by the polyphase filter take 1/up).
std::vector<double> DesignResamplingFilter(const RatePlan& plan);

// ceil(inFrames * up / down): the output covers the input's duration.
std::uint64_t ResampledLength(std::uint64_t inFrames, const RatePlan& plan);

// Resamples interleaved float frames block by block in memory bounded by the
// plan, not by the length of the stream.
class StreamingResampler {
public:
    StreamingResampler(const RatePlan& plan, unsigned int channels);
    ~StreamingResampler();
    StreamingResampler(const StreamingResampler&) = delete;
    StreamingResampler& operator=(const StreamingResampler&) = delete;

    // Takes `frames` interleaved frames and appends to `out` every output
    // frame that the input received so far completes.
    void Process(const float* in, std::size_t frames, std::vector<float>& out);
    // Ends the stream (silence follows it) and appends the remaining frames.
    void Finish(std::vector<float>& out);

    const RatePlan& Plan() const;
    const std::vector<double>& Taps() const;

private:
    struct Impl;
    std::unique_ptr<Impl> impl;
};

// The reference: one channel through one MRFProcess call over the whole
// signal, the filter starting from an empty history.
std::vector<float> ResampleOneCall(const float* in, std::size_t frames, const RatePlan& plan);

}  // namespace kestaudio
