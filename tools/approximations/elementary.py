#!/usr/bin/python3
"""Coefficients of the elliptic integrals, Dawson, Fresnel and zeta: src/special/tables/*.h.

usage: elementary.py REPOSITORY [NAME...]
"""

import sys

from mpmath import (cos, ellipe, ellipk, erfi, exp, fresnelc, fresnels, log, mpf, pi, sin, sqrt, zeta)

from rational import Table

# Fitting points that cluster at small arguments.
WARP = (lambda x: log(x), lambda y: exp(y))
EPS = mpf(10) ** -25


def elliptic(folder):
    t = Table("elementary.py", "QX_SPECIAL_TABLES_ELLIPTIC_H")
    # the constant is separate, so that only the smaller part has the rounding of a rational form
    t.add("ellipticKSmall", "(K(m) - pi / 2) / m in m", lambda m: (ellipk(m) - pi / 2) / m if m else pi / 8,
          0, mpf(1) / 2, 6, 6)
    t.add("ellipticKNear", "K + ln(m1) K(m1) / pi in m1 = 1 - m",
          lambda u: ellipk(1 - u) + log(u) * ellipk(u) / pi if u else log(mpf(4)), mpf(0), mpf(1) / 2, 6, 6)
    t.add("ellipticKLog", "K(m1) / pi in m1", lambda u: ellipk(u) / pi, 0, mpf(1) / 2, 6, 6)
    t.add("ellipticESmall", "(pi / 2 - E(m)) / m in m", lambda m: (pi / 2 - ellipe(m)) / m if m else pi / 8,
          0, mpf(1) / 2, 6, 6)
    # E = S(m1) - ln(m1) m1 L(m1), with L = (K(m1) - E(m1)) / (pi m1)
    t.add("ellipticENear", "E + ln(m1) (K(m1) - E(m1)) / pi in m1",
          lambda u: ellipe(1 - u) + log(u) * (ellipk(u) - ellipe(u)) / pi, EPS, mpf(1) / 2, 6, 6)
    t.add("ellipticELog", "(K(m1) - E(m1)) / (pi m1) in m1", lambda u: (ellipk(u) - ellipe(u)) / (pi * u),
          mpf(10)**-15, mpf(1) / 2, 6, 6)
    t.write(folder + "elliptic.h")


def dawson(folder):
    t = Table("elementary.py", "QX_SPECIAL_TABLES_DAWSON_H")

    def d(x):
        return sqrt(pi) / 2 * exp(-x * x) * erfi(x)
    a, b = mpf(13) / 4, mpf(25) / 4
    t.add("dawsonSmall", "D(x) / x in x^2", lambda z: d(sqrt(z)) / sqrt(z) if z else mpf(1), 0, a * a, 10, 10)

    def tail(y):
        x = 1 / sqrt(y)
        return (2 * x * d(x) - 1) / y
    t.add("dawsonMid", "(2 x D(x) - 1) x^2 in y = 1 / x^2", tail, 1 / (b * b), 1 / (a * a), 10, 10)
    t.add("dawsonFar", "(2 x D(x) - 1) x^2 in y = 1 / x^2", tail, mpf(10)**-5, 1 / (b * b), 7, 6)
    t.write(folder + "dawson.h")


def fresnel(folder):
    t = Table("elementary.py", "QX_SPECIAL_TABLES_FRESNEL_H")
    limit = mpf(8) / 5
    root = lambda w: sqrt(sqrt(w))
    t.add("fresnelCSmall", "C(x) / x in x^4", lambda w: fresnelc(root(w)) / root(w) if w else mpf(1),
          0, limit**4, 6, 6)
    t.add("fresnelSSmall", "S(x) / x^3 in x^4", lambda w: fresnels(root(w)) / root(w)**3 if w else pi / 6,
          0, limit**4, 6, 6)

    def auxiliary(which):
        def part(w):
            x = 1 / root(w)
            a = pi * x * x / 2
            c, s = mpf(1) / 2 - fresnelc(x), mpf(1) / 2 - fresnels(x)
            if which == "F":
                return (s * cos(a) - c * sin(a)) * pi * x
            return (c * cos(a) + s * sin(a)) * pi**2 * x**3
        return part
    for which, name in (("F", "pi x f"), ("G", "pi^2 x^3 g")):
        t.add(f"fresnel{which}Mid", f"{name} in 1 / x^4", auxiliary(which), mpf(1) / 81, 1 / limit**4, 9, 9)
        t.add(f"fresnel{which}Far", f"{name} in 1 / x^4", auxiliary(which), mpf(10)**-6, mpf(1) / 81, 7, 7)
    t.write(folder + "fresnel.h")


def riemann(folder):
    t = Table("elementary.py", "QX_SPECIAL_TABLES_ZETA_H")
    t.add("zetaLow", "(zeta(x) - 1) (1 - x) in x", lambda x: (zeta(x) - 1) * (1 - x), 0, 1 - mpf(10)**-20, 6, 5)
    t.add("zetaMid", "(zeta(x) - 1) 2^x (x - 1) / x in 1 / x",
          lambda u: (zeta(1 / u) - 1) * 2**(1 / u) * (1 / u - 1) * u, mpf(1) / 10, 1 - mpf(10)**-20, 8, 8, WARP,
          lambda u: 1 - 1 / zeta(1 / u))
    # The polynomials are in x shifted to the middle of the interval.
    t.add("zetaHigh", "ln(zeta(x) - 1 - 2^-x) in x - 30",
          lambda h: log(zeta(h + 30) - 1 - mpf(2)**(-h - 30)), -20, 20, 10, 10)
    t.lines.append("// zeta(n) - 1 for n = 0 ... 30; the place of the pole is not used.")
    t.array("zetaIntegersLessOne", [0 if n == 1 else zeta(n) - 1 for n in range(31)])
    t.lines.append("")
    t.write(folder + "zeta.h")


if __name__ == "__main__":
    made = {"elliptic": elliptic, "dawson": dawson, "fresnel": fresnel, "riemann": riemann}
    for name in sys.argv[2:] or made:
        made[name](sys.argv[1] + "/src/special/tables/")
