"""Tones of a recording, and the harmonics and noise beside the largest one."""

import dataclasses
import os

import numpy as np

from . import outputs
from .calls import call

FALLING_AMPLITUDE = 0
BLACKMAN_HARRIS_7, DEFAULT = 8, float("nan")  # window selector; side lobes below -160 dB
LEAST_DB = -300  # of the largest line; nothing below is drawn


@dataclasses.dataclass
class Tones:
    frequencies: np.ndarray
    amplitudes: np.ndarray  # of the peaks
    phases: np.ndarray  # of cosines, at the first sample
    residual_rms: float


@dataclasses.dataclass
class Harmonics:
    frequencies: np.ndarray  # where they are seen; NaN where a harmonic cannot be told from others
    amplitudes: np.ndarray
    phases: np.ndarray
    thd: float  # a ratio
    sinad: float  # dB, as the following
    snr: float
    sfdr: float
    enob: float  # bits
    noise_floor: float


def tones(values, rate=1.0, count=5):
    """Up to `count` tones, the largest first; fewer where the rest could be noise."""
    return Tones(*call("MultipleToneMeasurements", values, 1 / rate, count, FALLING_AMPLITUDE))


def harmonics(values, rate=1.0, highest=10, fundamental=0.0, full_scale=0.0):
    """A tone and its harmonics, up to `highest` or as many as the samples can tell. `fundamental` is
    about where it is, 0 for the largest tone; `full_scale` the amplitude to which bits refer, 0 for
    that of the tone."""
    highest = max(1, min(highest, len(values) // 2 - 1))
    return Harmonics(*call("HarmonicAnalysis", values, 1 / rate, fundamental, highest, full_scale))


def spectrum(values):
    """Frequencies in cycles per sample, and amplitudes as the lines under a window show them."""
    n = len(values)
    window = call("AllWinH", np.ones(n), BLACKMAN_HARRIS_7, DEFAULT, 0, 0)
    windowed = (values - call("Mean_head", values)) * window
    half = n // 2 + 1
    gain = n * call("Mean_head", window)
    return np.arange(half) / n, 2 * np.abs(call("ReOXFFTH80", windowed, 0, n, 0)[:half]) / gain


def plot(recording, found, analysis, path):
    """The spectrum in dB of the largest tone, with the tones and the harmonics."""
    from . import drawing, sections
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 4))
    scale, label = sections.frequency_axis(recording)
    frequencies, amplitudes = spectrum(recording.values)
    largest = found.amplitudes[0]

    def decibels(amplitudes):
        return 20 * np.log10(np.maximum(amplitudes / largest, 10**(LEAST_DB / 20)))

    lines = decibels(amplitudes)
    bottom = min(decibels(found.amplitudes).min(), np.median(lines)) - 25
    drawing.trace(axes, scale * frequencies, lines, color=drawing.GREY, linewidth=0.6)
    seen = np.nan_to_num(analysis.amplitudes) > largest * 10**(bottom / 20)
    axes.plot(found.frequencies, decibels(found.amplitudes), "o", color=drawing.BLUE, markersize=5,
              label="tones")
    axes.plot(analysis.frequencies[seen], decibels(analysis.amplitudes[seen]), "x", color=drawing.WARM,
              markersize=6, label="harmonics")
    for h in np.flatnonzero(seen):
        axes.annotate(str(h + 1), (analysis.frequencies[h], decibels(analysis.amplitudes[h])),
                      xytext=(0, 6), textcoords="offset points", ha="center", fontsize=8)
    axes.set(xlabel=label, ylabel="Amplitude (dB of the largest tone)",
             title=f"Tones of {recording.name}: SINAD {analysis.sinad:.1f} dB, {analysis.enob:.2f} bits")
    axes.set_ylim(bottom, 15)
    axes.margins(x=0.005)
    axes.legend(frameon=False)
    os.makedirs(os.path.dirname(path) or ".", exist_ok=True)
    marked = {"metadata": {"Creator": outputs.mark("tones")}} if path.lower().endswith(".svg") else {}
    with outputs.whole(path) as part:
        figure.savefig(part, **marked)
    plt.close(figure)
