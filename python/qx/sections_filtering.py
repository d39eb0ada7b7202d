"""The section of the report that shows a recording before and after a filter."""

import numpy as np

from . import drawing
from .calls import call
from .sections import Row, Section, frequency_axis, number, quantity

CUTOFF = 0.1  # cycles per sample
SHOWN = 1000  # samples


def smoothed(values):
    """The values through the low-pass, forward and backward. The ends meet zeros, so the mean goes
    around the filter."""
    mean = call("Mean_head", values)
    a, b = call("BWCoefs", 1.0, CUTOFF, 0.0, 4, 0)
    return mean + call("zeroPhaseCascadeFiltH", values - mean, 0, a, b, [], [], 0)[0]


def filtered(recording):
    n = len(recording.values)
    if n < 50:
        return None
    after = smoothed(recording.values)
    removed = recording.values - after
    scale, _ = frequency_axis(recording)
    unit = "Hz" if recording.rate else "cycles per sample"
    first = max(0, (n - SHOWN) // 2)
    part = slice(first, first + SHOWN)
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    axes.plot(recording.times()[part], recording.values[part], color=drawing.GREY, linewidth=0.7,
              label="before")
    axes.plot(recording.times()[part], after[part], color=drawing.WARM, linewidth=1.2, label="after")
    axes.legend(frameon=False)
    axes.set(title=f"{len(after[part])} samples from the middle, before and after the filter",
             xlabel=f"Time ({recording.time_unit})", ylabel=quantity(recording))
    axes.margins(x=0.005)
    rows = [Row("Half power, of one pass, at", number(CUTOFF * scale, 4), unit, "BWCoefs"),
            Row("RMS of what is left, without the mean",
                number(call("RMS_head", after - call("Mean_head", after))),
                recording.unit, "zeroPhaseCascadeFiltH, RMS_head"),
            Row("RMS of what is removed", number(call("RMS_head", removed)),
                recording.unit, "zeroPhaseCascadeFiltH, RMS_head"),
            Row("Greatest change", number(np.abs(removed).max()), recording.unit,
                "zeroPhaseCascadeFiltH")]
    return Section("Low-pass filter", "A Butterworth low-pass of fourth order as a cascade of "
                   "two sections, forward and backward, so that nothing is delayed.", rows,
                   [drawing.svg(plt, figure)])
