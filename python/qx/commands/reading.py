"""The options with which a recording is read, the same for every command."""

from .values import positive


def add_options(command, signal=True):
    """Options of recording.read; without `signal` those that concern the text of a table."""
    group = command.add_argument_group("how the file is read (docs/recordings.md has the rules)")
    if signal:
        group.add_argument("--rate", type=positive, metavar="HZ",
                           help="samples per second; the times in the file are not read then")
        group.add_argument("--column", metavar="NAME", help="column or channel, a name or a number")
        group.add_argument("--start", type=int, default=0, metavar="SAMPLES",
                           help="samples to leave out at the start")
    group.add_argument("--time", metavar="NAME|none", help="column of times, a name or a number; none: no column "
                       "is one" + ("" if signal else ", and x is the number of the row"))
    group.add_argument("--dates", choices=("dmy", "mdy"),
                       help="order of day and month where dates may be read both ways")
    group.add_argument("--decimal", choices=("point", "comma"), help="of the numbers in a table")
    group.add_argument("--thousands", action="store_true",
                       help="a single point or comma before three digits groups thousands")
    return group


def missing(group, *choices):
    group.add_argument("--missing", choices=choices,
                       help="what becomes of missing values, which are refused otherwise")


def of(options):
    """The arguments of recording.read."""
    return {name: getattr(options, name) for name in (
        "rate", "column", "time", "start", "dates", "decimal", "thousands", "missing")}
