// The denormal switches are placeholders: nothing is stored, nothing changes.

#include <kestaccel/BasicMath.h>
#include <kestaccel/VectorUtils.h>

#include <limits>

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

TEST(ModeControls, EveryGetAnswersFalseWhateverWasSet)
{
    for (const auto& control : kControls) {
        EXPECT_FALSE(control.get()) << control.name << " at start";
        control.set(true);
        EXPECT_FALSE(control.get()) << control.name << " after Set(true)";
        control.set(false);
        EXPECT_FALSE(control.get()) << control.name << " after Set(false)";
    }
}

TEST(ModeControls, DenormalArithmeticIsUnchangedBySetCalls)
{
    // If a Set reached the processor's control register, the denormal sum
    // would flush to zero.
    const float tiny = std::numeric_limits<float>::denorm_min();
    const float a[2] = {tiny, 3 * tiny}, b[2] = {tiny, tiny};
    float before[2], after[2];
    Add(2u, a, b, before);
    for (const auto& control : kControls) control.set(true);
    Add(2u, a, b, after);
    for (const auto& control : kControls) control.set(false);
    EXPECT_EQ(before[0], 2 * tiny);
    EXPECT_EQ(after[0], 2 * tiny);
    EXPECT_EQ(after[1], 4 * tiny);
}

}  // namespace
