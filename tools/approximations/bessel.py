#!/usr/bin/python3
"""Coefficients of the Bessel functions of order 0 and 1: src/special/tables/bessel.h.

usage: bessel.py REPOSITORY
"""

import sys

from mpmath import mpf, besselj, bessely, besseli, besselk, besseljzero, sqrt, log, pi, exp, cos, sin

from rational import Table

t = Table("bessel.py", "QX_SPECIAL_TABLES_BESSEL_H")
EPS = mpf(10) ** -25


def smooth(function):
    """The function, evaluated next to its removable singularity instead of at it."""
    return lambda z: function(z if z != 0 else EPS)


# J0 and J1 on [0, 8]: the zeros there are divided out.
zero = {n: [besseljzero(n, k) for k in (1, 2)] for n in (0, 1)}


def j_part(n):
    def part(z):
        x = sqrt(z)
        return besselj(n, x) / x**n / ((z - zero[n][0]**2) * (z - zero[n][1]**2))
    return smooth(part)


def y_part(n):
    # Y minus its logarithmic part, an entire function of z; for n = 1 also minus the pole.
    def part(z):
        x = sqrt(z)
        value = bessely(n, x) - 2 / pi * log(x) * besselj(n, x)
        if n == 1:
            value += 2 / (pi * x)
        return value / x**n
    return smooth(part)


def modulus(n, which):
    # J = sqrt(2 / (pi x)) (P cos c - Q sin c), c = x - (n / 2 + 1 / 4) pi
    def part(z):
        x = 1 / sqrt(z)
        c = x - (mpf(n) / 2 + mpf(1) / 4) * pi
        scale = sqrt(pi * x / 2)
        if which == "P":
            return scale * (besselj(n, x) * cos(c) + bessely(n, x) * sin(c))
        return scale * (bessely(n, x) * cos(c) - besselj(n, x) * sin(c)) * x
    return part


for n in (0, 1):
    name = f"j{n}"
    t.add(f"{name}Small", f"J{n}(x) / x^{n} / ((z - j1^2) (z - j2^2)) in z = x^2", j_part(n), 0, 64, 8, 6)
    # two ranges, because over a single range the terms would far exceed the value at the ends
    for label, a, b, p, q in (("Low", 0, 16, 6, 5), ("Mid", 16, 64, 8, 6)):
        t.add(f"y{n}{label}", f"(Y{n}(x) - 2/pi ln x J{n}(x) + [n = 1] 2/(pi x)) / x^{n} in z = x^2",
              y_part(n), a, b, p, q, shift=2, centre=mpf(a + b) / 2 if a else None)
    # two ranges of z = 1 / x^2
    for label, a, b, p, q in (("Mid", mpf(1) / 400, mpf(1) / 64, 5, 5), ("Far", mpf(10)**-10, mpf(1) / 400, 4, 4)):
        t.add(f"{name}Phase{label}Cos", f"P of order {n} in z = 1 / x^2", modulus(n, "P"), a, b, p, q)
        t.add(f"{name}Phase{label}Sin", f"x Q of order {n} in z = 1 / x^2", modulus(n, "Q"), a, b, p, q)

for n in (0, 1):
    t.add(f"i{n}Small", f"I{n}(x) / x^{n} in z = x^2", smooth(lambda z: besseli(n, sqrt(z)) / sqrt(z)**n), 0, 64, 15, 2)
    for label, a, b in (("Mid", mpf(1) / 24, mpf(1) / 8), ("Far", mpf(10)**-8, mpf(1) / 24)):
        t.add(f"i{n}{label}", f"sqrt(x) exp(-x) I{n}(x) in 1 / x",
              lambda u: besseli(n, 1 / u) * exp(-1 / u) / sqrt(u), a, b, 9, 7)
    if n == 0:
        low = lambda z: besselk(0, sqrt(z)) + log(sqrt(z)) * besseli(0, sqrt(z))
    else:
        low = lambda z: (besselk(1, sqrt(z)) - 1 / sqrt(z) - log(sqrt(z)) * besseli(1, sqrt(z))) / sqrt(z)
    t.add(f"k{n}Small", "K0(x) + ln x I0(x)" if n == 0 else "(K1(x) - 1 / x - ln x I1(x)) / x",
          smooth(low), 0, 1, 4, 3)
    for label, a, b in (("Mid", mpf(1) / 5, 1), ("Far", mpf(10)**-8, mpf(1) / 5)):
        t.add(f"k{n}{label}", f"sqrt(x) exp(x) K{n}(x) in 1 / x",
              lambda u: besselk(n, 1 / u) * exp(1 / u) / sqrt(u), a, b, 7, 7)

for n in (0, 1):
    for k in (1, 2):
        square = zero[n][k - 1]**2
        high = float(square)
        t.array(f"j{n}Zero{k}Squared", [high, square - mpf(high)])
t.write(sys.argv[1] + "/src/special/tables/bessel.h")
