"""The common interface of everything that works block by block.

A stream is called with successive blocks of any size, and returns the output for each. The outputs of all
blocks together have the same bits as the output for a single block (docs/guides/streams.md has the two
exceptions). `reset()` starts afresh, `copy()`
returns an independent stream in the same state, and `finish()` returns the output that is still pending at
the end of the signal. Streams can be pickled.
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
    """The base of streams. A subclass defines `_start()`, which returns the state of a channel before its
    first value, `_step(state, block)`, which returns the output and the next state without changing the
    given one, and `_end(state)`, if output is pending at the end.

    Parameters
    ----------
    channels : int, optional
        The number of channels of two-dimensional blocks. Without it, blocks have one dimension.
    axis : int
        The axis of the samples in a block.
    dtype : type
        The type of the samples: `float` or `complex`, and where the core supports them also
        `numpy.float32` and `numpy.complex64`.
    """

    dtypes: ClassVar[tuple[np.dtype[Any], ...]] = (np.dtype(float), np.dtype(complex))
    _output: Any = None  # the type of the results, if it differs from that of the samples

    def __init__(self, channels: int | None = None, axis: int = -1, dtype: DTypeLike = float) -> None:
        self.channels, self.axis, self.dtype = channels, axis, np.dtype(dtype)
        if self.dtype not in self.dtypes:
            known = ", ".join(str(one) for one in self.dtypes)
            raise ValueError(f"{type(self).__name__}: dtype: {self.dtype} is not one of {known}")
        if channels is not None and channels < 1:
            raise ValueError(f"{type(self).__name__}: channels: must be at least 1; got {channels}")
        if axis not in (-2, -1, 0, 1):
            raise ValueError(f"{type(self).__name__}: axis: {axis} is out of bounds for a block")
        self._last = axis in (-1, 1)  # whether the samples are along the last axis
        self.reset()

    def _start(self) -> Any:
        return None

    def _step(self, state: Any, block: NDArray[Any]) -> Any:
        raise NotImplementedError

    def _end(self, state: Any) -> Any:
        return np.empty(0, self._output or self.dtype)

    def reset(self) -> None:
        """Discards all blocks so far."""
        self._states = [self._start() for _ in range(self.channels or 1)]

    def copy(self) -> Self:
        """An independent stream in the same state."""
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
        """Returns the output that is pending at the end of the signal. The stream starts afresh."""
        found = [self._end(state) for state in self._states]
        self.reset()
        return found[0] if self.channels is None else self._joined(found)

    def _checked(self, block: ArrayLike, dimensions: int) -> NDArray[Any]:
        array = as_array(block)
        if array.ndim != dimensions:
            raise ValueError(f"{type(self).__name__}: blocks of {dimensions} dimension"
                             f"{'s'[:dimensions - 1]} are needed; got {array.ndim}")
        if array.dtype != self.dtype and not np.can_cast(array.dtype, self.dtype, "same_kind"):
            raise TypeError(f"{type(self).__name__}: samples of {self.dtype} are needed; got {array.dtype}; "
                            "pass the dtype when creating the stream")
        if dimensions == 2 and array.shape[int(not self._last)] != self.channels:
            raise ValueError(f"{type(self).__name__}: blocks of {self.channels} channels are needed; "
                             f"got {array.shape[int(not self._last)]}")
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
