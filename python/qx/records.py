"""Records of the exports as dictionaries; omitted fields are 0 or empty."""

import ctypes
import functools
from collections.abc import Mapping
from typing import Any

import numpy as np

from . import arrays
from .library import library
from .outcomes import at
from .scalars import C_TYPES, COMPLEX, c_number, shown


def is_pointer(field):
    """Whether a field is a pointer into an array of the caller, which the export sets in every call."""
    return field["type"].endswith("*") and "array" not in field


@functools.lru_cache(maxsize=None)
def record_type(name):
    """The ctypes structure of a record; arrays in it are handles."""
    description = library().records[name]
    fields: list[tuple[str, Any]] = []
    for field in description["fields"]:
        if "array" in field or is_pointer(field):
            fields.append((field["name"], ctypes.c_void_p))
        elif "element" in field and str(field.get("count", "1")).isdigit():
            c_type: Any = C_TYPES[field["element"]]
            fields.append((field["name"],
                           c_type * int(field["count"]) if "count" in field else c_type))
        else:
            raise TypeError(f"records of type {name} hold more than numbers and arrays")
    body: dict[str, Any] = {"_fields_": fields}
    if description["packed"]:
        body = {"_pack_": 1, **body}
    return type(name, (ctypes.Structure,), body)


class Record:
    """A record for a call, with the blocks of its arrays."""

    def __init__(self, name, contents, place):
        self.record = record_type(name)()
        self.blocks = {}
        self.fields = {field["name"]: field for field in library().records[name]["fields"]
                       if not is_pointer(field)}
        if not isinstance(contents, Mapping):
            raise TypeError(f"{at(place)}: a dictionary with fields of {name} is needed; "
                            f"got {shown(contents)}")
        for field in contents:
            if field not in self.fields:
                raise ValueError(f"{at(place)}: {name} has no field {field!r}; it has "
                                 f"{', '.join(self.fields)}")
        for field, description in self.fields.items():
            if "array" in description:
                self._put_array(field, description, contents, place)
            elif field in contents:
                self._put_numbers(field, description, contents[field], f"{place}.{field}")

    def _put_array(self, field, description, contents, place):
        kind = arrays.kind(description["array"], description["dimensions"])
        self.blocks[field] = (kind.given(contents[field], f"{place}.{field}", reuse=False)
                              if field in contents else kind.empty())
        setattr(self.record, field, self.blocks[field].handle)

    def _put_numbers(self, field, description, value, place):
        element, count = description["element"], description.get("count")
        if count is None:
            number = c_number(value, element, place)
            setattr(self.record, field, number if element in COMPLEX else number.value)
            return
        if np.shape(value) != (int(count),):
            raise ValueError(f"{at(place)}: {count} numbers are needed; got {shown(value)}")
        for i, one in enumerate(value):
            number = c_number(one, element, place)
            getattr(self.record, field)[i] = number if element in COMPLEX else number.value

    def _number(self, field):
        element, value = self.fields[field]["element"], getattr(self.record, field)
        if "count" in self.fields[field]:
            return [complex(*part) if element in COMPLEX else part for part in value]
        return complex(*value) if element in COMPLEX else value

    def contents(self):
        found = {}
        for field in self.fields:
            if field in self.blocks:
                block = self.blocks[field]
                block.show()
                found[field] = np.array(block)
            else:
                found[field] = self._number(field)
        return found
