// SwapBytes against a byte-array reversal on random words of every width, in
// place and out of place, on overlapping and unaligned buffers.

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

template <class Word>
class SwapBytesTest : public ::testing::Test {};
using WordTypes = ::testing::Types<unsigned short, unsigned int, unsigned long long, int24_t>;
TYPED_TEST_SUITE(SwapBytesTest, WordTypes);

// Both forms; twice gives the data back; src == dst is the in-place form; dst
// one word ahead of src reads back what the previous step wrote.
TYPED_TEST(SwapBytesTest, MatchesByteReversal)
{
    using Word = TypeParam;
    const std::size_t w = sizeof(Word);
    for (unsigned int n : SizesWithZero()) {
        SCOPED_TRACE(::testing::Message() << SeedTrace(400 + n) << " count " << n);
        std::mt19937 engine(400 + n);
        std::vector<unsigned char> raw((n + 1) * w);  // one spare word for the overlapping call
        for (auto& b : raw) b = static_cast<unsigned char>(engine() >> 24);
        auto expected = raw, chained = raw;
        for (std::size_t i = 0; i < n; ++i) {
            std::reverse(&expected[i * w], &expected[(i + 1) * w]);
            std::reverse_copy(&chained[i * w], &chained[(i + 1) * w], &chained[(i + 1) * w]);
        }
        std::vector<Word> src(n + 1);
        std::memcpy(static_cast<void*>(src.data()), raw.data(), raw.size());
        const auto same = [](const void* p, const std::vector<unsigned char>& bytes, std::size_t count) {
            return std::memcmp(p, bytes.data(), count) == 0;
        };

        GuardedBuffer<Word> dst(n), inPlace(n);
        ku::SwapBytes(n, static_cast<const Word*>(src.data()), dst.data());
        EXPECT_TRUE(same(dst.data(), expected, n * w));
        EXPECT_TRUE(same(src.data(), raw, raw.size())) << "source changed";
        std::copy(src.begin(), src.begin() + n, inPlace.data());
        ku::SwapBytes(n, inPlace.data());
        EXPECT_TRUE(same(inPlace.data(), expected, n * w));
        ku::SwapBytes(n, inPlace.data());
        EXPECT_TRUE(same(inPlace.data(), raw, n * w));
        EXPECT_TRUE(dst.Intact() && inPlace.Intact());

        auto one = src, shifted = src;
        ku::SwapBytes(n, static_cast<const Word*>(one.data()), one.data());
        EXPECT_TRUE(same(one.data(), expected, raw.size())) << "on one buffer";
        ku::SwapBytes(n, static_cast<const Word*>(shifted.data()), shifted.data() + 1);
        EXPECT_TRUE(same(shifted.data(), chained, raw.size())) << "overlapping";
    }
}

// Packed 24-bit words start at any byte: an array placed at an odd address
// inside a byte buffer is swapped word by word with a stride of three.
TEST(SwapBytes24, UnalignedArray)
{
    std::vector<unsigned char> storage(1 + 3 * 5 + 1, 0x5A);
    for (std::size_t i = 0; i < 15; ++i) storage[1 + i] = static_cast<unsigned char>(0x10 + i);
    ku::SwapBytes(5, reinterpret_cast<int24_t*>(storage.data() + 1));
    const std::vector<unsigned char> expected = {0x5A, 0x12, 0x11, 0x10, 0x15, 0x14, 0x13, 0x18, 0x17,
                                                 0x16, 0x1B, 0x1A, 0x19, 0x1E, 0x1D, 0x1C, 0x5A};
    EXPECT_EQ(expected, storage);
}

}  // namespace
