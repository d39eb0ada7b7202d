"""The section that shows a recording before and after a chosen filter."""

import numpy as np

from . import figures, filters, stats
from .sections import Row, Section, frequency_unit, number
from .sections_recording import over_time


def filtered(recording, kind, edges, order=4):
    """The section, and the filtered signal."""
    edges = edges[0] if len(edges) == 1 else tuple(edges)
    used = filters.butterworth(order, edges, kind, recording.rate or 1.0)
    after = used.zero_phase(recording.values)
    removed = recording.values - after
    source, unit = "Filter.zero_phase", recording.unit
    shown = ", ".join(f"{edge:g}" for edge in np.atleast_1d(edges))
    rows = [Row("Half power, of one pass, at", shown, frequency_unit(recording), "filters.butterworth"),
            Row("Standard deviation of the result", number(stats.std(after)), unit, source + ", stats.std"),
            Row("RMS of the removed part", number(stats.rms(removed)), unit, source + ", stats.rms"),
            Row("Greatest change", number(np.abs(removed).max()), unit, source)]
    plot = over_time(recording, "Before and after the filter", curves=[
        figures.Curve("before", recording.values, figures.GREY), figures.Curve("after", after, figures.WARM)])
    return Section("Filter", f"A Butterworth {kind} of order {order}, applied forward and backward to the signal, "
                   "continued at its ends, so that nothing is delayed.", rows, [plot]), after
