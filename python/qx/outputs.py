"""What the commands write: whole files only, never over a file of the user's unless they ask for it,
and never over the file that is being read.

A page or drawing of a command carries a mark, MARK and the command's name, near its beginning. A
file with the mark may be made anew, so that a command can be repeated.
"""

import contextlib
import os
import re
import stat

MARK = "python3 -m qx"
MARKED = 4096  # bytes at either end of a file in which a mark is looked for


class Exists(ValueError):
    """A file stands where a command is to write."""


_unfinished = set()
UNFINISHED = re.compile(r"\.\d+\.part\.")  # how names begin of what a process that was killed has left behind


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
    """Whether a regular file stands there; a pipe or a device is written to as it is."""
    return os.path.exists(path) and stat.S_ISREG(os.stat(path).st_mode)


def identity(path):
    """What all names and links of a file share."""
    status = os.stat(path)
    return status.st_dev, status.st_ino


def identities(paths):
    return {identity(path) for path in paths if os.path.exists(path)}


def check(path, force=False, command=None, inputs=frozenset()):
    """Refuses a path that must not be written. `inputs` has the identities of the files that are read:
    they are never replaced. What stands there already is replaced with `force`, or where it has the
    mark of `command`."""
    path = os.fspath(path)
    if not os.path.exists(path):
        return
    if identity(path) in inputs:
        raise Exists(f"{path}: is a file that is read, and is never replaced")
    if os.path.isdir(path):
        raise Exists(f"{path}: is a folder")
    if _is_file(path) and not force and not (command and is_marked(path, command)):
        raise Exists(f"{path}: exists; --force replaces it")


@contextlib.contextmanager
def whole(path):
    """The path of a new file beside `path`, which takes its place when the block is left, and is
    removed where that is by an exception. Its name ends as that of `path` does."""
    path = os.path.realpath(path)  # a link stays, and what it leads to is replaced
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
    """Removes what is unfinished, before the process ends at once."""
    for part in list(_unfinished):
        forget(part)


def make_folder(path):
    try:
        os.makedirs(path, exist_ok=True)
    except OSError as error:
        raise OSError(f"{path}: cannot be made: {error.strerror}") from None


def write_text(path, text):
    folder = os.path.dirname(path)
    if folder:
        make_folder(folder)
    with whole(path) as part, open(part, "w", encoding="utf-8", newline="") as file:
        file.write(text)


def add_force(command, text="replaces files that exist"):
    command.add_argument("--force", action="store_true", help=text)
