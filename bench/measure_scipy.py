"""Peaks against scipy.signal.find_peaks, in one process.

Ours is PeakD with windows of three samples, called through ctypes with existing arrays; it returns
positions between the samples, amplitudes and curvatures. SciPy's returns sample indices; in the second column
it is followed by the same parabola through three samples, in NumPy. The recording is repeated to
the required length.
"""

import ctypes
import sys
from pathlib import Path

import numpy as np

from pocketfft import DBL, block_of, load, ratio
from summary import print_summary

try:
    import scipy.signal
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

N = 1_000_000
RECORDING = Path(__file__).resolve().parent.parent / "examples/data/ecg_208_360hz.csv"


class Request(ctypes.Structure):
    _fields_ = [("data", ctypes.c_void_p), ("threshold", ctypes.c_double), ("width", ctypes.c_int32),
                ("polarity", ctypes.c_int32), ("locations", ctypes.c_void_p),
                ("amplitudes", ctypes.c_void_p), ("derivatives", ctypes.c_void_p),
                ("count", ctypes.c_int32), ("flags", ctypes.c_uint32)]


def refined(x, height):
    """The peaks of find_peaks in the form of PeakD's."""
    at = scipy.signal.find_peaks(x, height=height)[0]
    before, here, behind = x[at - 1], x[at], x[at + 1]
    curvature = before - 2 * here + behind
    with np.errstate(invalid="ignore"):  # the middle of a level stretch
        t = 0.5 * (before - behind) / curvature
    return at + t, here + 0.25 * (behind - before) * t, curvature


def main():
    host, module = load()
    recording = np.loadtxt(RECORDING, skiprows=2)
    signals = {"noise": np.random.default_rng(1).normal(size=N),
               "sine of period 628": np.sin(0.01 * np.arange(N)),
               "sine of period 31": np.sin(0.2 * np.arange(N)),
               "recording": np.resize(recording, N)}
    outputs = [block_of(host, DBL, np.zeros(1)) for _ in range(3)]
    buffer = ctypes.c_void_p(block_of(host, DBL, np.zeros(1)).value)
    state, error = (ctypes.c_byte * 256)(), ctypes.c_int32()
    ratios = {"peaks": [], "peaks above a height": [], "peaks with their parabolas": []}
    for name, x in signals.items():
        data = block_of(host, DBL, x)
        for height in (None, 0.5):
            request = Request(data, -1e300 if height is None else height, 3, 0, *outputs, 0, 5)
            call = lambda: module.PeakD(ctypes.byref(request), state, ctypes.byref(buffer),  # noqa: E731
                                        ctypes.byref(error))
            if call() != 0:
                sys.exit(f"{name} failed")
            mine, other = ratio(call, lambda: scipy.signal.find_peaks(x, height=height), N)
            again, whole = ratio(call, lambda: refined(x, height), N)
            case = name + (", all" if height is None else ", above 0.5")
            print(f"{case:<30} {request.count:7d} peaks {1e3 * mine:8.3f} ms  find_peaks "
                  f"{mine / other:5.2f}  with parabolas {again / whole:5.2f}")
            ratios["peaks" if height is None else "peaks above a height"].append((mine / other, name))
            ratios["peaks with their parabolas"].append((again / whole, case))
    for what, values in ratios.items():
        print_summary(f"{what}, called from Python", "SciPy", values)


if __name__ == "__main__":
    main()
