// The multi-rate filter's corners: a destination that overlaps the source
// without being it, branches too short to hold a tap, and an up factor of 0.

#include <kestaccel/MultiRate.h>

#include <csignal>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace kf = kestaccel::filter;

template <class T>
using Pool = std::vector<T, kestcore::allocator::STLAllocator<T>>;

template <class T>
struct Filter;
template <>
struct Filter<float> {
    using State = kestaccel::MRFState_Float;
};
template <>
struct Filter<double> {
    using State = kestaccel::MRFState_Double;
};

// The plain loop of a fresh filter (silent history) over one buffer: each
// output is summed from the oldest sample to the newest and stored before
// the next output reads the buffer.
template <class T>
void PlainLoop(unsigned int up, unsigned int down, const std::vector<T>& taps, std::int64_t start, T* buffer,
               std::ptrdiff_t src, std::ptrdiff_t dst, unsigned int cycles)
{
    const std::int64_t length = std::int64_t(taps.size() / up);
    std::int64_t phase = ((start % up) + up) % up, inputIndex = (start - phase) / std::int64_t(up);
    for (std::int64_t n = 0; n < std::int64_t(up) * cycles; ++n) {
        T sum = T(0);
        for (std::int64_t j = 0; j < length; ++j) {
            const std::int64_t s = inputIndex - length + 1 + j;
            sum += (s >= 0 ? buffer[src + s] : T(0)) * taps[phase + (length - 1 - j) * up];
        }
        buffer[dst + n] = sum;
        phase += down;
        inputIndex += phase / up;
        phase %= up;
    }
}

template <class T>
class MultiRateCorners : public ::testing::Test {};
TYPED_TEST_SUITE(MultiRateCorners, FloatingTypes);

TYPED_TEST(MultiRateCorners, OverlappingDestinationFollowsThePlainLoop)
{
    using T = TypeParam;
    const struct {
        unsigned int up, down, taps;
        std::ptrdiff_t shift;
        std::int64_t start;
    } cases[] = {{1, 1, 24, 1, 0}, {3, 2, 30, 2, 0}, {2, 3, 20, -3, 1}, {4, 1, 64, 5, -3}, {1, 2, 17, 40, 2}};
    for (const auto& c : cases) {
        SCOPED_TRACE(std::to_string(c.up) + "/" + std::to_string(c.down) + ", destination " +
                     std::to_string(c.shift) + " on");
        const unsigned int cycles = 48;
        const auto taps = RandomReals<T>(c.taps, 7);
        std::vector<T> expected = RandomReals<T>(cycles * (c.up + c.down) + 200, 8), actual = expected;
        const std::ptrdiff_t src = 50, dst = src + c.shift;
        PlainLoop(c.up, c.down, taps, c.start, expected.data(), src, dst, cycles);
        typename Filter<T>::State* state = nullptr;
        kf::MRFInit(&state, c.up, c.down, taps.data(), c.taps, Pool<T>(), 0, unsigned(c.start));
        kf::MRFProcess(actual.data() + src, actual.data() + dst, cycles, state);
        kf::MRFFree(state);
        EXPECT_TRUE(SameBitsArray(expected, actual));
    }
    // Taps {1, 0} pass each sample on; written one place on, the first
    // sample travels down the whole block.
    T buffer[12] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12};
    const T one[2] = {1, 0};
    typename Filter<T>::State* state = nullptr;
    kf::MRFInit(&state, 1, 1, one, 2, Pool<T>(), 0, 0);
    kf::MRFProcess(buffer, buffer + 1, 10, state);
    kf::MRFFree(state);
    const T want[12] = {1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 12};
    EXPECT_TRUE(SameBitsArray(want, buffer, 12));
}

// Fewer taps than branches: every output is +0 and reads nothing, however
// far back the first position lies (the sanitizer build sees any read).
TYPED_TEST(MultiRateCorners, EmptyBranchesReadNothing)
{
    using T = TypeParam;
    const T taps[3] = {1, 2, 3};
    typename Filter<T>::State* state = nullptr;
    kf::MRFInit(&state, 5, 2, taps, 3, Pool<T>(), 5000, 0);
    const auto src = RandomReals<T>(2 * 40, 3);
    std::vector<T> dst(5 * 40, T(-1));
    kf::MRFProcess(src.data(), dst.data(), 40, state);
    kf::MRFFree(state);
    for (T v : dst) EXPECT_TRUE(SameBits(T(0), v));
}

// An up factor of 0 ends the call with the divide fault (SIGFPE), as the
// division by it would on x86. Windows reports the same fault as an
// exception code, which the death tests of this platform's runner do not see.
#if !defined(_WIN32) && GTEST_HAS_DEATH_TEST
TYPED_TEST(MultiRateCorners, UpFactorZeroRaisesTheDivideFault)
{
    using T = TypeParam;
    const T taps[4] = {1, 2, 3, 4};
    typename Filter<T>::State* state = nullptr;
    EXPECT_EXIT(kf::MRFInit(&state, 0, 1, taps, 4, Pool<T>(), 0, 0), ::testing::KilledBySignal(SIGFPE), "");
}
#endif

}  // namespace
