"""Convolution and filters against NumPy and SciPy, in one process.

Ours are the exports, called through ctypes with existing arrays; theirs allocate their
output. Both include the cost of a call from Python, about a microsecond for ours and several for some of
theirs.
"""

import ctypes
import sys

import numpy as np

try:
    import scipy.ndimage
    import scipy.signal
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

from pocketfft import DBL, block_of, load, seconds
from summary import print_summary


def interleaved(ours, theirs):
    """The seconds of both, as medians of interleaved rounds."""
    repeats = max(1, int(0.01 / max(seconds(theirs, 1), 1e-6)))
    rounds = [(seconds(ours, repeats), seconds(theirs, repeats)) for _ in range(7)]
    return [sorted(column)[3] for column in zip(*rounds)]


class Bench:
    def __init__(self):
        self.host, self.module = load()
        self.host.QXHostNew2D.restype = ctypes.c_void_p
        self.noise = np.random.default_rng(1)
        self.error = ctypes.c_int32()

    def array(self, values):
        return block_of(self.host, DBL, np.asarray(values, float))

    def matrix(self, values):
        handle = ctypes.c_void_p(self.host.QXHostNew2D(DBL, *values.shape))
        block = ctypes.cast(handle, ctypes.POINTER(ctypes.c_void_p))[0]
        ctypes.memmove(block + 8, values.ctypes.data, values.nbytes)
        return handle

    def compare(self, what, peer, cases):
        ratios = []
        for name, ours, theirs in cases:
            mine, other = interleaved(ours, theirs)
            ratios.append((mine / other, name))
            print(f"{what}, {name:24} {1e6 * mine:12.1f} us  ratio {mine / other:5.2f}", flush=True)
        print_summary(what, peer, ratios)

    def convolution(self, algorithm, sizes, theirs):
        method = ctypes.byref(ctypes.c_int32(algorithm))
        for n, m in sizes:
            x, y = self.noise.normal(size=n), self.noise.normal(size=m)
            blocks = [self.array(x), self.array(y), self.array([0])]
            yield (f"{n} by {m}", lambda: self.module.Convolution(
                *blocks, method, ctypes.byref(self.error)), lambda: theirs(x, y))

    def fir(self):
        keep = ctypes.byref(ctypes.c_uint8(0))
        x = self.noise.normal(size=20000)
        for taps in (8, 16, 64, 256, 1024):
            b = self.noise.normal(size=taps)
            blocks = [self.array(x), self.array([]), self.array(b), self.array([]), self.array([])]
            yield (f"{taps} taps", lambda: self.module.IIR_Filter(
                *blocks, keep, ctypes.byref(self.error)),
                lambda: scipy.signal.lfilter(b, [1.0], x))

    def cascade(self):
        keep, form = ctypes.byref(ctypes.c_uint8(0)), ctypes.byref(ctypes.c_int32(0))
        x = self.noise.normal(size=20000)
        for sections in (2, 4, 8, 16, 64):
            sos = np.tile([0.9, 0.5, 0.3, 1, -0.5, 0.3], (sections, 1))
            blocks = [self.array(np.tile([-0.5, 0.3], sections)),
                      self.array(np.tile([0.9, 0.5, 0.3], sections)), self.array([])]
            signal = self.array(x)
            yield (f"{sections} sections", lambda: self.module.IIR_Filter2(
                signal, form, *blocks, keep, ctypes.byref(self.error)),
                lambda: scipy.signal.sosfilt(sos, x))

    def medians(self, theirs):
        # Ours works in place, so each call gets a copy.
        x = self.noise.normal(size=1000000)
        signal = self.array(x)
        block = ctypes.cast(signal, ctypes.POINTER(ctypes.c_void_p))[0]

        def ours(rank):
            ctypes.memmove(block + 4, x.ctypes.data, x.nbytes)
            self.module.MedianFilter81_H(signal, rank, rank)

        for rank in (1, 2, 3, 5, 10, 20, 50, 100):
            yield f"rank {rank}", lambda: ours(rank), lambda: theirs(x, 2 * rank + 1)

    def least_squares(self):
        x = self.noise.normal(size=100000)
        for order, frame in ((2, 5), (2, 11), (3, 25), (4, 51), (5, 101), (3, 501)):
            blocks = [self.array(x), order, frame, self.array([]), self.array([])]
            yield (f"order {order}, frame {frame}",
                   lambda: self.module.SavitzkyGolayFiltH(*blocks),
                   lambda: scipy.signal.savgol_filter(x, frame, order))

    def images(self):
        image = self.noise.normal(size=(512, 512))
        for size in (3, 7, 15):
            kernel = self.noise.normal(size=(size, size))
            blocks = [self.matrix(image), self.matrix(kernel), self.matrix(np.zeros((1, 1)))]
            yield (f"512 by 512, {size} by {size}",
                   lambda: self.module.Convolve_2DH(*blocks, 1, 0),
                   lambda: scipy.ndimage.convolve(image, kernel, mode="constant"))


def main():
    bench = Bench()
    bench.compare("direct convolution", "numpy.convolve", bench.convolution(
        0, [(100, 5), (1000, 16), (1000, 64), (20000, 100), (20000, 1000), (5000, 5000)],
        np.convolve))
    bench.compare("convolution by transforms", "scipy.signal.fftconvolve", bench.convolution(
        1, [(n, n) for n in (1000, 3000, 10000, 30000, 100000, 300000, 1000000, 3000000, 10000000)],
        scipy.signal.fftconvolve))
    bench.compare("FIR filter", "scipy.signal.lfilter", bench.fir())
    bench.compare("cascade", "scipy.signal.sosfilt", bench.cascade())
    bench.compare("median filter, 1e6 samples", "scipy.ndimage.median_filter",
                  bench.medians(lambda x, size: scipy.ndimage.median_filter(
                      x, size, mode="constant")))
    bench.compare("median filter, 1e6 samples", "scipy.signal.medfilt",
                  bench.medians(scipy.signal.medfilt))
    bench.compare("Savitzky-Golay filter", "scipy.signal.savgol_filter", bench.least_squares())
    bench.compare("direct convolution of matrices", "scipy.ndimage.convolve", bench.images())


if __name__ == "__main__":
    main()
