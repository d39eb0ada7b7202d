"""The cost of the topics from Python compared with NumPy and SciPy, in one process.

There are three groups: functions of 10 values, where the overhead of the call is nearly all of the time; calls of
topics compared with calls of their exports; and 16 channels of 10^6 samples, and 10^6 values of special functions,
where processors and memory decide. Each line has our time and the ratio ours/theirs; below 1
is faster. Ours and theirs take turns, so that other work on the machine affects both.
"""

import math
import sys
import time
from pathlib import Path

import numpy as np
import scipy.fft
import scipy.linalg
import scipy.signal
import scipy.special

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402


def times(functions, repeats, rounds):
    """The minimum of many rounds for each function; they take turns, and other work only adds to the times."""
    best = [math.inf] * len(functions)
    for _ in range(rounds):
        for which, function in enumerate(functions):
            start = time.perf_counter()
            for _ in range(repeats):
                function()
            best[which] = min(best[which], (time.perf_counter() - start) / repeats)
    return best


def compare(title, peer, rows, repeats, rounds, wanted):
    ratios = []
    for name, ours, theirs in rows:
        if wanted and not any(word in name for word in wanted):
            continue
        ours(), theirs()  # written, planned and warm
        mine, other = times((ours, theirs), repeats, rounds)
        ratios.append((mine / other, name))
        print(f"{name:34} {1e6 * mine:12.2f} us   {mine / other:6.2f}", flush=True)
    if ratios:
        print_summary(title, peer, ratios)


def small():
    """On 10 values."""
    x, z = np.random.default_rng(1).normal(size=10), np.arange(10) + 1j
    m, b = np.random.default_rng(2).normal(size=(3, 3)), np.ones(3)
    f = qx.filters.butterworth(4, 0.1)
    sos, few = f.sos, np.abs(x)
    transforms = [
        ("fft.rfft", lambda: qx.fft.rfft(x), lambda: np.fft.rfft(x)),
        ("fft.fft, real", lambda: qx.fft.fft(x), lambda: np.fft.fft(x)),
        ("fft.fft, complex", lambda: qx.fft.fft(z), lambda: np.fft.fft(z)),
        ("fft.ifft", lambda: qx.fft.ifft(z), lambda: np.fft.ifft(z)),
        ("fft.irfft", lambda: qx.fft.irfft(z[:6]), lambda: np.fft.irfft(z[:6]))]
    functions = [
        ("filter, cascade", lambda: f(x), lambda: scipy.signal.sosfilt(sos, x)),
        ("fft.dct", lambda: qx.fft.dct(x), lambda: scipy.fft.dct(x)),
        ("fft.hilbert", lambda: qx.fft.hilbert(x), lambda: scipy.signal.hilbert(x)),
        ("filters.median", lambda: qx.filters.median(x, 3), lambda: scipy.signal.medfilt(x, 3)),
        ("filters.savgol", lambda: qx.filters.savgol(x, 5, 2), lambda: scipy.signal.savgol_filter(x, 5, 2)),
        ("signals.convolve", lambda: qx.signals.convolve(x, x), lambda: scipy.signal.convolve(x, x)),
        ("spectra.welch", lambda: qx.spectra.welch(x, 1.0, nperseg=10),
         lambda: scipy.signal.welch(x, 1.0, nperseg=10)),
        ("linalg.solve, 3 by 3", lambda: qx.linalg.solve(m, b), lambda: scipy.linalg.solve(m, b)),
        ("linalg.inv, 3 by 3", lambda: qx.linalg.inv(m), lambda: scipy.linalg.inv(m)),
        ("linalg.det, 3 by 3", lambda: qx.linalg.det(m), lambda: scipy.linalg.det(m)),
        ("linalg.svd, 3 by 3", lambda: qx.linalg.svd(m), lambda: scipy.linalg.svd(m)),
        ("special.erf", lambda: qx.special.erf(x), lambda: scipy.special.erf(x)),
        ("special.gamma", lambda: qx.special.gamma(few), lambda: scipy.special.gamma(few)),
        ("special.jv", lambda: qx.special.jv(1.0, few), lambda: scipy.special.jv(1.0, few)),
        ("windows.get", lambda: qx.windows.get("hann", 10), lambda: scipy.signal.get_window("hann", 10)),
        ("stats.median", lambda: qx.stats.median(x), lambda: np.median(x)),
        ("stats.mean", lambda: qx.stats.mean(x), lambda: np.mean(x))]
    return transforms, functions


def topical():
    """A call of a topic and of its export."""
    x, e = np.random.default_rng(1).normal(size=10), qx.exports
    f = qx.filters.butterworth(4, 0.1)
    m = np.random.default_rng(2).normal(size=(3, 3))
    return [
        ("fft.rfft - ReOXFFTH", lambda: qx.fft.rfft(x), lambda: e.ReOXFFTH(x)),
        ("fft.fft - ReOXFFTH", lambda: qx.fft.fft(x), lambda: e.ReOXFFTH(x)),
        ("fft.hartley - FHTH", lambda: qx.fft.hartley(x), lambda: e.FHTH(x)),
        ("filter - IIR_Filter2", lambda: f(x), lambda: e.IIR_Filter2(x, 0, f._a, f._b, f._rest[0], 0)),
        ("stats.median - Median_head", lambda: qx.stats.median(x), lambda: e.Median_head(x)),
        ("stats.mean - Mean_head", lambda: qx.stats.mean(x), lambda: e.Mean_head(x)),
        ("special.erf - QX_Erf", lambda: qx.special.erf(0.5), lambda: e.QX_Erf(0.5)),
        ("linalg.det - Determinant_head", lambda: qx.linalg.det(m), lambda: e.Determinant_head(m, 0)),
        ("signals.unwrap - unWrap85", lambda: qx.signals.unwrap(x), lambda: e.unWrap85(x, 0))]


def large():
    """16 channels of 10^6 samples on all processors."""
    x = np.random.default_rng(1).normal(size=(16, 1000000))
    f = qx.filters.butterworth(8, 0.1)
    sos = f.sos
    fir = qx.filters.windowed(64, 0.1)
    taps = fir.taps
    return [
        ("real transform", lambda: qx.fft.rfft(x), lambda: scipy.fft.rfft(x)),
        ("cascade of 4 sections", lambda: f(x), lambda: scipy.signal.sosfilt(sos, x)),
        ("FIR filter of 65 taps", lambda: fir(x), lambda: scipy.signal.lfilter(taps, 1.0, x)),
        ("resampler 160/147", lambda: qx.multirate.resample(x, 160, 147),
         lambda: scipy.signal.resample_poly(x, 160, 147, axis=-1)),
        ("Welch spectrum", lambda: qx.spectra.welch(x, 1.0, nperseg=1024),
         lambda: scipy.signal.welch(x, 1.0, nperseg=1024)),
        ("median of 5", lambda: qx.filters.median(x[:2], 5), lambda: scipy.signal.medfilt(x[:2], (1, 5)))]


def many_values():
    """Special functions over 10^6 values."""
    x = np.random.default_rng(1).uniform(0.1, 20, 1000000)
    s, p = qx.special, scipy.special
    return [(name, lambda ours=ours: ours(x), lambda theirs=theirs: theirs(x)) for name, ours, theirs in (
        ("erf", s.erf, p.erf), ("gamma", s.gamma, p.gamma), ("gammaln", s.gammaln, p.gammaln),
        ("digamma", s.digamma, p.digamma), ("J1", lambda v: s.jv(1.0, v), lambda v: p.jv(1.0, v)),
        ("E1", lambda v: s.expn(1, v), lambda v: p.expn(1, v)))]


def main(*wanted):
    transforms, functions = small()
    compare("transforms of 10 values from Python", "NumPy", transforms, 200, 100, wanted)
    compare("functions of 10 values from Python", "SciPy", functions, 100, 60, wanted)
    rows = topical()
    for name, ours, theirs in rows:
        if not wanted or any(word in name for word in wanted):
            ours(), theirs()
            mine, other = times((ours, theirs), 200, 100)
            print(f"{name:34} {1e6 * (mine - other):+12.2f} us above the export's {1e6 * other:.2f}", flush=True)
    compare("16 channels of 10^6 samples from Python", "SciPy", large(), 1, 5, wanted)
    compare("special functions of 10^6 values from Python", "SciPy", many_values(), 1, 5, wanted)


if __name__ == "__main__":
    main(*sys.argv[1:])
