"""The command resample: WAV files at another rate."""

import contextlib
import io
import os
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path
from unittest import mock

PYTHON = str(Path(__file__).resolve().parent.parent)
sys.path.insert(0, PYTHON)

import numpy as np
import soundfile

import qx
from qx import __main__ as command
from qx import resampling


def tone(frequency, rate, n):
    """Two channels, the second a quarter period later."""
    t = np.arange(n)[:, np.newaxis] / rate
    return np.sin(2 * np.pi * (frequency * t + np.array([0, 0.25])))


def decibel(values):
    return 20 * np.log10(np.abs(values).max())


class Resample(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.source, self.target = (os.path.join(folder.name, name) for name in ("in.wav", "out.wav"))

    def command(self, *arguments):
        with contextlib.redirect_stdout(io.StringIO()) as out, contextlib.redirect_stderr(io.StringIO()) as err:
            try:
                code = command.main(["resample", *map(str, arguments)])
            except SystemExit as refused:  # for wrong arguments
                code = refused.code
        return subprocess.CompletedProcess(arguments, code, out.getvalue(), err.getvalue())

    def test_tones_keep_their_frequency_phase_and_level(self):
        for rate, new_rate, n in ((48000, 44100, 48001), (44100, 48000, 70000), (8000, 44100, 900),
                                  (44100, 11025, 100001), (1000, 999, 3000)):
            with self.subTest(rate=rate, new_rate=new_rate):
                frequency = 0.4 * min(rate, new_rate)
                soundfile.write(self.source, tone(frequency, rate, n), rate, "DOUBLE")
                ran = self.command(self.source, self.target, "--rate", str(new_rate), "--force")
                self.assertEqual(ran.stderr, "")
                sound, found_rate = soundfile.read(self.target)
                self.assertEqual(found_rate, new_rate)
                self.assertEqual(soundfile.info(self.target).subtype, "DOUBLE")
                self.assertEqual(len(sound), -(-n * new_rate // rate))
                self.assertIn(f"{len(sound)} frames at {new_rate} Hz", ran.stdout)
                edge = 200 * max(1, new_rate // rate)  # where the windows reach beyond the ends
                difference = sound - tone(frequency, new_rate, len(sound))
                self.assertLess(decibel(difference[edge:-edge]), -118)

    def test_what_the_new_rate_cannot_hold_does_not_come_back(self):
        for rate, new_rate in ((48000, 44100), (96000, 44100), (44100, 8000)):
            stream = resampling.Resampler(rate, new_rate, 2)
            for frequency in np.linspace(new_rate / 2, rate / 2, 20):
                stream.__init__(rate, new_rate, 2)
                sound = stream.put(tone(frequency, rate, 6000))
                self.assertLess(decibel(sound[400:]), -120)

    def test_the_memory_does_not_grow_with_the_length(self):
        soundfile.write(self.source, np.zeros((400_000, 1)), 48000, "PCM_16")
        sizes = []
        put = resampling.Resampler.put

        def watched(stream, frames):
            sizes.append(max(len(frames), len(found := put(stream, frames))))
            return found

        with mock.patch.object(resampling.Resampler, "put", watched):
            steps = []
            done = resampling.resample_file(self.source, self.target, 44100, steps.append)
        self.assertEqual(sum(steps), 400_000)
        self.assertEqual((done.read, soundfile.info(self.target).frames), (400_000, 367_500))
        self.assertEqual(soundfile.info(self.target).subtype, "PCM_16")
        self.assertLessEqual(max(sizes), resampling.FRAMES_AT_ONCE)

    def test_large_factors_share_the_positions_of_a_call(self):
        stream = resampling.Resampler(44100, 44101, 1)
        sound = np.concatenate([stream.put(tone(1000, 44100, 40000)[:, :1]), stream.end()])
        self.assertEqual(len(sound), 40001)
        self.assertLess(decibel((sound - tone(1000, 44101, 40001)[:, :1])[200:-200]), -118)

    def test_a_record_with_arrays_carries_a_stream_from_call_to_call(self):
        side, oversample = 8, 64
        t = np.arange(-side * oversample, side * oversample + 1) / oversample
        kernel = np.sinc(t) * np.kaiser(t.size, 8.0) / oversample
        design = {"ratio": 1.37, "mode": 0, "start": 20.0, "proto": kernel,
                  "oversample": oversample}
        x = np.cos(0.3 * np.arange(500))
        state, sound = {}, []
        for block in (x[:7], x[7:300], x[300:]):
            state, y, count = qx.call("Resample_Const", block, state, design, int(not state), 1)
            sound.append(y[:count])
        sound = np.concatenate(sound)
        times = 20 + 1.37 * np.arange(len(sound))
        self.assertGreater(times[-1], 480)
        self.assertLess(decibel(sound - np.cos(0.3 * times)), -60)
        self.assertEqual(state["history"].dtype, np.float64)
        with self.assertRaisesRegex(ValueError, "no field 'hist'"):
            qx.call("Resample_Const", x, {"hist": x}, design, 1, 1)

    def test_the_ending_says_the_format(self):
        sound = 0.1 * tone(100, 8000, 500)
        for subtype, ending, kind, expected in (
                ("PCM_16", "flac", "FLAC", "PCM_16"), ("FLOAT", "flac", "FLAC", "PCM_24"),
                ("PCM_24", "FLAC", "FLAC", "PCM_24"), ("FLOAT", "wav", "WAV", "FLOAT"),
                ("PCM_16", "aiff", "AIFF", "PCM_16"), ("DOUBLE", "w64", "W64", "DOUBLE")):
            with self.subTest(subtype=subtype, ending=ending):
                soundfile.write(self.source, sound, 8000, subtype)
                target = f"{self.target[:-3]}{subtype}.{ending}"
                ran = self.command(self.source, target, "--rate", "16000")
                self.assertEqual(ran.stderr, "")
                found = soundfile.info(target)
                self.assertEqual((found.format, found.subtype, found.samplerate), (kind, expected, 16000))
                self.assertEqual(f", {expected} in place of {subtype}\n" in ran.stdout, subtype != expected)
                self.assertLess(decibel(soundfile.read(target)[0][::2][20:-20] - sound[20:-20]), -60)

    def test_a_file_that_is_cut_off_is_reported(self):
        soundfile.write(self.source, 0.1 * tone(500, 8000, 1000), 8000, "PCM_16")
        with open(self.source, "r+b") as file:
            file.truncate(2044)
        ran = self.command(self.source, self.target, "--rate", "16000")
        self.assertEqual(ran.returncode, 0)
        self.assertRegex(ran.stderr, r"^qx: .*: the file is cut off: 2000 of 4000 bytes.*\n$")

    def test_clipping_is_told(self):
        square = np.sign(np.sin(2 * np.pi * 0.01 * (np.arange(2000) + 0.5)))
        told = 0, 0.0
        for subtype, clipped in (("PCM_16", True), ("FLOAT", False)):
            soundfile.write(self.source, square, 8000, subtype)
            ran = self.command(self.source, self.target, "--rate", "44100", "--force")
            sound, _ = soundfile.read(self.target)
            self.assertEqual((ran.returncode, np.abs(sound).max() > 1), (0, not clipped))
            if not clipped:  # the number of samples that would be beyond full scale
                self.assertEqual(ran.stderr, "")
                beyond = np.abs(sound)
                self.assertAlmostEqual(told[0], np.count_nonzero(beyond > 1), delta=20)
                self.assertAlmostEqual(told[1], decibel(sound), delta=0.06)
                continue
            match = re.fullmatch(r"qx: .*out.wav: (\d+) samples beyond full scale, by up to (\S+) dB, "
                                 r"clipped\n", ran.stderr)
            told = int(match[1]), float(match[2])

    def test_every_failure_is_one_line_and_leaves_no_file(self):
        soundfile.write(self.source, tone(100, 8000, 50), 8000)
        for source, target, rate, reason in (
                ("nowhere.wav", self.target, "8000", "no such file"),
                (__file__, self.target, "8000", "cannot be read as audio"),
                (self.source, "/nowhere/out.wav", "44100", "cannot be written"),
                (self.source, self.target, "7999993", "common divisor"),
                (self.source, self.target[:-3] + "mp3", "44100", "must end in one of .wav, "),
                (self.source, self.target, "0", "not between")):
            with self.subTest(reason=reason):
                ran = self.command(source, target, "--rate", rate)
                self.assertEqual(ran.returncode, 2)
                self.assertIn(reason, ran.stderr.splitlines()[-1])
                self.assertEqual(os.listdir(os.path.dirname(self.target)), ["in.wav"])


if __name__ == "__main__":
    unittest.main()
