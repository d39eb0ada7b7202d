"""Writes matrix_functions.dat: complex matrices with their exponential, principal logarithm and
principal square root, by mpmath with 60 digits. Numbers are hexadecimal, real and imaginary part."""

import pathlib
import random

import mpmath

mpmath.mp.dps = 60
RANDOM = random.Random(12)


def noise():
    return RANDOM.uniform(-1, 1)


def matrices():
    yield "real of small norm", [[0.05 * noise() + (i == j) for j in range(3)] for i in range(3)]
    for n in (2, 3, 5, 8):
        yield f"real {n}", [[noise() + 3 * (i == j) for j in range(n)] for i in range(n)]
        yield f"complex {n}", [[complex(noise(), noise()) + 3 * (i == j) for j in range(n)]
                               for i in range(n)]
    yield "large norm", [[8 * noise() + 20 * (i == j) for j in range(4)] for i in range(4)]
    yield "rotation", [[0.5, -1.0], [1.0, 0.5]]
    yield "symmetric", [[4.0, 1.0, 0.5], [1.0, 3.0, 0.25], [0.5, 0.25, 2.0]]
    yield "triangular", [[1.0, 2.0, 3.0], [0.0, 4.0, 5.0], [0.0, 0.0, 6.0]]


def words(matrix):
    values = [matrix[i, j] for i in range(matrix.rows) for j in range(matrix.cols)]
    return " ".join(f"{float(mpmath.re(v)).hex()} {float(mpmath.im(v)).hex()}" for v in values)


def main():
    lines = []
    for name, rows in matrices():
        a = mpmath.matrix(rows)
        log = mpmath.logm(a)
        root = mpmath.sqrtm(a)
        assert mpmath.mnorm(mpmath.expm(log) - a) < 1e-40 and mpmath.mnorm(root * root - a) < 1e-40
        lines += [f"{name.replace(' ', '_')} {a.rows}"]
        lines += [words(m) for m in (a, mpmath.expm(a), log, root)]
    path = pathlib.Path(__file__).parent / "matrix_functions.dat"
    path.write_text("\n".join(lines) + "\n")


if __name__ == "__main__":
    main()
