"""The command generate."""

import contextlib
import io
import sys
import tempfile
import unittest
from pathlib import Path

import numpy as np
import soundfile

sys.path.insert(0, str(Path(__file__).resolve().parent.parent))
from qx import __main__ as command  # noqa: E402
from qx import generation  # noqa: E402
from qx.commands import generate  # noqa: E402


class Generating(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def run_command(self, *arguments):
        out = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
        with contextlib.redirect_stdout(out), contextlib.redirect_stderr(out):
            code = command.main(["generate", *map(str, arguments)])
        return code, out.buffer.getvalue().decode()

    def generated(self, signal, *options):
        path = self.folder / "out.csv"
        code, text = self.run_command(signal, path, "--rate", 2000, "--seconds", 0.5, "--force", *options)
        self.assertEqual(code, 0, text)
        times, samples = np.loadtxt(path, delimiter=",", skiprows=1).T
        np.testing.assert_allclose(times, np.arange(1000) / 2000, atol=1e-15)
        return times, samples

    def test_names_are_those_of_the_signals(self):
        self.assertEqual(generate.NAMES, list(generation.SIGNALS))

    def test_every_signal_runs_and_is_finite(self):
        for signal in generate.NAMES:
            with self.subTest(signal):
                samples = self.generated(signal, "--delay", 0.1)[1]
                self.assertTrue(np.isfinite(samples).all())
                self.assertGreater(np.ptp(samples), 0)

    def test_waves_follow_their_options(self):
        times, samples = self.generated("sine", "--frequency", 50, "--amplitude", 2, "--phase", 30)
        np.testing.assert_allclose(samples, 2 * np.sin(2 * np.pi * 50 * times + np.pi / 6), atol=1e-11)
        _, samples = self.generated("square", "--frequency", 20, "--duty", 30)
        self.assertEqual(np.count_nonzero(samples == 1), 300)
        times, samples = self.generated("pulse", "--delay", 0.1, "--width", 0.05, "--amplitude", 3)
        self.assertEqual(times[samples == 3].min(), 0.1)
        self.assertEqual(np.count_nonzero(samples), 100)
        times, samples = self.generated("triangle-pulse", "--delay", 0.1, "--width", 0.05)
        self.assertEqual((times[samples > 0].min(), times[samples.argmax()]), (0.1005, 0.125))
        times, samples = self.generated("sinc", "--frequency", 25, "--delay", 0.2)
        np.testing.assert_allclose(samples, np.sinc(50 * (times - 0.2)), atol=1e-12)

    def test_a_seed_repeats_its_noise(self):
        first, again, other = (self.generated("gauss", "--seed", seed)[1] for seed in (5, 5, 6))
        np.testing.assert_array_equal(first, again)
        self.assertFalse(np.array_equal(first, other))
        self.assertAlmostEqual(first.std(), 1.0, delta=0.1)

    def test_wav(self):
        path = self.folder / "out.wav"
        code, text = self.run_command("sine", "--frequency", 50, "--rate", 2000, "--seconds", 2, path)
        self.assertEqual((code, text), (0, f"{path}: 4000 samples at 2000 Hz\n"))
        samples, rate = soundfile.read(path)
        self.assertEqual(rate, 2000)
        np.testing.assert_allclose(samples, np.sin(2 * np.pi * 50 * np.arange(4000) / 2000), atol=1e-7)

    def test_what_cannot_be_is_one_line(self):
        for arguments, part in ((("sine", self.folder / "out.txt"), ".csv or .wav"),
                                (("sine", self.folder / "out.wav", "--rate", 2000.5), "whole number"),
                                (("sine", self.folder / "out.csv", "--frequency", 30000),
                                 "--frequency 30000 Hz is above half the sampling rate, 22050 Hz"),
                                (("chirp", self.folder / "out.csv", "--to", 30000), "--to 30000 Hz is above"),
                                (("impulse", self.folder / "out.csv", "--delay", 9), "ErrIndexOutOfRange"),
                                (("binomial", self.folder / "out.csv", "--probability", 2),
                                 "ErrInvalidSelector")):
            code, text = self.run_command(*arguments)
            self.assertEqual(code, 2)
            self.assertIn(part, text)
            self.assertEqual(text.count("\n"), 1)


if __name__ == "__main__":
    unittest.main()
