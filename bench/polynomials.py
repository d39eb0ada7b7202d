"""Arithmetic and roots of polynomials against NumPy and SciPy, and roots also against the elders, in one process.

Ours is the export, called through the binding, which copies its inputs. PolyEv is as accurate as if computed in
twice the working precision, polyval uses plain Horner's rule. The common divisor has no peer.
"""

import os
import sys
from pathlib import Path

os.environ["OPENBLAS_NUM_THREADS"] = "1"

import numpy as np  # noqa: E402
from numpy.polynomial import polynomial  # noqa: E402
from scipy import signal  # noqa: E402

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from generators import best  # noqa: E402
from summary import print_summary  # noqa: E402

DEGREES = (3, 10, 30, 100, 200)
ELDER_WITH_GUESSES = "elder, from roots to three digits"


def noise(*shape):
    return np.random.default_rng(sum(shape)).normal(size=shape)


def values():
    for degree in (3, 10, 30):
        for n in (1000, 100_000, 1_000_000):
            p, x = noise(degree + 1), noise(n)
            yield (f"values, degree {degree}, n {n}", lambda: qx.PolyEv(p, x),
                   lambda: polynomial.polyval(x, p), 200_000 // n)
        for n in (1000, 100_000):
            p, x = p + 1j, noise(n) + 0.5j
            yield (f"complex values, degree {degree}, n {n}", lambda: qx.CxPolyEv(p, x),
                   lambda: polynomial.polyval(x, p), 100_000 // n)


def horner(p, a):
    y = p[-1] * np.eye(len(a))
    for coefficient in p[-2::-1]:
        y = y @ a + coefficient * np.eye(len(a))
    return y


def matrices():
    for n in (5, 50, 200):
        p, a = noise(26), noise(n, n) / n
        yield (f"of a matrix, degree 25, n {n}", lambda: qx.EvPoly2D(p, a, 1),
               lambda: horner(p, a), 2000 // n)


def arithmetic():
    for n in (10, 100, 1000):
        p, q = noise(2 * n), noise(n)
        q[-1] = 3.0 * n  # so that no quotient overflows
        u = p + 1j
        roots = np.exp(2j * np.pi * np.arange(n) / n)
        count = max(1, 2000 // n)
        yield (f"product, n {n}", lambda: qx.MultiplyPolyH(p, q),
               lambda: polynomial.polymul(p, q), count)
        yield (f"complex product, n {n}", lambda: qx.CxMultiplyPolyH(u, u),
               lambda: polynomial.polymul(u, u), count)
        yield (f"quotient, n {n}", lambda: qx.DividePolyH(p, q),
               lambda: polynomial.polydiv(p, q), count)
        yield (f"from roots, n {n}", lambda: qx.CxPolyFromRootsH(roots),
               lambda: polynomial.polyfromroots(roots), max(1, count // 10))


def fractions():
    for degree in (4, 8, 16):
        p = polynomial.polyfromroots(np.cos(np.arange(degree)))
        yield (f"partial fractions, degree {degree}",
               lambda: qx.PartialFractionsH([1.0, 2.0], p, 0.0),
               lambda: signal.residue([2.0, 1.0], p[::-1]), 20)


def real_roots(peer):
    """The elder only improves roots that are known; here it has three digits of them."""
    for degree in DEGREES:
        p = noise(degree + 1)
        found, _ = qx.PolyRoots2026_head(p)
        known, pairs = np.round(found.real[found.imag == 0], 3), found[found.imag != 0] * 1.001
        theirs = {"numpy.roots": lambda: np.roots(p[::-1]),
                  ELDER_WITH_GUESSES: lambda: qx.PolyRootsNtBst_head(p, known, 100, 1e-15, pairs, 100, 1e-15)}[peer]
        yield f"real coefficients, degree {degree}", lambda: qx.PolyRoots2026_head(p), theirs, 600 // degree


def complex_roots(peer):
    for degree in DEGREES:
        p = noise(degree + 1) + 1j * noise(1, degree + 1)[0]
        theirs = {"numpy.roots": lambda: np.roots(p[::-1]), "elder": lambda: qx.CxPolyRoots_head(p, 100)}[peer]
        yield f"complex coefficients, degree {degree}", lambda: qx.CxPolyRoots2026_head(p), theirs, 600 // degree


def compare(title, peer, cases):
    ratios = []
    for name, ours, theirs, repeats in cases:
        mine, other = best(ours, theirs, max(1, repeats), 7)
        ratios.append((mine / other, name))
        print(f"{name:40} {1e6 * mine:12.1f} us   {mine / other:6.2f}")
    print_summary(title, peer, ratios)


ROOTS = [("roots of real polynomials", "numpy.roots", real_roots),
         ("roots of real polynomials", ELDER_WITH_GUESSES, real_roots),
         ("roots of complex polynomials", "numpy.roots", complex_roots),
         ("roots of complex polynomials", "elder", complex_roots)]


def main():
    for title, peer, cases in ROOTS:
        compare(f"{title}, revision, called from Python", peer, cases(peer))
    for title, peer, cases in [("values of polynomials", "NumPy, plain", values),
                               ("polynomials of matrices", "NumPy, Horner", matrices),
                               ("arithmetic of polynomials", "NumPy", arithmetic),
                               ("partial fractions", "SciPy", fractions)]:
        compare(f"{title}, called from Python", peer, cases())
    for degree in (4, 16, 64):
        u, v, w = noise(degree // 2 + 1), noise(degree // 2 + 2), noise(degree // 2 + 3)
        p, q = polynomial.polymul(u, v), polynomial.polymul(u, w[:-2])
        mine, _ = best(lambda: qx.PolyGCD_H(p, q, 0.0), lambda: None, 5, 5)
        print(f"common divisor, degree {degree:3}                {1e6 * mine:12.1f} us")


if __name__ == "__main__":
    main()
