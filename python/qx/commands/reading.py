"""The options for reading a recording, which are the same for every command."""

from .values import positive


def add_options(command, signal=True):
    """Adds the options of recording.read; without `signal`, only those for the text of a table."""
    group = command.add_argument_group("how the file is read (docs/recordings.md has the rules)")
    if signal:
        group.add_argument("--rate", type=positive, metavar="HZ",
                           help="samples per second; the times in the file are then not read")
        group.add_argument("--column", metavar="NAME", help="column or channel, by name or number")
        group.add_argument("--start", type=int, default=0, metavar="SAMPLES",
                           help="number of samples to skip at the start")
    group.add_argument("--time", metavar="NAME|none", help="column of times, by name or number; none: there is no "
                       "such column" + ("" if signal else ", and x is the row number"))
    group.add_argument("--dates", choices=("dmy", "mdy"),
                       help="order of day and month in ambiguous dates")
    group.add_argument("--decimal", choices=("point", "comma"), help="decimal mark of the numbers in a table")
    group.add_argument("--thousands", action="store_true",
                       help="reads a single point or comma before three digits as a thousands separator")
    return group


def missing(group, *choices):
    group.add_argument("--missing", choices=choices,
                       help="what to do with missing values, which are otherwise refused")


def of(options):
    """The arguments of recording.read from the options."""
    return {name: getattr(options, name) for name in (
        "rate", "column", "time", "start", "dates", "decimal", "thousands", "missing")}
