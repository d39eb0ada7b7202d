"""Rotations of the coordinate system, Euler angles, and Cartesian, spherical and cylindrical coordinates.

Angles are in radians. The coordinate system is rotated and the points stay where they are: after a rotation
by a positive angle about Z, the point (1, 0, 0) has a negative y. Three Euler angles rotate the system three
times, each time about an axis of the system as rotated so far; the direction matrix is
:math:`R = R_3 R_2 R_1`.
"""

from __future__ import annotations

from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import Result, chosen, refuse, result, served

__all__ = ["EulerAngles", "convert", "euler_to_matrix", "matrix_to_euler", "rotate", "rotate2",
           "rotate_euler"]

core = served("coordinates")

SEQUENCES = {name: code for code, name in enumerate(
    ("XYX", "XYZ", "XZX", "XZY", "YXY", "YXZ", "YZX", "YZY", "ZXY", "ZXZ", "ZYX", "ZYZ"))}
KINDS = {"cartesian": 0, "spherical": 1, "cylindrical": 2}


@result
class EulerAngles(Result):
    """Three Euler angles in radians, in the order in which the system is rotated.

    Attributes
    ----------
    angle1, angle2, angle3 : float
        The angles about the first, second and third axis of the sequence.
    """

    angle1: float
    angle2: float
    angle3: float


def _points(function: Any, *coordinates: Any) -> Any:
    """The coordinates of points as one-dimensional arrays, and their common shape."""
    arrays = np.broadcast_arrays(*(np.asarray(one, float) for one in coordinates))
    return [one.ravel() for one in arrays], arrays[0].shape


def _shaped(found: Any, shape: Any) -> Any:
    return tuple(one.reshape(shape)[()] for one in found)


def rotate2(x: ArrayLike, y: ArrayLike, angle: float) -> tuple[Any, Any]:
    r"""Coordinates of points of the plane in a system rotated by an angle.

    .. math:: x' = x \cos\alpha + y \sin\alpha,\quad y' = y \cos\alpha - x \sin\alpha

    Parameters
    ----------
    x, y : float or array_like
        Coordinates of points, of any shape.
    angle : float
        The angle, in radians.

    Returns
    -------
    x, y

    Raises
    ------
    ValueError
        If a number is not finite.

    Examples
    --------
    >>> import qx
    >>> [round(one, 12) for one in qx.coordinates.rotate2(1.0, 0.0, 3.141592653589793 / 2)]
    [0.0, -1.0]
    """
    given, shape = _points("rotate2", x, y)
    return _shaped(core.rotate2(*given, float(angle)), shape)


def rotate(x: ArrayLike, y: ArrayLike, z: ArrayLike, direction: ArrayLike) -> tuple[Any, Any, Any]:
    """Coordinates of points of space in the system given by a direction matrix.

    Parameters
    ----------
    x, y, z : float or array_like
        Coordinates of points, of any shape.
    direction : array_like
        A 3-by-3 rotation; the nearest rotation is used.

    Returns
    -------
    x, y, z

    Raises
    ------
    ValueError
        If the matrix is not a 3-by-3 rotation, or a number is not finite.

    Examples
    --------
    >>> import qx
    >>> qx.coordinates.rotate(1.0, 2.0, 3.0, [[0, 1, 0], [-1, 0, 0], [0, 0, 1]])
    (2.0, -1.0, 3.0)
    """
    given, shape = _points("rotate", x, y, z)
    return _shaped(core.rotate(*given, np.asarray(direction, float)), shape)


def rotate_euler(x: ArrayLike, y: ArrayLike, z: ArrayLike, angles: tuple[float, float, float],
                 sequence: str = "ZYX") -> tuple[Any, Any, Any]:
    """Coordinates of points of space in the system rotated by three Euler angles.

    Parameters
    ----------
    x, y, z : float or array_like
        Coordinates of points, of any shape.
    angles : (float, float, float)
        The angles in radians, in the order of the rotations.
    sequence : str
        The axes of the three rotations: XYX, XYZ, XZX, XZY, YXY, YXZ, YZX, YZY, ZXY, ZXZ, ZYX or ZYZ. ZYX is
        yaw, pitch and roll.

    Returns
    -------
    x, y, z

    Raises
    ------
    ValueError
        If there are not three angles, a number is not finite, or sequence is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> [round(one, 12) for one in qx.coordinates.rotate_euler(1.0, 0.0, 0.0, (3.141592653589793 / 2, 0, 0))]
    [0.0, -1.0, 0.0]
    """
    code = chosen("coordinates.rotate_euler", "sequence", sequence, SEQUENCES)
    given, shape = _points("rotate_euler", x, y, z)
    return _shaped(core.rotate_euler(*given, *_three("rotate_euler", angles), code), shape)


def _three(function: Any, angles: Any) -> Any:
    given = [float(angle) for angle in angles]
    if len(given) != 3:
        refuse(f"coordinates.{function}", "angles", f"three angles are needed; got {len(given)}", "ErrSizesDisagree")
    return given


def euler_to_matrix(angles: tuple[float, float, float], sequence: str = "ZYX") -> NDArray[Any]:
    """The direction matrix of three Euler angles.

    Parameters
    ----------
    angles : (float, float, float)
        The angles in radians, in the order of the rotations.
    sequence : str
        The axes of the three rotations: XYX, XYZ, XZX, XZY, YXY, YXZ, YZX, YZY, ZXY, ZXZ, ZYX or ZYZ. ZYX is
        yaw, pitch and roll.

    Returns
    -------
    ndarray
        The 3-by-3 rotation.

    Raises
    ------
    ValueError
        If there are not three angles, one is not finite, or sequence is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.coordinates.euler_to_matrix((3.141592653589793 / 2, 0, 0)).round(12) + 0.0
    array([[ 0.,  1.,  0.],
           [-1.,  0.,  0.],
           [ 0.,  0.,  1.]])
    """
    code = chosen("coordinates.euler_to_matrix", "sequence", sequence, SEQUENCES)
    return core.euler_to_matrix(*_three("euler_to_matrix", angles), code)


def matrix_to_euler(direction: ArrayLike, sequence: str = "ZYX") -> EulerAngles:
    """The Euler angles of a direction matrix. At gimbal lock, where only the sum or the difference of two
    angles is determined, the third one is 0.

    Parameters
    ----------
    direction : array_like
        A 3-by-3 rotation.
    sequence : str
        The axes of the three turns: XYX, XYZ, XZX, XZY, YXY, YXZ, YZX, YZY, ZXY, ZXZ, ZYX or ZYZ. ZYX is
        yaw, pitch and roll.

    Returns
    -------
    EulerAngles

    Raises
    ------
    ValueError
        If the matrix is not a 3-by-3 rotation, or sequence is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.coordinates.matrix_to_euler([[0, 1, 0], [-1, 0, 0], [0, 0, 1]])
    EulerAngles
      angle1  1.5708
      angle2  -0
      angle3  -0
    """
    code = chosen("coordinates.matrix_to_euler", "sequence", sequence, SEQUENCES)
    return EulerAngles(*core.matrix_to_euler(np.asarray(direction, float), code))


def convert(first: ArrayLike, second: ArrayLike, third: ArrayLike,
            source: Literal["cartesian", "spherical", "cylindrical"],
            target: Literal["cartesian", "spherical", "cylindrical"]) -> tuple[Any, Any, Any]:
    """Converts coordinates of points between Cartesian (x, y, z), spherical (radius, azimuth, inclination
    from the positive z axis) and cylindrical (radius, azimuth, height).

    Parameters
    ----------
    first, second, third : float or array_like
        Coordinates of points, of any shape.
    source, target : {"cartesian", "spherical", "cylindrical"}
        The kind of the given coordinates, and the kind to return.

    Returns
    -------
    three floats or ndarrays
        Radii of at least 0, azimuths above -pi to pi, inclinations from 0 to pi.

    Raises
    ------
    ValueError
        If a number is not finite, or a kind is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> [round(one, 6) for one in qx.coordinates.convert(0.0, 2.0, 0.0, "cartesian", "spherical")]
    [2.0, 1.570796, 1.570796]
    """
    codes = [chosen("coordinates.convert", name, kind, KINDS) for name, kind in
             (("source", source), ("target", target))]
    given, shape = _points("convert", first, second, third)
    return _shaped(core.convert(*codes, *given), shape)
