#!/usr/bin/python3
"""Coefficients of the normal distribution: src/special/tables/normal.h. Also nodes and weights of
Gauss-Legendre quadrature on [0, 1]: src/special/tables/gauss_legendre.h.

usage: normal.py REPOSITORY
"""

import sys

from mpmath import erf, erfc, exp, legendre, mp, mpf, pi, quad, sqrt

from rational import Table

NODES = 32
LOGARITHM = (lambda x: mp.log(x), lambda y: exp(y))  # fitting points that cluster at small arguments


def mills(x):
    """The upper tail beyond x, divided by exp(-x^2 / 2)."""
    return exp(x * x / 2) * erfc(x / sqrt(2)) / 2


def normal(folder):
    t = Table("normal.py", "QX_SPECIAL_TABLES_NORMAL_H")
    t.add("centralNormal", "(P(X <= x) - 1/2) / x in x^2",
          lambda z: erf(sqrt(z / 2)) / 2 / sqrt(z) if z else 1 / sqrt(2 * pi), 0, 1, 4, 4)
    t.add("millsNear", "P(X > x) exp(x^2 / 2) in x", mills, 0, 2, 7, 7)
    t.add("millsMid", "P(X > x) exp(x^2 / 2) in x", mills, 2, 10, 8, 8, LOGARITHM)
    t.add("millsFar", "x P(X > x) exp(x^2 / 2) in 1 / x^2",
          lambda z: mills(1 / sqrt(z)) / sqrt(z) if z else 1 / sqrt(2 * pi), 0, mpf(1) / 100, 4, 4)
    t.write(folder + "normal.h")


def derivative(n, x):
    return n * (x * legendre(n, x) - legendre(n - 1, x)) / (x * x - 1)


def gauss_legendre(folder):
    t = Table("normal.py", "QX_SPECIAL_TABLES_GAUSS_LEGENDRE_H")
    head = t.lines.index("// Made by tools/approximations/normal.py. Each set: the centre, then numerator and")
    t.lines[head:head + 4] = [f"// Made by tools/approximations/normal.py: the {NODES} nodes of Gauss and Legendre's",
                              "// quadrature on [0, 1], ascending, and their weights."]
    at = t.lines.index('#include "special/rational.h"')
    del t.lines[at:at + 2]
    points = []
    for k in range(1, NODES + 1):
        x = mp.cos(pi * (k - mpf(1) / 4) / (NODES + mpf(1) / 2))
        for _ in range(8):
            x -= legendre(NODES, x) / derivative(NODES, x)
        points.append(((1 + x) / 2, 1 / ((1 - x * x) * derivative(NODES, x)**2)))
    points.sort()
    check = sum(w * exp(-5 * x) for x, w in points) / quad(lambda x: exp(-5 * x), [0, 1]) - 1
    assert abs(check) < mpf(10)**-30
    t.array("legendreNodes", [x for x, _ in points])
    t.lines.append("")
    t.array("legendreWeights", [w for _, w in points])
    t.lines.append("")
    t.write(folder + "gauss_legendre.h")


if __name__ == "__main__":
    mp.dps = 60
    place = sys.argv[1] + "/src/special/tables/"
    gauss_legendre(place)
    normal(place)
