"""Levenberg-Marquardt fits against scipy.optimize.curve_fit, in one process.

Both have the same samples, start and tolerance, 1e-8. Ours is the export, called through the
binding; SciPy's takes the model as a function of NumPy arrays and approximates its derivatives by
differences. Both run once without bounds and once with bounds that exclude the answer. Each line has
our time, the ratio ours/theirs and the difference of the costs.
"""

import sys
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from generators import best  # noqa: E402
from summary import print_summary  # noqa: E402

try:
    from scipy.optimize import curve_fit
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

TOLERANCE = 1e-8


def exponential(x, a, b, c):
    return a * np.exp(b * x) + c


def power(x, a, b, c):
    return a * x**b + c


def gaussian(x, a, m, s, c):
    return a * np.exp(-0.5 * ((x - m) / s)**2) + c


# Export, model, true parameters, start, and an upper bound that excludes the true first parameter.
MODELS = [("BoundExpFit_head", exponential, [3.0, -0.8, 1.0], [2.0, -0.4, 0.5], 2.8),
          ("BoundPowerFit_head", power, [2.0, 1.3, 1.0], [1.0, 1.0, 0.0], 1.9),
          ("BoundGaussianFit_head", gaussian, [4.0, 2.5, 0.6, 1.0], [3.0, 2.0, 1.0, 0.5], 3.9)]


def case(export, model, truth, start, upper, n):
    x = np.linspace(0.5, 5, n)
    y = model(x, *truth) + 0.1 * np.random.default_rng(n).normal(size=n)
    count = len(truth)
    lower = np.full(count, -np.inf)
    upper = np.array([upper] + [np.inf] * (count - 1))
    start = np.minimum(start, upper)

    def ours():
        return qx.call(export, y, x, [], TOLERANCE, 200, start, lower, upper, 0)[2:2 + count]

    def theirs():
        return curve_fit(model, x, y, start, bounds=(lower, upper), ftol=TOLERANCE)[0]

    excess = np.mean((y - model(x, *ours()))**2) / np.mean((y - model(x, *theirs()))**2) - 1
    return ours, theirs, excess


def peak(x, a, m, s):
    return gaussian(x, a, m, s, 0.0)


def revision_cases(n):
    """Name, ours, SciPy's and the elder, if there is one. curve_fit needs a start, and ours has no start for peaks. The
    elder of the peak ends at its limit of trials, with two to four digits."""
    x = np.linspace(0.5, 5, n)
    noise = 0.1 * np.random.default_rng(n).normal(size=n)
    y = gaussian(x, 4.0, 2.5, 0.6, 1.0) + noise
    lower, upper = np.full(4, -np.inf), np.array([4.5, np.inf, np.inf, np.inf])
    lone = peak(x, 4.0, 2.5, 0.6) + noise
    decay = exponential(x, 3.0, -0.8, 1.0) + noise
    bounded, free = (y, x, [], TOLERANCE, 200, [], lower, upper, 0), (lone, x, [], TOLERANCE, [], 200, 0.0)
    yield ("bounded gaussian, revision", lambda: qx.BoundGaussianFit2026_head(*bounded),
           lambda: curve_fit(gaussian, x, y, [3.0, 2.0, 1.0, 0.5], bounds=(lower, upper), ftol=TOLERANCE),
           lambda: qx.BoundGaussianFit_head(*bounded))
    yield ("gaussian peak, revision", lambda: qx.GaussianPeakFit2026_head(*free),
           lambda: curve_fit(peak, x, lone, [3.0, 2.0, 1.0], ftol=TOLERANCE), lambda: qx.GaussianPeakFit_head(*free))
    yield ("caller's model, qx.fit.curve",
           lambda: qx.fit.curve(exponential, x, decay, [2.0, -0.4, 0.5]),
           lambda: curve_fit(exponential, x, decay, [2.0, -0.4, 0.5], ftol=TOLERANCE), None)


def revisions():
    ratios = {}
    for n in (20, 100, 1000, 10000):
        for name, ours, theirs, elder in revision_cases(n):
            for peer, other in (("SciPy curve_fit", theirs), ("elder", elder)):
                if other is None:
                    continue
                mine, their = best(ours, other, max(2, 20_000 // n // 10), 7)
                ratios.setdefault((name, peer), []).append((mine / their, f"n {n}"))
                print(f"{name:30} n {n:6} {1e6 * mine:9.1f} us  over {peer:15} {mine / their:6.3f}", flush=True)
    for (name, peer), found in ratios.items():
        print_summary(f"{name}, called from Python", peer, found)


def main():
    for bounds in ("open", "cutting"):
        ratios = []
        for n in (20, 100, 1000, 10000):
            for export, model, truth, start, upper in MODELS:
                ours, theirs, excess = case(export, model, truth, start,
                                            upper if bounds == "cutting" else np.inf, n)
                mine, other = best(ours, theirs, max(2, 20_000 // n // 10), 7)
                name = f"{model.__name__}, n {n}"
                ratios.append((mine / other, name))
                print(f"{name:22} bounds {bounds:8} {1e6 * mine:9.1f} us  ratio {mine / other:6.3f}  "
                      f"cost {excess:+.1e}")
        print_summary(f"Levenberg-Marquardt fits, bounds {bounds}, called from Python",
                      "SciPy curve_fit", ratios)


if __name__ == "__main__":
    main()
    revisions()
