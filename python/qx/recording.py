"""Recordings from text tables, sheets, arrays and audio files.

A recording is read completely or not at all: anything that cannot be understood raises an InputError, one
line that says what is wrong and where. `choice` reports what was chosen, and why. The rules are in
docs/recordings.md.
"""

import contextlib
import csv
import dataclasses
import os
import re

import numpy as np

from . import audio, files, isolation, rates, stored, tables, times
from .envelopes import Envelope
from .files import InputError, printable
from .wholes import Whole

WIDEST = 1e307  # a range that is still a double with the margins of a plot
MOST_SAMPLES = 1 << 22  # samples of a recording that are kept in memory
MOST_CHANNELS = 64  # channels that a page shows


@dataclasses.dataclass
class Recording:
    name: str  # name of the file, without its folder
    values: np.ndarray
    rate: float | None  # samples per second, None if it is not known
    rate_source: str  # where the rate comes from
    unit: str  # unit of the values, empty if it is not known
    channel: str  # name of the column or channel
    notes: list  # comment lines of the file
    choice: str = ""  # what was taken from the file, and why
    whole: object = None  # all samples (Whole), if the values are only the first of them
    envelope: object = None  # the outline of all samples (Envelope), with gaps where values are left out
    row_rate: float | None = None  # rate of the outlines, which may differ from that of the values
    others: list = dataclasses.field(default_factory=list)  # the other channels (Channel)

    def times(self):
        """The abscissae of the samples: seconds, or sample numbers without a rate."""
        return np.arange(len(self.values)) / (self.rate or 1.0)

    @property
    def time_unit(self):
        return "s" if self.rate else "samples"


UNIT = re.compile(r"\[([^\]]+)\]|\(([^)]+)\)|(?:\s/\s*|/ ?)(\S+)$|"
                  r"^([munpkM]?(?:V|A|g|Pa|bar|m|W|N|K|Hz)|°C|%|dB)$")


@dataclasses.dataclass
class Channel:
    """A channel that is shown besides the analysed one: its outline."""
    channel: str
    unit: str
    envelope: object  # Envelope


def read(path, rate=None, column=None, decimal=None, missing=None, start=0, time=None, dates=None,
         thousands=False, outline=Envelope, progress=lambda samples: None):
    """Reads a text table, a sheet, arrays or an audio file; "-" is standard input. `rate` overrides what the
    file says; its times are then not read. `column` and `time` are names or numbers from 1; `time` is "none"
    if no column is time. `decimal` is "point" or "comma". `thousands` says that a single mark before three
    digits groups thousands. `dates` is "dmy" or "mdy" for ambiguous dates. `missing` is "skip" or
    "interpolate"; otherwise missing values are refused. `start` is the number of samples to skip. `outline`
    creates the object to which the values of each channel are added: the `envelope` of the recording and of
    the other channels. `progress` is called with the number of samples of each part. The file is read in a
    separate process with limits (qx/isolation.py)."""
    recording = isolation.read(_read, path, rate, column, decimal, missing, start, time, dates, thousands, outline,
                               told=progress)
    if recording.whole:
        recording.whole.progress = progress
    return recording


def _read(progress, path, file, rate, column, decimal, missing, start, time, dates, thousands, outline):
    with opened(path, file) as source:
        if audio.is_audio(source.name, source.head):
            recording = _of_audio(source, column, start, outline, progress)
        else:
            options = {"decimal": decimal, "missing": missing, "dates": dates, "thousands": thousands}
            reader = table_of(source, time, options, column)
            habit = rates.Habit(reader.layout.shown, {"comma": ",", "point": "."}.get(decimal, ""), thousands)
            recording = _of_table(reader, column, time, missing, start, rate, habit, outline, progress)
    some = recording.whole and recording.whole.moments
    lowest, highest = ((some.least, some.greatest) if some else
                       (float(recording.values.min()), float(recording.values.max())))
    if highest - lowest > WIDEST:
        raise InputError(f"{source.path}: from {lowest:g} to {highest:g} is more than a plot can span")
    if rate is not None:
        recording.rate, recording.rate_source = rate, "given on the command line"
    said = (f"{recording.rate:.10g} samples per second, {recording.rate_source}" if recording.rate
            else f"the sampling rate is not known: {recording.rate_source or 'nothing names one'}"
                 " (--rate sets it)")
    recording.choice = recording.choice.replace("{rate}", said)
    return _shown(recording)


def _shown(recording):
    """The recording with the texts of the file made printable."""
    for one in (recording, *recording.others):
        one.channel, one.unit = printable(one.channel), printable(one.unit)
    recording.name, recording.choice = printable(recording.name), printable(recording.choice)
    recording.rate_source, recording.notes = printable(recording.rate_source), list(map(printable, recording.notes))
    return recording


@contextlib.contextmanager
def opened(path, file):
    """The contents of a file (files.Source), which messages call `path`. Problems with the file itself raise an
    InputError."""
    try:
        with files.Source(path, file) as source:
            yield source
    except csv.Error as error:
        raise InputError(f"{path}: cannot be cut into cells: {error}") from None
    except OSError as error:
        raise InputError(f"{path}: cannot be read: {error.strerror or error}") from None


def table_of(source, time, options, *wanted):
    """The reader of a table: of text, of a sheet, or of arrays. `options` are those of tables.Reader, and
    `wanted` the names of columns that it must have."""
    kind = source.kind()
    if kind in stored.READERS:
        reader = stored.READERS[kind](source, [*wanted, time])
        reader.missing = options["missing"]
    elif kind:
        reader = stored.read_sheets(source, kind, options)
    else:
        reader = tables.Reader(source, **options)
    if time not in (None, "none"):
        reader.named_as_time = column_called(source.path, reader.layout, time)
    return reader


def _of_audio(source, column, start, outline, progress):
    whole = Whole(MOST_SAMPLES, outline, progress)
    path = source.local()
    outlines = {}
    values, rate, channel, channels, frames = audio.read(source.path, path, column, start, MOST_SAMPLES, whole,
                                                         outlines, outline)
    shown = [Channel(f"channel {i + 1} of {channels}", "FS", outlines[i]) for i in sorted(outlines)[:MOST_CHANNELS]]
    others = f"; others: {_listed(f'channel {i + 1}' for i in range(channels) if i + 1 != channel)}"
    choice = f"channel {channel} of {channels}; {{rate}}{others * (channels > 1)}"
    choice += _part(start, len(values), frames - start)
    if wrong := audio.wrong_length(path, frames):
        choice += f"; {wrong}"
    return Recording(source.name, values, rate or None, "from the header of the file", "FS",
                     f"channel {channel} of {channels}", [], choice, _if_longer(whole), whole.envelope, others=shown)


def _if_longer(whole):
    """All samples, if the values are a part of them. None if more than half of the kept values are missing, since
    the long segments of the spectra then have too few values."""
    whole.finish()
    return whole if whole.count > MOST_SAMPLES // 2 else None


def _listed(names, most=12):
    names = list(names)
    return ", ".join(names[:most]) + f" and {len(names) - most} more" * (len(names) > most)


def _part(start, count, there):
    """The remark for a recording of which only a part is in memory. `there` is the number of samples after the
    first `start`."""
    if there > MOST_SAMPLES:
        return (f"; samples {start + 1} to {start + count} of {start + there} are kept in memory, which holds "
                f"{MOST_SAMPLES} (--start takes others)")
    return f"; without the first {start} samples" if start else ""


def _of_table(reader, column, time, missing, start, rate, habit, outline, progress):
    path, layout = reader.path, reader.layout
    _refuse_wrapped(reader, column)
    clocks, indices = _roles(reader, time)
    chosen = _column(reader, clocks, indices, column)
    time = None if rate else _time_column(reader, [c for c in clocks if c != chosen])
    others = [c for c in _numeric(reader) if c not in (chosen, time, *clocks, *indices)][:MOST_CHANNELS]
    outlines = {c: outline() for c in others}
    whole = Whole(MOST_SAMPLES, outline, progress, missing == "interpolate")
    values, seconds, said = _columns(reader, chosen, time, start, outlines, whole)
    if not len(values):
        raise InputError(f"{path}: has no value from sample {start + 1} on")
    count, holes, row_rate = len(values), np.isnan(values), None
    if holes.any():
        if missing == "skip" and time is not None:
            row_rate, _ = _rate(reader, seconds, time, habit)
        values, seconds, treated = _without_holes(path, values, seconds, holes, missing)
        said.append(treated)
    source = ""
    if not rate:
        rate, source = _rate(reader, seconds, time, habit)
    label, unit = _label(layout, chosen, reader.notes)
    choice = "; ".join([*_told_of_columns(reader, values, chosen, time, indices), *reader.told, *said])
    choice += _part(start, count, whole.rows)
    shown = []
    for c, one in outlines.items():
        name, its_unit = _label(layout, c, reader.notes)
        shown.append(Channel(name, its_unit, one))
    return Recording(reader.name, values, rate, source, unit, label, reader.notes, choice,
                     _if_longer(whole), whole.envelope, row_rate, shown)


def _refuse_wrapped(reader, column):
    """Refuses a table whose lines hold several samples of one signal, unless a column is chosen."""
    for note in reader.notes:
        match = rates.SEVERAL_A_LINE.search(note)
        if match and int(match[1]) > 1 and column is None:
            raise InputError(f"{reader.path}: has {match[0]!r}, which is not read; --column takes one column "
                             "all the same")


def _told_of_columns(reader, values, chosen, time, indices):
    """Remarks on what was read from a table; the rate is inserted later."""
    layout = reader.layout
    choice = f"column {chosen + 1} of {layout.width}" + (f", {layout.names[chosen]}"
                                                         if layout.names[chosen] else "")
    if layout.units[chosen]:
        choice += f" ({layout.units[chosen]})"
    if layout.on_one_line:
        choice = f"{len(values)} values on one line"
    if layout.decimal == ",":
        choice += ", with decimal commas"
    yield choice
    if time is not None:
        yield f"time from {layout.label(time)}" + (f" ({layout.units[time]})" if layout.units[time] else "")
    yield "{rate}"
    others = [_named(layout, c, c in indices) for c in range(layout.width)
              if c not in (chosen, time, _date_beside(reader, time))]
    if others:
        yield f"others: {_listed(others)}"


def _named(layout, column, is_index):
    name = layout.names[column] or f"column {column + 1}"
    return name + " (counts the rows)" * is_index


def _roles(reader, time):
    """The columns of times, and those that count the rows."""
    layout = reader.layout
    if reader.named_as_time is not None:
        found = [reader.named_as_time]
    elif time == "none":
        found = []
    else:
        found = [c for c in range(layout.width) if reader.is_clock(c) or tables.time_unit(layout, c)[0]]
    indices = [c for c in range(layout.width) if c not in found and tables.is_index(layout, c)]
    unnamed = not any(layout.names) and layout.width > 1
    if unnamed and not found and time is None and 0 not in indices and reader.where != "the file" and _rises_evenly(
            layout.sample(0), layout):
        found = [0]
    return found, indices


def _rises_evenly(cells, layout):
    values = [layout.number(cell) for cell in cells]
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
    listed = ", ".join(repr(name) for name in layout.names if name) or "none has a name"
    raise InputError(f"{path}: no column {column!r} among its {layout.width}: {listed}")


def _column(reader, times, indices, column):
    """The index of the column to read: the chosen one, or else the first column of numbers that is neither
    time nor a count of the rows."""
    layout, path = reader.layout, reader.path
    if column is not None:
        return column_called(path, layout, column)
    numeric = _numeric(reader)
    signals = [c for c in numeric if c not in times and c not in indices]
    if signals or layout.width == 1 and numeric:
        return (signals or numeric)[0]
    held = [f"{layout.label(c)}, holds {tables.shown(layout.body[0][c])}" for c in range(layout.width)]
    raise InputError(f"{path}: no column of numbers that is neither time nor a count of the rows: "
                     f"{_listed(held)}; --column takes one all the same")


def _numeric(reader):
    """The columns of numbers."""
    layout = reader.layout
    return [c for c in range(layout.width) if not reader.is_clock(c) and any(
        layout.number(cell) is not None for cell in layout.sample(c))]


def _time_column(reader, times):
    """The first column with times of day or numbers, or else the first with dates alone."""
    dates = [c for c in times if reader.is_clock(c) and not any(
        ":" in cell for cell in reader.layout.sample(c))]
    ordered = [c for c in times if c not in dates] + dates
    return ordered[0] if ordered else None


def _date_beside(reader, time):
    """The column of dates that goes with a column of times of day, or None."""
    if time is None or not reader.is_clock(time) or not reader.is_of_day(time):
        return None
    return next((c for c in range(reader.layout.width) if c != time and reader.is_clock(c)
                 and not reader.is_of_day(c) and not any(":" in cell for cell in reader.layout.sample(c))), None)


def _columns(reader, chosen, time, start, outlines, whole):
    """The values and the times (or None) from a sample on, the figures of all values, and remarks on them.
    `outlines` contains the Envelopes of other columns, which are filled. A column that cannot be read is
    dropped."""
    date = _date_beside(reader, time)
    columns = [c for c in dict.fromkeys((chosen, time, date)) if c is not None]
    kept, seen = {c: [] for c in columns}, 0
    for part, _ in reader.parts(columns, outlines):
        first, last = max(0, start - seen), max(0, start + MOST_SAMPLES - seen)
        seen += len(part[chosen])
        for c in columns:
            kept[c].append(part[c][first:max(first, last)])
        whole.add(part[chosen][first:])
        for c in list(outlines):
            if part[c] is None:
                del outlines[c]
            else:
                outlines[c].add(part[c][first:])
    joined = {c: np.concatenate(parts) if parts else np.empty(0) for c, parts in kept.items()}
    seconds, said = joined.get(time), []
    if date is not None:
        seconds = seconds + joined[date]
        said = [f"dates from {reader.layout.label(date)}"]
    elif time is not None and reader.is_clock(time) and reader.is_of_day(time):
        seconds, nights = times.over_midnight(seconds)
        if nights:
            said = [f"the times go over midnight {nights} time{'s' * (nights > 1)}"]
    return joined[chosen], seconds, said


def _without_holes(path, values, seconds, holes, missing):
    count = int(holes.sum())
    if holes.all():
        raise InputError(f"{path}: all values are missing")
    missed = f"{count} missing value{'s' * (count > 1)} "
    if missing == "skip":
        return values[~holes], None if seconds is None else seconds[~holes], missed + "left out"
    at = np.arange(len(values)) if seconds is None else seconds
    values = values.copy()
    values[holes] = np.interp(at[holes], at[~holes], values[~holes])
    return values, seconds, missed + "interpolated"


def _rate(reader, seconds, time, habit):
    """The sampling rate and where it comes from; None and the reason, if there is none."""
    layout, reasons, named = reader.layout, [], []
    if reader.where == "the file":
        habit = rates.Habit(told=".")
        named = list(filter(None, map(stored.rate_in, reader.notes)))
    for text in [*reader.notes, *layout.names]:
        found, remarks = rates.named_in(text, habit)
        named += [one for one in found if text not in {other.words for other in named}]
        reasons += remarks
    if time is not None and len(seconds) > 1:
        scale, unit_said = _scale(reader, time, seconds)
        if scale is None:
            reasons.insert(0, unit_said)
        else:
            rate, told = times.rate_of(seconds, scale)
            if rate:
                return _with_comments(rate, "from the time column", unit_said, told, named)
            reasons.insert(0, f"the times {told}")
    if named:
        one = _the_named(reader.path, named)
        source = f"from {reader.where}, '{one.words}'" + (f", taken as {one.assumed}" if one.assumed else "")
        return one.readings[0], source + (f" ({'; '.join(reasons)})" if reasons else "")
    stem = os.path.splitext(reader.name)[0]
    if match := re.search(r"(\d+(?:[.,]\d+)?)_?(k|M)?hz(?![a-z])", stem, re.IGNORECASE):
        reasons.append(f"the file's name has {match[0]}, which may be a rate or not")
    return None, "; ".join(reasons)


AGREES = 0.01  # relative difference between the rate of the times and that of a comment
UNSAID = "which names no unit: taken as seconds"


def _agrees(rate, named):
    return any(abs(reading / rate - 1) <= AGREES for reading in named.readings)


def _with_comments(rate, source, unit_said, told, named):
    """The rate of the times, compared with the rates in comments. The comments decide on a unit that is not
    given, and disagreement is reported."""
    if unit_said == UNSAID and named and not any(_agrees(rate, one) for one in named):
        for scale, unit in ((1e-3, "milliseconds"), (1e-6, "microseconds"), (1e-9, "nanoseconds"), (60, "minutes")):
            if agreeing := [one for one in named if _agrees(rate / scale, one)]:
                rate, unit_said = rate / scale, f"which names no unit: taken as {unit} by '{agreeing[0].words}'"
                told = ""  # which referred to the other unit
                break
    others = [f"'{one.words}' says otherwise" for one in named if one.readings and not _agrees(rate, one)]
    return rate, "; ".join([source + f", {unit_said}" * bool(unit_said) + told, *dict.fromkeys(others)])


def _the_named(path, named):
    """The rate that a file names. Several rates, and an ambiguous one, are refused."""
    for one in named:
        if not one.readings:
            raise InputError(f"{path}: '{one.words}' names no single number: --rate says what the rate is")
    sure = [one for one in named if len(one.readings) == 1]
    for one in sure:
        for other in named:
            if not any(abs(reading / one.readings[0] - 1) <= 1e-3 for reading in other.readings):
                raise InputError(f"{path}: '{one.words}' and '{other.words}' are two sampling rates: --rate "
                                 "says which")
    if not sure:
        many = " or ".join(f"{reading:.10g}" for reading in named[0].readings)
        raise InputError(f"{path}: '{named[0].words}' may be {many} samples per second: --rate says which")
    return sure[0]


def _scale(reader, time, numbers):
    """The seconds of one unit of the times, and a remark on it; None and the reason, if it is not known."""
    layout = reader.layout
    if reader.is_clock(time):
        return 1.0, ""
    _, unit = tables.time_unit(layout, time, reader.named_as_time)
    origin = reader.origins.get(time, 0)
    first = float(numbers[0] + origin)
    if unit:
        scale = rates.seconds_of(unit)
        if scale is None:
            return None, f"the unit of the times, {unit}, is not known"
        is_julian = re.match(r"m?jd", layout.names[time].strip(), re.IGNORECASE)
        return scale, "whose numbers are Julian days" if is_julian else ""
    for scale, name in ((1e-9, "nanoseconds"), (1e-6, "microseconds"), (1e-3, "milliseconds"), (1.0, "seconds")):
        if 3e8 < first * scale < 4.2e9:  # from 1979 to 2103
            return scale, f"whose numbers are {name} since 1970"
    if (20000 <= first <= 80000 or 690000 <= first <= 800000) and len(numbers) > 2:
        return _of_days(layout.names[time], first, numbers)
    if not layout.names[time]:
        return 1.0, "which has no name and is taken as seconds"
    return 1.0, UNSAID


def _of_days(name, first, numbers):
    """Whether times around 45000 are days since 1900, as in spreadsheets, or seconds."""
    step = (numbers[-1] - numbers[0]) / (len(numbers) - 1)
    days = (86400.0, "whose numbers are days of a spreadsheet")
    if re.match(r"dat|fecha", name.strip(), re.IGNORECASE):
        return days
    if step <= 0:
        return 1.0, UNSAID
    in_seconds = abs(step * 1e4 - round(step * 1e4)) < 1e-6 * step * 1e4 + 1e-6
    length = step * 86400
    near = round(length) if length >= 0.75 else 1 / max(1, round(1 / length))
    in_days = abs(length / near - 1) < 0.01 and (length < 1 or any(
        near % unit == 0 for unit in (86400, 3600, 300, 60)) or near in (1, 2, 3, 4, 5, 6, 10, 12, 15, 20, 30))
    if in_days and not in_seconds:
        return days
    if not in_days:
        return 1.0, UNSAID
    return None, f"the times from {first:.10g} may be seconds or days of a spreadsheet"


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
