"""qx.spectra, qx.signals, qx.noise and qx.multirate compared with SciPy and NumPy, and their streams."""

import pickle
import sys
import unittest
from pathlib import Path

import hypothesis
import numpy as np
import pandas
import scipy.signal
from hypothesis import strategies

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import multirate, noise, signals, spectra  # noqa: E402

RNG = np.random.default_rng(7)


def close(found, expected, rtol=1e-9, atol=1e-12):
    np.testing.assert_allclose(found, expected, rtol=rtol, atol=atol)


# The same cases in each run, without a database of earlier ones.
hypothesis.settings.register_profile("same", derandomize=True, database=None)
hypothesis.settings.load_profile("same")


class Spectra(unittest.TestCase):
    @hypothesis.given(strategies.integers(1, 120), strategies.data(), strategies.booleans(),
                      strategies.sampled_from(["constant", "linear", False]),
                      strategies.sampled_from(["density", "spectrum"]),
                      strategies.sampled_from(["mean", "median"]), strategies.integers(0, 1))
    @hypothesis.settings(max_examples=80, deadline=None)
    def test_welch_is_that_of_the_field(self, nperseg, data, is_complex, detrend, scaling, average, axis):
        noverlap = data.draw(strategies.integers(0, nperseg - 1))
        nfft = nperseg + data.draw(strategies.integers(0, 9))
        x = RNG.normal(size=(120, 2) if not axis else (2, 120)) + 3
        x = x + 1j * x[::-1] if is_complex else x
        given = {"window": "hamming", "nperseg": nperseg, "noverlap": noverlap, "nfft": nfft,
                 "detrend": detrend, "scaling": scaling, "average": average, "axis": axis}
        f, expected = scipy.signal.welch(x, 50.0, return_onesided=not is_complex, **given)
        found = spectra.welch(x, 50.0, **given)
        close(found.frequencies, f)
        close(found.values, expected, 1e-8, 1e-12 * np.abs(expected).max() + 1e-28)

    def test_densities_have_units(self):
        x = noise.gaussian(200000, 0.5, seed=5) + signals.sine(200000, 50, 1000, 2.0)
        found = spectra.welch(x, 1000, nperseg=2000)
        self.assertAlmostEqual(found.power() / np.var(x), 1, 2)
        self.assertAlmostEqual(found.power(45, 55) / (2 + 0.25 / 500 * 10), 1, 2)
        self.assertAlmostEqual(found.values[300:900].mean() / (0.25 / 500), 1, 1)
        self.assertEqual((found.resolution, found.segments), (0.75, 199))
        line = spectra.welch(x, 1000, ("kaiser", 12), 2000, scaling="spectrum")
        self.assertAlmostEqual(line.amplitude.max(), np.sqrt(2), 2)
        self.assertRaises(ValueError, line.power)
        self.assertIn("frequencies  1001: [ 0. 0.5 ... 499.5 500. ]", repr(found))
        self.assertEqual(len(found.plot().lines), 1)

    def test_two_signals(self):
        x = RNG.normal(size=(2, 3000))
        y = scipy.signal.lfilter([1, 0.5], [1], x) + RNG.normal(size=x.shape) * 0.1
        given = {"window": "hann", "nperseg": 256, "noverlap": 100}
        close(spectra.csd(x, y, 10, **given).values, scipy.signal.csd(x, y, 10, **given)[1])
        close(spectra.coherence(x, y, 10, **given).values, scipy.signal.coherence(x, y, 10, **given)[1])
        first, second = (spectra.transfer_function(x, y, 10, estimator=one, **given) for one in ("H1", "H2"))
        close(first.values / second.values, first.coherence, 1e-9)
        expected = 1 + 0.5 * np.exp(-2j * np.pi * first.frequencies / 10)
        self.assertLess(np.abs(first.values - expected).max(), 0.15)
        self.assertTrue((np.abs(first.values - expected)[:, 1:-1] / np.abs(expected[1:-1])
                         < 6 * first.error[:, 1:-1]).all())
        close(spectra.csd(x[0], 1j * y[0], 10, **given).values,
              scipy.signal.csd(x[0], 1j * y[0], 10, return_onesided=False, **given)[1])
        self.assertRaisesRegex(ValueError, "x, y: must have the same shape", spectra.csd, x, y[0])
        tables = [pandas.DataFrame(one.T) for one in (x, y)]
        close(spectra.csd(*tables, 10, **given).values.T, spectra.csd(x, y, 10, **given).values)
        found = spectra.welch(tables[0], 10)
        close(found.power(), spectra.welch(x, 10).power())

    def test_spectrogram(self):
        x = RNG.normal(size=(2, 1500))
        f, t, expected = scipy.signal.spectrogram(x, 20)
        found = spectra.spectrogram(x, 20, window=scipy.signal.get_window(("tukey", 0.25), 256))
        close(found.values, expected)
        close(found.times, t)
        close(spectra.spectrogram(x.T, 20, "hann", 100, 50, axis=0).values,
              scipy.signal.spectrogram(x, 20, "hann", 100, 50)[2])
        self.assertTrue(found.frequencies is not None and len([*found]) == 3)

    def test_the_analytic_signal(self):
        x = RNG.normal(size=(2, 400))
        close(spectra.analytic(x), scipy.signal.hilbert(x))
        t = np.arange(5000) / 1000
        x = 7 + (1 + 0.3 * np.cos(2 * np.pi * t)) * np.sin(2 * np.pi * 100 * t)
        close(spectra.envelope(x)[100:-100], (1 + 0.3 * np.cos(2 * np.pi * t))[100:-100], 1e-3)
        close(spectra.instantaneous_frequency(x, 1000)[100:-100], 100, 1e-3)
        close(np.gradient(spectra.instantaneous_phase(x))[100:-100] * 1000 / 2 / np.pi, 100, 1e-3)
        close(spectra.power(x), np.abs(np.fft.fft(x) / 5000)**2, 1e-8, 1e-20)

    def test_what_cannot_be_is_refused(self):
        x = np.ones(10)
        for given, words in (({"noverlap": 10, "nperseg": 10}, "noverlap: must be below"),
                             ({"nfft": 5, "nperseg": 10}, "nfft: must be at least"), ({"fs": 0}, "fs"),
                             ({"window": "han"}, "did you mean 'hann'"), ({"detrend": "line"}, "detrend")):
            self.assertRaisesRegex(ValueError, words, spectra.welch, x, **given)
        self.assertRaisesRegex(ValueError, "empty", spectra.welch, x[:0])


class Signals(unittest.TestCase):
    def test_waves(self):
        t = np.arange(400) / 1000
        close(signals.sine(400, 7, 1000, 2, 0.3), 2 * np.sin(2 * np.pi * 7 * t + 0.3), atol=1e-10)
        close(signals.square(400, 7, 1000, duty=0.3), scipy.signal.square(2 * np.pi * 7 * t, 0.3))
        close(signals.sawtooth(400, 7, 1000, phase=np.pi), scipy.signal.sawtooth(2 * np.pi * 7 * t), atol=1e-9)
        close(signals.triangle(400, 7, 1000, phase=-np.pi / 2),
              scipy.signal.sawtooth(2 * np.pi * 7 * t, 0.5), atol=1e-9)
        close(signals.chirp(400, 5, 50, 1000, 2), 2 * scipy.signal.chirp(t, 5, 0.4, 50, phi=-90), atol=1e-9)
        close(signals.ramp(7, 1, 2, endpoint=False), np.linspace(1, 2, 7, endpoint=False))
        close(signals.ramp(7, 1, 2, scale="geometric"), np.geomspace(1, 2, 7))
        close(signals.sinc(9, 0.3, 1.0), np.sinc((np.arange(9) * 0.3 - 1.0) / np.pi * np.pi), 1e-9, 1e-15)
        close(signals.periodic_sinc(t, 5), scipy.special.diric(t, 5))
        close(signals.gauss_pulse(t - 0.2, 20, 0.6), scipy.signal.gausspulse(t - 0.2, 20, 0.6))
        x = 20 * t
        close(signals.phase_modulated(x, 50, 1000), np.sin(2 * np.pi * 50 * (t + 0.001) + x), atol=1e-9)
        for call in (lambda: signals.sine(0, 1), lambda: signals.sine(4, 1, 0), lambda: signals.pulse(3, 2, 2),
                     lambda: signals.gauss_pulse([], 1), lambda: signals.ramp(3, -1, 1, scale="geometric")):
            self.assertRaises(ValueError, call)

    def test_trends_and_scales(self):
        x = RNG.normal(size=(3, 60)) + 0.5 * np.arange(60)
        for type_ in ("linear", "constant"):
            close(signals.detrend(x, type_), scipy.signal.detrend(x, type=type_), 1e-8, 1e-11)
        cubic = np.polynomial.Polynomial.fit(np.arange(60), x[0], 3)(np.arange(60))
        close(signals.detrend(x[0], 3), x[0] - cubic, 1e-7, 1e-9)
        t = np.linspace(-1, 1, 200)
        y = 1e3 + RNG.normal(size=200)
        for order in (5, 6, 25, 50):  # 25 and 50 are beyond the digits of raw powers
            fitted = np.polynomial.chebyshev.Chebyshev.fit(t, y, order)(t)
            close(signals.detrend(y, order), y - fitted, 0, 1e-10)
        close(signals.unwrap(x), np.unwrap(x), 1e-12)
        close(signals.unwrap(x * 3, 5), np.unwrap(x * 3, period=5), 1e-10, 1e-10)
        close(signals.unwrap(x * 90, 360), np.unwrap(x * 90, period=360), 1e-12)
        close(signals.standardize(x.T, 0), ((x.T - x.mean(1)) / x.std(1)), 1e-9)
        found = signals.rescale(x, 2, 5)
        close([found.min(1), found.max(1)], [[2] * 3, [5] * 3])
        index = pandas.Index([3, 5, 9])
        self.assertTrue(signals.detrend(pandas.Series([1.0, 2.0, 4.0], index)).index.equals(index))

    @hypothesis.given(strategies.integers(1, 90), strategies.integers(1, 90), strategies.booleans(),
                      strategies.sampled_from(["full", "same", "valid"]),
                      strategies.sampled_from(["direct", "fft", "auto"]))
    @hypothesis.settings(max_examples=60, deadline=None)
    def test_convolution_and_correlation(self, nx, ny, is_complex, mode, method):
        x, y = RNG.normal(size=nx), RNG.normal(size=ny)
        x = x + 1j * x[::-1] if is_complex else x
        close(signals.convolve(x, y, mode, method), scipy.signal.convolve(x, y, mode, "direct"), 1e-9, 1e-10)
        if mode != "valid" or nx >= ny:
            close(signals.correlate(x, y, mode, method), scipy.signal.correlate(x, y, mode, "direct"), 1e-9,
                  1e-10)

    def test_correlation_matrices(self):
        x, y = RNG.normal(size=(2, 30))
        for one, other in ((x, y), (x + 1j * y, y - 2j * x)):
            full = signals.correlate(one, other)
            lags = np.subtract.outer(np.arange(4), np.arange(4))
            close(signals.correlation_matrix(one, 3, other), full[29 + lags])
            own = signals.correlation_matrix(one, 3, normalization="biased")
            close(own, own.conj().T)
            close(own[0, 0], np.mean(np.abs(one)**2))
        self.assertRaises(ValueError, signals.correlation_matrix, x, 30)

    def test_more_of_it(self):
        x, y = RNG.normal(size=(7, 9)), RNG.normal(size=(3, 4))
        for mode in ("full", "valid"):
            close(signals.convolve2(x, y, mode), scipy.signal.convolve2d(x, y, mode), 1e-9, 1e-12)
        close(signals.correlate2(x, y), scipy.signal.correlate2d(x, y), 1e-9, 1e-12)
        close(signals.correlate2(x + 1j, y * 1j), scipy.signal.correlate2d(x + 1j, y * 1j), 1e-9, 1e-12)
        close(signals.deconvolve(np.convolve(x[0], y[0]), y[0]), x[0], 1e-8)
        close(signals.autocorrelate(x, "biased")[0], np.correlate(x[0], x[0], "full") / 9, 1e-9, 1e-12)
        close(signals.correlate(x[0], x[1], normalization="unbiased"),
              np.correlate(x[0], x[1], "full") / np.r_[1:10, 8:0:-1], 1e-9)


class Noise(unittest.TestCase):
    def test_distributions(self):
        n = 200000
        for found, mean, variance in (
                (noise.uniform(n, 2, seed=3), 0, 4 / 3), (noise.gaussian(n, 2, seed=3), 0, 4),
                (noise.gamma(n, 3, seed=3), 3, 3), (noise.gamma(n, 8, seed=3), 8, 8),
                (noise.poisson(n, 4.5, seed=3), 4.5, 4.5), (noise.poisson(n, 30, seed=3), 30, 30),
                (noise.binomial(n, 10, 0.3, seed=3), 3, 2.1)):
            self.assertLess(abs(found.mean() - mean), 5 * np.sqrt(variance / n))
            self.assertLess(abs(found.var() / variance - 1), 0.03)
        self.assertEqual(sorted(noise.permutation(50, seed=2)), [*range(50)])
        self.assertEqual(sorted(noise.shuffle([["a"], ["b"]], seed=2).ravel()), ["a", "b"])
        tones = np.abs(np.fft.rfft(noise.periodic(65, 0.5, seed=2)))[1:] / 32.5
        close(tones, 0.5, 1e-9)

    def test_generators_go_on(self):
        for name, more in (("uniform", ()), ("gaussian", (2.0,)), ("gamma", (2,)), ("poisson", (20.0,)),
                           ("binomial", (40, 0.5))):
            whole = getattr(noise, name)(50, *more, seed=11)
            source = noise.Generator(11)
            first = getattr(source, name)(17, *more)
            copied, stored = source.copy(), pickle.loads(pickle.dumps(source))
            for one in (source, copied, stored):
                self.assertEqual(np.r_[first, getattr(one, name)(33, *more)].tolist(), whole.tolist())
            source.reset()
            self.assertEqual(getattr(source, name)(50, *more).tolist(), whole.tolist())
        self.assertFalse(np.array_equal(noise.gaussian(9), noise.gaussian(9)))
        for call in (lambda: noise.gaussian(0), lambda: noise.gaussian(5, seed=0),
                     lambda: noise.gaussian(5, seed=2**31), lambda: noise.poisson(5, -1),
                     lambda: noise.binomial(5, 2, 1.5), lambda: noise.gamma(5, 0)):
            self.assertRaises(ValueError, call)


class Multirate(unittest.TestCase):
    def test_resampled_sines_are_sines(self):
        for up, down in ((441, 480), (3, 2), (1, 4), (5, 1), (2, 4)):
            n, fs = 4000, 1000.0
            new = fs * up / down
            x = signals.sine(n, 30, fs, phase=0.4)
            found = multirate.resample(np.stack([x, -x]), up, down)
            self.assertEqual(found.shape[1], -(-n * up // down))
            expected = np.sin(2 * np.pi * 30 * np.arange(found.shape[1]) / new + 0.4)
            inner = slice(found.shape[1] // 4, -found.shape[1] // 4)
            close(found[0][inner], expected[inner], atol=3e-6)
            self.assertEqual((-found[1]).tobytes(), found[0].tobytes())
        x = RNG.normal(size=500)
        close(multirate.resample(x, 3, 2, taps=scipy.signal.firwin(61, 1 / 3)),
              scipy.signal.resample_poly(x, 3, 2, window=scipy.signal.firwin(61, 1 / 3)), 1e-8, 1e-9)
        self.assertEqual(multirate.resample(x, 7, 7).tolist(), x.tolist())
        self.assertRaisesRegex(ValueError, "odd", multirate.resample, x, 2, 1, taps=[0.5, 0.5])
        self.assertRaisesRegex(ValueError, "up: must be at least 1", multirate.resample, x, 0)

    def test_any_spacing(self):
        for spacing in (0.7071, 1.3, 2.9):
            w = 2 * np.pi * 0.39 * min(1, 1 / spacing)
            x = np.exp(1j * (w * np.arange(3000) + 0.3))
            found = multirate.respace(np.stack([x, 2 * x]), spacing, 2.25)
            self.assertEqual(found.shape[1], int((2999 - 2.25) / spacing) + 1)
            due = np.exp(1j * (w * (2.25 + spacing * np.arange(found.shape[1])) + 0.3))
            inner = slice(len(due) // 6, -len(due) // 6)
            close(found[1][inner], 2 * due[inner], 0, 1e-4)
            close(multirate.respace(x.real, spacing, 2.25), found[0].real, 1e-9, 1e-12)
        high = np.cos(2 * np.pi * 0.4 * np.arange(3000))  # would alias
        self.assertLess(np.abs(multirate.respace(high, 2.0)[300:-300]).max(), 1e-3)
        self.assertEqual(multirate.respace([1.0, 2.0], 1.0, 5.0).size, 0)
        for wrong in ({"spacing": 0}, {"spacing": 1, "start": -1}):
            self.assertRaises(ValueError, multirate.respace, [1.0], **wrong)

    def test_any_times(self):
        times = np.array([40.0, 50.25, 50.2501, 49.9, 61.7, 300.3])
        tones = np.array([0.03, 0.2, 0.38])

        def at(t):
            return np.exp(2j * np.pi * np.outer(tones, t))

        x = at(np.arange(400))
        for is_complex in (True, False):
            given, due = (x, at(times)) if is_complex else (x.imag, at(times).imag)
            close(multirate.resample_at(given, times), due, 0, 5e-5)
            close(multirate.resample_at(given.T, times / 10, 10, axis=0), due.T, 0, 5e-5)
        close(multirate.resample_at(x.imag, np.arange(5.5, 390)), multirate.respace(x.imag, 1.0, 5.5)[:, :385], 0, 1e-12)
        self.assertEqual(multirate.resample_at(x[0], [-1e300, 1e6]).tolist(), [0, 0])
        # Only frequencies below half the new rate remain.
        sparse = np.arange(100, 300, 4.0)
        close(multirate.resample_at(x, sparse, anti_alias=True)[0], at(sparse)[0], 0, 1e-4)
        self.assertLess(np.abs(multirate.resample_at(x, sparse, anti_alias=True)[1:]).max(), 2e-4)
        for times, reason in (([1.0, np.nan], "finite"), ([[1.0]], "one dimension"), ([2.0, 1.0], "must be increasing")):
            self.assertRaisesRegex(ValueError, reason, multirate.resample_at, x, times, anti_alias=True)

    def test_taps_apart(self):
        h, x = RNG.normal(size=5), RNG.normal(size=(3, 60))
        spread = np.zeros(13)
        spread[::3] = h
        for given in (x, x + 1j * x[::-1]):
            close(multirate.interpolated_fir(given, h, 3), scipy.signal.lfilter(spread, 1, given))
        self.assertRaisesRegex(ValueError, "spacing", multirate.interpolated_fir, x, h, 0)
        self.assertRaisesRegex(ValueError, "taps", multirate.interpolated_fir, x, [], 1)

    def test_single_precision_stays(self):
        x = RNG.normal(size=(2, 300))
        for dtype in (np.float32, np.complex64):
            found = multirate.resample(x.astype(dtype), 3, 2)
            self.assertEqual(found.dtype, dtype)
            close(found, multirate.resample(x, 3, 2), 1e-3, 1e-4)
        self.assertEqual(multirate.resample(x.astype(int), 3, 2).dtype, float)

    @hypothesis.given(strategies.lists(strategies.integers(0, 200), max_size=6),
                      strategies.sampled_from(["resample", "up", "average", "pick", "sum", "shift"]),
                      strategies.sampled_from([float, complex]), strategies.sampled_from([-1, 0]))
    @hypothesis.settings(max_examples=80, deadline=None)
    def test_blocks_have_the_bits_of_the_whole(self, cuts, which, dtype, axis):
        x = RNG.normal(size=(2, 200) if axis else (200, 2))
        x = x + 1j * x[::-1] if dtype is complex else x
        make, whole = {
            "resample": (lambda: multirate.Resampler(3, 2, 2, axis, dtype), lambda: multirate.resample(x, 3, 2, axis)),
            "up": (lambda: multirate.Resampler(4, 1, 2, axis, dtype), lambda: multirate.resample(x, 4, 1, axis)),
            "average": (lambda: multirate.Decimator(3, True, 2, axis, dtype),
                        lambda: multirate.decimate(x, 3, "average", axis)),
            "pick": (lambda: multirate.Decimator(3, False, 2, axis, dtype),
                     lambda: multirate.decimate(x, 3, "pick", axis)),
            "sum": (lambda: multirate.MovingSum(5, 2, 2, axis, dtype), lambda: multirate.moving_sum(x, 5, 2, axis)),
            "shift": (lambda: multirate.FrequencyShift(0.1, 1.0, 2, axis, dtype),
                      lambda: multirate.shift_frequency(x, 0.1, 1.0, axis)),
        }[which]
        stream = pickle.loads(pickle.dumps(make()))
        parts = []
        for part in np.split(x, sorted(cuts), axis):
            parts.append(stream(part))
            stream = stream.copy()
        found = np.concatenate([*parts, stream.finish()], axis)
        if which == "shift":  # its rotation is restarted with each block
            close(found, whole(), 1e-11)
        else:
            self.assertEqual(found.tobytes(), whole().tobytes())

    def test_what_they_compute(self):
        x = RNG.normal(size=60)
        close(multirate.moving_sum(x, 5), np.convolve(x, np.ones(5))[:60], 1e-9, 1e-12)
        close(multirate.moving_average(x, 4, 2), np.convolve(np.convolve(x, np.ones(4)), np.ones(4))[:60] / 16,
              1e-9, 1e-12)
        close(multirate.decimate(x, 4, "pick"), x[::4])
        close(multirate.decimate(x, 4, "average"), x.reshape(-1, 4).mean(1))
        close(multirate.decimate(x, 4), multirate.resample(x, 1, 4))
        close(multirate.shift_frequency(x, 5, 100), x * np.exp(2j * np.pi * 5 * np.arange(60) / 100), 1e-11)
        close(multirate.cic_decimate(np.ones(60), 3), [1 / 27, 17 / 27, *np.ones(18)], 1)
        close(multirate.cic_interpolate(np.ones(20), 3)[-9:], 1)


if __name__ == "__main__":
    unittest.main()
