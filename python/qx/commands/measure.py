"""The commands peaks and pulse."""

import argparse

from ..outputs import add_force
from . import reading
from .values import add_command

SHOWN = 20  # rows of a table that the terminal shows
PEAKS_EXAMPLES = """\
examples:
  python3 -m qx peaks examples/data/ecg_208_360hz.csv
  python3 -m qx peaks examples/data/ecg_208_360hz.csv --prominence 0.5 --width 9
  python3 -m qx peaks examples/data/ecg_208_360hz.csv --threshold 1.2 --csv peaks.csv
  python3 -m qx peaks examples/data/ecg_208_360hz.csv --events --csv beats.csv

On either side of a peak, take the lowest value before a higher peak or the end is reached. The prominence
of the peak is its height above the higher of these two values."""
PULSE_EXAMPLES = """\
examples:
  python3 -m qx generate pulse gate.csv --rate 1000 --delay 0.2 --width 0.3
  python3 -m qx pulse gate.csv
  python3 -m qx pulse examples/data/ecg_208_360hz.csv --events --number 2 --csv pulses.csv"""


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
    import io

    from .. import outputs
    text = io.StringIO()
    csv.writer(text).writerows([names, *rows])
    outputs.write_text(path, text.getvalue())
    print(f"{path}: {len(rows)} line" + "s" * (len(rows) != 1))


def show_table(names, rows):
    show_texts(names, [[f"{value:.6g}" for value in row] for row in rows])


def show_texts(names, rows):
    cells = [names, *rows[:SHOWN]]
    widths = [max(map(len, column)) for column in zip(*cells)]
    for row in cells:
        print("  ".join(cell.rjust(width) for cell, width in zip(row, widths)))
    if len(rows) > SHOWN:
        print(f"... and {len(rows) - SHOWN} more (--csv FILE writes all)")


def opened(options):
    from .. import outputs, recording
    if options.csv:
        outputs.check(options.csv, options.force, inputs=outputs.identities([options.file]))
    read = recording.read(options.file, **reading.of(options))
    print(f"{read.name}: {read.choice}")
    step = 1 / read.rate if read.rate else 1.0
    return read, step


def tell(options, names, rows):
    show_table(names, rows)
    if options.csv:
        write_table(options.csv, names, rows)


def peaks(options):
    from .. import measuring, sections_measuring
    read, step = opened(options)
    time, value = f"time ({read.time_unit})", read.unit or "value"
    if options.events:
        places, _ = sections_measuring.places_of(read)
        values = [float(read.whole.part(int(place), 1)[0]) for place in places] if read.whole else \
            read.values[places.astype(int)]
        rows = [(place * step, value) for place, value in zip(places, values)]
        names = [time, value]
        print(f"{read.name}: {len(rows)} events")
    else:
        found = measuring.peaks(read.values, options.threshold, options.width, options.valleys,
                                options.prominence)
        places = found.places
        columns = {time: places * step, value: found.values, "second derivative": found.curvatures / step**2}
        if found.prominences is not None:
            columns[f"prominence ({read.unit})" if read.unit else "prominence"] = found.prominences
        names, rows = list(columns), list(zip(*columns.values()))
        said = []
        if options.threshold is not None:
            side = "below" if options.valleys else "above"
            said.append(f"{side} {options.threshold:.6g} {read.unit}".rstrip())
        if found.prominence > 0:
            said.append(f"with a prominence of at least {found.prominence:.6g} {read.unit}".rstrip())
        kind = "valley" if options.valleys else "peak"
        print(f"{read.name}: {len(rows)} {kind}{'s' * (len(rows) != 1)} {' and '.join(said)}".rstrip())
    if len(places) > 1:
        from .. import stats
        interval = stats.median(places[1:] - places[:-1]) * step
        print(f"median interval {interval:.6g} {read.time_unit}"
              + (f", {60 / interval:.4g} per minute" if read.rate else ""))
    tell(options, names, rows)


def event_pulses(read):
    """The pulses of all events, with positions in the whole recording."""
    import dataclasses

    from .. import measuring
    places = measuring.events(read.values, read.rate)
    found = filter(None, (measuring.event_pulse(read.values, places, i) for i in range(len(places))))
    return [dataclasses.replace(one, start=one.start + part.start, end=one.end + part.start,
                                middle=one.middle + part.start) for one, part in found]


def pulse(options):
    from .. import measuring
    from ..sections import uncertain
    from ..tables import InputError
    read, step = opened(options)
    direction = measuring.FALLING if options.falling else measuring.RISING
    found = None  # all pulses, where they are needed
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
    for label, level, error in (("low level", one.low, one.low_error), ("high level", one.high, one.high_error)):
        text, error = uncertain(level, error)
        print(f"  {label:<24} {text:>12} {'± ' + error + ' ' if error else ''}{unit}".rstrip())
    for label, value, its_unit in (
            ("start", one.start * step, time),
            ("end", one.end * step, time), ("width at half height", one.width * step, time),
            ("first edge, 10% to 90%", one.first_duration * step, time),
            ("second edge, 90% to 10%", one.second_duration * step, time),
            ("slew rate", one.slew_rate / step, f"{unit or '1'}/{'s' if read.rate else 'sample'}"),
            ("overshoot", one.first_overshoot, "%"),
            ("overshoot after it", one.second_overshoot, "%")):
        print(f"  {label:<24} {value:>12.6g} {its_unit}".rstrip())
    if options.csv:
        names = ["pulse", f"start ({time})", f"end ({time})", f"width ({time})",
                 f"first edge ({time})", f"second edge ({time})", "overshoot (%)",
                 "overshoot after it (%)"]
        write_table(options.csv, names, [
            (i, p.start * step, p.end * step, p.width * step, p.first_duration * step,
             p.second_duration * step, p.first_overshoot, p.second_overshoot)
            for i, p in enumerate(found or (), 1)])


def add_common(command):
    command.add_argument("file", help="the recording; - is standard input")
    command.add_argument("--csv", metavar="FILE", help="writes the table to this file")
    add_force(command)
    reading.missing(reading.add_options(command), "skip", "interpolate")


def add(commands):
    command = add_command(
        commands, "peaks", PEAKS_EXAMPLES, help="finds the peaks of a recording",
        description="Finds peaks, by parabolas fitted to windows of samples, or repeated events.")
    add_common(command)
    command.add_argument("--threshold", type=float, metavar="VALUE",
                         help="finds peaks above this value, or valleys below it")
    command.add_argument("--prominence", type=float, metavar="VALUE",
                         help="least prominence of a peak; without this and --threshold, two fifths of the "
                         "third largest prominence, and at least a fifth of the largest")
    command.add_argument("--width", type=width, default=5, metavar="SAMPLES",
                         help="samples under a parabola, 5 by default; wider parabolas are less sensitive to noise")
    command.add_argument("--valleys", action="store_true", help="finds valleys instead")
    command.add_argument("--events", action="store_true",
                         help="finds repeated bursts of steep slope instead, such as heart beats")
    command.set_defaults(run=peaks)

    command = add_command(
        commands, "pulse", PULSE_EXAMPLES, help="measures a pulse of a recording",
        description="Measures a pulse between two states: levels, edges, width, overshoot.")
    add_common(command)
    command.add_argument("--number", type=number, default=1, metavar="N",
                         help="number of the pulse, the first by default")
    command.add_argument("--events", action="store_true",
                         help="measures the pulses of repeated events, such as heart beats, each with its "
                         "own levels")
    command.add_argument("--falling", action="store_true", help="measures pulses that begin with a falling edge")
    command.set_defaults(run=pulse)
