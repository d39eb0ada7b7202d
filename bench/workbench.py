"""Windows through the Python package against SciPy, in one process.

Ours is qx.call, including the copy into the host's block; theirs generates the window and
multiplies, the code that one would write without this library. Each line has our time and the
ratio ours/theirs; below 1 is faster.
"""

import math
import sys
import time
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402

try:
    from scipy.signal import windows
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

NAN = math.nan
CASES = [("Hanning", 1, NAN, windows.hann, ()), ("Hamming", 2, NAN, windows.hamming, ()),
         ("Blackman", 5, NAN, windows.blackman, ()), ("flat top", 6, NAN, windows.flattop, ()),
         ("Blackman-Harris, 4 terms", 7, NAN, windows.blackmanharris, ()),
         ("Kaiser, 8", 60, 8.0, windows.kaiser, (8.0,))]


def seconds(function, repeats, rounds):
    """The minimum of several rounds: other work on the machine only adds to the times."""
    best = math.inf
    for _ in range(rounds):
        start = time.perf_counter()
        for _ in range(repeats):
            function()
        best = min(best, (time.perf_counter() - start) / repeats)
    return best


def main():
    ratios = []
    for n in (10**3, 10**4, 10**5, 10**6, 10**7):
        x = np.random.default_rng(n).normal(size=n)
        repeats, rounds = max(1, 100_000 // n), 7 if n < 10**7 else 3
        for name, selector, parameter, window, arguments in CASES:
            ours = seconds(lambda: qx.call("AllWinH", x, selector, parameter, 0, 0), repeats, rounds)
            theirs = seconds(lambda: x * window(n, *arguments, False), repeats, rounds)
            ratios.append((ours / theirs, f"{name}, n {n}"))
            print(f"{name:26} n {n:>8}  {1e6 * ours:11.1f} us   {ours / theirs:5.2f}")
    print_summary("windows from Python", "SciPy", ratios)


if __name__ == "__main__":
    main()
