#!/usr/bin/python3
"""Coefficients of the error function, the sine, cosine and hyperbolic integrals and the
dilogarithm: src/special/tables/*.h.

usage: integrals.py REPOSITORY [NAME...]
"""

import sys

from mpmath import (chi, ci, cos, e1, erf, erfc, euler, exp, log, mp, mpf, nstr, pi, polylog, shi, si, sin, sqrt)

from rational import Table, as_double, nodes

# Fitting points that cluster at small arguments, and at arguments near -1.
LOGARITHM = (lambda x: log(x), lambda y: exp(y))
LOGARITHM_FROM_ONE = (lambda x: log(x + 1), lambda y: exp(y) - 1)
SQUARE_ROOT = (lambda x: sqrt(x), lambda y: y * y)
FOURTH_ROOT = (lambda x: sqrt(sqrt(x)), lambda y: y**4)


def error_function(folder):
    t = Table("integrals.py", "QX_SPECIAL_TABLES_ERROR_FUNCTION_H")
    t.add("erfSmall", "erf(x) / x in x^2", lambda z: erf(sqrt(z)) / sqrt(z) if z else 2 / sqrt(pi), 0, 1, 5, 5)
    t.add("erfcMid", "exp(x^2) erfc(x) in x", lambda x: exp(x * x) * erfc(x), 1, 8, 8, 8, LOGARITHM)
    t.add("erfcFar", "exp(x^2) erfc(x) in x", lambda x: exp(x * x) * erfc(x), 8, mpf("26.65"), 5, 6)
    t.write(folder + "error_function.h")


def exponential(folder):
    t = Table("integrals.py", "QX_SPECIAL_TABLES_EXPONENTIAL_INTEGRAL_H")

    def scaled(x):
        return x * exp(x) * e1(x)
    t.add("e1Small", "(E_1(x) + ln x + gamma) / x in x", lambda x: (e1(x) + log(x) + euler) / x if x else mpf(1),
          0, mpf(2) / 5, 4, 4)
    t.add("e1Near", "x exp(x) E_1(x) in x", scaled, mpf(2) / 5, 2, 8, 8, LOGARITHM)
    t.add("e1Mid", "x exp(x) E_1(x) in x", scaled, 2, 10, 7, 7, LOGARITHM)
    t.add("e1Far", "x exp(x) E_1(x) in 1 / x", lambda z: scaled(1 / z) if z > mpf(10)**-12 else 1 - z,
          0, mpf(1) / 10, 7, 7)
    t.write(folder + "exponential_integral.h")


def dilogarithm(folder):
    t = Table("integrals.py", "QX_SPECIAL_TABLES_DILOGARITHM_H")
    t.add("dilogarithm", "-Li2(-w) / w in w", lambda w: -polylog(2, -w).real / w if w else mpf(1),
          -mpf(1) / 2, mpf(1) / 2, 7, 7,
          LOGARITHM_FROM_ONE, centre=-mpf(1) / 2)  # all powers positive, so that nothing cancels
    t.write(folder + "dilogarithm.h")


def trigonometric(folder):
    t = Table("integrals.py", "QX_SPECIAL_TABLES_TRIGONOMETRIC_INTEGRALS_H")
    t.add("sineIntegralSmall", "Si(x) / x in x^2", lambda z: si(sqrt(z)) / sqrt(z), mpf(10)**-25, 16, 5, 5)
    t.add("cosineIntegralSmall", "(Ci(x) - ln x - gamma) / x^2 in x^2",
          lambda z: (ci(sqrt(z)) - log(z) / 2 - euler) / z, mpf(10)**-25, 16, 5, 5)

    def f(z):
        x = 1 / sqrt(z)
        return x * ((pi / 2 - si(x)) * cos(x) + ci(x) * sin(x))

    def g(z):
        x = 1 / sqrt(z)
        return x * x * ((pi / 2 - si(x)) * sin(x) - ci(x) * cos(x))
    low, middle, high = mpf(10)**-12, mpf(1) / 64, mpf(1) / 16
    t.add("auxiliaryFMid", "x f(x) in 1 / x^2", f, middle, high, 6, 7, FOURTH_ROOT)
    t.add("auxiliaryGMid", "x^2 g(x) in 1 / x^2", g, middle, high, 7, 7, FOURTH_ROOT)
    t.add("auxiliaryFFar", "x f(x) in 1 / x^2", f, low, middle, 8, 8, SQUARE_ROOT)
    t.add("auxiliaryGFar", "x^2 g(x) in 1 / x^2", g, low, middle, 8, 9, SQUARE_ROOT)
    t.write(folder + "trigonometric_integrals.h")


def chebyshev_value(coefficients, t):
    """The sum of c[k] T_k(t / 2), c[0] halved, by Clenshaw's recurrence."""
    b1 = b2 = mpf(0)
    for c in reversed(coefficients[1:]):
        b1, b2 = t * b1 - b2 + c, b1
    return t * b1 / 2 - b2 + coefficients[0] / 2


def chebyshev(table, name, what, function, argument, inverse, a, b, count=23):
    """A Chebyshev series in argument(x), for x in [a, b], which may map to less or more than [-2, 2].

    The polynomial interpolates at the Chebyshev points of the interval that is used and is then
    expressed in the Chebyshev polynomials of [-2, 2].
    """
    used = nodes(argument(b), argument(a), count)
    known = [function(inverse(t)) for t in used]

    def interpolant(t):
        total = mpf(0)
        for i, ti in enumerate(used):
            term = known[i]
            for j, tj in enumerate(used):
                if i != j:
                    term *= (t - tj) / (ti - tj)
            total += term
        return total
    points = nodes(mpf(-2), mpf(2), count)
    values = [interpolant(t) for t in points]
    exact = [2 * sum(v * cos(k * (2 * i + 1) * pi / (2 * count)) for i, v in enumerate(values)) / count
             for k in range(count)]
    rounded = [as_double(c) for c in exact]
    worst = [mpf(0), mpf(0)]
    for i in range(301):
        x = a + (b - a) * (mpf(2 * i + 1) / 602)**2
        y = function(x)
        for k, c in enumerate((exact, rounded)):
            worst[k] = max(worst[k], abs(chebyshev_value(c, argument(x)) / y - 1))
    line = (f"{what}, {count} coefficients, x in [{nstr(a, 6)}, {nstr(b, 6)}]: "
            f"{nstr(worst[0], 2)}, {nstr(worst[1], 2)}")
    print(name, line, flush=True)
    table.comment(line)
    table.array(name, rounded)
    table.lines.append("")


def hyperbolic(folder):
    mp.dps = 400  # the integrals grow like exp(x), and the fit uses differences
    t = Table("integrals.py", "QX_SPECIAL_TABLES_HYPERBOLIC_INTEGRALS_H")
    t.lines[5:9] = ["// Made by tools/approximations/integrals.py. Each set: the coefficients of the Chebyshev",
                    "// polynomials T_k(t / 2), k = 0, 1, ..., the first one doubled. The comment gives the",
                    "// function, t, the interval, and the largest relative error measured there, first with",
                    "// exact coefficients, then with these doubles."]

    def scaled_shi(x):
        return 2 * x * exp(-x) * shi(x)

    def scaled_chi(x):
        return 2 * x * exp(-x) * (chi(x) - log(x) - euler)
    ranges = (("Mid", "t = (576 / x - 52) / 10", lambda x: (576 / x - 52) / 10, lambda t: 576 / (10 * t + 52),
               mpf(8), mpf(18)),
              ("Far", "t = (6336 / x - 212) / 70", lambda x: (6336 / x - 212) / 70, lambda t: 6336 / (70 * t + 212),
               mpf(18), mpf(720)))
    for suffix, argument, forward, inverse, a, b in ranges:
        chebyshev(t, "hyperbolicSine" + suffix, f"2 x exp(-x) Shi(x) in {argument}", scaled_shi, forward, inverse, a, b)
        chebyshev(t, "hyperbolicCosine" + suffix, f"2 x exp(-x) (Chi(x) - ln x - gamma) in {argument}",
                  scaled_chi, forward, inverse, a, b)
    t.write(folder + "hyperbolic_integrals.h")


if __name__ == "__main__":
    made = {"error_function": error_function, "exponential": exponential, "dilogarithm": dilogarithm,
            "trigonometric": trigonometric, "hyperbolic": hyperbolic}
    for name in sys.argv[2:] or made:
        made[name](sys.argv[1] + "/src/special/tables/")
