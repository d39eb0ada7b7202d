"""Ten engineering tasks, each solved with this library and with SciPy. This library's results must agree with the
truth at least as well, in no more lines."""

import inspect
import sys
import unittest
from pathlib import Path

import numpy as np
import scipy.integrate
import scipy.linalg
import scipy.optimize
import scipy.signal

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402

RNG = np.random.default_rng(7)
FS = 1000.0
T = np.arange(4000) / FS


# A task has two solutions, `ours` and `theirs`, and the `error` of a result with respect to the truth.

class DesignAndApply:
    """A lowpass without delay: it removes a disturbance at 200 Hz, and keeps a slow wave, an offset and a ramp."""
    t = np.arange(4001) / FS  # the disturbance is 0 at both ends
    truth = 5 + 0.3 * t + np.sin(2 * np.pi * 2 * t)
    x = truth + 0.5 * np.sin(2 * np.pi * 200 * t)

    def ours(self):
        return qx.filters.butterworth(4, 40, fs=FS).zero_phase(self.x)

    def theirs(self):
        sos = scipy.signal.butter(4, 40, fs=FS, output="sos")
        return scipy.signal.sosfiltfilt(sos, self.x)

    def error(self, found):
        return np.abs(found - self.truth).max()


class ResampleAudio:
    """Resamples a tone from 48 kHz to 44.1 kHz."""
    x = np.sin(2 * np.pi * 5000 * np.arange(48000) / 48000)

    def ours(self):
        return qx.multirate.resample(self.x, 147, 160)

    def theirs(self):
        return scipy.signal.resample_poly(self.x, 147, 160)

    def error(self, found):
        due = np.sin(2 * np.pi * 5000 * np.arange(len(found)) / 44100)
        return np.abs(found - due)[2000:-2000].max()


class FindPeaks:
    """The times of the beats of a noisy pulse train."""
    places = np.sort(np.arange(0.2, 3.8, 0.3) + 0.02 * RNG.random(12))
    x = np.exp(-((T[:, None] - places) / 0.02)**2).sum(1) + 0.01 * RNG.normal(size=4000)

    def ours(self):
        return qx.measure.peaks(qx.filters.savgol(self.x, 21, 2), FS).positions

    def theirs(self):
        smooth = scipy.signal.savgol_filter(self.x, 21, 2)
        return scipy.signal.find_peaks(smooth, prominence=0.5)[0] / FS

    def error(self, found):
        return np.abs(found - self.places).max() if len(found) == 12 else np.inf


class BoundedExponential:
    """A decay with a rate that is known to be at least 1, and its standard errors."""
    y = 3 * np.exp(-1.5 * T) + 0.2 + 0.01 * RNG.normal(size=4000)

    def ours(self):
        fit = qx.fit.exponential(T, self.y, bounds={"b": (-10, -1)})
        return [*fit.parameters.values(), *fit.errors.values()]

    def theirs(self):
        p, c = scipy.optimize.curve_fit(lambda x, a, b, c: a * np.exp(b * x) + c, T, self.y, (1, -2, 0),
                                        bounds=([-np.inf, -10, -np.inf], [np.inf, -1, np.inf]))
        return [*p, *np.sqrt(np.diag(c))]

    def error(self, found):
        return np.abs((np.array(found[:3]) - [3, -1.5, 0.2]) / found[3:]).max()  # in standard errors


class Solve:
    """A system of 100 equations."""
    a, x = RNG.normal(size=(100, 100)), RNG.normal(size=100)
    b = a @ x

    def ours(self):
        return qx.linalg.solve(self.a, self.b)

    def theirs(self):
        return scipy.linalg.solve(self.a, self.b)

    def error(self, found):
        return np.abs(found - self.x).max()


class Eigenvalues:
    """The frequencies of a chain of 20 masses."""
    k = 2 * np.eye(20) - np.eye(20, k=1) - np.eye(20, k=-1)

    def ours(self):
        return np.sqrt(qx.linalg.eigvalsh(self.k))

    def theirs(self):
        return np.sqrt(scipy.linalg.eigvalsh(self.k))

    def error(self, found):
        return np.abs(found - 2 * np.sin(np.pi * np.arange(1, 21) / 42)).max()


class WindowedSpectrum:
    """The amplitude of a tone between two lines, 60 dB above another one."""
    x = 2 * np.sin(2 * np.pi * 100.1 * T) + 0.002 * np.sin(2 * np.pi * 130 * T)

    def ours(self):
        return np.sqrt(2 * qx.spectra.periodogram(self.x, FS, "flattop", scaling="spectrum").values)

    def theirs(self):
        return np.sqrt(2 * scipy.signal.periodogram(self.x, FS, "flattop", scaling="spectrum")[1])

    def error(self, found):
        return max(abs(found.max() / 2 - 1), abs(found[500:540].max() / 0.002 - 1))


class Displacement:
    """From an acceleration with an offset to the displacement."""
    truth = 0.01 * np.sin(2 * np.pi * 5 * T)
    a = -(2 * np.pi * 5)**2 * truth + 0.1

    def ours(self):
        return qx.calculus.displacement(self.a, FS)

    def theirs(self):
        v = scipy.integrate.cumulative_trapezoid(self.a, dx=1 / FS, initial=0)
        d = scipy.integrate.cumulative_trapezoid(v, dx=1 / FS, initial=0)
        return d - np.polyval(np.polyfit(T, d, 2), T)

    def error(self, found):
        return np.abs(found - self.truth).max() / 0.01


class Delay:
    """The delay of two records of noise, between the samples."""
    source = scipy.signal.sosfilt(scipy.signal.butter(6, 0.3, output="sos"), RNG.normal(size=8192))
    moved = np.fft.irfft(np.fft.rfft(source) * np.exp(-2j * np.pi * np.fft.rfftfreq(8192) * 7.3))
    x, y = source[2000:4000], moved[2000:4000]

    def ours(self):
        return qx.measure.delay(self.x, self.y)

    def theirs(self):
        full = scipy.signal.correlate(self.y, self.x)
        return scipy.signal.correlation_lags(len(self.y), len(self.x))[full.argmax()]

    def error(self, found):
        return abs(found - 7.3)


class StreamingFilter:
    """Filters a signal block by block, with the result for the whole signal."""
    x = RNG.normal(size=4000)
    blocks = np.split(x, [10, 1000, 1001, 3500])

    def ours(self):
        stream = qx.filters.elliptic(5, 0.1, 60, 100, fs=FS).stream()
        return np.concatenate([stream(block) for block in self.blocks])

    def theirs(self):
        sos = scipy.signal.ellip(5, 0.1, 60, 100, fs=FS, output="sos")
        state, found = np.zeros((len(sos), 2)), []
        for block in self.blocks:
            part, state = scipy.signal.sosfilt(sos, block, zi=state)
            found.append(part)
        return np.concatenate(found)

    def error(self, found):
        whole = scipy.signal.sosfilt(scipy.signal.ellip(5, 0.1, 60, 100, fs=FS, output="sos"), self.x)
        return np.abs(found - whole).max()


# The largest allowed error of a result.
TASKS = {DesignAndApply: 6e-3, ResampleAudio: 2e-6, FindPeaks: 2e-3, BoundedExponential: 3.5, Solve: 1e-10,
         Eigenvalues: 1e-12, WindowedSpectrum: 3e-3, Displacement: 1e-2, Delay: 1e-2, StreamingFilter: 1e-10}
AS_GOOD = 1.02  # allowed ratio to the error of the other solution, because of rounding


def lines_of(function):
    return len([line for line in inspect.getsource(function).split("\n")[1:] if line.strip()])


class TenTasks(unittest.TestCase):
    def test_results_and_lines(self):
        for kind, most in TASKS.items():
            with self.subTest(task=kind.__name__):
                task = kind()
                ours, theirs = task.error(task.ours()), task.error(task.theirs())
                self.assertLess(ours, most)
                self.assertLessEqual(ours, AS_GOOD * theirs + 1e-10, f"SciPy's error is {theirs:.3g}")
                self.assertLessEqual(lines_of(kind.ours), lines_of(kind.theirs))


if __name__ == "__main__":
    if "--show" in sys.argv:
        for kind in TASKS:
            one = kind()
            print(f"{kind.__name__:20} {one.error(one.ours()):.3g} {one.error(one.theirs()):.3g} "
                  f"{lines_of(kind.ours)} {lines_of(kind.theirs)}")
    else:
        unittest.main()
