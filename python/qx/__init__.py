"""The analysis library with NumPy arrays.

    import qx
    qx.Moment_head([1.0, 2.0, 4.0], 2)      # 1.5555555555555554
    qx.list("variance")                     # the functions whose name or text has the word
    help(qx.Moment_head)

Every export of the module is a function here. `python3 -m qx` tells the same on the command line.
"""

from . import catalogue as _catalogue
from .calls import NoSuchExport, call, export, hint as _hint
from .library import NotBuilt, library as _library
from .outcomes import QxError, QxWarning
from .plans import release
from .pointers import Pointer

list = _catalogue.find

__all__ = ["NoSuchExport", "NotBuilt", "Pointer", "QxError", "QxWarning", "call", "export", "list",
           "names", "release"]


def names():
    """The names of all exports."""
    return [*_library().entries]


def __getattr__(name):
    if name == "__version__":
        return _library().catalogue["version"]
    if name.startswith("__"):
        raise AttributeError(name)
    try:
        function = export(name)
    except NoSuchExport:
        known = [*_library().entries, *__all__]
        raise AttributeError(f"qx has no function {name}{_hint(name, known)}") from None
    globals()[name] = function
    return function


def __dir__():
    return [*globals(), *_library().entries]
