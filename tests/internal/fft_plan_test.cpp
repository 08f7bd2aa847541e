// Plan contents: the swap table, the twiddle recurrence, which tables exist
// for which kind and size, and the scratch vectors' capacities.

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <sstream>
#include <string>
#include <vector>

#include "support/TestSupport.h"
#include "transform/FFT/PlanKernels.h"

namespace {

using namespace kestaccel::transform::cpp;

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

// What a plan holds: size, order, which tables exist, the half plan, and
// the capacities of the forward, inverse and interleave scratch.
template <class E>
std::string Shape(const FFTPlan<E>& p)
{
    std::ostringstream s;
    s << "size " << p.size << " order " << p.order << (p.swapTable ? " swaps" : "") << (p.twiddles ? " twiddles" : "");
    if (p.halfPlan) s << " half " << p.halfPlan->size << " order " << p.halfPlan->order << (p.halfPlan->swapTable ? " swaps" : "");
    s << " scratch " << p.forwardScratch.capacity() << " " << p.inverseScratch.capacity() << " " << p.interleaveScratch.capacity();
    if (p.forwardScratch.size() + p.inverseScratch.size() + p.interleaveScratch.size() != 0) s << " in use";
    return s.str();
}

std::string Sized(unsigned int size, unsigned int order) { return "size " + std::to_string(size) + " order " + std::to_string(order); }

template <class E>
class FFTPlanTyped : public ::testing::Test {};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTPlanTyped, Elements);

// Complex plans: the swap table, size/2 twiddle pairs from 1, interleave
// scratch. Real plans: a half plan, size/2 - 1 combine pairs one step past
// 1, forward and inverse scratch. Destroying leaves nothing to free.
TYPED_TEST(FFTPlanTyped, ComplexAndRealPlansEveryOrder)
{
    using E = TypeParam;
    const double twoPi = 6.283185307179586;
    for (unsigned int order = 1; order <= 16; ++order) {
        SCOPED_TRACE("order " + std::to_string(order));
        const unsigned int size = 1u << order;
        FFTPlan<E> plan{};
        ASSERT_TRUE(BuildFFTPlan(plan, 1, size));
        EXPECT_EQ(Shape(plan), Sized(size, order) + " swaps twiddles scratch 0 0 " + std::to_string(2 * size));
        // Swap entry i is the larger of i and its bit reversal.
        const std::vector<std::uint32_t> swaps(plan.swapTable, plan.swapTable + size - 1);
        for (unsigned int i = 0; i + 1 < size; ++i) {
            unsigned int reversed = 0;
            for (unsigned int bit = 0; bit < order; ++bit) reversed |= ((i >> bit) & 1u) << (order - 1 - bit);
            ASSERT_EQ(swaps[i], std::max(i, reversed)) << "swap entry " << i;
        }
        const std::vector<std::uint32_t> worked[] = {{0, 4, 2, 6, 4, 5, 6},
                                                     {0, 8, 4, 12, 4, 10, 6, 14, 8, 9, 10, 13, 12, 13, 14}};
        if (order == 3 || order == 4) {
            EXPECT_EQ(swaps, worked[order - 3]);
        }
        const auto twiddles = RecurrenceTable<E>(twoPi / size, 1.0, 0.0, size / 2);
        EXPECT_TRUE(kestaccel_test::SameBitsArray(twiddles.data(), plan.twiddles, size));
        DestroyFFTPlan(plan);
        EXPECT_EQ(Shape(plan), Sized(size, order) + " scratch 0 0 0");
        if (order == 1) continue;  // two samples: FFTPlanSmall

        FFTPlan<E> real{};
        ASSERT_TRUE(BuildFFTPlan(real, 0, size));
        const std::string scratch = std::to_string(2 * size + 2);
        EXPECT_EQ(Shape(real), Sized(size, order) + " twiddles half " + std::to_string(size / 2) + " order " +
                                   std::to_string(order - 1) + " swaps scratch " + scratch + " " + scratch + " 0");
        const double c = std::cos(twoPi / size), s = std::sin(twoPi / size);
        const auto combine = RecurrenceTable<E>(twoPi / size, c, -s, size / 2 - 1);
        EXPECT_TRUE(kestaccel_test::SameBitsArray(combine.data(), real.twiddles, size - 2));
        DestroyFFTPlan(real);
        EXPECT_EQ(Shape(real), Sized(size, order) + " scratch 0 0 0");
    }
}

// A complex plan below two points is refused with nothing built; a real
// plan of one sample has nothing to build; one of two samples keeps the
// refused half plan of one point.
TEST(FFTPlanSmall, BelowFourPoints)
{
    const struct {
        unsigned int kind, size;
        bool built;
        const char* shape;
    } cases[] = {{1, 0, false, "size 0 order 0 scratch 0 0 0"},
                 {1, 1, false, "size 1 order 0 scratch 0 0 0"},
                 {0, 1, true, "size 1 order 0 scratch 0 0 0"},
                 {0, 2, false, "size 2 order 1 half 1 order 0 scratch 0 0 0"}};
    for (const auto& c : cases) {
        FFTPlan<double> plan{};
        EXPECT_EQ(BuildFFTPlan(plan, c.kind, c.size), c.built);
        EXPECT_EQ(Shape(plan), c.shape);
        DestroyFFTPlan(plan);
        EXPECT_EQ(Shape(plan), Sized(c.size, c.size / 2) + " scratch 0 0 0");
    }
}

// The capacity, then the elements bit for bit.
::testing::AssertionResult Holds(const ScratchVector<float>& v, const std::vector<float>& expected)
{
    std::vector<float> actual{static_cast<float>(v.capacity())};
    actual.insert(actual.end(), v.data(), v.data() + v.size());
    return kestaccel_test::SameBitsArray(expected, actual);
}

TEST(FFTScratchVector, ReserveKeepsElementsResizeZeroFillsTail)
{
    ScratchVector<float> v;
    v.Reserve(4);
    EXPECT_TRUE(Holds(v, {4}));
    v.Resize(3);
    EXPECT_TRUE(Holds(v, {4, 0, 0, 0}));
    for (unsigned int i = 0; i < 3; ++i) v.data()[i] = -1.5f - i;
    v.Resize(1);
    EXPECT_TRUE(Holds(v, {4, -1.5f}));
    v.Resize(6);  // grows: capacity becomes exactly 6, element 0 kept, tail zero
    EXPECT_TRUE(Holds(v, {6, -1.5f, 0, 0, 0, 0, 0}));
    v.Reserve(2);  // shrinking capacity keeps what fits
    EXPECT_TRUE(Holds(v, {2, -1.5f, 0}));
    v.Release();
    EXPECT_EQ(v.data(), nullptr);
}

}  // namespace
