#!/usr/bin/python3
"""Writes gamma_family.dat: the gamma family at 40 digits (mpmath), rounded to double. Each line is NAME
ARGUMENT ... VALUE, with numbers as hex floats."""

import random
from pathlib import Path

from mpmath import betainc, gamma, gammainc, loggamma, mp, mpf

mp.dps = 40
random.seed(20261121)


def line(name, arguments, value):
    return " ".join([name, *(float(a).hex() for a in arguments), float(value).hex()])


def gamma_lines():
    edges = [1e-9, 0.9e-9, 2.0, 3.0, 33.0, 1000.0, 143.01608, 1e-300, 0.5, 1.0]
    near = [e * (1 + s * 2.0 ** -40) for e in edges for s in (-1, 0, 1)]
    ordinary = [random.uniform(0.0, 40.0) for _ in range(60)]
    for x in near + ordinary + [random.uniform(40, 171.5) for _ in range(20)]:
        if x < 171.6 and x > 1e-307:
            yield line("gamma", [x], gamma(mpf(x)))
    for x in [-random.uniform(0.0, 33.0) for _ in range(40)] + [
            -random.uniform(33.0, 150.0) for _ in range(30)] + [-33.5, -34.5, -40.25, -40.75]:
        yield line("gamma", [x], gamma(mpf(x)))
    for x in near + ordinary + [10.0 ** random.uniform(-10, 300) for _ in range(60)]:
        yield line("lngamma", [x], loggamma(mpf(x)))
    for _ in range(150):
        a = 10.0 ** random.uniform(-2, 3)
        x = a * 10.0 ** random.uniform(-1, 0.5)
        yield line("gammap", [a, x], gammainc(mpf(a), 0, mpf(x), regularized=True))
        yield line("gammaq", [a, x], gammainc(mpf(a), mpf(x), regularized=True))
    for _ in range(200):
        a, b = (10.0 ** random.uniform(-1, 2) for _ in range(2))
        x = random.betavariate(a, b)
        if 1e-12 < x < 1 - 1e-12:
            yield line("beta", [a, b, x], betainc(mpf(a), mpf(b), 0, mpf(x), regularized=True))


if __name__ == "__main__":
    (Path(__file__).parent / "gamma_family.dat").write_text("\n".join(gamma_lines()) + "\n")
