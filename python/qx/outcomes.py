"""Failures and warnings of the exports and of the topics."""

import os
import re
import sys
import threading
import warnings
from types import FrameType
from typing import Optional

from numpy.linalg import LinAlgError

from .library import library

HOST_FAILURES = (1, 2)  # statuses of the host that some exports pass on
_PACKAGE = os.path.dirname(os.path.abspath(__file__)) + os.sep
_NAME = __name__.rpartition(".")[0] + "."  # of the package's modules


class QxError(Exception):
    """A failure: `code`, `name` and `text` as the host has them, `export`, `rule` (what the export's
    text says of this code), and `results` with what the export left behind. Most failures leave empty
    arrays and NaN. Failures of one kind are of a class that is also Python's or NumPy's for them."""

    def __init__(self, export, code, results=None, place="", message=None):
        self.export, self.code, self.results, self.place = export, code, results, place
        self.name, self.text = library().error_name(code), library().error_text(code)
        self.rule = rule(export, self.name)
        self._message = message
        because = f": {self.rule}" if self.rule else ""
        super().__init__(message or f"{export}{place}: {self.text} ({self.name}, {code}){because}")

    def __reduce__(self):
        return type(self), (self.export, self.code, self.results, self.place, self._message)


class ArgumentError(QxError, ValueError):
    """An argument, or several together, against a rule of the function."""


class MatrixError(QxError, LinAlgError):
    """A matrix that is singular, not square, not positive definite or too badly conditioned."""


class OutOfMemory(QxError, MemoryError):
    """The host has no memory for a result, or the library none for its work."""


_MATRIX = ("ErrSingularMatrix", "ErrNotSquare", "ErrNotPositiveDefinite", "ErrConditionTooHigh")
_MEMORY = ("ErrOutOfMemory", "ErrMeasureOutOfMemory", "ErrWorkspaceExhausted")
_OTHERS = ("ErrIterationLimit", "ErrNoUsableFit", "ErrOverflow", "ErrNonFiniteFunction", "ErrInternal",
           "ErrNotAvailable", "ErrBesselStatusOne", "ErrBesselStatusFour", "ErrMeasureNotFound",
           "ErrMeasureSearchShort", "ErrMeasureTooFewPoints", "ErrMeasureNullState")


def rule(export, name):
    """What the text of the export, or of the one whose codes it takes over, says of a code."""
    entry = library().entries.get(export, {"documentation": "", "inherited": []})
    for text in (entry["documentation"],
                 *(library().entries[other]["documentation"] for other in entry["inherited"])):
        codes = " ".join(text.partition("Codes:")[2].split())
        if found := re.search(rf"\b{name} \(((?:[^()]|\([^()]*\))*)\)", codes):
            return found[1]
    return ""


def kind_of(name, code=0):
    """The class of exception for a code."""
    if name in _MATRIX:
        return MatrixError
    if name in _MEMORY or code in HOST_FAILURES:
        return OutOfMemory
    return QxError if name in _OTHERS or not name.startswith("Err") else ArgumentError


def caller():
    """The public function of a topic that is at work, such as "fft.rfft"; empty for a call of an export."""
    found = ""
    frame: Optional[FrameType] = sys._getframe(1)
    while frame and frame.f_code.co_filename.startswith((_PACKAGE, "<qx ")):
        module = frame.f_globals.get("__name__", "").removeprefix(_NAME)
        parts = getattr(frame.f_code, "co_qualname", frame.f_code.co_name).split(".")  # before Python 3.11 the last one
        if "." not in module and parts[0] in frame.f_globals.get("__all__", ()):
            found = ".".join([module, *(part for part in parts[:2] if not part.startswith(("__", "<")))])
        frame = frame.f_back
    return found


def at(place):
    """A place in an export's arguments as messages name it, behind the function of a topic that was called."""
    function = caller()
    return f"qx.{function}: {place}" if function else place


def failure(export, code, results=None, place=""):
    """The exception for a code, of the class that fits it. It names the function of a topic that was called."""
    kind, function = kind_of(library().error_name(code), code), caller()
    error = kind(export, code, results, place)
    return kind(export, code, results, place, f"qx.{function}: {error}") if function else error


def named(error):
    """A failure out of a thread, which does not know what was called, under its name."""
    function = caller()
    if not function or str(error).startswith("qx."):
        return error
    text = f"qx.{function}: {error}"
    if isinstance(error, QxError):
        return type(error)(error.export, error.code, error.results, error.place, text)
    return type(error)(text) if type(error) in (TypeError, ValueError) else error


class QxWarning(UserWarning):
    """A warning: the results stand."""

    def __init__(self, export, code, message=None):
        self.export, self.code = export, code
        self.name, self.text = library().error_name(code), library().error_text(code)
        self._message = message
        super().__init__(message or f"{export}: {self.text} ({self.name}, {code})")

    def __reduce__(self):
        return QxWarning, (self.export, self.code, self._message)


def is_failure(status):
    return status < 0 or status in HOST_FAILURES


_kept = threading.local()  # the warnings of a thread that somebody else decides on


def tell(export, status, results, place=""):
    """Raises a failure; gives a warning at the line that called into the package."""
    if is_failure(status):
        raise failure(export, status, results, place)
    warn(QxWarning(export, status))


def warn(warning):
    """Gives a warning at the line that called into the package, or keeps it under keeping()."""
    kept = getattr(_kept, "warnings", None)
    if kept is not None:
        kept.append(warning)
        return
    level, frame = 1, sys._getframe()
    while frame.f_back and (frame.f_code.co_filename.startswith((_PACKAGE, "<qx "))):
        frame, level = frame.f_back, level + 1
    warnings.warn(warning, stacklevel=level)


def keeping(work, *arguments):
    """The result of work, done for somebody who decides on its warnings, and these warnings."""
    before, _kept.warnings = getattr(_kept, "warnings", None), []
    try:
        return work(*arguments), _kept.warnings
    finally:
        _kept.warnings = before
