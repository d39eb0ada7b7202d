"""Peaks, repeated events such as heart beats, and pulses of a recording.

Positions are sample numbers with fractions; the caller converts them to times for display.
"""

import bisect
import dataclasses

import numpy as np

from . import calculus, filters, multirate, signals, stats
from .outcomes import QxError
from .topical import served

core, smoothing = served("measure"), served("filters")

WHOLE_STREAM = 5  # flags: both first and last block
AUTOMATIC, BINS = 2, 100
FALLING, RISING = 0, 1
REFERENCES = {"high": 90.0, "mid": 50.0, "low": 10.0, "percent": 1}


# Peaks

@dataclasses.dataclass
class Peaks:
    places: np.ndarray
    values: np.ndarray
    curvatures: np.ndarray  # second derivatives, per sample squared
    prominences: "np.ndarray | None" = None  # only if the peaks were chosen by it
    prominence: float = 0.0  # the smallest prominence that was required


def prominences(values, maxima):
    """The height of each local maximum, by its index, above the higher of the lowest values on both
    sides of it, up to the next higher maximum or the end."""
    if not len(maxima):
        return np.zeros(0)
    heights = values[maxima]
    lowest = np.minimum.reduceat(values, np.r_[0, maxima])  # before, between and after them
    left = _lowest_before(heights, lowest[:-1])
    right = _lowest_before(heights[::-1], lowest[:0:-1])[::-1]
    return heights - np.maximum(left, right)


def _lowest_before(heights, lowest):
    """The lowest value between each peak and the last higher peak before it. `lowest` has the lowest values
    between neighbours."""
    found, higher = [], []  # the peaks with no higher one after them so far: height, lowest value before it
    for height, low in zip(heights.tolist(), lowest.tolist()):
        while higher and higher[-1][0] <= height:
            low = min(low, higher.pop()[1])
        found.append(low)
        higher.append((height, low))
    return np.array(found)


def local_maxima(values):
    """The indices of samples that are higher than both neighbours; for a plateau, of its middle."""
    starts = np.flatnonzero(np.diff(values, prepend=np.nan))  # starts of runs of equal values, without the first
    starts = np.r_[0, starts[starts > 0]]
    ends = np.r_[starts[1:], len(values)] - 1
    level = values[starts]
    is_higher = np.r_[False, (level[1:-1] > level[:-2]) & (level[1:-1] > level[2:]), False][:len(level)]
    return (starts[is_higher] + ends[is_higher]) // 2


def outstanding(found):
    """The default for the smallest prominence: two fifths of the third greatest, which one or two disturbances
    do not raise, and at least a fifth of the greatest, since the third one is noise if there are only one or
    two peaks."""
    greatest = np.sort(found)[:-4:-1]
    return max(0.4 * greatest[-1], 0.2 * greatest[0]) if len(greatest) else 0.0


def vertices(values, maxima, frame):
    """Positions, heights and curvatures of the parabolas through `frame` samples around each maximum, if their
    vertices lie among these samples; otherwise those of the sample."""
    fit = smoothing.savgol_coefficients(2, frame, filters.EMPTY, 1)[1]
    first = np.clip(maxima - frame // 2, 0, len(values) - frame)
    c0, c1, c2 = fit @ np.lib.stride_tricks.sliding_window_view(values, frame)[first].T
    with np.errstate(divide="ignore", invalid="ignore"):
        shift = -c1 / (2 * c2)
    is_inside = (c2 < 0) & (np.abs(shift) <= frame / 2)
    return (np.where(is_inside, first + frame // 2 + shift, maxima),
            np.where(is_inside, c0 + c1 * shift / 2, values[maxima]), 2 * c2)


def prominent_peaks(values, width, prominence=None):
    """Peaks of the values, smoothed by parabolas over `width` samples, with at least this prominence; with None,
    that of outstanding()."""
    frame = width + (width + 1) % 2
    smooth = filters.savgol(values, frame, 2)
    maxima = local_maxima(smooth)
    stand = prominences(smooth, maxima)
    if prominence is None:
        prominence = outstanding(stand)
    rounding = 64 * np.finfo(float).eps * np.abs(values).max()
    kept = stand >= max(prominence, rounding)
    places, tops, curvatures = vertices(values, maxima[kept], frame)
    return Peaks(places, tops, curvatures, stand[kept], prominence)


def peaks_beyond(values, threshold, width, valleys):
    request = {"data": values, "threshold": threshold, "width": width, "polarity": int(valleys),
               "flags": WHOLE_STREAM}
    found = core.PeakFinder(request, {}, [])[0]
    return Peaks(found["locations"], found["amplitudes"], found["derivatives"])


def peaks(values, threshold=None, width=5, valleys=False, prominence=None):
    """The peaks above the threshold, or the valleys below it, by parabolas over `width` samples. Without a
    threshold, or with a prominence, the peaks are chosen by their prominence."""
    if threshold is not None and prominence is None:
        return peaks_beyond(values, threshold, width, valleys)
    sign = -1.0 if valleys else 1.0
    found = prominent_peaks(sign * values, width, prominence)
    kept = slice(None) if threshold is None else found.values > sign * threshold
    return Peaks(found.places[kept], sign * found.values[kept], sign * found.curvatures[kept],
                 found.prominences[kept], found.prominence)


# Events

EVENT_SECONDS = 0.1  # the approximate duration of a burst, such as the steep part of a heart beat
EVENT_SAMPLES = 36  # its duration if the rate is not known
BLOCK = 1 << 20  # samples of a file in memory at once
STEPS = 6  # values of the activity in that time
QUIET = 1.5  # least ratio of bursts to the activity between them; tones, noise and drifts reach 0.9
REFRACTORY = 2.5  # least distance of events, in multiples of that time


def activity(means):
    """The root mean square slope around each of the means, relative to the largest slope."""
    slopes = calculus.derivative(means)
    power = signals.convolve((slopes / (np.abs(slopes).max() or 1.0))**2, np.full(STEPS, 1 / STEPS), method="direct")
    # A moving mean over an even number of values is half a step late.
    return np.sqrt(np.maximum(power[STEPS // 2:][:len(slopes)], 0))


def separated(places, strengths, apart):
    """The positions, without those that have a stronger one nearer than `apart`."""
    kept = []
    for i in np.argsort(-strengths, kind="stable"):
        at = bisect.bisect(kept, places[i])
        if all(abs(places[i] - near) >= apart for near in kept[max(0, at - 1):at + 1]):
            kept.insert(at, places[i])
    return np.array(kept)


def _burst(rate):
    """The number of samples in a burst, and the number averaged in each mean."""
    length = max(STEPS, round(EVENT_SECONDS * rate)) if rate else EVENT_SAMPLES
    return length, length // STEPS


def events(values, rate):
    """The repeated bursts of steep slope, such as the beats of an electrocardiogram: for each, the position at
    which the values are farthest from their median. Empty if there are fewer than three."""
    length, step = _burst(rate)
    if len(values) < 20 * step * STEPS:
        return np.zeros(0)
    return _events(multirate.decimate(values, step, "average"), length, step, lambda first, last: values[first:last])


MOST_MEANS = 1 << 24  # means of a whole recording that are held in memory


def events_of_whole(whole, rate):
    """The events of all samples of a file (wholes.Whole); None if it has too many means for the memory."""
    length, step = _burst(rate)
    if whole.count // step > MOST_MEANS:
        return None
    if whole.count < 20 * step * STEPS:
        return np.zeros(0)
    means = [multirate.decimate(part, step, "average") for part in whole.parts(step * max(1, BLOCK // step))]
    return _events(np.concatenate(means), length, step, lambda first, last: whole.part(first, last - first))


def _events(means, length, step, part_of):
    """The events of a signal, from its means and from parts of it."""
    strength = activity(means)
    largest = np.sort(strength)[-(len(strength) // 10):]
    level = stats.median(largest) / 2
    if level <= QUIET * stats.median(strength):
        return np.zeros(0)
    bursts = peaks(strength, level, 9)
    centres = separated(bursts.places, bursts.values, REFRACTORY * STEPS) * step + (step - 1) / 2
    found = []
    for centre in centres:
        first = max(0, round(centre) - length)
        part = part_of(first, round(centre) + length + 1)
        away = np.abs(part - stats.median(part))
        found.append(first + int(np.argmax(away)))
    found = np.unique(np.array(found, float))
    return found if len(found) >= 3 else np.zeros(0)


# Pulses

@dataclasses.dataclass
class Pulse:
    """One pulse: positions and times in samples, aberrations in per cent of the amplitude."""
    rises: bool  # whether it begins with a rising edge
    low: float  # the levels of the states
    high: float
    start: float  # start of the first transition
    end: float  # end of the second transition
    first_duration: float
    second_duration: float
    middle: float
    width: float  # between the crossings of the middle reference level
    slew_rate: float  # slew rate of the first transition, per sample
    first_overshoot: float  # beyond the state that the first transition leads to
    second_overshoot: float
    low_error: float = 0.0  # standard uncertainties of the levels
    high_error: float = 0.0


HISTOGRAM = {"method": AUTOMATIC, "bins": BINS}


NEAR = 1.5  # smallest range of a state around its level, in bins
GAIN = 1.1  # the least ratio by which doubling that range must increase the number of samples
ROUNDS = 50


def state_level(values, level, width, most):
    """The mean of the samples of the state around a level, and its standard uncertainty from their scatter.
    The state extends as far as samples are dense, up to `most`. It is determined again around the mean until
    the mean no longer changes."""
    away, half = np.abs(values - level), NEAR * width
    while 2 * half < most and np.count_nonzero(away <= 2 * half) > GAIN * np.count_nonzero(away <= half):
        half *= 2
    near = values[away <= half]
    for _ in range(ROUNDS):
        again = values[np.abs(values - near.mean()) <= half] if len(near) else near
        if len(again) == len(near):
            break
        near = again
    if len(near) < 2:
        return level, width / 12**0.5
    return float(near.mean()), float(near.std(ddof=1) / len(near)**0.5)


def levels(values, method=AUTOMATIC, bins=BINS):
    """The high and the low level, each with its standard uncertainty. Modes of the histogram, which are centres
    of bins, are refined by the samples around them. Extremes, for a waveform without modes, are not refined."""
    high, low, _ = core.levels(values, 0.0, 1.0, method, bins, 0)
    least, greatest = float(values.min()), float(values.max())
    width = (greatest - least) / bins
    if high == greatest and low == least or not width > 0:
        return (high, 0.0), (low, 0.0)
    most = (high - low) / 4
    found = state_level(values, high, width, most), state_level(values, low, width, most)
    return found if found[0][0] > found[1][0] else ((high, width / 12**0.5), (low, width / 12**0.5))


def references(high, low):
    """The levels at which edges are timed, as values."""
    return {name: low + (high - low) * percent / 100 for name, percent in (("high", 90), ("mid", 50), ("low", 10))} \
        | {"percent": 0}


def transition(values, direction, number, high, low):
    """The slewRate, duration, start and end of a transition and the overshoot in its direction, between refined
    levels."""
    found = core.pulses_transition(values, 0.0, 1.0, direction, number, references(high, low), HISTOGRAM, 0)[1:]
    under, over = found[-2:]
    modes = core.levels(values, 0.0, 1.0, AUTOMATIC, BINS, 0)[:2]
    # The export refers to the modes of the histogram.
    share, beyond = (over, modes[0] - high) if direction == RISING else (under, low - modes[1])
    excess = share / 100 * (modes[0] - modes[1]) + beyond
    return *found[:4], max(0.0, 100 * excess / (high - low))


def pulse(values, number=1, direction=RISING):
    """Pulse `number` of those that begin with an edge of this direction, or None if there is none."""
    try:
        (high, high_error), (low, low_error) = levels(values)
        width, middle = (core.pulses(values, 0.0, 1.0, direction, 1, number, references(high, low),
                                     HISTOGRAM, 0)[i] for i in (1, 3))
        first = transition(values, direction, number, high, low)
        second = transition(values, 1 - direction, number, high, low)
        if second[2] < first[3]:  # the waveform begins with an edge of the other direction
            second = transition(values, 1 - direction, number + 1, high, low)
    except QxError as error:
        if error.name.startswith("ErrMeasure"):
            return None
        raise
    return Pulse(direction == RISING, low, high, first[2], second[3], first[1], second[1], middle, width, first[0],
                 first[4], second[4], low_error, high_error)


MOST_PULSES = 1000


def pulses(values, direction=RISING):
    """All pulses of this direction, up to MOST_PULSES."""
    found = []
    while len(found) < MOST_PULSES and (one := pulse(values, len(found) + 1, direction)):
        found.append(one)
    return found


def event_pulse(values, places, i):
    """The pulse of event i, and the part of the values in which it was measured, as a slice from half way to the
    previous event to half way to the next. None for the first and last event, and if there is no pulse."""
    if not 0 < i < len(places) - 1:
        return None
    part = slice(int((places[i - 1] + places[i]) / 2), int((places[i] + places[i + 1]) / 2))
    rises = values[int(places[i])] > stats.median(values[part])
    found = pulse(values[part], 1, RISING if rises else FALLING)
    return (found, part) if found else None


def typical_event(values, places):
    """The event_pulse of median height among those that have one, else None."""
    heights = np.abs(values[places.astype(int)] - stats.median(values))
    order = np.argsort(np.abs(heights - stats.median(heights)), kind="stable")
    return next(filter(None, (event_pulse(values, places, i) for i in order)), None)
