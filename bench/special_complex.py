#!/usr/bin/python3
"""Times of the complex Bessel and Airy functions for arrays from Python, compared with SciPy's: scaled values
at 5000 random points of each region of the plane, in processor time of the calling thread, minima of
interleaved rounds. SciPy's four Airy functions come from one call, which is compared with all four of
ours.
"""

import sys
import time
import warnings
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402

try:
    from scipy import special
except ImportError:
    sys.exit(print("missing peer: python3-scipy"))

COUNT = 5000
BESSEL = (("J", special.jve), ("Y", special.yve), ("I", special.ive), ("K", special.kve),
          ("H1", special.hankel1e), ("H2", special.hankel2e))
AIRY = ("QX_CxAiryAi", "QX_CxAiryAiP", "QX_CxAiryBi", "QX_CxAiryBiP")
REGIONS = ((0, 0, 0.01, 1), (0, 3, 0.1, 3), (0, 5, 2, 20), (0, 5, 25, 100), (5, 40, 10, 60),
           (90, 300, 100, 600), (100, 500, 500, 1000))  # range of orders, range of moduli
TURNING = ((10, 22), (22, 60), (60, 200), (200, 1000))  # range of orders
AIRY_REGIONS = ((0.1, 1.5), (1.5, 9), (10, 100))


def seconds(function):
    start = time.thread_time()
    function()
    return time.thread_time() - start


def best(ours, theirs, rounds=15):
    times = [(seconds(ours), seconds(theirs)) for _ in range(rounds)]
    return [min(column) / COUNT for column in zip(*times)]


def shown(case, ours, theirs):
    print(f"{case:44} {1e9 * ours:8.0f} ns a point   {ours / theirs:5.2f}", flush=True)
    return ours / theirs, case


def on_rays(random, modulus):
    return modulus * np.exp(1j * random.uniform(-np.pi, np.pi, COUNT))


def turning_points(random, order):
    """z within 4 |order|^(1/3) of the order, next to the real axis."""
    side = random.choice([0, np.pi], COUNT) + random.normal(0, 0.05, COUNT)
    return abs(order + random.uniform(-4, 4, COUNT) * np.cbrt(order)) * np.exp(1j * side)


def bessel_cases(random):
    """The name of a case, its orders and its arguments; I and K have separate arguments."""
    for low, high, near, far in REGIONS:
        z = on_rays(random, random.uniform(near, far, COUNT))
        yield f"order {low} to {high}, modulus {near} to {far}", random.uniform(low, high, COUNT), z, z
    for low, high in TURNING:
        order = random.uniform(low, high, COUNT)
        z = turning_points(random, order)
        yield f"order {low} to {high}, turning points", order, z, 1j * z


def main():
    warnings.simplefilter("ignore")
    random = np.random.default_rng(1)
    ratios = []
    for where, order, oscillating, modified in bessel_cases(random):
        for name, peer in BESSEL:
            z = modified if name in "IK" else oscillating
            times = best(lambda: qx.call(f"QX_CxBessel{name}r", order, z, 1), lambda: peer(order, z))
            ratios.append(shown(f"{name}, {where}", *times))
    print_summary("complex Bessel functions, called from Python", "SciPy", ratios)
    ratios = []
    for near, far in AIRY_REGIONS:
        z = on_rays(random, random.uniform(near, far, COUNT))
        times = best(lambda: [qx.call(name, z, 1) for name in AIRY], lambda: special.airye(z))
        ratios.append(shown(f"all four Airy functions, modulus {near} to {far}", *times))
    print_summary("complex Airy functions, called from Python", "SciPy", ratios)


if __name__ == "__main__":
    main()
