"""Writes docs/accuracy/polynomial_arithmetic.md: errors of polynomial arithmetic against mpmath with
100 digits, next to those of NumPy and SciPy for the same numbers. Run from the root of the
repository with the library built:
QX_LIBRARY_DIR=build/release PYTHONPATH=python /usr/bin/python3 \\
    src/poly/tests/data/make_polynomial_arithmetic.py"""

import warnings
from pathlib import Path

import numpy as np
from mpmath import mp, mpc
from numpy.polynomial import polynomial
from scipy.signal import residue

import qx

mp.dps = 100
UNIT = 2.0**-53
PAGE = Path(__file__).parents[4] / "docs/accuracy/polynomial_arithmetic.md"


def exact(numbers):
    return [mpc(complex(x)) for x in numbers]


def value(coefficients, x):
    result = mpc(0)
    for a in reversed(coefficients):
        result = result * x + a
    return result


def evaluation():
    yield "## Values"
    yield ""
    yield ("Largest relative errors at 400 points at distances of about 1e-1 to 1e-3 from the multiple "
           "root; those of PolyEv and CxPolyEv also in units of eps + gamma(2n)^2 times the condition "
           "number, with eps = 2^-53.")
    yield ""
    yield ("| Polynomial | largest condition | PolyEv or CxPolyEv | in units of the bound "
           "| numpy polyval |")
    yield "|---|---|---|---|---|"
    random = np.random.default_rng(1)
    cases = [(f"(x - {root})^{n}", root, n) for root in (1, 1 + 1j) for n in (3, 5, 8, 12)]
    for name, root, n in cases:
        coefficients = polynomial.polyfromroots([root] * n)
        step = random.normal(size=400) * 10.0**random.uniform(-3, -1, 400)
        x = root + (step if root == 1 else step * np.exp(1j * random.uniform(0, 7, 400)))
        ours = qx.call("PolyEv" if root == 1 else "CxPolyEv", coefficients, x)
        theirs = polynomial.polyval(x, coefficients)
        gamma = 2 * n * UNIT / (1 - 2 * n * UNIT)
        worst = [0, 0, 0, 0]
        terms = exact(coefficients)
        for point, mine, other in zip(exact(x), exact(ours), exact(theirs)):
            true = value(terms, point)
            condition = sum(abs(a) * abs(point)**k for k, a in enumerate(terms)) / abs(true)
            error = abs(mine - true) / abs(true)
            found = (condition, error, error / (UNIT + gamma**2 * condition),
                     abs(other - true) / abs(true))
            worst = [max(pair) for pair in zip(worst, found)]
        yield "| {} | {:.2g} | {:.2g} | {:.2g} | {:.2g} |".format(name, *map(float, worst))
    yield ""


def largest_difference(found, true):
    size = max(map(abs, true))
    return float(max(abs(a - b) for a, b in zip(exact(found), true)) / size)


def products_of_roots():
    yield "## Coefficients from roots"
    yield ""
    yield ("Largest error relative to the largest coefficient, for roots rounded to double. "
           "NumPy splits the roots into halves and multiplies the products of the halves.")
    yield ""
    yield "| Roots | PolyFromRootsH | CxPolyFromRootsH | numpy polyfromroots |"
    yield "|---|---|---|---|"
    random = np.random.default_rng(2)
    disc = np.sqrt(random.uniform(size=40)) * np.exp(2j * np.pi * random.uniform(size=40))
    for name, roots in [("1 to 20", np.arange(1.0, 21) + 0j),
                        ("64th roots of 1", np.exp(2j * np.pi * np.arange(64) / 64)),
                        ("256th roots of 1", np.exp(2j * np.pi * np.arange(256) / 256)),
                        ("1, -1/2 and 2, 20 times each", np.repeat([1, -0.5, 2], 20) + 0j),
                        ("80 random in the disc, paired", np.concatenate([disc, disc.conj()])),
                        ("200 Chebyshev points", np.cos(np.pi * (np.arange(200) + 0.5) / 200) + 0j)]:
        true = [mpc(1)]
        for root in exact(roots):
            true = [a - root * b for a, b in zip([0] + true, true + [0])]
        found = [qx.call(name_, roots) for name_ in ("PolyFromRootsH", "CxPolyFromRootsH")]
        errors = [largest_difference(a, true) for a in found + [polynomial.polyfromroots(roots)]]
        yield "| {} | {:.2g} | {:.2g} | {:.2g} |".format(name, *errors)
    yield ""


def common_divisors():
    yield "## Common divisors"
    yield ""
    yield ("For 500 pairs each with random factors of degree 1 to 10 (coefficients normally "
           "distributed): how many divisors have the right degree, and the median and largest error "
           "of their coefficients relative to the largest coefficient. Noise is relative to the 2-norm.")
    yield ""
    yield ("| Noise | tolerance | right degree | median error | largest error "
           "| largest distance / noise |")
    yield "|---|---|---|---|---|---|"
    for noise, tolerance in ((0, 1e-10), (1e-12, 1e-10), (1e-8, 1e-6), (1e-5, 1e-4)):
        random = np.random.default_rng(3)
        errors, distances, right = [], [], 0
        for _ in range(500):
            u, v, w = (random.normal(size=random.integers(2, 12)) for _ in range(3))
            p, q = polynomial.polymul(u, v), polynomial.polymul(u, w)
            for a in (p, q):
                change = random.normal(size=len(a))
                a += noise * np.linalg.norm(a) * change / np.linalg.norm(change)
            gcd, distance = qx.call("PolyGCD_H", p, q, tolerance)
            if len(gcd) == len(u):
                right += 1
                errors.append(largest_difference(gcd, exact(u / u[-1])))
                distances.append(distance)
        yield "| {:g} | {:g} | {} | {:.2g} | {:.2g} | {} |".format(
            noise, tolerance, right, np.median(errors), max(errors),
            f"{max(distances) / noise:.2g}" if noise else "-")
    yield ""


def sum_of_fractions(part, poles, residues, x):
    total = value(exact(part), x)
    size = abs(total)
    power = 0
    for k, (pole, top) in enumerate(zip(poles, residues)):
        power = power + 1 if k and pole == poles[k - 1] else 1
        term = mpc(complex(top)) / (x - mpc(complex(pole)))**power
        total += term
        size += abs(term)
    return total, size


def partial_fractions():
    yield "## Partial fractions"
    yield ""
    yield ("The sum of the fractions is compared with the quotient at 50 points: largest error relative "
           "to the sum of the moduli of its terms. scipy.signal.residue has its default tolerance, 1e-3.")
    yield ""
    yield "| Denominator | PartialFractionsH | scipy residue |"
    yield "|---|---|---|"
    random = np.random.default_rng(4)
    for name, roots in [("(x + 1) (x + 2)", [-1, -2]), ("(x - 0.1)^2", [0.1] * 2),
                        ("(x - 1)^3 (x - 2)^2 (x - 3)", [1, 1, 1, 2, 2, 3]),
                        ("(x^2 + 1)^3 (x + 1)", [1j] * 3 + [-1j] * 3 + [-1]),
                        ("x^3 (x - 0.5)^4 (x + 2)", [0] * 3 + [0.5] * 4 + [-2]),
                        ("(x - 1) ... (x - 12)", list(range(1, 13))),
                        ("32 roots in the disc", list(np.exp(2j * np.pi * np.arange(16) / 33)
                                                      * random.uniform(0.5, 1, 16)))]:
        if len(roots) == 16:
            roots = roots + list(np.conj(roots))
            roots[0] = roots[0].real
            roots[16] = -0.3
        top, bottom = random.normal(size=4), polynomial.polyfromroots(roots).real
        part, poles, residues = qx.call("PartialFractionsH", top, bottom, 0.0)
        theirs = residue(top[::-1], bottom[::-1])
        found = [(part, poles, residues), (theirs[2][::-1], theirs[1], theirs[0])]
        errors = [0, 0]
        for re, im in random.normal(size=(50, 2)):
            x = 2 * mpc(re, im)
            true = value(exact(top), x) / value(exact(bottom), x)
            for k, fractions in enumerate(found):
                total, size = sum_of_fractions(*fractions, x)
                errors[k] = max(errors[k], abs(total - true) / size)
        yield "| {} | {:.2g} | {:.2g} |".format(name, *map(float, errors))


def main():
    warnings.simplefilter("ignore")
    lines = ["# Accuracy of polynomial arithmetic", "",
             "Written by `src/poly/tests/data/make_polynomial_arithmetic.py`.", ""]
    for section in (evaluation, products_of_roots, common_divisors, partial_fractions):
        lines += section()
    PAGE.write_text("\n".join(lines) + "\n")


if __name__ == "__main__":
    main()
