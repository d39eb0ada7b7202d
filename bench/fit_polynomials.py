"""Polynomial fits against numpy.polyfit, in one process.

Ours is the export, called through ctypes with existing arrays; it uses singular values and also returns the
values of the fit and the MSE. NumPy's returns only the coefficients, by singular values, on one
thread. Each line has our time and the ratio ours/theirs.
"""

import ctypes
import os
import sys

os.environ["OPENBLAS_NUM_THREADS"] = "1"

import numpy as np  # noqa: E402

from pocketfft import DBL, block_of, load  # noqa: E402
from pocketfft import seconds  # noqa: E402
from summary import print_summary  # noqa: E402


I32 = 3  # the type's code
BY_SINGULAR_VALUES = 6


def ratio(ours, theirs, n):
    repeats = max(1, 20_000 // n)
    rounds = [(seconds(ours, repeats), seconds(theirs, repeats)) for _ in range(15)]
    return [min(column) for column in zip(*rounds)]


def main():
    host, module = load()
    module.PolyFit_head.argtypes = ([ctypes.c_void_p] * 2 + [ctypes.c_int32] * 2
                                    + [ctypes.c_void_p] * 3)
    ratios = []
    for n in (20, 100, 1000, 10000, 100000, 1000000):
        noise = np.random.default_rng(n)
        x = np.linspace(-1, 1, n)
        y = noise.normal(size=n)
        handles = [block_of(host, DBL, values) for values in (x, y)]
        results = [block_of(host, DBL, np.zeros(1)) for _ in range(2)]
        mse = ctypes.c_double()
        for order in (1, 3, 6, 12):
            call = lambda: module.PolyFit_head(  # noqa: E731
                *handles, order, 0, *results, ctypes.byref(mse))
            if call() != 0:
                sys.exit("the fit failed")
            mine, other = ratio(call, lambda: np.polyfit(x, y, order), n)
            name = f"n {n}, order {order}"
            print(f"{name:<20} {1e6 * mine:10.1f} us  polyfit {mine / other:5.2f}", flush=True)
            ratios.append((mine / other, name))
    print_summary("polynomial fits, called from Python", "NumPy", ratios)
    revisions(host, module)


def matrix_of(host, values):
    """A two-dimensional host array, whose elements follow its two sizes."""
    handle = ctypes.c_void_p(host.QXHostNew2D(DBL, *values.shape))
    block = ctypes.cast(handle, ctypes.POINTER(ctypes.c_void_p))[0]
    ctypes.memmove(block + 8, np.ascontiguousarray(values).ctypes.data, values.nbytes)
    return handle


def revisions(host, module):
    """PolyFit2026_head against numpy.polyfit, GenLSFit2026_head against numpy.linalg.lstsq, and both against their
    elders with the algorithm by singular values that leaves out the smallest."""
    host.QXHostNew2D.restype = ctypes.c_void_p
    for export, choice in (("PolyFit2026_head", ctypes.c_double), ("PolyFit81_head", ctypes.c_int32)):
        getattr(module, export).argtypes = ([ctypes.c_void_p] * 2 + [ctypes.c_int32, ctypes.c_void_p, choice]
                                            + [ctypes.c_void_p] * 5)
    for export, choice in (("GenLSFit2026_head", ctypes.c_double), ("GenLSFit80_head", ctypes.c_int32)):
        getattr(module, export).argtypes = [ctypes.c_void_p] * 3 + [choice, ctypes.c_int32] + [ctypes.c_void_p] * 4
    ratios = {}
    for n in (20, 100, 1000, 10000, 100000):
        x, y = np.linspace(-1, 1, n), np.random.default_rng(n).normal(size=n)
        empty = [block_of(host, DBL, np.zeros(0)), block_of(host, I32, np.zeros(0, np.int32))]
        handles = [block_of(host, DBL, values) for values in (x, y)]
        results = [block_of(host, DBL, np.zeros(1)) for _ in range(2)]
        mse = ctypes.c_double()
        for order in (1, 3, 6, 12):
            matrix = np.vander(x, order + 1)
            rows, inverse = matrix_of(host, matrix), matrix_of(host, np.zeros((0, 0)))

            def polynomial(export, choice):
                return getattr(module, export)(*handles, order, empty[0], choice, empty[1], empty[0], *results,
                                               ctypes.byref(mse))

            def general(export, choice):
                return getattr(module, export)(rows, handles[1], empty[0], choice, 0, *results, inverse, ctypes.byref(mse))

            cases = [("polynomial", "NumPy polyfit", lambda: polynomial("PolyFit2026_head", -1.0),
                      lambda: np.polyfit(x, y, order)),
                     ("polynomial", "elder", lambda: polynomial("PolyFit2026_head", -1.0),
                      lambda: polynomial("PolyFit81_head", BY_SINGULAR_VALUES)),
                     ("general linear", "NumPy lstsq", lambda: general("GenLSFit2026_head", -1.0),
                      lambda: np.linalg.lstsq(matrix, y, rcond=None)),
                     ("general linear", "elder", lambda: general("GenLSFit2026_head", -1.0),
                      lambda: general("GenLSFit80_head", BY_SINGULAR_VALUES))]
            for what, peer, ours, theirs in cases:
                if ours() != 0 or (peer == "elder" and theirs() != 0):
                    sys.exit("the fit failed")
                mine, other = ratio(ours, theirs, n)
                name = f"n {n}, order {order}"
                ratios.setdefault((what, peer), []).append((mine / other, name))
                print(f"{what}, {name:<20} {1e6 * mine:10.1f} us  over {peer:13} {mine / other:5.2f}", flush=True)
    for (what, peer), found in ratios.items():
        print_summary(f"{what} fits, revision, called from Python", peer, found)


if __name__ == "__main__":
    main()
