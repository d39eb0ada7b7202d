#!/usr/bin/python3
"""Coefficients of the expansions for large order: src/special/tables/uniform.h.

The polynomials u_k of Debye's expansions, exactly, and Olver's expansion about the turning
point, whose coefficients are smooth functions of z although their formulas are singular at z = 1.
Source: F. W. J. Olver, Asymptotics and Special Functions, 1974, chapters 10 and 11.

usage: uniform.py REPOSITORY
"""

import sys

from mpmath import factorial, log, mp, mpf, mpc, sqrt, gamma

from debye import debye_polynomials
from rational import Table

COUNT = 10
mp.dps = 80


U = debye_polynomials(COUNT)


def u(k, t):
    return sum(mpf(c.numerator) / c.denominator * t**(k + 2 * j) for j, c in enumerate(U[k]))


def airy_u(k):
    return gamma(3 * k + mpf(1) / 2) / (54**k * factorial(k) * gamma(k + mpf(1) / 2))


def airy_v(k):
    return mpf(6 * k + 1) / (1 - 6 * k) * airy_u(k)


def place(w):
    """zeta, zeta^(3/2) and 1 / sqrt(1 - z^2) at z = 1 + w."""
    if abs(w) < mpf(10)**-7:
        w = mpf(10)**-7
    z = 1 + w
    s = sqrt(mpc(1 - z * z))
    power = mpf(3) / 2 * (log((1 + s) / z) - s)
    zeta = (abs(power) ** (mpf(2) / 3)) * (1 if z < 1 else -1)
    return z, zeta, power, 1 / s


def a(k):
    def value(w):
        _, _, power, t = place(w)
        return sum((mpf(3) / 2)**j * airy_v(j) / power**j * u(2 * k - j, t) for j in range(2 * k + 1)).real
    return value


def b(k):
    def value(w):
        _, zeta, power, t = place(w)
        total = sum((mpf(3) / 2)**j * airy_u(j) / power**j * u(2 * k - j + 1, t) for j in range(2 * k + 2))
        return (-power / zeta**2 * total).real
    return value


def slope(w):
    z, zeta, _, _ = place(w)
    return zeta / (1 - z)


def factor(w):
    z, zeta, _, _ = place(w)
    return sqrt(sqrt(4 * zeta / (1 - z * z)))


t = Table("uniform.py", "QX_SPECIAL_TABLES_UNIFORM_H")
low, high = mpf(-2) / 5, mpf(7) / 10
t.add("olverSlope", "zeta / (1 - z) in z - 1", slope, low, high, 10, 6)
t.add("olverFactor", "(4 zeta / (1 - z^2))^(1/4) in z - 1", factor, low, high, 8, 6)
t.add("olverA1", "A1(zeta) + 1 in z - 1", lambda w: a(1)(w) + 1, low, high, 7, 4)
t.add("olverA2", "A2(zeta) + 1 in z - 1", lambda w: a(2)(w) + 1, low, high, 5, 3)
t.add("olverB0", "B0(zeta) in z - 1", b(0), low, high, 8, 5)
t.add("olverB1", "B1(zeta) + 1 in z - 1", lambda w: b(1)(w) + 1, low, high, 6, 4)
t.write(sys.argv[1] + "/src/special/tables/uniform.h")
