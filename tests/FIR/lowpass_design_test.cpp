// GenerateLowpassFIRCoefficients against a plain evaluation, bit for bit, and
// the design's frequency response.

#include <kestaccel/FIR.h>
#include <kestaccel/Window.h>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

std::vector<double> Expected(double cutoff, unsigned int n, int type, bool normalize)
{
    const double c = cutoff + cutoff;
    const unsigned int h = n / 2, odd = n % 2;
    std::vector<double> taps(n);
    double x = odd ? 3.141592653589793 : 1.5707963267948966;
    if (odd) taps[h] = c;
    for (unsigned int i = odd; i < h + odd; ++i) {
        const double value = std::sin(x * c) / x;
        x = x + 3.141592653589793;
        taps[h + i] = value;
        taps[odd ? h - i : h - 1 - i] = value;
    }
    if (type == 0) ku::WindowBartlett(n, taps.data(), taps.data());
    if (type == 2) ku::WindowHamming(n, taps.data(), taps.data());
    if (type == 3) ku::WindowHann(n, taps.data(), taps.data());
    if (!normalize) return taps;
    double left = 0.0;
    for (unsigned int i = 0; i < h; ++i) left = left + taps[i];
    const double g = 1.0 / std::fabs(left * 2.0 + (odd ? taps[h] : 0.0));
    for (auto& t : taps) t = t * g;
    return taps;
}

// The work buffer is never touched.
std::vector<double> Design(double cutoff, unsigned int n, int type, bool normalize)
{
    GuardedBuffer<double> taps(n);
    GuardedBuffer<unsigned char> work(0);
    kestaccel::filter::GenerateLowpassFIRCoefficients(cutoff, n, taps.data(), static_cast<ku::DSPWindowType>(type),
                                                      normalize, work.data());
    EXPECT_TRUE(taps.Intact() && work.Intact());
    return taps.values();
}

// Both parities, 0 to 2 taps, the Nyquist cutoff, a negative cutoff (the scale
// divides by the size of the whole sum: sums to -1), cutoff 0 (NaN taps); 1, 4,
// 7 are no window. A NaN the arithmetic makes is promised as a NaN only.
TEST(LowpassDesign, MatchesPlainEvaluationAndSumsToOne)
{
    const struct {
        double cutoff;
        unsigned int taps;
    } cases[] = {{0.1, 31},  {0.1, 32}, {0.25, 63}, {0.25, 64}, {0.37, 101}, {0.05, 256}, {0.45, 9},
                 {0.45, 10}, {0.2, 0},  {0.3, 1},   {0.35, 2},  {0.5, 21},   {-0.2, 64},  {0.0, 16}};
    for (const auto& dc : cases) {
        for (int type : {0, 1, 2, 3, 4, 7}) {
            for (bool normalize : {false, true}) {
                SCOPED_TRACE("cutoff=" + std::to_string(dc.cutoff) + " taps=" + std::to_string(dc.taps) +
                             " window=" + std::to_string(type) + " normalize=" + std::to_string(normalize));
                const auto taps = Design(dc.cutoff, dc.taps, type, normalize);
                auto expected = Expected(dc.cutoff, dc.taps, type, normalize);
                for (std::size_t i = 0; i < taps.size(); ++i)
                    if (std::isnan(expected[i]) && std::isnan(taps[i])) expected[i] = taps[i];
                EXPECT_TRUE(SameBitsArray(expected, taps));
                if (!normalize || dc.taps < 3 || dc.cutoff == 0.0) continue;
                double sum = 0.0;
                for (double t : taps) sum += t;
                EXPECT_NEAR(dc.cutoff < 0 ? -1.0 : 1.0, sum, 1e-13);
            }
        }
    }
    EXPECT_TRUE(SameBits(1.0, Design(0.5, 21, 1, false)[10]));
    EXPECT_TRUE(std::isnan(Design(0.0, 16, 2, true)[0]));
}

TEST(LowpassDesign, PassesBelowTheCutoffAndStopsAbove)
{
    for (unsigned int n : {101u, 100u}) {
        for (int type : {2, 3}) {
            const auto taps = Design(0.2, n, type, true);
            SCOPED_TRACE(std::to_string(n) + " taps, window " + std::to_string(type));
            for (double f = 0.0; f <= 0.16; f += 0.005) EXPECT_NEAR(1.0, DtftMagnitude(taps.data(), n, f), 5e-3) << f;
            EXPECT_NEAR(0.5, DtftMagnitude(taps.data(), n, 0.2), 0.05);
            for (double f = 0.24; f <= 0.5; f += 0.005) EXPECT_LT(DtftMagnitude(taps.data(), n, f), 5e-3) << f;
        }
    }
}

}  // namespace
