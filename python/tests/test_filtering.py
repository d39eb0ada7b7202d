"""The section on a chosen filter."""

import sys
import unittest
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import recording, sections_filtering  # noqa: E402


def recorded(values, rate=None):
    return recording.Recording("test", np.asarray(values, float), rate, "", "V", "voltage", [])


class Filtered(unittest.TestCase):
    def test_gain_of_both_passes_and_ends(self):
        t = np.arange(4000)
        for frequency, gain in ((0.005, 1.0), (0.1, 0.5), (0.4, 0.0)):
            tone = 5 + np.cos(2 * np.pi * frequency * t)
            after = sections_filtering.filtered(recorded(tone), "lowpass", [0.1])[1] - 5
            middle = slice(1000, 3000)
            np.testing.assert_allclose(after[middle], gain * (tone[middle] - 5), atol=2e-3)
        ramp = np.linspace(0, 100, 500)
        np.testing.assert_allclose(sections_filtering.filtered(recorded(ramp), "lowpass", [0.1])[1], ramp, atol=1e-6)

    def test_section(self):
        values = np.random.default_rng(3).normal(size=3000)
        section, _ = sections_filtering.filtered(recorded(values, 360.0), "bandpass", [20, 60])
        left, removed = (float(row.value) for row in section.rows[1:3])
        self.assertLess(abs(left**2 + removed**2 - values.var()), 0.3 * values.var())
        self.assertEqual((section.rows[0].value, section.rows[0].unit), ("20, 60", "Hz"))


if __name__ == "__main__":
    unittest.main()
