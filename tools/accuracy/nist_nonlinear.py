#!/usr/bin/python3
"""SciPy's least_squares on the 27 nonlinear regression sets of NIST's Statistical Reference Datasets, from both starts
with exact derivatives: the columns of SciPy in docs/accuracy/fitting.md. Prints a row for each set and method.

usage: tools/accuracy/nist_nonlinear.py
"""

import math
from pathlib import Path

import numpy as np
from scipy.optimize import least_squares

DATA = Path(__file__).resolve().parents[2] / "src/fit/tests/data/nist_nonlinear.dat"
EVALUATIONS = 10000
exp = np.exp


def cubics(b, x):
    return (b[0] + x * (b[1] + x * (b[2] + x * b[3]))) / (1 + x * (b[4] + x * (b[5] + x * b[6])))


def wave(x, period, cosine, sine):
    phase = 2 * np.pi * x / period
    return cosine * np.cos(phase) + sine * np.sin(phase)


def peaks(b, x):
    return (b[0] * exp(-b[1] * x) + b[2] * exp(-((x - b[3]) / b[4]) ** 2) + b[5] * exp(-((x - b[6]) / b[7]) ** 2))


MODELS = {
    "Bennett5": lambda b, x: b[0] * (b[1] + x) ** (-1 / b[2]),
    "Chwirut": lambda b, x: exp(-b[0] * x) / (b[1] + b[2] * x),
    "DanWood": lambda b, x: b[0] * x ** b[1],
    "ENSO": lambda b, x: b[0] + wave(x, 12, b[1], b[2]) + wave(x, b[3], b[4], b[5]) + wave(x, b[6], b[7], b[8]),
    "Eckerle4": lambda b, x: b[0] / b[1] * exp(-0.5 * ((x - b[2]) / b[1]) ** 2),
    "Gauss": peaks, "Hahn1": cubics, "Thurber": cubics,
    "Kirby2": lambda b, x: (b[0] + x * (b[1] + x * b[2])) / (1 + x * (b[3] + x * b[4])),
    "Lanczos": lambda b, x: b[0] * exp(-b[1] * x) + b[2] * exp(-b[3] * x) + b[4] * exp(-b[5] * x),
    "MGH09": lambda b, x: b[0] * (x * x + x * b[1]) / (x * x + x * b[2] + b[3]),
    "MGH10": lambda b, x: b[0] * exp(b[1] / (x + b[2])),
    "MGH17": lambda b, x: b[0] + b[1] * exp(-x * b[3]) + b[2] * exp(-x * b[4]),
    "BoxBOD": lambda b, x: b[0] * (1 - exp(-b[1] * x)), "Misra1a": lambda b, x: b[0] * (1 - exp(-b[1] * x)),
    "Misra1b": lambda b, x: b[0] * (1 - (1 + b[1] * x / 2) ** -2.0),
    "Misra1c": lambda b, x: b[0] * (1 - (1 + 2 * b[1] * x) ** -0.5),
    "Misra1d": lambda b, x: b[0] * b[1] * x / (1 + b[1] * x),
    "Nelson": lambda b, x, second: b[0] - b[1] * x * exp(-b[2] * second),  # of ln y
    "Rat42": lambda b, x: b[0] / (1 + exp(b[1] - b[2] * x)),
    "Rat43": lambda b, x: b[0] / (1 + exp(b[1] - b[2] * x)) ** (1 / b[3]),
    "Roszman1": lambda b, x: b[0] - b[1] * x - np.arctan(b[2] / (x - b[3])) / np.pi,
}


def sets():
    lines = iter([line for line in DATA.read_text().splitlines() if not line.startswith("#")])
    for header in lines:
        name, _, parameters, count, _, squares, _ = header.split()
        b = np.array([next(lines).split() for _ in range(int(parameters))], float)
        data = np.array([next(lines).split() for _ in range(int(count))], float)
        yield name, b[:, 0], b[:, 1], b[:, 2], float(squares), data[:, 0], data[:, 1:].T


def fit(name, start, y, predictors, method):
    model = MODELS.get(name) or MODELS[name[:-1]]
    target = np.log(y) if name == "Nelson" else y

    def residuals(b):
        return model(b, *predictors) - target

    def jacobian(b):
        """Derivatives to rounding errors, from a step along the imaginary axis."""
        columns = []
        for j in range(len(b)):
            moved = b.astype(complex)
            moved[j] += 1e-30j
            columns.append(np.imag(model(moved, *predictors)) / 1e-30 * np.ones(len(y)))
        return np.column_stack(columns)

    with np.errstate(all="ignore"):
        try:
            # The smallest tolerances that least_squares accepts.
            tolerance = np.finfo(float).eps
            return least_squares(residuals, start, jacobian, method=method, x_scale="jac", ftol=tolerance,
                                 xtol=tolerance, gtol=tolerance, max_nfev=EVALUATIONS)
        except ValueError:  # residuals that are not finite
            return None


def cell(found, certified, squares):
    if found is None:
        return "not finite"
    error = np.max(np.abs(found.x / certified - 1))
    digits = min(11.0, max(0.0, -math.log10(max(error, 1e-300)))) if np.isfinite(error) else 0.0
    if digits < 1:
        return f"elsewhere, {2 * found.cost / squares:.3g} times the squares"
    return f"{digits:.1f} ({found.nfev})"


def main():
    for name, first, second, certified, squares, y, predictors in sets():
        cells = [cell(fit(name, start, y, predictors, method), certified, squares)
                 for method in ("lm", "trf") for start in (first, second)]
        print(f"| {name} | " + " | ".join(cells) + " |", flush=True)


if __name__ == "__main__":
    main()
