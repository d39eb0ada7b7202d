"""The section of the report on repeated events and one pulse among them."""

import numpy as np

from . import drawing, measuring
from .calls import call
from .sections import Row, Section, number, quantity


def scale_of(recording):
    """The time of a sample, and its unit."""
    return (1 / recording.rate, "s") if recording.rate else (1.0, "samples")


def marked(recording, found):
    """The whole recording with its events."""
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 2.9))
    times = recording.times()
    drawing.trace(axes, times, recording.values, color=drawing.BLUE, linewidth=0.7)
    axes.plot(times[found], recording.values[found], "o", color=drawing.WARM, markersize=3.2)
    axes.set(title=f"{len(found)} events", xlabel=f"Time ({recording.time_unit})",
             ylabel=quantity(recording))
    axes.margins(x=0.005)
    return drawing.svg(plt, figure)


def measured(recording, pulse, part):
    """One pulse with its levels and where its transitions begin and end."""
    step, _ = scale_of(recording)
    plt = drawing.pyplot()
    figure, axes = plt.subplots(figsize=(10, 2.9))
    values = recording.values[part]
    axes.plot(recording.times()[part], values, color=drawing.BLUE, linewidth=1.1)
    for level in (pulse.low, pulse.high):
        axes.axhline(level, color=drawing.GREY, linewidth=0.8, linestyle="--")
    ends = np.array([pulse.start, pulse.start + pulse.first_duration,
                     pulse.end - pulse.second_duration, pulse.end])
    axes.plot((part.start + ends) * step, np.interp(ends, np.arange(len(values)), values), "o",
              color=drawing.WARM, markersize=4)
    half = (pulse.low + pulse.high) / 2
    sides = (part.start + pulse.middle + np.array([-0.5, 0.5]) * pulse.width) * step
    axes.plot(sides, [half, half], color=drawing.WARM, linewidth=1.4)
    axes.set(title="One of them: levels, 10% and 90% of both edges, width at half height",
             xlabel=f"Time ({recording.time_unit})", ylabel=quantity(recording))
    axes.margins(x=0.005)
    return drawing.svg(plt, figure)


def interval_rows(recording, found):
    step, unit = scale_of(recording)
    intervals = np.diff(found) * step
    rows = [Row("Events", str(len(found)), "", "PeakD of the slope's power")]
    if recording.rate:
        rows.append(Row("Rate, by the median interval",
                        number(60 / call("Median_head", intervals), 4),
                        "1/min", "Median_head"))
    for label, value, export in (
            ("Median interval", call("Median_head", intervals), "Median_head"),
            ("Shortest interval", intervals.min(), "PeakD"),
            ("Longest interval", intervals.max(), "PeakD"),
            ("Standard deviation of the intervals",
             call("Moment_head", intervals, 2) ** 0.5, "Moment_head")):
        rows.append(Row(label, number(value, 4), unit, export))
    return rows


def pulse_rows(recording, pulse):
    step, unit = scale_of(recording)
    first, second = ("Rise", "Fall") if pulse.rises else ("Fall", "Rise")
    return [Row("Amplitude of one event", number(pulse.high - pulse.low, 4),
                recording.unit, "StateLevels"),
            Row(f"{first} between 10% and 90%", number(pulse.first_duration * step, 4), unit,
                "TransMeas"),
            Row(f"{second} between 90% and 10%", number(pulse.second_duration * step, 4),
                unit, "TransMeas"),
            Row("Width at half height", number(pulse.width * step, 4), unit,
                "PulseMeasEx"),
            Row("Overshoot", number(pulse.first_overshoot, 3), "%", "TransMeas"),
            Row("Overshoot behind it", number(pulse.second_overshoot, 3), "%",
                "TransMeas")]


def events(recording):
    places = measuring.events(recording.values, recording.rate)
    if len(places) < 3:
        return None
    found = places.astype(int)
    rows, figures = interval_rows(recording, places), [marked(recording, found)]
    one = measuring.typical_event(recording.values, places)
    if one:
        rows += pulse_rows(recording, one[0])
        figures.append(measured(recording, *one))
    return Section("Repeated events", "Where bursts of steep slope stand out, such as the beats "
                   "of an electrocardiogram; each is placed at the sample that is farthest from "
                   "the median around it.", rows, figures)
