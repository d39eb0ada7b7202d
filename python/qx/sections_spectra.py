"""Sections of the report: the amplitude spectrum with its tones, the averaged power spectrum, and the
spectrum over time."""

import math

import numpy as np

from . import figures, long_tones, spectra, stats, tones
from .sections import (Row, Section, frequency_axis, frequency_unit, number, power_unit, resolved, time_axis,
                       uncertain)
from .sections_recording import TIME

LONGEST = 1 << 17  # samples of the longest segment of an averaged spectrum
SEGMENTS = 4  # number of segments of a short recording, without overlap
COLUMNS, LEVELS = 800, 80.0  # of the spectrum over time: columns, and its range in decibels
SQUARES = (1e-140, 1e140)  # the range of values whose squares are in range


def is_constant(recording):
    if recording.whole:
        return not recording.whole.moments.greatest > recording.whole.moments.least
    return not np.ptp(recording.values) > 0


def local_maxima(values):
    """Indices of values that exceed both neighbours, the largest first."""
    inner = np.flatnonzero((values[1:-1] > values[:-2]) & (values[1:-1] >= values[2:])) + 1
    return inner[np.argsort(-values[inner], kind="stable")]


def amplitudes(recording, window="blackman_harris"):
    n = len(recording.values)
    if n < 8:
        return None
    if is_constant(recording):
        return Section("Amplitude spectrum", "The recording is constant: it has no component above frequency 0.")
    rate, whole = recording.rate or 1.0, recording.whole
    if whole:
        frequencies, shown, resolution = long_tones.spectrum(whole, rate, window)
        found = long_tones.strongest(whole, rate)
    else:
        frequencies, shown, resolution = tones.spectrum(recording.values, rate, window)
        found = tones.strongest(recording.values, rate)
    unit = frequency_unit(recording)
    rows, marks = [], []
    if found:
        pairs = [(uncertain(f, f_error), uncertain(a, a_error)) for f, f_error, a, a_error in zip(
            found.frequencies, found.frequency_errors, found.amplitudes, found.amplitude_errors)]
        rows.append(Row("Strongest part at", pairs[0][0][0], unit, "measure.tones", pairs[0][0][1]))
        for (f, f_error), (a, a_error) in pairs:
            at = f"{f} ± {f_error}" if f_error else f
            rows.append(Row(f"Tone at {at} {unit}", a, recording.unit, "measure.tones", a_error))
        marks = list(zip(found.frequencies, found.amplitudes))
        text = "The tones that stand out of the noise around them, with standard uncertainties."
    else:
        peaks = local_maxima(shown)
        text = "No tone stands out of the noise around it."
        if len(peaks):
            rows.append(Row("Strongest part at", resolved([frequencies[peaks[0]]], resolution)[0], unit,
                            "spectra.periodogram", number(resolution / 2, 2)))
    rows.append(Row("Resolution", number(resolution, 4), unit, "spectra.periodogram"))
    if whole:
        text += (f" Tones of all {whole.count} samples; the spectrum is the root mean square over half-overlapped segments"
                 f" of {long_tones.SEGMENT} samples.")
    largest = shown.max() or 1.0

    def decibels(amplitude):
        return 20 * (np.log10(np.maximum(amplitude / largest, 1e-15)) + math.log10(largest))

    levels = decibels(shown)
    top = max([levels.max(), *(decibels(a) for _, a in marks)])
    plot = figures.Plot(
        f"Amplitudes under a {window.replace('_', '-')} window", frequency_axis(recording, resolution)[1],
        f"Amplitude (dB re 1 {recording.unit})" if recording.unit else "Amplitude (dB)",
        [figures.Curve("spectrum", levels)], step=frequencies[1], may_be_log=True,
        marks=[figures.Mark(float(f), float(decibels(a)), resolved([f], 10 * frequencies[1])[0]) for f, a in marks],
        y_range=(max(float(np.median(levels)) - 40, top - 200), top + 8))
    return Section("Amplitude spectrum", text, rows, [plot])


def segment_length(n):
    return 2 ** max(3, min(int(math.log2(LONGEST)), int(math.log2(n / SEGMENTS))))


def power(recording, window="hann"):
    n = len(recording.values)
    if n < 16:
        return None
    x, whole = recording.values, recording.whole
    if whole:
        largest = float(max(whole.moments.greatest - whole.moments.mean, whole.moments.mean - whole.moments.least))
    else:
        largest = float(np.abs(x - x.mean()).max())
    if not SQUARES[0] < largest < SQUARES[1]:
        what = (f"The squares of values around {largest:.2g} are out of range, so there is no "
                "power spectrum." if largest else "The recording is constant: it has no power besides its "
                "mean.")
        return Section("Averaged power spectrum", what)
    rate = recording.rate or 1.0
    if whole:
        found, variance = whole.spectrum(rate, LONGEST, window), whole.moments.moment(2)
        of = f"without their means, of all {whole.count} samples"
    else:
        found, variance = spectra.welch(x, rate, window, segment_length(n)), stats.var(x)
        of = "without their means"
    unit = f"{power_unit(recording.unit, 2) or '1'}/{'Hz' if recording.rate else 'cycle per sample'}"
    decibels = 10 * np.log10(np.maximum(found.values, 1e-300))
    top = float(decibels[np.isfinite(decibels)].max(initial=-3000))
    plot = figures.Plot(
        f"Power spectrum, mean of {found.segments} segments under a {window.replace('_', '-')} window",
        frequency_axis(recording, found.resolution)[1], f"Density (dB re 1 {unit})",
        [figures.Curve("density", decibels)], step=found.frequencies[1], may_be_log=True,
        y_range=(max(float(decibels.min()), top - 120) - 3, top + 5))
    squared = power_unit(recording.unit, 2)
    rows = [Row("Power under the curve", number(found.power()), squared, "spectra.welch"),
            Row("Variance, for comparison", number(variance), squared, "stats.var"),
            Row("Resolution of the averaged spectrum", number(found.resolution, 4), frequency_unit(recording),
                "spectra.welch")]
    length = round(rate / found.frequencies[1])
    return Section("Averaged power spectrum", f"{found.segments} half-overlapped segments of {length} samples, {of}.",
                   rows, [plot])


def over_time(recording, window="hann"):
    """The power density by time and frequency, in decibels."""
    whole = recording.whole
    n = whole.count if whole else len(recording.values)
    largest = (max(-whole.moments.least, whole.moments.greatest) if whole else
               float(np.abs(recording.values).max()))
    if n < 256 or not SQUARES[0] < largest < SQUARES[1] or is_constant(recording):
        return None
    rate = recording.rate or 1.0
    length = 2 ** min(9, max(4, round(math.log2(2 * math.sqrt(n)))))
    hop = max(length // 2, -(-n // COLUMNS))
    parts = (whole.parts(hop, max(length, hop)) if whole else
             (recording.values[start:start + max(length, hop)] for start in range(0, n, hop)))
    decibels, resolution = _columns(parts, rate, length, window)
    top = float(decibels.max())
    bottom = max(top - LEVELS, float(np.percentile(decibels, 2)))
    shown = np.clip(np.round((decibels - bottom) / ((top - bottom) or 1.0) * 255), 0, 255).astype(np.uint8)
    unit = f"{power_unit(recording.unit, 2) or '1'}/{'Hz' if recording.rate else 'cycle per sample'}"
    image = figures.Image(shown, 0.0, n / rate, 0.0, rate / 2,
                          f"Density from {number(bottom, 3)} dB (dark) to {number(top, 3)} dB (bright) re 1 {unit}")
    plot = figures.Plot(
        f"Spectrum over time, {length} samples ({number(length / rate, 3)} {recording.time_unit}) at a time",
        time_axis(recording), frequency_axis(recording, resolution)[1],
        x_range=(0.0, n / rate), y_range=(0.0, rate / 2), link=TIME, image=image)
    return Section("Spectrum over time", f"{image.label}.", [], [plot])


def _columns(parts, rate, length, window):
    """Decibels by frequency and time; each column is the mean of the segments of a part."""
    columns, resolution = [], 0.0
    for part in parts:
        if len(part) >= length:
            found = spectra.welch(part, rate, window, length, length // 2)
            columns.append(found.values)
            resolution = found.resolution
    return 10 * np.log10(np.maximum(np.array(columns).T, 1e-300)), resolution
