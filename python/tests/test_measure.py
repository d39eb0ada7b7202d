"""Peaks, events and pulses: the module, the section of the report, the commands."""

import contextlib
import csv
import io
import os
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
RECORDING = PYTHON.parent / "examples/data/ecg_208_360hz.csv"
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import __main__ as command  # noqa: E402
from qx import measuring, recording, sections_measuring  # noqa: E402


def recorded(values, rate=None):
    return recording.Recording("test", np.asarray(values, float), rate, "", "V", "voltage", [])


def beats(rate, places, height=1.0):
    """Bells of 12 ms on a slow wave."""
    t = np.arange(round(30 * rate)) / rate
    wave = 0.4 * np.sin(0.5 * t)
    return wave + height * sum(np.exp(-((t - place) / 0.012)**2) for place in places)


class Peaks(unittest.TestCase):
    def test_a_stream_in_blocks(self):
        """A record with pointers, and an array passed by its address, from call to call."""
        x = np.sin(0.1 * np.arange(1000))
        state, buffer, places = {}, [], []
        for i, block in enumerate(np.split(x, [100, 107, 600])):
            request = {"data": block, "width": 7, "flags": 1 * (i == 0) + 4 * (i == 3)}
            found, state, buffer = qx.PeakD(request, state, buffer)
            self.assertEqual(buffer.size, 38 if i < 3 else 0)
            places += list(found["locations"])
        np.testing.assert_allclose(places, 10 * np.pi * (0.5 + 2 * np.arange(16)), atol=2e-3)
        self.assertNotIn("fitMatrix", state)

    def test_prominence_is_the_height_above_the_higher_of_both_sides(self):
        x = np.array([3, 0, 2, 1, 5, 4, 6, 2, 4, 4, 4, 1, 2.0])
        maxima = measuring.local_maxima(x)
        np.testing.assert_array_equal(maxima, [2, 4, 6, 9])
        # The peak 2 falls to 0 before 3, and to 1 before 5; the highest, 6, to 0 and to 1.
        np.testing.assert_array_equal(measuring.prominences(x, maxima), [1, 1, 5, 2])
        for x in (np.zeros(9), np.arange(9.0), np.ones(1)):
            self.assertEqual(measuring.prominences(x, measuring.local_maxima(x)).size, 0)

    def test_what_stands_out_is_found_in_signals_of_many_kinds(self):
        rng, t = np.random.default_rng(1), np.arange(10_000) / 1000
        noise, slow = rng.normal(size=10_000), 2 * np.pi * 5 * t

        def bells(places, width, heights=1.0):
            return np.sum(np.broadcast_to(heights, len(places))[:, None]
                          * np.exp(-((t - np.array(places)[:, None]) / width)**2), axis=0)

        often = np.arange(0.5, 10, 0.8)
        for name, x, expected in (
                ("sine", np.sin(slow), 50), ("fast sine", np.sin(1.0 * np.arange(1000)), 159),
                ("in noise", np.sin(slow) + 0.1 * noise, 50), ("in more", np.sin(slow) + 0.2 * noise, 50),
                ("in steps", np.round(10 * np.sin(slow)), 50), ("chirp", np.sin(2 * np.pi * (t + t**2)), 110),
                ("square", np.sign(np.sin(2 * np.pi * 2 * t)) + 0.01 * noise, 20),
                ("few", bells([1, 3, 4.5, 7, 9], 0.02) + 0.02 * noise, 5),
                ("one", bells([3], 0.02) + 0.02 * noise, 1),
                ("on a drift", bells(often, 0.012) + 2 * np.sin(0.5 * t) + 0.03 * noise, 12),
                ("one disturbed", bells(often, 0.012, [3.5] + 11 * [1.0]) + 0.03 * noise, 12)):
            with self.subTest(name):
                self.assertEqual(len(measuring.peaks(x).places), expected)
                self.assertEqual(len(measuring.peaks(-x, valleys=True).places), expected)
        found = measuring.peaks(np.sin(slow) + 2.0 * (t > 5), prominence=1.0, threshold=2.0)
        np.testing.assert_allclose(found.places, 5050 + 200 * np.arange(25), atol=1e-6)
        np.testing.assert_allclose(found.values, 3, rtol=1e-6)
        np.testing.assert_allclose(found.curvatures, -(2 * np.pi * 5 / 1000)**2, rtol=1e-3)

    def test_threshold_and_polarity(self):
        x = np.tile([0, 0, 0, 0, 0, 0, 1, 3, 1, 0, 0, 0, 0, -2, 0], 20)
        for valleys in (False, True):
            found = measuring.peaks(x, width=3, valleys=valleys)
            np.testing.assert_allclose(found.places, np.arange(20) * 15 + (13 if valleys else 7))


class Events(unittest.TestCase):
    def test_are_found_at_any_rate_and_polarity(self):
        places = 0.5 + np.cumsum(np.random.default_rng(1).uniform(0.5, 1.2, 30))
        places = places[places < 29.5]
        for rate in (200.0, 360.0, 8000.0):
            for height in (1.0, -1.0):
                found = measuring.events(beats(rate, places, height), rate) / rate
                np.testing.assert_allclose(found, places, atol=0.02)

    def test_nothing_repeats(self):
        noise = np.random.default_rng(5).normal(size=20000)
        for values in (np.zeros(5000), np.zeros(10), np.arange(3000.0), np.r_[np.zeros(2000), 1.0],
                       noise, np.cumsum(noise), np.sin(0.05 * np.arange(9000))):
            self.assertEqual(len(measuring.events(values, None)), 0)
            self.assertIsNone(sections_measuring.events(recorded(values)))

    def test_of_two_near_ones_the_stronger_stays(self):
        kept = measuring.separated(np.array([1.0, 2.0, 5.0, 6.5]), np.array([1.0, 3.0, 2.0, 1.0]), 1.5)
        np.testing.assert_array_equal(kept, [2.0, 5.0, 6.5])

    def test_section_of_the_recording(self):
        section = sections_measuring.events(recording.read(RECORDING))
        rows = {row.label: row.value for row in section.rows}
        # 58 beats, counted in the plot; one burst of noise at 19.9 s stands in for its neighbour.
        self.assertEqual(rows["Events"], "58")
        self.assertAlmostEqual(float(rows["Rate, by the median interval"]), 116.8, delta=1)
        self.assertTrue(0.01 < float(rows["Width at half height"]) < 0.05)
        self.assertEqual(len(section.figures), 2)


class Pulses(unittest.TestCase):
    def test_levels_are_means_of_the_states_and_no_centres_of_bins(self):
        rng = np.random.default_rng(1)
        gate = np.where(np.arange(1000) % 500 < 250, -0.3711, 1.2347)
        np.testing.assert_allclose(measuring.levels(gate), [(1.2347, 0), (-0.3711, 0)], rtol=1e-15, atol=1e-15)
        found = np.array([measuring.levels(gate + 0.02 * rng.normal(size=1000)) for _ in range(100)])
        np.testing.assert_allclose(found[:, :, 0].mean(0), [1.2347, -0.3711], atol=5e-4)
        np.testing.assert_allclose(found[:, :, 1].mean(0), found[:, :, 0].std(0), rtol=0.5)
        noisy = gate + 0.02 * rng.normal(size=1000)
        one = measuring.pulse(np.r_[np.full(50, -0.3711), noisy[250:], np.full(50, -0.3711)])
        self.assertAlmostEqual(one.high, 1.2347, delta=5 * one.high_error)

    def test_trapezoids(self):
        shape = np.r_[np.zeros(30), np.linspace(0, 1, 11), np.ones(40), np.linspace(1, 0, 6), np.zeros(13)]
        x = np.tile(shape, 5) * 2 + 1
        for direction, width in ((measuring.RISING, 48), (measuring.FALLING, 52)):
            found = measuring.pulses(x, direction)
            self.assertEqual(len(found), 5 if direction == measuring.RISING else 4)
            for one in found:
                self.assertAlmostEqual(one.width, width - 0.5, delta=1)
                edges = [one.first_duration, one.second_duration]
                np.testing.assert_allclose(sorted(edges), [4, 8], rtol=0.05)
                self.assertLess(one.start, one.end)
        self.assertEqual(measuring.pulses(np.zeros(100)), [])


class Commands(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.table = os.path.join(folder.name, "out.csv")

    def run_command(self, *arguments):
        with contextlib.redirect_stdout(io.StringIO()) as out, contextlib.redirect_stderr(io.StringIO()) as err:
            try:
                code = command.main([*map(str, arguments)])
            except SystemExit as refused:  # for wrong arguments
                code = refused.code
        return subprocess.CompletedProcess(arguments, code, out.getvalue(), err.getvalue())

    def written(self):
        with open(self.table, encoding="utf-8") as file:
            head, *rows = csv.reader(file)
        return head, np.array(rows, float)

    def test_peaks(self):
        ran = self.run_command("peaks", RECORDING, "--events", "--csv", self.table)
        self.assertEqual(ran.stderr, "")
        self.assertIn("58 events", ran.stdout)
        head, rows = self.written()
        self.assertEqual((head, rows.shape), (["time (s)", "mV"], (58, 2)))
        # The 58 beats, and a burst of noise as high as they are.
        self.assertIn(": 59 peaks with a prominence of at least", self.run_command("peaks", RECORDING).stdout)
        ran = self.run_command("peaks", RECORDING, "--threshold", "1.2", "--width", "9", "--csv", self.table,
                               "--force")
        head, rows = self.written()
        self.assertGreater(rows[:, 1].min(), 1.2)
        self.assertGreater(len(rows), 20)
        self.assertLess(rows[:, 2].max(), 0)

    def test_pulse(self):
        ran = self.run_command("pulse", RECORDING, "--events", "--number", "2", "--csv", self.table)
        self.assertEqual(ran.stderr, "")
        self.assertIn("pulse 2 of", ran.stdout)
        head, rows = self.written()
        self.assertTrue((np.diff(rows[:, 1]) > 0).all())
        self.assertTrue((rows[:, 2] > rows[:, 1]).all())

    def test_every_failure_is_one_line(self):
        for arguments, reason in ((("pulse", RECORDING, "--number", 5000), "no pulse 5000"),
                                  (("peaks", "nowhere.csv"), "no such file"),
                                  (("peaks", RECORDING, "--width", 2), "below 3")):
            ran = self.run_command(*arguments)
            self.assertEqual(ran.returncode, 2)
            self.assertIn(reason, ran.stderr.splitlines()[-1])


if __name__ == "__main__":
    unittest.main()
