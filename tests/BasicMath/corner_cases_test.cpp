// Two corners the random differential tests do not reach: complex sums whose
// destination starts half an element after (or before) a source, and the
// NaN that a NaN threshold passes through -1 / threshold.

#include <kestaccel/BasicMath.h>

#include <complex>
#include <functional>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

template <class T>
class BasicMathCorners : public ::testing::Test {};
TYPED_TEST_SUITE(BasicMathCorners, FloatingTypes);

// One element at a time, read whole before it is written, over the very
// same memory the library gets.
TYPED_TEST(BasicMathCorners, ComplexSumsReadEachElementWhole)
{
    using T = TypeParam;
    using C = std::complex<T>;
    using Op = std::function<C(C, C)>;
    using Call = std::function<void(unsigned int, const C*, const C*, C*)>;
    const struct {
        const char* name;
        Op op;
        Call call;
    } members[] = {
        {"Add", [](C a, C b) { return C(a.real() + b.real(), a.imag() + b.imag()); },
         [](unsigned int n, const C* a, const C* b, C* d) { ku::Add(n, a, b, d); }},
        {"Sub", [](C a, C b) { return C(b.real() - a.real(), b.imag() - a.imag()); },
         [](unsigned int n, const C* a, const C* b, C* d) { ku::Sub(n, a, b, d); }},
        {"Add_InPlace", [](C a, C b) { return C(a.real() + b.real(), a.imag() + b.imag()); },
         [](unsigned int n, const C* a, const C*, C* d) { ku::Add_InPlace(n, a, d); }},
        {"Sub_InPlace", [](C a, C b) { return C(b.real() - a.real(), b.imag() - a.imag()); },
         [](unsigned int n, const C* a, const C*, C* d) { ku::Sub_InPlace(n, a, d); }},
    };
    const unsigned int n = 37;
    for (const auto& m : members) {
        for (int shift : {1, -1, 3}) {
            SCOPED_TRACE(std::string(m.name) + ", destination " + std::to_string(shift) + " components on");
            std::vector<T> expected = RandomReals<T>(2 * n + 8, 17), actual = expected;
            const std::vector<T> other = RandomReals<T>(2 * n, 18);
            auto at = [](std::vector<T>& v, int component) { return reinterpret_cast<C*>(v.data() + 4 + component); };
            const bool inPlace = m.name[3] == '_';
            for (unsigned int i = 0; i < n; ++i) {
                C* e = at(expected, shift);
                const C b = inPlace ? e[i] : reinterpret_cast<const C*>(other.data())[i];
                e[i] = m.op(at(expected, 0)[i], b);
            }
            m.call(n, at(actual, 0), reinterpret_cast<const C*>(other.data()), at(actual, shift));
            EXPECT_TRUE(SameBitsArray(expected, actual));
        }
    }
    // Floats 1 to 6 plus zeros, written one component on.
    T a[6] = {1, 2, 3, 4, 5, 6};
    const C zeros[2] = {};
    ku::Add(2, reinterpret_cast<C*>(a), zeros, reinterpret_cast<C*>(a + 1));
    const T want[6] = {1, 1, 2, 2, 4, 6};
    EXPECT_TRUE(SameBitsArray(want, a, 6));
}

// -1 / threshold is a division: a NaN threshold's sign and payload pass on
// to the elements it sends to -1 / threshold.
TYPED_TEST(BasicMathCorners, NegativeLimitOfANaNThresholdIsADivision)
{
    using T = TypeParam;
    for (T threshold : {QuietNaN<T>(0x5), -QuietNaN<T>(0x9)}) {
        volatile T minusOne = T(-1);
        const T expected = minusOne / threshold;
        T x[3] = {T(-0.5), T(-0.25), T(-3)};
        ku::Invert_Threshold_InPlace(3, x, threshold);
        for (T v : x) EXPECT_TRUE(SameBits(expected, v));
    }
}

}  // namespace
