"""Sections of the report: the recording, its statistics, its histogram."""

import math

import numpy as np

from . import drawing
from .calls import call
from .sections import Row, Section, number, power_unit, quantity, resolved


def bins_for(n):
    """Twice the cube root of the number of samples, within what a plot can show."""
    return int(min(120, max(5, round(2 * n ** (1 / 3)))))


def overview(recording):
    n, unit = len(recording.values), recording.unit
    counted = f"{n} sample" + "s" * (n != 1)
    figures = []
    plt = drawing.pyplot()
    times = recording.times()
    figure, axes = plt.subplots(figsize=(10, 2.9))
    if recording.whole:
        _outline(axes, recording)
    else:
        drawing.trace(axes, times, recording.values, color=drawing.BLUE, linewidth=0.7)
    axes.set(title="The whole recording", xlabel=f"Time ({recording.time_unit})",
             ylabel=quantity(recording))
    axes.margins(x=0.005)
    figures.append(drawing.svg(plt, figure))
    part = _excerpt(recording)
    if part < n:
        figure, axes = plt.subplots(figsize=(10, 2.9))
        drawing.trace(axes, times[:part], recording.values[:part], color=drawing.BLUE, linewidth=1.1)
        shown = f"{times[part - 1]:.3g} {recording.time_unit}"
        axes.set(title=f"The first {shown}", xlabel=f"Time ({recording.time_unit})",
                 ylabel=quantity(recording))
        axes.margins(x=0.005)
        figures.append(drawing.svg(plt, figure))
    if recording.rate:
        text = (f"{counted}, {n / recording.rate:.6g} s at {recording.rate:.10g} samples per "
                f"second ({recording.rate_source}).")
    else:
        text = f"{counted}; the sampling rate is not known."
    if unit:
        text += f" Values in {unit}."
    return Section("Recording", text, _rows_of_whole(recording), figures)


def _outline(axes, recording):
    lows, highs = recording.whole.outline()
    group = -(-len(lows) // 4000)
    starts = np.arange(0, len(lows), group)
    axes.fill_between(starts * recording.whole.BLOCK / (recording.rate or 1.0),
                      np.minimum.reduceat(lows, starts), np.maximum.reduceat(highs, starts), color=drawing.BLUE,
                      linewidth=0.4)


def _rows_of_whole(recording):
    """Figures of the whole file where the other sections have a part of it."""
    whole, unit = recording.whole, recording.unit
    if not whole:
        return []
    lows, highs = whole.outline()
    return [Row("Samples in the file", str(whole.count), "", "read in parts"),
            Row("Mean of all", number(whole.mean), unit, "Mean_head"),
            Row("Root mean square of all", number(whole.rms), unit, "RMS_head"),
            Row("Lowest of all", number(lows.min()), unit, "read in parts"),
            Row("Highest of all", number(highs.max()), unit, "read in parts")]


def _excerpt(recording):
    """The number of samples at the start that show the shape of the signal."""
    n = len(recording.values)
    count = round(5 * recording.rate) if recording.rate and recording.rate < 2000 else 2000
    return count if count < 0.6 * n else n


def statistics(recording):
    x, unit = recording.values, recording.unit
    mean = call("Mean_head", x)
    moments = {order: call("Moment_head", x, order) for order in (2, 3, 4)}
    bins = bins_for(len(x))
    modes = call("ModeH", x, bins)
    shown = [mean, call("RMS_head", x), call("Median_head", x), *modes[:4]]
    # Digits for a thousandth of the range, and no less than six.
    mean_, rms, median, *modes = (max(pair, key=len) for pair in zip(
        map(number, shown), resolved(shown, 1e-3 * float(np.ptp(x)))))
    rows = [Row("Mean", mean_, unit, "Mean_head"), Row("Root mean square", rms, unit, "RMS_head"),
            Row("Median", median, unit, "Median_head"),
            Row(f"Mode, fullest of {bins} bins", ", ".join(modes) or "none", unit, "ModeH")]
    rows += [Row(f"Central moment of order {order}", number(moment), power_unit(unit, order),
                 "Moment_head") for order, moment in moments.items()]
    deviation = math.sqrt(moments[2])
    rows.append(Row("Standard deviation", number(deviation), unit, "√ moment 2"))
    if 1e-77 < deviation < 1e77:  # whose fourth power is a number
        rows.append(Row("Skewness", number(moments[3] / deviation**3), "",
                        "moment 3 / deviation³"))
        rows.append(Row("Kurtosis", number(moments[4] / deviation**4), "",
                        "moment 4 / deviation⁴"))
    return Section("Statistics", "All moments are about the mean and divided by the number of "
                   "samples.", rows)


def histogram(recording):
    x = recording.values
    counts, centres = call("histgran_head", x, bins_for(len(x)))
    mean, median = call("Mean_head", x), call("Median_head", x)
    width = centres[1] - centres[0] or 1.0
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    axes.bar(centres, counts, width=0.92 * width, color=drawing.BLUE)
    for value, name, colour in ((mean, "mean", drawing.WARM), (median, "median", drawing.DARK)):
        axes.axvline(value, color=colour, linewidth=1.3, label=f"{name} {resolved([value], width)[0]}",
                     linestyle="-" if name == "mean" else "--")
    axes.legend(frameon=False)
    axes.set(title=f"Histogram, {len(counts)} bins of width {number(width, 3)} {recording.unit}",
             xlabel=quantity(recording), ylabel="Samples per bin")
    axes.grid(axis="x", visible=False)
    coarse, coarse_centres = call("histgran_head", x, 12)
    longest = max(1, coarse.max())
    labels = resolved(coarse_centres, coarse_centres[1] - coarse_centres[0])
    wide = max(11, *map(len, labels))
    bars = [f"{label:>{wide}} {recording.unit}  {'#' * round(40 * count / longest):<40} {count}"
            for label, count in zip(labels, coarse)]
    return Section("Histogram", "Equal bins over the range of the data (histgran_head).",
                   figures=[drawing.svg(plt, figure)], terminal=["Histogram (bin centre, samples)", *bars])
