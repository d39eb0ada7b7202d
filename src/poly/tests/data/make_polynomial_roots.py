"""Writes docs/accuracy/polynomial_roots.md: forward errors of the roots of polynomials against
mpmath, next to those of numpy.roots (LAPACK's eigenvalues) for the same coefficients, and how often
multiplicities are recovered. Run from the repository's root with the library built:
QX_LIBRARY_DIR=build/release PYTHONPATH=python /usr/bin/python3 \\
    src/poly/tests/data/make_polynomial_roots.py"""

import warnings
from pathlib import Path

import numpy as np
from mpmath import mp, mpf

import qx

EPSILON = 2.0**-52
ROOT = Path(__file__).parents[4]
STRUCTURES = {
    "(x-1)^3": {1: 3},
    "(x-1)^20 (x-2)^15 (x-3)^10 (x-4)^5": {1: 20, 2: 15, 3: 10, 4: 5},
    "(x-1+0.01i)^20 (x-1-0.01i)^20 (x+2)^3": {1 - 0.01j: 20, 1 + 0.01j: 20, -2: 3},
    "(x+1)^8 (x-0.2)^16 (x-0.5)^24 (x-1)^8": {-1: 8, 0.2: 16, 0.5: 24, 1: 8},
    "(x+1)^6 (x-0.5-i)^3 (x-0.5+i)^3 (x-1)^2 (x-0.5)^4":
        {-1: 6, 0.5 + 1j: 3, 0.5 - 1j: 3, 1: 2, 0.5: 4},
    "(x-0.9)^5 (x-1)^5 (x-1.1)^5": {0.9: 5, 1.0: 5, 1.1: 5},
}


def cases():
    """Name, ascending coefficients, roots and their condition numbers, from polynomials.dat."""
    for line in (Path(__file__).parent / "polynomials.dat").read_text().splitlines():
        name, degree, *words = line.split()
        n = int(degree)
        numbers = np.array([float.fromhex(word) for word in words])
        a = numbers[:2 * n + 2].reshape(-1, 2) @ [1, 1j]
        roots = numbers[2 * n + 2:].reshape(-1, 3)
        yield name, a, roots[:, :2] @ [1, 1j], roots[:, 2]


def expanded(structure):
    """Ascending coefficients, rounded once."""
    mp.dps = 60
    a = [mpf(1)]
    for root, times in structure.items():
        for _ in range(times):
            a = [x - mp.mpmathify(root) * y for x, y in zip(a + [0], [0] + a)]
    return np.array([complex(x) for x in a[::-1]])


def matched_errors(found, roots):
    """Relative errors; each root is matched with the nearest computed root that is not matched yet."""
    found = list(found)
    errors = []
    for root in roots:
        if not found:
            return np.full(len(roots), np.inf)
        distances = np.abs(np.array(found) - root)
        errors.append(distances.min() / (abs(root) or 1))
        del found[int(distances.argmin())]
    return np.array(errors)


def attempt(call):
    with warnings.catch_warnings():
        warnings.simplefilter("ignore")
        try:
            return call()
        except (qx.QxError, np.linalg.LinAlgError):
            return None


def one_by_one(a):
    return attempt(lambda: qx.call("CxPolyRoots_head", a, 100))


def structured(a, tolerance=0.0):
    """Refined roots, simple roots and multiplicities."""
    name, coefficients = "CxMultPolyRoots_head", a
    if not np.any(a.imag):
        name, coefficients = "MultPolyRoots_head", np.ascontiguousarray(a.real)
    result = attempt(lambda: qx.call(name, coefficients, 1, tolerance))
    return result and result[1:]


def eigenvalues(a):
    return attempt(lambda: np.roots(a[::-1]))


def together(a):
    """The roots of the revision for the type of the coefficients, and their radii."""
    if np.any(a.imag):
        return attempt(lambda: qx.call("CxPolyRoots2026_head", a))
    return attempt(lambda: qx.call("PolyRoots2026_head", np.ascontiguousarray(a.real)))


def roots_together(a):
    found = together(a)
    return found and found[0]


def long_residual(a, roots):
    """The largest |p(z)| / sum of |a[i]| |z|^i in units of n eps, in long double."""
    a, z = a.astype(np.clongdouble), roots.astype(np.clongdouble)
    value, total = np.full(len(z), a[-1]), np.full(len(z), np.abs(a[-1]))
    for coefficient in a[-2::-1]:
        value, total = value * z + coefficient, total * np.abs(z) + np.abs(coefficient)
    return float((np.abs(value) / total).max() / (len(roots) * EPSILON))


def residual_table():
    yield "| Degree | polynomials | CxPolyRoots: worst residual, above 4 | PolyRoots2026 | numpy.roots |"
    yield "|---|---|---|---|---|"
    for degree, count in ((10, 2000), (25, 2000), (50, 1000), (100, 200), (200, 50)):
        random = np.random.default_rng(degree)
        residuals = [[], [], []]
        for _ in range(count):
            a = (random.standard_normal(degree + 1) + 0j)
            for found, method in zip(residuals, (one_by_one, roots_together, eigenvalues)):
                z = method(a)
                found.append(np.inf if z is None else long_residual(a, z))
        yield f"| {degree} | {count} | " + " | ".join(
            f"{max(found):.2g}, {sum(x > 4 for x in found)}" for found in residuals) + " |"


def cell(errors, scale=None):
    if errors is None or not np.all(np.isfinite(errors)):
        return "-"
    return f"{np.max(errors if scale is None else errors / scale):.2g}"


def simple_table():
    yield ("| Polynomial | largest condition | CxPolyRoots | PolyRoots2026 | MultPolyRoots, refined | numpy.roots "
           "| the same in units of condition n eps | | | |")
    yield "|---|---|---|---|---|---|---|---|---|---|"
    for name, a, roots, conditions in cases():
        refined = structured(a)
        merged = refined is not None and len(refined[0]) < len(roots)
        found = [one_by_one(a), roots_together(a), refined and np.repeat(refined[0], refined[2]), eigenvalues(a)]
        errors = [None if z is None else matched_errors(z, roots) for z in found]
        scale = conditions * EPSILON * len(roots)
        marks = ["", "", f" ({len(refined[0])} distinct)" if merged else "", ""]
        yield f"| {name} | {conditions.max():.2g} | " + " | ".join(
            [cell(e) + mark for e, mark in zip(errors, marks)]
            + [cell(e, scale) for e in errors]) + " |"


def scatter(found, structure):
    """The largest relative distance from the nearest root."""
    roots = np.array(list(structure), complex)
    return None if found is None else np.array(
        [(np.abs(roots - z) / np.abs(roots)).min() for z in found])


def structure_table():
    yield ("| Polynomial | multiplicities found | refined | as found | CxPolyRoots | PolyRoots2026 | numpy.roots |")
    yield "|---|---|---|---|---|---|---|"
    for name, structure in STRUCTURES.items():
        a = expanded(structure)
        refined, simple, times = structured(a)
        yield f"| {name} | {', '.join(map(str, times))} | " + " | ".join(
            cell(scatter(z, structure)) for z in (refined, simple, one_by_one(a), roots_together(a), eigenvalues(a))
        ) + " |"


def some_structure(random):
    """Of degree 3 at least: below that, roots are not merged."""
    while True:
        roots = random.permutation([-2.0, -1.2, -0.5, 0.4, 1.0, 1.7])[:random.integers(2, 5)]
        structure = {root: int(random.integers(1, 5)) for root in roots}
        if sum(structure.values()) > 2:
            return structure


def recovery_table():
    yield "| Noise of the coefficients | tolerance | recovered | largest error of a root |"
    yield "|---|---|---|---|"
    trials = 300
    for noise, tolerance in ((0, 1e-10), (1e-12, 1e-10), (1e-10, 1e-8), (1e-8, 1e-6), (1e-6, 1e-4)):
        random = np.random.default_rng(7)
        recovered, worst = 0, 0.0
        for _ in range(trials):
            structure = some_structure(random)
            a = expanded(structure)
            a = (a * (1 + noise * random.uniform(-1, 1, len(a)))).real.astype(complex)
            found = structured(a, tolerance)
            if sorted(found[2]) == sorted(structure.values()):
                recovered += 1
                worst = max(worst, scatter(found[0], structure).max())
        yield f"| {noise:g} | {tolerance:g} | {recovered} of {trials} | {worst:.2g} |"


def stuck_degrees(highest):
    for n in range(3, highest + 1):
        if one_by_one(np.array([-1] + [0] * (n - 1) + [1], complex)) is None:
            yield n


def main():
    stuck = ", ".join(map(str, stuck_degrees(150)))
    page = f"""# Accuracy of polynomial roots

Written by `src/poly/tests/data/make_polynomial_roots.py`; numpy.roots computes the eigenvalues of
the companion matrix with LAPACK.

Largest relative errors of a root against mpmath with 80 digits, for coefficients rounded to double. The
condition number of a root says how far it moves for a relative change of all coefficients; no method
in plain double precision can be expected to do better. PolyRoots2026 is PolyRoots2026_head where the
coefficients are real, otherwise CxPolyRoots2026_head; both end with steps in twice the precision. The
last four columns have the errors, in the same order, in units of each root's own condition number times
the degree times 2.2e-16.

{chr(10).join(simple_table())}

Newton's method with deflation resolves roots of very different magnitude, and the eigenvalues do not:
"small" has a root at 1 and three around 1e-30. Two digits are lost where deflation begins in the
middle of many roots on a line. MultPolyRoots_head merges clustered roots that are one multiple root within its
tolerance (1e-10).

The search of CxPolyRoots_head can get stuck where the polynomial is flat to the last bit, as x^n - 1
is around 0. It then ends with ErrIterationLimit: of n from 3 to 150, for {stuck}.

Residuals |p(z)| / sum of |a[i]| |z|^i in units of n eps, for normally distributed coefficients: the largest, and
the number of polynomials for which it is above 4 or no roots were found.

{chr(10).join(residual_table())}

Another 100102 polynomials of degree 1 to 200, normal, over 1e-100 to 1e100 and over 1e-5 to 1e5, real and complex, with
residuals in 113-bit arithmetic (`tools/accuracy/root_bound.cpp`): of 10.0 million roots of the revision the worst has
0.062 of the bound 4 n eps.

Multiple roots: the largest relative distance of a computed root from the nearest true one.

{chr(10).join(structure_table())}

Polynomials with 2 to 4 distinct roots out of -2, -1.2, -0.5, 0.4, 1 and 1.7, of multiplicities 1 to
4, with noise on their coefficients: how often all multiplicities are recovered.

{chr(10).join(recovery_table())}
"""
    (ROOT / "docs/accuracy/polynomial_roots.md").write_text(page)


if __name__ == "__main__":
    main()
