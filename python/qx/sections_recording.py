"""Sections of the report: the recording, its statistics, its histogram."""

import math

import numpy as np

from . import figures, stats
from .sections import Row, Section, number, power_unit, quantity, resolved, time_axis

TIME = "time"  # the link of all plots over time


def bins_for(n):
    """Twice the cube root of the number of samples, within what a plot can show."""
    return int(min(120, max(5, round(2 * n ** (1 / 3)))))


def over_time(recording, title, **more):
    """A plot over the time of the recording."""
    return figures.Plot(title, time_axis(recording), quantity(recording), step=1 / (recording.rate or 1.0),
                        link=TIME, **more)


def outline(recording, title, channel=None):
    """The whole of a recording, or of another of its channels, that may be longer than what is kept."""
    channel = channel or recording
    plot = over_time(recording, title)
    plot.y_label = quantity(channel)
    if channel.envelope is None or channel is recording and not recording.whole:
        plot.curves = [figures.Curve(channel.channel, channel.values)]
        return plot
    lows, highs = channel.envelope.bounds()
    alone = channel.envelope.samples == 1
    plot.curves = [figures.Curve(channel.channel, lows, highs=None if alone else highs)]
    plot.step *= channel.envelope.samples
    return plot


def overview(recording):
    n, unit = len(recording.values), recording.unit
    counted = f"{n} sample" + "s" * (n != 1)
    shown = [outline(recording, "The whole recording" if not recording.others else recording.channel)]
    for other in recording.others:
        shown.append(outline(recording, other.channel, other))
    if recording.rate:
        text = (f"{counted}, {n / recording.rate:.6g} s at {recording.rate:.10g} samples per "
                f"second ({recording.rate_source}).")
    else:
        text = f"{counted}; the sampling rate is not known."
    if unit:
        text += f" Values in {unit}."
    if recording.others:
        text += f" The other sections have the first of {len(shown)} channels."
    return Section("Recording", text, _rows_of_whole(recording), shown)


def _rows_of_whole(recording):
    """Figures of the whole file where the other sections have a part of it."""
    whole, unit = recording.whole, recording.unit
    if not whole:
        return []
    lows, highs = whole.envelope.bounds()
    return [Row("Samples in the file", str(whole.count), "", "read in parts"),
            Row("Mean of all", number(whole.mean), unit, "stats.mean"),
            Row("Root mean square of all", number(whole.rms), unit, "stats.rms"),
            Row("Lowest of all", number(lows.min()), unit, "read in parts"),
            Row("Highest of all", number(highs.max()), unit, "read in parts")]


def statistics(recording):
    x, unit = recording.values, recording.unit
    mean = stats.mean(x)
    moments = {order: stats.moment(x, order) for order in (2, 3, 4)}
    bins = bins_for(len(x))
    shown = [mean, stats.rms(x), stats.median(x), *stats.mode(x, bins)[:4]]
    # Digits for a thousandth of the range, and no less than six.
    mean_, rms, median, *modes = (max(pair, key=len) for pair in zip(
        map(number, shown), resolved(shown, 1e-3 * float(np.ptp(x)))))
    rows = [Row("Mean", mean_, unit, "stats.mean"), Row("Root mean square", rms, unit, "stats.rms"),
            Row("Median", median, unit, "stats.median"),
            Row(f"Mode, fullest of {bins} bins", ", ".join(modes) or "none", unit, "stats.mode")]
    rows += [Row(f"Central moment of order {order}", number(moment), power_unit(unit, order),
                 "stats.moment") for order, moment in moments.items()]
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
    whole = recording.whole
    if whole:
        counts, first, width = whole.histogram.shown(120)
        centres = first + width * np.arange(len(counts))
        mean, median = whole.mean, whole.histogram.median()
        coarse, first, step = whole.histogram.shown(12)
        coarse_centres = first + step * np.arange(len(coarse))
        source = f"Equal bins over all {whole.count} samples of the file."
    else:
        found, few = stats.histogram(x, bins_for(len(x))), stats.histogram(x, 12)
        counts, centres, coarse, coarse_centres = found.counts, found.centres, few.counts, few.centres
        mean, median = stats.mean(x), stats.median(x)
        source = "Equal bins over the range of the data (stats.histogram)."
    width = centres[1] - centres[0] or 1.0
    title = f"Histogram, {len(counts)} bins of width {number(width, 3)} {recording.unit}".rstrip()
    plot = figures.Plot(title, quantity(recording), "Samples per bin",
                        [figures.Curve("samples per bin", np.asarray(counts, float))], centres[0], width, bars=True,
                        x_range=(float(centres[0] - width), float(centres[-1] + width)),
                        verticals=[(float(value), f"{name} {resolved([value], width)[0]}") for name, value in
                                   (("mean", mean), ("median", median))])
    longest = max(1, max(coarse))
    labels = resolved(coarse_centres, coarse_centres[1] - coarse_centres[0])
    wide = max(11, *map(len, labels))
    bars = [f"{label:>{wide}} {recording.unit}  {'#' * round(40 * count / longest):<40} {count}"
            for label, count in zip(labels, coarse)]
    return Section("Histogram", source, figures=[plot], terminal=["Histogram (bin centre, samples)", *bars])
