"""Delimited text as columns of numbers. pandas cuts and converts; what stands here is which lines
are data, what the columns are, and where something is wrong (docs/recordings.md has the rules).

The head of the file decides on the layout. The body is read in parts, so memory is needed only for
the columns that are asked for.
"""

import collections
import csv
import dataclasses
import io
import itertools
import re

import numpy as np

HEAD_LINES = 400
LINES_AT_ONCE = 200_000
COMMENTS = ("#", "%", "//")
MISSING = {"", "-", "--", "?", "na", "n/a", "#n/a", "nan", "-nan", "null", "none", "nil", "missing"}

NUMBER = re.compile(r"[-+]?(\d+\.?\d*|\.\d+)([eE][-+]?\d+)?|[-+]?(nan|inf(inity)?)", re.IGNORECASE)
DECIMAL_COMMA = re.compile(r"[-+]?(\d+,?\d*|,\d+)([eE][-+]?\d+)?")
THOUSANDS = re.compile(r"[-+]?[1-9]\d{0,2}(\.\d{3})+,\d+")
CLOCK = re.compile(r"\d{4}[-/]\d\d?[-/]\d\d?([T ]\d\d?:\d\d(:\d\d([.,]\d+)?)?)? ?(Z|[-+]\d\d:?\d\d)?"
                   r"|\d\d?:\d\d(:\d\d([.,]\d+)?)?")
TIME_OF_DAY = re.compile(r"\d\d?:\d\d(:\d\d([.,]\d+)?)?")
TIME_NAME = re.compile(r"(?:rel(?:ative)?|abs(?:olute)?|elapsed|sample|sampling|system)?[ _]?"
                       r"(?:time[ _]?stamp|date[ _]?time|time|zeit|timestamp|date|datum|uhrzeit|clock|"
                       r"elapsed|seconds?|secs?|msecs?|millis(?:econds)?|t|s|ms)", re.IGNORECASE)
INDEX_NAME = re.compile(r"#|no\.?|nr\.?|n|i|id|idx|index|row|line|sample|samples|count|unnamed: 0|",
                        re.IGNORECASE)
SECONDS = {"s": 1.0, "sec": 1.0, "secs": 1.0, "second": 1.0, "seconds": 1.0, "ms": 1e-3, "msec": 1e-3,
           "msecs": 1e-3, "millis": 1e-3, "milliseconds": 1e-3, "us": 1e-6, "µs": 1e-6, "μs": 1e-6,
           "usec": 1e-6, "microseconds": 1e-6, "ns": 1e-9, "nanoseconds": 1e-9, "min": 60.0,
           "mins": 60.0, "minute": 60.0, "minutes": 60.0, "h": 3600.0, "hr": 3600.0, "hours": 3600.0,
           "d": 86400.0, "days": 86400.0}
KNOWN_UNIT = re.compile(r"[munpkMGµμ]?(V|A|g|Pa|bar|m|W|N|Hz|s|K|rad|T|C|F|Ohm|Ω)|°C|°F|°|deg|%|dB\w*|"
                        r"m/s2?|m/s\^2|m/s²|mm/s|um/s|µm/s|rpm|Nm|N m|1/min|counts?|LSB|-")


class InputError(Exception):
    """What is wrong with an input, with file and line."""


@dataclasses.dataclass
class Layout:
    separator: str | None  # None: one column; " ": any blanks
    decimal: str
    first: int  # number of the first line of data
    names: list
    units: list
    notes: list  # lines before the data that are no header
    body: list  # the cells of the first lines of data
    on_one_line: bool = False

    @property
    def width(self):
        return len(self.names)

    def label(self, column):
        """How a message names a column."""
        name = self.names[column]
        return f"column {column + 1}" + (f", {name}" if name else "")

    def sample(self, column):
        return [row[column] for row in self.body]


def encoding_of(path, start):
    """The encoding of a text by its first bytes, and whether these are text at all."""
    if start[:2] in (b"\xff\xfe", b"\xfe\xff"):
        return "utf-16"
    control = start.translate(None, bytes(set(range(256)) - set(range(32)) | {9, 10, 12, 13}))
    if control:
        line = start[:start.index(control[:1])].count(b"\n") + 1
        raise InputError(f"{path}:{line}: neither a text file nor an audio file: byte "
                         f"0x{control[0]:02X} found")
    try:
        start.decode("utf-8")
    except UnicodeDecodeError as error:
        if error.start < len(start) - 4:  # no letter that the sample cuts
            return "cp1252"
    return "utf-8-sig"


def number(cell, decimal):
    """The number in a cell, or None. NaN and infinities are numbers here."""
    if decimal == ",":
        return float(cell.replace(",", ".")) if DECIMAL_COMMA.fullmatch(cell) else None
    return float(cell) if NUMBER.fullmatch(cell) else None


def cells_of(line, separator):
    line = line.strip() if separator != "\t" else line.strip(" \r\n")
    if separator is None:
        return [line.strip('"').strip()]
    if separator == " ":
        return line.split() if '"' not in line else next(
            csv.reader([line], delimiter=" ", skipinitialspace=True))
    return [cell.strip() for cell in next(csv.reader([line], delimiter=separator, skipinitialspace=True))]


def is_value(cell):
    return bool(NUMBER.fullmatch(cell) or DECIMAL_COMMA.fullmatch(cell) or CLOCK.fullmatch(cell))


def _separator(lines, decimal):
    """The mark that cuts the later lines into most values; None for one column."""
    later = lines[len(lines) // 2:]
    best, found = (sum(is_value(cells_of(line, None)[0]) for line in later) / len(later), 0), None
    if decimal == "point" and any("," in line for line in later):
        best = (0.0, 0)
    for order, separator in enumerate((";", "\t", "|", ",", " ")):
        if found in (";", "\t", "|"):
            break  # these stand in no number
        rows = [cells_of(line, separator) for line in later]
        width, agreeing = collections.Counter(map(len, rows)).most_common(1)[0]
        if width < 2 or agreeing < 0.9 * len(rows) - 1:
            continue
        cells = [cell for row in rows for cell in row if cell.lower() not in MISSING]
        share = sum(map(is_value, cells)) / max(1, len(cells))
        if share > 0 and ((share, -order) > best or found is None and (
                share >= best[0] or separator in (";", "\t", "|"))):
            best, found = (share, -order), separator
    return found


def _commas_are_decimal(path, lines, decimal):
    """Whether single commas in lines with nothing else between numbers belong to the numbers."""
    later = lines[len(lines) // 2:]
    unclear = InputError(f"{path}: {shown(later[0].strip())} may be one number with a decimal comma or two "
                         "numbers: --decimal comma or --decimal point says which")
    if decimal is None and all(THOUSANDS.fullmatch(line.strip()) for line in later) and not any(
            "," in line and not THOUSANDS.fullmatch(line.strip()) for line in lines):
        raise unclear
    if not all(DECIMAL_COMMA.fullmatch(line.strip()) for line in later):
        return False
    if decimal:
        return decimal == "comma"
    before = [line for line in lines if not DECIMAL_COMMA.fullmatch(line.strip())]
    if before:
        return "," not in before[-1]
    parts = [line.strip().split(",") for line in lines]
    if any(len(part) == 1 or re.match("0[0-9]", part[1]) or part[0].startswith("-0") for part in parts):
        return True
    if len(parts) > 2 and [part[0] for part in parts] == [
            str(int(parts[0][0] or 0) + i) for i in range(len(parts))]:
        return False  # they count from line to line
    raise unclear


def _decimal(rows, decimal):
    if decimal:
        return {"comma": ",", "point": "."}[decimal]
    cells = [cell for row in rows for cell in row]
    with_comma = any("," in cell and DECIMAL_COMMA.fullmatch(cell) for cell in cells)
    return "," if with_comma and not any("." in cell and NUMBER.fullmatch(cell) for cell in cells) \
        else "."


def _is_unit(cell):
    return not cell or bool(re.fullmatch(r"\[.*\]|\(.*\)", cell) or KNOWN_UNIT.fullmatch(cell)
                            or cell.lower() in SECONDS)


def _names(rows, width):
    """Names, units and what else stands before the data, of its rows of cells."""
    header = [row for row in rows if len(row) == width]
    names, units = [""] * width, [""] * width
    if len(header) > 1 and all(map(_is_unit, header[-1])) and not all(map(_is_unit, header[-2])):
        units = [cell.strip("[]() ") for cell in header.pop()]
    if header:
        names = header.pop()
    return names, units, header + [row for row in rows if len(row) != width]


def layout_of(path, lines, decimal=None):
    """The layout of a table by its first lines, pairs of number and text without comments."""
    texts = [text for _, text in lines]
    if not texts:
        raise InputError(f"{path}: holds no numbers")
    commas_only = not any(mark in text for text in texts[len(texts) // 2:] for mark in ';\t|"')
    if commas_only and any("," in text for text in texts) and _commas_are_decimal(path, texts, decimal):
        separator = None
    else:
        separator = _separator(texts, decimal)
    rows = [cells_of(text, separator) for text in texts]
    width = collections.Counter(map(len, rows[len(rows) // 2:])).most_common(1)[0][0]
    mark = _decimal(rows, decimal)

    def is_data(row, columns):
        return len(row) == width and any(number(row[c], mark) is not None or CLOCK.fullmatch(row[c])
                                         for c in columns) and all(
            number(row[c], mark) is not None or CLOCK.fullmatch(row[c]) or row[c].lower() in MISSING
            for c in columns)

    later = [row for row in rows[len(rows) // 2:] if len(row) == width]
    valued = [c for c in range(width) if any(row[c] for row in later) and 2 * sum(
        number(row[c], mark) is not None or bool(CLOCK.fullmatch(row[c])) for row in later)
        >= sum(row[c].lower() not in MISSING for row in later)]
    first = next((i for i, row in enumerate(rows) if is_data(row, valued)), None)
    if first is None:  # a lower half that is no data, as of one value and one word
        valued = list(range(width))
        first = next((i for i, row in enumerate(rows) if is_data(row, valued)), None)
    if first is None:
        raise InputError(f"{path}: holds no numbers")
    names, units, other = _names(rows[:first], width)
    found = Layout(separator, mark, lines[first][0], names, units,
                   [" ".join(filter(None, row)) for row in other], rows[first:])
    if len(rows) == 1 and width > 2:
        found.on_one_line = True
        found.names, found.units, found.body = [""], [""], [[cell] for cell in rows[0]]
    else:
        found.body = [row for row in found.body if len(row) == width]
    return found


def shown(cell):
    return repr(cell if len(cell) <= 40 else cell[:37] + "...")


class Reader:
    """A table as columns of numbers, part by part."""

    def __init__(self, path, decimal=None, missing=None):
        self.path, self.missing = path, missing
        with open(path, "rb") as file:
            start = file.read(1 << 20)
        if not start:
            raise InputError(f"{path}: the file is empty")
        self.encoding = encoding_of(path, start)
        self.comments, head = [], []
        with self._open() as file:
            for number_, line in enumerate(file, 1):
                text = line.strip()
                if text.startswith(COMMENTS):
                    self.comments.append(text.lstrip("#%/ ").strip())
                elif text:
                    head.append((number_, line.rstrip("\n")))
                if len(head) == HEAD_LINES:
                    break
        self.layout = layout_of(path, head, decimal)
        self.notes = self.comments + self.layout.notes

    def _open(self):
        return open(self.path, encoding=self.encoding, newline=None,
                    errors="strict" if self.encoding != "cp1252" else "replace")

    def parts(self, columns):
        """For each part of the body a dictionary of the columns, NaN where a value is missing, and
        the line number of each row."""
        if self.layout.on_one_line:
            yield self._converted([self.layout.first] * len(self.layout.body),
                                  [row[0] for row in self.layout.body], columns, None, 1)
            return
        with self._open() as file:
            lines = enumerate(file, 1)
            for number_, _ in zip(range(1, self.layout.first), lines):
                pass
            while part := self._lines(lines):
                yield self._converted(*part, columns, self.layout.separator, self.layout.width)

    def _lines(self, lines):
        """The numbers and texts of the next lines of data."""
        try:
            while part := list(itertools.islice(lines, LINES_AT_ONCE)):
                numbers = [n for n, line in part if line.strip() and not line.lstrip().startswith(COMMENTS)]
                if numbers:
                    first = part[0][0]
                    return numbers, [part[n - first][1].rstrip("\n") for n in numbers]
        except UnicodeError:
            raise InputError(f"{self.path}: is no text in {self.encoding} throughout") from None
        return None

    def _converted(self, numbers, lines, columns, separator, width):
        self._hold_width(numbers, lines, separator, width)
        values = {}
        for column in columns:
            if self.is_clock(column):
                values[column] = self._clock(numbers, self._cells(lines, column, separator, width), column)
                continue
            try:
                found = self._read(lines, column, separator, width, np.float64)
            except ValueError:
                found = None
            if found is None or not np.isfinite(found).all():
                found = self._examined(numbers, self._cells(lines, column, separator, width), column)
            values[column] = found
        return values, np.array(numbers)

    def _read(self, lines, column, separator, width, dtype):
        import pandas
        return pandas.read_csv(
            io.StringIO("\n".join(lines)), header=None, names=list(range(width)), usecols=[column],
            sep=r"\s+" if separator == " " else separator or "\x1f", decimal=self.layout.decimal,
            dtype={column: dtype}, na_filter=False, skipinitialspace=True, index_col=False,
            float_precision="round_trip", engine="c", skip_blank_lines=False)[column].to_numpy()

    def _cells(self, lines, column, separator, width):
        return [str(cell).strip().strip('"').strip()
                for cell in self._read(lines, column, separator, width, str)]

    def _hold_width(self, numbers, lines, separator, width):
        if separator is None:
            return
        if separator == " " or any('"' in line for line in lines):
            counts = [len(cells_of(line, separator)) for line in lines]
        else:
            counts = [line.strip("\r\n").count(separator) + 1 for line in lines]
            if separator == "\t":
                counts = [len(cells_of(line, separator)) if count != width else count
                          for line, count in zip(lines, counts)]
        if counts.count(width) != len(counts):
            i = next(i for i, count in enumerate(counts) if count != width)
            raise InputError(f"{self.path}:{numbers[i]}: {counts[i]} cell{'s' * (counts[i] != 1)} where "
                             f"the other lines have {width}")

    def _examined(self, numbers, cells, column):
        """The numbers of cells among which some are none."""
        values = np.empty(len(cells))
        for i, cell in enumerate(cells):
            value = number(cell, self.layout.decimal)
            place = f"{self.path}:{numbers[i]}: {self.layout.label(column)}"
            if cell.lower() in MISSING:
                if self.missing is None:
                    raise InputError(f"{place}: {shown(cell)} where a value is needed; --missing skip or "
                                     "--missing interpolate reads the others")
                value = np.nan
            elif value is None:
                raise InputError(f"{place}: {shown(cell)} is not a number")
            elif not np.isfinite(value):
                raise InputError(f"{place}: {shown(cell)} is not a finite number")
            values[i] = value
        return values

    def is_clock(self, column):
        sample = [cell for cell in self.layout.sample(column) if cell.lower() not in MISSING]
        return bool(sample) and 2 * sum(bool(CLOCK.fullmatch(cell)) for cell in sample) > len(sample)

    def _clock(self, numbers, cells, column):
        """Seconds of dates and times of day."""
        import pandas
        cells = [cell.replace(",", ".") for cell in cells]
        if TIME_OF_DAY.fullmatch(cells[0]):
            times = pandas.to_timedelta([cell if cell.count(":") == 2 else cell + ":00"
                                         for cell in cells], errors="coerce")
        else:
            times = pandas.to_datetime(cells, utc=True, errors="coerce")
        wrong = np.flatnonzero(times.isna())
        if len(wrong):
            i = wrong[0]
            raise InputError(f"{self.path}:{numbers[i]}: {self.layout.label(column)}: "
                             f"{shown(cells[i])} is no time like those before")
        nanoseconds = times.asi8
        if not hasattr(self, "start"):
            self.start = nanoseconds[0]
        return (nanoseconds - self.start) / 1e9


def time_unit(layout, column):
    """Whether the name of a column says that it is time, and the unit that it or the row of units
    says, or an empty text."""
    name, unit = layout.names[column].strip(), layout.units[column]
    match = TIME_NAME.match(name)
    rest = name[match.end():] if match else ""
    if not match or not re.fullmatch(r"|[\s_/(\[,:.-].*", rest):
        return False, ""
    stem = match[0].lower()
    words = re.findall(r"[^\s_/()\[\],:.-]+", rest)
    if not unit:
        unit = next((word for word in reversed(words) if word.lower() in SECONDS), "")
    if not unit and words and re.search(r"[(\[/]", rest):
        unit = words[-1]  # one that is not known stays one
    if not unit and stem.rstrip("s") in ("ms", "msec", "milli", "m"):
        unit = "ms"
    if stem in ("t", "s", "ms") and (unit or rest) and unit.lower() not in SECONDS:
        return False, ""  # T in degrees, or s of something
    return True, unit


def is_index(layout, column):
    """Whether a column counts the rows."""
    if not INDEX_NAME.fullmatch(layout.names[column].strip()) or layout.width == 1 or (
            column > 0 and not any(layout.names)):
        return False
    values = [number(cell, layout.decimal) for cell in layout.sample(column)]
    return len(values) > 2 and all(value is not None and value == values[0] + i
                                   for i, value in enumerate(values))
