"""Reports on many recordings."""

import os
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path
from unittest import mock

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
os.environ["PYTHONPATH"] = str(PYTHON)  # for the workers
from qx import many, report  # noqa: E402


def without_time(page):
    return re.sub(r"<footer>.*?</footer>", "", page)


class Many(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.source = self.folder / "recordings"
        (self.source / "deep").mkdir(parents=True)
        rng = np.random.default_rng(6)
        for name, rate in (("a b.csv", 100), ("deep/c$.csv", 200), ("<d>.txt", 300)):
            lines = "\n".join(map(str, rng.normal(size=40)))
            (self.source / name).write_text(f"# sampling rate {rate} Hz\n{lines}\n", "utf-8")
        (self.source / "wrong.csv").write_text("u\n1\nx\n2\n", "utf-8")
        (self.source / "notes.md").write_text("# no recording\n", "utf-8")

    def pages(self, folder):
        return {path.name: without_time(path.read_text("utf-8")) for path in folder.iterdir()}

    def test_a_page_each_and_an_index_whatever_works_on_them(self):
        options = {"rate": None}
        with mock.patch.object(many, "_local", lambda _: many.concurrent.futures.ThreadPoolExecutor(1)):
            found = many.write([str(self.source)], self.folder / "one", options)
        pages = self.pages(self.folder / "one")
        self.assertEqual(sorted(pages), ["<d>.txt.html", "a b.csv.html", "deep_c$.csv.html", "index.html"])
        index = pages["index.html"]
        self.assertIn("3 of 4 recordings were read", index)
        self.assertRegex(index, r'<a href="deep_c%24.csv.html">deep_c\$.csv</a></td><td class="value">40'
                                r'</td><td class="value">200</td>')
        self.assertRegex(index, "<h2>Skipped because of their extensions</h2><ul><li>.*notes.md</li>")
        self.assertIn("wrong.csv:3: column 1, u: &#x27;x&#x27; is not a number", index)
        self.assertEqual([bool(outcome.failure) for outcome in found], [False, False, False, True])
        ran = subprocess.run([sys.executable, "-m", "qx", "report", self.source, "--workers", "2", "--output",
                              self.folder / "two"], capture_output=True, text=True)
        self.assertEqual(ran.returncode, 0, ran.stderr)
        self.assertRegex(ran.stderr, r"\Aqx: .*wrong.csv:3: .*\n\Z")
        self.assertRegex(ran.stdout, r"^3 of 4 recordings were read: .*index.html\n"
                                     r"skipped because of their file name extensions: .*notes.md\n$")
        self.assertEqual(self.pages(self.folder / "two"), pages)

    def test_the_workers_of_a_cluster(self):
        import distributed
        with distributed.LocalCluster(n_workers=1, threads_per_worker=1, processes=False,
                                      dashboard_address=None) as cluster:
            found = many.write([str(self.source / "*.csv")], self.folder / "out", {},
                               scheduler=cluster.scheduler_address)
        self.assertEqual([(Path(o.name).name.split("_")[-1], bool(o.failure)) for o in found],
                         [("a b.csv", False), ("wrong.csv", True)])

    def test_a_process_that_dies_takes_no_other_along(self):
        with mock.patch.object(many, "report_on", die_or_report):
            pairs = [("a b.csv", str(self.source / "a b.csv")), ("dies", "dies"), ("<d>.txt", "x")]
            found = {outcome.name: outcome for outcome in many.outcomes(pairs, {}, workers=1)}
        self.assertIn("its process died", found["dies"].failure)
        self.assertEqual((found["a b.csv"].failure, found["<d>.txt"].failure), ("", ""))

    def test_what_is_found(self):
        names = [name for name, _ in many.files_of([str(self.source / "deep"), str(self.source / "*.csv")])]
        self.assertEqual(sorted(name.split("_")[-1] for name in names), ["a b.csv", "c$.csv", "wrong.csv"])
        with self.assertRaisesRegex(many.InputError, "holds no text table"):
            (self.folder / "empty").mkdir()
            many.write([str(self.folder / "empty")], self.folder / "out", {})
        self.assertFalse(many.is_many([str(self.source / "a b.csv")]))
        broken = mock.Mock(side_effect=RuntimeError("of ours"), __name__="broken")
        with mock.patch.object(report, "SECTIONS", [broken]):
            outcome = many.report_on("a", str(self.source / "a b.csv"), {})
        self.assertRegex(outcome.failure, "a b.csv: RuntimeError: of ours")


def die_or_report(name, path, options):
    if name == "dies":
        os._exit(9)
    return many.Outcome(name)


if __name__ == "__main__":
    unittest.main()
