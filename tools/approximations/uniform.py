#!/usr/bin/python3
"""Coefficients of the expansions for large order: src/special/tables/uniform.h.

The polynomials u_k of the expansions of Debye, exactly, and Olver's expansion about the turning
point, whose coefficients are smooth functions of z although their formulas are singular at z = 1.
Source: F. W. J. Olver, Asymptotics and Special Functions, 1974, chapters 10 and 11.

usage: uniform.py REPOSITORY
"""

import sys
from fractions import Fraction

from mpmath import factorial, log, mp, mpf, mpc, sqrt, gamma

from rational import Table

COUNT = 10
mp.dps = 80


def debye_polynomials(count):
    # u_{k+1}(t) = t^2 (1 - t^2) u_k'(t) / 2 + 1/8 int_0^t (1 - 5 s^2) u_k(s) ds
    u = [{0: Fraction(1)}]
    while len(u) < count:
        following = {}

        def add(power, value):
            following[power] = following.get(power, Fraction(0)) + value
        for power, c in u[-1].items():
            add(power + 1, c * power / 2)
            add(power + 3, -c * power / 2)
            add(power + 1, c / (8 * (power + 1)))
            add(power + 3, -5 * c / (8 * (power + 3)))
        u.append(following)
    return u


U = debye_polynomials(COUNT)


def u(k, t):
    return sum(mpf(c.numerator) / c.denominator * t**p for p, c in U[k].items())


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
t.lines.append("// u_k(t) = t^k times a polynomial in t^2 of degree k, ascending.")
t.lines.append(f"inline constexpr int debyeCount = {COUNT};")
t.lines.append(f"inline constexpr double debye[debyeCount][debyeCount] = {{")
for k in range(COUNT):
    row = [U[k].get(k + 2 * j, Fraction(0)) for j in range(k + 1)]
    lines = t.values([mpf(c.numerator) / c.denominator for c in row])
    lines[0] = "    {" + lines[0].strip()
    lines[-1] += "},"
    t.lines += lines
t.lines += ["};", ""]
t.write(sys.argv[1] + "/src/special/tables/uniform.h")
