"""The command line, python3 -m qx COMMAND. The commands are in qx/commands."""

import argparse
import contextlib
import errno
import io
import os
import sys

from .commands import add_all
from .files import printable
from .interruption import EXIT, Watch

EXIT_WRONG = 2
FULL = (errno.ENOSPC, errno.EDQUOT, errno.EFBIG, errno.EIO)
EXAMPLES = """\
examples:
  python3 -m qx report examples/data/ecg_208_360hz.csv
  python3 -m qx list variance

python3 -m qx COMMAND --help shows the options and examples of a command."""


def parser():
    parser = argparse.ArgumentParser(prog="python3 -m qx", description="The analysis library.",
                                     epilog=EXAMPLES,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    add_all(parser.add_subparsers(dest="command", required=True))
    return parser


def arguments(argv):
    return parser().parse_args(argv)


def main(argv=None):
    options = arguments(argv)
    for stream in (sys.stdout, sys.stderr):
        if isinstance(stream, io.TextIOWrapper):  # not a substitute
            stream.reconfigure(errors="replace")
    try:
        options.run(options)
        _flush()
    except BrokenPipeError:
        os.dup2(os.open(os.devnull, os.O_WRONLY), sys.stdout.fileno())
    except Exception as error:  # every failure is reported in one line
        if os.environ.get("QX_TRACEBACK"):
            raise
        with contextlib.suppress(OSError):
            _flush()
        print(f"qx: {_line_of(error)}", file=sys.stderr)
        return EXIT_WRONG
    return 0


def _flush():
    """Flushes standard output. If that fails, the rest is dropped and not tried again at exit."""
    try:
        sys.stdout.flush()
    except BrokenPipeError:
        raise
    except OSError as error:
        os.dup2(os.open(os.devnull, os.O_WRONLY), sys.stdout.fileno())
        raise OSError(error.errno, error.strerror) from None


def _line_of(error):
    """What went wrong, in one line."""
    if isinstance(error, OSError) and error.strerror:
        # An error without a file name concerns standard output: outputs.py names its files.
        place = error.filename or ("standard output: cannot be written" if error.errno in FULL else "")
        text = f"{place}: {error.strerror}" if place else error.strerror
    else:
        text = str(error.args[0]) if isinstance(error, LookupError) and error.args else str(error)
    return printable(text) or type(error).__name__


def run():
    """main() as the entry point of a process."""
    with Watch():
        return main()
    return EXIT


if __name__ == "__main__":
    sys.exit(run())
