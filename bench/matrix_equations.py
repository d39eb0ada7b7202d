"""Sylvester and Lyapunov equations, functions and Schur forms of matrices against SciPy, in one process.

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


def exponential_cases():
    for kind, prefix in (("real", ""), ("complex", "Cx")):
        for n in ORDERS:
            a, = matrices(kind, n, 1)
            yield (f"{kind}, n {n}", lambda: qx.call(prefix + "MatrixExp2026_head", a), lambda: linalg.expm(a))


def function_cases(export, peer, of_elder=None):
    """Compares with the peer, or with the elder export if one is given."""
    for kind, prefix in (("real", ""), ("complex", "Cx")):
        for n in ORDERS:
            a, = matrices(kind, n, 1)
            other = (lambda: qx.call(of_elder[kind], a)) if of_elder else (lambda: peer(a))
            yield f"{kind}, n {n}", lambda: qx.call(prefix + export, a), other


def power_cases():
    for kind, prefix in (("real", ""), ("complex", "Cx")):
        for n in ORDERS:
            a, = matrices(kind, n, 1)
            yield (f"{kind}, n {n}", lambda: qx.call(prefix + "MatrixPower2026_head", a, -3),
                   lambda: np.linalg.matrix_power(a, -3))


def schur_cases():
    """Unordered, and with eigenvalues of negative real part first, compared with SciPy's sorted form."""
    for n in ORDERS:
        a, = matrices("real", n, 1)
        yield f"n {n}", lambda: qx.call("Schur2026_head", a, 1, 0), lambda: linalg.schur(a, output="real")
        yield (f"ordered, n {n}", lambda: qx.call("Schur2026_head", a, 1, 1),
               lambda: linalg.schur(a, output="real", sort="lhp"))


def blas_of_scipy():
    maps = Path("/proc/self/maps").read_text().split()
    return ", ".join(sorted({word for word in maps if re.match("lib.*blas", Path(word).name)}))


if __name__ == "__main__":
    print("BLAS of SciPy:", blas_of_scipy())
    compare("Sylvester equations", "SciPy", sylvester_cases())
    compare("continuous Lyapunov equations", "SciPy", continuous_cases())
    compare("discrete Lyapunov equations", "SciPy", discrete_cases())
    compare("matrix exponentials, revision", "SciPy", exponential_cases())
    compare("matrix logarithms, revision", "SciPy",
            function_cases("MatrixLn2026_head", lambda a: linalg.logm(a, disp=False)))
    compare("matrix square roots, revision", "SciPy", function_cases("MatrixSqrt2026_head", linalg.sqrtm))
    compare("matrix square roots, revision", "elder",
            function_cases("MatrixSqrt2026_head", None, {"real": "MatrixSqrtH", "complex": "CxMatrixSqrt_head"}))
    compare("matrix powers of -3, revision", "NumPy", power_cases())
    compare("Schur forms, revision", "SciPy", schur_cases())
