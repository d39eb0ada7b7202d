"""Functions that the parsers and options of several commands share."""

import argparse
import sys


def positive(text):
    value = float(text)
    if not 0 < value < float("inf"):
        raise argparse.ArgumentTypeError(f"{text} is not above 0")
    return value


def add_command(commands, name, examples, **texts):
    """The parser of a command, whose help ends with the examples, unchanged. `texts` contains `help`, one
    line, and `description` where one line is not enough."""
    texts.setdefault("description", texts["help"][:1].upper() + texts["help"][1:] + ".")
    return commands.add_parser(name, epilog=examples,
                               formatter_class=argparse.RawDescriptionHelpFormatter, **texts)


def bar():
    """A progress bar of samples on a terminal, removed at the end. Work done within a second shows no bar."""
    import tqdm
    return tqdm.tqdm(unit=" samples", unit_scale=True, delay=1, leave=False, disable=not sys.stderr.isatty())
