"""Sections of the report: the recording, its statistics, its histogram."""

import dataclasses
import math

import numpy as np

from . import figures, stats
from .sections import Row, Section, number, power_unit, quantity, resolved, time_axis

TIME = "time"  # the name that links all plots over time


def bins_for(n):
    """Twice the cube root of the number of samples, within the limits of a plot."""
    return int(min(120, max(5, round(2 * n ** (1 / 3)))))


def over_time(recording, title, **more):
    """A plot over the time of the recording."""
    return figures.Plot(title, time_axis(recording), quantity(recording), step=1 / (recording.rate or 1.0),
                        link=TIME, **more)


def outline(recording, title, channel=None):
    """A plot of the whole recording, or of another of its channels, which may be longer than what is in memory."""
    channel = channel or recording
    of_rows = dataclasses.replace(recording, rate=recording.row_rate or recording.rate)
    plot = over_time(of_rows, title)
    plot.link = TIME if of_rows.rate == recording.rate else "rows"
    plot.y_label = quantity(channel)
    if channel is recording and (channel.envelope is None or channel.envelope.count == len(recording.values)):
        plot.curves = [figures.Curve(channel.channel, channel.values)]
        return plot
    lows, highs = channel.envelope.bounds()
    alone = channel.envelope.samples == 1
    plot.curves = [figures.Curve(channel.channel, lows, highs=None if alone else highs)]
    plot.step *= channel.envelope.samples
    return plot


def count_of(recording):
    """The number of samples of the recording, including those that are not in memory."""
    return recording.whole.count if recording.whole else len(recording.values)


def overview(recording):
    n, unit = count_of(recording), recording.unit
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
        text += f" The other sections are about the first of {len(shown)} channels."
    return Section("Recording", text, figures=shown)


def statistics(recording):
    x, whole, unit = recording.values, recording.whole, recording.unit
    bins = 120 if whole else bins_for(len(x))
    if whole:
        counts, centres = whole.histogram(bins)
        moments = {order: whole.moments.moment(order) for order in (2, 3, 4)}
        extremes = whole.moments.least, whole.moments.greatest
        shown = [whole.moments.mean, whole.moments.rms, whole.median, *centres[counts == counts.max()][:4]]
    else:
        moments = {order: stats.moment(x, order) for order in (2, 3, 4)}
        extremes = float(x.min()), float(x.max())
        shown = [stats.mean(x), stats.rms(x), stats.median(x), *stats.mode(x, bins)[:4]]
    # Enough digits for a thousandth of the range, and at least six.
    lowest, highest, mean_, rms, median, *modes = (max(pair, key=len) for pair in zip(
        map(number, [*extremes, *shown]), resolved([*extremes, *shown], 1e-3 * (extremes[1] - extremes[0]))))
    rows = [Row("Mean", mean_, unit, "stats.mean"), Row("Root mean square", rms, unit, "stats.rms"),
            Row("Median", median, unit, "stats.median"),
            Row("Lowest", lowest, unit, "samples"), Row("Highest", highest, unit, "samples"),
            Row(f"Mode, fullest of {bins} bins", ", ".join(modes) or "none", unit, "stats.mode")]
    rows += [Row(f"Central moment of order {order}", number(moment), power_unit(unit, order),
                 "stats.moment") for order, moment in moments.items()]
    deviation = math.sqrt(moments[2])
    rows.append(Row("Standard deviation", number(deviation), unit, "√ moment 2"))
    if 1e-77 < deviation < 1e77:  # its fourth power is in range
        rows.append(Row("Skewness", number(moments[3] / deviation**3), "",
                        "moment 3 / deviation³"))
        rows.append(Row("Kurtosis", number(moments[4] / deviation**4), "",
                        "moment 4 / deviation⁴"))
    text = "All moments are about the mean and divided by the number of samples."
    if whole:
        text += f" Of all {whole.count} samples."
    return Section("Statistics", text, rows)


def histogram(recording):
    x = recording.values
    whole = recording.whole
    if whole:
        (counts, centres), (coarse, coarse_centres) = whole.histogram(120), whole.histogram(12)
        mean, median = whole.moments.mean, whole.median
        source = f"Equal bins over the range of all {whole.count} samples."
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
