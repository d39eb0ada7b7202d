"""Writes docs/accuracy/linear_systems.md: backward errors of the solvers of systems for kinds of
matrices, next to LAPACK's (through SciPy) for the same matrices. Run from the repository's root with
the library built: QX_LIBRARY_DIR=build/release PYTHONPATH=python /usr/bin/python3 \\
    src/linalg/tests/data/make_linear_systems.py"""

import warnings

import mpmath
import numpy as np
import scipy.linalg

import qx

EPSILON = 2.0**-52
ORDERS = (1, 2, 3, 5, 10, 30, 100, 300)


def kinds(n, random):
    i, j = np.indices((n, n))
    yield "random", random.standard_normal((n, n))
    yield "graded", np.ldexp(random.standard_normal((n, n)), np.maximum(40 - i - j, -400))
    yield "badly scaled", np.ldexp(random.standard_normal((n, n)), i % 3 * 30 + j % 2 * 20)
    yield "of rank n/2", (random.standard_normal((n, (n + 1) // 2))
                          @ random.standard_normal(((n + 1) // 2, n)))
    yield "nearly defective", 2 * np.eye(n) + np.eye(n, k=1) + 1e-10 * (j == 0) * (i > 0)
    yield "Hilbert", 1.0 / (i + j + 1)
    yield "Vandermonde", ((i + 1) / n)**j
    yield "Frank", np.where(j < i - 1, 0.0, n - np.maximum(i, j))
    yield "Kahan", np.sin(1.2)**i * np.where(i == j, 1.0, np.where(i < j, -np.cos(1.2), 0.0))
    yield "Grcar", 1.0 * (j == i - 1) * -1 + (j >= i) * (j <= i + 3)


def backward_error(a, b, x):
    """|b - a x| / (|a| |x|) in the Frobenius norm, in units of n eps, the residual in long double."""
    if not np.all(np.isfinite(x)):
        return np.nan
    wide = a.astype(np.longdouble if a.dtype == float else np.clongdouble)
    residual = b - wide @ x
    scale = np.linalg.norm(a) * np.linalg.norm(x) * len(a) * EPSILON
    return float(np.sqrt(np.sum(np.abs(residual)**2))) / scale if scale else 0.0


def normal_error(a, b, x):
    """|a^H (b - a x)| / (|a| |a| |x| + |a| |b|) in units of n eps, for least squares."""
    wide = a.astype(np.longdouble)
    residual = b - wide @ x
    norm = np.linalg.norm(a)
    scale = norm * (norm * np.linalg.norm(x) + np.linalg.norm(b)) * max(a.shape) * EPSILON
    return float(np.sqrt(np.sum((wide.T @ residual)**2))) / scale if scale else 0.0


def solved(call):
    with warnings.catch_warnings():
        warnings.simplefilter("ignore")
        try:
            return call()
        except (qx.QxError, np.linalg.LinAlgError):
            return None


def worst(results):
    known = [value for value in results if value is not None and not np.isnan(value)]
    return f"{max(known):.2f}" if known else "-"


def main():
    table = {}
    for n in ORDERS:
        random = np.random.default_rng(n)
        for kind, a in kinds(n, random):
            b = random.standard_normal(n)
            z = a * np.exp(1j * random.uniform(0, 6, (n, n)))
            definite = a.T @ a / max(np.linalg.norm(a)**2, 1e-300) + 0.01 * np.eye(n)
            row = table.setdefault(kind, {name: [] for name in (
                "LU", "dgesv", "LU complex", "zgesv", "Cholesky", "dpotrs", "SVD", "dgelsd")})

            def add(name, matrix, x, error=backward_error):
                row[name].append(None if x is None else error(matrix, b, x))

            add("LU", a, solved(lambda: qx.call("EqsByLUDri_head", a, b)))
            add("dgesv", a, solved(lambda: scipy.linalg.solve(a, b)))
            add("LU complex", z, solved(lambda: qx.call("CxEqsByLUDri_head", z, b + 0j)))
            add("zgesv", z, solved(lambda: scipy.linalg.solve(z, b + 0j)))
            add("Cholesky", definite, solved(lambda: qx.call("EqsByCholeskyDri_head", definite, b)))
            add("dpotrs", definite,
                solved(lambda: scipy.linalg.cho_solve(scipy.linalg.cho_factor(definite), b)))
            add("SVD", a, solved(lambda: qx.call("GenLinEqs_head", a, b)), normal_error)
            add("dgelsd", a, solved(lambda: scipy.linalg.lstsq(a, b, cond=n * EPSILON)[0]),
                normal_error)
    names = list(next(iter(table.values())))
    lines = [
        "# Accuracy of linear systems", "",
        "Worst backward errors over the orders " + ", ".join(map(str, ORDERS)) + ", in units of",
        "n times 2.2e-16, of the library and of LAPACK (through SciPy) on the same matrices:",
        "|b - a x| / (|a| |x|) of the solvers, and the residual of the normal equations,",
        "|a^T (b - a x)| / (|a| (|a| |x| + |b|)), of least squares (SVD, dgelsd). Solutions that overflow and",
        "matrices that are refused as singular are left out. The matrix for Cholesky is a^T a / |a|^2 + 1/100.",
        "Written by `src/linalg/tests/data/make_linear_systems.py`.", "",
        "| Matrix | " + " | ".join(names) + " |", "|---" * (len(names) + 1) + "|"]
    for kind, row in table.items():
        lines.append(f"| {kind} | " + " | ".join(worst(row[name]) for name in names) + " |")
    mpmath.mp.dps = 60
    lines += ["", "Forward errors for the Hilbert matrix, b = a (1, ..., 1), against the exact inverse"
              " with 60 digits:", "", "| n | condition number | LU | dgesv |", "|---|---|---|---|"]
    for n in (2, 4, 6, 8, 10, 12):
        a = 1.0 / (np.indices((n, n)).sum(0) + 1)
        b = a.sum(1)
        exact = mpmath.lu_solve(mpmath.matrix(a.tolist()), mpmath.matrix(b.tolist()))
        exact = np.array([float(value) for value in exact])
        errors = [np.linalg.norm(x - exact) / np.linalg.norm(exact) for x in
                  (qx.call("EqsByLUDri_head", a, b), np.linalg.solve(a, b))]
        condition = qx.call("CondNumber_head", a, 0)
        lines.append(f"| {n} | {condition:.1e} | {errors[0]:.1e} | {errors[1]:.1e} |")
    with open("docs/accuracy/linear_systems.md", "w", encoding="utf-8") as file:
        file.write("\n".join(lines) + "\n")


main()
