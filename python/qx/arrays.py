"""Converts NumPy arrays to host blocks, and host blocks to NumPy arrays.

An array is copied once into a block. A large block is returned as a NumPy view of it, without a copy. The
view keeps the block alive, and is passed to a later call as an input without a copy. The blocks of small
arrays are kept for the next call and their contents are copied out, which costs less than creating a block
and a view.
"""

import ctypes
import functools
import math

import numpy as np

from .library import library
from .outcomes import at

TYPE_CODES = {"I32": 3, "U8": 5, "U32": 7, "SGL": 9, "DBL": 10, "CSG": 12, "CDB": 13}
DTYPES = {"I32": np.dtype(np.int32), "U8": np.dtype(np.uint8), "U32": np.dtype(np.uint32),
          "SGL": np.dtype(np.float32), "DBL": np.dtype(np.float64), "CSG": np.dtype(np.complex64),
          "CDB": np.dtype(np.complex128)}
LARGEST = 2**31 - 1  # most elements of a block
SMALL = 16384  # bytes up to which a block is kept
KEPT_SHAPES, KEPT_PER_SHAPE = 32, 4


@functools.lru_cache(maxsize=None)
def element_dtype(element):
    """The NumPy type of an element; records have their natural C layout."""
    if element in DTYPES:
        return DTYPES[element]
    fields = library().records[element]["fields"]
    if any("element" not in field or "count" in field for field in fields):
        raise TypeError(f"records of type {element} hold more than plain numbers")
    return np.dtype([(field["name"], DTYPES[field["element"]]) for field in fields], align=True)


def came(value):
    """The description, for a message, of a value that was passed instead of an array."""
    if isinstance(value, np.ndarray):
        return f"{value.ndim} of {value.dtype}"
    if isinstance(value, (list, tuple)):
        return f"a {type(value).__name__} of {len(value)}"
    return f"{str(value)[:40]!r} ({type(value).__name__})"


class _Memory:
    """Exposes memory to NumPy without owning it."""

    __slots__ = ("__array_interface__",)
    __array_interface__: dict


class Block:
    """A host array, which owns a handle. `shape` and `elements`, a view of a small block that does not leave
    the package, are valid until a call has the block as an output; then show() must be called."""

    __slots__ = ("handle", "kind", "address", "shown", "sizes", "dims", "shape", "small", "elements",
                 "_free", "__weakref__")

    def __init__(self, handle, kind):
        if not handle:
            raise MemoryError("the host has no memory for an array of this size")
        self.handle, self.kind = handle, kind
        self._free = library().host.QXHostFree
        self.address = ctypes.c_void_p.from_address(handle)
        self.show()

    def __del__(self):
        if hasattr(self, "_free"):
            self._free(self.handle)

    def show(self):
        self.shown = self.address.value
        self.sizes = self.kind.fields.from_address(self.shown)
        self.dims = self.sizes[:]
        self.shape = tuple(self.dims)
        interface = self.__array_interface__
        self.small = math.prod(self.shape) * self.kind.dtype.itemsize <= SMALL
        self.elements = None
        if self.small:
            memory = _Memory()
            memory.__array_interface__ = interface
            self.elements = np.asarray(memory)

    def is_shown(self):
        return self.address.value == self.shown and self.sizes[:] == self.dims

    @property
    def __array_interface__(self):
        kind = self.kind
        return {"version": 3, "shape": self.shape, "typestr": kind.dtype.str,
                "descr": kind.dtype.descr, "data": (self.shown + 4 * kind.dimensions, False)}


class Kind:
    """The arrays of one element type and number of dimensions, with the blocks that are kept. Operations on
    lists and dictionaries are atomic under the interpreter's lock, so threads can share them."""

    def __init__(self, element, dimensions):
        self.element, self.dimensions = element, dimensions
        self.dtype = element_dtype(element)
        self.fields = ctypes.c_int32 * dimensions
        self.none = [0] * dimensions
        self.kept = {}  # shape -> blocks

    def given(self, value, place, reuse=True):
        """A block with the content of an array. With `reuse`, if `value` is a view of a whole block, it is that
        block itself; this is only for arrays that the call does not change."""
        if type(value) is np.ndarray and value.dtype is self.dtype:
            try:
                block = self.kept[value.shape].pop()
            except (KeyError, IndexError):
                pass
            else:
                block.elements[...] = value
                return block
        array = self.checked(value, place)
        if reuse and array.dtype == self.dtype and array.flags.c_contiguous \
                and isinstance(array.base, Block) and array.shape == array.base.shape \
                and array.__array_interface__["data"] == array.base.__array_interface__["data"]:
            return array.base
        return self._copied(array)

    def _copied(self, array):
        try:
            block = self.kept[array.shape].pop()
        except (KeyError, IndexError):
            host, element = library().host, TYPE_CODES.get(self.element)
            if element is None:
                array = np.ascontiguousarray(array, self.dtype)
                return Block(host.QXHostCopyRecords(self.dtype.itemsize, array.size,
                                                    array.ctypes.data), self)
            direct = array.dtype == self.dtype and array.flags.c_contiguous
            source = array.ctypes.data if direct and array.size else None
            copy = (host.QXHostCopy1D, host.QXHostCopy2D, host.QXHostCopy3D)[self.dimensions - 1]
            block = Block(copy(element, *array.shape, source), self)
            if direct:
                return block
        np.asarray(block)[...] = array
        return block

    def checked(self, value, place):
        """`value` as an array of the right number of dimensions, which can be cast to the element type with no
        loss except of precision."""
        dtype = self.dtype
        if isinstance(value, np.ma.MaskedArray) and np.ma.is_masked(value):
            raise ValueError(f"{at(place)}: {np.ma.count_masked(value)} elements are masked, and an array "
                             "of the library has no mask: fill or compress it")
        array = self._records(value, place) if dtype.names and not isinstance(value, np.ndarray) \
            else np.asarray(value)
        if array.ndim != self.dimensions:
            raise ValueError(f"{at(place)}: an array of {self.dimensions} dimension"
                             f"{'s'[:self.dimensions - 1]} is needed; got {came(value)}, which has "
                             f"{array.ndim}")
        if array.size > LARGEST:
            raise ValueError(f"{at(place)}: {array.size} elements are more than an array can hold")
        if array.dtype == dtype or array.size == 0:
            return array
        if not np.can_cast(array.dtype, dtype, "same_kind") and not (
                array.dtype.kind in "bui" and dtype.kind in "bui"):
            raise TypeError(f"{at(place)}: elements of {dtype} are needed; got {array.dtype}")
        if dtype.kind in "ui" and array.dtype.kind != "b":
            limits = np.iinfo(dtype)
            if array.min() < limits.min or array.max() > limits.max:
                raise ValueError(f"{at(place)}: a value lies outside {limits.min} to {limits.max}")
        return array

    def _records(self, value, place):
        """A list of tuples as an array of records. NumPy itself would copy a plain number to every field."""
        names = self.dtype.names
        for row in value if isinstance(value, (list, tuple)) else [value]:
            if not isinstance(row, (tuple, list, np.void)) or (
                    len(row) != len(names)):  # type: ignore[arg-type]  # np.void has a length
                raise TypeError(f"{at(place)}: a list of tuples ({', '.join(names)}) is needed; got {came(row)}")
        return np.array([tuple(row) for row in value], self.dtype)

    def give_back(self, block):
        """Takes back a block after a call that had it as an input."""
        if block.small and self.element in TYPE_CODES:
            self._keep(block)

    def _keep(self, block):
        kept = self.kept.get(block.shape)
        if kept is None:
            if len(self.kept) >= KEPT_SHAPES:
                self.kept = {}
            kept = self.kept.setdefault(block.shape, [])
        if len(kept) < KEPT_PER_SHAPE:
            kept.append(block)

    def changed(self, block):
        """The array in a block that was both input and output."""
        if not block.is_shown():
            block.show()
        if not block.small:
            return np.asarray(block)
        array = block.elements.copy()
        self._keep(block)
        return array

    def output(self, spare):
        """An empty block for an output; `spare` has the blocks of earlier calls."""
        try:
            block = spare.pop()
        except IndexError:
            return self.empty()
        block.sizes[:] = self.none
        return block

    def result(self, block, spare):
        """The array in a block that was an output."""
        if block.address.value != block.shown or block.sizes[:] != block.dims:
            block.show()
        if not block.small:
            return np.asarray(block)
        if len(spare) < KEPT_PER_SHAPE:
            array = block.elements.copy()
            spare.append(block)
            return array
        return block.elements.copy()

    def empty(self):
        host, element = library().host, TYPE_CODES.get(self.element)
        if element is None or self.dimensions > 2:
            raise TypeError(f"the host cannot resize arrays of {self.element} in {self.dimensions} "
                            "dimensions")
        return Block(host.QXHostNew1D(element, 0) if self.dimensions == 1
                     else host.QXHostNew2D(element, 0, 0), self)


class Vector(Kind):
    """One-dimensional arrays, whose single size is set and read faster."""

    def changed(self, block):
        if block.small and block.address.value == block.shown and block.sizes[0] == block.dims[0]:
            array = block.elements.copy()
            self._keep(block)
            return array
        return super().changed(block)

    def output(self, spare):
        try:
            block = spare.pop()
        except IndexError:
            return self.empty()
        block.sizes[0] = 0
        return block

    def result(self, block, spare):
        if block.small and block.address.value == block.shown and block.sizes[0] == block.dims[0]:
            array = block.elements.copy()
            if len(spare) < KEPT_PER_SHAPE:
                spare.append(block)
            return array
        return super().result(block, spare)


@functools.lru_cache(maxsize=None)
def kind(element, dimensions):
    return (Vector if dimensions == 1 else Kind)(element, dimensions)
