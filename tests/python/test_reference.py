"""The bindings give the bits of the C++ calls: reference/Reference.cpp, built
beside the module, writes the bytes of one representative call per family;
the same calls through Python must give the same bytes."""

import os
import subprocess

import numpy as np
import pytest

import kestaccel as k
from conftest import data

N = 257
f32, f64, c64 = np.float32, np.float64, np.complex64
a, b = data(N, f32, 1), data(N, f32, 2)
da, db = data(N, f64, 3), data(N, f64, 4)
specials = a.copy()
specials[0] = -0.0
specials[1:2].view(np.uint32)[0] = 0xFFC00000  # a negative quiet NaN
SOS = np.array([0.0675, 0.135, 0.0675, 1.0, -1.143, 0.4128, 1.0, 2.0, 1.0, 1.0, -1.5, 0.7])
THIRD = np.array([0.1, 0.2, 0.2, 0.1, 2.0, -0.9, 0.4, -0.05], f32)


def reductions():
    lo, hi, lo_index, hi_index = k.MinMaxIndex(a)
    return [f32(v) for v in (k.Sum(a), k.NormL2(a), k.DotProduct(a, b), k.StandardDeviation(a), lo, hi)] + \
        [np.uint32(lo_index), np.uint32(hi_index)]


def convert():
    packed = k.Convert(a, k.int24, -23, True)
    return [k.Convert(a, np.int16, -15, True), packed, k.Convert(packed, f32, 23),
            k.Convert(data(N, np.int32, 9), f64, 31)]


def fft():
    impl = k.FFTImpl_Float(0, 100)  # 128 points
    return [k.FFTFwd(data(1024, f32, 11), k.FFTState_Float(10)),
            k.FFTInv(data(64, np.complex128, 12), k.FFTInit(k.FFTState_Complex_Double_Interleaved, 6)),
            *impl.ProcessFwd(a[:128], b[:128])]


def fir():
    x, state = data(512, f32, 14), k.FIRInit(data(37, f32, 13), 37)
    return [k.FIR(state, x[:300]), k.FIR(state, x[300:]), k.FIRGetDlyLine(state)]


def convolution():
    down, phase = k.DownSample(a[:10], 4, 1)
    return [k.Convolve(da[:40], db[:13]), down, np.uint32(phase), k.UpSample(a[:10], 3, 2)]


CASES = {
    "Sub_f32": lambda: [k.Sub(a, b)],
    "Div_c64": lambda: [k.Div(data(N, c64, 5), data(N, c64, 6))],
    "AddProduct_f64": lambda: [k.AddProduct(da, db, data(N, f64, 7))],
    "MulConstant_InPlace_i16": lambda: [k.MulConstant_InPlace(data(N, np.int16, 8), 12345, 13)],
    "DivConstantRev_f32": lambda: [k.DivConstantRev(0.75, a)],
    "Abs_f32": lambda: [k.Abs(specials), k.Abs_InPlace(specials.copy())],
    "Pow_f64": lambda: [k.Pow(k.Abs(da), db)],
    "Ln_f32": lambda: [k.Ln(a)],
    "Reductions_f32": reductions,
    "Thresholds": lambda: [k.Threshold_GTVal(da, 0.25, 9.0), k.Trim(a.copy(), -0.5, 0.25),
                           k.VectorSlope(np.empty(N), 0.1, 0.3)],
    "Convert": convert,
    "Layout": lambda: [k.Interleave([a[:50], b[:50], a[50:100]]), k.SwapBytes(data(N, np.uint32, 10)),
                       k.ConvertFloat2Half(a)],
    "Windows": lambda: [k.WindowKaiser(np.ones(65), 0.2), k.WindowBlackman(a[:64], -0.16)],
    "Lowpass": lambda: [k.GenerateLowpassFIRCoefficients(0.2, 31, k.kDSPWindowHamming, True)],
    "FFT": fft,
    "FIR": fir,
    "IIR": lambda: [k.IIR(da, k.IIRInit_BiQuad(SOS, 2)), k.IIR(a, k.IIRInit(THIRD, 3))],
    "MRF": lambda: [k.MRFProcess(a, 40, k.MRFInit(3, 2, data(24, f32, 15)))],
    "Convolution": convolution,
    "Multiply": lambda: [k.Multiply(k.ColMajor, data(12, c64, 16).reshape(3, 4, order="F"),
                                    data(20, c64, 17).reshape(4, 5, order="F"))],
}


@pytest.fixture(scope="module")
def cpp():
    program = os.environ.get("KESTACCEL_REFERENCE")
    assert program, "KESTACCEL_REFERENCE must name the reference program (ctest sets it)"
    lines = subprocess.run([program], check=True, capture_output=True, text=True).stdout.split("\n")
    return dict(line.split(" ") for line in lines if line)


def test_every_case_is_run_on_both_sides(cpp):
    assert sorted(cpp) == sorted(CASES)


@pytest.mark.parametrize("name", sorted(CASES))
def test_same_bytes_as_cpp(cpp, name):
    outputs = CASES[name]()
    assert b"".join(np.asarray(x).tobytes(order="A") for x in outputs).hex() == cpp[name]
