"""Sylvester and Lyapunov equations, functions and Schur forms of matrices against SciPy, and the revisions of 2026
also against their elders, in one process.

Ours is the export, called through the binding. SciPy's speed depends on the BLAS that it finds; the first
line names it.
"""

import re
import sys
import time
from pathlib import Path

import numpy as np

try:
    from scipy import linalg
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402

ORDERS = (5, 10, 20, 50, 100, 200)
ROUNDS = 9


def seconds(function, repeats):
    start = time.perf_counter()
    for _ in range(repeats):
        function()
    return (time.perf_counter() - start) / repeats


def compare(what, peer, cases):
    """The minima of interleaved rounds, which a busy machine disturbs least."""
    ratios = []
    for name, ours, theirs in cases:
        repeats = max(1, int(0.01 / seconds(theirs, 1)))
        rounds = [(seconds(ours, repeats), seconds(theirs, repeats)) for _ in range(ROUNDS)]
        mine, other = (min(column) for column in zip(*rounds))
        ratios.append((mine / other, name))
        print(f"{what}, {name:14} {1e6 * mine:10.1f} us  ratio {mine / other:5.2f}", flush=True)
    print_summary(what, peer, ratios)


def matrices(kind, n, count):
    random = np.random.default_rng(n)
    real = [random.standard_normal((n, n)) for _ in range(2 * count)]
    if kind == "real":
        return real[:count]
    return [re + 1j * im for re, im in zip(real[:count], real[count:])]


def sylvester_cases():
    for kind, export in (("real", "Sylvester_head"), ("complex", "CxSylvester_head")):
        for n in ORDERS:
            a, b, c = matrices(kind, n, 3)
            yield (f"{kind}, n {n}", lambda: qx.call(export, a, b, c),
                   lambda: linalg.solve_sylvester(a, b, c))


def continuous_cases():
    for kind, export in (("real", "Lyapunov_head"), ("complex", "CxLyapunov_head")):
        for n in ORDERS:
            a, q = matrices(kind, n, 2)
            yield (f"{kind}, n {n}", lambda: qx.call(export, a, q),
                   lambda: linalg.solve_continuous_lyapunov(a, q))


def discrete_cases():
    """SciPy's default method: Kronecker products below order 10, otherwise the bilinear map."""
    for kind, export in (("real", "Lyapunov2011_head"), ("complex", "CxLyapunov2011_head")):
        for n in ORDERS:
            a, q = matrices(kind, n, 2)
            yield (f"{kind}, n {n}", lambda: qx.call(export, a, q, 1),
                   lambda: linalg.solve_discrete_lyapunov(a, q))


def function_cases(export, peer=None, elder=None, arguments=()):
    """Compares with the peer, or with the elder exports, real and complex, if they are given."""
    for kind, prefix, of_elder in zip(("real", "complex"), ("", "Cx"), elder or ("", "")):
        for n in ORDERS:
            a, = matrices(kind, n, 1)
            other = (lambda: qx.call(of_elder, a, *arguments)) if elder else (lambda: peer(a))
            yield f"{kind}, n {n}", lambda: qx.call(prefix + export, a, *arguments), other


def schur_cases(elder=None):
    """Unordered, and by ascending real part, compared with SciPy's form, which is sorted by the sign only."""
    for n in ORDERS:
        a, = matrices("real", n, 1)
        for name, order, sort in (("", 0, None), ("ordered, ", 1, "lhp")):
            other = ((lambda: qx.call(elder, a, 1, order)) if elder
                     else lambda: linalg.schur(a, output="real", sort=sort))
            yield f"{name}n {n}", lambda: qx.call("Schur2026_head", a, 1, order), other


def blas_of_scipy():
    maps = Path("/proc/self/maps").read_text().split()
    return ", ".join(sorted({word for word in maps if re.match("lib.*blas", Path(word).name)}))


if __name__ == "__main__":
    print("BLAS of SciPy:", blas_of_scipy())
    compare("Sylvester equations", "SciPy", sylvester_cases())
    compare("continuous Lyapunov equations", "SciPy", continuous_cases())
    compare("discrete Lyapunov equations", "SciPy", discrete_cases())
    for what, export, peer, elder in (
            ("matrix exponentials", "MatrixExp2026_head", linalg.expm, ("MatrixExp_head", "CxMatrixExp_head")),
            ("matrix logarithms", "MatrixLn2026_head", lambda a: linalg.logm(a, disp=False),
             ("MatrixLn_head", "CxMatrixLn_head")),
            ("matrix square roots", "MatrixSqrt2026_head", linalg.sqrtm, ("MatrixSqrtH", "CxMatrixSqrt_head"))):
        compare(f"{what}, revision", "SciPy", function_cases(export, peer))
        compare(f"{what}, revision", "elder", function_cases(export, elder=elder))
    compare("matrix powers of -3, revision", "NumPy",
            function_cases("MatrixPower2026_head", lambda a: np.linalg.matrix_power(a, -3), arguments=(-3,)))
    compare("matrix powers of -3, revision", "elder",
            function_cases("MatrixPower2026_head", elder=("MatrixPower_head", "CxMatrixPower_head"), arguments=(-3,)))
    compare("Schur forms, revision", "SciPy", schur_cases())
    compare("Schur forms, revision", "elder", schur_cases("Schur80_head"))
