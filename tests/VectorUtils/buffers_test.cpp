// Buffer primitives: allocation, the 32-bit byte count of Copy/Move/Zero,
// Set's zero path, byte comparison, and the deliberately uneven overloads.

#include <kestaccel/VectorUtils.h>

#include <complex>
#include <limits>
#include <numeric>
#include <string>
#include <type_traits>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using namespace kestaccel_test;
using cf = std::complex<float>;
using cd = std::complex<double>;

// The overload sets are uneven on purpose; the gaps must stay gaps.
KESTACCEL_PROBE(HasCopy, ku::Copy(0u, Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasMove, ku::Move(0u, Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasSet, ku::Set(0u, Arg<T*>(), Arg<T>()))
KESTACCEL_PROBE(HasZero, ku::Zero(0u, Arg<T*>()))
KESTACCEL_PROBE(HasEqual, ku::Equal(0u, Arg<const T*>(), Arg<const T*>()))
KESTACCEL_PROBE(HasFree, ku::Free(Arg<T*>()))
static_assert(kGap<HasCopy, signed char, cf> && kGap<HasCopy, unsigned int, cd>, "no complex Copy");
static_assert(kGap<HasMove, unsigned char, int> && kGap<HasMove, short, signed char> && !HasMove<cf>::value,
              "Move has no int, signed char or complex form");
static_assert(kGap<HasSet, int, signed char> && !HasSet<cd>::value, "no Set of signed char or complex");
static_assert(kGap<HasZero, int, signed char> && !HasZero<cf>::value, "no Zero of signed char or complex");
static_assert(kGap<HasEqual, unsigned char, float> && !HasEqual<short>::value && !HasEqual<signed char>::value,
              "only bytes are compared");
static_assert(kGap<HasFree, cf, int> && HasFree<short>::value && !HasFree<unsigned int>::value &&
                  !HasFree<signed char>::value, "no Free of int, unsigned int or signed char");

// The complex forms zero their elements even in memory that held data: dirty
// a block, release it, and ask again for the same size.
template <class C, class Alloc>
void ExpectZeroedComplexAllocation(Alloc allocate)
{
    constexpr unsigned int n = 257;
    for (int round = 0; round < 4; ++round) {
        C* block = allocate(n);
        for (unsigned int i = 0; i < n; ++i) {
            ASSERT_TRUE(SameBits(C(0, 0), block[i])) << "element " << i;
            block[i] = C(-1.5, std::numeric_limits<typename C::value_type>::quiet_NaN());
        }
        ku::Free(block);
    }
}

// A count of 0 gives a block; every block goes back through any overload of
// Free, and Free of null does nothing.
TEST(Malloc, AllocationAndRelease)
{
    float* f = ku::Malloc_Float(0);
    unsigned char* b = ku::Malloc_Byte(0);
    EXPECT_TRUE(f != nullptr && b != nullptr);
    ku::Free(f);
    ku::Free(b);
    ku::Free(reinterpret_cast<unsigned char*>(ku::Malloc_Float(16)));
    ku::Free(reinterpret_cast<double*>(ku::Malloc_Int16(8)));
    ku::Free(static_cast<unsigned char*>(nullptr));
    ku::Free(static_cast<short*>(nullptr));
    ku::Free(static_cast<float*>(nullptr));
    ku::Free(static_cast<double*>(nullptr));
    ku::Free(static_cast<cf*>(nullptr));
    ku::Free(static_cast<cd*>(nullptr));
    ExpectZeroedComplexAllocation<cf>(ku::Malloc_Complex_Float);
    ExpectZeroedComplexAllocation<cd>(ku::Malloc_Complex_Double);
}

template <class T>
std::vector<T> Pattern(std::size_t n, int salt)
{
    std::vector<T> v(n);
    for (std::size_t i = 0; i < n; ++i) v[i] = static_cast<T>(static_cast<int>((i * 37 + salt) % 101) - 50);
    return v;
}

template <class T>
class BlockOps : public ::testing::Test {};
using ElementTypes = ::testing::Types<unsigned char, signed char, short, int, unsigned int, float, double>;
TYPED_TEST_SUITE(BlockOps, ElementTypes);

// Every member where it exists; Set clears for a value equal to zero (-0.0
// stores +0.0) and stores any other bits and all.
TYPED_TEST(BlockOps, WriteExactlyCountElements)
{
    using T = TypeParam;
    T* const null = nullptr;
    ku::Copy(0u, null, null);
    for (unsigned int n : InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n));
        const auto src = Pattern<T>(n, 3);
        GuardedBuffer<T> copied(n), moved(n), set(n, T(7));
        ku::Copy(n, src.data(), copied.data());
        EXPECT_EQ(src, copied.values());
        EXPECT_TRUE(copied.Intact());
        if constexpr (HasMove<T>::value) {
            ku::Move(n, src.data(), moved.data());
            EXPECT_EQ(src, moved.values());
            EXPECT_TRUE(moved.Intact());
        }
        if constexpr (HasZero<T>::value) {
            ku::Set(n, set.data(), T(9));
            EXPECT_EQ(std::vector<T>(n, T(9)), set.values());
            ku::Set(n, set.data(), T(0));
            EXPECT_EQ(std::vector<T>(n, T(0)), set.values());
            ku::Set(n, set.data(), T(9));
            ku::Zero(n, set.data());
            EXPECT_EQ(std::vector<T>(n, T(0)), set.values());
            EXPECT_TRUE(set.Intact());
        }
        if constexpr (std::is_floating_point_v<T>) {
            const T nan = -QuietNaN<T>(0x12345);  // a payload and the sign bit: any canonicalisation shows
            ku::Set(n, set.data(), nan);
            EXPECT_TRUE(SameBitsArray(std::vector<T>(n, nan), set.values()));
            ku::Set(n, set.data(), -T(0));
            EXPECT_TRUE(SameBitsArray(std::vector<T>(n, T(0)), set.values()));
            EXPECT_TRUE(set.Intact());
        }
    }
    if constexpr (HasMove<T>::value) {
        ku::Move(0u, null, null);
        const auto original = Pattern<T>(64, 11);
        auto forward = original, backward = original, expectForward = original, expectBackward = original;
        ku::Move(48u, forward.data(), forward.data() + 16);
        ku::Move(48u, backward.data() + 16, backward.data());
        std::copy(original.begin(), original.begin() + 48, expectForward.begin() + 16);
        std::copy(original.begin() + 16, original.end(), expectBackward.begin());
        EXPECT_EQ(expectForward, forward);
        EXPECT_EQ(expectBackward, backward);
    }
    if constexpr (HasZero<T>::value) {
        ku::Zero(0u, null);
        ku::Set(0u, null, T(1));
        ku::Set(0u, null, T(0));
    }
}

// The 32-bit byte count wraps: to 0 bytes (these small buffers stay untouched)
// or to 4; Set's zero path wraps as Zero does.
TEST(ByteCount, CopyMoveZeroAndSetOfZeroWrapAtFourGibibytes)
{
    constexpr unsigned int kWrapsToZero = 1u << 30, kWrapsToOne = kWrapsToZero + 1u;
    const float src[4] = {1.0f, 2.0f, 3.0f, 4.0f};
    for (const unsigned int count : {kWrapsToZero, kWrapsToOne}) {
        SCOPED_TRACE(count);
        float copied[2] = {-1, -1}, moved[2] = {-1, -1}, cleared[2] = {-1, -1}, set[2] = {-1, -1};
        ku::Copy(count, src, copied);
        ku::Move(count, src, moved);
        ku::Zero(count, cleared);
        ku::Set(count, set, 0.0f);
        ku::Set(count, set, -0.0f);
        const float first = count == kWrapsToOne ? 1.0f : -1.0f, zero = count == kWrapsToOne ? 0.0f : -1.0f;
        EXPECT_TRUE(SameBitsArray({first, -1, first, -1, zero, -1, zero, -1},
                                  std::vector<float>{copied[0], copied[1], moved[0], moved[1], cleared[0], cleared[1],
                                                     set[0], set[1]}));
    }
    double d[2] = {5.0, 5.0};
    ku::Set(1u << 29, d, 0.0);  // 4 GiB of doubles
    EXPECT_EQ(d[0], 5.0);
}

// Equal compares bytes: a difference at any position is found, and the bytes
// before it (none for count 0) compare equal.
TEST(Equal, ADifferenceAtAnyPositionIsFound)
{
    for (unsigned int n : {5u, 16u, 23u, 32u, 50u}) {
        std::vector<unsigned char> a(n);
        std::iota(a.begin(), a.end(), static_cast<unsigned char>(n));
        for (unsigned int at = 0; at < n; ++at) {
            auto b = a;
            b[at] ^= 0x80;
            EXPECT_FALSE(ku::Equal(n, a.data(), b.data())) << "size " << n << ", position " << at;
            EXPECT_TRUE(ku::Equal(at, a.data(), b.data())) << "size " << n << ", position " << at;
        }
        EXPECT_TRUE(ku::Equal(n, a.data(), std::vector<unsigned char>(a).data()));
    }
}

}  // namespace
