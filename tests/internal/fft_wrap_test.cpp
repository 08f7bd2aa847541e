// Move and Copy form their byte count in 32 bits, and the transforms that
// stage their input or copy out their spectrum through them keep the wrap:
// the interleaved forms work up to order 28 (float) and 27 (double), the
// deinterleaved and real forms up to 29 and 28. Above, the literal steps run
// and move too little or nothing. Checked on the size arithmetic that picks
// those steps, since the transforms themselves would need gigabytes.

#include <gtest/gtest.h>

#include "transform/FFT/FFTInterfaceKernels.h"

namespace {

using namespace kestaccel::transform::cpp;

TEST(FFTByteCountWrap, LiteralStepsTakeOverWhereTheCountWraps)
{
    const struct {
        bool (*wraps)(unsigned int);
        unsigned int lastWorkingOrder;
        const char* name;
    } forms[] = {{InterleavedMoveWraps<float>, 28, "interleaved float"},
                 {InterleavedMoveWraps<double>, 27, "interleaved double"},
                 {DeinterleavedMoveWraps<float>, 29, "deinterleaved float"},
                 {DeinterleavedMoveWraps<double>, 28, "deinterleaved double"},
                 {RealCopyWraps<float>, 29, "real float"},
                 {RealCopyWraps<double>, 28, "real double"}};
    for (const auto& f : forms) {
        for (unsigned int order = 1; order <= 30; ++order) {
            EXPECT_EQ(order > f.lastWorkingOrder, f.wraps(1u << order)) << f.name << ", order " << order;
        }
    }
}

}  // namespace
