"""Recordings from text tables and WAV files.

A recording is read completely or not at all: whatever cannot be understood ends with an
InputError of one line that says what is wrong and where.
"""

import dataclasses
import math
import os
import re
import struct

import numpy as np


class InputError(Exception):
    """What is wrong with an input, with file and line."""


WIDEST = 1e307  # with the margins of a plot still a double


@dataclasses.dataclass
class Recording:
    name: str  # of the file, without its folder
    values: np.ndarray
    rate: float | None  # samples per second, None if it is not known
    rate_source: str  # where the rate comes from
    unit: str  # of the values, empty if it is not known
    channel: str  # name of the column or channel
    notes: list  # comment lines of the file

    def times(self):
        """The abscissae of the samples: seconds, or sample numbers without a rate."""
        return np.arange(len(self.values)) / (self.rate or 1.0)

    @property
    def time_unit(self):
        return "s" if self.rate else "samples"


RATE = re.compile(r"(\d+(?:[.,]\d+)?)\s*_?(k?)(?:hz|samples\s*(?:per\s+second|/\s*s(?:ec)?)|sps)"
                  r"(?![a-z])", re.IGNORECASE)
NAMED_RATE = re.compile(r"(?:\bfs|(?:sampl\w*|frame)[ _-]*(?:rate|frequency))\W{0,3}"
                        r"(\d+(?:\.\d+)?)\s*(k?)", re.IGNORECASE)
UNIT = re.compile(r"(?:\[([^\]]+)\]|\(([^)]+)\)|^([munpkM]?(?:V|A|g|Pa|bar|m|W|N|K|Hz)|°C|%|dB)$)")
TIME_NAME = re.compile(r"^\s*(t|time|sec|secs|seconds|zeit)\b", re.IGNORECASE)


def rate_in(text):
    """A sampling rate that a text names, or None."""
    for pattern in (RATE, NAMED_RATE):
        match = pattern.search(text)
        if match:
            rate = float(match.group(1).replace(",", ".")) * (1000 if match.group(2) else 1)
            if rate > 0:
                return rate
    return None


def read(path, rate=None, column=None):
    """Reads a CSV or WAV file. `rate` overrides what the file says; `column` is a name or a
    number from 1."""
    path = os.fspath(path)
    if not os.path.exists(path):
        raise InputError(f"{path}: no such file")
    if os.path.isdir(path):
        raise InputError(f"{path}: is a folder; a CSV or WAV file is needed")
    try:
        with open(path, "rb") as file:
            data = file.read()
    except OSError as error:
        raise InputError(f"{path}: cannot be read: {error.strerror}") from None
    if not data:
        raise InputError(f"{path}: the file is empty")
    if data[:4] in (b"RIFF", b"RIFX", b"RF64"):
        recording = _wav(path, data, column)
    else:
        recording = _table(path, _text(path, data), column)
    lowest, highest = float(recording.values.min()), float(recording.values.max())
    if highest - lowest > WIDEST:
        raise InputError(f"{path}: from {lowest:g} to {highest:g} is more than a plot can span")
    if rate is not None:
        recording.rate, recording.rate_source = rate, "given on the command line"
    elif recording.rate is None:
        recording.rate = rate_in(os.path.splitext(recording.name)[0])
        recording.rate_source = "from the file's name" if recording.rate else "unknown"
    return recording


def _text(path, data):
    if data[:2] in (b"\xff\xfe", b"\xfe\xff"):
        try:
            return data.decode("utf-16")
        except UnicodeDecodeError:
            raise InputError(f"{path}: neither a text file nor a WAV file") from None
    control = data[:65536].translate(None, bytes(set(range(256)) - set(range(32)) | {9, 10, 12, 13}))
    if control:
        line = data[:data.index(control[:1])].count(b"\n") + 1
        raise InputError(f"{path}:{line}: neither a text file nor a WAV file: byte "
                         f"0x{control[0]:02X} found")
    try:
        return data.decode("utf-8-sig")
    except UnicodeDecodeError:
        return data.decode("latin-1")


def _number(cell, decimal_comma):
    """The number in a cell, or None. NaN and infinities are numbers here."""
    if decimal_comma:
        cell = cell.replace(",", ".")
    if "_" in cell:
        return None
    try:
        return float(cell)
    except ValueError:
        return None


class _Layout:
    """How the lines of a table are cut into cells."""

    def __init__(self, lines):
        sample = [line for _, line in lines[:200]]
        self.separator = next((mark for mark in ";\t" if all(mark in line for line in sample)), None)
        if self.separator is None and any("," in line for line in sample):
            self.separator = ","
        self.decimal_comma = self.separator in (";", "\t") and not any(
            "." in line for line in sample[1:])

    def cells(self, line):
        parts = line.split(self.separator) if self.separator else line.split()
        return [part.strip().strip('"').strip() for part in parts]

    def numbers(self, line):
        return [_number(cell, self.decimal_comma) for cell in self.cells(line)]


def _table(path, text, column):
    notes, lines = [], []
    for number, line in enumerate(text.splitlines(), 1):
        line = line.strip()
        if line.startswith(("#", "%", "//")):
            notes.append(line.lstrip("#%/ ").strip())
        elif line:
            lines.append((number, line))
    if not lines:
        raise InputError(f"{path}: holds no numbers")
    layout = _Layout(lines)
    header = ""
    while lines and all(value is None for value in layout.numbers(lines[0][1])):
        header = lines.pop(0)[1]
    if not lines:
        raise InputError(f"{path}: holds no numbers")

    width = len(layout.cells(lines[0][1]))
    names = [header.strip('"')] if width == 1 else layout.cells(header)
    if len(names) != width:
        names = [""] * width
    index = _column(path, names, width, column)
    rate, rate_source = next(
        ((found, "from the file's comments") for found in map(rate_in, [*notes, header]) if found),
        (None, "unknown"))
    values = _values(path, lines, layout, index)
    if rate is None and TIME_NAME.match(names[0]) and width > 1 and index != 0:
        rate = _rate_of_times(_values(path, lines, layout, 0), names[0])
        rate_source = "from the time column" if rate else "unknown"
    unit = _unit(names[index])
    if not unit and notes:
        units = re.findall(r"(?<=, )([munk]?V|[munk]?A|g|m/s2|Pa)(?=[,.;]|$)", notes[0])
        unit = units[0] if units else ""
    channel = re.sub(r"\s*[\[(].*", "", names[index]) or f"column {index + 1}"
    if channel == unit:
        channel = "value"
    return Recording(os.path.basename(path), values, rate, rate_source, unit, channel, notes)


def _unit(name):
    match = UNIT.search(name)
    return next((group for group in match.groups() if group), "") if match else ""


def _column(path, names, width, column):
    """The index of the column to read: the chosen one, else the first that is not time."""
    if column is None:
        return 1 if width > 1 and TIME_NAME.match(names[0]) else 0
    if column in names:
        return names.index(column)
    if str(column).isdigit() and 1 <= int(column) <= width:
        return int(column) - 1
    listed = ", ".join(repr(name) for name in names if name) or "none of them has a name"
    raise InputError(f"{path}: no column {column!r} among its {width}: {listed}")


def _values(path, lines, layout, index):
    values = np.empty(len(lines))
    for i, (number, line) in enumerate(lines):
        cells = layout.cells(line)
        if index >= len(cells) or not cells[index]:
            raise InputError(f"{path}:{number}: column {index + 1} is missing")
        value = _number(cells[index], layout.decimal_comma)
        if value is None:
            raise InputError(f"{path}:{number}: {_shown(cells[index])} is not a number")
        if not math.isfinite(value):
            raise InputError(f"{path}:{number}: {_shown(cells[index])} is not a finite number")
        values[i] = value
    return values


def _shown(cell):
    return repr(cell if len(cell) <= 40 else cell[:37] + "...")


def _rate_of_times(times, name):
    """The rate of evenly spaced times, or None."""
    steps = np.diff(times)
    if len(steps) == 0 or steps.min() <= 0:
        return None
    step = (times[-1] - times[0]) / len(steps)
    if np.abs(steps - step).max() > 0.01 * step + 1e-9 * abs(times[-1]):
        return None
    scale = {"ms": 1e-3, "us": 1e-6, "µs": 1e-6, "min": 60.0}.get(_time_unit(name), 1.0)
    rate = 1.0 / (step * scale)
    return round(rate, 3) if abs(rate - round(rate, 3)) < 1e-6 * rate else rate


def _time_unit(name):
    match = re.search(r"[\[(]\s*(\S+?)\s*[\])]", name)
    return match.group(1) if match else "s"


def _wav(path, data, column):
    """Uncompressed WAV files: integers of 8 to 32 bits, floats of 32 and 64. The unit is the
    full scale, FS."""
    if data[:4] != b"RIFF" or data[8:12] != b"WAVE":
        raise InputError(f"{path}: not a WAV file that can be read (only RIFF WAVE)")
    chunks, position = {}, 12
    while position + 8 <= len(data):
        name, size = struct.unpack_from("<4sI", data, position)
        chunks.setdefault(name, data[position + 8:position + 8 + size])
        position += 8 + size + size % 2
    if len(chunks.get(b"fmt ", b"")) < 16:
        raise InputError(f"{path}: the WAV file has no format chunk")
    if not chunks.get(b"data"):
        raise InputError(f"{path}: the WAV file holds no samples")
    form, channels, rate, _, _, bits = struct.unpack_from("<HHIIHH", chunks[b"fmt "])
    if form == 0xFFFE and len(chunks[b"fmt "]) >= 26:
        form = struct.unpack_from("<H", chunks[b"fmt "], 24)[0]
    if (form, bits) not in ((1, 8), (1, 16), (1, 24), (1, 32), (3, 32), (3, 64)) or channels < 1:
        raise InputError(f"{path}: WAV format {form} with {bits} bits cannot be read")
    body = chunks[b"data"]
    body = body[:len(body) // (channels * bits // 8) * (channels * bits // 8)]
    if not body:
        raise InputError(f"{path}: the WAV file holds no samples")
    samples = _samples(body, form, bits).reshape(-1, channels)
    if column is not None and not (str(column).isdigit() and 1 <= int(column) <= channels):
        raise InputError(f"{path}: no channel {column!r} among its {channels}")
    channel = int(column or 1)
    values = np.ascontiguousarray(samples[:, channel - 1])
    wrong = np.flatnonzero(~np.isfinite(values))
    if len(wrong):
        raise InputError(f"{path}: sample {wrong[0] + 1} is not a finite number")
    return Recording(os.path.basename(path), values, float(rate) or None, "from the WAV header",
                     "FS", f"channel {channel} of {channels}", [])


def _samples(body, form, bits):
    if form == 3:
        return np.frombuffer(body, f"<f{bits // 8}").astype(float)
    if bits == 8:
        return (np.frombuffer(body, np.uint8).astype(float) - 128) / 128
    if bits == 24:
        wide = np.zeros((len(body) // 3, 4), np.uint8)
        wide[:, 1:] = np.frombuffer(body, np.uint8).reshape(-1, 3)
        return wide.view("<i4").ravel() / 2.0**31
    return np.frombuffer(body, f"<i{bits // 8}") / 2.0**(bits - 1)
