#!/usr/bin/python3
"""Writes data/factorial_anova.dat: analyses of variance with two and three factors, exact by
fractions, with p and the critical value from 40 digits (mpmath).

The sums of squares are differences of raw sums. The denominator of a source follows from the expected mean squares:
linear equations determine the combination of mean squares that contains each component of variance as often as the
source does, except the component of the source itself. The published figures are listed with the data and compared
with the results."""

import random
from fractions import Fraction
from itertools import chain, combinations, product
from math import prod
from pathlib import Path

from mpmath import betainc, mp, mpf

mp.dps = 40
NAN = float("nan")

# Life of batteries in hours by material and temperature (D. C. Montgomery, Design and analysis of
# experiments, example of a design with two factors).
BATTERIES = [[[130, 155, 74, 180], [34, 40, 80, 75], [20, 70, 82, 58]],
             [[150, 188, 159, 126], [136, 122, 106, 115], [25, 70, 58, 45]],
             [[138, 110, 168, 160], [174, 120, 150, 139], [96, 104, 82, 60]]]
BATTERIES_PUBLISHED = {"A": (10683.72, 7.91), "B": (39118.72, 28.97), "AB": (9613.78, 3.56),
                       "error": (18230.75, None), "total": (77646.97, None)}

# Breaks of yarn by wool and tension (L. H. C. Tippett, Technological applications of statistics, 1950;
# the data set warpbreaks of R, with the table from its example).
BREAKS = [[[26, 30, 54, 25, 70, 52, 51, 26, 67], [18, 21, 29, 17, 12, 18, 35, 30, 36],
           [36, 21, 24, 18, 10, 43, 28, 15, 26]],
          [[27, 14, 29, 19, 29, 31, 41, 20, 44], [42, 26, 19, 16, 39, 28, 21, 39, 29],
           [20, 21, 24, 17, 13, 15, 15, 16, 28]]]
BREAKS_PUBLISHED = {"A": (450.7, 3.765), "B": (2034.3, 8.498), "AB": (1002.8, 4.189),
                    "error": (5745.1, None)}

# Measurements of 20 parts by 3 operators, twice each; both factors random (Montgomery, the same, a
# study of a gauge's capability).
GAUGE = [[[21, 20], [20, 20], [19, 21]], [[24, 23], [24, 24], [23, 24]], [[20, 21], [19, 21], [20, 22]],
         [[27, 27], [28, 26], [27, 28]], [[19, 18], [19, 18], [18, 21]], [[23, 21], [24, 21], [23, 22]],
         [[22, 21], [22, 24], [22, 20]], [[19, 17], [18, 20], [19, 18]], [[24, 23], [25, 23], [24, 24]],
         [[25, 23], [26, 25], [24, 25]], [[21, 20], [20, 20], [21, 20]], [[18, 19], [17, 19], [18, 19]],
         [[23, 25], [25, 25], [25, 25]], [[24, 24], [23, 25], [24, 25]], [[29, 30], [30, 28], [31, 30]],
         [[26, 26], [25, 26], [25, 27]], [[20, 20], [19, 20], [20, 20]], [[19, 21], [19, 19], [21, 23]],
         [[25, 26], [25, 24], [25, 25]], [[19, 19], [18, 17], [19, 17]]]
GAUGE_PUBLISHED = {"A": (1185.425, 87.65), "B": (2.617, 1.84), "AB": (27.050, 0.72),
                   "error": (59.5, None), "total": (1274.592, None)}

# Impurity by temperature and pressure, one observation each (Montgomery, the same).
IMPURITY = [[[5], [4], [6], [3], [5]], [[3], [1], [4], [2], [3]], [[1], [1], [3], [1], [2]]]
IMPURITY_PUBLISHED = {"A": (23.33, 46.67), "B": (11.60, 11.60), "error": (2.00, None)}

# Deviations of the fill height by carbonation, pressure and speed of the line (Montgomery, the same).
BOTTLES = [[[[-3, -1], [-1, 0]], [[-1, 0], [1, 1]]], [[[0, 1], [2, 1]], [[2, 3], [6, 5]]],
           [[[5, 4], [7, 6]], [[7, 9], [10, 11]]]]
BOTTLES_PUBLISHED = {"A": (252.750, 178.412), "B": (45.375, 64.059), "C": (22.042, 31.118),
                     "AB": (5.250, 3.706), "AC": (0.583, 0.412), "BC": (1.042, 1.471),
                     "ABC": (1.083, 0.765), "error": (8.5, None), "total": (336.625, None)}


def cells_of(nested, factors):
    """Converts nested lists to {levels: observations}."""
    if factors == 0:
        return {(): [Fraction(y) for y in nested]}
    return {(i, *rest): values for i, part in enumerate(nested)
            for rest, values in cells_of(part, factors - 1).items()}


def subsets_of(factors):
    return list(chain.from_iterable(combinations(range(factors), size)
                                    for size in range(1, factors + 1)))


def solved(rows, right):
    """Solves the equations by elimination; the system need not be square but must be solvable."""
    rows = [[*map(Fraction, row), Fraction(value)] for row, value in zip(rows, right)]
    unknowns, pivots = len(rows[0]) - 1, []
    for column in range(unknowns):
        pivot = next((row for row in rows[len(pivots):] if row[column] != 0), None)
        if pivot is None:
            continue
        rows.remove(pivot)
        pivot = [value / pivot[column] for value in pivot]
        rows.insert(len(pivots), pivot)
        rows = [row if row is pivot else [a - row[column] * b for a, b in zip(row, pivot)] for row in rows]
        pivots.append(column)
    assert all(row[-1] == 0 for row in rows[len(pivots):]), "there is no such combination"
    result = [Fraction(0)] * unknowns
    for row, column in zip(rows, pivots):
        result[column] = row[-1]
    return result


def expectations(levels, random_factors, observations, subsets):
    """The expected mean square of each source: the coefficient of each component of variance, that of the error last.
    The coefficients of fixed effects other than the source itself are 0."""
    rows = []
    for source in subsets:
        row = [prod(levels[i] for i in range(len(levels)) if i not in part) * observations
               if set(source) <= set(part) and (part == source or set(part) & random_factors) else 0
               for part in subsets]
        rows.append([*row, 1])
    return [*rows, [0] * len(subsets) + [1]]


def upper_tail(f, numerator, denominator):
    d, v = mpf(numerator), mpf(denominator.numerator) / denominator.denominator
    f = mpf(f.numerator) / f.denominator
    return betainc(v / 2, d / 2, 0, v / (v + d * f), regularized=True)


def critical_value(alpha, numerator, denominator):
    d, v = mpf(numerator), mpf(denominator.numerator) / denominator.denominator
    tail = lambda x: mp.log(betainc(v / 2, d / 2, 0, 1 / (1 + mp.exp(x)), regularized=True) / mpf(alpha))
    low, high = mpf(-50), mpf(50)
    assert tail(low) > 0 > tail(high)
    for _ in range(90):
        x = (low + high) / 2
        low, high = (x, high) if tail(x) > 0 else (low, x)
    return mp.exp(x) * v / d


def analysed(cells, random_factors, alpha):
    """{source: (SS, df, MS, f, p, degrees of the denominator, critical value)}."""
    factors = len(next(iter(cells)))
    levels = [1 + max(cell[i] for cell in cells) for i in range(factors)]
    observations = len(next(iter(cells.values())))
    subsets = subsets_of(factors)
    everything = [y for values in cells.values() for y in values]
    n = len(everything)

    def raw(subset):
        sums = {}
        for cell, values in cells.items():
            key = tuple(cell[i] for i in subset)
            sums[key] = sums.get(key, 0) + sum(values)
        return sum(total * total for total in sums.values()) / Fraction(n, len(sums))

    squares, degrees = {(): raw(())}, {}
    for subset in subsets:
        squares[subset] = raw(subset) - sum(squares[part] for part in squares if set(part) < set(subset))
        degrees[subset] = prod(levels[i] - 1 for i in subset)
    total = sum(y * y for y in everything) - squares[()]
    if observations > 1:
        tested = subsets
        error = total - sum(squares[subset] for subset in subsets)
        error_degrees = n - prod(levels)
    else:
        *tested, whole = subsets
        error, error_degrees = squares[whole], degrees[whole]
    means = [squares[subset] / degrees[subset] for subset in tested] + [error / error_degrees]
    all_degrees = [degrees[subset] for subset in tested] + [error_degrees]
    expected = expectations(levels, random_factors, observations, tested)

    name = lambda subset: "".join("ABC"[i] for i in subset)
    table = {name(subset): (NAN, 0, NAN, NAN, NAN, NAN, NAN) for subset in subsets}
    for at, source in enumerate(tested):
        wanted = expected[at].copy()
        wanted[at] = 0
        others = [i for i in range(len(means)) if i != at]
        weights = solved([[expected[i][j] for i in others] for j in range(len(wanted))], wanted)
        parts = [(weight, means[i], all_degrees[i]) for weight, i in zip(weights, others) if weight != 0]
        denominator = sum(weight * mean for weight, mean, _ in parts)
        if denominator <= 0:
            return None
        v = denominator ** 2 / sum((weight * mean) ** 2 / d for weight, mean, d in parts)
        f = means[at] / denominator
        table[name(source)] = (squares[source], degrees[source], means[at], f,
                               upper_tail(f, degrees[source], v), v,
                               critical_value(alpha, degrees[source], v))
    table["error"] = (error, error_degrees, means[-1], NAN, NAN, NAN, NAN)
    table["total"] = (total, n - 1, NAN, NAN, NAN, NAN, NAN)
    return table


def check(table, published):
    for source, (squares, f) in published.items():
        for value, text in ((table[source][0], squares), (table[source][3], f)):
            if text is not None:
                digits = len(str(text).split(".")[1])
                assert abs(float(value) - text) <= 0.5001 * 10.0 ** -digits, (source, float(value), text)


def lines_of(name, cells, random_factors, alpha, published=None):
    table = analysed(cells, random_factors, alpha)
    if published:
        check(table, published)
    factors = len(next(iter(cells)))
    levels = [1 + max(cell[i] for cell in cells) for i in range(factors)]
    signed = [-count if i in random_factors else count for i, count in enumerate(levels)]
    observations = len(next(iter(cells.values())))
    print(name, "no denominator" if table is None else "")
    yield " ".join(map(str, ["design", name.replace(" ", "_"), factors, *signed, observations, alpha,
                             "ErrAnovaDesign" if table is None else "0"]))
    yield from (" ".join([*map(str, cell), float(y).hex()]) for cell, values in cells.items()
                for y in values)
    for source, row in (table or {}).items():
        yield " ".join([source, *(float(value).hex() for value in row)])


def moved(cells):
    """Moved to multiples of 1/8 at a distance of 10^9 from 0, which are exact."""
    return {cell: [10 ** 9 + y / 8 for y in values] for cell, values in cells.items()}


def designs():
    two = [("batteries", BATTERIES, BATTERIES_PUBLISHED), ("breaks", BREAKS, BREAKS_PUBLISHED),
           ("impurity", IMPURITY, IMPURITY_PUBLISHED)]
    for name, data, published in two:
        yield name, cells_of(data, 2), set(), 0.05, published
        yield name + " moved", moved(cells_of(data, 2)), set(), 0.01
    yield "gauge", cells_of(GAUGE, 2), {0, 1}, 0.05, GAUGE_PUBLISHED
    yield "gauge, operators fixed", cells_of(GAUGE, 2), {0}, 0.001
    bottles = cells_of(BOTTLES, 3)
    yield "bottles", bottles, set(), 0.05, BOTTLES_PUBLISHED
    for subset in subsets_of(3):
        yield f"bottles, random {subset}".replace(" ", ""), bottles, set(subset), 0.1
    yield "bottles moved", moved(bottles), {0, 1, 2}, 0.05
    yield "bottles, means", {cell: [sum(values) / 2] for cell, values in bottles.items()}, set(), 0.05
    draw = random.Random(20261122)
    for levels, observations in (((4, 3, 5), 3), ((2, 6, 3), 2), ((5, 2, 2), 4)):
        for random_factors in ({0, 1, 2}, {1}, {0, 2}):
            effect = {}
            cells = {}
            for cell in product(*map(range, levels)):
                for subset in subsets_of(3):
                    effect.setdefault((subset, *(cell[i] for i in subset)),
                                      Fraction(draw.randrange(-64, 65), 16 * len(subset)))
                mean = sum(effect[(subset, *(cell[i] for i in subset))] for subset in subsets_of(3)
                           if len(subset) < 3)
                cells[cell] = [Fraction(float(mean + Fraction(draw.randrange(-99, 100), 50)))
                               for _ in range(observations)]
            yield f"drawn {levels} random {random_factors}".replace(" ", ""), cells, random_factors, 0.025


if __name__ == "__main__":
    lines = chain.from_iterable(lines_of(*design) for design in designs())
    (Path(__file__).parent / "data/factorial_anova.dat").write_text("\n".join(lines) + "\n")
