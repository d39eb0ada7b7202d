#!/usr/bin/python3
"""Writes docs/accuracy/matrix_revisions.md: elders, revisions and LAPACK (through SciPy) for the same matrices,
with elements of all magnitudes.

usage: QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/matrix_revisions.py
"""

import itertools
import warnings
from pathlib import Path

import mpmath
import numpy as np
from scipy import linalg

import qx

PAGE = Path(__file__).resolve().parents[2] / "docs/accuracy/matrix_revisions.md"
EPS = 2.0**-52
SHAPES = ((1, 1), (5, 9), (30, 7), (100, 100), (40, 200), (200, 200))
ORDERS = (1, 2, 5, 30, 100, 200)
POWERS = (-300, -150, -30, -16, -12, -8, 0, 150, 300)
random = np.random.default_rng(1)


def noise(m, n, kind):
    real = random.standard_normal((m, n))
    return real + 1j * random.standard_normal((m, n)) if kind == "complex" else real


KINDS = {
    "random": noise,
    "graded": lambda m, n, kind: noise(m, n, kind) * np.exp2(-np.add.outer(np.arange(m), np.arange(n)) / 4),
    "of rank n/2": lambda m, n, kind: noise(m, (min(m, n) + 1) // 2, kind) @ noise((min(m, n) + 1) // 2, n, kind),
    "zero": lambda m, n, kind: 0 * noise(m, n, kind),
}


def norm(a):
    return np.sqrt((np.abs(a) ** 2).sum())


def call(name, *arguments):
    prefix = "Cx" if any(np.iscomplexobj(a) for a in arguments) else ""
    with warnings.catch_warnings():
        warnings.simplefilter("ignore")
        return qx.call(prefix + name, *arguments)


def long(a):
    return np.asarray(a, dtype=np.clongdouble if np.iscomplexobj(a) else np.longdouble)


def decomposition_ratios(a, u, s, v):
    """The residual and the distance of u and v from orthonormal, in units of max(m, n) eps."""
    unit = EPS * max(a.shape)
    residual = norm(long(u) * long(s) @ long(v).conj().T - long(a))
    apart = [norm(long(q).conj().T @ long(q) - np.eye(q.shape[1])) / unit for q in (u, v)]
    return float(residual / (norm(long(a)) or 1) / unit), float(max(apart))


def decompositions(a):
    yield "elder", call("SVDEx_head", a, 0)
    yield "revision", call("SVD2026_head", a, 0)
    u, s, vh = linalg.svd(a, full_matrices=False, lapack_driver="gesvd")
    yield "LAPACK", (u, s, vh.conj().T)


def values_ratio(a):
    """Errors of the singular values against LAPACK's for the matrix scaled to magnitude 1, in units of max(m, n) eps."""
    largest = np.abs(a).max() or 1.0
    power = 2.0 ** np.floor(np.log2(largest))
    expected = linalg.svdvals(a / power)
    found = {"elder": call("SVDS_head", a), "revision": call("SVDS2026_head", a)}
    return {name: float(np.abs(s / power - expected).max() / (expected[0] or 1) / EPS / max(a.shape))
            for name, s in found.items()}


def worst(rows):
    return [max(column) for column in zip(*rows)]


def decomposition_table():
    lines = ["| Elements | matrix | elder: residual, orthogonality, values | revision | LAPACK: residual, orthogonality |",
             "|---|---|---|---|---|"]
    for power in POWERS:
        for name, matrix in KINDS.items():
            if name == "zero" and power:
                continue
            found = {"elder": [], "revision": [], "LAPACK": []}
            for shape in SHAPES:
                for kind in ("real", "complex"):
                    a = matrix(*shape, kind) * 10.0**power
                    values = values_ratio(a)
                    for who, (u, s, v) in decompositions(a):
                        more = (values[who],) if who in values else ()
                        found[who].append(decomposition_ratios(a, u, s, v) + more)
            cells = [", ".join(f"{x:.2g}" for x in worst(rows)) for rows in found.values()]
            lines.append(f"| 1e{power} | {name} | " + " | ".join(cells) + " |")
            print(lines[-1], flush=True)
    return lines


def conditioned(n, kind, condition):
    q = [np.linalg.qr(noise(n, n, kind))[0] for _ in range(2)]
    return q[0] @ np.diag(np.geomspace(1, 1 / condition, n)) @ q[1]


def solution_table():
    """Relative errors of solutions, pseudo-inverses, norms and condition numbers, divided by eps times the condition
    number, against long double results for the matrix scaled to magnitude 1."""
    lines = ["| Elements | least squares, elder | revision | dgelsd | pseudo-inverse, elder | revision | pinv "
             "| LU, revision | dgesv | condition estimate / exact |", "|---" * 10 + "|"]
    for power in POWERS:
        rows = []
        for n in ORDERS:
            for kind in ("real", "complex"):
                condition = 1000.0 if n > 1 else 1.0
                one = conditioned(n, kind, condition)
                a = one * 10.0**power
                scale = 2.0 ** np.floor(np.log2(np.abs(a).max()))
                near, x = a / scale, noise(n, 1, kind)
                b = near @ x
                exact = refined(near, b)
                unit = EPS * condition * n

                def error(found):
                    return float(norm(long(found) - exact) / norm(exact) / unit)

                inverse = refined(near, np.eye(n, dtype=near.dtype))

                def inverse_error(found):
                    return float(norm(long(found) - inverse) / norm(inverse) / unit)

                lu, reciprocal = call("EqsSetByLU2026_head", a, b)
                norms = np.abs(near).sum(0).max() * float(np.abs(inverse).sum(0).max())
                with np.errstate(all="ignore"):
                    rows.append((error(call("EqsSetBySVDDri_head", a, b) * scale),
                                 error(call("EqsSetBySVD2026_head", a, b, -1.0) * scale),
                                 error(linalg.lstsq(a, b, lapack_driver="gelsd")[0] * scale),
                                 inverse_error(call("PseudoInverse_head", a, -1.0) * scale),
                                 inverse_error(call("PseudoInverse2026_head", a, -1.0) * scale),
                                 inverse_error(linalg.pinv(a) * scale), error(lu * scale),
                                 error(linalg.solve(a, b) * scale), 1 / reciprocal / norms))
        found = [*worst(rows)[:-1], min(row[-1] for row in rows)]
        lines.append(f"| 1e{power} | " + " | ".join(f"{x:.2g}" for x in found) + " |")
        print(lines[-1], flush=True)
    return lines


def exponential_table():
    """Errors relative to the largest element, against mpmath with 50 digits."""
    lines = ["| Matrix | elder | revision | scipy.linalg.expm |", "|---|---|---|---|"]
    kinds = {f"random {kind}, {scale:g}": [scale * noise(n, n, kind) for n in (2, 3, 5, 8) for _ in range(6)]
             for kind in ("real", "complex") for scale in (1e-3, 0.1, 1.0, 5.0, 20.0)}
    kinds |= {f"rotation by {angle:g}": [np.array([[0.0, -angle], [angle, 0.0]])] for angle in (0.9, 10.0, 1000.0)}
    kinds |= {f"1, {large:g}; 0, -1": [np.array([[1.0, large], [0.0, -1.0]])] for large in (1e6, 1e15, 1e100)}
    for name, matrices in kinds.items():
        worst_of = [0.0, 0.0, 0.0]
        for a in matrices:
            # Squaring loses a few of the many digits.
            with mpmath.workdps(400 if np.abs(a).max() > 1e10 else 50):
                exact = np.array(mpmath.expm(mpmath.matrix(a.tolist())).tolist())
                size = np.abs(exact).max()
                for k, found in enumerate((call("MatrixExp_head", a), call("MatrixExp2026_head", a), linalg.expm(a))):
                    error = np.abs(found - exact).max() / size if np.all(np.isfinite(found)) else np.inf
                    worst_of[k] = max(worst_of[k], float(error))
        lines.append(f"| {name} | " + " | ".join(f"{x:.2g}" for x in worst_of) + " |")
        print(lines[-1], flush=True)
    return lines


def values_function(a, function, digits):
    """A function of a diagonalisable matrix by mpmath; values within 1e-13 of the negative axis are on it."""
    with mpmath.workdps(digits):
        values, vectors = mpmath.eig(mpmath.matrix(a.tolist()))
        size = max(abs(value) for value in values)
        values = [mpmath.re(v) if abs(mpmath.im(v)) < 1e-13 * size and mpmath.re(v) < 0 else v for v in values]
        found = vectors * mpmath.diag([function(v) for v in values]) * vectors**-1
        # Divided by the largest element, so that squares of errors do not overflow.
        largest = max(abs(x) for x in found)
        return np.array((found / largest).tolist(), dtype=complex), float(largest)


def logarithm_kinds():
    def turned(n, kind):
        q = noise(n, n, kind)
        return q @ np.diag(-np.arange(1.0, n + 1)) @ np.linalg.inv(q)

    def graded(n, kind, step):
        return noise(n, n, kind) * np.exp2(-step * np.add.outer(np.arange(n), np.arange(n)))

    def triangle(n, kind):
        return np.diag(random.uniform(0.5, 2, n)) + 1e6 * np.triu(noise(n, n, kind), 1)

    for kind in ("real", "complex"):
        yield f"random {kind}", lambda n, kind=kind: noise(n, n, kind)
        yield f"{kind}, negative eigenvalues", lambda n, kind=kind: turned(n, kind)
    yield "random real, 1e-14", lambda n: 1e-14 * noise(n, n, "real")
    yield "random real, 1e300", lambda n: 1e300 * noise(n, n, "real")
    yield "graded by 2^-4", lambda n: graded(n, "real", 4)
    yield "graded by 2^-12", lambda n: graded(n, "real", 12)
    yield "triangular, 1e6 above", lambda n: triangle(n, "real")


def functions_table():
    """The worst and the median error relative to the largest element, against mpmath."""
    lines = ["| Matrix | log, elder | revision | SciPy's logm | square root, elder | revision | SciPy's sqrtm |",
             "|---" * 7 + "|"]
    for name, matrix in logarithm_kinds():
        cells = []
        matrices = [matrix(n) for n in (2, 3, 5, 8) for _ in range(5)]
        elder_root = "MatrixSqrt_head" if np.iscomplexobj(matrices[0]) else "MatrixSqrtH"
        for function, exports, peer in ((mpmath.log, ("MatrixLn_head", "MatrixLn2026_head"), linalg.logm),
                                        (mpmath.sqrt, (elder_root, "MatrixSqrt2026_head"), linalg.sqrtm)):
            errors = {method: [] for method in (*exports, peer)}
            for a in matrices:
                exact, size = values_function(a, function, 100)
                for method, found in errors.items():
                    found.append(error_of(method, a, exact, size))
            cells += [f"{max(found):.1e}, {np.median(found):.0e}" for found in errors.values()]
        lines.append(f"| {name} | " + " | ".join(cells) + " |")
        print(lines[-1], flush=True)
    return lines


def error_of(method, a, exact, size):
    try:
        with np.errstate(all="ignore"):
            result = call(method, a) if isinstance(method, str) else method(a, disp=False)[0]
            error = np.abs(result / size - exact).max()
    except (ValueError, np.linalg.LinAlgError):
        return np.inf
    return float(error) if np.isfinite(error) else np.inf


def power_table():
    """Errors of the cube of the inverse, in units of n eps times the condition number, which is 1000."""
    lines = ["| Elements | matrix | elder | revision | numpy.linalg.matrix_power |", "|---|---|---|---|---|"]
    for exponent, kind in itertools.product((-80, -30, -12, -8, 0, 80), ("real", "complex")):
        worst_of = [0.0, 0.0, 0.0]
        for n in (2, 5, 10):
            a = conditioned(n, kind, 1000.0) * 10.0**exponent
            with mpmath.workdps(60):
                exact = mpmath.matrix(a.tolist())**-3
                size = max(abs(x) for x in exact)
                exact = np.array((exact / size).tolist(), dtype=a.dtype)
            found = (call("MatrixPower_head", a, -3), call("MatrixPower2026_head", a, -3),
                     np.linalg.matrix_power(a, -3))
            for k, power in enumerate(found):
                error = float(np.abs(power / float(size) - exact).max() / (EPS * n * 1000))
                worst_of[k] = max(worst_of[k], error if np.isfinite(error) else np.inf)
        lines.append(f"| 1e{exponent} | {kind} | " + " | ".join(f"{x:.2g}" for x in worst_of) + " |")
        print(lines[-1], flush=True)
    return lines


def properties_table():
    """Worst relative errors of 2-norms, Frobenius norms and condition numbers in units of n eps (times the condition
    number for the latter), and how many of the ranks are wrong."""
    lines = ["| Elements | 2-norm, elder | revision | NumPy | Frobenius norm, elder | revision | NumPy "
             "| condition, elder | revision | NumPy | wrong ranks, elder | revision | NumPy |", "|---" * 13 + "|"]
    for power in POWERS:
        errors, wrong = [], []
        for n in (1, 2, 5, 30, 100):
            for kind in ("real", "complex"):
                condition = 1000.0 if n > 1 else 1.0
                one = conditioned(n, kind, condition)
                scale = 2.0 ** np.floor(np.log2(10.0**power))
                a = one * scale
                exact = linalg.svdvals(one)  # off by a few eps of the norm
                norm_unit, unit = EPS * n, EPS * n * condition
                with np.errstate(all="ignore"):
                    norms = (call("Norm_head", a, 0), call("Norm2026_head", a, 0), np.linalg.norm(a, 2))
                    roots = (call("Norm_head", a, 2), call("Norm2026_head", a, 2), np.linalg.norm(a))
                    conditions = (call("CondNumber_head", a, 0), call("CondNumber2026_head", a, 0),
                                  np.linalg.cond(a, 2))
                frobenius = float(norm(long(one)))
                errors.append([abs(found / scale / exact[0] - 1) / norm_unit for found in norms]
                              + [abs(found / scale / frobenius - 1) / norm_unit for found in roots]
                              + [abs(found * exact[-1] / exact[0] - 1) / unit for found in conditions])
                half = noise(n, (n + 1) // 2, kind) @ noise((n + 1) // 2, n, kind) * scale
                ranks = (call("Rank_head", half, -1.0), call("Rank2026_head", half, -1.0),
                         np.linalg.matrix_rank(half))
                wrong.append([int(found != (n + 1) // 2) for found in ranks])
        cells = [f"{x:.2g}" if np.isfinite(x) else "-" for x in worst(errors)]
        cells += [f"{sum(column)} of {len(wrong)}" for column in zip(*wrong)]
        lines.append(f"| 1e{power} | " + " | ".join(cells) + " |")
        print(lines[-1], flush=True)
    return lines


def schur_table():
    """Graded matrices ordered by increasing modulus: how many forms are out of order, and the worst residual and
    distance of u from orthogonal in units of n eps."""
    lines = ["| Matrix | out of order, elder | revision | LAPACK, unordered: residual, orthogonality "
             "| elder | revision |", "|---" * 6 + "|"]
    for step in (0, 2, 4, 8):
        apart, ratios = [0, 0], [[], [], []]
        for n in (4, 6, 10, 20, 40):
            for _ in range(6):
                a = noise(n, n, "real") * np.exp2(-step * np.add.outer(np.arange(n), np.arange(n)) / 2)
                found = [linalg.schur(a, output="real")]
                for k, export in enumerate(("Schur80_head", "Schur2026_head")):
                    t, u, w = qx.call(export, a, 1, 3)
                    moduli = np.abs(w)
                    apart[k] += bool(np.any(moduli[1:] < moduli[:-1] * (1 - 1e-14)))
                    found.append((t, u))
                for rows, (t, u) in zip(ratios, found):
                    residual = norm(long(u) @ long(t) @ long(u).T - long(a)) / norm(long(a))
                    rows.append((float(residual / EPS / n),
                                 float(norm(long(u).T @ long(u) - np.eye(n)) / EPS / n)))
        cells = [f"{count} of 30" for count in apart]
        cells += [", ".join(f"{x:.2g}" for x in worst(rows)) for rows in ratios]
        name = f"graded by 2^-{step}" if step else "random"
        lines.append(f"| {name} | " + " | ".join(cells) + " |")
        print(lines[-1], flush=True)
    return lines


def blocks_table():
    """Orders at which the revisions work in blocks: the worst residual and distance from orthogonal or unitary; for
    general eigenproblems, only the residual a v - v w."""
    def hermitian(a, values, v):
        return residual(a, long(v) * values @ long(v).conj().T), apart(v)

    def general(a, values, v):
        return (residual(long(a) @ long(v), long(v) * values) * float(norm(long(a) @ long(v)) / norm(long(a))),)

    def triangular(a, q, r):
        return residual(a, long(q) @ long(r)), apart(q)

    def residual(a, product):
        return float(norm(long(product) - long(a)) / norm(long(a)) / EPS / len(a))

    def apart(q):
        return float(norm(long(q).conj().T @ long(q) - np.eye(len(q))) / EPS / len(q))

    def symmetric(year):
        def solve(a):
            if np.iscomplexobj(a):
                values, vectors = qx.call(f"CxEigenValueVector{year}_head", a, 1, 1)
                return values.real, vectors
            vectors, values = qx.call(f"SymEvectorEvalue{year}_head", a, 1)
            return values, vectors
        return solve

    def eigen(year):
        return lambda a: (qx.call(f"CxEigenValueVector{year}_head", a, 0, 1) if np.iscomplexobj(a)
                          else qx.call(f"EigenValueVector{year}_head", a, 1))

    def factors(year):
        def solve(a):
            q, r = qx.call(("Cx" if np.iscomplexobj(a) else "") + f"QRDec{year}H", a, 0, 1)[-2:]
            return q, r
        return solve

    problems = (("symmetric or Hermitian", hermitian, symmetric,
                 lambda a: linalg.eigh(a, driver="evd"), True),
                ("general eigenproblem", general, eigen, linalg.eig, False),
                ("QR", triangular, factors, linalg.qr, False))
    lines = ["| Problem | matrix | elder | revision | LAPACK |", "|---" * 5 + "|"]
    for name, ratios, ours, peer, mirrored in problems:
        for matrix in ("random", "graded", "of rank n/2"):
            rows = [[], [], []]
            for n in (70, 170, 300):
                for kind in ("real", "complex"):
                    a = KINDS[matrix](n, n, kind)
                    a = a + a.conj().T if mirrored else a
                    for row, solve in zip(rows, (ours(""), ours("2026"), peer)):
                        try:
                            row.append(ratios(a, *solve(a)))
                        except qx.QxError:
                            row.append((np.inf,))
            cells = [", ".join(f"{x:.2g}" for x in worst(row)) for row in rows]
            lines.append(f"| {name} | {matrix} | " + " | ".join(cells).replace("inf", "no convergence") + " |")
            print(lines[-1], flush=True)
    return lines


def refined(a, b):
    """a^-1 b in long double, by refinement of the solution in double precision."""
    factors = linalg.lu_factor(a)
    x = long(np.zeros_like(b))
    for _ in range(8):
        left = long(b) - long(a) @ x
        x = x + long(linalg.lu_solve(factors, left.astype(a.dtype)))
    return x


def main():
    tables = [decomposition_table(), solution_table(), exponential_table(), functions_table(), power_table(),
              properties_table(), schur_table(), blocks_table()]
    PAGE.write_text(f"""# Accuracy of the revisions of linear algebra

Elders, revisions and LAPACK (through SciPy) for the same real and complex matrices, with elements of the magnitude in
the first column. Written by `tools/accuracy/matrix_revisions.py`.

## Singular values

`SVDEx_head` and `SVD2026_head`; the values alone from `SVDS_head` and `SVDS2026_head`; and their complex twins. Worst
over the shapes {", ".join(f"{m} by {n}" for m, n in SHAPES)}, in units of max(m, n)
eps: |a - u diag(s) v^H| / |a| and the distance of u and v from orthonormal, computed in long double, with Frobenius
norms; then the singular values, relative to the largest one, against those that LAPACK computes for the matrix scaled
to magnitude 1.

""" + "\n".join(tables[0]) + f"""

## Systems, least squares and pseudo-inverses

`EqsSetBySVDDri_head` and `EqsSetBySVD2026_head`, whose solution for one right-hand side is that of `GenLinEqs_head`
and `GenLinEqs2026_head`; `PseudoInverse_head` and `PseudoInverse2026_head`; `EqsSetByLU2026_head`, whose elder
`EqsSetByLUDri_head` always fails; and their complex twins. Relative errors in units of n eps times the condition
number, which is 1000, worst over the orders {", ".join(map(str, ORDERS))}, against solutions that are refined in long
double. The last column is the smallest ratio of the condition number that `EqsSetByLU2026_head` estimates to the
exact one, in the 1-norm.

""" + "\n".join(tables[1]) + """

## Exponential

`MatrixExp_head` and `MatrixExp2026_head`, `CxMatrixExp_head` and `CxMatrixExp2026_head`. Errors relative to the
largest element of the result, against mpmath: the worst over six random matrices of each of the orders 2, 3, 5 and 8,
with normally distributed elements of the given magnitude; rotations; and matrices with one large element.

""" + "\n".join(tables[2]) + """

## Logarithm and square root

`MatrixLn_head` and `MatrixLn2026_head`; `MatrixSqrtH`, for complex matrices `CxMatrixSqrt_head`, and
`MatrixSqrt2026_head`; and their complex twins. Errors relative to the largest element of the result, the worst and
the median over five matrices of each of the orders 2, 3, 5 and 8, against values from mpmath's eigenvalues and
eigenvectors with 100 digits. Eigenvalues that rounding has moved off the negative axis count as negative: the
imaginary part of their logarithm is +pi.

""" + "\n".join(tables[3]) + """

## Negative powers

`MatrixPower_head` and `MatrixPower2026_head`, `CxMatrixPower_head` and `CxMatrixPower2026_head`. The cube of the
inverse of matrices of the orders 2, 5 and 10 with condition number 1000: the largest error relative to the largest
element, in units of n eps times the condition number, against mpmath with 60 digits.

""" + "\n".join(tables[4]) + """

## Norm, condition and rank

`Norm_head`, `CondNumber_head` and `Rank_head`, `Norm2026_head`, `CondNumber2026_head` and `Rank2026_head`, and their
complex twins; norms and condition numbers of type 0 (the 2-norm), norms also of type 2 (Frobenius). Real and complex
matrices of the orders 1, 2, 5, 30 and 100 with condition number 1000, against LAPACK's singular values of the
matrices scaled to magnitude 1: relative errors in units of n eps, or of n eps times the condition number for the
condition number; a dash where the sum of squares overflows. The ranks are those of products of n by n/2 matrices.

""" + "\n".join(tables[5]) + """

## Ordered Schur forms

`Schur80_head` and `Schur2026_head`. Thirty real matrices of the orders 4 to 40 for each row, ordered by increasing
modulus of the eigenvalues: the number of forms whose eigenvalues are out of order although the code is 0; then the
worst residual and the largest distance of u from orthogonal, computed in long double, in units of n eps.

""" + "\n".join(tables[6]) + """

## Eigenproblems and QR by blocks

`SymEvectorEvalue_head` and, for Hermitian matrices, `CxEigenValueVector_head`; `EigenValueVector_head` and
`CxEigenValueVector_head`; `QRDecH` and `CxQRDecH`; and the revisions with 2026 in their names. Matrices of the orders
70, 170 and 300, real and complex: the worst residual and, except for general eigenproblems, the largest distance of
the vectors or q from orthonormal, computed in long double, in units of n eps.

""" + "\n".join(tables[7]) + "\n")


if __name__ == "__main__":
    main()
