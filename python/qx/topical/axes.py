"""Functions of one channel over arrays of any dimension.

The values along one axis form a channel; the other axes number the channels. Each channel is processed by
a separate call, so its results have the same bits as if it were alone. Where there is enough work, channels
are processed in threads, which run in parallel while they are inside the exports.
"""

from __future__ import annotations

import math
import operator
import os
import threading
from concurrent.futures import ThreadPoolExecutor
from collections.abc import Callable, Sequence
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from ..outcomes import QxError, at, keeping, named, warn

Channel = Callable[[NDArray[Any]], Any]  # a function of one channel

ENOUGH = 1 << 15  # number of elements from which threads pay off
LARGE = 1 << 16  # bytes of a result from which it is copied into its row immediately


class _Last(int):
    """The default axis: the last one; for a pandas table, the rows, so that its columns are the channels."""

    def __repr__(self) -> str:
        return "-1"

    def __reduce__(self) -> str:
        return "LAST"


LAST = _Last(-1)


class _Workers:
    """The worker threads, created when they are first needed; a forked process creates its own."""

    def __init__(self) -> None:
        self.begin()

    def begin(self) -> None:
        self.pool: ThreadPoolExecutor | None = None
        self.lock, self.here = threading.Lock(), threading.local()

    def is_one(self) -> bool:
        """Whether this thread is a worker, which must not wait for other workers."""
        return bool(getattr(self.here, "is_worker", False))

    def _begin(self) -> None:
        self.here.is_worker = True

    def get(self) -> ThreadPoolExecutor:
        with self.lock:
            if self.pool is None:
                self.pool = ThreadPoolExecutor(processors(), "qx", self._begin)
            return self.pool


_workers = _Workers()
if hasattr(os, "register_at_fork"):
    os.register_at_fork(after_in_child=_workers.begin)


def processors() -> int:
    """The number of processors that this process may use."""
    return len(os.sched_getaffinity(0)) if hasattr(os, "sched_getaffinity") else os.cpu_count() or 1


def many(function: Callable[[Any], Any], channels: Sequence[Any] | NDArray[Any], size: int) -> list[Any]:
    """The results of the function for each channel, in order. The channels have `size` elements in all."""
    if len(channels) < 2 or size < ENOUGH or processors() < 2 or _workers.is_one():
        return [function(channel) for channel in channels]
    try:
        done = list(_workers.get().map(lambda channel: keeping(function, channel), channels))
    except (QxError, TypeError, ValueError) as error:
        raise named(error) from None
    given = {(warning.export, warning.code): warning for _, kept in done for warning in kept}
    for warning in given.values():
        warn(warning)
    return [found for found, _ in done]


def is_pandas(x: object) -> bool:
    return type(x).__module__.partition(".")[0] == "pandas" and hasattr(x, "iloc")


def as_array(x: ArrayLike) -> NDArray[Any]:
    """x as an array of numbers. Masked values are refused, since no export takes a mask."""
    if type(x) is np.ndarray:
        return x
    if isinstance(x, np.ma.MaskedArray) and np.ma.is_masked(x):
        raise ValueError(f"{at('x')}: {np.ma.count_masked(x)} elements are masked: fill or compress the array")
    return np.asarray(x)


def vector(x: ArrayLike, function: str, argument: str) -> NDArray[Any]:
    """x as a one-dimensional array, for functions without an axis."""
    array = as_array(x)
    if array.ndim != 1:
        raise ValueError(f"qx.{function}: {argument}: one dimension is needed; got {array.ndim}")
    return array


def along(function: Channel, x: ArrayLike, axis: int = LAST) -> Any:
    """Applies a function of one channel to all channels of x along the axis.

    The result takes the place of the channel. It is an array of any length, a number, which removes the
    axis, or a tuple of these, for which a tuple is returned.
    """
    if type(x) is np.ndarray and x.ndim == 1 and axis is LAST:
        return function(x)
    if is_pandas(x):
        return _of_pandas(function, x, axis)
    return _along(function, as_array(x), axis)


def _check_axis(dimensions: int, axis: int) -> None:
    if not dimensions:
        raise ValueError(f"{at('x')}: an array of at least one dimension is needed; got a single value")
    try:
        place = operator.index(axis)
    except TypeError:
        raise TypeError(f"{at('axis')}: a whole number is needed; got {axis!r}") from None
    if not -dimensions <= place < dimensions:
        raise ValueError(f"{at('axis')}: {place} is out of bounds for an array of {dimensions} "
                         f"dimension{'s'[:dimensions - 1]}")


def _flat(x: NDArray[Any], axis: int) -> tuple[NDArray[Any], NDArray[Any]]:
    """The channels as rows, and x with the axis moved to the end."""
    moved = np.moveaxis(x, axis, -1)
    flat = moved.reshape(math.prod(moved.shape[:-1]), moved.shape[-1])
    if not len(flat):
        raise ValueError(f"{at('x')}: an array of shape {x.shape} has no channel along axis {int(axis)}")
    return flat, moved


def _along(function: Channel, x: NDArray[Any], axis: int) -> Any:
    _check_axis(x.ndim, axis)
    if x.ndim == 1:
        return function(x)
    flat, moved = _flat(x, axis)
    rows = _Rows(len(flat))
    found = many(lambda i: rows.kept(i, function(flat[i])), range(len(flat)), x.size)
    shape, place = moved.shape[:-1], axis % x.ndim
    if isinstance(found[0], tuple):
        return tuple(_together(rows.whole(which, parts), shape, place) for which, parts in enumerate(zip(*found)))
    return _together(rows.whole(0, found), shape, place)


class _Rows:
    """Collects the large results of channels in one array. Each is copied into its row as soon as it is
    computed, while it is in the processor's cache, and its memory is reused for the next channel. The first
    result determines the shape of the rows; results of another shape are kept as they are."""

    def __init__(self, count: int) -> None:
        self.count, self.lock = count, threading.Lock()
        self.arrays: dict[int, NDArray[Any]] = {}  # by the position in a tuple
        self.filled: dict[int, int] = {}  # the number of rows filled

    def kept(self, i: int, found: Any) -> Any:
        """The result of channel i, moved into its row where it fits."""
        if isinstance(found, tuple):
            return tuple(self._row(i, place, part) for place, part in enumerate(found))
        return self._row(i, 0, found)

    def _row(self, i: int, place: int, found: Any) -> Any:
        if type(found) is not np.ndarray or found.ndim != 1 or found.nbytes < LARGE:
            return found
        with self.lock:
            array = self.arrays.get(place)
            if array is None:
                array = self.arrays[place] = np.empty((self.count, len(found)), found.dtype)
            if len(found) != array.shape[1] or found.dtype != array.dtype:
                return found
            self.filled[place] = self.filled.get(place, 0) + 1
        array[i] = found
        return array[i]

    def whole(self, place: int, parts: Sequence[Any]) -> Sequence[Any] | NDArray[Any]:
        """The array of all results, or the separate results if some are not in it."""
        return self.arrays[place] if self.filled.get(place) == self.count else parts


def by_channel(function: Channel, x: ArrayLike, axis: int = LAST) -> Any:
    """The result of the function for one channel; for several channels, a list of the results, nested where
    x has more than two dimensions. The channels of a pandas table are its columns."""
    if is_pandas(x):
        axis = 0 if axis is LAST else axis
    x = as_array(x)
    if x.ndim == 1 and axis in (-1, 0):
        return function(x)
    _check_axis(x.ndim, axis)
    flat, moved = _flat(x, axis)
    found = many(function, flat, x.size)
    for count in moved.shape[-2:0:-1]:
        found = [found[first:first + count] for first in range(0, len(found), count)]
    return found


def along_pairs(function: Callable[[NDArray[Any], NDArray[Any]], float], x: ArrayLike, y: ArrayLike,
                axis: int = LAST) -> Any:
    """The number that the function returns for each pair of channels of x and y. The channels are broadcast
    against each other, and may differ in length."""
    places = [0 if axis is LAST and is_pandas(one) else axis for one in (x, y)]
    arrays = [as_array(one) for one in (x, y)]
    for one, place in zip(arrays, places):
        _check_axis(one.ndim, 0 if one.ndim == 1 else place)  # a single channel has one axis
    moved = [one if one.ndim == 1 else np.moveaxis(one, place, -1) for one, place in zip(arrays, places)]
    shape = np.broadcast_shapes(*(one.shape[:-1] for one in moved))
    rows = [np.broadcast_to(one, (*shape, one.shape[-1])).reshape(math.prod(shape), one.shape[-1]) for one in moved]
    found = many(lambda pair: function(*pair), [*zip(*rows)], sum(row.size for row in rows))
    return np.array(found).reshape(shape) if shape else found[0]


def _together(parts: Sequence[Any] | NDArray[Any], shape: tuple[int, ...], place: int) -> NDArray[Any]:
    """The results of all channels as one array, with the results of a channel along the axis `place`."""
    first = np.asarray(parts[0])
    if not isinstance(parts, np.ndarray) and any(np.shape(part) != first.shape for part in parts):
        together = np.empty(len(parts), object)
        together[:] = parts
        return together.reshape(shape)
    whole = parts if isinstance(parts, np.ndarray) else np.stack(parts)
    together = whole.reshape(*shape, *first.shape)
    return np.moveaxis(together, -1, place) if first.ndim == 1 else together


def either(real: Channel, of_complex: Channel, x: Any, axis: int = LAST) -> Any:
    """along(), with the function for real or for complex channels, depending on the type of x."""
    if type(x) is np.ndarray and x.ndim == 1 and axis is LAST:
        return of_complex(x) if x.dtype.kind == "c" else real(x)
    if type(x) is not np.ndarray and not is_pandas(x):
        x = as_array(x)
    kind = x.dtype.kind if type(x) is np.ndarray else x.to_numpy().dtype.kind
    return along(of_complex if kind == "c" else real, x, axis)


def count_of(x: ArrayLike, axis: int = LAST) -> int:
    """The number of values in a channel."""
    shape = np.shape(x)
    _check_axis(len(shape), axis)
    return shape[0 if axis is LAST and is_pandas(x) else axis]


# pandas

def _of_pandas(function: Channel, x: Any, axis: int) -> Any:
    """Series and tables. They keep their index where the number of values is unchanged, and always keep their
    columns."""
    place = 0 if axis is LAST else axis % x.ndim
    found = _along(function, as_array(x.to_numpy()), place)
    if isinstance(found, tuple):
        return tuple(_dressed(part, x, place) for part in found)
    return _dressed(found, x, place)


def _dressed(values: Any, x: Any, place: int) -> Any:
    import pandas
    if np.ndim(values) == 0:
        return values
    if x.ndim == 1:
        index = x.index if len(values) == len(x) else None
        return pandas.Series(values, index, name=x.name)
    if values.ndim == 1:  # one number for each channel
        return pandas.Series(values, x.index if place else x.columns)
    rows = x.index if place or len(values) == len(x) else None
    columns = x.columns if not place or values.shape[1] == x.shape[1] else None
    return pandas.DataFrame(values, rows, columns)
