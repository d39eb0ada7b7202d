"""Fits of a model to two columns of a table. The fits are done by exports; what stands here is which
columns they are given, and how the result is told and shown."""

import dataclasses
import os
from collections.abc import Callable

import numpy as np

from . import outputs, recording
from .calls import call
from .files import InputError

ITERATIONS, TOLERANCE = 2000, 1e-12
NATURAL = 2.71828  # the exports take these digits for e


@dataclasses.dataclass
class Model:
    formula: str
    parameters: list
    value: Callable  # (x, parameters) to what the formula says
    fit: Callable  # (x, y, w, options) to fit and parameters


@dataclasses.dataclass
class Options:
    """What a fit may be told, values by the names of the parameters."""
    method: int = 0  # 0 least squares, 1 least absolute residuals, 2 bisquare
    guess: dict = dataclasses.field(default_factory=dict)
    lower: dict = dataclasses.field(default_factory=dict)
    upper: dict = dataclasses.field(default_factory=dict)


@dataclasses.dataclass
class Columns:
    x: np.ndarray
    y: np.ndarray
    w: np.ndarray  # empty without weights
    x_label: str
    y_label: str


@dataclasses.dataclass
class Fit:
    model: Model
    parameters: list
    columns: Columns
    values: np.ndarray  # of the model at x
    deviation: float  # sqrt of the sum of w r^2 over the degrees of freedom
    mean_absolute: float  # the mean of |w r|
    r_square: float

    @property
    def residuals(self):
        return self.columns.y - self.values


def _bounds(model, options):
    return ([options.lower.get(name, -np.inf) for name in model.parameters],
            [options.upper.get(name, np.inf) for name in model.parameters])


def _guess(model, options):
    if not options.guess:
        return []
    missing = [name for name in model.parameters if name not in options.guess]
    if missing:
        raise ValueError(f"the guess has no value for {', '.join(missing)}")
    return [options.guess[name] for name in model.parameters]


def _line(x, y, w, options):
    lower, upper = _bounds(MODELS["line"], options)
    if options.method == 0:
        fit, *parameters, _ = call("BoundLinearFit_head", y, x, w, lower, upper)
    else:
        export = ("BoundLinearFitLAR_head", "BoundLinearFitBi_head")[options.method - 1]
        fit, _, *parameters, _ = call(export, y, x, w, TOLERANCE, ITERATIONS, lower, upper)
    return fit, parameters


def _bounded(export, name):
    def fit(x, y, w, options):
        model = MODELS[name]
        values, _, *parameters, _ = call(export, y, x, w, TOLERANCE, ITERATIONS,
                                         _guess(model, options), *_bounds(model, options), options.method)
        return values, parameters
    return fit


def _logarithm(x, y, w, options):
    model = MODELS["logarithm"]
    values, _, *parameters, _ = call("BoundLogFit_head", y, x, w, NATURAL, ITERATIONS,
                                     _guess(model, options), *_bounds(model, options), options.method,
                                     TOLERANCE)
    return values, parameters


MODELS = {
    "line": Model("a x + b", ["a", "b"], lambda x, p: p[0] * x + p[1], _line),
    "exponential": Model("a exp(b x) + c", ["a", "b", "c"], lambda x, p: p[0] * np.exp(p[1] * x) + p[2],
                         _bounded("BoundExpFit_head", "exponential")),
    "power": Model("a x^b + c", ["a", "b", "c"], lambda x, p: p[0] * x**p[1] + p[2],
                   _bounded("BoundPowerFit_head", "power")),
    "logarithm": Model("a ln(b x)", ["a", "b"], lambda x, p: p[0] * np.log(p[1] * x), _logarithm),
    "gaussian": Model("a exp(-((x - m) / s)^2 / 2) + c", ["a", "m", "s", "c"],
                      lambda x, p: p[0] * np.exp(-0.5 * ((x - p[1]) / p[2])**2) + p[3],
                      _bounded("BoundGaussianFit_head", "gaussian")),
}


def polynomial(order):
    if order < 0:
        raise ValueError(f"no polynomial of order {order}")
    names = [f"c{j}" for j in range(order + 1)]

    def fit(x, y, w, options):
        if options.method:
            raise ValueError("a polynomial is fitted by least squares only")
        if options.guess or options.lower != options.upper:
            raise ValueError("a polynomial takes fixed coefficients, but no guess and no bounds")
        fixed = [names.index(name) for name in options.lower]
        values, parameters, _ = call("PolyFit81_head", x, y, order, w, 0, fixed,
                                     list(options.lower.values()))
        return values, list(parameters)
    terms = ["c0", "c1 x", *(f"c{j} x^{j}" for j in range(2, order + 1))]
    formula = " + ".join(terms[:order + 1] if order < 5 else [*terms[:3], "...", terms[order]])
    return Model(formula, names, lambda x, p: np.polynomial.polynomial.polyval(x, p), fit)


def model_of(name, order=2):
    if name == "polynomial":
        return polynomial(order)
    if name not in MODELS:
        raise ValueError(f"no model {name!r}; there are {', '.join(MODELS)} and polynomial")
    return MODELS[name]


def _label(layout, column):
    name, unit = layout.names[column] or f"column {column + 1}", layout.units[column]
    return f"{name} ({unit})" if unit else name


def read(path, x=None, y=None, weights=None, decimal=None, missing=None, time=None, dates=None,
         thousands=False):
    """Two columns of a table, and a third one with weights. Each is a name or a number from 1; x is the column
    `time`, the first one where neither is said, and y the first other one. With `time` "none", and for a table
    of one column, x is the number of the row. The others are as in recording.read."""
    with recording.opened(path) as source:
        options = {"decimal": decimal, "missing": missing, "dates": dates, "thousands": thousands}
        x = x if time in (None, "none") else time
        reader = recording.table_of(source, time, options, x, y, weights)
        return _columns_of(reader, x, y, weights, x is None and time == "none")


def _columns_of(reader, x, y, weights, by_rows):
    path = reader.path
    layout = reader.layout
    chosen = {role: None if name is None else recording.column_called(path, layout, name)
              for role, name in (("x", x), ("y", y), ("w", weights))}
    free = [c for c in range(layout.width) if c not in chosen.values()]
    for role in ("y",) if by_rows else ("x", "y"):
        if chosen[role] is None and (layout.width > 1 or role == "y"):
            if not free:
                raise InputError(f"{path}: no column is left for {role}")
            chosen[role] = free.pop(0)
    wanted = [c for c in dict.fromkeys(chosen.values()) if c is not None]
    parts = [part for part, _ in reader.parts(wanted)]
    values = {c: np.concatenate([part[c] for part in parts]) for c in wanted}
    rows = np.arange(1.0, len(values[chosen["y"]]) + 1)
    columns = {role: rows if role == "x" and c is None else values.get(c, np.empty(0))
               for role, c in chosen.items()}
    complete = ~np.any([np.isnan(column) for column in columns.values() if len(column)], axis=0)
    if not complete.any():
        raise InputError(f"{path}: holds no complete row")
    columns = {role: column[complete] if len(column) else column for role, column in columns.items()}
    return Columns(**columns, x_label="row" if chosen["x"] is None else _label(layout, chosen["x"]),
                   y_label=_label(layout, chosen["y"]))


def fit(model, columns, options=Options()):
    for name in {**options.guess, **options.lower, **options.upper}:
        if name not in model.parameters:
            raise ValueError(f"{model.formula} has no parameter {name}")
    x, y, w = columns.x, columns.y, columns.w
    values, parameters = model.fit(x, y, w, options)
    fixed = sum(name in options.lower and options.lower[name] == options.upper.get(name)
                for name in model.parameters)
    freedom = len(y) - len(parameters) + fixed
    deviation, r_square = float("nan"), float("nan")
    if freedom > 0 and len(y) > 1:
        _, r_square, deviation = call("GoodnessOfFit_head", y, values, np.abs(w), freedom)
    weighted = (y - values) * (np.abs(w) if len(w) else 1.0)
    return Fit(model, parameters, columns, values, deviation,
               call("Mean_head", np.abs(weighted)), r_square)


def lines(result):
    """The result for the terminal."""
    yield f"{result.columns.y_label} = {result.model.formula}, x = {result.columns.x_label}"
    for name, value in zip(result.model.parameters, result.parameters):
        yield f"  {name:<4} {value:.10g}"
    yield f"{len(result.values)} samples, standard deviation of the residuals {result.deviation:.6g},"
    yield f"  mean absolute residual {result.mean_absolute:.6g}, R^2 {result.r_square:.8g}"


def plot(result, path):
    """Data and fit above, residuals below; the suffix of the path says the format."""
    from . import drawing
    plt = drawing.pyplot()
    columns = result.columns
    order = np.argsort(columns.x, kind="stable")
    fine = np.linspace(columns.x.min(), columns.x.max(), 500)
    figure, (above, below) = plt.subplots(2, 1, figsize=(8, 5.5), sharex=True,
                                          gridspec_kw={"height_ratios": [3, 1]})
    dense = len(order) > 500
    above.plot(columns.x, columns.y, ".", color=drawing.GREY, markersize=2 if dense else 5, label="data")
    above.plot(fine, result.model.value(fine, result.parameters), color=drawing.BLUE, linewidth=1.6,
               label=result.model.formula)
    above.set(ylabel=columns.y_label)
    above.legend(frameon=False)
    below.axhline(0, color=drawing.GREY, linewidth=0.8)
    below.plot(columns.x[order], result.residuals[order], "." if dense else ".-", color=drawing.WARM,
               linewidth=0.7, markersize=2 if dense else 4)
    below.set(xlabel=columns.x_label, ylabel="residual")
    os.makedirs(os.path.dirname(path) or ".", exist_ok=True)
    marked = {"metadata": {"Creator": outputs.mark("fit")}} if path.lower().endswith(".svg") else {}
    with outputs.whole(path) as part:
        figure.savefig(part, **marked)
    plt.close(figure)
