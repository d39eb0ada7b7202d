#!/usr/bin/python3
"""Writes data/distribution_tails.dat: values of distributions in either tail at 50 digits (mpmath), rounded
to double, by the series of the incomplete gamma and beta functions with positive terms. A line: NAME
ARGUMENT ... VALUE, numbers as hex floats. NAME is a distribution and a function: cdf, sf, logcdf, logsf, pdf."""

import random
from pathlib import Path

from mpmath import erfc, exp, log, log1p, loggamma, mp, mpf, pi, sqrt

mp.dps = 50
random.seed(20261123)
WORK = 700  # digits that 1 - p needs in the far tail


def series(first, ratio):
    """The sum of positive terms from `first` on; each following term is ratio(k) times the previous one."""
    total, term, k = first, first, 0
    while term > total * mpf(10)**-(mp.dps + 3):
        term *= ratio(k)
        total += term
        k += 1
    return total


def chi2(x, dof):
    a, x = mpf(dof) / 2, mpf(x) / 2
    slope = exp(a * log(x) - x - loggamma(a))
    lower = slope * series(1 / a, lambda k: x / (a + k + 1))
    return lower, 1 - lower, slope / (2 * x)


def beta(a, b, x, y):
    """I_x(a, b), its complement, and the derivative with respect to ln(x / y)."""
    if x > y:
        upper, lower, slope = beta(b, a, y, x)
        return lower, upper, slope
    slope = exp(a * log(x) + b * log(y) + loggamma(a + b) - loggamma(a) - loggamma(b))
    lower = slope * series(1 / a, lambda k: x * (a + b + k) / (a + k + 1))
    return lower, 1 - lower, slope


def f(x, n, d):
    x, n, d = mpf(x), mpf(n), mpf(d)
    lower, upper, slope = beta(n / 2, d / 2, n * x / (n * x + d), d / (n * x + d))
    return lower, upper, slope / x


def t(x, dof):
    lower, upper, slope = f(mpf(x)**2, 1, dof)
    half = upper / 2
    return (half, 1 - half, slope * abs(mpf(x))) if x < 0 else (1 - half, half, slope * abs(mpf(x)))


def norm(x):
    return (erfc(-mpf(x) / sqrt(2)) / 2, erfc(mpf(x) / sqrt(2)) / 2, exp(-mpf(x)**2 / 2) / sqrt(2 * pi))


def log_of(part, other):
    return log(part) if part < other else log1p(-other)


def lines(name, function, arguments):
    with mp.workdps(WORK):
        lower, upper, density = function(*arguments)
        values = {"cdf": lower, "sf": upper, "logcdf": log_of(lower, upper), "logsf": log_of(upper, lower),
                  "pdf": density}
    for what, value in values.items():
        yield " ".join([name + "_" + what, *(float(a).hex() for a in arguments), float(value).hex()])


def points():
    for x in (-38.4, -30.0, -10.0, -2.0, -1.0, -1e-9, 0.0, 0.3, 1.9999, 5.0, 12.0, 37.5):
        yield "norm", norm, [x]
    for dof in (1e-3, 0.3, 1.0, 2.0, 7.5, 15.9, 16.1, 60.0, 400.0):
        for spread in (-8, -2, 0.01, 3, 6):
            yield "chi2", chi2, [dof * float(exp(spread * min(1, sqrt(2 / mpf(dof))))), dof]
        for x in (-30.0, -1.0, 1e-6, 0.4, 3.0, 200.0):
            yield "t", t, [x, dof]
        for d in (0.2, 3.0, 40.5, 900.0):
            x = random.choice([-6, -1.5, 0.1, 2, 7])
            yield "f", f, [float(exp(x * min(4, sqrt(2 / mpf(dof) + 2 / mpf(d))))), dof, d]

    # Degrees of the direct evaluation and on both sides of its ends, at points in both tails.
    for dof in (1.0, 1.05, 1.9, 2.0, 2.5, 5.0, 17.3, 50.0, 99.0, 390.5, 410.5):
        for spread in (-5, -1.2, -0.1, 0.2, 1.7, 5):
            yield "chi2", chi2, [dof * float(exp(spread * min(1, sqrt(2 / mpf(dof))))), dof]
        for d in (1.0, 1.7, 2.0, 9.0, 48.6, 97.3, 101.0):
            for spread in (-4, -0.3, 0.4, 5):
                yield "f", f, [float(exp(spread * min(3, sqrt(2 / mpf(dof) + 2 / mpf(d))))), dof, d]


if __name__ == "__main__":
    data = Path(__file__).parent / "data"
    text = [one for name, function, arguments in points() for one in lines(name, function, arguments)]
    (data / "distribution_tails.dat").write_text("\n".join(text) + "\n")
