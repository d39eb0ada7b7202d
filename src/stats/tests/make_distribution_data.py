#!/usr/bin/python3
"""Writes data/distributions.dat: the distribution functions at 40 digits (mpmath), rounded to double. Each
line is NAME ARGUMENT ... VALUE, with numbers as hex floats."""

import random
from pathlib import Path

from mpmath import betainc, gammainc, mp, mpf

mp.dps = 40
random.seed(20261122)


def line(name, arguments, value):
    return " ".join([name, *(float(a).hex() for a in arguments), float(value).hex()])


def distribution_lines():
    for _ in range(60):
        dof = random.choice([1, 2, 3, 5, 10, 30, 200])
        t = random.uniform(-6, 6)
        tail = betainc(mpf(dof) / 2, mpf(1) / 2, 0, dof / (mpf(t) ** 2 + dof), regularized=True) / 2
        yield line("t", [t, dof], tail if t < 0 else 1 - tail)
        d = random.choice([1, 2, 4, 7, 40])
        f = 10.0 ** random.uniform(-2, 1.5)
        z = mpf(f) * dof / (mpf(f) * dof + d)
        yield line("f", [f, dof, d], betainc(mpf(dof) / 2, mpf(d) / 2, 0, z, regularized=True))
        x = dof * 10.0 ** random.uniform(-1, 0.7)
        yield line("chi2", [x, dof], gammainc(mpf(dof) / 2, 0, mpf(x) / 2, regularized=True))
        x = random.uniform(-5, 5)
        yield line("normal", [x], mp.ncdf(mpf(x)))


if __name__ == "__main__":
    data = Path(__file__).parent / "data"
    (data / "distributions.dat").write_text("\n".join(distribution_lines()) + "\n")
