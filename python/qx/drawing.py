"""Plots as SVG texts for pages. Colours are those of a light page; the style of the pages (pages.py) turns
them round on a dark one."""

import io
import math
import textwrap
import warnings

import numpy as np

BLUE, DARK, GREY, WARM = "#2f6db3", "#1f2d3d", "#8795a6", "#c8553d"
NARROW = 4.6  # inches


def pyplot():
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


def svg(plt, figure):
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


def _drawn(plt, figure, kind):
    buffer = io.StringIO()
    # Names in the drawing are made from its content; the two of a figure are never shown together.
    plt.rcParams["svg.hashsalt"] = kind
    with warnings.catch_warnings():
        warnings.filterwarnings("ignore", message="Glyph .* missing from current font")
        figure.savefig(buffer, format="svg", metadata={"Date": None})
    text = buffer.getvalue()
    return text[text.index("<svg"):].replace("<svg ", f'<svg class="{kind}" ', 1)


def trace(axes, x, y, **style):
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


def decades(axes, values):
    """A logarithmic scale over the decades that matter, where there are any."""
    top = values.max()
    if top > 0 and math.isfinite(top):
        axes.set_yscale("log")
        axes.yaxis.set_major_formatter(lambda value, _: f"{value:g}")  # as text, not as a formula
        positive = values[values > 1e-12 * top]
        axes.set_ylim(max(positive.min(), 1e-2 * np.median(positive)) / 1.5, 1.6 * top)
