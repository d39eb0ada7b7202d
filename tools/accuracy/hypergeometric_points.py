"""The points at which the hypergeometric functions of Gauss, Kummer and Tricomi are measured."""

import random

import mpmath

from accuracy import Function, around, from_gsl, from_scipy

PAGE = "hypergeometric.md"
TITLE = "Accuracy: the hypergeometric functions of Gauss, Kummer and Tricomi"


def boxes(n, *ranges, seed=1):
    """n points, each coordinate drawn from an interval (low, high) or from a list."""
    r = random.Random(seed)
    return [tuple(r.choice(v) if isinstance(v, list) else r.uniform(*v) for v in ranges) for _ in range(n)]


SIMPLE = [0.25, 0.5, 1.0, 1.5, 2.0, 3.0]


def gauss_box(low, high, n=80):
    return boxes(n, (low, high), (-3, 3), (-3, 3), (0.1, 4))


def with_integer(low, high, differences, n=60):
    """Points with an integer c - a - b."""
    r = random.Random(2)
    points = []
    for _ in range(n):
        a, b = r.choice([0.25, 0.5, 1.0, 1.75, 2.0]), r.choice([0.5, 1.0, 1.25, 2.5])
        c = a + b + r.choice(differences)
        if c > 0:
            points.append((r.uniform(low, high), a, b, c))
    return points


GAUSS = [("x in [-1, -0.5], |a|, |b| < 3, c in [0.1, 4]",
          gauss_box(-1, -0.5) + [(x, 0.7, 1.3, 2.25) for x in around(-0.5) + [-1.0]]),
         ("x in [-0.5, 0.2], the same", gauss_box(-0.5, 0.2) + [(x, 0.7, 1.3, 2.25) for x in around(0.2) if x < 0.2]),
         ("x in [0.2, 0.5], the same",
          gauss_box(0.2, 0.5) + [(x, 0.7, 1.3, 2.25) for x in around(0.2) if x >= 0.2]),
         ("x in [0.5, 0.99], the same", gauss_box(0.5, 0.99)),
         ("1 - x in [1e-15, 0.01], the same", [(1 - 10**-e, a, b, c) for e, a, b, c in gauss_box(2, 15)]),
         ("x = 1, c > a + b", [(1.0, a, b, max(a + b, 0) + c) for _, a, b, c in gauss_box(0, 1, 40)]),
         ("c - a - b = 0, 1, 2, x in [0.5, 0.99]", with_integer(0.5, 0.99, [0, 1, 2])),
         ("c - a - b = 0, 1, 2, x in [0.2, 0.5]", with_integer(0.2, 0.5, [0, 1, 2])),
         ("c - a - b = -1, -2, x in [0.2, 0.99]", with_integer(0.2, 0.99, [-1, -2])),
         ("c - a - b 1e-8 off an integer, x in [0.2, 0.99]",
          [(x, a, b, c + 1e-8) for x, a, b, c in with_integer(0.2, 0.99, [0, 1])]),
         ("c in [4, 12], x in [-1, 0.2]", boxes(60, (-1, 0.2), (-3, 3), (-3, 3), (4, 12))),
         ("c in [4, 12], x in [0.2, 0.5]", boxes(60, (0.2, 0.5), (-3, 3), (-3, 3), (4, 12))),
         ("c in [4, 12], x in [0.5, 0.99]", boxes(60, (0.5, 0.99), (-3, 3), (-3, 3), (4, 12))),
         ("a = 0 ... -12, x in [-1, 1]", boxes(60, (-1, 1), [-float(k) for k in range(13)], (-5, 5), (0.1, 5))),
         ("c - a = 0 ... -6, x in [-1, 0.99]", [(x, c + k, b, c) for x, k, b, c in
                                                boxes(60, (-1, 0.99), [float(k) for k in range(7)], (-3, 3), SIMPLE)]),
         ("|a|, |b| < 20, c in [-20, 20], x in [-1, 0.2]", boxes(60, (-1, 0.2), (-20, 20), (-20, 20), (-20, 20))),
         ("|a|, |b| < 100, c in [-100, 100], x in [-1, 1]", boxes(60, (-1, 1), (-100, 100), (-100, 100), (-100, 100)))]
FAR = [("x in [-100, -1], |a|, |b| < 3, c in [0.1, 4]", gauss_box(-100, -1)),
       ("x in [-100, -1], |a|, |b| < 100, c in [-100, 100]",
        boxes(60, (-100, -1), (-100, 100), (-100, 100), (-100, 100))),
       ("x in [-100, -1], b - a = 0, 1, 2",
        [(x, a, a + m, c) for x, a, m, c in boxes(60, (-100, -1), SIMPLE, [0.0, 1.0, 2.0], (0.1, 4))]),
       ("x in [-1e8, -100], |a|, |b| < 3, c in [0.1, 4]",
        [(-10**e, a, b, c) for e, a, b, c in gauss_box(2, 8)])]

KUMMER = [("x in [-1, 1], |a| < 3, b in [0.1, 5]", boxes(60, (-1, 1), (-3, 3), (0.1, 5))),
          ("x in [-10, -1], a in [0.1, 5], b in [0.1, 5]", boxes(60, (-10, -1), (0.1, 5), (0.1, 5))),
          ("x in [-25, -10], the same", boxes(60, (-25, -10), (0.1, 5), (0.1, 5))),
          ("x in [-50, -25], the same", boxes(60, (-50, -25), (0.1, 5), (0.1, 5))),
          ("x in [-1000, -50], the same", boxes(60, (-1000, -50), (0.1, 5), (0.1, 5))),
          ("x in [1, 25], the same", boxes(60, (1, 25), (0.1, 5), (0.1, 5))),
          ("x in [25, 700], the same", boxes(60, (25, 700), (0.1, 5), (0.1, 5))),
          ("x in [1, 25], a in [-5, -0.1], b in [0.1, 5]", boxes(60, (1, 25), (-5, -0.1), (0.1, 5))),
          ("x in [25, 700], the same", boxes(60, (25, 700), (-5, -0.1), (0.1, 5))),
          ("x in [-50, -1], a in [-5, -0.1], b in [0.1, 5]", boxes(60, (-50, -1), (-5, -0.1), (0.1, 5))),
          ("x in [-20, 20], |a| < 20, b in [-20, 20]", boxes(60, (-20, 20), (-20, 20), (-20, 20))),
          ("x in [-100, 100], |a|, |b| < 30", boxes(60, (-100, 100), (-30, 30), (-30, 30))),
          ("x in [-100, 100], |a|, |b| < 100", boxes(60, (-100, 100), (-100, 100), (-100, 100)))]

TRICOMI = [("x in [0, 1], |a| < 2, b in [-2, 2]", boxes(60, (0.001, 1), (-2, 2), (-2, 2))),
           ("x in [1, 3], the same", boxes(60, (1, 3), (-2, 2), (-2, 2))),
           ("x in [3, 6], the same", boxes(60, (3, 6), (-2, 2), (-2, 2))),
           ("x in [0, 3], b = 0, 1, 2, 3", boxes(60, (0.001, 3), (0.1, 2), [0.0, 1.0, 2.0, 3.0])),
           ("x in [3, 6], b = 0, 1, 2, 3", boxes(60, (3, 6), (0.1, 2), [0.0, 1.0, 2.0, 3.0])),
           ("x in [6, 8], |a| < 2, b in [-2, 2]", boxes(60, (6, 8), (-2, 2), (-2, 2)) + [(6.0, 0.5, 0.5)]),
           ("x in [8, 12], the same", boxes(60, (8, 12), (-2, 2), (-2, 2))),
           ("x in [12, 20], the same", boxes(60, (12, 20), (-2, 2), (-2, 2))),
           ("x in [20, 40], the same", boxes(60, (20, 40), (-2, 2), (-2, 2))),
           ("x in [40, 1e4], the same", boxes(60, (40, 1e4), (-2, 2), (-2, 2))),
           ("x in [0, 6], |a| < 10, b in [-10, 10]", boxes(60, (0.001, 6), (-10, 10), (-10, 10))),
           ("x in [6, 100], the same", boxes(60, (6, 100), (-10, 10), (-10, 10))),
           ("a = 0 ... -9, x in [6, 100], |b| < 5",
            boxes(60, (6, 100), [-float(k) for k in range(10)], (-5, 5))),
           ("x in [0.001, 100], |a|, |b| < 100", boxes(60, (0.001, 100), (-100, 100), (-100, 100))),
           ("the same, whole b", boxes(60, (0.001, 100), (-100, 100), [float(k) for k in range(-50, 51)]))]


def moved(function):
    """A peer with x as the last argument instead of the first."""
    return function and (lambda x, *rest: function(*rest, x))


GAUSS_PEERS = {"GSL": moved(from_gsl("gsl_sf_hyperg_2F1", "dddd")), "SciPy": moved(from_scipy("hyp2f1"))}
GAUSS_NOTE = """From x = 0.2 on, the value is the difference of two parts of magnitude x^(1-c), large where x is below 0.5
and c is large. If c - a - b is close to an integer, as many digits are lost as the two agree in. At an integer, the
limit form is summed to 1.8e-11 of 1 + |sum|, an error that the difference magnifies."""
KUMMER_NOTE = """The value comes from the first method whose error estimate is below 1.8e-11, about 8e4 eps. If there is
no such method, the series is accepted up to an estimate of 1.2e-4, even where the asymptotic form is more
accurate, which happens around x = -36; `fails` means that no method was accepted and the value is NaN."""
TRICOMI_NOTE = """The asymptotic sum begins at x = 6, where its smallest term is still large; where the terms grow from the
first one on, for |a (1 + a - b)| > x, no correct digit is left. Below 6, the difference of two values of M loses
digits as these grow, and for integer b the value is the mean of those at b - 0.0005 and b + 0.0005, by design."""

REVISION = "At the points of the elder."

FUNCTIONS = [
    Function("QX_Gauss_2011", "ddddo", lambda x, a, b, c: mpmath.hyp2f1(a, b, c, x), GAUSS, GAUSS_PEERS,
             note=GAUSS_NOTE),
    Function("QX_Gauss", "ddddo", lambda x, a, b, c: mpmath.hyp2f1(a, b, c, x),
             [GAUSS[1], GAUSS[10], GAUSS[15]], GAUSS_PEERS,
             note="The interval in which its method differs from QX_Gauss_2011: the series itself on [-0.5, 0.2)."),
    Function("QX_Gauss_2026", "ddddo", lambda x, a, b, c: mpmath.hyp2f1(a, b, c, x), GAUSS + FAR, GAUSS_PEERS,
             note="At the points of QX_Gauss_2011, and below -1."),
    Function("QX_Kummer", "dddo", lambda x, a, b: mpmath.hyp1f1(a, b, x), KUMMER,
             {"GSL": moved(from_gsl("gsl_sf_hyperg_1F1", "ddd")), "SciPy": moved(from_scipy("hyp1f1"))},
             note=KUMMER_NOTE),
    Function("QX_Kummer_2026", "dddo", lambda x, a, b: mpmath.hyp1f1(a, b, x), KUMMER,
             {"GSL": moved(from_gsl("gsl_sf_hyperg_1F1", "ddd")), "SciPy": moved(from_scipy("hyp1f1"))},
             note=REVISION),
    Function("QX_Tricomi", "dddo", lambda x, a, b: mpmath.hyperu(a, b, x), TRICOMI,
             {"GSL": moved(from_gsl("gsl_sf_hyperg_U", "ddd")), "SciPy": moved(from_scipy("hyperu"))},
             note=TRICOMI_NOTE),
    Function("QX_Tricomi_2026", "dddo", lambda x, a, b: mpmath.hyperu(a, b, x), TRICOMI,
             {"GSL": moved(from_gsl("gsl_sf_hyperg_U", "ddd")), "SciPy": moved(from_scipy("hyperu"))},
             note=REVISION),
]
