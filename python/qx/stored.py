"""Recordings stored as arrays or sheets by other programs, read by libraries that Debian has.

NumPy's files need no other package. Each of the other formats needs one, which is loaded only for it. If the
package is missing, the error names it.
"""

import contextlib
import datetime
import io
import re

import numpy as np

from .files import InputError, needs
from .rates import Named
from .tables import Layout, Reader

ROWS_AT_ONCE = 1 << 20
SAMPLE = 400
RATE_NAMES = {"rate", "sr", "fs", "sfreq", "srate", "samplerate", "sample_rate", "samp_rate", "sampling_rate",
              "samplingrate", "sampling_frequency", "samplingfrequency", "framerate"}


def rate_in(note):
    """The rate (rates.Named) in a note that has only a name and a number, or None."""
    name, _, value = note.partition(" = ")
    number = re.fullmatch(r"(\d[\d.e+-]*)( Hz)?", value)
    if name.lower() not in RATE_NAMES or not number or float(number[1]) <= 0:
        return None
    return Named(note, (float(number[1]),), "" if number[2] else "hertz")


@contextlib.contextmanager
def reading(path, what=""):
    """Turns an exception of a reader into an InputError. A broken file can cause exceptions of any kind."""
    try:
        yield
    except (InputError, MemoryError):
        raise
    except Exception as error:
        said = error.strerror if isinstance(error, OSError) and error.strerror else error
        raise InputError(f"{path}: cannot be read{f' as {what}' if what else ''}: {said or type(error).__name__}") from None


class Arrays:
    """Columns of arrays with the interface of a tables.Reader. A column is a function of a slice."""

    where = "the file"

    def __init__(self, source, columns, notes, told=()):
        self.path, self.name, self.columns, self.named_as_time = source.path, source.name, columns, None
        self.comments, self.notes, self.told = notes, notes, list(told)
        self.missing, self.origins = None, {}
        self.length = columns[0].length
        with reading(self.path):
            sample = [column.values(slice(0, SAMPLE)) for column in columns]
        body = [[repr(float(cell)) for cell in row] for row in zip(*sample)]
        self.layout = Layout(None, ".", 1, [column.name for column in columns], [column.unit for column in columns],
                             notes, body, shown=".")

    def is_clock(self, column):
        return self.columns[column].is_clock

    def is_of_day(self, column):
        return False

    def parts(self, columns, beside=()):
        start = 0
        while start < self.length:
            part = slice(start, min(start + ROWS_AT_ONCE, self.length))
            with reading(self.path):
                values = {c: self._values(c, part) for c in columns}
                values |= {c: self._or_none(c, part) for c in beside}
            yield values, np.arange(part.start + 1, part.stop + 1)
            start = part.stop

    def _or_none(self, column, part):
        values = self.columns[column].values(part)
        return np.where(np.isfinite(values), values, np.nan)

    def _values(self, column, part):
        values = self.columns[column].values(part)
        for wrong, what, left_out in (
                (np.isnan(values), "missing; --missing skip or --missing interpolate reads the others", self.missing),
                (np.isinf(values), "not a finite number", False)):
            places = np.flatnonzero(wrong)
            if len(places) and not left_out:
                raise InputError(f"{self.path}: {self.layout.label(column)}: sample {part.start + places[0] + 1} is "
                                 f"{what}")
        return values


class Column:
    """The numbers of one name. `data` is anything that can be sliced; `pick` takes the column out of a slice."""

    def __init__(self, name, data, length, pick=lambda part: part, unit=""):
        self.name, self.length, self.unit = name, length, unit
        self._data, self._pick = data, pick
        first = np.asarray(pick(data[0:1]))
        self.is_clock = first.dtype.kind == "M"
        self._origin = None
        if self.is_clock and length:
            self._origin = first[0]

    def values(self, part):
        found = np.asarray(self._pick(self._data[part]))
        if self.is_clock:
            return (found - self._origin).astype("timedelta64[ns]").astype(np.int64) / 1e9
        return found.astype(np.float64)


def columns_of(path, name, data, unit=""):
    """The columns of one array: the fields of records, the shorter side of a matrix, or the array itself."""
    dtype, shape = data.dtype, [n for n in data.shape]
    if dtype.names:
        return [Column(field, data, shape[0], lambda part, field=field: part[field], unit) for field in dtype.names
                if dtype[field].kind in "iufbM" and not dtype[field].shape]
    if dtype.kind == "c":
        raise InputError(f"{path}: {name or 'the array'} holds complex numbers")
    if dtype.kind not in "iufbM" or not shape or 0 in shape:
        return []
    if len(shape) == 1:
        return [Column(name, data, shape[0], unit=unit)]
    if len(shape) > 2:
        if sum(n > 1 for n in shape) > 2:
            return []
        data = np.asarray(data).squeeze()
        return columns_of(path, name, np.atleast_1d(data), unit)
    if 1 in shape:
        return [Column(name, np.asarray(data).reshape(-1), max(shape), unit=unit)]
    across = shape[1] > shape[0]  # whether a row is a channel
    data = _Turned(data) if across else data
    named = [f"{name}[{i + 1}]" if name else "" for i in range(min(shape))]
    return [Column(one, data, max(shape), lambda part, i=i: part[:, i], unit) for i, one in enumerate(named)]


class _Turned:
    """A matrix whose rows are channels, sliced along them."""

    def __init__(self, data):
        self.data = data

    def __getitem__(self, part):
        return np.asarray(self.data[:, part]).T


def assembled(source, arrays, notes, wanted):
    """A table of columns of the same length: those that include a wanted column, or else the longest. `arrays`
    are triples of name, array and unit."""
    path, columns = source.path, []
    with reading(path):
        for name, data, unit in arrays:
            if np.ndim(data) == 0 or np.size(data) == 1 and not getattr(data.dtype, "names", None):
                value = np.asarray(data).reshape(-1)[0]
                if np.asarray(value).dtype.kind in "iuf":
                    notes.append(f"{name.split('/')[-1]} = {float(value):.17g}" + (f" {unit}" if unit else ""))
                continue
            columns += columns_of(path, name, data, unit)
    if not columns:
        raise InputError(f"{path}: holds no array of numbers")
    lengths = {column.length for column in columns if wanted and column.name in wanted}
    length = max(lengths or {column.length for column in columns})
    others = [f"{column.name} ({column.length} samples)" for column in columns if column.length != length]
    told = [f"of other lengths: {', '.join(others[:8])}{' and more' if len(others) > 8 else ''}"] if others else []
    return Arrays(source, [column for column in columns if column.length == length], notes, told)


def read_npy(source, wanted):
    with reading(source.path):
        array = np.load(source.local(), mmap_mode="r", allow_pickle=False)
    return assembled(source, [("", array, "")], [], wanted)


def read_npz(source, wanted):
    with reading(source.path), np.load(source.local(), allow_pickle=False) as file:
        arrays = [(name, file[name], "") for name in file.files]
    return assembled(source, arrays, [], wanted)


def read_mat(source, wanted):
    try:
        import scipy.io
    except ImportError:
        raise needs(f"{source.path}: a MAT file", "the package python3-scipy") from None
    with reading(source.path, "a MAT file"):
        found = scipy.io.loadmat(source.local(), squeeze_me=True)
    arrays = []
    for name, value in found.items():
        if name.startswith("__"):
            continue
        value = np.asarray(value)
        if value.dtype.names and value.ndim == 0:  # a structure
            arrays += [(f"{name}.{field}", np.asarray(value[field].item()), "") for field in value.dtype.names]
        else:
            arrays.append((name, value, ""))
    arrays = [(name.split(".")[-1] if "." in name and np.size(value) == 1 else name, value, unit)
              for name, value, unit in arrays]
    notes = [f"{name} = {value}" for name, value, _ in arrays if value.dtype.kind == "U" and value.ndim == 0]
    return assembled(source, [one for one in arrays if one[1].dtype.kind not in "UO"], notes, wanted)


def read_hdf5(source, wanted):
    try:
        import h5py
    except ImportError:
        raise needs(f"{source.path}: an HDF5 file", "the package python3-h5py") from None
    with reading(source.path, "HDF5"):
        arrays, notes = _contents_of_hdf5(h5py, source)
    return assembled(source, arrays, notes, wanted)


def _contents_of_hdf5(h5py, source):
    file = source.keep(h5py.File(source.local(), "r"))  # its arrays are read in parts
    arrays, notes = [], [*_attributes(file)]

    def visit(name, item):
        if name.startswith("#") or any(value in (b"char", "char") for kind, value in item.attrs.items()
                                       if kind.endswith("_class")):
            return  # references and texts
        notes.extend(_attributes(item))
        if isinstance(item, h5py.Dataset) and item.dtype.kind in "iufbcV":
            unit = item.attrs.get("units", item.attrs.get("unit", ""))
            unit = unit.decode(errors="replace") if isinstance(unit, bytes) else str(unit)
            value = item[()] if item.size <= 1 else item
            if item.size:
                arrays.append((name, value, unit))
    file.visititems(visit)
    return arrays, notes


def _attributes(item):
    """The attributes of a group or data set that are a single number or text."""
    for name, value in item.attrs.items():
        value = value.decode(errors="replace") if isinstance(value, bytes) else value
        if isinstance(value, str):
            if name.lower() not in ("unit", "units", "class", "version", "title") and not name.endswith("_class"):
                yield f"{name} = {value}"
        elif np.size(value) == 1 and np.asarray(value).dtype.kind in "iuf":
            yield f"{name} = {float(np.asarray(value).reshape(-1)[0]):.17g}"


def read_parquet(source, wanted):
    import pandas
    with reading(source.path, "Parquet"):
        try:
            frame = pandas.read_parquet(source.local())
        except ImportError:
            raise needs(f"{source.path}: a Parquet table", "pyarrow (pip install pyarrow)") from None
    if frame.index.dtype.kind == "M":
        frame = frame.reset_index()
    arrays = []
    for name in frame.columns:
        column = frame[name]
        if getattr(column.dtype, "tz", None) is not None:
            column = column.dt.tz_convert(None)
        arrays.append((str(name), column.to_numpy(), ""))
    return assembled(source, [one for one in arrays if one[1].dtype.kind != "O"], [], wanted)


def read_edf(source, wanted):
    what = f"{source.path}: an EDF or BDF recording"
    head = source.head
    try:
        signals = int(head[252:256])
        labels = [head[256 + 16 * i:272 + 16 * i].decode("latin-1").strip() for i in range(signals)]
        counts = [int(head[256 + 216 * signals + 8 * i:264 + 216 * signals + 8 * i]) for i in range(signals)]
    except ValueError:
        raise InputError(f"{what} whose header cannot be read") from None
    of_signals = {count for label, count in zip(labels, counts) if "Annotations" not in label and label != "Status"}
    if len(of_signals) > 1:
        raise InputError(f"{what} whose channels have several sampling rates, which is not read")
    try:
        import mne
    except ImportError:
        raise needs(what, "the package python3-mne") from None
    import os
    import shutil
    import tempfile
    with tempfile.TemporaryDirectory(prefix="qx-") as folder:
        kind = "bdf" if head[:1] == b"\xff" else "edf"
        path = os.path.join(folder, f"recording.{kind}")  # its reader goes by the extension
        shutil.copy(source.local(), path)
        with reading(source.path, "EDF or BDF"):
            raw = getattr(mne.io, f"read_raw_{kind}")(path, preload=True, verbose="error")
            data, units = raw.get_data(), getattr(raw, "_orig_units", {})
    arrays = [(name, values, "V" if "V" in units.get(name, "") else "") for name, values in zip(raw.ch_names, data)]
    return assembled(source, arrays, [f"sampling rate = {raw.info['sfreq']:.17g} Hz"], wanted)


# Sheets are converted to text with tabs, so that header, time and units are found as in any table.

def _cell(value):
    if value is None or value != value:
        return ""
    if isinstance(value, bool):
        return str(int(value))
    if isinstance(value, datetime.timedelta):
        return repr(value.total_seconds())
    if isinstance(value, (datetime.datetime, datetime.date, datetime.time)):
        return value.isoformat()
    if isinstance(value, float) and value.is_integer() and abs(value) < 1e15:
        return str(int(value))
    return repr(value) if isinstance(value, (int, float)) else " ".join(str(value).split())


def _sheets_xlsx(source):
    try:
        import openpyxl
    except ImportError:
        raise needs(f"{source.path}: an Excel workbook", "the package python3-openpyxl") from None
    book = openpyxl.load_workbook(source.local(), read_only=True, data_only=True)
    for sheet in book.worksheets:
        yield sheet.title, sheet.iter_rows(values_only=True)


def _sheets_xls(source):
    try:
        import xlrd
    except ImportError:
        raise needs(f"{source.path}: an old Excel workbook or another office document",
                    "the package python3-xlrd") from None
    book = xlrd.open_workbook(source.local())
    for sheet in book.sheets():
        yield sheet.name, ([xlrd.xldate_as_datetime(cell.value, book.datemode) if cell.ctype == xlrd.XL_CELL_DATE
                            else xlrd.error_text_from_code.get(cell.value, "#N/A")
                            if cell.ctype == xlrd.XL_CELL_ERROR else cell.value
                            for cell in row] for row in sheet.get_rows())


def _sheets_ods(source):
    import pandas
    try:
        sheets = pandas.read_excel(source.local(), sheet_name=None, header=None, engine="odf", dtype=object)
    except ImportError:
        raise needs(f"{source.path}: an OpenDocument sheet", "the package python3-odf") from None
    for name, frame in sheets.items():
        yield name, frame.itertuples(index=False, name=None)


SHEETS = {"xlsx": _sheets_xlsx, "xls": _sheets_xls, "ods": _sheets_ods}


class _Text:
    """The text of a sheet, as a source for tables.Reader."""

    def __init__(self, source, text):
        self.path, self.name, self.head = source.path, source.name, text[:1 << 16]
        self._text = text

    def open(self):
        return io.BytesIO(self._text)


def read_sheets(source, kind, options):
    """The first sheet with numbers as a table."""
    names, chosen = [], None
    with reading(source.path, "a workbook"):
        for name, rows in SHEETS[kind](source):
            names.append(name)
            if chosen is None:
                lines = [[_cell(value) for value in row] for row in rows]
                if any(cell and cell.lstrip("-")[:1].isdigit() for line in lines for cell in line):
                    chosen = name, lines
    if chosen is None:
        raise InputError(f"{source.path}: holds no numbers")
    name, lines = chosen
    used = [c for c in range(max(map(len, lines))) if any(c < len(line) and line[c] for line in lines)]
    lines = [[line[c] if c < len(line) else "" for c in used] for line in lines]
    text = "\n".join("\t".join(line) if any(line) else "" for line in lines)  # rows keep their numbers
    reader = Reader(_Text(source, text.encode()), **{**options, "decimal": options["decimal"] or "point"})
    if len(names) > 1:
        reader.told.append(f"sheet {name!r} of {', '.join(map(repr, names))}")
    return reader


READERS = {"npy": read_npy, "npz": read_npz, "mat": read_mat, "hdf5": read_hdf5, "parquet": read_parquet,
           "edf": read_edf, "bdf": read_edf}
ENDINGS = (".npy", ".npz", ".mat", ".h5", ".hdf5", ".hdf", ".xlsx", ".xlsm", ".xls", ".ods", ".parquet", ".edf",
           ".bdf")
