"""The points at which the error function, the exponential, sine, cosine and hyperbolic integrals and the
dilogarithm are measured."""

import functools

import mpmath
from mpmath import mpf

from accuracy import Function, around, from_gsl, from_scipy, from_std, linear, logarithmic, pairs, product, single

PAGE = "integrals.md"
TITLE = "Accuracy: error function, exponential, sine, cosine and hyperbolic integrals, dilogarithm"


def rows(*intervals):
    return [(name, single(points)) for name, points in intervals]


@functools.cache
def exponential(x, n):
    """E_n(x) by the continued fraction; mpmath's own function silently loses digits at large n and x."""
    if x <= 1 or n == 0:
        return mpmath.expint(n, x)
    tail = mpf(0)
    for k in range(1000, 0, -1):
        tail = k * (n + k - 1) / (x + n + 2 * k - tail)
    return mpmath.exp(-x) / (x + n - tail)


def expint_of_one(function):
    """The C++ library has only Ei: E_1(x) = -Ei(-x)."""
    return function and (lambda x, n: -function(-x) if n == 1 else float("nan"))


def cosine(x):
    if x < 1e6:
        return mpmath.ci(x)
    # the asymptotic expansion, whose terms fall by x^2 each
    f, g = (1 - 2 / x**2 + 24 / x**4 - 720 / x**6) / x, (1 - 6 / x**2 + 120 / x**4 - 5040 / x**6) / x**2
    return f * mpmath.sin(x) - g * mpmath.cos(x)


TINY = ("tiny", logarithmic(1e-300, 1e-8, 12))
ERF = rows(TINY, ("[1e-8, 1]", linear(1e-8, 1) + around(1.0)), ("[1, 6]", linear(1, 6)),
           ("[-6, -1]", linear(-6, -1)))
ERFC = rows(TINY, ("[0, 1]", linear(0, 1) + around(1.0)), ("[1, 8]", linear(1, 8) + around(8.0)),
            ("[8, 26.5]", linear(8, 26.5)), ("[-6, 0]", linear(-6, -1e-3)))
EXPONENTIAL = [("n = 0, x to 700", product(logarithmic(1e-5, 700, 20), [0])),
               ("n = 1, x in [0, 1]", product(linear(0.001, 1) + logarithmic(1e-300, 1e-3, 10) + around(1.0), [1])),
               ("n = 1, x in [1, 700]", product(logarithmic(1, 700), [1])),
               ("n = 2 ... 169, x in [0, 1]", pairs(linear(0.001, 1, 50) + logarithmic(1e-300, 1e-3, 10),
                                                    [2, 3, 4, 7, 15, 40, 100, 168, 169])),
               ("n = 170 ... 5000, x in [0, 1]", pairs(linear(0.001, 1, 30), [170, 171, 300, 1000, 5000])),
               ("n = 2 ... 5000, x in [1, 700]", pairs(logarithmic(1, 700, 60), [2, 3, 4, 7, 15, 40, 100, 170, 1000,
                                                                                 5000])),
               ("n = 5001 ... 1e9, x to 700", pairs(logarithmic(1e-5, 700, 40), [5001, 7000, 10**5, 10**9]))]
SINE = rows(TINY, ("[0, 4]", linear(0.001, 4) + around(4.0)), ("[4, 8]", linear(4, 8) + around(8.0)),
            ("[8, 1e6]", logarithmic(8, 1e6)))
EXPONENTIAL_2026 = [
    (f"n = 1, {name}", [(x, 1) for x in points])
    for name, points in (("[1e-300, 0.4]", logarithmic(1e-300, 0.4)), ("[0.4, 2]", linear(0.4, 2) + around(0.4)),
                         ("[2, 10]", linear(2, 10) + around(2.0)), ("[10, 700]", linear(10, 700) + around(10.0)))]
# GSL needs seconds for each value of an order of 1e9; the same points serve two functions.
EXPONENTIAL_PEERS = {"GSL": functools.cache(lambda x, n: from_gsl("gsl_sf_expint_En", "id")(n, x)),
                     "C++": expint_of_one(from_std("std_expint", "d")),
                     "SciPy": lambda x, n: from_scipy("expn")(n, x)}
COSINE = rows(TINY, ("[0, 4]", linear(0.001, 4) + around(4.0) + [0.6165054856207162, 3.384180422551187]),
              ("[4, 8]", linear(4, 8) + around(8.0)), ("[8, 1e6]", logarithmic(8, 1e6)),
              ("[1e6, 1e20]", logarithmic(1e6, 1e20)))
HYPERBOLIC = rows(TINY, ("[0, 8]", linear(0.001, 8) + around(8.0) + [0.5238225713898644]),
                  ("[8, 18]", linear(8, 18) + around(18.0)), ("[18, 88]", linear(18, 88)),
                  ("[88, 700]", linear(88, 700) + around(700.0, 2)), ("[700, 716]", linear(700, 716)))
DILOGARITHM = rows(("[0, 0.5]", linear(0, 0.5) + logarithmic(1e-300, 1e-3, 10) + around(0.5)),
                   ("[0.5, 1.5]", linear(0.5, 1.5) + around(1.0) + around(1.5)),
                   ("[1.5, 2]", linear(1.5, 2) + around(2.0)), ("[2, 1e300]", logarithmic(2, 1e300)))

FUNCTIONS = [
    Function("QX_Erf", "do", mpmath.erf, ERF,
             {"GSL": from_gsl("gsl_sf_erf", "d"), "C++": from_std("std_erf", "d"), "SciPy": from_scipy("erf")}),
    Function("QX_ErfC", "do", mpmath.erfc, ERFC,
             {"GSL": from_gsl("gsl_sf_erfc", "d"), "C++": from_std("std_erfc", "d"), "SciPy": from_scipy("erfc")}),
    Function("QX_ExpI", "dio", exponential, EXPONENTIAL + EXPONENTIAL_2026, EXPONENTIAL_PEERS),
    Function("QX_ExpI_2026", "dio", exponential, EXPONENTIAL + EXPONENTIAL_2026, EXPONENTIAL_PEERS),
    Function("QX_SinI", "do", mpmath.si, SINE,
             {"GSL": from_gsl("gsl_sf_Si", "d"), "SciPy": from_scipy("sici", 0)}),
    Function("QX_CosI", "do", cosine, COSINE,
             {"GSL": from_gsl("gsl_sf_Ci", "d"), "SciPy": from_scipy("sici", 1)},
             lambda x: 1 / x if x > 4 else mpf("0.47"),
             note="Relative to its largest value, 0.47, up to x = 4, where it has two zeros, and to 1 / x beyond."),
    Function("QX_SinhI", "do", mpmath.shi, HYPERBOLIC,
             {"GSL": from_gsl("gsl_sf_Shi", "d"), "SciPy": from_scipy("shichi", 0)}),
    Function("QX_CoshI", "do", mpmath.chi, HYPERBOLIC,
             {"GSL": from_gsl("gsl_sf_Chi", "d"), "SciPy": from_scipy("shichi", 1)}, 1,
             note="Errors are absolute where |Chi| < 1, near its zero at 0.52."),
    Function("QX_Diln", "do", lambda x: mpmath.polylog(2, 1 - x), DILOGARITHM,
             {"GSL": lambda x: from_gsl("gsl_sf_dilog", "d")(1 - x), "SciPy": from_scipy("spence")},
             note="GSL's argument is 1 - x, which is rounded."),
]
