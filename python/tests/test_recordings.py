"""How recordings are read: files written by people (data/recordings.txt), and by instruments and programs."""

import bz2
import contextlib
import datetime
import gzip
import importlib.util
import io
import lzma
import re
import struct
import sys
import tempfile
import unittest
import zipfile
from pathlib import Path
from unittest import mock

import h5py
import numpy as np
import openpyxl
import scipy.io
import soundfile
import zstandard

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import __main__ as command  # noqa: E402
from qx import isolation, recording  # noqa: E402
from qx.commands import reading  # noqa: E402

HERE = mock.patch.object(isolation, "AVAILABLE", False)  # files are read in this process, with its patches
CASES = Path(__file__).resolve().parent / "data/recordings.txt"


def cases():
    """The name, the statements and the text of each case."""
    for part in re.split(r"^== ", CASES.read_text("utf-8"), flags=re.MULTILINE)[1:]:
        head, _, text = part.partition("\n---\n")
        name, *lines = head.split("\n")
        statements = [tuple(map(str.strip, line.split(":", 1))) for line in lines]
        yield name, statements, "".join(map(repeated, text.splitlines(keepends=True)))


def repeated(line):
    """A line, or the lines that "@COUNT RATE TEXT" represents."""
    if not (match := re.match(r"@(\d+) (\S+) (.*\n)", line)):
        return line
    return "".join(_formatted(match[3], i, i / float(match[2])) for i in range(int(match[1])))


def _formatted(text, i, t):
    def field(match):
        value = i if match[2] == "i" else t
        return format(value + float(match[1] or 0), match[3] or "g") if match[2] == "t" else str(i)
    return re.sub(r"\{(?:([\d.]+)\+)?([it])(?::([^}]*))?\}", field, text)


def read(path, *options):
    """A recording, read with options of the command line."""
    return recording.read(path, **reading.of(command.arguments(["report", str(path), *options])))


class InFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def refuses(self, path, fragment, *options):
        with self.assertRaises(recording.InputError) as caught:
            read(path, *options)
        self.assertIn(fragment, str(caught.exception))
        self.assertNotIn("\n", str(caught.exception))


class WhatPeopleWrite(InFolder):
    def test_every_case(self):
        known = {"options", "file", "rate", "column", "values", "says", "refused"}
        names = set()
        for name, statements, text in cases():
            with self.subTest(name):
                self.assertNotIn(name, names)
                names.add(name)
                said = dict(statements)
                self.assertLessEqual(set(said), known)
                self.assertTrue(set(said) - {"options", "file"}, "states nothing")
                path = self.folder / said.get("file", "data.csv")
                path.write_text(text, "utf-8")
                options = said.get("options", "").split()
                if "refused" in said:
                    self.refuses(path, said["refused"], *options)
                    continue
                self.holds(read(path, *options), statements)
        self.assertGreater(len(names), 200)

    def holds(self, found, statements):
        for what, expected in statements:
            if what == "rate" and expected == "none":
                self.assertIsNone(found.rate, found.choice)
            elif what == "rate":
                value, _, doubt = expected.partition("+-")
                self.assertIsNotNone(found.rate, found.choice)
                self.assertAlmostEqual(found.rate, float(value), delta=float(doubt or 1e-9 * float(value)))
            elif what == "column":
                self.assertIn(f"column {expected} of", found.choice)
            elif what == "values":
                values = list(map(float, expected.split()))
                self.assertEqual(found.values[:len(values)].tolist(), values)
            elif what == "says":
                self.assertIn(expected, found.choice)


RAMP = np.arange(1.0, 101)


class WhatProgramsKeep(InFolder):
    def holds(self, path, rate, *options, values=RAMP, says=()):
        found = read(path, *options)
        np.testing.assert_allclose(found.values, values)
        self.assertEqual(found.rate, rate, found.choice)
        for part in says:
            self.assertIn(part, found.choice)

    def test_compressed_tables_and_what_is_broken_in_them(self):
        text = "# fs = 100 Hz\nu\n" + "".join(f"{value}\n" for value in RAMP)
        path = self.folder / "a.csv.gz"
        for name, pack in (("a.csv.gz", gzip.compress), ("a.csv.bz2", bz2.compress), ("a.csv.xz", lzma.compress),
                           ("a.csv.zst", zstandard.ZstdCompressor().compress), ("without_an_ending", gzip.compress)):
            with self.subTest(name):
                (self.folder / name).write_bytes(pack(text.encode()))
                self.holds(self.folder / name, 100)
        path.write_bytes(gzip.compress(text.encode())[:-20])
        self.refuses(path, "cannot be unpacked, perhaps cut off")
        path.write_bytes(gzip.compress(wav(RAMP)))
        self.holds(path, 8000, values=RAMP / 32768)
        with zipfile.ZipFile(self.folder / "a.zip", "w") as archive:
            archive.writestr("deep/a.csv", text)
            archive.writestr("__MACOSX/a.csv", "x")
        self.holds(self.folder / "a.zip", 100)
        with zipfile.ZipFile(self.folder / "a.zip", "a") as archive:
            archive.writestr("b.csv", text)
        self.refuses(self.folder / "a.zip", "is an archive of 2 files, b.csv, deep/a.csv: unpacked")

    def test_a_pipe(self):
        text = "# fs = 100 Hz\nu\n" + "".join(f"{value}\n" for value in RAMP)
        for content, rate, values in ((text.encode(), 100, RAMP), (gzip.compress(text.encode()), 100, RAMP),
                                      (wav(RAMP), 8000, RAMP / 32768)):
            with mock.patch.object(sys, "stdin", io.TextIOWrapper(io.BytesIO(content))):
                self.holds("-", rate, values=values)
        with mock.patch.object(sys, "stdin", io.TextIOWrapper(io.BytesIO(b"1\nx2\n"))):
            self.refuses("-", "standard input:2: column 1: 'x2'")

    def test_arrays_of_numpy(self):
        path = self.folder / "a.npy"
        for array, options, values in ((RAMP, (), RAMP), (RAMP.astype("<i2"), (), RAMP),
                                       (np.array([RAMP, -RAMP]), ("--column", "2"), -RAMP),
                                       (np.array([RAMP, -RAMP]).T, ("--column", "2"), -RAMP),
                                       (np.rec.fromarrays([RAMP, -RAMP], names="a,b"), ("--column", "b"), -RAMP)):
            np.save(path, array)
            self.holds(path, 5, "--rate", "5", *options, values=values)
        for array, fragment in ((RAMP + 1j, "complex numbers"), (np.array(["a"], object), "cannot be read"),
                                (np.array([1, np.nan, 3]), "sample 2 is missing"),
                                (np.array([1, 2, np.inf]), "sample 3 is not a finite number")):
            np.save(path, array, allow_pickle=True)
            self.refuses(path, fragment)
        np.save(path, np.array([1, np.nan, 3]))
        self.holds(path, None, "--missing", "interpolate", values=[1, 2, 3])
        path.write_bytes(path.read_bytes()[:-4])
        self.refuses(path, "cannot be read")
        path = self.folder / "a.npz"
        np.savez(path, t=RAMP / 250, x=RAMP, odd=np.ones(7))
        self.holds(path, 250, says=["time from column 1, t", "of other lengths: odd (7 samples)"])
        self.holds(path, None, "--column", "odd", values=np.ones(7))
        np.savez_compressed(path, x=RAMP, fs=44.125)  # with three decimals, which are not a group of thousands here
        self.holds(path, 44.125, says=["'fs = 44.125', taken as hertz"])
        when = np.datetime64("2024-01-01T00:00:00") + np.arange(100) * np.timedelta64(2, "ms")
        np.savez(path, when=when, x=RAMP)
        self.holds(path, 500)

    def test_mat_files(self):
        path = self.folder / "a.mat"
        scipy.io.savemat(path, {"x": RAMP, "Fs": 2000.0, "remark": "low-pass at 100 Hz"})
        self.holds(path, 2000)
        scipy.io.savemat(path, {"data": {"signal": RAMP[:, np.newaxis], "dt": 0.002}})
        self.holds(path, 500, says=["data.signal", "'dt = 0.002', taken as seconds"])
        path.write_bytes(path.read_bytes()[:200])
        self.refuses(path, "cannot be read as a MAT file")

    def test_hdf5_files(self):
        path = self.folder / "a.h5"
        with h5py.File(path, "w") as file:
            force = file.create_dataset("run/force", data=RAMP)
            force.attrs["units"], force.attrs["sampling_rate"] = "N", 1000.0
            file.create_dataset("run/matrix", data=np.array([RAMP, -RAMP]))
            file.attrs["author"] = "somebody"
        self.holds(path, 1000, says=["run/force (N)", "others: run/matrix[1], run/matrix[2]"])
        self.holds(path, 1000, "--column", "run/matrix[2]", values=-RAMP)
        path.write_bytes(path.read_bytes()[:1000])
        self.refuses(path, "cannot be read as HDF5")

    def test_tables_of_columns(self):
        import pandas
        path = self.folder / "a.parquet"
        path.write_bytes(b"PAR1" + bytes(9))
        frame = pandas.DataFrame({"t (ms)": np.arange(0, 400, 4), "u": RAMP, "label": ["x"] * 100})
        with HERE, mock.patch.object(pandas, "read_parquet", lambda _: frame):
            self.holds(path, 250, says=["column 2 of 2, u"])

    @unittest.skipUnless(importlib.util.find_spec("mne"), "python3-mne is not installed")
    def test_edf_files(self):
        def fields(*columns):
            return b"".join(str(value).ljust(width).encode() for values, width in columns for value in values)

        def edf(counts):
            head = fields(([0], 8), (["", ""], 80), (["01.01.24", "00.00.00", 768], 8), ([""], 44), ([5, 1], 8),
                          ([2], 4), (["ECG", "Resp"], 16), (["", ""], 80), (["uV", "uV"], 8), ([-32768] * 2, 8),
                          ([32767] * 2, 8), ([-32768] * 2, 8), ([32767] * 2, 8), (["", ""], 80), (counts, 8),
                          (["", ""], 32))
            return head + b"".join(np.concatenate([part, -part[:counts[1]]]).astype("<i2").tobytes()
                                   for part in RAMP.reshape(5, 20))

        path = self.folder / "a.edf"
        path.write_bytes(edf([20, 20]))
        self.holds(path, 20, "--column", "Resp", values=-1e-6 * RAMP, says=["Resp (V)", "others: ECG"])
        path.write_bytes(edf([20, 10]))
        self.refuses(path, "several sampling rates")

    def test_workbooks(self):
        path = self.folder / "a.xlsx"
        book = openpyxl.Workbook()
        book.active.append(["only a remark"])
        sheet = book.create_sheet("run 1")
        sheet.append(["Time", "Force (N)", "n"])
        for i, value in enumerate(RAMP):
            time = datetime.datetime(2024, 1, 31, 23, 59, 50) + datetime.timedelta(seconds=i)
            sheet.append([time, value, i * 1.234])
        book.save(path)
        self.holds(path, 1, says=["sheet 'run 1' of 'Sheet', 'run 1'", "Force (N)"])
        sheet["B5"] = "#N/A"
        book.save(path)
        self.refuses(path, ":5: column 2, Force (N): '#N/A' where a value is needed")
        path.write_bytes(path.read_bytes()[:-100])
        self.refuses(path, "cannot be unpacked")

    def test_what_a_missing_reader_is_called(self):
        np.savez(self.folder / "a.npz", x=RAMP)
        edf = b"0       " + b" " * 244 + b"1   " + b"ECG".ljust(16) + b" " * 200 + b"100     " + b" " * 32
        for content, module, package in (
                (zstandard.ZstdCompressor().compress(b"1\n2\n"), "zstandard", "python3-zstandard"),
                (b"\x89HDF\r\n\x1a\n" + bytes(600), "h5py", "python3-h5py"), (edf, "mne", "python3-mne"),
                (b"PAR1" + bytes(90), "pyarrow", "pyarrow (pip install pyarrow)"),
                (b"a MAT-file".ljust(200, b" "), "scipy.io", "python3-scipy")):
            with self.subTest(module), HERE, mock.patch.dict(sys.modules, {module: None, "fastparquet": None}):
                path = self.folder / "data.bin"
                path.write_bytes(content)
                self.refuses(path, f"reading needs {'the package ' * package.startswith('python3')}{package}")

    def test_files_of_others_are_refused_by_name(self):
        for content, name in ((b"%PDF-1.4\n", "a PDF document"), (b"SQLite format 3\0", "an SQLite database"),
                              (b"\x89PNG\r\n", "a PNG picture"), (b"MDF     4.10\0", "an MDF recording"),
                              (b"\0\0\0\x20ftypmp42", "an MP4 video or sound"), (b"\x7fELF\1", "a program"),
                              (b"{\\rtf1", "an RTF document"), (b"GDF 2.10", "a GDF recording")):
            path = self.folder / "measurement.csv"
            path.write_bytes(content)
            self.refuses(path, f"is {name}")

    def test_audio_with_wrong_lengths(self):
        path = self.folder / "a.wav"
        whole = wav(RAMP)
        data = whole.index(b"data") + 4
        streamed = whole[:data] + b"\xff\xff\xff\xff" + whole[data + 4:]
        for content, count, says in ((whole, 100, ""), (whole[:-100], 50, "is cut off: 100 of 200 bytes"),
                                     (streamed, 100, "does not give the length"),
                                     (whole[:data] + struct.pack("<I", 100) + whole[data + 4:], 50,
                                      "at the end of the file belong to no chunk"),
                                     (whole + bytes(50), 100, "header")):
            with self.subTest(says):
                path.write_bytes(content)
                self.holds(path, 8000, values=RAMP[:count] / 32768, says=[says])
        path.write_bytes(whole[:data] + bytes(4) + whole[data + 4:])
        self.refuses(path, "holds no samples: 200 bytes at the end")
        for name, subtype in (("a.aiff", "PCM_16"), ("a.flac", "PCM_16"), ("a.au", "PCM_16"), ("a.w64", "PCM_16"),
                              ("a.caf", "PCM_16"), ("a.rf64", "PCM_16"), ("a.ogg", "VORBIS")):
            with self.subTest(name):
                path = self.folder / name
                soundfile.write(path, np.tile(RAMP / 32768, 200), 8000, subtype)
                found = read(path)
                self.assertEqual((len(found.values), found.choice.count(";")), (20000, 1), found.choice)
                path.write_bytes(path.read_bytes()[:path.stat().st_size // 2])
                try:
                    said = read(path).choice
                except recording.InputError as error:
                    said = str(error)
                self.assertRegex(said, "cut off|announces|cannot be read", name)


def wav(values, rate=8000):
    body = np.asarray(values, "<i2").tobytes()
    fmt = struct.pack("<HHIIHH", 1, 1, rate, 2 * rate, 2, 16)
    chunks = b"fmt " + struct.pack("<I", 16) + fmt + b"data" + struct.pack("<I", len(body)) + body
    return b"RIFF" + struct.pack("<I", 4 + len(chunks)) + b"WAVE" + chunks


class Commands(InFolder):
    def test_every_command_reads_with_the_same_options(self):
        path = self.folder / "a.csv"
        path.write_text("when;u\n" + "".join(f"01/02/2024 00:00:{i:02};{i % 7 + 1}.000,5\n" for i in range(60)))
        for name in ("peaks", "pulse", "fit"):
            with self.subTest(name):
                options = ["--model", "line", "--plot", str(self.folder / "fit.svg")] if name == "fit" else [
                    "--csv", str(self.folder / f"{name}.csv")]
                out = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
                with contextlib.redirect_stdout(out), contextlib.redirect_stderr(out):
                    code = command.main([name, str(path), "--time", "when", "--dates", "dmy", "--thousands",
                                         *options])
                told = out.buffer.getvalue().decode()
                self.assertEqual(code, 0, told)
                self.assertIn("u = a x + b, x = when" if name == "fit" else "1 samples per second, from the time",
                              told)


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
