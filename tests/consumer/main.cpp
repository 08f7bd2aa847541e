// A tiny outside program: it must compile against the installed umbrella
// header, link through the CMake package and run. It touches a free
// function, a state record and the exported FFTImpl template, whose members,
// vtable and type information come from the library.
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
    bool ok = b[0] == -1.0f && b[3] == 2.0f;

    // An impulse transforms to a flat spectrum.
    kestaccel::transform::FFTImpl<kestaccel::FFTState_Complex_Float_Deinterleaved, std::complex<float>> fft;
    fft.SetFFTSize(8);
    float re[8] = {1, 0, 0, 0, 0, 0, 0, 0}, im[8] = {}, outRe[8], outIm[8];
    fft.ProcessFwd(re, im, outRe, outIm);
    for (int i = 0; i < 8; ++i) ok = ok && outRe[i] == 1.0f && outIm[i] == 0.0f;
    ok = ok && fft.GetBlockSize() == 8;

    Free(a);
    Free(b);
    std::printf("consumer: %s\n", ok ? "ok" : "wrong result");
    return ok ? 0 : 1;
}
