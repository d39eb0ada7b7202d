"""Rational rates against scipy.signal.upfirdn, in one process.

Ours is the export, called through ctypes with existing arrays, on one block in double precision;
SciPy's allocates its output. Each line has our time and the ratio ours/theirs.
"""

import ctypes
import sys

import numpy as np

from pocketfft import DBL, block_of, load, ratio
from summary import print_summary

try:
    import scipy.signal
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

INPUTS = 20000


def main():
    host, module = load()
    module.ppMultiRateFIRH_DBL.argtypes = ([ctypes.c_void_p] * 3 + [ctypes.c_int32] * 3
                                           + [ctypes.c_void_p, ctypes.c_double]
                                           + [ctypes.c_void_p] * 4)
    x = np.random.default_rng(1).normal(size=INPUTS)
    ratios = []
    for up, down in ((2, 1), (1, 2), (3, 2), (160, 147), (147, 160)):
        for terms in (8, 16, 32, 64):
            h = np.random.default_rng(2).normal(size=terms * up)
            source, taps, result, state = (block_of(host, DBL, values)
                                           for values in (x, h, np.zeros(1), np.zeros(0)))
            reset, remove = ctypes.c_uint8(1), ctypes.c_uint8(0)
            delay, phase = ctypes.c_int32(), ctypes.c_int32()
            others = [ctypes.byref(value) for value in (reset, remove, delay, phase)]
            mode = 2 if up == 1 else 3
            call = lambda: module.ppMultiRateFIRH_DBL(  # noqa: E731
                source, result, state, mode, up, down, taps, 1.0, *others)
            if call() != 0:
                sys.exit(f"{up}/{down} failed")
            mine, other = ratio(call, lambda: scipy.signal.upfirdn(h, x, up, down), INPUTS)
            name = f"{up}/{down}, {terms} taps"
            print(f"{name:<18} {1e6 * mine:9.1f} us  upfirdn {mine / other:5.2f}")
            ratios.append((mine / other, name))
    print_summary("rational rates, called from Python", "SciPy", ratios)


if __name__ == "__main__":
    main()
