"""Recordings from text tables and audio files.

A recording is read completely or not at all: whatever cannot be understood ends with an InputError of
one line that says what is wrong and where. What was chosen, and why, is told in `choice`;
docs/recordings.md has the rules.
"""

import dataclasses
import os
import re

import numpy as np

from . import audio, tables
from .calls import call
from .tables import InputError  # noqa: F401, for those who read recordings

WIDEST = 1e307  # with the margins of a plot still a double
MOST_SAMPLES = 1 << 24  # that are kept of one recording


@dataclasses.dataclass
class Recording:
    name: str  # of the file, without its folder
    values: np.ndarray
    rate: float | None  # samples per second, None if it is not known
    rate_source: str  # where the rate comes from
    unit: str  # of the values, empty if it is not known
    channel: str  # name of the column or channel
    notes: list  # comment lines of the file
    choice: str = ""  # what was taken from the file, and why
    whole: object = None  # figures of the whole file (Whole) where the values are a part of it

    def times(self):
        """The abscissae of the samples: seconds, or sample numbers without a rate."""
        return np.arange(len(self.values)) / (self.rate or 1.0)

    @property
    def time_unit(self):
        return "s" if self.rate else "samples"


class Whole:
    """Figures of a recording that is too long to be kept, part by part."""

    BLOCK = 4096  # samples between two points of the outline

    def __init__(self):
        self.count, self.total, self.squares = 0, 0.0, 0.0
        self.lows, self.highs, self._rest = [], [], np.empty(0)

    def add(self, values):
        if not len(values):
            return
        n = len(values)
        self.count += n
        self.total += n * call("Mean_head", values)
        rms = call("RMS_head", values)
        self.squares += n * (rms * rms)  # beyond all numbers perhaps, and no error
        values = np.concatenate([self._rest, values])
        blocks = values[:len(values) // self.BLOCK * self.BLOCK].reshape(-1, self.BLOCK)
        if len(blocks):
            self.lows.append(blocks.min(axis=1))
            self.highs.append(blocks.max(axis=1))
        self._rest = values[blocks.size:].copy()

    def outline(self):
        """The least and the greatest values of blocks one after the other, the last one shorter."""
        rest = [self._rest] if len(self._rest) else []
        return (np.concatenate([*self.lows, *([part.min()] for part in rest)]),
                np.concatenate([*self.highs, *([part.max()] for part in rest)]))

    @property
    def mean(self):
        return self.total / self.count

    @property
    def rms(self):
        return (self.squares / self.count) ** 0.5


NUMBER = r"(\d+(?:[.,]\d+)?(?:e\d+)?)\s*(k|M)?"
# A rate says that it is one: a plain number of hertz may be a corner or a tone.
RATES = [re.compile(pattern, re.IGNORECASE) for pattern in (
    rf"\b(?:fs|f_s|(?:sampl\w*|frame|abtast|scan)[ _-]*(?:rate|frequency|freq|frequenz))\W{{0,3}}"
    rf"(?:\((?:hz|1/s|s/s)\)\W{{0,2}})?{NUMBER}",
    rf"(?<![\d.,]){NUMBER}\s*(?:samples\s*(?:per\s+second|/\s*s(?:ec)?)|sps|s/s)(?![a-z])")]
UNIT = re.compile(r"\[([^\]]+)\]|\(([^)]+)\)|(?:\s/\s*|/ ?)(\S+)$|"
                  r"^([munpkM]?(?:V|A|g|Pa|bar|m|W|N|K|Hz)|°C|%|dB)$")


def rate_in(text):
    """A sampling rate that a text names as such, or None."""
    for pattern in RATES:
        if match := pattern.search(text):
            scale = {"k": 1e3, "M": 1e6}.get(match[2], 1e3 if match[2] else 1.0)
            rate = float(match[1].replace(",", ".")) * scale
            if rate > 0:
                return rate
    return None


def read(path, rate=None, column=None, decimal=None, missing=None, start=0):
    """Reads a text table or an audio file. `rate` overrides what the file says; `column` is a name or
    a number from 1; `decimal` is "point" or "comma"; `missing` values are refused, or "skip" or
    "interpolate"; `start` samples are left out."""
    path = os.fspath(path)
    if not os.path.exists(path):
        raise InputError(f"{path}: no such file")
    if os.path.isdir(path):
        raise InputError(f"{path}: is a folder; a text table or an audio file is needed")
    try:
        with open(path, "rb") as file:
            head = file.read(4096)
        if audio.is_audio(path, head):
            recording = _of_audio(path, column, start)
        else:
            recording = _of_table(path, column, decimal, missing, start)
    except OSError as error:
        raise InputError(f"{path}: cannot be read: {error.strerror}") from None
    lowest, highest = float(recording.values.min()), float(recording.values.max())
    if highest - lowest > WIDEST:
        raise InputError(f"{path}: from {lowest:g} to {highest:g} is more than a plot can span")
    if rate is not None:
        recording.rate, recording.rate_source = rate, "given on the command line"
    said = (f"{recording.rate:.10g} samples per second, {recording.rate_source}" if recording.rate
            else f"the sampling rate is not known: {recording.rate_source or 'nothing names one'}"
                 " (--rate sets it)")
    recording.choice = recording.choice.replace("{rate}", said)
    return recording


def _of_audio(path, column, start):
    whole = Whole()
    values, rate, channel, channels, frames = audio.read(path, column, start, MOST_SAMPLES, whole)
    others = f"; others: {_listed(f'channel {i + 1}' for i in range(channels) if i + 1 != channel)}"
    choice = f"channel {channel} of {channels}; {{rate}}{others * (channels > 1)}"
    choice += _part(start, len(values), frames)
    return Recording(os.path.basename(path), values, rate or None, "from the header of the file", "FS",
                     f"channel {channel} of {channels}", [], choice, whole if whole.count else None)


def _listed(names, most=12):
    names = list(names)
    return ", ".join(names[:most]) + f" and {len(names) - most} more" * (len(names) > most)


def _part(start, count, all_of_them):
    """What is told where the memory holds a part of a recording only."""
    if all_of_them > MOST_SAMPLES:
        return (f"; samples {start + 1} to {start + count} of {all_of_them}, since at most {MOST_SAMPLES} "
                "are analysed at once (--start takes others)")
    return f"; without the first {start} samples" if start else ""


def _of_table(path, column, decimal, missing, start):
    reader = tables.Reader(path, decimal, missing)
    layout = reader.layout
    times, indices = _roles(reader)
    chosen = _column(path, reader, times, indices, column)
    time = _time_column(reader, [c for c in times if c != chosen])
    values, seconds, whole = _columns(reader, chosen, time, start)
    if not len(values):
        raise InputError(f"{path}: has no value from sample {start + 1} on")
    said = []
    holes = np.isnan(values)
    if holes.any():
        values, seconds, treated = _without_holes(path, values, seconds, holes, missing)
        said.append(treated)
    rate, source = _rate(path, reader, seconds, time)
    label, unit = _label(layout, chosen, reader.notes)
    choice = f"column {chosen + 1} of {layout.width}" + (f", {layout.names[chosen]}"
                                                         if layout.names[chosen] else "")
    if layout.units[chosen]:
        choice += f" ({layout.units[chosen]})"
    if layout.on_one_line:
        choice = f"{len(values)} values on one line"
    parts = [choice]
    if layout.decimal == ",":
        parts[0] += ", with decimal commas"
    if time is not None:
        parts.append(f"time from {layout.label(time)}"
                     + (f" ({layout.units[time]})" if layout.units[time] else ""))
    parts.append("{rate}")
    others = [_named(layout, c, c in indices) for c in range(layout.width) if c not in (chosen, time)]
    if others:
        parts.append(f"others: {_listed(others)}")
    choice = "; ".join(parts + said) + _part(start, len(values), whole.count)
    is_part = whole.count > MOST_SAMPLES
    return Recording(os.path.basename(path), values, rate, source, unit, label, reader.notes, choice,
                     whole if is_part else None)


def _named(layout, column, is_index):
    name = layout.names[column] or f"column {column + 1}"
    return name + " (counts the rows)" * is_index


def _roles(reader):
    """The columns that are time and those that count the rows."""
    layout = reader.layout
    times = [c for c in range(layout.width) if reader.is_clock(c) or tables.time_unit(layout, c)[0]]
    indices = [c for c in range(layout.width) if c not in times and tables.is_index(layout, c)]
    unnamed = not any(layout.names) and layout.width > 1
    if unnamed and not times and 0 not in indices and _rises_evenly(layout.sample(0), layout.decimal):
        times = [0]
    return times, indices


def _rises_evenly(cells, decimal):
    values = [tables.number(cell, decimal) for cell in cells]
    if len(values) < 3 or None in values:
        return False
    steps = np.diff(values)
    return bool(steps.min() > 0 and steps.max() - steps.min() <= 0.01 * steps.max())


def column_called(path, layout, column):
    """The index of the column with a name, with or without its unit, or with a number from 1."""
    if column in layout.names:
        return layout.names.index(column)
    bare = [re.sub(r"\s*[\[(].*", "", name) for name in layout.names]
    if column in bare:
        return bare.index(column)
    if str(column).isdigit() and 1 <= int(column) <= layout.width:
        return int(column) - 1
    listed = ", ".join(repr(name) for name in layout.names if name) or "none of them has a name"
    raise InputError(f"{path}: no column {column!r} among its {layout.width}: {listed}")


def _column(path, reader, times, indices, column):
    """The index of the column to read: the chosen one, else the first of numbers that is neither time
    nor a count of the rows."""
    layout = reader.layout
    if column is not None:
        return column_called(path, layout, column)
    numeric = [c for c in range(layout.width) if not reader.is_clock(c) and any(
        tables.number(cell, layout.decimal) is not None for cell in layout.sample(c))]
    signals = [c for c in numeric if c not in times and c not in indices]
    if signals or layout.width == 1 and numeric:
        return (signals or numeric)[0]
    held = [f"{layout.label(c)}, holds {tables.shown(layout.body[0][c])}" for c in range(layout.width)]
    raise InputError(f"{path}: no column of numbers that is neither time nor a count of the rows: "
                     f"{_listed(held)}; --column takes one all the same")


def _time_column(reader, times):
    """The first that has times of day or numbers; a date alone comes after these."""
    dates = [c for c in times if reader.is_clock(c) and not any(
        ":" in cell for cell in reader.layout.sample(c))]
    ordered = [c for c in times if c not in dates] + dates
    return ordered[0] if ordered else None


def _columns(reader, chosen, time, start):
    """The values and the times, or None, from a sample on, and the figures of all."""
    columns = [chosen] if time is None else [chosen, time]
    kept, seen, whole = {c: [] for c in columns}, 0, Whole()
    for part, _ in reader.parts(columns):
        count = len(part[chosen])
        first, last = max(0, start - seen), max(0, start + MOST_SAMPLES - seen)
        seen += count
        for c in columns:
            kept[c].append(part[c][first:max(first, last)])
        whole.add(part[chosen][~np.isnan(part[chosen])])
    joined = {c: np.concatenate(parts) if parts else np.empty(0) for c, parts in kept.items()}
    return joined[chosen], joined.get(time), whole


def _without_holes(path, values, seconds, holes, missing):
    count = int(holes.sum())
    if holes.all():
        raise InputError(f"{path}: no value is left without the missing ones")
    missed = f"{count} missing value{'s' * (count > 1)} "
    if missing == "skip":
        return values[~holes], None if seconds is None else seconds[~holes], missed + "left out"
    at = np.arange(len(values)) if seconds is None else seconds
    values = values.copy()
    values[holes] = np.interp(at[holes], at[~holes], values[~holes])
    return values, seconds, missed + "interpolated"


def _rate(path, reader, seconds, time):
    """The sampling rate and where it comes from; without one, why."""
    layout, reason = reader.layout, ""
    if time is not None and len(seconds) > 1:
        scale, unit_said = _scale(reader, time, seconds)
        rate, told = rate_of_times(seconds, scale)
        if rate:
            return rate, "from the time column" + unit_said + told
        reason = f"the times {told}"
        if scale is None:
            reason = f"the unit of the times, {tables.time_unit(layout, time)[1]}, is not known"
    for text in [*reader.notes, *layout.names]:
        if rate := rate_in(text):
            return rate, "from a comment of the file" + f" ({reason})" * bool(reason)
    stem = os.path.splitext(os.path.basename(path))[0]
    if match := re.search(r"(\d+(?:[.,]\d+)?)_?(k|M)?hz(?![a-z])", stem, re.IGNORECASE):
        hint = f"the file's name has {match[0]}, which may be a rate or not"
        reason = f"{reason}; {hint}" if reason else hint
    return None, reason


def _scale(reader, time, times):
    """The seconds of one unit of the times, None if it is not known, and what to say of it."""
    if reader.is_clock(time):
        return 1.0, ""
    _, unit = tables.time_unit(reader.layout, time)
    if unit:
        return tables.SECONDS.get(unit.lower()), ""
    if not reader.layout.names[time]:
        return 1.0, ", which has no name and is taken as seconds"
    for least, scale, name in ((1e17, 1e-9, "nanoseconds"), (1e14, 1e-6, "microseconds"),
                               (1e11, 1e-3, "milliseconds")):
        if times[0] > least:
            return scale, f", whose numbers are {name} since 1970"
    return 1.0, ""


LEAST_ROUNDED = 8  # times, so that an even line through all of them is no accident


def rate_of_times(times, scale=1.0):
    """The rate of times, and in words what is uneven in them; None where they give no rate."""
    if scale is None:
        return None, ""
    steps = np.diff(times)
    if not np.isfinite(steps).all():
        return None, "are not all there"
    mean = (times[-1] - times[0]) / len(steps)
    digit = _last_digit(times)
    spread = np.abs(steps - mean).max()
    if steps.min() >= 0 and mean > 0 and spread > 1e-6 * mean and len(times) >= LEAST_ROUNDED:
        off_line = np.abs(times - (times[0] + mean * np.arange(len(times)))).max()
        if off_line <= 1.01 * digit:
            return _rounded_rate(mean * scale), (
                f", where times are rounded to {digit * scale:.3g} s: the mean of all")
    if steps.min() <= 0:
        return None, f"do not rise at sample {int(np.argmax(steps <= 0)) + 2}"
    step = float(np.median(steps))
    if spread <= 0.01 * mean + 4e-16 * abs(times[-1]):
        jitter = spread / mean
        return _rounded_rate(mean * scale), (f", whose steps differ by up to {100 * jitter:.2g} %: the mean"
                                             if jitter > 1e-4 else "")
    usual = np.abs(steps - step) <= 0.01 * step + 1.01 * digit
    gaps = np.flatnonzero(~usual & (steps > 1.5 * step))
    if len(gaps) and len(gaps) <= 0.05 * len(steps) and usual.sum() + len(gaps) == len(steps):
        step = float(steps[usual].mean())
        longest = gaps[np.argmax(steps[gaps])]
        return _rounded_rate(step * scale), (
            f", where {len(gaps)} gap{'s are' if len(gaps) > 1 else ' is'} closed, the longest of "
            f"{steps[longest] * scale:.4g} s after sample {longest + 1}: the samples are taken as even")
    return None, (f"are uneven, steps from {steps.min() * scale:.4g} to {steps.max() * scale:.4g} s: the "
                  "samples are taken one after the other")


def _last_digit(times):
    """The unit of the last decimal digit with which times are written, 0 if it is too fine."""
    some = np.abs(times[:2000])
    for digits in range(0, 10):
        scaled = some * 10**digits
        if np.abs(scaled - np.round(scaled)).max() <= 1e-6 + 1e-12 * scaled.max():
            return 10.0**-digits
    return 0.0


def _rounded_rate(step):
    rate = 1.0 / step
    return round(rate, 3) if abs(rate - round(rate, 3)) < 1e-6 * rate else rate


def _label(layout, column, notes):
    """The name of the signal and its unit."""
    name, unit = layout.names[column], layout.units[column]
    if not unit and (match := UNIT.search(name)):
        unit = next((group for group in match.groups() if group), "")
    if not unit and notes:
        units = re.findall(r"(?<=, )([munk]?V|[munk]?A|g|m/s2|Pa)(?=[,.;]|$)", notes[0])
        unit = units[0] if units else ""
    label = re.sub(r"\s*[\[(].*|\s+/\s.*", "", name) or f"column {column + 1}"
    return ("value" if label == unit else label), unit
