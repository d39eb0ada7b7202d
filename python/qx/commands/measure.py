"""The commands peaks and pulse."""

import argparse

from .values import positive

SHOWN = 20  # lines of a table on the terminal


def width(text):
    value = int(text)
    if value < 3:
        raise argparse.ArgumentTypeError(f"{text} is below 3")
    return value


def number(text):
    value = int(text)
    if value < 1:
        raise argparse.ArgumentTypeError(f"{text} is below 1")
    return value


def write_table(path, names, rows):
    import csv
    with open(path, "w", newline="", encoding="utf-8") as file:
        csv.writer(file).writerows([names, *rows])
    print(f"{path}: {len(rows)} line" + "s" * (len(rows) != 1))


def show_table(names, rows):
    cells = [names, *([f"{value:.6g}" for value in row] for row in rows[:SHOWN])]
    widths = [max(map(len, column)) for column in zip(*cells)]
    for row in cells:
        print("  ".join(cell.rjust(width) for cell, width in zip(row, widths)))
    if len(rows) > SHOWN:
        print(f"... and {len(rows) - SHOWN} more (--csv FILE writes all)")


def opened(options):
    from .. import recording
    read = recording.read(options.file, rate=options.rate, column=options.column)
    step = 1 / read.rate if read.rate else 1.0
    return read, step


def tell(options, names, rows):
    show_table(names, rows)
    if options.csv:
        write_table(options.csv, names, rows)


def peaks(options):
    from .. import measuring
    read, step = opened(options)
    time, value = f"time ({read.time_unit})", read.unit or "value"
    if options.events:
        places = measuring.events(read.values, read.rate)
        rows = [(place * step, read.values[int(place)]) for place in places]
        names = [time, value]
        print(f"{read.name}: {len(rows)} events")
    else:
        found = measuring.peaks(read.values, options.threshold, options.width, options.valleys)
        places = found.places
        rows = list(zip(places * step, found.values, found.curvatures / step**2))
        names = [time, value, "second derivative"]
        print(f"{read.name}: {len(rows)} " + ("valleys below" if options.valleys else "peaks above")
              + f" {found.threshold:.6g} {read.unit}".rstrip())
    if len(places) > 1:
        from ..calls import call
        interval = call("Median_head", places[1:] - places[:-1]) * step
        print(f"median interval {interval:.6g} {read.time_unit}"
              + (f", {60 / interval:.4g} per minute" if read.rate else ""))
    tell(options, names, rows)


def event_pulses(read):
    """The pulses of all events, with places in the whole recording."""
    import dataclasses

    from .. import measuring
    places = measuring.events(read.values, read.rate)
    found = filter(None, (measuring.event_pulse(read.values, places, i) for i in range(len(places))))
    return [dataclasses.replace(one, start=one.start + part.start, end=one.end + part.start,
                                middle=one.middle + part.start) for one, part in found]


def pulse(options):
    from .. import measuring
    from ..tables import InputError
    read, step = opened(options)
    direction = measuring.FALLING if options.falling else measuring.RISING
    found = None  # all of them, where they are needed
    if options.events:
        found = event_pulses(read)
    elif options.csv:
        found = measuring.pulses(read.values, direction)
    if found is None:
        one = measuring.pulse(read.values, options.number, direction)
    else:
        one = found[options.number - 1] if options.number <= len(found) else None
    if one is None:
        kind = "falling" if options.falling else "rising"
        raise InputError(f"{options.file}: there is no pulse {options.number}" + (
            "" if options.events else f" that begins with a {kind} edge"))
    unit, time = read.unit or "", read.time_unit
    print(f"{read.name}: pulse {options.number}" + (f" of {len(found)}" if found else ""))
    for label, value, its_unit in (
            ("low level", one.low, unit), ("high level", one.high, unit), ("start", one.start * step, time),
            ("end", one.end * step, time), ("width at half height", one.width * step, time),
            ("first edge, 10% to 90%", one.first_duration * step, time),
            ("second edge, 90% to 10%", one.second_duration * step, time),
            ("slew rate", one.slew_rate / step, f"{unit or '1'}/{'s' if read.rate else 'sample'}"),
            ("overshoot", one.first_overshoot, "%"),
            ("overshoot behind it", one.second_overshoot, "%")):
        print(f"  {label:<24} {value:>12.6g} {its_unit}".rstrip())
    if options.csv:
        names = ["pulse", f"start ({time})", f"end ({time})", f"width ({time})",
                 f"first edge ({time})", f"second edge ({time})", "overshoot (%)",
                 "overshoot behind it (%)"]
        write_table(options.csv, names, [
            (i, p.start * step, p.end * step, p.width * step, p.first_duration * step,
             p.second_duration * step, p.first_overshoot, p.second_overshoot)
            for i, p in enumerate(found, 1)])


def add_common(command):
    command.add_argument("file")
    command.add_argument("--rate", type=positive, metavar="HZ", help="samples per second")
    command.add_argument("--column", metavar="NAME", help="column or channel, a name or a number")
    command.add_argument("--csv", metavar="FILE", help="writes the table there")


def add(commands):
    command = commands.add_parser(
        "peaks", help="finds the peaks of a recording",
        description="Finds peaks, by parabolas through windows of samples, or repeated events.")
    add_common(command)
    command.add_argument("--threshold", type=float, metavar="VALUE",
                         help="peaks lie above it; by default half way from the median to the outer "
                         "hundredth of the values")
    command.add_argument("--width", type=width, default=5, metavar="SAMPLES",
                         help="of a parabola, 5 by default; wider ones pass over noise")
    command.add_argument("--valleys", action="store_true", help="seeks valleys, below the threshold")
    command.add_argument("--events", action="store_true",
                         help="repeated bursts of steep slope instead, such as heart beats")
    command.set_defaults(run=peaks)

    command = commands.add_parser(
        "pulse", help="measures a pulse of a recording",
        description="Measures a pulse between two states: levels, edges, width, overshoot.")
    add_common(command)
    command.add_argument("--number", type=number, default=1, metavar="N",
                         help="which pulse, the first by default")
    command.add_argument("--events", action="store_true",
                         help="those of repeated events, such as heart beats, each between levels of "
                         "its own")
    command.add_argument("--falling", action="store_true", help="pulses that begin with a falling edge")
    command.set_defaults(run=pulse)
