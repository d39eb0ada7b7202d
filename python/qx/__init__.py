"""Numerical analysis of measured and generated signals.

    import qx
    lowpass = qx.filters.butterworth(4, 40, fs=1000)
    smooth = lowpass.zero_phase(x)
    help(qx.filters)                        # the functions of a topic

The topics are modules: filters, fft, windows, spectra, signals, noise, multirate, linalg, poly, fit,
interpolate, calculus, stats, special, measure, coordinates. They are built on the exports of the library,
which can also be called as functions of `qx.exports` and of `qx` itself:

    qx.Moment_head([1.0, 2.0, 4.0], 2)      # 1.5555555555555554
    qx.list("variance")                     # the exports whose name or text contains the word
    help(qx.Moment_head)

`python3 -m qx` offers the same on the command line.
"""

import importlib as _importlib

from . import catalogue as _catalogue
from .calls import NoSuchExport, call, export
from .library import NotBuilt, library as _library
from .outcomes import ArgumentError, MatrixError, OutOfMemory, QxError, QxWarning
from .plans import release
from .pointers import Pointer
from .topical.newest import TOPICS as _TOPICS, answer as _answer

list = _catalogue.find

__all__ = ["ArgumentError", "MatrixError", "NoSuchExport", "NotBuilt", "OutOfMemory", "Pointer",
           "QxError", "QxWarning", "call", "export", "list", "names", "release"]


def names():
    """The names of all exports."""
    return [*_library().entries]


def __getattr__(name):
    if name == "__version__":
        return _library().catalogue["version"]
    if name in _TOPICS or name == "exports":
        return _importlib.import_module(f".{name}", __name__)
    if name.startswith("__"):
        raise AttributeError(name)
    try:
        function = export(name)
    except NoSuchExport:
        raise AttributeError(f"qx has no function {name}{_answer(name, __all__)}") from None
    globals()[name] = function
    return function


class _First(str):
    """A name that dir() sorts before all others."""

    def __lt__(self, other):
        return str.__lt__(self, other) if isinstance(other, _First) else True

    def __gt__(self, other):
        return str.__gt__(self, other) if isinstance(other, _First) else False


def __dir__():
    own = [name for name in globals() if name not in _TOPICS]
    return [*map(_First, _TOPICS), *{*own, "exports", *_library().entries}]
