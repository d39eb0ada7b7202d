"""The page of speeds shows what was measured: two runs that agree, what has changed, and on which machine.

    speed_page_test.py SOURCE [TEST...]
"""

import json
import sys
import tempfile
import unittest
from pathlib import Path

SOURCE = Path(sys.argv.pop(1)).resolve()
sys.path.insert(0, str(SOURCE / "bench"))

import record
import speed_page

PRINTED = """== fft
     8   1.23 ns
missing peer: gsl (apt-get install libgsl-dev)
summary | short, 2 to 8 | FFTW | 0.6543 | 1.2 | 8 | 7 | AVX2 | g++ 12.2.0
summary | long | FFTW | missing | | | 0 | AVX2 | g++ 12.2.0
stopped: after 200 s
"""


class Page(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.page = self.folder / "speed.md"
        self.runs = 0

    def run_of(self, means, family="fft", **more):
        self.runs += 1
        run = {"family": family, "time": f"2026-01-01T00:00:{self.runs:02}+00:00", "commit": "c", "machine": "m",
               "load": 0.5, "width": "AVX2", "compiler": "g++", "missing": [], "stopped": None,
               "rows": [{"what": what, "peer": "FFTW", "mean": mean, "worst": 2 * mean, "case": "8", "count": 7}
                        for what, mean in means.items()], **more}
        (self.folder / "logs").mkdir(exist_ok=True)
        (self.folder / f"logs/{family}-{self.runs:02}.json").write_text(json.dumps(run), "utf-8")

    def rows(self, width="AVX2"):
        """The page's cells by family and group: mean, runs, before, worst."""
        speed_page.main(self.folder / "logs", self.page)
        text = self.page.read_text("utf-8").split(f"## Width {width}")[1].split("\n## ")[0]
        cells = [[cell.strip() for cell in line.split("|")[1:-1]] for line in text.splitlines()
                 if line.startswith("| ") and not line.startswith("| Family")]
        return {(row[0], row[1]): tuple(row[3:7]) for row in cells}

    def test_what_a_benchmark_prints_becomes_figures(self):
        self.assertEqual(record.read(PRINTED), {
            "width": "AVX2", "compiler": "g++ 12.2.0", "missing": ["gsl (apt-get install libgsl-dev)"],
            "stopped": "after 200 s", "rows": [{"what": "short, 2 to 8", "peer": "FFTW", "mean": 0.6543, "worst": 1.2,
                                                "case": "8", "count": 7}]})
        summary = "summary | short, 2 to 8 | FFTW | 0.7 | 1 | 8 | 7 | {} | g++ 12.2.0\n"
        for more in (summary.format("AVX2"), summary.format("SSE2").replace("short", "other"),
                     summary.format("AVX2").replace("short", "|z|")):
            with self.assertRaises(SystemExit):
                record.read(PRINTED + more)

    def test_two_runs_agree_or_the_row_is_marked(self):
        self.run_of({"a": 9.0}, commit="of before")
        self.run_of({"a": 0.50, "b": 1.00})
        self.assertEqual(self.rows()["fft", "b"][1], "one run")
        self.run_of({"a": 0.514, "b": 1.04, "c": 1.0})
        self.assertEqual(self.rows(), {("fft", "a"): ("0.51", "", "", "1.03"),
                                       ("fft", "b"): ("1.02", "4 % apart", "", "2.08"),
                                       ("fft", "c"): ("1.00", "one run", "", "2.00")})

    def test_runs_of_different_states_are_not_combined(self):
        for name in ("commit", "machine", "compiler"):
            self.run_of({"a": 1.0})
            self.run_of({"a": 2.0}, **{name: "other"})
            self.assertEqual(self.rows()["fft", "a"][:2], ("2.00", "one run"), name)

    def test_changes_since_the_previous_page_are_marked(self):
        def twice(mean, **more):
            self.run_of({"a": mean, "b": 1.0}, **more)
            self.run_of({"a": mean, "b": 1.04}, **more)
            return {group: cells[2] for (_, group), cells in self.rows().items()}

        twice(1.0)
        self.assertEqual(twice(1.06), {"a": "1.00", "b": ""})
        self.assertEqual(self.rows()["fft", "a"][2], "1.00", "written again, it compares with the same page")
        self.assertEqual(twice(1.10), {"a": "", "b": ""})
        self.assertEqual(twice(1.0), {"a": "1.10", "b": ""})
        self.assertEqual(twice(9.0, machine="other"), {"a": "", "b": ""})

    def test_widths_have_tables_and_families_that_were_not_run_stay(self):
        self.run_of({"a": 1.0}, "stats")
        self.run_of({"a": 0.01}, width="SSE2")
        self.assertEqual(set(self.rows()), {("stats", "a")})
        self.assertEqual(self.rows("SSE2"), {("fft", "a"): ("0.01", "one run", "", "0.02")})
        for path in (self.folder / "logs").glob("stats-*"):
            path.unlink()
        self.run_of({"a": 2.0}, "windows", stopped="after 9 s", missing=["gsl"])
        self.assertEqual(set(self.rows()), {("stats", "a"), ("windows", "a")})
        text = self.page.read_text("utf-8")
        for part in ("Machine: m.", "Measured on 2026-01-01", "- `windows`, after 9 s", "- `windows`: gsl"):
            self.assertIn(part, text)

    def test_the_committed_page_is_that_of_its_figures(self):
        figures = json.loads((SOURCE / "docs/speed.json").read_text("utf-8"))
        self.assertEqual((SOURCE / "docs/speed.md").read_text("utf-8"), speed_page.page(figures),
                         "bench/run --page writes it")


if __name__ == "__main__":
    unittest.main()
