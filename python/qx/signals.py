"""Waveforms, pulses and patterns, and operations on whole signals: detrending, scaling, convolution and
correlation.

Frequencies are in the unit of the sampling rate `fs`, phases in radians.
"""

from __future__ import annotations

import math
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import LAST, LOW_ORDER, along, chosen, positive, refuse, served, vector, whole_number
from .topical.axes import as_array

__all__ = ["arbitrary", "autocorrelate", "chirp", "convolve", "convolve2", "correlate", "correlate2",
           "correlation_matrix", "deconvolve", "detrend", "frequency_modulated", "gauss_monopulse",
           "gauss_pulse", "impulse", "periodic_sinc", "phase_modulated", "pulse", "ramp", "rescale",
           "sawtooth", "sinc", "sine", "square", "standardize", "triangle", "triangle_pulse", "unwrap"]

core = served("signals")

EMPTY = np.empty(0)
NORMALIZATIONS = {"none": 0, "unbiased": 1, "biased": 2}
METHODS = {"direct": 0, "fft": 1}
DIRECT = 64  # up to this length of the shorter sequence, direct sums are faster than transforms


def _wave(name: Any, n: Any, frequency: Any, fs: Any, amplitude: Any, phase: Any, *more: Any) -> Any:
    n = whole_number(f"signals.{name}", "n", n, 1)
    if not fs > 0:
        refuse(f"signals.{name}", "fs", f"must be above 0; got {fs}", "ErrSamplingNotPositive")
    return getattr(core, name)(n, float(amplitude), frequency / fs, math.degrees(phase), *more)[0]


def _of_times(name: Any, t: Any, *arguments: Any) -> Any:
    """A pulse at the caller's times, of any shape."""
    times = _times(name, t)
    return getattr(core, name)(times.ravel(), 0, *arguments).reshape(times.shape)


def _times(name: Any, t: Any) -> Any:
    times = np.asarray(t, float)
    if not times.size:
        refuse(f"signals.{name}", "t", "is empty", "ErrEmptyInput")
    return times


def sine(n: int, frequency: float, fs: float = 1.0, amplitude: float = 1.0,
         phase: float = 0.0) -> NDArray[np.float64]:
    r"""A sine wave.

    .. math:: x_i = A \sin(2\pi f i / f_s + \varphi)

    Parameters
    ----------
    n : int
        Number of values.
    frequency : float
        In the unit of fs.
    fs : float
        The sampling rate.
    amplitude : float
        The largest magnitude.
    phase : float
        The phase of the first value, in radians.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.sine(4, 250, fs=1000).round(12) + 0.0
    array([ 0.,  1.,  0., -1.])
    """
    return _wave("sine", n, frequency, fs, amplitude, phase)


def square(n: int, frequency: float, fs: float = 1.0, amplitude: float = 1.0, phase: float = 0.0,
           duty: float = 0.5) -> NDArray[np.float64]:
    """A square wave between amplitude and -amplitude.

    Parameters
    ----------
    n : int
        Number of values.
    frequency : float
        In the unit of fs.
    fs : float
        The sampling rate.
    amplitude : float
        The largest magnitude.
    phase : float
        The phase of the first value, in radians.
    duty : float
        The fraction of a period during which the wave is high, from 0 to 1.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.square(4, 250, fs=1000)
    array([ 1.,  1., -1., -1.])
    """
    return _wave("square", n, frequency, fs, amplitude, phase, 100 * float(duty))


def triangle(n: int, frequency: float, fs: float = 1.0, amplitude: float = 1.0,
             phase: float = 0.0) -> NDArray[np.float64]:
    """A triangle wave that starts like a sine, rising from 0.

    Parameters
    ----------
    n : int
        Number of values.
    frequency : float
        In the unit of fs.
    fs : float
        The sampling rate.
    amplitude : float
        The largest magnitude.
    phase : float
        The phase of the first value, in radians.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.triangle(4, 250, fs=1000)
    array([ 0.,  1.,  0., -1.])
    """
    return _wave("triangle", n, frequency, fs, amplitude, phase)


def sawtooth(n: int, frequency: float, fs: float = 1.0, amplitude: float = 1.0,
             phase: float = 0.0) -> NDArray[np.float64]:
    """A sawtooth wave. It rises from 0 to amplitude in the first half of a period, and from -amplitude to 0
    in the second.

    Parameters
    ----------
    n : int
        Number of values.
    frequency : float
        In the unit of fs.
    fs : float
        The sampling rate.
    amplitude : float
        The largest magnitude.
    phase : float
        The phase of the first value, in radians.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.sawtooth(4, 250, fs=1000)
    array([ 0. ,  0.5, -1. , -0.5])
    """
    return _wave("sawtooth", n, frequency, fs, amplitude, phase)


def arbitrary(n: int, table: ArrayLike, frequency: float, fs: float = 1.0, amplitude: float = 1.0,
              phase: float = 0.0, interpolate: bool = True) -> NDArray[np.float64]:
    """A wave whose period is given by a table.

    Parameters
    ----------
    n : int
        Number of values.
    table : array_like
        The values of one period.
    frequency : float
        In the unit of fs.
    fs : float
        The sampling rate.
    amplitude : float
        The factor by which the table is multiplied.
    phase : float
        The phase of the first value, in radians.
    interpolate : bool
        Whether to interpolate linearly between the values of the table rather than hold each value.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.arbitrary(6, [0.0, 1.0], 0.25)
    array([0. , 0.5, 1. , 0.5, 0. , 0.5])
    """
    return _wave("arbitrary", n, frequency, fs, amplitude, phase,
                 vector(table, "signals.arbitrary", "table"), int(interpolate))


def chirp(n: int, f0: float, f1: float, fs: float = 1.0, amplitude: float = 1.0) -> NDArray[np.float64]:
    r"""A sine whose frequency changes linearly from f0 at the first value to f1 one step after the last.

    .. math:: x_i = A \sin\left(2\pi i \left(f_0 + \frac{f_1 - f_0}{2n} i\right) / f_s\right)

    Parameters
    ----------
    n : int
        Number of values.
    f0, f1 : float
        The frequencies, in the unit of fs.
    fs : float
        The sampling rate.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.chirp(4, 0, 500, fs=1000).round(6)
    array([ 0.      ,  0.382683,  1.      , -0.382683])
    """
    n = whole_number("signals.chirp", "n", n, 1)
    if not fs > 0:
        refuse("signals.chirp", "fs", f"must be above 0; got {fs}", "ErrSamplingNotPositive")
    return core.chirp(n, float(amplitude), f0 / fs, f1 / fs)


def pulse(n: int, delay: int, width: int, amplitude: float = 1.0) -> NDArray[np.float64]:
    """A rectangular pulse: `width` values of amplitude starting at index `delay`, the others 0.

    Parameters
    ----------
    n : int
        Number of values.
    delay : int
        Number of values before the pulse.
    width : int
        Number of values in the pulse.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, or the pulse does not fit into the n values.

    Examples
    --------
    >>> import qx
    >>> qx.signals.pulse(5, 1, 2)
    array([0., 1., 1., 0., 0.])
    """
    n = whole_number("signals.pulse", "n", n, 1)
    return core.pulse(n, float(amplitude), delay, width)


def impulse(n: int, delay: int = 0, amplitude: float = 1.0) -> NDArray[np.float64]:
    """An impulse: one value of amplitude, the others 0.

    Parameters
    ----------
    n : int
        Number of values.
    delay : int
        The index of the impulse.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, or delay is not from 0 to n - 1.

    Examples
    --------
    >>> import qx
    >>> qx.signals.impulse(4, 1)
    array([0., 1., 0., 0.])
    """
    n = whole_number("signals.impulse", "n", n, 1)
    return core.impulse(n, float(amplitude), delay)


def ramp(n: int, start: float, stop: float, endpoint: bool = True,
         scale: Literal["linear", "geometric"] = "linear") -> NDArray[np.float64]:
    """Values from start to stop, evenly spaced or in equal ratios.

    Parameters
    ----------
    n : int
        Number of values.
    start, stop : float
        The first and the last value.
    endpoint : bool
        Whether stop is the last value, rather than the value that would come next.
    scale : {"linear", "geometric"}
        Equal steps or equal ratios.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, n is 1 with different ends, or an end is not above 0 on a geometric scale.

    Examples
    --------
    >>> import qx
    >>> qx.signals.ramp(4, 1, 1000, scale="geometric").round(9)
    array([   1.,   10.,  100., 1000.])
    """
    code = chosen("signals.ramp", "scale", scale, {"linear": 0, "geometric": 1})
    n = whole_number("signals.ramp", "n", n, 1)
    return core.ramp(n, float(start), float(stop), int(not endpoint), code)


def sinc(n: int, dt: float = 1.0, delay: float = 0.0, amplitude: float = 1.0) -> NDArray[np.float64]:
    r"""The cardinal sine (sinc).

    .. math:: x_i = A \frac{\sin \pi t}{\pi t},\quad t = i\,\Delta t - d

    Parameters
    ----------
    n : int
        Number of values.
    dt : float
        The time between values.
    delay : float
        The time of the peak.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or dt is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.sinc(3, 0.5, 0.5).round(6)
    array([0.63662, 1.     , 0.63662])
    """
    n = whole_number("signals.sinc", "n", n, 1)
    return core.sinc(n, float(amplitude), float(delay), float(dt))


def gauss_pulse(t: ArrayLike, fc: float, bandwidth: float = 0.5, level: float = -6.0,
                amplitude: float = 1.0) -> NDArray[np.float64]:
    r"""A cosine under a Gaussian.

    .. math:: x = A e^{-k (\pi f_c t)^2} \cos 2\pi f_c t,\quad k = \frac{5 b^2}{\ln 10 \cdot L}

    The spectrum of the pulse is L dB down at a distance of b fc / 2 from fc.

    Parameters
    ----------
    t : array_like
        Times.
    fc : float
        The frequency of the cosine, in cycles per unit of time.
    bandwidth : float
        The width of the spectrum as a fraction of fc.
    level : float
        The level relative to the peak at which the width is taken, in dB; negative.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If t is empty, fc or bandwidth is not above 0, or level is not below 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.gauss_pulse([0.0, 0.1], 5).round(6)
    array([ 1.      , -0.799918])
    """
    if not level < 0:
        refuse("signals.gauss_pulse", "level", f"must be below 0 dB; got {level}", "ErrNotStrictlyPositive")
    return _of_times("gauss_pulse", t, float(amplitude), 0.0, 1.0, float(fc), float(bandwidth), -float(level))


def gauss_monopulse(t: ArrayLike, fc: float, amplitude: float = 1.0) -> NDArray[np.float64]:
    r"""The derivative of a Gaussian, with its peak at t = 1 / (2 pi fc).

    .. math:: x = 2 A \sqrt{e}\, u e^{-2u^2},\quad u = \pi f_c t

    Parameters
    ----------
    t : array_like
        Times.
    fc : float
        The frequency of the greatest power, in cycles per unit of time.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If t is empty or fc is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.gauss_monopulse([0.0, 0.1], 5).round(6)
    array([0.      , 0.037251])
    """
    times = _times("gauss_monopulse", t)
    return core.gauss_monopulse(times.ravel(), 0, 1.0, 0.0, float(fc), float(amplitude)).reshape(times.shape)


def triangle_pulse(t: ArrayLike, width: float = 1.0, skew: float = 0.5,
                   amplitude: float = 1.0) -> NDArray[np.float64]:
    """A triangular pulse about t = 0.

    Parameters
    ----------
    t : array_like
        Times.
    width : float
        The width, in the unit of time.
    skew : float
        The position of the peak as a fraction of the width, from 0 to 1.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If t is empty, width is not above 0, or skew is not from 0 to 1.

    Examples
    --------
    >>> import qx
    >>> qx.signals.triangle_pulse([-0.5, -0.25, 0.0, 0.25])
    array([0. , 0.5, 1. , 0.5])
    """
    return _of_times("triangle_pulse", t, float(amplitude), 0.0, 1.0, float(width), float(skew))


def periodic_sinc(t: ArrayLike, order: int, amplitude: float = 1.0) -> NDArray[np.float64]:
    r"""The periodic cardinal sine (Dirichlet kernel).

    .. math:: x = A \frac{\sin(N t / 2)}{N \sin(t / 2)}

    Parameters
    ----------
    t : array_like
        Times.
    order : int
        The order N.
    amplitude : float
        The largest magnitude.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If t is empty or order is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.signals.periodic_sinc([0.0, 1.0], 3).round(6)
    array([1.      , 0.693535])
    """
    order = whole_number("signals.periodic_sinc", "order", order, 1, "ErrNotStrictlyPositive")
    return _of_times("periodic_sinc", t, float(amplitude), order, 1.0, 0.0)


def phase_modulated(x: ArrayLike, fc: float, fs: float = 1.0) -> NDArray[np.float64]:
    r"""A sine of frequency fc whose phase is shifted by x.

    .. math:: y_i = \sin(2\pi f_c (i + 1) / f_s + x_i)

    Parameters
    ----------
    x : array_like
        Phases in radians.
    fc : float
        The frequency of the carrier, in the unit of fs.
    fs : float
        The sampling rate.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x does not have one dimension, or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.phase_modulated([0.0, 0.0, 1.57079632679], 0.25).round(6)
    array([ 1.,  0., -0.])
    """
    return _modulated("phase_modulated", np.degrees(vector(x, "signals.phase_modulated", "x")), fc, fs)


def frequency_modulated(x: ArrayLike, fc: float, fs: float = 1.0) -> NDArray[np.float64]:
    r"""A sine whose frequency is fc + x.

    .. math:: y_i = \sin\Big(\frac{2\pi}{f_s} \sum_{j \le i} (f_c + x_j)\Big)

    Parameters
    ----------
    x : array_like
        Frequencies, in the unit of fs.
    fc : float
        The frequency of the carrier, in the unit of fs.
    fs : float
        The sampling rate.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x does not have one dimension, or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.signals.frequency_modulated([0.0, 0.0, 0.25, 0.0], 0.25).round(6) + 0.0
    array([1., 0., 0., 1.])
    """
    return _modulated("frequency_modulated", vector(x, "signals.frequency_modulated", "x"), fc, fs)


def _modulated(name: Any, x: Any, fc: Any, fs: Any) -> Any:
    if not fs > 0:
        refuse(f"signals.{name}", "fs", f"must be above 0; got {fs}", "ErrSamplingNotPositive")
    return getattr(core, name)(len(x), 1 / fs, float(fc), np.asarray(x, float), 0.0, 0.0)[1]


def detrend(x: ArrayLike, type: Literal["linear", "constant"] | int = "linear", axis: int = LAST) -> Any:
    """The values less their mean, least-squares line or least-squares polynomial.

    Parameters
    ----------
    x : array_like
        Real values.
    type : {"linear", "constant"} or int
        What is subtracted; a number is the order of a polynomial, up to 50.
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If x is too short for the order, or type is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.signals.detrend([1.0, 2.0, 4.0, 5.0]).round(6)
    array([ 0.1, -0.3,  0.3, -0.1])
    """
    order = type if isinstance(type, int) and type is not True else \
        chosen("signals.detrend", "type", type, {"linear": 1, "constant": 0})
    order = whole_number("signals.detrend", "type", order, 0, "ErrPolynomialOrderNegative")

    def of_channel(channel: Any) -> Any:
        if len(channel) <= order:
            refuse("signals.detrend", "x", f"more than {order} values are needed; got {len(channel)}",
                   "ErrPolynomialOrderTooHigh")
        t = np.linspace(-1, 1, len(channel)) if len(channel) > 1 else np.zeros(1)
        if not order:
            return channel - np.mean(channel)
        if order > LOW_ORDER:
            return channel - core.detrend_high(t, channel, order, EMPTY, -1.0, [], [])[0]
        return channel - core.detrend(t, channel, order, EMPTY, 0, [], [])[0]

    return along(of_channel, x, axis)


def unwrap(x: ArrayLike, period: float = 2 * math.pi, axis: int = LAST) -> Any:
    """Phases without jumps: each is shifted by whole periods to within half a period of its predecessor.

    Parameters
    ----------
    x : array_like
        Phases.
    period : float
        The period of the phases: 2 pi, 360, 1, ...
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.signals.unwrap([0.0, 350.0, 340.0, 10.0], 360)
    array([  0., -10., -20.,  10.])
    """
    if period == 2 * math.pi:
        return along(lambda channel: core.unwrap(channel, 0), x, axis)
    if period == 360:
        return along(lambda channel: core.unwrap(channel, 2), x, axis)
    scale = 2 * math.pi / positive("signals.unwrap", "period", period)
    return along(lambda channel: core.unwrap(channel * scale, 0) / scale, x, axis)


def standardize(x: ArrayLike, axis: int = LAST) -> Any:
    """The values shifted and scaled to mean 0 and standard deviation 1.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x; NaN where all values are equal.

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.signals.standardize([1.0, 3.0])
    array([-1.,  1.])
    """
    return along(lambda channel: core.standardize(channel)[0], x, axis)


def rescale(x: ArrayLike, low: float = -1.0, high: float = 1.0, axis: int = LAST) -> Any:
    """The values shifted and scaled so that the least is low and the greatest is high.

    Parameters
    ----------
    x : array_like
        Real values.
    low, high : float
        The new bounds.
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.signals.rescale([1.0, 2.0, 5.0], 0, 1)
    array([0.  , 0.25, 1.  ])
    """
    return along(lambda channel: (core.rescale(channel)[0] + 1) * ((high - low) / 2) + low, x, axis)


def _method(function: Any, method: Any, x: Any, y: Any) -> Any:
    if method == "auto":
        return int(min(len(x), len(y)) > DIRECT)
    return chosen(function, "method", method, {"auto": 1, **METHODS})


def _part(full: Any, mode: Any, function: Any, nx: Any, ny: Any) -> Any:
    """What `mode` keeps of the full result."""
    mode = chosen(function, "mode", mode, {"full": "full", "same": "same", "valid": "valid"})
    if mode == "full":
        return full
    size = nx if mode == "same" else max(nx, ny) - min(nx, ny) + 1
    first = (len(full) - size) // 2
    return full[first:first + size]


def _both(function: str, x: ArrayLike, y: ArrayLike) -> tuple[NDArray[Any], NDArray[Any], bool]:
    x, y = vector(x, function, "x"), vector(y, function, "y")
    if not len(x) or not len(y):
        refuse(function, "x, y", "an array is empty", "ErrEmptyInput")
    return x, y, x.dtype.kind == "c" or y.dtype.kind == "c"


def convolve(x: ArrayLike, y: ArrayLike, mode: Literal["full", "same", "valid"] = "full",
             method: Literal["auto", "direct", "fft"] = "auto") -> NDArray[Any]:
    r"""The convolution of two sequences.

    .. math:: z_t = \sum_i x_i y_{t-i}

    Parameters
    ----------
    x, y : array_like
        Real or complex values.
    mode : {"full", "same", "valid"}
        "full" returns all nx + ny - 1 values, "same" the middle nx values, and "valid" the values to which
        all of the shorter sequence contributes.
    method : {"auto", "direct", "fft"}
        Direct sums, which are exact to rounding, or transforms, which are faster for long sequences.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If an array is empty or does not have one dimension, or an option is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.signals.convolve([1.0, 2.0, 3.0], [1.0, -1.0])
    array([ 1.,  1.,  1., -3.])
    """
    x, y, is_complex = _both("signals.convolve", x, y)
    method = _method("signals.convolve", method, x, y)
    full = core.convolve_complex(x, y, method, 0, 0) if is_complex else core.convolve(x, y, method)
    return _part(full, mode, "signals.convolve", len(x), len(y))


def correlate(x: ArrayLike, y: ArrayLike, mode: Literal["full", "same", "valid"] = "full",
              method: Literal["auto", "direct", "fft"] = "auto",
              normalization: Literal["none", "unbiased", "biased"] = "none") -> NDArray[Any]:
    r"""The cross-correlation of two sequences.

    .. math:: z_k = \sum_l x_l\, \overline{y_{l - k + n_y - 1}}

    Parameters
    ----------
    x, y : array_like
        Real or complex values.
    mode : {"full", "same", "valid"}
        As for `convolve`; in the full result lag 0 is at ny - 1.
    method : {"auto", "direct", "fft"}
        As for `convolve`.
    normalization : {"none", "unbiased", "biased"}
        What each lag is divided by: nothing, the number of its terms, or the greater length.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        As for `convolve`.

    Examples
    --------
    >>> import qx
    >>> qx.signals.correlate([1.0, 2.0, 3.0], [0.0, 1.0, 0.5])
    array([0.5, 2. , 3.5, 3. , 0. ])
    """
    x, y, is_complex = _both("signals.correlate", x, y)
    method = _method("signals.correlate", method, x, y)
    norm = chosen("signals.correlate", "normalization", normalization, NORMALIZATIONS)
    full = core.convolve_complex(y, x, method, 1, norm) if is_complex else core.correlate(y, x, method, norm)
    return _part(full, mode, "signals.correlate", len(x), len(y))


def autocorrelate(x: ArrayLike, normalization: Literal["none", "unbiased", "biased"] = "none",
                  axis: int = LAST) -> NDArray[np.float64]:
    """The autocorrelation of n real values: 2 n - 1 lags, with lag 0 in the middle.

    Parameters
    ----------
    x : array_like
        Real values.
    normalization : {"none", "unbiased", "biased"}
        As for `correlate`.
    axis : int
        The axis along which to work.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x is empty, or normalization is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.signals.autocorrelate([1.0, 2.0]).round(12)
    array([2., 5., 2.])
    """
    norm = chosen("signals.autocorrelate", "normalization", normalization, NORMALIZATIONS)
    return along(lambda channel: core.autocorrelate(channel, norm), x, axis)


def correlation_matrix(x: ArrayLike, max_lag: int, y: ArrayLike | None = None,
                       normalization: Literal["none", "unbiased", "biased"] = "none") -> NDArray[Any]:
    r"""The correlation matrix of order max_lag + 1, a Toeplitz matrix.

    .. math:: R_{ij} = r(i - j), \quad r(k) = \sum_l x_{l+k}\, \overline{y_l}

    Parameters
    ----------
    x : array_like
        Real or complex values.
    max_lag : int
        The largest lag, at least 0 and below the number of values.
    y : array_like, optional
        The same number of values; x by default, which makes the matrix symmetric (Hermitian).
    normalization : {"none", "unbiased", "biased"}
        As for `correlate`.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If the arrays are empty or differ in length, max_lag is out of range, or normalization is not a
        valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.signals.correlation_matrix([1.0, 2.0, 0.0], 1)
    array([[5., 2.],
           [2., 5.]])
    """
    x, y, is_complex = _both("signals.correlation_matrix", x, x if y is None else y)
    most = whole_number("signals.correlation_matrix", "max_lag", max_lag, 0, "ErrIndexOutOfRange")
    norm = chosen("signals.correlation_matrix", "normalization", normalization, NORMALIZATIONS)
    return (core.correlation_matrix_complex if is_complex else core.correlation_matrix)(x, y, most, norm)


def deconvolve(xy: ArrayLike, y: ArrayLike) -> NDArray[np.float64]:
    """The sequence whose convolution with y is xy. A remainder of the division stays in the result.

    Parameters
    ----------
    xy, y : array_like
        Real values; y is not longer than xy.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If an array is empty or y is longer than xy.

    Examples
    --------
    >>> import qx
    >>> qx.signals.deconvolve([1.0, 1.0, 1.0, -3.0], [1.0, -1.0]).round(12)
    array([1., 2., 3.])
    """
    xy, y, _ = _both("signals.deconvolve", xy, y)
    if len(y) > len(xy):
        refuse("signals.deconvolve", "y", "must not be longer than xy", "ErrSizesDisagree")
    return core.deconvolve(xy, y)


def _matrices(function: Any, x: Any, y: Any, method: Any) -> Any:
    x, y = as_array(x), as_array(y)
    if x.ndim != 2 or y.ndim != 2:
        refuse(function, "x, y", f"two dimensions are needed; got {x.ndim} and {y.ndim}", "ErrSizesDisagree")
    if method == "auto":
        method = "fft" if y.size > DIRECT else "direct"
    return x, y, chosen(function, "method", method, METHODS), "c" in x.dtype.kind + y.dtype.kind


def convolve2(x: ArrayLike, y: ArrayLike, mode: Literal["full", "same", "valid"] = "full",
              method: Literal["auto", "direct", "fft"] = "auto") -> NDArray[Any]:
    r"""The convolution of two matrices.

    .. math:: z_{rc} = \sum_i \sum_j x_{ij} y_{r-i,\,c-j}

    Parameters
    ----------
    x, y : array_like
        Matrices, real or complex.
    mode : {"full", "same", "valid"}
        "full" returns all values, "same" the size of x, starting half of y's rows and columns in, and
        "valid" the values where y lies wholly within x.
    method : {"auto", "direct", "fft"}
        Direct sums or transforms.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a matrix is empty, y exceeds x in mode "valid", or an option is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.signals.convolve2([[1.0, 2.0]], [[1.0], [1.0]])
    array([[1., 2.],
           [1., 2.]])
    """
    x, y, method, is_complex = _matrices("signals.convolve2", x, y, method)
    size = chosen("signals.convolve2", "mode", mode, {"full": 0, "same": 1, "valid": 2})
    return (core.convolve2_complex if is_complex else core.convolve2)(x, y, size, method)


def correlate2(x: ArrayLike, y: ArrayLike, method: Literal["auto", "direct", "fft"] = "auto") -> NDArray[Any]:
    r"""The cross-correlation of two matrices at all lags. Lag 0 is at the index of the last row and column
    of y.

    .. math:: z_{rc} = \sum_i \sum_j x_{ij}\, \overline{y_{i - r + m - 1,\, j - c + n - 1}}

    Parameters
    ----------
    x, y : array_like
        Matrices, real or complex.
    method : {"auto", "direct", "fft"}
        Direct sums or transforms.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a matrix is empty, or method is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.signals.correlate2([[1.0, 2.0]], [[1.0, 1.0]])
    array([[1., 3., 2.]])
    """
    x, y, method, is_complex = _matrices("signals.correlate2", x, y, method)
    return (core.correlate2_complex if is_complex else core.correlate2)(y, x, method)
