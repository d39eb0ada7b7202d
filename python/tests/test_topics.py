"""What all topics share: where names are found, axes, threads, pandas, words and errors, results, streams."""

import ast
import doctest
import functools
import importlib
import inspect
import itertools
import pickle
import re
import subprocess
import sys
import threading
import unittest
import unittest.mock
import warnings
from pathlib import Path

import hypothesis
import numpy as np
import pandas
from hypothesis import strategies

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import measuring  # noqa: E402
from qx.topical import LAST, Result, along, axes, newest, result, words  # noqa: E402

TOPICS = {name: importlib.import_module(f"qx.{name}") for name in newest.TOPICS}
SERVED = {export for keys in newest.NEWEST.values() for export in keys.values()}
SECTIONS = ("Parameters\n", "Returns\n", "Examples\n")

# The same cases in each run, without a database of earlier ones.
hypothesis.settings.register_profile("same", derandomize=True, database=None)
hypothesis.settings.load_profile("same")


class Names(unittest.TestCase):
    def test_topics_come_first_and_exports_stay(self):
        self.assertEqual(dir(qx)[:len(TOPICS)], sorted(TOPICS))
        self.assertEqual(set(qx.names()) - set(dir(qx)), set())
        self.assertEqual(dir(qx.exports), sorted(qx.names()))
        self.assertIs(qx.Mean_head, qx.exports.Mean_head)

    def test_wrong_names_are_answered_with_their_place(self):
        for place, name in ((qx, "butterworth"), (qx.exports, "Butterworth"), (qx, "butterwort")):
            with self.assertRaisesRegex(AttributeError, r"it is qx\.filters\.butterworth"):
                getattr(place, name)
        with self.assertRaisesRegex(AttributeError, "did you mean Mean_head"):
            qx.exports.Mean_hed
        for topic, wrong, answer in (("fft", "rffft", "did you mean rfft"), ("fft", "csd", r"it is qx\.spectra\.csd"),
                                     ("filters", "FIRCoefs", "did you mean"), ("linalg", "slove", "did you mean solve")):
            with self.assertRaisesRegex(AttributeError, rf"qx\.{topic} has no function {wrong}; {answer}"):
                getattr(TOPICS[topic], wrong)
        self.assertFalse(hasattr(qx.fft, "_hidden"))

    def test_failures_name_what_was_called(self):
        column, rows = np.zeros((3, 1)), np.ones((2, 1 << 15), complex)
        for call, kind, text in (
                (lambda: qx.fft.rfft([]), ValueError, r"qx\.fft\.rfft: .*\(ErrEmptyInput"),
                (lambda: qx.fft.rfft(np.zeros((2, 0))), ValueError, r"qx\.fft\.rfft: .*\(ErrEmptyInput"),
                (lambda: qx.fft.rfft(1.0), ValueError, r"qx\.fft\.rfft: x: an array of at least one dimension"),
                (lambda: qx.fft.fft(column, axis=2), ValueError, r"qx\.fft\.fft: axis: 2 is out of bounds"),
                (lambda: qx.fft.fft(column, axis=0.5), TypeError, r"qx\.fft\.fft: axis: a whole number"),
                (lambda: qx.stats.skew([1j, 2]), TypeError, r"qx\.stats\.skew: .* elements of float64"),
                (lambda: qx.stats.median(rows), TypeError, r"qx\.stats\.median: .* elements of float64"),
                (lambda: qx.stats.moment(rows.real, -1), ValueError, r"qx\.stats\.moment: "),
                (lambda: qx.filters.butterworth(2, 0.1)([]), ValueError, r"qx\.filters\.Filter: "),
                (lambda: qx.special.expn(10**30, 1.0), ValueError, r"qx\.special\.expn: .*: n: "),
                (lambda: qx.fft.idct([]), ValueError, r"qx\.fft\.idct: x: is empty"),
                (lambda: qx.fft.rfftfreq(4, 0), ValueError, r"qx\.fft\.rfftfreq: d: must be above 0"),
                (lambda: qx.fft.zoom([1.0, 2.0], (0, 1), fs=0), ValueError, r"qx\.fft\.zoom: fs: must be above 0"),
                (lambda: qx.fft.fftshift(1.0), ValueError, r"qx\.fft\.fftshift: x: "),
                (lambda: qx.spectra.welch([1.0, 2.0], np.inf), ValueError, r"qx\.spectra\.welch: fs: must be above"),
                (lambda: qx.signals.unwrap([1.0, 2.0], 0), ValueError, r"qx\.signals\.unwrap: period: must be above"),
                (lambda: qx.multirate.low_pass(np.inf, 2), TypeError, r"qx\.multirate\.low_pass: up: a whole"),
                (lambda: qx.multirate.resample([1.0], 1e300), ValueError, r"qx\.multirate\.resample: up: .* is too large"),
                (lambda: qx.measure.band_frequencies(3, 25, np.inf), ValueError, "low, high: must be above 0, finite"),
                (lambda: qx.measure.tone([1.0, 2.0], "fast"), TypeError, r"qx\.measure\.tone: fs: a number"),
                (lambda: qx.multirate.respace([1.0], 1e308), ValueError, r"qx\.multirate\.respace: spacing, start: "),
                (lambda: qx.fft.dzt([1.0], 0, 1e308), ValueError, r"qx\.fft\.dzt: size: .* is too large"),
                (lambda: qx.fit.curve(3, [1.0], [1.0], [1]), TypeError, r"qx\.fit\.curve: f: a function is needed"),
                (lambda: qx.fit.nonlinear("f", [1.0], [1.0], [1]), TypeError, r"nonlinear: f: a function is needed"),
                (lambda: qx.calculus.quad(None, 0, 1), TypeError, r"qx\.calculus\.quad: f: a function is needed"),
                (lambda: qx.linalg.solve_banded(1, column, [1.0]), ValueError, r"bands: the numbers of diagonals"),
                (lambda: qx.linalg.solve_banded((0, -1), column, [1.0]), ValueError, r"bands: must be at least 0"),
                (lambda: qx.measure.delay([], [1.0]), ValueError, r"qx\.measure\.delay: x, y: an array is empty"),
                (lambda: qx.linalg.toeplitz(3), ValueError, r"qx\.linalg\.toeplitz: c: one dimension")):
            with unittest.mock.patch.object(axes, "processors", lambda: 2), self.assertRaisesRegex(kind, text):
                call()
        with self.assertRaisesRegex(ValueError, r"^ReOXFFTH: "):
            qx.exports.ReOXFFTH([])

    def test_every_key_of_the_table_belongs_to_a_function(self):
        for topic, keys in newest.NEWEST.items():
            public = TOPICS[topic].__all__
            self.assertEqual(public, sorted(public), topic)
            for key, name in keys.items():
                self.assertIn(name, qx.names())
                self.assertIn(newest.function_of(topic, key), public)

    def test_the_page_of_exports_and_topics_is_up_to_date(self):
        tool = PYTHON.parent / "tools/topics_table.py"
        self.assertEqual(subprocess.run([sys.executable, tool, "--check"]).returncode, 0,
                         f"{tool} writes docs/topics.md")

    def test_every_export_is_served_or_compared_with(self):
        rows = re.findall(r"(?m)^\| `(\w+)` \| (.*) \|$", (PYTHON.parent / "docs/topics.md").read_text("utf-8"))
        self.assertEqual(sorted(export for export, _ in rows), sorted(qx.names()))
        for export, text in rows:
            places = re.findall(rf"\b((?:{'|'.join(TOPICS)})\.[\w.]*\w)", text)
            self.assertTrue(places or text.startswith(("for hosts", "NumPy: ")), f"{export}: {text}")
            for place in places:
                topic, *names = place.split(".")
                self.assertIn(names[0], TOPICS[topic].__all__, f"{export}: {place}")
                functools.reduce(getattr, names, TOPICS[topic])  # also methods
            if places and export not in SERVED:
                self.assertIn("(not called, for comparison)", text, export)

    def test_topics_call_the_newest_revision(self):
        page, known = (PYTHON.parent / "docs/revisions.md").read_text("utf-8"), set(qx.names())
        pairs = [(set(re.findall(r"`(\w+)`", elder)) & known, set(re.findall(r"`(\w+)`", revision)) & known)
                 for elder, revision in re.findall(r"(?m)^\| (`[^|]*) \| (`[^|]*) \|", page)]
        self.assertGreaterEqual(len(pairs), 40)
        elders = {elder: revisions for names, revisions in pairs for elder in names if revisions}
        # Trends of low order over [-1, 1], where the elder has enough digits and is faster: newest.LOW_ORDER.
        scaled = {("signals", "detrend"), ("calculus", "velocity")}
        for topic, keys in newest.NEWEST.items():
            for key, export in keys.items():
                if (topic, key) not in scaled:
                    self.assertNotIn(export, elders, f"{topic}.{key}: {elders.get(export)}")

    def test_every_key_of_the_table_is_used(self):
        """Keys are used as `core.KEY`, or by name in a text, whole or in two parts, without "_complex" and the like."""
        for topic, keys in newest.NEWEST.items():
            files = [TOPICS[topic].__file__, *[measuring.__file__] * (topic == "measure")]
            nodes = [node for file in files for node in ast.walk(ast.parse(Path(file).read_text("utf-8")))]
            called = {node.attr for node in nodes if isinstance(node, ast.Attribute)}
            texts = {node.value for node in nodes if isinstance(node, ast.Constant)}
            for key in keys:
                named = {key, *(key.removesuffix(ending) for ending in ("_complex", "_single", "_sized"))}
                name, _, ending = key.rpartition("_")
                self.assertTrue(key in called or named & texts or {name, "_" + ending} <= texts, f"{topic}.{key}")

    def test_the_workbench_calls_no_export_by_its_name(self):
        for file in [*(PYTHON / "qx").glob("*.py"), *(PYTHON / "qx/commands").glob("*.py")]:
            if file.name not in ("__init__.py", "calls.py", "exports.py"):
                self.assertNotRegex(file.read_text("utf-8"), r"(?<!def )\b(?:call|export)\(\"", file.name)

    def test_every_function_has_a_text_with_its_arguments(self):
        for topic, module in TOPICS.items():
            for name in module.__all__:
                value = getattr(module, name)
                self.assertTrue(value.__doc__, f"{topic}.{name}")
                if inspect.isfunction(value):
                    for section in SECTIONS:
                        self.assertIn(section, value.__doc__, f"{topic}.{name}")
                    for argument in inspect.signature(value).parameters:
                        self.assertRegex(value.__doc__, rf"(?m)^    (\*?\w+, )*\*?{argument}(, \w+)* : ",
                                         f"{topic}.{name}")

    def test_examples_give_what_they_show(self):
        for topic, module in TOPICS.items():
            with self.subTest(topic=topic):
                self.assertEqual(doctest.testmod(module).failed, 0)


def calls_of(work):
    """The number of Python functions that a call enters."""
    count = 0

    def seen(frame, event, _):
        nonlocal count
        count += event == "call"

    sys.setprofile(seen)
    try:
        work()
    finally:
        sys.setprofile(None)
    return count


class Axes(unittest.TestCase):
    def test_one_channel_takes_the_short_way(self):
        x = np.arange(10.0)
        f = qx.filters.butterworth(4, 0.1)
        for topical, export in ((lambda: qx.fft.hartley(x), lambda: qx.exports.FHTH(x)),
                                (lambda: qx.fft.fft(x), lambda: qx.exports.ReOXFFTH(x)),
                                (lambda: qx.stats.median(x), lambda: qx.exports.Median_head(x)),
                                (lambda: qx.special.erf(0.5), lambda: qx.exports.QX_Erf(0.5)),
                                (lambda: f(x), lambda: qx.exports.IIR_Filter2(x, 0, f._a, f._b, [], 0))):
            topical(), export()  # generated at the first call
            self.assertLessEqual(calls_of(topical) - calls_of(export), 3)

    @hypothesis.given(strategies.lists(strategies.integers(1, 5), min_size=1, max_size=4), strategies.data())
    @hypothesis.settings(max_examples=60, deadline=None)
    def test_each_channel_has_the_bits_that_it_has_alone(self, shape, data):
        axis = data.draw(strategies.integers(-len(shape), len(shape) - 1))
        x = np.random.default_rng(sum(shape)).normal(size=shape)
        for alone, n in ((lambda channel: np.cumsum(channel), None),
                         (lambda channel: np.r_[channel, channel], None),
                         (lambda channel: channel.sum(), 1)):
            found = along(alone, x, axis)
            expected = np.apply_along_axis(alone, axis, x)
            self.assertEqual(np.asarray(found).tobytes(), expected.tobytes())
            self.assertEqual(np.shape(found), expected.shape)

    def test_channels_run_in_threads_with_the_same_bits(self):
        x = np.random.default_rng(1).normal(size=(8, 5000))
        used = set()

        def alone(channel):
            used.add(threading.get_ident())
            return qx.fft.rfft(channel)

        with unittest.mock.patch.object(axes, "processors", lambda: 2):
            found = along(alone, x)
            self.assertNotIn(threading.get_ident(), used)
            nested = along(lambda channel: along(alone, np.stack([channel] * 2))[1], x)
        self.assertEqual(found.tobytes(), np.stack([qx.fft.rfft(row) for row in x]).tobytes())
        self.assertEqual(nested.tobytes(), found.tobytes())

    def test_large_results_of_channels_are_what_they_are_alone(self):
        x = np.random.default_rng(1).normal(size=(3, 2, axes.LARGE // 8))
        ramp = itertools.count()
        for alone in (lambda channel: channel, lambda channel: channel[::-1], lambda channel: (channel[0], channel * 2),
                      lambda channel: channel * (1j if channel[0] > 0 else 1)):
            parts = [[alone(channel) for channel in row] for row in x]
            found, single = along(alone, x), not isinstance(parts[0][0], tuple)
            for which, one in enumerate((found,) if single else found):
                expected = [[part if single else part[which] for part in row] for row in parts]
                self.assertEqual(one.tolist(), np.array(expected).tolist())
                self.assertFalse(np.shares_memory(one, x))
        uneven = along(lambda channel: np.ones(len(channel) + next(ramp)), x)
        self.assertEqual(sorted(len(one) - x.shape[2] for one in uneven.ravel()), list(range(6)))
        np.testing.assert_array_equal(along(lambda channel: channel + 1, np.moveaxis(x, -1, 0), 0),
                                      np.moveaxis(x, -1, 0) + 1)

    def test_failures_and_warnings_of_threads_reach_the_caller(self):
        x = np.ones((4, 20000))
        with unittest.mock.patch.object(axes, "processors", lambda: 2):
            with warnings.catch_warnings(record=True) as given:
                warnings.simplefilter("always")
                along(lambda channel: qx.MSE_head(channel, channel[:-1]), x)
            self.assertEqual([(str(Path(one.filename).name), one.message.name) for one in given],
                             [(Path(__file__).name, "WarnLengthsDiffer")])
            with self.assertRaises(ValueError):
                along(lambda channel: qx.Mean_head(channel[:0]), x)

    def test_pandas_keeps_index_and_columns(self):
        index = pandas.date_range("2024-01-01", periods=50, freq="s")
        table = pandas.DataFrame(np.random.default_rng(1).normal(size=(50, 2)), index, ["a", "b"])
        f = qx.filters.butterworth(2, 0.1)
        found = f(table)
        pandas.testing.assert_index_equal(found.index, index)
        self.assertEqual([*found.columns], ["a", "b"])
        np.testing.assert_array_equal(found["b"], f(table["b"].to_numpy()))
        self.assertEqual(f(table["a"]).name, "a")
        pandas.testing.assert_frame_equal(f(table, axis=0), found)
        self.assertEqual(qx.fft.rfft(table).shape, (26, 2))
        self.assertEqual([*qx.fft.rfft(table).columns], ["a", "b"])
        self.assertEqual([*along(lambda channel: channel.sum(), table).index], ["a", "b"])

    def test_what_has_no_channel_is_refused(self):
        for x, axis in ((1.0, LAST), (np.zeros((2, 3)), 2), (np.zeros((0, 3)), -1)):
            with self.assertRaises(ValueError):
                qx.fft.fft(x, axis=axis)
        with self.assertRaisesRegex(ValueError, "1 elements are masked"):
            qx.fft.fft(np.ma.masked_equal([1.0, 2.0], 2.0))
        self.assertEqual(repr(inspect.signature(qx.fft.rfft).parameters["axis"].default), "-1")
        self.assertIs(pickle.loads(pickle.dumps(LAST)), LAST)


class Refusals(unittest.TestCase):
    def test_words_are_listed(self):
        with self.assertRaises(ValueError) as caught:
            qx.filters.butterworth(4, 0.1, "lowpas")
        self.assertEqual(str(caught.exception), "qx.filters.butterworth: kind: 'lowpas' is not one of 'lowpass', "
                         "'highpass', 'bandpass', 'bandstop'; did you mean 'lowpass'? (ErrInvalidSelector)")
        self.assertEqual((caught.exception.name, caught.exception.code), ("ErrInvalidSelector", -20061))
        self.assertIsInstance(caught.exception, qx.QxError)
        again = pickle.loads(pickle.dumps(caught.exception))
        self.assertEqual((str(again), again.code), (str(caught.exception), -20061))
        with self.assertRaisesRegex(ValueError, "0 is not one of 'lowpass'"):
            qx.filters.butterworth(4, 0.1, 0)

    def test_whole_numbers(self):
        self.assertEqual(words.whole_number("f", "n", 3.0), 3)
        self.assertRaisesRegex(TypeError, "f: n: a whole number", words.whole_number, "f", "n", 2.5)
        self.assertRaisesRegex(ValueError, "n: must be at least 1", words.whole_number, "f", "n", 0, 1)


@result
class Sample(Result):
    """A result for the tests."""
    places: np.ndarray
    count: int
    level: float
    _unpacked = ("places", "count")


class Results(unittest.TestCase):
    def test_they_are_shown_and_unpacked(self):
        found = Sample(np.arange(3.0), 3, 1 / 3)
        self.assertEqual(repr(found), "Sample\n  places  [0. 1. 2.]\n  count   3\n  level   0.333333")
        self.assertIn("<th style='text-align:left'>level</th>", found._repr_html_())
        places, count = found
        self.assertEqual((len(places), count, len(found)), (3, 3, 2))
        self.assertIn("2 x 50: [[0. 0. ... 0. 0.]", repr(Sample(np.zeros((2, 50)), 1, 0.0)))


if __name__ == "__main__":
    unittest.main()
