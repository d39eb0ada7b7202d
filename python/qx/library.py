"""The module and the stand-in host as ctypes libraries, and the catalogue of the exports.

ctypes.CDLL releases the interpreter's lock during every call, so calls from several Python threads run in
parallel.
"""

import ctypes
import functools
import json
import os
import sys
from pathlib import Path

PACKAGE = Path(__file__).resolve().parent
NAMES = ("qxanalysis.dll", "qxrt.dll") if sys.platform == "win32" else (
    "libqxanalysis.so", "libqxrt.so")


class NotBuilt(ImportError):
    """The libraries were not found."""


class Library:
    """Both libraries, loaded once. The host is loaded first, since the module looks for it by name among the
    libraries of the process."""

    def __init__(self, folder, catalogue):
        module_name, host_name = NAMES
        self.folder = folder
        self.host = ctypes.CDLL(str(folder / host_name))
        self.module = ctypes.CDLL(str(folder / module_name))
        self.catalogue = json.loads(catalogue.read_text("utf-8"))
        self.entries = {entry["name"]: entry for entry in self.catalogue["exports"]}
        self.records = self.catalogue["records"]
        self._declare_host()

    def _declare_host(self):
        pointer, int32 = ctypes.c_void_p, ctypes.c_int32
        for name, result, arguments in (
                ("QXHostNew1D", pointer, [int32, int32]),
                ("QXHostNew2D", pointer, [int32, int32, int32]),
                ("QXHostCopy1D", pointer, [int32, int32, pointer]),
                ("QXHostCopy2D", pointer, [int32, int32, int32, pointer]),
                ("QXHostCopy3D", pointer, [int32, int32, int32, int32, pointer]),
                ("QXHostCopyRecords", pointer, [int32, int32, pointer]),
                ("QXHostFree", None, [pointer]),
                ("QXHostReleaseObject", int32, [pointer]),
                ("QXHostCalls", int32, [pointer, ctypes.c_char_p, ctypes.c_int64, pointer, pointer]),
                ("QXHostErrorText", ctypes.c_char_p, [int32]),
                ("QXHostErrorName", ctypes.c_char_p, [int32])):
            function = getattr(self.host, name)
            function.restype, function.argtypes = result, arguments

    def error_name(self, code):
        return self.host.QXHostErrorName(code).decode()

    def error_text(self, code):
        return self.host.QXHostErrorText(code).decode()


def folders():
    """The folders in which the libraries are looked for: only QX_LIBRARY_DIR if it is set, or else the folder of
    the package and the release build of the source tree."""
    chosen = os.environ.get("QX_LIBRARY_DIR")
    if chosen:
        return [Path(chosen).resolve()]
    return [PACKAGE, PACKAGE.parent.parent / "build" / "release"]


@functools.lru_cache(maxsize=None)
def library():
    for folder in folders():
        # The catalogue is beside the libraries, or where an installation has it.
        for catalogue in (folder / "catalogue.json",
                          *(prefix / "share/qxanalysis/catalogue.json" for prefix in [*folder.parents][:2])):
            if catalogue.exists() and all((folder / name).exists() for name in NAMES):
                return Library(folder, catalogue)
    places = ", ".join(str(folder) for folder in folders())
    raise NotBuilt(f"{', '.join(NAMES)} and catalogue.json not found in {places}: build them with "
                   "./run, or set QX_LIBRARY_DIR to their folder")
