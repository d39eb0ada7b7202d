"""The command report."""

import os

from .values import positive


def report_on(options):
    from .. import recording, report
    read = recording.read(options.file, options.rate, options.column)
    path = os.path.join(options.output, "report.html")
    for line in report.write(read, path):
        print(line)
    print(f"\nThe report with plots: {path}")


def add(commands):
    command = commands.add_parser("report", help="analyses a recording, CSV or WAV")
    command.add_argument("file")
    command.add_argument("--rate", type=positive, metavar="HZ", help="samples per second")
    command.add_argument("--column", metavar="NAME", help="column or channel, a name or a number")
    command.add_argument("--output", default="out", metavar="FOLDER",
                         help="where report.html goes, out by default")
    command.set_defaults(run=report_on)
