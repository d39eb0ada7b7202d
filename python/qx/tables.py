"""Delimited text as columns of numbers. pandas splits the lines and converts the cells; this module determines
which lines are data, what the columns are, and where something is wrong (docs/recordings.md has the rules).

The head of the file determines the layout. The body is read in parts, so memory is needed only for the
requested columns.
"""

import collections
import contextlib
import csv
import dataclasses
import io
import itertools
import re

import numpy as np

from .files import InputError
from .rates import seconds_of
from .times import CLOCK, ONLY_DIGITS, SLASHED, TIME_OF_DAY, TWO_FIELDS, Format

HEAD_LINES = 400
LINES_AT_ONCE = 200_000
COMMENTS = ("#", "%", "//")
# What spreadsheets write where a formula failed. It begins like a comment, but is not one.
ERROR = re.compile(r"#(?:N/A|NV|NA|DIV/0!|VALUE!|VALEUR!|WERT!|REF!|BEZUG!|NAME\?|NOM\?|NUM!|NOMBRE!|ZAHL!|"
                   r"NULL!|NUL!)(?=\s*(?:$|[;,\t|\"])|(?:\s+[-+\d.,eE]+|\s+#\S+)+\s*$)", re.IGNORECASE)
MISSING = {"", "-", "--", "?", "na", "n/a", "nan", "-nan", "null", "none", "nil", "missing"}

EXPONENT = r"([eEdD][-+]?\d+)?"
NUMBER = re.compile(rf"[-+]?(\d+\.?\d*|\.\d+){EXPONENT}|[-+]?(nan|inf(inity)?)", re.IGNORECASE)
DECIMAL_COMMA = re.compile(rf"[-+]?(\d+,?\d*|,\d+){EXPONENT}")
# Thousands, grouped by blanks or apostrophes, with or without a decimal mark; by commas; by points.
SPACED = re.compile(rf"[-+]?[1-9]\d{{0,2}}(?:[ '’\u00a0\u2009\u202f]\d{{3}})+([.,]\d*)?{EXPONENT}")
COMMA_GROUPS = re.compile(rf"[-+]?[1-9]\d{{0,2}}(,\d{{3}})+(\.\d*)?{EXPONENT}")
POINT_GROUPS = re.compile(rf"[-+]?[1-9]\d{{0,2}}(\.\d{{3}})+(,\d*)?{EXPONENT}")
OPEN = re.compile(r"[-+]?[1-9]\d{0,2}[.,]\d{3}")  # one group of thousands, or three decimals
MINUS = str.maketrans({"\u2212": "-", "\u2013": "-", "\uff0d": "-"})
UNITS_ALONE = re.compile(r"[munkMµμ]?(?:V|A|g|Pa|bar|N|W)|°C|%|dB|m/s2?|m/s²|Nm|rpm|mm|µm")
TIME_NAME = re.compile(
    r"(?:rel(?:ative)?|abs(?:olute)?|elapsed|sample|sampling|system|utc|gps|local|unix|epoch|mess|log|start)?[ _-]?"
    r"(?P<stem>time[ _]?stamps?|date[ _-]?time|time|zeit(?:stempel|punkt)?|date|datum|uhrzeit|clock|elapsed|uptime|"
    r"seconds?|secs?|msecs?|millis(?:econds)?|micros(?:econds)?|heure|horodatage|tiempo|fecha|temps|ts|epoch|"
    r"unix|utc|m?jd|t|s|ms|us|µs)(?=$|[\s_/(\[,:.-])", re.IGNORECASE)
WEAK_NAMES = {"temps", "ts", "epoch", "unix", "utc", "jd", "mjd", "us"}  # which also mean other things
NO_UNIT = {"in", "utc", "gmt", "local", "unix", "epoch", "since", "start", "from", "time", "date", "of", "day",
           "elapsed", "relative", "absolute", "heure", "uhrzeit", "zeit", "stamp", "iso", "iso8601"}
INDEX_NAME = re.compile(r"#|no\.?|nr\.?|n|i|id|idx|index|row|line|sample|samples|count|unnamed: 0|",
                        re.IGNORECASE)
KNOWN_UNIT = re.compile(r"[munkpMGµμ]?(V|A|g|Pa|bar|m|W|N|Hz|s|K|rad|T|C|F|Ohm|Ω)|°C|°F|°|deg|%|dB\w*|"
                        r"m/s2?|m/s\^2|m/s²|mm/s|um/s|µm/s|rpm|Nm|N m|1/min|counts?|LSB|-")


@dataclasses.dataclass
class Layout:
    separator: str | None  # None: one column; " ": any blanks
    decimal: str
    first: int  # number of the first line of data
    names: list
    units: list
    notes: list  # lines before the data that are not a header
    body: list  # the cells of the first lines of data
    on_one_line: bool = False
    thousands: str = ""  # the mark that groups them, besides blanks and apostrophes
    shown: str = ""  # the decimal mark, if numbers of the head have one

    @property
    def width(self):
        return len(self.names)

    def label(self, column):
        """The name of a column in messages."""
        name = self.names[column]
        return f"column {column + 1}" + (f", {name}" if name else "")

    def sample(self, column):
        return [row[column] for row in self.body]

    def number(self, cell):
        return number(cell, self.decimal, self.thousands)


def encoding_of(path, start):
    """The encoding of a text by its first bytes. A file that is not a text is refused."""
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
        if error.start < len(start) - 4:  # not a character cut off at the end of the sample
            return "cp1252"
    return "utf-8-sig"


def is_comment(text):
    return text.startswith(COMMENTS) and not ERROR.match(text)


def is_missing(cell):
    return cell.lower() in MISSING or bool(ERROR.fullmatch(cell))


def _is_failed(cell):
    return bool(ERROR.fullmatch(cell)) or cell.lower() in ("na", "n/a", "nan", "null")


def number(cell, decimal, thousands=""):
    """The number in a cell, or None. NaN and infinities are numbers here."""
    cell = cell.translate(MINUS)
    if thousands and (COMMA_GROUPS if thousands == "," else POINT_GROUPS).fullmatch(cell):
        cell = cell.replace(thousands, "")
    elif SPACED.fullmatch(cell):
        cell = re.sub(r"[^-+\d.,a-zA-Z]", "", cell)
    if not (DECIMAL_COMMA if decimal == "," else NUMBER).fullmatch(cell):
        return None
    if decimal == ",":
        cell = cell.replace(",", ".")
    try:
        return float(cell)
    except ValueError:  # the exponent may be Fortran's
        return float(re.sub("[dD]", "e", cell))


def cells_of(line, separator):
    line = line.strip() if separator != "\t" else line.strip(" \r\n")
    if separator is None:
        return [line.strip('"').strip()]
    if separator == " ":
        return re.split(r"[ \t]+", line) if '"' not in line else next(
            csv.reader([line], delimiter=" ", skipinitialspace=True))
    return [cell.strip() for cell in next(csv.reader([line], delimiter=separator, skipinitialspace=True))]


def is_value(cell):
    cell = cell.translate(MINUS)
    return bool(NUMBER.fullmatch(cell) or DECIMAL_COMMA.fullmatch(cell) or CLOCK.fullmatch(cell)
                or SPACED.fullmatch(cell) or COMMA_GROUPS.fullmatch(cell) or POINT_GROUPS.fullmatch(cell))


def _separator(lines, decimal):
    """The mark that splits the later lines into the most values; None for one column."""
    later = lines[len(lines) // 2:]
    best, found = (False, sum(is_value(cells_of(line, None)[0]) for line in later) / len(later), 0), None
    if decimal == "point" and any("," in line for line in later):
        best = (False, 0.0, 0)
    for order, separator in enumerate((";", "\t", "|", ",", " ")):
        if found in (";", "\t", "|"):
            break  # these marks do not occur in numbers
        if separator == " " and best[1] == 1 and _is_one_column(lines):
            break  # blanks group digits
        rows = [cells_of(line, separator) for line in later]
        width, agreeing = collections.Counter(map(len, rows)).most_common(1)[0]
        if width < 2 or agreeing < 0.9 * len(rows) - 1:
            continue
        cells = [cell for row in rows for cell in row if not is_missing(cell)]
        share = sum(map(is_value, cells)) / max(1, len(cells))
        rank = (_agrees_with_names(lines, separator, width), share, -order)
        if share > 0 and (rank > best or found is None and (share >= best[1] or separator in (";", "\t", "|"))):
            best, found = rank, separator
    return found


def _agrees_with_names(lines, separator, width):
    """Whether the mark splits the line above the values into the same number of cells, none of them a value."""
    rows = [cells_of(line, separator) for line in lines[:len(lines) // 2 + 1]]
    above = list(itertools.takewhile(lambda row: not any(map(is_value, row)), rows))
    return bool(above) and len(above[-1]) == width


def _is_one_column(lines):
    """Whether a row of names above lines of single values is one name."""
    above = list(itertools.takewhile(lambda line: not is_value(line.strip()), lines))
    return bool(above) and len(above[-1].split()) == 1


def _commas_belong_to_numbers(path, lines, decimal, thousands):
    """Whether commas in lines with nothing else between numbers belong to the numbers."""
    def is_one(line):
        return any(kind.fullmatch(line.translate(MINUS)) for kind in (
            DECIMAL_COMMA, POINT_GROUPS, COMMA_GROUPS, SPACED))

    lines = [line.strip() for line in lines]
    later = lines[len(lines) // 2:]
    if not all(map(is_one, later)) or not any("," in line for line in later):
        return False
    grouped = any(not DECIMAL_COMMA.fullmatch(line.translate(MINUS)) for line in later)
    if grouped and thousands:
        return True
    if decimal and not grouped:
        return decimal == "comma" or thousands
    before = [line for line in lines if not is_one(line)]
    if before:
        return "," not in before[-1]
    parts = [line.split(",") for line in lines]
    if not grouped:
        if any(len(part) == 1 or re.match("0[0-9]", part[1]) or part[0].startswith("-0") for part in parts):
            return True
        if len(parts) > 2 and [part[0] for part in parts] == [
                str(int(parts[0][0] or 0) + i) for i in range(len(parts))]:
            return False  # the numbers before the commas count the lines
    raise InputError(f"{path}: {shown(later[0])} may be one number with a decimal comma or two "
                     "numbers: --decimal comma or --decimal point says which")


def _marks(path, columns, decimal, thousands):
    """The decimal mark, the thousands separator or an empty text, and the decimal mark that cells show."""
    decimals, groups, in_doubt = set(), set(), {}
    for cells in columns:
        for cell in cells:
            cell = cell.translate(MINUS)
            if "." not in cell and "," not in cell or CLOCK.fullmatch(cell):
                continue
            if OPEN.fullmatch(cell):
                in_doubt.setdefault("." if "." in cell else ",", []).append((cell, cells))
            elif COMMA_GROUPS.fullmatch(cell):
                groups.add(",")
            elif POINT_GROUPS.fullmatch(cell):
                groups.add(".")
            elif "," in cell and (DECIMAL_COMMA.fullmatch(cell) or SPACED.fullmatch(cell)):
                decimals.add(",")
            elif "." in cell and (NUMBER.fullmatch(cell) or SPACED.fullmatch(cell)):
                decimals.add(".")
    other = {",": ".", ".": ","}
    if decimal:
        mark = {"comma": ",", "point": "."}[decimal]
        return mark, other[mark], mark
    if len(groups) == 1 and not groups & decimals:
        decimals = {other[mark] for mark in groups}
    if thousands and not decimals and len(in_doubt) == 1:
        decimals = {other[mark] for mark in in_doubt}
    if len(decimals) == 1:
        mark = decimals.pop()
        return mark, other[mark], mark
    if decimals:
        return ".", "", "."
    for mark, cells in in_doubt.items():
        for cell, column in cells:
            if mark == "," or _whole_below(column):
                raise InputError(f"{path}: {_both_readings(cell, mark)}")
    return ".", "", "." if in_doubt else ""


def _both_readings(cell, mark):
    digits = cell.replace(mark, "")
    return (f"{shown(cell)} may be {digits} or {cell.replace(mark, '.')}: --thousands or --decimal "
            f"{'comma' if mark == ',' else 'point'} says which")


def _whole_below(column):
    """Whether a column holds only whole numbers below a thousand and groups of three digits, as where
    thousands are grouped."""
    whole = [cell for cell in column if re.fullmatch(r"[-+]?\d{1,3}", cell)]
    return any(cell.lstrip("+-") != "0" for cell in whole) and all(
        OPEN.fullmatch(cell) or cell in whole for cell in column if not is_missing(cell))


def _is_unit(cell):
    return not cell or bool(re.fullmatch(r"\[.*\]|\(.*\)", cell) or KNOWN_UNIT.fullmatch(cell)
                            or seconds_of(cell) is not None)


def _names(rows, width):
    """Names, units and other notes from the rows of cells before the data."""
    header = [row for row in rows if len(row) == width]
    names, units = [""] * width, [""] * width
    if len(header) > 1 and all(map(_is_unit, header[-1])) and not all(map(_is_unit, header[-2])):
        units = [cell.strip("[]() ") for cell in header.pop()]
    if header:
        names = header.pop()
    return names, units, header + [row for row in rows if len(row) != width]


def layout_of(path, lines, decimal=None, thousands=False):
    """The layout of a table by its first lines, given as pairs of number and text, without comments."""
    texts = [text for _, text in lines]
    if not texts:
        raise InputError(f"{path}: holds no numbers")
    commas_only = not any(mark in text for text in texts[len(texts) // 2:] for mark in ';\t|"')
    if commas_only and any("," in text for text in texts) and _commas_belong_to_numbers(
            path, texts, decimal, thousands):
        separator = None
    else:
        separator = _separator(texts, decimal)
    rows = [cells_of(text, separator) for text in texts]
    width = collections.Counter(map(len, rows[len(rows) // 2:])).most_common(1)[0][0]

    def is_data(row, columns):
        return len(row) == width and any(is_value(row[c]) for c in columns) and all(
            is_value(row[c]) or is_missing(row[c]) for c in columns)

    later = [row for row in rows[len(rows) // 2:] if len(row) == width]
    valued = [c for c in range(width) if any(row[c] for row in later) and 2 * sum(
        is_value(row[c]) for row in later) >= sum(not is_missing(row[c]) for row in later)]
    first = next((i for i, row in enumerate(rows) if is_data(row, valued)), None)
    if first is None:  # the lower half is not data, as with one value and one word
        valued = list(range(width))
        first = next((i for i, row in enumerate(rows) if is_data(row, valued)), None)
    if first is None:
        raise InputError(f"{path}: holds no numbers")
    while first > 0 and len(rows[first - 1]) == width and all(_is_failed(rows[first - 1][c]) for c in valued):
        first -= 1  # a missing value is not a name
    body = [row for row in rows[first:] if len(row) == width]
    mark, groups, shown_mark = _marks(path, list(zip(*body)), decimal, thousands)
    names, units, other = _names(rows[:first], width)
    found = Layout(separator, mark, lines[first][0], names, units,
                   ["; ".join(filter(None, row)) for row in other], body, thousands=groups, shown=shown_mark)
    if len(rows) == 1 and width > 2:
        found.on_one_line = True
        found.names, found.units, found.body = [""], [""], [[cell] for cell in rows[0]]
    return found


def shown(cell):
    return repr(cell if len(cell) <= 40 else cell[:37] + "...")


class Reader:
    """A table as columns of numbers, read part by part."""

    where = "a comment of the file"

    def __init__(self, source, decimal=None, missing=None, dates=None, thousands=False):
        self.source, self.path, self.name = source, source.path, source.name
        self.missing, self.dates = missing, dates
        self.named_as_time = None  # the number of a column that is time regardless of its name
        with source.open() as file:
            start = file.read(1 << 20)
        if not start:
            raise InputError(f"{self.path}: the file is empty")
        self.encoding = encoding_of(self.path, start)
        self.comments, head = [], []
        self.told, self.origins, self.formats = [], {}, {}
        with self._open() as file:
            for number_, line in enumerate(file, 1):
                text = line.strip()
                if is_comment(text):
                    self.comments.append(text.lstrip("#%/ ").strip())
                    above = self.comments[-1] if not head else ""
                elif text:
                    head.append((number_, line.rstrip("\n")))
                if len(head) == HEAD_LINES:
                    break
        self.layout = layout_of(self.path, head, decimal, thousands)
        if self.comments and not any(self.layout.names) and head[0][0] == self.layout.first:
            self._name_by(above)
        self.notes = self.comments + self.layout.notes

    def _name_by(self, comment):
        """Takes the names of columns from the comment above the data, if it looks like a row of names."""
        attempts = [cells_of(comment, mark) for mark in (self.layout.separator, ",", ";", "\t")]
        attempts.append(re.findall(r"[^\s\[(]+(?:\s*[\[(][^\])]*[\])])?", comment))  # each with its unit
        for cells in attempts:
            plain = all(re.match(r"[^\W\d_][^:=]{0,30}$", cell) for cell in cells)
            if len(cells) == self.layout.width > 1 and plain and any(
                    TIME_NAME.match(cell) or re.search(r"[\[(]", cell) for cell in cells):
                self.layout.names = cells
                return

    @contextlib.contextmanager
    def _open(self):
        try:
            with io.TextIOWrapper(self.source.open(), encoding=self.encoding, newline=None,
                                  errors="strict" if self.encoding != "cp1252" else "replace") as file:
                yield file
        except UnicodeError:
            raise InputError(f"{self.path}: is not {self.encoding} text throughout") from None

    def _parts_of_lines(self):
        """The line numbers and texts of the lines of data, part by part, and how they are split."""
        if self.layout.on_one_line:
            yield [self.layout.first] * len(self.layout.body), [row[0] for row in self.layout.body], None, 1
            return
        with self._open() as file:
            lines = enumerate(file, 1)
            for number_, _ in zip(range(1, self.layout.first), lines):
                pass
            while part := self._lines(lines):
                yield *part, self.layout.separator, self.layout.width

    def parts(self, columns, beside=()):
        """For each part of the body, a dictionary of the columns, with NaN where a value is missing, and the
        line number of each row. A column of `beside` is None in a part where it has cells that are not numbers."""
        for column in filter(self.is_clock, columns):
            self._settle(column)
        for numbers, lines, separator, width in self._parts_of_lines():
            values, at = self._converted(numbers, lines, columns, separator, width)
            for column in beside:
                values[column] = self._or_none(numbers, lines, column, separator, width)
            yield values, at

    def _or_none(self, numbers, lines, column, separator, width):
        before, self.missing = self.missing, "skip"  # missing values are gaps
        try:
            return self._converted(numbers, lines, [column], separator, width)[0][column]
        except InputError:
            return None
        finally:
            self.missing = before

    def _lines(self, lines):
        """The numbers and texts of the next lines of data."""
        while part := list(itertools.islice(lines, LINES_AT_ONCE)):
            numbers = [n for n, line in part if line.strip() and not is_comment(line.lstrip())]
            if numbers:
                first = part[0][0]
                return numbers, [part[n - first][1].rstrip("\n") for n in numbers]
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
            if found is None or not np.isfinite(found).all() or not self.layout.shown and (
                    found != np.floor(found)).any():
                found = self._examined(numbers, self._cells(lines, column, separator, width), column)
            elif np.abs(found).max(initial=0) > 2**53:
                found = self._of_long_numbers(found, lines, column, separator, width)
            values[column] = found
        return values, np.array(numbers)

    def _of_long_numbers(self, found, lines, column, separator, width):
        """Times as whole numbers with more digits than a double holds, as differences from the first."""
        if not time_unit(self.layout, column, self.named_as_time)[0]:
            return found
        try:
            exact = self._read(lines, column, separator, width, np.int64)
        except (ValueError, OverflowError):
            return found
        origin = self.origins.setdefault(column, int(exact[0]))
        return (exact - origin).astype(float)

    def _read(self, lines, column, separator, width, dtype):
        import pandas
        return pandas.read_csv(
            io.StringIO("\n".join(lines)), header=None, names=list(range(width)), usecols=[column],
            sep=r"\s+" if separator == " " else separator or "\x1f", decimal=self.layout.decimal,
            dtype={column: dtype}, na_filter=False, skipinitialspace=True, index_col=False,
            float_precision="round_trip", engine="c", skip_blank_lines=False)[column].to_numpy()

    def _cells(self, lines, column, separator, width):
        import pandas
        try:
            cells = self._read(lines, column, separator, width, str)
        except pandas.errors.ParserError as error:  # of unbalanced quotation marks
            raise InputError(f"{self.path}: cannot be cut into cells: {error}") from None
        return [str(cell).strip().strip('"').strip() for cell in cells]

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
        """The numbers of cells, some of which are not numbers."""
        values = np.empty(len(cells))
        layout = self.layout
        for i, cell in enumerate(cells):
            value = layout.number(cell)
            place = f"{self.path}:{numbers[i]}: {layout.label(column)}"
            if is_missing(cell):
                if self.missing is None:
                    raise InputError(f"{place}: {shown(cell)} where a value is needed; --missing skip or "
                                     "--missing interpolate reads the others")
                value = np.nan
            elif not layout.shown and OPEN.fullmatch(cell) and _whole_below(layout.sample(column)):
                raise InputError(f"{place}: {_both_readings(cell, '.' if '.' in cell else ',')}")
            elif value is None:
                raise InputError(f"{place}: {shown(cell)} is not a number")
            elif not np.isfinite(value):
                raise InputError(f"{place}: {shown(cell)} is not a finite number")
            values[i] = value
        return values

    def is_clock(self, column):
        sample = [cell for cell in self.layout.sample(column) if not is_missing(cell)]
        if bool(sample) and 2 * sum(bool(CLOCK.fullmatch(cell)) for cell in sample) > len(sample):
            return True
        return self._is_of_digits(column, sample)

    def _is_of_digits(self, column, sample):
        """Whether a column has dates and times like 20240131115930."""
        if not sample or not all(map(ONLY_DIGITS.fullmatch, sample)):
            return False
        is_time, unit = time_unit(self.layout, column, self.named_as_time)
        days = any(len(cell) < 12 for cell in sample)
        return is_time and not unit and not (days and not re.search(r"dat|fecha|day|jour|tag",
                                                                    self.layout.names[column], re.IGNORECASE))

    def _settle(self, column):
        """Chooses how the times of a column are read. If the first times are ambiguous, all are examined."""
        if column in self.formats:
            return
        beside = any(c != column and self.is_clock(c) and not any(":" in cell for cell in self.layout.sample(c))
                     for c in range(self.layout.width))
        form = Format(self.dates, beside, f"{self.layout.names[column]} {self.layout.units[column]}")
        if form.is_open(self.layout.sample(column)):
            kept = {}  # the texts that decide, in the order of the file
            for numbers, lines, separator, width in self._parts_of_lines():
                for cell in self._cells(lines, column, separator, width):
                    match = SLASHED.match(cell) or TWO_FIELDS.fullmatch(cell)
                    if match:
                        kept[match[0]] = None
            if doubt := form.settle(list(kept)):
                raise InputError(f"{self.path}: {self.layout.label(column)}: {doubt}")
        self.formats[column] = form

    def _clock(self, numbers, cells, column):
        """The seconds of dates and times of day since the first."""
        nanoseconds, wrong = self.formats[column].parse(cells)
        if wrong is not None:
            cell = cells[wrong]
            hint = "; --time none or --rate reads the values without it"
            raise InputError(f"{self.path}:{numbers[wrong]}: {self.layout.label(column)}: "
                             f"{shown(cell)} is not a time{' like those before' * (wrong > 0)}{hint}")
        origin = self.origins.setdefault(column, int(nanoseconds[0]))
        return (nanoseconds - origin) / 1e9

    def is_of_day(self, column):
        """Whether a column has times without a day."""
        sample = [cell for cell in self.layout.sample(column) if not is_missing(cell)]
        return bool(sample) and all(map(TIME_OF_DAY.fullmatch, sample))


def time_unit(layout, column, named=None):
    """Whether the name of a column says that it is time, and the unit from the name or from the row of units,
    or an empty text. `named` is the number of a column that is time regardless of its name."""
    name, unit = layout.names[column].strip(), layout.units[column]
    match = TIME_NAME.match(name)
    if named == column:
        words = re.findall(r"[^\s_/()\[\],:.-]+", name[match.end():] if match else name)
        found = next((word for word in reversed(words) if seconds_of(word) is not None), "")
        return True, unit or found or ("ms" if match and match["stem"].lower() == "ms" else "")
    if not match:
        return False, ""
    stem, rest = match["stem"], name[match.end():]
    words = [word for word in re.findall(r"[^\s_/()\[\],:.-]+", rest) if word.lower() not in NO_UNIT]
    if not unit:
        unit = next((word for word in reversed(words) if seconds_of(word) is not None), "")
    if not unit and words and re.search(r"[(\[/]", rest):
        unit = words[-1]  # an unknown unit is kept
    if not unit and seconds_of(stem) is not None and stem.lower() != "s":
        unit = stem
    if stem in ("T", "S", "s"):  # also used for temperature, distance and others
        sure = re.search(r"[(\[/\s]", rest) or layout.units[column] or (
            stem == "s" and layout.width > 1 and all(
                UNITS_ALONE.fullmatch(other) for i, other in enumerate(layout.names) if i != column))
        if not sure or not (stem == "s" and not rest and not unit) and seconds_of(unit) is None:
            return False, ""
    elif stem.lower() in ("t", "ms") and (unit or rest) and seconds_of(unit) is None:
        return False, ""  # t of something else
    if stem.lower() in WEAK_NAMES and not layout_rises(layout, column):
        return False, ""
    return True, unit or ("d" if stem.lower() in ("jd", "mjd") else "s" if stem == "s" else "")


def layout_rises(layout, column):
    """Whether the first values of a column are times or are increasing."""
    sample = layout.sample(column)
    values = [layout.number(cell) for cell in sample]
    if None in values:
        return all(CLOCK.fullmatch(cell) for cell in sample)
    return len(values) > 2 and all(sooner < later for sooner, later in zip(values, values[1:]))


def is_index(layout, column):
    """Whether a column counts the rows."""
    if not INDEX_NAME.fullmatch(layout.names[column].strip()) or layout.width == 1 or (
            column > 0 and not any(layout.names)):
        return False
    values = [layout.number(cell) for cell in layout.sample(column)]
    return len(values) > 2 and all(value is not None and value == values[0] + i
                                   for i, value in enumerate(values))
