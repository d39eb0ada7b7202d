"""The building blocks of the sections of pages: rows of figures, numbers as texts, units and axes."""

import dataclasses
import math


@dataclasses.dataclass
class Row:
    label: str
    value: str
    unit: str
    source: str  # the function that computed the number, and what else it depends on
    error: str = ""  # the standard uncertainty, in the unit of the value


@dataclasses.dataclass
class Section:
    title: str
    text: str  # one paragraph
    rows: list = dataclasses.field(default_factory=list)
    figures: list = dataclasses.field(default_factory=list)  # figures.Plot, or HTML texts
    terminal: list = dataclasses.field(default_factory=list)  # further lines for the terminal


def number(value, digits=6):
    return f"{value:.{digits}g}" if math.isfinite(value) else "out of range"


def resolved(values, step):
    """The values as texts, with enough digits to resolve a difference of `step`."""
    values = [float(value) for value in values]
    largest = max((abs(value) for value in values), default=0.0)
    if not (step > 0 and math.isfinite(step) and math.isfinite(largest)):
        return [number(value) for value in values]
    place = math.floor(math.log10(step)) - 1  # the place of the last digit, one finer than the step
    if 1e-4 <= max(largest, step) < 1e7:
        return [f"{value:.{min(17, max(0, -place))}f}" for value in values]
    digits = max(1, math.floor(math.log10(largest)) - place) if largest else 1
    return [f"{value:.{min(17, digits)}e}" for value in values]


def uncertain(value, error):
    """A value and its standard uncertainty as texts: the significant digits, and two of the uncertainty."""
    value, error = float(value), float(error)
    if not (math.isfinite(value) and math.isfinite(error) and error > 1e-15 * abs(value)):
        return number(value, 12), number(error, 2) if error > 0 or not math.isfinite(error) else ""
    return resolved([value], error)[0], f"{error:#.2g}".rstrip(".")


def power_unit(unit, exponent):
    if not unit or exponent == 1:
        return unit
    return unit + {2: "²", 3: "³", 4: "⁴"}[exponent]


def quantity(recording):
    """The label of an axis of values."""
    name = recording.channel[:1].upper() + recording.channel[1:]
    return f"{name} ({recording.unit})" if recording.unit else name


def time_axis(recording):
    """The label of an axis of times, with the distance between samples."""
    if recording.rate:
        return f"Time (s), a sample every {number(1 / recording.rate, 3)} s"
    return "Time (samples)"


def frequency_unit(recording):
    return "Hz" if recording.rate else "cycles per sample"


def frequency_axis(recording, resolution=None):
    """The factor from cycles per sample, and the label of an axis of frequencies; `resolution` is in
    the unit of the axis."""
    label = f"Frequency ({frequency_unit(recording)})"
    if resolution:
        label += f", resolution {number(resolution, 3)} {frequency_unit(recording)}"
    return recording.rate or 1.0, label
