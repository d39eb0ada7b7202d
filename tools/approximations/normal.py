#!/usr/bin/python3
"""Coefficients of the normal distribution and its quantile: src/special/tables/normal.h. Also nodes and weights of
Gauss-Legendre quadrature on [0, 1]: src/special/tables/gauss_legendre.h.

usage: normal.py REPOSITORY
"""

import sys

from mpmath import erfc, erfinv, exp, findroot, legendre, log, mp, mpf, pi, quad, sqrt

from rational import Table

NODES = 32
LOGARITHM = (lambda x: mp.log(x), lambda y: exp(y))  # fitting points that cluster at small arguments
BEYOND_ONE = (lambda x: mp.log(x - 1), lambda y: 1 + exp(y))
BESIDE_POLE = (lambda z: mp.log(mpf(1) / 4 - z), lambda y: mpf(1) / 4 - exp(y))  # the pole of the quantile at 1/2


def mills(x):
    """The upper tail beyond x, divided by exp(-x^2 / 2)."""
    return exp(x * x / 2) * erfc(x / sqrt(2)) / 2


def central_point(z):
    q = sqrt(z)
    return sqrt(2) * erfinv(2 * q) / q if z else sqrt(2 * pi)


def tail_point(r):
    """The start is the leading term of the tail's expansion."""
    y = r * r
    return findroot(lambda x: log(erfc(x / sqrt(2)) / 2) + y, sqrt(2 * y - log(4 * pi * y)))


def normal(folder):
    t = Table("normal.py", "QX_SPECIAL_TABLES_NORMAL_H")
    t.pieces("mills", "P(X > x) exp(x^2 / 2) in x", mills, mpf(1) / 4, 40, 10)
    t.add("millsFar", "x P(X > x) exp(x^2 / 2) in 1 / x^2",
          lambda z: mills(1 / sqrt(z)) / sqrt(z) if z else 1 / sqrt(2 * pi), 0, mpf(1) / 100, 4, 4)
    what = "x with P(X > x) = p "
    t.add("pointCentral", what + "by 1/2 - p in (1/2 - p)^2", central_point, 0, mpf("0.180625"), 8, 7, BESIDE_POLE,
          centre="0.180625")
    t.add("pointNear", what + "in r = sqrt(-ln p)", tail_point, mpf("1.6"), 5, 8, 7, BEYOND_ONE, centre=1.5)
    t.add("pointFar", what + "in r = sqrt(-ln p)", tail_point, 5, mpf("27.3"), 8, 7, LOGARITHM, centre=5)
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
