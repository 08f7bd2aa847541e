// A short tour of kestaccel: allocate buffers, fill them, add and subtract
// (mind the reversed operands of Sub), and compare the results byte for byte.
//
//   kestaccel_demo [count]     count defaults to 8

#include <kestaccel/kestaccel.h>

#include <cstdio>
#include <cstdlib>

int main(int argc, char** argv)
{
    using namespace kestaccel::utility;

    unsigned int count = 8;
    if (argc > 1) {
        const long requested = std::strtol(argv[1], nullptr, 10);
        if (requested <= 0 || requested > 1 << 20) {
            std::fprintf(stderr, "usage: %s [count], with 1 <= count <= 1048576\n", argv[0]);
            return 2;
        }
        count = static_cast<unsigned int>(requested);
    }

    float* ramp = Malloc_Float(count);
    float* ones = Malloc_Float(count);
    float* sum = Malloc_Float(count);
    float* back = Malloc_Float(count);

    for (unsigned int i = 0; i < count; ++i) ramp[i] = 0.25f * static_cast<float>(i);
    Set(count, ones, 1.0f);

    Add(count, ramp, ones, sum);   // sum[i]  = ramp[i] + 1
    Sub(count, ones, sum, back);   // back[i] = sum[i] - ones[i]: the second minus the first

    std::printf("i      ramp      ramp+1    (ramp+1)-1\n");
    const unsigned int shown = count < 8 ? count : 8;
    for (unsigned int i = 0; i < shown; ++i)
        std::printf("%-4u %8.3f  %8.3f  %8.3f\n", i, ramp[i], sum[i], back[i]);
    if (shown < count) std::printf("... (%u elements in all)\n", count);

    const bool same = Equal(count * static_cast<unsigned int>(sizeof(float)),
                            reinterpret_cast<const unsigned char*>(ramp),
                            reinterpret_cast<const unsigned char*>(back));
    std::printf("round trip %s the original bytes\n", same ? "reproduces" : "does NOT reproduce");

    Free(ramp);
    Free(ones);
    Free(sum);
    Free(back);
    return same ? 0 : 1;
}
