"""Tones of a recording with their uncertainties, and the harmonics and noise of the largest one."""

import dataclasses
import math

import numpy as np

from . import figures, measure, spectra
from .outcomes import QxError
from .sections import frequency_axis

WINDOW = "blackman_harris7"  # side lobes below -160 dB
LEAST_DB = -300  # relative to the largest line; nothing below is drawn
AROUND = 8  # bins on either side of a tone from which the noise at the tone is estimated
FREE = 10  # lines among them that are independent under the window, each with two degrees of freedom
FALSE = 0.01  # probability that noise alone has a significant tone


@dataclasses.dataclass
class Tones:
    """Tones, the largest first; errors are standard uncertainties. A tone is significant if it exceeds what the
    noise around it can explain."""
    frequencies: np.ndarray
    frequency_errors: np.ndarray
    amplitudes: np.ndarray
    amplitude_errors: np.ndarray
    phases: np.ndarray  # phases of cosines, at the first sample
    significant: np.ndarray
    residual_rms: float
    resolution: float  # one over the length of the recording


def tones(values, rate=1.0, count=5, lines_of=None):
    """Up to `count` tones, fewer if the rest could be noise; raises QxError if all values are equal.

    The uncertainties are the least possible for an unbiased estimate from n samples, with the density S of the
    noise around the tone in place of that of white noise: sqrt(S fs / n) for the amplitude A, and
    sqrt(3 S fs / (n (n^2 - 1))) fs / (pi A) for the frequency (D. C. Rife and R. R. Boorstyn, "Single-tone
    parameter estimation from discrete-time observations", 1974). Deviations from a tone, such as a changing
    amplitude, count as noise. A tone is significant if the ratio of its line to the mean of those around it has
    a probability below FALSE in noise, by the F distribution and for n / 2 lines, or for those of `lines_of`
    samples if the values are a band of them."""
    n = len(values)
    scale = float(np.abs(values).max()) or 1.0
    x = values / scale
    found = measure.tones(x, rate, count)
    t = np.arange(n) / rate
    rest = x - x.mean()
    for frequency, amplitude, phase in zip(found.frequencies, found.amplitudes, found.phases):
        rest = rest - amplitude * np.cos(2 * math.pi * frequency * t + phase)
    density = spectra.periodogram(rest, rate, "hann").values
    at = np.round(found.frequencies * n / rate).astype(int)
    noise = np.array([density[max(1, i - AROUND):i + AROUND + 1].mean() for i in at])
    with np.errstate(divide="ignore"):
        strength = found.amplitudes**2 * n / (2 * noise * rate)
    return Tones(found.frequencies,
                 rate * np.sqrt(3 * noise * rate / (n * (float(n)**2 - 1))) / (math.pi * found.amplitudes),
                 scale * found.amplitudes, scale * np.sqrt(noise * rate / n), found.phases,
                 strength > FREE * (((lines_of or n) / 2 / FALSE) ** (1 / FREE) - 1), scale * found.residual, rate / n)


def strongest(values, rate, count=5):
    """The `tones` that stand out; None if there are none."""
    return standing_out(lambda: tones(values, rate, count))


def standing_out(measure_them):
    """The significant tones among the measured ones; None if there are none."""
    try:
        found = measure_them()
    except QxError as error:
        if not error.name.startswith("ErrMeasure"):
            raise
        return None
    kept = {field.name: getattr(found, field.name)[found.significant] for field in dataclasses.fields(found)
            if isinstance(getattr(found, field.name), np.ndarray)}
    return dataclasses.replace(found, **kept) if found.significant.any() else None


def spectrum(values, rate=1.0, window=WINDOW):
    """Frequencies, the amplitudes of the lines under the window, and the resolution."""
    scale = float(np.abs(values).max()) or 1.0
    found = spectra.periodogram(values / scale, rate, window, scaling="spectrum")
    amplitudes = np.sqrt(2 * found.values)
    amplitudes[0] = 0.0
    if len(values) % 2 == 0:
        amplitudes[-1] /= math.sqrt(2)
    return found.frequencies, scale * amplitudes, found.resolution


def plot(recording, found, analysis, drawn):
    """The spectrum in dB relative to the largest tone, with the tones and the harmonics; `drawn` is the result of
    `spectrum`."""
    frequencies, amplitudes, resolution = drawn
    largest = found.amplitudes[0]

    def decibels(amplitudes):
        return 20 * np.log10(np.maximum(amplitudes / largest, 10**(LEAST_DB / 20)))

    lines = decibels(amplitudes)
    bottom = min(decibels(found.amplitudes).min(), np.median(lines)) - 25
    seen = np.nan_to_num(analysis.amplitudes) > largest * 10**(bottom / 20)
    marks = [figures.Mark(f, decibels(a), "", figures.BLUE) for f, a, is_tone in zip(
        found.frequencies, found.amplitudes, found.significant) if is_tone]
    marks += [figures.Mark(analysis.frequencies[h], decibels(analysis.amplitudes[h]), str(h + 1))
              for h in np.flatnonzero(seen)]
    return figures.Plot(
        f"Tones of {recording.name}: SINAD {analysis.sinad:.1f} dB, {analysis.enob:.2f} bits; harmonics by number",
        frequency_axis(recording, resolution)[1], "Amplitude (dB relative to the largest tone)",
        [figures.Curve("spectrum", lines, figures.GREY)], step=frequencies[1], marks=marks, y_range=(bottom, 15))
