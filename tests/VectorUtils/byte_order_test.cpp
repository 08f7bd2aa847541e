// SwapBytes: hand-worked words, bit-for-bit agreement with a byte-array
// reversal written here on random words of every width, the in-place and
// out-of-place forms, overlapping and unaligned buffers, empty calls.

#include <kestaccel/VectorUtils.h>

#include <algorithm>
#include <cstring>
#include <random>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using kestcore::utility::int24_t;
namespace ku = kestaccel::utility;

int24_t FromBytes(unsigned char b0, unsigned char b1, unsigned char b2)
{
    int24_t word;
    word.bytes[0] = b0;
    word.bytes[1] = b1;
    word.bytes[2] = b2;
    return word;
}

TEST(SwapBytesHandWorked, EachWidth)
{
    unsigned short h = 0x1234;
    ku::SwapBytes(1, &h);
    EXPECT_EQ(0x3412, h);

    unsigned int w = 0x12345678u;
    ku::SwapBytes(1, &w);
    EXPECT_EQ(0x78563412u, w);

    unsigned long long q = 0x0102030405060708ull;
    ku::SwapBytes(1, &q);
    EXPECT_EQ(0x0807060504030201ull, q);

    int24_t p = FromBytes(0xC0, 0xFF, 0xEE);
    ku::SwapBytes(1, &p);
    EXPECT_EQ(0xEE, p.bytes[0]);
    EXPECT_EQ(0xFF, p.bytes[1]);
    EXPECT_EQ(0xC0, p.bytes[2]);
    ku::SwapBytes(1, &p);
    EXPECT_TRUE(p == FromBytes(0xC0, 0xFF, 0xEE));

    const int24_t src = FromBytes(0x01, 0x02, 0x03);
    int24_t dst = FromBytes(0, 0, 0);
    ku::SwapBytes(1, &src, &dst);
    EXPECT_TRUE(dst == FromBytes(0x03, 0x02, 0x01));
}

template <class Word>
class SwapBytesTest : public ::testing::Test {};
using WordTypes = ::testing::Types<unsigned short, unsigned int, unsigned long long, int24_t>;
TYPED_TEST_SUITE(SwapBytesTest, WordTypes);

template <class Word>
std::vector<Word> RandomWords(std::size_t count, std::uint32_t seed)
{
    std::mt19937 engine(seed);
    std::vector<unsigned char> bytes(count * sizeof(Word));
    for (auto& b : bytes) b = static_cast<unsigned char>(engine() >> 24);
    std::vector<Word> words(count);
    if (count) std::memcpy(static_cast<void*>(words.data()), bytes.data(), bytes.size());
    return words;
}

// The reference works on the object's bytes, independent of shifts and masks.
template <class Word>
Word Reversed(Word word)
{
    unsigned char bytes[sizeof(Word)];
    std::memcpy(bytes, &word, sizeof(Word));
    std::reverse(bytes, bytes + sizeof(Word));
    Word result;
    std::memcpy(static_cast<void*>(&result), bytes, sizeof(Word));
    return result;
}

template <class Word>
bool SameWords(const std::vector<Word>& a, const std::vector<Word>& b)
{
    return a.size() == b.size() && (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(Word)) == 0);
}

TYPED_TEST(SwapBytesTest, MatchesByteReversal)
{
    using Word = TypeParam;
    for (unsigned int n : InterestingSizes()) {
        const std::uint32_t seed = 400 + n;
        SCOPED_TRACE(SeedTrace(seed));
        const auto src = RandomWords<Word>(n, seed);
        std::vector<Word> expected(n);
        for (std::size_t i = 0; i < n; ++i) expected[i] = Reversed(src[i]);

        auto srcCopy = src;
        GuardedBuffer<Word> dst(n);
        ku::SwapBytes(n, static_cast<const Word*>(srcCopy.data()), dst.data());
        EXPECT_TRUE(SameWords(expected, dst.values())) << "count " << n;
        EXPECT_TRUE(SameWords(src, srcCopy)) << "source changed, count " << n;
        EXPECT_TRUE(dst.Intact());

        GuardedBuffer<Word> inPlace(n);
        std::copy(src.begin(), src.end(), inPlace.data());
        ku::SwapBytes(n, inPlace.data());
        EXPECT_TRUE(SameWords(expected, inPlace.values())) << "count " << n;
        EXPECT_TRUE(inPlace.Intact());

        // Twice gives the data back.
        ku::SwapBytes(n, inPlace.data());
        EXPECT_TRUE(SameWords(src, inPlace.values())) << "count " << n;

        // The second-buffer form on one buffer is the in-place form.
        auto same = src;
        ku::SwapBytes(n, static_cast<const Word*>(same.data()), same.data());
        EXPECT_TRUE(SameWords(expected, same)) << "count " << n;
    }
}

// A destination one word behind the source reads back what the previous step
// wrote: the ascending loop alternates reversed and original words.
TYPED_TEST(SwapBytesTest, OverlapFollowsAscendingOrder)
{
    using Word = TypeParam;
    for (unsigned int n : {9u, 64u, 1023u}) {
        auto buffer = RandomWords<Word>(n + 1, 500 + n);
        auto expected = buffer;
        for (std::size_t i = 0; i < n; ++i) expected[i + 1] = Reversed(expected[i]);
        ku::SwapBytes(n, static_cast<const Word*>(buffer.data()), buffer.data() + 1);
        EXPECT_TRUE(SameWords(expected, buffer)) << "count " << n;
    }
}

TYPED_TEST(SwapBytesTest, EmptyCallTouchesNothing)
{
    using Word = TypeParam;
    ku::SwapBytes(0, static_cast<Word*>(nullptr));
    ku::SwapBytes(0, static_cast<const Word*>(nullptr), static_cast<Word*>(nullptr));
    GuardedBuffer<Word> untouched(0);
    ku::SwapBytes(0, untouched.data());
    EXPECT_TRUE(untouched.Intact());
}

// Packed 24-bit words start at any byte: an array placed at an odd address
// inside a byte buffer is swapped word by word with a stride of three.
TEST(SwapBytes24, UnalignedArray)
{
    std::vector<unsigned char> storage(1 + 3 * 5 + 1, 0x5A);
    for (std::size_t i = 0; i < 15; ++i) storage[1 + i] = static_cast<unsigned char>(0x10 + i);
    auto* words = reinterpret_cast<int24_t*>(storage.data() + 1);
    ku::SwapBytes(5, words);
    for (std::size_t k = 0; k < 5; ++k) {
        EXPECT_EQ(0x10 + 3 * k + 2, storage[1 + 3 * k]);
        EXPECT_EQ(0x10 + 3 * k + 1, storage[2 + 3 * k]);
        EXPECT_EQ(0x10 + 3 * k, storage[3 + 3 * k]);
    }
    EXPECT_EQ(0x5A, storage.front());
    EXPECT_EQ(0x5A, storage.back());
}

}  // namespace
