#!/usr/bin/python3
"""Values by mpmath at 40 digits for special_gamma_test. usage: make_gamma.py > gamma.dat"""

import mpmath
from mpmath import mpf
from reference import row, sides

# The positive zero of the digamma function, near which the error is absolute.
for x in [1e-300, 1e-9, 0.3, 1.4616321449683623, 1.5, 5.5, 37.25, 1e5, 1e12, 1e300] + list(
        sides(1, 2, 7, 10, 1e9)) + [float(n) for n in range(1, 13)]:
    row("Psi", [x], 0, mpmath.digamma(mpf(x)), 7, 1)
for x in (-0.5, -0.504083008264455409, -1e-9, -1e-300, -3.7, -9.999, -10.25, -33.125, -1000.75, -1e6 - 0.5):
    row("Psi", [x], 0, mpmath.digamma(mpf(x)), 7, abs(mpmath.pi * mpmath.cot(mpmath.pi * mpf(x))) + 1)

for a in (1e-300, 1e-9, 0.5, 1.0, 2.5, 10.0, 18.566433578077874, 25.3, 33.5, 100.0, 171.0, 1e4, 1e9, 0.9e12, 2e12, 1e15):
    for b in (1e-9, 0.75, 1.0, 2.6251833548202748, 3.0, 7.1, 40.0, 165.5, 1234.5, 1e9):
        value = mpmath.beta(mpf(a), mpf(b))
        row("BetaComplete", [a, b], 0, value, 12)
for a, b in [(-2.5, 1.25), (-4.8178181157026057, -19.159449570182726), (-0.3, -0.7 + 2.0**-40), (3.2563498815717686, -17.5)]:
    # next to the poles of gamma(a + b), the rounding of the sum would be magnified a thousandfold
    row("BetaComplete", [a, b], 0, mpmath.beta(mpf(a), mpf(b)), 16)
for a, b, x in [(2.0, 3.0, 0.3), (0.5, 0.5, 0.999), (1.0, 7.0, 0.2), (12.5, 4.0, 0.75), (1e-3, 5.0, 1e-6)]:
    row("Beta", [a, b, x], 0, mpmath.betainc(mpf(a), mpf(b), 0, mpf(x), regularized=True), 14, 0.1)

for n in list(range(0, 36)) + [49, 50]:
    row("Fact", [n], 0, mpmath.factorial(n), 0.5)  # exact where a double can be, otherwise correctly rounded
for n in (51, 60, 100, 142, 143, 160, 166):
    row("Fact", [n], 0, mpmath.factorial(n), 5)
for n in (2, 3, 10, 31, 32, 33, 170, 998, 999, 1000, 123456, 2**31 - 1):
    row("LnFact", [n], 0, mpmath.loggamma(mpf(n) + 1), 4)

for x in (1e-20, 0.5, 1.5, 2.0, 17.25, 32.5, -0.5, -17.3):
    row("GammaComplete", [x], 0, mpmath.gamma(mpf(x)), 8)
for x in (33.5, 70.25, 140.5, 150.75):
    row("GammaComplete", [x], 0, mpmath.gamma(mpf(x)), 4)
    row("Stirling", [x], 0, mpmath.gamma(mpf(x)), 4)
for x in (1e-20, 0.75, 2.5, 32.9, 33.1, 999.0, 1001.0, 1e100):
    row("LnGamma", [x], 0, mpmath.loggamma(mpf(x)), 4, 1)
for a in (0.5, 3.0, 40.0):
    for x in [a / 3, 2 * a] + list(sides(1, a)):
        row("GammaP", [a, x], 0, mpmath.gammainc(mpf(a), 0, mpf(x), regularized=True), 30 + a, 1)
        row("GammaC", [a, x], 0, mpmath.gammainc(mpf(a), mpf(x), regularized=True), 30 + a, 1)

for x in [-30.5, -17.0, -8.3, -1.0, -1e-9, -1e-20, 0.0, 0.5, 0.9999, 1.0001, 2.0, 3.5, 30.0, 30.5, 90.0,
          126.9] + list(sides(10, 50)):
    row("Zeta", [x], 0, mpmath.zeta(mpf(x)), 22 if x < 0 else 3)
