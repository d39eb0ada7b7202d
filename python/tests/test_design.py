"""Filters of the workbench: the command design, and the section that cleans a recording."""

import contextlib
import html
import io
import json
import re
import sys
import tempfile
import unittest
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import __main__ as command  # noqa: E402
from qx import design, design_page, recording, sections_cleaning  # noqa: E402


def gain(design_, frequency):
    return design_.filter.response([frequency]).magnitude[0]


class Filters(unittest.TestCase):
    def test_iir_filters_of_all_families_and_types(self):
        for family in design.FAMILIES:
            for kind, edges, passed, stopped in (
                    ("lowpass", [30], 5, 170), ("highpass", [30], 150, 1),
                    ("bandpass", [30, 60], 43, 170), ("bandstop", [30, 60], 170, 43)):
                done = design.iir(family, kind, edges, 360.0, 5, fourth=True)
                self.assertTrue(done.filter.is_stable and done.filter.is_iir)
                self.assertLess(abs(gain(done, passed) - 1), 0.2, (family, kind))
                self.assertLess(gain(done, stopped), 0.01, (family, kind))
                # Sections of fourth order give the same filter.
                z = np.exp(-2j * np.pi * passed / 360)
                a, b = (np.reshape(done.numbers[name], (-1, n)) for name, n in (("a", 4), ("b", 5)))
                value = np.prod([np.polyval(above[::-1], z) / (1 + z * np.polyval(below[::-1], z))
                                 for above, below in zip(b, a)])
                self.assertAlmostEqual(abs(value), gain(done, passed), 9)

    def test_fir_filters(self):
        for done in (design.windowed("highpass", [30], 360, 101, "hamming"),
                     design.equiripple("highpass", [20, 40], 360, 101, 10),
                     design.narrow("highpass", [28, 40], 360)):
            self.assertFalse(done.filter.is_iir)
            self.assertLess(abs(gain(done, 100) - 1), 0.13)
            self.assertLess(gain(done, 5), 0.003)
        self.assertIn("of 1 and", design.equiripple("bandstop", [10, 20, 30, 40], 100, 61).note)
        done = design.narrow("bandpass", [990, 1000, 1010, 1020], 8000)
        self.assertGreater(done.numbers["M"], 1)
        self.assertLess(abs(gain(done, 1005) - 1), 0.13)

    def test_the_lines_of_programs_are_the_filter(self):
        import qx
        x = np.random.default_rng(1).normal(size=200)
        for done in (design.iir("elliptic", "bandstop", [48, 52], 1000.0, 3), design.windowed("lowpass", [90], 1000.0, 9)):
            said = {"x": x}
            text = design_page.programs(done)[0]
            code = html.unescape(re.search("<h3>Python</h3><pre>(.*?)</pre>", text, re.DOTALL)[1])
            exec(code, said)
            np.testing.assert_array_equal(said["y"], done.filter(x))
            a, b = (re.search(rf"const double {name}_.. = {{(.*?)}}", text) for name in "ab")
            a, b = (np.array(list(map(float, one[1].split(",")))) if one else np.empty(0) for one in (a, b))
            y = qx.IIR_Filter2(x, 0, a, b, [], 0)[0] if len(a) else qx.IIR_Filter(x, a, b, [], [], 0)[0]
            np.testing.assert_array_equal(y, said["y"])

    def test_phase_has_no_jumps(self):
        done = design.equiripple("lowpass", [100, 130], 1000.0, 41)
        frequencies = design_page.frequencies_for(done.edges, 1000.0)
        phase = design_page.unwrapped(done.filter.response(frequencies).values)
        np.testing.assert_allclose(phase, -360 * 20 * frequencies / 1000, atol=1e-6)

    def test_edges_that_do_not_suit_the_type(self):
        for call in (lambda: design.iir("bessel", "bandpass", [1], 9.0, 2),
                     lambda: design.equiripple("lowpass", [1], 9, 21),
                     lambda: design.narrow("bandstop", [1, 2], 9)):
            with self.assertRaisesRegex(ValueError, "edge"):
                call()

    def test_half_power_lies_between_the_points(self):
        frequencies = np.linspace(0, 0.5, 101)
        made = design.iir("butterworth", "bandpass", [0.123, 0.234], 1.0, 3).filter
        found = design_page.half_power(frequencies, made.response(frequencies).values)
        np.testing.assert_allclose(found, [0.123, 0.234], atol=3e-4)


class Command(unittest.TestCase):
    def run_in(self, folder, *arguments):
        out = io.StringIO()
        with contextlib.redirect_stdout(out), contextlib.redirect_stderr(out):
            code = command.main(["design", *arguments, "--output", folder])
        return code, out.getvalue()

    def test_writes_page_and_coefficients(self):
        with tempfile.TemporaryDirectory() as folder:
            code, text = self.run_in(folder, "chebyshev", "lowpass", "40", "--rate", "360", "--ripple", "0.5")
            self.assertEqual(code, 0, text)
            self.assertRegex(text, r"Group delay in the pass band +\S+ to \S+ ms")
            page = Path(folder, "design.html").read_text("utf-8")
            for part in ("Magnitude", "Phase, without jumps", "Group delay", "Impulse response", "Step response",
                         "Poles and zeros", "sos = [[", "IIR_Filter2(x, &amp;form", "qx::host::check",
                         "qx.filters.chebyshev1(4, 0.5, 40.0, kind=&#x27;lowpass&#x27;, fs=360.0)", "edge 40"):
                self.assertIn(part, page)
            numbers = json.loads(Path(folder, "design.json").read_text("utf-8"))
            self.assertEqual([len(numbers[name]) for name in ("a", "b", "sos")], [4, 6, 2])
            code, text = self.run_in(folder, "narrow", "lowpass", "20", "25", "--rate", "8000")
            self.assertEqual(code, 0, text)
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
                code, text = self.run_in(folder, *arguments)
                self.assertEqual((code, text.count("\n")), (2, 1), text)
                self.assertIn(said, text)


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
            hum = sections_cleaning.hum_of(dirty)
            self.assertEqual(hum.mains, mains)
            self.assertAlmostEqual(hum.amplitude, 0.2, delta=0.01)
            highpass, bandstop = sections_cleaning.filters_for(360.0, mains)
            after = (highpass * bandstop).zero_phase(dirty.values)
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
        section = sections_cleaning.cleaned(recorded(self.pulses + self.noise + np.sin(0.3 * self.t)))
        self.assertIn("No mains hum", section.text)
        self.assertEqual(len(section.rows), 2)
        self.assertIsNone(sections_cleaning.cleaned(recorded(self.noise)))
        ramp = 0.5 * self.t - 3  # which remains a ramp up to its ends
        wander = sections_cleaning.wander_of(ramp + self.noise, sections_cleaning.filters_for(360.0, None)[0])
        self.assertLess(np.abs(wander - ramp).max(), 0.01)

    def test_leaves_recordings_alone_that_do_not_suit(self):
        for other in (recorded(self.noise, None), recorded(self.noise, 50.0),
                      recorded(self.noise[:2000]), recorded(np.ones(7200))):
            self.assertIsNone(sections_cleaning.cleaned(other))


if __name__ == "__main__":
    unittest.main()
