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
_NAME = __name__.rpartition(".")[0] + "."  # the prefix of the package's modules


class QxError(Exception):
    """A failure of an export. It has the `code`, its `name` and `text`, the `export`, the `rule` (what the
    export's documentation says about this code), and the `results` that the export returned nevertheless,
    usually empty arrays and NaN. The subclasses are also the exceptions that Python or NumPy raise in such
    cases."""

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
    """An argument, or a combination of arguments, that the function does not accept."""


class MatrixError(QxError, LinAlgError):
    """A matrix that is singular, not square, not positive definite, or too badly conditioned."""


class OutOfMemory(QxError, MemoryError):
    """The host has no memory for a result, or the library has none for its work."""


_MATRIX = ("ErrSingularMatrix", "ErrNotSquare", "ErrNotPositiveDefinite", "ErrConditionTooHigh")
_MEMORY = ("ErrOutOfMemory", "ErrMeasureOutOfMemory", "ErrWorkspaceExhausted")
_OTHERS = ("ErrIterationLimit", "ErrNoUsableFit", "ErrOverflow", "ErrNonFiniteFunction", "ErrInternal",
           "ErrNotAvailable", "ErrBesselStatusOne", "ErrBesselStatusFour", "ErrMeasureNotFound",
           "ErrMeasureSearchShort", "ErrMeasureTooFewPoints", "ErrMeasureNullState")


def rule(export, name):
    """What the documentation of the export, or of the export whose codes it shares, says about a code."""
    entry = library().entries.get(export, {"documentation": "", "inherited": []})
    for text in (entry["documentation"],
                 *(library().entries[other]["documentation"] for other in entry["inherited"])):
        codes = " ".join(text.partition("Codes:")[2].split())
        if found := re.search(rf"\b{name} \(((?:[^()]|\([^()]*\))*)\)", codes):
            return found[1]
    return ""


def kind_of(name, code=0):
    """The exception class for a code."""
    if name in _MATRIX:
        return MatrixError
    if name in _MEMORY or code in HOST_FAILURES:
        return OutOfMemory
    return QxError if name in _OTHERS or not name.startswith("Err") else ArgumentError


def caller():
    """The public function of a topic that is being called, such as "fft.rfft"; empty for a call of an export."""
    found = ""
    frame: Optional[FrameType] = sys._getframe(1)
    while frame and frame.f_code.co_filename.startswith((_PACKAGE, "<qx ")):
        module = frame.f_globals.get("__name__", "").removeprefix(_NAME)
        # Before Python 3.11 there is only the last part of the name.
        parts = getattr(frame.f_code, "co_qualname", frame.f_code.co_name).split(".")
        if "." not in module and parts[0] in frame.f_globals.get("__all__", ()):
            found = ".".join([module, *(part for part in parts[:2] if not part.startswith(("__", "<")))])
        frame = frame.f_back
    return found


def at(place):
    """A place in the arguments as messages name it, after the topic's function that was called."""
    function = caller()
    return f"qx.{function}: {place}" if function else place


def failure(export, code, results=None, place=""):
    """The exception for a code, of the matching class. It names the topic's function that was called."""
    kind, function = kind_of(library().error_name(code), code), caller()
    error = kind(export, code, results, place)
    return kind(export, code, results, place, f"qx.{function}: {error}") if function else error


def named(error):
    """A failure from a thread, with the name of the called function, which the thread does not know."""
    function = caller()
    if not function or str(error).startswith("qx."):
        return error
    text = f"qx.{function}: {error}"
    if isinstance(error, QxError):
        return type(error)(error.export, error.code, error.results, error.place, text)
    return type(error)(text) if type(error) in (TypeError, ValueError) else error


class QxWarning(UserWarning):
    """A warning: the results are valid."""

    def __init__(self, export, code, message=None):
        self.export, self.code = export, code
        self.name, self.text = library().error_name(code), library().error_text(code)
        self._message = message
        super().__init__(message or f"{export}: {self.text} ({self.name}, {code})")

    def __reduce__(self):
        return QxWarning, (self.export, self.code, self._message)


def is_failure(status):
    return status < 0 or status in HOST_FAILURES


_kept = threading.local()  # the warnings of a thread that its caller handles


def tell(export, status, results, place=""):
    """Raises a failure, or issues a warning at the line that called into the package."""
    if is_failure(status):
        raise failure(export, status, results, place)
    warn(QxWarning(export, status))


def warn(warning):
    """Issues a warning at the line that called into the package, or keeps it under keeping()."""
    kept = getattr(_kept, "warnings", None)
    if kept is not None:
        kept.append(warning)
        return
    level, frame = 1, sys._getframe()
    while frame.f_back and (frame.f_code.co_filename.startswith((_PACKAGE, "<qx "))):
        frame, level = frame.f_back, level + 1
    warnings.warn(warning, stacklevel=level)


def keeping(work, *arguments):
    """The result of work, and its warnings, which the caller handles."""
    before, _kept.warnings = getattr(_kept, "warnings", None), []
    try:
        return work(*arguments), _kept.warnings
    finally:
        _kept.warnings = before
