"""Figures of a recording of any length. Those that need one pass are computed while the file is read. The samples
are written to a temporary file, which further passes read in blocks, so the memory does not depend on the length."""

import functools
import tempfile
from typing import Any

import numpy as np

from . import spectra, stats
from .envelopes import Envelope

BLOCK = 1 << 20  # samples in memory at once
FINE = 120 * 512  # fine bins, from which those of histograms are summed
SELECTED = 1 << 22  # most samples among which a rank is found by sorting


class Moments:
    """Count, mean, sums of powers of the differences from it, and extremes, computed part by part. The first value is
    subtracted from all, so that a small spread far from zero is not lost. Parts are combined by the formulas of
    P. Pébay, "Formulas for robust, one-pass parallel computation of covariances and arbitrary-order
    statistical moments", 2008."""

    def __init__(self):
        self.count, self.sums = 0, np.zeros(3)
        self._first: Any = None
        self._mean = np.float64(0)
        self.least, self.greatest = np.inf, -np.inf

    def add(self, values):
        self.least, self.greatest = min(self.least, float(values.min())), max(self.greatest, float(values.max()))
        self._first = values[0] if self._first is None else self._first
        values = values - self._first
        a, b, n = self.count, len(values), self.count + len(values)
        mean = np.float64(stats.mean(values))
        mine, theirs = self.sums, np.array([b * stats.moment(values, order) for order in (2, 3, 4)])
        with np.errstate(over="ignore", invalid="ignore"):
            d, p, q = mean - self._mean, a / n, b / n
            self.sums = mine + theirs + np.array([
                d**2 * a * q,
                d**3 * a * q * (p - q) + 3 * d * (p * theirs[0] - q * mine[0]),
                d**4 * a * q * (p * p - p * q + q * q) + 6 * d**2 * (p * p * theirs[0] + q * q * mine[0])
                + 4 * d * (p * theirs[1] - q * mine[1])])
            self._mean = self._mean + d * q
        self.count = n

    @property
    def mean(self):
        return float(self._first + self._mean)

    def moment(self, order):
        """The central moment of order 2, 3 or 4."""
        return float(self.sums[order - 2] / self.count)

    @property
    def rms(self):
        return float(np.hypot(self.mean, np.sqrt(self.moment(2))))


class AveragedSpectrum:
    """The spectrum of spectra.welch, with half-overlapped segments, computed part by part."""

    def __init__(self, segment, window="hann", scaling="density"):
        self.segment, self.window, self.scaling = segment, window, scaling
        self._sum, self._segments, self._rest = np.zeros(segment // 2 + 1), 0, np.empty(0)

    def add(self, values):
        values = np.concatenate([self._rest, values])
        half = self.segment // 2
        count = len(values) // half - 1  # number of complete segments
        if count > 0:
            found = self._welch(values[:(count + 1) * half], 1.0)
            self._sum += found.values * found.segments
            self._segments += found.segments
            self._rest = values[count * half:].copy()
        else:
            self._rest = values

    def _welch(self, values, rate):
        return spectra.welch(values, rate, self.window, self.segment, self.segment // 2, scaling=self.scaling)

    def result(self, rate):
        """A spectra.Spectrum, of at least one segment."""
        one = self._welch(np.zeros(self.segment), rate)
        mean = self._sum / self._segments
        return spectra.Spectrum(one.frequencies, mean / rate if self.scaling == "density" else mean, one.resolution,
                                self._segments, self.scaling)


class Whole:
    """All samples of a file. For a file of up to `kept` samples, only the outline is made, since its samples are in
    memory. Missing samples are gaps of the outline and are left out of the figures; with `fill` they are
    interpolated linearly, as by numpy.interp. `progress` is called with the number of samples of each block that is
    read or passed; it is not sent to another process with a Whole."""

    def __init__(self, kept, outline=Envelope, progress=lambda samples: None, fill=False):
        self.progress, self._fill = progress, fill
        self.kept, self.rows = kept, 0  # rows of the file, including those without a value
        self.envelope, self.moments = outline(), Moments()
        self._waiting = []  # parts that wait until there are more samples than are kept
        self._last, self._gap = None, 0  # the last value, and the number of missing values after it
        self._file: Any = None

    def add(self, values):
        if not len(values):
            return
        self.progress(len(values))
        self.rows += len(values)
        if self._fill:
            values = self._filled(values)
        self._take(values)

    def finish(self):
        """Takes the missing values at the end."""
        if self._gap and self._last is not None:
            self._take(np.full(self._gap, self._last))
        self._gap = 0

    def _take(self, values):
        self.envelope.add(values)
        self._waiting.append(values)
        if self.rows > self.kept and isinstance(self.envelope, Envelope):  # other outlines keep all samples themselves
            for part in self._waiting:
                self._sum_up(part)
            self._waiting = []

    @property
    def count(self):
        """The number of samples in the figures."""
        return self.moments.count

    def _sum_up(self, values):
        values = values[~np.isnan(values)]
        if len(values):
            self.moments.add(values)
            if self._file is None:
                self._file = tempfile.TemporaryFile(buffering=0)
            self._file.seek(0, 2)
            self._file.write(np.ascontiguousarray(values, float))

    def __getstate__(self):
        return {**self.__dict__, "progress": None, "_waiting": []}

    def _filled(self, values):
        """The values without gaps, starting with those for a gap at the end of the previous part. A gap at the end
        of this part waits for the next one."""
        at, before = np.flatnonzero(~np.isnan(values)), self._gap
        if len(at) == len(values) and not before:
            self._last = values[-1]
            return values
        if not len(at):
            self._gap += len(values)
            return values[:0]
        known, ends = values[at], np.arange(-before, at[-1] + 1)
        self._gap = len(values) - 1 - int(at[-1])
        if self._last is not None:
            at, known = np.r_[-before - 1, at], np.r_[self._last, known]
        self._last = known[-1]
        return np.interp(ends, at, known)

    def part(self, first, count):
        """`count` samples from `first` on; fewer at the end."""
        self._file.seek(8 * first)
        return np.fromfile(self._file, float, min(count, self.count - first))

    def parts(self, hop=None, length=None):
        """Blocks that start `hop` samples apart; `length` can make them longer."""
        hop = hop or BLOCK
        for first in range(0, self.count, hop):
            found = self.part(first, length or hop)
            self.progress(min(hop, len(found)))
            yield found

    @functools.cached_property
    def _counts(self):
        low, high = self.moments.least, self.moments.greatest
        counts = np.zeros(FINE, np.int64)
        for part in self.parts():
            counts += np.bincount(_places(part, low, high), minlength=FINE)
        return counts

    def histogram(self, bins):
        """The counts and centres of equal bins between the extremes; `bins` is 120 or a divisor of it."""
        low, high = self.moments.least, self.moments.greatest
        return (self._counts.reshape(bins, -1).sum(1), low + (np.arange(bins) + 0.5) * ((high - low) / bins))

    @functools.cached_property
    def median(self):
        upper = self._of_rank(self.count // 2)
        return upper if self.count % 2 else (upper + self._of_rank(self.count // 2 - 1)) / 2

    def _of_rank(self, rank):
        """The sample of the given rank in ascending order."""
        low, high, counts = self.moments.least, self.moments.greatest, self._counts
        while low < high:
            below = np.cumsum(counts)
            at = int(np.searchsorted(below, rank, "right"))
            rank -= int(below[at] - counts[at])
            chosen, inside = [], Moments()
            for part in self.parts():
                part = part[(part >= low) & (part <= high)]
                part = part[_places(part, low, high) == at]
                if counts[at] <= SELECTED:
                    chosen.append(part)
                elif len(part):
                    inside.least = min(inside.least, float(part.min()))
                    inside.greatest = max(inside.greatest, float(part.max()))
            if counts[at] <= SELECTED:
                return float(np.partition(np.concatenate(chosen), rank)[rank])
            low, high = inside.least, inside.greatest
            counts = np.zeros(FINE, np.int64)
            for part in self.parts():
                part = part[(part >= low) & (part <= high)]
                counts += np.bincount(_places(part, low, high), minlength=FINE)
        return low

    def spectrum(self, rate, segment, window="hann", scaling="density"):
        found = AveragedSpectrum(segment, window, scaling)
        for part in self.parts():
            found.add(part)
        return found.result(rate)


def _places(values, low, high):
    """The bins of values, out of FINE bins between two limits; the last bin includes the upper limit."""
    if not low < high:
        return np.full(len(values), FINE - 1)
    return np.minimum((values - low) * (FINE / (high - low)), FINE - 1).astype(np.int64)
