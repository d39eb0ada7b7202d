"""Noise, waves and small array work against NumPy, and the noise of 2026 also against its elders, in one process.

Ours is the export, called through the binding, which copies its inputs; theirs is the code that a user of NumPy
would write, with a new array for the result.
"""

import sys
import time
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402

STATE = {"s1": 1, "s2": 2, "s3": 3}


def noise_cases(n):
    random = np.random.default_rng(1)
    return [
        ("uniform noise", lambda: qx.call("white", n, 1.0, -1, STATE),
         lambda: random.random(n) * 2.0 - 1.0),
        ("uniform numbers alone", lambda: qx.call("white", n, 1.0, -1, STATE),
         lambda: random.random(n)),
        ("Gaussian noise", lambda: qx.call("Gauss", n, 1.0, -1, STATE, {}),
         lambda: random.standard_normal(n)),
    ]


def counter_cases(n):
    random = np.random.default_rng(1)
    place = (1, 0, 0.0)
    return [
        ("uniform", lambda: qx.White2026(n, 1.0, *place), lambda: random.random(n) * 2.0 - 1.0),
        ("uniform numbers alone", lambda: qx.White2026(n, 1.0, *place), lambda: random.random(n)),
        ("Gauss", lambda: qx.Gauss2026(n, 1.0, *place), lambda: random.standard_normal(n)),
        ("gamma, shape 2.5", lambda: qx.Gamma2026(n, 2.5, *place), lambda: random.standard_gamma(2.5, n)),
        ("gamma, shape 0.3", lambda: qx.Gamma2026(n, 0.3, *place), lambda: random.standard_gamma(0.3, n)),
        ("Poisson, mean 5", lambda: qx.Poisson2026(n, 5.0, *place), lambda: random.poisson(5.0, n)),
        ("Poisson, mean 1e4", lambda: qx.Poisson2026(n, 1e4, *place), lambda: random.poisson(1e4, n)),
        ("binomial, 20 trials", lambda: qx.Binomial2026(n, 20.0, 0.3, *place),
         lambda: random.binomial(20, 0.3, n)),
        ("binomial, 1000 trials", lambda: qx.Binomial2026(n, 1000.0, 0.4, *place),
         lambda: random.binomial(1000, 0.4, n)),
        ("permutation", lambda: qx.RiffleIntNum2026_head(n, *place), lambda: random.permutation(n)),
        *(("shuffled " + name, lambda export=export, x=x: export(x, *place), lambda x=x: shuffled(random, x))
          for name, export, _, x in shuffles(n)),
    ]


def shuffled(random, x):
    """The elements in random order, and the order."""
    order = random.permutation(len(x))
    return x[order], order


def shuffles(n):
    x = np.arange(n)
    return [("doubles", qx.RiffleArrayDBL2026_head, qx.RiffleArrayDBL2012_head, x * 1.0),
            ("complex numbers", qx.RiffleArrayCDB2026_head, qx.RiffleArrayCDB2012_head, x * 1j),
            ("integers", qx.RiffleArrayInt2026_head, qx.RiffleArrayInt2012_head, x.astype(np.int32))]


def elder_cases(n):
    """The elder's gamma noise has whole orders only; its shuffles are those without bias."""
    place, seeded = (1, 0, 0.0), (-1, STATE)
    return [
        ("uniform", lambda: qx.White2026(n, 1.0, *place), lambda: qx.white(n, 1.0, *seeded)),
        ("Gauss", lambda: qx.Gauss2026(n, 1.0, *place), lambda: qx.Gauss(n, 1.0, *seeded, {})),
        ("gamma, shape 3", lambda: qx.Gamma2026(n, 3.0, *place), lambda: qx.GammaNoiseH(n, 3, *seeded)),
        ("gamma, shape 30", lambda: qx.Gamma2026(n, 30.0, *place), lambda: qx.GammaNoiseH(n, 30, *seeded)),
        ("Poisson, mean 5", lambda: qx.Poisson2026(n, 5.0, *place), lambda: qx.PoissonNoiseH(n, 5.0, *seeded)),
        ("Poisson, mean 1e4", lambda: qx.Poisson2026(n, 1e4, *place), lambda: qx.PoissonNoiseH(n, 1e4, *seeded)),
        ("binomial, 20 trials", lambda: qx.Binomial2026(n, 20.0, 0.3, *place),
         lambda: qx.BinomialNoiseH(n, 20, 0.3, *seeded, {})),
        ("binomial, 1000 trials", lambda: qx.Binomial2026(n, 1000.0, 0.4, *place),
         lambda: qx.BinomialNoiseH(n, 1000, 0.4, *seeded, {})),
        ("permutation", lambda: qx.RiffleIntNum2026_head(n, *place), lambda: qx.RiffleIntNum2012_head(n, *seeded, 1)),
        *(("shuffled " + name, lambda export=export, x=x: export(x, *place),
           lambda elder=elder, x=x: elder(x, *seeded, 1)) for name, export, elder, x in shuffles(n)),
    ]


def wave_cases(n):
    i = np.arange(n)
    table = np.sin(np.arange(1000) * 2 * np.pi / 1000)
    return [
        ("sine", lambda: qx.call("SineWaveCIN", n, 1.0, 0.01, 0.0),
         lambda: np.sin(2 * np.pi * 0.01 * i)),
        ("sawtooth", lambda: qx.call("SawtoothWaveCIN", n, 1.0, 0.01, 0.0),
         lambda: 2 * np.mod(0.01 * i + 0.5, 1.0) - 1),
        ("square", lambda: qx.call("SquareWaveCIN", n, 1.0, 0.01, 0.0, 50.0),
         lambda: np.where(np.mod(0.01 * i, 1.0) < 0.5, 1.0, -1.0)),
        ("triangle", lambda: qx.call("TriangleWaveCIN", n, 1.0, 0.01, 0.0),
         lambda: 1 - 4 * np.abs(np.mod(0.01 * i - 0.25, 1.0) - 0.5)),
        ("table", lambda: qx.call("ArbitraryWaveCIN", n, 1.0, 0.01, 0.0, table, 0),
         lambda: table[np.mod(10.0 * i, 1000).astype(np.int64)]),
        ("chirp", lambda: qx.call("ChirpCIN", n, 1.0, 0.01, 0.1),
         lambda: np.sin(i * (0.09 * np.pi / n * i + 0.02 * np.pi))),
    ]


def array_cases(n):
    x = np.random.default_rng(2).normal(size=n)
    phase = np.angle(np.exp(1j * 0.7 * np.arange(n)))
    matrix = x.reshape(-1, 10)

    def standardised():
        return (x - x.mean()) / x.std()

    def scaled():
        low, high = x.min(), x.max()
        return (x - (high + low) / 2) / ((high - low) / 2)

    return [
        ("scale", lambda: qx.call("Scale1DCIN", x), scaled),
        ("quick scale", lambda: qx.call("QScale", matrix), lambda: matrix / np.abs(matrix).max()),
        ("standardise", lambda: qx.call("Norm1", x), standardised),
        ("line", lambda: qx.call("Line1", x, 2.0, 1.0), lambda: 2.0 * x + 1.0),
        ("unwrap", lambda: qx.call("unWrap85", phase, 0), lambda: np.unwrap(phase)),
    ]


def coordinate_cases(n):
    points = np.random.default_rng(3).normal(size=(3, n))
    direction = qx.call("Euler2Direction_head", 0.3, -0.1, 0.2)

    def spherical():
        from_axis = np.hypot(points[0], points[1])
        return (np.hypot(from_axis, points[2]), np.arctan2(points[1], points[0]),
                np.arctan2(from_axis, points[2]))

    def cartesian(radius, azimuth, inclination):
        from_axis = radius * np.sin(inclination)
        return from_axis * np.cos(azimuth), from_axis * np.sin(azimuth), radius * np.cos(inclination)

    angles = spherical()
    return [
        ("rotate", lambda: qx.call("CoordRotationDirection_head", *points, direction),
         lambda: direction @ points),
        ("to spherical", lambda: qx.call("CoordConversion_head", 0, 1, *points), spherical),
        ("to cylindrical", lambda: qx.call("CoordConversion_head", 0, 2, *points),
         lambda: (np.hypot(points[0], points[1]), np.arctan2(points[1], points[0]), points[2].copy())),
        ("from spherical", lambda: qx.call("CoordConversion_head", 1, 0, *angles),
         lambda: cartesian(*angles)),
    ]


GROUPS = [("noise", "NumPy", noise_cases),
          ("noise of 2026", "NumPy", counter_cases), ("noise of 2026", "elder", elder_cases),
          ("waves", "NumPy", wave_cases), ("scaling and unwrapping", "NumPy", array_cases),
          ("coordinates", "NumPy", coordinate_cases)]


def seconds(function, repeats):
    start = time.perf_counter()
    for _ in range(repeats):
        function()
    return (time.perf_counter() - start) / repeats


def best(ours, theirs, repeats, rounds=11):
    """The minima of interleaved rounds: other work on the machine only adds to the times."""
    times = [(seconds(ours, repeats), seconds(theirs, repeats)) for _ in range(rounds)]
    return [min(column) for column in zip(*times)]


def main():
    for title, peer, cases in GROUPS:
        ratios = []
        for n in (10**3, 10**4, 10**5, 10**6):
            for name, ours, theirs in cases(n):
                mine, other = best(ours, theirs, max(1, 100_000 // n))
                ratios.append((mine / other, f"{name}, n {n}"))
                print(f"{name:26} n {n:>8}  {1e9 * mine / n:9.2f} ns a sample   {mine / other:5.2f}")
        print_summary(f"{title}, called from Python", peer, ratios)


if __name__ == "__main__":
    main()
