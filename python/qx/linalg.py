"""Linear algebra: systems, least squares, eigenvalues, decompositions, functions of matrices and matrix
equations.

Names and arguments are those of `numpy.linalg` and `scipy.linalg`. Matrices may be real or complex, and
may be stacked: an array of more than two dimensions is processed matrix by matrix, in threads. A singular
matrix raises `numpy.linalg.LinAlgError`; a badly conditioned system gives a warning.
"""

from __future__ import annotations

import math
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .outcomes import QxWarning, keeping, warn
from .topical import Result, chosen, refuse, result, served, vector, whole_number
from .topical.axes import as_array, many

__all__ = ["Eigen", "GSVD", "Hessenberg", "LU", "LeastSquares", "QR", "QZ", "SVD", "Schur", "balance",
           "charpoly", "cholesky", "companion", "cond", "det", "eig", "eigh", "eigvals",
           "eigvalsh", "expm", "from_eigenvalues", "gsvd", "hessenberg", "inv", "is_positive_definite",
           "is_positive_semidefinite",
           "is_symmetric", "kron", "logm", "lstsq", "lu", "matrix_power", "matrix_rank",
           "norm", "pinv", "qr", "qz", "schur", "solve", "solve_banded",
           "solve_discrete_lyapunov", "solve_lyapunov", "solve_sylvester", "sqrtm", "svd",
           "svdvals", "toeplitz", "trace"]

core = served("linalg")

EPS = float(np.finfo(float).eps)
WORST = 1e-4 / EPS  # the condition number above which fewer than four digits are certain


@result
class LeastSquares(Result):
    """A least-squares solution; unpacks like the result of `numpy.linalg.lstsq`.

    Attributes
    ----------
    x : ndarray
        The solution; the one of smallest norm where there are several.
    residuals : ndarray
        The sums of the squared residuals, one for each right-hand side.
    rank : int
        The rank of the matrix.
    singular_values : ndarray
        The singular values of the matrix, in descending order.
    """

    x: NDArray[Any]
    residuals: NDArray[Any]
    rank: int
    singular_values: NDArray[Any]


@result
class Eigen(Result):
    """Eigenvalues and eigenvectors: a v = v diag(values).

    Attributes
    ----------
    values : ndarray
        The eigenvalues.
    vectors : ndarray
        The eigenvectors, in columns.
    """

    values: NDArray[Any]
    vectors: NDArray[Any]


@result
class SVD(Result):
    """A singular value decomposition: a = u diag(s) vh.

    Attributes
    ----------
    u : ndarray
        The left singular vectors, in columns.
    s : ndarray
        The singular values, in descending order.
    vh : ndarray
        The conjugated right singular vectors, in rows.
    """

    u: NDArray[Any]
    s: NDArray[Any]
    vh: NDArray[Any]


@result
class QR(Result):
    """A QR decomposition: a = q r, or a[:, permutation] = q r.

    Attributes
    ----------
    q : ndarray
        Orthonormal columns.
    r : ndarray
        An upper triangular matrix.
    permutation : ndarray or None
        The order of the columns, if they were exchanged.
    """

    q: NDArray[Any]
    r: NDArray[Any]
    permutation: NDArray[Any] | None = None

    def __iter__(self) -> Any:
        return iter((self.q, self.r) if self.permutation is None else (self.q, self.r, self.permutation))


@result
class LU(Result):
    """An LU decomposition: a = p l u.

    Attributes
    ----------
    p : ndarray
        A permutation.
    l : ndarray
        A lower triangular matrix with ones on the diagonal.
    u : ndarray
        An upper triangular matrix.
    """

    p: NDArray[Any]
    l: NDArray[Any]  # noqa: E741
    u: NDArray[Any]


@result
class Schur(Result):
    """A Schur form: a = z t z^H. Real forms have 2-by-2 blocks for pairs of conjugate eigenvalues.

    Attributes
    ----------
    t : ndarray
        The (almost) triangular form.
    z : ndarray
        A unitary matrix.
    values : ndarray
        The eigenvalues in the order of the diagonal.
    """

    t: NDArray[Any]
    z: NDArray[Any]
    values: NDArray[Any]
    _unpacked = ("t", "z")


@result
class QZ(Result):
    """A generalised Schur form: a = q s z^H, b = q t z^H.

    Attributes
    ----------
    s, t : ndarray
        The (almost) triangular forms.
    q, z : ndarray
        A unitary matrix.
    alpha, beta : ndarray
        The eigenvalues are alpha / beta.
    """

    s: NDArray[Any]
    t: NDArray[Any]
    q: NDArray[Any]
    z: NDArray[Any]
    alpha: NDArray[Any]
    beta: NDArray[Any]
    _unpacked = ("s", "t", "q", "z")


@result
class Hessenberg(Result):
    """A Hessenberg form: a = q h q^H.

    Attributes
    ----------
    h : ndarray
        A matrix that is zero below the first subdiagonal.
    q : ndarray
        A unitary matrix.
    """

    h: NDArray[Any]
    q: NDArray[Any]


def _served(name: Any, *matrices: Any) -> Any:
    """The export for real or for complex matrices."""
    for matrix in matrices:
        if matrix.dtype.kind == "c":
            return getattr(core, name + "_complex")
    return getattr(core, name)


def _matrix(function: str, a: ArrayLike, is_square: bool = False, argument: str = "a") -> NDArray[Any]:
    a = as_array(a)
    if a.ndim < 2:
        refuse(function, argument, f"at least two dimensions are needed; got {a.ndim}", "ErrNotSquare")
    if is_square and a.shape[-1] != a.shape[-2]:
        refuse(function, argument, f"must be square; got {a.shape[-2]} by {a.shape[-1]}", "ErrNotSquare")
    if not a.size:
        refuse(function, argument, "is empty", "ErrEmptyInput")
    return a


def _each(function: Any, *stacks: Any) -> Any:
    """Applies a function of matrices to stacks of them."""
    for stack in stacks:
        if stack.ndim != 2:
            break
    else:
        return function(*stacks)
    shape = np.broadcast_shapes(*(stack.shape[:-2] for stack in stacks))
    flat = [np.broadcast_to(stack, shape + stack.shape[-2:]).reshape(-1, *stack.shape[-2:]) for stack in stacks]
    rows = [*zip(*flat)]
    found = many(lambda row: function(*row), rows, sum(one.size for one in flat))

    def stacked(parts: Any) -> Any:
        parts = [np.asarray(part) for part in parts]
        return np.stack(parts).reshape(*shape, *parts[0].shape)

    if isinstance(found[0], Result):
        fields = {name: [getattr(one, name) for one in found] for name in found[0].__dict__}
        return type(found[0])(*(None if parts[0] is None else stacked(parts) for parts in fields.values()))
    return stacked(found)


def _sides(function: str, a: NDArray[Any], b: ArrayLike) -> tuple[NDArray[Any], bool]:
    """b as a matrix, and whether it was a vector."""
    b = as_array(b)
    is_vector = b.ndim == 1 or b.ndim == a.ndim - 1 and b.ndim > 1 and b.shape == a.shape[:-1]
    columns = b[..., None] if is_vector else b
    if columns.ndim < 2 or columns.shape[-2] != a.shape[-2]:
        refuse(function, "b", f"must have as many rows as a, {a.shape[-2]}; got shape {b.shape}",
               "ErrSizeMismatch")
    return columns, is_vector


def _factors(function: Any, a: Any) -> Any:
    """The LU factors and pivots of a matrix that is not singular."""
    (lu, pivots, _), kept = keeping(_served("lu", a), a)
    if kept or not lu.diagonal().all():
        refuse(function, "a", "is singular: a pivot is 0", "ErrSingularMatrix")
    return lu, pivots


def _warn_of(function: Any, condition: Any) -> None:
    if not condition < WORST:
        digits = max(0, math.floor(-math.log10(EPS * condition))) if condition < np.inf else 0
        warn(QxWarning(f"qx.{function}", 20006, f"qx.{function}: a is badly conditioned, {condition:.1e}: about "
                       f"{digits} digits of the result are certain"))


def _largest_column(a: NDArray[Any]) -> Any:
    """The largest column sum of magnitudes."""
    return np.maximum.reduce(np.add.reduce(np.abs(a), 0))


ASSUMPTIONS = {"general": "general", "positive": "positive", "lower": "lower", "upper": "upper"}


def solve(a: ArrayLike, b: ArrayLike,
          assume: Literal["general", "positive", "lower", "upper"] = "general") -> NDArray[Any]:
    """The solution x of a x = b.

    The method is LU factorisation with row exchanges. A `QxWarning` is given where the condition number
    leaves fewer than four certain digits.

    Parameters
    ----------
    a : array_like
        A square matrix, or a stack of them.
    b : array_like
        A vector, or a matrix with one right-hand side in each column.
    assume : {"general", "positive", "lower", "upper"}
        The structure of a: none, symmetric (Hermitian) and positive definite, or triangular. The opposite
        triangle of a triangular matrix is not read.

    Returns
    -------
    ndarray
        The same shape as b.

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square, is singular, or is not positive definite as assumed.
    ValueError
        If the shape of b does not match a, or assume is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.solve([[2.0, 1.0], [1.0, 3.0]], [3.0, 5.0]).round(12)
    array([0.8, 1.4])
    """
    kind = chosen("linalg.solve", "assume", assume, ASSUMPTIONS)
    a = _matrix("linalg.solve", a, True)
    columns, is_vector = _sides("linalg.solve", a, b)

    def of_one(a: Any, columns: Any) -> Any:
        if kind in ("lower", "upper"):
            return _served("solve_triangular", a, columns)(a, int(kind == "upper"), columns)
        if kind == "positive":
            return _served("solve_positive", a, columns)(a, 0, columns)
        try:
            (x, reciprocal), _ = keeping(_served("solve", a, columns), a, columns)
        except np.linalg.LinAlgError:
            refuse("linalg.solve", "a", "is singular: a pivot is 0", "ErrSingularMatrix")
        _warn_of("linalg.solve", 1 / reciprocal if reciprocal else np.inf)
        return x

    found = _each(of_one, a, columns)
    return found[..., 0] if is_vector else found


def lstsq(a: ArrayLike, b: ArrayLike, rcond: float | None = None) -> LeastSquares:
    """The x that minimises the sum of squares of a x - b, of smallest norm where there are several, by the
    singular value decomposition.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.
    b : array_like
        A vector, or a matrix with one right-hand side in each column.
    rcond : float, optional
        Singular values up to rcond times the largest one count as 0; max(m, n) eps by default.

    Returns
    -------
    LeastSquares

    Raises
    ------
    ValueError
        If the shape of b does not match a, or an element is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.lstsq([[1.0, 0.0], [1.0, 1.0], [1.0, 2.0]], [1.0, 2.0, 2.0]).x.round(6)
    array([1.166667, 0.5     ])
    """
    a = _matrix("linalg.lstsq", a)
    if a.ndim > 2:
        refuse("linalg.lstsq", "a", "one matrix is needed, not a stack", "ErrSizesDisagree")
    columns, is_vector = _sides("linalg.lstsq", a, b)
    limit: float = max(a.shape) * EPS if rcond is None else float(rcond)
    x = _served("lstsq", a, columns)(a, columns, limit / max(a.shape))
    values = _served("svdvals", a)(a)
    rank = int(np.sum(values > limit * values.max(initial=0)))
    left = np.sum(np.abs(columns - a @ x)**2, 0)
    return LeastSquares(x[:, 0] if is_vector else x, left, rank, values)


def inv(a: ArrayLike) -> NDArray[Any]:
    """The inverse of a square matrix, by LU factorisation.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square or singular.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.inv([[2.0, 1.0], [1.0, 1.0]])
    array([[ 1., -1.],
           [-1.,  2.]])
    """
    a = _matrix("linalg.inv", a, True)

    def of_one(a: Any) -> Any:
        lu, pivots = _factors("linalg.inv", a)
        found = _served("solve_inverse", a)(lu, pivots)
        _warn_of("linalg.inv", _largest_column(a) * _largest_column(found))
        return found

    return _each(of_one, a)


def pinv(a: ArrayLike, rcond: float | None = None) -> NDArray[Any]:
    """The pseudo-inverse (E. H. Moore, R. Penrose), by the singular value decomposition.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.
    rcond : float, optional
        Singular values up to rcond times the largest one count as 0; max(m, n) eps by default.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.pinv([[1.0], [1.0]]).round(12)
    array([[0.5, 0.5]])
    """
    def of_one(a: Any) -> Any:
        limit = -1.0 if rcond is None else rcond * _served("svdvals", a)(a)[0]
        return _served("pinv", a)(a, float(limit))

    return _each(of_one, _matrix("linalg.pinv", a))


def det(a: ArrayLike) -> Any:
    """The determinant of a square matrix.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    float or complex

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.det([[2.0, 1.0], [1.0, 3.0]])
    5.0
    """
    a = _matrix("linalg.det", a, True)
    return _served("det", a)(a, 0) if a.ndim == 2 else _each(lambda a: _served("det", a)(a, 0), a)


def trace(a: ArrayLike) -> Any:
    """The sum of the diagonal of a square matrix.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    float or complex

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.trace([[2.0, 1.0], [1.0, 3.0]])
    5.0
    """
    return _each(lambda a: _served("trace", a)(a), _matrix("linalg.trace", a, True))


NORMS = {"spectral": 0, 2: 0, 1: 1, "fro": 2, "frobenius": 2, math.inf: 3}
CONDITIONS = {None: 0, 2: 0, 1: 1, "fro": 2, "frobenius": 2, math.inf: 3}


def norm(a: ArrayLike, ord: int | float | str | None = None) -> float:
    """The norm of a vector or a matrix.

    Parameters
    ----------
    a : array_like
        One or two dimensions.
    ord : int, float or str, optional
        For a vector, the p of its p-norm, 2 by default. For a matrix, 2 or "spectral" for the largest
        singular value, 1 or inf for the largest column or row sum of magnitudes, or "fro" for the root of
        the sum of squares, which is the default.

    Returns
    -------
    float

    Raises
    ------
    ValueError
        If a is empty, or ord is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.norm([[3.0, 0.0], [4.0, 0.0]]), qx.linalg.norm([1.0, -2.0], 1)
    (5.0, 3.0)
    """
    a = as_array(a)
    if a.ndim == 1:
        return _served("norm_vector", a)(a, 2.0 if ord is None else float(ord))
    kind = chosen("linalg.norm", "ord", "fro" if ord is None else ord, NORMS)
    a = _matrix("linalg.norm", a)
    if a.ndim > 2:
        refuse("linalg.norm", "a", "one matrix is needed, not a stack", "ErrSizesDisagree")
    return _served("norm", a)(a, kind)


def cond(a: ArrayLike, p: float | Literal["fro"] | None = None) -> float:
    """The condition number: the factor by which relative errors of the right-hand side of a system may grow.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.
    p : {None, 2, 1, inf, "fro"}
        The norm; by default 2, for the ratio of the largest to the smallest singular value.

    Returns
    -------
    float

    Raises
    ------
    ValueError
        If a is empty, or p is not a valid choice.
    numpy.linalg.LinAlgError
        If a is not square and the norm is not 2.

    Examples
    --------
    >>> import qx
    >>> round(qx.linalg.cond([[2.0, 0.0], [0.0, 0.5]]), 12)
    4.0
    """
    kind = chosen("linalg.cond", "p", p, CONDITIONS)
    return _each(lambda a: _served("cond", a)(a, kind), _matrix("linalg.cond", a, kind > 0))


def matrix_rank(a: ArrayLike, rcond: float | None = None) -> int:
    """The number of singular values above rcond times the largest one.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.
    rcond : float, optional
        max(m, n) eps by default.

    Returns
    -------
    int

    Raises
    ------
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.matrix_rank([[1.0, 2.0], [2.0, 4.0]])
    1
    """
    def of_one(a: Any) -> Any:
        limit = -1.0 if rcond is None else rcond * _served("svdvals", a)(a)[0]
        return _served("matrix_rank", a)(a, float(limit))

    return _each(of_one, _matrix("linalg.matrix_rank", a))


def eig(a: ArrayLike, b: ArrayLike | None = None) -> Eigen:
    """Eigenvalues and unit eigenvectors of a square matrix; with b, those of a v = value b v.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.
    b : array_like, optional
        A second matrix of the same shape.

    Returns
    -------
    Eigen

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.eig([[0.0, 1.0], [-1.0, 0.0]]).values
    array([0.+1.j, 0.-1.j])
    """
    a = _matrix("linalg.eig", a, True)
    if b is None:
        return _each(lambda a: Eigen(*(core.eig_complex(a, 0, 1) if a.dtype.kind == "c" else core.eig(a, 1))), a)
    b = _matrix("linalg.eig", b, True, "b")
    return _each(lambda a, b: Eigen(*_served("eig_general", a, b)(a, b, 1)), a, b)


def eigvals(a: ArrayLike, b: ArrayLike | None = None) -> NDArray[np.complex128]:
    """The eigenvalues of `eig`, without the vectors.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.
    b : array_like, optional
        A second matrix of the same shape.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.eigvals([[2.0, 0.0], [0.0, 1.0]]).real
    array([2., 1.])
    """
    a = _matrix("linalg.eigvals", a, True)
    if b is None:
        return _each(lambda a: (core.eig_complex(a, 0, 0) if a.dtype.kind == "c" else core.eig(a, 0))[0], a)
    b = _matrix("linalg.eigvals", b, True, "b")
    return _each(lambda a, b: _served("eig_general", a, b)(a, b, 0)[0], a, b)


def eigh(a: ArrayLike) -> Eigen:
    """Eigenvalues in ascending order and orthonormal eigenvectors of a symmetric or Hermitian matrix, of which
    the lower triangle is read.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    Eigen

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.eigh([[2.0, 1.0], [1.0, 2.0]]).values.round(12)
    array([1., 3.])
    """
    def of_one(a: Any) -> Any:
        if a.dtype.kind == "c":
            values, vectors = core.eig_complex(a, 1, 1)
            return Eigen(values.real, vectors)
        vectors, values = core.eigh(a, 1)
        return Eigen(values, vectors)

    return _each(of_one, _matrix("linalg.eigh", a, True))


def eigvalsh(a: ArrayLike) -> NDArray[np.float64]:
    """The eigenvalues of `eigh`, without the vectors.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.eigvalsh([[2.0, 1.0], [1.0, 2.0]]).round(12)
    array([1., 3.])
    """
    return _each(lambda a: core.eig_complex(a, 1, 0)[0].real if a.dtype.kind == "c" else core.eigh(a, 0)[1],
                 _matrix("linalg.eigvalsh", a, True))


def svd(a: ArrayLike, full_matrices: bool = True) -> SVD:
    r"""The singular value decomposition.

    .. math:: a = u\, \mathrm{diag}(s)\, v^H

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.
    full_matrices : bool
        Whether u and vh are square, rather than having as many vectors as there are singular values.

    Returns
    -------
    SVD

    Raises
    ------
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.svd([[3.0, 0.0], [0.0, 4.0]]).s.round(12)
    array([4., 3.])
    """
    def of_one(a: Any) -> Any:
        u, s, v = _served("svd", a)(a, int(full_matrices))
        return SVD(u, s, v.conj().T)

    return _each(of_one, _matrix("linalg.svd", a))


def svdvals(a: ArrayLike) -> NDArray[np.float64]:
    """The singular values in descending order.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.svdvals([[3.0, 0.0], [0.0, 4.0]]).round(12)
    array([4., 3.])
    """
    return _each(lambda a: _served("svdvals", a)(a), _matrix("linalg.svdvals", a))


def qr(a: ArrayLike, mode: Literal["reduced", "complete"] = "reduced", pivoting: bool = False) -> QR:
    """The QR decomposition by Householder reflections.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.
    mode : {"reduced", "complete"}
        Whether q has min(m, n) columns or is square.
    pivoting : bool
        Whether to exchange columns so that the diagonal of r descends.

    Returns
    -------
    QR

    Raises
    ------
    ValueError
        If a is empty, has an element that is not finite, or mode is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> q, r = qx.linalg.qr([[3.0, 1.0], [4.0, 2.0]])
    >>> abs(r).round(12)
    array([[5. , 2.2],
           [0. , 0.4]])
    """
    economy = chosen("linalg.qr", "mode", mode, {"reduced": 1, "complete": 0})

    def of_one(a: Any) -> Any:
        permutation, q, r = _served("qr", a)(a, int(pivoting), economy)
        return QR(q, r, np.argmax(np.abs(permutation), 0) if pivoting else None)

    return _each(of_one, _matrix("linalg.qr", a))


def lu(a: ArrayLike) -> LU:
    """The LU decomposition with row exchanges, a = p l u. The matrix may be singular.

    Parameters
    ----------
    a : array_like
        A matrix, real or complex.

    Returns
    -------
    LU

    Raises
    ------
    ValueError
        If a is empty.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.lu([[1.0, 2.0], [3.0, 4.0]]).u.round(6)
    array([[3.      , 4.      ],
           [0.      , 0.666667]])
    """
    def of_one(a: Any) -> Any:
        (packed, pivots, _), _ = keeping(_served("lu", a), a)
        m, n = a.shape
        k, order = min(m, n), np.arange(m)
        for step, pivot in enumerate(pivots[:m]):
            order[[step, pivot]] = order[[pivot, step]]
        p = np.zeros((m, m))
        p[order, np.arange(m)] = 1
        return LU(p, np.tril(packed[:, :k], -1) + np.eye(m, k), np.triu(packed[:k]))

    return _each(of_one, _matrix("linalg.lu", a))


def cholesky(a: ArrayLike) -> NDArray[Any]:
    """The lower triangular l with a = l l^H, for a symmetric (Hermitian) and positive definite matrix, of
    which the lower triangle is read.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square, not positive definite, or nearly singular.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.cholesky([[4.0, 2.0], [2.0, 2.0]])
    array([[2., 0.],
           [1., 1.]])
    """
    return _each(lambda a: _served("cholesky", a)(a), _matrix("linalg.cholesky", a, True))


SORTS = {"none": 0, "ascending real": 1, "descending real": 2, "ascending": 3, "descending": 4}


def schur(a: ArrayLike,
          sort: Literal["none", "ascending real", "descending real", "ascending", "descending"] = "none") -> Schur:
    """The Schur form of a square matrix.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.
    sort : {"none", "ascending real", "descending real", "ascending", "descending"}
        The order of the eigenvalues: unsorted, by their real parts, or by their moduli.

    Returns
    -------
    Schur

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.schur([[1.0, 2.0], [0.0, 3.0]], "descending").values.real.round(12)
    array([3., 1.])
    """
    order = chosen("linalg.schur", "sort", sort, SORTS)

    def of_one(a: Any) -> Any:
        t, z, values = _served("schur", a)(a, 1, order)
        return Schur(t, z, values)

    return _each(of_one, _matrix("linalg.schur", a, True))


def qz(a: ArrayLike, b: ArrayLike,
       sort: Literal["none", "ascending real", "descending real", "ascending", "descending"] = "none") -> QZ:
    """The generalised Schur form of two square matrices.

    Parameters
    ----------
    a, b : array_like
        Square matrices of the same shape.
    sort : {"none", "ascending real", "descending real", "ascending", "descending"}
        As for `schur`.

    Returns
    -------
    QZ

    Raises
    ------
    numpy.linalg.LinAlgError
        If a or b is not square.
    ValueError
        If they differ in shape, or sort is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> found = qx.linalg.qz([[2.0, 0.0], [0.0, 3.0]], [[1.0, 0.0], [0.0, 1.0]])
    >>> (found.alpha / found.beta).real.round(12)
    array([2., 3.])
    """
    order = chosen("linalg.qz", "sort", sort, SORTS)

    def of_one(a: Any, b: Any) -> Any:
        s, t, q, z, alpha, beta = _served("qz", a, b)(a, b, 1, order)
        return QZ(s, t, q, z, alpha, beta)

    return _each(of_one, _matrix("linalg.qz", a, True), _matrix("linalg.qz", b, True, "b"))


def hessenberg(a: ArrayLike) -> Hessenberg:
    """The Hessenberg form of a square matrix.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    Hessenberg

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.hessenberg([[1.0, 2.0], [3.0, 4.0]]).h
    array([[1., 2.],
           [3., 4.]])
    """
    return _each(lambda a: Hessenberg(*_served("hessenberg", a)(a, 1, len(a))), _matrix("linalg.hessenberg", a, True))


def expm(a: ArrayLike) -> NDArray[Any]:
    r"""The exponential of a square matrix.

    .. math:: e^A = \sum_k A^k / k!

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.expm([[0.0, 1.0], [0.0, 0.0]])
    array([[1., 1.],
           [0., 1.]])
    """
    return _each(lambda a: _served("expm", a)(a), _matrix("linalg.expm", a, True))


def _real_of_real(a: NDArray[Any], found: NDArray[Any]) -> NDArray[Any]:
    """The function of a real matrix; real where no imaginary part is left."""
    return found.real if a.dtype.kind != "c" and not np.any(found.imag) else found


def logm(a: ArrayLike) -> NDArray[Any]:
    """The principal logarithm of a square matrix; negative eigenvalues have the imaginary part +pi.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray
        Real where a is real and has no negative eigenvalue.

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a has the eigenvalue 0, or an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.logm([[1.0, 1.0], [0.0, 1.0]])
    array([[0., 1.],
           [0., 0.]])
    """
    return _each(lambda a: _real_of_real(a, _served("logm", a)(a)), _matrix("linalg.logm", a, True))


def sqrtm(a: ArrayLike) -> NDArray[Any]:
    """The principal square root of a square matrix.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray
        Real where a is real and has no negative eigenvalue.

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite, or no root is found.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.sqrtm([[4.0, 0.0], [0.0, 9.0]])
    array([[2., 0.],
           [0., 3.]])
    """
    return _each(lambda a: _real_of_real(a, _served("sqrtm", a)(a)), _matrix("linalg.sqrtm", a, True))


def matrix_power(a: ArrayLike, n: int) -> NDArray[Any]:
    """An integer power of a square matrix; a negative power is that of the inverse.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.
    n : int
        The exponent.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square, or is singular and n is negative.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.matrix_power([[1.0, 1.0], [0.0, 1.0]], 3)
    array([[1., 3.],
           [0., 1.]])
    """
    n = whole_number("linalg.matrix_power", "n", n)
    return _each(lambda a: _served("matrix_power", a)(a, n), _matrix("linalg.matrix_power", a, True))


def solve_sylvester(a: ArrayLike, b: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The solution x of a x + x b = q.

    Parameters
    ----------
    a : array_like
        A square matrix of order m.
    b : array_like
        A square matrix of order n.
    q : array_like
        An m by n matrix.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a or b is not square, or a and -b have a common eigenvalue.
    ValueError
        If the shape of q does not match.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.solve_sylvester([[1.0]], [[2.0]], [[6.0]])
    array([[2.]])
    """
    a, b = _matrix("linalg.solve_sylvester", a, True), _matrix("linalg.solve_sylvester", b, True, "b")
    q = _matrix("linalg.solve_sylvester", q, argument="q")
    return _served("solve_sylvester", a, b, q)(a, b, q, 0)


def solve_lyapunov(a: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The solution x of a x + x a^H = q (continuous time).

    Parameters
    ----------
    a, q : array_like
        Square matrices of the same order.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a matrix is not square, or a and -a^H have a common eigenvalue.
    ValueError
        If q does not fit.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.solve_lyapunov([[-1.0]], [[-2.0]])
    array([[1.]])
    """
    a, q = _matrix("linalg.solve_lyapunov", a, True), _matrix("linalg.solve_lyapunov", q, True, "q")
    return _served("solve_lyapunov", a, q)(a, q, 0)


def solve_discrete_lyapunov(a: ArrayLike, q: ArrayLike) -> NDArray[Any]:
    """The solution x of a x a^H - x + q = 0 (discrete time).

    Parameters
    ----------
    a, q : array_like
        Square matrices of the same order.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a matrix is not square, or the product of two eigenvalues of a is 1.
    ValueError
        If q does not fit.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.solve_discrete_lyapunov([[0.5]], [[3.0]])
    array([[4.]])
    """
    a = _matrix("linalg.solve_discrete_lyapunov", a, True)
    q = _matrix("linalg.solve_discrete_lyapunov", q, True, "q")
    return _served("solve_lyapunov", a, q)(a, q, 1)


def solve_banded(bands: tuple[int, int], ab: ArrayLike, b: ArrayLike) -> NDArray[Any]:
    """The solution x of a x = b for a banded matrix.

    Parameters
    ----------
    bands : (int, int)
        The numbers of diagonals below and above the main diagonal.
    ab : array_like
        The diagonals in rows, the topmost first: a[i, j] is at row u + i - j, column j, with u diagonals
        above the main one.
    b : array_like
        A vector, or a matrix with one right-hand side in each column.

    Returns
    -------
    ndarray
        The same shape as b.

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is singular.
    ValueError
        If the sizes disagree.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.solve_banded((0, 1), [[0.0, 1.0], [1.0, 1.0]], [3.0, 2.0])
    array([1., 2.])
    """
    if np.shape(bands) != (2,):
        refuse("linalg.solve_banded", "bands", f"the numbers of diagonals below and above are needed; got {bands!r}",
               "ErrSizesDisagree")
    below, above = (whole_number("linalg.solve_banded", "bands", one, 0, "ErrNegativeCount") for one in bands)
    ab, b = _matrix("linalg.solve_banded", ab, argument="ab"), as_array(b)
    if b.ndim == 1:
        return _served("solve_banded", ab, b)(ab, b, below, above)
    return _served("solve_banded_many", ab, b)(ab, b, below, above)


def charpoly(a: ArrayLike) -> NDArray[Any]:
    """The coefficients of the characteristic polynomial det(t I - a), the constant first.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    ndarray

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.charpoly([[1.0, 0.0], [0.0, 2.0]]).round(12)
    array([ 2., -3.,  1.])
    """
    return _each(lambda a: _served("charpoly", a)(a), _matrix("linalg.charpoly", a, True))


def is_positive_definite(a: ArrayLike) -> bool:
    """Whether a matrix is exactly symmetric (Hermitian) and all its eigenvalues are above 0.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    bool

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.is_positive_definite([[2.0, 1.0], [1.0, 2.0]])
    True
    """
    return bool(_served("is_positive_definite", _matrix("linalg.is_positive_definite", a, True))(as_array(a)))


def is_positive_semidefinite(a: ArrayLike, tolerance: float | None = None) -> bool:
    """Whether a matrix is symmetric (Hermitian) and has no eigenvalue below 0, within a tolerance, by
    symmetric elimination with diagonal pivoting.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.
    tolerance : float, optional
        The tolerance, relative to the largest diagonal element; 2.2e-16 times the order by default.

    Returns
    -------
    bool

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite, or the tolerance is negative.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.is_positive_semidefinite([[1.0, 1.0], [1.0, 1.0]])
    True
    """
    a = _matrix("linalg.is_positive_semidefinite", a, True)
    if tolerance is not None and not tolerance >= 0:
        refuse("linalg.is_positive_semidefinite", "tolerance", f"must not be negative; got {tolerance}",
               "ErrNegativeSetting")
    return bool(_served("is_positive_semidefinite", a)(a, -1.0 if tolerance is None else float(tolerance))[0])


def from_eigenvalues(values: ArrayLike) -> NDArray[np.float64]:
    r"""A full symmetric matrix that has the given eigenvalues, for tests.

    .. math:: Q \operatorname{diag}(\lambda)\, Q, \quad Q = 1 - \frac{2}{n} e e^T

    Parameters
    ----------
    values : array_like
        The eigenvalues, real.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If there are no values.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.eigvalsh(qx.linalg.from_eigenvalues([3.0, 1.0, 2.0])).round(12)
    array([1., 2., 3.])
    """
    return core.from_eigenvalues(as_array(values))


def is_symmetric(a: ArrayLike, tolerance: float = 0.0) -> bool:
    """Whether a matrix is symmetric (Hermitian, if it is complex) within a tolerance.

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.
    tolerance : float
        The largest difference allowed between elements.

    Returns
    -------
    bool

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.is_symmetric([[1.0, 2.0], [2.0, 1.0]])
    True
    """
    a = _matrix("linalg.is_symmetric", a, True)
    more = (1,) if a.dtype.kind == "c" else ()
    return bool(_served("is_symmetric", a)(a, float(tolerance), 0, *more))


def balance(a: ArrayLike) -> tuple[NDArray[Any], NDArray[Any]]:
    """Balances a square matrix for the computation of eigenvalues: rows and columns are permuted and scaled
    by powers of two (B. N. Parlett and C. Reinsch, 1969).

    Parameters
    ----------
    a : array_like
        A square matrix, real or complex.

    Returns
    -------
    two ndarrays
        The balanced matrix, and t with a t = t balanced.

    Raises
    ------
    numpy.linalg.LinAlgError
        If a is not square.
    ValueError
        If a is empty or has an element that is not finite.

    Examples
    --------
    >>> import qx
    >>> balanced, t = qx.linalg.balance([[1.0, 1024.0], [0.0009765625, 1.0]])
    >>> balanced
    array([[1., 1.],
           [1., 1.]])
    """
    a = _matrix("linalg.balance", a, True)
    balanced, low, high, scale = _served("balance", a)(a, 3)
    return balanced, _served("balance_back", a)(3, 0, low, high, scale, np.eye(len(a)))


@result
class GSVD(Result):
    """A generalised singular value decomposition of a and b.

    Attributes
    ----------
    alpha, beta : ndarray
        The generalised singular values are alpha / beta; alpha^2 + beta^2 = 1.
    u, v, q : ndarray
        A unitary matrix.
    rank : int
        The rank of a and b together.
    """

    alpha: NDArray[Any]
    beta: NDArray[Any]
    u: NDArray[Any]
    v: NDArray[Any]
    q: NDArray[Any]
    rank: int


def gsvd(a: ArrayLike, b: ArrayLike) -> GSVD:
    """The generalised singular values of two matrices with the same number of columns.

    Parameters
    ----------
    a, b : array_like
        Matrices.

    Returns
    -------
    GSVD

    Raises
    ------
    ValueError
        If a matrix is empty, or the numbers of columns differ.

    Examples
    --------
    >>> import qx
    >>> found = qx.linalg.gsvd([[3.0, 0.0], [0.0, 1.0]], [[1.0, 0.0], [0.0, 1.0]])
    >>> (found.alpha / found.beta).round(9)
    array([3., 1.])
    """
    a, b = _matrix("linalg.gsvd", a), _matrix("linalg.gsvd", b, argument="b")
    if a.shape[-1] != b.shape[-1]:
        refuse("linalg.gsvd", "b", f"must have as many columns as a, {a.shape[-1]}; got {b.shape[-1]}",
               "ErrSizesDisagree")
    _, _, alpha, beta, u, v, q, k, rank_b = _served("gsvd", a, b)(a, b)
    return GSVD(alpha[:k + rank_b], beta[:k + rank_b], u, v, q, k + rank_b)


def kron(a: ArrayLike, b: ArrayLike) -> NDArray[Any]:
    """The Kronecker product of two matrices.

    Parameters
    ----------
    a, b : array_like
        Matrices.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If a matrix is empty.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.kron([[1.0, 2.0]], [[1.0], [1.0]])
    array([[1., 2.],
           [1., 2.]])
    """
    a, b = _matrix("linalg.kron", a), _matrix("linalg.kron", b, argument="b")
    return _served("kron", a, b)(a, b)


def toeplitz(c: ArrayLike, r: ArrayLike | None = None) -> NDArray[Any]:
    """The matrix with constant diagonals.

    Parameters
    ----------
    c : array_like
        The first column.
    r : array_like, optional
        The first row, of which the first element is not read; the conjugate of c by default.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If c is empty.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.toeplitz([1.0, 2.0, 3.0])
    array([[1., 2., 3.],
           [2., 1., 2.],
           [3., 2., 1.]])
    """
    c = vector(c, "linalg.toeplitz", "c")
    r = c.conj() if r is None else vector(r, "linalg.toeplitz", "r")
    return _served("toeplitz", c, r)(2, len(c), c, r)


def companion(p: ArrayLike) -> NDArray[Any]:
    """The companion matrix of a polynomial, whose eigenvalues are its roots.

    Parameters
    ----------
    p : array_like
        Coefficients, the highest power first, as for `scipy.linalg.companion`.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If there are fewer than two coefficients.

    Examples
    --------
    >>> import qx
    >>> qx.linalg.companion([1.0, -3.0, 2.0])
    array([[ 3., -2.],
           [ 1.,  0.]])
    """
    p = as_array(p)
    return _served("toeplitz", p)(4, len(p), p, p[:0])
