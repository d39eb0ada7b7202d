"""Calls of the exports by the catalogue: what goes in, what comes out, what went wrong."""

import ctypes
import difflib
import functools
import inspect
import keyword
import operator
import warnings

import numpy as np

from . import arrays, plans
from .library import library

C_TYPES = {"I16": ctypes.c_int16, "I32": ctypes.c_int32, "U8": ctypes.c_uint8,
           "U16": ctypes.c_uint16, "U32": ctypes.c_uint32, "SGL": ctypes.c_float,
           "DBL": ctypes.c_double}
COMPLEX_PARTS = {"CSG": ctypes.c_float, "CDB": ctypes.c_double}
RESULTS = {"ErrorCode": ctypes.c_int32, "int32_t": ctypes.c_int32, "uint32_t": ctypes.c_uint32,
           "uint8_t": ctypes.c_uint8, "double": ctypes.c_double, "DBL": ctypes.c_double,
           "float": ctypes.c_float, "void": None}
INTEGER_LIMITS = {"I16": (-2**15, 2**15 - 1), "I32": (-2**31, 2**31 - 1), "U32": (0, 2**32 - 1),
                  "U8": (0, 255), "U16": (0, 65535)}
HOST_FAILURES = (1, 2)  # statuses of the host that some exports pass on


class QxError(Exception):
    """A failure: `code`, `name` and `text` as the host has them, `export`, and `results` with
    what the export left behind. Most failures leave empty arrays and NaN."""

    def __init__(self, export, code, results=None, place=""):
        self.export, self.code, self.results = export, code, results
        self.name, self.text = library().error_name(code), library().error_text(code)
        super().__init__(f"{export}{place}: {self.text} ({self.name}, {code})")


class QxWarning(UserWarning):
    """A warning: the results stand."""

    def __init__(self, export, code):
        self.export, self.code = export, code
        self.name, self.text = library().error_name(code), library().error_text(code)
        super().__init__(f"{export}: {self.text} ({self.name}, {code})")


def scalar(value, element, name):
    """A number as ctypes takes it, refused where it would lose anything but precision."""
    if element in COMPLEX_PARTS:
        value = complex(value)
        return (COMPLEX_PARTS[element] * 2)(value.real, value.imag)
    if element in INTEGER_LIMITS:
        try:
            number = operator.index(value)
        except TypeError:
            if not (isinstance(value, float) and value.is_integer()):
                raise TypeError(f"{name}: a whole number is needed, not {value!r}") from None
            number = int(value)
        lowest, highest = INTEGER_LIMITS[element]
        if not lowest <= number <= highest:
            raise ValueError(f"{name}: {number} lies outside {lowest} to {highest}")
        return C_TYPES[element](number)
    if isinstance(value, (str, bytes)):
        raise TypeError(f"{name}: a number is needed, not {value!r}")
    return C_TYPES[element](value)


def plain(c_value, element):
    if element in COMPLEX_PARTS:
        return complex(*c_value)
    return c_value.value


@functools.lru_cache(maxsize=None)
def record_type(name):
    """The ctypes structure of a record; arrays in it are handles."""
    description = library().records[name]
    fields = []
    for field in description["fields"]:
        if "array" in field:
            fields.append((field["name"], ctypes.c_void_p))
            continue
        if "element" not in field or "count" in field or field["element"] in COMPLEX_PARTS:
            raise TypeError(f"records of type {name} hold more than numbers and arrays")
        fields.append((field["name"], C_TYPES[field["element"]]))
    body = {"_fields_": fields}
    if description["packed"]:
        body = {"_pack_": 1, **body}
    return type(name, (ctypes.Structure,), body)


class Record:
    """A record for a call, with the blocks of the arrays in it."""

    def __init__(self, name, contents, argument):
        self.record = record_type(name)()
        self.blocks = {}
        fields = {field["name"]: field for field in library().records[name]["fields"]}
        for field in contents:
            if field not in fields:
                raise ValueError(f"{argument}: {name} has no field {field!r}")
        for field, description in fields.items():
            if "array" in description:
                element, dimensions = description["array"], description["dimensions"]
                block = (arrays.filled(contents[field], element, dimensions, field, reuse=False)
                         if field in contents else arrays.empty(element, dimensions))
                self.blocks[field] = block
                setattr(self.record, field, block.handle)
            elif field in contents:
                setattr(self.record, field, contents[field])

    def contents(self):
        return {field: self.blocks[field].view() if field in self.blocks
                else getattr(self.record, field) for field, _ in self.record._fields_}


class Export:
    """One export, ready to be called."""

    def __init__(self, entry):
        self.entry, self.name = entry, entry["name"]
        self.arguments = entry["arguments"]
        self.function = getattr(library().module, self.name)
        self.function.restype = RESULTS.get(entry["returns"], ctypes.c_void_p)
        self.given = [a for a in self.arguments if self._is_given(a)]
        self.taken = [a for a in self.arguments
                      if a["direction"] != "in" and a["kind"] not in ("slot", "instance", "error")]
        self.has_error = any(a["kind"] == "error" for a in self.arguments)
        self.has_plan = any(a["kind"] in ("slot", "instance") for a in self.arguments)
        self.names = [a["name"] + "_" * keyword.iskeyword(a["name"]) for a in self.given]
        self.gives_value = not self.taken and not self.has_error and (
            entry["returns"] not in ("ErrorCode", "void"))
        self.is_scalar = bool(self.given) and all(
            a["kind"] in ("value", "reference", "output", "error") for a in self.arguments) and all(
            a["element"] in C_TYPES for a in self.arguments if a["kind"] == "value")
        if self.is_scalar:
            self.function.argtypes = [
                C_TYPES[a["element"]] if a["kind"] == "value" else ctypes.c_void_p
                for a in self.arguments]

    @staticmethod
    def _is_given(argument):
        return argument["direction"] != "out" and argument["kind"] not in ("slot", "instance")

    @staticmethod
    def _length(argument, value):
        """What the length of a plan may depend on: the shape of an array, a whole number."""
        if argument["kind"].startswith("array"):
            return np.shape(value)
        return value if argument.get("element") == "I32" else None

    def signature(self):
        """How the export is called from Python."""
        results = [a["name"] for a in self.taken] or (["value"] if self.gives_value else [])
        text = ", ".join([f'"{self.name}"', *self.names])
        return (", ".join(results) + " = " if results else "") + f"qx.call({text})"

    def bind(self, positional, named):
        """The given values in the order of the arguments."""
        if not named and len(positional) == len(self.names):
            return positional
        parameters = [inspect.Parameter(name, inspect.Parameter.POSITIONAL_OR_KEYWORD)
                      for name in self.names]
        try:
            return inspect.Signature(parameters).bind(*positional, **named).args
        except TypeError as error:
            raise TypeError(f"{error}; the call is {self.signature()}") from None

    def __call__(self, *positional, **named):
        values = self.bind(positional, named)
        if self.is_scalar and any(np.ndim(value) for value in values):
            return self._mapped(values)
        return self._called(values)

    def _called(self, values):
        lengths = tuple(map(self._length, self.given, values)) if self.has_plan else ()
        self._check_buffers(values)
        values = iter(values)
        c_arguments, kept = [], []
        for argument in self.arguments:
            value = next(values) if self._is_given(argument) else None
            c_argument, keep = self._prepare(argument, value, lengths)
            c_arguments.append(c_argument)
            kept.append(keep)
        result = self.function(*c_arguments)
        return self._finish(result, kept)

    def _check_buffers(self, values):
        """A plain pointer has no length of its own, so the count is held against the array."""
        for argument, value in zip(self.given, values):
            if argument["kind"] == "buffer":
                count = values[[a["name"] for a in self.given].index(argument["length"])]
                if np.size(value) < count:
                    raise ValueError(f"{argument['name']}: {count} elements are needed, not "
                                     f"{np.size(value)}")

    def _prepare(self, argument, value, lengths):
        """What the function is given, and what is kept to read results from."""
        kind, name, element = argument["kind"], argument["name"], argument.get("element")
        if kind.startswith("array"):
            dimensions = int(kind[5])
            if argument["direction"] == "out":
                block = arrays.empty(element, dimensions)
            else:
                block = arrays.filled(value, element, dimensions, name,
                                      reuse=argument["direction"] == "in")
            return ctypes.c_void_p(block.handle), block
        if kind == "value":
            number = scalar(value, element, name)
            return number, number
        if kind in ("reference", "inout"):
            number = scalar(value, element, name)
            return ctypes.byref(number), number
        if kind in ("output", "error"):
            number = ((COMPLEX_PARTS[element] * 2)() if element in COMPLEX_PARTS
                      else C_TYPES[element]())
            return ctypes.byref(number), number
        if kind in ("slot", "instance"):
            word = plans.word((self.name, name, lengths), argument)
            return ctypes.c_void_p(word.address), word
        if kind == "record":
            record = Record(element, value or {}, name)
            return ctypes.byref(record.record), record
        if kind == "buffer":
            array = np.array(arrays.checked(value, arrays.element_dtype(element), 1, name),
                             arrays.element_dtype(element))
            return ctypes.c_void_p(array.ctypes.data), array
        if kind == "opaque":
            pointer = ctypes.c_void_p(value)
            return (ctypes.byref(pointer) if argument["direction"] == "out" else pointer), pointer
        raise TypeError(f"{self.name} takes a {kind}, which cannot be given from Python")

    def _finish(self, result, kept):
        results = []
        for argument, keep in zip(self.arguments, kept):
            if argument["direction"] == "in" or argument["kind"] in ("slot", "instance", "error"):
                continue
            if argument["kind"].startswith("array"):
                results.append(keep.view())
            elif argument["kind"] == "record":
                results.append(keep.contents())
            elif argument["kind"] == "opaque":
                results.append(keep.value)
            elif argument["kind"] == "buffer":
                results.append(keep)
            else:
                results.append(plain(keep, argument["element"]))
        status = next((keep.value for argument, keep in zip(self.arguments, kept)
                       if argument["kind"] == "error"), 0)
        if status == 0 and (self.has_error or self.entry["returns"] == "ErrorCode"):
            status = result or 0
        if status < 0 or status in HOST_FAILURES:
            raise QxError(self.name, status, dict(zip([a["name"] for a in self.taken], results)))
        if status > 0:
            warnings.warn(QxWarning(self.name, status), stacklevel=5)
        if not results:
            return result if self.gives_value else None
        return results[0] if len(results) == 1 else tuple(results)

    def _mapped(self, values):
        """A function of scalars over arrays, element by element, with NumPy's broadcasting. The
        function writes straight into the elements of the result."""
        spread = np.broadcast_arrays(*[
            arrays.checked(value, arrays.element_dtype(a["element"]), np.ndim(value), a["name"])
            for value, a in zip(values, self.given)])
        shape, n = spread[0].shape, spread[0].size
        spread = iter(spread)
        columns, kept, results, codes = [], [], [], None
        for argument in self.arguments:
            dtype = arrays.element_dtype(argument["element"])
            if self._is_given(argument):
                data = np.ascontiguousarray(next(spread), dtype).ravel()
                if argument["kind"] == "value":
                    columns.append(data.tolist())
                    continue
            else:
                data = np.zeros(n, dtype)
            if argument["kind"] == "error":
                codes = data
            elif argument["direction"] == "out":
                results.append(data.reshape(shape))
            kept.append(data)  # only its address goes into the calls
            start = data.ctypes.data
            columns.append(range(start, start + n * dtype.itemsize, dtype.itemsize))
        returned = [self.function(*row) for row in zip(*columns)]
        if self.entry["returns"] == "ErrorCode":
            codes = np.array(returned, np.int32)
        if codes is not None:
            self._check_mapped(codes)
        if self.gives_value:
            return np.array(returned, None if n else float).reshape(shape)
        return results[0] if len(results) == 1 else tuple(results)

    def _check_mapped(self, codes):
        failed = np.flatnonzero(codes < 0)
        if len(failed):
            raise QxError(self.name, int(codes[failed[0]]), place=f" at element {failed[0]}")
        for code in np.unique(codes[codes > 0]):
            warnings.warn(QxWarning(self.name, int(code)), stacklevel=5)


@functools.lru_cache(maxsize=None)
def export(name):
    entry = library().entries.get(name)
    if entry is None:
        close = difflib.get_close_matches(name, library().entries, 3, 0.6)
        hint = f"; did you mean {' or '.join(close)}?" if close else ""
        raise LookupError(f"there is no export {name}{hint}")
    return Export(entry)


def call(name, *positional, **named):
    """Calls an export.

    Inputs are given in the order of the declaration: arrays as anything that NumPy takes, scalars
    as numbers whether they travel by value or by reference, records as dictionaries (fields left
    out are 0 or empty), arrays of records as lists of tuples. Outputs come back in the order of the declaration, arrays as NumPy
    arrays, a single one bare and several as a tuple; an array that is input and output comes back
    as a new one. Plans are kept behind the scenes. A failure raises QxError, a warning is given
    as QxWarning. A function of scalars maps over arrays.
    """
    return export(name)(*positional, **named)
