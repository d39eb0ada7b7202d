"""Analysis of variance with one factor and contingency tables, the revisions of 2026 against SciPy and against their
elders, in one process.

Ours is the export, called through the binding. The analysis of variance returns the whole table and the critical value
and sorts the observations by their labels; SciPy's f_oneway takes sorted groups and returns f and p.
"""

import sys
from pathlib import Path

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from generators import best  # noqa: E402
from summary import print_summary  # noqa: E402

try:
    from scipy import stats
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

ALPHA = 0.05


def variance_cases():
    """The name, repeats, ours, SciPy's and the elder."""
    for n in (20, 1000, 100_000, 1_000_000):
        for levels in (2, 8):
            y = 10.0 + np.random.default_rng(n).normal(size=n)
            labels = (np.arange(n) % levels).astype(np.int32)
            groups = [y[labels == level] for level in range(levels)]
            yield (f"n {n}, {levels} levels", max(1, 10_000 // n),
                   lambda: qx.Anova1Way_head_2026(y, labels, levels, ALPHA), lambda: stats.f_oneway(*groups),
                   lambda: qx.Anova1Way_head_2017(y, labels, levels, ALPHA))


def table_cases():
    for shape in ((2, 2), (3, 5), (20, 20), (200, 200)):
        table = np.random.default_rng(sum(shape)).integers(5, 100, shape, np.int32)
        yield (f"{shape[0]} by {shape[1]}", max(1, 2000 // table.size), lambda: qx.Contingency2026_head(table),
               lambda: stats.chi2_contingency(table, correction=False), lambda: qx.Contingency_head(table))


def main():
    for what, peer, cases in (("analysis of variance, one factor", "SciPy f_oneway", variance_cases),
                              ("contingency tables", "SciPy chi2_contingency", table_cases)):
        ratios = {peer: [], "elder": []}
        for name, repeats, ours, theirs, elder in cases():
            for which, other in ((peer, theirs), ("elder", elder)):
                mine, their = best(ours, other, repeats)
                ratios[which].append((mine / their, name))
                print(f"{what}, {name:20} {1e6 * mine:10.1f} us  over {which:22} {mine / their:6.2f}", flush=True)
        for which, found in ratios.items():
            print_summary(f"{what}, revision, called from Python", which, found)


if __name__ == "__main__":
    main()
