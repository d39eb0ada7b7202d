#!/usr/bin/python3
"""Values by mpmath at 40 digits for special_integrals_test. usage: make_integrals.py > integrals.dat"""

import mpmath
from mpmath import mpf
from reference import row, sides


def exponential(n, x):
    """E_n(x). mpmath's own function silently loses digits at large n and x (8 digits at 100, 100)."""
    if x <= 1 or n == 0:
        return mpmath.expint(n, x)
    tail = mpf(0)
    for k in range(1000, 0, -1):
        tail = k * (n + k - 1) / (x + n + 2 * k - tail)
    return mpmath.exp(-x) / (x + n - tail)


ORDINARY = [1e-300, 1e-20, 1e-5, 0.1, 0.5, 0.75]

for x in ORDINARY + [0.9, 1.5, 3.0, 5.9] + list(sides(1)):
    for s in (1, -1):
        row("Erf", [s * x], 0, mpmath.erf(mpf(s * x)), 4)
for x in ORDINARY + [2.0, 4.5, 9.5, 11.0, 20.3, 25.0, 26.0] + list(sides(1, 8)):
    row("ErfC", [x], 0, mpmath.erfc(mpf(x)), 8)
    row("ErfC", [-x], 0, mpmath.erfc(mpf(-x)), 4)

for n in (0, 1, 2, 3, 7, 20, 100, 169, 170, 171, 1000, 5000, 5001, 100000):
    for x in [1e-300, 1e-9, 0.01, 0.5, 0.99, 3.0, 20.0, 100.0, 500.0] + list(sides(1)):
        if n == 0 and x < 1e-280:
            continue
        # exp(-x) of the rounded argument is exact enough; the series loses a few digits to cancellation below 1
        row("ExpI", [x, n], 0, exponential(n, mpf(x)), 12)

for x in ORDINARY + [0.2, 1.3, 3.0, 5.5, 30.0, 400.0, 705.0] + list(sides(0.4, 2, 10)):
    row("ExpI2026", [x, 1], 0, mpmath.e1(mpf(x)), 4)

for x in ORDINARY + [1.9264476603173705, 2.0, 3.0, 5.0, 7.5, 12.0, 100.0, 12345.5, 1e8, 1e22, 1e120] + list(
        sides(4, 8)):
    m = mpf(x)
    # Ci oscillates with the modulus 1 / x; its zeros below 4 lie at 0.617 and 3.384
    row("CosI", [x], 0, mpmath.ci(m) if x < 1e10 else mpmath.sin(m) / m, 8, 1 / m if x > 4 else mpf("0.5"))
    row("CosI", [-x], 0, mpmath.ci(m) if x < 1e10 else mpmath.sin(m) / m, 8, 1 / m if x > 4 else mpf("0.5"))
    for s in (1, -1):
        row("SinI", [s * x], 0, s * mpmath.si(m) if x < 1e20 else s * mpmath.pi / 2, 4)
for x in (0.6165054856207162, 3.384180422551187):
    row("CosI", [x], 0, mpmath.ci(mpf(x)), 8, 0.5)

for x in ORDINARY + [0.5238225713898644, 1.0, 4.0, 7.5, 10.0, 15.0, 25.0, 60.0, 90.0, 300.0, 690.0, 705.0, 715.0] + list(
        sides(8, 18, 88)):
    m = mpf(x)
    for s in (1, -1):
        row("SinhI", [s * x], 0, s * mpmath.shi(m), 6)
        row("CoshI", [s * x], 0, mpmath.re(mpmath.chi(m)), 12, 1 if x < 1 else 0)  # a zero at 0.524

for x in ORDINARY + [1e-10, 0.25, 0.497829450764894, 0.5064019646879256, 1 - 2.0**-30, 1 + 2.0**-30, 1.25, 1.75,
                     3.0, 100.0, 1e9, 1e200] + list(sides(0.5, 1, 1.5, 2)):
    row("Diln", [x], 0, mpmath.polylog(2, 1 - mpf(x)), 4)

for x in [1e-200, 0.5, 0.92, 2.0, 5.0, 20.0, 60.0] + list(sides(3.25, 6.25)):
    row("Dawson", [x], 0, mpmath.sqrt(mpmath.pi) / 2 * mpmath.exp(-mpf(x)**2) * mpmath.erfi(mpf(x)), 4)
for x in [1e-50, 0.4, 1.0, -2.2, 17.3, 123456.75] + list(sides(1.6, 3)):
    row("FresnelIntegrals", [x], 0, mpmath.fresnelc(mpf(x)), 4)
    row("FresnelIntegrals", [x], 1, mpmath.fresnels(mpf(x)), 3)
