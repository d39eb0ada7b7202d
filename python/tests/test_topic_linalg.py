"""qx.linalg, qx.poly, qx.interpolate, qx.calculus, qx.special and qx.coordinates compared with NumPy and SciPy."""

import sys
import unittest
import unittest.mock
import warnings
from pathlib import Path

import hypothesis
import numpy as np
import scipy.integrate
import scipy.interpolate
import scipy.linalg
import scipy.spatial.transform
import scipy.special
from hypothesis import strategies

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import calculus, coordinates, interpolate, linalg, poly, special  # noqa: E402

RNG = np.random.default_rng(7)


def close(found, expected, rtol=1e-9, atol=1e-10):
    np.testing.assert_allclose(found, expected, rtol=rtol, atol=atol)


def some(*shape, is_complex=False):
    a = RNG.normal(size=shape)
    return a + 1j * RNG.normal(size=shape) if is_complex else a


# The same cases in each run, without a database of earlier ones.
hypothesis.settings.register_profile("same", derandomize=True, database=None)
hypothesis.settings.load_profile("same")


class Systems(unittest.TestCase):
    @hypothesis.given(strategies.integers(1, 60), strategies.booleans(), strategies.booleans(),
                      strategies.sampled_from([None, 1, 3]), strategies.sampled_from([(), (2,)]))
    @hypothesis.settings(max_examples=60, deadline=None)
    def test_solve(self, n, is_complex, is_complex_b, columns, stack):
        a = some(*stack, n, n, is_complex=is_complex) + 3 * n * np.eye(n)
        b = some(*stack, n, *([columns] if columns else []), is_complex=is_complex_b)
        expected = np.linalg.solve(a, b if columns else b[..., None])
        close(linalg.solve(a, b), expected if columns else expected[..., 0], 1e-8)
        if not stack:
            close(linalg.inv(a), np.linalg.inv(a), 1e-8)
            square = a @ a.conj().T
            close(linalg.solve(square, b, "positive"), np.linalg.solve(square, b), 1e-6)
            for which, triangle in (("lower", np.tril), ("upper", np.triu)):
                close(linalg.solve(a, b, which), np.linalg.solve(triangle(a), b), 1e-7)

    def test_bad_systems(self):
        for n in (3, 80):
            singular = np.ones((n, n))
            with self.assertRaisesRegex(np.linalg.LinAlgError, "linalg.solve: a: is singular") as caught:
                linalg.solve(singular, np.ones(n))
            self.assertEqual(caught.exception.name, "ErrSingularMatrix")
        for n in (10, 60):
            u = np.linalg.qr(some(n, n))[0]
            for condition, warns in ((1e6, False), (1e13, True)):
                a = u @ np.diag(np.geomspace(1, 1 / condition, n)) @ u.T
                with warnings.catch_warnings(record=True) as given:
                    warnings.simplefilter("always")
                    linalg.solve(a, np.ones(n))
                self.assertEqual([str(one.message)[:40] for one in given if warns],
                                 ["qx.linalg.solve: a is badly conditioned,"] if warns else [])
                self.assertEqual(bool(given), warns, (n, condition))
        for call, kind in ((lambda: linalg.solve(np.ones((2, 3)), [1, 2]), np.linalg.LinAlgError),
                           (lambda: linalg.solve(np.eye(2), [1, 2, 3]), ValueError),
                           (lambda: linalg.cholesky([[1.0, 2.0], [2.0, 1.0]]), np.linalg.LinAlgError),
                           (lambda: linalg.expm([1.0]), np.linalg.LinAlgError),
                           (lambda: linalg.solve(np.eye(2), [1, 2], "diagonal"), ValueError)):
            self.assertRaises(kind, call)

    def test_warnings_of_stacks_reach_the_caller(self):
        u = np.linalg.qr(some(60, 60))[0]
        bad = u @ np.diag(np.geomspace(1, 1e-13, 60)) @ u.T
        with warnings.catch_warnings(record=True) as given, \
                unittest.mock.patch("qx.topical.axes.processors", lambda: 2):
            warnings.simplefilter("always")
            linalg.solve(np.stack([bad] * 12), np.ones((12, 60)))
        self.assertEqual([Path(one.filename).name for one in given], [Path(__file__).name])

    def test_the_condition_estimate_is_near(self):
        for n in (60, 150):
            for a in (some(n, n), scipy.linalg.toeplitz(0.9 ** np.arange(n)), np.tril(np.ones((n, n)))):
                exact = np.linalg.cond(a, 1)
                found = 1 / qx.exports.EqsSetByLU2026_head(a, np.ones((n, 1)))[1]
                self.assertTrue(exact / 4 < found < exact * 1.001, (n, found / exact))

    def test_least_squares(self):
        for is_complex in (False, True):
            for scale in (1, 1e-9):
                a, b = scale * some(12, 4, is_complex=is_complex), some(12, 2)
                expected = np.linalg.lstsq(a, b, rcond=None)
                found = linalg.lstsq(a, b)
                close(found.x, expected[0], 1e-8)
                close(found.residuals, expected[1], 1e-8)
                self.assertEqual(found.rank, 4)
                close(found.singular_values, expected[3])
                close(linalg.pinv(a), np.linalg.pinv(a), 1e-8, 1e-6)
        a[:, 3] = a[:, 0]
        with self.assertWarnsRegex(qx.QxWarning, "WarnRankDeficient"):
            self.assertEqual((linalg.lstsq(a, b[:, 0]).rank, linalg.matrix_rank(a)), (3, 3))
        ab = np.array([[0, 1, 1, 1], [4.0, 4, 4, 4], [1, 1, 1, 0]])
        close(linalg.solve_banded((1, 1), ab, np.ones((4, 2))), scipy.linalg.solve_banded((1, 1), ab, np.ones((4, 2))))


class Decompositions(unittest.TestCase):
    @hypothesis.given(strategies.integers(1, 12), strategies.integers(1, 12), strategies.booleans(),
                      strategies.sampled_from([(), (3,)]))
    @hypothesis.settings(max_examples=40, deadline=None)
    def test_they_give_the_matrix_back(self, m, n, is_complex, stack):
        a = some(*stack, m, n, is_complex=is_complex)
        u, s, vh = linalg.svd(a, full_matrices=False)
        close((u * s[..., None, :]) @ vh, a)
        close(linalg.svdvals(a), np.linalg.svd(a, compute_uv=False))
        q, r = linalg.qr(a)
        close(q @ r, a)
        p, low, up = linalg.lu(a)
        close(p @ low @ up, a)
        if m == n:
            w, v = linalg.eig(a)
            close(a @ v, v * w[..., None, :], 1e-7, 1e-8)
            h = a + np.swapaxes(a.conj(), -1, -2)
            w, v = linalg.eigh(h)
            close(w, np.linalg.eigvalsh(h))
            close(linalg.eigvalsh(h), w)
            close(h @ v, v * w[..., None, :])
            positive = a @ np.swapaxes(a.conj(), -1, -2) + np.eye(n)
            close(linalg.cholesky(positive), np.linalg.cholesky(positive))
            t, z = linalg.schur(a)
            close(z @ t @ np.swapaxes(z.conj(), -1, -2), a)
            h, q = linalg.hessenberg(a)
            close(q @ h @ np.swapaxes(q.conj(), -1, -2), a)
            close(linalg.det(a), np.linalg.det(a), 1e-8)
            close(linalg.trace(a), np.trace(a, axis1=-2, axis2=-1))

    def test_more_of_them(self):
        a, b = some(5, 5), some(5, 5)
        q, r, order = linalg.qr(a, pivoting=True)
        close(q @ r, a[:, order])
        s, t, q, z = linalg.qz(a, b)
        close(q @ s @ z.T, a)
        close(q @ t @ z.T, b)
        close(np.sort(np.abs(linalg.eigvals(a, b))), np.sort(np.abs(scipy.linalg.eigvals(a, b))), 1e-7)
        self.assertEqual(linalg.svd(some(3, 7)).vh.shape, (7, 7))
        tiny = 1e-13 * a
        close(linalg.svdvals(tiny), np.linalg.svd(tiny, compute_uv=False), 1e-9, 0)
        for ord_ in (None, 1, 2, np.inf, "fro"):
            close(linalg.norm(a, ord_), np.linalg.norm(a, ord_))
        for p in (None, 1, 2, np.inf, "fro"):
            close(linalg.cond(a, p), np.linalg.cond(a, p), 1e-8)
        close(linalg.norm(a[0], 3), np.linalg.norm(a[0], 3))
        balanced, theirs = linalg.balance(a * np.geomspace(1, 1e6, 5)), scipy.linalg.matrix_balance(
            a * np.geomspace(1, 1e6, 5))
        close((a * np.geomspace(1, 1e6, 5)) @ balanced[1], balanced[1] @ balanced[0], 1e-9, 1e-6)
        close(np.linalg.norm(balanced[0]), np.linalg.norm(theirs[0]), 0.5)
        found = linalg.gsvd(a, b[:3])
        close(found.alpha**2 + found.beta**2, 1)
        finite = found.beta > 1e-8
        close(np.sort(found.alpha[finite] / found.beta[finite])**-2,
              np.sort(np.linalg.eigvalsh(np.linalg.inv(a).T @ b[:3].T @ b[:3] @ np.linalg.inv(a)))[2:][::-1], 1e-6)
        self.assertEqual([linalg.is_symmetric(a), linalg.is_symmetric(a + a.T),
                          linalg.is_symmetric(1j * (a - a.T))], [False, True, True])
        close(linalg.charpoly(a)[::-1], np.poly(a), 1e-8)
        close(linalg.kron(a, 1j * b), np.kron(a, 1j * b))
        close(linalg.toeplitz([1, 2, 3], [1, 5j, 6]), scipy.linalg.toeplitz([1, 2, 3], [1, 5j, 6]))
        self.assertIn("values   [", repr(linalg.eigh(a + a.T)))

    def test_given_eigenvalues(self):
        for values in ([3.0, 0.0, 5.0], [3.0, -1e-3, 5.0], [-2.0], [0.0]):
            a = linalg.from_eigenvalues(values)
            close(np.linalg.eigvalsh(a), np.sort(values))
            turned = np.linalg.qr(some(len(values), len(values), is_complex=True))[0]
            for one in (a, turned @ a @ turned.conj().T):
                self.assertEqual(linalg.is_positive_semidefinite(one, 1e-9), min(values) >= 0, values)
        self.assertFalse(linalg.is_positive_semidefinite([[1.0, 2.0], [0.0, 5.0]]), "not symmetric")
        self.assertTrue(linalg.is_positive_semidefinite([[1.0, 0.5], [0.4, 1.0]], 0.1))
        self.assertRaisesRegex(ValueError, "tolerance", linalg.is_positive_semidefinite, [[1.0]], -1.0)
        self.assertRaises(np.linalg.LinAlgError, linalg.is_positive_semidefinite, [[1.0, 2.0]])

    def test_functions_and_equations(self):
        a = 0.3 * some(4, 4) + 2 * np.eye(4)
        close(linalg.expm(a), scipy.linalg.expm(a), 1e-6)
        close(linalg.logm(a), scipy.linalg.logm(a), 1e-6, 1e-7)
        close(linalg.sqrtm(a), scipy.linalg.sqrtm(a), 1e-8)
        close(linalg.matrix_power(a, -2), np.linalg.matrix_power(a, -2), 1e-8)
        for _ in range(20):
            self.assertEqual(linalg.sqrtm(0.3 * some(4, 4) + 2 * np.eye(4)).dtype, float)
        self.assertEqual(linalg.sqrtm(np.diag([1.0, -4.0])).dtype, complex)
        b, q = some(3, 3, is_complex=True) + 4 * np.eye(3), some(4, 3)
        close(linalg.solve_sylvester(a, b, q), scipy.linalg.solve_sylvester(a.astype(complex), b, q), 1e-8)
        q = some(4, 4)
        close(linalg.solve_lyapunov(a, q), scipy.linalg.solve_continuous_lyapunov(a, q), 1e-8)
        close(linalg.solve_discrete_lyapunov(0.3 * a, q), scipy.linalg.solve_discrete_lyapunov(0.3 * a, q), 1e-8)


class Polynomials(unittest.TestCase):
    def test_arithmetic(self):
        polynomial = np.polynomial.polynomial
        p, q = some(5), some(3)
        for p in (p, p + 1j):
            close(poly.add(p, q), polynomial.polyadd(p, q))
            close(poly.subtract(p, q), polynomial.polysub(p, q))
            close(poly.multiply(p, q), polynomial.polymul(p, q))
            for found, expected in zip(poly.divide(p, q), polynomial.polydiv(p, q)):
                close(found, expected, 1e-8)
            close(poly.derivative(p, 2), polynomial.polyder(p, 2))
            close(poly.integral(p, 0.5), polynomial.polyint(p, k=0.5))
            close(poly.evaluate(p, some(2, 3)).shape, (2, 3))
            close(poly.evaluate(p, 0.3), polynomial.polyval(0.3, p))
            close(poly.compose(p, q)[-1], p[-1] * q[-1]**4)
            close(np.sort_complex(poly.roots(p)), np.sort_complex(polynomial.polyroots(p)), 1e-8)
        roots = [1.0, 2 + 1j, 2 - 1j]
        self.assertEqual(poly.from_roots(roots).dtype, float)
        close(poly.from_roots(roots), polynomial.polyfromroots(roots).real)
        self.assertEqual(poly.from_roots([1j, 2]).dtype, complex)
        close(poly.roots(poly.from_roots([3.0] * 6)), np.full(6, 3.0), 1e-9)
        close(poly.evaluate_matrix([1.0, 2.0, 3.0], np.diag([1.0, 2.0])), np.diag([6.0, 17.0]))
        fractions = poly.partial_fractions([1.0, 2.0], [2.0, 5.0, 4.0, 1.0])
        x = 0.7
        found, order = 0.0, {}
        for pole, residue in zip(fractions.poles, fractions.residues):
            order[pole] = order.get(pole, 0) + 1
            found += residue / (x - pole)**order[pole]
        close(found, (1 + 2 * x) / (2 + 5 * x + 4 * x**2 + x**3), 1e-7)


class Calculus(unittest.TestCase):
    def test_integrals(self):
        x = np.linspace(0, 2, 33)
        y = np.stack([np.sin(3 * x), x**4, np.exp(x)])
        close(calculus.trapezoid(y, dx=x[1]), np.trapz(y, dx=x[1]))
        close(calculus.simpson(y, x), scipy.integrate.simpson(y, x=x))
        uneven = x**2
        close(calculus.trapezoid(y, uneven), np.trapz(y, uneven))
        close(calculus.integrate(y[1], x), 2**5 / 5, 1e-12)
        self.assertRaisesRegex(ValueError, "evenly spaced", calculus.simpson, y[0], uneven)
        exact = np.stack([(1 - np.cos(3 * x)) / 3, x**5 / 5, np.exp(x) - 1])
        for rule, error in (("trapezoid", 2e-2), ("corrected", 4e-5), ("simpson", 2e-4), ("boole", 2e-5)):
            self.assertLess(np.abs(calculus.cumulative(y, x, rule=rule) - exact).max(), error, rule)
        noise = (-1.0) ** np.arange(1001)
        self.assertLess(np.abs(calculus.cumulative(noise)).max(), 2)
        self.assertGreater(np.abs(calculus.cumulative(noise, rule="simpson")).max(), 100)
        u, v, w = x[:5]**2, x[:7], np.exp(x[:6])
        whole = calculus.integrate3(u[:, None, None] * v[:, None] * w, x[1], x[1], x[1], "trapezoid")
        close(whole, np.prod([np.trapz(one, dx=x[1]) for one in (u, v, w)]))
        close(calculus.integrate2(np.outer(y[1], y[2]), x[1], x[1], "boole"),
              2**5 / 5 * (np.exp(2) - 1), 1e-7)

    def test_derivatives(self):
        x = np.linspace(0, 2, 41)
        y = np.stack([np.sin(3 * x), np.exp(x)])
        exact = np.stack([3 * np.cos(3 * x), np.exp(x)])
        close(calculus.derivative(y, x), np.gradient(y, x[1], axis=1, edge_order=2), 1e-8)
        self.assertLess(np.abs(calculus.derivative(y, x, rule="five-point") - exact).max(), 2e-3)
        close(calculus.derivative(x**4, x, rule="five-point"), 4 * x**3, 1e-8, 1e-8)
        close(calculus.derivative(y.T, x, rule="forward", axis=0)[:-1], (np.diff(y) / x[1]).T)
        self.assertRaisesRegex(ValueError, "at least 5", calculus.derivative, [1.0, 2.0], rule="five-point")

    def test_functions(self):
        for f, a, b, expected in ((np.cos, 0, 2, np.sin(2)), (lambda x: 1 / np.sqrt(x), 0, 1, 2),
                                  (lambda x: np.exp(-x), 0, np.inf, 1),
                                  (lambda x: 1 / (1 + x * x), -np.inf, np.inf, np.pi),
                                  (lambda x: np.exp(1j * x), 0, 1, np.sin(1) + 1j * (1 - np.cos(1))),
                                  (np.cos, 2, 0, -np.sin(2)), (lambda x: np.abs(x - 0.3), 0, 1, 0.29)):
            value, error = calculus.quad(f, a, b)
            self.assertLess(abs(value - expected), 1e-8)
            self.assertLessEqual(abs(value - expected), max(error, 1e-12))
        self.assertRaises(ValueError, calculus.quad, np.cos, np.nan, 1)
        self.assertRaises(qx.QxError, calculus.quad, lambda x: x * np.nan, 0, 1)

    def test_motion(self):
        t = np.arange(4000) / 1000
        expected = 0.01 * np.sin(2 * np.pi * 7 * t)
        a = -(2 * np.pi * 7)**2 * expected + 0.2
        close(calculus.displacement(a, 1000), expected, 0, 2e-5)
        close(calculus.velocity(np.stack([a, a]), 1000)[1], 2 * np.pi * 7 * 0.01 * np.cos(2 * np.pi * 7 * t), 0, 5e-4)
        close(calculus.displacement(a, 1000, cutoff=1.0)[1000:-1000], expected[1000:-1000], 0, 2e-5)


class Interpolation(unittest.TestCase):
    def test_splines(self):
        x = np.sort(some(12))
        y = np.sin(3 * x)
        at = np.linspace(x[0] - 0.2, x[-1] + 0.2, 70)
        for bounds, given in (("natural", ()), (((1, 0.5), (1, -0.5)), (0.5, -0.5))):
            theirs = scipy.interpolate.CubicSpline(x, y, bc_type=bounds)
            ours = interpolate.CubicSpline(x, y, *given)
            for derivative in range(3):
                close(ours(at, derivative), theirs(at, derivative), 1e-7, 1e-7)
        self.assertRaisesRegex(ValueError, "must be increasing", interpolate.CubicSpline, [1, 0], [1, 2])
        self.assertEqual(interpolate.CubicSpline([1.0], [5.0])(3.0), 5.0)

    def test_polynomials_and_rationals(self):
        x = np.linspace(1, 2, 6)
        found = interpolate.polynomial([[1.1, 1.55]], x, x**5)
        close(found.values, [[1.1**5, 1.55**5]])
        close(interpolate.rational(1.37, x, 1 / x).values, 1 / 1.37, 1e-8)
        close(interpolate.linear([0.0, 1.1, 3.0], x, x), [1, 1.1, 2])


class Special(unittest.TestCase):
    def test_they_are_scipys(self):
        x = np.linspace(0.1, 9, 40)
        for name, arguments in (
                ("gamma", (x,)), ("gammaln", (x,)), ("gammainc", (2.5, x)), ("gammaincc", (2.5, x)),
                ("beta", (x, 1.5)), ("betainc", (2.0, 3.0, x / 10)), ("digamma", (x,)), ("zeta", (x + 1,)),
                ("erf", (x - 3,)), ("erfc", (x - 3,)), ("expn", (2, x)), ("sici", (x,)), ("shichi", (x,)),
                ("spence", (x,)), ("fresnel", (x,)), ("ellipk", (x / 10,)), ("ellipkinc", (x / 7, 0.4)),
                ("ellipe", (x / 10,)), ("ellipeinc", (x / 7, 0.4)), ("ellipj", (x, 0.4)),
                ("hyp2f1", (1.0, 2.0, 3.5, x / 10)), ("hyp1f1", (1.0, 2.5, x)), ("jv", (1.5, x)),
                ("yv", (2.0, x)), ("iv", (1.5, x)), ("kn", (2, x)), ("kv", (1.5, x)),
                ("hankel1", (0.5, x)), ("hankel2", (0.5, x)), ("spherical_jn", (2, x)),
                ("spherical_yn", (2, x)), ("airy", (x - 4,)), ("struve", (1.0, x)),
                ("jv", (0.5, x + 2j)), ("yv", (0.5, x + 2j)), ("iv", (0.5, x + 2j)), ("kv", (0.5, x + 2j)),
                ("airy", (x + 1j,)), ("factorial", (np.arange(20),))):
            theirs = getattr(scipy.special, name)(*arguments)
            ours = getattr(special, name)(*arguments)
            for one, other in zip(ours if isinstance(ours, tuple) else [ours],
                                  theirs if isinstance(theirs, tuple) else [theirs]):
                with self.subTest(name=name):
                    close(one, other, 1e-7, 1e-9)
        # Next to the median of a large parameter, by the first terms of its series, and outside the domain.
        near = 1 / (3 * np.sqrt(2 * np.pi * 1e9))
        close(special.gammainc([1e9, 2.0], [1e9, 3.0]), [0.5 + near, scipy.special.gammainc(2, 3)], 1e-13)
        close(special.gammaincc(1e9, 1e9), 0.5 - near, 1e-13)
        self.assertTrue(np.isnan(special.gammainc(1e9, -1.0)))
        close(special.kelvin(0, 2.0)[:2], [scipy.special.ber(2), scipy.special.bei(2)])
        close(special.pbdv(1.5, 1.0), scipy.special.pbdv(1.5, 1.0)[0])
        close(special.dawsn(1.5), scipy.special.dawsn(1.5))
        close(special.jv(0.5, 3j, scaled=True), scipy.special.jve(0.5, 3j))
        close(special.hyperu(1.0, 1.5, 8.0), scipy.special.hyperu(1.0, 1.5, 8.0), 1e-9)
        self.assertEqual(special.erf(np.ones((2, 3))).shape, (2, 3))


class Coordinates(unittest.TestCase):
    def test_rotations(self):
        angles = (0.3, -0.7, 1.9)
        points = some(3, 2, 4)
        for sequence in coordinates.SEQUENCES:
            matrix = coordinates.euler_to_matrix(angles, sequence)
            close(matrix @ matrix.T, np.eye(3))
            back = coordinates.matrix_to_euler(matrix, sequence)
            close(coordinates.euler_to_matrix(tuple(back), sequence), matrix)
            found = coordinates.rotate(*points, matrix)
            close(found, np.einsum("ij,jkl->ikl", matrix, points))
            close(coordinates.rotate_euler(*points, angles, sequence), found)
        theirs = scipy.spatial.transform.Rotation.from_euler("ZYX", angles).as_matrix().T
        close(coordinates.euler_to_matrix(angles), theirs)
        close(coordinates.rotate2(1.0, 0.0, np.pi / 2), [0, -1])
        self.assertRaises(ValueError, coordinates.euler_to_matrix, (1, 2))
        self.assertRaises(ValueError, coordinates.rotate, *points, np.ones((3, 3)))

    def test_kinds(self):
        points = some(3, 6)
        for kind in ("spherical", "cylindrical"):
            found = coordinates.convert(*points, "cartesian", kind)
            close(coordinates.convert(*found, kind, "cartesian"), points)
            radius = np.sqrt((points**2)[:3 if kind == "spherical" else 2].sum(0))
            close(found[0], radius)


if __name__ == "__main__":
    unittest.main()
