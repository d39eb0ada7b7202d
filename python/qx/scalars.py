"""Converts numbers for ctypes, and refuses those that would lose anything but precision."""

import ctypes
from typing import Any
import operator
import textwrap

import numpy as np

from .outcomes import at

C_TYPES: dict[str, Any] = {
    "I16": ctypes.c_int16, "I32": ctypes.c_int32, "U8": ctypes.c_uint8, "U16": ctypes.c_uint16,
    "U32": ctypes.c_uint32, "SGL": ctypes.c_float, "DBL": ctypes.c_double, "CSG": ctypes.c_float * 2,
    "CDB": ctypes.c_double * 2}
COMPLEX = ("CSG", "CDB")
LIMITS = {"I16": (-2**15, 2**15 - 1), "I32": (-2**31, 2**31 - 1), "U32": (0, 2**32 - 1),
          "U8": (0, 255), "U16": (0, 65535)}


def shown(value):
    return f"{str(value)[:40]!r} ({type(value).__name__})" if isinstance(value, (str, bytes)) else \
        f"{str(value)[:40]} ({type(value).__name__})"


def is_number(value):
    return np.ndim(value) == 0 and not isinstance(value, (str, bytes)) and value is not np.ma.masked


def whole(value, element, place):
    """An int within the limits of the element."""
    try:
        number = operator.index(value)
    except TypeError:
        if not (isinstance(value, float) and value.is_integer()):
            raise TypeError(f"{at(place)}: a whole number is needed; got {shown(value)}") from None
        number = int(value)
    lowest, highest = LIMITS[element]
    if not lowest <= number <= highest:
        raise ValueError(f"{at(place)}: {shown(number)} lies outside {lowest} to {highest}")
    return number


def chosen(value, values, place):
    """An int that is one of the values, which are the keys of a dictionary with a text for each."""
    number = whole(value, "I32", place)
    if number not in values:
        known = "; ".join(f"{value} {textwrap.shorten(text, 60, placeholder=' ...')}".rstrip()
                          for value, text in values.items())
        raise ValueError(f"{at(place)}: {shown(number)} is not one of its values, which are {known}")
    return number


def real(value, place):
    try:
        if is_number(value):
            return float(value)
    except (TypeError, ValueError):
        pass
    raise TypeError(f"{at(place)}: a number is needed; got {shown(value)}")


def complex_parts(value, element, place):
    try:
        if is_number(value):
            number = complex(value)
            return C_TYPES[element](number.real, number.imag)
    except (TypeError, ValueError):
        pass
    raise TypeError(f"{at(place)}: a complex number is needed; got {shown(value)}")


def c_number(value, element, place):
    """A ctypes object with the number in it."""
    if element in COMPLEX:
        return complex_parts(value, element, place)
    return C_TYPES[element](whole(value, element, place) if element in LIMITS
                            else real(value, place))
