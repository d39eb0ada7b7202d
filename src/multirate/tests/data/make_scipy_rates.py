#!/usr/bin/python3
"""Writes scipy_rates.dat: streams at rational rates by scipy.signal.

Each case is a line: "upfirdn" or "resample_poly", up, down, the numbers of samples, taps and
outputs, then these three arrays in hexadecimal. upfirdn computes unscaled sums; resample_poly is centred
on the taps and scaled by up.
"""

from pathlib import Path

import numpy as np
import scipy.signal

CASES = [("upfirdn", 1, 1, 7), ("upfirdn", 4, 1, 11), ("upfirdn", 1, 3, 8), ("upfirdn", 3, 2, 12),
         ("upfirdn", 5, 7, 30), ("upfirdn", 7, 5, 3), ("resample_poly", 2, 1, 9),
         ("resample_poly", 3, 5, 31), ("resample_poly", 8, 7, 65), ("resample_poly", 7, 8, 65)]


def main():
    random = np.random.default_rng(2026)
    lines = []
    for name, up, down, taps in CASES:
        x = random.normal(size=40)
        h = random.normal(size=taps)
        if name == "upfirdn":
            y = scipy.signal.upfirdn(h, x, up, down)
        else:
            h = h + h[::-1]
            y = scipy.signal.resample_poly(x, up, down, window=h)
        values = [value.hex() for part in (x, h, y) for value in part.tolist()]
        lines.append(" ".join([name, *map(str, (up, down, x.size, h.size, y.size)), *values]))
    (Path(__file__).parent / "scipy_rates.dat").write_text("\n".join(lines) + "\n")


if __name__ == "__main__":
    main()
