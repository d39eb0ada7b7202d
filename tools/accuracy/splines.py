#!/usr/bin/python3
"""Writes docs/accuracy/splines.md: the errors of smoothing splines and least-squares splines against
dense solutions with 80 digits, next to SciPy's.

    QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/splines.py

Needs the Debian packages python3-mpmath and python3-scipy.
"""

from pathlib import Path

import numpy as np
from mpmath import inverse, lu_solve, matrix, mp, mpf
from scipy.interpolate import make_lsq_spline, make_smoothing_spline

import qx
from pages import table

PAGE = Path(__file__).resolve().parents[2] / "docs/accuracy/splines.md"
EPS = 2.0**-52
N = 40
LAMBDAS = (1e-9, 1e-3, 1.0, 1e3, 1e9)
random = np.random.default_rng(27)
mp.dps = 80

even = np.linspace(0.0, N, N)
triples = np.sort(np.r_[np.arange(14.0), np.arange(13) + 1e-7, np.arange(13) - 1e-7])
SMOOTHING = {"even": (even, None), "at random": (np.sort(random.uniform(0, N, N)), None),
             "spacing from 1e-8 to 1": (np.cumsum(10.0 ** random.uniform(-8, 0, N)), None),
             "triples, 1e-7 apart": (triples, None),
             "deviations from 1e-4 to 1": (even, 10.0 ** random.uniform(-4, 0, N))}


def dense(x, y, d, lam):
    """Values, second derivatives and the trace of the matrix from y to the values."""
    x = [mpf(v) for v in x]
    h = [b - a for a, b in zip(x, x[1:])]
    m = N - 2
    q, r, inverse_squares = matrix(N, m), matrix(m, m), matrix(N, N)
    for j in range(m):
        q[j, j], q[j + 1, j], q[j + 2, j] = 1 / h[j], -1 / h[j] - 1 / h[j + 1], 1 / h[j + 1]
        r[j, j] = (h[j] + h[j + 1]) / 3
        if j + 1 < m:
            r[j, j + 1] = r[j + 1, j] = h[j + 1] / 6
    for i in range(N):
        inverse_squares[i, i] = mpf(d[i]) ** -2
    curvature = inverse(r) * q.T
    influence = inverse(inverse_squares + mpf(lam) * q * curvature) * inverse_squares
    values = influence * matrix([mpf(v) for v in y])
    return values, curvature * values, sum(influence[i, i] for i in range(N))


def largest_error(found, exact):
    """Of an array, relative to its largest element, in units of eps."""
    size = max(abs(v) for v in exact)
    return float(max(abs(mpf(float(a)) - b) for a, b in zip(found, exact)) / size / EPS)


def smoothing_rows():
    for name, (x, deviations) in SMOOTHING.items():
        y = np.sin(4 * x / x[-1]) + 0.1 * random.standard_normal(N)
        d = np.ones(N) if deviations is None else deviations
        for lam in LAMBDAS:
            lam *= ((x[-1] - x[0]) / N) ** 3
            values, second, trace = dense(x, y, d, lam)
            ours = qx.call("CubicSplineFit_head", x, y, [] if deviations is None else d, 1, lam)
            try:
                peer = text(largest_error(make_smoothing_spline(x, y, d**-2.0, lam)(x), values))
            except (ValueError, np.linalg.LinAlgError) as failure:
                peer = type(failure).__name__
            yield (f"| {name} | {lam:.0e} | " + " | ".join(map(text, (
                largest_error(ours[0], values), largest_error(ours[2][1:-1], second),
                float(abs(mpf(float(ours[4])) - trace) / trace / EPS)))) + f" | {peer} |")


def basis(knots, degree, x):
    """The matrix of B-splines by the recurrence of Cox and de Boor."""
    t = [mpf(float(k)) for k in knots]
    count = len(t) - degree - 1
    last = max(i for i in range(count) if t[i] < t[i + 1])
    rows = matrix(len(x), count)
    for row, at in enumerate(mpf(float(v)) for v in x):
        span = min(max(i for i in range(count) if t[i] <= at and t[i] < t[i + 1]), last)
        b = {span: mpf(1)}
        for j in range(1, degree + 1):
            def next_of(i):
                rising = (at - t[i]) / (t[i + j] - t[i]) * b[i] if i in b else 0
                falling = (t[i + j + 1] - at) / (t[i + j + 1] - t[i + 1]) * b[i + 1] if i + 1 in b else 0
                return rising + falling
            b = {i: next_of(i) for i in range(span - j, span + 1)}
        for i, value in b.items():
            rows[row, i] = value
    return rows


KNOTS = {"even": np.linspace(0, 1, 12)[1:-1],
         "pairs, 1e-6 apart": np.sort(np.r_[0.2, 0.2 + 1e-6, 0.5, 0.5 + 1e-6, 0.8, 0.8 + 1e-6]),
         "three within 1e-4 of an end": np.array([2e-5, 5e-5, 1e-4, 0.4, 0.7]),
         "nine in the first tenth": np.linspace(0, 0.1, 11)[1:-1]}


def least_squares_rows():
    x = np.sort(np.r_[random.uniform(0, 1, 120), random.uniform(0, 0.1, 60), random.uniform(0, 1e-4, 20), 0, 1])
    y = np.sin(9 * x) + 0.1 * random.standard_normal(len(x))
    for name, inner in KNOTS.items():
        for degree in (1, 3, 5, 9):
            if degree == 1 and "pairs" in name:
                continue  # no sample between the knots of a pair
            ours = qx.call("BSplineFit_head", x, y, [], degree, 0, inner)
            a = basis(ours[0], degree, x)
            exact = lu_solve(a.T * a, a.T * matrix([mpf(float(v)) for v in y]))
            fitted = a * exact
            try:
                peer = make_lsq_spline(x, y, np.asarray(ours[0]), k=degree)
                peers = [text(largest_error(peer.c, exact)), text(largest_error(peer(x), fitted))]
            except (ValueError, np.linalg.LinAlgError) as failure:
                peers = [type(failure).__name__] * 2
            yield (f"| {name} | {degree} | {text(largest_error(ours[1], exact))} | "
                   f"{text(largest_error(ours[2], fitted))} | " + " | ".join(peers) + " |")


def text(value):
    return f"{value:.2g}" if value < 1e4 else f"{value:.0e}"


if __name__ == "__main__":
    PAGE.write_text(f"""# Accuracy of splines

Errors against dense solutions with 80 digits, in units of 2.2e-16. For values, second derivatives and
coefficients, the largest error is divided by the largest element; for the effective parameters, the error is
relative. SciPy's errors are for the same samples. Written by `tools/accuracy/splines.py`.

**Smoothing splines**, `CubicSplineFit_head` with lambda given, {N} samples.

{table(["Samples", "lambda", "values", "second derivatives", "parameters", "SciPy: values"],
       smoothing_rows())}

**Least-squares splines**, `BSplineFit_head`, 202 samples on 0 to 1, of which at least 20
are below 1e-4 and 80 below 0.1. SciPy
solves the normal equations, whose condition number is the square.

{table(["Knots", "Degree", "coefficients", "values", "SciPy: coefficients", "values"],
       least_squares_rows())}
""")
