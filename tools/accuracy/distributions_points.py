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

NORMAL_ROWS = [("[-8, 0]", single(linear(-8, 0))), ("[0, 8]", single(linear(0, 8)))]
T_ROWS = [*rows("t in [-40, -3]", TAILS), *rows("|t| in [0.001, 3]", linear(-3, 3, 8) + [-1e-3]),
          ("|t| = 1e-6", product([-1e-6, 1e-6], DOFS))]
F_ROWS = [(t, two(p)) for t, p in rows("f in [0.01, 1]", logarithmic(0.01, 1, 6)) +
          rows("f in [1, 50]", logarithmic(1, 50, 6))]
CHI_ROWS = [(t, [(x * d, d) for x, d in p]) for t, p in rows("x in [0.1, 0.8] dof", [0.1, 0.3, 0.5, 0.8]) +
            rows("x in [0.8, 1.2] dof", [0.9, 0.99, 1.0, 1.01, 1.1]) + rows("x in [1.2, 5] dof", [1.2, 2, 5])]

FUNCTIONS = [
    Function("NormDist_head", "Do", normal, NORMAL_ROWS,
             OF_X, 1, note=LOW_PRECISION.format("the error is 1e-5, or 4.5e10 eps")),
    Function("TDist_head", "DIoe", student, T_ROWS,
             {"GSL": from_gsl("gsl_cdf_tdist_P", "dd"), "SciPy": peer(from_scipy("stdtr"), 1, 0)},
             note="Computed from dof / (t^2 + dof), which approaches 1 for small t and loses the digits of t^2."),
    Function("FDist_head", "DIIoe", fisher, F_ROWS,
             {"GSL": from_gsl("gsl_cdf_fdist_P", "ddd"), "SciPy": peer(from_scipy("fdtr"), 1, 2, 0)},
             note="Computed as 1 minus the upper tail: small probabilities have the absolute error of those near 1."),
    Function("ChiSquare_head", "DIoe", chi_square, CHI_ROWS,
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
def far(function, digits=400):
    """A function evaluated with the digits that a complement of 1e-320 needs."""
    def value(*arguments):
        with mp.workdps(digits):
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


def lower_chi_square(x, dof):
    a, x = dof / 2, x / 2
    slope = mpmath.exp(a * mpmath.log(x) - x - mpmath.loggamma(a))
    return slope * series(1 / a, lambda k: x / (a + k + 1))


def lower_fisher(f, n, d):
    return lower_beta(n / 2, d / 2, n * f / (n * f + d), d / (n * f + d))


def upper_student(t, dof):
    tail = lower_beta(dof / 2, mpf(1) / 2, dof / (dof + t * t), t * t / (dof + t * t)) / 2
    return 1 - tail if t < 0 else tail


def student_density(t, dof):
    return (mpmath.exp(mpmath.loggamma((dof + 1) / 2) - mpmath.loggamma(dof / 2)) / mpmath.sqrt(dof * mpmath.pi) *
            (1 + t * t / dof)**(-(dof + 1) / 2))


def fisher_density(f, n, d):
    return ((n * f / (n * f + d))**(n / 2) * (d / (n * f + d))**(d / 2) / f *
            mpmath.exp(mpmath.loggamma((n + d) / 2) - mpmath.loggamma(n / 2) - mpmath.loggamma(d / 2)))


def chi_square_density(x, dof):
    return mpmath.exp((dof / 2 - 1) * mpmath.log(x / 2) - x / 2 - mpmath.loggamma(dof / 2)) / 2


REAL = [0.3, 1.0, 2.5, 7.0, 30.0, 400.0]


def chosen(peer_function, *order):
    """A peer without the last argument, which selects the value, or with its arguments in another order."""
    return peer_function and (lambda *a: peer_function(*[a[k] for k in order]))


def negative(peer_function, *order, sign=1):
    """sign times a peer at minus its last argument, of those in the given order."""
    return peer_function and (lambda *a: sign * peer_function(*[a[k] for k in order[:-1]], -a[order[-1]]))


def from_stats(distribution, method):
    """A method of a distribution of scipy.stats, without the argument that selects the value."""
    try:
        from scipy import stats
    except ImportError:
        return None
    entry = getattr(getattr(stats, distribution), method)
    return lambda x, *more: float(entry(x, *more[:-1]))


def with_choice(points, choice):
    return [(*point, choice) for point in points]


T_POINTS = product([0.001, 0.4, 2.0, 9.0, 60.0], REAL)
F_POINTS = [(f, n, d) for f in (1e-9, 0.01, 0.4, 1.1, 3.0, 60.0) for n in REAL for d in (0.5, 4.0, 90.0)]
CHI_POINTS = [(float(x * d), d) for d in REAL for x in (1e-3, 0.3, 0.9, 1.2, 2.0, 3.0)] + [(900.0, 3.0)]
WHAT = ("probability", "survival", "logarithm of the probability", "logarithm of the survival", "density")


def choices(name, signature, lower, upper, density, elder_rows, more, peers):
    """The five values of a revision: the parts at the points of the elder and at more points, the others at these."""
    references = (lower, upper, lambda *a: mpmath.log(lower(*a)), lambda *a: mpmath.log(upper(*a)), density)
    return [Function(name, signature, far(lambda *a, value=value: value(*a[:-1])),
                     [(t, with_choice(p, what)) for t, p in (elder_rows if what < 2 else []) + more],
                     {"GSL": gsl, "SciPy": scipy}, title=f"{name}, {word}")
            for what, (word, value, (gsl, scipy)) in enumerate(zip(WHAT, references, peers))]


FUNCTIONS += choices(
    "NormDist2026_head", "DIoe", lambda x: mpmath.erfc(-x / mpmath.sqrt(2)) / 2,
    lambda x: mpmath.erfc(x / mpmath.sqrt(2)) / 2, lambda x: mpmath.exp(-x * x / 2) / mpmath.sqrt(2 * mpmath.pi),
    NORMAL_ROWS, [("x in [-37, -3]", single(linear(-37, -3))), ("x in [-3, 38]", single(linear(-3, 38)))],
    [(chosen(from_gsl("gsl_cdf_ugaussian_P", "d"), 0), chosen(from_scipy("ndtr"), 0)),
     (chosen(from_gsl("gsl_cdf_ugaussian_Q", "d"), 0), negative(from_scipy("ndtr"), 0)),
     (None, chosen(from_scipy("log_ndtr"), 0)), (None, negative(from_scipy("log_ndtr"), 0)),
     (chosen(from_gsl("gsl_ran_ugaussian_pdf", "d"), 0), from_stats("norm", "pdf"))])
FUNCTIONS += choices(
    "TDist2026_head", "DDIoe", lambda t, dof: upper_student(-t, dof), upper_student, student_density,
    T_ROWS, [("t in [0.001, 60], 0.3 to 400 degrees", T_POINTS)],
    [(chosen(from_gsl("gsl_cdf_tdist_P", "dd"), 0, 1), chosen(from_scipy("stdtr"), 1, 0)),
     (chosen(from_gsl("gsl_cdf_tdist_Q", "dd"), 0, 1), negative(from_scipy("stdtr"), 1, 0)),
     (None, from_stats("t", "logcdf")), (None, from_stats("t", "logsf")),
     (chosen(from_gsl("gsl_ran_tdist_pdf", "dd"), 0, 1), from_stats("t", "pdf"))])
FUNCTIONS += choices(
    "FDist2026_head", "DDDIoe", lower_fisher, lambda f, n, d: 1 - lower_fisher(f, n, d), fisher_density,
    F_ROWS, [("f in [1e-9, 60], 0.3 to 400 degrees", F_POINTS)],
    [(chosen(from_gsl("gsl_cdf_fdist_P", "ddd"), 0, 1, 2), chosen(from_scipy("fdtr"), 1, 2, 0)),
     (chosen(from_gsl("gsl_cdf_fdist_Q", "ddd"), 0, 1, 2), chosen(from_scipy("fdtrc"), 1, 2, 0)),
     (None, from_stats("f", "logcdf")), (None, from_stats("f", "logsf")),
     (chosen(from_gsl("gsl_ran_fdist_pdf", "ddd"), 0, 1, 2), from_stats("f", "pdf"))])
FUNCTIONS += choices(
    "ChiSquare2026_head", "DDIoe", lower_chi_square, lambda x, dof: 1 - lower_chi_square(x, dof), chi_square_density,
    CHI_ROWS, [("x in [0.001, 3] dof, 0.3 to 400 degrees", CHI_POINTS)],
    [(chosen(from_gsl("gsl_cdf_chisq_P", "dd"), 0, 1), chosen(from_scipy("chdtr"), 1, 0)),
     (chosen(from_gsl("gsl_cdf_chisq_Q", "dd"), 0, 1), chosen(from_scipy("chdtrc"), 1, 0)),
     (None, from_stats("chi2", "logcdf")), (None, from_stats("chi2", "logsf")),
     (chosen(from_gsl("gsl_ran_chisq_pdf", "dd"), 0, 1), from_stats("chi2", "pdf"))])


# The inverses at the points of their elders, which take the lower tail, and in the other tail.
TAIL = [1e-30, 1e-12, 1e-4, 0.01, 0.2, 0.45, 0.77, 0.95]


def fisher_point(p, n, d):
    """The point above which the probability is p."""
    return root(lambda f: 1 - far(lambda *a: 1 - lower_fisher(*a), 100)(f, n, d) / p, mpf("1e-12"), mpf("1e9"))


def chi_square_point(p, dof):
    return root(lambda x: 1 - far(lambda *a: 1 - lower_chi_square(*a), 100)(x, dof) / p, mpf("1e-12"), 5 * dof + 500)


FUNCTIONS += [
    Function("InvNdist2026_head", "DIoe", lambda p, tail: normal_quantile(p),
             [("p in [1e-300, 0.5)", with_choice(single(logarithmic(1e-300, 0.49)), 0)),
              ("p in [0.501, 1)", with_choice(single(linear(0.501, 1 - 1e-9)), 0))],
             {"GSL": chosen(from_gsl("gsl_cdf_ugaussian_Pinv", "d"), 0), "SciPy": chosen(from_scipy("ndtri"), 0)}),
    Function("InvNdist2026_head", "DIoe", lambda p, tail: -normal_quantile(p),
             [("p in [1e-300, 0.5)", with_choice(single(logarithmic(1e-300, 0.49)), 1)),
              ("p in [0.501, 1)", with_choice(single(linear(0.501, 1 - 1e-9)), 1))],
             {"GSL": chosen(from_gsl("gsl_cdf_ugaussian_Qinv", "d"), 0),
              "SciPy": lambda p, tail: -from_scipy("ndtri")(p)}, title="InvNdist2026_head, upper tail"),
    Function("InvTdist2026_head", "DIDoe", lambda p, tail, dof: student_quantile(p, dof),
             [(t, [(p, 0, dof) for p, dof in q]) for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS[1:])],
             {"GSL": chosen(from_gsl("gsl_cdf_tdist_Pinv", "dd"), 0, 2), "SciPy": chosen(from_scipy("stdtrit"), 2, 0)}),
    Function("InvTdist2026_head", "DIDoe", lambda p, tail, dof: -student_quantile(p, dof),
             [(t, [(p, 1, dof) for p, dof in q]) for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS[1:])],
             {"GSL": chosen(from_gsl("gsl_cdf_tdist_Qinv", "dd"), 0, 2),
              "SciPy": lambda p, tail, dof: -from_scipy("stdtrit")(dof, p)}, title="InvTdist2026_head, upper tail"),
    Function("InvFDist2026_head", "DIDDoe", lambda p, tail, n, d: fisher_quantile(p, n, d),
             [(t, [(p, 0, n, 9.0) for p, n in q]) for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES)],
             {"GSL": chosen(from_gsl("gsl_cdf_fdist_Pinv", "ddd"), 0, 2, 3),
              "SciPy": chosen(from_scipy("fdtri"), 2, 3, 0)}),
    Function("InvFDist2026_head", "DIDDoe", lambda p, tail, n, d: fisher_point(p, n, d),
             [(t, [(p, 1, n, 9.0) for p, n in q]) for t, q in rows("p in [1e-30, 0.95]", TAIL)],
             {"GSL": chosen(from_gsl("gsl_cdf_fdist_Qinv", "ddd"), 0, 2, 3),
              "SciPy": chosen(from_stats("f", "isf"), 0, 2, 3, 1)}, title="InvFDist2026_head, upper tail"),
    Function("InvChiSquare2026_head", "DIDoe", lambda p, tail, dof: chi_square_quantile(p, dof),
             [(t, [(p, 0, dof) for p, dof in q])
              for t, q in rows("p in [1e-4, 0.999]", PROBABILITIES, DOFS, [1000, 3000])],
             {"GSL": chosen(from_gsl("gsl_cdf_chisq_Pinv", "dd"), 0, 2),
              "SciPy": lambda p, tail, dof: 2 * from_scipy("gammaincinv")(dof / 2, p)}),
    Function("InvChiSquare2026_head", "DIDoe", lambda p, tail, dof: chi_square_point(p, dof),
             [(t, [(p, 1, dof) for p, dof in q]) for t, q in rows("p in [1e-30, 0.95]", TAIL, DOFS, [1000, 3000])],
             {"GSL": chosen(from_gsl("gsl_cdf_chisq_Qinv", "dd"), 0, 2), "SciPy": chosen(from_scipy("chdtri"), 2, 0)},
             title="InvChiSquare2026_head, upper tail"),
]
