"""Pointers that exports give and take back: only such as came from an export go into one, and none
that was given back. A made-up address would end the process."""

import ctypes

from .outcomes import at
from .scalars import shown

GIVES_BACK = {"destroy_oxfft_table"}


class Pointer:
    """What an export gave, of a type that only the library knows."""

    __slots__ = ("type", "address")

    def __init__(self, kind, address):
        self.type, self.address = kind, address

    def __bool__(self):
        return bool(self.address)

    def __repr__(self):
        return f"<{self.type} {'given back' if self.address is None else hex(self.address)}>"

    def __reduce__(self):
        raise TypeError(f"a {self.type} belongs to this process and cannot be pickled")


def address(value, kind, place, gives_back):
    """The address behind a Pointer of that type; None is null, and a library that is loaded by
    ctypes goes where any pointer goes."""
    if value is None:
        return None
    if kind == "void *" and isinstance(value, ctypes.CDLL):
        return value._handle
    if not isinstance(value, Pointer) or value.type != kind:
        raise TypeError(f"{at(place)}: a {kind} from an export is needed; {shown(value)} came")
    if value.address is None:
        raise ValueError(f"{at(place)}: it has been given back before")
    found = value.address
    if gives_back:
        value.address = None
    return found


def pointer(kind, found):
    return Pointer(kind, found or 0)
