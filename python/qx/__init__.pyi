"""The names of the package. Written by qx.stubs."""

from builtins import list as _list
from collections.abc import Callable
from typing import Any

from . import exports as exports
from . import filters as filters
from . import fft as fft
from . import windows as windows
from . import spectra as spectra
from . import signals as signals
from . import noise as noise
from . import multirate as multirate
from . import linalg as linalg
from . import poly as poly
from . import fit as fit
from . import interpolate as interpolate
from . import calculus as calculus
from . import stats as stats
from . import special as special
from . import measure as measure
from . import coordinates as coordinates
from .calls import NoSuchExport as NoSuchExport, call as call
from .catalogue import Found
from .exports import *
from .library import NotBuilt as NotBuilt
from .outcomes import ArgumentError as ArgumentError, MatrixError as MatrixError, \
    OutOfMemory as OutOfMemory, QxError as QxError, QxWarning as QxWarning
from .plans import release as release
from .pointers import Pointer as Pointer

__version__: str

def export(name: str) -> Callable[..., Any]: ...
def list(pattern: str = "*") -> Found: ...
def names() -> _list[str]: ...
