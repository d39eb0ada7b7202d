"""Figures of a recording of any length, part by part: moments, outline, histogram and spectrum."""

from typing import Any

import numpy as np

from . import spectra, stats
from .envelopes import Envelope

SEGMENT = 1 << 16  # samples, of the averaged spectrum


class Histogram:
    """Counts in equal bins, which become wider by factors of two when values are beyond them."""

    BINS = 1 << 12

    def __init__(self):
        self.counts, self.low, self.width = np.zeros(self.BINS, np.int64), None, 0.0

    def add(self, values):
        least, greatest = float(values.min()), float(values.max())
        if self.low is None:
            self.width = (greatest - least) / (self.BINS // 2) or max(abs(least), 1e-300) * 1e-9
            self.low = least - self.width * self.BINS / 4
        while least < self.low:
            self._widen(self.BINS // 2)
        while greatest >= self.low + self.width * self.BINS:
            self._widen(0)
        places = ((values - self.low) / self.width).astype(np.int64)
        self.counts += np.bincount(np.clip(places, 0, self.BINS - 1), minlength=self.BINS)

    def _widen(self, shift):
        self.low -= shift * 2 * self.width
        halves = self.counts.reshape(-1, 2).sum(1)
        self.counts = np.zeros(self.BINS, np.int64)
        self.counts[shift:shift + len(halves)] = halves
        self.width *= 2

    def shown(self, most):
        """No more than `most` counts of bins in use, the first centre and the width."""
        used = np.flatnonzero(self.counts)
        first, last = used[0], used[-1] + 1
        group = -(-(last - first) // most)
        counts = np.add.reduceat(self.counts[first:last], np.arange(0, last - first, group))
        return counts, self.low + (first + group / 2) * self.width, group * self.width

    def median(self):
        """To within half a bin."""
        middle = np.searchsorted(np.cumsum(self.counts), (self.counts.sum() + 1) // 2)
        return self.low + (middle + 0.5) * self.width


class AveragedSpectrum:
    """The spectrum of spectra.welch by segments that overlap by half, part by part."""

    def __init__(self, segment=SEGMENT, window="hann"):
        self.segment, self.window = segment, window
        self._sum: Any = 0.0
        self._segments, self._rest = 0, np.empty(0)

    def add(self, values):
        values = np.concatenate([self._rest, values])
        half = self.segment // 2
        count = len(values) // half - 1  # segments that are complete
        if count > 0:
            found = spectra.welch(values[:(count + 1) * half], 1.0, self.window, self.segment, half)
            self._sum = self._sum + found.values * found.segments
            self._segments += found.segments
            self._rest = values[count * half:].copy()
        else:
            self._rest = values

    def result(self, rate):
        """A spectra.Spectrum; the file has a segment at least."""
        one = spectra.welch(np.zeros(self.segment), rate, self.window, self.segment)
        return spectra.Spectrum(one.frequencies, self._sum / self._segments / rate, one.resolution, self._segments,
                                "density")


class Whole:
    """Figures of all samples of a file. Of one that is not longer than `kept` samples only the outline
    is made: the other sections have the samples."""

    def __init__(self, kept, outline=Envelope, progress=lambda samples: None):
        self._progress = progress
        self.kept, self.count, self.total, self.squares = kept, 0, 0.0, 0.0
        self.envelope, self.histogram, self.spectrum = outline(), Histogram(), AveragedSpectrum()
        self._waiting = []  # until there are more than are kept

    def add(self, values):
        if not len(values):
            return
        self._progress(len(values))
        self.count += len(values)
        self.envelope.add(values)
        self._waiting.append(values)
        if self.count > self.kept:
            for part in self._waiting:
                self._sum_up(part)
            self._waiting = []

    def _sum_up(self, values):
        n = len(values)
        self.total += n * stats.mean(values)
        rms = stats.rms(values)
        self.squares += n * (rms * rms)  # beyond all numbers perhaps, and no error
        self.histogram.add(values)
        self.spectrum.add(values)

    def __getstate__(self):
        return {**self.__dict__, "_progress": None, "_waiting": []}

    @property
    def mean(self):
        return self.total / self.count

    @property
    def rms(self):
        return (self.squares / self.count) ** 0.5
