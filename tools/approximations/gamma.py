#!/usr/bin/python3
"""Coefficients of the gamma function on [2, 3]: src/special/tables/reciprocal_gamma.h; of its quotient by the
leading term of Stirling's formula: src/special/tables/stirling.h. Also, in twice the
precision, those of its reciprocal on [1, 2]: src/special/tables/gamma_pairs.h.

usage: gamma.py REPOSITORY
"""

import sys

from mpmath import exp, gamma, log, loggamma, lu_solve, matrix, mp, mpf, pi, rgamma, sqrt

from rational import Table, as_double, horner, nodes

DEGREE, PAIRS = 27, 16  # of the reciprocal; the coefficients from PAIRS on need no second double


def reciprocal(t):
    points = [(h, rgamma(h + mpf(3) / 2)) for h in nodes(-mpf(1) / 2, mpf(1) / 2, DEGREE + 1)]
    system = matrix(DEGREE + 1, DEGREE + 1)
    for i, (h, _) in enumerate(points):
        for j in range(DEGREE + 1):
            system[i, j] = h**j
    c = list(lu_solve(system, matrix([f for _, f in points])))
    stored = [as_double(v) + (as_double(v - as_double(v)) if k < PAIRS else 0) for k, v in enumerate(c)]
    worst = max(abs(horner(stored, h) / rgamma(h + mpf(3) / 2) - 1) for h in (mpf(i) / 80 for i in range(-40, 41)))
    print("inverseGamma", mp.nstr(worst, 2))
    t.pairs("inverseGamma", f"1 / gamma(x) on [1, 2] in powers of x - 3/2: {mp.nstr(worst, 2)}, with the coefficients "
            "after these:", c[:PAIRS])
    t.array("inverseGammaRest", c[PAIRS:])
    t.lines.append("")


def stirling(w):
    if w < mpf(10)**-20:
        return (1 - w / 12) / sqrt(2 * pi)
    a = 1 / w
    return exp((a - mpf(1) / 2) * log(a) - a - loggamma(a))


if __name__ == "__main__":
    mp.dps = 60
    folder = sys.argv[1] + "/src/special/tables/"
    t = Table("gamma.py", "QX_SPECIAL_TABLES_GAMMA_PAIRS_H")
    head = t.lines.index("// Made by tools/approximations/gamma.py. Each set: the centre, then numerator and")
    t.lines[head:head + 4] = ["// Made by tools/approximations/gamma.py: numbers as a double and the rest."]
    t.lines[t.lines.index('#include "special/rational.h"')] = '#include "frame/extended.h"'
    reciprocal(t)
    t.write(folder + "gamma_pairs.h")
    t = Table("gamma.py", "QX_SPECIAL_TABLES_STIRLING_H")
    what = "a^(a - 1/2) exp(-a) / gamma(a) in "
    t.pieces("stirlingFew", what + "a - 1/2", lambda x: stirling(1 / (x + mpf(1) / 2)), mpf(1) / 4, 10, 17)
    t.pieces("stirlingMany", what + "1 / a", stirling, mpf(1) / 24, 8, 9)
    t.write(folder + "stirling.h")
    t = Table("gamma.py", "QX_SPECIAL_TABLES_RECIPROCAL_GAMMA_H")
    t.add("gammaTwoToThree", "gamma(x) in x", gamma, 2, 3, 7, 6)
    t.write(folder + "reciprocal_gamma.h")
