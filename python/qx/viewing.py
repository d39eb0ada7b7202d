"""Recordings for `view`: all samples of all channels on disk, with levels of detail, and the sections for a part of
them, with a chosen filter and window."""

import contextlib
import dataclasses
import os
import tempfile
import threading

import numpy as np

from . import figures, pages, recording, sections_recording, sections_spectra
from .files import InputError
from .outcomes import QxError
from .sections import Section, number
from .sections_filtering import filtered
from .sections_measuring import events

BLOCK = 64  # number of samples, or of blocks, in a block of the next level
WINDOWS = ("hann", "hamming", "blackman", "blackman_harris", "flattop", "boxcar")
KINDS = ("none", "lowpass", "highpass", "bandpass", "bandstop")
MOST = 1 << 22  # most samples in the sections


class Levels:
    """The samples of a channel in a file, and the lowest and highest values of blocks. It is filled part by part,
    like an Envelope. The file has no name, so its space is freed however the process ends."""

    def __init__(self):
        self._file = tempfile.TemporaryFile()
        self._parts, self._rest, self.count = [], np.empty(0), 0

    def add(self, values):
        values = np.ascontiguousarray(values, float)
        try:
            self._file.write(values.data)
            self._file.flush()
        except OSError as error:
            raise InputError(f"the samples cannot be kept in {tempfile.gettempdir()}: {error.strerror}") from None
        self.count += len(values)
        values = np.concatenate([self._rest, values])
        whole = len(values) // BLOCK * BLOCK
        if whole:
            self._parts.append(figures.extremes(values[:whole], BLOCK))
        self._rest = values[whole:].copy()

    def finish(self):
        self._file.flush()
        self.values = np.memmap(self._file, float, "r", shape=(self.count,))
        self._file.close()
        if len(self._rest):
            self._parts.append(figures.extremes(self._rest, BLOCK))
        blocks = tuple(map(np.concatenate, zip(*self._parts)))
        self._blocks = [(BLOCK, *blocks), (BLOCK**2, *figures.extremes(blocks[0], BLOCK, blocks[1]))]
        self._parts, self._rest = [], np.empty(0)

    def seen(self, first, last, most):
        """The samples from `first` to `last`, in at most about `most` groups: the first index, the number of samples
        in a group, and the lowest and the highest values, or the samples themselves and None."""
        first, last = max(0, first), min(self.count, last)
        group = max(1, -(-(last - first) // max(1, most)))
        for samples, lows, highs in reversed(self._blocks):
            if group >= samples:
                part = slice(first // samples, -(-last // samples))
                group //= samples
                return (part.start * samples, group * samples,
                        *figures.extremes(lows[part], group, highs[part])) if group > 1 else (
                            part.start * samples, samples, lows[part], highs[part])
        values = self.values[first:last]
        return (first, 1, values, None) if group == 1 else (first, group, *figures.extremes(values, group))


@dataclasses.dataclass
class Choices:
    """Which part of a recording is analysed, and how."""
    channel: int = 0
    start: float = 0.0  # in the unit of the recording's times
    end: float = float("inf")
    window: str = "hann"
    kind: str = "none"
    edges: tuple = ()
    order: int = 4


class Opened:
    """A recording that is shown, and read again when its file has changed."""

    def __init__(self, path, options):
        self.path, self.options = path, options
        self.name = os.path.basename(path)
        self._lock = threading.Lock()
        self._seen = None
        self.version = 0
        self.read()

    def state(self):
        """"same", "changed" or "gone", depending on the file's present state."""
        found = self._status()
        return "same" if found == self._seen else "changed" if found else "gone"

    def _status(self):
        with contextlib.suppress(OSError):
            status = os.stat(self.path)
            return status.st_ino, status.st_size, status.st_mtime_ns
        return None

    def read(self):
        """Reads the file again if it has changed. If that fails, the earlier contents are kept."""
        with self._lock:
            status = self._status()
            if status == self._seen and self.version:
                return
            self._take(recording.read(self.path, **self.options, outline=Levels))
            self._seen = status
            self.version += 1

    def _take(self, read):
        channels = [(read.channel, read.unit, read.envelope)]
        channels += [(other.channel, other.unit, other.envelope) for other in read.others]
        for *_, levels in channels:
            levels.finish()
        self.recording, self.channels = dataclasses.replace(
            read, rate=read.row_rate or read.rate, others=[], whole=None, envelope=None), channels

    def plots(self):
        """The plots of the channels. Their samples are requested as they are needed."""
        for name, unit, levels in self.channels:
            shown = dataclasses.replace(self.recording, channel=name, unit=unit)
            plot = figures.described(sections_recording.over_time(shown, name, curves=[
                figures.Curve(name, np.empty(0))]))
            yield {**plot, "count": levels.count}

    def data(self, channel, start, end, points):
        """A part of a channel, in the form that the page takes."""
        levels = self.channels[channel][2]
        rate = self.recording.rate or 1.0
        first, group, lows, highs = levels.seen(int(np.floor(start * rate)), int(np.ceil(end * rate)) + 1, points)
        return {"start": first / rate, "step": group / rate, "lows": figures.numbers(lows),
                "highs": None if highs is None else figures.numbers(highs)}

    def sections(self, choices):
        """The sections, with their plots over time shifted to the position of the part."""
        name, unit, levels = self.channels[choices.channel]
        rate = self.recording.rate or 1.0
        first = min(max(0, round(choices.start * rate)), levels.count - 1)
        last = min(levels.count, round(min(choices.end, levels.count / rate) * rate) + 1)
        if last <= first:
            raise InputError("the part ends before it begins")
        said = ""
        if last - first > MOST:
            last = first + MOST
            said = f" Only the first {MOST} samples of the part are analysed."
        values = np.array(levels.values[first:last])
        there = np.isfinite(values)
        if there.sum() < 2:
            raise InputError("the part has fewer than two samples")
        part = dataclasses.replace(self.recording, channel=name, unit=unit, values=values[there])
        known = part  # used for the statistics; the other sections need even times
        if not there.all():
            at = np.arange(len(values))
            part = dataclasses.replace(part, values=np.interp(at, at[there], values[there]))
            said += (f" {len(values) - there.sum()} missing values are left out of statistics and histogram, and "
                     "interpolated elsewhere.")
        unit_ = part.time_unit
        found = [Section("Analysed part", f"{name}: {len(values)} samples from {number(first / rate, 9)} to "
                         f"{number((last - 1) / rate, 9)} {unit_}.{said}")]
        if choices.kind != "none":
            section, after = filtered(part, choices.kind, choices.edges, choices.order)
            found.append(section)
            known = part = dataclasses.replace(part, values=after)
        for make in (lambda one: sections_recording.statistics(known), lambda one: sections_recording.histogram(known),
                     lambda one: sections_spectra.amplitudes(one, choices.window),
                     lambda one: sections_spectra.power(one, choices.window),
                     lambda one: sections_spectra.over_time(one, choices.window), events):
            try:
                section = make(part)
            except QxError as error:
                section = Section("Not possible", f"{error}.")
            if section:
                found.append(section)
        for plot in pages.plots_of(found):
            if plot.link == sections_recording.TIME:
                _move(plot, first / rate)
        return found


def _move(plot, by):
    plot.start += by
    plot.x_range = plot.x_range and (plot.x_range[0] + by, plot.x_range[1] + by)
    for mark in plot.marks:
        mark.x += by
    if plot.image:
        plot.image.left += by
        plot.image.right += by
