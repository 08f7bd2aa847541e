"""What Python passes is checked: each bad input raises TypeError or
ValueError with a message that names the problem, and never reaches the C++
call, which checks almost nothing."""

import numpy as np
import pytest

import kestaccel as k

f32 = np.ones(8, np.float32)
f64 = np.ones(8, np.float64)
i16 = np.ones(8, np.int16)
c64 = np.ones(8, np.complex64)
big = np.ones(20, np.float32)
readonly = np.ones(8, np.float32)
readonly.flags.writeable = False


def fir():
    return k.FIRInit(np.ones(4, np.float32), 4)


def closed(make):
    state = make()
    state.close()
    return state


BAD = [
    # Element types with no C++ overload, mixed types, conversions refused.
    (lambda: k.Add(i16, i16), TypeError, "float32"),
    (lambda: k.Add(f32, f64), TypeError, "float64"),
    (lambda: k.Add([1.0, 2.0], f32), TypeError, "incompatible"),
    (lambda: k.DivConstantRev(2.0, f64), TypeError, "float32"),
    (lambda: k.MaxIndex(f64), TypeError, "float32"),
    (lambda: k.Move(np.ones(8, np.int32)), TypeError, "uint32"),
    (lambda: k.AddConstantProduct(c64, c64.copy(), 1j), TypeError, "float64"),
    (lambda: k.SwapBytes(f32), TypeError, "uint16"),
    (lambda: k.Convert(f64, np.int16, -15, True), TypeError, "float32 -> int16"),
    (lambda: k.Convert(i16, np.float32), TypeError, "takes scale and no round"),
    (lambda: k.FFTFwd(f64, k.FFTState_Float(3)), TypeError, "FFTState_Double"),
    (lambda: k.FFTInit(int, 3), TypeError, "FFTState"),
    # In-place arguments must be writable and contiguous.
    (lambda: k.Abs_InPlace(readonly), ValueError, "read-only"),
    (lambda: k.Add_InPlace(f32, np.ones(16, np.float32)[::2]), ValueError, "not contiguous"),
    (lambda: k.Add(f32, f32, readonly), ValueError, "read-only"),
    # Lengths that must agree.
    (lambda: k.Add(f32, f32[:7]), ValueError, "same number"),
    (lambda: k.Mul(f32, f32, np.ones(9, np.float32)), ValueError, "dst has 9 elements"),
    (lambda: k.FFTFwd(f32[:7], k.FFTState_Float(3)), ValueError, "8 elements"),
    (lambda: k.FFTInv(f32, k.FFTState_Float(3)), ValueError, "10 elements"),
    (lambda: k.FFTFwd(f32, f32, k.FFTState_Complex_Float_Deinterleaved(3), f32, f32), ValueError, "distinct"),
    (lambda: k.FIRInit(np.ones(4, np.float32), 5), ValueError, "tapCount"),
    (lambda: k.FIRSetDlyLine(fir(), np.ones(4, np.float32)), ValueError, "tapCount - 1"),
    (lambda: k.IIRInit(np.ones(6, np.float32), 3), ValueError, "8 elements"),
    (lambda: k.IIRInit_BiQuad(f64, 2), ValueError, "12 elements"),
    (lambda: k.Multiply(k.RowMajor, np.ones((2, 3)), np.ones((2, 3))), ValueError, "inner"),
    (lambda: k.Interleave([f32, f32[:4]]), ValueError, "same number of frames"),
    # Sizes and counts the C++ calls cannot take.
    (lambda: k.FFTState_Float(0), ValueError, "order 0"),
    (lambda: k.FFTState_Double(31), ValueError, "no usable transform"),
    (lambda: k.FFTImpl_Float(0, 1000)
     .ProcessFwd(np.ones(1000, np.float32), np.ones(1000, np.float32)), ValueError, "1024 elements"),
    (lambda: k.FFTImpl_Double(0, 1).ProcessFwd(f64[:1], f64[:1]), ValueError, "no state"),
    (lambda: k.FIRInit(None, 0), ValueError, "vector too long"),
    (lambda: k.IIRInit(np.ones(2, np.float32), 0), ValueError, "order 0"),
    (lambda: k.Max(f32[:0]), ValueError, "empty"),
    (lambda: k.MinMaxIndex(f32[:0]), ValueError, "empty"),
    (lambda: k.Convolve(f32[:0], f32), ValueError, "non-empty"),
    (lambda: k.Convolve(big[:8], big[:8], big[5:]), ValueError, "overlap"),
    (lambda: k.UpSample(big[:8], 2, 0, big[:16]), ValueError, "in place"),
    (lambda: k.UpSample(f32, 2**30, 0), ValueError, "32-bit"),
    (lambda: k.DownSample(f32, 0, 0), ValueError, "factor"),
    (lambda: k.DownSample(f32, 4, 12), ValueError, "phase"),
    (lambda: k.MinMax(f32, 9), ValueError, "count"),
    (lambda: k.MRFInit(0, 1, f32), ValueError, "upFactor"),
    (lambda: k.MRFProcess(f32, 8, k.MRFInit(1, 2, f32)), ValueError, "reads 16 samples"),
    (lambda: k.MRFProcess(f32, 1, k.MRFInit(2, 1, f32, 0, 2**32 - 40)), ValueError, "before its history"),
    (lambda: k.resample_poly(f32, 3, 2, "better"), ValueError, "fast, default, best"),
    (lambda: k.resample_poly(f32, 0, 2), ValueError, "at least 1"),
    # A state after its Free.
    (lambda: k.FIR(closed(fir), f32), ValueError, "closed"),
    (lambda: k.IIR(1.0, closed(lambda: k.IIRInit_BiQuad(f64[:6], 1))), ValueError, "closed"),
    (lambda: k.FFTFwd(f32, closed(lambda: k.FFTState_Float(3))), ValueError, "closed"),
    (lambda: k.MRFProcess(f32, 1, closed(lambda: k.MRFInit(1, 1, f32))), ValueError, "closed"),
    (lambda: closed(lambda: k.FFTImpl_Float(3)).GetOrder(), ValueError, "closed"),
]


@pytest.mark.parametrize("call, error, message", BAD, ids=range(len(BAD)))
def test_bad_input_raises(call, error, message):
    with pytest.raises(error, match=message):
        call()


def test_states_free_once_whichever_way_they_end():
    with fir() as state:
        k.FIR(state, f32)
    assert state.closed
    k.FIRFree(state)  # a second Free does nothing
    state.close()
    iir = k.IIRInit(np.ones(4), 1)
    k.IIRFree(iir)
    del iir  # the owner is collected after its Free


def test_strided_inputs_are_copied_and_dst_is_written():
    x = np.arange(16, dtype=np.float32)
    dst = np.empty(8, np.float32)
    assert k.Sub(x[::2], x[1::2], dst) is dst
    np.testing.assert_array_equal(dst, np.ones(8, np.float32))
