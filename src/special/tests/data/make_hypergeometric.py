#!/usr/bin/python3
"""Values by mpmath at 40 digits for special_hypergeometric_test.

usage: make_hypergeometric.py > hypergeometric.dat
"""

import random

import mpmath
from mpmath import mpf
from reference import row, sides


def gauss(x, a, b, c, tolerance, names=("Gauss", "Gauss_2011"), scale=0):
    value = mpmath.hyp2f1(mpf(a), mpf(b), mpf(c), mpf(x))
    for name in names:
        row(name, [x, a, b, c], 0, value, tolerance, scale)


def kummer(x, a, b, tolerance):
    row("Kummer", [x, a, b], 0, mpmath.hyp1f1(mpf(a), mpf(b), mpf(x)), tolerance)


def tricomi(x, a, b, tolerance):
    row("Tricomi", [x, a, b], 0, mpmath.hyperu(mpf(a), mpf(b), mpf(x)), tolerance)


# Pfaff's form, the series itself, the connection formula; c is moderate, because of the cancellation below 0.5.
for a, b, c in [(0.7, 1.3, 2.25), (-0.6, 2.2, 0.9), (1.5, -2.3, -1.4), (0.25, 0.5, 3.1), (3.2, 1.7, 1.05),
                (-0.4, -1.7, 0.6)]:
    for x in [-1.0, -0.75, -0.2, 0.0, 1e-300, 0.1] + list(sides(-0.5)):
        gauss(x, a, b, c, 40)
    for x in [0.4, 0.7, 0.95, 1 - 2.0**-30] + list(sides(0.2, 0.5)):
        gauss(x, a, b, c, 4000 if x < 0.3 else 180)
for x in (-0.5, -0.1, 0.1):  # where the terms grow again after the poles
    gauss(x, 5.3, 7.2, -40.5, 400)
gauss(-0.9, 30.5, 22.25, -41.5, 4000)
gauss(0.15, 1000.25, 1e-18, 2.5, 4000)  # terms that begin below the tolerance and grow

# c - a - b an integer: summed to 1.8e-11, which the cancellation of the two sums multiplies.
for m in range(-4, 5):
    for x in (0.25, 0.6, 0.95, 1 - 2.0**-40):
        gauss(x, 0.7, 1.25, 0.7 + 1.25 + m, 3e6 if x < 0.5 else 3.5e5)
        gauss(x, 1, 2, 3 + m, 3e6 if x < 0.5 else 3.5e5) if m > -3 else None
gauss(0.75, 0.5, 0.5, 1 + 1e-9, 3.4e6)  # the limit form next to the integer
gauss(0.75, 0.5, 0.5, 1 + 1e-8, 9e7)  # the connection next to its poles
gauss(0.75, 0.5, 0.5, 1 + 3.5e-8, 3.3e7)

# Series that terminate: through a or b, with c a lower negative integer, after Euler's transformation.
for x in (-1.0, -0.6, 0.3, 0.9, 0.999):
    gauss(x, -5, 2.2, 0.3, 40)
    gauss(x, 1.7, -7, -9, 40)
    gauss(x, -3, -8, -5, 40)
    gauss(x, -20, 21, 1, 40)  # Legendre's polynomial of degree 20, where the terms reach 1e14
    gauss(x, 3.5, 0.75, 0.5, 40)
    gauss(x, 0.3, 6.25, 2.25, 40)
    gauss(x, 2.5, 1.25, 2.5, 8)
    gauss(x, 1.25, 40, 1.25, 40)
gauss(0.3, 900.25, 2.5, 2.5, 20)  # a power that multiplies the rounding of 1 - x
gauss(1.0, -5, 2.2, 0.3, 40)
for a, b, c in [(0.7, 1.3, 2.25), (0.5, 0.5, 3), (-0.6, 2.2, 1.9), (-20.5, 33.25, 60.5), (130.5, 140.25, 400.0),
                (71.25, -90.5, 2.75), (2.75, 0.25, 60.5)]:
    gauss(1.0, a, b, c, 4000 if c > 300 else 400)

# The Bessel functions: small and large arguments, orders that are integers or not, negative orders.
for x, a, b in [(1.5, -1.3, 2.2), (-3, 2.3, 1.1), (-3, 2.3, -1.1), (20, -30, 5.5), (-8, 3.25, 6), (12, -4, 2),
                (-25, 7.5, 3), (1e-3, -0.5, 0.5), (40, -25.5, 2), (-0.01, 50, 1.5), (9, -60.25, 12.5), (60, -100.5, 2.25)]:
    kummer(x, a, b, 1400)
# Series of one sign, with cancellation, with terms that grow again after the poles.
for x, a, b in [(0.5, 0.7, 1.3), (10, 2.5, 0.25), (60, 3, 7), (300, 1.5, 2.5), (-2, -3.5, 1.25), (5, 1.5, -20.5),
                (1e-200, 3, 2), (13, 1.3, -60.5)]:
    kummer(x, a, b, 13)
for x, a, b in [(-9, 1.5, 3), (-20, 0.5, 4.25), (-30, 2.25, 7.5), (-25, -0.5, 1), (-35, 1, 9), (-40, -7.5, 0.3)]:
    kummer(x, a, b, 12)
kummer(50.0, -3 - 2.0**-50, 2, 11)  # one term almost vanishes, the later ones dominate
# The asymptotic form, on both sides.
for x, a, b in [(-90, 0.5, 4.25), (-300, 1.5, 4), (-1e5, 2.25, 9.5), (-1e5, -1.5, 2), (-400, -3.25, 0.5),
                (-1e300, 0.5, 2.25), (690, 4.25, 1.5), (680, -17.25, 17.5),
                (-237.25, 2, 0.5)]:
    kummer(x, a, b, 210)
# Sums that terminate.
for x, a, b in [(3, -2, -5), (-50, -6, 0.5), (7.5, -1, 4), (-2, -4, -7)]:
    kummer(x, a, b, 5)

for a, b in [(0.7, 0.3), (1.5, -1.25), (-2.3, 0.6), (2.2, 1.7), (3, 2.5), (-3, 0.25)]:
    for x in (1e-10, 0.1, 1, 3, 5.9):
        tricomi(x, a, b, 21 if x < 1 else 550 if x < 2 else 1.2e7)
    for x in [30, 80, 1e5]:
        tricomi(x, a, b, 110 if x < 50 else 5)
for a, b in [(0.7, 0.3), (0.5, 1.25), (-0.3, 0.4), (1, 2)]:
    for x, tolerance in [(6.0, 8e9), (7.5, 1.4e9), (12.0, 4.2e6)]:
        tricomi(x, a, b, tolerance)
for a, b in [(-4, 0.5), (-9, 2.25), (0.5, 4.5), (2.25, 7.25)]:  # sums that terminate
    for x in (6.0, 9.0, 40.0):
        tricomi(x, a, b, 2000)
for a, b in [(0.7, 1), (1.5, 2), (0.25, 3), (0.3, 0), (1.25, -2)]:  # the mean next to an integer
    for x in (0.5, 2.0, 4.0):
        tricomi(x, a, b, 3.3e9)

# The revisions over their regions, with typical arguments: integers, half-integers and others; then integer
# differences, the neighbours of thresholds, and sums that lose hundreds of digits to cancellation.
random_ = random.Random(2026)


def parameter(size):
    x = random_.uniform(-size, size)
    return random_.choice((x, x, float(round(x)), round(2 * x) / 2))


def is_pole(b):
    return b <= 0 and b == round(b)


for size in [2.0] * 8 + [10.0] * 10 + [100.0] * 20:
    a, b, c = (parameter(size) for _ in range(3))
    for x in (random_.uniform(-100, 100), random_.uniform(-2, 2)):
        if not is_pole(b):
            row("Kummer_2026", [x, a, b], 0, mpmath.hyp1f1(mpf(a), mpf(b), mpf(x)), 200)
        row("Tricomi_2026", [abs(x), a, b], 0, mpmath.hyperu(mpf(a), mpf(b), mpf(abs(x))), 2000)
    for x in (random_.uniform(-1, 1), random_.uniform(-100, -1), 1 - 10**random_.uniform(-6, -1)):
        if not is_pole(c):
            gauss(x, a, b, c, 500, ["Gauss_2026"])
for x, a, b in [(x, 30.25, 12.5) for x in sides(30, -30)] + [(-95, 99.5, 3), (60, -95.25, 2.5), (-3, -2, -7),
                                                             (0.5, 40, -60.5), (-1e4, 2.5, 7), (300, 40, -9.75),
                                                             # asymptotic sums that pass through 0
                                                             (63, 3, 34.5), (52, -4, 10), (-36, 7, 1)]:
    row("Kummer_2026", [x, a, b], 0, mpmath.hyp1f1(mpf(a), mpf(b), mpf(x)), 200)
for x, a, b in [(x, a, b) for x in sides(1) for a in (0.75, -8.5) for b in (1, 2.25, -3)] + [
        (0.01, 60, 2), (3, 90, 80.5), (3, -64, 57.5), (1e-6, 0.5, 1), (50, -90.5, 20), (0.2, -80.25, 95), (12, -40, 60),
        (0.3, 2.5, 3 + 2.0**-40), (5.25, -66.5 - 2.0**-14, -56.5),
        (0.25, -98.5, -1), (0.93, -78, -1.6)]:
    row("Tricomi_2026", [x, a, b], 0, mpmath.hyperu(mpf(a), mpf(b), mpf(x)), 2000)
for x, a, b, c in [(x, 0.75, 1.5, c) for x in sides(0.9, -9, 0.4, -0.5, -0.95) for c in (2.25, 4.5)] + [
        (0.95, 0.7, 1.25, 1.95 + 2.0**-40), (-50, 1.5, 3.5, 40), (-1e8, 0.5, 2.5, 1.25), (0.5, -60, 61, 1),
        (-70, 11, 12, 39), (0.85, -71.5, 98.25, 11.5), (-3, -5, 2.5, -9), (-200, -40, 7.5, 2.5), (0.3, 6.5, 2, 2.5),
        (1, 0.5, -1.25, 3), (0.9992, -79, 14, 2),
        (-9.25, 2.5, -4.5, -2 - 2.0**-16)]:
    gauss(x, a, b, c, 500, ["Gauss_2026"])
