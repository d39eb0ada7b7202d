"""The report on a recording: figures in a table, plots in a page. The analysis is done by exports;
NumPy carries arrays and scales them for display.

A section is a function that takes a recording and gives a Section, or None where the recording is
too short for it; SECTIONS lists them in the order of the page.
"""

import dataclasses
import html
import io
import math
import textwrap
import warnings
from datetime import datetime, timezone

import numpy as np

from . import outputs
from .calls import call
from .outcomes import QxError

BLUE, DARK, GREY, WARM = "#2f6db3", "#1f2d3d", "#8795a6", "#c8553d"


@dataclasses.dataclass
class Row:
    label: str
    value: str
    unit: str
    export: str  # the export behind the number, and what else went into it


@dataclasses.dataclass
class Section:
    title: str
    text: str  # one paragraph
    rows: list = dataclasses.field(default_factory=list)
    figures: list = dataclasses.field(default_factory=list)  # SVG texts
    terminal: list = dataclasses.field(default_factory=list)  # further lines for the terminal


def number(value, digits=6):
    return f"{value:.{digits}g}" if math.isfinite(value) else "beyond all numbers"


def resolved(values, step):
    """The values as texts with the digits that a difference of `step` needs."""
    values = [float(value) for value in values]
    largest = max(map(abs, values), default=0.0)
    if not (step > 0 and math.isfinite(step) and math.isfinite(largest)):
        return [number(value) for value in values]
    place = math.floor(math.log10(step)) - 1  # of the last digit, one finer than the step
    if 1e-4 <= max(largest, step) < 1e7:
        return [f"{value:.{max(0, -place)}f}" for value in values]
    digits = max(1, math.floor(math.log10(largest)) - place) if largest else 1
    return [f"{value:.{min(17, digits)}e}" for value in values]


def power_unit(unit, exponent):
    if not unit or exponent == 1:
        return unit
    return unit + {2: "²", 3: "³", 4: "⁴"}[exponent]


def quantity(recording):
    """The label of an axis of values."""
    name = recording.channel[:1].upper() + recording.channel[1:]
    return f"{name} ({recording.unit})" if recording.unit else name


def bins_for(n):
    """Twice the cube root of the number of samples, within what a plot can show."""
    return int(min(120, max(5, round(2 * n ** (1 / 3)))))


# Plots

def _pyplot():
    import matplotlib
    matplotlib.use("svg")
    import matplotlib.pyplot as plt
    plt.rcParams.update({
        "font.family": "DejaVu Sans", "font.size": 9.5, "axes.edgecolor": GREY,
        "axes.labelcolor": DARK, "axes.titlesize": 11, "axes.titlecolor": DARK,
        "axes.titleweight": "bold", "axes.titlelocation": "left", "axes.spines.top": False,
        "axes.spines.right": False, "axes.grid": True, "grid.color": "#dfe5ec",
        "grid.linewidth": 0.7, "axes.axisbelow": True, "xtick.color": DARK, "ytick.color": DARK,
        "axes.formatter.useoffset": False, "text.parse_math": False, "savefig.transparent": True,
        # Texts stay texts: the reader's fonts have what ours lacks.
        "svg.fonttype": "none", "figure.constrained_layout.use": True})
    return plt


def _svg(plt, figure):
    """The figure for a page: as it is, and redrawn for windows as narrow as a telephone."""
    drawings = [_drawn(plt, figure, "wide")]
    width, height = figure.get_size_inches()
    if width > 6:
        figure.set_size_inches(NARROW, max(2.6, 0.85 * height))
        for axes in figure.axes:
            axes.set_title(textwrap.fill(axes.get_title("left"), 46), loc="left")
            longest = max((len(label.get_text()) for label in axes.get_xticklabels()), default=0)
            if longest > 5 and axes.get_xscale() == "linear":
                axes.locator_params(axis="x", nbins=max(2, 40 // (longest + 2)))
        drawings.append(_drawn(plt, figure, "narrow"))
    plt.close(figure)
    return "".join(drawings)


NARROW = 4.6  # inches


def _drawn(plt, figure, kind):
    buffer = io.StringIO()
    # Names in the drawing are made from its content; the two of a figure are never shown together.
    plt.rcParams["svg.hashsalt"] = kind
    with warnings.catch_warnings():
        warnings.filterwarnings("ignore", message="Glyph .* missing from current font")
        figure.savefig(buffer, format="svg", metadata={"Date": None})
    text = buffer.getvalue()
    return text[text.index("<svg"):].replace("<svg ", f'<svg class="{kind}" ', 1)


def _trace(axes, x, y, **style):
    """A line, or the band between extremes where there are more samples than a plot can show."""
    limit = 12000
    if len(x) <= limit:
        axes.plot(x, y, **style)
        return
    group = -(-len(x) // (limit // 4))
    whole = len(x) // group * group
    parts = y[:whole].reshape(-1, group)
    axes.fill_between(x[:whole:group], parts.min(axis=1), parts.max(axis=1),
                      color=style.get("color"), linewidth=0.4)


# Sections

def overview(recording):
    n, unit = len(recording.values), recording.unit
    counted = f"{n} sample" + "s" * (n != 1)
    figures = []
    plt = _pyplot()
    times = recording.times()
    figure, axes = plt.subplots(figsize=(10, 2.9))
    if recording.whole:
        _outline(axes, recording)
    else:
        _trace(axes, times, recording.values, color=BLUE, linewidth=0.7)
    axes.set(title="The whole recording", xlabel=f"Time ({recording.time_unit})",
             ylabel=quantity(recording))
    axes.margins(x=0.005)
    figures.append(_svg(plt, figure))
    part = _excerpt(recording)
    if part < n:
        figure, axes = plt.subplots(figsize=(10, 2.9))
        _trace(axes, times[:part], recording.values[:part], color=BLUE, linewidth=1.1)
        shown = f"{times[part - 1]:.3g} {recording.time_unit}"
        axes.set(title=f"The first {shown}", xlabel=f"Time ({recording.time_unit})",
                 ylabel=quantity(recording))
        axes.margins(x=0.005)
        figures.append(_svg(plt, figure))
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
                      np.minimum.reduceat(lows, starts), np.maximum.reduceat(highs, starts), color=BLUE,
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
    plt = _pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    axes.bar(centres, counts, width=0.92 * width, color=BLUE)
    for value, name, colour in ((mean, "mean", WARM), (median, "median", DARK)):
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
                   figures=[_svg(plt, figure)], terminal=["Histogram (bin centre, samples)", *bars])


def frequency_axis(recording):
    """The factor from cycles per sample and the label of an axis of frequencies."""
    if recording.rate:
        return recording.rate, "Frequency (Hz)"
    return 1.0, "Frequency (cycles per sample)"


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
    plt = _pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    _trace(axes, frequencies, np.maximum(shown, 1e-300), color=BLUE, linewidth=0.6)
    _decades(axes, shown)
    axes.set(title="Amplitude spectrum of the whole recording", xlabel=label,
             ylabel=f"Amplitude ({recording.unit})" if recording.unit else "Amplitude")
    axes.margins(x=0.005)
    return Section("Amplitude spectrum",
                   f"Peak amplitudes of the sinusoids of the recording, {number(frequencies[0], 3)} "
                   f"{unit} apart, without a window; the five strongest parts of the spectrum.",
                   rows, [_svg(plt, figure)])


def _decades(axes, values):
    """A logarithmic scale over the decades that matter, where there are any."""
    top = values.max()
    if top > 0 and math.isfinite(top):
        axes.set_yscale("log")
        axes.yaxis.set_major_formatter(lambda value, _: f"{value:g}")  # as text, not as a formula
        positive = values[values > 1e-12 * top]
        axes.set_ylim(max(positive.min(), 1e-2 * np.median(positive)) / 1.5, 1.6 * top)


HANNING = 1  # window selector
DEFAULT = math.nan  # window parameter


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
    plt = _pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.1))
    axes.plot(frequencies, decibels, color=BLUE, linewidth=1.1)
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
                   rows, [_svg(plt, figure)])


# Families with sections of their own; they take the above from here.
from .sections_cleaning import cleaned  # noqa: E402
from .sections_filtering import filtered  # noqa: E402
from .sections_measuring import events  # noqa: E402

SECTIONS = [overview, statistics, histogram, amplitudes, power, filtered, cleaned, events]


# Output

# For all pages: plots in the size of the window, and dark where the reader prefers it. The drawings
# have no ground of their own, so turning their colours round does it for them.
COMMON_STYLE = """
:root { color-scheme: light dark; --text: #1f2d3d; --ground: #fff; --quiet: #5b6b7d; --line: #dfe5ec;
        --shade: #f5f7fa; --link: #2f6db3; }
body { font: 15px/1.5 "DejaVu Sans", "Segoe UI", Helvetica, Arial, sans-serif; color: var(--text);
       max-width: 62em; margin: 2em auto; padding: 0 1.2em; background: var(--ground); }
figure { margin: 0 0 .6em; } figure svg { width: 100%; height: auto; } figure svg.narrow { display: none; }
@media (max-width: 640px) { body { margin: 1em auto; padding: 0 .8em; }
  figure svg.wide:not(:only-child) { display: none; } figure svg.narrow { display: block; } }
@media (prefers-color-scheme: dark) {
  :root { --text: #dde4ec; --ground: #15191e; --quiet: #93a1b1; --line: #303a45; --shade: #1d232a;
          --link: #7db2ea; }
  figure svg { filter: invert(1) hue-rotate(180deg); } }
@media print { figure svg.narrow { display: none; } }
"""
HEAD = ('<meta charset="utf-8"><meta name="viewport" content="width=device-width, initial-scale=1">')

STYLE = COMMON_STYLE + """
h1 { font-size: 1.6em; margin-bottom: .1em; overflow-wrap: anywhere; } h2 { font-size: 1.15em;
     margin: 1.8em 0 .4em; border-bottom: 1px solid var(--line); padding-bottom: .2em; }
p.source { color: var(--quiet); margin: .2em 0; overflow-wrap: anywhere; }
table { border-collapse: collapse; } td, th { padding: .22em 1.4em .22em 0; text-align: left;
     border-bottom: 1px solid var(--line); } td.value { text-align: right; white-space: nowrap;
     font-variant-numeric: tabular-nums; padding-right: .5em; } td.export { color: var(--quiet);
     font-family: "DejaVu Sans Mono", Consolas, monospace; font-size: .86em; overflow-wrap: anywhere; }
table + figure { margin-top: 1em; } footer { margin-top: 3em; color: var(--quiet); font-size: .85em; }
@media (max-width: 640px) { td, th { padding-right: .6em; } td.export { font-size: .7em; } }
"""


def page(recording, sections):
    escape = html.escape
    title = recording.name
    out = ["<!DOCTYPE html>", f'<html lang="en"><head>{HEAD}{outputs.generator("report")}',
           f"<title>{escape(title)}</title><style>{STYLE}</style></head><body>",
           f"<h1>{escape(title)}</h1>"]
    if recording.choice:
        out.append(f'<p class="source">{escape(recording.choice)}.</p>')
    if recording.notes:
        out.append(f'<p class="source">{escape(" ".join(recording.notes))}</p>')
    for section in sections:
        out.append(f"<h2>{escape(section.title)}</h2><p>{escape(section.text)}</p>")
        if section.rows:
            out.append("<table><tr><th>Quantity</th><th>Value</th><th></th><th>From</th></tr>")
            out += [f'<tr><td>{escape(row.label)}</td><td class="value">{escape(row.value)}</td>'
                    f'<td>{escape(row.unit)}</td><td class="export">{escape(row.export)}</td></tr>'
                    for row in section.rows]
            out.append("</table>")
        out += [f"<figure>{figure}</figure>" for figure in section.figures]
    made = datetime.now(timezone.utc).strftime("%Y-%m-%d %H:%M UTC")
    out.append(f"<footer>Made {made} by python3 -m qx report.</footer></body></html>")
    return "\n".join(out) + "\n"


def lines(recording, sections):
    """The report for the terminal."""
    yield recording.name
    if recording.choice:
        yield recording.choice
    for section in sections:
        yield ""
        yield f"{section.title}: {section.text}"
        width = max((len(row.label) for row in section.rows), default=0)
        for row in section.rows:
            yield (f"  {row.label:<{width}}  {row.value:>14} {row.unit:<6} {row.export}").rstrip()
        yield from (f"  {line}" for line in section.terminal)


def sections_of(recording):
    found = []
    for make in SECTIONS:
        try:
            section = make(recording)
        except QxError as error:
            section = Section(make.__name__.replace("_", " ").capitalize(),
                              f"Not possible for this recording: {error}.")
        if section:
            found.append(section)
    return found


def write(recording, path):
    """Writes the page and gives the lines for the terminal."""
    sections = sections_of(recording)
    outputs.write_text(path, page(recording, sections))
    return list(lines(recording, sections))
