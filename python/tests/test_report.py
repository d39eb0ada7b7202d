"""Recordings, the report and the command line."""

import contextlib
import html
import io
import json
import re
import struct
import sys
import tempfile
import unittest
from pathlib import Path
from unittest import mock
from xml.etree import ElementTree

import numpy as np
import soundfile

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import __main__ as command  # noqa: E402
from qx import audio, isolation, measuring, pages, recording, report, sections, sections_measuring  # noqa: E402
from qx import sections_recording, sections_spectra, tables, wholes  # noqa: E402

HERE = mock.patch.object(isolation, "AVAILABLE", False)  # files are read in this process, with its patches
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

    def drawn(self, text):
        """The data of the page's plots, each of which has an element in the page."""
        plots = json.loads(re.search(r'<script type="application/json" id="plots">(.*?)</script>', text, re.DOTALL)[1])
        self.assertEqual(re.findall(r'data-plot="(\d+)"', text), [str(i) for i in range(len(plots))])
        return plots

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
    def read(self, text, name="data.csv", **options):
        return recording.read(self.file(text, name), **options)

    def holds(self, text, values, rate=None, said="", name="data.csv", **options):
        """Checks the values that are read, and a part of the remarks on them."""
        with self.subTest(text=text[:60], **options):
            read = self.read(text, name, **options)
            np.testing.assert_allclose(read.values[:len(values)], values)
            self.assertEqual(read.rate, rate)
            self.assertIn(said, read.choice)

    def test_cells_decimals_and_headers(self):
        for text, values, said in (
                ("1\n2.5\n-3e-1\n", [1, 2.5, -0.3], "column 1 of 1; the sampling rate is not known"),
                ("\ufeffvalue\r\n1\r\n\r\n2\r\n", [1, 2], "column 1 of 1, value"),
                ("u;v\n1,5;2,5\n2;3\n", [1.5, 2], "u, with decimal commas"),
                ("u\tv\n1,5\t2,5\n", [1.5], "others: v"),
                ("u|v\n1|2\n", [1], "others: v"),
                ("  1.5   2.5\n 3.5   2.5\n", [1.5, 3.5], "others: column 2"),
                ("u\n1,5\n2,5\n", [1.5, 2.5], "with decimal commas"),
                ("0,05\n0,5\n", [0.05, 0.5], "with decimal commas"),
                ("-1,5\n-0,5\n", [-1.5, -0.5], "with decimal commas"),
                ("1,5\n2\n", [1.5, 2], "with decimal commas"),
                ("u,v\n1,5\n2,5\n", [1, 2], "others: v"),
                ("4,-5\n6,5\n", [4, 6], "others: column 2"),
                ("7,5\n8,9\n9,5\n", [5, 9, 5], "others: column 1 (counts the rows)"),
                ('"u, N","v"\n"1,5","2,5"\n"3,5","4"\n', [1.5, 3.5], "column 1 of 2, u, N"),
                ('"1.5"\n"2.5"\n', [1.5, 2.5], "column 1 of 1"),
                ("1,2,3.5,4\n", [1, 2, 3.5, 4], "4 values on one line"),
                ("1 2 3\n", [1, 2, 3], "3 values on one line"),
                ("u,\n1,\n2,\n", [1, 2], "u"),
                ("label;u\non;1\noff;2\n", [1, 2], "column 2 of 2, u; "),
                ("Model,ABC\nSerial,12\nforce,load\n1,2\n2,3\n", [1, 2], "force")):
            self.holds(text, values, said=said)
        self.holds("1,5\n2,5\n", [1.5, 2.5], decimal="comma")
        self.holds("1,5\n2,5\n", [1, 2], decimal="point")
        for encoding in ("utf-16", "latin-1"):
            read = self.read("# 5 Hz, °C\n1\n2\n".encode(encoding))
            self.assertEqual((read.values.tolist(), read.notes), ([1, 2], ["5 Hz, °C"]))
        two = self.file("a [N],b\n1,2\n3,4\n")
        for column in ("b", "2"):
            self.assertEqual(recording.read(two, column=column).values.tolist(), [2, 4])
        self.assertEqual(recording.read(two, column="a").unit, "N")

    def test_time(self):
        for header, rate in (("Time_s", 0.5), ("time_ms", 500), ("t / ms", 500), ("time [min]", 1 / 120),
                             ("timestamp", 0.5), ("Zeit (us)", 500000), ("ms", 500), ("seconds", 0.5),
                             ("elapsed time (s)", 0.5)):
            self.holds(f"{header},u\n0,4\n2,5\n4,7\n", [4, 5, 7], rate, f"time from column 1, {header}; ")
        for header in ("T (°C)", "temp", "s1", "total"):  # which are not time
            self.holds(f"{header},u\n0,4\n2,5\n4,7\n", [0, 2, 4], None, "others: u")
        for text, values, rate, said in (
                ("Time (ticks),u\n0,4\n2,5\n4,7\n", [4, 5, 7], None, "unit of the times, ticks, is not"),
                ("time,a_x,a_y\nms,g,g\n0,1,2\n2,2,3\n", [1, 2], 500, "a_x (g); time from column 1, time (ms)"),
                (",t (ms),a (g)\n0,0,1\n1,2,2\n2,4,4\n", [1, 2, 4], 500, "column 1 (counts the rows)"),
                ("sample;u\n1;4\n2;5\n3;7\n", [4, 5, 7], None, "others: sample (counts"),
                ("0.0,1.5\n0.1,2.5\n0.2,3\n", [1.5, 2.5, 3], 10, "has no name and is taken as seconds"),
                ("time,u\n2024-02-28T23:59:59.990Z,1\n2024-02-29T00:00:00.000Z,2\n", [1, 2], 100, ""),
                ("date;clock;u\n2024-01-01;12:00:00,0;1\n2024-01-01;12:00:00,5;2\n", [1, 2], 2,
                 "time from column 2, clock"),
                ("timestamp,u\n1700000000000,1\n1700000000010,2\n", [1, 2], 100, "milliseconds since"),
                ("t,u\n0,4\n1,5\n3,6\n", [4, 5, 6], None, "uneven, steps from 1 to 2 s"),
                ("t,u\n0,4\n0,5\n", [4, 5], None, "do not rise at sample 2"),
                ("t,u\n" + "".join(f"{i / 360:.3f},{i}\n" for i in range(721)), [0, 1], 360,
                 "rounded to 0.001 s"),
                ("t,u\n" + "".join(f"{i / 100:.1f},{i}\n" for i in range(1000)), [0, 1], 100.1,
                 "rounded to 0.1 s"),
                ("t,u\n" + "".join(f"{i + 7 * (i > 30) + 5 * (i > 60)},{i}\n" for i in range(99)), [0, 1],
                 1, "2 gaps are closed, the longest of 8 s after sample 31")):
            if rate == 100.1:  # as exact as the last time allows
                self.assertAlmostEqual(self.read(text).rate, 100, delta=0.2)
                continue
            self.holds(text, values, rate, said)

    def test_a_rate_is_one_that_is_called_so(self):
        for text, rate in (("# sampling rate: 2.5k\n1\n", 2500), ("# fs = 44.1 kHz\n1\n", 44100),
                           ("# low-pass, 100 Hz\n# Sample rate (Hz): 2000\n1\n2\n", 2000),
                           ("# 50 samples per second\n1\n", 50), ("Sample Rate,1000\nu,v\n1,2\n3,4\n", 1000),
                           ("# low-pass at 100 Hz\n1\n", None), ("force at 50 Hz [N]\n1\n2\n", None),
                           ("# sampling rate 10 Hz\nt,u\n0,1\n0.5,2\n", 2)):
            with self.subTest(text=text):
                self.assertEqual(self.read(text).rate, rate)
        self.holds("1\n", [1], None, "name has 44.1khz, which may be a rate", name="tone_44.1khz.csv")
        self.assertEqual(self.read("# fs = 8 Hz\n1\n", rate=5.0).rate, 5)

    def test_missing_values(self):
        text = "t,u\n0,1\n1,\n2,NA\n3,4\n"
        self.holds(text, [1, 2, 3, 4], 1, "2 missing values interpolated", missing="interpolate")
        self.holds(text, [1, 4], 1 / 3, "2 missing values left out", missing="skip")
        for missing in ("interpolate", "skip"):
            self.assertNotIn("first", self.read(text, missing=missing).choice)
        with self.assertRaisesRegex(recording.InputError, ":3: column 2, u: '' where a value is needed"):
            self.read(text)
        self.assertRaisesRegex(recording.InputError, "all values are missing", self.read, "u\n1\n-\n",
                               missing="skip", start=1)

    def test_long_tables_and_recordings_are_read_in_parts(self):
        lines = [f"{i};{i % 7}" for i in range(1000)]
        lines[700] = "# a comment"
        text = "t;u\n" + "\n".join(lines)
        with HERE, mock.patch.object(tables, "LINES_AT_ONCE", 97):
            read = self.read(text)
            self.assertEqual(read.values.tolist(), [i % 7 for i in range(1000) if i != 700])
            self.assertRaisesRegex(recording.InputError, ":902: column 2, u: 'x' is not a number", self.read,
                                   text.replace("\n900;4", "\n900;x"))
            self.assertRaisesRegex(recording.InputError, ":902: 3 cells where the other lines have 2",
                                   self.read, text.replace("\n900;4", "\n900;4;5"))
            with mock.patch.object(recording, "MOST_SAMPLES", 200):
                read = self.read(text, start=150)
                self.assertEqual(read.values.tolist(), [i % 7 for i in range(150, 350)])
                self.assertIn("samples 151 to 350 of 999", read.choice)
                rest = np.array([i % 7 for i in range(1000) if i != 700])[150:]
                self.assertAlmostEqual(read.whole.moments.mean, rest.mean(), delta=1e-12)
                self.assertAlmostEqual(read.whole.moments.rms, np.sqrt(np.mean(rest**2)), delta=1e-12)
                samples = [struct.pack("<h", v) for v in range(500)]
                read = self.read(wav(samples), "a.wav", start=250)
                self.assertEqual((32768 * read.values).tolist(), [*range(250, 450)])
                self.assertIn("samples 251 to 450 of 500", read.choice)
                with mock.patch.object(audio, "FRAMES_AT_ONCE", 90):
                    section = sections_recording.overview(self.read(wav(samples), "a.wav"))
                self.assertEqual((32768 * section.figures[0].curves[0].values).tolist(), [*range(500)])
                self.assertTrue(section.text.startswith("500 samples"))
            self.assertIn("without the first 150 samples", self.read(text, start=150).choice)

    def test_a_file_of_any_length_has_the_figures_of_all_its_samples(self):
        rng = np.random.default_rng(3)
        mixed = np.r_[rng.normal(size=3000), 8 + rng.normal(size=2000), np.sin(np.arange(4000))]
        for name, x in (("mixed", mixed), ("coarse", np.round(2 * mixed)), ("one value", np.full(9001, 7.0)),
                        ("far away", 1e9 + mixed[:8999])):
            for at_once in (20, 1 << 20):
                with self.subTest(name, at_once=at_once), mock.patch.object(wholes, "SELECTED", at_once):
                    whole = wholes.Whole(1000)
                    for part in np.split(x, [700, 701, 5000]):
                        whole.add(part)
                    whole.finish()
                    self.assertEqual(whole.median, np.median(x))
                    self.assertEqual(whole.histogram(12)[0].tolist(), qx.stats.histogram(x, 12).counts.tolist())
                    exact = x.astype(np.longdouble)
                    np.testing.assert_allclose(
                        [whole.moments.mean, whole.moments.rms, *map(whole.moments.moment, (2, 3, 4))],
                        [exact.mean(), np.sqrt(np.mean(exact**2)), *(np.mean((exact - exact.mean())**order)
                                                                     for order in (2, 3, 4))], rtol=1e-11)
                    found, expected = whole.spectrum(10.0, 256), qx.spectra.welch(x, 10.0, nperseg=256)
                    np.testing.assert_allclose(found.values, expected.values, rtol=1e-10, atol=1e-300)
                    self.assertEqual((found.segments, found.resolution), (expected.segments, expected.resolution))
        x = mixed
        outline = wholes.Envelope(64)
        for part in np.split(x, [3, 3, 4000, 8999]):
            outline.add(part)
        lows, highs = outline.bounds()
        self.assertLessEqual(len(lows), 65)
        starts = np.arange(0, len(x), outline.samples)
        np.testing.assert_array_equal(lows, np.minimum.reduceat(x, starts))
        np.testing.assert_array_equal(highs, np.maximum.reduceat(x, starts))

    def test_missing_values_keep_their_places(self):
        x = np.sin(np.arange(999.0))
        gaps = np.isin(np.arange(999), [0, 1, 300, 700, 701, 702, 997, 998])
        text = "time (s),u\n" + "".join(f"{i / 100},{'' if gone else repr(value)}\n" for i, (value, gone) in enumerate(
            zip(x.tolist(), gaps)))
        filled = np.interp(np.arange(999), np.flatnonzero(~gaps), x[~gaps])
        for kept in (200, 2000):
            for lines in (10, 301, 2000):
                with HERE, mock.patch.object(recording, "MOST_SAMPLES", kept), mock.patch.object(
                        tables, "LINES_AT_ONCE", lines):
                    for missing, values, outline in (("skip", x[~gaps], np.where(gaps, np.nan, x)),
                                                     ("interpolate", filled, filled)):
                        read = self.read(text, missing=missing)
                        np.testing.assert_allclose(read.envelope.bounds()[0], outline, rtol=1e-12)
                        self.assertEqual(read.row_rate or read.rate, 100)
                        if read.whole:
                            np.testing.assert_allclose(read.whole.part(0, 999), values, rtol=1e-12)
                        else:
                            np.testing.assert_allclose(read.values, values, rtol=1e-12)

    def test_a_report_on_a_long_file_is_that_on_all_its_samples(self):
        t = np.arange(30_000) / 1000
        rng = np.random.default_rng(5)
        x = np.where(t < 20, 0.1, 0.4) * np.sin(2 * np.pi * 50.5 * t) + 0.01 * rng.normal(size=len(t))
        soundfile.write(self.folder / "a.wav", x, 1000, "DOUBLE")
        sections_ = [sections_recording.overview, sections_recording.statistics, sections_recording.histogram,
                     sections_spectra.power, sections_spectra.over_time]
        with mock.patch.object(report, "SECTIONS", sections_), mock.patch.object(sections_spectra, "LONGEST", 1024):
            expected = report.sections_of(recording.read(self.folder / "a.wav"))
            with HERE, mock.patch.object(recording, "MOST_SAMPLES", 7000), mock.patch.object(wholes, "BLOCK", 4001):
                read = recording.read(self.folder / "a.wav")
                self.assertEqual((len(read.values), read.whole.count), (7000, 30_000))
                found = report.sections_of(read)
        for one, other in zip(found, expected, strict=True):
            self.assertEqual([(row.label, row.value) for row in one.rows if "Mode" not in row.label],
                             [(row.label, row.value) for row in other.rows if "Mode" not in row.label])
            self.assertEqual(one.text.split(" samples")[0] if one is found[0] else one.title,
                             other.text.split(" samples")[0] if one is found[0] else other.title)
            for plot, alike in zip(one.figures, other.figures):
                self.assertEqual(plot.x_label, alike.x_label)

    def test_events_of_a_long_file_are_those_of_all_its_samples(self):
        t = np.arange(40_000) / 1000
        beats = sum(np.exp(-((t - place) / 0.01) ** 2) for place in np.arange(0.5, 40, 0.8))
        x = beats + 0.01 * np.random.default_rng(5).normal(size=len(t))
        soundfile.write(self.folder / "a.wav", x / 2, 1000, "DOUBLE")
        expected = sections_measuring.events(recording.read(self.folder / "a.wav"))
        with HERE, mock.patch.object(recording, "MOST_SAMPLES", 7000), mock.patch.object(measuring, "BLOCK", 4001):
            read = recording.read(self.folder / "a.wav")
            np.testing.assert_array_equal(sections_measuring.places_of(read)[0], measuring.events(x / 2, 1000))
            found = sections_measuring.events(read)
            self.assertIn("Events of all 40000 samples", found.text)
            count = len(sections_measuring.interval_rows(read, np.arange(3.0)))
            self.assertEqual([(row.label, row.value) for row in found.rows[:count]],
                             [(row.label, row.value) for row in expected.rows[:count]])
            self.assertEqual(found.rows[0].value, "50")
            self.assertLess(max(mark.x for mark in found.figures[0].marks), 7)
            at_the_end = np.array([30_000.0, 31_000, 32_000])
            with mock.patch.object(measuring, "events_of_whole", lambda *_: at_the_end):
                self.assertEqual(sections_measuring.events(read).figures[0].marks, [])
            with mock.patch.object(measuring, "MOST_MEANS", 100):
                self.assertIn("of the samples in memory", sections_measuring.events(read).text)

    def test_all_channels_are_there(self):
        read = self.read("time,a [V],word,b\n0,1,x,5\n1,2,y,\n2,3,z,7\n")
        self.assertEqual([(one.channel, one.unit) for one in read.others], [("b", "")])
        np.testing.assert_array_equal(read.others[0].envelope.bounds()[0], [5, np.nan, 7])
        stereo = wav([struct.pack("<hh", 0, 16384)] * 2, channels=2)
        read = self.read(stereo, "a.wav", column="2")
        self.assertEqual([one.channel for one in read.others], ["channel 1 of 2"])
        lines, page = report.lines(read, found := report.sections_of(read)), report.page(read, found)
        self.assertIn("first of 2 channels", "".join(lines))
        self.assertEqual([plot["y_label"] for plot in self.drawn(page)][:2],
                         ["Channel 2 of 2 (FS)", "Channel 1 of 2 (FS)"])

    def test_audio_files(self):
        for samples, form, bits in (
                ([struct.pack("<h", v) for v in (0, 16384, -32768)], 1, 16),
                ([bytes([v]) for v in (128, 192, 0)], 1, 8),
                ([struct.pack("<i", v)[:3] for v in (0, 1 << 22, -(1 << 23))], 1, 24),
                ([struct.pack("<i", v) for v in (0, 1 << 30, -(1 << 31))], 1, 32),
                ([struct.pack("<f", v) for v in (0, 0.5, -1)], 3, 32),
                ([struct.pack("<d", v) for v in (0, 0.5, -1)], 3, 64)):
            with self.subTest(form=form, bits=bits):
                read = self.read(wav(samples, form, bits), "a.wav")
                self.assertEqual((read.values.tolist(), read.rate), ([0, 0.5, -1], 8000))
        stereo = wav([struct.pack("<hh", 0, 16384)] * 2, channels=2)
        read = self.read(stereo, column="2")  # by its content, regardless of the name
        self.assertEqual(read.values.tolist(), [0.5, 0.5])
        self.assertEqual(read.choice, "channel 2 of 2; 8000 samples per second, from the header of the "
                                      "file; others: channel 1")
        tone = np.sin(np.arange(1000) / 10) / 2
        for name in ("a.flac", "a.aiff", "a.w64"):
            soundfile.write(self.folder / name, tone, 22050, "PCM_24")
            read = recording.read(self.folder / name)
            np.testing.assert_allclose(read.values, tone, atol=2**-23)
            self.assertEqual(read.rate, 22050)

    def test_bad_input_is_one_line_that_says_what_and_where(self):
        nan_wav = wav([struct.pack("<f", v) for v in (0, float("nan"))], 3, 32)
        for content, reason in (
                ("", "is empty"), ("# only\n\n", "holds no numbers"), ("a\nb\n", "holds no numbers"),
                ("1\n2\nnan\n", ":3: column 1: 'nan' where a value"), ("v\n1\n-inf\n", ":3: column 1, v: '-inf'"),
                ("1\n# c\nx2\n", ":3: column 1: 'x2' is not a number"), ("1\n2_0\n", ":2: column 1: '2_0'"),
                ("t,u\n0,1\n1,2\n2\n", ":4: 1 cell where the other lines have 2"),
                ("1,5\n2,5\n", "'2,5' may be one number with a decimal comma or two"),
                ("1.234,5\n1.235,6\n", "may be one number with a decimal comma or two"),
                ("t,u\n12:00:00,1\n12:00:01,2\n13h,3\n", ":4: column 1, t: '13h' is not a time"),
                (b"\x01\x02\0\0", ":1: neither"), (b"1\n2\n\x00\n", ":3: neither"),
                (b"RIFF\0\0\0\0WAVE", "cannot be read as audio"), (wav([]), "no samples"),
                (wav([b"\0\0"], form=85), "cannot be read as audio"),
                (nan_wav, "sample 2"), ("1e308\n-1e308\n", "more than a plot can span")):
            with self.subTest(content=content[:30]):
                path = self.file(content)
                code, _, err = run("report", path, "--output", self.folder / "out")
                self.assertEqual(code, 2)
                self.assertEqual(err.count("\n"), 1, err)
                self.assertIn(str(path), err)
                self.assertIn(reason, err)
                self.assertFalse((self.folder / "out").exists())
        for arguments, reason in (([self.folder / "none.csv"], "no such file"),
                                  ([self.file("a,b\n1,2\n"), "--column", "c"], "no column 'c'")):
            code, _, err = run("report", *arguments)
            self.assertEqual((code, err.count("\n")), (2, 1))
            self.assertIn(reason, err)
        for rate in ("0", "-1", "nan", "inf", "x"):
            with contextlib.redirect_stderr(io.StringIO()), self.assertRaises(SystemExit):
                command.arguments(["report", "a.csv", f"--rate={rate}"])


class Report(InFolder):
    def made(self, values, name="data.csv", unit="V", channel="u"):
        """The lines and the page of a report."""
        page = self.folder / "report.html"
        made = recording.Recording(name, np.asarray(values, float), 100.0, "given", unit, channel, [], "all")
        return report.write(made, page), page.read_text("utf-8")

    def test_labels_have_the_digits_that_tell_them_apart(self):
        wave = np.sin(np.arange(3000) / 9)
        for offset, factor in ((101325, 0.01), (-3e9, 0.1), (5e-9, 1e-12), (0, 1e160)):
            with mock.patch.object(report, "SECTIONS", [sections_recording.histogram, sections_spectra.amplitudes]):
                lines, _ = self.made(offset + factor * wave)
            start = next(i for i, line in enumerate(lines) if "bin centre" in line)
            labels = [line.split()[0] for line in lines[start + 1:start + 13]]
            self.assertEqual(len(set(labels)), 12, labels)
            step = np.diff([float(label) for label in labels])
            np.testing.assert_allclose(step, step.mean(), rtol=0.2)
            strongest = [float(part[1]) for line in lines if (part := re.search(r"Tone at (\S+) ", line))]
            self.assertAlmostEqual(strongest[0], 100 / 9 / (2 * np.pi), delta=1e-6)

    def test_uncertain_values_have_the_digits_that_hold(self):
        for value, error, shown in ((50.4999998, 0.00121, ("50.5000", "0.0012")), (1.5050411, 0.005, ("1.5050", "0.0050")),
                                    (-1234.5, 28, ("-1234", "28")), (2.6e8, 3.2e7, ("2.60e+08", "3.2e+07")),
                                    (0.1, 0, ("0.1", "")), (1 / 3, 1e-18, ("0.333333333333", "1e-18")),
                                    (5, float("inf"), ("5", "out of range"))):
            self.assertEqual(sections.uncertain(value, error), shown)

    def test_figures_beyond_all_numbers_have_a_plain_sentence(self):
        wave = np.sin(np.arange(300) / 9)
        for values in (wave * 1e160, wave * 1e-160, np.sign(wave) * 5e-324, np.full(300, 7.0)):
            with self.subTest(values=values[:2]):
                lines, page = self.made(values)
                self.assertIsNone(re.search(r"\b(inf|nan)\b", "\n".join(lines)))
                self.assertGreaterEqual(len(self.drawn(page)), 2)
            if values.max() > 1e100:
                self.assertTrue(any("are out of range" in line for line in lines))

    def test_names_are_shown_as_they_stand(self):
        name, channel, unit = "a $x_1^{ 温度 <i>.csv", "温度 $y^{ & <b>", "m$/s^{"
        _, page = self.made(np.arange(100.0) % 7, name, unit, channel)
        self.assertIn(f"{channel} ({unit})", [plot["y_label"] for plot in self.drawn(page)])
        self.assertIn(f"<h1>{html.escape(name)}</h1>", page)
        self.assertNotIn("& <b>", page)
        self.assertIn('<meta name="viewport"', page)

    def test_pages_without_dygraphs_have_drawings_and_say_so(self):
        with mock.patch.object(pages, "DYGRAPHS", Path("/nowhere")):
            pages.dygraphs.cache_clear()
            self.addCleanup(pages.dygraphs.cache_clear)
            _, page = self.made(np.sin(np.arange(3000) / 9) + np.arange(3000) % 500, "a $x_1^{ <i>")
        self.assertIn("install Debian&#x27;s package libjs-dygraphs", page)
        self.assertNotIn("<script", page)
        drawings = re.findall(r'<figure class="still">(.*?)</figure>', page, re.DOTALL)
        self.assertGreaterEqual(len(drawings), 5)
        for drawing in drawings:
            self.assertEqual(re.findall(r'<svg class="(\w+)"', drawing), ["wide", "narrow"])
            ElementTree.fromstring(f"<g>{drawing}</g>")

    def test_a_page_of_a_long_recording_with_many_channels_stays_small(self):
        rng = np.random.default_rng(1)
        soundfile.write(self.folder / "a.wav", rng.normal(size=(150_000, 24)) / 9, 48000)
        code, out, err = run("report", self.folder / "a.wav", "--output", self.folder)
        self.assertEqual((code, err), (0, ""))
        page = (self.folder / "report.html").read_bytes()
        self.assertLess(len(page), 5_000_000)
        shown = self.drawn(page.decode())
        self.assertEqual(sum(plot["title"].startswith("channel") for plot in shown), 24)

    def test_a_section_that_cannot_be_leaves_the_others(self):
        def refused(_):
            qx.Mean_head([])

        with mock.patch.object(report, "SECTIONS", [refused, sections_recording.statistics]):
            lines, _ = self.made([1.0, 2.0])
        self.assertTrue(any(line.startswith("Refused: Not possible for this recording") for line in lines))
        self.assertTrue(any("Root mean square" in line for line in lines))

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
        self.assertEqual(len({plot["title"] for plot in self.drawn(text)}), 9)

    def test_shows_what_a_file_says_as_text(self):
        path = self.file("# <script>note</script>\n<b>force</b>\n1\n2\n", "a & b.csv")
        self.assertEqual(run("report", path, "--output", self.folder)[0], 0)
        text = (self.folder / "report.html").read_text("utf-8")
        self.assertNotIn("<script>note", text)
        self.assertNotIn("<b>force", text)
        self.assertIn("<h1>a &amp; b.csv</h1>", text)
        self.assertIn("&lt;script&gt;note", text)

    def test_of_data_without_spread_and_of_one_sample(self):
        for text in ("7\n", "1e300\n-1e300\n", "1e100\n" + 20 * "-2e99\n"):
            with self.subTest(text=text):
                code, out, err = run("report", self.file(text), "--output", self.folder / "out")
                self.assertEqual((code, err), (0, ""))
                self.assertIn("the sampling rate is not known", out)


class Spectra(unittest.TestCase):
    def rows(self, x, rate=1000.0):
        read = recording.Recording("", np.asarray(x, float), rate, "", "V", "u", [])
        return {row.label: row for row in sections_spectra.amplitudes(read).rows}, read

    def test_a_tone_between_two_lines_has_its_amplitude_and_frequency(self):
        t = np.arange(1000) / 1000
        rows, _ = self.rows(3 + np.sin(2 * np.pi * 50.5 * t))
        self.assertAlmostEqual(float(rows["Strongest part at"].value), 50.5, 6)
        tones = [row for label, row in rows.items() if label.startswith("Tone at")]
        self.assertEqual(len(tones), 1)  # and no leakage beside it
        self.assertAlmostEqual(float(tones[0].value), 1.0, 6)
        noise = np.random.default_rng(2).normal(size=1000)
        rows, read = self.rows(np.sin(2 * np.pi * 50.5 * t) + 0.1 * noise)
        strongest = rows["Strongest part at"]
        self.assertLess(abs(float(strongest.value) - 50.5), 4 * float(strongest.error))
        self.assertLess(float(strongest.error), 0.005)
        plot = sections_spectra.amplitudes(read).figures[0]
        self.assertAlmostEqual(plot.marks[0].y, 0, delta=0.1)  # dB
        self.assertIn("resolution", plot.x_label)

    def test_noise_has_a_strongest_part_with_the_resolution(self):
        rows, _ = self.rows(np.random.default_rng(1).normal(size=2000))
        self.assertFalse([label for label in rows if label.startswith("Tone")])
        self.assertAlmostEqual(float(rows["Resolution"].value), 2 * float(rows["Strongest part at"].error), delta=0.02)
        self.assertEqual([int(i) for i in sections_spectra.local_maxima(np.array([5, 9, 8, 0, 7, 1.0]))], [1, 4])

    def test_the_averaged_spectrum_has_long_segments_and_the_power(self):
        x = np.random.default_rng(4).normal(size=1000)
        section = sections_spectra.power(recording.Recording("", x, 100.0, "", "V", "u", []))
        rows = {row.label: float(row.value) for row in section.rows}
        self.assertAlmostEqual(rows["Power under the curve"], x.var(), delta=0.1 * x.var())
        self.assertAlmostEqual(rows["Resolution of the averaged spectrum"], 1.5 * 100 / 128, 3)

    def test_over_time_a_sweep_rises(self):
        x = np.sin(2 * np.pi * np.cumsum(np.linspace(0.01, 0.4, 40_000)))
        image = sections_spectra.over_time(recording.Recording("", x, None, "", "", "u", [])).figures[0].image
        peaks = image.values.argmax(0) / (len(image.values) - 1) / 2
        np.testing.assert_allclose(peaks, np.linspace(0.01, 0.4, len(peaks)), atol=0.01)


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
        # The text that a twin shares with others is included, and so is the header's introduction.
        code, out, _ = run("show", "InvCxOXFFTH")
        for part in ("As InvCxOXFFTH80, of", "InvCxOXFFTH80: The inverse transform x[j] = 1/n sum",
                     "-20003  ErrEmptyInput", "Fourier transforms of any length"):
            self.assertIn(part, out)
        for arguments in (["show", "Moment"], ["list", "no-such"]):
            code, _, err = run(*arguments)
            self.assertEqual((code, err.count("\n")), (2, 1))


if __name__ == "__main__":
    unittest.main()
