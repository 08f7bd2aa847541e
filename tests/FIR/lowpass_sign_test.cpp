// The normalised design divides by the size of the whole tap sum, centre
// included, so the taps add up to 1, or to -1 where the sinc's sum is
// negative: cutoffs below 0, and cutoffs past the Nyquist frequency whose
// sinc sums to a small or negative value.

#include <kestaccel/FIR.h>

#include <cmath>
#include <vector>

#include <gtest/gtest.h>

namespace {

TEST(LowpassDesign, NormalisedTapsSumToPlusOrMinusOne)
{
    const struct {
        double cutoff;
        unsigned int taps;
        double sum;
    } cases[] = {{-0.2, 1, -1.0}, {-0.2, 7, -1.0}, {0.7, 7, 1.0}, {0.9, 15, 1.0}, {0.2, 31, 1.0}, {-0.3, 40, -1.0}};
    for (const auto& c : cases) {
        for (int window : {0, 1, 2, 3}) {
            if (c.taps == 1 && window != 1) continue;  // one windowed tap is 0
            std::vector<double> taps(c.taps);
            kestaccel::filter::GenerateLowpassFIRCoefficients(
                c.cutoff, c.taps, taps.data(), static_cast<kestaccel::utility::DSPWindowType>(window), true, nullptr);
            double sum = 0.0;
            for (double t : taps) sum += t;
            EXPECT_NEAR(c.sum, sum, 1e-12) << c.taps << " taps at cutoff " << c.cutoff << ", window " << window;
        }
    }
}

}  // namespace
