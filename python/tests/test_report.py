"""Recordings, the report and the command line."""

import contextlib
import io
import os
import re
import struct
import sys
import tempfile
import unittest
import xml.etree.ElementTree
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import __main__ as command  # noqa: E402
from qx import recording, report  # noqa: E402

ECG = PYTHON.parent / "examples/data/ecg_208_360hz.csv"


def run(*arguments):
    """The exit code, the output and the error output of a command."""
    out = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
    err = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
    with contextlib.redirect_stdout(out), contextlib.redirect_stderr(err):
        code = command.main(list(map(str, arguments)))
    return code, out.buffer.getvalue().decode(), err.buffer.getvalue().decode()


class InFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def file(self, content, name="data.csv"):
        path = self.folder / name
        path.write_bytes(content if isinstance(content, bytes) else content.encode())
        return path


def wav(samples, form=1, bits=16, rate=8000, channels=1):
    body = b"".join(samples)
    block = channels * bits // 8
    fmt = struct.pack("<HHIIHH", form, channels, rate, rate * block, block, bits)
    chunks = b"fmt " + struct.pack("<I", 16) + fmt + b"LIST" + struct.pack("<I", 3) + b"odd\0" \
        + b"data" + struct.pack("<I", len(body)) + body
    return b"RIFF" + struct.pack("<I", 4 + len(chunks)) + b"WAVE" + chunks


class Reading(InFolder):
    def test_tables(self):
        for text, values, rate, unit in (
                ("1\n2.5\n-3e-1\n", [1, 2.5, -0.3], None, ""),
                ("# at 50 Hz\nforce [N]\n1\n2\n", [1, 2], 50, "N"),
                ("t;u (mV)\n0;1,5\n0,5;2,5\n1;3,5\n", [1.5, 2.5, 3.5], 2, "mV"),
                ("time [ms],x\n0,4\n2,5\n4,6\n", [4, 5, 6], 500, ""),
                ("\ufeffvalue\r\n1\r\n\r\n2\r\n", [1, 2], None, ""),
                ("time [min],x\n0,4\n1,5\n", [4, 5], 1 / 60, ""),
                ("t,x\n0,4\n1,5\n3,6\n", [4, 5, 6], None, ""),  # uneven times
                ("t,x\n0,4\n0,5\n", [4, 5], None, ""),  # times that stand still
                ("# sampling rate: 2.5k\n1\n", [1], 2500, ""),
                ("1 10\n2 20\n", [1, 2], None, "")):
            with self.subTest(text=text):
                read = recording.read(self.file(text))
                np.testing.assert_allclose(read.values, values)
                self.assertEqual((read.rate, read.unit), (rate, unit))
        for encoding in ("utf-16", "latin-1"):
            read = recording.read(self.file("# 5 Hz, °C\n1\n2\n".encode(encoding)))
            self.assertEqual((read.values.tolist(), read.notes), ([1, 2], ["5 Hz, °C"]))
        two = self.file("a,b\n1,2\n3,4\n")
        self.assertEqual(recording.read(two, column="b").values.tolist(), [2, 4])
        self.assertEqual(recording.read(two, column="2").values.tolist(), [2, 4])
        self.assertEqual(recording.read(self.file("1\n", "tone_44.1khz.csv")).rate, 44100)
        self.assertEqual(recording.read(self.file("1\n", "tone_8hz.csv"), rate=5.0).rate, 5)

    def test_wav_files(self):
        for samples, form, bits in (
                ([struct.pack("<h", v) for v in (0, 16384, -32768)], 1, 16),
                ([bytes([v]) for v in (128, 192, 0)], 1, 8),
                ([struct.pack("<i", v)[:3] for v in (0, 1 << 22, -(1 << 23))], 1, 24),
                ([struct.pack("<i", v) for v in (0, 1 << 30, -(1 << 31))], 1, 32),
                ([struct.pack("<f", v) for v in (0, 0.5, -1)], 3, 32),
                ([struct.pack("<d", v) for v in (0, 0.5, -1)], 3, 64)):
            with self.subTest(form=form, bits=bits):
                read = recording.read(self.file(wav(samples, form, bits), "a.wav"))
                self.assertEqual((read.values.tolist(), read.rate), ([0, 0.5, -1], 8000))
        extensible = wav([struct.pack("<h", 16384)], 0xFFFE)
        extensible = extensible.replace(b"fmt \x10\0\0\0", b"fmt \x1a\0\0\0").replace(
            b"LIST", b"\x08\0\x10\0\x04\0\0\0\x01\0LIST")
        self.assertEqual(recording.read(self.file(extensible)).values.tolist(), [0.5])
        stereo = wav([struct.pack("<hh", 0, 16384)] * 2, channels=2)
        self.assertEqual(recording.read(self.file(stereo), column="2").values.tolist(), [0.5, 0.5])

    def test_bad_input_is_one_line_that_says_what_and_where(self):
        nan_wav = wav([struct.pack("<f", v) for v in (0, float("nan"))], 3, 32)
        for content, reason in (
                ("", "is empty"), ("# only\n\n", "holds no numbers"), ("a\nb\n", "holds no numbers"),
                ("1\n2\nnan\n", ":3: 'nan' is not a finite"), ("v\n1\n-inf\n", ":3: '-inf' is not"),
                ("1\n# c\nx2\n", ":3: 'x2' is not a number"), ("1\n2_0\n", ":2: '2_0' is not"), ("t,u\n0,1\n1,\n", ":3: column 2"),
                (b"\x7fELF\x01\0\0", ":1: neither"),
                (b"1\n2\n\x00\n", ":3: neither"), (b"RIFF\0\0\0\0WAVE", "no format"),
                (wav([]), "no samples"), (wav([b"\0\0"], form=85), "cannot be read"),
                (nan_wav, "sample 2"), ("1e308\n-1e308\n", "more than a plot can span")):
            with self.subTest(content=content[:30]):
                path = self.file(content)
                code, _, err = run("report", path, "--output", self.folder / "out")
                self.assertEqual(code, 2)
                self.assertEqual(err.count("\n"), 1, err)
                self.assertIn(str(path), err)
                self.assertIn(reason, err)
                self.assertFalse((self.folder / "out").exists())
        for arguments, reason in (([self.folder], "is a folder"),
                                  ([self.folder / "none.csv"], "no such file"),
                                  ([self.file("1,2\n"), "--column", "c"], "no column 'c'")):
            code, _, err = run("report", *arguments)
            self.assertEqual((code, err.count("\n")), (2, 1))
            self.assertIn(reason, err)
        for rate in ("0", "-1", "nan", "inf", "x"):
            with contextlib.redirect_stderr(io.StringIO()), self.assertRaises(SystemExit):
                command.arguments(["report", "a.csv", f"--rate={rate}"])


class Report(InFolder):
    def test_of_the_example(self):
        page = self.folder / "new" / "report.html"
        code, out, err = run("report", ECG, "--output", page.parent)
        self.assertEqual((code, err), (0, ""))
        x = np.loadtxt(ECG, skiprows=2)
        d = x - x.mean()
        expected = {"Mean": x.mean(), "Root mean square": np.sqrt(np.mean(x * x)),
                    "Median": np.median(x), "Central moment of order 2": np.mean(d**2),
                    "Central moment of order 3": np.mean(d**3),
                    "Central moment of order 4": np.mean(d**4),
                    "Skewness": np.mean(d**3) / d.std()**3, "Kurtosis": np.mean(d**4) / d.std()**4}
        for label, value in expected.items():
            shown = re.search(rf"^  {label} +(\S+)", out, re.MULTILINE)
            self.assertIsNotNone(shown, label)
            self.assertAlmostEqual(float(shown.group(1)), value, delta=1e-5 * abs(value))
        shown = re.search(r"Power under the curve +(\S+)", out)
        self.assertAlmostEqual(float(shown.group(1)), np.mean(d**2), delta=0.1 * np.mean(d**2))
        self.assertIn("30 s at 360 samples per second", out)
        text = page.read_text("utf-8")
        self.assertIn("MIT-BIH", text)
        figures = re.findall(r"<svg.*?</svg>", text, re.DOTALL)
        self.assertEqual(len(figures), 6)
        for figure in figures:
            xml.etree.ElementTree.fromstring(figure)

    def test_shows_what_a_file_says_as_text(self):
        path = self.file("# <script>note</script>\n<b>force</b>\n1\n2\n", "a & b.csv")
        self.assertEqual(run("report", path, "--output", self.folder)[0], 0)
        text = (self.folder / "report.html").read_text("utf-8")
        self.assertNotRegex(text, "<script>|<b>force")
        self.assertIn("<h1>a &amp; b.csv</h1>", text)
        self.assertIn("&lt;script&gt;note", text)

    def test_of_data_without_spread_and_of_one_sample(self):
        for text in ("7\n", "7\n7\n7\n", "1e300\n-1e300\n", "0\n", "1e100\n" + 20 * "-2e99\n"):
            with self.subTest(text=text):
                code, out, err = run("report", self.file(text), "--output", self.folder / "out")
                self.assertEqual((code, err), (0, ""))
                self.assertIn("the sampling rate is not known", out)


class Spectra(unittest.TestCase):
    def test_a_sinusoid_has_its_amplitude(self):
        for n in (100, 101):
            x = 3 + 0.5 * np.cos(2 * np.pi * 7 * np.arange(n) / n + 0.3)
            if n % 2 == 0:
                x += 0.25 * np.cos(np.pi * np.arange(n))
            frequencies, amplitudes = report.amplitude_spectrum(
                recording.Recording("", x, None, "", "", "", []))
            expected = np.zeros(n // 2 + 1)
            expected[[0, 7]] = 3, 0.5
            if n % 2 == 0:
                expected[n // 2] = 0.25  # no second side to add
            np.testing.assert_allclose(amplitudes, expected, atol=1e-13)
            self.assertAlmostEqual(frequencies[7], 7 / n)

    def test_the_strongest_parts_are_apart(self):
        values = np.array([5, 9, 8, 0, 7, 1.0])
        found = report.strongest(np.arange(6) / 10, values, 3, 0.15)
        self.assertEqual([int(i) for i in found], [1, 4])
        self.assertEqual(report.strongest(np.arange(6) / 10, 0 * values, 3, 0.15), [])

    def test_the_averaged_spectrum_is_a_density(self):
        x = np.random.default_rng(4).normal(size=1000)
        for length in (64, 50):
            frequencies, density, segments = report.averaged_spectrum(x, length)
            window = 0.5 - 0.5 * np.cos(2 * np.pi * np.arange(length) / length)
            starts = range(0, 1000 - length + 1, length // 2)
            parts = [np.abs(np.fft.rfft(window * x[i:i + length]))**2 for i in starts]
            expected = np.mean(parts, axis=0) / np.sum(window**2)
            expected[1:-1] *= 2
            np.testing.assert_allclose(density, expected, rtol=1e-9)
            self.assertEqual(segments, len(parts))


class Catalogue(unittest.TestCase):
    def test_list_and_show(self):
        code, out, _ = run("list", "m*_head")
        self.assertEqual(code, 0)
        names = re.findall(r"^  (\w+)", out, re.MULTILINE)
        self.assertLessEqual({"Mean_head", "MSE_head", "Moment_head", "Median_head"}, set(names))
        self.assertTrue(all(re.fullmatch(r"[Mm]\w*_head", name) for name in names), names)
        code, out, _ = run("show", "Moment_head")
        self.assertEqual(code, 0)
        for part in ("moment = qx.Moment_head(x, order)", "-20021  ErrOrderNotPositive", "qx/basic_statistics.h"):
            self.assertIn(part, out)
        # What a twin takes over from others comes with it, and so does the header's introduction.
        code, out, _ = run("show", "InvCxOXFFTH")
        for part in ("As InvCxOXFFTH80, of", "InvCxOXFFTH80: The inverse transform x[j] = 1/n sum",
                     "-20003  ErrEmptyInput", "Fourier transforms of any length"):
            self.assertIn(part, out)
        for arguments in (["show", "Moment"], ["list", "no-such"]):
            code, _, err = run(*arguments)
            self.assertEqual((code, err.count("\n")), (2, 1))


if __name__ == "__main__":
    unittest.main()
