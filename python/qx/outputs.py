"""The files that the commands write. Files are complete or not written at all. A user's file is only replaced on
request, and the file that is being read is never replaced.

A page or plot written by a command has a mark, MARK and the command's name, near its beginning. A file with the
mark may be replaced, so that a command can be repeated.
"""

import contextlib
import os
import re
import stat

MARK = "python3 -m qx"
MARKED = 4096  # bytes at either end of a file in which a mark is looked for


class Exists(ValueError):
    """A file already exists where a command is to write."""


_unfinished = set()
UNFINISHED = re.compile(r"\.\d+\.part\.")  # in the names of files left behind by a process that was killed


def mark(command):
    return f"{MARK} {command}"


def generator(command):
    """The mark of a page, for its head."""
    return f'<meta name="generator" content="{mark(command)}">'


def is_marked(path, command):
    with open(path, "rb") as file:
        ends = file.read(MARKED)
        file.seek(-min(MARKED, os.path.getsize(path)), os.SEEK_END)
        ends += b"\n" + file.read()
    return mark(command).encode() in ends


def _is_file(path):
    """Whether the path is that of a regular file. Pipes and devices are written to directly."""
    return os.path.exists(path) and stat.S_ISREG(os.stat(path).st_mode)


def identity(path):
    """The identity of a file, the same for all its names and links."""
    status = os.stat(path)
    return status.st_dev, status.st_ino


def identities(paths):
    return {identity(path) for path in paths if os.path.exists(path)}


def check(path, force=False, command=None, inputs=frozenset()):
    """Refuses a path that must not be written. `inputs` contains the identities of the files that are read, which
    are never replaced. Another existing file may be replaced with `force`, or if it has the mark of `command`."""
    path = os.fspath(path)
    if not os.path.exists(path):
        return
    if identity(path) in inputs:
        raise Exists(f"{path}: is an input file, which is never replaced")
    if os.path.isdir(path):
        raise Exists(f"{path}: is a folder")
    if _is_file(path) and not force and not (command and is_marked(path, command)):
        raise Exists(f"{path}: exists; --force replaces it")


@contextlib.contextmanager
def whole(path):
    """The path of a new file beside `path`, with the same extension. It replaces `path` at the end of the block, and
    is removed if the block ends with an exception."""
    path = os.path.realpath(path)  # a link is kept, and its target is replaced
    try:
        if os.path.exists(path) and not _is_file(path):
            yield path
            return
        folder, name = os.path.split(path)
        part = os.path.join(folder, f".{os.getpid()}.part.{name}")
        os.close(os.open(part, os.O_WRONLY | os.O_CREAT | os.O_EXCL, 0o666))
        _unfinished.add(part)
        try:
            yield part
            os.replace(part, path)
        finally:
            forget(part)
    except OSError as error:
        raise OSError(f"{path}: cannot be written: {error.strerror or error}") from None


def forget(part):
    _unfinished.discard(part)
    with contextlib.suppress(FileNotFoundError):
        os.remove(part)


def forget_all():
    """Removes unfinished files before the process ends immediately."""
    for part in list(_unfinished):
        forget(part)


def make_folder(path):
    try:
        os.makedirs(path, exist_ok=True)
    except OSError as error:
        raise OSError(f"{path}: cannot be created: {error.strerror}") from None


def write_text(path, text):
    folder = os.path.dirname(path)
    if folder:
        make_folder(folder)
    with whole(path) as part, open(part, "w", encoding="utf-8", newline="") as file:
        file.write(text)


def add_force(command, text="replaces existing files"):
    command.add_argument("--force", action="store_true", help=text)
