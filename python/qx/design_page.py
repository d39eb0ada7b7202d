"""The page that shows what a filter does: magnitude, phase and group delay."""

import html
import math

import numpy as np

from . import drawing, outputs, pages
from .sections import Row, Section, number, resolved

POINTS = 4000
FLOOR = -200.0  # dB


def write(filter_, title, rate, path):
    """Writes the page and gives the lines for the terminal."""
    frequencies = np.linspace(0, 0.5, POINTS + 1)
    section = described(filter_, frequencies, rate)
    outputs.write_text(path, page(title, section))
    lines = [title, ""]
    wide = max(len(row.label) for row in section.rows)
    lines += [f"  {row.label:<{wide}}  {row.value} {row.unit}".rstrip() for row in section.rows]
    return lines


def page(title, section):
    rows = "".join(f"<tr><td>{html.escape(row.label)}</td><td>{html.escape(row.value)} "
                   f"{html.escape(row.unit)}</td><td>{html.escape(row.export)}</td></tr>"
                   for row in section.rows)
    figures = "".join(f"<figure>{figure}</figure>" for figure in section.figures)
    return (f'<!DOCTYPE html>\n<html lang="en"><head><meta charset="utf-8">'
            f'<meta name="viewport" content="width=device-width">{outputs.generator("design")}'
            f"<title>{html.escape(title)}</title>"
            f"<style>{pages.COMMON_STYLE} td {{ padding: .1em 1.2em .1em 0; }}</style></head><body>"
            f"<h1>{html.escape(title)}</h1>{figures}<table>{rows}</table></body></html>\n")


def decibels(gain):
    return 20 * np.log10(np.maximum(np.abs(gain), 10 ** (FLOOR / 20)))


def half_power(frequencies, gain):
    """Where the magnitude crosses the half of its greatest power, between points along a line."""
    excess = np.abs(gain) ** 2 / np.max(np.abs(gain)) ** 2 - 0.5
    at = np.flatnonzero((excess[1:] > 0) != (excess[:-1] > 0))
    share = excess[at] / (excess[at] - excess[at + 1])
    return frequencies[at] + share * (frequencies[at + 1] - frequencies[at])


def described(filter_, frequencies, rate):
    gain, delay = filter_.response(frequencies), filter_.group_delay(frequencies)
    unit = "Hz" if rate != 1 else "cycles per sample"
    coefficients = sum(len(b) + len(a) - 1 for b, a in filter_.sections)
    kind = (f"{coefficients} taps" if filter_.is_fir() else
            f"{len(filter_.sections)} sections, {coefficients} coefficients")
    crossings = resolved(rate * half_power(frequencies, gain), rate * frequencies[1])
    passed = np.abs(gain) > 0.5 ** 0.5 * np.abs(gain).max()
    delays = delay[passed & np.isfinite(delay)]
    rows = [Row("Filter", kind + (", " + filter_.note if filter_.note else ""), "",
                filter_.export),
            Row("Stable", "yes" if filter_.is_stable() else "NO", "", "roots"),
            Row("Half power at", ", ".join(crossings) or "no frequency", unit, ""),
            Row("Least gain", number(decibels(gain).min(), 4), "dB", ""),
            Row("Greatest gain", number(decibels(gain).max(), 4), "dB", "")]
    if len(delays):
        rows.append(Row("Group delay of what passes",
                        f"{number(delays.min(), 4)} to {number(delays.max(), 4)}",
                        "samples", ""))
    return Section("Filter", "", rows, figures(frequencies, gain, delay, rate, unit))


def figures(frequencies, gain, delay, rate, unit):
    plt = drawing.pyplot()
    x = rate * frequencies
    phase = np.where(np.abs(gain) < 1e-12, math.nan, np.angle(gain))
    jumps = np.flatnonzero(np.abs(np.diff(phase)) > 0.9 * math.pi) + 1
    phase = np.insert(phase, jumps, math.nan)  # no line is drawn across them
    curves = [("Magnitude", "Gain (dB)", x, decibels(gain)),
              ("Phase", "Phase (degrees)", np.insert(x, jumps, x[jumps]), np.degrees(phase)),
              ("Group delay", "Delay (samples)" if rate == 1 else "Delay (ms)", x,
               delay * (1 if rate == 1 else 1000 / rate))]
    drawn = []
    for name, label, at, values in curves:
        figure, axes = plt.subplots(figsize=(10, 2.8))
        axes.plot(at, values, color=drawing.BLUE, linewidth=1.2)
        axes.set(title=name, xlabel=f"Frequency ({unit})", ylabel=label)
        axes.margins(x=0.005)
        if name == "Magnitude":
            top = values.max()
            axes.set_ylim(max(values.min(), top - 140) - 3, top + 5)
        if name == "Group delay":
            # Where nothing passes the delay may be anything.
            passed = values[(np.abs(gain) > 1e-3 * np.abs(gain).max()) & np.isfinite(values)]
            low, high = passed.min(), passed.max()
            room = 0.1 * (high - low) + 1e-3 * abs(high)
            axes.set_ylim(low - room, high + room)
        drawn.append(drawing.svg(plt, figure))
    return drawn
