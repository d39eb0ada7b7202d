"""The command verify: whether the library's results on this machine have the published bits."""

import os
import subprocess
import sys

EPILOG = """\
Every export is called with the arguments of its recipes, and a hash of all results is compared with the hash
published with this version. This takes a few seconds. The exit status is 0 if all agree.

examples:
  python3 -m qx verify
  QX_WIDTH=2 python3 -m qx verify      # as on a processor without AVX2 (4: without AVX-512)"""

PROGRAM, PUBLISHED = "print_hashes", "hashes.txt"


def add(commands):
    import argparse
    command = commands.add_parser("verify", help="compares the results of all exports with the published ones",
                                  description=__doc__, epilog=EPILOG,
                                  formatter_class=argparse.RawDescriptionHelpFormatter)
    command.set_defaults(run=verify)


def _files():
    """The program that prints the hashes, and the published hashes. Both are beside the libraries, or in
    the source tree."""
    from ..library import library
    folder = library().folder
    for published in (folder / PUBLISHED, folder.parent.parent / "tests/conformance" / PUBLISHED):
        if published.exists() and (folder / PROGRAM).exists():
            return folder / PROGRAM, published
    raise LookupError(f"{PROGRAM} and {PUBLISHED} are not beside the libraries in {folder}: a wheel has them "
                      "(tools/package wheel), and in the tree cmake --build build/release --target print_hashes")


def verify(options):
    program, published = _files()
    due = dict(line.split() for line in published.read_text("utf-8").splitlines())
    # Without /proc, the program cannot find the files beside it.
    ran = subprocess.run([program], capture_output=True, text=True,
                         env={**os.environ, "LD_LIBRARY_PATH": str(program.parent)})
    if ran.returncode:
        raise RuntimeError(f"{program} ended with {ran.returncode}: {ran.stderr.strip()[-500:]}")
    found = {line.split()[1]: line.split()[0] for line in ran.stdout.splitlines()}
    differing = sorted(name for name in due.keys() | found.keys() if found.get(name) != due.get(name))
    for name in differing:
        print(f"{name}: {found.get(name, 'no result')}, published {due.get(name, 'nothing')}")
    print(f"{sum(found.get(name) == value for name, value in due.items())} of {len(due)} exports give the published "
          "bits here.")
    if differing:
        sys.stdout.flush()
        raise ValueError(f"{len(differing)} exports give other results than the published ones")
