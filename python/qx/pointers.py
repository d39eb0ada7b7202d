"""Pointers that exports return and take back. An export only accepts pointers that came from an export and have
not been given back, since an invalid address would crash the process."""

import ctypes

from .outcomes import at
from .scalars import shown

GIVES_BACK = {"destroy_oxfft_table"}


class Pointer:
    """A pointer returned by an export, to a type that only the library knows."""

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
    """The address of a Pointer of that type. None is null, and a library loaded by ctypes is accepted for any
    pointer."""
    if value is None:
        return None
    if kind == "void *" and isinstance(value, ctypes.CDLL):
        return value._handle
    if not isinstance(value, Pointer) or value.type != kind:
        raise TypeError(f"{at(place)}: a {kind} from an export is needed; got {shown(value)}")
    if value.address is None:
        raise ValueError(f"{at(place)}: it has already been given back")
    found = value.address
    if gives_back:
        value.address = None
    return found


def pointer(kind, found):
    return Pointer(kind, found or 0)
