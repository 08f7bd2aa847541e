// The packed 24-bit sample type: layout, conversions and equality, checked
// against byte-level expectations written here.

#include <kestcore/utility/int24_t.h>

#include <climits>
#include <cstring>
#include <random>
#include <type_traits>
#include <vector>

#include "support/TestSupport.h"

namespace {

using kestcore::utility::int24_t;

TEST(Int24, LayoutIsThreeUnalignedBytes)
{
    EXPECT_EQ(3u, sizeof(int24_t));
    EXPECT_EQ(1u, alignof(int24_t));
    EXPECT_TRUE(std::is_trivially_copyable<int24_t>::value);
    EXPECT_TRUE(std::has_unique_object_representations<int24_t>::value);  // no padding
    int24_t array[4];
    EXPECT_EQ(9, reinterpret_cast<unsigned char*>(&array[3]) - reinterpret_cast<unsigned char*>(&array[0]));
}

TEST(Int24, FromIntStoresLittleEndianAndSaturates)
{
    const int24_t a(0x123456);
    EXPECT_EQ(0x56, a.bytes[0]);
    EXPECT_EQ(0x34, a.bytes[1]);
    EXPECT_EQ(0x12, a.bytes[2]);

    const int24_t minusOne(-1);
    EXPECT_EQ(0xFF, minusOne.bytes[0]);
    EXPECT_EQ(0xFF, minusOne.bytes[1]);
    EXPECT_EQ(0xFF, minusOne.bytes[2]);

    const struct {
        int in, out;
    } cases[] = {{8388607, 8388607}, {8388608, 8388607}, {INT_MAX, 8388607}, {-8388608, -8388608},
                 {-8388609, -8388608}, {INT_MIN, -8388608}, {0, 0}, {-5, -5}, {0x01000000, 8388607}};
    for (const auto& c : cases) EXPECT_EQ(c.out, static_cast<int>(int24_t(c.in))) << "from " << c.in;
}

TEST(Int24, ToIntSignExtendsBit23)
{
    std::mt19937 engine(24);
    for (int k = 0; k < 1000; ++k) {
        int24_t word;
        for (auto& b : word.bytes) b = static_cast<unsigned char>(engine() >> 24);
        long long expected = word.bytes[0] + 256LL * word.bytes[1] + 65536LL * word.bytes[2];
        if (word.bytes[2] >= 0x80) expected -= 16777216LL;
        ASSERT_EQ(expected, static_cast<int>(word));
    }
    int24_t top;
    top.bytes[0] = 0x00;
    top.bytes[1] = 0x00;
    top.bytes[2] = 0x80;
    EXPECT_EQ(-8388608, static_cast<int>(top));
}

TEST(Int24, EqualityComparesTheThreeBytes)
{
    int24_t a(1000), b(1000);
    EXPECT_TRUE(a == b);
    EXPECT_FALSE(a != b);
    for (int i = 0; i < 3; ++i) {
        int24_t c = a;
        c.bytes[i] ^= 0x01;
        EXPECT_FALSE(a == c) << "byte " << i;
        EXPECT_TRUE(a != c) << "byte " << i;
    }
    // Saturated values equal the limit they were cut to.
    EXPECT_TRUE(int24_t(9000000) == int24_t(8388607));
}

// Elements start at odd addresses inside a byte buffer; reads and writes
// through the array touch exactly their three bytes.
TEST(Int24, UnalignedAccessInAnArray)
{
    std::vector<unsigned char> storage(2 + 3 * 7 + 2, 0xA5);
    auto* words = reinterpret_cast<int24_t*>(storage.data() + 1);
    const int values[] = {0, 1, -1, 8388607, -8388608, 0x123456, -0x123456};
    for (int i = 0; i < 7; ++i) words[i] = int24_t(values[i]);
    for (int i = 0; i < 7; ++i) EXPECT_EQ(values[i], static_cast<int>(words[i])) << "element " << i;
    EXPECT_EQ(0x56, storage[1 + 3 * 5]);
    EXPECT_EQ(0x34, storage[2 + 3 * 5]);
    EXPECT_EQ(0x12, storage[3 + 3 * 5]);
    EXPECT_EQ(0xA5, storage[0]);
    EXPECT_EQ(0xA5, storage[1 + 3 * 7]);
}

}  // namespace
