#!/usr/bin/python3
"""Coefficients of the Airy functions and of Olver's uniform expansion: src/special/tables/airy.h.

usage: airy.py REPOSITORY
"""

import sys

from mpmath import airyai, airybi, cos, exp, mpf, pi, sin, sqrt

from rational import Table

t = Table("airy.py", "QX_SPECIAL_TABLES_AIRY_H")
START = mpf(209) / 100
ZETA = 2 * START * sqrt(START) / 3


def place(u):
    zeta = 1 / u
    x = (3 * zeta / 2) ** (mpf(2) / 3)
    return x, zeta, sqrt(sqrt(x))


def growing(which, derivative):
    def part(u):
        x, zeta, root = place(u)
        if which == "ai":
            value = airyai(x, derivative=derivative) * exp(zeta) * 2 * sqrt(pi)
        else:
            value = airybi(x, derivative=derivative) * exp(-zeta) * sqrt(pi)
        return value * root if derivative == 0 else value / root * (-1 if which == "ai" else 1)
    return part


def oscillating(which, derivative):
    # Ai(-x) = (sin(t) F - cos(t) G) / (sqrt(pi) root), Bi(-x) = (cos(t) F + sin(t) G) / ..., and
    # Ai'(-x) = -root (cos(t) F + sin(t) G) / sqrt(pi), Bi'(-x) = root (sin(t) F - cos(t) G) / ...,
    # t = zeta + pi / 4; G is odd in 1 / zeta.
    def part(z):
        x, zeta, root = place(sqrt(z))
        s, c = sin(zeta + pi / 4), cos(zeta + pi / 4)
        a, b = airyai(-x, derivative=derivative), airybi(-x, derivative=derivative)
        if derivative == 0:
            scale = sqrt(pi) * root
            f, g = scale * (s * a + c * b), scale * (s * b - c * a)
        else:
            scale = sqrt(pi) / root
            f, g = scale * (s * b - c * a), scale * (-s * a - c * b)
        return f if which == "F" else g * zeta
    return part


small = mpf(10)**-9
for name, d in (("ai", 0), ("aip", 1)):
    t.add(f"{name}Decay", f"{name} scaled, in 1 / zeta", growing("ai", d), small, 1 / ZETA, 7, 7)
for name, d in (("bi", 0), ("bip", 1)):
    t.add(f"{name}Growth", f"{name} scaled, in 1 / zeta", growing("bi", d), small, mpf(1) / 16, 7, 5)
for name, d in (("airy", 0), ("airyp", 1)):
    for which in "FG":
        for label, low, high, p, q in (("Mid", mpf(1) / 50, 1 / ZETA**2, 10, 9),
                                       ("Far", mpf(10)**-9, mpf(1) / 50, 7, 6)):
            t.add(f"{name}Wave{which}{label}",
                  f"{which} of the {'function' if d == 0 else 'derivative'}, in 1 / zeta^2",
                  oscillating(which, d), low, high, p, q)
t.write(sys.argv[1] + "/src/special/tables/airy.h")
