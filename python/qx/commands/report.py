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

Pages of an earlier report in the folder are replaced. Other files of these names are replaced only with
--force."""


LISTED = 10  # files listed on the terminal


def report_on(options):
    from .. import many
    reading = reading_options.of(options)
    if many.is_many(options.files):
        return report_on_many(options, reading)
    from .. import isolation
    isolation.prepare()  # while this process loads the modules needed after reading
    from .. import outputs, recording, report
    path = os.path.join(options.output, "report.html")
    outputs.check(path, options.force, "report", outputs.identities(options.files))
    with bar() as shown:
        read = recording.read(options.files[0], **reading, progress=shown.update)
        lines = report.write(read, path)  # long recordings are read several times
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
        print(f"skipped because of their file name extensions: {printable(', '.join(left[:LISTED]))}"
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
                          help="analyses recordings: text tables, audio files and others",
                          description="Analyses one or more recordings. If there are several, each has a "
                          "page, and an index links to them.")
    command.add_argument("files", nargs="+", metavar="FILE|FOLDER|PATTERN", help="the recordings; - is standard input")
    reading_options.missing(reading_options.add_options(command), "skip", "interpolate")
    command.add_argument("--output", default="out", metavar="FOLDER",
                         help="folder for the pages, out by default")
    command.add_argument("--workers", type=count, metavar="N",
                         help="number of processes for many recordings; by default, the number of processors")
    command.add_argument("--scheduler", metavar="ADDRESS",
                         help="address of a Dask cluster that processes many recordings; its workers need this "
                         "package and access to the files by the same paths")
    add_force(command, "also replaces files that are not pages of an earlier report")
    command.set_defaults(run=report_on)
