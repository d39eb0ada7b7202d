"""Polynomials, given by their real or complex coefficients in ascending powers, the constant first, as in
`numpy.polynomial`.
"""

from __future__ import annotations

from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import Result, result, served, vector, whole_number

__all__ = ["PartialFractions", "Roots", "add", "compose", "derivative", "divide", "evaluate",
           "evaluate_matrix", "from_roots", "gcd", "integral", "lcm", "multiple_roots",
           "multiply", "partial_fractions", "roots", "subtract"]

core = served("poly")

CLUSTERED = 1e-10  # the relative error radius from which a root may be a multiple one
MOST_STRUCTURED = 100  # the highest degree at which multiple roots are looked for


def _given(function: Any, *polynomials: Any) -> Any:
    given = [vector(p, f"poly.{function}", "coefficients") for p in polynomials]
    return given, any(p.dtype.kind == "c" for p in given)


def _of(function: Any, *polynomials: Any) -> Any:
    given, is_complex = _given(function, *polynomials)
    return getattr(core, function + "_complex" if is_complex else function)(*given)


@result
class Roots(Result):
    """The distinct roots of a polynomial.

    Attributes
    ----------
    roots : ndarray of complex128
        Each root once.
    multiplicities : ndarray of int32
        The multiplicity of each root.
    """

    roots: NDArray[Any]
    multiplicities: NDArray[Any]


@result
class PartialFractions(Result):
    """A rational function as a polynomial and a sum over its poles.

    Attributes
    ----------
    polynomial : ndarray
        The polynomial part: the quotient of the division.
    poles : ndarray of complex128
        The poles, each repeated by its multiplicity, with equal poles adjacent.
    residues : ndarray of complex128
        For the k-th of several equal poles, the coefficient of 1 / (x - pole)^k.
    """

    polynomial: NDArray[Any]
    poles: NDArray[Any]
    residues: NDArray[Any]


def add(p: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The sum of two polynomials.

    Parameters
    ----------
    p, q : array_like
        Coefficients.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a coefficient is not finite or the result overflows.

    Examples
    --------
    >>> import qx
    >>> qx.poly.add([1.0, 2.0], [1.0])
    array([2., 2.])
    """
    return _of("add", p, q)


def subtract(p: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The difference of two polynomials.

    Parameters
    ----------
    p, q : array_like
        Coefficients.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a coefficient is not finite or the result overflows.

    Examples
    --------
    >>> import qx
    >>> qx.poly.subtract([1.0, 2.0], [1.0])
    array([0., 2.])
    """
    return _of("subtract", p, q)


def multiply(p: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The product of two polynomials.

    Parameters
    ----------
    p, q : array_like
        Coefficients.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a coefficient is not finite or the result overflows.

    Examples
    --------
    >>> import qx
    >>> qx.poly.multiply([1.0, 1.0], [1.0, -1.0])
    array([ 1.,  0., -1.])
    """
    return _of("multiply", p, q)


def divide(p: ArrayLike, q: ArrayLike) -> tuple[NDArray[Any], NDArray[Any]]:
    r"""Quotient and remainder of a division.

    .. math:: p = s q + r

    Parameters
    ----------
    p, q : array_like
        Coefficients.

    Returns
    -------
    two ndarrays

    Raises
    ------
    ValueError
        If q is 0, or a coefficient is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.divide([1.0, 0.0, 1.0], [1.0, 1.0])
    (array([-1.,  1.]), array([2.]))
    """
    return _of("divide", p, q)


def gcd(p: ArrayLike, q: ArrayLike, tolerance: float = 1e-10) -> NDArray[Any]:
    """The monic common divisor of highest degree among polynomials within a relative distance of p and q
    (Z. Zeng, "Computing multiple roots of inexact polynomials", 2005).

    Parameters
    ----------
    p, q : array_like
        Coefficients.
    tolerance : float
        The distance, relative to the norm of the coefficients.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If both are 0, or a coefficient is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.gcd([2.0, 3.0, 1.0], [3.0, 4.0, 1.0]).round(12)
    array([1., 1.])
    """
    given, is_complex = _given("gcd", p, q)
    return (core.gcd_complex if is_complex else core.gcd)(*given, float(tolerance))[0]


def lcm(p: ArrayLike, q: ArrayLike, tolerance: float = 1e-10) -> NDArray[Any]:
    """The monic least common multiple of real polynomials within a relative distance of p and q.

    Parameters
    ----------
    p, q : array_like
        Coefficients.
    tolerance : float
        The distance, relative to the norm of the coefficients.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a polynomial is 0, or a coefficient is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.lcm([1.0, 1.0], [2.0, 3.0, 1.0]).round(12)
    array([2., 3., 1.])
    """
    given, _ = _given("lcm", p, q)
    return core.lcm(*given, float(tolerance))


def evaluate(p: ArrayLike, x: ArrayLike) -> Any:
    r"""The values of a polynomial, as accurate as if computed with twice the digits (S. Graillat, P.
    Langlois and N. Louvet, "Compensated Horner scheme", 2005).

    .. math:: p(x) = \sum_k p_k x^k

    Parameters
    ----------
    p : array_like
        Coefficients.
    x : float, complex or array_like
        The points, of any shape.

    Returns
    -------
    float, complex or ndarray
        The same shape as x.

    Raises
    ------
    ValueError
        If there are no coefficients, or one is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.evaluate([1.0, 0.0, 2.0], [0.0, 3.0])
    array([ 1., 19.])
    """
    x = np.asarray(x)
    given, is_complex = _given("evaluate", p)
    run = core.evaluate_complex if is_complex or x.dtype.kind == "c" else core.evaluate
    return run(*given, x.ravel()).reshape(x.shape)[()]


def evaluate_matrix(p: ArrayLike, a: ArrayLike) -> NDArray[Any]:
    r"""A polynomial of a square matrix (M. S. Paterson and L. J. Stockmeyer, "On the number of nonscalar
    multiplications necessary to evaluate polynomials", 1973).

    .. math:: p(A) = \sum_k p_k A^k

    Parameters
    ----------
    p : array_like
        Coefficients.
    a : array_like
        A square matrix.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If there are no coefficients, or one is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.evaluate_matrix([1.0, 1.0], [[0.0, 1.0], [1.0, 0.0]])
    array([[1., 1.],
           [1., 1.]])
    """
    a = np.asarray(a)
    given, is_complex = _given("evaluate_matrix", p)
    run = core.evaluate_matrix_complex if is_complex or a.dtype.kind == "c" else core.evaluate_matrix
    return run(*given, a, 1)


def derivative(p: ArrayLike, m: int = 1) -> NDArray[Any]:
    """The m-th derivative.

    Parameters
    ----------
    p : array_like
        Coefficients.
    m : int
        The order of the derivative.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If m is negative, or there are no coefficients.

    Examples
    --------
    >>> import qx
    >>> qx.poly.derivative([1.0, 2.0, 3.0])
    array([2., 6.])
    """
    m = whole_number("poly.derivative", "m", m, 0, "ErrNegativeCount")
    given, is_complex = _given("derivative", p)
    return (core.derivative_complex if is_complex else core.derivative)(*given, m)


def integral(p: ArrayLike, constant: complex = 0.0) -> NDArray[Any]:
    """The integral with a given value at 0.

    Parameters
    ----------
    p : array_like
        Coefficients.
    constant : float or complex
        The value at 0.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If there are no coefficients, or one is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.integral([1.0, 2.0])
    array([0., 1., 1.])
    """
    given, is_complex = _given("integral", p)
    if is_complex or np.iscomplexobj(constant):
        return core.integral_complex(*given, complex(constant))
    return core.integral(*given, float(constant.real))


def compose(p: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The polynomial p(q(x)).

    Parameters
    ----------
    p, q : array_like
        Coefficients.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a coefficient is not finite or the result overflows.

    Examples
    --------
    >>> import qx
    >>> qx.poly.compose([0.0, 0.0, 1.0], [1.0, 1.0])
    array([1., 2., 1.])
    """
    return _of("compose", p, q)


def from_roots(roots: ArrayLike) -> NDArray[Any]:
    """The monic polynomial with the given roots; real where they are real or form conjugate pairs.

    Parameters
    ----------
    roots : array_like
        The roots, each repeated by its multiplicity.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a root is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.from_roots([1.0, 2.0])
    array([ 2., -3.,  1.])
    """
    given = vector(roots, "poly.from_roots", "roots")
    left = list(given[given.imag != 0]) if given.dtype.kind == "c" else []
    while left:
        one = left.pop()
        near = [i for i, other in enumerate(left) if abs(other - np.conj(one)) <= 1e-10 * abs(one)]
        if not near:
            return core.from_roots_complex(given)
        left.pop(near[0])
    return core.from_roots(given)


def roots(p: ArrayLike) -> NDArray[np.complex128]:
    """All roots, each repeated by its multiplicity, in the order of increasing modulus. The roots of a real
    polynomial are real or exact conjugate pairs (D. A. Bini, "Numerical computation of polynomial zeros by
    means of Aberth's method", 1996). Simple roots are as accurate as the coefficients allow. Where roots lie
    close together, up to degree 100, `multiple_roots` decides whether they are a multiple root.

    Parameters
    ----------
    p : array_like
        Coefficients.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If the polynomial is constant, or a coefficient is not finite.

    Examples
    --------
    >>> import numpy as np, qx
    >>> np.sort(qx.poly.roots([2.0, -3.0, 1.0]).real)
    array([1., 2.])
    """
    given, is_complex = _given("roots", p)
    found, radii = (core.roots_complex if is_complex else core.roots)(*given)
    if len(found) <= MOST_STRUCTURED and np.any(radii > CLUSTERED * np.abs(found)):
        structure = multiple_roots(p)
        if np.any(structure.multiplicities > 1):
            return np.repeat(structure.roots, structure.multiplicities)
    return found


def multiple_roots(p: ArrayLike, tolerance: float = 1e-10) -> Roots:
    """The distinct roots with their multiplicities: a multiple root is as accurate as a simple one (Z.
    Zeng, "Computing multiple roots of inexact polynomials", 2005).

    Parameters
    ----------
    p : array_like
        Coefficients.
    tolerance : float
        The change of the coefficients, relative for those above 1, that is allowed to make roots multiple.

    Returns
    -------
    Roots

    Raises
    ------
    ValueError
        If the polynomial is constant, or a coefficient is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.multiple_roots([1.0, 3.0, 3.0, 1.0])
    Roots
      roots           [-1.+0.j]
      multiplicities  [3]
    """
    given, is_complex = _given("multiple_roots", p)
    run = core.multiple_roots_complex if is_complex else core.multiple_roots
    _, refined, _, multiplicities = run(*given, 1, float(tolerance))
    return Roots(refined, multiplicities)


def partial_fractions(numerator: ArrayLike, denominator: ArrayLike,
                      tolerance: float = 1e-10) -> PartialFractions:
    r"""The partial fractions of a real rational function.

    .. math:: \frac{n(x)}{d(x)} = p(x) + \sum_{z,k} \frac{r_{zk}}{(x - z)^k}

    Parameters
    ----------
    numerator, denominator : array_like
        Coefficients.
    tolerance : float
        The change of the coefficients, relative for those above 1, that is allowed to make poles multiple.

    Returns
    -------
    PartialFractions

    Raises
    ------
    ValueError
        If the denominator is 0, or a coefficient is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.poly.partial_fractions([1.0], [2.0, 3.0, 1.0]).residues.real.round(12)
    array([-1.,  1.])
    """
    given, _ = _given("partial_fractions", numerator, denominator)
    return PartialFractions(*core.partial_fractions(*given, float(tolerance)))
