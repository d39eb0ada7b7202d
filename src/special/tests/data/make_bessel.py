#!/usr/bin/python3
"""Values by mpmath at 40 digits for special_bessel_test: export, arguments, output, value, tolerance.

The tolerance is absolute: a multiple of eps times the value or, where the function oscillates, its
modulus. Points lie on both sides of each threshold between methods.

usage: make_bessel.py > bessel.dat
"""

import mpmath
from mpmath import mpf, pi, sqrt
from reference import row, sides


def wave(order, x):
    return sqrt(2 / (pi * x)) if x > max(1, abs(order)) else 0


for x in [-50.3, -7.0, -1.0, 0.3, 1.7, 5.0, 50.0, 103.0] + list(sides(-2.09, 2.09, 8.3203353)):
    m = mpf(x)
    root = abs(m)**0.25 / sqrt(pi) if x < -1 else 0
    for i, (f, d) in enumerate([(mpmath.airyai, 0), (mpmath.airyai, 1), (mpmath.airybi, 0), (mpmath.airybi, 1)]):
        row("Airy", [x], i, f(m, derivative=d), 16, 0 if x >= -1 else (root if d else 1 / (pi * root)))

for n in (0, 1):
    for x in [1e-20, 0.1, 2.4048255576957729, 3.7, 7.1, 13.0, 100.5, 1e6] + list(sides(8, 20)):
        row("BesselJr", [n, x], 0, mpmath.besselj(n, mpf(x)), 9, wave(n, x))
        row("BesselYr", [n, x], 0, mpmath.bessely(n, mpf(x)), 17, max(wave(n, x), mpf("0.3")))
for n, x in [(2, 0.5), (5, 5.5), (30, 28), (30, 33), (150, 20), (150, 149.5), (150, 152), (199, 180),
             (107, 0.10170048004340347), (60, 1000.5)]:
    row("BesselJr", [n, x], 0, mpmath.besselj(n, mpf(x)), 5, wave(n, x))
    row("BesselYr", [n, x], 0, mpmath.bessely(n, mpf(x)), 9, wave(n, x))
for n in (200, 200.5, 1234, 1234.5):  # expansions for large order and their boundaries
    for f in [0.2, 0.97, 1.0, 1.1, 3, 40] + list(sides(0.6, 1.7)):
        x = n * f
        row("BesselJr", [n, x], 0, mpmath.besselj(mpf(n), mpf(x)), 4000, wave(n, x))
        row("BesselYr", [n, x], 0, mpmath.bessely(mpf(n), mpf(x)), 4000, wave(n, x))
for x in sides(0.3 * 200.5**2):
    row("BesselJr", [200.5, x], 0, mpmath.besselj(mpf(200.5), mpf(x)), 40, wave(200.5, x))
for v in (0.3, 2.75, 9.9, -0.3, -9.9):  # series against Hankel's form, which has 1e-12 there
    a = abs(v)
    for x in [0.01, 1.0, 8.0, 30.0, 5000.0] + list(sides((a * 0.0083 + 0.09) * a + 12.9)):
        hard = 12 < x < 25
        row("BesselJr", [v, x], 0, mpmath.besselj(mpf(v), mpf(x)), 8600 if hard else 9, wave(v, x))
        row("BesselYr", [v, x], 0, mpmath.bessely(mpf(v), mpf(x)), 5200 if hard else 26, wave(v, x))
for v, x in [(17.2, 14.0), (17.2, 15.5), (60.6, 28.0), (60.6, 28.1), (60.6, 59), (60.6, 62), (199.9, 150),
             (199.9, 230), (-60.6, 28.0), (-60.6, 28.1), (-60.6, 70), (-199.9, 100)]:
    row("BesselJr", [v, x], 0, mpmath.besselj(mpf(v), mpf(x)), 95, wave(v, x))
for n in (0, 1, 4, 40, -3):
    for x in (1e-17, 0.2, 5.0, 12.0, 45.0, 1e5):
        order = n + mpf(1) / 2
        scale = 1 / mpf(x) if x > abs(n) + 1 else 0
        row("BesselJs", [n, x], 0, sqrt(pi / (2 * mpf(x))) * mpmath.besselj(order, mpf(x)), 5, scale)
        row("BesselYs", [n, x], 0, sqrt(pi / (2 * mpf(x))) * mpmath.bessely(order, mpf(x)), 6, scale)
for v in (0, 1, -1, 7, 99, 100, 101, 0.5, 33.3, 99.9, 100.1, -0.4, -5.5, -120.3):
    for x in [1e-3, 3.0, 60.0, 500.0] + list(sides(8, 24, 40)):
        row("BesselIr", [v, x], 0, mpmath.besseli(mpf(v), mpf(x)), 180 if abs(v) < 100 else 1100)
for n in (0, 1, 2, 60, -3, 999, 1001):
    for x in [1e-6, 0.3, 40.0, 600.0] + list(sides(1, 5)):
        row("BesselKn", [n, x], 0, mpmath.besselk(n, mpf(x)), 20 if abs(n) < 900 else 5700)
for n in (0, 1, -1, 2, 6, 31, 99, 100, 260):
    for x in [0.05, 1.0, 17.0, 90.0, 300.0] + list(sides(2, 5, 40)):
        m = mpf(x)
        tolerance = 175 if n < 100 else 1600
        first = mpmath.besselj(n, m * mpmath.expjpi(mpf(3) / 4))
        second = mpmath.expjpi(-mpf(n) / 2) * mpmath.besselk(n, m * mpmath.expjpi(mpf(1) / 4))
        for i in (0, 1):
            row("KelvinI", [x, n], i, (first.real, first.imag)[i], tolerance, abs(first))
            row("KelvinK", [x, n], i, (second.real, second.imag)[i], tolerance, abs(second))
for v in (0, 1, -1, -2, 0.5, 4.4, -2.3, 60):
    for x in [0.01, 3.0, 12.0, 100.0] + list(sides(18, 30)):
        row("Struve", [x, v], 0, mpmath.struveh(mpf(v), mpf(x)), 270, wave(v, x))
for x in (-3.0, -40.0):
    for v in (0, 1):
        row("Struve", [x, v], 0, mpmath.struveh(mpf(v), mpf(x)), 4, mpf("0.05"))
row("Struve", [2.5, -3.5], 0, mpmath.struveh(mpf(-3.5), mpf(2.5)), 3)
row("Struve", [2.5, -4.5], 0, mpmath.struveh(mpf(-4.5), mpf(2.5)), 3)
for v in (0, 1, 6, 0.4, 3.3, 20.2, -0.5, -1, -9.7):
    for x in [-9.0, -6.5, -2.0, 0.0, 3.0, 6.5, 7.5, 25.0] + list(sides(1, 5)):
        scale = sqrt(mpmath.gamma(v + 1)) if v > 0 and x * x < 4 * v + 2 else 0
        row("ParabolicCylinder", [x, v], 0, mpmath.pcfd(mpf(v), mpf(x)), 150, scale)
