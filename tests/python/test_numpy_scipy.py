"""numpy and scipy as independent references, within tolerance: the helpers
are the library's transforms and filters, so their errors are those of its
float32 and float64 arithmetic."""

import numpy as np
import pytest
import scipy.signal as ss

import kestaccel as k
from conftest import data

f32, f64 = np.float32, np.float64


def error(x, reference):
    """The largest error relative to the reference's largest magnitude."""
    return np.max(np.abs(x - reference)) / np.max(np.abs(reference))


def tolerance(dtype, n):
    # float32 twiddles are each rounded once from the double recurrence that
    # makes them; float64 ones keep the drift of that recurrence, which grows
    # with the length (about n / 4 machine epsilons at 65536).
    eps = np.finfo(dtype).eps
    return 8 * eps if dtype == f32 else eps * max(8, n)


@pytest.mark.parametrize("dtype", [f32, f64])
@pytest.mark.parametrize("n", [1, 2, 16, 1024, 65536])
def test_fft_against_numpy(n, dtype):
    x = data(2 * n, dtype, n)
    z = x[:n] + 1j * x[n:]
    zc = z.astype(np.result_type(dtype, 1j))
    assert error(k.fft(zc), np.fft.fft(z)) < tolerance(dtype, n)
    assert error(k.ifft(zc), np.fft.ifft(z)) < tolerance(dtype, n)
    if n > 1:
        X = k.rfft(x[:n])
        assert X.imag[0] == 0 and X.imag[-1] == 0
        Y = np.fft.rfft(x[:n].astype(f64))  # real DC and Nyquist: numpy ignores their imaginary parts
        assert error(X, Y) < tolerance(dtype, n)
        assert error(k.irfft(Y.astype(X.dtype)), np.fft.irfft(Y)) < 2 * tolerance(dtype, n)


@pytest.mark.parametrize("dtype", [f32, f64])
def test_filters_against_scipy(dtype):
    x = data(4096, dtype, 21)
    fir = ss.firwin(63, 0.3).astype(dtype)
    b, a = ss.butter(4, 0.2)
    sos = ss.butter(8, 0.1, output="sos")
    # Coefficients rounded to the element type on both sides.
    b, a, sos = (v.astype(dtype).astype(f64) for v in (b, a, sos))
    # The float32 recursions lose what their poles amplify.
    limit = {f32: 1e-5, f64: 1e-13}[dtype]
    assert error(k.lfilter(fir, [1.0], x), ss.lfilter(fir.astype(f64), [1.0], x.astype(f64))) < limit
    assert error(k.lfilter(b, a, x), ss.lfilter(b, a, x.astype(f64))) < limit
    assert error(k.sosfilt(sos, x), ss.sosfilt(sos, x.astype(f64))) < limit


def snr(x, reference):
    return 10 * np.log10(np.sum(reference ** 2) / np.sum((x - reference) ** 2))


# Three tones inside every preset's passband, at fractions of the lower rate.
@pytest.mark.parametrize("up, down", [(160, 147), (147, 160), (2, 1), (1, 3)])
@pytest.mark.parametrize("preset", k.resample_presets(), ids=lambda p: p["name"])
def test_resample_poly_against_scipy(up, down, preset):
    n = 20000
    lower = min(1.0, up / down)  # the lower rate, in input samples per second
    tones = [(0.3, 0.05 * lower, 0.1), (0.3, 0.17 * lower, 1.3), (0.3, 0.33 * lower, 2.2)]

    def signal(t):
        return sum(amplitude * np.sin(2 * np.pi * f * t + phase) for amplitude, f, phase in tones)

    x = signal(np.arange(n)).astype(f32)
    quality = preset["name"]
    y = k.resample_poly(x, up, down, quality)
    assert y.dtype == f32 and len(y) == -(-n * up // down)
    exact = signal(np.arange(len(y)) * down / up)
    inner = slice(len(y) // 10, -len(y) // 10)  # away from the edges, where both start from silence
    # Within 10 dB of the preset's attenuation, or of what float32 samples hold.
    assert snr(y[inner], exact[inner]) > min(preset["attenuationDb"], 140) - 10
    # scipy's own filter (Kaiser, beta 5) is good to about 57 dB on these tones.
    assert snr(y[inner], ss.resample_poly(x.astype(f64), up, down)[inner]) > 50
    # Two channels resample as two separate signals.
    np.testing.assert_array_equal(k.resample_poly(np.stack([x, -x], axis=1), up, down, quality), np.stack([y, -y], 1))
