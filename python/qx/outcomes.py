"""Failures and warnings of the exports."""

import os
import sys
import warnings

from .library import library

HOST_FAILURES = (1, 2)  # statuses of the host that some exports pass on
_PACKAGE = os.path.dirname(os.path.abspath(__file__))


class QxError(Exception):
    """A failure: `code`, `name` and `text` as the host has them, `export`, and `results` with
    what the export left behind. Most failures leave empty arrays and NaN."""

    def __init__(self, export, code, results=None, place=""):
        self.export, self.code, self.results, self.place = export, code, results, place
        self.name, self.text = library().error_name(code), library().error_text(code)
        super().__init__(f"{export}{place}: {self.text} ({self.name}, {code})")

    def __reduce__(self):
        return QxError, (self.export, self.code, self.results, self.place)


class QxWarning(UserWarning):
    """A warning: the results stand."""

    def __init__(self, export, code):
        self.export, self.code = export, code
        self.name, self.text = library().error_name(code), library().error_text(code)
        super().__init__(f"{export}: {self.text} ({self.name}, {code})")

    def __reduce__(self):
        return QxWarning, (self.export, self.code)


def is_failure(status):
    return status < 0 or status in HOST_FAILURES


def tell(export, status, results, place=""):
    """Raises a failure; gives a warning at the line that called into the package."""
    if is_failure(status):
        raise QxError(export, status, results, place)
    level, frame = 1, sys._getframe()
    while frame.f_back and (frame.f_code.co_filename.startswith((_PACKAGE, "<qx "))):
        frame, level = frame.f_back, level + 1
    warnings.warn(QxWarning(export, status), stacklevel=level)
