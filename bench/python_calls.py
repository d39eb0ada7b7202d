"""The cost of a call from Python, in one process.

Ours are functions of the package on a few values, where the overhead of the call is nearly all of
the time; theirs are the corresponding functions of NumPy. Each line has our time and the ratio
ours/theirs; below 1 is faster.
"""

import math
import sys
import time
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402


def seconds(function, repeats=200, rounds=300):
    """The minimum of many short rounds: other work on the machine only adds to the times."""
    best = math.inf
    for _ in range(rounds):
        start = time.perf_counter()
        for _ in range(repeats):
            function()
        best = min(best, (time.perf_counter() - start) / repeats)
    return best


def main():
    x, z = np.arange(10.0), np.arange(10) + 1j
    few = x.tolist()
    m = np.arange(9.0).reshape(3, 3) + np.eye(3)
    rows = [("Mean_head, 10 values", lambda: qx.Mean_head(x), lambda: np.mean(x)),
            ("Mean_head, a list", lambda: qx.Mean_head(few), lambda: np.mean(few)),
            ("Moment_head", lambda: qx.Moment_head(x, 2), lambda: np.var(x)),
            ("Mean_head by qx.call", lambda: qx.call("Mean_head", x), lambda: np.mean(x)),
            ("ReOXFFTH80, plan kept", lambda: qx.ReOXFFTH80(x, 0, 10, 0), lambda: np.fft.fft(x)),
            ("CxOXFFTH80_IDP, plan kept", lambda: qx.CxOXFFTH80_IDP(z, 0, 10, 0),
             lambda: np.fft.fft(z)),
            ("histgran_head, 5 bins", lambda: qx.histgran_head(x, 5), lambda: np.histogram(x, 5)),
            ("Determinant_head, 3 by 3", lambda: qx.Determinant_head(m, 0), lambda: np.linalg.det(m))]
    ratios = []
    for name, ours, theirs in rows:
        mine, other = seconds(ours), seconds(theirs)
        ratios.append((mine / other, name))
        print(f"{name:28} {1e6 * mine:8.2f} us   {mine / other:5.2f}")
    print_summary("calls from Python", "NumPy", ratios)


if __name__ == "__main__":
    main()
