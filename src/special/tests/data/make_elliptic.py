#!/usr/bin/python3
"""Values by mpmath at 40 digits for special_elliptic_test, as in make_bessel.py.

usage: make_elliptic.py > elliptic.dat
"""

import mpmath
from mpmath import mpf
from reference import row, sides

for m in [0, 1e-10, 0.3, 0.9, 0.999, 1 - 2.0**-40] + list(sides(0.5)):
    for phi in (-1.0, 1e-8, 0.7, 1.5, 1.6, 3.0, -17.3):
        row("Elliptic1", [m, phi], 0, mpmath.ellipf(mpf(phi), mpf(m)), 9)
        row("Elliptic2", [m, phi], 0, mpmath.ellipe(mpf(phi), mpf(m)), 8)
    row("Elliptic1", [m, mpf("nan")], 0, mpmath.ellipk(mpf(m)), 5)
    row("Elliptic2", [m, mpf("nan")], 0, mpmath.ellipe(mpf(m)), 3)
for phi in (-1.0, 1e-8, 0.7, 1.5):  # m = 1: a logarithm whose argument is near 1 for small phi, and a sine
    row("Elliptic1", [1, phi], 0, mpmath.atanh(mpmath.sin(mpf(phi))), 5, 1)
    row("Elliptic2", [1, phi], 0, mpmath.sin(mpf(phi)), 1)
for phi in (3.0, -17.3):
    row("Elliptic2", [1, phi], 0, mpmath.ellipe(mpf(phi), 1), 1)
for m in [1e-12, 0.3, 0.99, 1 - 2.0**-33, 1 - 2.0**-27, 1] + list(sides(1e-9, 0.999999999)):
    if m > 1:
        continue
    for u in (-3.0, 0.2, 1.0, 9.0):
        for i, kind in enumerate(("sn", "cn", "dn")):
            row("EllipticJ", [u, m], i, mpmath.ellipfun(kind, mpf(u), m=mpf(m)), 17, 1)
for phi in (1e-300, -1e-17, 1e-8, 0.3, 1.2, -1.5, 1.5707963) + tuple(sides(mpmath.pi / 4)):
    row("Elliptic1_2026", [1, phi], 0, mpmath.atanh(mpmath.sin(mpf(phi))), 4)
for phi in (-1.0, 3.0, 1.6):
    row("Elliptic1_2026", [0.9, phi], 0, mpmath.ellipf(mpf(phi), mpf(0.9)), 9)
