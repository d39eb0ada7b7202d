"""The section of the report that shows a recording before and after a filter."""

import math

import numpy as np

from . import report
from .calls import call

CUTOFF = 0.1  # cycles per sample
SHOWN = 1000  # samples


def smoothing_sections(cutoff):
    """A fourth-order Butterworth low-pass as two sections of second order, (a, b), by the bilinear
    transform of its two pairs of poles."""
    warped = math.tan(math.pi * cutoff)
    a, b = [], []
    for angle in (math.pi / 8, 3 * math.pi / 8):
        damping = 2 * math.cos(angle) * warped
        scale = 1 + damping + warped**2
        a += [2 * (warped**2 - 1) / scale, (1 - damping + warped**2) / scale]
        b += [warped**2 / scale, 2 * warped**2 / scale, warped**2 / scale]
    return a, b


def smoothed(values):
    """The values through the low-pass, forward and backward. The ends meet zeros, so the mean goes
    around the filter."""
    mean = call("Mean_head", values)
    a, b = smoothing_sections(CUTOFF)
    return mean + call("zeroPhaseCascadeFiltH", values - mean, 0, a, b, [], [], 0)[0]


def filtered(recording):
    n = len(recording.values)
    if n < 50:
        return None
    after = smoothed(recording.values)
    removed = recording.values - after
    scale, _ = report.frequency_axis(recording)
    unit = "Hz" if recording.rate else "cycles per sample"
    first = max(0, (n - SHOWN) // 2)
    part = slice(first, first + SHOWN)
    plt = report._pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    axes.plot(recording.times()[part], recording.values[part], color=report.GREY, linewidth=0.7,
              label="before")
    axes.plot(recording.times()[part], after[part], color=report.WARM, linewidth=1.2, label="after")
    axes.legend(frameon=False)
    axes.set(title=f"{len(after[part])} samples from the middle, before and after the filter",
             xlabel=f"Time ({recording.time_unit})", ylabel=report.quantity(recording))
    axes.margins(x=0.005)
    rows = [report.Row("Half power, of one pass, at", report.number(CUTOFF * scale, 4), unit, "design"),
            report.Row("RMS of what is left, without the mean",
                       report.number(call("RMS_head", after - call("Mean_head", after))),
                       recording.unit, "zeroPhaseCascadeFiltH, RMS_head"),
            report.Row("RMS of what is removed", report.number(call("RMS_head", removed)),
                       recording.unit, "zeroPhaseCascadeFiltH, RMS_head"),
            report.Row("Greatest change", report.number(np.abs(removed).max()), recording.unit,
                       "zeroPhaseCascadeFiltH")]
    return report.Section("Low-pass filter", "A Butterworth low-pass of fourth order as a cascade of "
                          "two sections, forward and backward, so that nothing is delayed.", rows,
                          [report._svg(plt, figure)])
