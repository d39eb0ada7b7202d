"""The kind of a file, by its first bytes, and its contents, which may be compressed or come from a pipe."""

import bz2
import contextlib
import gzip
import io
import lzma
import os
import re
import shutil
import tempfile
import zipfile

HEAD = 1 << 16
PIPE = "-"
UNPACKING = {b"\x1f\x8b": gzip.open, b"BZh": bz2.open, b"\xfd7zXZ\0": lzma.open}
ZSTD = b"\x28\xb5\x2f\xfd"
COMPRESSED = (".gz", ".bz2", ".xz", ".zst", ".zip")

# Files that begin like this are read by stored.py ...
ARRAYS = ((b"\x93NUMPY", "npy"), (b"\x89HDF\r\n\x1a\n", "hdf5"), (b"PAR1", "parquet"),
          (b"\xffBIOSEMI", "bdf"), (b"\xd0\xcf\x11\xe0\xa1\xb1\x1a\xe1", "xls"))
# ... and files that begin like this are not supported.
FOREIGN = (
    (rb"%PDF-", "a PDF document"), (rb"\s*<(?:!doctype html|html)", "an HTML page"),
    (rb"\s*<\?xml", "an XML document"), (rb"\{\\rtf", "an RTF document"),
    (rb"\s*\{\s*\"|\s*\[\s*[\[{\"]", "JSON"), (rb"\x89PNG", "a PNG picture"),
    (rb"\xff\xd8\xff", "a JPEG picture"), (rb"GIF8", "a GIF picture"), (rb"II\*\0|MM\0\*", "a TIFF picture"),
    (rb"RIFF....AVI ", "an AVI video"), (rb"RIFF....WEBP", "a WebP picture"), (rb"....ftyp", "an MP4 video or sound"),
    (rb"\x1aE\xdf\xa3", "a Matroska video or sound"), (rb"7z\xbc\xaf\x27\x1c", "a 7z archive"),
    (rb"Rar!\x1a\x07", "a RAR archive"), (rb".{257}ustar", "a tar archive"),
    (rb"SQLite format 3\0", "an SQLite database"), (rb"\x7fELF", "a program"),
    (rb"MZ.{0,200}\0", "a program for Windows"), (rb"ARROW1|FEA1", "an Arrow (Feather) table"),
    (rb"ORC", "an ORC table"), (rb"CDF[\x01\x02\x05]", "a netCDF file"), (rb"SIMPLE  =", "a FITS file"),
    (rb"\x0e\x03\x13\x01", "an HDF4 file"), (rb"MDF     |UnFinMF ", "an MDF recording"),
    (rb"GDF [12]", "a GDF recording"), (rb"ABF2?[ \0]", "an ABF recording"),
    (rb"\x80[\x02-\x05]", "a Python pickle"))
# A text may begin with the same bytes, but it has no byte 0.
BINARY = {"an ORC table", "an MP4 video or sound", "an ABF recording", "an Arrow (Feather) table",
          "an MDF recording"}


CONTROL = re.compile("[\x00-\x1f\x7f-\x9f\u061c\u200e\u200f\u2028-\u202e\u2066-\u2069\ud800-\udfff]")


def printable(text):
    """A text from a file, or the name of a file, without terminal control characters and without marks that
    change the writing direction."""
    return CONTROL.sub(lambda found: " " if found[0] in "\t\n\r" else "\N{REPLACEMENT CHARACTER}", text)


class InputError(Exception):
    """A problem with an input, with file and line, in one line that can be shown on a terminal."""

    def __init__(self, text=""):
        super().__init__(printable(text))


def needs(what, package):
    """The error for a file whose reader is not installed."""
    return InputError(f"{what}: reading needs {package}")


@contextlib.contextmanager
def unpacking(path):
    """Turns an exception of an unpacker into an InputError. A broken file can cause exceptions of any kind."""
    try:
        yield
    except (InputError, MemoryError):
        raise
    except Exception as error:
        raise InputError(f"{path}: cannot be unpacked, perhaps cut off: {error or type(error).__name__}") from None


class _Unpacked(io.RawIOBase):
    """A stream that unpacks as it is read."""

    def __init__(self, path, unpack):
        self._path = path
        with unpacking(path):
            self._stream = unpack()

    def readable(self):
        return True

    def readinto(self, room):
        with unpacking(self._path):
            found = self._stream.read(len(room))
        room[:len(found)] = found
        return len(found)

    def close(self):
        if not self.closed:
            self._stream.close()
        super().close()


class Source:
    """The contents of a file, which messages call `path`. It is a context manager, which deletes its copies at
    the end."""

    def __init__(self, path, file):
        self.path, self._file = path, file
        self.name = os.path.basename(self.path)
        self._folder, self._unpack, self._local = None, None, None
        self._open = contextlib.ExitStack()
        if not os.path.exists(self._file):
            raise InputError(f"{self.path}: no such file")
        if os.path.isdir(self._file):
            raise InputError(f"{self.path}: is a folder; a text table or an audio file is needed")
        with open(self._file, "rb") as file:
            self.head = file.read(HEAD)
        self._look_inside()

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self._open.close()
        if self._folder:
            self._folder.cleanup()

    def _copy(self, stream):
        """The path of a file with the contents of a stream."""
        if not self._folder:
            self._folder = tempfile.TemporaryDirectory(prefix="qx-")
        handle, path = tempfile.mkstemp(dir=self._folder.name)
        try:
            with open(handle, "wb") as file:
                shutil.copyfileobj(stream, file, 1 << 20)
        except OSError as error:
            raise InputError(f"{self.path}: cannot be unpacked into {tempfile.gettempdir()}: {error.strerror}") from None
        return path

    def _look_inside(self):
        self.members = []
        for mark, unpack in UNPACKING.items():
            if self.head.startswith(mark):
                self._unpack = lambda unpack=unpack: unpack(self._file, "rb")
        if self.head.startswith(ZSTD):
            self._unpack = self._zstd
        if self.head.startswith(b"PK\x03\x04"):
            with unpacking(self.path), zipfile.ZipFile(self._file) as archive:
                self.members = [name for name in archive.namelist()
                                if not name.endswith("/") and not name.startswith("__MACOSX/")]
            if len(self.members) == 1 and not self.members[0].endswith(".npy"):
                self._unpack = lambda: zipfile.ZipFile(self._file).open(self.members[0])
        if self._unpack:
            with self.open() as stream:
                self.head = stream.read(HEAD)

    def _zstd(self):
        try:
            import zstandard
        except ImportError:
            raise needs(f"{self.path}: compressed by zstd", "the package python3-zstandard") from None
        return zstandard.open(self._file, "rb")

    def open(self):
        """The contents as a stream of bytes from the start."""
        return io.BufferedReader(_Unpacked(self.path, self._unpack), 1 << 18) if self._unpack else open(self._file, "rb")

    def local(self):
        """The path of a file with the unpacked contents."""
        if not self._unpack:
            return self._file
        if not self._local:
            with self.open() as stream:
                self._local = self._copy(stream)
        return self._local

    def keep(self, file):
        """Keeps an open file, which is closed together with the contents."""
        return self._open.enter_context(file)

    def kind(self):
        """The kind that stored.py reads, or an empty text. Unsupported kinds are refused by their names."""
        if not self._unpack and self.members:
            return self._kind_of_archive()
        for start, kind in ARRAYS:
            if self.head.startswith(start) and (kind != "parquet" or b"\0" in self.head):
                return kind
        if self.head[512:520] == ARRAYS[1][0]:
            return "hdf5"  # after a user block
        if b"MAT-file" in self.head[:128] or self.name.lower().endswith(".mat") and b"\0" in self.head[:128]:
            return "mat"
        if self.head.startswith(b"0       ") and len(self.head) >= 256 and b"\n" not in self.head[:256]:
            return "edf"
        for pattern, name in FOREIGN:
            if re.match(pattern, self.head[:512], re.IGNORECASE | re.DOTALL) and (
                    name not in BINARY or b"\0" in self.head):
                raise InputError(f"{self.path}: is {name}, which is not a supported recording")
        return ""

    def _kind_of_archive(self):
        names = set(self.members)
        if all(name.endswith(".npy") for name in names):
            return "npz"
        if "xl/workbook.xml" in names:
            return "xlsx"
        if "mimetype" in names and "content.xml" in names:
            with unpacking(self.path), zipfile.ZipFile(self._file) as archive:
                if b"spreadsheet" in archive.read("mimetype"):
                    return "ods"
        if "[Content_Types].xml" in names or "mimetype" in names:
            raise InputError(f"{self.path}: is an office document without a table")
        raise InputError(f"{self.path}: is an archive of {len(names)} files, {', '.join(sorted(names)[:5])}"
                         f"{' and more' if len(names) > 5 else ''}: unpacked, its folder is read")
