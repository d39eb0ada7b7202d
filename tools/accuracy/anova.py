#!/usr/bin/python3
"""Writes docs/accuracy/anova.md: the errors of the analysis of variance and of contingency tables,
against exact fractions and probabilities with 40 digits, next to R's and SciPy's.

    QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/anova.py

The references are those of src/stats/tests/make_factorial_anova_data.py, which has the published data
with their sources. Needs the Debian packages python3-mpmath, python3-scipy and r-base-core.
"""

import subprocess
import sys
from fractions import Fraction
from pathlib import Path

import mpmath
import numpy as np
from scipy import stats

import qx
from pages import table

ROOT = Path(__file__).resolve().parents[2]
PAGE = ROOT / "docs/accuracy/anova.md"
sys.path.insert(0, str(ROOT / "src/stats/tests"))
import make_factorial_anova_data as reference  # noqa: E402

EPS = Fraction(1, 2**52)
OFFSETS = ("0", "1e3", "1e6", "1e9", "1e12")
SIGNIFICANCES = (0.5, 0.1, 0.05, 0.01, 1e-3, 1e-6, 1e-12)
DATA = [("batteries, 3 by 3, 4 each", reference.cells_of(reference.BATTERIES, 2)),
        ("breaks, 2 by 3, 9 each", reference.cells_of(reference.BREAKS, 2)),
        ("impurity, 3 by 5, 1 each", reference.cells_of(reference.IMPURITY, 2)),
        ("gauge, 20 by 3, 2 each", reference.cells_of(reference.GAUGE, 2)),
        ("bottles, 3 by 2 by 2, 2 each", reference.cells_of(reference.BOTTLES, 3))]
R_VERSION = subprocess.run(["Rscript", "-e", "cat(R.version$major, R.version$minor, sep='.')"],
                           capture_output=True, text=True, check=True).stdout


def moved(cells, offset):
    """The data in eighths, with the offset added: exact in doubles."""
    return {cell: [int(float(offset)) + y / 8 for y in values] for cell, values in cells.items()}


def columns(cells):
    """The observations and the label of each in each factor."""
    y = [float(value) for values in cells.values() for value in values]
    labels = [[cell[i] for cell, values in cells.items() for _ in values]
              for i in range(len(next(iter(cells))))]
    return y, labels


def ours(cells, random_factors=(), significance=0.05):
    """The columns of the table: sums of squares, degrees, mean squares, f, p, degrees of the
    denominators, critical values."""
    y, labels = columns(cells)
    signed = [-(max(l) + 1) if i in random_factors else max(l) + 1 for i, l in enumerate(labels)]
    name = "Anova2Way_head_2017" if len(labels) == 2 else "ANOVA3Way_head_2017"
    return qx.call(name, y, *(np.array(one, np.int32) for one in labels), *signed,
                   len(next(iter(cells.values()))), significance)


def of_r(cells):
    """Sums of squares, f and p of the sources in R's analysis of a linear model with fixed factors."""
    y, labels = columns(cells)
    names = "ABC"[:len(labels)]
    frame = ", ".join([f"y = c({','.join(map(repr, y))})"]
                      + [f"{name} = factor(c({','.join(map(str, l))}))" for name, l in zip(names, labels)])
    terms = "*".join(names) if len(next(iter(cells.values()))) > 1 else "+".join(names)
    script = (f"d <- data.frame({frame}); t <- anova(lm(y ~ {terms}, d)); "
              "cat(sprintf('%s %a %a %a\\n', gsub(':', '', rownames(t)), t[[2]], t[[4]], t[[5]]), sep='')")
    done = subprocess.run(["Rscript", "-e", script], capture_output=True, text=True, check=True)
    rows = (line.split() for line in done.stdout.splitlines())
    return {name if name != "Residuals" else "error":
            tuple(float("nan") if value == "NA" else float.fromhex(value) for value in values)
            for name, *values in rows}


def error(value, exact):
    """The relative error in units of eps; 0 if either number is NaN."""
    exact = float("nan") if exact != exact else exact
    if exact != exact or value != value:
        return 0.0
    if not np.isfinite(value):
        return np.inf
    exact = Fraction(exact) if not isinstance(exact, reference.mpf) else Fraction(str(exact))
    return float(abs(Fraction(value) - exact) / (abs(exact) * EPS)) if exact else (np.inf if value else 0.0)


def errors(found, exact):
    """The largest errors of the sums of squares, f and p over the sources; found: {source: numbers}."""
    largest = [0.0] * 3
    for source, numbers in found.items():
        for i, at in enumerate((0, 3, 4)):
            largest[i] = max(largest[i], error(numbers[i], exact[source][at]))
    return largest


def sources_of(table, factors):
    names = ["".join("ABC"[i] for i in s) for s in reference.subsets_of(factors)] + ["error"]
    return {name: (table[0][i], table[3][i], table[4][i]) for i, name in enumerate(names)}


def text(value):
    return "0" if value == 0 else f"{value:.2g}" if value < 1e4 else f"{value:.0e}"


def offset_rows():
    for name, cells in DATA:
        for offset in OFFSETS:
            data = moved(cells, offset)
            factors = len(next(iter(cells)))
            exact = reference.analysed(data, set(), 0.05)
            cols = [*errors(sources_of(ours(data), factors), exact), *errors(of_r(data), exact)]
            yield f"| {name} | {offset} | " + " | ".join(map(text, cols)) + " |"


def random_rows():
    """All choices of random factors for the designs with more than one observation per cell."""
    for name, cells in DATA:
        factors = len(next(iter(cells)))
        if len(next(iter(cells.values()))) == 1:
            continue
        largest, refused = [0.0] * 4, 0
        choices = reference.subsets_of(factors)
        for chosen in choices:
            exact = reference.analysed(cells, set(chosen), 0.05)
            try:
                table = ours(cells, chosen)
            except qx.QxError as failure:
                assert failure.name == "ErrAnovaDesign" and exact is None, (name, chosen)
                refused += 1
                continue
            cols = errors(sources_of(table, factors), exact)
            names = ["".join("ABC"[i] for i in s) for s in reference.subsets_of(factors)]
            cols.append(max(error(table[6][i], exact[n][6]) for i, n in enumerate(names)))
            largest = [max(pair) for pair in zip(largest, cols)]
        yield f"| {name} | {len(choices)} | {refused} | " + " | ".join(map(text, largest)) + " |"


def critical_rows():
    """Critical values for fixed factors, whose degrees of freedom are integers, next to R's and SciPy's."""
    for significance in SIGNIFICANCES:
        largest = [0.0] * 3
        for _, cells in DATA:
            factors = len(next(iter(cells)))
            exact = reference.analysed(cells, set(), significance)
            table = ours(cells, (), significance)
            for i, subset in enumerate(reference.subsets_of(factors)):
                value = exact["".join("ABC"[k] for k in subset)]
                if value[6] != value[6]:
                    continue
                degrees = (float(value[1]), float(value[5]))
                done = subprocess.run(
                    ["Rscript", "-e", f"cat(sprintf('%a', qf({significance!r}, {degrees[0]}, {degrees[1]}, "
                     "lower.tail = FALSE)))"], capture_output=True, text=True, check=True)
                found = (table[6][i], float.fromhex(done.stdout), stats.f.isf(significance, *degrees))
                largest = [max(a, error(float(b), value[6])) for a, b in zip(largest, found)]
        yield f"| {significance:g} | " + " | ".join(map(text, largest)) + " |"


def nist_sets():
    """NIST's sets for one factor: name and samples, as the doubles nearest to the published decimals."""
    lines = [line for line in (ROOT / "src/stats/tests/data/nist_anova.dat").read_text().splitlines()
             if line and line[0] != "#"]
    while lines:
        name, n, _ = lines[0].split()[:3]
        levels = {}
        for label, value in (line.split() for line in lines[1:1 + int(n)]):
            levels.setdefault(label, []).append(float(value))
        yield name, list(levels.values())
        lines = lines[1 + int(n):]


def one_way_rows():
    """f against exact fractions of the same doubles."""
    for name, samples in nist_sets():
        exact = [[Fraction(value) for value in sample] for sample in samples]
        n, k = sum(map(len, exact)), len(exact)
        mean = sum(map(sum, exact)) / n
        means = [sum(sample) / len(sample) for sample in exact]
        between = sum(len(sample) * (m - mean)**2 for sample, m in zip(exact, means))
        within = sum((value - m)**2 for sample, m in zip(exact, means) for value in sample)
        f = between / (k - 1) / (within / (n - k))
        y = np.concatenate(samples)
        labels = np.repeat(np.arange(k), list(map(len, samples))).astype(np.int32)
        found = [qx.call(name_, y, labels, k, 0.05)[2] for name_ in ("Anova1Way_head_2017", "Anova1Way_head_2026")]
        found.append(stats.f_oneway(*samples).statistic)
        yield f"| {name} | " + " | ".join(text(float(abs(Fraction(float(v)) / f - 1) / EPS)) for v in found) + " |"


CONTINGENCY = {
    "2 by 2, nearly independent": [[1001, 999], [998, 1003]],
    "hair and eyes, 4 by 4": [[68, 119, 26, 7], [20, 84, 17, 94], [15, 54, 14, 10], [5, 29, 14, 16]],  # Snee, 1974
    "3 by 2, dependent": [[400, 20], [30, 350], [200, 210]],
    "2 by 2, nearly diagonal": [[200, 1], [3, 190]],
    "2 by 2, large counts": [[2000000000, 1999900000], [1999800000, 2000000000]],
}


def contingency_rows():
    mpmath.mp.dps = 60
    for name, counts in CONTINGENCY.items():
        rows, cols = [sum(row) for row in counts], [sum(col) for col in zip(*counts)]
        total = sum(rows)
        exact = sum((o - Fraction(r * c, total))**2 / Fraction(r * c, total)
                    for row, r in zip(counts, rows) for o, c in zip(row, cols))
        dof = (len(rows) - 1) * (len(cols) - 1)
        half = mpmath.mpf(exact.numerator) / exact.denominator / 2
        p = mpmath.gammainc(mpmath.mpf(dof) / 2, half, mpmath.inf, regularized=True)
        found = [qx.call(export, np.array(counts, np.int32)) for export in ("Contingency_head", "Contingency2026_head")]
        found.append(stats.chi2_contingency(np.array(counts, float), correction=False)[:2])
        cells = []
        for chi_square, probability in found:
            cells.append(text(float(abs(Fraction(float(chi_square)) / exact - 1) / EPS)))
            cells.append(text(float(abs(mpmath.mpf(float(probability)) / p - 1) / 2.0**-52)))
        yield f"| {name} | {mpmath.nstr(p, 3)} | " + " | ".join(cells) + " |"


if __name__ == "__main__":
    PAGE.write_text(f"""# Accuracy of the analysis of variance

`Anova2Way_head_2017` and `ANOVA3Way_head_2017` (their shorter forms give the same numbers), on
published data. The tables show the largest relative errors over the sources of an analysis, in units of 2.2e-16,
against exact fractions; those of p and of critical values are against 40 digits. 0 means that every bit is
correct, and up to 0.5 that the result is the nearest double. Written by `tools/accuracy/anova.py`.

**Data away from 0.** The data are in eighths, with a constant added, which does not change the sums of squares;
all factors are fixed. R {R_VERSION}: `anova(lm(...))`.

{table(["Data", "Constant", "squares", "f", "p", "R: squares", "f", "p"], offset_rows())}

**Random factors.** All choices of random factors. Analyses without a positive denominator are refused; in exact
arithmetic, they have no positive denominator either.

{table(["Data", "Choices", "Refused", "squares", "f", "p", "critical"], random_rows())}

**One factor.** Errors of f for NIST's sets, whose means are up to 1e13 standard deviations from 0, against exact
fractions of the same doubles.

{table(["Set", "Anova1Way_head_2017", "Anova1Way_head_2026", "SciPy f_oneway"], one_way_rows())}

**Critical values.** Largest errors by significance, over all sources of the data above with fixed factors.

{table(["Significance", "ours", "R qf", "SciPy f.isf"], critical_rows())}

**Contingency tables.** The statistic is compared with exact fractions, p with 60 digits. The revision
computes p from the rounded statistic; where p is small, the rounding error of half an ulp is multiplied by half
the statistic.

{table(["Table", "p", "Contingency_head: statistic", "p", "Contingency2026_head: statistic", "p",
        "SciPy: statistic", "p"], contingency_rows())}
""")
