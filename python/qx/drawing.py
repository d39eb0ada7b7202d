"""Plots drawn by matplotlib, as SVG texts for pages without dygraphs and as separate files. The colours are for a
light page; the style of the pages (pages.py) inverts them on a dark one."""

import io
import math
import os
import textwrap
import warnings

import numpy as np

from . import figures, outputs

BLUE, DARK, GREY, WARM = "#2f6db3", "#1f2d3d", "#8795a6", "#c8553d"
COLOURS = {figures.BLUE: BLUE, figures.WARM: WARM, figures.GREY: GREY}
NARROW = 4.6  # inches


def pyplot():
    import logging
    logging.getLogger("matplotlib").setLevel(logging.ERROR)  # no warnings if the home folder is not writable
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
        # Texts are kept as texts: the reader's fonts may have characters that ours lack.
        "svg.fonttype": "none", "figure.constrained_layout.use": True})
    return plt


def svg(plot):
    """The plot for a page, in normal width and redrawn for windows as narrow as a telephone."""
    plt = pyplot()
    figure, axes = plt.subplots(figsize=(10, 3.0))
    draw(axes, plot)
    drawings = [_drawn(plt, figure, "wide")]
    figure.set_size_inches(NARROW, 2.7)
    axes.set_title(textwrap.fill(plot.title, 46), pad=18 if axes.get_legend() else 6)
    longest = max((len(label.get_text()) for label in axes.get_xticklabels()), default=0)
    if longest > 5:
        axes.locator_params(axis="x", nbins=max(2, 40 // (longest + 2)))
    drawings.append(_drawn(plt, figure, "narrow"))
    plt.close(figure)
    return "".join(drawings)


def _drawn(plt, figure, kind):
    buffer = io.StringIO()
    # Identifiers in a drawing are derived from its content; the two drawings of a figure are never shown together.
    plt.rcParams["svg.hashsalt"] = kind
    with warnings.catch_warnings():
        warnings.filterwarnings("ignore", message="Glyph .* missing from current font")
        figure.savefig(buffer, format="svg", metadata={"Date": None})
    text = buffer.getvalue()
    return text[text.index("<svg"):].replace("<svg ", f'<svg class="{kind}" ', 1)


def draw(axes, plot):
    """Draws the plot on matplotlib axes, with its legend, if any, above the data."""
    plot = figures.reduced(plot, 6000)
    places = plot.places() if plot.curves else np.empty(0)
    if plot.image:
        axes.imshow(figures.palette()[plot.image.values], origin="lower", aspect="auto", extent=(
            plot.image.left, plot.image.right, plot.image.bottom, plot.image.top))
        axes.grid(False)
    for curve in plot.curves:
        colour = COLOURS[curve.colour]
        if plot.bars:
            axes.bar(places, curve.values, width=0.92 * plot.step, color=colour, label=curve.name)
        elif curve.highs is not None:
            axes.fill_between(places, curve.values, curve.highs, color=colour, linewidth=0.4, label=curve.name)
        else:
            axes.plot(places, curve.values, "." if curve.dots else "-", color=colour, linewidth=0.9, markersize=3,
                      label=curve.name)
    for y, label in plot.levels:
        axes.axhline(y, color=GREY, linewidth=0.8, linestyle="--", label=label)
    for x, label in plot.verticals:
        axes.axvline(x, color=WARM, linewidth=1.2, label=label)
    for mark in plot.marks:
        axes.plot(mark.x, mark.y, "o", color=COLOURS[mark.colour], markersize=3.2)
        if mark.label:
            axes.annotate(mark.label, (mark.x, mark.y), xytext=(0, 5), textcoords="offset points", ha="center",
                          fontsize=7.5)
    has_legend = len(plot.curves) + len(plot.levels) + len(plot.verticals) > 1
    axes.set_title(textwrap.fill(plot.title, 110), pad=18 if has_legend else 6)
    axes.set(xlabel=plot.x_label, ylabel=plot.y_label)
    axes.margins(x=0.005)
    if plot.y_range and all(map(math.isfinite, plot.y_range)):
        axes.set_ylim(*plot.y_range)
    if plot.x_range:
        axes.set_xlim(*plot.x_range)
    if has_legend:
        axes.legend(frameon=False, fontsize=8, loc="lower right", bbox_to_anchor=(1.0, 1.0), ncols=3, borderaxespad=0.2)


def save(plots, path, command, heights=None):
    """Writes the plots, one above the other, to a file whose extension determines the format."""
    plt = pyplot()
    figure, all_axes = plt.subplots(len(plots), 1, figsize=(10, 3.0 * len(plots) + 1), squeeze=False,
                                    gridspec_kw={"height_ratios": heights})
    for axes, plot in zip(all_axes[:, 0], plots):
        draw(axes, plot)
    os.makedirs(os.path.dirname(path) or ".", exist_ok=True)
    marked = {"metadata": {"Creator": outputs.mark(command)}} if path.lower().endswith(".svg") else {}
    with outputs.whole(path) as part:
        figure.savefig(part, **marked)
    plt.close(figure)
