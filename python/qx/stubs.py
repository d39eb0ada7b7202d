"""Writes the stub file of the package, for type checkers and editors: python3 -m qx.stubs FILE."""

import re
import sys
from pathlib import Path

from .functions import documentation, parameters, returned
from .library import library

HEAD = '''"""The exports as functions. Written by qx.stubs from the catalogue."""

from builtins import list as _list
from collections.abc import Callable, Mapping
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .calls import NoSuchExport as NoSuchExport, call as call
from .catalogue import Found
from .library import NotBuilt as NotBuilt
from .outcomes import QxError as QxError, QxWarning as QxWarning
from .plans import release as release
from .pointers import Pointer as Pointer

__version__: str

def export(name: str) -> Callable[..., Any]: ...
def list(pattern: str = "*") -> Found: ...
def names() -> _list[str]: ...
'''


def stub(entry):
    """The function in a stub file."""
    text = re.sub(r": '([^']*)'", r": \1", parameters(entry))
    lines = documentation(entry).replace("\\", "\\\\").replace('"""', "'''").split("\n")
    body = "\n".join([lines[0], *(f"    {line}" if line else "" for line in lines[1:])])
    return f'def {entry["name"]}({text}) -> {returned(entry)}:\n    """{body}"""\n'


def text():
    return "\n\n".join([HEAD, *map(stub, library().catalogue["exports"])])


if __name__ == "__main__":
    Path(sys.argv[1]).write_text(text(), "utf-8")
