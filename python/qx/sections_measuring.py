"""The section of the report on repeated events and one pulse among them."""

import numpy as np

from . import figures, measuring, stats
from .sections import Row, Section, number, uncertain
from .sections_recording import over_time


def scale_of(recording):
    """The time between samples, and its unit."""
    return (1 / recording.rate, "s") if recording.rate else (1.0, "samples")


def marked(recording, found):
    """The whole recording with its events."""
    step, _ = scale_of(recording)
    return over_time(recording, f"{len(found)} events", curves=[figures.Curve(recording.channel, recording.values)],
                     marks=[figures.Mark(float(i * step), float(recording.values[i])) for i in found[:5000]])


def measured(recording, pulse, part):
    """One pulse with its levels and the ends of its transitions."""
    step, _ = scale_of(recording)
    values = recording.values[part]
    ends = np.array([pulse.start, pulse.start + pulse.first_duration,
                     pulse.end - pulse.second_duration, pulse.end])
    marks = [figures.Mark(float((part.start + end) * step), float(np.interp(end, np.arange(len(values)), values)),
                          label) for end, label in zip(ends, ("10%", "90%", "90%", "10%"))]
    half = (pulse.low + pulse.high) / 2
    marks += [figures.Mark(float((part.start + pulse.middle + side * pulse.width) * step), float(half), "50%")
              for side in (-0.5, 0.5)]
    plot = over_time(recording, "One of them: levels, 10%, 50% and 90% of both edges",
                     curves=[figures.Curve(recording.channel, values)], marks=marks,
                     levels=[(float(pulse.low), "low"), (float(pulse.high), "high")])
    plot.start, plot.link = part.start * step, ""
    return plot


def interval_rows(recording, found):
    step, unit = scale_of(recording)
    intervals = np.diff(found) * step
    rows = [Row("Events", str(len(found)), "", "bursts of slope")]
    if recording.rate:
        rows.append(Row("Rate, by the median interval",
                        number(60 / stats.median(intervals), 4),
                        "1/min", "stats.median"))
    for label, value, export in (
            ("Median interval", stats.median(intervals), "stats.median"),
            ("Shortest interval", intervals.min(), "bursts of slope"),
            ("Longest interval", intervals.max(), "bursts of slope"),
            ("Standard deviation of the intervals",
             stats.std(intervals), "stats.std")):
        rows.append(Row(label, number(value, 4), unit, export))
    return rows


def pulse_rows(recording, pulse):
    step, unit = scale_of(recording)
    first, second = ("Rise", "Fall") if pulse.rises else ("Fall", "Rise")
    amplitude, error = uncertain(pulse.high - pulse.low, np.hypot(pulse.high_error, pulse.low_error))
    return [Row("Amplitude of one event", amplitude, recording.unit, "measure.pulses", error),
            Row(f"{first} between 10% and 90%", number(pulse.first_duration * step, 4), unit,
                "measure.pulses"),
            Row(f"{second} between 90% and 10%", number(pulse.second_duration * step, 4),
                unit, "measure.pulses"),
            Row("Width at half height", number(pulse.width * step, 4), unit,
                "measure.pulses"),
            Row("Overshoot", number(pulse.first_overshoot, 3), "%", "measure.pulses"),
            Row("Overshoot after it", number(pulse.second_overshoot, 3), "%",
                "measure.pulses")]


def places_of(recording):
    """The events of all samples, or of those in memory if there are too many, and a sentence about this."""
    whole = recording.whole
    places = measuring.events_of_whole(whole, recording.rate) if whole else None
    if places is not None:
        return places, f" Events of all {whole.count} samples; the plots show those in memory."
    return (measuring.events(recording.values, recording.rate),
            " Events of the samples in memory, since there are too many." if whole else "")


def events(recording):
    places, of = places_of(recording)
    if len(places) < 3:
        return None
    rows = interval_rows(recording, places)
    places = places[places < len(recording.values)]
    found = places.astype(int)
    figures = [marked(recording, found)]
    one = measuring.typical_event(recording.values, places) if len(places) else None
    if one:
        rows += pulse_rows(recording, one[0])
        figures.append(measured(recording, *one))
    return Section("Repeated events", "Bursts of steep slope, such as the beats "
                   "of an electrocardiogram. Each is placed at the sample that is farthest from "
                   "the median around it." + of, rows, figures)
