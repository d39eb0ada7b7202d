#!/usr/bin/python3
"""fortran_order.py SOURCE NAME...: the files of a source of LAPACK, with its BLAS, that hold the named
routines, and all that these mention, in an order in which they can be compiled. A routine named with a
dash before it, "-dgemm", is left out: it comes from elsewhere.

Prints a line for each file, "STAGE PATH". A file uses modules of files of lower stages only, so the
files of one stage can be compiled at the same time.
"""

import re
import sys
from pathlib import Path

SUFFIXES = {".f", ".f90"}
MODULE = re.compile(r"\s*module\s+(?!procedure\b)(\w+)\s*", re.IGNORECASE)
USE = re.compile(r"\s*use\b(?:\s*,\s*non_intrinsic\s*::|\s*::)?\s*(\w+)", re.IGNORECASE)


class File:
    """A source: the words in its code, the modules in it and those that it uses."""

    def __init__(self, path):
        self.path = path
        free = path.suffix.lower() == ".f90"
        code = [line.split("!")[0] for line in path.read_text("utf-8", errors="replace").splitlines()
                if free or line[:1] not in ("c", "C", "*", "!")]
        statements = ";".join(code).split(";")
        self.words = {word.lower() for line in code for word in re.findall(r"[A-Za-z]\w*", line)}
        self.modules = {found[1].lower() for text in statements if (found := MODULE.fullmatch(text))}
        self.uses = {found[1].lower() for text in statements if (found := USE.match(text))}


def files_of(source):
    """The file of each routine and of each module, by name."""
    files = {}
    for folder in ("SRC", "INSTALL", "BLAS/SRC"):
        for path in sorted((source / folder).glob("*")):
            name = path.stem.lower()
            if path.suffix.lower() in SUFFIXES and not name.endswith("test") and name not in (
                    "xerbla", "xerbla_array"):
                files[name] = File(path)
    for file in list(files.values()):
        files.update(dict.fromkeys(file.modules, file))
    return files


def closure(files, names):
    """The files of the names and of all that they mention, by path."""
    wanted, taken = list(names), {}
    while wanted:
        file = files.get(wanted.pop())
        if file and file.path not in taken:
            taken[file.path] = file
            wanted += file.words
    return [taken[path] for path in sorted(taken)]


def stages(chosen):
    """Each file with its stage, from the lowest; within a stage by path."""
    holders = {module: file for file in chosen for module in file.modules}
    found = {}

    def stage(file, users=()):
        if file in users:
            sys.exit(f"{file.path} uses modules that use it")
        if file not in found:
            needed = {holders[name] for name in file.uses - file.modules if name in holders}
            found[file] = max((stage(other, (*users, file)) + 1 for other in needed), default=0)
        return found[file]

    return sorted(((stage(file), file.path) for file in chosen))


def main(source, *names):
    files = files_of(Path(source))
    if missing := [name for name in names if name.lstrip("-") not in files]:
        sys.exit(f"{source} has no {', '.join(missing)}")
    for name in names:
        if name.startswith("-"):
            del files[name[1:]]
    names = [name for name in names if name in files]
    for stage, path in stages(closure(files, names)):
        print(stage, path)


if __name__ == "__main__":
    main(*sys.argv[1:])
