"""The exports by their names."""

import difflib
import functools

from .functions import Writer
from .library import library


class NoSuchExport(LookupError):
    """No export has that name."""

    def __str__(self):
        return self.args[0]


def hint(name, names):
    """What a wrong name may have meant, as the end of a message."""
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
    """Calls an export by its name, as its function qx.NAME does.

    Inputs are given in the order of the declaration: arrays as anything that NumPy takes, scalars
    as numbers whether they travel by value or by reference, records as dictionaries (fields left
    out are 0 or empty), arrays of records as lists of tuples. Outputs come back in the order of the
    declaration, arrays as NumPy arrays, a single one bare and several as a tuple; an array that is
    input and output comes back as a new one. Plans are kept behind the scenes. A failure raises
    QxError, a warning is given as QxWarning. A function of real numbers maps over arrays.
    """
    return export(name)(*positional, **named)
