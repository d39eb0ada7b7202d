"""The command line: python3 -m qx COMMAND; the commands stand in qx/commands."""

import argparse
import io
import os
import sys

from .commands import add_all
from .interruption import EXIT, Watch

EXIT_WRONG = 2
EXAMPLES = """\
examples:
  python3 -m qx report examples/data/ecg_208_360hz.csv
  python3 -m qx list variance

python3 -m qx COMMAND --help has the options and examples of a command."""


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
        if isinstance(stream, io.TextIOWrapper):  # and no stand-in
            stream.reconfigure(errors="replace")
    try:
        options.run(options)
        sys.stdout.flush()
    except BrokenPipeError:
        os.dup2(os.open(os.devnull, os.O_WRONLY), sys.stdout.fileno())
    except Exception as error:  # every failure is one line for the user
        if os.environ.get("QX_TRACEBACK"):
            raise
        message = str(error.args[0]) if isinstance(error, LookupError) and error.args else str(error)
        print(f"qx: {message or type(error).__name__}", file=sys.stderr)
        return EXIT_WRONG
    return 0


def run():
    """main() for a process of its own."""
    with Watch():
        return main()
    return EXIT


if __name__ == "__main__":
    sys.exit(run())
