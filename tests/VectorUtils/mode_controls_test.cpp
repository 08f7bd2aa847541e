// The denormal switches are placeholders: nothing is stored, nothing changes.

#include <kestaccel/BasicMath.h>
#include <kestaccel/VectorUtils.h>

#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel::utility;

struct ModeControl {
    const char* name;
    bool (*get)();
    void (*set)(bool);
};

const ModeControl kControls[] = {
    {"DenormalsAreZero", GetDenormalsAreZero, SetDenormalsAreZero},
    {"FlushDenormalsToZero", GetFlushDenormalsToZero, SetFlushDenormalsToZero},
    {"DenormalExceptionsEnabled", GetDenormalExceptionsEnabled, SetDenormalExceptionsEnabled},
};

// Gets answer false and no Set reaches the processor; bits are compared, since
// a flush-to-zero mode would flush a comparison too.
TEST(ModeControls, GetsAnswerFalseAndSetsChangeNothing)
{
    using kestaccel_test::FromBits;
    const float a[2] = {FromBits<float>(1u), FromBits<float>(3u)}, b[2] = {a[0], a[0]};
    for (const auto& control : kControls) {
        EXPECT_FALSE(control.get()) << control.name << " at start";
        for (const bool enable : {true, false}) {
            control.set(enable);
            float sum[2] = {};
            Add(2u, a, b, sum);
            EXPECT_FALSE(control.get()) << control.name << " after Set(" << enable << ")";
            EXPECT_TRUE(kestaccel_test::SameBitsArray(std::vector<float>{FromBits<float>(2u), FromBits<float>(4u)},
                                                      std::vector<float>(sum, sum + 2)))
                << control.name << " after Set(" << enable << ")";
        }
    }
}

}  // namespace
