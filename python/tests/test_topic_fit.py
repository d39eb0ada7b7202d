"""qx.fit, qx.stats and qx.measure compared with SciPy, and their streams."""

import concurrent.futures
import pickle
import sys
import unittest
from pathlib import Path

import hypothesis
import numpy as np
import pandas
import scipy.interpolate
import scipy.optimize
import scipy.signal
import scipy.stats
from hypothesis import strategies

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import exports, fit, measure, signals, stats  # noqa: E402

RNG = np.random.default_rng(7)


def close(found, expected, rtol=1e-9, atol=1e-12):
    np.testing.assert_allclose(found, expected, rtol=rtol, atol=atol)


MODELS = {
    "line": (lambda x, a, b: a * x + b, (2.0, -1.0), {}),
    "exponential": (lambda x, a, b, c: a * np.exp(b * x) + c, (3.0, -1.2, 0.5), {}),
    "power": (lambda x, a, b, c: a * x**b + c, (2.0, -0.7, 0.5), {}),
    "logarithm": (lambda x, a, b: a * np.log(b * x), (2.0, 1.5), {}),
    "gaussian": (lambda x, a, m, s, c: a * np.exp(-0.5 * ((x - m) / s)**2) + c, (3.0, 1.4, 0.3, 0.5), {}),
}


def model_of_rows(x, p):
    return p[0] * np.exp(-x[:, 0]) * np.cos(p[1] * x[:, 1])


def interrupted(x, p):
    raise KeyboardInterrupt


# The same cases in each run, without a database of earlier ones.
hypothesis.settings.register_profile("same", derandomize=True, database=None)
hypothesis.settings.load_profile("same")


class Fits(unittest.TestCase):
    def test_parameters_errors_and_covariance(self):
        x = np.linspace(0.4, 3, 80)
        for sigma in (None, 0.02 + 0.05 * RNG.random(80)):
            for name, (model, truth, more) in MODELS.items():
                y = model(x, *truth) + RNG.normal(size=80) * (0.05 if sigma is None else sigma)
                expected, covariance = scipy.optimize.curve_fit(model, x, y, truth, sigma, xtol=1e-12, ftol=1e-12)
                for found in (getattr(fit, name)(x, y, sigma, **more), fit.curve(model, x, y, truth, sigma)):
                    with self.subTest(name=name):
                        p, c = found
                        close(p, expected, 1e-5)
                        close(c, covariance, 1e-3, 1e-6 * np.abs(covariance).max())
                        close([*found.errors.values()], np.sqrt(np.diagonal(covariance)), 1e-3)
                        close(found.values + found.residuals, y)
                        self.assertEqual(found.dof, 80 - len(p))
                        self.assertTrue(0.9 < found.r_square < 1)
                        if "lambda" not in found.formula:
                            again = pickle.loads(pickle.dumps(found))
                            self.assertEqual(again.predict(1.5), found.predict(1.5))
                        close(found.predict([[0.5], [1.5]]), model(np.array([[0.5], [1.5]]), *p), 1e-12)

    def test_uncertainty_is_carried_on(self):
        x = np.linspace(0, 3, 60)
        found = fit.exponential(x, 2 * np.exp(-0.7 * x) + 0.02 * RNG.normal(size=60))
        # The scatter of fitted parameters agrees with their errors.
        drawn = RNG.multivariate_normal(*found, 20000).T
        for f in (lambda a, b, c: -np.log(2) / b, lambda a, b, c: np.array([a + c, a * b])):
            value, error = found.derived(f)
            close(value, f(*found.parameters.values()))
            close(error, np.std(f(*drawn), -1), 0.05)
        close(found.derived(lambda a, b, c: b)[1], found.errors["b"], 1e-6)
        fixed = fit.exponential(x, 2 * np.exp(-0.7 * x), bounds={"c": (0, 0)})
        self.assertLess(fixed.derived(lambda a, b, c: c)[1], 1e-12)
        # The bounds of the curve are the standard error of its value, times the quantile of Student's distribution.
        low, high = found.confidence(1.5)
        factor = scipy.stats.t.ppf(0.975, found.dof)
        close((high - low) / 2, factor * found.derived(lambda a, b, c: a * np.exp(b * 1.5) + c)[1], 1e-6)

    def test_bands(self):
        x = np.linspace(0, 2, 40)
        y = 1 + 2 * x - 0.5 * x**2 + RNG.normal(size=40) * 0.1
        found = fit.polynomial(x, y, 2)
        rows = np.vander(x, 3, True)
        at = np.array([-0.5, 0.7, 3.0])
        t = scipy.stats.t.ppf(0.95, 37)
        width = t * np.sqrt(np.einsum("ij,jk,ik->i", np.vander(at, 3, True), found.covariance, np.vander(at, 3, True)))
        low, high = found.confidence(at, 0.9)
        close((high - low) / 2, width, 1e-8)
        close((high + low) / 2, found.predict(at), 1e-10)
        low, high = found.prediction(at, 0.9)
        close((high - low) / 2, np.hypot(width, t * found.rmse), 1e-8)
        close([*found.intervals(0.9).values()], [(v - t * e, v + t * e) for v, e in
                                                 zip(found.parameters.values(), found.errors.values())], 1e-8)
        linear = fit.linear(rows, y, names=["c0", "c1", "c2"])
        close([*linear.parameters.values()], [*found.parameters.values()], 1e-9)
        close(linear.confidence(np.vander(at, 3, True), 0.9), found.confidence(at, 0.9), 1e-8)
        inside = [fit.line(x, 3 * x + RNG.normal(size=40)).intervals(0.9)["a"] for _ in range(300)]
        self.assertTrue(0.84 < np.mean([a < 3 < b for a, b in inside]) < 0.95)
        self.assertEqual(len(found.plot().lines), 2)
        self.assertRaises(ValueError, found.confidence, at, 1.5)
        self.assertRegex(repr(found), r"c2 +-0\.\d+ \+- 0\.0\d")
        self.assertEqual(found["c0"], found.parameters["c0"])

    def test_bounds_fixed_parameters_and_methods(self):
        x = np.linspace(0, 3, 60)
        y = 3 * np.exp(-1.2 * x) + 0.5 + RNG.normal(size=60) * 0.02
        found = fit.exponential(x, y, bounds={"b": (-1.0, 0.0)})
        expected = scipy.optimize.curve_fit(MODELS["exponential"][0], x, y, (3, -0.9, 0.5),
                                            bounds=([-np.inf, -1, -np.inf], [np.inf, 0, np.inf]))[0]
        close([*found.parameters.values()], expected, 1e-4)
        held = fit.exponential(x, y, bounds={"c": (0.5, 0.5)})
        self.assertEqual((held["c"], held.errors["c"], held.intervals()["c"]), (0.5, 0.0, (0.5, 0.5)))
        self.assertEqual(held.dof, 58)
        held = fit.curve(MODELS["exponential"][0], x, y, (1, -1, 0.5), bounds={"c": (0.5, 0.5)})
        self.assertEqual(held.errors["c"], 0)
        self.assertEqual([*fit.exponential(x, y - 0.5, offset=False).parameters], ["a", "b"])
        y[::7] += 1
        for method in ("absolute", "bisquare"):
            found = fit.exponential(x, y, guess={"a": 3, "b": -1, "c": 0.5}, method=method)
            self.assertLess(abs(found["b"] + 1.2), 0.1)
            self.assertLess(abs(fit.line(x, np.where(x > 2.8, 50, 2 * x), method=method)["a"] - 2), 0.05)
        close(fit.polynomial(x, 2 * x + x**2, 2, fixed={"c0": 0.0})["c1"], 2)
        close(fit.curve(lambda x, a: a * x, x, 2 * x, [1], sigma=0.5, absolute_sigma=True).errors["a"],
              0.5 / np.sqrt(np.sum(x**2)), 1e-6)

    def test_losses_and_derivatives(self):
        rng, x = np.random.default_rng(3), np.linspace(0, 4, 50)
        model = MODELS["exponential"][0]
        y = model(x, 3, -1.2, 0.5) + rng.normal(size=50) * 0.02
        y[::9] += 1.5

        def jacobian(x, a, b, c):
            return np.stack([np.exp(b * x), a * x * np.exp(b * x), np.ones(len(x))], -1)

        for loss in ("linear", "soft_l1", "huber", "cauchy", "arctan"):
            theirs = scipy.optimize.least_squares(lambda p: (y - model(x, *p)) / 0.1, (3, -1, 0.5), loss=loss,
                                                  f_scale=0.5, xtol=1e-15, ftol=1e-15, gtol=1e-15)
            for more in ({}, {"jacobian": jacobian}):
                found = fit.curve(model, x, y, (3, -1, 0.5), 0.1, loss=loss, scale=0.5, **more)
                close([*found.parameters.values()], theirs.x, 1e-5)
                inverse = np.linalg.inv(theirs.jac.T @ theirs.jac)
                close(found.covariance, inverse * 2 * theirs.cost / 47, 2e-3, 1e-6)
                close(found.predict(1.5), model(1.5, *found.parameters.values()))

    def test_models_of_arrays(self):
        rng = np.random.default_rng(4)
        x = rng.uniform(size=(60, 2))
        y = model_of_rows(x, [2.0, 3.0]) + 0.01 * rng.normal(size=60)
        found = fit.nonlinear(model_of_rows, x, y, [1, 2], bounds={"p1": (0, 2.9)}, names=["height", "p1"])
        self.assertEqual([*found.parameters], ["height", "p1"])
        self.assertEqual(found["p1"], 2.9)
        again = pickle.loads(pickle.dumps(found))
        close(again.predict(x[:3]), found.values[:3])
        self.assertEqual(found.confidence(x[:4])[0].shape, (4,))
        # From several threads simultaneously, and within a model.
        with concurrent.futures.ThreadPoolExecutor(4) as threads:
            every = [*threads.map(lambda _: fit.nonlinear(model_of_rows, x, y, [1, 2])["p1"], range(8))]
        self.assertEqual(len(set(every)), 1)
        line = np.arange(9.0)
        self.assertEqual(fit.curve(lambda x, a: a * x * fit.line(line, line)["a"], line, line, [3])["a"], 1)

    def test_exceptions_of_a_model_come_through(self):
        x = np.arange(5.0)
        calls = []

        def model(x, a):
            calls.append(a)
            if len(calls) == 3:
                raise KeyError("stop here")
            return a * x + 1 / (a + 2)

        with self.assertRaisesRegex(KeyError, "stop here"):
            fit.curve(model, x, x, [1])
        self.assertEqual(len(calls), 3)
        with self.assertRaises(KeyboardInterrupt):
            fit.nonlinear(interrupted, x, x, [1])
        with self.assertRaisesRegex(ValueError, "model: values of shape .5,. are needed; got .2,."):
            exports.NonlinearFit2026(x, x, [], lambda x, p: [1, 2], None, None, [1], [], [], 0, 1, 0, 0)
        with self.assertRaisesRegex(TypeError, "jacobian: a function is needed"):
            exports.NonlinearFit2026(x, x, [], model, 3, None, [1], [], [], 0, 1, 0, 0)
        with self.assertRaisesRegex(qx.QxError, "model is null"):
            exports.NonlinearFit2026(x, x, [], None, None, None, [1], [], [], 0, 1, 0, 0)

    def test_polynomials_of_high_order_keep_their_digits(self):
        x = np.linspace(-1, 1, 300)
        for degree in (26, 50):
            exact = np.polynomial.chebyshev.Chebyshev.basis(degree)
            coefficients = exact.convert(kind=np.polynomial.Polynomial).coef
            found = fit.polynomial(x, exact(x), degree)
            close([*found.parameters.values()], coefficients, 0, 1e-9 * np.abs(coefficients).max())

    def test_peaks_need_no_guess(self):
        x = np.linspace(-5, 60, 150)
        for offset, truth in ((True, (-3, 55.0, 0.4, 1)), (False, (0.2, -6.0, 30.0)), (True, (5, 30, 40, -7))):
            found = fit.gaussian(x, MODELS["gaussian"][0](x, *truth, *([] if offset else [0])), offset=offset)
            close([*found.parameters.values()], truth, 1e-7)

    def test_what_cannot_be_is_refused(self):
        x = np.arange(5.0)
        for call, words in (
                (lambda: fit.line(x, x[1:]), "x, y: must have the same length"),
                (lambda: fit.line(x, x, sigma=0), "sigma"), (lambda: fit.power(x, x), "x: must be above 0"),
                (lambda: fit.line(x, x, bounds={"k": (0, 1)}), "'k' is not one of 'a', 'b'"),
                (lambda: fit.line(x, x, bounds={"a": (1, 0)}), "above its upper"),
                (lambda: fit.exponential(x, x, guess={"a": 1}), "has no value for b, c"),
                (lambda: fit.polynomial(x, x, 51), "at most 50"), (lambda: fit.line(x, x, method="l1"), "l1"),
                (lambda: fit.curve(lambda x, a: a * x, x, x, [1, 2]), "values for a are needed|guess"),
                (lambda: fit.curve(lambda x, a: a * np.nan * x, x, x, [1]), "not finite"),
                (lambda: fit.curve(lambda x, a, b: a * x, x, x, [2, 1]), "does not depend")):
            with self.assertRaisesRegex((ValueError, np.linalg.LinAlgError), words):
                call()

    def test_splines(self):
        x = np.linspace(0, 6, 80)
        y = np.sin(x) + RNG.normal(size=80) * 0.1
        theirs = scipy.interpolate.make_smoothing_spline(x, y, lam=0.01)
        ours = fit.SmoothingSpline(x, y, smoothing=0.01)
        at = np.linspace(0, 6, 333)
        close(ours(at), theirs(at), 1e-6, 1e-7)
        close(ours(at, 1), theirs.derivative(1)(at), 1e-5, 1e-5)
        close(ours(x), ours.values, 1e-12)
        self.assertLess(np.abs(fit.SmoothingSpline(x, y)(at) - np.sin(at)).max(), 0.12)
        self.assertLessEqual(np.sum((fit.SmoothingSpline(x, y, 0.1, residual=80).values - y)**2) / 0.01, 80.1)
        knots = [1.5, 3.0, 4.5]
        theirs = scipy.interpolate.LSQUnivariateSpline(x, y, knots)
        ours = fit.BSpline(x, y, knots)
        close(ours(at), theirs(at), 1e-8, 1e-9)
        close(ours(x), ours.values, 1e-9)


class Statistics(unittest.TestCase):
    def test_numbers(self):
        x = RNG.gamma(2, size=(3, 400))
        for name, expected in (("mean", x.mean(1)), ("var", x.var(1)), ("std", x.std(1)),
                               ("median", np.median(x, 1)), ("skew", scipy.stats.skew(x, 1)),
                               ("kurtosis", scipy.stats.kurtosis(x, 1)), ("rms", np.sqrt((x**2).mean(1)))):
            close(getattr(stats, name)(x), expected)
            close(getattr(stats, name)(x.T, axis=0), expected)
        close(stats.std(x, ddof=1), x.std(1, ddof=1))
        close(stats.rms(1j * x[0]), stats.rms(x[0]))
        close(stats.moment(x, 3), scipy.stats.moment(x, 3, 1))
        for constant in (0.1, -0.27829495, 3.0):  # with and without rounding of the mean
            self.assertTrue(np.isnan([stats.skew([constant] * 10), stats.kurtosis([constant] * 10)]).all())
        self.assertFalse(np.isfinite(stats.skew([0, 1e150, 3e150])))
        table = pandas.DataFrame(x.T, columns=[*"abc"])
        self.assertEqual([*stats.mean(table).index], [*"abc"])
        self.assertRaises(ValueError, stats.var, [1.0], ddof=1)
        counts, edges = stats.histogram(x[0], 20)
        expected = np.histogram(x[0], 20)
        close(counts, expected[0])
        close(edges, expected[1])
        close(stats.histogram(x[0], [0, 1, 2, 5]).counts, np.histogram(x[0], [0, 1, 2, 5])[0])

    def test_distributions_and_tests(self):
        at = np.array([-1.5, 0.0, 0.7, 2.0])
        for name, dof, theirs in (("norm", (), scipy.stats.norm), ("t", (5,), scipy.stats.t),
                                  ("chi2", (5,), scipy.stats.chi2), ("f", (3, 8), scipy.stats.f)):
            ours = getattr(stats, name)
            for value in ("cdf", "sf", "logcdf", "logsf", "pdf"):
                with np.errstate(divide="ignore"):
                    expected = getattr(theirs, value)(at, *dof)
                close(getattr(ours, value)(at, *dof), expected, 1e-12)
            close(ours.ppf([1e-9, 0.5, 0.95], *dof), theirs.ppf([1e-9, 0.5, 0.95], *dof), 1e-9, 1e-12)
            close(ours.isf([1e-4, 0.5, 0.95], *dof), theirs.isf([1e-4, 0.5, 0.95], *dof), 1e-9, 1e-12)
        close(stats.t.sf(2.0, 2.5), scipy.stats.t.sf(2.0, 2.5), 1e-12)
        self.assertRaisesRegex(ValueError, "dof: 1 are needed; got 0", stats.t.cdf, 1.0)
        table = [[10, 20, 5], [20, 10, 9]]
        expected = scipy.stats.chi2_contingency(table, correction=False)
        close([*stats.contingency(table)], expected[:2])
        groups = [RNG.normal(size=n) + n / 20 for n in (8, 12, 9)]
        found = stats.anova(*groups)
        close([found.f[0], found.p[0]], scipy.stats.f_oneway(*groups), 1e-8)
        for samples, rule in (([[1.0, 2.0]], "at least two samples are needed"), ([[1.0], [2.0]], "must have two values"),
                              ([[1.0, 2.0], []], "sample 1 is empty"),
                              ([[1.0, np.nan], [2.0]], "sample 0 has a value that is not finite")):
            with self.assertRaisesRegex(ValueError, "qx.stats.anova: samples: .*" + rule):
                stats.anova(*samples)
        y = RNG.normal(size=(2, 3, 4))
        a, b, _ = np.indices(y.shape)
        found = stats.anova2(y.ravel(), np.array(["u", "v"])[a.ravel()], b.ravel())
        between = 12 * np.sum((y.mean((1, 2)) - y.mean())**2)
        within = np.sum((y - y.mean(2, keepdims=True))**2)
        close(found.sums[[0, 3]], [between, within], 1e-9)
        close(found.f[0], between / (within / 18), 1e-9)
        self.assertIn("error", repr(found))

    @hypothesis.given(strategies.lists(strategies.integers(0, 200), max_size=6))
    @hypothesis.settings(max_examples=30, deadline=None)
    def test_running_statistics(self, cuts):
        x = RNG.normal(size=(2, 200)) + 1000
        whole, running = stats.Running(2), stats.Running(2)
        expected = whole(x)
        for part in np.split(x, sorted(cuts), 1):
            found = running(part)
            running = pickle.loads(pickle.dumps(running.copy()))
        self.assertEqual(repr(found), repr(expected))
        for name in ("mean", "std", "rms", "least", "greatest"):
            self.assertEqual(getattr(found, name).tobytes(), getattr(expected, name).tobytes())
        close(found.std, x.std(1), 1e-9)
        self.assertEqual(found.count, 200)


class Peaks(unittest.TestCase):
    def test_peaks_are_scipys(self):
        x = np.convolve(RNG.normal(size=600), np.hanning(9), "same")
        for given, theirs in (({"height": 0.5, "prominence": 0.0}, {"height": 0.5, "prominence": 0.0}),
                              ({"prominence": 1.5}, {"prominence": 1.5}),
                              ({"height": 0.5}, {"height": 0.5})):
            at, more = scipy.signal.find_peaks(x, **theirs)
            found = measure.peaks(x, **given)
            close(found.indices, at)
            close(found.prominences, scipy.signal.peak_prominences(x, at)[0])
            close(found.widths, scipy.signal.peak_widths(x, at)[0], 1e-6)
        found = measure.peaks(x, prominence=0.5, distance=20)
        self.assertTrue(np.all(np.diff(found.indices) >= 20))
        self.assertEqual(len(measure.peaks(-x, prominence=1.5, valleys=True)), len(measure.peaks(x, prominence=1.5)))
        self.assertEqual(len(measure.peaks([1.0, 2.0])), 0)

    @hypothesis.given(strategies.lists(strategies.integers(0, 500), max_size=20))
    @hypothesis.settings(max_examples=40, deadline=None)
    def test_finder(self, cuts):
        x = signals.sine(500, 0.031) + 0.2 * signals.sine(500, 0.007)
        whole = measure.PeakFinder(0.3, 7)
        expected = np.concatenate([whole(x).positions, whole.finish().positions])
        finder = measure.PeakFinder(0.3, 7)
        parts = []
        for part in np.split(x, sorted(cuts)):
            parts.append(finder(part).positions)
            finder = pickle.loads(pickle.dumps(finder.copy()))
        found = np.concatenate([*parts, finder.finish().positions])
        self.assertEqual(found.tobytes(), expected.tobytes())
        close(found, measure.peaks(x, prominence=0.5).positions, 0, 0.15)
        close(measure.PeakFinder(0.3, 7)(x).heights[:5], measure.peaks(x, prominence=0.5).heights[:5], 0, 0.01)

    @hypothesis.given(strategies.lists(strategies.integers(0, 300), max_size=6),
                      strategies.sampled_from([*measure.SLOPES]), strategies.sampled_from([0.0, 20.0]))
    @hypothesis.settings(max_examples=40, deadline=None)
    def test_triggers(self, cuts, slope, holdoff):
        x = signals.sine(300, 0.031) + 0.1 * RNG.normal(size=300)
        expected = measure.trigger(x, 0.2, 10.0, slope, 0.3, holdoff / 10)
        stream = measure.Trigger(0.2, 10.0, slope, 0.3, holdoff / 10)
        found = [stream(part) for part in np.split(x, sorted(cuts))]
        close(np.concatenate([one.indices for one in found]), expected.indices)
        close(np.concatenate([one.positions for one in found]), expected.positions, 1e-12)
        armed, due = False, []
        if slope == "rising" and not holdoff:
            for i, value in enumerate(x):
                if armed and value >= 0.2:
                    due.append(i)
                    armed = False
                armed = armed or value < 0.2 - 0.3
            close(expected.indices, due)

    def test_pulses_and_levels(self):
        t = np.arange(1000) / 100
        x = np.interp(t % 5, [1, 1.2, 3, 3.4], [0.0, 2.0, 2.0, 0.0])
        high, low, amplitude = measure.levels(x)
        close([high, low, amplitude], [2, 0, 2], 0, 0.02)
        found = measure.pulses(x, 100)
        self.assertEqual(len(found), 2)
        close([found[0].start, found[0].width, found[0].rise, found[0].fall], [1.1, 2.1, 0.16, 0.32], 0, 0.01)
        close(found[0].slew_rate, 2 / 0.2, 0.02)
        inverted = measure.pulses(-x, 100, "falling")
        close([inverted[0].rise, inverted[0].fall], [0.32, 0.16], 0, 0.01)

    def test_cycles(self):
        x = 1 + 2 * signals.sine(4000, 7.03, 1000)
        found = measure.cycles(x, 1000)
        self.assertEqual(len(found), 27)
        close(found.periods, 1 / 7.03, 1e-3)
        close(found.means, 1, 0, 0.02)
        close(found.rms, np.sqrt(3), 0, 0.02)
        self.assertRaises(ValueError, measure.cycles, [])

    def test_delays(self):
        n, fs = 2000, 1000.0
        source = qx.filters.butterworth(6, 0.1)(qx.noise.gaussian(8 * n, seed=5))
        for true in (0.0, 3.25, -17.4, 120.875):
            spectrum = np.fft.rfft(source)
            moved = np.fft.irfft(spectrum * np.exp(-2j * np.pi * np.fft.rfftfreq(8 * n) * true), 8 * n)
            found = measure.delay(source[3 * n:4 * n], moved[3 * n:4 * n], fs)
            self.assertLess(abs(found * fs - true), 2e-3)
        self.assertLess(abs(measure.delay(source[:500], -source[:500], most=0.5)), 1)
        self.assertRaises(qx.QxError, measure.delay, np.ones(9), np.ones(9))


class Channels(unittest.TestCase):
    """The results for each of several channels."""

    turns = np.multiply.outer([5.3, 11.1, 20.0], np.arange(2000) / 1000) + np.array([0, 0.2])[:, None, None]
    x = np.sin(2 * np.pi * turns) + 0.1 * np.sin(4 * np.pi * turns)
    CALLS = {
        "peaks": lambda x, **axis: measure.peaks(x, 1000, prominence=0.5, **axis),
        "levels": lambda x, **axis: measure.levels(x, **axis),
        "pulses": lambda x, **axis: measure.pulses(x, 1000, **axis),
        "cycles": lambda x, **axis: measure.cycles(x, 1000, **axis),
        "tone": lambda x, **axis: measure.tone(x, 1000, near=11, within=20, **axis),
        "tones": lambda x, **axis: measure.tones(x, 1000, 2, **axis),
        "harmonics": lambda x, **axis: measure.harmonics(x, 1000, count=3, **axis),
        "trigger": lambda x, **axis: measure.trigger(x, 0.3, 1000, **axis),
    }

    def same(self, found, expected, what):
        if isinstance(expected, list):
            self.assertEqual(len(found), len(expected), what)
            for one, other in zip(found, expected):
                self.same(one, other, what)
        else:
            np.testing.assert_equal(vars(found), vars(expected), what)

    def test_lists_by_channel(self):
        for name, call in self.CALLS.items():
            alone = [[call(channel) for channel in row] for row in self.x]
            self.assertTrue(repr(alone[0][0]), name)
            self.same(call(self.x), alone, name)
            self.same(call(np.moveaxis(self.x, -1, 0), axis=0), alone, name)
            self.same(call(pandas.DataFrame(self.x[0].T)), alone[0], name)
            self.assertRaisesRegex(ValueError, "axis: 2", call, self.x[0], axis=2)
            self.assertRaisesRegex(ValueError, "no channel", call, np.empty((0, 9)))

    def test_delays_of_pairs(self):
        source = np.random.default_rng(3).normal(size=1300)
        x = source[100:1100]
        y = np.stack([source[93:1093], source[100:1100], source[110:1110]])
        close(measure.delay(x, y, 10.0), [0.7, 0, -1], 0, 0.02)
        close(measure.delay(x, y[:, :900].T, axis=0), [7, 0, -10], 0, 0.1)
        np.testing.assert_array_equal(measure.delay(x, y), [measure.delay(x, one) for one in y])
        np.testing.assert_array_equal(measure.delay(y, y[::-1]), [measure.delay(*two) for two in zip(y, y[::-1])])
        self.assertRaises(ValueError, measure.delay, y, y[:2])


class Sound(unittest.TestCase):
    # IEC 61672-1: nominal frequency, A and C weighting and the limits of class 1, in dB.
    TABLE = ((31.5, -39.4, -3.0, 1.5, -1.5), (63, -26.2, -0.8, 1.0, -1.0), (125, -16.1, -0.2, 1.0, -1.0),
             (250, -8.6, 0.0, 1.0, -1.0), (500, -3.2, 0.0, 1.0, -1.0), (1000, 0.0, 0.0, 0.7, -0.7),
             (2000, 1.2, -0.2, 1.0, -1.0), (4000, 1.0, -0.8, 1.0, -1.0), (8000, -1.1, -3.0, 1.5, -2.5),
             (16000, -6.6, -8.5, 2.5, -16.0))

    def test_weightings(self):
        for nominal, a, c, above, below in self.TABLE:
            exact = 1000 * 10 ** (round(10 * np.log10(nominal / 1000)) / 10)
            for kind, due in (("A", a), ("C", c)):
                self.assertLess(abs(measure.weighting(exact, kind) - due), 0.06, (nominal, kind))
                for fs in (48000, 96000):
                    gain = measure.weighting_filter(fs, kind).response([exact]).decibels[0]
                    self.assertTrue(below <= gain - due <= above, (fs, nominal, kind, gain, due))
        self.assertEqual(measure.weighting([10.0, 1e4], "Z").tolist(), [0, 0])

    def test_levels(self):
        x = np.sqrt(2) * signals.sine(96000, 1000, 48000)
        close(measure.sound_level(np.stack([x, 10 * x]), 48000), [93.98, 113.98], 0, 0.01)
        x = np.sqrt(2) * signals.sine(96000, 100, 48000)
        close(measure.sound_level(x, 48000), 93.98 - 19.1, 0, 0.1)
        close(measure.sound_level(x, 48000, "Z"), 93.98, 0, 0.01)

    # IEC 61260-1: relative attenuation of class 1 at frequencies G^(+-Omega), least and greatest, in dB.
    LIMITS = ((0, -0.4, 0.4), (1 / 8, -0.4, 0.5), (1 / 4, -0.4, 0.7), (3 / 8, -0.4, 1.4), (0.4999, -0.4, 5.3),
              (1, 16.6, np.inf), (2, 40.5, np.inf), (3, 60.0, np.inf), (4, 70.0, np.inf))

    def test_band_filters_are_of_class_1(self):
        for fraction in (1, 3):
            g = 10 ** 0.3
            for middle, fs in ((1000.0, 20000.0), (1000.0, 48000.0)):
                half = g ** (0.5 / fraction)
                f = measure._band_filter(middle, half, fs)
                for omega, least, greatest in self.LIMITS:
                    for sign in (-1, 1):
                        ratio = 1 + (g ** (0.5 / fraction) - 1) / (g ** 0.5 - 1) * (g ** omega - 1)
                        frequency = middle * ratio ** sign
                        if frequency < fs / 2:
                            loss = -f.response([frequency]).decibels[0]
                            self.assertTrue(least <= loss <= greatest, (fraction, fs, omega, sign, loss))

    def test_bands(self):
        fs = 16000.0
        x = qx.noise.gaussian(160000, seed=2)
        found = measure.octave_bands(x, fs, 1, 31.5, 4000)
        close(found.frequencies, 1000 * 10 ** (0.3 * np.arange(-5, 3)))
        due = 10 * np.log10((found.edges[:, 1] - found.edges[:, 0]) / (fs / 2))
        close(found.levels, due + 10 * np.log10(np.var(x)), 0, 1.0)
        self.assertLess(np.abs(found.levels - due)[3:].max(), 0.4)
        tone = measure.octave_bands(np.stack([np.sqrt(2) * signals.sine(64000, 100, fs)] * 2), fs, 3, reference=2e-5)
        self.assertEqual(tone.levels.shape, (2, len(tone.frequencies)))
        at = tone.levels.argmax(-1)
        close(tone.frequencies[at], 100)
        close(tone.levels.max(-1), 94, 0, 0.15)
        self.assertEqual(len(measure.band_frequencies(3, 25, 20000)), 30)
        self.assertRaisesRegex(ValueError, "half the sampling rate", measure.octave_bands, x, fs, 3, 25, 8000)


class Tones(unittest.TestCase):
    def test_tones(self):
        x = 0.3 + signals.sine(2000, 50.37, 1000, 2.0, 0.4) + signals.sine(2000, 151.11, 1000, 0.02)
        one = measure.tone(x, 1000)
        close([one.frequency, one.amplitude, one.phase + np.pi / 2], [50.37, 2, 0.4], 1e-3)
        close(measure.tone(x, 1000, near=151).frequency, 151.11, 1e-4)
        frequencies, amplitudes = measure.tones(x, 1000, 2)
        close(frequencies, [50.37, 151.11], 1e-8)
        close(amplitudes, [2, 0.02], 1e-8)
        found = measure.harmonics(x, 1000, count=5)
        close(found.thd, 0.01, 1e-6)
        self.assertIn("thd", found._repr_html_())


if __name__ == "__main__":
    unittest.main()
