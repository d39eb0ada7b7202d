"""Filters of the workbench: the command design, and the section that cleans a recording."""

import json
import os
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import design, design_page, recording, report, sections_cleaning  # noqa: E402, F401


def gain(filter_, frequency, rate):
    return abs(filter_.response(np.array([frequency / rate]))[0])


class Filters(unittest.TestCase):
    def test_iir_filters_of_all_families_and_types(self):
        for family in design.FAMILIES:
            for kind, edges, passed, stopped in (
                    ("lowpass", [30], 5, 170), ("highpass", [30], 150, 1),
                    ("bandpass", [30, 60], 43, 170), ("bandstop", [30, 60], 170, 43)):
                for form in (design.SECOND_ORDER, design.FOURTH_ORDER):
                    *_, made = design.iir(family, kind, edges, 360, 5, form=form)
                    self.assertTrue(made.is_stable() and not made.is_fir())
                    self.assertLess(abs(gain(made, passed, 360) - 1), 0.2, (family, kind))
                    self.assertLess(gain(made, stopped, 360), 0.01, (family, kind))

    def test_fir_filters(self):
        for made in (design.windowed("highpass", [30], 360, 101, "hamming"),
                     design.equiripple("highpass", [20, 40], 360, 101, 10),
                     design.narrow("highpass", [28, 40], 360)[1]):
            self.assertTrue(made.is_fir())
            self.assertLess(abs(gain(made, 100, 360) - 1), 0.13)
            self.assertLess(gain(made, 5, 360), 0.003)
        self.assertIn("of 1 and", design.equiripple("bandstop", [10, 20, 30, 40], 100, 61).note)
        staged, made = design.narrow("bandpass", [990, 1000, 1010, 1020], 8000)
        self.assertGreater(staged["M"], 1)
        self.assertLess(abs(gain(made, 1005, 8000) - 1), 0.13)

    def test_group_delay_is_the_slope_of_the_phase(self):
        at, step = np.linspace(0.02, 0.45, 50), 1e-6
        for made in (design.iir("elliptic", "bandpass", [0.1, 0.2], 1.0, 4)[2],
                     design.windowed("lowpass", [0.1], 1.0, 21)):
            turned = made.response(at + step) / made.response(at - step)
            slope = -np.angle(turned) / (4 * np.pi * step)
            np.testing.assert_allclose(made.group_delay(at), slope, rtol=1e-5, atol=1e-4)
        # A comb's gain is 0 at one quarter, and no delay is told there.
        comb = design.fir([1.0, 0, 1.0], "")
        self.assertTrue(np.isnan(comb.group_delay(np.array([0.25]))[0]))
        self.assertEqual(comb.group_delay(np.array([0.1]))[0], 1.0)

    def test_edges_that_do_not_suit_the_type(self):
        for call in (lambda: design.iir("bessel", "bandpass", [1], 9, 2),
                     lambda: design.equiripple("lowpass", [1], 9, 21),
                     lambda: design.narrow("bandstop", [1, 2], 9)):
            with self.assertRaisesRegex(ValueError, "edge"):
                call()

    def test_half_power_lies_between_the_points(self):
        frequencies = np.linspace(0, 0.5, 101)
        *_, made = design.iir("butterworth", "bandpass", [0.123, 0.234], 1.0, 3)
        found = design_page.half_power(frequencies, made.response(frequencies))
        np.testing.assert_allclose(found, [0.123, 0.234], atol=3e-4)


class Command(unittest.TestCase):
    def run_in(self, folder, *arguments):
        return subprocess.run([sys.executable, "-m", "qx", "design", *arguments, "--output", folder],
                              text=True, capture_output=True,
                              env={**os.environ, "PYTHONPATH": str(PYTHON)})

    def test_writes_page_and_coefficients(self):
        with tempfile.TemporaryDirectory() as folder:
            done = self.run_in(folder, "chebyshev", "lowpass", "40", "--rate", "360", "--ripple", "0.5")
            self.assertEqual(done.returncode, 0, done.stderr)
            self.assertIn("Group delay of what passes", done.stdout)
            self.assertEqual(Path(folder, "design.html").read_text("utf-8").count("<figure>"), 3)
            numbers = json.loads(Path(folder, "design.json").read_text("utf-8"))
            self.assertEqual((numbers["export"], len(numbers["a"]), len(numbers["b"])),
                             ("ChebyshevCoefs90", 4, 6))
            done = self.run_in(folder, "narrow", "lowpass", "20", "25", "--rate", "8000")
            self.assertEqual(done.returncode, 0, done.stderr)
            self.assertGreater(json.loads(Path(folder, "design.json").read_text())["M"], 1)

    def test_says_in_one_line_what_cannot_be(self):
        with tempfile.TemporaryDirectory() as folder:
            for arguments, said in ((("bessel", "lowpass", "50", "--rate", "100"),
                                     "not below half the sampling rate"),
                                    (("elliptic", "bandpass", "5", "80", "--rate", "100"),
                                     "the edge 80 Hz is above half the sampling rate, 50 Hz"),
                                    (("elliptic", "bandstop", "52", "48", "--rate", "1000"),
                                     "wrong order: 52 comes before 48"),
                                    (("butterworth", "highpass", "40"), "in cycles per sample"),
                                    (("equiripple", "lowpass", "3", "--rate", "8"), "2 edges")):
                done = self.run_in(folder, *arguments)
                self.assertEqual(done.returncode, 2)
                self.assertIn(said, done.stderr)
                self.assertEqual(done.stderr.count("\n"), 1)


def recorded(values, rate=360.0):
    return recording.Recording("test", np.asarray(values, float), rate, "", "mV", "lead", [])


class Cleaning(unittest.TestCase):
    def setUp(self):
        self.t = np.arange(7200) / 360
        self.pulses = np.exp(-((self.t + 0.4) % 0.8 - 0.4) ** 2 / 2 / 0.02**2)
        self.noise = 0.01 * np.random.default_rng(3).normal(size=7200)

    def test_removes_hum_and_wander_and_keeps_the_rest(self):
        for mains in (50.0, 60.0):
            hum = 0.2 * np.sin(2 * np.pi * (mains + 0.05) * self.t)
            wander = 0.7 * np.sin(2 * np.pi * 0.12 * self.t) + 0.3
            dirty = recorded(self.pulses + self.noise + hum + wander)
            found, amplitude = sections_cleaning.hum_of(dirty)
            self.assertEqual(found, mains)
            self.assertAlmostEqual(amplitude, 0.2, delta=0.03)
            filters = sections_cleaning.filters_for(360.0, found)
            after = sections_cleaning.both_ways(dirty.values, filters, 2160)
            clean = self.pulses + self.noise
            left = (after - clean + clean.mean())[360:-360]
            self.assertLess(np.sqrt(np.mean(left**2)), 0.04)
            section = sections_cleaning.cleaned(dirty)
            before, rest = (float(row.value) for row in section.rows[1:3])
            self.assertLess(rest, 0.05 * before)
            self.assertAlmostEqual(float(section.rows[0].value), 0.7 / 2**0.5, delta=0.03)
            self.assertEqual(len(section.figures), 2)

    def test_takes_no_hum_where_none_stands_out(self):
        self.assertIsNone(sections_cleaning.hum_of(recorded(self.noise)))
        section = sections_cleaning.cleaned(recorded(self.pulses + self.noise))
        self.assertIn("No hum", section.text)
        self.assertEqual(len(section.rows), 2)

    def test_leaves_recordings_alone_that_do_not_suit(self):
        for other in (recorded(self.noise, None), recorded(self.noise, 50.0),
                      recorded(self.noise[:2000]), recorded(np.ones(7200))):
            self.assertIsNone(sections_cleaning.cleaned(other))


if __name__ == "__main__":
    unittest.main()
