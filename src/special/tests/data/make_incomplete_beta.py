#!/usr/bin/python3
"""Writes incomplete_beta.dat: both tails of the regularised incomplete beta function at the point
p / (p + q), and logarithms in twice the precision, at 40 digits (mpmath), rounded to double. Each line is
NAME ARGUMENT ... VALUE, with numbers as hex floats."""

import random
from pathlib import Path

from mpmath import exp, log, loggamma, mp, mpf

mp.dps = 50
random.seed(20261122)


def line(name, arguments, value):
    return " ".join([name, *(float(a).hex() for a in arguments), float(value).hex()])


def below(a, b, x, y):
    """The lower tail at x by the series 2F1(a + b, 1; a + 1; x), whose terms are positive."""
    front = exp(a * log(x) + b * log(y) - log(a) - loggamma(a) - loggamma(b) + loggamma(a + b))
    total = term = mpf(1)
    n = 0
    while term > total * mpf(10) ** -45:
        term *= (a + b + n) / (a + 1 + n) * x
        n += 1
        total += term
    return front * total


def tails(a, b, p, q):
    a, b, p, q = (mpf(value) for value in (a, b, p, q))
    x, y = p / (p + q), q / (p + q)
    if x <= (a + 1) / (a + b + 2):
        lower = below(a, b, x, y)
        return lower, 1 - lower
    upper = below(b, a, y, x)
    return 1 - upper, upper


def lines():
    degrees = [0.5, 1, 1.5, 2, 2.5, 5, 10, 16.5, 50, 300, 2500, 20000]
    for _ in range(260):
        a, b = random.choice(degrees), random.choice(degrees)
        if random.random() < 0.3:
            a *= random.uniform(0.9, 1.1)
        mean, spread = a / (a + b), (a * b / (a + b + 1)) ** 0.5 / (a + b)
        x = mean + spread * random.gauss(0, 1) * random.choice([0.3, 1, 3, 10])
        if random.random() < 0.2:
            x = random.random() ** 8
        if not 0 < x < 1 or (1 - x) * max(a, b) < 1e-3:
            continue
        for name, value in zip(("lower", "upper"), tails(a, b, x, 1 - x)):
            if 1e-280 < value < 0.6:
                yield line(name, [a, b, x, 1 - x], value)
    for _ in range(40):
        x = mpf(random.choice([random.uniform(0.5, 2), 10 ** random.uniform(-300, 300)]))
        value = log(x)
        yield line("loghigh", [x], value)
        yield line("loglow", [x], value - mpf(float(value)))


Path(__file__).with_name("incomplete_beta.dat").write_text("\n".join(lines()) + "\n")
