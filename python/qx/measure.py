"""Measurements on signals: peaks, levels, pulses and transitions, tones and harmonics, triggers, delays,
sound levels and octave bands.

Times and positions are measured from the first sample, in seconds if the sampling rate `fs` is given in Hz;
with its default of 1.0 they are in samples.
"""

from __future__ import annotations

import math
from typing import TYPE_CHECKING, Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from . import measuring, windows
from .outcomes import QxError
from .topical import (LAST, Result, Stream, along, along_pairs, by_channel, chosen, count_of, positive, refuse, result,
                      served, whole_number)

if TYPE_CHECKING:
    from . import filters

__all__ = ["Bands", "Cycles", "Harmonics", "Levels", "PeakFinder", "Peaks", "Pulse", "Tone", "Tones",
           "Trigger", "Triggers", "Vertices", "band_frequencies", "cycles", "delay",
           "harmonics", "levels", "octave_bands", "peaks", "pulses", "sound_level", "tone",
           "tones", "trigger", "weighting", "weighting_filter"]

core = served("measure")

POLARITIES = {"rising": 1, "falling": 0}
SLOPES = {"rising": 0, "falling": 1, "either": 2}
LEVELS = {"histogram": 0, "peak": 1, "auto": 2}


@result
class Peaks(Result):
    """Peaks in order of time; unpacks into positions and heights.

    Attributes
    ----------
    positions : ndarray
        The times of the peaks, interpolated by the parabola through the nearest samples.
    heights : ndarray
        The values of these parabolas at the peaks.
    prominences : ndarray
        How far each peak rises above its surroundings, up to the next higher peak.
    widths : ndarray
        The widths in time at half the prominence.
    indices : ndarray of int
        The indices of the samples that are higher than their neighbours; for a plateau, of its middle.
    """

    positions: NDArray[Any]
    heights: NDArray[Any]
    prominences: NDArray[Any]
    widths: NDArray[Any]
    indices: NDArray[Any]
    _unpacked = ("positions", "heights")

    def __len__(self) -> int:
        return len(self.positions)


@result
class Tone(Result):
    """A tone, amplitude cos(2 pi frequency t + phase) + offset.

    Attributes
    ----------
    frequency, amplitude, phase, offset : float
        The frequency in the unit of fs, the peak amplitude, the phase at the first sample in radians, and
        the constant offset.
    residual : float
        The root mean square of the residuals.
    """

    frequency: float
    amplitude: float
    phase: float
    offset: float
    residual: float


@result
class Tones(Result):
    """Several tones; unpacks into frequencies and amplitudes.

    Attributes
    ----------
    frequencies, amplitudes, phases : ndarray
        The frequencies in the unit of fs, the peak amplitudes, and the phases at the first sample in
        radians.
    residual : float
        The root mean square of the residuals.
    """

    frequencies: NDArray[Any]
    amplitudes: NDArray[Any]
    phases: NDArray[Any]
    residual: float
    _unpacked = ("frequencies", "amplitudes")


@result
class Harmonics(Result):
    """A tone and its harmonics, by the definitions of IEEE Std 1241-2010.

    Attributes
    ----------
    frequencies, amplitudes, phases : ndarray
        Of the fundamental and the harmonics; NaN for a harmonic that cannot be separated from others.
    thd : float
        The total harmonic distortion, as a ratio of amplitudes.
    sinad, snr, sfdr : float
        The signal to noise and distortion ratio, the signal to noise ratio and the spurious-free dynamic
        range, in dB.
    enob : float
        The effective number of bits.
    noise_floor : float
        The noise in a bin of the spectrum, in dB relative to the fundamental.
    """

    frequencies: NDArray[Any]
    amplitudes: NDArray[Any]
    phases: NDArray[Any]
    thd: float
    sinad: float
    snr: float
    sfdr: float
    enob: float
    noise_floor: float


@result
class Levels(Result):
    """The two states of a waveform; unpacks into high, low and amplitude.

    Attributes
    ----------
    high, low, amplitude : float
        The levels of the states and their difference.
    """

    high: float
    low: float
    amplitude: float


@result
class Pulse(Result):
    """A pulse, by the terms of IEEE Std 181.

    Attributes
    ----------
    start, middle, width : float
        The time at which the first edge crosses the middle reference level, the time of the pulse's middle,
        and the width at that level.
    high, low : float
        The levels of the states.
    rise, fall : float
        The durations of the edges between the low and the high reference level.
    slew_rate : float
        The slew rate of the first edge, in units of the signal per unit of time.
    overshoot_first, overshoot_second : float
        The overshoot after each edge, in its direction, in per cent of the amplitude.
    """

    start: float
    middle: float
    width: float
    high: float
    low: float
    rise: float
    fall: float
    slew_rate: float
    overshoot_first: float
    overshoot_second: float


@result
class Vertices(Result):
    """The peaks found in a stream.

    Attributes
    ----------
    positions, heights : ndarray
        The vertices of the parabolas fitted to the samples, and their values there.
    """

    positions: NDArray[Any]
    heights: NDArray[Any]

    def __len__(self) -> int:
        return len(self.positions)


@result
class Triggers(Result):
    """The crossings of a level.

    Attributes
    ----------
    positions : ndarray
        The times of the crossings, by linear interpolation between samples.
    indices : ndarray of int
        The indices of the samples that trigger.
    """

    positions: NDArray[Any]
    indices: NDArray[Any]

    def __len__(self) -> int:
        return len(self.positions)


@result
class Bands(Result):
    """Levels in bands; unpacks into midband frequencies and levels.

    Attributes
    ----------
    frequencies : ndarray
        The exact midband frequencies, in the unit of fs.
    levels : ndarray
        In dB relative to the square of the reference.
    edges : ndarray
        The lower and the upper edge of each band.
    """

    frequencies: NDArray[Any]
    levels: NDArray[Any]
    edges: NDArray[Any]
    _unpacked = ("frequencies", "levels")

    def plot(self, axes: Any = None) -> Any:
        """Plots the levels as bars with matplotlib; returns the axes."""
        if axes is None:
            from matplotlib import pyplot
            axes = pyplot.subplots()[1]
        axes.bar(range(len(self.frequencies)), self.levels)
        axes.set_xticks(range(len(self.frequencies)), [f"{one:.3g}" for one in self.frequencies], rotation=90)
        axes.set(xlabel="band", ylabel="level (dB)")
        return axes


def _rate(function: Any, fs: Any) -> Any:
    return positive(f"measure.{function}", "fs", fs, "ErrSamplingNotPositive")


def peaks(x: ArrayLike, fs: float = 1.0, height: float | None = None, prominence: float | None = None,
          distance: float | None = None, valleys: bool = False, axis: int = LAST) -> Any:
    """The peaks of a signal, or its valleys.

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    fs : float
        The sampling rate.
    height : float, optional
        Only peaks above this height are returned; only valleys below it.
    prominence : float, optional
        The smallest prominence. Without height and prominence, the peaks that rise out of the noise are
        returned: those with at least two fifths of the third largest prominence, and at least a fifth of
        the largest.
    distance : float, optional
        The smallest distance between peaks, in time. Of peaks that are closer, the less prominent are
        dropped.
    valleys : bool
        Whether to look for valleys.
    axis : int
        The axis of time.

    Returns
    -------
    Peaks, or a list with one entry for each channel

    Raises
    ------
    ValueError
        If x has no channel, or fs is not above 0.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.cos(2 * np.pi * 5.3 * np.arange(1000) / 1000)
    >>> qx.measure.peaks(x, 1000).positions.round(4)
    array([0.1887, 0.3774, 0.566 , 0.7547, 0.9434])
    """
    fs = _rate("peaks", fs)
    return by_channel(lambda channel: _peaks(channel.astype(float), fs, height, prominence, distance, valleys),
                      x, axis)


def _peaks(x: NDArray[Any], fs: float, height: float | None, prominence: float | None, distance: float | None,
           valleys: bool) -> Peaks:
    sign = -1.0 if valleys else 1.0
    values = sign * x
    at = measuring.local_maxima(values) if len(x) > 2 else np.zeros(0, int)
    stand = measuring.prominences(values, at)
    if prominence is None and height is None:
        prominence = measuring.outstanding(stand)
    kept = np.ones(len(at), bool)
    if height is not None:
        kept &= values[at] > sign * height
    if prominence is not None:
        kept &= stand >= max(prominence, 64 * np.finfo(float).eps * np.abs(x).max(initial=0))
    at, stand = at[kept], stand[kept]
    if distance is not None and len(at):
        chosen_ones = set(measuring.separated(at, stand, distance * fs).tolist())
        kept = np.array([one in chosen_ones for one in at.tolist()])
        at, stand = at[kept], stand[kept]
    positions, heights = _vertices(values, at)
    return Peaks(positions / fs, sign * heights, stand, _widths(values, at, stand) / fs, at)


def _vertices(values: Any, at: Any) -> Any:
    """The vertices of the parabolas through each sample and its neighbours; on a plateau, the sample itself."""
    before, here, behind = values[at - 1], values[at], values[at + 1]
    bend = before - 2 * here + behind
    is_sharp = (bend < 0) & (here >= before) & (here >= behind)
    shift = np.divide(before - behind, 2 * bend, out=np.zeros(len(at)), where=is_sharp)
    return at + shift, here + (behind - before) * shift / 4


def _widths(values: Any, at: Any, stand: Any) -> Any:
    """The widths at half the prominences, in samples, by linear interpolation between samples."""
    found = np.zeros(len(at))
    for i, (place, prominence) in enumerate(zip(at.tolist(), stand.tolist())):
        level = values[place] - prominence / 2
        left = right = place
        while left > 0 and values[left] > level:
            left -= 1
        while right < len(values) - 1 and values[right] > level:
            right += 1
        start = left + ((level - values[left]) / (values[left + 1] - values[left])
                        if values[left] < level else 0)
        end = right - ((level - values[right]) / (values[right - 1] - values[right])
                       if values[right] < level else 0)
        found[i] = end - start
    return found


class PeakFinder(Stream):
    """Finds the peaks above a threshold, or the valleys below it, in a stream. Each block returns the
    `Vertices` that have become certain with it. A parabola is fitted to every window of `width` samples.
    Positions count from the start of the stream.

    Parameters
    ----------
    threshold : float
        Peaks are above it, valleys below.
    width : int
        The number of samples in a window, at least 3.
    fs : float
        The sampling rate.
    valleys : bool
        Look for valleys.

    Examples
    --------
    >>> import qx
    >>> finder = qx.measure.PeakFinder(0.5, width=5)
    >>> found = finder(qx.signals.sine(100, 0.02)), finder.finish()
    >>> sum(len(part) for part in found)
    2
    """

    dtypes = (np.dtype(float),)

    def __init__(self, threshold: float, width: int = 5, fs: float = 1.0, valleys: bool = False) -> None:
        self.threshold, self.valleys = float(threshold), bool(valleys)
        self.width = whole_number("measure.PeakFinder", "width", width, 3, "ErrInvalidSelector")
        self.fs = _rate("PeakFinder", fs)
        super().__init__()

    def _start(self) -> Any:
        """The samples not yet passed on, the export's state and buffer, and whether it has been called."""
        return np.empty(0), {}, np.empty(0), False

    def _run(self, state: Any, block: Any, is_last: Any) -> Any:
        _, place, buffer, has_begun = state
        request = {"data": block, "threshold": self.threshold, "width": self.width,
                   "polarity": int(self.valleys), "flags": (not has_begun) + 4 * is_last}
        found, place, buffer = core.PeakFinder(request, place, buffer)
        return Vertices(found["locations"] / self.fs, found["amplitudes"]), (np.empty(0), place, buffer, True)

    def _step(self, state: Any, block: Any) -> Any:
        block = np.concatenate([state[0], block])
        if len(block) < 2 * self.width:
            return _no_vertices(), (block, *state[1:])
        # The rest is kept back, so that the last block is long enough.
        found, state = self._run(state, block[:-self.width], False)
        return found, (block[-self.width:], *state[1:])

    def __call__(self, block: Any) -> Any:
        found = super().__call__(block)
        return found if isinstance(found, Vertices) else _no_vertices()

    def finish(self) -> Any:
        """Returns the peaks of the last window. The stream starts afresh."""
        state = self._states[0]
        self.reset()
        if len(state[0]) < self.width:
            return _no_vertices()
        return self._run(state, state[0], True)[0]


def _no_vertices() -> Any:
    return Vertices(np.empty(0), np.empty(0))


def _no_triggers() -> Any:
    return Triggers(np.empty(0), np.empty(0, int))


def levels(x: ArrayLike, method: Literal["auto", "histogram", "peak"] = "auto", bins: int = 256,
           axis: int = LAST) -> Any:
    """The levels of the two states of a waveform.

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    method : {"auto", "histogram", "peak"}
        "histogram" uses the modes of the histogram, refined by the samples around them, "peak" the extremes,
        and "auto" whichever of the two fits the signal.
    bins : int
        The number of bins of the histogram.
    axis : int
        The axis of time.

    Returns
    -------
    Levels, or a list with one entry for each channel

    Raises
    ------
    QxError
        If the signal does not have two states.
    ValueError
        If x is empty, or method is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> [round(one, 2) for one in qx.measure.levels(qx.signals.square(1000, 0.01) + 1)]
    [2.0, 0.0, 2.0]
    """
    code = chosen("measure.levels", "method", method, LEVELS)
    bins = whole_number("measure.levels", "bins", bins, 1, "ErrMeasureEmptyChannel")
    return by_channel(lambda channel: _levels(channel, code, bins), x, axis)


def _levels(x: NDArray[Any], code: int, bins: int) -> Levels:
    (high, _), (low, _) = measuring.levels(x.astype(float), code, bins)
    return Levels(high, low, high - low)


def pulses(x: ArrayLike, fs: float = 1.0, first: Literal["rising", "falling"] = "rising", axis: int = LAST) -> Any:
    """The pulses of a waveform, up to 1000.

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    fs : float
        The sampling rate.
    first : {"rising", "falling"}
        The edge with which a pulse begins.
    axis : int
        The axis of time.

    Returns
    -------
    list of Pulse, or a list with one entry for each channel

    Raises
    ------
    ValueError
        If x has no channel, or first is not a valid choice.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.interp(np.arange(100), [20, 30, 60, 70], [0.0, 1.0, 1.0, 0.0])
    >>> found, = qx.measure.pulses(x, fs=10)
    >>> round(found.width, 3), round(found.rise, 3)
    (4.0, 0.8)
    """
    fs = _rate("pulses", fs)
    direction = chosen("measure.pulses", "first", first, POLARITIES)
    return by_channel(lambda channel: _pulses(channel.astype(float), fs, direction), x, axis)


def _pulses(x: NDArray[Any], fs: float, direction: int) -> list[Pulse]:
    return [Pulse((one.middle - one.width / 2) / fs, one.middle / fs, one.width / fs, one.high, one.low,
                  (one.first_duration if one.rises else one.second_duration) / fs,
                  (one.second_duration if one.rises else one.first_duration) / fs,
                  one.slew_rate * fs, one.first_overshoot, one.second_overshoot)
            for one in measuring.pulses(x, direction)]


@result
class Cycles(Result):
    """Means over the cycles of a waveform.

    Attributes
    ----------
    starts : ndarray
        The times at which the cycles start.
    periods : ndarray
        The durations of the cycles.
    means, rms : ndarray
        The mean and the root mean square over each cycle.
    """

    starts: NDArray[Any]
    periods: NDArray[Any]
    means: NDArray[Any]
    rms: NDArray[Any]

    def __len__(self) -> int:
        return len(self.starts)


def cycles(x: ArrayLike, fs: float = 1.0, axis: int = LAST) -> Any:
    """Mean and root mean square over each cycle of a waveform, up to 1000 cycles. A cycle lies between
    crossings of the middle of the two levels.

    Parameters
    ----------
    x : array_like
        Real values, of any dimension.
    fs : float
        The sampling rate.
    axis : int
        The axis of time.

    Returns
    -------
    Cycles, or a list with one entry for each channel

    Raises
    ------
    QxError
        If the waveform does not have two levels.
    ValueError
        If x is empty or fs is not above 0.

    Examples
    --------
    >>> import qx
    >>> found = qx.measure.cycles(3 + qx.signals.sine(1000, 0.0101))
    >>> found.means.round(2), found.rms.round(2)
    (array([3., 3., 3., 3., 3., 3., 3., 3., 3.]), array([3.08, 3.08, 3.08, 3.08, 3.08, 3.08, 3.08, 3.08, 3.08]))
    """
    fs = _rate("cycles", fs)
    return by_channel(lambda channel: _cycles(channel.astype(float), fs), x, axis)


def _cycles(x: NDArray[Any], fs: float) -> Cycles:
    found = []
    while len(found) < measuring.MOST_PULSES:
        try:
            _, mean, rms, start, end, *_ = core.cycles(x, 0.0, 1 / fs, len(found) + 1, measuring.REFERENCES,
                                                       measuring.HISTOGRAM, 0)
        except QxError as error:
            if error.name in ("ErrMeasureSearchShort", "ErrMeasureNotFound"):
                break
            raise
        found.append((start, end - start, mean, rms))
    return Cycles(*np.array(found).reshape(-1, 4).T)


def tone(x: ArrayLike, fs: float = 1.0, near: float | None = None, within: float | None = None, axis: int = LAST) -> Any:
    """The largest tone, or the largest tone near a frequency, fitted by least squares (IEEE Std 1057).

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    fs : float
        The sampling rate.
    near : float, optional
        The approximate frequency of the tone, in the unit of fs.
    within : float, optional
        The largest distance of the tone from there; 2 bins by default.
    axis : int
        The axis of time.

    Returns
    -------
    Tone, or a list with one entry for each channel

    Raises
    ------
    QxError
        If no tone is found.
    ValueError
        If there are fewer than 4 samples, or one is not finite.

    Examples
    --------
    >>> import qx
    >>> found = qx.measure.tone(qx.signals.sine(1000, 50.2, fs=1000), fs=1000)
    >>> round(found.frequency, 6), round(found.amplitude, 6)
    (50.2, 1.0)
    """
    fs = _rate("tone", fs)
    half = 0.0 if near is None else 2 * fs / max(count_of(x, axis), 1) if within is None else float(within)
    return by_channel(lambda channel: Tone(*core.tone(channel, 1 / fs, 0.0 if near is None else float(near), half)),
                      x, axis)


def tones(x: ArrayLike, fs: float = 1.0, count: int = 5,
          order: Literal["amplitude", "frequency"] = "amplitude", axis: int = LAST) -> Any:
    """The largest tones, fitted together by least squares. Tones that could be noise are not returned.

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    fs : float
        The sampling rate.
    count : int
        The largest number of tones.
    order : {"amplitude", "frequency"}
        Whether to sort by descending amplitude or ascending frequency.
    axis : int
        The axis of time.

    Returns
    -------
    Tones, or a list with one entry for each channel

    Raises
    ------
    QxError
        If no tone is found.
    ValueError
        If there are fewer than 4 samples, one is not finite, or order is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> x = qx.signals.sine(1000, 50.2, 1000) + 0.1 * qx.signals.sine(1000, 120, 1000)
    >>> qx.measure.tones(x, 1000).frequencies.round(6)
    array([ 50.2, 120. ])
    """
    code = chosen("measure.tones", "order", order, {"amplitude": 0, "frequency": 1})
    count = whole_number("measure.tones", "count", count, 1, "ErrMeasureBadCount")
    step = 1 / _rate("tones", fs)
    return by_channel(lambda channel: Tones(*core.tones(channel, step, count, code)), x, axis)


def harmonics(x: ArrayLike, fs: float = 1.0, fundamental: float | None = None, count: int = 10,
              full_scale: float | None = None, axis: int = LAST) -> Any:
    """A tone with its harmonics, its distortion and the noise.

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    fs : float
        The sampling rate.
    fundamental : float, optional
        The approximate frequency of the tone, in the unit of fs; by default, the largest tone is taken.
    count : int
        The highest multiple; fewer harmonics are returned where the samples do not resolve them.
    full_scale : float, optional
        The amplitude to which the effective bits refer; by default, that of the tone.
    axis : int
        The axis of time.

    Returns
    -------
    Harmonics, or a list with one entry for each channel

    Raises
    ------
    QxError
        If no tone is found.
    ValueError
        If there are fewer than 4 samples, or one is not finite.

    Examples
    --------
    >>> import qx
    >>> x = qx.signals.sine(1000, 50.2, 1000) + 0.01 * qx.signals.sine(1000, 100.4, 1000)
    >>> round(qx.measure.harmonics(x, 1000).thd, 9)
    0.01
    """
    most = min(whole_number("measure.harmonics", "count", count, 1, "ErrMeasureBadCount"),
               max(1, count_of(x, axis) // 2 - 1))
    step = 1 / _rate("harmonics", fs)
    return by_channel(lambda channel: Harmonics(*core.harmonics(channel, step, float(fundamental or 0), most,
                                                                float(full_scale or 0))), x, axis)


def trigger(x: ArrayLike, level: float, fs: float = 1.0,
            slope: Literal["rising", "falling", "either"] = "rising", hysteresis: float = 0.0,
            holdoff: float = 0.0, axis: int = LAST) -> Any:
    """All crossings of a level by a signal.

    Parameters
    ----------
    x : array_like
        Real samples, of any dimension.
    level : float
        The level.
    fs : float
        The sampling rate.
    slope : {"rising", "falling", "either"}
        The direction of the crossings.
    hysteresis : float
        How far beyond the level the signal must have been before a crossing.
    holdoff : float
        The time after a trigger during which crossings are ignored.
    axis : int
        The axis of time.

    Returns
    -------
    Triggers, or a list with one entry for each channel

    Raises
    ------
    ValueError
        If a sample is not finite, hysteresis or holdoff is negative, or slope is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.measure.trigger(qx.signals.sine(100, 0.04), 0.5).positions.round(2)
    array([ 2.09, 27.09, 52.09, 77.09])
    """
    return by_channel(lambda channel: Trigger(level, fs, slope, hysteresis, holdoff)(channel.astype(float)),
                      x, axis)


class Trigger(Stream):
    """The stream of `trigger`. Each block returns its Triggers; positions and indices count from the start of
    the stream.

    Parameters
    ----------
    level : float
        The level.
    fs : float
        The sampling rate.
    slope : {"rising", "falling", "either"}
        The direction of the crossings.
    hysteresis : float
        How far beyond the level the signal must have been before a crossing.
    holdoff : float
        The time after a trigger during which crossings are ignored.

    Examples
    --------
    >>> import qx
    >>> stream, x = qx.measure.Trigger(0.5), qx.signals.sine(100, 0.04)
    >>> len(stream(x[:60])), len(stream(x[60:]))
    (3, 1)
    """

    dtypes = (np.dtype(float),)

    def __init__(self, level: float, fs: float = 1.0, slope: Literal["rising", "falling", "either"] = "rising",
                 hysteresis: float = 0.0, holdoff: float = 0.0) -> None:
        self.slope = chosen("measure.trigger", "slope", slope, SLOPES)
        self.level, self.hysteresis, self.fs = float(level), float(hysteresis), _rate("trigger", fs)
        if not hysteresis >= 0 or not holdoff >= 0:
            refuse("measure.trigger", "hysteresis, holdoff", "must not be negative", "ErrNegativeSetting")
        self.holdoff = round(holdoff * self.fs)
        super().__init__()

    def _start(self) -> Any:
        """The export's state, and the number of samples so far."""
        return {}, 0

    def _step(self, state: Any, block: Any) -> Any:
        place, before = state
        positions, indices, start = [], [], 0
        while start <= len(block):
            place, index, position = core.trigger(block, self.level, self.hysteresis, self.slope, start,
                                                  self.holdoff, place)
            if index < 0:
                break
            positions.append(before + position)
            indices.append(before + index)
            start = index + 1
        return Triggers(np.array(positions) / self.fs, np.array(indices, int)), (place, before + len(block))

    def __call__(self, block: Any) -> Any:
        found = super().__call__(block)
        return found if isinstance(found, Triggers) else _no_triggers()

    def finish(self) -> Any:
        """Returns no triggers, since none are pending. The stream starts afresh."""
        self.reset()
        return _no_triggers()


def delay(x: ArrayLike, y: ArrayLike, fs: float = 1.0, most: float | None = None,
          axis: int = LAST) -> Any:
    """The delay of y with respect to x: the position of the peak of their cross-correlation. It is
    interpolated between samples by the Fourier series of the correlation, which is exact for signals
    band-limited below fs / 2.

    Parameters
    ----------
    x, y : array_like
        Real signals: one channel and several, or channels in pairs.
    fs : float
        The sampling rate.
    most : float, optional
        The largest delay in either direction, in time.
    axis : int
        The axis of time.

    Returns
    -------
    float or ndarray
        The delay in time; negative where y is earlier.

    Raises
    ------
    ValueError
        If an array is empty or fs is not above 0.
    QxError
        If the signals have no correlation.

    Examples
    --------
    >>> import qx
    >>> x = qx.filters.butterworth(4, 0.1)(qx.noise.gaussian(2000, seed=3))
    >>> round(qx.measure.delay(x[100:1100], x[93:1093]), 9)
    7.0
    """
    fs = _rate("delay", fs)
    return along_pairs(lambda one, other: _delay(one.astype(float), other.astype(float), fs, most), x, y, axis)


def _delay(x: NDArray[Any], y: NDArray[Any], fs: float, most: float | None) -> float:
    if not len(x) or not len(y):
        refuse("measure.delay", "x, y", "an array is empty", "ErrEmptyInput")
    x, y = x - x.mean(), y - y.mean()
    full = core.delay(x, y, 1, 0)  # lag 0 is at the last index of x
    lags = np.arange(len(full)) - (len(x) - 1)
    inside = np.abs(lags) <= (math.inf if most is None else most * fs)
    if not inside.any() or not np.any(full[inside]):
        refuse("measure.delay", "x, y", "have no correlation, or no lag is allowed", "ErrMeasureNotFound")
    best = int(lags[inside][np.argmax(full[inside])])
    return _refined(x, y, best) / fs


def _refined(x: Any, y: Any, lag: Any) -> Any:
    """The maximum of the correlation's Fourier series near a lag, by Newton's method. Only the overlap of
    both signals is correlated, under a Hann window, so that the ends do not shift the maximum."""
    first, last = max(0, -lag), min(len(x), len(y) - lag)
    window = windows.hann(last - first + 2)[1:-1]
    x, y = ((part - np.average(part, weights=window)) * window
            for part in (x[first:last], y[first + lag:last + lag]))
    n = 2 * len(x)
    half = n // 2 + 1
    cross = np.conj(core.delay_spectrum(x, 0, n, 0)[:half]) * core.delay_spectrum(y, 0, n, 0)[:half]
    w = 2 * np.pi * np.arange(half) / n
    at = 0.0
    for _ in range(50):
        turned = cross * np.exp(1j * w * at)
        slope, bend = -np.sum(w * turned.imag), -np.sum(w * w * turned.real)
        if not bend < 0:
            return float(lag)
        step = -slope / bend
        at += max(-0.5, min(0.5, step))
        if abs(step) < 1e-12:
            break
    return lag + (at if abs(at) <= 1 else 0.0)


# Sound levels. The constants of the frequency weightings are those of IEC 61672-1, annex E, in Hz.

WEIGHTINGS = {"A": "A", "C": "C", "Z": "Z"}
_F1, _F2, _F3, _F4 = 20.598997, 107.65265, 737.86223, 12194.217
MOST_BANDS = 1000  # in an octave
_BAND_RATIO = 10 ** 0.3  # an octave, by IEC 61260-1


def weighting(frequencies: ArrayLike, kind: Literal["A", "C", "Z"] = "A") -> Any:
    r"""The frequency weighting of IEC 61672-1.

    .. math:: A(f) = 20 \lg \frac{f_4^2 f^4}{(f^2 + f_1^2) \sqrt{(f^2 + f_2^2)(f^2 + f_3^2)} (f^2 + f_4^2)} - A_{1000}

    Parameters
    ----------
    frequencies : array_like
        In Hz.
    kind : {"A", "C", "Z"}
        The weighting; Z is flat.

    Returns
    -------
    float or ndarray
        The weighting in dB, 0 at 1 kHz.

    Raises
    ------
    ValueError
        If kind is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.measure.weighting([100.0, 1000.0]).round(1)
    array([-19.1,   0. ])
    """
    kind = chosen("measure.weighting", "kind", kind, WEIGHTINGS)
    f = np.asarray(frequencies, float)

    def gain(f: Any) -> Any:
        f = f * f
        c = _F4**2 * f / ((f + _F1**2) * (f + _F4**2))
        return c if kind == "C" else c * f / np.sqrt((f + _F2**2) * (f + _F3**2))

    if kind == "Z":
        return np.zeros(f.shape)[()]
    with np.errstate(divide="ignore"):
        return (20 * np.log10(gain(f) / gain(np.float64(1000.0))))[()]


def weighting_filter(fs: float, kind: Literal["A", "C"] = "A") -> filters.Filter:
    """The A or C weighting as a filter: the poles of IEC 61672-1 by the bilinear transform, with 0 dB at
    1 kHz. At rates from 48 kHz on, it is within class 1 up to 16 kHz.

    Parameters
    ----------
    fs : float
        The sampling rate in Hz, above 2 kHz.
    kind : {"A", "C"}
        The weighting.

    Returns
    -------
    qx.filters.Filter

    Raises
    ------
    ValueError
        If fs is not above 2 kHz, or kind is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> abs(qx.measure.weighting_filter(48000).response([100.0, 1000.0]).decibels).round(2)
    array([19.15,  0.  ])
    """
    from . import filters
    kind = chosen("measure.weighting_filter", "kind", kind, {"A": "A", "C": "C"})
    if not fs > 2000:
        refuse("measure.weighting_filter", "fs", f"must be above 2000 Hz; got {fs}", "ErrAboveNyquist")
    w1, w2, w3, w4 = (2 * np.pi * f for f in (_F1, _F2, _F3, _F4))
    sections = [([1.0, 0.0, 0.0], (w1, w1)), ([0.0, 0.0, w4 * w4], (w4, w4))]
    if kind == "A":
        sections.insert(1, ([1.0, 0.0, 0.0], (w2, w3)))
    rows = []
    for (s2, s1, s0), (p, q) in sections:
        k = 2 * fs
        above = [s2 * k * k + s1 * k + s0, 2 * s0 - 2 * s2 * k * k, s2 * k * k - s1 * k + s0]
        below = [(k + p) * (k + q), 2 * (p * q - k * k), (k - p) * (k - q)]
        rows.append([*above, *below])
    made = filters.from_sos(rows, fs)
    sos = made.sos
    sos[0, :3] /= made.response([1000.0]).magnitude[0]
    found = filters.from_sos(sos, fs)
    found.title = f"{kind} weighting, fs {fs:g}"
    return found


def sound_level(x: ArrayLike, fs: float, weighting: Literal["A", "C", "Z"] = "A", reference: float = 2e-5,
                axis: int = LAST) -> Any:
    """The equivalent sound level.

    Parameters
    ----------
    x : array_like
        Sound pressure in Pa.
    fs : float
        The sampling rate in Hz.
    weighting : {"A", "C", "Z"}
        The frequency weighting.
    reference : float
        The pressure at 0 dB.
    axis : int
        The axis of time.

    Returns
    -------
    float or ndarray
        In dB.

    Raises
    ------
    ValueError
        If x is empty, or weighting is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> round(qx.measure.sound_level(2**0.5 * qx.signals.sine(48000, 1000, 48000), 48000), 1)
    94.0
    """
    kind = chosen("measure.sound_level", "weighting", weighting, WEIGHTINGS)
    f = None if kind == "Z" else weighting_filter(fs, kind)

    def of_channel(channel: Any) -> Any:
        mean_square = core.sound_level(f(channel) if f else channel)**2
        return 10 * math.log10(mean_square / reference**2) if mean_square else -math.inf

    return along(of_channel, x, axis)


def octave_bands(x: ArrayLike, fs: float, fraction: int = 3, low: float = 25.0,
                 high: float | None = None, reference: float = 1.0, axis: int = LAST) -> Bands:
    """The levels in octave or fractional-octave bands, by Butterworth bandpass filters with the midband
    frequencies and edges of IEC 61260-1. Low bands are filtered at a lower rate.

    Parameters
    ----------
    x : array_like
        Real samples.
    fs : float
        The sampling rate in Hz.
    fraction : int
        1 for octaves, 3 for third octaves, ...
    low, high : float, optional
        The lowest and the highest midband frequency, in Hz; by default, up to 0.45 fs.
    reference : float
        The value at 0 dB, such as 2e-5 for a sound pressure in Pa.
    axis : int
        The axis of time.

    Returns
    -------
    Bands
        The levels, with the bands along the axis of time.

    Raises
    ------
    ValueError
        If x is empty, there is no band, or the highest band ends above fs / 2.

    Examples
    --------
    >>> import qx
    >>> x = qx.signals.sine(20000, 1000, 20000, 2**0.5)
    >>> found = qx.measure.octave_bands(x, 20000, 1, 500, 2000)
    >>> found.levels.round(1), found.frequencies.round(1)
    (array([-20.1,  -0. , -19.1]), array([ 501.2, 1000. , 1995.3]))
    """
    from . import multirate
    name = "measure.octave_bands"
    fs = _rate("octave_bands", fs)
    fraction = whole_number(name, "fraction", fraction, 1)
    half = _BAND_RATIO ** (0.5 / fraction)
    if high is None:
        high = float(0.45 * fs / half)
    middles = band_frequencies(fraction, low, high)
    if not len(middles):
        refuse(name, "low, high", "there is no band between them", "ErrRangeReversed")
    if middles[-1] * half >= fs / 2:
        refuse(name, "high", f"the band at {middles[-1]:.5g} ends above half the sampling rate, {fs / 2:g}",
               "ErrAboveNyquist")

    def of_channel(channel: Any) -> Any:
        found, rate = np.empty(len(middles)), fs
        channel = np.asarray(channel, float)
        for i in range(len(middles) - 1, -1, -1):
            while middles[i] * half < 0.05 * rate and len(channel) > 64:
                channel, rate = multirate.resample(channel, 1, 2), rate / 2
            passed = _band_filter(middles[i], half, rate)(channel)
            mean_square = core.sound_level(passed)**2
            found[i] = 10 * math.log10(mean_square / reference**2) if mean_square else -math.inf
        return found

    return Bands(middles, along(of_channel, x, axis), np.stack([middles / half, middles * half], -1))


def _band_filter(middle: Any, half: Any, rate: Any) -> Any:
    from . import filters
    return filters.butterworth(3, (middle / half, middle * half), "bandpass", rate)


def band_frequencies(fraction: int = 3, low: float = 25.0, high: float = 20000.0) -> NDArray[np.float64]:
    r"""The exact midband frequencies of IEC 61260-1 with base 10.

    .. math:: f_k = 1000 \cdot 10^{0.3 k / b}

    Parameters
    ----------
    fraction : int
        1 for octaves, 3 for third octaves, ...
    low, high : float
        The lowest and the highest frequency, in Hz; a nominal frequency stands for the exact one next to it.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If fraction is below 1, or the bounds are not above 0 and ascending.

    Examples
    --------
    >>> import qx
    >>> qx.measure.band_frequencies(1, 31.5, 16000).round(2)
    array([   31.62,    63.1 ,   125.89,   251.19,   501.19,  1000.  ,
            1995.26,  3981.07,  7943.28, 15848.93])
    """
    fraction = whole_number("measure.band_frequencies", "fraction", fraction, 1)
    if fraction > MOST_BANDS:
        refuse("measure.band_frequencies", "fraction", f"must be at most {MOST_BANDS}; got {fraction}",
               "ErrRangeReversed")
    if not 0 < low <= high < math.inf:
        refuse("measure.band_frequencies", "low, high", "must be above 0, finite and in order", "ErrRangeReversed")
    shift = 0.0 if fraction % 2 else 0.5  # even fractions have no band at 1 kHz
    step = 0.3 / fraction

    def index(f: Any) -> Any:
        return math.log10(f / 1000) / step - shift

    first, last = math.ceil(index(low) - 0.25), math.floor(index(high) + 0.25)
    return 1000 * 10.0 ** (step * (np.arange(first, last + 1) + shift))
