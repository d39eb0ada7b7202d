"""The command report."""

import os

from .values import positive


def report_on(options):
    from .. import recording, report
    read = recording.read(options.file, options.rate, options.column, options.decimal, options.missing,
                          options.start)
    path = os.path.join(options.output, "report.html")
    for line in report.write(read, path):
        print(line)
    print(f"\nThe report with plots: {path}")


def add(commands):
    command = commands.add_parser("report", help="analyses a recording, a text table or an audio file")
    command.add_argument("file")
    command.add_argument("--rate", type=positive, metavar="HZ", help="samples per second")
    command.add_argument("--column", metavar="NAME", help="column or channel, a name or a number")
    command.add_argument("--decimal", choices=("point", "comma"), help="of the numbers in a table")
    command.add_argument("--missing", choices=("skip", "interpolate"),
                         help="what becomes of missing values, which are refused otherwise")
    command.add_argument("--start", type=int, default=0, metavar="SAMPLES",
                         help="samples to leave out at the start")
    command.add_argument("--output", default="out", metavar="FOLDER",
                         help="where report.html goes, out by default")
    command.set_defaults(run=report_on)
