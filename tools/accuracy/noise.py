#!/usr/bin/python3
"""Compares the elders' noise, the revisions of 2026 and NumPy's Philox generator with the exact distributions, and
prints the tables of docs/accuracy/noise.md.

usage: QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/noise.py
"""

import numpy as np
from scipy import stats

import qx

N = 1_000_000
STATE = {"s1": 1, "s2": 2, "s3": 3}


def row(*cells):
    print("| " + " | ".join(cells) + " |", flush=True)


def of_law(x, law):
    """The p value of the Kolmogorov-Smirnov test, or of the chi-square test for integers with few values."""
    if law.std() > 1e4 or not hasattr(law, "pmf"):
        if law.std() > 1e4:
            return stats.kstest((x - law.mean()) / law.std(), "norm").pvalue
        return stats.kstest(x, law.cdf).pvalue
    low, high = law.ppf(1e-4), law.ppf(1 - 1e-4)
    edges = np.unique(np.floor(np.linspace(low, high, 80)))
    expected = np.diff(np.r_[0, law.cdf(edges), 1]) * len(x)
    found = np.histogram(x, np.r_[-np.inf, edges + 0.5, np.inf])[0]
    used = expected > 20
    return stats.chisquare(found[used], expected[used] * found[used].sum() / expected[used].sum()).pvalue


def distributions():
    random = np.random.Generator(np.random.Philox(1))
    row("distribution", "elder", "revision", "NumPy")
    row("---", "---", "---", "---")

    def compare(name, law, elder, newest, numpy):
        cells = []
        for make in (elder, newest, numpy):
            if make is None:
                cells.append("-")
                continue
            x = np.asarray(make(), float)
            cells.append(f"{of_law(x, law):.2g} ({x.std() / law.std() - 1:+.1e})")
        row(name, *cells)
    compare("uniform", stats.uniform(-1, 2), lambda: qx.white(N, 1.0, 7, STATE)[0],
            lambda: qx.White2026(N, 1.0, 7, 0, 0.0), lambda: 2 * random.random(N) - 1)
    compare("Gauss", stats.norm(), lambda: qx.Gauss(N, 1.0, 7, STATE, {})[0], lambda: qx.Gauss2026(N, 1.0, 7, 0, 0.0),
            lambda: random.standard_normal(N))
    for shape in (0.3, 3, 30):
        compare(f"gamma, shape {shape}", stats.gamma(shape),
                (lambda shape=shape: qx.GammaNoiseH(N, shape, 7, STATE)[0]) if shape >= 1 else None,
                lambda shape=shape: qx.Gamma2026(N, float(shape), 7, 0, 0.0),
                lambda shape=shape: random.standard_gamma(shape, N))
    for mean in (3.0, 100.0, 1e12, 1e14, 1e15):
        compare(f"Poisson, mean {mean:g}", stats.poisson(mean),
                lambda mean=mean: qx.PoissonNoiseH(N, mean, 7, STATE)[0],
                lambda mean=mean: qx.Poisson2026(N, mean, 7, 0, 0.0), lambda mean=mean: random.poisson(mean, N))
    for trials, p in ((20, 0.3), (1000, 0.4), (2_000_000_000, 0.3), (4_000_000_000_000_000, 0.25)):
        compare(f"binomial, {trials:g} trials of {p}", stats.binom(trials, p),
                (lambda trials=trials, p=p: qx.BinomialNoiseH(N, trials, p, 7, STATE, {})[0])
                if trials < 2**31 else None,
                lambda trials=trials, p=p: qx.Binomial2026(N, float(trials), p, 7, 0, 0.0),
                lambda trials=trials, p=p: random.binomial(trials, p, N))


def streams():
    print()
    row("correlation of two sequences of 30000", "elder", "revision")
    row("---", "---", "---")
    n = 30000
    for first, second in ((7, 14), (1000003, 2000006)):
        elder = np.corrcoef(qx.white(n, 1.0, first, STATE)[0], qx.white(n, 1.0, second, STATE)[0])[0, 1]
        newest = np.corrcoef(qx.White2026(n, 1.0, first, 0, 0.0), qx.White2026(n, 1.0, second, 0, 0.0))[0, 1]
        row(f"seeds {first} and {second}", f"{elder:+.3f}", f"{newest:+.3f}")


if __name__ == "__main__":
    distributions()
    streams()
