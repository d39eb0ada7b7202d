"""Calls of exports with NumPy arrays."""

import gc
import os
import subprocess
import sys
import threading
import time
import unittest
import warnings
from pathlib import Path
from unittest import mock

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
import qx  # noqa: E402
from qx import arrays, plans  # noqa: E402
from qx.library import library  # noqa: E402


class Arrays(unittest.TestCase):
    def test_everything_numpy_takes_goes_in(self):
        data = np.arange(12.0)
        expected = data[::-3].mean()
        for given in (data[::-3], list(data[::-3]), tuple(data[::-3]), data[::-3].astype(np.int64),
                      data[::-3].astype(np.float32), data[::-3].astype(">f8")):
            self.assertEqual(qx.call("Mean_head", given), expected)
        self.assertEqual(qx.call("CxRMS_head", [3 + 4j, 5]), 5.0)
        self.assertEqual(qx.call("CxRMS_head", [3.0, 3.0]), 3.0)
        self.assertEqual(qx.call("MSE_head", y=[1.0], x=[3.0]), 4.0)

    def test_arrays_and_records_come_out(self):
        x = np.random.default_rng(1).normal(size=1000)
        counts, centres = qx.call("histgran_head", x, 10)
        expected, edges = np.histogram(x, 10)
        self.assertEqual(counts.tolist(), expected.tolist())
        self.assertEqual((counts.dtype, centres.dtype), (np.int32, np.float64))
        np.testing.assert_allclose(centres, (edges[1:] + edges[:-1]) / 2, rtol=1e-12, atol=1e-15)
        intervals = [(-1.0, 0.0, 0), (0.5, 1.0, 2)]
        counts, summary = qx.call("GenHistH", x, intervals)
        inside = [((x >= -1) & (x < 0)).sum(), ((x >= 0.5) & (x <= 1)).sum()]
        self.assertEqual(counts.tolist(), inside)
        self.assertEqual(summary["outside"], len(x) - sum(inside))
        self.assertEqual(summary["below"], (x < -1).sum())
        self.assertEqual(qx.call("ModeH", [5.0], 0).size, 0)

    def test_results_live_as_long_as_they_are_used_and_go_back_in_without_a_copy(self):
        _, centres = qx.call("histgran_head", np.arange(100.0), 20)
        kept = centres.copy()
        part = centres[5:]
        del centres
        gc.collect()
        others = [qx.call("histgran_head", np.arange(100.0), 20) for _ in range(50)]
        np.testing.assert_array_equal(part, kept[5:])
        whole = others[0][1]
        again = arrays.filled(whole, "DBL", 1, "x", reuse=True)
        self.assertIs(again, whole.base)
        for other in (whole[1:], whole[::-1], whole.copy(), whole.astype(np.float32)):
            self.assertIsNot(arrays.filled(other, "DBL", 1, "x", reuse=True), whole.base)
        self.assertIsNot(arrays.filled(whole, "DBL", 1, "x", reuse=False), whole.base)
        self.assertEqual(qx.call("Mean_head", part), kept[5:].mean())
        # A square turned about its diagonal has the shape and the address of its block, too.
        square = qx.call("DCT_2DH", np.arange(9.0).reshape(3, 3), 0, 0)
        self.assertIsNot(arrays.filled(square.T, "DBL", 2, "x", reuse=True), square.base)
        np.testing.assert_allclose(qx.call("InvDCT_2DH", square.T),
                                   np.arange(9.0).reshape(3, 3).T, atol=1e-14)

    def test_what_would_lose_its_meaning_is_refused(self):
        for name, values, error, reason in (
                ("Mean_head", [[[1.0]]], ValueError, "1 dimension"),
                ("Mean_head", [3.0], ValueError, "1 dimension"),
                ("Mean_head", [[1j]], TypeError, "float64 is needed"),
                ("Mean_head", [["a"]], TypeError, "float64 is needed"),
                ("Moment_head", [[1.0], 1.5], TypeError, "whole number"),
                ("Moment_head", [[1.0], "2"], TypeError, "whole number"),
                ("Moment_head", [[1.0], 2**31], ValueError, "outside"),
                ("Contingency_head", [[[1, 2], [3, 2**31]]], ValueError, "outside"),
                ("Mean_head", [np.broadcast_to(0.0, 2**31)], ValueError, "more than an array"),
                ("Moment_head", [[1.0]], TypeError, r"moment = qx.call\(\"Moment_head\", x, order\)"),
                ("Moment_hed", [[1.0], 2], LookupError, "did you mean Moment_head")):
            with self.subTest(name=name, values=values):
                self.assertRaisesRegex(error, reason, qx.call, name, *values)


class Outcomes(unittest.TestCase):
    def test_failures_and_warnings(self):
        with self.assertRaises(qx.QxError) as caught:
            qx.call("Mean_head", [])
        error = caught.exception
        self.assertEqual((error.code, error.name, error.export), (-20003, "ErrEmptyInput", "Mean_head"))
        self.assertIn(error.text, str(error))
        self.assertTrue(np.isnan(error.results["mean"]))
        with self.assertRaises(qx.QxError) as caught:
            qx.call("CxRMS_head", [])  # this one returns its code
        self.assertEqual(caught.exception.code, -20003)
        with self.assertWarns(qx.QxWarning) as caught:
            self.assertEqual(qx.call("MSE_head", [1.0, 2.0], [1.0]), 0.0)
        self.assertEqual((caught.warning.code, caught.warning.name), (20004, "WarnLengthsDiffer"))
        self.assertEqual(Path(caught.filename).name, Path(__file__).name)
        with warnings.catch_warnings():
            warnings.simplefilter("error", qx.QxWarning)
            self.assertRaises(qx.QxWarning, qx.call, "MSE_head", [1.0, 2.0], [1.0])

    def test_every_code_has_its_name_and_its_own_text(self):
        codes = {n: c for n, c in library().catalogue["codes"].items() if c != 0}
        self.assertGreater(len(codes), 90)
        texts = set()
        for name, code in codes.items():
            self.assertEqual(library().error_name(code), name)
            texts.add(library().error_text(code))
        self.assertEqual(len(texts), len(codes))


class Concurrency(unittest.TestCase):
    def test_the_interpreter_runs_on_during_a_call(self):
        x = np.random.default_rng(2).normal(size=3_000_000)
        thread = threading.Thread(target=qx.call, args=("ModeH", x, 0))
        thread.start()
        turns = 0
        while thread.is_alive():
            time.sleep(0.001)
            turns += 1
        self.assertGreater(turns, 20)

    def test_threads_do_not_disturb_each_other(self):
        data = [np.random.default_rng(i).normal(size=2000 + i) for i in range(8)]
        expected = [np.median(x) for x in data]
        found = [None] * len(data)

        def work(i):
            for _ in range(200):
                found[i] = qx.call("Median_head", data[i])

        threads = [threading.Thread(target=work, args=(i,)) for i in range(len(data))]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join()
        self.assertEqual(found, expected)


class Plans(unittest.TestCase):
    def setUp(self):
        qx.release()
        self.released = []
        release = plans.Word.release
        patch = mock.patch.object(plans.Word, "release",
                                  lambda word: (self.released.append(word), release(word)))
        patch.start()
        self.addCleanup(patch.stop)

    @staticmethod
    def transform(n):
        qx.call("ReOXFFTH80", np.ones(4), 0, n, 0)

    def test_the_latest_are_kept_and_the_others_released(self):
        cache = plans._per_thread.cache
        self.transform(1)
        first = next(iter(cache.words.values()))
        for n in range(2, plans.KEPT_PER_THREAD + 1):
            self.transform(n)
        second = list(cache.words.values())[1]
        self.assertEqual(self.released, [])
        self.transform(1)  # used again: the plan of length 2 is now the oldest
        self.transform(1000)
        self.assertEqual(self.released, [second])
        self.assertIsNone(second.value.value)
        self.assertIn(first, cache.words.values())

    def test_each_thread_has_its_own_until_it_ends(self):
        self.transform(5)
        words = []

        def work():
            self.transform(5)
            words.extend(plans._per_thread.cache.words.values())

        thread = threading.Thread(target=work)
        thread.start()
        thread.join()
        gc.collect()
        self.assertEqual(len(words), 1)
        self.assertNotIn(words[0], plans._per_thread.cache.words.values())
        self.assertEqual(self.released, words)

    def test_transforms_keep_their_plans(self):
        rng = np.random.default_rng(3)
        qx.release()
        for n in (1, 2, 47, 100):
            x = rng.normal(size=n)
            for name in ("ReOXFFTH80", "ReOXFFTH80_IDP"):
                for _ in range(3):
                    y = qx.call(name, x, 0, n, 0)
                np.testing.assert_allclose(y, np.fft.fft(x), atol=1e-12)
        words = plans._per_thread.cache.words
        self.assertEqual(len(words), 8)
        self.assertTrue(all(word.value.value for word in words.values()))
        qx.release()
        self.assertEqual(len(words), 0)
        np.testing.assert_allclose(qx.call("ReOXFFTH80", x, 0, n, 0), np.fft.fft(x), atol=1e-12)
        for n in range(1, 2 * plans.KEPT_PER_THREAD):
            qx.call("ReOXFFTH80", x, 0, n, 0)
        self.assertEqual(len(words), plans.KEPT_PER_THREAD)

    def test_an_array_in_and_out_leaves_the_callers_alone(self):
        h = np.array([1.0, 2.0, 3.0, 4.0])
        before = h.copy()
        first = qx.call("InvReOXFFTHCH", h)
        np.testing.assert_array_equal(h, before)
        view = qx.call("DCT_1DH", h, 0)  # a view of a block that an input would take as it is
        before = view.copy()
        qx.call("SpectrumH", view)
        np.testing.assert_array_equal(view, before)
        second = qx.call("InvReOXFFTHCH", h)
        np.testing.assert_array_equal(first[1], second[1])


class Scalars(unittest.TestCase):
    def test_functions_of_scalars_map_over_arrays(self):
        t = np.array([[-1.0, 0.0], [1.0, 6.5]])
        found = qx.call("TDist_head", t, 1)  # one degree of freedom: Cauchy's distribution
        np.testing.assert_allclose(found, 0.5 + np.arctan(t) / np.pi, rtol=1e-9)
        self.assertEqual(qx.call("TDist_head", 6.5, 1), found[1, 1])
        self.assertEqual(qx.call("TDist_head", [], 1).shape, (0,))
        self.assertEqual(qx.call("TDist_head", t[:, :1], [1, 2, 3]).shape, (2, 3))
        self.assertRaises(TypeError, qx.call, "TDist_head", t * 1j, 1)
        self.assertRaises(TypeError, qx.call, "TDist_head", t, [1.5])
        with self.assertRaisesRegex(qx.QxError, "at element 2") as caught:
            qx.call("TDist_head", 1.0, [1, 2, 0, -1])
        self.assertLess(caught.exception.code, 0)
        self.assertEqual(qx.call("NormDist_head", [-np.inf, np.inf]).tolist(), [0.0, 1.0])

    @unittest.skipUnless("QX_BesselJr" in qx.names(), "not in this build")
    def test_several_results_and_values(self):
        x = np.array([[0.5, 1.0], [2.0, 40.0]])
        np.testing.assert_allclose(qx.call("QX_BesselJr", 0.5, x),
                                   np.sqrt(2 / (np.pi * x)) * np.sin(x), rtol=1e-12)
        orders = qx.call("QX_BesselJs", np.arange(4)[:, np.newaxis], x[0])
        self.assertEqual(orders.shape, (4, 2))
        np.testing.assert_allclose(orders[0], np.sin(x[0]) / x[0], rtol=1e-12)
        several = qx.call("QX_EllipticJ", x, 0.5)
        self.assertEqual([part.shape for part in several], 4 * [(2, 2)])
        np.testing.assert_allclose(several[0]**2 + several[1]**2, 1.0, rtol=1e-12)


class Finding(unittest.TestCase):
    def test_missing_libraries_are_named(self):
        ran = subprocess.run([sys.executable, "-m", "qx", "list"], capture_output=True, text=True,
                             env={**os.environ, "QX_LIBRARY_DIR": "/nowhere", "PYTHONPATH": PYTHON})
        self.assertNotEqual(ran.returncode, 0)
        self.assertEqual(ran.stderr.count("\n"), 1)
        self.assertRegex(ran.stderr, "/nowhere.*QX_LIBRARY_DIR")


if __name__ == "__main__":
    unittest.main()
