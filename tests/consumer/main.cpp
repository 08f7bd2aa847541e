// A tiny outside program: it must compile against the installed umbrella
// header, link through the CMake package and run.
#include <kestaccel/kestaccel.h>

#include <cstdio>

int main()
{
    using namespace kestaccel::utility;
    float* a = Malloc_Float(4);
    float* b = Malloc_Float(4);
    for (unsigned int i = 0; i < 4; ++i) {
        a[i] = 1.0f;
        b[i] = static_cast<float>(i);
    }
    Sub(4, a, b, b);  // b[i] - a[i]
    const bool ok = b[0] == -1.0f && b[3] == 2.0f;
    Free(a);
    Free(b);
    std::printf("consumer: %s\n", ok ? "ok" : "wrong result");
    return ok ? 0 : 1;
}
