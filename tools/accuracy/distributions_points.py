"""The points at which the distributions and their quantiles are measured."""

import mpmath
from mpmath import mp, mpf

from accuracy import Function, from_gsl, from_scipy, linear, logarithmic, product, single
from gamma_points import lower_gamma, regularised_beta

PAGE = "distributions.md"
TITLE = "Accuracy: distributions"

DOFS = [1, 2, 3, 5, 10, 30, 200]
MANY = [1000, 30000]


def normal(x):
    return mpmath.erfc(-x / mpmath.sqrt(2)) / 2


def student(t, dof):
    tail = regularised_beta(dof / 2, mpf(1) / 2, dof / (t * t + dof)) / 2
    return tail if t < 0 else 1 - tail


def fisher(f, n, d):
    return regularised_beta(n / 2, d / 2, f * n / (f * n + d))


def chi_square(x, dof):
    return lower_gamma(dof / 2, x / 2)


def root(function, low, high):
    """The root of an increasing function between two numbers, to the precision of a double."""
    low, high = mpf(low), mpf(high)
    with mp.workdps(25):
        for _ in range(400):
            middle = (low + high) / 2
            if function(middle) < 0:
                low = middle
            else:
                high = middle
            if high - low < mpf(2)**-20 * max(abs(middle), mpf("1e-30")):
                break
        return mpmath.findroot(function, (low, high), solver="anderson", tol=1e-35, verify=False)


def normal_quantile(p):
    if p > 0.5:
        return -normal_quantile(1 - p)
    return mpmath.findroot(lambda x: mpmath.log(normal(x) / p), -mpmath.sqrt(-2 * mpmath.log(p)))


def student_quantile(p, dof):
    return root(lambda t: student(t, dof) - p, -100, 100)


def fisher_quantile(p, n, d):
    return root(lambda f: fisher(f, n, d) - p, mpf("1e-12"), 10000)


def chi_square_quantile(p, dof):
    return root(lambda x: chi_square(x, dof) - p, mpf("1e-12"), 5000)


def rows(name, points, dofs=DOFS, many=MANY):
    return [(f"{name}, to {dofs[-1]} degrees", product(points, dofs)),
            (f"{name}, {many[0]} and {many[-1]} degrees", product(points, many))]


def two(points):
    return [(x, n, d) for x, n in points for d in (1, 4, 40)]


def peer(function, *order):
    """A peer with its arguments in another order."""
    return function and (lambda *a: function(*[a[k] for k in order]))


TAILS = [-40.0, -12.5, -6.0, -3.3]
PROBABILITIES = [1e-4, 0.01, 0.2, 0.45, 0.77, 0.95, 0.999]
OF_X = {"GSL": from_gsl("gsl_cdf_ugaussian_P", "d"), "SciPy": from_scipy("ndtr")}
LOW_PRECISION = "An approximation of low order, kept so that results stay comparable; in absolute terms {}."
BISECTION = ("A bisection that stops at an absolute width of 1e-4, or 4.5e11 eps; errors are absolute where the value is "
             "below 1.")

FUNCTIONS = [
    Function("NormDist_head", "Do", normal, [("[-8, 0]", single(linear(-8, 0))), ("[0, 8]", single(linear(0, 8)))],
             OF_X, 1, note=LOW_PRECISION.format("the error is 1e-5, or 4.5e10 eps")),
    Function("TDist_head", "DIoe", student,
             rows("t in [-40, -3]", TAILS) + rows("|t| in [0.001, 3]", linear(-3, 3, 8) + [-1e-3]) +
             [("|t| = 1e-6", product([-1e-6, 1e-6], DOFS))],
             {"GSL": from_gsl("gsl_cdf_tdist_P", "dd"), "SciPy": peer(from_scipy("stdtr"), 1, 0)},
             note="Computed from dof / (t^2 + dof), which approaches 1 for small t and loses the digits of t^2."),
    Function("FDist_head", "DIIoe", fisher,
             [(t, two(p)) for t, p in rows("f in [0.01, 1]", logarithmic(0.01, 1, 6)) +
              rows("f in [1, 50]", logarithmic(1, 50, 6))],
             {"GSL": from_gsl("gsl_cdf_fdist_P", "ddd"), "SciPy": peer(from_scipy("fdtr"), 1, 2, 0)},
             note="Computed as 1 minus the upper tail: small probabilities have the absolute error of those near 1."),
    Function("ChiSquare_head", "DIoe", chi_square,
             [(t, [(x * d, d) for x, d in p]) for t, p in rows("x in [0.1, 0.8] dof", [0.1, 0.3, 0.5, 0.8]) +
              rows("x in [0.8, 1.2] dof", [0.9, 0.99, 1.0, 1.01, 1.1]) + rows("x in [1.2, 5] dof", [1.2, 2, 5])],
             {"GSL": from_gsl("gsl_cdf_chisq_P", "dd"), "SciPy": peer(from_scipy("chdtr"), 1, 0)}),
    Function("InvNdist_head", "Doe", normal_quantile,
             [("p in [1e-300, 0.5]", single(logarithmic(1e-300, 0.5))), ("p in [0.5, 1)", single(linear(0.5, 1 - 1e-9)))],
             {"GSL": from_gsl("gsl_cdf_ugaussian_Pinv", "d"), "SciPy": from_scipy("ndtri")}, 1,
             note=LOW_PRECISION.format("the error is 4.5e-4, or 2e12 eps")),
    Function("InvTdist_head", "DIoe", student_quantile, rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS[1:]),
             {"GSL": from_gsl("gsl_cdf_tdist_Pinv", "dd"), "SciPy": peer(from_scipy("stdtrit"), 1, 0)}, 1,
             note=BISECTION),
    Function("InvFDist_head", "DIIoe", fisher_quantile,
             [(t, [(p, n, 9) for p, n in q]) for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES)],
             {"GSL": from_gsl("gsl_cdf_fdist_Pinv", "ddd"), "SciPy": peer(from_scipy("fdtri"), 1, 2, 0)}, 1,
             note=BISECTION),
    Function("InvChiSquare_head", "DIoe", chi_square_quantile, rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS, [1000, 3000]),
             {"GSL": from_gsl("gsl_cdf_chisq_Pinv", "dd"),
              "SciPy": lambda p, dof: 2 * from_scipy("gammaincinv")(dof / 2, p)}, 1, note=BISECTION),
]


# The revisions: tails and logarithms by series with positive terms, in as many digits as 1 - p needs.
def far(function):
    """A function evaluated with the digits that a complement of 1e-320 needs."""
    def value(*arguments):
        with mp.workdps(400):
            return +function(*(mpf(a) for a in arguments))
    return value


def series(first, ratio):
    total, term, k = first, first, 0
    while term > total * mpf(10)**-(mp.dps - 5):
        term *= ratio(k)
        total += term
        k += 1
    return total


def lower_beta(a, b, x, y):
    if x > y:
        return 1 - lower_beta(b, a, y, x)
    slope = mpmath.exp(a * mpmath.log(x) + b * mpmath.log(y) + mpmath.loggamma(a + b) - mpmath.loggamma(a) -
                       mpmath.loggamma(b))
    return slope * series(1 / a, lambda k: x * (a + b + k) / (a + k + 1))


def upper_chi_square(x, dof):
    a, x = dof / 2, x / 2
    slope = mpmath.exp(a * mpmath.log(x) - x - mpmath.loggamma(a))
    return 1 - slope * series(1 / a, lambda k: x / (a + k + 1))


def lower_fisher(f, n, d):
    return lower_beta(n / 2, d / 2, n * f / (n * f + d), d / (n * f + d))


def upper_student(t, dof):
    return lower_beta(dof / 2, mpf(1) / 2, dof / (dof + t * t), t * t / (dof + t * t)) / 2


SURVIVAL = 1
REAL = [0.3, 1.0, 2.5, 7.0, 30.0, 400.0]


def chosen(peer_function, *order):
    """A peer without the last argument, which selects the value."""
    return peer_function and (lambda *a: peer_function(*[a[k] for k in order]))


def minus_first(peer_function):
    return peer_function and (lambda x, what: peer_function(-x))


def with_choice(points, choice):
    return [(*point, choice) for point in points]


T_POINTS = product([0.001, 0.4, 2.0, 9.0, 60.0], REAL)
F_POINTS = [(f, n, d) for f in (1e-9, 0.01, 0.4, 1.1, 3.0, 60.0) for n in REAL for d in (0.5, 4.0, 90.0)]
CHI_POINTS = [(float(x * d), d) for d in REAL for x in (1e-3, 0.3, 0.9, 1.2, 2.0, 3.0)] + [(900.0, 3.0)]

FUNCTIONS += [
    Function("NormDist2026_head", "DIoe", far(lambda x, what: mpmath.erfc(x / mpmath.sqrt(2)) / 2),
             [("survival, x in [-3, 38]", with_choice(single(linear(-3, 38)), SURVIVAL))],
             {"GSL": chosen(from_gsl("gsl_cdf_ugaussian_Q", "d"), 0), "SciPy": minus_first(from_scipy("ndtr"))}),
    Function("TDist2026_head", "DDIoe", far(lambda t, dof, what: upper_student(t, dof)),
             [("survival, t in [0.001, 60], 0.3 to 400 degrees", with_choice(T_POINTS, SURVIVAL))],
             {"GSL": chosen(from_gsl("gsl_cdf_tdist_Q", "dd"), 0, 1),
              "SciPy": lambda t, dof, what: from_scipy("stdtr")(dof, -t)}),
    Function("FDist2026_head", "DDDIoe", far(lambda f, n, d, what: 1 - lower_fisher(f, n, d)),
             [("survival, f in [1e-9, 60], 0.3 to 400 degrees", with_choice(F_POINTS, SURVIVAL))],
             {"GSL": chosen(from_gsl("gsl_cdf_fdist_Q", "ddd"), 0, 1, 2),
              "SciPy": lambda f, n, d, what: from_scipy("fdtrc")(n, d, f)}),
    Function("FDist2026_head", "DDDIoe", far(lambda f, n, d, what: lower_fisher(f, n, d)),
             [("probability, f in [1e-9, 60], 0.3 to 400 degrees", with_choice(F_POINTS, 0))],
             {"GSL": chosen(from_gsl("gsl_cdf_fdist_P", "ddd"), 0, 1, 2),
              "SciPy": lambda f, n, d, what: from_scipy("fdtr")(n, d, f)}, title="FDist2026_head, probability"),
    Function("ChiSquare2026_head", "DDIoe", far(lambda x, dof, what: upper_chi_square(x, dof)),
             [("survival, x in [0.001, 3] dof, 0.3 to 400 degrees", with_choice(CHI_POINTS, SURVIVAL))],
             {"GSL": chosen(from_gsl("gsl_cdf_chisq_Q", "dd"), 0, 1),
              "SciPy": lambda x, dof, what: from_scipy("chdtrc")(dof, x)}),
    # The inverses at the points of their elders, which take the lower tail.
    Function("InvNdist2026_head", "DIoe", lambda p, tail: normal_quantile(p),
             [("p in [1e-300, 0.5)", with_choice(single(logarithmic(1e-300, 0.49)), 0)),
              ("p in [0.501, 1)", with_choice(single(linear(0.501, 1 - 1e-9)), 0))],
             {"GSL": chosen(from_gsl("gsl_cdf_ugaussian_Pinv", "d"), 0), "SciPy": chosen(from_scipy("ndtri"), 0)}),
    Function("InvTdist2026_head", "DIDoe", lambda p, tail, dof: student_quantile(p, dof),
             [(t, [(p, 0, dof) for p, dof in q]) for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS[1:])],
             {"GSL": chosen(from_gsl("gsl_cdf_tdist_Pinv", "dd"), 0, 2), "SciPy": chosen(from_scipy("stdtrit"), 2, 0)}),
    Function("InvFDist2026_head", "DIDDoe", lambda p, tail, n, d: fisher_quantile(p, n, d),
             [(t, [(p, 0, n, 9.0) for p, n in q]) for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES)],
             {"GSL": chosen(from_gsl("gsl_cdf_fdist_Pinv", "ddd"), 0, 2, 3),
              "SciPy": chosen(from_scipy("fdtri"), 2, 3, 0)}),
    Function("InvChiSquare2026_head", "DIDoe", lambda p, tail, dof: chi_square_quantile(p, dof),
             [(t, [(p, 0, dof) for p, dof in q])
              for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS, [1000, 3000])],
             {"GSL": chosen(from_gsl("gsl_cdf_chisq_Pinv", "dd"), 0, 2),
              "SciPy": lambda p, tail, dof: 2 * from_scipy("gammaincinv")(dof / 2, p)}),
]
