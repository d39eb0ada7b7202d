#!/usr/bin/python3
"""Measures how the error of InvChirpZT_head grows with the number of points and with the arc, and
prints the table of docs/accuracy/chirp_z.md.

    QX_LIBRARY_DIR=build/release tools/accuracy/chirp_z.py

The points are computed in long double and rounded, so that the errors are those of the inverse alone.
"""

import sys
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "python"))

import qx  # noqa: E402

ARCS = [1.0, 0.999, 0.99, 0.9, 0.75, 0.5, 0.25, 0.1]  # of a turn, n points spread over it
LENGTHS = [4, 8, 16, 32, 64, 128, 256, 512]
TURN = 2 * np.arctan2(np.longdouble(0), np.longdouble(-1))


def error(n, arc):
    """The largest relative error for three random signals."""
    w = complex(np.exp(-1j * float(TURN * arc / n)))
    angle = np.arctan2(np.longdouble(w.imag), np.longdouble(w.real))
    growth = np.log(np.longdouble(w.real) ** 2 + np.longdouble(w.imag) ** 2) / 2
    exponent = np.outer(np.arange(n), np.arange(n)).astype(np.longdouble)
    matrix = np.exp(exponent * growth) * (np.cos(exponent * angle) + 1j * np.sin(exponent * angle))
    worst = 0.0
    for seed in range(3):
        noise = np.random.default_rng(seed)
        x = noise.normal(size=n) + 1j * noise.normal(size=n)
        again = qx.call("InvChirpZT_head", (matrix @ x).astype(complex), 1.0, w, 0)
        worst = np.maximum(worst, np.abs(again - x).max() / np.abs(x).max())
    return worst


def main():
    print("| Arc / turn | " + " | ".join(f"n = {n}" for n in LENGTHS) + " |")
    print("|" + "---|" * (len(LENGTHS) + 1))
    for arc in ARCS:
        cells = [error(n, arc) for n in LENGTHS]
        print(f"| {arc:g} | " + " | ".join(f"{e:.0e}" if e < 1 else "lost" for e in cells) + " |")


if __name__ == "__main__":
    main()
