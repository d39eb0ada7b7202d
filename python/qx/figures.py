"""The contents of plots, independent of how they are drawn: pages draw them with dygraphs (pages.py), files and
pages without dygraphs with matplotlib (drawing.py)."""

import base64
import dataclasses
import io

import numpy as np

BLUE, WARM, GREY = "blue", "warm", "grey"  # colours of the page's style, light or dark
MOST_POINTS = 1 << 15  # points of a curve in a page; longer curves are reduced to lowest and highest values


@dataclasses.dataclass
class Curve:
    name: str
    values: np.ndarray
    colour: str = BLUE
    highs: "np.ndarray | None" = None  # the highest values of blocks, if the values are the lowest ones
    dots: bool = False  # points instead of a line


@dataclasses.dataclass
class Mark:
    x: float
    y: float
    label: str = ""
    colour: str = WARM


@dataclasses.dataclass
class Image:
    """Values over x and y, from 0 to 255, shown as colours; the first row is the lowest."""
    values: np.ndarray
    left: float
    right: float
    bottom: float
    top: float
    label: str  # label of the colours: the quantity, and the values of the darkest and the brightest


@dataclasses.dataclass
class Plot:
    """Curves over a common axis, with even steps or at the abscissae x."""
    title: str
    x_label: str
    y_label: str
    curves: list = dataclasses.field(default_factory=list)
    start: float = 0.0
    step: float = 1.0
    x: "np.ndarray | None" = None
    marks: list = dataclasses.field(default_factory=list)
    levels: list = dataclasses.field(default_factory=list)  # pairs of a y and a label
    verticals: list = dataclasses.field(default_factory=list)  # pairs of an x and a label
    y_range: "tuple | None" = None
    x_range: "tuple | None" = None  # the range shown initially
    link: str = ""  # plots with the same link share their x axis
    bars: bool = False
    may_be_log: bool = False  # whether the reader can make the x axis logarithmic
    image: "Image | None" = None

    def places(self):
        return self.start + self.step * np.arange(len(self.curves[0].values)) if self.x is None else self.x


def extremes(values, group, highs=None):
    """The lowest and the highest of every `group` values; the last group may be shorter."""
    starts = np.arange(0, len(values), group)
    return (np.fmin.reduceat(values, starts),
            np.fmax.reduceat(values if highs is None else highs, starts))


def reduced(plot, most=MOST_POINTS):
    """The plot with at most `most` points in a curve, without losing extremes."""
    longest = max((len(curve.values) for curve in plot.curves), default=0)
    if longest <= most:
        return plot
    group = -(-longest // (most // 2))
    curves = []
    for curve in plot.curves:
        lows, highs = extremes(curve.values, group, curve.highs)
        curves.append(dataclasses.replace(curve, values=lows, highs=highs))
    x = None if plot.x is None else plot.x[::group]
    return dataclasses.replace(plot, curves=curves, step=plot.step * group, x=x)


def numbers(values):
    """An array as text, each number with an accuracy of seven digits of the largest distance from the middle."""
    values = np.asarray(values, float)
    finite = values[np.isfinite(values)]
    middle = float(finite.min() / 2 + finite.max() / 2) if len(finite) else 0.0
    scale = float(np.abs(finite - middle).max(initial=0)) or 1.0
    with np.errstate(under="ignore", invalid="ignore"):
        stored = ((values - middle) / scale).astype("<f4")
    return {"middle": middle, "scale": scale, "data": base64.b64encode(stored.tobytes()).decode()}


def palette():
    """256 colours from dark to bright."""
    stops = np.array([(13, 16, 48), (52, 42, 120), (38, 110, 142), (53, 167, 118), (170, 208, 62), (253, 240, 170)])
    at = np.linspace(0, len(stops) - 1, 256)
    return np.stack([np.interp(at, range(len(stops)), part) for part in stops.T], -1).round().astype(np.uint8)


def png(values):
    """Values from 0 to 255 as an image whose first row is the lowest."""
    import PIL.Image
    image = PIL.Image.fromarray(np.ascontiguousarray(values[::-1], np.uint8), "P")
    image.putpalette(palette().tobytes())
    file = io.BytesIO()
    image.save(file, "PNG", optimize=True)
    return file.getvalue()


def described(plot, most=MOST_POINTS):
    """The plot in the form that a page takes: numbers, texts, lists and dictionaries."""
    plot = reduced(plot, most)
    found = {name: getattr(plot, name) for name in ("title", "x_label", "y_label", "start", "step", "link", "bars",
                                                    "may_be_log", "y_range", "x_range", "levels",
                                                    "verticals")}
    found["marks"] = [dataclasses.asdict(mark) for mark in plot.marks]
    found["curves"] = [{"name": curve.name, "colour": curve.colour, "dots": curve.dots, **numbers(curve.values),
                        "highs": None if curve.highs is None else numbers(curve.highs)} for curve in plot.curves]
    if plot.x is not None:
        found["x"] = [float(x) for x in plot.x]
    if plot.image:
        shown = dataclasses.asdict(plot.image)
        shown["values"] = "data:image/png;base64," + base64.b64encode(png(plot.image.values)).decode()
        found["image"] = shown
    return found
