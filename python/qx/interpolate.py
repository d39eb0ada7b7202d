"""Values between the points of a table."""

from __future__ import annotations

from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import Result, refuse, result, served, vector

__all__ = ["CubicSpline", "Interpolated", "linear", "polynomial", "rational"]

core = served("interpolate")


def _table(function: str, x: ArrayLike, y: ArrayLike) -> tuple[NDArray[Any], NDArray[Any]]:
    x, y = (vector(one, f"interpolate.{function}", name).astype(float) for one, name in ((x, "x"), (y, "y")))
    if len(x) != len(y) or not len(x):
        refuse(f"interpolate.{function}", "x, y", f"must have the same length and not be empty; got {len(x)} "
               f"and {len(y)} values", "ErrSizeMismatch")
    return x, y


@result
class Interpolated(Result):
    """Interpolated values; unpacks into values and errors.

    Attributes
    ----------
    values : float or ndarray
        The values at the requested points.
    errors : float or ndarray
        Estimates of their errors: the last corrections.
    """

    values: NDArray[Any]
    errors: NDArray[Any]


class CubicSpline:
    """The cubic spline through the points of a table.

    Parameters
    ----------
    x, y : array_like
        The points; x is strictly increasing.
    start, end : float, optional
        The slopes at the ends. Without a slope, the second derivative at that end is 0 (natural spline).

    Attributes
    ----------
    x, y, second_derivatives : ndarray
        The table and the second derivatives of the spline at its points.

    Raises
    ------
    ValueError
        If x and y differ in length or are empty, or x is not increasing.

    Examples
    --------
    >>> import qx
    >>> spline = qx.interpolate.CubicSpline([0.0, 1.0, 2.0], [0.0, 1.0, 4.0], 0.0, 4.0)
    >>> spline([0.5, 1.5]), spline(1.0, derivative=1)
    (array([0.25, 2.25]), 2.0)
    """

    def __init__(self, x: ArrayLike, y: ArrayLike, start: float | None = None,
                 end: float | None = None) -> None:
        self.x, self.y = _table("CubicSpline", x, y)
        if np.any(np.diff(self.x) <= 0):
            refuse("interpolate.CubicSpline", "x", "must be increasing", "ErrAbscissaeOrder")
        natural = float("nan")
        self.second_derivatives = core.CubicSpline(self.y, self.x, natural if start is None else float(start),
                                                   natural if end is None else float(end))

    def __call__(self, xi: ArrayLike, derivative: int = 0) -> Any:
        """Values of the spline or of one of its derivatives.

        Parameters
        ----------
        xi : float or array_like
            The points, of any shape. Beyond the table, the end segments are extrapolated.
        derivative : int
            The order of the derivative, from 0 to 3.

        Returns
        -------
        float or ndarray
        """
        if derivative not in (0, 1, 2, 3):
            refuse("interpolate.CubicSpline", "derivative", f"must be from 0 to 3; got {derivative}")
        xi = np.asarray(xi, float)
        if len(self.x) == 1:
            return (np.full(xi.shape, self.y[0]) if not derivative else np.zeros(xi.shape))[()]
        i = np.clip(np.searchsorted(self.x, xi, "right") - 1, 0, len(self.x) - 2)
        h = self.x[i + 1] - self.x[i]
        b = (xi - self.x[i]) / h
        a = 1 - b
        y0, y1 = self.y[i], self.y[i + 1]
        m0, m1 = self.second_derivatives[i], self.second_derivatives[i + 1]
        return (a * y0 + b * y1 + ((a**3 - a) * m0 + (b**3 - b) * m1) * (h * h / 6),
                (y1 - y0) / h + ((3 * b * b - 1) * m1 - (3 * a * a - 1) * m0) * (h / 6),
                a * m0 + b * m1, (m1 - m0) / h)[derivative][()]

    def __repr__(self) -> str:
        return f"CubicSpline: {len(self.x)} points from {self.x[0]:g} to {self.x[-1]:g}"


def _each(run: Any, xi: Any) -> Any:
    xi = np.asarray(xi, float)
    found = [run(one) for one in xi.ravel().tolist()]
    values, errors = (np.array(part).reshape(xi.shape)[()] for part in zip(*found)) if found else \
        (np.empty(xi.shape), np.empty(xi.shape))
    return Interpolated(values, errors)


def linear(xi: ArrayLike, x: ArrayLike, y: ArrayLike) -> Any:
    """Linear interpolation in a table; beyond its ends, the first or the last value.

    Parameters
    ----------
    xi : float or array_like
        Where, of any shape.
    x, y : array_like
        The points; x rises.

    Returns
    -------
    float or ndarray

    Raises
    ------
    ValueError
        If x and y differ in length or are empty, or x is not increasing.

    Examples
    --------
    >>> import qx
    >>> qx.interpolate.linear(0.5, [0.0, 1.0], [0.0, 4.0])
    2.0
    """
    x, y = _table("linear", x, y)
    if np.any(np.diff(x) <= 0):
        refuse("interpolate.linear", "x", "must be increasing", "ErrAbscissaeOrder")
    return np.interp(np.asarray(xi, float), x, y)[()]


def polynomial(xi: ArrayLike, x: ArrayLike, y: ArrayLike) -> Interpolated:
    """The polynomial through all points of a table (E. H. Neville, "Iterative interpolation", 1934).

    Parameters
    ----------
    xi : float or array_like
        Where, of any shape.
    x, y : array_like
        The points.

    Returns
    -------
    Interpolated

    Raises
    ------
    ValueError
        If x and y differ in length, are empty, or two x are equal.

    Examples
    --------
    >>> import qx
    >>> qx.interpolate.polynomial(1.5, [0.0, 1.0, 2.0], [0.0, 1.0, 4.0]).values
    2.25
    """
    x, y = _table("polynomial", x, y)
    return _each(lambda one: core.polynomial(y, x, one), xi)


def rational(xi: ArrayLike, x: ArrayLike, y: ArrayLike) -> Interpolated:
    """The rational function through all points of a table (R. Bulirsch and J. Stoer, 1964).

    Parameters
    ----------
    xi : float or array_like
        Where, of any shape.
    x, y : array_like
        The points.

    Returns
    -------
    Interpolated

    Raises
    ------
    ValueError
        If x and y differ in length, are empty, or the function has a pole at xi.

    Examples
    --------
    >>> import qx
    >>> round(float(qx.interpolate.rational(1.5, [1.0, 2.0, 3.0], [1.0, 0.5, 1 / 3]).values), 9)
    0.666666667
    """
    x, y = _table("rational", x, y)
    return _each(lambda one: core.rational(y, x, one), xi)
