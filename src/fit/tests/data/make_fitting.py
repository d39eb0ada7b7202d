"""The linear part of docs/accuracy/fitting.md, from the built module and nist_linear.dat.

    QX_LIBRARY_DIR=build/release PYTHONPATH=python make_fitting.py

A number of digits is -log10 of the largest relative error of the coefficients, of their standard
deviations (from the covariance and the MSE) or of the sum of squared residuals, at most 15.
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
    """Coefficients, standard deviations, MSE, or None where the method fails."""
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


def cell(values):
    return " / ".join(values)


def main():
    used = [(i, name) for i, name in enumerate(METHODS) if name]
    print("| Set | terms | " + " | ".join(name for _, name in used) + " | LAPACK |")
    print("|---|---|" + "---|" * (len(used) + 1))
    for name, kind, exact, deviations, squares, y, x in sets():
        k = len(exact)
        cells = []
        for algorithm, _ in used:
            found = fit(kind, k, y, x, algorithm)
            cells.append("fails" if found is None else
                         cell([digits(found[0], exact), digits(found[1], deviations),
                               digits(found[2], squares)]))
        matrix = np.vander(x[:, 0], k, increasing=True) if kind == "polynomial" else x
        peer = np.linalg.lstsq(matrix, y, rcond=0)[0]
        cells.append(digits(peer, exact))
        print(f"| {name} | {k} | " + " | ".join(cells) + " |")
    print()
    name, _, exact, _, squares, y, x = next(sets())
    slope, intercept, mse = qx.call("LinFit_head", y, x[:, 0], [])[1:]
    print("LinFit_head on Norris:", digits([intercept, slope], exact), digits(mse * len(y), squares))


if __name__ == "__main__":
    main()
