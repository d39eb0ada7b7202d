#!/usr/bin/python3
"""Counts the Gaussian peaks that the elder, the revision and SciPy miss, for docs/accuracy/fitting.md.

    peaks.py

Exact peaks and dips of all widths from 1.5 samples to the range, at even or random abscissae; with a level and
bounds that contain the answer for the bounded fit, without either for the other one. A peak is missed if a
parameter is off by more than 1e-6. SciPy's curve_fit has a usual start: the sample farthest from the median, with
a tenth of the range as width.
"""

import sys
import warnings
from pathlib import Path

import numpy as np
from scipy.optimize import curve_fit

ROOT = Path(__file__).resolve().parent.parent.parent
sys.path.insert(0, str(ROOT / "python"))
import qx  # noqa: E402

COUNT = 510


def bell(x, a, m, s, c=0.0):
    return a * np.exp(-0.5 * ((x - m) / s)**2) + c


def peak(rng, with_level):
    n = int(np.exp(rng.uniform(np.log(16), np.log(600))))
    size = 10**rng.uniform(-2, 2)
    first = size * rng.uniform(-5, 5)
    a = rng.choice([-1, 1]) * 10**rng.uniform(-2, 2)
    truth = [a, first + size * rng.uniform(), size * np.exp(rng.uniform(np.log(1.5 / n), 0))]
    if with_level:
        truth.append(a * rng.uniform(-2, 2))
    even = np.linspace(0, 1, n) if rng.uniform() < 0.5 else rng.uniform(size=n)
    x = first + size * even
    widths = np.array([3 * abs(a), size, truth[2], 3 * abs(a)])[:len(truth)]
    lower = np.where(rng.uniform(size=len(truth)) < 0.3, -np.inf, truth - widths * rng.uniform(size=len(truth)))
    upper = np.where(rng.uniform(size=len(truth)) < 0.3, np.inf, truth + 3 * widths * rng.uniform(size=len(truth)))
    return x, bell(x, *truth), np.array(truth), lower, upper


def is_found(fit, truth):
    try:
        with warnings.catch_warnings(), np.errstate(all="ignore"):
            warnings.simplefilter("ignore")
            p = np.array(fit())
    except (qx.QxError, RuntimeError, ValueError):
        return False
    return bool(np.all(np.abs(np.abs(p / truth) - 1) < 1e-6))


def peers(x, y, truth, lower, upper):
    middle = np.median(y)
    at = np.argmax(np.abs(y - middle))
    start = np.array([y[at] - middle, x[at], 0.1 * np.ptp(x), middle])[:len(truth)]
    return curve_fit(bell, x, y, np.clip(start, lower, upper), bounds=(lower, upper), xtol=1e-14, ftol=1e-14,
                     gtol=1e-14, maxfev=5000)[0]


def main():
    rng = np.random.default_rng(510)
    missed = np.zeros(3, int)
    for _ in range(COUNT):
        x, y, truth, lower, upper = peak(rng, True)
        fits = [lambda e=e: qx.call(e, y, x, [], 1e-12, 2000, [], lower, upper, 0)[2:6]
                for e in ("BoundGaussianFit_head", "BoundGaussianFit2026_head")]
        missed += [not is_found(fit, truth) for fit in (*fits, lambda: peers(x, y, truth, lower, upper))]
    print(f"bounded, of {COUNT}: elder {missed[0]}, revision {missed[1]}, curve_fit {missed[2]}")
    missed[:] = 0
    for _ in range(COUNT):
        x, y, truth, lower, upper = peak(rng, False)
        fits = [lambda e=e: qx.call(e, y, x, [], 1e-14, [], 5000, 1e-300)[1:4]
                for e in ("GaussianPeakFit_head", "GaussianPeakFit2026_head")]
        free = np.full(3, np.inf)
        missed += [not is_found(fit, truth) for fit in (*fits, lambda: peers(x, y, truth, -free, free))]
    print(f"without bounds and level, of {COUNT}: elder {missed[0]}, revision {missed[1]}, curve_fit {missed[2]}")


if __name__ == "__main__":
    main()
