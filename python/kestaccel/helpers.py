"""numpy-style helpers, each a thin layer over the exact library calls, so
their results are the bits those calls give."""

import threading

import numpy as np

from . import _kestaccel as _k

_COMPLEX = {np.dtype(np.complex64): _k.FFTState_Complex_Float_Interleaved,
            np.dtype(np.complex128): _k.FFTState_Complex_Double_Interleaved}
_REAL = {np.dtype(np.float32): _k.FFTState_Float, np.dtype(np.float64): _k.FFTState_Double}
_states = threading.local()


def _order(n, least):
    if n < least or n & (n - 1):
        raise ValueError("the length must be a power of two of at least %d, not %d" % (least, n))
    # Order 32 is the one-point state: the length is 1 << (order % 32).
    return n.bit_length() - 1 or 32


def _state(kind, n, least=1):
    """A state per type and length, kept per thread: the real states write
    their scratch, so a state must not serve two threads at once."""
    cache = _states.__dict__.setdefault("cache", {})
    order = _order(n, least)
    if (kind, order) not in cache:
        cache[kind, order] = kind(order)
    return cache[kind, order]


def _complex(x):
    x = np.asarray(x)
    if x.dtype in (np.float32, np.float64):
        x = x.astype(np.complex64 if x.dtype == np.float32 else np.complex128)  # exact
    if x.ndim != 1 or x.dtype not in _COMPLEX:
        raise TypeError("a 1-D array of complex64, complex128, float32 or float64 is needed, not %s %s"
                        % (x.ndim, x.dtype))
    return x


def fft(x):
    """fft(x): the unscaled forward transform of a 1-D array whose length is a
    power of two, by FFTFwd on an interleaved complex state: complex64 (or
    float32) gives complex64, complex128 (or float64) complex128."""
    x = _complex(x)
    return _k.FFTFwd(x, _state(_COMPLEX[x.dtype], len(x)))


def ifft(X):
    """ifft(X): the inverse of fft, scaled by 1/N as numpy.fft.ifft is (FFTInv)."""
    X = _complex(X)
    return _k.FFTInv(X, _state(_COMPLEX[X.dtype], len(X)))


def rfft(x):
    """rfft(x): the N/2 + 1 bins of a real float32 or float64 array of N
    samples, N a power of two of at least 2, by FFTFwd on a real state. The
    packed spectrum of N + 2 values is returned as complex64 or complex128
    (a view, no copy); the imaginary parts of DC and Nyquist are exact zeros."""
    x = np.asarray(x)
    if x.ndim != 1 or x.dtype not in _REAL:
        raise TypeError("rfft takes a 1-D float32 or float64 array, not %s" % x.dtype)
    packed = _k.FFTFwd(x, _state(_REAL[x.dtype], len(x), 2))
    return packed.view(np.complex64 if x.dtype == np.float32 else np.complex128)


def irfft(X):
    """irfft(X): N = 2 * (len(X) - 1) real samples from N/2 + 1 complex64 or
    complex128 bins, by FFTInv on a real state (scaled by 1/N). Unlike
    numpy.fft.irfft, the imaginary parts at DC and Nyquist are not ignored
    from N = 4 up: the library reads them as given."""
    X = np.ascontiguousarray(X)
    if X.ndim != 1 or X.dtype not in _COMPLEX:
        raise TypeError("irfft takes a 1-D complex64 or complex128 array, not %s" % X.dtype)
    packed = X.view(np.float32 if X.dtype == np.complex64 else np.float64)
    return _k.FFTInv(packed, _state(_REAL[packed.dtype], 2 * (len(X) - 1), 2))


def lfilter(b, a, x):
    """lfilter(b, a, x): filters a 1-D float32 or float64 array x from silence,
    as scipy.signal.lfilter(b, a, x) does, with the coefficients rounded to
    x's type. With a == [1] and float32 x it is the library's FIR filter
    (FIRInit, FIR: each output summed in float from the oldest sample to the
    newest); otherwise one IIR section of order max(len(a), len(b)) - 1 (at
    least 1) in transposed direct form II (IIRInit, IIR), its taps multiplied
    by the reciprocal of a[0]."""
    x = np.asarray(x)
    if x.ndim != 1 or x.dtype not in _REAL:
        raise TypeError("lfilter takes a 1-D float32 or float64 array, not %s" % x.dtype)
    b, a = np.atleast_1d(np.asarray(b, np.float64)), np.atleast_1d(np.asarray(a, np.float64))
    if x.dtype == np.float32 and len(a) == 1 and a[0] == 1:
        with _k.FIRInit(b.astype(np.float32), len(b)) as state:
            return _k.FIR(state, x)
    order = max(len(a), len(b), 2) - 1
    taps = np.zeros(2 * order + 2, x.dtype)
    taps[:len(b)] = b
    taps[order + 1:order + 1 + len(a)] = a
    with _k.IIRInit(taps, order) as state:
        return _k.IIR(x, state)


def sosfilt(sos, x):
    """sosfilt(sos, x): filters a 1-D float32 or float64 array x from silence
    through a cascade of biquads, as scipy.signal.sosfilt does: sos has one
    row b0 b1 b2 a0 a1 a2 per section, rounded to x's type (IIRInit_BiQuad,
    IIR). As in C++, every section is scaled by the FIRST section's a0;
    scipy's own sections have a0 = 1, where the two agree."""
    x = np.asarray(x)
    if x.ndim != 1 or x.dtype not in _REAL:
        raise TypeError("sosfilt takes a 1-D float32 or float64 array, not %s" % x.dtype)
    sos = np.asarray(sos, np.float64)
    if sos.ndim != 2 or sos.shape[1] != 6:
        raise ValueError("sos must have shape (sections, 6)")
    with _k.IIRInit_BiQuad(sos.astype(x.dtype).ravel(), len(sos)) as state:
        return _k.IIR(x, state)
