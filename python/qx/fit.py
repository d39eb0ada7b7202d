"""Fits with named parameters, standard errors and confidence bands, and splines through noisy data.

    fit = qx.fit.exponential(x, y)
    fit.parameters["b"], fit.errors["b"]
    fit.predict(5.0)
    low, high = fit.confidence(5.0)         # of the curve; fit.prediction() for one more observation

Standard errors and bands are based on the scatter of the residuals. For models that are not linear in their
parameters, they hold to first order.
"""

from __future__ import annotations

import dataclasses
import functools
import inspect
import math
from collections.abc import Callable, Iterator, Sequence
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .outcomes import QxError, QxWarning, warn
from .topical import Result, chosen, procedure, refuse, result, served, vector, whole_number

__all__ = ["BSpline", "Fit", "SmoothingSpline", "curve", "exponential", "gaussian", "line", "linear",
           "logarithm", "nonlinear", "polynomial", "power"]

core = served("fit")

EMPTY = np.empty(0)
NATURAL = 2.71828  # the exports use these digits of e
TOLERANCE, ITERATIONS = 1e-12, 2000
AS_EPSILON = -1.0  # as a tolerance for singular values: eps
METHODS = {"least squares": 0, "absolute": 1, "bisquare": 2}
LOSSES = {"linear": 0, "soft_l1": 1, "huber": 2, "cauchy": 3, "arctan": 4}
UNDETERMINED = 3  # the reason with which such a fit ends
SETTLED = 1e-10  # the relative step of the parameters below which a fit has converged


@result
class Fit(Result):
    """A fitted model; unpacks into the parameters as an array and their covariance, like the result of
    `scipy.optimize.curve_fit`.

    Attributes
    ----------
    formula : str
        The model.
    parameters : dict
        The values of the parameters by name.
    errors : dict
        The standard errors of the parameters by name; 0 for fixed ones.
    covariance : ndarray
        The covariance of the parameters, in their order.
    r_square : float
        The fraction of the variance that the model explains.
    rmse : float
        The root of the (weighted) sum of squared residuals divided by the degrees of freedom.
    dof : int
        The degrees of freedom: the number of samples with a weight above 0, less that of free parameters.
    residuals, values : ndarray
        The residuals y - values, and the values of the model, at the samples.
    """

    formula: str
    parameters: dict[str, float]
    errors: dict[str, float]
    covariance: NDArray[Any]
    r_square: float
    rmse: float
    dof: int
    residuals: NDArray[Any]
    values: NDArray[Any]
    # What the fit was made from.
    _model: _Model = dataclasses.field(init=False, repr=False)
    _x: NDArray[Any] = dataclasses.field(init=False, repr=False)
    _w: NDArray[Any] = dataclasses.field(init=False, repr=False)
    _fixed: NDArray[Any] = dataclasses.field(init=False, repr=False)

    def __iter__(self) -> Iterator[Any]:
        return iter((np.array([*self.parameters.values()]), self.covariance))

    def __len__(self) -> int:
        return 2

    def __getitem__(self, name: Any) -> Any:
        return self.parameters[name]

    def _shown(self) -> Any:
        rows = [("formula", self.formula)]
        rows += [(name, f"{value:.6g} +- {self.errors[name]:.2g}") for name, value in self.parameters.items()]
        return rows + [("r_square", f"{self.r_square:.6g}"), ("rmse", f"{self.rmse:.6g}"),
                       ("dof", str(self.dof))]

    def predict(self, x: ArrayLike) -> Any:
        """The model at x.

        Parameters
        ----------
        x : float or array_like
            The points, of any shape.

        Returns
        -------
        float or ndarray
        """
        return self._model.value(np.asarray(x, float), np.array([*self.parameters.values()]))[()]

    def confidence(self, x: ArrayLike | None = None, level: float = 0.95) -> tuple[Any, Any]:
        """Bounds of the curve, at each x separately.

        Parameters
        ----------
        x : float or array_like, optional
            The points; the samples by default.
        level : float
            The confidence level, between 0 and 1.

        Returns
        -------
        two floats or ndarrays
            Lower and upper bounds.
        """
        return self._band(core.Fit_confidence, x, level)

    def prediction(self, x: Any = None, level: Any = 0.95) -> Any:
        """Bounds of one more observation of weight 1 at each x; arguments and results as for `confidence`."""
        return self._band(core.Fit_prediction, x, level)

    def intervals(self, level: Any = 0.95) -> Any:
        """Confidence intervals of the parameters: the lower and the upper bound by name. Both bounds of a
        fixed parameter are its value."""
        found = self._bounds(core.Fit_confidence, self._x[:0], level)
        free = iter(zip(*found[:2]))
        return {name: (float(value), float(value)) if is_fixed else tuple(map(float, next(free)))
                for (name, value), is_fixed in zip(self.parameters.items(), self._fixed)}

    def derived(self, f: Callable[..., Any]) -> tuple[Any, Any]:
        r"""A quantity derived from the parameters, and its standard error to first order (the law of
        propagation of uncertainty in the "Guide to the expression of uncertainty in measurement", 2008).

        .. math:: u^2 = \sum_{jk} \frac{\partial f}{\partial p_j} \frac{\partial f}{\partial p_k} C_{jk}

        Parameters
        ----------
        f : callable
            Takes the parameters in their order; returns a number or an array.

        Returns
        -------
        value, error : float or ndarray

        Examples
        --------
        >>> import numpy as np, qx
        >>> x = np.linspace(0, 3, 50)
        >>> y = 2 * np.exp(-0.7 * x) + qx.noise.gaussian(50, 0.01, seed=1)
        >>> half, error = qx.fit.exponential(x, y).derived(lambda a, b, c: -np.log(2) / b)
        >>> bool(abs(half - np.log(2) / 0.7) < 3 * error < 0.15)
        True
        """
        p = np.array([*self.parameters.values()])
        # The bounds of a model without x, whose values are those of f.
        slopes = _Model("", self.parameters, lambda _, p: np.asarray(f(*p), float)).jacobian(None, p)
        variance = np.einsum("...j,jk,...k", slopes, self.covariance, slopes)
        return np.asarray(f(*p), float)[()], np.sqrt(np.maximum(variance, 0.0))[()]

    def _bounds(self, bounds: Any, x: Any, level: Any) -> Any:
        """The export's bounds of the model, linearised at the parameters, at the samples and at x."""
        if not 0 < level < 1:
            refuse("fit.Fit", "level", f"must be between 0 and 1; got {level}", "ErrProbabilityOutOfRange")
        p = np.array([*self.parameters.values()])
        free = ~self._fixed
        rows = self._model.jacobian(np.concatenate([self._x, x]), p)[:, free]
        weights = np.concatenate([self._w if len(self._w) else np.ones(len(self._x)), np.zeros(len(x))])
        linear = rows @ p[free]
        observed = linear + np.concatenate([self.residuals, np.zeros(len(x))])
        found = bounds(np.ascontiguousarray(rows), observed, weights, p[free], float(level))
        return [*found[:-2], *(curve - linear for curve in found[-2:])]

    def _band(self, bounds: Any, x: Any, level: Any) -> Any:
        at = self._x if x is None else np.asarray(x, float)
        shape = at.shape[:1 - self._x.ndim or None]  # without the dimensions of a row
        new = at.reshape(-1, *self._x.shape[1:]) if x is not None else self._x[:0]
        lower, upper = self._bounds(bounds, new, level)[-2:]
        if x is not None:
            lower, upper = (one[len(self._x):].reshape(shape) for one in (lower, upper))
        middle = self.predict(at)
        return middle + lower[()], middle + upper[()]

    def plot(self, axes: Any = None, level: float = 0.95) -> Any:
        """Plots the samples, the model and the bounds of the curve with matplotlib.

        Parameters
        ----------
        axes : matplotlib Axes, optional
            Where to draw; new ones by default.
        level : float
            The confidence level of the bounds.

        Returns
        -------
        matplotlib Axes
        """
        if axes is None:
            from matplotlib import pyplot
            axes = pyplot.subplots()[1]
        at = np.linspace(self._x.min(), self._x.max(), 400)
        axes.plot(self._x, self.residuals + self.values, ".", label="samples")
        axes.plot(at, self.predict(at), label=self.formula)
        axes.fill_between(at, *self.confidence(at, level), alpha=0.25, label=f"{level:.0%}")
        axes.legend(frameon=False)
        return axes


class _Model:
    """A formula, the names of its parameters, its values, and its derivatives with respect to them in columns."""

    made_by: tuple[Any, ...]  # the function and arguments that make it, for pickling

    def __init__(self, formula: Any, names: Any, value: Any, jacobian: Any = None) -> None:
        self.formula, self.names, self.value = formula, list(names), value
        self.jacobian = jacobian or self._differences

    def __reduce__(self) -> Any:
        return self.made_by

    def _differences(self, x: Any, p: Any) -> Any:
        columns = []
        for j, one in enumerate(p):
            step = np.cbrt(np.finfo(float).eps) * (abs(one) or 1.0)
            above, below = p.copy(), p.copy()
            above[j], below[j] = one + step, one - step
            columns.append((self.value(x, above) - self.value(x, below)) / (above[j] - below[j]))
        return np.stack(columns, -1)


def _maker(build: Any) -> Any:
    """Decorates a function that makes models, so that they are pickled by its name and arguments."""
    @functools.wraps(build)
    def make(*arguments: Any) -> Any:
        model = build(*arguments)
        model.made_by = make, arguments
        return model
    return make


def _or_without(offset: Any, formula: Any, names: Any, value: Any, columns: Any) -> Any:
    """The model with or without its constant c."""
    if offset:
        return _Model(formula + " + c", [*names, "c"], lambda x, p: value(x, p) + p[-1],
                      lambda x, p: np.stack([*columns(x, p), np.ones(len(x))], -1))
    return _Model(formula, names, value, lambda x, p: np.stack(columns(x, p), -1))


@_maker
def _line() -> Any:
    return _Model("a x + b", "ab", lambda x, p: p[0] * x + p[1], lambda x, p: np.stack([x, np.ones(len(x))], -1))


@_maker
def _polynomial(degree: Any) -> Any:
    terms = ["c0", "c1 x", *(f"c{j} x^{j}" for j in range(2, degree + 1))]
    formula = " + ".join(terms[:degree + 1] if degree < 5 else [*terms[:3], "...", terms[degree]])
    return _Model(formula, [f"c{j}" for j in range(degree + 1)],
                  lambda x, p: np.polynomial.polynomial.polyval(x, p), lambda x, p: np.vander(x, len(p), True))


@_maker
def _exponential(offset: Any) -> Any:
    return _or_without(offset, "a exp(b x)", ["a", "b"], lambda x, p: p[0] * np.exp(p[1] * x),
                       lambda x, p: [np.exp(p[1] * x), p[0] * x * np.exp(p[1] * x)])


@_maker
def _power(offset: Any) -> Any:
    return _or_without(offset, "a x^b", ["a", "b"], lambda x, p: p[0] * x**p[1],
                       lambda x, p: [x**p[1], p[0] * x**p[1] * np.log(x)])


@_maker
def _logarithm() -> Any:
    return _Model("a ln(b x)", "ab", lambda x, p: p[0] * np.log(p[1] * x),
                  lambda x, p: np.stack([np.log(p[1] * x), np.full(len(x), p[0] / p[1])], -1))


@_maker
def _gaussian(offset: Any) -> Any:
    def bell(x: Any, p: Any) -> Any:
        return np.exp(-0.5 * ((x - p[1]) / p[2])**2)

    return _or_without(offset, "a exp(-((x - m) / s)^2 / 2)", ["a", "m", "s"], lambda x, p: p[0] * bell(x, p),
                       lambda x, p: [bell(x, p), p[0] * bell(x, p) * (x - p[1]) / p[2]**2,
                                     p[0] * bell(x, p) * (x - p[1])**2 / p[2]**3])


@_maker
def _rows(names: Any) -> Any:
    """y = H c, where each x is a row."""
    return _Model("H c", names, lambda H, p: np.asarray(H, float) @ p, lambda H, p: np.asarray(H, float))


@_maker
def _any(f: Any, names: Any, jacobian: Any) -> Any:
    slopes = None if jacobian is None else lambda x, p: np.asarray(jacobian(x, *p), float)
    return _Model(f"{getattr(f, '__name__', 'f')}(x, {', '.join(names)})", names,
                  lambda x, p: np.asarray(f(x, *p), float) + np.zeros(np.shape(x)), slopes)


@_maker
def _of_vector(f: Any, names: Any, jacobian: Any) -> Any:
    slopes = None if jacobian is None else lambda x, p: np.asarray(jacobian(x, p), float)
    return _Model(f"{getattr(f, '__name__', 'f')}(x, p)", names, lambda x, p: np.asarray(f(x, p), float), slopes)


def _samples(function: Any, x: Any, y: Any, sigma: Any) -> tuple[NDArray[Any], NDArray[Any], NDArray[Any]]:
    """x, y and the weights 1 / sigma^2, which are empty without sigma."""
    x, y = (vector(one, f"fit.{function}", name).astype(float) for one, name in ((x, "x"), (y, "y")))
    if len(x) != len(y):
        refuse(f"fit.{function}", "x, y", f"must have the same length; got {len(x)} and {len(y)}",
               "ErrSizeMismatch")
    if sigma is None:
        return x, y, EMPTY
    sigma = np.broadcast_to(np.asarray(sigma, float), y.shape)
    if not np.all(sigma > 0):
        refuse(f"fit.{function}", "sigma", "must be above 0", "ErrNotStrictlyPositive")
    return x, y, 1 / sigma**2


def _finished(model: Any, x: Any, y: Any, w: Any, p: Any, fixed: Any = None, absolute: Any = False,
              covariance: Any = None) -> Any:
    """The Fit for the parameters found, and for their covariance where it is known."""
    p = np.array([float(one) for one in p])
    fixed = np.zeros(len(p), bool) if fixed is None else np.asarray(fixed, bool)
    values = model.value(x, p)
    residuals = y - values
    dof = int(np.count_nonzero(w) if len(w) else len(x)) - int(np.sum(~fixed))
    weighted = residuals**2 if not len(w) else w * residuals**2
    sse = float(np.sum(weighted))
    about = y - (np.average(y, weights=w) if len(w) else np.mean(y))
    total = float(np.sum(about**2 if not len(w) else w * about**2))
    variance = sse / dof if dof > 0 else math.inf
    free = np.flatnonzero(~fixed)
    is_known = covariance is not None
    if not is_known:
        covariance = np.zeros((len(p), len(p)))
    if not is_known and len(free) and len(x) >= len(free):
        rows = np.ascontiguousarray(model.jacobian(x, p)[:, free])
        if np.all(np.isfinite(rows)):
            inverse = core.Fit_covariance(rows, np.zeros(len(rows)), w, 0.0, 1)[2]
            covariance[np.ix_(free, free)] = inverse if absolute else inverse * variance
        else:
            covariance[np.ix_(free, free)] = np.nan
    errors = np.sqrt(np.maximum(np.diagonal(covariance), 0))
    found = Fit(model.formula, dict(zip(model.names, p.tolist())), dict(zip(model.names, errors.tolist())),
                covariance, 1 - sse / total if total else 1.0, math.sqrt(variance), dof, residuals, values)
    found._model, found._x, found._w, found._fixed = model, x, w, fixed
    return found


def _limits(function: Any, names: Any, bounds: Any, guess: Any, fixed: Any) -> Any:
    """Lower and upper bounds and start values in the order of the names."""
    bounds = {**(bounds or {}), **{name: (value, value) for name, value in fixed.items()}}
    for name in {*bounds, *(guess or {})} - set(names) - set(fixed):
        chosen(f"fit.{function}", "bounds, guess", name, {one: one for one in names})
    every = [*names, *(name for name in fixed if name not in names)]
    lower = [float(bounds.get(name, (-math.inf, math.inf))[0]) for name in every]
    upper = [float(bounds.get(name, (-math.inf, math.inf))[1]) for name in every]
    if any(not low <= high for low, high in zip(lower, upper)):
        refuse(f"fit.{function}", "bounds", "a lower bound is above its upper bound", "ErrBoundsCrossed")
    start = []
    if guess:
        if missing := [name for name in names if name not in guess]:
            refuse(f"fit.{function}", "guess", f"has no value for {', '.join(missing)}", "ErrFitStartValues")
        start = [float({**guess, **fixed}[name]) for name in every]
    return lower, upper, start


def _bounded(function: Any, run: Any, model: Any, x: Any, y: Any, w: Any, bounds: Any, guess: Any, method: Any,
             fixed: Any) -> Any:
    """A fit by an export that takes bounds, start values and methods."""
    code = chosen(f"fit.{function}", "method", method, METHODS)
    lower, upper, start = _limits(function, model.names, bounds, guess, fixed)
    p = run(y, x, w, start, lower, upper, code)
    return _finished(model, x, y, w, p[:len(model.names)],
                     [low == high for low, high in zip(lower, upper)][:len(model.names)])


def line(x: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None, bounds: dict[str, Any] | None = None,
         method: Literal["least squares", "absolute", "bisquare"] = "least squares") -> Fit:
    """A line y = a x + b.

    Parameters
    ----------
    x, y : array_like
        The samples.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a common factor.
    bounds : dict, optional
        The lower and upper bounds of parameters by name; equal bounds fix a parameter.
    method : {"least squares", "absolute", "bisquare"}
        What is minimised: the squares of the residuals, their absolute values, or squares in which outliers
        have no weight.

    Returns
    -------
    Fit
        The fit, with the parameters a, the slope, and b.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import qx
    >>> qx.fit.line([0.0, 1.0, 2.0, 3.0], [1.0, 3.1, 4.9, 7.0])
    Fit
      formula   a x + b
      a         1.98 +- 0.042
      b         1.03 +- 0.079
      r_square  0.999083
      rmse      0.0948683
      dof       2
    """
    x, y, w = _samples("line", x, y, sigma)

    def run(y: Any, x: Any, w: Any, start: Any, lower: Any, upper: Any, code: Any) -> Any:
        if code == 0:
            return core.line(y, x, w, lower, upper)[1:3]
        export = core.line_absolute if code == 1 else core.line_bisquare
        return export(y, x, w, TOLERANCE, ITERATIONS, lower, upper)[2:4]

    return _bounded("line", run, _line(), x, y, w, bounds, None, method, {})


def polynomial(x: ArrayLike, y: ArrayLike, degree: int, sigma: ArrayLike | None = None,
               fixed: dict[str, Any] | None = None) -> Fit:
    """A polynomial c0 + c1 x + c2 x^2 + ...

    Parameters
    ----------
    x, y : array_like
        The samples.
    degree : int
        The highest power, up to 50. From about 20 on, values of the fit can lose half of their digits or more,
        because large terms cancel.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a factor.
    fixed : dict, optional
        Values of coefficients by their names, such as {"c0": 0.0}.

    Returns
    -------
    Fit
        The fit, with the parameters c0, c1, ...

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import qx
    >>> round(qx.fit.polynomial([0.0, 1.0, 2.0, 3.0, 4.0], [1.0, 2.0, 5.0, 10.0, 17.0], 2).parameters['c2'], 9)
    1.0
    """
    degree = whole_number("fit.polynomial", "degree", degree, 0, "ErrPolynomialOrderNegative")
    if degree > 50:
        refuse("fit.polynomial", "degree", f"must be at most 50; got {degree}", "ErrPolynomialOrderTooHigh")
    x, y, w = _samples("polynomial", x, y, sigma)
    names = [f"c{j}" for j in range(degree + 1)]
    given = fixed or {}
    orders = [chosen("fit.polynomial", "fixed", name, {one: j for j, one in enumerate(names)}) for name in given]
    p = core.polynomial(x, y, degree, w, AS_EPSILON, orders, [float(value) for value in given.values()])[1]
    return _finished(_polynomial(degree), x, y, w, p, [name in given for name in names])


def exponential(x: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None, offset: bool = True,
                bounds: dict[str, Any] | None = None, guess: dict[str, Any] | None = None,
                method: Literal["least squares", "absolute", "bisquare"] = "least squares") -> Fit:
    """An exponential y = a exp(b x) + c.

    Parameters
    ----------
    x, y : array_like
        The samples.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a factor.
    offset : bool
        Whether the model has a constant c.
    bounds : dict, optional
        By the name of a parameter its lower and upper bound; equal ones fix it.
    guess : dict, optional
        Start values of the parameters by name.
    method : {"least squares", "absolute", "bisquare"}
        What is made least: the squares of the residuals, their absolute values, or squares without those
        far off.

    Returns
    -------
    Fit
        The fit, with the parameters a, b, c.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(0, 2, 20)
    >>> {name: round(value, 6) for name, value in qx.fit.exponential(x, 3 * np.exp(-2 * x) + 1).parameters.items()}
    {'a': 3.0, 'b': -2.0, 'c': 1.0}
    """
    x, y, w = _samples("exponential", x, y, sigma)
    return _bounded("exponential", lambda y, x, w, start, lower, upper, code: core.exponential(
        y, x, w, TOLERANCE, ITERATIONS, start, lower, upper, code)[2:5], _exponential(bool(offset)), x, y, w,
        bounds, guess, method, {} if offset else {"c": 0.0})


def power(x: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None, offset: bool = True,
          bounds: dict[str, Any] | None = None, guess: dict[str, Any] | None = None,
          method: Literal["least squares", "absolute", "bisquare"] = "least squares") -> Fit:
    """A power y = a x^b + c of positive x.

    Parameters
    ----------
    x, y : array_like
        The samples.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a factor.
    offset : bool
        Whether the model has a constant c.
    bounds : dict, optional
        By the name of a parameter its lower and upper bound; equal ones fix it.
    guess : dict, optional
        Start values of the parameters by name.
    method : {"least squares", "absolute", "bisquare"}
        What is made least: the squares of the residuals, their absolute values, or squares without those
        far off.

    Returns
    -------
    Fit
        The fit, with the parameters a, b, c.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(1, 4, 20)
    >>> {name: round(value, 6) for name, value in qx.fit.power(x, 3 * x**-0.5 + 1).parameters.items()}
    {'a': 3.0, 'b': -0.5, 'c': 1.0}
    """
    x, y, w = _samples("power", x, y, sigma)
    if np.any(x <= 0):
        refuse("fit.power", "x", "must be above 0", "ErrNotStrictlyPositive")
    return _bounded("power", lambda y, x, w, start, lower, upper, code: core.power(
        y, x, w, TOLERANCE, ITERATIONS, start, lower, upper, code)[2:5], _power(bool(offset)), x, y, w,
        bounds, guess, method, {} if offset else {"c": 0.0})


def logarithm(x: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None, bounds: dict[str, Any] | None = None,
              guess: dict[str, Any] | None = None,
              method: Literal["least squares", "absolute", "bisquare"] = "least squares") -> Fit:
    """A logarithm y = a ln(b x) of positive x.

    Parameters
    ----------
    x, y : array_like
        The samples.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a factor.
    bounds : dict, optional
        By the name of a parameter its lower and upper bound; equal ones fix it.
    guess : dict, optional
        Start values of the parameters by name.
    method : {"least squares", "absolute", "bisquare"}
        What is made least: the squares of the residuals, their absolute values, or squares without those
        far off.

    Returns
    -------
    Fit
        The fit, with the parameters a, b.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(1, 4, 20)
    >>> {name: round(value, 6) for name, value in qx.fit.logarithm(x, 3 * np.log(2 * x)).parameters.items()}
    {'a': 3.0, 'b': 2.0}
    """
    x, y, w = _samples("logarithm", x, y, sigma)
    if np.any(x <= 0):
        refuse("fit.logarithm", "x", "must be above 0", "ErrNotStrictlyPositive")
    return _bounded("logarithm", lambda y, x, w, start, lower, upper, code: core.logarithm(
        y, x, w, NATURAL, ITERATIONS, start, lower, upper, code, TOLERANCE)[2:4], _logarithm(), x, y, w, bounds, guess,
        method, {})


def gaussian(x: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None, offset: bool = True,
             bounds: dict[str, Any] | None = None, guess: dict[str, Any] | None = None,
             method: Literal["least squares", "absolute", "bisquare"] = "least squares") -> Fit:
    """A peak or dip y = a exp(-((x - m) / s)^2 / 2) + c.

    Parameters
    ----------
    x, y : array_like
        The samples.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a factor.
    offset : bool
        Whether the model has a constant c.
    bounds : dict, optional
        By the name of a parameter its lower and upper bound; equal ones fix it.
    guess : dict, optional
        Start values of the parameters by name.
    method : {"least squares", "absolute", "bisquare"}
        What is made least: the squares of the residuals, their absolute values, or squares without those
        far off.

    Returns
    -------
    Fit
        The fit, with the parameters a, m, s, c.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If no fit is found.

    Warns
    -----
    QxWarning
        If the fit does not converge: there may be no peak in the data.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(-3, 3, 40)
    >>> fit = qx.fit.gaussian(x, 2 * np.exp(-0.5 * (x - 1)**2 / 0.25) + 1)
    >>> {name: round(value, 6) for name, value in fit.parameters.items()}
    {'a': 2.0, 'm': 1.0, 's': 0.5, 'c': 1.0}
    """
    x, y, w = _samples("gaussian", x, y, sigma)
    if not offset and not bounds and method == "least squares":
        start = _limits("gaussian", "ams", None, guess, {})[2]
        p = _as_far_as_it_goes("ams", lambda: core.gaussian_peak(y, x, w, TOLERANCE, start, ITERATIONS, 0.0)[1:4])
        return _finished(_gaussian(False), x, y, w, p)
    return _bounded("gaussian", lambda y, x, w, start, lower, upper, code: _as_far_as_it_goes(
        "amsc", lambda: core.gaussian(y, x, w, TOLERANCE, ITERATIONS, start, lower, upper, code)[2:6]),
        _gaussian(bool(offset)), x, y, w, bounds, guess, method, {} if offset else {"c": 0.0})


def _as_far_as_it_goes(names: Any, run: Any) -> Any:
    """The parameters of a fit, with a warning where it has not converged."""
    try:
        return run()
    except QxError as error:
        if error.name != "ErrIterationLimit" or not isinstance(error.results, dict):
            raise
        warn(QxWarning("qx.fit.gaussian", error.code, f"qx.fit.gaussian: the fit has not converged in {ITERATIONS} "
                                                      "steps: the data may have no peak"))
        return [error.results[name] for name in names]


def linear(H: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None,
           names: Sequence[str] | None = None) -> Fit:
    """A model that is linear in its parameters, y = H c.

    Parameters
    ----------
    H : array_like
        A row for each sample, a column for each parameter.
    y : array_like
        The samples.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a factor.
    names : sequence of str, optional
        The names of the parameters; c0, c1, ... by default.

    Returns
    -------
    Fit
        The fit; `predict` and the bands take further rows.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma is not above 0,
        a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import qx
    >>> round(qx.fit.linear([[1.0, 0.0], [1.0, 1.0], [1.0, 2.0]], [1.0, 3.0, 5.0]).parameters['c1'], 9)
    2.0
    """
    H = np.asarray(H, float)
    if H.ndim != 2:
        refuse("fit.linear", "H", f"two dimensions are needed; got {H.ndim}", "ErrSizesDisagree")
    names = [f"c{j}" for j in range(H.shape[1])] if names is None else list(names)
    if len(names) != H.shape[1]:
        refuse("fit.linear", "names", f"{H.shape[1]} names are needed; got {len(names)}", "ErrSizesDisagree")
    _, y, w = _samples("linear", np.zeros(len(H)), y, sigma)
    p = core.linear(H, y, w, AS_EPSILON, 0)[0]
    return _finished(_rows(tuple(names)), H, y, w, p)


def curve(f: Callable[..., Any], x: ArrayLike, y: ArrayLike, guess: dict[str, Any] | Sequence[Any],
          sigma: ArrayLike | None = None, bounds: dict[str, Any] | None = None,
          absolute_sigma: bool = False, jacobian: Callable[..., Any] | None = None,
          loss: Literal["linear", "soft_l1", "huber", "cauchy", "arctan"] = "linear",
          scale: float = 1.0) -> Fit:
    """Fits any model, by a trust-region method (J. J. More, "The Levenberg-Marquardt algorithm:
    implementation and theory", 1978).

    Parameters
    ----------
    f : callable
        f(x, a, b, ...): the model. The parameters have the names of its arguments. An exception that it
        raises ends the fit.
    x, y : array_like
        The samples.
    guess : dict or sequence
        Start values, by name or in the order of the arguments.
    sigma : float or array_like, optional
        The standard deviation of each y, up to a common factor.
    bounds : dict, optional
        The lower and upper bounds of parameters by name; equal bounds fix a parameter. f is not evaluated
        beyond the bounds.
    absolute_sigma : bool
        Whether sigma are the actual standard deviations. The covariance is then not scaled by the scatter
        of the residuals.
    jacobian : callable, optional
        jacobian(x, a, b, ...): the derivatives of f with respect to its parameters, a row for each sample.
        By default, they are approximated by differences.
    loss : {"linear", "soft_l1", "huber", "cauchy", "arctan"}
        The loss function of the squared residuals, as for `scipy.optimize.least_squares`. All but "linear"
        reduce the influence of outliers. The covariance holds to first order, with the derivatives weighted
        by the loss.
    scale : float
        The size of the residuals, in units of sigma, from which the loss reduces their influence.

    Returns
    -------
    Fit

    Warns
    -----
    QxWarning
        If the samples do not determine all parameters, whose errors are then infinite, or the parameters
        have not settled to 7 digits.

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma or the scale is not
        above 0, a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(0, 1, 30)
    >>> fit = qx.fit.curve(lambda x, amplitude, rate: amplitude * np.exp(-rate * x), x, 2 * np.exp(-3 * x), [1, 1])
    >>> {name: round(value, 6) for name, value in fit.parameters.items()}
    {'amplitude': 2.0, 'rate': 3.0}
    """
    procedure("fit.curve", "f", f)
    names = [*inspect.signature(f).parameters][1:]
    given = guess if isinstance(guess, dict) else [*guess]
    start = given if isinstance(given, dict) else dict(zip(names, given))
    if len(given) != len(names) or set(start) != set(names):
        refuse("fit.curve", "guess", f"values for {', '.join(names)} are needed; got {guess!r}", "ErrFitStartValues")
    x, y, w = _samples("curve", x, y, sigma)
    return _nonlinear("curve", _any(f, tuple(names), jacobian), x, y, w, start, bounds, absolute_sigma,
                      jacobian is not None, loss, scale)


def nonlinear(f: Callable[..., Any], x: ArrayLike, y: ArrayLike, guess: Sequence[Any],
              sigma: ArrayLike | None = None, bounds: dict[str, Any] | None = None,
              absolute_sigma: bool = False, jacobian: Callable[..., Any] | None = None,
              loss: Literal["linear", "soft_l1", "huber", "cauchy", "arctan"] = "linear",
              scale: float = 1.0, names: Sequence[str] | None = None) -> Fit:
    """Like `curve`, for models f(x, p) with an array of parameters, and samples with one or more x each.

    Parameters
    ----------
    f : callable
        f(x, p): the model. An exception that it raises ends the fit.
    x : array_like
        A number, a row or an array for each sample.
    y : array_like
        The samples.
    guess : sequence
        Start values of p.
    sigma, absolute_sigma, loss, scale : optional
        As for `curve`.
    bounds : dict, optional
        By the name of a parameter its lower and upper bound; equal ones fix it.
    jacobian : callable, optional
        jacobian(x, p): the derivatives of f with respect to p, a row for each sample.
    names : sequence of str, optional
        The names of the parameters; p0, p1, ... by default.

    Returns
    -------
    Fit

    Raises
    ------
    ValueError
        If x and y differ in length, there are fewer samples than parameters, a sigma or the scale is not
        above 0, a lower bound is above its upper bound, or an option is not a valid choice.
    QxError
        If the fit does not converge.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.random.default_rng(1).uniform(size=(40, 2))
    >>> y = 2 * np.exp(-x[:, 0]) * np.cos(3 * x[:, 1])
    >>> fit = qx.fit.nonlinear(lambda x, p: p[0] * np.exp(-x[:, 0]) * np.cos(p[1] * x[:, 1]), x, y, [1, 2])
    >>> {name: round(value, 6) for name, value in fit.parameters.items()}
    {'p0': 2.0, 'p1': 3.0}
    """
    procedure("fit.nonlinear", "f", f)
    start = [float(one) for one in guess]
    names = [f"p{j}" for j in range(len(start))] if names is None else list(names)
    if len(names) != len(start) or len(set(names)) < len(names):
        refuse("fit.nonlinear", "names", f"{len(start)} different names are needed; got {names!r}", "ErrSizesDisagree")
    x = np.asarray(x, float)
    if not x.ndim:
        refuse("fit.nonlinear", "x", "a number or a row for each sample is needed; got one number", "ErrEmptyInput")
    _, y, w = _samples("nonlinear", np.zeros(len(x)), y, sigma)
    return _nonlinear("nonlinear", _of_vector(f, tuple(names), jacobian), x, y, w, dict(zip(names, start)), bounds,
                      absolute_sigma, jacobian is not None, loss, scale)


def _nonlinear(function: Any, model: Any, x: Any, y: Any, w: Any, start: Any, bounds: Any, absolute: Any,
               has_jacobian: Any, loss: Any, scale: Any) -> Any:
    """The fit of a model whose values and derivatives are computed by Python functions."""
    code = chosen(f"fit.{function}", "loss", loss, LOSSES)
    names = model.names
    if len(x) < len(names):
        refuse(f"fit.{function}", "x", f"at least {len(names)} samples are needed; got {len(x)}",
               "ErrFitPointsTooFew")
    if not scale > 0:
        refuse(f"fit.{function}", "scale", f"must be above 0; got {scale}", "ErrNotStrictlyPositive")
    lower, upper, p = _limits(function, names, bounds, start, {})
    export = getattr(core, function)
    jacobian = (lambda _, p: model.jacobian(x, p)) if has_jacobian else None
    with np.errstate(all="ignore"):
        try:
            _, p, covariance, _, cost, reason = export(
                EMPTY, y, w, lambda _, p: model.value(x, p), jacobian, None, p, lower, upper, code, float(scale),
                SETTLED, ITERATIONS)
        except QxError as error:
            if error.name == "ErrNonFiniteFunction":
                refuse(f"fit.{function}", "guess", "the model is not finite there", "ErrNaNInData")
            raise
    fixed = np.equal(lower, upper)
    if reason == UNDETERMINED:
        without = ~np.any(model.jacobian(x, p), 0) & ~fixed
        if without.any():
            refuse(f"fit.{function}", "f", "does not depend on each parameter at " + ", ".join(
                f"{name} {one:.6g}" for name, one in zip(names, p)), "ErrSingularMatrix")
    if absolute:
        dof = len(y) - np.count_nonzero(~fixed)
        covariance = covariance / (2 * cost / dof) if cost > 0 and dof > 0 else None
    return _finished(model, x, y, w, p, fixed, absolute, covariance)


class SmoothingSpline:
    r"""The smoothing spline: a natural cubic spline that is a compromise between closeness and smoothness.

    It minimises :math:`\sum ((y - s(x)) / \sigma)^2 + \lambda \int s''^2`. By default, lambda is chosen by
    generalised cross validation. C. H. Reinsch, "Smoothing by spline functions", 1967; P. Craven, G. Wahba,
    "Smoothing noisy data with spline functions", 1979.

    Parameters
    ----------
    x, y : array_like
        The samples; x is increasing.
    sigma : float or array_like, optional
        The standard deviation of each y.
    smoothing : float, optional
        lambda; with 0, the spline passes through all samples.
    residual : float, optional
        Instead of lambda, the sum of squares of (y - s) / sigma that the spline is allowed to have.

    Attributes
    ----------
    x, values : ndarray
        The abscissae of the samples, and the values of the spline there.
    smoothing : float
        lambda.
    effective_parameters : float
        The effective number of parameters of the spline.

    Raises
    ------
    ValueError
        If x and y differ in length, x is not increasing, or a sigma is not above 0.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(0, 6, 60)
    >>> spline = qx.fit.SmoothingSpline(x, np.sin(x) + qx.noise.gaussian(60, 0.1, seed=5))
    >>> bool(abs(spline(3.0) - np.sin(3.0)) < 0.1)
    True
    """

    def __init__(self, x: ArrayLike, y: ArrayLike, sigma: ArrayLike | None = None,
                 smoothing: float | None = None, residual: float | None = None) -> None:
        if smoothing is not None and residual is not None:
            refuse("fit.SmoothingSpline", "smoothing, residual", "only one of them may be given")
        x, y, w = _samples("SmoothingSpline", x, y, sigma)
        method, parameter = (1, float(smoothing)) if smoothing is not None else \
            (2, float(residual)) if residual is not None else (0, 0.0)
        self.x: NDArray[Any] = x
        self.values, self.coefficients, _, self.smoothing, self.effective_parameters = core.SmoothingSpline(
            x, y, 1 / np.sqrt(w) if len(w) else EMPTY, method, parameter)

    def __call__(self, xi: Any, derivative: Any = 0) -> Any:
        """The spline, or its derivative of order 0 to 3, at xi; beyond the samples the spline is a line."""
        xi = np.asarray(xi, float)
        if len(self.x) == 1:
            return (np.full(xi.shape, self.values[0]) if not derivative else np.zeros(xi.shape))[()]
        i = np.clip(np.searchsorted(self.x, xi, "right") - 1, 0, len(self.x) - 2)
        inside = np.clip(xi, self.x[0], self.x[-1])
        t, c = inside - self.x[i], self.coefficients[i]
        c0, c1, c2, c3 = np.moveaxis(c, -1, 0)
        value, slope = c0 + t * (c1 + t * (c2 + t * c3)), c1 + t * (2 * c2 + t * 3 * c3)
        is_beyond = xi != inside
        found = (value + slope * (xi - inside), slope, np.where(is_beyond, 0, 2 * c2 + 6 * c3 * t),
                 np.where(is_beyond, 0, 6 * c3))
        return found[derivative][()]

    def __repr__(self) -> str:
        return (f"SmoothingSpline: {len(self.x)} samples, lambda {self.smoothing:.6g}, "
                f"{self.effective_parameters:.4g} effective parameters")


class BSpline:
    """The least-squares spline of a given degree with a few knots.

    Parameters
    ----------
    x, y : array_like
        The samples; x is not decreasing.
    knots : int or array_like
        The number of interior knots, which are placed at quantiles of x; or the knots themselves.
    degree : int
        The degree of the spline, from 1 to 9.
    sigma : float or array_like, optional
        The standard deviation of each y.

    Attributes
    ----------
    knots, coefficients : ndarray
        The knots and coefficients of the B-splines (C. de Boor, "A Practical Guide to Splines", 1978).
    values : ndarray
        The spline at the samples.
    mse : float
        The mean of the weighted squared residuals.

    Raises
    ------
    ValueError
        If x and y differ in length, x decreases, degree is not from 1 to 9, or there are too many knots.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.linspace(0, 1, 30)
    >>> spline = qx.fit.BSpline(x, x**3, 2)
    >>> round(spline(0.5), 9)
    0.125
    """

    def __init__(self, x: ArrayLike, y: ArrayLike, knots: ArrayLike = 4, degree: int = 3,
                 sigma: ArrayLike | None = None) -> None:
        x, y, w = _samples("BSpline", x, y, sigma)
        interior, places = (whole_number("fit.BSpline", "knots", knots, 0, "ErrNegativeCount"), EMPTY) \
            if np.ndim(knots) == 0 else (0, vector(knots, "fit.BSpline", "knots"))
        self.degree = whole_number("fit.BSpline", "degree", degree, 1, "ErrOrderNotPositive")
        self.knots, self.coefficients, self.values, self.mse = core.BSpline(
            x, y, w, self.degree, interior, places)

    def __call__(self, xi: Any) -> Any:
        """The spline at xi, by de Boor's recurrence; beyond the samples the end pieces are extrapolated."""
        xi = np.asarray(xi, float)
        k, t = self.degree, self.knots
        i = np.clip(np.searchsorted(t, xi, "right") - 1, k, len(t) - k - 2)
        d = [self.coefficients[i - k + j] for j in range(k + 1)]
        for r in range(1, k + 1):
            for j in range(k, r - 1, -1):
                low, high = t[i - k + j], t[i + 1 + j - r]
                a = (xi - low) / (high - low)
                d[j] = (1 - a) * d[j - 1] + a * d[j]
        return d[k][()]

    def __repr__(self) -> str:
        return f"BSpline: degree {self.degree}, {len(self.coefficients)} coefficients, mse {self.mse:.6g}"
