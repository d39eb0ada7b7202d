"""Fits of a model to two columns of a table: the choice of the columns, and the presentation of the result."""

import dataclasses
import math
import warnings
from typing import Any

import numpy as np

from . import drawing, figures, isolation, recording
from . import fit as topic
from .files import InputError, printable
from .outcomes import QxWarning
from .sections import number, uncertain

METHODS = ("least squares", "absolute", "bisquare")
FORMULAS = {"line": ("a x + b", "ab"), "exponential": ("a exp(b x) + c", "abc"), "power": ("a x^b + c", "abc"),
            "logarithm": ("a ln(b x)", "ab"), "gaussian": ("a exp(-((x - m) / s)^2 / 2) + c", "amsc")}
TIED = 0.9999  # correlation from which only a combination of parameters is known
FAR = 100.0  # times the range of the data


@dataclasses.dataclass
class Options:
    """The options of a fit; values are given by the names of the parameters."""
    method: int = 0  # index in METHODS
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
class Fitted:
    fit: topic.Fit
    columns: Columns
    warnings: list


def parameters_of(model, order=2):
    """The formula of a model and the names of its parameters."""
    if model == "polynomial":
        if order < 0:
            raise ValueError(f"no polynomial of order {order}")
        return f"polynomial of order {order}", [f"c{j}" for j in range(order + 1)]
    if model not in FORMULAS:
        raise ValueError(f"no model {model!r}; there are {', '.join(FORMULAS)} and polynomial")
    formula, names = FORMULAS[model]
    return formula, list(names)


def _label(layout, column):
    name, unit = layout.names[column] or f"column {column + 1}", layout.units[column]
    return printable(f"{name} ({unit})" if unit else name)


def read(path, x=None, y=None, weights=None, decimal=None, missing=None, time=None, dates=None,
         thousands=False):
    """Two columns of a table, and a third one with weights. Each is a name or a number from 1. By default, x is
    the column `time`, or else the first one, and y is the first other column. With `time` "none", and for a table
    of one column, x is the row number. The other arguments are those of recording.read."""
    return isolation.read(_read, path, x, y, weights, decimal, missing, time, dates, thousands)


def _read(_, path, file, x, y, weights, decimal, missing, time, dates, thousands):
    with recording.opened(path, file) as source:
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


def fit(model, columns, options=Options(), order=2):
    """Fits a model by its name."""
    formula, names = parameters_of(model, order)
    for name in {**options.guess, **options.lower, **options.upper}:
        if name not in names:
            raise ValueError(f"{formula} has no parameter {name}")
    unfinished: list[str] = []
    with np.errstate(divide="ignore"):
        sigma = 1 / np.sqrt(np.abs(columns.w)) if len(columns.w) else None
    if model == "polynomial":
        if options.method:
            raise ValueError("a polynomial is fitted by least squares only")
        if options.guess or options.lower != options.upper:
            raise ValueError("a polynomial takes fixed coefficients, but no guess and no bounds")
        found = topic.polynomial(columns.x, columns.y, order, sigma, options.lower)
    else:
        bounds = {name: (options.lower.get(name, -math.inf), options.upper.get(name, math.inf))
                  for name in {**options.lower, **options.upper}}
        said: dict[str, Any] = {"bounds": bounds, "method": METHODS[options.method]}
        if model != "line":
            said["guess"] = options.guess or None
        with warnings.catch_warnings(record=True) as caught:
            warnings.simplefilter("always", QxWarning)
            found = getattr(topic, model)(columns.x, columns.y, sigma, **said)
        unfinished = [str(one.message) for one in caught]
    return Fitted(found, columns, [*unfinished, *doubts(model, found, columns)])


def doubts(model, found, columns):
    """Reasons why the parameters may be meaningless, as sentences."""
    free = [name for name in found.parameters if found.errors[name] != 0]
    if found.dof <= 0:
        return ["there are no more samples than parameters, so their uncertainties are unknown"]
    said = []
    unknown = [name for name in free if not math.isfinite(found.errors[name])]
    if unknown:
        said.append(f"the data do not determine {', '.join(unknown)}")
    said += [f"{one} and {other} are known only together: their correlation is {value:.6f}"
             for one, other, value in _tied(found)] if model != "polynomial" else []
    if model in ("exponential", "power", "gaussian"):
        height, spread = found.parameters["a"], float(np.ptp(columns.y))
        if 2 * found.errors["a"] > abs(height):
            said.append(f"a is below twice its standard error: there may be no {model} in the data")
        if abs(height) > FAR * spread:
            said.append(f"a is {abs(height) / spread:.2g} times the range of the data, which do not extend that far")
    if model == "gaussian" and not columns.x.min() <= found.parameters["m"] <= columns.x.max():
        said.append("m is outside the data, which do not contain the peak")
    return said


def _tied(found):
    """Pairs of parameters with a correlation above TIED, and the correlation."""
    names, covariance = list(found.parameters), found.covariance
    deviations = np.sqrt(np.diagonal(covariance))
    for i in range(len(names)):
        for j in range(i):
            product = deviations[i] * deviations[j]
            if product > 0 and math.isfinite(product) and abs(covariance[i, j]) > TIED * product:
                yield names[j], names[i], covariance[i, j] / product


def lines(result):
    """The result for the terminal."""
    found, columns = result.fit, result.columns
    yield f"{columns.y_label} = {found.formula}, x = {columns.x_label}"
    for name, value in found.parameters.items():
        if found.errors[name]:
            value, error = uncertain(value, found.errors[name])
            yield f"  {name:<4} {value} ± {error}"
        else:
            yield f"  {name:<4} {value:.10g}"
    weighted = found.residuals * np.abs(columns.w) if len(columns.w) else found.residuals
    yield f"{len(found.values)} samples, standard deviation of the residuals {number(_deviation(found))},"
    yield f"  mean absolute residual {np.mean(np.abs(weighted)):.6g}, R^2 {found.r_square:.8g}"
    yield from (f"Warning: {warning}." for warning in result.warnings)


def _deviation(found):
    return found.rmse if found.dof > 0 else math.nan


def plots(result):
    """The plots of data and fit, and of the residuals."""
    found, columns = result.fit, result.columns
    fine = np.linspace(columns.x.min(), columns.x.max(), 500)
    x = np.concatenate([columns.x, fine])
    data = np.concatenate([columns.y, np.full(len(fine), np.nan)])
    order = np.argsort(x, kind="stable")
    with np.errstate(all="ignore"):
        curve = found.predict(x[order])
    rest = np.argsort(columns.x, kind="stable")
    return [figures.Plot(f"Fit to {columns.y_label}", columns.x_label, columns.y_label,
                         [figures.Curve("data", data[order], figures.GREY, dots=True),
                          figures.Curve(found.formula, curve)], x=x[order]),
            figures.Plot("", columns.x_label, "residual",
                         [figures.Curve("residual", found.residuals[rest], figures.WARM, dots=True)], x=columns.x[rest])]


def plot(result, path):
    """Plots data and fit above and residuals below. The suffix of the path determines the format."""
    drawing.save(plots(result), path, "fit", [2, 1])
