"""Changes of the sampling rate, moving sums and frequency shifts, for whole signals and for streams.

Most functions have a stream class, which takes blocks of any size and returns the same bits as a single call.
"""

from __future__ import annotations

import functools
import math
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, DTypeLike, NDArray

from .topical import LAST, Stream, along, chosen, either, refuse, served, vector, whole_number

__all__ = ["Decimator", "FrequencyShift", "InterpolatedFIR", "MovingSum", "Resampler", "cic_decimate", "cic_interpolate",
           "decimate", "interpolated_fir", "low_pass", "moving_average", "moving_sum", "resample", "resample_at",
           "respace",           "shift_frequency"]

EMPTY = np.empty(0)
core = served("multirate")

ATTENUATION = 123.0  # of what would alias, in dB: 123 by the estimate, 122 by the spectrum of the taps
PASSBAND = 0.9  # the fraction of the lower band that passes unchanged
OVERSAMPLE, HALF_KERNEL = 256, 32  # of the kernel of respace: entries per sample, samples to each side
ALL_TYPES = tuple(map(np.dtype, (np.float64, np.complex128, np.float32, np.complex64)))


def low_pass(up: int, down: int, attenuation: float = ATTENUATION,
             passband: float = PASSBAND) -> NDArray[np.float64]:
    """The taps for a change of the rate by up / down: an odd number of samples of a cardinal sine under a
    Kaiser window, with unit sum.

    The estimates of length and shape are those of J. F. Kaiser, "Nonrecursive digital filter design
    using the I0-sinh window function", 1974.

    Parameters
    ----------
    up, down : int
        The factors of the rate.
    attenuation : float
        The attenuation of what would alias, in dB.
    passband : float
        The fraction of the lower band that passes unchanged, below 1.

    Returns
    -------
    ndarray of float64

    Examples
    --------
    >>> import qx
    >>> len(qx.multirate.low_pass(3, 2))
    483
    """
    up, down = (whole_number("multirate.low_pass", name, value, 1, "ErrNotStrictlyPositive")
                for name, value in (("up", up), ("down", down)))
    if max(up, down) >= 2**31:
        refuse("multirate.low_pass", "up, down", f"must be below 2^31; got {up} and {down}", "ErrSizesDisagree")
    edge = 1 / max(up, down)  # the edge of the lower band; 1 is half the rate of the grid
    width = edge * (1 - passband)
    half = math.ceil((attenuation - 7.95) / (2.285 * math.pi * width) / 2)
    cutoff = edge * (1 + passband) / 2
    taps = np.sinc(cutoff * np.arange(-half, half + 1)) * np.kaiser(2 * half + 1, 0.1102 * (attenuation - 8.7))
    return taps / taps.sum()


@functools.lru_cache(maxsize=16)
def _kept(up: int, down: int) -> NDArray[np.float64]:
    taps = low_pass(up, down)
    taps.flags.writeable = False
    return taps


def _taps(up: int, down: int) -> NDArray[np.float64]:
    """Those of `low_pass`, whose design takes longer than most signals: few of them are kept."""
    return _kept(up, down) if max(up, down) <= 1000 else low_pass(up, down)


def _ratio(function: Any, up: Any, down: Any) -> Any:
    up, down = (whole_number(function, name, value, 1, "ErrNotStrictlyPositive")
                for name, value in (("up", up), ("down", down)))
    common = math.gcd(up, down)
    return up // common, down // common


class Resampler(Stream):
    """The stream of `resample`. The first value stays at time 0. `finish()` returns the last values, which
    the filter computes from beyond the end.

    Parameters
    ----------
    up, down : int
        The new rate is up / down times the old one.
    channels : int, optional
        Number of channels of a two-dimensional block; without it, blocks have one dimension.
    axis : int
        The axis of time in a two-dimensional block.
    dtype : type
        The type of the samples; `numpy.float32` and `numpy.complex64` are kept.
    taps : array_like, optional
        A symmetric filter of odd length and unit sum, at `up` times the old rate; by default, that of
        `low_pass`.

    Examples
    --------
    >>> import numpy as np, qx
    >>> stream, x = qx.multirate.Resampler(3, 2), qx.signals.sine(1000, 0.01)
    >>> found = np.concatenate([stream(x[:300]), stream(x[300:]), stream.finish()])
    >>> bool((found == qx.multirate.resample(x, 3, 2)).all())
    True
    """

    dtypes = ALL_TYPES

    def __init__(self, up: int, down: int, channels: int | None = None, axis: int = -1,
                 dtype: DTypeLike = float, taps: ArrayLike | None = None) -> None:
        self.up, self.down = _ratio("multirate.Resampler", up, down)
        taps = _taps(self.up, self.down) if taps is None else vector(taps, "multirate.resample", "taps")
        if len(taps) % 2 == 0:
            refuse("multirate.resample", "taps", f"an odd number is needed; got {len(taps)}", "ErrBadTapCount")
        single = np.dtype(dtype) in (np.float32, np.complex64)
        self.taps = np.asarray(taps, np.float32 if single else float)
        self._run = {"float64": "resample", "complex128": "resample_complex", "float32": "resample_single",
                     "complex64": "resample_complex_single"}.get(np.dtype(dtype).name, "")
        super().__init__(channels, axis, dtype)

    def _start(self) -> Any:
        """State, delay still to be removed, phase, numbers of values read and written."""
        return None, 0, 0, 0, 0

    def _step(self, begun: Any, block: Any) -> Any:
        state, delay, phase, read, written = begun
        if self.up == self.down:
            return block.copy(), begun
        is_new = state is None
        found, state, delay, phase = getattr(core, self._run)(
            block, np.empty(0, self.dtype) if is_new else state, 3, self.up, self.down, self.taps, 1.0,
            int(is_new), 1, delay, phase)
        return found, (state, delay, phase, read + len(block), written + len(found))

    def _end(self, begun: Any) -> Any:
        read, written = begun[3:]
        due = -(-read * self.up // self.down) - written
        if due <= 0:
            return np.empty(0, self.dtype)
        behind = np.zeros(len(self.taps) // 2 // self.up + 1 + self.down, self.dtype)
        return self._step(begun, behind)[0][:due]


def resample(x: ArrayLike, up: int, down: int = 1, axis: int = LAST,
             taps: ArrayLike | None = None) -> NDArray[Any]:
    """The signal at up / down times its rate, without delay.

    Parameters
    ----------
    x : array_like
        Real or complex values; single precision is kept.
    up, down : int
        The new rate is up / down times the old one.
    axis : int
        The axis of time.
    taps : array_like, optional
        A symmetric filter of odd length and unit sum, at `up` times the old rate. By default, that of
        `low_pass`, which leaves 90 % of the lower band unchanged and attenuates what would alias by 122 dB.

    Returns
    -------
    ndarray
        n up / down values, rounded up, for n values of x.

    Raises
    ------
    ValueError
        If a factor is below 1, or the number of taps is even.

    Examples
    --------
    >>> import qx
    >>> x = qx.signals.sine(1000, 10, fs=1000)
    >>> found = qx.multirate.resample(x, 441, 480)
    >>> len(found), bool(abs(found[400:500] - qx.signals.sine(919, 10, fs=918.75)[400:500]).max() < 1e-5)
    (919, True)
    """
    def of_channel(channel: Any) -> Any:
        dtype = channel.dtype if channel.dtype in ALL_TYPES else np.dtype(float)
        stream = Resampler(up, down, dtype=dtype, taps=taps)
        begun = stream(channel)
        return np.concatenate([begun, stream.finish()])

    taps = _taps(*_ratio("multirate.resample", up, down)) if taps is None else taps
    return along(of_channel, x, axis)


def respace(x: ArrayLike, spacing: float, start: float = 0.0, axis: int = LAST) -> NDArray[Any]:
    """The signal at any constant time spacing, which need not be a ratio of whole numbers. The kernel is a
    cardinal sine under a Kaiser window, interpolated linearly between 256 entries per sample.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    spacing : float
        The time between the new values, in samples of x. Above 1, what would alias is removed.
    start : float
        The time of the first value, in samples of x.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray
        The values at the times start + k spacing, up to the time of the last sample. For frequencies up to
        0.4 of the lower rate, the error is below 5e-5 of the largest value.

    Raises
    ------
    ValueError
        If x is empty, spacing is not above 0, or start is negative.

    Examples
    --------
    >>> import qx
    >>> found = qx.multirate.respace(qx.signals.sine(400, 0.01), 0.7071)
    >>> bool(abs(found[200:300] - qx.signals.sine(566, 0.01 * 0.7071)[200:300]).max() < 1e-5)
    True
    """
    name = "multirate.respace"
    if not 0 < spacing < 2**31 or not 0 <= start < math.inf:
        refuse(name, "spacing, start", "must be above 0 and below 2^31, and finite and at least 0; "
               f"got {spacing} and {start}",
               "ErrSamplingNotPositive")
    kernel = _kernel()
    design = {"ratio": float(spacing), "mode": 0, "start": float(start), "proto": kernel, "oversample": OVERSAMPLE}

    def of_channel(channel: Any) -> Any:
        n = len(channel)
        if not n:
            refuse(name, "x", "is empty", "ErrEmptyInput")
        count = int(math.floor((n - 1 - start) / spacing)) + 1 if start <= n - 1 else 0
        behind = math.ceil(max(spacing, 1.0) * (HALF_KERNEL + 2)) + 2
        long = np.concatenate([channel, np.zeros(behind, channel.dtype)])
        run = core.respace_complex if channel.dtype.kind == "c" else core.respace
        _, found, made = run(long, {}, design, 1, 1)
        return found[:min(count, made)]

    return along(of_channel, x, axis)


def resample_at(x: ArrayLike, times: ArrayLike, fs: float = 1.0, anti_alias: bool = False,
                axis: int = LAST) -> NDArray[Any]:
    """The signal at arbitrary times, which need not be evenly spaced, by the kernel of `respace`. The signal
    is taken as 0 before the first sample and after the last.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    times : array_like
        The times of the new values, from the first sample, in any order; increasing for anti_alias.
    fs : float
        The sampling rate of x.
    anti_alias : bool
        Whether to remove what would alias where the times are further apart than the samples. The kernel
        is stretched by the gap before each time.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If x is empty, fs is not above 0, a time is not finite, or times are not increasing with anti_alias.

    Examples
    --------
    >>> import numpy as np, qx
    >>> times = np.array([0.2, 0.203, 0.2061])
    >>> found = qx.multirate.resample_at(qx.signals.sine(400, 7.0, fs=1000), times, fs=1000)
    >>> bool(abs(found - np.sin(2 * np.pi * 7 * times)).max() < 1e-5)
    True
    """
    name = "multirate.resample_at"
    if not fs > 0:
        refuse(name, "fs", f"must be above 0; got {fs}", "ErrSamplingNotPositive")
    at = vector(times, name, "times") * float(fs)
    if not np.all(np.isfinite(at)):
        refuse(name, "times", "must be finite", "ErrNonFiniteInput")
    gaps = np.diff(at)
    if anti_alias and np.any(gaps <= 0):
        refuse(name, "times", "must be increasing for anti_alias", "ErrAbscissaeOrder")
    design = {"mode": 0, "antiAlias": int(anti_alias), "proto": _kernel(), "oversample": OVERSAMPLE}
    stretch = min(max(gaps.max(initial=1.0), 1.0), OVERSAMPLE) if anti_alias else 1.0
    behind = math.ceil(stretch * (HALF_KERNEL + 2)) + 2

    def of_channel(channel: Any) -> Any:
        if not len(channel):
            refuse(name, "x", "is empty", "ErrEmptyInput")
        is_complex = channel.dtype.kind == "c"
        # Far from the signal, the kernel reads only zeros: such times are moved to the nearest such place.
        clipped = np.clip(at, -behind, len(channel) - 1 + behind) if not anti_alias else at
        reach = max(math.ceil(clipped.max(initial=0.0)) + behind - len(channel), 0)
        long = np.concatenate([channel, np.zeros(reach, channel.dtype)])
        run = core.resample_at_complex if is_complex else core.resample_at
        last = at[0] - (gaps[0] if len(gaps) else 1.0) if len(at) else 0.0
        found, _, made, _ = run(long, clipped.astype(complex) if is_complex else clipped, design, float(last))
        assert made == len(at)
        return found

    return along(of_channel, x, axis)


class InterpolatedFIR(Stream):
    """The stream of `interpolated_fir`.

    Parameters
    ----------
    taps : array_like
        The taps, real.
    spacing : int
        The distance between taps, in samples.
    channels : int, optional
        Number of channels of a two-dimensional block; without it, blocks have one dimension.
    axis : int
        The axis of time in a two-dimensional block.

    Examples
    --------
    >>> import qx
    >>> stream = qx.multirate.InterpolatedFIR([1.0, -1.0], 2)
    >>> stream([1.0, 2.0, 4.0]), stream([8.0])
    (array([1., 2., 3.]), array([6.]))
    """

    dtypes = (np.dtype(float),)

    def __init__(self, taps: ArrayLike, spacing: int, channels: int | None = None, axis: int = -1) -> None:
        self.taps = vector(taps, "multirate.InterpolatedFIR", "taps").astype(float)
        if not len(self.taps):
            refuse("multirate.InterpolatedFIR", "taps", "are empty", "ErrOrderNotPositive")
        self.spacing = whole_number("multirate.InterpolatedFIR", "spacing", spacing, 1, "ErrNotStrictlyPositive")
        super().__init__(channels, axis)

    def _start(self) -> Any:
        return np.zeros((len(self.taps) - 1) * self.spacing)

    def _step(self, state: Any, block: Any) -> Any:
        found, state, _ = core.InterpolatedFIR(block, self.spacing, 1.0, self.taps, state, 0, 0)
        return found, state


def interpolated_fir(x: ArrayLike, taps: ArrayLike, spacing: int, axis: int = LAST) -> NDArray[Any]:
    r"""An interpolated FIR filter, whose taps are several samples apart: a sharp filter with few taps, whose
    pass band repeats at multiples of 1 / spacing.

    .. math:: y_i = \sum_k h_k x_{i - k L}

    Y. Neuvo, C.-Y. Dong and S. K. Mitra, "Interpolated finite impulse response filters", 1984.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    taps : array_like
        The taps, real.
    spacing : int
        The distance between taps, in samples.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray
        The same shape as x.

    Raises
    ------
    ValueError
        If there are no taps, or spacing is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.interpolated_fir([1.0, 2.0, 4.0, 8.0], [1.0, -1.0], 2)
    array([1., 2., 3., 6.])
    """
    stream = InterpolatedFIR(taps, spacing)

    def of_real(channel: Any) -> Any:
        return stream.copy()(channel)

    return either(of_real, lambda channel: of_real(channel.real) + 1j * of_real(channel.imag), x, axis)


def _kernel() -> Any:
    """The table of the kernel: OVERSAMPLE entries per sample, unit sum."""
    t = np.arange(-HALF_KERNEL * OVERSAMPLE, HALF_KERNEL * OVERSAMPLE + 1) / OVERSAMPLE
    kernel = np.sinc(0.9 * t) * np.kaiser(len(t), 0.1102 * (100 - 8.7))
    return kernel / kernel.sum()


class Decimator(Stream):
    """The stream of `decimate` without a filter: every factor-th value, or the mean of each group.

    Parameters
    ----------
    factor : int
        The size of a group, from which one value is returned.
    average : bool
        Whether to return the mean of each group rather than its first value.
    channels : int, optional
        Number of channels of a two-dimensional block; without it, blocks have one dimension.
    axis : int
        The axis of time in a two-dimensional block.
    dtype : {float, complex}
        The type of the samples.

    Examples
    --------
    >>> import qx
    >>> stream = qx.multirate.Decimator(2, average=True)
    >>> stream([1.0, 3.0, 5.0]), stream([7.0])
    (array([2.]), array([6.]))
    """

    def __init__(self, factor: int, average: bool = False, channels: int | None = None, axis: int = -1,
                 dtype: type[float] | type[complex] = float) -> None:
        self.factor = whole_number("multirate.Decimator", "factor", factor, 1, "ErrNotStrictlyPositive")
        self.average = bool(average)
        super().__init__(channels, axis, dtype)

    def _start(self) -> Any:
        return 0, 1, 0, self.dtype.type(0)

    def _step(self, state: Any, block: Any) -> Any:
        start, reset, count, total = state
        run = core.decimate_complex if self.dtype.kind == "c" else core.decimate
        found, start, count, total = run(block, self.factor, int(self.average), start, reset, count, total)
        return found, (start, 0, count, total)


def decimate(x: ArrayLike, factor: int, method: Literal["filter", "average", "pick"] = "filter",
             axis: int = LAST) -> NDArray[Any]:
    """Every factor-th value, after a filter, averaged over groups, or as it is.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    factor : int
        The size of a group, from which one value is returned.
    method : {"filter", "average", "pick"}
        "filter" uses the filter of `resample`, without delay. "average" returns the mean of each group and
        drops an incomplete last group. "pick" returns the first value of each group, including an
        incomplete last one, without regard to aliasing.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If factor is below 1, or method is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.decimate([1.0, 3.0, 5.0, 7.0], 2, "average")
    array([2., 6.])
    """
    way = chosen("multirate.decimate", "method", method, {"filter": 0, "average": 1, "pick": 2})
    factor = whole_number("multirate.decimate", "factor", factor, 1, "ErrNotStrictlyPositive")
    if not way:
        return resample(x, 1, factor, axis)

    def of_channel(channel: Any) -> Any:
        return Decimator(factor, way == 1, dtype=complex if channel.dtype.kind == "c" else float)(channel)

    return along(of_channel, x, axis)


class MovingSum(Stream):
    """The stream of `moving_sum`.

    Parameters
    ----------
    width : int
        Number of values in a sum.
    stages : int
        Number of moving sums, one after the other.
    channels : int, optional
        Number of channels of a two-dimensional block; without it, blocks have one dimension.
    axis : int
        The axis of time in a two-dimensional block.
    dtype : {float, complex}
        The type of the samples.

    Examples
    --------
    >>> import qx
    >>> stream = qx.multirate.MovingSum(2)
    >>> stream([1.0, 2.0]), stream([3.0])
    (array([1., 3.]), array([5.]))
    """

    def __init__(self, width: int, stages: int = 1, channels: int | None = None, axis: int = -1,
                 dtype: type[float] | type[complex] = float) -> None:
        self.width = whole_number("multirate.MovingSum", "width", width, 1, "ErrNotStrictlyPositive")
        self.stages = whole_number("multirate.MovingSum", "stages", stages, 1, "ErrNotStrictlyPositive")
        super().__init__(channels, axis, dtype)

    def _start(self) -> Any:
        return (np.zeros(self.stages, self.dtype), np.zeros((self.stages, self.width), self.dtype), 0)

    def _step(self, state: Any, block: Any) -> Any:
        if self.width == 1:
            return block.copy(), state
        run = core.moving_sum_complex if self.dtype.kind == "c" else core.moving_sum
        found, *state = run(block, self.stages, self.width, *state, 0)
        return found, tuple(state)


def moving_sum(x: ArrayLike, width: int, stages: int = 1, axis: int = LAST) -> Any:
    r"""The sums of each value and the width - 1 values before it, with zeros before the first value.

    .. math:: y_i = \sum_{j=0}^{w-1} x_{i-j}

    The sums are updated from value to value, so rounding errors accumulate.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    width : int
        Number of values in a sum.
    stages : int
        Number of moving sums, one after the other.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If width or stages is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.moving_sum([1.0, 2.0, 3.0], 2)
    array([1., 3., 5.])
    """
    return either(MovingSum(width, stages), MovingSum(width, stages, dtype=complex), x, axis) \
        if np.ndim(x) == 1 else along(lambda channel: moving_sum(channel, width, stages), x, axis)


def moving_average(x: ArrayLike, width: int, stages: int = 1, axis: int = LAST) -> Any:
    """The sums of `moving_sum` divided by width^stages. Since zeros are assumed before the first value, the
    means start from 0 and are too small before the width-th value.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    width : int
        Number of values in a mean.
    stages : int
        Number of moving means, one after the other.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If width or stages is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.moving_average([2.0, 2.0, 2.0, 5.0], 3)
    array([0.66666667, 1.33333333, 2.        , 3.        ])
    """
    return moving_sum(x, width, stages, axis) / float(width)**stages


def cic_decimate(x: ArrayLike, factor: int, stages: int = 3, differential_delay: int = 1,
                 axis: int = LAST) -> NDArray[np.float64]:
    """Decimation by a cascaded integrator-comb filter with unit gain at frequency 0.

    Parameters
    ----------
    x : array_like
        Real values.
    factor : int
        Number of input values for each output value.
    stages : int
        Number of stages of the filter.
    differential_delay : int
        The delay of the combs, in samples at the lower rate.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If a number is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.cic_decimate([1.0] * 6, 2, 1)
    array([0.5, 1. , 1. ])
    """
    return along(lambda channel: core.cic_decimate(channel, EMPTY, stages, factor, differential_delay, 0, 1, 0)[0],
                 x, axis)


def cic_interpolate(x: ArrayLike, factor: int, stages: int = 3, differential_delay: int = 1,
                    axis: int = LAST) -> NDArray[np.float64]:
    """Interpolation by a cascaded integrator-comb filter with unit gain at frequency 0.

    Parameters
    ----------
    x : array_like
        Real values.
    factor : int
        Number of output values for each input value.
    stages : int
        Number of stages of the filter.
    differential_delay : int
        The delay of the combs, in samples at the lower rate.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If a number is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.cic_interpolate([1.0, 2.0], 2, 1)
    array([1., 1., 2., 2.])
    """
    return along(lambda channel: core.cic_interpolate(channel, EMPTY, stages, factor, differential_delay, 0, 1, 0)[0],
                 x, axis)


class FrequencyShift(Stream):
    """The stream of `shift_frequency`. Successive blocks join without a phase jump; those of a complex
    signal, to within rounding.

    Parameters
    ----------
    frequency : float
        The shift, in the unit of fs.
    fs : float
        The sampling rate.
    channels : int, optional
        Number of channels of a two-dimensional block; without it, blocks have one dimension.
    axis : int
        The axis of time in a two-dimensional block.
    dtype : {float, complex}
        The type of the samples; the output is complex.

    Examples
    --------
    >>> import qx
    >>> stream = qx.multirate.FrequencyShift(0.25)
    >>> (stream([1.0]).round(12), stream([1.0]).round(12).imag)
    (array([1.+0.j]), array([1.]))
    """

    _output = complex

    def __init__(self, frequency: float, fs: float = 1.0, channels: int | None = None, axis: int = -1,
                 dtype: type[float] | type[complex] = float) -> None:
        if not fs > 0:
            refuse("multirate.FrequencyShift", "fs", f"must be above 0; got {fs}", "ErrSamplingNotPositive")
        self.frequency, self.fs = float(frequency), float(fs)
        super().__init__(channels, axis, dtype)

    def _start(self) -> Any:
        return 0.0

    def _step(self, phase: Any, block: Any) -> Any:
        if self.dtype.kind == "c":
            found, phase = core.shift_frequency_complex(block, self.frequency, self.fs, phase)
        else:
            phase, found = core.shift_frequency(block, self.frequency, self.fs, phase)
        return found, phase


def shift_frequency(x: ArrayLike, frequency: float, fs: float = 1.0,
                    axis: int = LAST) -> NDArray[np.complex128]:
    r"""The signal shifted in frequency.

    .. math:: y_i = x_i e^{2\pi \mathrm{j} f i / f_s}

    Parameters
    ----------
    x : array_like
        Real or complex values.
    frequency : float
        The shift, in the unit of fs.
    fs : float
        The sampling rate.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.multirate.shift_frequency([1.0, 1.0], 0.5).real
    array([ 1., -1.])
    """
    return either(FrequencyShift(frequency, fs), FrequencyShift(frequency, fs, dtype=complex), x, axis) \
        if np.ndim(x) == 1 else along(lambda channel: shift_frequency(channel, frequency, fs), x, axis)
