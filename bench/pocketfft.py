"""One-dimensional transforms against SciPy's pocketfft, in one process.

Ours is the export itself, called through ctypes with existing arrays and plan; theirs is
scipy.fft with one worker, which allocates its output. Both include the cost of a call from Python, about a
microsecond for ours and several for theirs, so short lengths say little. For real data, ours returns
the whole spectrum and theirs half of it.
"""

import ctypes
import os
import sys
import time
from pathlib import Path

import numpy as np

try:
    import scipy.fft
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

from summary import print_summary

LENGTHS = [1024, 4096, 16384, 65536, 262144, 1048576, 1000, 10000, 100000, 1000000,
           1155, 5040, 30030, 83160, 1009, 2003, 10007]
DBL, CDB = 10, 13


def load():
    folder = Path(os.environ.get("QX_LIBRARY_DIR", "build/release")).resolve()
    host = ctypes.CDLL(str(folder / "libqxrt.so"), mode=ctypes.RTLD_GLOBAL)
    module = ctypes.CDLL(str(folder / "libqxanalysis.so"))
    host.QXHostNew1D.restype = ctypes.c_void_p
    return host, module


def block_of(host, code, values):
    """A host array with the values, which directly follow its size."""
    handle = ctypes.c_void_p(host.QXHostNew1D(code, len(values)))
    block = ctypes.cast(handle, ctypes.POINTER(ctypes.c_void_p))[0]
    ctypes.memmove(block + 4, values.ctypes.data, values.nbytes)
    return handle


def seconds(function, repeats):
    start = time.perf_counter()
    for _ in range(repeats):
        function()
    return (time.perf_counter() - start) / repeats


def ratio(ours, theirs, n):
    repeats = max(2, 400_000 // n)
    rounds = [(seconds(ours, repeats), seconds(theirs, repeats)) for _ in range(9)]
    return [sorted(column)[4] for column in zip(*rounds)]


def main():
    host, module = load()
    ratios = {"complex": [], "real": []}
    for n in LENGTHS:
        noise = np.random.default_rng(n)
        z = noise.normal(size=n) + 1j * noise.normal(size=n)
        x = noise.normal(size=n)
        cases = [("complex", module.CxOXFFTH, CDB, z, lambda: scipy.fft.fft(z, workers=1)),
                 ("real", module.ReOXFFTH, DBL, x, lambda: scipy.fft.rfft(x, workers=1))]
        line = f"{n:>8}"
        for kind, export, code, values, theirs in cases:
            source = block_of(host, code, values)
            result = block_of(host, CDB, np.zeros(1, complex))
            slot = ctypes.c_void_p()
            call = lambda: export(source, result, ctypes.byref(slot))  # noqa: E731
            if call() != 0:
                sys.exit(f"{kind} transform of {n} values failed")
            mine, other = ratio(call, theirs, n)
            ratios[kind].append((mine / other, str(n)))
            line += f"   {kind} {1e6 * mine:10.1f} us {mine / other:5.2f}"
        print(line)
    for kind, values in ratios.items():
        print_summary(f"{kind} transform, called from Python", "SciPy", values)


if __name__ == "__main__":
    main()
