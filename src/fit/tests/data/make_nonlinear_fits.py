#!/usr/bin/python3
"""Fits by SciPy's least_squares for the tests, each the best of many starts.

    make_nonlinear_fits.py > nonlinear_fits.dat

There are two kinds of problems: models with bounds and losses and a given start, and noisy Gaussian peaks and dips
without a start. Samples are rounded to 6 digits, so that the file has exactly the samples that were fitted.
"""

import sys

import numpy as np
from scipy.optimize import least_squares

LOSSES = ["linear", "soft_l1", "huber", "cauchy", "arctan"]
MODELS = {
    "decay": (lambda x, p: p[0] * np.exp(-p[1] * x) + p[2], (3.0, 0.9, 1.0)),
    "resonance": (lambda x, p: p[0] / (1 + ((x - p[1]) / p[2])**2) + p[3], (4.0, 2.5, 0.7, 0.5)),
    "saturation": (lambda x, p: p[0] * x / (p[1] + x), (5.0, 1.5)),
}


def bell(x, p):
    return p[0] * np.exp(-0.5 * ((x - p[1]) / p[2])**2) + p[3]


def rounded(values):
    return np.array([float(f"{value:.6g}") for value in values])


def best(model, x, y, w, starts, lower, upper, loss="linear", scale=1.0):
    found = None
    for start in starts:
        try:
            one = least_squares(lambda p: np.sqrt(w) * (model(x, p) - y), np.clip(start, lower, upper), "3-point",
                                (lower, upper), loss=loss, f_scale=scale, xtol=1e-15, ftol=1e-15, gtol=1e-15,
                                x_scale=np.maximum(np.abs(start), 1e-3), max_nfev=2000)
        except ValueError:
            continue
        if np.isfinite(one.cost) and (found is None or one.cost < found.cost):
            found = one
    return found


def write(*lines):
    for line in lines:
        print(*(f"{value:.17g}" if isinstance(value, float) else value for value in line))


def boxes(rng, truth):
    """Bounds that contain the answer, exclude it or fix a parameter."""
    count = len(truth)
    lower, upper = np.full(count, -np.inf), np.full(count, np.inf)
    if rng.uniform() < 0.6:
        j = rng.integers(count)
        if rng.uniform() < 0.5:
            lower[j], upper[j] = truth[j] * 1.02, truth[j] * 3
        else:
            lower[j], upper[j] = truth[j] * 0.3, truth[j] * 0.98
    return lower, upper


def bounded(rng, name, loss):
    model, truth = MODELS[name]
    truth = np.array(truth) * rng.uniform(0.7, 1.4, len(truth))
    n = int(rng.integers(12, 30))
    x = 0.25 * np.arange(n) + 0.25
    y = model(x, truth) + 0.1 * rng.normal(size=n)
    y[rng.integers(n, size=2)] += 2.0
    y, w = rounded(y), rounded(rng.uniform(0.5, 2, n) if rng.uniform() < 0.5 else np.ones(n))
    lower, upper = boxes(rng, truth)
    start = np.clip(rounded(truth * rng.uniform(0.8, 1.25, len(truth))), lower, upper)
    found = best(model, x, y, w, [start, truth], lower, upper, LOSSES[loss], 0.25)
    if np.any(np.abs(found.x) > 20):  # a valley that extends to infinity
        return bounded(rng, name, loss)
    return write(("fit", name, loss, n, float(found.cost)), [*start.tolist()], [*lower.tolist()], [*upper.tolist()],
                 [*found.x.tolist()], y.tolist(), w.tolist())


def peak(rng):
    n = int(rng.integers(16, 60))
    x = 0.125 * np.arange(n)
    reach = x[-1]
    truth = np.array([rng.choice([-1, 1]) * 10**rng.uniform(-1, 2), reach * rng.uniform(-0.1, 1.1),
                      reach * np.exp(rng.uniform(np.log(0.8 / n), np.log(0.7))), 0.0])
    truth[3] = truth[0] * rng.uniform(-2, 2)
    y = rounded(bell(x, truth) + abs(truth[0]) * 10**rng.uniform(-2, -0.3) * rng.normal(size=n))
    spread = np.ptp(y)
    lower = np.array([-20 * spread, x[0] - reach, 0.05 * x[1], -np.inf])
    upper = np.array([20 * spread, x[-1] + reach, 4 * reach, np.inf])
    starts = [truth]
    for _ in range(50):
        starts.append([rng.choice([-1, 1]) * spread * rng.uniform(0.3, 1.5), reach * rng.uniform(-0.2, 1.2),
                       reach * np.exp(rng.uniform(np.log(0.5 / n), np.log(1.0))), rng.uniform(y.min(), y.max())])
    found = best(bell, x, y, np.ones(n), starts, lower, upper)
    write(("peak", n, float(found.cost)), lower.tolist(), upper.tolist(), found.x.tolist(), y.tolist())


def main():
    rng = np.random.default_rng(2026)
    print("# fit: model, loss, samples, cost; start, bounds, parameters, y and weights, at x = (i + 1) / 4, with the")
    print("# scale 0.25 of the loss. peak: samples, cost; bounds, parameters and y, at x = i / 8.")
    for name in MODELS:
        for loss in range(len(LOSSES)):
            for _ in range(3):
                bounded(rng, name, loss)
    for i in range(60):
        peak(rng)
        print(f"{i + 1} of 60 peaks", file=sys.stderr)


if __name__ == "__main__":
    main()
