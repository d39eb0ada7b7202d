"""Statistics of samples, distributions, contingency tables and analyses of variance.

Functions of samples work along the last axis, rather than on all values like those of NumPy. For a pandas
table, they return one result per column.
"""

from __future__ import annotations

import math
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import LAST, Result, Stream, along, either, refuse, result, served, whole_number
from .topical.axes import as_array

__all__ = ["Anova", "Distribution", "Histogram", "Running", "Summary", "Test", "anova", "anova2",
           "anova3", "chi2", "contingency", "f", "histogram", "kurtosis", "mean", "median",
           "mode", "moment", "mse", "norm", "rms", "skew", "std", "t", "var"]

core = served("stats")


@result
class Histogram(Result):
    """Counts of samples in bins; unpacks into counts and edges, like the result of `numpy.histogram`.

    Attributes
    ----------
    counts : ndarray of int32
        The number of samples in each bin.
    edges : ndarray
        The edges of the bins, one more than there are bins.
    centres : ndarray
        The centres of the bins.
    """

    counts: NDArray[Any]
    edges: NDArray[Any]
    centres: NDArray[Any]
    _unpacked = ("counts", "edges")


@result
class Test(Result):
    """The result of a test; unpacks into the statistic and the probability.

    Attributes
    ----------
    statistic : float
        The test statistic.
    p : float
        The probability of a larger statistic by chance.
    dof : tuple
        The degrees of freedom.
    """

    statistic: float
    p: float
    dof: tuple[int, ...]
    _unpacked = ("statistic", "p")


@result
class Anova(Result):
    """An analysis of variance; each array has one element for each row of the table.

    Attributes
    ----------
    sources : tuple of str
        The names of the rows.
    sums : ndarray
        Sums of squares.
    dof : ndarray
        Degrees of freedom.
    means : ndarray
        Mean squares.
    f : ndarray
        Ratios of variances; NaN for rows without one.
    p : ndarray
        Probabilities of larger ratios by chance.
    critical : ndarray
        The values that f exceeds by chance with probability `significance`.
    """

    sources: tuple[str, ...]
    sums: NDArray[Any]
    dof: NDArray[Any]
    means: NDArray[Any]
    f: NDArray[Any]
    p: NDArray[Any]
    critical: NDArray[Any]

    def _rows(self) -> Any:
        def text(value: Any) -> Any:
            return "" if np.isnan(value) else f"{value:.6g}"
        yield "Anova", "sum", "dof", "mean", "F", "p", "critical F"
        for row in zip(self.sources, self.sums, self.dof, self.means, self.f, self.p, self.critical):
            yield row[0], *map(text, row[1:])

    def __repr__(self) -> str:
        return "\n".join(row[0].ljust(8) + "".join(cell.rjust(13) for cell in row[1:]) for row in self._rows())

    def _repr_html_(self) -> str:
        rows = "".join("<tr>" + "".join(f"<td>{cell}</td>" for cell in row) + "</tr>" for row in self._rows())
        return f"<table>{rows}</table>"


class Distribution:
    """A distribution with its functions and quantiles. This module has `norm`, `t`, `chi2` and `f`. As in
    `scipy.stats`, the degrees of freedom follow the argument; they need not be whole numbers.

    Small probabilities keep their digits in either tail: use `sf` and `isf` for the upper tail.

    Examples
    --------
    >>> import qx
    >>> qx.stats.chi2.cdf(3.841, 1).round(3)
    0.95
    >>> float(qx.stats.norm.sf(20.0)), float(qx.stats.norm.isf(1e-300))
    (2.7536241186062337e-89, 37.047096299361186)
    """

    def __init__(self, name: Any, parameters: Any) -> None:
        self.name, self.parameters = name, parameters

    def _degrees(self, dof: Any) -> Any:
        if len(dof) != len(self.parameters):
            refuse(f"stats.{self.name}", ", ".join(self.parameters) or "dof",
                   f"{len(self.parameters)} are needed; got {len(dof)}", "ErrTooFewForParameters")
        return dof

    def _value(self, x: Any, dof: Any, what: int) -> Any:
        return np.asarray(getattr(core, self.name)(x, *self._degrees(dof), what))[()]

    def _point(self, p: Any, dof: Any, tail: int) -> Any:
        return np.asarray(getattr(core, f"{self.name}_point")(p, tail, *self._degrees(dof)))[()]

    def cdf(self, x: Any, *dof: Any) -> Any:
        """The probability of a value less than or equal to x."""
        return self._value(x, dof, 0)

    def sf(self, x: Any, *dof: Any) -> Any:
        """The probability of a value above x."""
        return self._value(x, dof, 1)

    def logcdf(self, x: Any, *dof: Any) -> Any:
        """The logarithm of `cdf`."""
        return self._value(x, dof, 2)

    def logsf(self, x: Any, *dof: Any) -> Any:
        """The logarithm of `sf`."""
        return self._value(x, dof, 3)

    def pdf(self, x: Any, *dof: Any) -> Any:
        """The probability density."""
        return self._value(x, dof, 4)

    def ppf(self, p: Any, *dof: Any) -> Any:
        """The quantile: the value that is not exceeded with probability p."""
        return self._point(p, dof, 0)

    def isf(self, p: Any, *dof: Any) -> Any:
        """The value that is exceeded with probability p."""
        return self._point(p, dof, 1)

    def __repr__(self) -> str:
        return f"Distribution {self.name}({', '.join(self.parameters)})"


norm = Distribution("norm", ())
t = Distribution("t", ("dof",))
chi2 = Distribution("chi2", ("dof",))
f = Distribution("f", ("n", "d"))


def mean(x: ArrayLike, axis: int = LAST) -> Any:
    """The arithmetic mean.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.stats.mean([1.0, 2.0, 6.0])
    3.0
    """
    return along(core.mean, x, axis)


def rms(x: ArrayLike, axis: int = LAST) -> Any:
    """The root mean square of real or complex values.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.stats.rms([3.0, 4.0]) ** 2
    12.500000000000002
    """
    return either(core.rms, core.rms_complex, x, axis)


def moment(x: ArrayLike, order: int, axis: int = LAST) -> Any:
    r"""The central moment.

    .. math:: \frac1n \sum_i (x_i - \bar x)^m

    Parameters
    ----------
    x : array_like
        Real values.
    order : int
        The order m.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty or order is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.stats.moment([1.0, 2.0, 6.0], 2)
    4.666666666666667
    """
    order = whole_number("stats.moment", "order", order, 1, "ErrOrderNotPositive")
    return along(lambda channel: core.moment(channel, order), x, axis)


def var(x: ArrayLike, axis: int = LAST, ddof: int = 0) -> Any:
    """The variance.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.
    ddof : int
        The sum of squares is divided by n - ddof; use 1 to estimate the variance of the population.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty, or does not have more than ddof values.

    Examples
    --------
    >>> import qx
    >>> qx.stats.var([1.0, 2.0, 6.0], ddof=1)
    7.0
    """
    def of_channel(channel: Any) -> Any:
        n = len(channel)
        if n and n <= ddof:
            refuse("stats.var", "ddof", f"must be below the number of values, {n}; got {ddof}", "ErrSizesDisagree")
        return core.moment(channel, 2) * (n / (n - ddof) if n else 1.0)

    return along(of_channel, x, axis)


def std(x: ArrayLike, axis: int = LAST, ddof: int = 0) -> Any:
    """The standard deviation, the root of the variance.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.
    ddof : int
        As for `var`.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty, or does not have more than ddof values.

    Examples
    --------
    >>> import qx
    >>> qx.stats.std([1.0, 3.0])
    1.0
    """
    return np.sqrt(var(x, axis, ddof))


def _standardized(channel: NDArray[Any], order: int) -> float:
    """The central moment divided by the same power of the standard deviation. It is NaN where all values are
    equal: the rounding error of their mean is not a spread."""
    if len(channel) and channel.min() == channel.max():
        return math.nan
    moment, variance = np.float64(core.moment(channel, order)), np.float64(core.moment(channel, 2))
    with np.errstate(all="ignore"):
        return float(moment / variance ** (order / 2))


def skew(x: ArrayLike, axis: int = LAST) -> Any:
    """The skewness: the third central moment divided by the second to the power 3/2; NaN where all values are
    equal.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> round(qx.stats.skew([1.0, 2.0, 6.0]), 6)
    0.59517
    """
    return along(lambda channel: _standardized(channel, 3), x, axis)


def kurtosis(x: ArrayLike, axis: int = LAST, fisher: bool = True) -> Any:
    """The kurtosis: the fourth central moment divided by the square of the second; NaN where all values are
    equal.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.
    fisher : bool
        Whether to subtract 3, the kurtosis of a normal distribution.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> round(qx.stats.kurtosis([1.0, 2.0, 6.0]), 6)
    -1.5
    """
    return along(lambda channel: _standardized(channel, 4), x, axis) - 3 * bool(fisher)


def median(x: ArrayLike, axis: int = LAST) -> Any:
    """The median.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray; for a pandas table, a Series

    Raises
    ------
    ValueError
        If x is empty or contains NaN.

    Examples
    --------
    >>> import qx
    >>> qx.stats.median([1.0, 2.0, 6.0])
    2.0
    """
    return along(core.median, x, axis)


def mode(x: ArrayLike, intervals: int = 0) -> NDArray[np.float64]:
    """The most frequent values, in ascending order.

    Parameters
    ----------
    x : array_like
        Real values.
    intervals : int
        If above 0, the number of bins of equal width; the centres of the fullest bins are returned.

    Returns
    -------
    ndarray of float64
        Empty where no value occurs twice.

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.stats.mode([1.0, 2.0, 2.0, 3.0])
    array([2.])
    """
    return core.mode(as_array(x).ravel(), whole_number("stats.mode", "intervals", intervals, 0))


def mse(x: ArrayLike, y: ArrayLike) -> float:
    """The mean square of the differences.

    Parameters
    ----------
    x, y : array_like
        Real values, of the same length.

    Returns
    -------
    float

    Raises
    ------
    ValueError
        If x is empty, or differs from y in length.

    Examples
    --------
    >>> import qx
    >>> qx.stats.mse([1.0, 2.0], [1.0, 4.0])
    2.0
    """
    x, y = as_array(x).ravel(), as_array(y).ravel()
    if x.shape != y.shape:
        refuse("stats.mse", "x, y", f"must have the same length; got {len(x)} and {len(y)}", "ErrSizeMismatch")
    return core.mse(x, y)


def histogram(x: ArrayLike, bins: ArrayLike = 10) -> Histogram:
    """Counts in bins of equal width from the least to the greatest value, or in bins with given edges.

    Parameters
    ----------
    x : array_like
        Real values.
    bins : int or array_like
        The number of bins, or their edges in ascending order; the last bin includes its upper edge.

    Returns
    -------
    Histogram

    Raises
    ------
    ValueError
        If x is empty, or the edges are not in ascending order.

    Examples
    --------
    >>> import qx
    >>> qx.stats.histogram([1.0, 2.0, 2.5, 5.0], 2).counts
    array([3, 1], dtype=int32)
    """
    x = as_array(x).astype(float).ravel()
    if np.ndim(bins) == 0:
        bins = whole_number("stats.histogram", "bins", bins, 1)
        counts, centres = core.histogram(x, bins)
        return Histogram(counts, np.linspace(np.nanmin(x), np.nanmax(x), bins + 1), centres)
    edges = as_array(bins).astype(float)
    if edges.ndim != 1 or len(edges) < 2 or np.any(np.diff(edges) < 0):
        refuse("stats.histogram", "bins", "must be at least two edges in ascending order", "ErrRangeReversed")
    intervals = [(low, high, 0) for low, high in zip(edges[:-1], edges[1:])]
    intervals[-1] = (edges[-2], edges[-1], 2)
    return Histogram(core.histogram_intervals(x, intervals)[0], edges, (edges[1:] + edges[:-1]) / 2)


def contingency(table: ArrayLike) -> Test:
    r"""Pearson's test of independence on a table of counts.

    .. math:: \chi^2 = \sum (O - E)^2 / E

    Parameters
    ----------
    table : array_like
        Counts, at least 2 by 2.

    Returns
    -------
    Test

    Raises
    ------
    ValueError
        If the table is too small or a count is negative.

    Examples
    --------
    >>> import qx
    >>> round(qx.stats.contingency([[10, 20], [20, 10]]).statistic, 6)
    6.666667
    """
    table = as_array(table)
    statistic, p = core.contingency(table)
    return Test(statistic, p, ((table.shape[0] - 1) * (table.shape[1] - 1),))


def anova(*samples: ArrayLike, significance: float = 0.05) -> Anova:
    """The one-way analysis of variance: whether the means of several samples differ.

    Parameters
    ----------
    *samples : array_like
        The values at each level of the factor.
    significance : float
        The probability to which the critical values refer.

    Returns
    -------
    Anova

    Raises
    ------
    ValueError
        If there are fewer than two samples, or one is empty.

    Examples
    --------
    >>> import qx
    >>> round(qx.stats.anova([1.0, 2.0, 3.0], [2.0, 3.0, 4.0]).f[0], 9)
    1.5
    """
    groups = [as_array(one).astype(float).ravel() for one in samples]
    if len(groups) < 2:
        refuse("stats.anova", "samples", f"at least two samples are needed; got {len(groups)}", "ErrAnovaFewLevels")
    for i, group in enumerate(groups):
        if not len(group):
            refuse("stats.anova", "samples", f"sample {i} is empty", "ErrEmptyInput")
        if not np.all(np.isfinite(group)):
            refuse("stats.anova", "samples", f"sample {i} has a value that is not finite", "ErrNaNInData")
    if len(groups) == sum(map(len, groups)):
        refuse("stats.anova", "samples", "at least one of them must have two values", "ErrAnovaFewLevels")
    y = np.concatenate(groups) if groups else np.empty(0)
    labels = np.repeat(np.arange(len(groups), dtype=np.int32), [len(one) for one in groups])
    between, mean_between, ratio, p, error, mean_error, total, critical = core.anova(
        y, labels, len(groups), float(significance))
    nan, k, n = math.nan, len(groups), len(y)
    return Anova(("between", "within", "total"), np.array([between, error, total]), np.array([k - 1, n - k, n - 1.0]),
                 np.array([mean_between, mean_error, nan]), np.array([ratio, nan, nan]), np.array([p, nan, nan]),
                 np.array([critical, nan, nan]))


def _coded(function: Any, y: Any, labels: Any, random: Any) -> Any:
    """y, the labels as numbers, and the numbers of levels, which the exports take as negative for random
    factors."""
    y = as_array(y).astype(float).ravel()
    codes, levels = [], []
    for labels_of_one, is_random in zip(labels, random):
        found, code = np.unique(as_array(labels_of_one).ravel(), return_inverse=True)
        if len(code) != len(y):
            refuse(function, "labels", f"must be as many as the values, {len(y)}; got {len(code)}",
                   "ErrSizeMismatch")
        codes.append(code.astype(np.int32))
        levels.append(-len(found) if is_random else len(found))
    cells = math.prod(abs(level) for level in levels)
    if not cells or len(y) % cells:
        refuse(function, "y", f"must have the same number of values in each of the {cells} cells; got {len(y)}",
               "ErrAnovaCountMismatch")
    return y, codes, levels, len(y) // cells


def _table(sources: Any, found: Any) -> Any:
    parts = [np.asarray(part, float) for part in (*found[:5], found[6])]

    def whole(part: Any) -> Any:
        return np.concatenate([part, np.full(len(sources) - len(part), math.nan)])

    return Anova(sources, *map(whole, parts))


def anova2(y: ArrayLike, a: ArrayLike, b: ArrayLike, random: tuple[bool, bool] = (False, False),
           significance: float = 0.05) -> Anova:
    """The analysis of variance of two factors, with the same number of values in each cell.

    Parameters
    ----------
    y : array_like
        The values.
    a, b : array_like
        The level of each factor for each value, as numbers or words.
    random : (bool, bool)
        Whether the levels of each factor are a random sample from many.
    significance : float
        For the critical values.

    Returns
    -------
    Anova
        The table, with the rows A, B, AB, error and total.

    Raises
    ------
    ValueError
        If lengths differ, or cells have different numbers of values.

    Examples
    --------
    >>> import qx
    >>> y = [1.0, 2.0, 2.0, 4.0, 5.0, 5.0, 9.0, 7.0]
    >>> qx.stats.anova2(y, [0, 0, 0, 0, 1, 1, 1, 1], [0, 0, 1, 1, 0, 0, 1, 1]).f[:3].round(3)
    array([32.111,  9.   ,  1.   ])
    """
    y, codes, levels, count = _coded("stats.anova2", y, (a, b), random)
    return _table(("A", "B", "AB", "error", "total"), core.anova2(y, *codes, *levels, count, float(significance)))


def anova3(y: ArrayLike, a: ArrayLike, b: ArrayLike, c: ArrayLike,
           random: tuple[bool, bool, bool] = (False, False, False), significance: float = 0.05) -> Anova:
    """The analysis of variance of three factors, with the same number of values in each cell.

    Parameters
    ----------
    y : array_like
        The values.
    a, b, c : array_like
        The level of each factor for each value, as numbers or words.
    random : (bool, bool, bool)
        Whether the levels of each factor are a random sample from many.
    significance : float
        For the critical values.

    Returns
    -------
    Anova
        The table, with the rows A, B, C, AB, AC, BC, ABC, error and total.

    Raises
    ------
    ValueError
        If lengths differ, or cells have different numbers of values.

    Examples
    --------
    >>> import numpy as np, qx
    >>> y = np.arange(16.0) ** 2
    >>> a, b, c = np.indices((2, 2, 2)).reshape(3, -1).repeat(2, 1)
    >>> qx.stats.anova3(y, a, b, c).dof
    array([ 1.,  1.,  1.,  1.,  1.,  1.,  1.,  8., 15.])
    """
    y, codes, levels, count = _coded("stats.anova3", y, (a, b, c), random)
    return _table(("A", "B", "C", "AB", "AC", "BC", "ABC", "error", "total"),
                  core.anova3(y, *codes, *levels, count, float(significance)))


@result
class Summary(Result):
    """Statistics of the values so far.

    Attributes
    ----------
    count : int
        The number of values.
    mean, std, rms, least, greatest : float or ndarray
        The mean, the population standard deviation, the root mean square, the least and the greatest value.
    """

    count: int
    mean: float
    std: float
    rms: float
    least: float
    greatest: float


class Running(Stream):
    """Statistics of a stream. Each block returns the `Summary` of all values so far, with the same bits as for
    all values in a single block.

    Parameters
    ----------
    channels : int, optional
        Number of channels of a two-dimensional block; without it, blocks have one dimension.
    axis : int
        The axis of time in a block of two dimensions.

    Examples
    --------
    >>> import qx
    >>> running = qx.stats.Running()
    >>> (running([1.0, 2.0]).mean, running([6.0]).mean)
    (1.5, 3.0)
    """

    dtypes = (np.dtype(float),)

    def __init__(self, channels: int | None = None, axis: int = -1) -> None:
        super().__init__(channels, axis)

    def _start(self) -> Any:
        """The count, the first value, the sums of the differences from it and of their squares, the least and
        the greatest value."""
        return 0, 0.0, 0.0, 0.0, math.inf, -math.inf

    def _step(self, state: Any, block: Any) -> Any:
        count, first, total, squares, least, greatest = state
        first = first if count else float(block[0])
        away = block - first
        # The values are summed one after the other, so that the division into blocks does not matter.
        total = float(np.cumsum(np.concatenate([[total], away]))[-1])
        squares = float(np.cumsum(np.concatenate([[squares], away * away]))[-1])
        return np.empty(0), (count + len(block), first, total, squares, min(least, float(block.min())),
                             max(greatest, float(block.max())))

    def __call__(self, block: Any) -> Any:
        super().__call__(block)
        return self.summary()

    def summary(self) -> Any:
        """The Summary so far; NaN where there were no values."""
        parts = []
        for count, first, total, squares, least, greatest in self._states:
            n = count or math.nan
            mean, variance = first + total / n, max(squares / n - (total / n)**2, 0.0) if count else math.nan
            parts.append((mean, math.sqrt(variance) if count else math.nan,
                          math.sqrt(variance + mean * mean) if count else math.nan, least, greatest))
        columns: list[Any] = [np.array(column) for column in zip(*parts)]
        if self.channels is None:
            columns = [float(column[0]) for column in columns]
        return Summary(self._states[0][0], *columns)

    def finish(self) -> Any:
        """The Summary of all values. The stream starts afresh."""
        found = self.summary()
        self.reset()
        return found
