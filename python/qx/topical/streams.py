"""One protocol for all that runs on blocks.

A stream is called with blocks of any size, one after the other, and returns what they give. All blocks
together give the bits of one piece. `reset()` begins anew, `copy()` is a stream that goes on from here
by itself, `finish()` returns what is still to come when the signal has ended. Streams can be pickled.
"""

from __future__ import annotations

import copy
from typing import TYPE_CHECKING, Any, ClassVar

import numpy as np
from numpy.typing import ArrayLike, DTypeLike, NDArray

from .axes import as_array, many

if TYPE_CHECKING:
    from typing_extensions import Self


class Stream:
    """A subclass has `_start()`, the state of a channel before its first value, and
    `_step(state, block)`, which returns the output and the next state and leaves the given one as it
    is; `_end(state)` where something is left at the end.

    Parameters
    ----------
    channels : int, optional
        Blocks have two dimensions with so many channels. Without it they have one.
    axis : int
        The axis of a block along which the samples are.
    dtype : type
        Of the samples: `float` or `complex`; where the core has them also `numpy.float32` and
        `numpy.complex64`.
    """

    dtypes: ClassVar[tuple[np.dtype[Any], ...]] = (np.dtype(float), np.dtype(complex))
    _output: Any = None  # the type of the results where it is another one

    def __init__(self, channels: int | None = None, axis: int = -1, dtype: DTypeLike = float) -> None:
        self.channels, self.axis, self.dtype = channels, axis, np.dtype(dtype)
        if self.dtype not in self.dtypes:
            known = ", ".join(str(one) for one in self.dtypes)
            raise ValueError(f"{type(self).__name__}: dtype: {self.dtype} is none of {known}")
        if channels is not None and channels < 1:
            raise ValueError(f"{type(self).__name__}: channels: must be at least 1; {channels} came")
        if axis not in (-2, -1, 0, 1):
            raise ValueError(f"{type(self).__name__}: axis: {axis} is none of a block")
        self._last = axis in (-1, 1)  # the samples are along the last axis
        self.reset()

    def _start(self) -> Any:
        return None

    def _step(self, state: Any, block: NDArray[Any]) -> Any:
        raise NotImplementedError

    def _end(self, state: Any) -> Any:
        return np.empty(0, self._output or self.dtype)

    def reset(self) -> None:
        """Forgets all blocks so far."""
        self._states = [self._start() for _ in range(self.channels or 1)]

    def copy(self) -> Self:
        """A stream that has seen the same blocks and goes on by itself."""
        other = copy.copy(self)
        other._states = list(self._states)  # no state is changed in place
        return other

    def __call__(self, block: ArrayLike) -> Any:
        if self.channels is None:
            if type(block) is not np.ndarray or block.dtype is not self.dtype or block.ndim != 1:
                block = self._checked(block, 1)
            if not len(block):
                return np.empty(0, self._output or self.dtype)
            found, self._states[0] = self._step(self._states[0], block)
            return found
        return self._through(self._checked(block, 2))

    def finish(self) -> Any:
        """What is still to come when the signal has ended; begins anew."""
        found = [self._end(state) for state in self._states]
        self.reset()
        return found[0] if self.channels is None else self._joined(found)

    def _checked(self, block: ArrayLike, dimensions: int) -> NDArray[Any]:
        array = as_array(block)
        if array.ndim != dimensions:
            raise ValueError(f"{type(self).__name__}: blocks of {dimensions} dimension"
                             f"{'s'[:dimensions - 1]} are needed; {array.ndim} came")
        if array.dtype != self.dtype and not np.can_cast(array.dtype, self.dtype, "same_kind"):
            raise TypeError(f"{type(self).__name__}: samples of {self.dtype} are needed; {array.dtype} "
                            "came: name the dtype when the stream is made")
        if dimensions == 2 and array.shape[int(not self._last)] != self.channels:
            raise ValueError(f"{type(self).__name__}: blocks of {self.channels} channels are needed; "
                             f"{array.shape[int(not self._last)]} came")
        return array.astype(self.dtype, copy=False)

    def _through(self, block: NDArray[Any]) -> Any:
        rows = block if self._last else block.T
        if not rows.shape[1]:
            return self._joined([np.empty(0, self._output or self.dtype)] * len(rows))
        found = many(lambda i: self._step(self._states[i], rows[i]), range(len(rows)), block.size)
        self._states = [state for _, state in found]
        return self._joined([output for output, _ in found])

    def _joined(self, outputs: list[Any]) -> Any:
        return np.stack(outputs, 0 if self._last else 1)
