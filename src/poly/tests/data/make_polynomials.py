#!/usr/bin/python3
"""Writes polynomials.dat: polynomials with coefficients in double and their roots to 50 digits
(mpmath), rounded. Each line has NAME DEGREE, the coefficients from the constant term on, and each root with
its condition number, the relative change of the root for a relative change of all coefficients. Numbers are
hex floats; coefficients and roots have a real and an imaginary part."""

import random
from pathlib import Path

from mpmath import chebyt, chop, legendre, mp, mpc, mpf, polyroots, taylor

mp.dps = 80


def product(roots):
    """Descending coefficients, exact enough."""
    coefficients = [mpf(1)]
    for root in roots:
        coefficients = [a - root * b for a, b in zip(coefficients + [0], [0] + coefficients)]
    return coefficients


def polynomials():
    """Names and coefficients from the constant term on."""
    source = random.Random(20261121)
    normal = lambda count: [mpf(source.gauss(0, 1)) for _ in range(count)]
    for n in (1, 2, 3, 4, 5, 10, 15, 20):
        yield f"Wilkinson-{n}", product(range(1, n + 1))[::-1]
    for n in (5, 10, 20, 30):
        yield f"Chebyshev-{n}", chop(taylor(lambda x: chebyt(n, x), 0, n), 1e-40)
        yield f"Legendre-{n}", chop(taylor(lambda x: legendre(n, x), 0, n), 1e-40)
    for gap in (1e-1, 1e-2, 1e-3):
        yield f"clustered-{gap:g}", product([1, 1 + gap, 1 - gap, mpc(1, gap), -2, 3])[::-1]
    for n in (3, 10, 30, 60):
        yield f"random-{n}", normal(n + 1)
        yield f"complex-{n}", [mpc(a, b) for a, b in zip(normal(n + 1), normal(n + 1))]
    for n in (5, 16, 25):
        yield f"unity-{n}", [-1] + [0] * (n - 1) + [1]
    for n in (4, 8, 14):
        yield f"Bessel-{n}", [mp.factorial(2 * n - k) / 2**(n - k) / mp.factorial(k)
                              / mp.factorial(n - k) for k in range(n + 1)]
    yield "large", product([mpf(10)**30, mpc(2, 1) * mpf(10)**30, -3 * mpf(10)**30, 1])[::-1]
    yield "small", product([mpf(10)**-30, mpc(2, 1) * mpf(10)**-30, -3 * mpf(10)**-30, 1])[::-1]
    yield "graded", product([mpf(10)**k for k in range(-6, 7)])[::-1]


def hex_pair(z):
    z = mpc(z)
    return f"{float(z.real).hex()} {float(z.imag).hex()}"


def line(name, coefficients):
    a = [mpc(complex(c)) for c in coefficients]
    roots = polyroots(a[::-1], maxsteps=2000, extraprec=600)
    words = [name, str(len(a) - 1), *map(hex_pair, a)]
    for root in roots:
        size = sum(abs(c) * abs(root)**k for k, c in enumerate(a))
        slope = sum(k * c * root**(k - 1) for k, c in enumerate(a) if k > 0)
        words += [hex_pair(root), float(size / abs(root * slope) if root else 1).hex()]
    return " ".join(words)


if __name__ == "__main__":
    data = Path(__file__).parent
    (data / "polynomials.dat").write_text(
        "".join(line(name, a) + "\n" for name, a in polynomials()))
