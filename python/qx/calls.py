"""The exports by their names."""

import difflib
import functools

from .functions import Writer
from .library import library


class NoSuchExport(LookupError):
    """There is no export of that name."""

    def __str__(self):
        return self.args[0]


def hint(name, names):
    """The names that a wrong name may have meant, as the end of a message."""
    lower = {known.lower(): known for known in names}
    near = [lower[match] for match in difflib.get_close_matches(name.lower(), lower, 3, 0.6)]
    return f"; did you mean {' or '.join(near)}?" if near else ""


def entry(name):
    found = library().entries.get(name)
    if found is None:
        raise NoSuchExport(f"there is no export {name}{hint(str(name), library().entries)}")
    return found


@functools.lru_cache(maxsize=None)
def export(name):
    """The function that calls an export."""
    return Writer(entry(name)).function()


def call(name, /, *positional, **named):
    """Calls an export by its name, like its function qx.NAME.

    Inputs are passed in the order of the declaration: arrays as anything that NumPy accepts, scalars as
    numbers, whether passed by value or by reference, records as dictionaries (omitted fields are 0 or empty),
    and arrays of records as lists of tuples. Outputs are returned in the order of the declaration, arrays as
    NumPy arrays; several outputs are returned as a tuple. An array that is both input and output is returned
    as a new array. Plans are cached. A failure raises QxError, and a warning is issued as QxWarning. A
    function of real numbers is mapped over arrays.
    """
    return export(name)(*positional, **named)
