"""Writes docs/accuracy/factorisations.md: residuals and orthogonality of factorisations and
eigenproblems over kinds of matrices, next to LAPACK's (through SciPy) for the same matrices, and the
error of matrix functions against mpmath. Run from the repository's root with the library built:
QX_LIBRARY_DIR=build/release PYTHONPATH=python /usr/bin/python3 \\
    src/linalg/tests/data/make_factorisations.py"""

import pathlib

import numpy as np
import scipy.linalg

import qx
from make_linear_systems import EPSILON, kinds

REFUSED = set()  # (order, kind) for which the limit of 40 iterations was too low
ORDERS = (1, 2, 3, 5, 10, 30, 100, 300)


def wide(a):
    return a.astype(np.clongdouble if np.iscomplexobj(a) else np.longdouble)


def norm(a):
    return float(np.sqrt(np.sum(np.abs(a)**2)))


def residual(product, a):
    scale = norm(a) * max(a.shape) * EPSILON
    return norm(product - wide(a)) / scale if scale else 0.0


def from_unitary(*factors):
    return max(norm(wide(q).conj().T @ wide(q) - np.eye(q.shape[1])) / (max(q.shape) * EPSILON)
               for q in factors)


def svd_errors(a, u, s, v):
    return residual(wide(u) * s @ wide(v).conj().T, a), from_unitary(u, v)


def qr_errors(a, q, r):
    return residual(wide(q) @ wide(r), a), from_unitary(q)


def symmetric_errors(a, w, v):
    return residual(wide(v) * w @ wide(v).T, a), from_unitary(v)


def pair_errors(a, w, v):
    """The largest |a v - w v| / (|a| |v|), without a measure of orthogonality."""
    difference = wide(a) @ wide(v.astype(complex)) - wide(v.astype(complex)) * w
    scale = norm(a) * len(a) * EPSILON
    columns = np.sqrt(np.sum(np.abs(difference)**2, axis=0)) / np.linalg.norm(v, axis=0)
    return float(columns.max()) / scale if scale else 0.0, None


def rows_of(a, kind):
    symmetric = (a + a.T) / 2
    u, s, v = qx.call("SVDEx_head", a, 0)
    yield "SVD", svd_errors(a, u, s, v)
    u, s, vh = scipy.linalg.svd(a, lapack_driver="gesvd")
    yield "dgesvd", svd_errors(a, u, s, vh.T)
    z = a * np.exp(1j * np.arange(a.size).reshape(a.shape))
    yield "SVD complex", svd_errors(z, *qx.call("CxSVDEx_head", z, 0))
    yield "QR", qr_errors(a, *qx.call("qrd_head", a, 0))
    yield "dgeqrf", qr_errors(a, *scipy.linalg.qr(a))
    yield "Gram-Schmidt, modified", qr_errors(a, *qx.call("qrd_head", a, 1))
    yield "Gram-Schmidt, classical", qr_errors(a, *qx.call("qrd_head", a, 2))
    v, w = qx.call("SymEvectorEvalue_head", symmetric, 1)
    yield "symmetric", symmetric_errors(symmetric, w, v)
    yield "dsyev", symmetric_errors(symmetric, *scipy.linalg.eigh(symmetric, driver="ev"))
    try:
        yield "general", pair_errors(a, *qx.call("EigenValueVector_head", a, 1))
    except qx.QxError as error:
        assert error.name == "ErrIterationLimit"
        REFUSED.add((len(a), kind))
    yield "dgeev", pair_errors(a, *scipy.linalg.eig(a))


def factorisations():
    table = {}
    for n in ORDERS:
        for kind, a in kinds(n, np.random.default_rng(n)):
            for name, errors in rows_of(a, kind):
                old = table.setdefault(kind, {}).get(name, (0.0, None))
                table[kind][name] = tuple(
                    new if before is None else max(before, new) if new is not None else None
                    for before, new in zip(old, errors))
    names = list(next(iter(table.values())))
    yield "| Matrix | " + " | ".join(names) + " |"
    yield "|---" * (len(names) + 1) + "|"
    for kind, row in table.items():
        cells = [f"{r:.2f}" if q is None else f"{r:.2f}, {q:.2f}" for r, q in row.values()]
        yield f"| {kind} | " + " | ".join(cells) + " |"


def numbers(line):
    values = [float.fromhex(word) for word in line.split()]
    n = round((len(values) / 2)**0.5)
    return (np.array(values[::2]) + 1j * np.array(values[1::2])).reshape(n, n)


def functions():
    lines = (pathlib.Path(__file__).parent / "matrix_functions.dat").read_text().splitlines()
    yield "| Matrix | row norm | exp | SciPy's expm | log | SciPy's logm | square root | exp(log(a)) |"
    yield "|---|---|---|---|---|---|---|---|"
    for at in range(0, len(lines), 5):
        name = lines[at].split()[0].replace("_", " ")
        a, exp, log, root = (numbers(line) for line in lines[at + 1:at + 5])

        def error(x, exact):
            return f"{norm(x - exact) / norm(exact):.1e}"
        ours = qx.call("CxMatrixLn_head", a)
        yield (f"| {name} | {np.linalg.norm(a, np.inf):.1f} "
               f"| {error(qx.call('CxMatrixExp_head', a), exp)} | {error(scipy.linalg.expm(a), exp)} "
               f"| {error(ours, log)} | {error(scipy.linalg.logm(a), log)} "
               f"| {error(qx.call('CxMatrixSqrt_head', a), root)} "
               f"| {error(qx.call('CxMatrixExp_head', ours), a)} |")


def main():
    table = "\n".join(factorisations())
    refused = ", ".join(f"{kind} of order {n}" for n, kind in sorted(REFUSED)) or "none"
    text = f"""# Accuracy of factorisations, eigenproblems and matrix functions

Largest errors over the orders {", ".join(map(str, ORDERS))}, in units of n times 2.2e-16, next to
LAPACK's (through SciPy) for the same matrices: |a - product of the factors| / |a|, then the distance of
the unitary factors from unitary, |q^H q - 1|; for general eigenproblems, the largest |a v - w v| / (|a| |v|).
Written by `src/linalg/tests/data/make_factorisations.py`.

{table}

Refused by the general eigenproblem, whose iteration stops after 40 steps for one value: {refused}.

Where the residual of a general eigenproblem is large, the reason is balancing: the residual is small for the
balanced matrix, but rows and columns that differ greatly in magnitude make the balanced matrix very different.
LAPACK balances by Euclidean norms instead of sums of absolute values, and therefore leaves the Frank and
Vandermonde matrices unchanged.

Relative errors of matrix functions against mpmath with 60 digits (complex exports):

{chr(10).join(functions())}

The exponential uses the degree that its bound of 1e-8 requires, and the logarithm is refined with that
exponential; both are therefore less accurate than the square root, although exp(log(a)) reproduces a.
"""
    pathlib.Path("docs/accuracy/factorisations.md").write_text(text)


if __name__ == "__main__":
    main()
