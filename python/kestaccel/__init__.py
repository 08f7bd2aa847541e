"""kestaccel from numpy: the library's own functions, names and meanings,
with the same bits as the C++ calls, and a few numpy-style helpers on top.

Conventions of the bindings (each function's docstring gives its meaning):

* Arrays must have the element type of a C++ overload; nothing is
  converted, and a missing C++ overload raises TypeError listing the
  supported types.  Read-only arguments that are not C-contiguous are
  copied first; arrays written in place must be C-contiguous and writable.
* The Python signature keeps the C++ order of the inputs and drops the
  counts, which come from the array lengths (at most 2**32 - 1 elements).
  A destination moves to a trailing optional ``dst`` argument: omitted, a
  new array is returned; given, it is written and returned.
* Oddities are kept: ``Sub(a, b)`` is ``b - a``, ``Div(a, b)`` is
  ``b / a``; FIR takes its state first and IIR last; MRFProcess counts
  cycles, not samples; ``Abs`` and ``Abs_InPlace`` differ on -0 and NaN.
* The state records are Python objects that free their C++ state when
  closed (``close()``, the C++ ``...Free`` call, or the end of a ``with``
  block) or collected; a closed state raises ValueError.
* Long calls release the GIL.
"""

from ._kestaccel import *  # noqa: F401,F403
from ._kestaccel import (FFTState_Float, FFTState_Double, FFTState_Complex_Float_Interleaved,
                         FFTState_Complex_Double_Interleaved, FFTState_Complex_Float_Deinterleaved,
                         FFTState_Complex_Double_Deinterleaved)
from .helpers import fft, ifft, rfft, irfft, lfilter, sosfilt  # noqa: F401

_FFT_STATES = (FFTState_Float, FFTState_Double, FFTState_Complex_Float_Interleaved,
               FFTState_Complex_Double_Interleaved, FFTState_Complex_Float_Deinterleaved,
               FFTState_Complex_Double_Deinterleaved)


def FFTInit(state_type, order):
    """FFTInit(state_type, order): a new state of 1 << (order % 32) points, for
    example ``FFTInit(FFTState_Float, 10)`` for 1024 real samples; the same as
    ``state_type(order)``.  The ORDER, not the length."""
    if state_type not in _FFT_STATES:
        raise TypeError("FFTInit takes one of the six FFTState_* types, not %r" % (state_type,))
    return state_type(order)
