// GenerateLowpassFIRCoefficients against a plain evaluation written here
// (sinc with its abscissa advanced by addition, the library's windows in
// place, normalisation by the left half), bit for bit; and the designed
// filter's frequency response, measured through the taps' DTFT.

#include <kestaccel/FIR.h>
#include <kestaccel/Window.h>

#include <cmath>
#include <cstdint>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using kestaccel::filter::GenerateLowpassFIRCoefficients;
using kestaccel::utility::DSPWindowType;

const double kPi = 3.141592653589793;

std::vector<double> ExpectedSinc(double cutoff, unsigned int n)
{
    const double c = cutoff + cutoff;
    std::vector<double> taps(n);
    const unsigned int h = n / 2;
    double x = (n % 2) ? kPi : 1.5707963267948966;
    if (n % 2) taps[h] = c;
    const unsigned int first = (n % 2) ? 1 : 0;
    for (unsigned int i = first; i < h + first; ++i) {
        const double value = std::sin(x * c) / x;
        x = x + kPi;
        taps[h + i] = value;
        taps[(n % 2) ? h - i : h - 1 - i] = value;
    }
    return taps;
}

void ExpectedWindow(int type, std::vector<double>& taps)
{
    const auto n = static_cast<unsigned int>(taps.size());
    if (type == 0) kestaccel::utility::WindowBartlett(n, taps.data(), taps.data());
    if (type == 2) kestaccel::utility::WindowHamming(n, taps.data(), taps.data());
    if (type == 3) kestaccel::utility::WindowHann(n, taps.data(), taps.data());
}

void ExpectedNormalise(std::vector<double>& taps)
{
    const std::size_t n = taps.size(), h = n / 2;
    const double centre = (n % 2) ? taps[h] : 0.0;
    double left = 0.0;
    for (std::size_t i = 0; i < h; ++i) left = left + taps[i];
    const double g = 1.0 / (std::fabs(left) * 2.0 + centre);
    for (auto& t : taps) t = t * g;
}

std::vector<double> Expected(double cutoff, unsigned int n, int type, bool normalize)
{
    auto taps = ExpectedSinc(cutoff, n);
    ExpectedWindow(type, taps);
    if (normalize) ExpectedNormalise(taps);
    return taps;
}

std::vector<double> Design(double cutoff, unsigned int n, int type, bool normalize)
{
    GuardedBuffer<double> taps(n);
    GenerateLowpassFIRCoefficients(cutoff, n, taps.data(), static_cast<DSPWindowType>(type), normalize, nullptr);
    EXPECT_TRUE(taps.Intact());
    return taps.values();
}

struct DesignCase {
    double cutoff;
    unsigned int taps;
};

const DesignCase kCases[] = {{0.1, 31}, {0.1, 32}, {0.25, 63}, {0.25, 64}, {0.37, 101},
                             {0.37, 100}, {0.05, 255}, {0.05, 256}, {0.45, 9}, {0.45, 10}};

// 1, 4 and 7 name no window; 0, 2 and 3 are Bartlett, Hamming and Hann.
const int kWindowTypes[] = {0, 1, 2, 3, 4, 7};

TEST(LowpassDesign, MatchesPlainEvaluationBitForBit)
{
    for (const auto& dc : kCases) {
        for (int type : kWindowTypes) {
            for (bool normalize : {false, true}) {
                SCOPED_TRACE("cutoff=" + std::to_string(dc.cutoff) + " taps=" + std::to_string(dc.taps) +
                             " window=" + std::to_string(type) + " normalize=" + std::to_string(normalize));
                EXPECT_TRUE(SameBitsArray(Expected(dc.cutoff, dc.taps, type, normalize),
                                          Design(dc.cutoff, dc.taps, type, normalize)));
            }
        }
    }
}

TEST(LowpassDesign, TapsAreExactlySymmetric)
{
    for (const auto& dc : kCases) {
        for (int type : kWindowTypes) {
            const auto taps = Design(dc.cutoff, dc.taps, type, true);
            for (unsigned int i = 0; i < dc.taps / 2; ++i)
                ASSERT_TRUE(SameBits(taps[i], taps[dc.taps - 1 - i])) << dc.taps << " taps, window " << type;
        }
    }
}

TEST(LowpassDesign, NormalisedTapsSumToOneForBothParities)
{
    for (const auto& dc : kCases) {
        for (int type : kWindowTypes) {
            const auto taps = Design(dc.cutoff, dc.taps, type, true);
            double sum = 0.0;
            for (double t : taps) sum += t;
            EXPECT_NEAR(1.0, sum, 1e-13) << dc.taps << " taps, window " << type;
        }
    }
}

// A negative cutoff makes the left half sum negative; the absolute value in
// the scale keeps that sign, so an even design sums to -1.
TEST(LowpassDesign, NegativeSumKeepsItsSign)
{
    const auto taps = Design(-0.2, 64, 2, true);
    double sum = 0.0;
    for (double t : taps) sum += t;
    EXPECT_NEAR(-1.0, sum, 1e-13);
}

double Gain(const std::vector<double>& taps, double f)
{
    double re = 0.0, im = 0.0;
    for (std::size_t k = 0; k < taps.size(); ++k) {
        re += taps[k] * std::cos(2.0 * kPi * f * static_cast<double>(k));
        im -= taps[k] * std::sin(2.0 * kPi * f * static_cast<double>(k));
    }
    return std::hypot(re, im);
}

TEST(LowpassDesign, PassesBelowTheCutoffAndStopsAbove)
{
    for (unsigned int n : {101u, 100u}) {
        for (int type : {2, 3}) {
            const double cutoff = 0.2;
            const auto taps = Design(cutoff, n, type, true);
            SCOPED_TRACE(std::to_string(n) + " taps, window " + std::to_string(type));
            for (double f = 0.0; f <= 0.16; f += 0.005) EXPECT_NEAR(1.0, Gain(taps, f), 5e-3) << "f=" << f;
            EXPECT_NEAR(0.5, Gain(taps, cutoff), 0.05);
            for (double f = 0.24; f <= 0.5; f += 0.005) EXPECT_LT(Gain(taps, f), 5e-3) << "f=" << f;
        }
    }
}

TEST(LowpassDesign, WorkBufferIsNeverTouched)
{
    std::vector<unsigned char> work(4096, 0x5A);
    std::vector<double> taps(64);
    for (int type : kWindowTypes) {
        GenerateLowpassFIRCoefficients(0.2, 64, taps.data(), static_cast<DSPWindowType>(type), true, work.data());
        GenerateLowpassFIRCoefficients(0.2, 63, taps.data(), static_cast<DSPWindowType>(type), false, work.data());
    }
    for (unsigned char b : work) ASSERT_EQ(0x5A, b);
}

TEST(LowpassDesign, ZeroTapsWriteNothing)
{
    for (int type : kWindowTypes) {
        GuardedBuffer<double> taps(0);
        GenerateLowpassFIRCoefficients(0.2, 0, taps.data(), static_cast<DSPWindowType>(type), true, nullptr);
        EXPECT_TRUE(taps.Intact());
    }
}

TEST(LowpassDesign, OneTapIsTwiceTheCutoff)
{
    const auto plain = Design(0.3, 1, 1, false);
    EXPECT_TRUE(SameBits(0.3 + 0.3, plain[0]));
    const auto scaled = Design(0.3, 1, 1, true);
    EXPECT_TRUE(SameBits((0.3 + 0.3) * (1.0 / (0.0 * 2.0 + (0.3 + 0.3))), scaled[0]));
    EXPECT_NEAR(1.0, scaled[0], 1e-15);
    // One sample of a cosine window is 0/0.
    EXPECT_TRUE(std::isnan(Design(0.3, 1, 3, false)[0]));
}

TEST(LowpassDesign, TwoTapsAreEqualHalfSampleSincs)
{
    const double c = 0.35 + 0.35;
    const double expected = std::sin(1.5707963267948966 * c) / 1.5707963267948966;
    const auto taps = Design(0.35, 2, 1, false);
    EXPECT_TRUE(SameBits(expected, taps[0]));
    EXPECT_TRUE(SameBits(expected, taps[1]));
}

// At the Nyquist cutoff every off-centre tap is sin(k pi) / (k pi), which
// the rounded pi leaves close to, but not exactly, 0.
TEST(LowpassDesign, NyquistCutoffLeavesOnlyTheCentre)
{
    const auto taps = Design(0.5, 21, 1, false);
    EXPECT_TRUE(SameBits(1.0, taps[10]));
    unsigned int nonZero = 0;
    for (unsigned int i = 0; i < 21; ++i) {
        if (i == 10) continue;
        EXPECT_LT(std::fabs(taps[i]), 1e-15) << "at " << i;
        nonZero += taps[i] != 0.0;
    }
    EXPECT_GT(nonZero, 0u);
}

TEST(LowpassDesign, ZeroCutoffNormalisesToNaN)
{
    const auto plain = Design(0.0, 16, 2, false);
    for (double t : plain) EXPECT_EQ(0.0, t);
    const auto scaled = Design(0.0, 16, 2, true);
    for (double t : scaled) EXPECT_TRUE(std::isnan(t));
}

}  // namespace
