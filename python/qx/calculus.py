"""Integrals and derivatives of samples and of functions, and velocity and displacement from acceleration.
"""

from __future__ import annotations

import math
from collections.abc import Callable
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike

from . import windows
from .topical import LAST, LOW_ORDER, Result, along, chosen, procedure, refuse, result, served, whole_number
from .topical.axes import as_array

__all__ = ["Quadrature", "cumulative", "derivative", "displacement", "integrate", "integrate2",
           "integrate3", "quad", "simpson", "trapezoid", "velocity"]

core = served("calculus")

RULES = {"trapezoid": 0, "simpson": 1, "simpson38": 2, "boole": 3, "left": 4, "right": 5}
DERIVATIVES = {"central": 0, "five-point": 1, "forward": 2, "backward": 3}


def _step(function: Any, x: Any, dx: Any) -> Any:
    """The distance between samples: dx, or that of the evenly spaced x."""
    if x is None:
        if not dx > 0:
            refuse(function, "dx", f"must be above 0; got {dx}", "ErrSamplingNotPositive")
        return float(dx)
    x = as_array(x).astype(float)
    steps = np.diff(x)
    if x.ndim != 1 or not len(steps) or not steps[0] > 0 or \
            np.abs(steps - steps.mean()).max() > 1e-9 * np.abs(x).max(initial=0) + 1e-12 * steps[0]:
        refuse(function, "x", "must be evenly spaced and increasing", "ErrAbscissaeOrder")
    return float((x[-1] - x[0]) / len(steps))


@result
class Quadrature(Result):
    """The integral of a function; unpacks into value and error.

    Attributes
    ----------
    value : float or complex
        The integral.
    error : float
        An estimate of the error of the integral, usually far above the actual error.
    evaluations : int
        The number of points at which the function was evaluated.
    """

    value: float
    error: float
    evaluations: int
    _unpacked = ("value", "error")


def trapezoid(y: ArrayLike, x: ArrayLike | None = None, dx: float = 1.0, axis: int = LAST) -> Any:
    """The integral by the trapezoidal rule; x may be spaced unevenly.

    Parameters
    ----------
    y : array_like
        Samples.
    x : array_like, optional
        The abscissae of the samples, in any spacing.
    dx : float
        The distance between samples, where x is not given.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray

    Raises
    ------
    ValueError
        If there are too few samples, x is evenly spaced but decreasing, or dx is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.calculus.trapezoid([1.0, 2.0, 4.0])
    4.5
    """
    if x is not None and (np.ndim(x) == 1 and np.ptp(np.diff(as_array(x))) != 0):
        weights = np.diff(as_array(x).astype(float))
        return along(lambda channel: float(np.sum((channel[1:] + channel[:-1]) * weights) / 2), y, axis)
    return integrate(y, x, dx, "trapezoid", axis)


def simpson(y: ArrayLike, x: ArrayLike | None = None, dx: float = 1.0, axis: int = LAST) -> Any:
    """The integral by Simpson's rule, which is exact for cubic polynomials, for 3 or more samples.

    Parameters
    ----------
    y : array_like
        Samples.
    x : array_like, optional
        The abscissae of the samples, evenly spaced.
    dx : float
        The distance between samples, where x is not given.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray

    Raises
    ------
    ValueError
        If there are too few samples for the rule, x is not evenly spaced, or dx is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.calculus.simpson([0.0, 1.0, 4.0, 9.0])
    9.0
    """
    return integrate(y, x, dx, "simpson", axis)


def integrate(y: ArrayLike, x: ArrayLike | None = None, dx: float = 1.0,
              rule: Literal["trapezoid", "simpson", "simpson38", "boole", "left", "right"] = "boole",
              axis: int = LAST) -> Any:
    """The integral by a composite Newton-Cotes rule. Samples left over after the last whole panel are
    integrated by a one-sided formula of the same order.

    Parameters
    ----------
    y : array_like
        Samples.
    x : array_like, optional
        The abscissae of the samples, evenly spaced.
    dx : float
        The distance between samples, where x is not given.
    rule : {"trapezoid", "simpson", "simpson38", "boole", "left", "right"}
        Panels of 2, 3, 4 or 5 samples, or rectangles.
    axis : int
        The axis along which to work.

    Returns
    -------
    float or ndarray

    Raises
    ------
    ValueError
        If there are too few samples for the rule, x is not evenly spaced, or dx is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.calculus.integrate([0.0, 1.0, 16.0, 81.0, 256.0])
    204.8
    """
    code = chosen("calculus.integrate", "rule", rule, RULES)
    step = _step("calculus.integrate", x, dx)
    return along(lambda channel: core.integrate(channel, step, code), y, axis)


def integrate2(y: ArrayLike, dx: float = 1.0, dy: float = 1.0,
               rule: Literal["trapezoid", "simpson", "simpson38", "boole"] = "simpson") -> float:
    """The integral over both dimensions of a matrix.

    Parameters
    ----------
    y : array_like
        Samples in two dimensions.
    dx : float
        The distance between samples in a row.
    dy : float
        The distance between rows.
    rule : {"trapezoid", "simpson", "simpson38", "boole"}
        As for `integrate`.

    Returns
    -------
    float

    Raises
    ------
    ValueError
        If a dimension is below 3 or shorter than a panel, or rule is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.calculus.integrate2([[1.0] * 3] * 3)
    4.0
    """
    code = chosen("calculus.integrate2", "rule", rule, {name: RULES[name] for name in [*RULES][:4]})
    return core.integrate2(as_array(y), [float(dx), float(dy)], code)


def integrate3(y: ArrayLike, dx: float = 1.0, dy: float = 1.0, dz: float = 1.0,
               rule: Literal["trapezoid", "simpson", "simpson38", "boole"] = "simpson") -> float:
    """The integral over three dimensions.

    Parameters
    ----------
    y : array_like
        Samples y[plane, row, column].
    dx, dy, dz : float
        The distances between samples in a row, between rows, and between planes.
    rule : {"trapezoid", "simpson", "simpson38", "boole"}
        As for `integrate`.

    Returns
    -------
    float

    Raises
    ------
    ValueError
        If there are not three dimensions, one is below 3 or shorter than a panel, or rule is not a valid
        choice.

    Examples
    --------
    >>> import numpy as np, qx
    >>> qx.calculus.integrate3(np.ones((3, 5, 4)))
    24.0
    """
    code = chosen("calculus.integrate3", "rule", rule, {name: RULES[name] for name in [*RULES][:4]})
    y = as_array(y)
    if y.ndim != 3:
        refuse("calculus.integrate3", "y", f"three dimensions are needed; got {y.ndim}", "ErrSizesDisagree")
    # The export takes the numbers of rows, columns and planes, and the planes one after the other.
    planes, rows, columns = y.shape
    return core.integrate3(np.ascontiguousarray(y, float).reshape(rows, columns, planes),
                           [float(dx), float(dy), float(dz)], code)


def cumulative(y: ArrayLike, x: ArrayLike | None = None, dx: float = 1.0,
               rule: Literal["corrected", "trapezoid", "simpson", "simpson38", "boole", "left", "right"] = "corrected",
               axis: int = LAST) -> Any:
    """The running integral from 0 at the first sample.

    Parameters
    ----------
    y : array_like
        Samples.
    x : array_like, optional
        The abscissae of the samples, evenly spaced.
    dx : float
        The distance between samples, where x is not given.
    rule : {"corrected", "trapezoid", "simpson", "simpson38", "boole", "left", "right"}
        "corrected" uses trapezoids and corrects them by the slopes at both ends, by the Euler-Maclaurin
        formula, with an error of fourth order. Simpson's and the higher rules are accurate for smooth
        samples, but amplify noise at half the sampling rate without bound.
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as y.

    Raises
    ------
    ValueError
        If there are too few samples for the rule, x is not evenly spaced, or dx is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.calculus.cumulative([0.0, 1.0, 4.0, 9.0, 16.0]).round(9)
    array([ 0.        ,  0.33333333,  2.66666667,  9.        , 21.33333333])
    """
    code = chosen("calculus.cumulative", "rule", rule, {"corrected": None, **RULES})
    step = _step("calculus.cumulative", x, dx)
    if code is not None:
        return along(lambda channel: core.cumulative(channel, step, code), y, axis)
    return along(lambda channel: _corrected(channel, step), y, axis)


def _corrected(channel: Any, step: Any) -> Any:
    if len(channel) < 2:
        return np.zeros(len(channel))
    found = core.cumulative(channel, step, 0)
    if len(channel) < 5:
        return found
    slopes = _slopes(channel, step, 1)
    return found - (slopes - slopes[0]) * (step * step / 12)


def _slopes(channel: Any, step: Any, code: Any) -> Any:
    """The derivative, with samples beyond the ends from a polynomial through as many samples as the rule takes."""
    order = {0: 2, 1: 4, 2: 1, 3: 1}[code]
    need = 2 if code == 1 else 1
    if len(channel) <= order:
        refuse("calculus.derivative", "y", f"at least {order + 1} samples are needed; got {len(channel)}",
               "ErrSizesDisagree")
    before, behind = list(channel[:order + 1]), list(channel[-order - 1:])
    for _ in range(need):  # the next value of a polynomial has vanishing differences
        signs = [(-1.0)**k * math.comb(order + 1, k) for k in range(1, order + 2)]
        before.insert(0, -sum(s * v for s, v in zip(signs, before)))
        behind.append(-sum(s * v for s, v in zip(signs, behind[::-1])))
    return core.derivative(channel, before[:need], behind[-need:], step, code)


def derivative(y: ArrayLike, x: ArrayLike | None = None, dx: float = 1.0,
               rule: Literal["central", "five-point", "forward", "backward"] = "central",
               axis: int = LAST) -> Any:
    """The derivative of samples. The samples are extended beyond the ends by the polynomial through the
    nearest ones, so that the order of the rule holds up to the ends.

    Parameters
    ----------
    y : array_like
        Samples.
    x : array_like, optional
        The abscissae of the samples, evenly spaced.
    dx : float
        The distance between samples, where x is not given.
    rule : {"central", "five-point", "forward", "backward"}
        The samples used besides the current one: two or four neighbours, the next one, or the previous one.
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as y.

    Raises
    ------
    ValueError
        If there are too few samples for the rule, x is not evenly spaced, or dx is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.calculus.derivative([0.0, 1.0, 4.0, 9.0])
    array([0., 2., 4., 6.])
    """
    code = chosen("calculus.derivative", "rule", rule, DERIVATIVES)
    step = _step("calculus.derivative", x, dx)
    return along(lambda channel: _slopes(np.asarray(channel, float), step, code), y, axis)


# The points and weights of Gauss and Kronrod with 7 and 15 points: A. S. Kronrod, "Nodes and weights of
# quadrature formulas", 1965.
_POINTS = np.array([0.991455371120812639206854697526329, 0.949107912342758524526189684047851,
                    0.864864423359769072789712788640926, 0.741531185599394439863864773280788,
                    0.586087235467691130294144691693390, 0.405845151377397166906606412076961,
                    0.207784955007898467600689403773245, 0.0])
_WEIGHTS = np.array([0.022935322010529224963732008058970, 0.063092092629978553290700663189204,
                     0.104790010322250183839876322541518, 0.140653259715525918745189590510238,
                     0.169004726639267902826583426598550, 0.190350578064785409913256402421014,
                     0.204432940075298892414161999234649, 0.209482141084727828012999174891714])
_GAUSS = np.array([0.129484966168869693270611432679082, 0.279705391489276667901467771423780,
                   0.381830050505118944950369775488975, 0.417959183673469387755102040816327])
_X15 = np.r_[-_POINTS, _POINTS[-2::-1]]
_K15 = np.r_[_WEIGHTS, _WEIGHTS[-2::-1]]
_G15 = np.zeros(15)
_G15[1::2] = np.r_[_GAUSS, _GAUSS[-2::-1]]


def quad(f: Callable[..., Any], a: float, b: float, tolerance: float = 1e-10, limit: int = 1000) -> Quadrature:
    r"""The integral of a function from a to b, by Gauss-Kronrod quadrature that halves the interval with the
    largest error estimate.

    .. math:: \int_a^b f(x)\,dx

    Parameters
    ----------
    f : callable
        Takes an array of points and returns the same number of values, real or complex.
    a, b : float
        The ends; infinite ones are allowed.
    tolerance : float
        The error to aim at, relative to the integral.
    limit : int
        The largest number of intervals.

    Returns
    -------
    Quadrature

    Raises
    ------
    ValueError
        If an end is NaN or limit is below 1.
    QxError
        If the function is not finite at a point.

    Examples
    --------
    >>> import numpy as np, qx
    >>> found = qx.calculus.quad(lambda x: np.exp(-x**2), -np.inf, np.inf)
    >>> round(found.value**2, 9)
    3.141592654
    """
    if math.isnan(a) or math.isnan(b):
        refuse("calculus.quad", "a, b", "an end is NaN", "ErrNaNInData")
    procedure("calculus.quad", "f", f)
    limit = whole_number("calculus.quad", "limit", limit, 1)
    if math.isinf(a) or math.isinf(b):
        return _quad_infinite(f, a, b, tolerance, limit)

    def part(low: Any, high: Any) -> Any:
        half, middle = (high - low) / 2, (high + low) / 2
        values = np.asarray(f(middle + half * _X15))
        whole = half * np.sum(_K15 * values)
        return abs(whole - half * np.sum(_G15 * values)), whole, low, high

    parts = [part(float(a), float(b))]
    while len(parts) < limit:
        error, total = sum(one[0] for one in parts), sum(one[1] for one in parts)
        worst = max(range(len(parts)), key=lambda i: parts[i][0])
        _, _, low, high = parts[worst]
        middle = (low + high) / 2
        if not error > tolerance * abs(total) or not low < middle < high and not high < middle < low:
            break
        parts[worst:worst + 1] = [part(low, middle), part(middle, high)]
    value, error = sum(one[1] for one in parts), sum(one[0] for one in parts)
    if not np.isfinite(value):
        refuse("calculus.quad", "f", "is not finite at a point", "ErrNonFiniteFunction")
    return Quadrature(value[()], float(error), 15 * (2 * len(parts) - 1))


def _quad_infinite(f: Any, a: Any, b: Any, tolerance: Any, limit: Any) -> Any:
    """By the substitution x = t / (1 - t^2), which maps -1 to 1 to the whole axis."""
    def place(x: Any) -> Any:
        if math.isinf(x):
            return math.copysign(1.0, x)
        return 2 * x / (1 + math.sqrt(1 + 4 * x * x))

    def changed(t: Any) -> Any:
        rest = 1 - t * t
        return np.asarray(f(t / rest)) * ((1 + t * t) / (rest * rest))

    return quad(changed, place(a), place(b), tolerance, limit)


def velocity(acceleration: ArrayLike, fs: float, drift: int | None = 1, cutoff: float | None = None,
             axis: int = LAST) -> Any:
    """The velocity from a measured acceleration. An offset of the acceleration and the unknown initial
    velocity add a line to it, which is removed.

    Parameters
    ----------
    acceleration : array_like
        The acceleration, in units of length per time squared.
    fs : float
        The sampling rate.
    drift : int or None
        The order of the polynomial that is removed from the result; None to remove nothing.
    cutoff : float, optional
        A frequency, in the unit of fs, below which there is only drift. It is removed by a second-order
        Butterworth highpass, applied in both directions.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray, or the pandas type of acceleration
        The same shape as acceleration.

    Raises
    ------
    ValueError
        If fs is not above 0, or there are too few samples.

    Examples
    --------
    >>> import numpy as np, qx
    >>> t = np.arange(2000) / 1000
    >>> a = np.cos(2 * np.pi * 5 * t) + 0.3
    >>> found = qx.calculus.velocity(a, 1000)
    >>> round(float(np.ptp(found)) * np.pi * 5, 2)
    1.0
    """
    return _motion(acceleration, fs, drift, cutoff, 1, axis)


def _motion(acceleration: Any, fs: Any, drift: Any, cutoff: Any, times: Any, axis: Any) -> Any:
    from . import filters
    if not fs > 0:
        refuse("calculus.velocity", "fs", f"must be above 0; got {fs}", "ErrSamplingNotPositive")
    found = acceleration
    for _ in range(times):
        found = cumulative(found, dx=1 / fs, axis=axis)
    if drift is not None:
        found = along(lambda channel: _driftless(channel, drift), found, axis)
    if cutoff is not None:
        found = filters.butterworth(2, cutoff, "highpass", fs).zero_phase(found, axis)
    return found


def _driftless(channel: Any, order: Any) -> Any:
    """The values less a least-squares polynomial under a Blackman window, which vibrations of several periods
    hardly affect."""
    n = len(channel)
    order = whole_number("calculus.displacement", "drift", order, 0, "ErrPolynomialOrderNegative")
    weights = windows.blackman(n + 2)[1:-1]  # all above 0
    t = np.linspace(-1, 1, n)
    if order > LOW_ORDER:
        return channel - core.velocity_high(t, channel, order, weights, -1.0, [], [])[0]
    return channel - core.velocity(t, channel, order, weights, 0, [], [])[0]


def displacement(acceleration: ArrayLike, fs: float, drift: int | None = 2, cutoff: float | None = None,
                 axis: int = LAST) -> Any:
    """The displacement from a measured acceleration. An offset of the acceleration and the unknown initial
    velocity and position add a parabola to it, which is removed.

    Parameters
    ----------
    acceleration : array_like
        The acceleration, in units of length per time squared.
    fs : float
        The sampling rate.
    drift : int or None
        The order of the polynomial that is removed from the result; None for nothing.
    cutoff : float, optional
        As for `velocity`.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray, or the pandas type of acceleration
        The same shape as acceleration.

    Raises
    ------
    ValueError
        If fs is not above 0, or there are too few samples.

    Examples
    --------
    >>> import numpy as np, qx
    >>> t = np.arange(2000) / 1000
    >>> a = -(2 * np.pi * 5)**2 * np.sin(2 * np.pi * 5 * t) + 0.3
    >>> found = qx.calculus.displacement(a, 1000)
    >>> round(float(np.ptp(found)), 1)
    2.0
    """
    return _motion(acceleration, fs, drift, cutoff, 2, axis)
