"""The section of the report on filtering."""

import sys
import unittest
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import recording, report, sections_filtering  # noqa: E402, F401


def recorded(values, rate=None):
    return recording.Recording("test", np.asarray(values, float), rate, "", "V", "voltage", [])


class LowPass(unittest.TestCase):
    def test_gain_of_both_passes(self):
        t = np.arange(4000)
        for frequency, gain in ((0.005, 1.0), (sections_filtering.CUTOFF, 0.5), (0.4, 0.0)):
            tone = 5 + np.cos(2 * np.pi * frequency * t)
            after = sections_filtering.smoothed(tone) - 5
            middle = slice(1000, 3000)
            np.testing.assert_allclose(after[middle], gain * (tone[middle] - 5), atol=2e-3)

    def test_section(self):
        self.assertIsNone(sections_filtering.filtered(recorded(range(49))))
        for n, rate in ((50, None), (3000, 360.0)):
            values = np.random.default_rng(n).normal(size=n)
            section = sections_filtering.filtered(recorded(values, rate))
            left, removed = (float(row.value) for row in section.rows[1:3])
            self.assertLess(abs(left**2 + removed**2 - values.var()), 0.3 * values.var())
            self.assertTrue(section.figures[0].startswith("<svg"))
        self.assertEqual(section.rows[0].value, "36")


if __name__ == "__main__":
    unittest.main()
