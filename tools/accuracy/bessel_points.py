"""The points at which Bessel and related functions, elliptic, Dawson's and Fresnel integrals and zeta are measured."""

import mpmath
from mpmath import mpf, pi, sqrt

from accuracy import (Function, around, from_gsl, from_scipy, from_std, linear, logarithmic, pairs, product,
                      single)

PAGE = "bessel.md"
TITLE = "Accuracy: Bessel and related functions, elliptic, Dawson's and Fresnel integrals, zeta"


def wave(order, x):
    """The modulus of J and Y where they oscillate."""
    return sqrt(2 / (pi * x)) if x > abs(order) and x > 1 else mpf(0)


def airy_wave(power):
    return lambda x: sqrt(1 / pi) * abs(x)**power if x < -1 else mpf(0)


AIRY = [("[-1000, -2.09]", single([-x for x in logarithmic(2.09, 1000)] + around(-2.09))),
        ("[-2.09, 2.09]", single(linear(-2.09, 2.09) + around(2.09))),
        ("[2.09, 8.32]", single(linear(2.09, 8.3203353) + around(8.3203353))),
        ("[8.33, 103.8]", single(linear(8.33, 103.8))),
        ("tiny", single(logarithmic(1e-300, 1e-8, 10)))]


def airy(output, title, reference, power, gsl, scipy):
    return Function("QX_Airy", "doooo", reference, AIRY, output=output, title=title, scale=airy_wave(power),
                    peers={"GSL": from_gsl(gsl, "dm"), "SciPy": from_scipy("airy", scipy)})


INTEGER = [("n = 0, x in [0, 8]", product([0], linear(0.001, 8) + logarithmic(1e-300, 1e-3, 8))),
           ("n = 1, x in [0, 8]", product([1], linear(0.001, 8) + logarithmic(1e-300, 1e-3, 8))),
           ("n = 0, 1, x in [8, 1e4]", product([0, 1], around(8.0) + around(20.0) + logarithmic(8, 1e4))),
           ("n = 2 ... 150, x in [0.1, 300]", pairs(logarithmic(0.1, 300, 60), range(2, 151, 7))),
           ("n = 200 ... 5000, x to 3 n", [(n, n * f) for n in (200, 201, 777, 5000) for f in (0.3, 0.599, 0.601,
            0.8, 0.95, 0.999, 1, 1.001, 1.02, 1.3, 1.699, 1.701, 2.5, 3)])]
INTEGER = [(t, [(n, x) if t[4] in "01" or "200" in t else (x, n) for n, x in p]) for t, p in INTEGER]
INTEGER[3] = (INTEGER[3][0], [(n, x) for x, n in pairs(logarithmic(0.1, 300, 60), range(2, 151, 7))])

ORDERS = [0.25, 1 / 3, 0.5, 1.5, 2.75, 5.2, 9.9, 15.1]
REAL = [("v in [0.25, 15], x to 12.9", product(ORDERS, linear(0.01, 12.9, 16))),
        ("v in [0.25, 15], x in [12.9, 20]", product(ORDERS, linear(12.9, 20, 8))),
        ("v in [0.25, 15], x in [20, 1e4]", product(ORDERS, logarithmic(20, 1e4, 8))),
        ("v in [17, 200], x < v", product([17.3, 20.5, 33.4, 77.7, 150.2, 199.9], linear(1, 17, 9)) +
         [(v, v * f) for v in (20.5, 77.7, 150.2, 199.9) for f in (0.3, 0.5, 0.8, 0.95)]),
        ("v in [17, 200], x > v", [(v, v * f) for v in (20.5, 77.7, 150.2, 199.9) for f in (1.05, 1.3, 2, 5, 50)]),
        ("v in [200, 3000]", [(v, v * f) for v in (200.5, 1000.25, 3000.7) for f in (0.3, 0.6, 0.8, 0.95, 1, 1.05,
                                                                                     1.3, 1.7, 3, 20)])]
NEGATIVE = [("v in [-15, -0.25], x to 12.9", product([-v for v in ORDERS], linear(0.01, 12.9, 16))),
            ("v in [-199, -17]", product([-17.3, -33.4, -77.7, -199.4], [1, 5, 12, 20, 50, 120, 300.0]))]

BESSEL_J = {"GSL": from_gsl("gsl_sf_bessel_Jnu", "dd"), "C++": from_std("std_j", "dd"), "SciPy": from_scipy("jv")}
BESSEL_Y = {"GSL": from_gsl("gsl_sf_bessel_Ynu", "dd"), "C++": from_std("std_y", "dd"), "SciPy": from_scipy("yv")}
BESSEL_I = {"GSL": from_gsl("gsl_sf_bessel_Inu", "dd"), "C++": from_std("std_i", "dd"), "SciPy": from_scipy("iv")}


def struve(x, v):
    return mpmath.struveh(v, x)


def kelvin_scale(function):
    def scale(x, n):
        # of the pair: the modulus
        z = x * mpmath.expjpi(mpf(1) / 4)
        return abs(mpmath.besseli(n, z) if function == "i" else mpmath.besselk(n, z))
    return scale


def kelvin_i(part):
    return lambda x, n: part(mpmath.besselj(n, x * mpmath.expjpi(mpf(3) / 4)))


def kelvin_k(part):
    return lambda x, n: part(mpmath.expjpi(-n / 2) * mpmath.besselk(n, x * mpmath.expjpi(mpf(1) / 4)))


KELVIN = [("n = 0, x in [0.01, 2]", product(linear(0.01, 2, 25), [0])),
          ("n = 0, x in [2, 5]", product(around(2.0, 2) + linear(2, 5, 25), [0])),
          ("n = 0, x in [5, 60]", product(around(5.0, 2) + around(40.0, 2) + linear(5, 60, 25), [0])),
          ("n = 1 ... 99, x in [0.1, 200]", pairs(logarithmic(0.1, 200, 60), range(1, 100, 4))),
          ("n = 100 ... 1000, x in [50, 900]", pairs(linear(50, 900, 25), range(100, 1001, 90)))]

KELVIN_PEERS = {name: from_scipy(name) for name in ("ber", "bei", "ker", "kei")}


def kelvin(export, output, title, reference, scale):
    peer = KELVIN_PEERS[title]
    return Function(export, "dioo", reference, KELVIN, output=output, title=f"{export}: {title}", scale=scale,
                    peers={"SciPy": lambda x, n: peer(x) if n == 0 else float("nan")})


CYLINDER = [("v in [-10, -0.1], x in [-8, 1]", product([-0.1, -0.5, -1, -2.5, -10], linear(-8, 0.99, 8))),
            ("v in [-10, -0.1], x in [1, 5]", product([-0.1, -0.5, -1, -2.5, -10], linear(1, 5, 8))),
            ("v in [-10, -0.1], x in [5, 30]", product([-0.1, -0.5, -1, -2.5, -10], linear(5, 30, 8))),
            ("v in [0, 20], x in [-8, 1]", product([0, 0.5, 1, 3.3, 7, 20.2], linear(-8, 0.99, 8))),
            ("v in [0, 20], x in [1, 5]", product([0, 0.5, 1, 3.3, 7, 20.2], linear(1, 5, 8))),
            ("v in [0, 20], x in [5, 30]", product([0, 0.5, 1, 3.3, 7, 20.2], linear(5, 30, 8)))]

PARAMETERS = [1e-10, 0.01, 0.3, 0.5, 0.75, 0.99, 1 - 1e-9]
INCOMPLETE = [("m in [0, 0.99], |phi| <= 1.4", product(linear(-1.4, 1.4, 24), PARAMETERS[:6])),
              ("m = 0.999999999, |phi| <= 1.4", product(linear(-1.4, 1.4, 24), PARAMETERS[6:])),
              ("m in [0, 0.99], |phi| in [1.4, pi/2]", product(linear(1.4, 1.5707, 24), PARAMETERS[:6])),
              ("m in [0, 0.99], |phi| to 50", product(linear(-50, 50, 24), PARAMETERS[:6]))]
COMPLETE = [("m in [0, 0.5]", single([0] + linear(0, 0.5) + around(0.5))),
            ("m in [0.5, 1]", single(linear(0.5, 1 - 2**-53) + [1 - 10.0**-k for k in range(1, 16)]))]


def swapped(function):
    return (lambda m, phi: function(phi, m)) if function else None


def square_root(function):
    return (lambda *a: function(*a[:-1], float(mpmath.sqrt(a[-1])))) if function else None


ELLIPTIC_F = [(t, [(m, phi) for phi, m in p]) for t, p in INCOMPLETE]

JACOBI = [("m in [0.01, 0.99], |u| <= 5", product(linear(-5, 5, 25), [0.01, 0.3, 0.5, 0.9, 0.99])),
          ("m = 1e-10", product(linear(-5, 5, 20), [1e-10])),
          ("m = 1 - 1e-10, |u| <= 15", product(linear(-15, 15, 30), [1 - 1e-10])),
          ("m in [0.01, 0.99], u to 100", product(linear(5, 100, 20), [0.01, 0.5, 0.99]))]


def jacobi(output, title):
    kind = ("sn", "cn", "dn")[output]
    return Function("QX_EllipticJ", "ddoooo", lambda u, m: mpmath.ellipfun(kind, u, m=m), JACOBI, output=output,
                    title=title, scale=None if output == 2 else lambda u, m: mpf(1),
                    peers={"SciPy": from_scipy("ellipj", output)})


ZETA = [("[-30.8, 0]", single(linear(-30.8, -0.01) + [-2.0001, -1e-9])),
        ("[0, 1]", single(linear(0, 0.999) + [1 - 1e-10])),
        ("[1, 10]", single(linear(1.0001, 10) + around(10.0) + [1 + 1e-10])),
        ("[10, 50]", single(linear(10, 50) + around(50.0))),
        ("[50, 200]", single(linear(50, 200) + [127.0])), ("integers", single([0.0] + [float(k) for k in range(2, 60)]))]
DAWSON = [("[0, 3.25]", single(linear(0.001, 3.25) + logarithmic(1e-300, 1e-3, 10))),
          ("[3.25, 6.25]", single(linear(3.25, 6.25) + around(3.25))),
          ("[6.25, 1e12]", single(logarithmic(6.25, 1e12) + around(6.25) + around(1e9, 2)))]
FRESNEL = [("[0, 1.6]", single(linear(0.001, 1.6) + logarithmic(1e-100, 1e-3, 10))),
           ("[1.6, 3]", single(linear(1.6, 3) + around(1.6))),
           ("[3, 1e8]", single(logarithmic(3, 1e8) + around(3.0)))]


def dawson(x):
    if x > 30:
        return sum(mpmath.fac2(2 * k - 1) / (2 * x * x)**k for k in range(0, 60)) / (2 * x) if x < 1e5 else \
            (1 + 1 / (2 * x * x) + 3 / (4 * x**4)) / (2 * x)
    return sqrt(pi) / 2 * mpmath.exp(-x * x) * mpmath.erfi(x)


def limit(name):
    """F(phi, 1)."""
    return Function(name, "ddoi", lambda m, phi, *a: mpmath.atanh(mpmath.sin(phi)),
                    [("m = 1, phi in [1e-20, 0.78]", [(1.0, x, 0) for x in logarithmic(1e-20, 0.78)]),
                     ("m = 1, phi in [0.78, 1.57079632]", [(1.0, x, 0) for x in linear(0.78, 1.57079632)])],
                    {"GSL": lambda m, phi, *a: square_root(from_gsl("gsl_sf_ellint_F", "ddm"))(phi, m),
                     "SciPy": lambda m, phi, *a: from_scipy("ellipkinc")(phi, m)}, title=f"{name}, m = 1")


FUNCTIONS = [
    airy(0, "Ai", lambda x: mpmath.airyai(x), -0.25, "gsl_sf_airy_Ai", 0),
    airy(1, "Ai'", lambda x: mpmath.airyai(x, derivative=1), 0.25, "gsl_sf_airy_Ai_deriv", 1),
    airy(2, "Bi", lambda x: mpmath.airybi(x), -0.25, "gsl_sf_airy_Bi", 2),
    airy(3, "Bi'", lambda x: mpmath.airybi(x, derivative=1), 0.25, "gsl_sf_airy_Bi_deriv", 3),
    Function("QX_BesselJr", "ddo", mpmath.besselj, INTEGER, BESSEL_J, wave, title="QX_BesselJr, integer order"),
    Function("QX_BesselJr", "ddo", mpmath.besselj, REAL + NEGATIVE, BESSEL_J, wave, title="QX_BesselJr, real order"),
    Function("QX_BesselYr", "ddo", mpmath.bessely, INTEGER, BESSEL_Y, wave, title="QX_BesselYr, integer order"),
    Function("QX_BesselYr", "ddo", mpmath.bessely, REAL + NEGATIVE, BESSEL_Y, wave, title="QX_BesselYr, real order"),
    Function("QX_BesselJs", "ido", lambda n, x: sqrt(pi / (2 * x)) * mpmath.besselj(n + mpf(1) / 2, x),
             [("n = 0 ... 50, x in [0.01, 13]", product([0, 1, 2, 5, 12, 50], linear(0.01, 13, 10))),
              ("n = 0 ... 50, x in [13, 1e4]", product([0, 1, 2, 5, 12, 50], logarithmic(13, 1e4, 10)))],
             {"GSL": from_gsl("gsl_sf_bessel_jl", "id"), "C++": from_std("std_sph_j", "id"),
              "SciPy": from_scipy("spherical_jn")}, lambda n, x: 1 / x if x > n + 1 else mpf(0)),
    Function("QX_BesselYs", "ido", lambda n, x: sqrt(pi / (2 * x)) * mpmath.bessely(n + mpf(1) / 2, x),
             [("n = 0 ... 50, x in [0.01, 13]", product([0, 1, 2, 5, 12, 50], linear(0.01, 13, 10))),
              ("n = 0 ... 50, x in [13, 1e4]", product([0, 1, 2, 5, 12, 50], logarithmic(13, 1e4, 10)))],
             {"GSL": from_gsl("gsl_sf_bessel_yl", "id"), "C++": from_std("std_sph_y", "id"),
              "SciPy": from_scipy("spherical_yn")}, lambda n, x: 1 / x if x > n + 1 else mpf(0)),
    Function("QX_BesselIr", "ddo", mpmath.besseli,
             [("n = 0, 1, x in [0, 700]", product([0, 1], logarithmic(1e-5, 700) + around(8.0, 2) + around(24.0, 2))),
              ("n = 2 ... 99, x to 700", pairs(range(2, 100, 3), logarithmic(0.1, 700))),
              ("v in [0.25, 99.9], x to 700", pairs([0.25, 0.5, 1.5, 7.7, 33.3, 99.9], logarithmic(0.1, 700, 25)) +
               product([0.25, 2.5, 8.8], [10, 39, 41, 100, 500])),
              ("v in [-99.9, -0.25]", product([-0.25, -0.5, -7.7, -33.3, -99.9], [0.5, 3, 10, 30, 80, 300])),
              ("v in [100, 1000]", product([100, 100.5, 250, 1000.3], [20, 100, 300, 600]))], BESSEL_I),
    Function("QX_BesselKn", "ido", mpmath.besselk,
             [("n = 0, 1, x in [0, 700]", product([0, 1], logarithmic(1e-5, 700) + around(1.0, 2) + around(5.0, 2))),
              ("n = 2 ... 100", pairs(range(2, 101, 3), logarithmic(0.1, 700))),
              ("n = 1000, 1001, 5000", product([1000, 1001, 5000], [400, 1000, 1400]))],
             {"GSL": from_gsl("gsl_sf_bessel_Kn", "id"), "C++": from_std("std_k", "dd"), "SciPy": from_scipy("kn")}),
    kelvin("QX_KelvinI", 0, "ber", kelvin_i(mpmath.re), kelvin_scale("i")),
    kelvin("QX_KelvinI", 1, "bei", kelvin_i(mpmath.im), kelvin_scale("i")),
    kelvin("QX_KelvinK", 0, "ker", kelvin_k(mpmath.re), kelvin_scale("k")),
    kelvin("QX_KelvinK", 1, "kei", kelvin_k(mpmath.im), kelvin_scale("k")),
    Function("QX_Struve", "ddo", struve,
             [("v in [-3.2, 10], x in [0, 18]", product(linear(0.01, 18, 12), [-3.2, -1, 0, 0.5, 1, 4.4, 10])),
              ("v in [-3.2, 10], x in [18, 30]", product(linear(18.01, 30, 12), [-3.2, -1, 0, 0.5, 1, 4.4, 10])),
              ("v in [-3.2, 10], x in [30, 1000]", product(logarithmic(30.01, 1000, 12), [-3.2, -1, 0, 0.5, 1, 4.4, 10])),
              ("v in [30, 150], x to 2 v", [(v * f, v) for v in (30, 77.7, 150) for f in (0.1, 0.5, 1, 1.4, 1.6, 2)])],
             {"SciPy": lambda x, v: from_scipy("struve")(v, x)},
             lambda x, v: sqrt(2 / (pi * x)) if x > abs(v) else mpf(0)),
    Function("QX_ParabolicCylinder", "ddo", lambda x, v: mpmath.pcfd(v, x), CYLINDER,
             {"SciPy": lambda x, v: from_scipy("pbdv", 0)(v, x)},
             lambda x, v: sqrt(mpmath.gamma(v + 1)) / 2 if v > 0 and x * x < 4 * v + 2 else mpf(0)),
    Function("QX_Elliptic1_85", "ddo1".replace("1", "i"), lambda m, *a: mpmath.ellipk(m),
             [(t, [(m, 0.0, 1) for m, in p]) for t, p in COMPLETE],
             {"GSL": square_root(from_gsl("gsl_sf_ellint_Kcomp", "dm")) and
              (lambda m, *a: square_root(from_gsl("gsl_sf_ellint_Kcomp", "dm"))(m)),
              "C++": lambda m, *a: from_std("std_ellint_k", "d")(m),
              "SciPy": lambda m, *a: from_scipy("ellipk")(m)}, title="QX_Elliptic1, complete"),
    Function("QX_Elliptic1", "ddo", lambda m, phi: mpmath.ellipf(phi, m), ELLIPTIC_F,
             {"GSL": swapped(square_root(from_gsl("gsl_sf_ellint_F", "ddm"))),
              "C++": swapped(from_std("std_ellint_f", "dd")), "SciPy": swapped(from_scipy("ellipkinc"))},
             title="QX_Elliptic1, incomplete"),
    limit("QX_Elliptic1_85"), limit("QX_Elliptic1_2026"),
    Function("QX_Elliptic2_85", "ddoi", lambda m, *a: mpmath.ellipe(m),
             [(t, [(m, 0.0, 1) for m, in p]) for t, p in COMPLETE],
             {"GSL": lambda m, *a: square_root(from_gsl("gsl_sf_ellint_Ecomp", "dm"))(m),
              "C++": lambda m, *a: from_std("std_ellint_e", "d")(m),
              "SciPy": lambda m, *a: from_scipy("ellipe")(m)}, title="QX_Elliptic2, complete"),
    Function("QX_Elliptic2", "ddo", lambda m, phi: mpmath.ellipe(phi, m), ELLIPTIC_F,
             {"GSL": swapped(square_root(from_gsl("gsl_sf_ellint_E", "ddm"))),
              "C++": swapped(from_std("std_ellint_e2", "dd")), "SciPy": swapped(from_scipy("ellipeinc"))},
             title="QX_Elliptic2, incomplete"),
    jacobi(0, "QX_EllipticJ: sn"), jacobi(1, "QX_EllipticJ: cn"), jacobi(2, "QX_EllipticJ: dn"),
    Function("QX_Dawson", "do", dawson, DAWSON, {"GSL": from_gsl("gsl_sf_dawson", "d"), "SciPy": from_scipy("dawsn")}),
    Function("QX_FresnelIntegrals", "doo", mpmath.fresnelc, FRESNEL, {"SciPy": from_scipy("fresnel", 1)}, output=0,
             title="QX_FresnelIntegrals: C"),
    Function("QX_FresnelIntegrals", "doo", mpmath.fresnels, FRESNEL, {"SciPy": from_scipy("fresnel", 0)}, output=1,
             title="QX_FresnelIntegrals: S"),
    Function("QX_Zeta", "do", mpmath.zeta, ZETA, {"GSL": from_gsl("gsl_sf_zeta", "d"), "C++": from_std("std_zeta", "d"),
                                                  "SciPy": lambda x: from_scipy("zeta")(x) if x > 1 else float("nan")}),
]
