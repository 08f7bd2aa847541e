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

// Three bytes, alignment 1: elements at odd addresses land little-endian with a
// stride of three and touch nothing else.
TEST(Int24, LayoutAndUnalignedAccess)
{
    EXPECT_EQ(3u, sizeof(int24_t));
    EXPECT_EQ(1u, alignof(int24_t));
    EXPECT_TRUE(std::is_trivially_copyable<int24_t>::value);
    EXPECT_TRUE(std::has_unique_object_representations<int24_t>::value);
    std::vector<unsigned char> storage(1 + 3 * 7 + 1, 0xA5);
    auto* words = reinterpret_cast<int24_t*>(storage.data() + 1);
    const int values[] = {0, 1, -1, 8388607, -8388608, 0x123456, -0x123456};
    for (int i = 0; i < 7; ++i) words[i] = int24_t(values[i]);
    const std::vector<unsigned char> expected = {0xA5, 0,    0,    0,    1,    0,    0,    0xFF, 0xFF, 0xFF, 0xFF, 0xFF,
                                                 0x7F, 0,    0,    0x80, 0x56, 0x34, 0x12, 0xAA, 0xCB, 0xED, 0xA5};
    EXPECT_EQ(expected, storage);
    for (int i = 0; i < 7; ++i) EXPECT_EQ(values[i], static_cast<int>(words[i])) << "element " << i;
}

TEST(Int24, ConversionsAndEquality)
{
    // From int saturates; to int sign-extends bit 23 of any three bytes.
    const struct { int in, out; } cases[] = {{8388607, 8388607},   {8388608, 8388607}, {INT_MAX, 8388607},
                                             {-8388608, -8388608}, {-8388609, -8388608}, {INT_MIN, -8388608},
                                             {0, 0}, {-5, -5}, {0x01000000, 8388607}};
    for (const auto& c : cases) EXPECT_EQ(c.out, static_cast<int>(int24_t(c.in))) << "from " << c.in;

    std::mt19937 engine(24);
    for (int k = 0; k < 1000; ++k) {
        int24_t word;
        for (auto& b : word.bytes) b = static_cast<unsigned char>(engine() >> 24);
        const long long value = word.bytes[0] + 256LL * word.bytes[1] + 65536LL * word.bytes[2];
        ASSERT_EQ(word.bytes[2] >= 0x80 ? value - 16777216LL : value, static_cast<int>(word));
    }

    // Equality compares the three bytes; saturated values equal their limit.
    const int24_t a(1000);
    EXPECT_TRUE(a == int24_t(1000) && !(a != int24_t(1000)));
    for (int i = 0; i < 3; ++i) {
        int24_t c = a;
        c.bytes[i] ^= 0x01;
        EXPECT_TRUE(!(a == c) && a != c) << "byte " << i;
    }
    EXPECT_TRUE(int24_t(9000000) == int24_t(8388607));
}

}  // namespace
