"""The analysis library with NumPy arrays.

    import qx
    qx.call("Moment_head", [1.0, 2.0, 4.0], 2)      # 1.5555555555555554

`python3 -m qx list` names the exports, `python3 -m qx show NAME` explains one.
"""

from .calls import QxError, QxWarning, call, export
from .library import NotBuilt, library
from .plans import release

__all__ = ["NotBuilt", "QxError", "QxWarning", "call", "export", "names", "release"]


def names():
    """The names of all exports."""
    return list(library().entries)
