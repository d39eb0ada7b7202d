"""Least squares, pseudo-inverses, norms, condition numbers and ranks by singular values: the revisions of 2026 against
NumPy and against their elders, in one process.

Ours is the export, called through the binding. NumPy's speed depends on the BLAS that it finds; the first line
names it.
"""

import sys
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from matrix_equations import blas_of_scipy, compare  # noqa: E402

SHAPES = ((5, 5), (50, 50), (200, 200), (100, 10), (1000, 20))
SIDES = 10
DEFAULT = -1.0  # the tolerance that selects the usual one

# What, revision, elder, the arguments of both, and the peer with its name.
ROWS = [
    ("least squares, ten right sides", "EqsSetBySVD2026_head", "EqsSetBySVDDri82_head", lambda a, b: (a, b, DEFAULT),
     "numpy.linalg.lstsq", lambda a, b: np.linalg.lstsq(a, b, rcond=None)),
    ("least squares, one right side", "GenLinEqs2026_head", "GenLinEqs82_head", lambda a, b: (a, b[:, 0], DEFAULT),
     "numpy.linalg.lstsq", lambda a, b: np.linalg.lstsq(a, b[:, 0], rcond=None)),
    ("pseudo-inverses", "PseudoInverse2026_head", "PseudoInverse_head", lambda a, b: (a, DEFAULT),
     "numpy.linalg.pinv", lambda a, b: np.linalg.pinv(a)),
    ("norms by singular values", "Norm2026_head", "Norm_head", lambda a, b: (a, 0),
     "numpy.linalg.norm", lambda a, b: np.linalg.norm(a, 2)),
    ("Frobenius norms", "Norm2026_head", "Norm_head", lambda a, b: (a, 2),
     "numpy.linalg.norm", lambda a, b: np.linalg.norm(a)),
    ("condition numbers", "CondNumber2026_head", "CondNumber_head", lambda a, b: (a, 0),
     "numpy.linalg.cond", lambda a, b: np.linalg.cond(a)),
    ("ranks", "Rank2026_head", "Rank_head", lambda a, b: (a, DEFAULT),
     "numpy.linalg.matrix_rank", lambda a, b: np.linalg.matrix_rank(a))]
# The elders of GenLinEqs2026_head that have no complex form, and their arguments after the tolerance.
REAL_ELDERS = [("GenLinEqs2010_head", ()), ("GenLinEqsbySVD2011_head", (1,))]


def noise(kind, *shape):
    random = np.random.default_rng(sum(shape))
    x = random.standard_normal(shape)
    return x if kind == "real" else x + 1j * random.standard_normal(shape)


def cases(export, arguments, other, prefixes):
    """`other` takes the prefix of the kind and the arrays, and returns what is compared."""
    for kind, prefix in prefixes.items():
        for rows, columns in SHAPES:
            a, b = noise(kind, rows, columns), noise(kind, rows, SIDES)
            given = arguments(a, b)
            yield f"{kind}, {rows} by {columns}", lambda: qx.call(prefix + export, *given), other(prefix, a, b)


def main():
    print("BLAS of NumPy:", blas_of_scipy())
    both, real = {"real": "", "complex": "Cx"}, {"real": ""}
    for what, export, elder, arguments, name, peer in ROWS:
        compare(f"{what}, revision", name,
                cases(export, arguments, lambda prefix, a, b: lambda: peer(a, b), both))
        compare(f"{what}, revision", "elder",
                cases(export, arguments, lambda prefix, a, b: lambda: qx.call(prefix + elder, *arguments(a, b)), both))
    for elder, more in REAL_ELDERS:
        compare("least squares, one right side, revision", f"elder {elder}",
                cases("GenLinEqs2026_head", lambda a, b: (a, b[:, 0], DEFAULT),
                      lambda prefix, a, b: lambda: qx.call(elder, a, b[:, 0], DEFAULT, *more), real))


if __name__ == "__main__":
    main()
