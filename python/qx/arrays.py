"""NumPy arrays as host blocks and host blocks as NumPy arrays.

An array goes into a block with one copy. A block comes out as a NumPy view without any copy; the
view keeps the block alive. Such a view, given to a call as an input, goes back in without a copy.
"""

import ctypes

import numpy as np

from .library import library

TYPE_CODES = {"I32": 3, "U8": 5, "U32": 7, "SGL": 9, "DBL": 10, "CSG": 12, "CDB": 13}
DTYPES = {"I32": np.dtype(np.int32), "U8": np.dtype(np.uint8), "U32": np.dtype(np.uint32),
          "SGL": np.dtype(np.float32), "DBL": np.dtype(np.float64), "CSG": np.dtype(np.complex64),
          "CDB": np.dtype(np.complex128)}
LARGEST = 2**31 - 1

_record_dtypes = {}


def element_dtype(element):
    """The NumPy type of an element; records have their natural layout in C."""
    if element in DTYPES:
        return DTYPES[element]
    if element not in _record_dtypes:
        fields = library().records[element]["fields"]
        if any("element" not in field or "count" in field for field in fields):
            raise TypeError(f"records of type {element} hold more than plain numbers")
        _record_dtypes[element] = np.dtype(
            [(field["name"], DTYPES[field["element"]]) for field in fields], align=True)
    return _record_dtypes[element]


class Block:
    """A host array: owns a handle and shows the block's present content to NumPy."""

    __slots__ = ("handle", "dtype", "dimensions", "_free", "__weakref__")

    def __init__(self, handle, dtype, dimensions):
        if not handle:
            raise MemoryError("the host has no memory for an array of this size")
        self.handle, self.dtype, self.dimensions = handle, dtype, dimensions
        self._free = library().host.QXHostFree

    def __del__(self):
        if hasattr(self, "_free"):
            self._free(self.handle)

    @property
    def __array_interface__(self):
        address = ctypes.c_void_p.from_address(self.handle).value
        shape = tuple((ctypes.c_int32 * self.dimensions).from_address(address))
        return {"version": 3, "shape": shape, "data": (address + 4 * self.dimensions, False),
                "typestr": self.dtype.str, "descr": self.dtype.descr}

    def view(self):
        return np.asarray(self)


def empty(element, dimensions):
    """A block of no elements, for an output."""
    host = library().host
    if element not in TYPE_CODES:
        raise TypeError(f"the host cannot resize arrays of {element}")
    handle = (host.QXHostNew1D(TYPE_CODES[element], 0) if dimensions == 1
              else host.QXHostNew2D(TYPE_CODES[element], 0, 0))
    return Block(handle, DTYPES[element], dimensions)


def checked(value, dtype, dimensions, name):
    """`value` as an array of the right number of dimensions whose cast to `dtype` loses nothing
    but precision."""
    array = np.asarray(value, dtype) if dtype.names and not isinstance(value, np.ndarray) \
        else np.asarray(value)
    if array.ndim != dimensions:
        raise ValueError(f"{name}: an array of {dimensions} dimension{'s'[:dimensions - 1]} is "
                         f"needed, not of {array.ndim}")
    if array.size > LARGEST:
        raise ValueError(f"{name}: {array.size} elements are more than an array can have")
    if array.dtype == dtype or array.size == 0:
        return array
    if not np.can_cast(array.dtype, dtype, "same_kind") and not (
            array.dtype.kind in "bui" and dtype.kind in "bui"):
        raise TypeError(f"{name}: an array of {dtype} is needed, not of {array.dtype}")
    if dtype.kind in "ui" and array.dtype.kind != "b":
        limits = np.iinfo(dtype)
        if array.min() < limits.min or array.max() > limits.max:
            raise ValueError(f"{name}: a value lies outside {limits.min} to {limits.max}")
    return array


def filled(value, element, dimensions, name, reuse):
    """A block with the content of an array. With `reuse` the block behind `value` itself, where
    `value` shows the whole of one: only for arrays that the call leaves alone."""
    dtype = element_dtype(element)
    array = checked(value, dtype, dimensions, name)
    if reuse and isinstance(array.base, Block) and array.dtype == dtype:
        whole = array.base.__array_interface__
        if whole["shape"] == array.shape and array.flags.c_contiguous \
                and whole["data"][0] == array.__array_interface__["data"][0]:
            return array.base
    host = library().host
    if element not in TYPE_CODES:
        array = np.ascontiguousarray(array, dtype)
        return Block(host.QXHostCopyRecords(dtype.itemsize, array.size, array.ctypes.data), dtype, 1)
    direct = array.dtype == dtype and array.flags.c_contiguous
    source = array.__array_interface__["data"][0] if direct and array.size else None
    copy = (host.QXHostCopy1D, host.QXHostCopy2D, host.QXHostCopy3D)[dimensions - 1]
    block = Block(copy(TYPE_CODES[element], *array.shape, source), dtype, dimensions)
    if not direct:
        block.view()[...] = array
    return block
