#!/usr/bin/python3
"""Times of the complex Bessel and Airy functions over arrays from Python, as ratios to SciPy's in the
same run (scaled values, 5000 random points of each region of the plane).

usage: PYTHONPATH=python bench/special_complex.py
"""

import time
import warnings

import numpy as np
from scipy import special

import qx

COUNT = 5000
BESSEL = (("J", special.jve), ("Y", special.yve), ("I", special.ive), ("K", special.kve),
          ("H1", special.hankel1e), ("H2", special.hankel2e))
AIRY = ("QX_CxAiryAi", "QX_CxAiryAiP", "QX_CxAiryBi", "QX_CxAiryBiP")
REGIONS = ((0, 0, 0.01, 1), (0, 3, 0.1, 3), (0, 5, 2, 20), (0, 5, 25, 100), (5, 40, 10, 60),
           (90, 300, 100, 600), (100, 500, 500, 1000))


def best(work):
    times = []
    for _ in range(9):
        start = time.perf_counter()
        work()
        times.append(time.perf_counter() - start)
    return min(times) / COUNT * 1e9


def main():
    warnings.simplefilter("ignore")
    r = np.random.default_rng(1)
    for low, high, near, far in REGIONS:
        order = r.uniform(low, high, COUNT)
        z = r.uniform(near, far, COUNT) * np.exp(1j * r.uniform(-np.pi, np.pi, COUNT))
        row = []
        for name, peer in BESSEL:
            ours = best(lambda: qx.call(f"QX_CxBessel{name}r", order, z, 1))
            row.append(f"{name} {ours:.0f} ns {ours / best(lambda: peer(order, z)):.2f}")
        print(f"order {low} to {high}, |z| {near} to {far}: " + ", ".join(row), flush=True)
    for near, far in ((0.1, 1.5), (1.5, 9), (10, 100)):
        z = r.uniform(near, far, COUNT) * np.exp(1j * r.uniform(-np.pi, np.pi, COUNT))
        ours = [best(lambda: qx.call(name, z, 1)) for name in AIRY]
        peer = best(lambda: special.airye(z))  # all four at once
        print(f"Airy, |z| {near} to {far}: all four {sum(ours):.0f} ns, {sum(ours) / peer:.2f}")


main()
