// The audio layer's streaming resampler and the kestaccel program, on
// signals and files made here.

#include <gtest/gtest.h>

#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include <openssl/evp.h>
#include <sndfile.h>

#include "audio/Resampler.h"
#include "audio/Spectrum.h"

namespace fs = std::filesystem;
using namespace kestaudio;

namespace {

// Streaming in blocks of uneven sizes gives the bits of one MRFProcess call
// over the whole signal, for every preset (float and double filters), at
// ratios whose D is above 1 and at D = 1. Carrying one filter state across
// calls at D > 1 drifts, and fails here.
TEST(StreamingResampler, EqualsOneCallOverTheWholeSignal)
{
    const unsigned int pairs[][2] = {{48000, 44100}, {44100, 48000}, {96000, 44100}, {8000, 48000}};
    std::mt19937 rng(7);
    std::uniform_real_distribution<float> noise(-0.9f, 0.9f);
    const std::size_t frames = 20011;
    std::vector<float> in(frames * 2);
    for (float& v : in) v = noise(rng);
    for (const auto& pair : pairs) {
        for (const ResamplePreset& preset : ResamplePresets()) {
            SCOPED_TRACE(std::to_string(pair[0]) + " -> " + std::to_string(pair[1]) + " " + preset.name);
            const RatePlan plan = PlanResampling(pair[0], pair[1], preset);
            StreamingResampler resampler(plan, 2);
            std::vector<float> out;
            std::size_t step = 1;
            for (std::size_t pos = 0; pos < frames; pos += step, step = step * 7 % 4999 + 1) {
                resampler.Process(in.data() + pos * 2, std::min(step, frames - pos), out);
            }
            resampler.Finish(out);
            ASSERT_EQ(out.size(), 2 * ResampledLength(frames, plan));
            for (int c = 0; c < 2; ++c) {
                std::vector<float> mono(frames);
                for (std::size_t i = 0; i < frames; ++i) mono[i] = in[i * 2 + c];
                const std::vector<float> whole = ResampleOneCall(mono.data(), frames, plan);
                std::size_t mismatches = 0;
                for (std::size_t i = 0; i < whole.size(); ++i) {
                    mismatches += std::memcmp(&whole[i], &out[i * 2 + c], sizeof(float)) != 0;
                }
                EXPECT_EQ(mismatches, 0u) << "channel " << c;
            }
        }
    }
}

struct CliResult {
    int status;
    std::string out, err;
};

// Runs the program through the shell (for ulimit) with output captured.
CliResult Cli(const std::string& args, const std::string& prefix = "")
{
    const fs::path dir = fs::temp_directory_path();
    const std::string out = (dir / "kestaccel-test.out").string(), err = (dir / "kestaccel-test.err").string();
    const std::string command = prefix + "'" KESTACCEL_CLI "' " + args + " >'" + out + "' 2>'" + err + "'";
    const int raw = std::system(("/bin/sh -c \"" + command + "\"").c_str());
    auto slurp = [](const std::string& p) {
        std::ifstream f(p);
        std::stringstream s;
        s << f.rdbuf();
        return s.str();
    };
    return {WIFEXITED(raw) ? WEXITSTATUS(raw) : -1, slurp(out), slurp(err)};
}

std::string FileBytes(const fs::path& p)
{
    std::ifstream f(p, std::ios::binary);
    std::stringstream s;
    s << f.rdbuf();
    return s.str();
}

struct Audio {
    SF_INFO info{};
    std::vector<float> samples;
    std::vector<int> ints;
};

Audio Load(const fs::path& p)
{
    Audio a;
    SNDFILE* f = sf_open(p.c_str(), SFM_READ, &a.info);
    EXPECT_NE(f, nullptr) << p;
    if (f == nullptr) return a;
    a.samples.resize(a.info.frames * a.info.channels);
    sf_readf_float(f, a.samples.data(), a.info.frames);
    sf_seek(f, 0, SEEK_SET);
    a.ints.resize(a.samples.size());
    sf_readf_int(f, a.ints.data(), a.info.frames);
    sf_close(f);
    return a;
}

// The digest the program prints: the samples as stored, little-endian, 2, 3
// or 4 bytes each.
std::string SampleDigest(const Audio& a)
{
    const int sub = a.info.format & SF_FORMAT_SUBMASK;
    std::string bytes;
    for (std::size_t i = 0; i < a.ints.size(); ++i) {
        std::uint32_t v;
        int width = 4;
        if (sub == SF_FORMAT_FLOAT) {
            std::memcpy(&v, &a.samples[i], 4);
        } else {
            width = sub == SF_FORMAT_PCM_16 ? 2 : sub == SF_FORMAT_PCM_24 ? 3 : 4;
            v = std::uint32_t(a.ints[i]) >> (32 - 8 * width);
        }
        for (int b = 0; b < width; ++b) bytes += char(v >> (8 * b));
    }
    unsigned char md[32];
    unsigned int len = 0;
    EVP_Digest(bytes.data(), bytes.size(), md, &len, EVP_sha256(), nullptr);
    char hex[65];
    for (int i = 0; i < 32; ++i) std::snprintf(hex + 2 * i, 3, "%02x", md[i]);
    return hex;
}

class Program : public ::testing::Test {
protected:
    void SetUp() override
    {
        dir = fs::temp_directory_path() / ("kestaccel-tool-test-" + std::to_string(::getpid()));
        fs::remove_all(dir);
        fs::create_directories(dir);
        input = dir / "in.wav";
        ASSERT_EQ(Cli("generate '" + input.string() + "' --seconds 1 --quiet").status, 0);
        inputBytes = FileBytes(input);
    }
    void TearDown() override
    {
        EXPECT_EQ(FileBytes(input), inputBytes) << "the input changed";
        fs::remove_all(dir);
    }
    std::set<std::string> Listing() const
    {
        std::set<std::string> names;
        for (const auto& e : fs::directory_iterator(dir)) names.insert(e.path().filename().string());
        return names;
    }
    fs::path dir, input;
    std::string inputBytes;
};

// Each command on a short stereo file: it succeeds, prints the digest of the
// samples it wrote, and the file holds what the command promises.
TEST_F(Program, EachCommandWritesWhatItPromises)
{
    const Audio source = Load(input);
    ASSERT_EQ(source.info.channels, 2);
    ASSERT_EQ(source.info.frames, 48000);
    // The tone segment (0.4 s to 0.7 s): 1 kHz at -6 dBFS in channel 1.
    auto toneLevel = [&](const Audio& a, double frequency) {
        const double rate = a.info.samplerate;
        std::vector<double> x;
        for (std::size_t i = std::size_t(0.42 * rate); x.size() < 4096; ++i) x.push_back(a.samples[i * a.info.channels]);
        return MeasureTone(x.data(), x.size(), rate, frequency, 1.0, rate).gainDb;
    };
    const double sourceLevel = toneLevel(source, 1000);
    ASSERT_NEAR(sourceLevel, -6.02, 0.01);

    struct Case {
        const char* args;  // IN and OUT are substituted
        const char* out;
        int rate, format;
        double toneChangeDb;  // the 1 kHz tone's change in level, within 0.05 dB
    };
    const Case cases[] = {
        {"resample IN OUT --rate 44100", "r.wav", 44100, SF_FORMAT_WAV | SF_FORMAT_FLOAT, 0},
        {"resample IN OUT --rate 16000 --quality fast --bits 24", "r.flac", 16000, SF_FORMAT_FLAC | SF_FORMAT_PCM_24, 0},
        {"filter IN OUT --lowpass 4000 --fir 301", "l.wav", 48000, SF_FORMAT_WAV | SF_FORMAT_FLOAT, 0},
        {"filter IN OUT --highpass 8000 --biquads 4", "h.aiff", 48000, SF_FORMAT_AIFF | SF_FORMAT_FLOAT, -95},
        {"filter IN OUT --bandpass 500 2000 --biquads 4", "b.wav", 48000, SF_FORMAT_WAV | SF_FORMAT_FLOAT, 0},
        {"convert IN OUT --bits 16", "c.flac", 48000, SF_FORMAT_FLAC | SF_FORMAT_PCM_16, 0},
        {"convert IN OUT --format caf --bits 32", "c.out", 48000, SF_FORMAT_CAF | SF_FORMAT_PCM_32, 0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.args);
        std::string args = c.args;
        const fs::path out = dir / c.out;
        args.replace(args.find("IN"), 2, "'" + input.string() + "'");
        args.replace(args.find("OUT"), 3, "'" + out.string() + "'");
        const CliResult run = Cli(args);
        ASSERT_EQ(run.status, 0) << run.err;
        const Audio a = Load(out);
        EXPECT_EQ(a.info.samplerate, c.rate);
        EXPECT_EQ(a.info.format, c.format);
        EXPECT_EQ(a.info.channels, 2);
        EXPECT_EQ(a.info.frames, (48000ll * c.rate + 47999) / 48000);
        EXPECT_EQ(run.out, "samples-sha256 " + SampleDigest(a) + "  " + out.string() + "\n");
        const double change = toneLevel(a, 1000) - sourceLevel;
        if (c.toneChangeDb < 0) {
            EXPECT_LT(change, c.toneChangeDb);
        } else {
            EXPECT_NEAR(change, 0, 0.05);
        }
    }
    // The resampled float file is the one-call result, bit for bit.
    const Audio resampled = Load(dir / "r.wav");
    const RatePlan plan = PlanResampling(48000, 44100, PresetFor(Quality::Default));
    for (int ch = 0; ch < 2; ++ch) {
        std::vector<float> mono(48000);
        for (std::size_t i = 0; i < mono.size(); ++i) mono[i] = source.samples[i * 2 + ch];
        const std::vector<float> whole = ResampleOneCall(mono.data(), mono.size(), plan);
        for (std::size_t i = 0; i < whole.size(); ++i) {
            ASSERT_EQ(std::memcmp(&whole[i], &resampled.samples[i * 2 + ch], 4), 0) << "frame " << i;
        }
    }
    // 16 bits: round half away from zero of x * 32768, the top held at 32767.
    const Audio shorts = Load(dir / "c.flac");
    for (std::size_t i = 0; i < source.samples.size(); ++i) {
        const long expected = std::min(32767l, std::lround(double(source.samples[i]) * 32768));
        ASSERT_EQ(shorts.ints[i] >> 16, expected) << "sample " << i;
    }
    // The spectrum: an SVG with a curve per channel and the spectrogram.
    ASSERT_EQ(Cli("spectrum '" + input.string() + "' '" + (dir / "s.svg").string() + "'").status, 0);
    const std::string svg = FileBytes(dir / "s.svg");
    EXPECT_EQ(svg.rfind("<svg", 0), 0u);
    EXPECT_NE(svg.find("channel 2"), std::string::npos);
    EXPECT_NE(svg.find("Spectrogram"), std::string::npos);
    EXPECT_NE(Cli("resample --help").out.find("usage: kestaccel resample"), std::string::npos);
}

// Every bad input: its exit status, one line naming the problem, and no file
// left behind, temporary ones included.
TEST_F(Program, BadInputFailsCleanly)
{
    std::ofstream(dir / "junk.wav") << "not audio at all";
    fs::create_directories(dir / "sub");
    const std::string in = "'" + input.string() + "'", out = "'" + (dir / "out.wav").string() + "'";
    struct Case {
        std::string args, prefix;
        int status;
        const char* message;
    };
    const Case cases[] = {
        {"resample '" + (dir / "missing.wav").string() + "' " + out + " --rate 8000", "", 1, "No such file"},
        {"convert '" + (dir / "junk.wav").string() + "' " + out, "", 1, "not an audio file"},
        {"resample " + in + " " + out + " --rate 0", "", 2, "--rate must lie between 1 and 2000000"},
        {"resample " + in + " " + out + " --rate 1e12", "", 2, "--rate must lie between"},
        {"resample " + in + " " + out + " --rate 1999993", "", 2, "taps, more than the limit"},
        {"resample " + in + " '" + (dir / "sub" / ".." / "in.wav").string() + "' --rate 8000", "", 2, "is the input"},
        {"convert " + in + " '" + (dir / "none" / "x.wav").string() + "'", "", 1, "cannot write in the folder"},
        {"convert " + in + " " + out, "ulimit -f 64; ", 1, "File too large"},
        {"filter " + in + " " + out + " --lowpass 30000", "", 2, "half the sample rate"},
        {"resample " + in + " " + out + " --rate 8000 --speed 2", "", 2, "unknown option"},
    };
    const std::set<std::string> before = Listing();
    for (const Case& c : cases) {
        SCOPED_TRACE(c.args);
        const CliResult run = Cli(c.args, c.prefix);
        EXPECT_EQ(run.status, c.status);
        EXPECT_NE(run.err.find(c.message), std::string::npos) << run.err;
        EXPECT_EQ(std::count(run.err.begin(), run.err.end(), '\n'), 1) << run.err;
        EXPECT_EQ(run.out, "");
        EXPECT_EQ(Listing(), before);
    }
}

}  // namespace
