"""Change of the sampling rate, moving sums and shifts in frequency, of whole signals and of streams.

Each function has a class of its name's stream: blocks of any size give the bits of one piece.
"""

from __future__ import annotations

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

ATTENUATION = 123.0  # dB by the estimate, 122 by the spectrum of the taps, of what would fold back
PASSBAND = 0.9  # the part of the lower band that passes unchanged
OVERSAMPLE, HALF_KERNEL = 256, 32  # entries a sample, and samples to each side, of the kernel of respace
ALL_TYPES = tuple(map(np.dtype, (np.float64, np.complex128, np.float32, np.complex64)))


def low_pass(up: int, down: int, attenuation: float = ATTENUATION,
             passband: float = PASSBAND) -> NDArray[np.float64]:
    """The taps for a change of the rate by up / down: a cardinal sine under a Kaiser window, of odd
    number and unit sum.

    The estimates of length and shape are those of J. F. Kaiser, "Nonrecursive digital filter design
    using the I0-sinh window function", 1974.

    Parameters
    ----------
    up, down : int
        The factors of the rate.
    attenuation : float
        How far down is, in dB, what would fold back.
    passband : float
        The part of the lower band that passes unchanged, below 1.

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
        refuse("multirate.low_pass", "up, down", f"must be below 2^31; {up} and {down} came", "ErrSizesDisagree")
    edge = 1 / max(up, down)  # of the lower band, 1 being half the rate of the grid
    width = edge * (1 - passband)
    half = math.ceil((attenuation - 7.95) / (2.285 * math.pi * width) / 2)
    cutoff = edge * (1 + passband) / 2
    taps = np.sinc(cutoff * np.arange(-half, half + 1)) * np.kaiser(2 * half + 1, 0.1102 * (attenuation - 8.7))
    return taps / taps.sum()


def _ratio(function: Any, up: Any, down: Any) -> Any:
    up, down = (whole_number(function, name, value, 1, "ErrNotStrictlyPositive")
                for name, value in (("up", up), ("down", down)))
    common = math.gcd(up, down)
    return up // common, down // common


class Resampler(Stream):
    """The stream of `resample`. The first value stays at time 0; `finish()` returns the last values,
    whose filter reaches beyond the end.

    Parameters
    ----------
    up, down : int
        The new rate is up / down times the old one.
    channels : int, optional
        How many channels a block of two dimensions has; without it blocks have one dimension.
    axis : int
        The axis of time in a block of two dimensions.
    dtype : type
        Of the samples; `numpy.float32` and `numpy.complex64` stay as they are.
    taps : array_like, optional
        A symmetric filter of odd length and unit sum, at the rate `up` times the old one; that of
        `low_pass` by default.

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
        taps = low_pass(self.up, self.down) if taps is None else vector(taps, "multirate.resample", "taps")
        if len(taps) % 2 == 0:
            refuse("multirate.resample", "taps", f"an odd number is needed; {len(taps)} came", "ErrBadTapCount")
        single = np.dtype(dtype) in (np.float32, np.complex64)
        self.taps = np.asarray(taps, np.float32 if single else float)
        self._run = {"float64": "resample", "complex128": "resample_complex", "float32": "resample_single",
                     "complex64": "resample_complex_single"}.get(np.dtype(dtype).name, "")
        super().__init__(channels, axis, dtype)

    def _start(self) -> Any:
        """State, delay to be taken off, phase, values read and written."""
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
        Real or complex values; single precision stays.
    up, down : int
        The new rate is up / down times the old one.
    axis : int
        The axis of time.
    taps : array_like, optional
        A symmetric filter of odd length and unit sum, at the rate `up` times the old one; by default that
        of `low_pass`, which leaves 90 % of the lower band unchanged and takes 122 dB from what would fold
        back.

    Returns
    -------
    ndarray
        With n up / down values, rounded up, for n.

    Raises
    ------
    ValueError
        If a factor is below 1, or taps are not of odd number.

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

    taps = low_pass(*_ratio("multirate.resample", up, down)) if taps is None else taps
    return along(of_channel, x, axis)


def respace(x: ArrayLike, spacing: float, start: float = 0.0, axis: int = LAST) -> NDArray[Any]:
    """The signal at any constant spacing of times, which need not be a ratio of whole numbers: by a
    cardinal sine under a Kaiser window, read along lines between 256 entries a sample.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    spacing : float
        The time between the new values, in samples of x; above 1 what would fold back is taken away.
    start : float
        The time of the first value, in samples of x.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray
        At the times start + k spacing up to that of the last sample. The error is below 5e-5 of
        the largest value up to 0.4 of the lower rate.

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
               f"{spacing} and {start} came",
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
    """The signal at any times, which need not be evenly spaced, by the kernel of `respace`. Before the first
    and behind the last sample the signal is 0.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    times : array_like
        Of the new values, from the first sample, in any order; rising for anti_alias.
    fs : float
        The sampling rate of x.
    anti_alias : bool
        Take away what would fold back where times are further apart than samples: the kernel is
        stretched by the gap before each time.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If x is empty, fs is not above 0, a time is not finite, or times do not rise with anti_alias.

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
        refuse(name, "fs", f"must be above 0; {fs} came", "ErrSamplingNotPositive")
    at = vector(times, name, "times") * float(fs)
    if not np.all(np.isfinite(at)):
        refuse(name, "times", "must be finite", "ErrNonFiniteInput")
    gaps = np.diff(at)
    if anti_alias and np.any(gaps <= 0):
        refuse(name, "times", "must rise for anti_alias", "ErrAbscissaeOrder")
    design = {"mode": 0, "antiAlias": int(anti_alias), "proto": _kernel(), "oversample": OVERSAMPLE}
    stretch = min(max(gaps.max(initial=1.0), 1.0), OVERSAMPLE) if anti_alias else 1.0
    behind = math.ceil(stretch * (HALF_KERNEL + 2)) + 2

    def of_channel(channel: Any) -> Any:
        if not len(channel):
            refuse(name, "x", "is empty", "ErrEmptyInput")
        is_complex = channel.dtype.kind == "c"
        # What reads only zeros need not be read: times far away become the next ones that do.
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
        How many samples they are apart.
    channels : int, optional
        How many channels a block of two dimensions has; without it blocks have one dimension.
    axis : int
        The axis of time in a block of two dimensions.

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
    r"""A filter whose taps are several samples apart: a sharp filter of few taps, whose passband repeats
    at multiples of 1 / spacing (interpolated FIR filter).

    .. math:: y_i = \sum_k h_k x_{i - k L}

    Y. Neuvo, C.-Y. Dong and S. K. Mitra, "Interpolated finite impulse response filters", 1984.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    taps : array_like
        The taps, real.
    spacing : int
        How many samples they are apart.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray
        Of the shape of x.

    Raises
    ------
    ValueError
        If there is no tap, or spacing is below 1.

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
    """The table of the kernel: OVERSAMPLE entries a sample, unit sum."""
    t = np.arange(-HALF_KERNEL * OVERSAMPLE, HALF_KERNEL * OVERSAMPLE + 1) / OVERSAMPLE
    kernel = np.sinc(0.9 * t) * np.kaiser(len(t), 0.1102 * (100 - 8.7))
    return kernel / kernel.sum()


class Decimator(Stream):
    """The stream of `decimate` without a filter: every factor-th value, or the means of groups.

    Parameters
    ----------
    factor : int
        How many values become one.
    average : bool
        The mean of each group in place of its first value.
    channels : int, optional
        How many channels a block of two dimensions has; without it blocks have one dimension.
    axis : int
        The axis of time in a block of two dimensions.
    dtype : {float, complex}
        Of the samples.

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
    """Every factor-th value: behind a filter, of means, or as they are.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    factor : int
        How many values become one.
    method : {"filter", "average", "pick"}
        The filter of `resample`, without delay; the means of groups; the first of each group, whatever
        folds back. The last two drop what is behind the last whole group or keep its first value.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If factor is below 1, or method is none of its words.

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
        How many values a sum has.
    stages : int
        How many moving sums follow each other.
    channels : int, optional
        How many channels a block of two dimensions has; without it blocks have one dimension.
    axis : int
        The axis of time in a block of two dimensions.
    dtype : {float, complex}
        Of the samples.

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
    r"""The sums of each value and the width - 1 before it, zeros before the first one.

    .. math:: y_i = \sum_{j=0}^{w-1} x_{i-j}

    The sums are running ones: each rounding error stays.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    width : int
        How many values a sum has.
    stages : int
        How many moving sums follow each other.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray, or what x is of pandas
        Of the shape of x.

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
    """The sums of `moving_sum` over the number of their values, width^stages: before the width-th value,
    whose sum has fewer, they begin from 0.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    width : int
        How many values a mean has.
    stages : int
        How many moving means follow each other.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray, or what x is of pandas
        Of the shape of x.

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
    """Decimation behind a cascaded integrator-comb filter of unit gain at frequency 0.

    Parameters
    ----------
    x : array_like
        Real values.
    factor : int
        How many values become one.
    stages : int
        How many stages the filter has.
    differential_delay : int
        The delay of the combs, in values of the lower rate.
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
    """Interpolation by a cascaded integrator-comb filter of unit gain at frequency 0.

    Parameters
    ----------
    x : array_like
        Real values.
    factor : int
        How many values each one becomes.
    stages : int
        How many stages the filter has.
    differential_delay : int
        The delay of the combs, in values of the lower rate.
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
    """The stream of `shift_frequency`; the blocks of a complex signal join without a jump of the phase,
    to rounding.

    Parameters
    ----------
    frequency : float
        By how much, in the unit of fs.
    fs : float
        The sampling rate.
    channels : int, optional
        How many channels a block of two dimensions has; without it blocks have one dimension.
    axis : int
        The axis of time in a block of two dimensions.
    dtype : {float, complex}
        Of the samples; what comes out is complex.

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
            refuse("multirate.FrequencyShift", "fs", f"must be above 0; {fs} came", "ErrSamplingNotPositive")
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
        By how much, in the unit of fs.
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
