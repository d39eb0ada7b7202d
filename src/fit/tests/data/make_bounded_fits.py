"""Random bounded least-squares problems and their solutions by SciPy's least_squares.

    make_bounded_fits.py > bounded_fits.dat

Each line has: model, n, seed, whether samples have weights (1 or 0), the parameters and the noise level of
the samples, guess, lower bounds, upper bounds, then the cost (the mean of w r^2) and
the parameters of the optimum. The samples are generated from the seed, here and in the test: x is
x0 + (i + u / 2) step, y the model plus noise times v, w is 1 + t / 2, with u, v, t from one stream
of numbers in [-1, 1).
"""

import sys

import numpy as np
from scipy.optimize import least_squares

INF = np.inf
PROBLEMS = 200  # of each model


class Noise:
    """The stream of tests/support/recipe.h."""

    def __init__(self, seed):
        self.state = (seed * 0x9E3779B97F4A7C15 + 0x632BE59BD9B4E019) % 2**64

    def symmetric(self):
        self.state = z = (self.state + 0x9E3779B97F4A7C15) % 2**64
        z = ((z ^ (z >> 30)) * 0xBF58476D1CE4E5B9) % 2**64
        z = ((z ^ (z >> 27)) * 0x94D049BB133111EB) % 2**64
        bits = ((z ^ (z >> 31)) >> 32) % 2**32
        return (bits - 2**32 if bits >= 2**31 else bits) / 2**31


def exponential(x, p):
    return p[0] * np.exp(p[1] * x) + p[2]


def power(x, p):
    return p[0] * x**p[1] + p[2]


def gaussian(x, p):
    return p[0] * np.exp(-0.5 * ((x - p[1]) / p[2]) ** 2) + p[3]


def logarithm(x, p):
    return p[0] * np.log(p[1] * x)


def line(x, p):
    return p[0] * x + p[1]


# For each model: the function, the range of x, and a function that draws true parameters.
MODELS = {
    "exponential": (exponential, (0.0, 4.0),
                    lambda r: [r.choice([-1, 1]) * r.uniform(1, 5), r.choice([-1, 1]) * r.uniform(.2, 1.5),
                               r.uniform(-3, 3)]),
    "power": (power, (0.5, 6.0),
              lambda r: [r.choice([-1, 1]) * r.uniform(1, 4), r.choice([-1, 1]) * r.uniform(.3, 2),
                         r.uniform(-3, 3)]),
    "gaussian": (gaussian, (-4.0, 4.0),
                 lambda r: [r.choice([-1, 1]) * r.uniform(1, 5), r.uniform(-1.5, 1.5), r.uniform(.5, 1.5),
                            r.uniform(-2, 2)]),
    "logarithm": (logarithm, (0.5, 8.0),
                  lambda r: [r.choice([-1, 1]) * r.uniform(1, 5), r.uniform(.5, 4)]),
    "line": (line, (-3.0, 5.0), lambda r: [r.uniform(-4, 4), r.uniform(-6, 6)]),
}


def samples_of(model, n, seed, weighted, p, sigma):
    f, (x0, x1), _ = MODELS[model]
    noise = Noise(seed)
    x, y, w = np.empty(n), np.empty(n), np.empty(n)
    step = (x1 - x0) / n
    for i in range(n):
        x[i] = x0 + (i + 0.5 * noise.symmetric()) * step if i else x0
        y[i] = f(x[i], p) + sigma * noise.symmetric()
        w[i] = 1 + 0.5 * noise.symmetric()
    return x, y, w if weighted else np.ones(n)


def short(value):
    return float(f"{value:.4g}")


def problem(random, model, seed):
    f, _, make = MODELS[model]
    p = [short(v) for v in make(random)]
    n = int(random.integers(len(p) + 2, 40))
    sigma = short(random.uniform(0.01, 0.3))
    weighted = int(random.integers(2))
    guess = [short(v * random.uniform(0.8, 1.25)) for v in p]
    lower, upper = [], []
    for v in p:
        # Bounds that contain the parameter, exclude it, or fix it; some sides are open.
        centre = v + random.choice([0, 0, 0.3, -0.3]) * abs(v)
        width = abs(v) * random.uniform(0.05, 0.6)
        sides = [short(centre - width), short(centre + width)]
        if random.random() < 0.1:
            sides[1] = sides[0]
        else:
            sides = [side if random.random() < 0.6 else open_
                     for side, open_ in zip(sides, (-INF, INF))]
        if model == "logarithm" and v == p[1]:
            sides = [max(sides[0], 0.01), max(sides[1], 0.02)]
        lower.append(sides[0])
        upper.append(sides[1])
    return n, seed, weighted, p, sigma, guess, lower, upper


def optimum(model, n, seed, weighted, p, sigma, guess, lower, upper):
    f = MODELS[model][0]
    x, y, w = samples_of(model, n, seed, weighted, p, sigma)
    lower, upper = np.array(lower), np.array(upper)
    free = lower < upper
    full = np.where(free, guess, lower)

    def residuals(q):
        full[free] = q
        return np.sqrt(w) * (y - f(x, full))

    if not free.any():
        return np.mean(residuals([]) ** 2), full
    inside = np.clip(guess, lower, upper)[free]
    # SciPy would move a start on a bound inwards, with a warning.
    best = least_squares(residuals, inside, bounds=(lower[free], upper[free]), x_scale="jac",
                         ftol=1e-15, xtol=1e-15, gtol=1e-15, max_nfev=2000)
    residuals(best.x)
    return np.mean(best.fun ** 2), full.copy()


def main():
    print(__doc__.split("\n\n")[2].replace("\n", " ").strip().join(("# ", "")))
    for model in MODELS:
        random = np.random.default_rng(len(model))
        for number in range(PROBLEMS):
            parts = problem(random, model, number + 1)
            cost, found = optimum(model, *parts)
            n, seed, weighted, p, sigma, guess, lower, upper = parts
            fields = [model, n, seed, weighted, *p, sigma, *guess, *lower, *upper, f"{cost:.13g}",
                      *(f"{v:.13g}" for v in found)]
            print(*fields)


if __name__ == "__main__":
    sys.exit(main())
