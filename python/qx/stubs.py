"""Writes the stub files, for type checkers and editors, into a folder:

    python3 -m qx.stubs [FOLDER | --check]

The files are `__init__.pyi`, for the package, and `exports.pyi`, with every export. Without a folder, they are
written beside the modules, with one sentence on each export instead of its full text, which changes more often than
the arguments. With --check, nothing is written, and the status is 0 if the files are up to date.
"""

import re
import sys
from pathlib import Path

from .catalogue import summary
from .functions import documentation, parameters, returned
from .library import library
from .topical.newest import TOPICS

HERE = Path(__file__).parent

PACKAGE = '''"""The names of the package. Written by qx.stubs."""

from builtins import list as _list
from collections.abc import Callable
from typing import Any

from . import exports as exports
{topics}
from .calls import NoSuchExport as NoSuchExport, call as call
from .catalogue import Found
from .exports import *
from .library import NotBuilt as NotBuilt
from .outcomes import ArgumentError as ArgumentError, MatrixError as MatrixError, \\
    OutOfMemory as OutOfMemory, QxError as QxError, QxWarning as QxWarning
from .plans import release as release
from .pointers import Pointer as Pointer

__version__: str

def export(name: str) -> Callable[..., Any]: ...
def list(pattern: str = "*") -> Found: ...
def names() -> _list[str]: ...
'''

EXPORTS = '''"""Every export as a function. Written by qx.stubs from the catalogue."""

from collections.abc import Callable, Mapping
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .pointers import Pointer
'''


def stub(entry, is_full):
    """The function in a stub file."""
    signature = re.sub(r": '([^']*)'", r": \1", parameters(entry))
    text = documentation(entry) if is_full else summary(entry, 100)
    lines = text.replace("\\", "\\\\").replace('"""', "'''").split("\n")
    body = "\n".join([lines[0], *(f"    {line}" if line else "" for line in lines[1:])])
    return f'def {entry["name"]}({signature}) -> {returned(entry)}:\n    """{body}"""\n'


def texts(is_full=True):
    """The files by their names."""
    topics = "\n".join(f"from . import {topic} as {topic}" for topic in TOPICS)
    exports = [EXPORTS, *(stub(entry, is_full) for entry in library().catalogue["exports"])]
    return {"__init__.pyi": PACKAGE.replace("{topics}", topics), "exports.pyi": "\n\n".join(exports)}


def main(*arguments):
    if arguments == ("--check",):
        return int(any((HERE / name).read_text("utf-8") != text for name, text in texts(False).items()))
    for name, text in texts(bool(arguments)).items():
        Path(*(arguments or [HERE]), name).write_text(text, "utf-8")
    return 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
