"""Calls of exports with NumPy arrays."""

import ast
import concurrent.futures
import copy
import gc
import inspect
import multiprocessing
import os
import pickle
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
from qx import arrays, functions, outcomes, plans, stubs  # noqa: E402
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

    def test_results_live_as_long_as_they_are_used(self):
        for bins in (20, 20_000):  # a copy, and a view of the block
            with self.subTest(bins=bins):
                data = np.arange(100.0)
                _, centres = qx.histgran_head(data, bins)
                kept = centres.copy()
                part = centres[5:]
                del centres
                gc.collect()
                others = [qx.histgran_head(data, bins) for _ in range(20)]
                np.testing.assert_array_equal(part, kept[5:])
                del others
                self.assertEqual(qx.Mean_head(part), qx.Mean_head(kept[5:]))

    def test_a_large_result_goes_back_in_without_a_copy(self):
        kind = arrays.kind("DBL", 1)
        _, whole = qx.histgran_head(np.arange(100.0), 20_000)
        self.assertIs(kind.given(whole, "x"), whole.base)
        for other in (whole[1:], whole[:-1], whole[::-1], whole.copy(), whole.astype(np.float32)):
            self.assertIsNot(kind.given(other, "x"), whole.base)
        self.assertIsNot(kind.given(whole, "x", reuse=False), whole.base)
        # A transposed square matrix also has the shape and the address of its block.
        square = qx.DCT_2DH(np.arange(10_000.0).reshape(100, 100), 0, 0)
        self.assertIsNot(arrays.kind("DBL", 2).given(square.T, "x"), square.base)
        square.shape = (50, 200)  # in place: no longer the shape of the block
        self.assertIsNot(arrays.kind("DBL", 2).given(square, "x"), square.base)
        square.shape = (100, 100)
        np.testing.assert_allclose(qx.InvDCT_2DH(square.T), np.arange(10_000.0).reshape(100, 100).T,
                                   atol=1e-9)

    def test_blocks_that_are_kept_hold_nothing_of_earlier_calls(self):
        rng = np.random.default_rng(5)
        for n in (5, 5, 3, 9, 5, 0, 5):
            x = rng.normal(size=n)
            if n:
                np.testing.assert_allclose(qx.ReOXFFTH80(x, 0, n, 0), np.fft.fft(x), atol=1e-13)
                self.assertEqual(qx.Mean_head(x.tolist()), qx.Mean_head(x))
                continue
            with self.assertRaises(qx.QxError) as caught:
                qx.ReOXFFTH80(x, 0, n, 0)
            self.assertEqual(caught.exception.results["out"].size, 0)
        self.assertEqual(qx.CxConvolution([1j, 2], [3], 0, 0, 0).tolist(), [3j, 6])
        with self.assertRaises(qx.QxError) as caught:
            qx.CxConvolution([], [3], 0, 0, 0)  # which does not change its output
        self.assertEqual(caught.exception.results["out"].size, 0)
        kept = arrays.kind("DBL", 1).kept
        for n in range(1, 3 * arrays.KEPT_SHAPES):
            qx.Mean_head(np.ones(n))
        self.assertLessEqual(len(kept), arrays.KEPT_SHAPES)
        self.assertTrue(all(block.small for blocks in kept.values() for block in blocks))

    def test_records_with_arrays_in_them(self):
        lower = np.array([[2.0, 0, 0], [1, 3, 0], [4, 5, 6]])
        columns = np.triu_indices(3)  # of the transposed matrix, since the packing is by columns
        packed = {"packed": lower.T[columns], "triangle": 0}
        right = np.array([2.0, 4.0, 3.0])
        np.testing.assert_array_equal(qx.Compact_to_Matrix_head(packed), lower)
        np.testing.assert_allclose(qx.TriLinEqs_head(packed, right), np.linalg.solve(lower, right))
        inverse = qx.Tri_InvMatrix_head(packed)
        np.testing.assert_allclose(inverse["packed"], np.linalg.inv(lower).T[columns])
        complex_packed = {"packed": (1 + 2j) * packed["packed"], "triangle": 0}
        np.testing.assert_allclose(qx.CxCompact_to_Matrix_head(complex_packed), (1 + 2j) * lower)
        for given, error, reason in (
                ({"paked": [1.0]}, ValueError, "TriLinEqs_head: a: PackedTriangle has no field 'paked'"),
                ({"packed": [1j]}, TypeError, r"a\.packed: elements of float64"),
                ({"triangle": "low"}, TypeError, r"a\.triangle: a whole number is needed; got 'low'"),
                (3, TypeError, "a dictionary with fields of PackedTriangle is needed; got 3"),
                ([], TypeError, "a dictionary with fields of PackedTriangle is needed")):
            self.assertRaisesRegex(error, reason, qx.TriLinEqs_head, given, right)
        for given in (3.0, [3.0], [(0.0, 1.0)], [(0.0, 1.0, 2), 5], np.array([3.0])):
            self.assertRaisesRegex(TypeError, "GenHistH: intervals: .* needed", qx.GenHistH, right, given)

    def test_what_would_lose_its_meaning_is_refused(self):
        masked = np.ma.array([1.0, 2.0], mask=[False, True])
        for name, values, error, reason in (
                ("Mean_head", [[[1.0]]], ValueError, "Mean_head: x: an array of 1 dimension"),
                ("Mean_head", [3.0], ValueError, "1 dimension is needed; got '3.0'"),
                ("Mean_head", [[1j]], TypeError, "elements of float64 are needed; got complex128"),
                ("Mean_head", [["a"]], TypeError, "elements of float64 are needed"),
                ("Mean_head", [masked], ValueError, "Mean_head: x: 1 elements are masked"),
                ("Moment_head", [[1.0], 1.5], TypeError, "order: a whole number is needed; got 1.5"),
                ("Moment_head", [[1.0], "2"], TypeError, r"whole number is needed; got '2' \(str\)"),
                ("Moment_head", [[1.0], 2**31], ValueError, "Moment_head: order: .* outside"),
                ("Contingency_head", [[[1, 2], [3, 2**31]]], ValueError, "outside"),
                ("Mean_head", [np.broadcast_to(0.0, 2**31)], ValueError, "more than an array"),
                ("AllWinH", [[1.0], 1, "0.5", 0, 0], TypeError, "number is needed; got '0.5'"),
                ("AllWinH", [[1.0], 1, [0.5], 0, 0], TypeError, "number is needed; got \\[0.5"),
                ("NormDist_head", ["a"], TypeError, "NormDist_head: x: a number is needed"),
                ("Moment_head", [[1.0]], TypeError, r"Moment_head\(\) missing .* argument: 'order'"),
                ("Moment_hed", [[1.0], 2], LookupError, "did you mean Moment_head")):
            with self.subTest(name=name, values=values):
                self.assertRaisesRegex(error, reason, qx.call, name, *values)
        self.assertEqual(qx.Mean_head(np.ma.array([1.0, 3.0])), 2.0)

    def test_pointers_are_those_of_exports_and_given_back_once(self):
        plan = qx.create_oxfft_table(64)
        self.assertTrue(plan)
        self.assertFalse(qx.create_oxfft_table(0))
        qx.destroy_oxfft_table(plan)
        self.assertRaisesRegex(ValueError, "already been given back", qx.destroy_oxfft_table, plan)
        for wrong in (12345, 0.5, "x", object()):
            self.assertRaisesRegex(TypeError, "from an export", qx.destroy_oxfft_table, wrong)
        self.assertRaisesRegex(TypeError, "from an export", qx.SetQXRTModule, 4096, 0)
        qx.destroy_oxfft_table(None)
        self.assertRaises(TypeError, pickle.dumps, plan)


class Outcomes(unittest.TestCase):
    def test_failures_and_warnings(self):
        with self.assertRaises(qx.QxError) as caught:
            qx.call("Mean_head", [])
        error = caught.exception
        self.assertEqual((error.code, error.name, error.export), (-20003, "ErrEmptyInput", "Mean_head"))
        self.assertIn(error.text, str(error))
        self.assertTrue(np.isnan(error.results["mean"]))
        with self.assertRaises(qx.QxError) as caught:
            qx.call("CxRMS_head", [])  # this export returns its code
        self.assertEqual(caught.exception.code, -20003)
        with self.assertWarns(qx.QxWarning) as caught:
            self.assertEqual(qx.call("MSE_head", [1.0, 2.0], [1.0]), 0.0)
        self.assertEqual((caught.warning.code, caught.warning.name), (20004, "WarnLengthsDiffer"))
        self.assertEqual(Path(caught.filename).name, Path(__file__).name)
        with warnings.catch_warnings():
            warnings.simplefilter("error", qx.QxWarning)
            self.assertRaises(qx.QxWarning, qx.call, "MSE_head", [1.0, 2.0], [1.0])
        with self.assertWarns(qx.QxWarning) as caught:
            qx.MSE_head([1.0, 2.0], [1.0])
        self.assertEqual(Path(caught.filename).name, Path(__file__).name)

    def test_failures_travel_between_processes(self):
        with self.assertRaises(qx.QxError) as caught:
            qx.histgran_head([1.0], 0)
        error = pickle.loads(pickle.dumps(caught.exception))
        self.assertEqual((str(error), error.code), (str(caught.exception), caught.exception.code))
        self.assertEqual(sorted(error.results), sorted(caught.exception.results))
        warning = pickle.loads(pickle.dumps(qx.QxWarning("MSE_head", 20004)))
        self.assertEqual((warning.code, warning.name), (20004, "WarnLengthsDiffer"))
        with concurrent.futures.ProcessPoolExecutor(
                1, multiprocessing.get_context("spawn")) as processes:
            self.assertEqual(processes.submit(qx.Mean_head, [1.0, 3.0]).result(), 2.0)
            failed = processes.submit(qx.Mean_head, []).exception()
        self.assertEqual((type(failed), failed.name), (qx.ArgumentError, "ErrEmptyInput"))

    def test_failures_are_of_pythons_and_numpys_kinds(self):
        for kind, call in ((ValueError, lambda: qx.Mean_head([])),
                           (np.linalg.LinAlgError, lambda: qx.InvMatrixLUDri_head([[1.0, 2.0], [2.0, 4.0]])),
                           (MemoryError, lambda: outcomes.tell("Mean_head", -20001, {}))):
            with self.subTest(kind=kind):
                with self.assertRaises(kind) as caught:
                    call()
                self.assertIsInstance(caught.exception, qx.QxError)
        with self.assertRaisesRegex(qx.QxError, r"ErrBadCutoff, -20023\): a frequency is not above 0") as caught:
            qx.BWCoefs90(1000, -1, 0, 4, 0, 0)
        self.assertRegex(caught.exception.rule, "^a frequency is not above 0, or fl is not below fh;")

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
        view = qx.call("DCT_1DH", h, 0)  # a view of a block that would be passed as an input without a copy
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
    def test_few_elements_are_those_of_single_calls(self):
        x = np.linspace(0.1, 9, 12)
        by_shape = {shape: x.reshape(shape) for shape in ((12,), (3, 4), (1, 1, 12))}
        for values in (*by_shape.values(), x[::-1], x[::2], x.astype(np.float32), x.astype(">f8")):
            expected = [qx.QX_BesselJr(0.5, float(v)) for v in values.ravel()]
            for _ in range(2):  # the second call uses the memory of the first
                found = qx.QX_BesselJr(0.5, values)
                self.assertEqual(found.tolist(), np.reshape(expected, values.shape).tolist())
        first = qx.QX_BesselJr(0.5, x)
        kept = first.copy()
        qx.QX_BesselJr(0.5, x + 1)
        self.assertEqual(first.tolist(), kept.tolist())
        for part, several in enumerate(qx.QX_EllipticJ(x, 0.5)):
            self.assertEqual(several.tolist(), [qx.QX_EllipticJ(float(v), 0.5)[part] for v in x])

    def test_a_code_among_few_elements_is_told_and_forgotten(self):
        orders = np.array([1, 2, 0, 3], np.int32)
        for _ in range(2):
            with self.assertRaisesRegex(qx.QxError, "at element 2"):
                qx.TDist_head(1.0, orders)
            self.assertEqual(qx.TDist_head(1.0, orders + 1).tolist(),
                             [qx.TDist_head(1.0, int(n) + 1) for n in orders])
        self.assertRaises(TypeError, qx.TDist_head, np.ones(4), np.ones(4))

    @unittest.skipUnless("QX_CxBesselJr" in qx.names(), "not in this build")
    def test_functions_of_complex_numbers_map_over_arrays(self):
        z = np.array([[1 + 2j, -3.0], [complex(-2, -0.0), 40j]])
        found = qx.call("QX_CxBesselKr", 0.5, z, [1, 1])  # sqrt(pi / (2 z)) of the sides of z
        np.testing.assert_allclose(found, np.sqrt(np.pi / 2) / np.sqrt(z), rtol=1e-14)
        self.assertEqual(qx.call("QX_CxBesselKr", 0.5, -3, 1), found[0, 1])
        orders = np.arange(3.0)[:, np.newaxis]
        self.assertEqual(qx.call("QX_CxBesselJr", orders, z[0], 0).shape, (3, 2))
        airy = qx.call("QX_CxAiryAi", z, 0)
        self.assertEqual(airy[1, 1], qx.call("QX_CxAiryAi", 40j, 0))
        self.assertEqual(qx.call("QX_CxAiryAi", [], 0).shape, (0,))
        with self.assertRaisesRegex(qx.QxError, "at element 1"):
            qx.call("QX_CxBesselYr", 1.0, [1j, 0, 2], 0)
        with self.assertWarns(qx.QxWarning):
            qx.call("QX_CxBesselJr", 0.0, [1.0, 5e7], 0)
        self.assertRaises(TypeError, qx.call, "QX_CxBesselJr", z, z, 0)

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


class Selectors(unittest.TestCase):
    """Arguments that take a few values, which the headers list."""

    REFUSED = {"ErrInvalidSelector", "ErrMeasureTooManyChannels"}
    NOT_REFUSED = {"Rxy80: algorithm", "RampPtrn85: scale"}  # by the code, which treats them like other values
    GIVEN = {"fs": 8.0, "fl": 1.0, "fh": 2.0, "hist": {"method": 2, "bins": 10}, "iterations": 9,
             "request": {"width": 3, "data": np.arange(8.0)}, "bins": 10, "tolerance": 1e-3,
             "pulseNumber": 1, "number": 1, "cycleNumber": 1, "scaled": 0, "symmetric": 0, "n": 8,
             "attenuation": 40.0, "direction": np.eye(3),
             "fixedOrders": [0], "fixedValues": [1.0], "H": np.vander(np.arange(99.0), 2)}

    def given(self, argument):
        if argument["name"] in self.GIVEN:
            return self.GIVEN[argument["name"]]
        if argument["kind"].startswith("array"):
            n = int(argument["kind"][5])
            return np.arange(1.0, 100.0) if n == 1 else np.eye(4) if n == 2 else np.ones((8, 8, 8))
        if argument["kind"] == "opaque":
            return None
        if argument["kind"] == "procedure":
            return lambda x, p: p[0] * x
        return {} if argument["kind"] == "record" else 1

    def names_of_codes(self, entry, argument):
        """The export's answers to values of the argument, without the check of the package."""
        plain, given = copy.deepcopy(entry), {}
        for other in plain["arguments"]:
            values = dict(other.pop("values", {}))
            if functions.is_given(other):
                given[functions.python_name(other)] = min(values) if values else self.given(other)
        function = functions.Writer(plain).function()
        for value in (*range(0 if argument["element"][0] == "U" else -1, 14), 29, 30, 34, 35, 60, 65, 66):
            given[functions.python_name(argument)] = value
            try:
                function(**given)
                yield value, "none"
            except qx.QxError as error:
                yield value, error.name

    @mock.patch("warnings.warn")
    def test_are_those_of_the_code(self, _):
        checked = 0
        for entry in library().entries.values():
            for argument in entry["arguments"]:
                if "values" not in argument or "ErrInvalidSelector" not in entry["codes"]:
                    continue
                place, values = f"{entry['name']}: {argument['name']}", dict(argument["values"])
                found = dict(self.names_of_codes(entry, argument))
                self.assertEqual([v for v in values if found.get(v) in self.REFUSED], [], place)
                if place not in self.NOT_REFUSED:
                    self.assertEqual({v: found[v] for v in found if v not in values
                                      and found[v] not in self.REFUSED}, {}, place)
                checked += 1
        self.assertGreater(checked, 90)

    def test_others_are_refused_with_the_list(self):
        x = [1.0, 2.0]
        for call, reason in (
                (lambda: qx.Rxy80(x, x, 7, 0), "Rxy80: algorithm: 7 .* 0 direct summation; 1 transforms$"),
                (lambda: qx.AllCosWinH(x, 12, 0), "1 Hanning; .*; 9 low sidelobe, five terms; 11 Blackman-N"),
                (lambda: qx.BWCoefs90(9.0, 1.0, 2.0, 2, 4, 0), "type: 4 .*0 lowpass; .*; 3 bandstop"),
                (lambda: qx.StateLevels(x, 0, 1, 9, 9, 0), "method: 9 .*; 1 minimum and maximum; 2 the histogram"),
                (lambda: qx.NumerIntegration2D_2017_head(np.eye(9), x, 4), "rule: 4 .*0 trapezoid; .*; 3 Bode .Boole.$")):
            self.assertRaisesRegex(ValueError, reason, call)
        hist = {"method": 9, "bins": 9}  # a field, which only the code checks
        with self.assertRaisesRegex(qx.QxError, "method of the measurement is unknown.*unknown method"):
            qx.PulseMeasEx([0.0, 1, 1, 0, 1], 0, 1, 1, 1, 1, {"high": 90, "mid": 50, "low": 10, "percent": 1}, hist, 0)
        self.assertRaisesRegex(TypeError, "algorithm: a whole number is needed; got 0.5", qx.Rxy80, x, x, 0.5, 0)
        np.testing.assert_allclose(qx.Rxy80(x, x, np.int64(1), 0.0), qx.Rxy80(x, x, 0, 0))

    def test_every_one_that_a_code_refuses_is_told(self):
        silent = {name for name, entry in library().entries.items() if "ErrInvalidSelector" in entry["codes"]
                  and not any("values" in argument for argument in entry["arguments"])}
        # Fields of records and amounts; the others are arguments of a twin export.
        self.assertEqual(silent, {"QZ_head", "CxQZ_head", "TriLinEqs_head", "CxTriLinEqs_head",
                                  "Tri_InvMatrix_head", "CxTri_InvMatrix_head", "CoordRotationEuler_head",
                                  "Euler2Direction_head", "Sylvester_head", "CxSylvester_head",
                                  "Lyapunov_head", "CxLyapunov_head", "GammaNoiseH", "PoissonNoiseH",
                                  "BinomialNoiseH", "Gamma2026", "Poisson2026", "Binomial2026", "PeakD"})


class Functions(unittest.TestCase):
    def test_every_export_is_a_function(self):
        stub = {node.name: node for node in ast.parse(stubs.texts()["exports.pyi"]).body
                if isinstance(node, ast.FunctionDef)}
        for name, entry in library().entries.items():
            function = getattr(qx, name)
            self.assertTrue(inspect.isfunction(function), name)
            self.assertTrue(function.__doc__.startswith(entry["documentation"]), name)
            names = [*inspect.signature(function).parameters]
            expected = [a["name"] for a in entry["arguments"]
                        if a["direction"] != "out" and a["kind"] not in ("slot", "instance")]
            self.assertEqual([part.rstrip("_") for part in names], expected, name)
            self.assertEqual([part.arg for part in stub[name].args.args], names, name)
            self.assertEqual(ast.get_docstring(stub[name], clean=False).count("\n"),
                             functions.documentation(entry).count("\n"), name)
            self.assertIs(pickle.loads(pickle.dumps(function)), function)
        self.assertLessEqual({"Mean_head", "call", "list"}, set(dir(qx)))
        own = {path.stem for path in (PYTHON / "qx").glob("*.py")} | set(qx.__all__)
        self.assertEqual(own & set(qx.names()), set(), "names that hide an export")

    def test_help_has_what_exports_share(self):
        texts = {family["name"]: family["introduction"] for family in library().catalogue["families"]}
        for name, entry in library().entries.items():
            text = getattr(qx, name).__doc__
            self.assertIn(texts[entry["family"]], text, name)
            for argument in entry["arguments"]:
                for field in library().records.get(argument.get("element"), {"fields": ()})["fields"]:
                    if argument["element"] not in ("CDB", "CSG") and not field["type"].endswith("*"):
                        self.assertIn(f"\n    {field['name']} (", text, name)
        self.assertIn("width (int32_t): samples of a window, from 3\n", qx.PeakD.__doc__)
        self.assertNotIn("fitMatrix", qx.PeakD.__doc__, "no field for callers")
        self.assertRegex(qx.PeakD.__doc__, r"QXPeakFlags\. The bits.*\n    1 starts .*\n    4 scans the last window")
        self.assertRegex(qx.StateLevels.__doc__, r"QXLevelMethod\. How .*\n(    .*\n)+    2 the histogram if")

    def test_a_star_that_begins_a_line_is_kept(self):
        self.assertIn("The code is in\n*err and is", qx.PeriodNoise.__doc__)

    def test_the_version_is_the_projects(self):
        project = (PYTHON.parent / "CMakeLists.txt").read_text("utf-8")
        self.assertIn(f"project(qxanalysis VERSION {qx.__version__} ", project)

    def test_arguments_have_names(self):
        self.assertEqual(qx.Moment_head(order=2, x=[1.0, 3.0]), 1.0)
        self.assertEqual(qx.ReOXFFTH([1.0]).tolist(), [1])
        self.assertRaisesRegex(TypeError, "unexpected keyword argument 'power'", qx.Moment_head,
                               [1.0], power=2)

    def test_exports_are_found_by_their_texts(self):
        found = qx.list("variance")
        self.assertTrue(found)
        self.assertFalse(any("variance" in name.lower() for name in found[-1:]))
        self.assertRegex(repr(qx.list("mean_head")), r"^Mean_head +\S.*\n?")
        self.assertEqual(qx.list("Mean_hea?"), ["Mean_head"])
        self.assertIn("Mean_head", qx.list("arithmetic mean") + qx.list("mean basic"))
        self.assertRaisesRegex(qx.NoSuchExport, "Meen_hed.*did you mean .*Mean_head", qx.list, "Meen_hed")
        self.assertRaisesRegex(AttributeError, "did you mean .*Mean_head", getattr, qx, "mean_hed")

    def test_a_call_does_no_work_that_it_does_not_need(self):
        """Counts the lines of Python that run, which are the cost of a call besides the export."""
        for name, arguments, most in (("Mean_head", (np.ones(10),), 30),
                                      ("ReOXFFTH80", (np.ones(10), 0, 10, 0), 60)):
            function = getattr(qx, name)
            function(*arguments), function(*arguments)
            lines = []

            def trace(frame, event, _):
                lines.append(event)
                return trace

            sys.settrace(trace)
            try:
                function(*arguments)
            finally:
                sys.settrace(None)
            self.assertLess(lines.count("line"), most, name)


class Finding(unittest.TestCase):
    def test_missing_libraries_are_named(self):
        ran = subprocess.run([sys.executable, "-m", "qx", "list"], capture_output=True, text=True,
                             env={**os.environ, "QX_LIBRARY_DIR": "/nowhere", "PYTHONPATH": PYTHON})
        self.assertNotEqual(ran.returncode, 0)
        self.assertEqual(ran.stderr.count("\n"), 1)
        self.assertRegex(ran.stderr, "/nowhere.*QX_LIBRARY_DIR")


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
