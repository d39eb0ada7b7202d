"""Writes the stub files, for type checkers and editors: python3 -m qx.stubs FILE [EXPORTS], of the package
and of qx.exports."""

import re
import sys
from pathlib import Path

from .functions import documentation, parameters, returned
from .library import library
from .topical.newest import TOPICS

HEAD = '''"""The exports as functions. Written by qx.stubs from the catalogue."""

from builtins import list as _list
from collections.abc import Callable, Mapping
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from . import exports as exports, {topics}
from .calls import NoSuchExport as NoSuchExport, call as call
from .catalogue import Found
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

EXPORTS_HEAD = '''"""Every export as a function. Written by qx.stubs from the catalogue."""

from collections.abc import Mapping
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .pointers import Pointer
'''


def stub(entry):
    """The function in a stub file."""
    text = re.sub(r": '([^']*)'", r": \1", parameters(entry))
    lines = documentation(entry).replace("\\", "\\\\").replace('"""', "'''").split("\n")
    body = "\n".join([lines[0], *(f"    {line}" if line else "" for line in lines[1:])])
    return f'def {entry["name"]}({text}) -> {returned(entry)}:\n    """{body}"""\n'


def text():
    topics = ", ".join(f"{topic} as {topic}" for topic in TOPICS)
    return "\n\n".join([HEAD.replace("{topics}", topics), *map(stub, library().catalogue["exports"])])


def text_of_exports():
    return "\n\n".join([EXPORTS_HEAD, *map(stub, library().catalogue["exports"])])


if __name__ == "__main__":
    for path, written in zip(sys.argv[1:], (text, text_of_exports)):
        Path(path).write_text(written(), "utf-8")
