"""qx.filters, qx.windows and qx.fft compared with SciPy and NumPy, and the streams of filters."""

import pickle
import sys
import unittest
from pathlib import Path

import hypothesis
import numpy as np
import scipy.fft
import scipy.ndimage
import scipy.signal
from hypothesis import strategies

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import filters, windows  # noqa: E402

RNG = np.random.default_rng(7)
SHORT = {"lowpass": 40, "highpass": 40, "bandpass": (40, 90), "bandstop": (40, 90)}


def close(found, expected, rtol=1e-9, atol=1e-12):
    np.testing.assert_allclose(found, expected, rtol=rtol, atol=atol)


# The same cases in each run, without a database of earlier ones.
hypothesis.settings.register_profile("same", derandomize=True, database=None)
hypothesis.settings.load_profile("same")


class Designs(unittest.TestCase):
    def test_responses_are_those_of_other_designs(self):
        frequencies = np.linspace(1, 499, 200)
        for kind, edges in SHORT.items():
            for made, order, design in (
                    (filters.butterworth(5, edges, kind, fs=1000), 5, {"ftype": "butter"}),
                    (filters.chebyshev1(4, 0.5, edges, kind, fs=1000), 4, {"ftype": "cheby1", "rp": 0.5}),
                    (filters.chebyshev2(4, 50, edges, kind, fs=1000), 4, {"ftype": "cheby2", "rs": 50}),
                    (filters.elliptic(4, 0.5, 60, edges, kind, fs=1000), 4,
                     {"ftype": "ellip", "rp": 0.5, "rs": 60})):
                with self.subTest(kind=kind, **design):
                    sos = scipy.signal.iirfilter(order, edges, btype=kind, fs=1000, output="sos", **design)
                    expected = scipy.signal.sosfreqz(sos, frequencies, fs=1000)[1]
                    close(made.response(frequencies).values, expected, 1e-6, 1e-9)
                    b, a = scipy.signal.iirfilter(order, edges, btype=kind, fs=1000, **design)
                    beside = [scipy.signal.sosfreqz(sos, frequencies + step, fs=1000)[1]
                              for step in (-1e-3, 1e-3)]
                    delay = -np.angle(beside[1] / beside[0]) / (2 * np.pi * 2e-6)
                    close(np.abs(np.sort_complex(made.poles)), np.abs(np.sort_complex(np.roots(a))), 1e-4)
                    there = np.abs(expected) > 1e-3
                    close(made.response(frequencies).delay[there], delay[there], 1e-3, 1e-3)
                    self.assertTrue(made.is_stable and made.is_iir)
        sos = scipy.signal.bessel(4, 40, fs=1000, norm="mag", output="sos")
        close(filters.bessel(4, 40, fs=1000).response(frequencies).values,
              scipy.signal.sosfreqz(sos, frequencies, fs=1000)[1], 1e-6)

    def test_windowed_filters(self):
        for kind, edges in SHORT.items():
            expected = scipy.signal.firwin(101, edges, pass_zero=kind, fs=1000)
            close(filters.windowed(101, edges, kind, fs=1000).taps, expected, 1e-9, 1e-14)
        expected = scipy.signal.firwin(60, 40, window=("kaiser", 5.0), fs=1000, scale=False)
        found = filters.windowed(60, 40, window=("kaiser", 5.0), fs=1000, scale=False)
        close(found.taps, expected, 1e-9, 1e-14)
        self.assertEqual(found.delay, 29.5)

    def test_equiripple_filters(self):
        bands, desired = [0, 50, 80, 500], [1, 0]
        made = filters.equiripple(71, bands, desired, [1, 10], fs=1000)
        close(made.taps, scipy.signal.remez(71, bands, desired, weight=[1, 10], fs=1000), atol=2e-5)
        at = made.response(np.linspace(0, 50, 500)).magnitude
        self.assertLess(np.abs(at - 1).max(), 1.05 * made.ripple)
        hilbert = filters.equiripple(31, [0.05, 0.45], [1], kind="hilbert")
        close(hilbert.response([0.2]).magnitude, 1, 0.01)

    def test_narrow_filters(self):
        for kind, edges, passed, stopped in (
                ("lowpass", (10, 15), (1, 9), (16, 450)), ("highpass", (10, 15), (16, 450), (1, 9)),
                ("bandpass", (95, 98, 102, 105), (99, 101), (1, 94)),
                ("bandstop", (95, 98, 102, 105), (1, 94), (99, 101))):
            f = filters.narrow(edges, kind, 0.1, 60, 1000)
            loss = -f.response(np.linspace(*passed, 50)).decibels
            self.assertLess(np.abs(loss).max(), 0.11, kind)
            self.assertGreater((-f.response(np.linspace(*stopped, 50)).decibels).min(), 59, kind)
            self.assertFalse(f.is_iir)
            self.assertEqual(f.delay, (len(f.taps) - 1) / 2)

    def test_sections_come_and_go(self):
        sos = scipy.signal.ellip(5, 1, 40, 0.2, output="sos")
        x = RNG.normal(size=300)
        made = filters.from_sos(sos * 2.0, fs=10)
        close(made.sos, sos * [2, 2, 2, 2, 2, 2] / [[2]], 1e-14)
        close(made(x), scipy.signal.sosfilt(sos, x))
        b, a = scipy.signal.butter(3, 0.2)
        direct = filters.from_ba(b, a)
        close(direct(x), scipy.signal.lfilter(b, a, x))
        close(filters.from_ba([1.0, 2.0])(x), scipy.signal.lfilter([1, 2], [1], x))
        both = filters.butterworth(2, 0.1) * filters.butterworth(2, 0.1, "highpass")
        self.assertEqual(both.sos.shape, (2, 6))
        close(np.sort(made.zeros.imag), np.sort(scipy.signal.ellip(5, 1, 40, 0.2, output="zpk")[0].imag), 1e-6, 1e-6)
        again = pickle.loads(pickle.dumps(made))
        self.assertEqual(again(x).tobytes(), made(x).tobytes())
        self.assertRegex(direct._repr_html_() + repr(made), "4 and 4 coefficients.*3 sections")
        self.assertEqual(len(direct.plot().lines), 1)

    def test_what_cannot_be_is_refused_in_the_words_of_the_caller(self):
        for call, pattern, name in (
                (lambda: filters.butterworth(0, 0.1), "order: must be at least 1", "ErrOrderNotPositive"),
                (lambda: filters.butterworth(2, 600, fs=1000), "cutoff: must be between 0 and half the sampling "
                 "rate, 500; got 600", "ErrAboveNyquist"),
                (lambda: filters.butterworth(2, 40), "pass fs for frequencies", "ErrAboveNyquist"),
                (lambda: filters.butterworth(2, (90, 40), "bandpass", 1000), "must be increasing", "ErrBadCutoff"),
                (lambda: filters.butterworth(2, (40, 90), fs=1000), "needs one frequency", "ErrSizesDisagree"),
                (lambda: filters.chebyshev1(2, -1, 0.1), "ripple: must be above 0", "ErrRippleNotPositive"),
                (lambda: filters.elliptic(2, 3, 2, 0.1), "below the attenuation", "ErrRippleAboveAttenuation"),
                (lambda: filters.windowed(10, 0.1, "highpass"), "odd number", "ErrBadTapCount"),
                (lambda: filters.equiripple(10, [0, 0.1, 0.2], [1, 0]), "3, 2 and 2", "ErrSizesDisagree"),
                (lambda: filters.from_sos([[1, 0, 0, 0, 0, 0]]), "a0", "ErrBadCoefficients"),
                (lambda: filters.savgol(np.ones(9), 4, 2), "odd", "ErrBadTapCount"),
                (lambda: filters.median(np.ones(9), 0), "size", "ErrNegativeCount"),
                (lambda: filters.butterworth(2, 0.1)(np.ones(9)[:0]), "", "ErrEmptyInput"),
                (lambda: filters.butterworth(2, 0.1).zero_phase(np.ones(9), pad=9), "pad",
                 "ErrSizesDisagree")):
            with self.assertRaisesRegex(ValueError, pattern) as caught:
                call()
            self.assertEqual(caught.exception.name, name)


class ZeroPhase(unittest.TestCase):
    def test_it_is_filtering_in_both_directions(self):
        x = np.cumsum(RNG.normal(size=400)) + 50
        f = filters.butterworth(4, 0.05)
        sos = f.sos
        for extension in ("odd", "even", "constant"):
            close(f.zero_phase(x, extension=extension, pad=60),
                  scipy.signal.sosfiltfilt(sos, x, padtype=extension, padlen=60), 1e-8)
        b, a = scipy.signal.butter(3, 0.2)
        close(filters.from_ba(b, a).zero_phase(x, pad=30), scipy.signal.filtfilt(b, a, x, padlen=30), 1e-7)
        h = scipy.signal.firwin(21, 0.2)
        close(filters.from_ba(h).zero_phase(x, pad=63), scipy.signal.filtfilt(h, [1], x, padlen=63), 1e-7)
        z = x + 1j * x[::-1]
        close(f.zero_phase(z), f.zero_phase(x) + 1j * f.zero_phase(x[::-1]), 1e-12)

    def test_offsets_and_ramps_stay(self):
        t = np.arange(500.0)
        for x in (np.full(500, 3.0), 2 - 0.01 * t):
            for f in (filters.butterworth(4, 0.02), filters.elliptic(4, 0.001, 60, 0.05),
                      filters.windowed(51, 0.1)):
                gain = f.response([0.0]).magnitude[0]**2
                close(f.zero_phase(x), gain * x, 1e-6, 1e-6)
        self.assertEqual(filters.butterworth(2, 0.1).zero_phase([5.0]).round(9), [5.0])
        unstable = filters.from_ba([1.0], [1.0, -1.0])  # an integrator has no steady state
        self.assertTrue(np.isfinite(unstable.zero_phase(t)).all())


def stream_of(make, x, cuts, axis=-1):
    stream = make()
    return np.concatenate([stream(part) for part in np.split(x, sorted(cuts), axis)], axis)


class Streams(unittest.TestCase):
    @hypothesis.given(strategies.lists(strategies.integers(0, 300), max_size=8), strategies.booleans(),
                      strategies.sampled_from(["iir", "direct", "fir"]), strategies.sampled_from([-1, 0]))
    @hypothesis.settings(max_examples=50, deadline=None)
    def test_blocks_have_the_bits_of_the_whole(self, cuts, is_complex, which, axis):
        f = {"iir": filters.elliptic(5, 1, 60, 0.1), "fir": filters.windowed(33, 0.1),
             "direct": filters.from_ba(*scipy.signal.butter(3, 0.3))}[which]
        x = RNG.normal(size=(3, 300) if axis else (300, 3))
        x = x + 1j * x[::-1] if is_complex else x
        dtype = complex if is_complex else float
        found = stream_of(lambda: f.stream(3, axis, dtype), x, cuts, axis)
        self.assertEqual(found.tobytes(), f(x, axis).tobytes())
        one = np.ascontiguousarray(x[0] if axis else x[:, 0])
        self.assertEqual(stream_of(lambda: f.stream(dtype=dtype), one, cuts).tobytes(), f(one).tobytes())

    def test_protocol(self):
        f, x = filters.butterworth(4, 0.1), RNG.normal(size=100)
        stream = f.stream()
        begun = stream(x[:40])
        other, stored = stream.copy(), pickle.loads(pickle.dumps(stream))
        rest = stream(x[40:])
        for one in (other, stored):
            self.assertEqual(one(x[40:]).tobytes(), rest.tobytes())
        self.assertEqual(np.r_[begun, rest].tobytes(), f(x).tobytes())
        stream.reset()
        self.assertEqual(stream(x).tobytes(), f(x).tobytes())
        self.assertEqual(stream.finish().size, 0)
        self.assertEqual(f.stream(2)(np.zeros((2, 0))).shape, (2, 0))
        for call in (lambda: f.stream(2)(np.zeros(5)), lambda: f.stream(2)(np.zeros((3, 5))),
                     lambda: f.stream(0), lambda: f.stream(axis=3), lambda: f.stream(dtype=np.float32)):
            self.assertRaises(ValueError, call)
        self.assertRaisesRegex(TypeError, "got complex128", f.stream(), [1j])


class ComplexCoefficients(unittest.TestCase):
    """A pass band on one side of 0."""

    b, a = np.array(scipy.signal.butter(4, 0.2)) * np.exp(0.6j * np.pi * np.arange(5))
    f = filters.from_ba(b, a)

    def test_signals(self):
        x = RNG.normal(size=(2, 300))
        for given in (x, x + 1j * x[::-1]):
            close(self.f(given), scipy.signal.lfilter(self.b, self.a, given))
            close(filters.from_ba(self.b)(given), scipy.signal.lfilter(self.b, 1, given))
            for axis, blocks in ((-1, given), (0, given.T)):
                stream = self.f.stream(2, axis, given.dtype.type)
                found = [stream(part) for part in np.split(blocks, [1, 7, 200], axis)]
                np.testing.assert_array_equal(np.concatenate(found, axis), self.f(blocks, axis=axis))
        tone = np.exp(1j * np.pi * np.outer([0.6, -0.6], np.arange(300)))
        close(np.abs(self.f.zero_phase(tone)[:, 150]), [1, 0], 0, 1e-6)
        close(self.f.zero_phase(tone)[0, 100:200], tone[0, 100:200], 1e-6)
        self.assertEqual(pickle.loads(pickle.dumps(self.f))(x).dtype, complex)

    def test_what_it_is(self):
        w, expected = scipy.signal.freqz(self.b, self.a, np.linspace(-3, 3, 50))
        close(self.f.response(w / 2 / np.pi).values, expected)
        roots = scipy.signal.tf2zpk(self.b, self.a)
        for found, due in zip((self.f.zeros, self.f.poles), roots):
            close(np.sort(np.angle(found)), np.sort(np.angle(due)), 0, 1e-3)  # a zero of order 4
        close(np.sort_complex(self.f.poles), np.sort_complex(roots[1]), 1e-6)
        close((self.f * filters.from_ba([1, 1j])).ba[0], np.convolve(self.b, [1, 1j]))
        self.assertTrue(self.f.is_stable)


class Smoothing(unittest.TestCase):
    def test_savgol(self):
        x = RNG.normal(size=(3, 60))
        for deriv in (0, 1, 2, 4):
            expected = scipy.signal.savgol_filter(x, 11, 3, deriv=deriv, delta=0.1)
            close(filters.savgol(x, 11, 3, deriv, 0.1), expected, 1e-8, 1e-8)
        close(filters.savgol(x.T, 11, 3, axis=0), filters.savgol(x, 11, 3).T, 0)

    def test_median(self):
        x = RNG.normal(size=50)
        for size in (1, 3, 7, 51, 99):
            for ends, mode in (("reflect", "reflect"), ("nearest", "nearest"), ("zero", "constant")):
                close(filters.median(x, size, ends), scipy.ndimage.median_filter(x, size, mode=mode), 0)


class Windows(unittest.TestCase):
    def test_windows_are_those_of_the_field(self):
        for name, theirs in (("hann", "hann"), ("hamming", "hamming"), ("blackman", "blackman"),
                             ("blackman_harris", "blackmanharris"), ("nuttall", "nuttall"),
                             ("triangle", "bartlett"), ("bartlett_hann", "barthann"), ("bohman", "bohman"),
                             ("boxcar", "boxcar"), (("kaiser", 8.6), ("kaiser", 8.6)),
                             (("gaussian", 7.0), ("gaussian", 7.0)), (("chebyshev", 70), ("chebwin", 70))):
            for n in (1, 2, 16, 33):
                for symmetric in (False, True):
                    if n < 3 and (symmetric or n == 1 or "cheb" in str(theirs)):
                        continue
                    with self.subTest(name=name, n=n, symmetric=symmetric):
                        close(windows.get(name, n, symmetric),
                              scipy.signal.get_window(theirs, n, fftbins=not symmetric), 1e-9, 2e-9)

    def test_formulas_and_constants(self):
        u = 2 * np.arange(33) / 32 - 1
        theta = np.pi * (u + 1)
        close(windows.welch(33), 1 - u**2, atol=1e-15)
        near = 1 - 6 * u**2 + 6 * np.abs(u)**3
        close(windows.parzen(33), np.where(np.abs(u) <= 0.5, near, 2 * (1 - np.abs(u))**3), atol=1e-14)
        for name, terms in (("blackman_harris3", [0.42323, 0.49755, 0.07922]),
                            ("blackman_exact", [7938 / 18608, 9240 / 18608, 1430 / 18608])):
            expected = sum((-1)**k * a * np.cos(k * theta) for k, a in enumerate(terms))
            close(getattr(windows, name)(33), expected, atol=1e-14)
            close(windows.cosine_sum(33, terms), expected, atol=1e-14)
        ramp = np.sin(np.pi * np.arange(4) / 8)**2  # floor(0.3 * 32 / 2) values at each end
        close(windows.tukey(32, 0.3), np.r_[ramp, np.ones(24), ramp[::-1]], atol=1e-15)
        close(windows.get(("tukey", 0.3), 31), windows.tukey(32, 0.3)[:-1], 0)
        close(windows.tukey(9, 1), windows.hann(9), 0)
        self.assertEqual(windows.exponential(5, 0.1)[-1].round(12), 0.1)
        self.assertEqual(windows.force(4, 25).tolist(), [1, 0, 0, 0])
        for name, enbw in (("hann", 1.5), ("boxcar", 1.0), ("hamming", 1.3628)):
            self.assertAlmostEqual(windows.constants(name).enbw, enbw, 4)
        values = RNG.normal(size=8)
        self.assertEqual(windows.get(values, 8).tolist(), values.tolist())
        for wrong in ("hannn", ("hann", 1), "kaiser", ("kaiser", 1, 2), values[:3]):
            self.assertRaises(ValueError, windows.get, wrong, 8)

    def test_apply(self):
        x = RNG.normal(size=(2, 16)) + 1j
        for window in ("hann", ("tukey", 0.25), ("gaussian", 3.0)):
            close(windows.apply(x, window), x * windows.get(window, 16), 1e-14)
            close(windows.apply(x.T.real, window, 0, True), (x.real * windows.get(window, 16, True)).T, 1e-14)


class Transforms(unittest.TestCase):
    @hypothesis.given(strategies.integers(1, 40), strategies.one_of(strategies.none(), strategies.integers(1, 50)),
                      strategies.sampled_from(["backward", "ortho", "forward"]), strategies.integers(0, 1),
                      strategies.sampled_from(["fft", "ifft", "rfft", "irfft"]))
    @hypothesis.settings(max_examples=120, deadline=None)
    def test_they_are_numpys(self, length, n, norm, axis, name):
        shape = (3, length)[::1 if axis else -1]
        x = RNG.normal(size=shape)
        if name != "rfft":
            x = x + 1j * RNG.normal(size=shape)
        if name == "irfft" and n is None and length < 2:
            return
        close(getattr(qx.fft, name)(x, n, axis, norm), getattr(np.fft, name)(x, n, axis, norm), 1e-10, 1e-11)
        if name == "fft":
            close(qx.fft.fft(x.real, n, axis, norm), np.fft.fft(x.real, n, axis, norm), 1e-10, 1e-11)

    @hypothesis.given(strategies.integers(1, 90), strategies.integers(1, 120), strategies.integers(-99, 99),
                      strategies.integers(1, 30), strategies.booleans(), strategies.integers(0, 1))
    @hypothesis.settings(max_examples=60, deadline=None)
    def test_a_band_of_bins(self, length, n, start, size, is_complex, axis):
        x = RNG.normal(size=(length, 2) if axis == 0 else (2, length))
        x = x + 1j * x[::-1] if is_complex else x
        before = x.copy()
        due = np.take(np.fft.fft(x, n, axis), np.arange(start, start + size) % n, axis)
        close(qx.fft.dzt(x, start, size, n, axis), due, 0, 1e-12 * n)
        np.testing.assert_array_equal(x, before)

    def test_the_others(self):
        x = RNG.normal(size=(4, 15))
        for norm in ("backward", "ortho"):
            for n in (None, 9, 20):
                close(qx.fft.dct(x, n, norm=norm), scipy.fft.dct(x, 2, n, norm=norm))
                close(qx.fft.idct(x, n, norm=norm), scipy.fft.idct(x, 2, n, norm=norm))
                close(qx.fft.dst(x, n, norm=norm), scipy.fft.dst(x, 1, n, norm=norm))
                close(qx.fft.idst(x, n, norm=norm), scipy.fft.idst(x, 1, n, norm=norm))
        for n in (32768, 32769, 40000):  # where the half-complex form is used
            y = RNG.normal(size=n)
            close(qx.fft.rfft(y), np.fft.rfft(y), 1e-9, 1e-8)
        close(qx.fft.hilbert(x), scipy.signal.hilbert(x).imag)
        close(qx.fft.ihilbert(qx.fft.hilbert(x)), x - x.mean(-1, keepdims=True))
        close(qx.fft.ihartley(qx.fft.hartley(x)), x)
        close(qx.fft.hartley(x), np.fft.fft(x).real - np.fft.fft(x).imag)
        close(qx.fft.ihalf_complex(qx.fft.half_complex(x)), x)
        close(qx.fft.fft2(x), np.fft.fft2(x))
        close(qx.fft.ifft2(qx.fft.fft2(x[None] + 1j)), x[None] + 1j)
        close(qx.fft.czt(x, 7, np.exp(0.2j), 1.1), scipy.signal.czt(x, 7, np.exp(0.2j), 1.1))
        close(qx.fft.iczt(qx.fft.czt(x)), x, 1e-10, 1e-10)
        close(qx.fft.zoom(x, (1, 3), 11, fs=20), scipy.signal.zoom_fft(x, (1, 3), 11, fs=20))
        for n in (1, 8, 9):
            close(qx.fft.fftshift(qx.fft.fftfreq(n, 0.1)), np.fft.fftshift(np.fft.fftfreq(n, 0.1)))
        with self.assertRaises(TypeError):
            qx.fft.rfft(x + 1j)


if __name__ == "__main__":
    unittest.main()
