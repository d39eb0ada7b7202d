"""The points at which the gamma and beta functions, factorials and the digamma function are measured."""

import mpmath
from mpmath import mpf

from accuracy import Function, around, from_gsl, from_scipy, from_std, linear, logarithmic, product, single

PAGE = "gamma.md"
TITLE = "Accuracy: gamma and beta functions, factorials, digamma"


def complete(points):
    """Arguments a, x and the selector of the complete form."""
    return [(a, 0.0, 1) for a, in single(points)]


def first(function):
    """A peer that takes only the first argument."""
    return function and (lambda a, *rest: function(a))


GAMMA = [("tiny", logarithmic(1e-300, 1e-8, 12) + around(1e-9)),
         ("[1e-8, 2]", linear(1e-8, 2)), ("[2, 33]", linear(2, 33) + around(3.0) + around(33.0)),
         ("[33, 143]", linear(33, 143.01608) + around(33.0)), ("[143, 171.6]", linear(143.02, 171.6)),
         ("[-33, 0], off the poles", [-n - f for n in range(0, 33, 2) for f in (0.1, 0.5, 0.9)]),
         ("[-33, 0], 1e-6 off the poles", [-n - s * 1e-6 for n in range(1, 33, 3) for s in (1, -1)]),
         ("[-150, -33], off the poles", [-n - f for n in range(33, 150, 7) for f in (0.1, 0.5, 0.9)])]
LN_GAMMA = [("tiny", logarithmic(1e-300, 1e-8, 12)), ("[0, 3]", linear(1e-8, 3) + around(1.0) + around(2.0)),
            ("[3, 33]", linear(3, 33) + around(3.0) + around(33.0)),
            ("[33, 1000]", logarithmic(33, 1000) + around(33.0) + around(1000.0)),
            ("[1000, 1e300]", logarithmic(1000, 1e300))]


def by_shares(shares, parameters):
    return [(a, a * s) for a in parameters for s in shares]


BELOW, NEAR, ABOVE = [0.01, 0.1, 0.5, 0.8], [0.95, 0.99, 1 - 2**-50, 1.0, 1 + 2**-50, 1.01, 1.05], [1.2, 2, 5]
SMALL, MIDDLE, LARGE = [0.1, 0.3, 0.5, 1, 1.7, 3, 6.5, 10], [15, 33, 50.5, 80, 100], [300, 1000, 1e4, 1e5]
INCOMPLETE = [(f"a in {t}, x in {u}", by_shares(s, p)) for t, p in (("[0.1, 10]", SMALL), ("[10, 100]", MIDDLE),
                                                                    ("[100, 1e5]", LARGE))
              for u, s in (("[0.01, 0.8] a", BELOW), ("[0.95, 1.05] a", NEAR), ("[1.2, 5] a", ABOVE))]
INCOMPLETE += [("a in [1e-10, 0.01], x in [0.01, 5]", product([1e-10, 1e-5, 0.01], linear(0.01, 5, 8) + [1.0]))]

BETA = [("a, b in [0.1, 10]", product(linear(0.1, 10, 8), linear(0.1, 10, 7))),
        ("a in [10, 1000], b in [0.1, 10]", product(logarithmic(10, 1000, 8), linear(0.1, 10, 7))),
        ("a, b in [10, 500]", product(logarithmic(10, 500, 8), logarithmic(10, 500, 7))),
        ("a in [1e3, 1e15], b in [1e-10, 5]", product(logarithmic(1e3, 1e15, 10), logarithmic(1e-10, 5, 7))),
        ("tiny", product(logarithmic(1e-300, 1e-8, 6), logarithmic(1e-300, 1, 6))),
        ("a in [-20, 0], b in [-20, 10]", product(linear(-19.7, -0.3, 8), linear(-19.45, 9.2, 7)))]


def incomplete_beta(parameters):
    return [(a, b, x) for a in parameters for b in parameters
            for x in (0.05, 0.3, 0.6, 0.95, a / (a + b), min(1.1 * a / (a + b), 0.999))]


INCOMPLETE_BETA = [("a, b in [0.1, 10]", incomplete_beta([0.1, 0.5, 1, 2, 5.5, 10])),
                   ("a, b in [10, 100]", incomplete_beta([12, 33, 70.5, 100])),
                   ("a, b in [100, 1000]", incomplete_beta([100, 333, 1000])),
                   ("a, b in [2000, 20000]", incomplete_beta([2000, 20000]))]


def lower_gamma(a, x):
    if x > a:
        return 1 - mpmath.gammainc(a, x, regularized=True)
    return mpmath.gammainc(a, 0, x, regularized=True)


def regularised_beta(a, b, x):
    """By the series with positive terms; I_x(a, b) = 1 - I_(1-x)(b, a) keeps it short."""
    if x > a / (a + b):
        return 1 - regularised_beta(b, a, 1 - x)
    series = mpmath.hyp2f1(a + b, 1, a + 1, x, maxterms=10**6)
    return x**a * (1 - x)**b / (a * mpmath.beta(a, b)) * series


PSI = [("(0, 1]", linear(1e-3, 1) + logarithmic(1e-300, 1e-3, 10)),
       ("[1, 10]", linear(1, 10) + around(10.0) + [1.4616321449683623]),
       ("integers to 30", [float(n) for n in range(1, 31)]),
       ("[10, 1e12]", logarithmic(10, 1e12) + around(1e9)),
       ("[-100, 0]", [-n - f for n in range(0, 100, 7) for f in (0.1, 0.45, 0.55, 0.9)]),
       ("[-100, 0], 1e-6 off the poles", [-n - s * 1e-6 for n in range(1, 100, 9) for s in (1, -1)])]


def plus_one(function):
    return function and (lambda n: function(n + 1))


def fact(low, high):
    return single(list(range(low, high + 1)))


FUNCTIONS = [
    Function("QX_Gamma_85", "ddoi", lambda a, *rest: mpmath.gamma(a), [(t, complete(p)) for t, p in GAMMA],
             {"GSL": first(from_gsl("gsl_sf_gamma", "d")), "C++": first(from_std("std_gamma", "d")),
              "SciPy": first(from_scipy("gamma"))}, title="QX_Gamma, complete"),
    Function("QX_LnGamma", "do", mpmath.loggamma, [(t, single(p)) for t, p in LN_GAMMA],
             {"GSL": from_gsl("gsl_sf_lngamma", "d"), "C++": from_std("std_lgamma", "d"),
              "SciPy": from_scipy("gammaln")}, 1,
             note="Errors are absolute where |ln gamma| < 1, near the zeros at 1 and 2."),
    Function("QX_Stirling", "do", mpmath.gamma,
             [(t, single(p)) for t, p in (("[33, 143]", linear(33, 143.01608) + around(143.01608)),
                                          ("[143, 171.6]", linear(143.02, 171.6)), ("[10, 33]", linear(10, 33)))],
             {"GSL": from_gsl("gsl_sf_gamma", "d"), "C++": from_std("std_gamma", "d"), "SciPy": from_scipy("gamma")},
             note="Intended for x > 33; below that, its five terms leave the error in the last row."),
    Function("QX_Gamma", "ddo", lower_gamma, INCOMPLETE,
             {"GSL": from_gsl("gsl_sf_gamma_inc_P", "dd"), "SciPy": from_scipy("gammainc")},
             title="QX_Gamma, incomplete: P(a, x)",
             note="The common factor exp(a ln x - x - ln gamma(a)) loses digits in proportion to a ln a; beyond x = a, "
                  "the value is 1 - Q(a, x). Both are kept so that results stay comparable."),
    Function("QX_GammaC", "ddo", lambda a, x: mpmath.gammainc(a, x, regularized=True), INCOMPLETE,
             {"GSL": from_gsl("gsl_sf_gamma_inc_Q", "dd"), "SciPy": from_scipy("gammaincc")}, title="QX_GammaC: Q(a, x)",
             note="The same; below x = a and below x = 1, the value is 1 - P(a, x), which leaves few digits for tiny a."),
    Function("QX_Beta_85", "dddoi", lambda a, b, *rest: mpmath.beta(a, b),
             [(t, [(a, b, 0.0, 1) for a, b in p]) for t, p in BETA],
             {"GSL": lambda a, b, *rest: from_gsl("gsl_sf_beta", "dd")(a, b),
              "C++": lambda a, b, *rest: from_std("std_beta", "dd")(a, b),
              "SciPy": lambda a, b, *rest: from_scipy("beta")(a, b)}, title="QX_Beta, complete"),
    Function("QX_Beta", "dddo", regularised_beta, INCOMPLETE_BETA,
             {"GSL": from_gsl("gsl_sf_beta_inc", "ddd"), "SciPy": from_scipy("betainc")},
             title="QX_Beta, incomplete: I_x(a, b)", scale=mpf("0.001"),
             note="Errors are absolute where the value is below 0.001. The fractions end after 100 terms, which affects the "
                  "last rows, and the common factor comes from logarithms of gamma."),
    Function("QX_Fact", "io", mpmath.factorial,
             [("n = 0 ... 33", fact(0, 33)), ("n = 34 ... 50", fact(34, 50)), ("n = 51 ... 170", fact(51, 170))],
             {"GSL": from_gsl("gsl_sf_fact", "u"), "C++": plus_one(from_std("std_gamma", "d")),
              "SciPy": plus_one(from_scipy("gamma"))}),
    Function("QX_LnFact", "io", lambda n: mpmath.loggamma(n + 1),
             [("n = 2 ... 33", fact(2, 33)), ("n = 34 ... 1100", single(range(34, 1101, 13))),
              ("n to 2^31", single([int(x) for x in logarithmic(1100, 2**31 - 1)]))],
             {"GSL": from_gsl("gsl_sf_lnfact", "u"), "C++": plus_one(from_std("std_lgamma", "d")),
              "SciPy": plus_one(from_scipy("gammaln"))}),
    Function("QX_Psi", "do", mpmath.digamma, [(t, single(p)) for t, p in PSI],
             {"GSL": from_gsl("gsl_sf_psi", "d"), "SciPy": from_scipy("psi")}, 1,
             note="Errors are absolute where |psi| < 1, near its zeros."),
]
