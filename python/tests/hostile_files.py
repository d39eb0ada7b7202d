"""Reads recordings of every supported kind that are corrupted at random, and reports what happens.

    hostile_files.py [--each 10000] [--seed 0] [--keep FOLDER] [KIND...]

It prints a line for each kind: how many files were read and refused, how many refusals came from a limit or a crash
of a library, the longest time and the largest memory. Then it prints every failure that is not a refusal in one line,
which is a fault of this package. The test beside it (test_hostile.py) uses a few files of each kind.
"""

import argparse
import bz2
import collections
import contextlib
import datetime
import gzip
import importlib.util
import io
import lzma
import random
import re
import sys
import tempfile
import time
import warnings
import zipfile
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
if str(PYTHON) not in sys.path:
    sys.path.insert(0, str(PYTHON))
from qx import isolation, recording  # noqa: E402

RAMP = np.arange(60.0) % 7
TEXT = ("# fs = 100 Hz\ntime [s];force (N);remark\n"
        + "".join(f"{i / 100};{v};7\n" for i, v in enumerate(RAMP))).encode()
DATED = ("Date,Time,u [V]\n" + "".join(f"01/02/2024,11:59:{i:02},{v}\n" for i, v in enumerate(RAMP))).encode()
NUMBERS = (0, 1, 2, 0x7f, 0x80, 0xff, 0x7fff, 0x8000, 0xffff, 0x7fffffff, 0x80000000, 0xfffffffe, 0xffffffff, 2**40,
           2**63 - 1, 2**63, 2**64 - 1)
TOKENS = (b"nan", b"-inf", b"1e999", b"1e308", b"-1e308", b"9" * 400, b"\"", b"'", b";", b",", b"\t", b"|", b"\n",
          b"\r\n", b"#", b"%", b"<b>", b"]]>", b"&x;", b"\xef\xbb\xbf", b"\xff\xfe", b"\x00",
          "\u00a0\u2212\u0663".encode(), b"31.02.2024", b"00/01/2024", b"01/01/9999", b"2024-13-45", b"99:99:99", b"24:00",
          b"fs = 0 Hz", b"fs = 1e400 kHz", b"sampling rate", b"dt = -1 s", b"{", b"[" * 60, b"20240230", b"1,234,567",
          b"1.234,5", b"0x1p3", b"1_000", b"1e", b"-", b"")


def made(write):
    """The bytes that a function writes to a path."""
    with tempfile.TemporaryDirectory() as folder:
        path = Path(folder) / "made"
        write(path)
        return next(Path(folder).iterdir()).read_bytes()


def audio(kind, subtype):
    import soundfile
    sound = np.stack([RAMP, -RAMP], -1).repeat(5, 0) / 8
    return made(lambda path: soundfile.write(path, sound, 8000, subtype, format=kind))


def workbook():
    import openpyxl
    book = openpyxl.Workbook()
    book.active.append(["Time", "Force (N)"])
    for i, value in enumerate(RAMP):
        book.active.append([datetime.datetime(2024, 1, 31) + datetime.timedelta(seconds=i), value])
    return made(lambda path: book.save(path))


def sheet_of_office():
    import pandas
    frame = pandas.DataFrame({"t (s)": np.arange(20) / 10, "u": RAMP[:20]})
    return made(lambda path: frame.to_excel(path.with_suffix(".ods"), engine="odf", index=False))


def mat(**options):
    import scipy.io
    return made(lambda path: scipy.io.savemat(path.with_suffix(".mat"), {
        "x": RAMP, "Fs": 2000.0, "data": {"signal": RAMP, "gain": 0.002}, "remark": "text"}, **options))


def hdf5(**options):
    import h5py

    def write(path):
        with h5py.File(path, "w", **options) as file:
            force = file.create_dataset("run/force", data=RAMP, chunks=(20,), compression="gzip")
            force.attrs["units"], force.attrs["sampling_rate"] = "N", 1000.0
            file["matrix"] = np.array([RAMP, -RAMP])
    return made(write)


def edf(start=b"0       ", width=2):
    def fields(*columns):
        return b"".join(str(value).ljust(size).encode() for values, size in columns for value in values)
    head = fields((["", ""], 80), (["01.01.24", "00.00.00", 768], 8), (["24BIT" if width == 3 else ""], 44), ([3, 1], 8),
                  ([2], 4), (["ECG", "Resp"], 16), (["", ""], 80), (["uV", "uV"], 8), ([-32768] * 2, 8), ([32767] * 2, 8),
                  ([-32768] * 2, 8), ([32767] * 2, 8), (["", ""], 80), ([20, 20], 8), (["", ""], 32))
    return start + head + bytes(3 * 2 * 20 * width)


def archive(name, content):
    file = io.BytesIO()
    with zipfile.ZipFile(file, "w", zipfile.ZIP_DEFLATED) as packed:
        packed.writestr(name, content)
    return file.getvalue()


def zstd(content):
    import zstandard
    return zstandard.ZstdCompressor().compress(content)


def numpys(save, *arrays, **more):
    file = io.BytesIO()
    save(file, *arrays, **more)
    return file.getvalue()


TABLE = np.rec.fromarrays([RAMP, RAMP.astype("<i2")], names="a,b")
# By kind: the extension, the module that reading needs, and the function that makes a file.
KINDS = {
    "text": ("csv", "pandas", lambda: TEXT),
    "dates": ("csv", "pandas", lambda: DATED),
    "UTF-16": ("txt", "pandas", lambda: b"\xff\xfe" + TEXT.decode().encode("utf-16-le")),
    "gzip": ("csv.gz", "pandas", lambda: gzip.compress(TEXT)),
    "bzip2": ("csv.bz2", "pandas", lambda: bz2.compress(TEXT)),
    "xz": ("csv.xz", "pandas", lambda: lzma.compress(TEXT)),
    "zstd": ("csv.zst", "zstandard", lambda: zstd(TEXT)),
    "zip": ("zip", "pandas", lambda: archive("a.csv", TEXT)),
    "npy": ("npy", "numpy", lambda: numpys(np.save, TABLE)),
    "npz": ("npz", "numpy", lambda: numpys(np.savez_compressed, x=RAMP, fs=100.0, t=TABLE)),
    "xlsx": ("xlsx", "openpyxl", workbook),
    "xls": ("xls", "xlrd", lambda: (Path(__file__).parent / "data/small.xls").read_bytes()),
    "ods": ("ods", "odf", sheet_of_office),
    "MAT 5": ("mat", "scipy", mat),
    "MAT 5 packed": ("mat", "scipy", lambda: mat(do_compression=True)),
    "MAT 4": ("mat", "scipy", lambda: made(lambda path: __import__("scipy.io").io.savemat(
        path.with_suffix(".mat"), {"x": RAMP, "fs": 100.0}, format="4"))),
    "HDF5": ("h5", "h5py", hdf5),
    "HDF5 latest": ("h5", "h5py", lambda: hdf5(libver="latest")),
    "EDF": ("edf", "mne", edf),
    "BDF": ("bdf", "mne", lambda: edf(b"\xffBIOSEMI", 3)),
    "Parquet": ("parquet", "pyarrow", lambda: made(lambda path: __import__("pandas").DataFrame(
        {"t": RAMP, "u": RAMP}).to_parquet(path))),
    **{kind: (kind.split()[0].lower(), "soundfile", lambda kind=kind: audio(kind.split()[0], (kind.split() + ["PCM_16"])[1]))
       for kind in ("WAV", "WAV MS_ADPCM", "WAVEX", "RF64", "W64", "AIFF", "AIFF ALAW", "AU", "CAF", "CAF ALAC_16", "FLAC",
                    "OGG VORBIS", "OGG OPUS", "MP3 MPEG_LAYER_III", "VOC")},
}


def rezipped(rng, content):
    """The archive with one of its files corrupted, and with correct checksums."""
    out = io.BytesIO()
    with zipfile.ZipFile(io.BytesIO(content)) as old, zipfile.ZipFile(out, "w", zipfile.ZIP_DEFLATED) as new:
        names = old.namelist()
        spoilt = rng.choice(names)
        for name in names:
            new.writestr(name, mutated(rng, old.read(name)) if name == spoilt else old.read(name))
    return out.getvalue()


def mutated(rng, content):
    data = bytearray(content)
    for _ in range(rng.choice((1, 1, 2, 3, 8))):
        most = min(len(data), rng.choice((16, 64, 512, len(data) or 1)))
        at = rng.randrange(most) if most else 0
        length = rng.choice((1, 2, 4, 8, 30, len(data) // 4 + 1))
        match rng.randrange(9):
            case 0 if data:
                data[at] ^= 1 << rng.randrange(8)
            case 1 if data:
                data[at] = rng.choice((0, 1, 0x7f, 0x80, 0xff, rng.randrange(256)))
            case 2:
                del data[at:at + length]
            case 3:
                data[at:at] = data[at:at + length]
            case 4:
                data[at:at] = rng.randbytes(min(length, 64))
            case 5:
                del data[rng.randrange(len(data) + 1):]
            case 6:
                data[at:at + length] = data[rng.randrange(len(data) + 1):][:length]
            case 7:
                size, order = rng.choice((1, 2, 4, 8)), rng.choice(("little", "big"))
                data[at:at + size] = (rng.choice(NUMBERS) % (1 << 8 * size)).to_bytes(size, order)
            case _:
                data[at:at + rng.choice((0, 0, 3))] = rng.choice(TOKENS)
    return bytes(data)


def spoilt(rng, content):
    if content.startswith(b"PK") and rng.random() < 0.7:
        return rezipped(rng, content)
    return mutated(rng, content)


def memory(process):
    """The largest memory that a process has used, in bytes."""
    with contextlib.suppress(OSError), open(f"/proc/{process.pid}/status") as file:
        found = re.search(r"VmHWM:\s*(\d+)", file.read())
        return int(found[1]) << 10 if found else 0
    return 0


class Tally:
    def __init__(self, kind):
        self.kind, self.counts, self.ends = kind, collections.Counter(), collections.Counter()
        self.seconds, self.memory, self.faults = 0.0, 0, []

    def add(self, path, options):
        before = time.monotonic()
        try:
            recording.read(path, **options)
            self.counts["read"] += 1
        except recording.InputError as error:
            self.counts["refused"] += 1
            text = str(error)
            if end := re.search(r"crashed \(\w+\)|takes more than .* of (?:processor time|memory)|has done nothing|"
                                r"was terminated", text):
                self.ends[re.sub(r"\d+", "n", end[0])] += 1
            if not text.startswith(str(path)) or "\n" in text:
                self.faults.append(f"no line of ours: {text!r}")
        except Exception as error:
            self.faults.append(f"{type(error).__name__}: {error}")
        self.seconds = max(self.seconds, time.monotonic() - before)
        for worker in isolation._idle:
            self.memory = max(self.memory, memory(worker.process))

    def __str__(self):
        ends = ", ".join(f"{count} {end}" for end, count in self.ends.items())
        return (f"{self.kind:20} {self.counts['read']:6} read {self.counts['refused']:6} refused {len(self.faults):4} faults"
                f" {self.seconds:6.2f} s {self.memory / 1e6:6.0f} MB  {ends}")


def attack(kind, count, seed, folder, keep=None):
    """The Tally of a kind; None if its files cannot be made or read here."""
    ending, module, make = KINDS[kind]
    if importlib.util.find_spec(module) is None:
        return None
    with warnings.catch_warnings():
        warnings.simplefilter("ignore")
        content = make()
    rng, tally = random.Random(f"{kind} {seed}"), Tally(kind)
    path = folder / f"spoilt.{ending}"
    path.write_bytes(content)
    recording.read(path)  # the intact file can be read
    for i in range(count):
        path.write_bytes(data := spoilt(rng, content))
        faults, ends = len(tally.faults), tally.ends.total()
        tally.add(path, {"missing": rng.choice((None, "skip", "interpolate")), "rate": rng.choice((None, 5.0))})
        if keep and (len(tally.faults) > faults or tally.ends.total() > ends):
            (keep / f"{kind.replace(' ', '_')}_{i}.{path.name.partition('.')[2]}").write_bytes(data)
    return tally


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("kinds", nargs="*", metavar="KIND")
    parser.add_argument("--each", type=int, default=10_000)
    parser.add_argument("--seed", type=int, default=0)
    parser.add_argument("--keep", type=Path, help="folder for the files that are faults, or meet a limit")
    options = parser.parse_args()
    if options.keep:
        options.keep.mkdir(parents=True, exist_ok=True)
    faults = 0
    for kind in options.kinds or KINDS:
        with tempfile.TemporaryDirectory() as folder:
            try:
                tally = attack(kind, options.each, options.seed, Path(folder), options.keep)
            except Exception as error:
                print(f"{kind:20} cannot be made here: {type(error).__name__}: {error}", flush=True)
                continue
        if tally is None:
            print(f"{kind:20} has no reader here", flush=True)
            continue
        print(tally, flush=True)
        for text, count in collections.Counter(re.sub(r"\d+", "n", fault) for fault in tally.faults).most_common(8):
            print(f"    {count} x {text[:300]}")
        faults += len(tally.faults)
    return bool(faults)


if __name__ == "__main__":
    sys.exit(main())
