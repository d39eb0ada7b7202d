#!/usr/bin/python3
"""Writes docs/accuracy/matrix_equations.md: residuals of Sylvester and Lyapunov equations, computed
in long double, next to SciPy's for the same matrices.

usage: QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/matrix_equations.py
"""

import warnings
from pathlib import Path

import numpy as np
from scipy import linalg

import qx

PAGE = Path(__file__).resolve().parents[2] / "docs/accuracy/matrix_equations.md"
ORDERS = (2, 5, 10, 20, 50, 100, 200)
DIRECT = 20  # the largest order for SciPy's Kronecker products
EPS = 2.0**-52
random = np.random.default_rng(1)


def noise(n, kind):
    real = random.standard_normal((n, n))
    return real + 1j * random.standard_normal((n, n)) if kind == "complex" else real


def rotated(values, kind, above):
    """A matrix with these eigenvalues; `above` is the size of the elements above the diagonal of its Schur form."""
    n = len(values)
    q = np.linalg.qr(noise(n, kind))[0]
    return q @ (np.diag(values) + above * np.triu(noise(n, kind), 1)) @ q.conj().T


def jordan(n, value):
    return value * np.eye(n) + np.diag(np.ones(n - 1), 1)


def powers(n, exponents):
    return np.ldexp(1.0, exponents(*np.indices((n, n))))


def regular(n, kind):
    return noise(n, kind) + n * np.eye(n)


KINDS = {
    "random": noise,
    "stable": lambda n, kind: noise(n, kind) - 2 * np.sqrt(n) * np.eye(n),
    "contraction": lambda n, kind: noise(n, kind) * 0.6 / np.sqrt(n),
    "graded": lambda n, kind: regular(n, kind) * powers(n, lambda i, j: -(20 * (i + j) // n)),
    "badly scaled": lambda n, kind: regular(n, kind) * powers(n, lambda i, j: 15 * (i % 3 - j % 3)),
    "defective": lambda n, kind: jordan(n, 0.75),
    "nearly defective": lambda n, kind: rotated(np.full(n, 0.75), kind, 0.2),
    "nearly singular, sums": lambda n, kind: rotated(np.r_[1e-12, np.linspace(1, 2, n - 1)], kind, 0.1),
    "nearly singular, products": lambda n, kind: rotated(np.r_[1 - 1e-12, np.linspace(-0.9, 0.5, n - 1)],
                                                         kind, 0.1),
    "huge": lambda n, kind: noise(n, kind) * 1e120,
}


def norm(a):
    return np.sqrt((np.abs(a) ** 2).sum())


def ratio(a, b, c, x, products):
    long = np.clongdouble if any(np.iscomplexobj(m) for m in (a, b, c, x)) else np.longdouble
    a, b, c, x = (np.asarray(m, dtype=long) for m in (a, b, c, x))
    residual = a @ x @ b - x - c if products else a @ x + x @ b - c
    size = norm(a) * norm(b) + 1 if products else norm(a) + norm(b)
    return float(norm(residual) / (EPS * size * norm(x)))


def ours(export, *arguments):
    prefix = "Cx" if any(np.iscomplexobj(a) for a in arguments) else ""
    try:
        return qx.call(prefix + export, *arguments)
    except qx.QxError as error:
        return error.name


def theirs(solve, *arguments, **options):
    try:
        with warnings.catch_warnings(), np.errstate(all="ignore"):
            warnings.simplefilter("ignore")
            return solve(*arguments, **options)
    except (np.linalg.LinAlgError, ValueError, RuntimeError) as error:
        return type(error).__name__


def columns(a, kind):
    """Name, solution and the equation that it belongs to, of each column of the table."""
    n = len(a)
    b, c = KINDS["random"](n, kind) * norm(a) / n, noise(n, kind)
    q = c + c.conj().T
    adjoint = a.conj().T
    yield "Sylvester", ours("Sylvester_head", a, b, c), (a, b, c, False)
    yield "SciPy", theirs(linalg.solve_sylvester, a, b, c), (a, b, c, False)
    yield "products", ours("Sylvester2011_head", a, b, c, 2), (a, b, c, True)
    yield "Lyapunov", ours("Lyapunov_head", a, q), (a, adjoint, q, False)
    yield "SciPy ", theirs(linalg.solve_continuous_lyapunov, a, q), (a, adjoint, q, False)
    yield "discrete", ours("Lyapunov2011_head", a, q, 1), (a, adjoint, -q, True)
    yield ("SciPy, bilinear", theirs(linalg.solve_discrete_lyapunov, a, q, method="bilinear"),
           (a, adjoint, -q, True))
    direct = n <= DIRECT
    yield ("SciPy, direct", theirs(linalg.solve_discrete_lyapunov, a, q, method="direct")
           if direct else None, (a, adjoint, -q, True))


def worst_row(name, kind):
    worst = {}
    for n in ORDERS:
        a = KINDS[name](n, kind)
        if kind == "complex":
            a = a + 0j
        for column, x, equation in columns(a, kind):
            found = worst.setdefault(column, [0.0, set()])
            if isinstance(x, str):
                found[1].add(x)
            elif x is not None:
                value = ratio(*equation[:3], x, equation[3])
                found[0] = max(found[0], value) if np.isfinite(value) else np.inf
    return worst


def cell(value, refusals):
    return ", ".join(([f"{value:.3g}"] if value else []) + sorted(refusals))


def main():
    lines = []
    for name in KINDS:
        for kind in ("real", "complex"):
            row = worst_row(name, kind)
            if not lines:
                lines = ["| Matrix | " + " | ".join(c.strip() for c in row) + " |",
                         "|---" * (len(row) + 1) + "|"]
            lines.append(f"| {name}, {kind} | " + " | ".join(cell(*found) for found in row.values())
                         + " |")
            print(lines[-1], flush=True)
    PAGE.write_text(f"""# Accuracy of matrix equations

Residuals, computed in long double, in units of eps (|a| + |b|) |x| (of eps (|a| |b| + 1) |x| for
products), with Frobenius norms: the largest over the orders {", ".join(map(str, ORDERS))}, next to SciPy's for
the same matrices (its direct method for discrete equations up to order {DIRECT}). Right-hand sides are random, and
symmetric for Lyapunov equations; b of the Sylvester equations is random, of the magnitude of a. A
code means that the equation was refused at some of the orders. Written by
`tools/accuracy/matrix_equations.py`.

""" + "\n".join(lines) + "\n")


if __name__ == "__main__":
    main()
