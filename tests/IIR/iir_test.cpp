// IIR filter: the recursion against a plain transposed-form loop written
// here, the block paths against the single-sample form, the normalisation
// of the init calls, the setters and their null cases, in float and double.

#include <kestaccel/IIR.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

#include "support/AllocationCount.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace kf = kestaccel::filter;

template <class T>
struct StateOf;
template <>
struct StateOf<float> {
    using type = kestaccel::IIRState_Float;
};
template <>
struct StateOf<double> {
    using type = kestaccel::IIRState_Double;
};

// The recursion written out plainly, on taps already divided by a0. The
// steps and their association: y = b0 x + d0; d[i] = (b[i+1] x + d[i+1]) -
// a[i+1] y; d[last] = b[order] x - a[order] y.
template <class T>
struct PlainCascade {
    unsigned int order;
    std::vector<T> taps;   // sections of 2 * order + 2, a0 included but unread
    std::vector<T> state;  // order per section

    T Step(T x)
    {
        const std::size_t sections = state.size() / order;
        for (std::size_t s = 0; s < sections; ++s) {
            const T* b = &taps[s * (2 * order + 2)];
            const T* a = b + order + 1;
            T* d = &state[s * order];
            const T y = T(b[0] * x) + d[0];
            for (std::size_t i = 0; i + 1 < order; ++i) {
                const T bx = b[i + 1] * x;
                const T withState = bx + d[i + 1];
                const T ay = a[i + 1] * y;
                d[i] = withState - ay;
            }
            const T bx = b[order] * x;
            const T ay = a[order] * y;
            d[order - 1] = bx - ay;
            x = y;
        }
        return x;
    }
};

// Taps for a cascade with a0 = `leading` in every section; small feedback
// taps keep the output bounded over a few hundred samples.
template <class T>
std::vector<T> RandomSections(unsigned int order, unsigned int sections, T leading, std::uint32_t seed)
{
    auto taps = RandomReals<T>(2 * (order + 1) * sections, seed, T(-0.3), T(0.3));
    for (unsigned int s = 0; s < sections; ++s) taps[s * (2 * order + 2) + order + 1] = leading;
    return taps;
}

// The taps as the init calls store them: each times the reciprocal of one
// leading tap.
template <class T>
std::vector<T> Scaled(const std::vector<T>& taps, T leading)
{
    const T r = T(1) / leading;
    std::vector<T> out(taps.size());
    for (std::size_t i = 0; i < taps.size(); ++i) out[i] = r * taps[i];
    return out;
}

template <class T>
class IIRTyped : public ::testing::Test {
protected:
    using State = typename StateOf<T>::type;
    State* state = nullptr;
    ~IIRTyped() override { kf::IIRFree(state); }

    std::vector<T> DelayLine(std::size_t count) const
    {
        GuardedBuffer<T> out(count);
        kf::IIRGetDlyLine(state, out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};

using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(IIRTyped, Precisions);

// Within one machine epsilon relative to the larger magnitude.
template <class T>
::testing::AssertionResult WithinOneEpsilon(double expected, T actual)
{
    const double scale = std::max(std::fabs(expected), std::fabs(double(actual)));
    const double limit = double(std::numeric_limits<T>::epsilon()) * scale;
    if (std::fabs(double(actual) - expected) <= limit) return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << actual << " differs from " << expected << " by more than " << limit;
}

// ---------------------------------------------------------------------------
// Known first outputs.
// ---------------------------------------------------------------------------
TYPED_TEST(IIRTyped, OrderTenFirstOutput)
{
    using T = TypeParam;
    const std::vector<T> taps = {T(0.0031), T(0.014),  T(0.0069),  T(0.111), T(0.2119), T(0.0091),
                                 T(0.074),  T(0.1),    T(1.0),     T(0.0),   T(0.0),    T(0.08),
                                 T(1.0),    T(0.005),  T(0.0005),  T(0.33),  T(0.044),  T(0.00035),
                                 T(0.0),    T(0.7779), T(0.113),   T(0.006)};
    kf::IIRInit(&this->state, taps.data(), 10, nullptr);
    ASSERT_NE(nullptr, this->state);
    EXPECT_TRUE(WithinOneEpsilon(0.02325, kf::IIR(T(0.6), this->state)));
}

// The second section is scaled by the first section's a0 (0.111), not by its
// own (0.08): 0.6 * 0.0031 / 0.111 * 0.074 / 0.111.
TYPED_TEST(IIRTyped, TwoSectionFirstOutputUsesTheFirstLeadingTap)
{
    using T = TypeParam;
    const std::vector<T> taps = {T(0.0031), T(0.014), T(0.0069), T(0.111), T(0.2119), T(0.0091),
                                 T(0.074),  T(0.1),   T(1.0),    T(0.08),  T(1.0),    T(0.005)};
    kf::IIRInit_BiQuad(&this->state, taps.data(), 2, nullptr);
    ASSERT_NE(nullptr, this->state);
    EXPECT_TRUE(WithinOneEpsilon(0.01117117117117117, kf::IIR(T(0.6), this->state)));
    T block[1] = {T(0.6)};
    kf::IIRSetDlyLine(this->state, std::vector<T>(4, T(0)).data());
    kf::IIR(1, block, block, this->state);
    EXPECT_TRUE(WithinOneEpsilon(0.01117117117117117, block[0]));
}

// ---------------------------------------------------------------------------
// The recursion, bit for bit, and the states it leaves.
// ---------------------------------------------------------------------------
TYPED_TEST(IIRTyped, SingleSampleFormMatchesThePlainRecursion)
{
    using T = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 4u, 10u}) {
        const std::uint32_t seed = 500 + order;
        SCOPED_TRACE(SeedTrace(seed));
        const T a0 = T(1.37);
        const auto taps = RandomSections<T>(order, 1, a0, seed);
        const auto initial = RandomReals<T>(order, seed + 1, T(-0.5), T(0.5));
        PlainCascade<T> plain{order, Scaled(taps, a0), initial};
        kf::IIRInit(&this->state, taps.data(), order, initial.data());
        ASSERT_NE(nullptr, this->state);
        for (T x : RandomReals<T>(300, seed + 2)) {
            const T expected = plain.Step(x);
            ASSERT_TRUE(SameBits(expected, kf::IIR(x, this->state)));
        }
        EXPECT_TRUE(SameBitsArray(plain.state, this->DelayLine(order)));
        kf::IIRFree(this->state);
        this->state = nullptr;
    }
}

// Sections with different a0: all are scaled by the first one's reciprocal.
TYPED_TEST(IIRTyped, BiquadCascadeMatchesThePlainRecursion)
{
    using T = TypeParam;
    for (unsigned int sections : {1u, 2u, 3u, 5u}) {
        const std::uint32_t seed = 600 + sections;
        SCOPED_TRACE(SeedTrace(seed));
        auto taps = RandomSections<T>(2, sections, T(1.3), seed);
        for (unsigned int s = 1; s < sections; ++s) taps[6 * s + 3] = T(0.5) + T(s);
        const auto initial = RandomReals<T>(2 * sections, seed + 1, T(-0.5), T(0.5));
        PlainCascade<T> plain{2, Scaled(taps, taps[3]), initial};
        kf::IIRInit_BiQuad(&this->state, taps.data(), sections, initial.data());
        ASSERT_NE(nullptr, this->state);
        for (T x : RandomReals<T>(200, seed + 2)) {
            const T expected = plain.Step(x);
            ASSERT_TRUE(SameBits(expected, kf::IIR(x, this->state)));
        }
        EXPECT_TRUE(SameBitsArray(plain.state, this->DelayLine(2 * sections)));
        kf::IIRFree(this->state);
        this->state = nullptr;
    }
}

// ---------------------------------------------------------------------------
// Block forms against the single-sample form.
// ---------------------------------------------------------------------------
struct BlockShape {
    unsigned int order;
    unsigned int sections;
};

template <class T>
class IIRBlock : public IIRTyped<T> {
protected:
    void Create(const BlockShape& shape, const std::vector<T>& taps, const std::vector<T>& initial,
                typename IIRTyped<T>::State** into)
    {
        if (shape.order == 2)
            kf::IIRInit_BiQuad(into, taps.data(), shape.sections, initial.data());
        else
            kf::IIRInit(into, taps.data(), shape.order, initial.data());
    }
};
TYPED_TEST_SUITE(IIRBlock, Precisions);

TYPED_TEST(IIRBlock, BlockAndInPlaceGiveTheBitsOfSampleBySample)
{
    using T = TypeParam;
    const BlockShape shapes[] = {{2, 1}, {2, 2}, {2, 3}, {2, 4}, {1, 1}, {3, 1}, {6, 1}};
    for (const BlockShape& shape : shapes) {
        for (unsigned int count : {1u, 2u, 5u, 64u, 333u}) {
            const std::uint32_t seed = shape.order * 1000 + shape.sections * 100 + count;
            SCOPED_TRACE(SeedTrace(seed));
            const auto taps = RandomSections<T>(shape.order, shape.sections, T(1.1), seed);
            const auto initial = RandomReals<T>(shape.order * shape.sections, seed + 1, T(-0.5), T(0.5));
            const auto input = RandomReals<T>(count, seed + 2);
            typename IIRTyped<T>::State *single = nullptr, *block = nullptr, *inPlace = nullptr;
            this->Create(shape, taps, initial, &single);
            this->Create(shape, taps, initial, &block);
            this->Create(shape, taps, initial, &inPlace);

            std::vector<T> expected(count);
            for (unsigned int i = 0; i < count; ++i) expected[i] = kf::IIR(input[i], single);
            GuardedBuffer<T> out(count);
            kf::IIR(count, input.data(), out.data(), block);
            GuardedBuffer<T> buffer(count);
            std::copy(input.begin(), input.end(), buffer.data());
            kf::IIR_InPlace(count, buffer.data(), inPlace);

            EXPECT_TRUE(out.Intact());
            EXPECT_TRUE(buffer.Intact());
            EXPECT_TRUE(SameBitsArray(expected, out.values()));
            EXPECT_TRUE(SameBitsArray(expected, buffer.values()));
            const std::size_t states = shape.order * shape.sections;
            std::vector<T> s1(states), s2(states), s3(states);
            kf::IIRGetDlyLine(single, s1.data());
            kf::IIRGetDlyLine(block, s2.data());
            kf::IIRGetDlyLine(inPlace, s3.data());
            EXPECT_TRUE(SameBitsArray(s1, s2));
            EXPECT_TRUE(SameBitsArray(s1, s3));
            kf::IIRFree(single);
            kf::IIRFree(block);
            kf::IIRFree(inPlace);
        }
    }
}

TYPED_TEST(IIRBlock, CountZeroWritesNothingAndKeepsTheStates)
{
    using T = TypeParam;
    for (const BlockShape shape : {BlockShape{2, 2}, BlockShape{2, 3}, BlockShape{3, 1}}) {
        const std::uint32_t seed = 90 + shape.order + shape.sections;
        SCOPED_TRACE(SeedTrace(seed));
        const auto taps = RandomSections<T>(shape.order, shape.sections, T(1), seed);
        const auto initial = RandomReals<T>(shape.order * shape.sections, seed + 1);
        this->Create(shape, taps, initial, &this->state);
        GuardedBuffer<T> out(0);
        const T source = T(1);
        kf::IIR(0, &source, out.data(), this->state);
        kf::IIR_InPlace(0, out.data(), this->state);
        EXPECT_TRUE(out.Intact());
        EXPECT_TRUE(SameBitsArray(initial, this->DelayLine(initial.size())));
        kf::IIRFree(this->state);
        this->state = nullptr;
    }
}

// ---------------------------------------------------------------------------
// Setters, getters and the null cases.
// ---------------------------------------------------------------------------
TYPED_TEST(IIRTyped, NullDelayLineClearsOnlyTheFirstSection)
{
    using T = TypeParam;
    const auto taps = RandomSections<T>(2, 3, T(1), 71);
    const auto initial = RandomReals<T>(6, 72);
    kf::IIRInit_BiQuad(&this->state, taps.data(), 3, initial.data());
    kf::IIRSetDlyLine(this->state, nullptr);
    const std::vector<T> expected = {T(0), T(0), initial[2], initial[3], initial[4], initial[5]};
    EXPECT_TRUE(SameBitsArray(expected, this->DelayLine(6)));
}

TYPED_TEST(IIRTyped, DelayLineSavedAndRestoredReplaysExactly)
{
    using T = TypeParam;
    const auto taps = RandomSections<T>(2, 3, T(1), 73);
    kf::IIRInit_BiQuad(&this->state, taps.data(), 3, nullptr);
    std::vector<T> warmUp = RandomReals<T>(50, 74);
    kf::IIR_InPlace(50, warmUp.data(), this->state);
    const auto saved = this->DelayLine(6);
    const auto input = RandomReals<T>(40, 75);
    std::vector<T> first(40), again(40);
    kf::IIR(40, input.data(), first.data(), this->state);
    kf::IIRSetDlyLine(this->state, saved.data());
    kf::IIR(40, input.data(), again.data(), this->state);
    EXPECT_TRUE(SameBitsArray(first, again));
}

// Init takes the states unscaled, even when a0 is not 1.
TYPED_TEST(IIRTyped, InitialStatesAreNotScaled)
{
    using T = TypeParam;
    const std::vector<T> taps = {T(0.5), T(0.25), T(2), T(0.75)};
    const std::vector<T> initial = {T(0.375)};
    kf::IIRInit(&this->state, taps.data(), 1, initial.data());
    EXPECT_TRUE(SameBitsArray(initial, this->DelayLine(1)));
    // y = (0.5 / 2) * 1 + 0.375, exact in both precisions.
    EXPECT_TRUE(SameBits(T(0.625), kf::IIR(T(1), this->state)));
}

// SetTaps stores what it is given; an a0 of 2 is not read.
TYPED_TEST(IIRTyped, SetTapsStoresAsGiven)
{
    using T = TypeParam;
    const std::uint32_t seed = 80;
    SCOPED_TRACE(SeedTrace(seed));
    auto taps = RandomSections<T>(3, 1, T(1), seed);
    kf::IIRInit(&this->state, std::vector<T>(8, T(1)).data(), 3, nullptr);
    PlainCascade<T> plain{3, taps, std::vector<T>(3, T(0))};
    taps[4] = T(2);
    kf::IIRSetTaps(this->state, taps.data());
    for (T x : RandomReals<T>(100, seed + 1)) ASSERT_TRUE(SameBits(plain.Step(x), kf::IIR(x, this->state)));
}

TYPED_TEST(IIRTyped, NullArgumentsChangeNothing)
{
    using T = TypeParam;
    using State = typename IIRTyped<T>::State;
    const auto taps = RandomSections<T>(2, 2, T(1), 81);
    const auto initial = RandomReals<T>(4, 82);
    kf::IIRInit_BiQuad(&this->state, taps.data(), 2, initial.data());

    kf::IIRSetTaps(this->state, nullptr);
    kf::IIRSetTaps(static_cast<State*>(nullptr), taps.data());
    kf::IIRSetDlyLine(static_cast<State*>(nullptr), initial.data());
    kf::IIRGetDlyLine(this->state, nullptr);
    GuardedBuffer<T> untouched(0);
    kf::IIRGetDlyLine(static_cast<const State*>(nullptr), untouched.data());
    EXPECT_TRUE(untouched.Intact());
    kf::IIRFree(static_cast<State*>(nullptr));
    EXPECT_TRUE(SameBitsArray(initial, this->DelayLine(4)));

    // The taps are still those of the init call.
    PlainCascade<T> plain{2, taps, initial};
    for (T x : RandomReals<T>(20, 83)) ASSERT_TRUE(SameBits(plain.Step(x), kf::IIR(x, this->state)));
}

TYPED_TEST(IIRTyped, BadInitArgumentsLeaveThePointerAlone)
{
    using T = TypeParam;
    using State = typename IIRTyped<T>::State;
    auto* const sentinel = reinterpret_cast<State*>(static_cast<std::uintptr_t>(0x4321));
    const auto taps = RandomSections<T>(2, 1, T(1), 84);
    State* state = sentinel;
    kf::IIRInit(&state, static_cast<const T*>(nullptr), 2, nullptr);
    EXPECT_EQ(sentinel, state);
    kf::IIRInit(&state, taps.data(), 0, nullptr);
    EXPECT_EQ(sentinel, state);
    kf::IIRInit_BiQuad(&state, static_cast<const T*>(nullptr), 1, nullptr);
    EXPECT_EQ(sentinel, state);
    kf::IIRInit_BiQuad(&state, taps.data(), 0, nullptr);
    EXPECT_EQ(sentinel, state);
    kf::IIRInit(static_cast<State**>(nullptr), taps.data(), 2, nullptr);
    kf::IIRInit_BiQuad(static_cast<State**>(nullptr), taps.data(), 1, nullptr);
}

}  // namespace

// After init the filter allocates nothing, and Free gives back every block.
namespace {

TYPED_TEST(IIRBlock, FilteringAllocatesNothingAndFreeReleasesAll)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    using T = TypeParam;
    for (const BlockShape shape : {BlockShape{2, 2}, BlockShape{2, 3}, BlockShape{4, 1}}) {
        const auto taps = RandomSections<T>(shape.order, shape.sections, T(1.1), 77);
        const auto input = RandomReals<T>(700, 78);
        std::vector<T> out(input.size()), buffer(input);
        ResetAllocationTally();
        typename IIRTyped<T>::State* state = nullptr;
        this->Create(shape, taps, std::vector<T>(shape.order * shape.sections), &state);
        const std::size_t afterInit = CurrentAllocationTally().news;
        EXPECT_GT(afterInit, 0u);
        kf::IIR(700u, input.data(), out.data(), state);
        kf::IIR_InPlace(700u, buffer.data(), state);
        kf::IIR(input[0], state);
        EXPECT_EQ(afterInit, CurrentAllocationTally().news) << "a filtering call allocated";
        kf::IIRFree(state);
        const AllocationTally tally = CurrentAllocationTally();
        EXPECT_EQ(tally.news, tally.deletes);
    }
}

}  // namespace
