// Plan contents: the swap table, the twiddle recurrence, which tables exist
// for which kind and size, and the scratch vectors' capacities.

#include <cmath>
#include <cstdint>
#include <vector>

#include "support/TestSupport.h"
#include "transform/FFT/PlanKernels.h"

namespace {

using kestaccel::transform::cpp::BuildFFTPlan;
using kestaccel::transform::cpp::DestroyFFTPlan;
using kestaccel::transform::cpp::FFTPlan;
using kestaccel::transform::cpp::ScratchVector;
using kestaccel_test::SameBits;

std::vector<std::uint32_t> SwapTable(unsigned int size)
{
    FFTPlan<float> plan{};
    EXPECT_TRUE(BuildFFTPlan(plan, 1, size));
    std::vector<std::uint32_t> table(plan.swapTable, plan.swapTable + size - 1);
    DestroyFFTPlan(plan);
    return table;
}

TEST(FFTSwapTable, SizesEightAndSixteen)
{
    EXPECT_EQ(SwapTable(8), (std::vector<std::uint32_t>{0, 4, 2, 6, 4, 5, 6}));
    EXPECT_EQ(SwapTable(16), (std::vector<std::uint32_t>{0, 8, 4, 12, 4, 10, 6, 14, 8, 9, 10, 13, 12, 13, 14}));
}

TEST(FFTSwapTable, EntryIsLargerOfIndexAndItsBitReversal)
{
    for (unsigned int order = 1; order <= 16; ++order) {
        SCOPED_TRACE("order " + std::to_string(order));
        const unsigned int size = 1u << order;
        const auto table = SwapTable(size);
        for (unsigned int i = 0; i + 1 < size; ++i) {
            unsigned int reversed = 0;
            for (unsigned int bit = 0; bit < order; ++bit) reversed |= ((i >> bit) & 1u) << (order - 1 - bit);
            ASSERT_EQ(table[i], std::max(i, reversed)) << "entry " << i;
        }
    }
}

// The recurrence as the plan must run it: double arithmetic, each product
// and sum rounded on its own, rounded to E only when stored.
template <class E>
std::vector<E> RecurrenceTable(double theta, double wr, double wi, unsigned int pairs)
{
    const double c = std::cos(theta), s = std::sin(theta);
    std::vector<E> table;
    for (unsigned int t = 0; t < pairs; ++t) {
        table.push_back(static_cast<E>(wr));
        table.push_back(static_cast<E>(wi));
        const double r = wr * c - (-s) * wi;
        const double i = wr * (-s) + c * wi;
        wr = r;
        wi = i;
    }
    return table;
}

template <class E>
class FFTPlanTyped : public ::testing::Test {};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTPlanTyped, Elements);

TYPED_TEST(FFTPlanTyped, ComplexPlanHoldsRecurrenceTwiddlesAndScratch)
{
    using E = TypeParam;
    const double pi = 3.141592653589793;
    for (unsigned int order = 1; order <= 12; ++order) {
        SCOPED_TRACE("order " + std::to_string(order));
        const unsigned int size = 1u << order;
        FFTPlan<E> plan{};
        ASSERT_TRUE(BuildFFTPlan(plan, 1, size));
        EXPECT_EQ(plan.size, size);
        EXPECT_EQ(plan.order, order);
        EXPECT_EQ(plan.halfPlan, nullptr);
        EXPECT_NE(plan.swapTable, nullptr);
        const auto expected = RecurrenceTable<E>(pi / (size / 2), 1.0, 0.0, size / 2);
        EXPECT_TRUE(kestaccel_test::SameBitsArray(expected.data(), plan.twiddles, size));
        EXPECT_EQ(plan.interleaveScratch.capacity(), 2 * size);
        EXPECT_EQ(plan.interleaveScratch.size(), 0u);
        EXPECT_EQ(plan.forwardScratch.capacity(), 0u);
        EXPECT_EQ(plan.inverseScratch.capacity(), 0u);
        DestroyFFTPlan(plan);
        EXPECT_EQ(plan.twiddles, nullptr);
        EXPECT_EQ(plan.swapTable, nullptr);
        EXPECT_EQ(plan.interleaveScratch.data(), nullptr);
    }
}

TYPED_TEST(FFTPlanTyped, RealPlanHoldsHalfPlanAndCombineTwiddles)
{
    using E = TypeParam;
    const double twoPi = 6.283185307179586;
    for (unsigned int order = 2; order <= 12; ++order) {
        SCOPED_TRACE("order " + std::to_string(order));
        const unsigned int size = 1u << order;
        FFTPlan<E> plan{};
        ASSERT_TRUE(BuildFFTPlan(plan, 0, size));
        EXPECT_EQ(plan.order, order);
        EXPECT_EQ(plan.swapTable, nullptr);
        ASSERT_NE(plan.halfPlan, nullptr);
        EXPECT_EQ(plan.halfPlan->size, size / 2);
        EXPECT_EQ(plan.halfPlan->order, order - 1);
        const double c = std::cos(twoPi / size), s = std::sin(twoPi / size);
        const auto expected = RecurrenceTable<E>(twoPi / size, c, -s, size / 2 - 1);
        EXPECT_TRUE(kestaccel_test::SameBitsArray(expected.data(), plan.twiddles, size - 2));
        EXPECT_EQ(plan.forwardScratch.capacity(), 2 * size + 2);
        EXPECT_EQ(plan.inverseScratch.capacity(), 2 * size + 2);
        EXPECT_EQ(plan.forwardScratch.size(), 0u);
        EXPECT_EQ(plan.interleaveScratch.capacity(), 0u);
        DestroyFFTPlan(plan);
        EXPECT_EQ(plan.halfPlan, nullptr);
    }
}

// Pair t stands for exp(-2 pi i t / N): the recurrence drifts only in the
// last bits, and the sign convention is the forward one.
TEST(FFTPlanTwiddles, CloseToDirectFactors)
{
    FFTPlan<double> plan{};
    ASSERT_TRUE(BuildFFTPlan(plan, 1, 1024));
    for (unsigned int t = 0; t < 512; ++t) {
        const double angle = -2.0 * 3.141592653589793 * t / 1024.0;
        EXPECT_NEAR(plan.twiddles[2 * t], std::cos(angle), 4e-14) << t;
        EXPECT_NEAR(plan.twiddles[2 * t + 1], std::sin(angle), 4e-14) << t;
    }
    EXPECT_TRUE(SameBits(1.0, plan.twiddles[0]));
    EXPECT_TRUE(SameBits(0.0, plan.twiddles[1]));
    DestroyFFTPlan(plan);
}

TEST(FFTPlanSmall, ComplexBelowTwoPointsIsRefused)
{
    for (unsigned int size : {0u, 1u}) {
        FFTPlan<float> plan{};
        EXPECT_FALSE(BuildFFTPlan(plan, 1, size));
        EXPECT_EQ(plan.size, size);
        EXPECT_EQ(plan.order, 0u);
        EXPECT_EQ(plan.swapTable, nullptr);
        EXPECT_EQ(plan.twiddles, nullptr);
        EXPECT_EQ(plan.interleaveScratch.capacity(), 0u);
        DestroyFFTPlan(plan);
    }
}

TEST(FFTPlanSmall, RealOfOneAndTwoSamplesHaveNoTables)
{
    FFTPlan<double> one{};
    EXPECT_TRUE(BuildFFTPlan(one, 0, 1));
    EXPECT_EQ(one.halfPlan, nullptr);
    EXPECT_EQ(one.twiddles, nullptr);
    DestroyFFTPlan(one);

    FFTPlan<double> two{};
    EXPECT_FALSE(BuildFFTPlan(two, 0, 2));
    EXPECT_EQ(two.order, 1u);
    ASSERT_NE(two.halfPlan, nullptr);
    EXPECT_EQ(two.halfPlan->size, 1u);
    EXPECT_EQ(two.halfPlan->swapTable, nullptr);
    EXPECT_EQ(two.twiddles, nullptr);
    EXPECT_EQ(two.forwardScratch.capacity(), 0u);
    DestroyFFTPlan(two);
    EXPECT_EQ(two.halfPlan, nullptr);
}

TEST(FFTPlanOrder, SmallestExponentNotBelowSize)
{
    for (unsigned int order = 1; order <= 16; ++order) {
        FFTPlan<float> plan{};
        BuildFFTPlan(plan, 0, 1u << order);
        EXPECT_EQ(plan.order, order);
        DestroyFFTPlan(plan);
    }
}

TEST(FFTScratchVector, ReserveKeepsElementsResizeZeroFillsTail)
{
    ScratchVector<float> v;
    v.Reserve(4);
    EXPECT_EQ(v.capacity(), 4u);
    EXPECT_EQ(v.size(), 0u);
    v.Resize(3);
    ASSERT_EQ(v.size(), 3u);
    for (unsigned int i = 0; i < 3; ++i) {
        EXPECT_TRUE(SameBits(0.0f, v.data()[i]));
        v.data()[i] = -1.5f - i;
    }
    v.Resize(1);
    EXPECT_EQ(v.size(), 1u);
    EXPECT_EQ(v.capacity(), 4u);
    v.Resize(6);  // grows: capacity becomes exactly 6, element 0 kept, tail zero
    EXPECT_EQ(v.capacity(), 6u);
    ASSERT_EQ(v.size(), 6u);
    EXPECT_TRUE(SameBits(-1.5f, v.data()[0]));
    for (unsigned int i = 1; i < 6; ++i) EXPECT_TRUE(SameBits(0.0f, v.data()[i])) << i;
    v.Reserve(2);  // shrinking capacity keeps what fits
    EXPECT_EQ(v.capacity(), 2u);
    EXPECT_EQ(v.size(), 2u);
    EXPECT_TRUE(SameBits(-1.5f, v.data()[0]));
    v.Release();
    EXPECT_EQ(v.data(), nullptr);
}

}  // namespace
