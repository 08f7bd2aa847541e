// Buffer primitives: allocation, the 32-bit byte count of Copy/Move/Zero,
// Set's zero path, byte comparison, and the deliberately uneven overloads.

#include <kestaccel/VectorUtils.h>

#include <climits>
#include <cmath>
#include <complex>
#include <cstring>
#include <limits>
#include <numeric>
#include <type_traits>
#include <utility>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel::utility;
using kestaccel_test::Bits;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::SameBits;

// ---------------------------------------------------------------------------
// Overload coverage: what exists, and the gaps that must stay gaps.
// ---------------------------------------------------------------------------
template <class T, class = void>
struct HasCopy : std::false_type {};
template <class T>
struct HasCopy<T, std::void_t<decltype(Copy(0u, std::declval<const T*>(), std::declval<T*>()))>> : std::true_type {};

template <class T, class = void>
struct HasMove : std::false_type {};
template <class T>
struct HasMove<T, std::void_t<decltype(Move(0u, std::declval<const T*>(), std::declval<T*>()))>> : std::true_type {};

template <class T, class = void>
struct HasSet : std::false_type {};
template <class T>
struct HasSet<T, std::void_t<decltype(Set(0u, std::declval<T*>(), std::declval<T>()))>> : std::true_type {};

template <class T, class = void>
struct HasZero : std::false_type {};
template <class T>
struct HasZero<T, std::void_t<decltype(Zero(0u, std::declval<T*>()))>> : std::true_type {};

template <class T, class = void>
struct HasEqual : std::false_type {};
template <class T>
struct HasEqual<T, std::void_t<decltype(Equal(0u, std::declval<const T*>(), std::declval<const T*>()))>> : std::true_type {};

template <class T, class = void>
struct HasFree : std::false_type {};
template <class T>
struct HasFree<T, std::void_t<decltype(Free(std::declval<T*>()))>> : std::true_type {};

using cf = std::complex<float>;
using cd = std::complex<double>;

static_assert(HasCopy<signed char>::value && HasCopy<int>::value && HasCopy<unsigned int>::value, "");
static_assert(!HasCopy<cf>::value && !HasCopy<cd>::value, "no complex Copy");
static_assert(HasMove<unsigned char>::value && HasMove<short>::value && HasMove<unsigned int>::value, "");
static_assert(!HasMove<int>::value && !HasMove<signed char>::value && !HasMove<cf>::value, "Move has no int, signed char or complex form");
static_assert(HasSet<int>::value && !HasSet<signed char>::value && !HasSet<cd>::value, "");
static_assert(HasZero<int>::value && !HasZero<signed char>::value && !HasZero<cf>::value, "");
static_assert(HasEqual<unsigned char>::value, "");
static_assert(!HasEqual<float>::value && !HasEqual<short>::value && !HasEqual<signed char>::value, "only bytes are compared");
static_assert(HasFree<cf>::value && HasFree<short>::value, "");
static_assert(!HasFree<int>::value && !HasFree<unsigned int>::value && !HasFree<signed char>::value, "");

// ---------------------------------------------------------------------------
// Allocation.
// ---------------------------------------------------------------------------
TEST(Malloc, ZeroCountGivesABlockThatFreeAccepts)
{
    float* f = Malloc_Float(0);
    unsigned char* b = Malloc_Byte(0);
    EXPECT_NE(f, nullptr);
    EXPECT_NE(b, nullptr);
    Free(f);
    Free(b);
}

TEST(Malloc, FreeOfNullDoesNothingForEveryOverload)
{
    Free(static_cast<unsigned char*>(nullptr));
    Free(static_cast<short*>(nullptr));
    Free(static_cast<float*>(nullptr));
    Free(static_cast<double*>(nullptr));
    Free(static_cast<cf*>(nullptr));
    Free(static_cast<cd*>(nullptr));
    SUCCEED() << "no crash";
}

// The complex forms zero their elements even in memory that held data: dirty
// a block, release it, and ask again for the same size (the heap usually
// hands the same block back; either way every element must read (0, 0)).
template <class C, class Alloc>
void ExpectZeroedComplexAllocation(Alloc allocate)
{
    constexpr unsigned int n = 257;
    for (int round = 0; round < 4; ++round) {
        C* block = allocate(n);
        for (unsigned int i = 0; i < n; ++i) {
            EXPECT_EQ(Bits(block[i].real()), 0u) << "element " << i;
            EXPECT_EQ(Bits(block[i].imag()), 0u) << "element " << i;
            block[i] = C(-1.5, std::numeric_limits<typename C::value_type>::quiet_NaN());
        }
        Free(block);
    }
}

TEST(Malloc, ComplexBlocksReadZero)
{
    ExpectZeroedComplexAllocation<cf>(Malloc_Complex_Float);
    ExpectZeroedComplexAllocation<cd>(Malloc_Complex_Double);
}

TEST(Malloc, BlocksOfOneTypeMayBeFreedThroughAnother)
{
    // All overloads of Free are one release.
    float* f = Malloc_Float(16);
    Free(reinterpret_cast<unsigned char*>(f));
    short* s = Malloc_Int16(8);
    Free(reinterpret_cast<double*>(s));
    SUCCEED() << "no crash";
}

// ---------------------------------------------------------------------------
// Copy, Move, Zero, Set over every element type that has them.
// ---------------------------------------------------------------------------
template <class T>
std::vector<T> Pattern(std::size_t n, int salt)
{
    std::vector<T> v(n);
    for (std::size_t i = 0; i < n; ++i) v[i] = static_cast<T>(static_cast<int>((i * 37 + salt) % 101) - 50);
    return v;
}

template <class T>
class BlockOps : public ::testing::Test {};
using MovableTypes = ::testing::Types<unsigned char, short, unsigned int, float, double>;
TYPED_TEST_SUITE(BlockOps, MovableTypes);

TYPED_TEST(BlockOps, CopyMoveAndZeroWriteExactlyCountElements)
{
    using T = TypeParam;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        const auto src = Pattern<T>(n, 3);
        GuardedBuffer<T> copied(n), moved(n), cleared(n, T(7));
        Copy(n, src.data(), copied.data());
        Move(n, src.data(), moved.data());
        Zero(n, cleared.data());
        EXPECT_EQ(copied.values(), src) << n;
        EXPECT_EQ(moved.values(), src) << n;
        EXPECT_EQ(cleared.values(), std::vector<T>(n, T(0))) << n;
        EXPECT_TRUE(copied.Intact());
        EXPECT_TRUE(moved.Intact());
        EXPECT_TRUE(cleared.Intact());
    }
}

TYPED_TEST(BlockOps, MoveHandlesOverlapInBothDirections)
{
    using T = TypeParam;
    const unsigned int n = 64;
    const auto original = Pattern<T>(n, 11);
    const unsigned int shift = n / 4;

    auto forward = original;  // onto itself, shifted forward by a quarter
    Move(n - shift, forward.data(), forward.data() + shift);
    auto expected = original;
    const std::vector<T> staged(original.begin(), original.end() - shift);
    std::copy(staged.begin(), staged.end(), expected.begin() + shift);
    EXPECT_EQ(forward, expected);

    auto backward = original;
    Move(n - shift, backward.data() + shift, backward.data());
    expected = original;
    std::copy(original.begin() + shift, original.end(), expected.begin());
    EXPECT_EQ(backward, expected);
}

TYPED_TEST(BlockOps, CountZeroAcceptsNullPointers)
{
    using T = TypeParam;
    Copy(0u, static_cast<const T*>(nullptr), static_cast<T*>(nullptr));
    Move(0u, static_cast<const T*>(nullptr), static_cast<T*>(nullptr));
    Zero(0u, static_cast<T*>(nullptr));
    Set(0u, static_cast<T*>(nullptr), T(1));
    Set(0u, static_cast<T*>(nullptr), T(0));
    SUCCEED() << "nothing was touched";
}

TYPED_TEST(BlockOps, SetStoresTheValueInEveryElement)
{
    using T = TypeParam;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        GuardedBuffer<T> buffer(n);
        Set(n, buffer.data(), T(9));
        EXPECT_EQ(buffer.values(), std::vector<T>(n, T(9))) << n;
        Set(n, buffer.data(), T(0));
        EXPECT_EQ(buffer.values(), std::vector<T>(n, T(0))) << n;
        EXPECT_TRUE(buffer.Intact());
    }
}

TEST(BlockOps, CopyOfSignedCharAndIntAreBlockCopies)
{
    std::vector<signed char> sc = {-128, -1, 0, 1, 127}, scOut(5);
    Copy(5u, sc.data(), scOut.data());
    EXPECT_EQ(scOut, sc);
    std::vector<int> in = {INT_MIN, -1, 0, 1, INT_MAX}, inOut(5);
    Copy(5u, in.data(), inOut.data());
    EXPECT_EQ(inOut, in);
    std::vector<int> cleared = in;
    Zero(5u, cleared.data());
    EXPECT_EQ(cleared, std::vector<int>(5, 0));
    Set(5u, cleared.data(), -3);
    EXPECT_EQ(cleared, std::vector<int>(5, -3));
}

// ---------------------------------------------------------------------------
// The 32-bit byte count. These calls pass small buffers on purpose: a count
// whose byte count wraps to 0 must not touch them at all, and one that wraps
// to 4 touches exactly one float.
// ---------------------------------------------------------------------------
constexpr unsigned int kWrapsToZero = 1u << 30;        // 1073741824 floats = 4 GiB
constexpr unsigned int kWrapsToOne = (1u << 30) + 1u;  // 4 GiB + 4 bytes

TEST(ByteCount, CopyMoveAndZeroWrapAtFourGibibytes)
{
    const float src[4] = {1.0f, 2.0f, 3.0f, 4.0f};
    float dst[4] = {-1.0f, -1.0f, -1.0f, -1.0f};

    Copy(kWrapsToZero, src, dst);
    Move(kWrapsToZero, src, dst);
    Zero(kWrapsToZero, dst);
    for (float v : dst) EXPECT_EQ(v, -1.0f);

    Copy(kWrapsToOne, src, dst);
    EXPECT_EQ(dst[0], 1.0f);
    EXPECT_EQ(dst[1], -1.0f);

    dst[0] = -1.0f;
    Move(kWrapsToOne, src, dst);
    EXPECT_EQ(dst[0], 1.0f);
    EXPECT_EQ(dst[1], -1.0f);

    Zero(kWrapsToOne, dst);
    EXPECT_EQ(dst[0], 0.0f);
    EXPECT_EQ(dst[1], -1.0f);
}

TEST(ByteCount, SetsZeroPathWrapsLikeZero)
{
    // Zero and -0 take the block-clear path with its 32-bit byte count.
    float dst[2] = {5.0f, 5.0f};
    Set(kWrapsToZero, dst, 0.0f);
    Set(kWrapsToZero, dst, -0.0f);
    EXPECT_EQ(dst[0], 5.0f);
    Set(kWrapsToOne, dst, -0.0f);
    EXPECT_TRUE(SameBits(0.0f, dst[0]));
    EXPECT_EQ(dst[1], 5.0f);

    double d[2] = {5.0, 5.0};
    Set(1u << 29, d, 0.0);  // 4 GiB of doubles
    EXPECT_EQ(d[0], 5.0);
}

// ---------------------------------------------------------------------------
// Set's two paths for floating values.
// ---------------------------------------------------------------------------
template <class T>
class SetFloating : public ::testing::Test {};
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(SetFloating, FloatingTypes);

TYPED_TEST(SetFloating, NegativeZeroStoresPositiveZero)
{
    using T = TypeParam;
    GuardedBuffer<T> buffer(33, T(3));
    Set(33u, buffer.data(), T(-0.0));
    for (std::size_t i = 0; i < 33; ++i) EXPECT_TRUE(SameBits(T(0), buffer[i])) << i;
    EXPECT_TRUE(buffer.Intact());
}

TYPED_TEST(SetFloating, NaNIsStoredWithItsPayload)
{
    using T = TypeParam;
    using B = kestaccel_test::BitsType<T>;
    // A quiet NaN with a payload and the sign bit set: any canonicalisation
    // or sign change shows.
    const B bits = sizeof(T) == 4 ? B(0xFFC12345u) : B(0xFFF8123456789ABCull);
    const T nan = kestaccel_test::FromBits<T>(bits);
    GuardedBuffer<T> buffer(19);
    Set(19u, buffer.data(), nan);
    for (std::size_t i = 0; i < 19; ++i) EXPECT_EQ(Bits(buffer[i]), bits) << i;
    EXPECT_TRUE(buffer.Intact());
}

TEST(SetShort, ZeroLeavesTheSameBytesAsZero)
{
    std::vector<short> a(21, 77), b(21, -77);
    Set(21u, a.data(), short(0));
    Zero(21u, b.data());
    EXPECT_EQ(0, std::memcmp(a.data(), b.data(), 21 * sizeof(short)));
}

// ---------------------------------------------------------------------------
// Equal compares bytes.
// ---------------------------------------------------------------------------
TEST(Equal, CountZeroIsTrueAndABufferEqualsItself)
{
    const unsigned char a[3] = {1, 2, 3}, b[3] = {4, 5, 6};
    EXPECT_TRUE(Equal(0u, a, b));
    EXPECT_TRUE(Equal(3u, a, a));
    EXPECT_FALSE(Equal(3u, a, b));
}

TEST(Equal, ADifferenceAtAnyPositionIsFound)
{
    for (unsigned int n : {5u, 16u, 23u, 32u, 50u}) {
        std::vector<unsigned char> a(n);
        std::iota(a.begin(), a.end(), static_cast<unsigned char>(n));
        for (unsigned int at = 0; at < n; ++at) {
            auto b = a;
            b[at] ^= 0x80;
            EXPECT_FALSE(Equal(n, a.data(), b.data())) << "size " << n << ", position " << at;
            EXPECT_TRUE(Equal(at, a.data(), b.data())) << "bytes before the difference are equal";
        }
        EXPECT_TRUE(Equal(n, a.data(), std::vector<unsigned char>(a).data()));
    }
}

}  // namespace
