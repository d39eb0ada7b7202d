"""Smoothing splines and least-squares splines against SciPy, in one process.

Ours is the export, called through the binding, which copies its inputs and returns values and
coefficients; SciPy's functions return only the spline. SciPy has no search for a sum of squares, so
searches for lambda are also compared with one fit by SciPy with lambda given.
"""

import os
import sys
from pathlib import Path

os.environ["OPENBLAS_NUM_THREADS"] = "1"

import numpy as np  # noqa: E402

try:
    from scipy.interpolate import make_lsq_spline, make_smoothing_spline
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from generators import best  # noqa: E402
from summary import print_summary  # noqa: E402

NOISE = 0.1


def samples(n):
    random = np.random.default_rng(n)
    x = np.sort(random.uniform(0, 100, n))
    return x, np.sin(x) + NOISE * random.normal(size=n)


def compare(what, peer, cases):
    ratios = []
    for name, rounds, ours, theirs in cases:
        mine, other = best(ours, theirs, 1, rounds)
        ratios.append((mine / other, name))
        print(f"{what}, {name:32} {1e3 * mine:9.2f} ms  ratio {mine / other:6.3f}", flush=True)
    print_summary(f"{what}, called from Python", peer, ratios)


def least_squares_cases():
    for n in (10**4, 10**5, 10**6):
        x, y = samples(n)
        for degree in (1, 3, 5, 9):
            for interior in sorted({10, 1000, n // 10}):
                inner = np.quantile(x, np.arange(1, interior + 1) / (interior + 1))
                knots = np.r_[[x[0]] * (degree + 1), inner, [x[-1]] * (degree + 1)]
                yield (f"n {n}, degree {degree}, {interior} knots", 3 + 10**6 // n // 10,
                       lambda: qx.call("BSplineFit_head", x, y, [], degree, interior, []),
                       lambda: make_lsq_spline(x, y, knots, k=degree))


def given_cases():
    for n in (10**3, 10**4, 10**5, 10**6):
        x, y = samples(n)
        for lam in (1e-3, 10.0):
            yield (f"n {n}, lambda {lam:g}", max(1, min(9, 10**6 // n)),
                   lambda: qx.call("CubicSplineFit_head", x, y, [], 1, lam),
                   lambda: make_smoothing_spline(x, y, lam=lam))


def cross_validation_cases():
    for n in (10**3, 10**4):
        x, y = samples(n)
        yield (f"n {n}", 5, lambda: qx.call("CubicSplineFit_head", x, y, [], 0, 0.0),
               lambda: make_smoothing_spline(x, y))


def search_cases():
    for n in (10**3, 10**4, 10**5, 10**6):
        x, y = samples(n)
        for method, name in ((0, "cross validation"), (2, "sum of squares")):
            yield (f"{name}, n {n}", max(1, min(9, 10**5 // n)),
                   lambda: qx.call("CubicSplineFit_head", x, y, [], method, n * NOISE**2),
                   lambda: make_smoothing_spline(x, y, lam=1e-3))


if __name__ == "__main__":
    compare("least-squares splines", "SciPy make_lsq_spline", least_squares_cases())
    compare("smoothing splines, lambda given", "SciPy make_smoothing_spline", given_cases())
    compare("smoothing splines, cross validation", "SciPy make_smoothing_spline",
            cross_validation_cases())
    compare("smoothing splines, searches for lambda", "SciPy, one fit with lambda given",
            search_cases())
