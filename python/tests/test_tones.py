"""Tones, harmonics and triggers: the topic, the command, streams."""

import contextlib
import csv
import io
import os
import sys
import tempfile
import unittest
from pathlib import Path
from unittest import mock

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent))
import qx  # noqa: E402
from qx import __main__ as command, long_tones, tones, wholes  # noqa: E402

RATE = 1000.0
T = np.arange(4000) / RATE
SIGNAL = 2 * np.cos(2 * np.pi * 50 * T + 1) + 0.02 * np.cos(2 * np.pi * 150 * T) + 0.1 * np.cos(2 * np.pi * 83.3 * T)


class Topic(unittest.TestCase):
    def test_the_largest_come_first(self):
        found = tones.tones(SIGNAL, RATE, 3)
        np.testing.assert_allclose(found.frequencies, [50, 83.3, 150], rtol=1e-9)
        np.testing.assert_allclose(found.amplitudes, [2, 0.1, 0.02], rtol=1e-9)
        self.assertTrue(found.significant.all())

    def test_of_a_long_recording_the_whole_resolves_what_a_part_does_not(self):
        rng, n = np.random.default_rng(7), 100_000
        t, x = np.arange(n), 1e-3 * rng.normal(size=n) + 3
        expected = np.array([(0.0501, 1.0, 0.3), (0.0501 + 3.3 / n, 0.5, 1.0), (0.2, 0.05, -2.0), (0.4999, 0.3, 2.0),
                             (32.5 / n, 0.2, -1.0)])
        for frequency, amplitude, phase in expected:
            x += amplitude * np.cos(2 * np.pi * frequency * t + phase)
        with mock.patch.multiple(long_tones, SEGMENT=4096, BLOCK=4096, MOST_KEPT=12_000, NARROWEST=64):
            whole = wholes.Whole(10)
            for part in np.array_split(x, 7):
                whole.add(part)
            found = long_tones.measured(whole, 10.0, 5)
            residual = long_tones.residual_rms(whole, found, 10.0)
            _, amplitudes, _ = long_tones.spectrum(whole, 10.0)
        for frequency, amplitude, phase in expected:
            i = np.argmin(np.abs(found.frequencies - 10 * frequency))
            self.assertLess(abs(found.frequencies[i] - 10 * frequency), 5 * found.frequency_errors[i])
            self.assertLess(abs(found.amplitudes[i] - amplitude), 5 * found.amplitude_errors[i])
            self.assertAlmostEqual(found.phases[i], phase, delta=0.01)
        self.assertLess(found.frequency_errors.max() * n / 10, 0.01)  # of the resolution
        self.assertAlmostEqual(residual, 1e-3, delta=2e-5)
        self.assertAlmostEqual(amplitudes[round(0.2 * 4096)], 0.05, delta=0.005)

    def test_harmonics_of_a_long_recording_are_means_of_powers(self):
        n = 40_000
        t = np.arange(n) / RATE
        x = np.cos(2 * np.pi * 50.05 * t) + 0.01 * np.cos(2 * np.pi * 100.1 * t) + np.random.default_rng(
            1).normal(size=n) * np.where(t < 20, 1e-3, 3e-3)
        with mock.patch.object(long_tones, "SEGMENT", 4000):
            whole = wholes.Whole(10)
            whole.add(x)
            found = long_tones.harmonics(whole, RATE, 50.05, 3, 2.0)
        expected = qx.measure.harmonics(x, RATE, 50.05, 3, 2.0)
        for name, near in (("thd", 1e-5), ("sinad", 0.1), ("snr", 0.1), ("enob", 0.02)):
            self.assertAlmostEqual(getattr(found, name), getattr(expected, name), delta=near)
        self.assertAlmostEqual(found.snr, 10 * np.log10(0.5 / 5e-6), delta=0.2)
        self.assertAlmostEqual(found.noise_floor, expected.noise_floor + 10, delta=0.2)  # bins ten times as wide
        np.testing.assert_allclose(found.amplitudes[:2], expected.amplitudes[:2], atol=1e-4)

    def test_uncertainties_are_the_scatter_of_the_estimates(self):
        rng, n = np.random.default_rng(2), 1000
        wave = np.sin(2 * np.pi * 50.5 * T[:n])
        for colour in (1, 5):  # white, and with the least noise at the tone
            found = []
            for _ in range(150):
                noise = rng.normal(size=n + colour - 1)
                noise = noise if colour == 1 else np.convolve(noise, [1, 0, 0, 0, -1], "valid")
                one = tones.tones(wave + 0.3 * noise, RATE, 1)
                found.append((one.frequencies[0], one.amplitudes[0], one.frequency_errors[0], one.amplitude_errors[0]))
            found = np.array(found)
            np.testing.assert_allclose(found[:, :2].mean(0), [50.5, 1], atol=4 * found[:, :2].std(0).max() / 150**0.5)
            for at in (0, 1):
                self.assertLess(abs(found[:, at + 2].mean() / found[:, at].std() - 1), 0.3, (colour, at))

    def test_noise_has_no_tones_and_a_changing_one_is_uncertain(self):
        rng = np.random.default_rng(1)
        self.assertLessEqual(sum(tones.strongest(rng.normal(size=500), 1.0) is not None for _ in range(100)), 6)
        self.assertIsNone(tones.strongest(np.full(50, 3.0), 1.0))
        fading = tones.tones(np.exp(-3 * T[:1000]) * np.sin(2 * np.pi * 50 * T[:1000]), RATE, 1)
        self.assertGreater(fading.amplitude_errors[0], 0.05 * fading.amplitudes[0])

    def test_lines_of_the_spectrum_have_the_amplitudes_of_tones(self):
        frequencies, amplitudes, resolution = tones.spectrum(SIGNAL + 5, RATE)
        self.assertAlmostEqual(amplitudes[np.argmin(np.abs(frequencies - 50))], 2, 6)
        away = np.abs(frequencies[:, None] - [0, 50, 83.3, 150]).min(1) > 5
        self.assertLess(amplitudes[away].max(), 1e-7)
        self.assertTrue(2 * RATE / 4000 < resolution < 3 * RATE / 4000)

    def test_a_trigger_goes_through_blocks_with_its_state(self):
        whole, state = [], {}
        for size in (len(SIGNAL), 1, 7):
            state, places = {}, []
            for first in range(0, 500, size):
                block, index = SIGNAL[:500][first:first + size], -1
                while True:
                    state, index, position = qx.Triggerh_86(block, 0.5, 0.3, 2, index + 1, 2, state)
                    if index < 0:
                        break
                    places.append(first + position)
            whole = whole or places
            np.testing.assert_allclose(places, whole, atol=1e-12)
        self.assertEqual(len(whole), 50)
        with self.assertRaisesRegex(ValueError, "slope: 3 .* 0 rising; 1 falling"):
            qx.Triggerh(SIGNAL, 0.0, 3, 0)


class Command(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.addCleanup(os.chdir, os.getcwd())
        os.chdir(folder.name)

    def run_command(self, *arguments):
        out = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
        with contextlib.redirect_stdout(out), contextlib.redirect_stderr(out):
            code = command.main(["tones", *arguments])
        return code, out.buffer.getvalue().decode()

    def test_prints_and_plots_tones_and_harmonics(self):
        np.savetxt("signal.csv", np.column_stack([T, SIGNAL]), delimiter=",", header="time (s),U (V)", comments="")
        code, text = self.run_command("signal.csv", "--count", "3", "--harmonics", "3", "--csv", "tones.csv")
        self.assertEqual(code, 0, text)
        for words in ("3 tones", "frequency (Hz)", "amplitude (V)", "THD", "SINAD", "ENOB"):
            self.assertIn(words, text)
        self.assertIn("harmonics", Path("out/tones.svg").read_text())
        with open("tones.csv", newline="") as file:
            rows = list(csv.reader(file))
        self.assertEqual([row[:2] for row in rows[1:]], [[kind, str(i)] for kind in ("tone", "harmonic")
                                                         for i in (1, 2, 3)])
        self.assertAlmostEqual(float(rows[2][2]), 83.3, 6)

    def test_says_where_there_is_nothing_to_measure(self):
        Path("constant.csv").write_text("5\n" * 40)
        for arguments, words in ((("constant.csv",), "ErrMeasureNotFound"), (("none.csv",), "none.csv"),
                                 (("constant.csv", "--count", "0"), None)):
            try:
                code, text = self.run_command(*arguments)
            except SystemExit as refused:
                code, text = refused.code, ""
            self.assertEqual(code, 2)
            self.assertIn(words or "", text)
            self.assertFalse(Path("out/tones.svg").exists())


if __name__ == "__main__":
    unittest.main()
