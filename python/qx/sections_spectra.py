"""Sections of the report: the amplitude spectrum and the averaged power spectrum."""

import math

import numpy as np

from . import drawing
from .calls import call
from .sections import Row, Section, frequency_axis, number, power_unit, resolved

HANNING = 1  # window selector
DEFAULT = math.nan  # window parameter


def amplitude_spectrum(recording):
    """Frequencies in cycles per sample from 0 to one half, and the amplitudes of their parts."""
    n = len(recording.values)
    half = n // 2 + 1
    amplitudes = np.abs(call("ReOXFFTH80", recording.values, 0, n, 0)[:half]) / n
    amplitudes[1:(n + 1) // 2] *= 2  # the two sides together; zero and Nyquist stand alone
    return np.arange(half) / n, amplitudes


def strongest(frequencies, values, count, apart):
    """The indices of the greatest values that are so far apart from each other."""
    found = []
    for i in np.argsort(values)[::-1]:
        if values[i] > 0 and all(abs(frequencies[i] - frequencies[j]) >= apart for j in found):
            found.append(i)
        if len(found) == count:
            break
    return found


def amplitudes(recording):
    if len(recording.values) < 2:
        return None
    scale, label = frequency_axis(recording)
    frequencies, values = amplitude_spectrum(recording)
    shown, frequencies = values[1:], scale * frequencies[1:]
    unit = "Hz" if recording.rate else "per sample"
    found = strongest(frequencies, shown, 5, 0.01 * frequencies[-1])
    rows = [Row(f"At {label} {unit}", number(shown[i], 4), recording.unit, "ReOXFFTH80")
            for i, label in zip(found, resolved(frequencies[found], frequencies[0]))]
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    drawing.trace(axes, frequencies, np.maximum(shown, 1e-300), color=drawing.BLUE, linewidth=0.6)
    drawing.decades(axes, shown)
    axes.set(title="Amplitude spectrum of the whole recording", xlabel=label,
             ylabel=f"Amplitude ({recording.unit})" if recording.unit else "Amplitude")
    axes.margins(x=0.005)
    return Section("Amplitude spectrum",
                   f"Peak amplitudes of the sinusoids of the recording, {number(frequencies[0], 3)} "
                   f"{unit} apart, without a window; the five strongest parts of the spectrum.",
                   rows, [drawing.svg(plt, figure)])


def averaged_spectrum(x, length):
    """The power density of x per cycle per sample, averaged over half-overlapped segments under a
    window, from 0 to one half cycle per sample; and the number of segments."""
    constants = call("WinConstByNameH", length, HANNING, DEFAULT)
    total, segments = np.zeros(length), 0
    for start in range(0, len(x) - length + 1, length // 2):
        windowed = call("AllWinH", x[start:start + length], HANNING, DEFAULT, 0, 0)
        total += call("SpectrumH", windowed)
        segments += 1
    # A spectrum of squares over length^2 has the window's power, length cg^2 enbw, in each value.
    density = total[:length // 2 + 1] / segments * length / (constants["cg"]**2 * constants["enbw"])
    density[1:(length + 1) // 2] *= 2
    return np.arange(length // 2 + 1) / length, density, segments


def power(recording):
    n = len(recording.values)
    if n < 16:
        return None
    scale, label = frequency_axis(recording)
    length = 2 ** min(16, max(3, int(math.log2(n / 8))))
    x = recording.values - call("Mean_head", recording.values)
    largest = float(np.abs(x).max())
    if not 1e-140 < largest < 1e140:
        what = (f"The squares of values around {largest:.2g} leave the range of numbers, so there is no "
                "power spectrum." if largest else "The recording is constant: it has no power beside its "
                "mean.")
        return Section("Averaged power spectrum", what)
    frequencies, density, segments = averaged_spectrum(x, length)
    frequencies, density = scale * frequencies, density / scale
    unit = f"{power_unit(recording.unit, 2) or '1'}/{'Hz' if recording.rate else 'cycle per sample'}"
    decibels = 10 * np.log10(np.maximum(density, 1e-300))
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    axes.plot(frequencies, decibels, color=drawing.BLUE, linewidth=1.1)
    top = decibels[np.isfinite(decibels)].max(initial=-3000)
    axes.set_ylim(max(decibels.min(), top - 120) - 3, top + 5)
    axes.set(title=f"Power spectrum, mean of {segments} segments under a Hanning window",
             xlabel=label, ylabel=f"Density (dB re 1 {unit})")
    axes.margins(x=0.005)
    step = frequencies[1]
    rows = [Row("Power under the curve", number(density.sum() * step), power_unit(recording.unit, 2),
                "SpectrumH, AllWinH"),
            Row("Variance, for comparison", number(call("Moment_head", recording.values, 2)),
                power_unit(recording.unit, 2), "Moment_head"),
            Row("Strongest above 0 at", resolved([frequencies[1 + np.argmax(density[1:])]], step)[0],
                "Hz" if recording.rate else "cycles per sample", "SpectrumH, AllWinH")]
    return Section("Averaged power spectrum",
                   f"{segments} half-overlapped segments of {length} samples, without the mean, "
                   "scaled by the window's coherent gain and noise bandwidth (WinConstByNameH).",
                   rows, [drawing.svg(plt, figure)])
