import numpy as np


def data(n, dtype, seed):
    """The inputs of reference/Reference.cpp: a 64-bit LCG whose top bits give
    values in [-1, 1) that are exact in the element type."""
    dtype = np.dtype(dtype)
    if dtype.kind == "c":
        return data(2 * n, np.float32 if dtype == np.complex64 else np.float64, seed).view(dtype)
    out = np.empty(n, dtype)
    for i in range(n):
        seed = (seed * 6364136223846793005 + 1442695040888963407) & 0xFFFFFFFFFFFFFFFF
        out[i] = {np.dtype(np.float32): lambda s: (s >> 40) / 8388608.0 - 1.0,
                  np.dtype(np.float64): lambda s: (s >> 11) / 4503599627370496.0 - 1.0,
                  np.dtype(np.int16): lambda s: (s >> 48) - 32768,
                  np.dtype(np.int32): lambda s: (s >> 32) - 2147483648,
                  np.dtype(np.uint32): lambda s: s >> 32}[dtype](seed)
    return out
