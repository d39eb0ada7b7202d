"""The command report."""

import argparse
import os
import sys

from ..outputs import add_force
from . import reading as reading_options
from .values import add_command, bar

EXAMPLES = """\
examples:
  python3 -m qx report examples/data/ecg_208_360hz.csv
  python3 -m qx report examples/data/ecg_208_360hz.csv --start 3600 --output second-part
  python3 -m qx report examples/data --workers 2 --output many
  python3 -m qx report "examples/data/*.csv" --rate 360

Pages of an earlier report in the folder are replaced; other files of their names only with --force."""


LISTED = 10  # files on the terminal


def report_on(options):
    from .. import many
    reading = reading_options.of(options)
    if many.is_many(options.files):
        return report_on_many(options, reading)
    from .. import isolation
    isolation.prepare()  # while this process loads what comes after reading
    from .. import outputs, recording, report
    path = os.path.join(options.output, "report.html")
    outputs.check(path, options.force, "report", outputs.identities(options.files))
    with bar() as shown:
        read = recording.read(options.files[0], **reading, progress=shown.update)
        lines = report.write(read, path)  # long recordings are passed several times
    for line in lines:
        print(line)
    print(f"\nThe report with plots: {path}")


def report_on_many(options, reading):
    import tqdm

    from .. import many
    from ..files import printable
    shown = tqdm.tqdm(unit=" recordings", disable=not sys.stderr.isatty())

    def tell(outcome):
        if outcome.failure:
            shown.write(f"qx: {outcome.failure}", file=sys.stderr)
        shown.update()

    try:
        found = many.write([os.fspath(path) for path in options.files], options.output, reading,
                           options.workers, options.scheduler, tell, shown.reset, options.force)
    except BaseException:
        shown.leave = False
        raise
    finally:
        shown.close()
    read = sum(not outcome.failure for outcome in found)
    print(f"{read} of {len(found)} recordings were read: {os.path.join(options.output, 'index.html')}")
    if left := many.left_out(options.files):
        print(f"left out by their endings: {printable(', '.join(left[:LISTED]))}"
              + f" and {len(left) - LISTED} more, which the index lists" * (len(left) > LISTED))
    if not read:
        raise many.InputError("no recording could be read")


def count(text):
    value = int(text)
    if value < 1:
        raise argparse.ArgumentTypeError(f"{text} is not above 0")
    return value


def add(commands):
    command = add_command(commands, "report", EXAMPLES,
                          help="analyses recordings, text tables or audio files",
                          description="Analyses a recording, or many: each has a page then, and "
                          "an index leads to them.")
    command.add_argument("files", nargs="+", metavar="FILE|FOLDER|PATTERN", help="- is standard input")
    reading_options.missing(reading_options.add_options(command), "skip", "interpolate")
    command.add_argument("--output", default="out", metavar="FOLDER",
                         help="where the pages go, out by default")
    command.add_argument("--workers", type=count, metavar="N",
                         help="processes for many recordings; as many as processors by default")
    command.add_argument("--scheduler", metavar="ADDRESS",
                         help="of a Dask cluster that is given many recordings; its workers have this "
                         "package and reach the files by the same paths")
    add_force(command, "replaces files that are no pages of an earlier report")
    command.set_defaults(run=report_on)
