"""Prints the table of linear models of docs/accuracy/fitting.md, from the built module and nist_linear.dat.

    QX_LIBRARY_DIR=build/release PYTHONPATH=python make_fitting.py
"""

import math
from pathlib import Path

import numpy as np
import qx

METHODS = ["SVD", "QR", None, None, "LU", "Cholesky", "cut SVD"]


def sets():
    lines = iter((Path(__file__).parent / "nist_linear.dat").read_text().splitlines())
    for header in lines:
        name, kind, n, k, _ = header.split()
        exact = np.array([next(lines).split() for _ in range(int(k))], float)
        squares = float(next(lines))
        data = np.array([next(lines).split() for _ in range(int(n))], float)
        yield name, kind, exact[:, 0], exact[:, 1], squares, data[:, 0], data[:, 1:]


def digits(found, exact):
    with np.errstate(all="ignore"):
        error = np.max(np.abs(np.asarray(found) - exact) / np.where(exact == 0, 1, np.abs(exact)))
    if not np.isfinite(error):
        return "-"
    return f"{15 if error < 1e-15 else min(15, max(0, -math.log10(error))):.1f}"


def fit(kind, k, y, x, algorithm):
    """Coefficients, standard deviations and sum of squares, or None if the method fails."""
    try:
        matrix = np.vander(x[:, 0], k, increasing=True) if kind == "polynomial" else x
        c, _, covariance, mse = qx.call("GenLSFit80_head", matrix, y, [], algorithm, 1)
        if kind == "polynomial":
            c = qx.call("PolyFit_head", x[:, 0], y, k - 1, algorithm)[1]
    except qx.QxError:
        return None
    freedom = len(y) - k
    scale = np.sum((y - matrix @ c) ** 2) / freedom
    with np.errstate(invalid="ignore"):
        return c, np.sqrt(np.diag(covariance) * scale), mse * len(y)


def revised(kind, k, y, x):
    """The same by GenLSFit2026_head and PolyFit2026_head."""
    matrix = np.vander(x[:, 0], k, increasing=True) if kind == "polynomial" else x
    c, _, covariance, mse = qx.call("GenLSFit2026_head", matrix, y, [], -1.0, 1)
    squares = mse * len(y)
    if kind == "polynomial":
        _, c, mse = qx.call("PolyFit2026_head", x[:, 0], y, k - 1, [], -1.0, [], [])
    return c, np.sqrt(np.diag(covariance) * squares / (len(y) - k)), mse * len(y)


def main():
    used = [(i, name) for i, name in enumerate(METHODS) if name]
    print("| Set | Terms | " + " | ".join(name for _, name in used) + " | revision | LAPACK |")
    print("|---|---|" + "---|" * (len(used) + 2))
    for name, kind, exact, deviations, squares, y, x in sets():
        k = len(exact)
        cells = []
        for algorithm, _ in used:
            found = fit(kind, k, y, x, algorithm)
            pairs = zip(found, (exact, deviations, squares)) if found else ()
            cells.append(" / ".join(digits(*pair) for pair in pairs) or "refused")
        matrix = np.vander(x[:, 0], k, increasing=True) if kind == "polynomial" else x
        pairs = zip(revised(kind, k, y, x), (exact, deviations, squares))
        cells.append(" / ".join(digits(*pair) for pair in pairs))
        cells.append(digits(np.linalg.lstsq(matrix, y, rcond=0)[0], exact))
        print(f"| {name} | {k} | " + " | ".join(cells) + " |")
    _, _, exact, _, squares, y, x = next(sets())
    slope, intercept, mse = qx.call("LinFit_head", y, x[:, 0], [])[1:]
    print(f"\n`LinFit_head` on Norris: {digits([intercept, slope], exact)} digits of the "
          f"coefficients, {digits(mse * len(y), squares)} of the sum of squares.")


if __name__ == "__main__":
    main()
