// Convert between buffers of different element types that overlap: the
// result is the ascending loop's over the very same bytes, whatever the
// types, each step reading what the steps before it wrote. The reference
// converts one element at a time through separate variables, with the
// library's own single-element result, so only the order is under test.

#include <kestaccel/VectorUtils.h>

#include <cstring>
#include <functional>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

struct Pair {
    const char* name;
    std::size_t srcSize, dstSize;
    // Converts `count` elements at byte offsets of `bytes`.
    std::function<void(unsigned int count, unsigned char* bytes, std::ptrdiff_t src, std::ptrdiff_t dst)> call;
    // Writes `count` source values in range at `bytes`.
    std::function<void(unsigned int count, unsigned char* bytes)> fill;
};

template <class S, class D, class Convert>
Pair MakePair(const char* name, Convert convert)
{
    return {name, sizeof(S), sizeof(D), [convert](unsigned int n, unsigned char* bytes, std::ptrdiff_t s, std::ptrdiff_t d) {
                convert(n, reinterpret_cast<const S*>(bytes + s), reinterpret_cast<D*>(bytes + d));
            },
            [](unsigned int n, unsigned char* bytes) {
                for (unsigned int i = 0; i < n; ++i) {
                    const S v = std::is_floating_point<S>::value ? S(int(i * 37 % 201) - 100) / S(128)
                                                                  : S(int(i * 37 % 201) - 100);
                    std::memcpy(bytes + i * sizeof(S), &v, sizeof(S));
                }
            }};
}

std::vector<Pair> Pairs()
{
    return {
        MakePair<short, float>("short->float", [](unsigned int n, const short* s, float* d) { ku::Convert(n, s, d, 15); }),
        MakePair<float, short>("float->short", [](unsigned int n, const float* s, short* d) { ku::Convert(n, s, d, -15, true); }),
        MakePair<int, float>("int->float", [](unsigned int n, const int* s, float* d) { ku::Convert(n, s, d, 0); }),
        MakePair<float, int>("float->int", [](unsigned int n, const float* s, int* d) { ku::Convert(n, s, d, -8, false); }),
        MakePair<double, int>("double->int", [](unsigned int n, const double* s, int* d) { ku::Convert(n, s, d, -31, true); }),
        MakePair<short, double>("short->double", [](unsigned int n, const short* s, double* d) { ku::Convert(n, s, d, 3); }),
        MakePair<int, double>("int->double", [](unsigned int n, const int* s, double* d) { ku::Convert(n, s, d, 31); }),
        MakePair<float, double>("float->double", [](unsigned int n, const float* s, double* d) { ku::Convert(n, s, d); }),
        MakePair<double, float>("double->float", [](unsigned int n, const double* s, float* d) { ku::Convert(n, s, d); }),
    };
}

TEST(ConversionOverlap, MixedTypesFollowTheAscendingLoop)
{
    const unsigned int n = 67;
    for (const Pair& p : Pairs()) {
        const std::ptrdiff_t span = std::ptrdiff_t(n * (p.srcSize > p.dstSize ? p.srcSize : p.dstSize));
        // Whole destination elements apart, so that both stay naturally aligned.
        const std::ptrdiff_t d = std::ptrdiff_t(p.dstSize);
        for (std::ptrdiff_t shift : {std::ptrdiff_t(0), d, -d, 2 * d, d * (n / 3)}) {
            SCOPED_TRACE(std::string(p.name) + ", destination " + std::to_string(shift) + " bytes on");
            std::vector<unsigned char> expected(2 * span + 64);
            const std::ptrdiff_t src = 16, dst = 16 + shift;
            p.fill(n, expected.data() + src);
            std::vector<unsigned char> actual = expected;
            for (unsigned int i = 0; i < n; ++i) {
                std::vector<unsigned char> single(32);
                std::memcpy(single.data(), expected.data() + src + i * p.srcSize, p.srcSize);
                p.call(1, single.data(), 0, 16);
                std::memcpy(expected.data() + dst + i * p.dstSize, single.data() + 16, p.dstSize);
            }
            p.call(n, actual.data(), src, dst);
            EXPECT_EQ(expected, actual);
        }
    }
    // The shorts 1, 2, 3, 4 read as floats one by one: each step reads
    // shorts that the float before it has replaced.
    short s[8] = {1, 2, 3, 4};
    ku::Convert(4, s, reinterpret_cast<float*>(s), 0);
    const float want[4] = {1.0f, 16256.0f, 0.0f, 18046.0f};
    EXPECT_TRUE(SameBitsArray(want, reinterpret_cast<const float*>(s), 4));
}

}  // namespace
