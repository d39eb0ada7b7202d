"""Writes matrix_functions.dat: complex matrices with their exponential, principal logarithm and
principal square root, by mpmath with 60 digits; and hard_matrix_functions.dat: matrices with eigenvalues
on the negative axis, defective, graded, of extreme size, with logarithm and square root from their
eigenvalues by mpmath with 150 digits. Numbers are hexadecimal, real and imaginary part."""

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


def similar(values, is_complex=False):
    """A matrix with these eigenvalues, up to rounding."""
    n = len(values)
    with mpmath.workdps(60):
        v = mpmath.matrix([[mpmath.mpc(noise(), noise() if is_complex else 0) + (i == j) for j in range(n)]
                           for i in range(n)])
        a = v * mpmath.diag(values) * v**-1
        return [[complex(a[i, j]) for j in range(n)] for i in range(n)]


def hard_matrices():
    yield "negative values", similar([-1, -2, -3, -7])
    yield "negative among complex", similar([-1, -5, 2, 8], True)
    yield "of all kinds", [[0.0, -2.0, 1.0, 0.5], [2.0, 0.0, 3.0, 1.0], [0.0, 0.0, -1.5, 4.0], [0.0, 0.0, 0.0, 2.5]]
    yield "graded 5", [[noise() * 2.0**(-5 * i - 5 * j) for j in range(5)] for i in range(5)]
    yield "graded complex", [[complex(noise(), noise()) * 2.0**(-6 * i - 6 * j) for j in range(4)] for i in range(4)]
    yield "small", [[1e-14 * noise() for _ in range(4)] for _ in range(4)]
    yield "near 0", [[complex(noise(), noise()) * 1e-290 for _ in range(3)] for _ in range(3)]
    yield "near the largest", [[noise() * 1e308 for _ in range(3)] for _ in range(3)]
    yield "large beside small", [[1.5, 1e6, -1e5], [0.0, 0.5, 1e6], [0.0, 0.0, 0.75]]
    yield "close values", [[1.0, 1.0, 2.0], [0.0, 1.0 + 2.0**-40, 3.0], [0.0, 0.0, 1.0 - 2.0**-30]]


def of_eigenvalues(a, function):
    """The function of a diagonalisable matrix; values within 1e-12 of the negative axis are on it."""
    values, vectors = mpmath.eig(a)
    size = max(abs(value) for value in values)
    on_axis = [mpmath.re(v) if abs(mpmath.im(v)) < 1e-12 * size and mpmath.re(v) < 0 else v for v in values]
    return vectors * mpmath.diag([function(v) for v in on_axis]) * vectors**-1


def defective():
    """u j u^-1 in integers, where j has the Jordan block (4, 1; 0, 4, 1; 0, 0, 4) and a -9."""
    u = mpmath.matrix([[1, 2, 0, 1], [0, 1, 3, 0], [0, 0, 1, 2], [0, 0, 0, 1]])
    u = u.T * u
    functions = [(mpmath.mpf(4), mpmath.mpf(1), mpmath.mpf(0), mpmath.mpf(-9)),
                 (mpmath.log(4), 1 / mpmath.mpf(4), -1 / mpmath.mpf(32), mpmath.mpc(mpmath.log(9), mpmath.pi)),
                 (mpmath.mpf(2), 1 / mpmath.mpf(4), -1 / mpmath.mpf(64), mpmath.mpc(0, 3))]
    for value, first, second, single in functions:
        j = mpmath.diag([value, value, value, single])
        j[0, 1] = j[1, 2] = first
        j[0, 2] = second
        yield u * j * u**-1


def hard_cases():
    with mpmath.workdps(150):
        for name, rows in hard_matrices():
            a = mpmath.matrix(rows)
            yield name, a, of_eigenvalues(a, mpmath.log), of_eigenvalues(a, mpmath.sqrt)
        yield "defective", *defective()


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
    lines = []
    for name, *matrices_of in hard_cases():
        lines += [f"{name.replace(' ', '_')} {matrices_of[0].rows}", *map(words, matrices_of)]
    path.with_name("hard_matrix_functions.dat").write_text("\n".join(lines) + "\n")


if __name__ == "__main__":
    main()
