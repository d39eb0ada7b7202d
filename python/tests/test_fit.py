"""The command fit."""

import contextlib
import io
import sys
import tempfile
import unittest
from pathlib import Path
from unittest import mock

import numpy as np

sys.path.insert(0, str(Path(__file__).resolve().parent.parent))
from qx import __main__ as command  # noqa: E402
from qx import fitting  # noqa: E402

VALUES = {"line": lambda x, a, b: a * x + b, "exponential": lambda x, a, b, c: a * np.exp(b * x) + c,
          "power": lambda x, a, b, c: a * x**b + c, "logarithm": lambda x, a, b: a * np.log(b * x),
          "gaussian": lambda x, a, m, s, c: a * np.exp(-0.5 * ((x - m) / s)**2) + c}
TRUTH = {"line": [0.7, 2.0], "exponential": [3.0, -0.8, 1.0], "power": [2.0, 1.3, 1.0],
         "logarithm": [2.5, 1.5], "gaussian": [4.0, 2.5, 0.6, 1.0]}


class Fitting(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.table = self.folder / "data.csv"
        self.x = np.linspace(0.5, 5, 80)

    def write(self, *columns, header="time (s),force (N)"):
        rows = [header, *(",".join(f"{value:.17g}" for value in row) for row in zip(*columns))]
        self.table.write_text("\n".join(rows) + "\n")

    def run_command(self, *arguments, plots=False):
        out = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
        with contextlib.redirect_stdout(out), contextlib.redirect_stderr(out), (
                contextlib.nullcontext() if plots else mock.patch.object(fitting, "plot")):
            code = command.main(["fit", str(self.table), *map(str, arguments)])
        return code, out.buffer.getvalue().decode()

    def parameters(self, *arguments):
        code, text = self.run_command(*arguments)
        self.assertEqual(code, 0, text)
        return [float(line.split()[1]) for line in text.splitlines() if line.startswith("  ")
                and not line.startswith("  mean")], text

    def test_every_model_gives_back_what_the_data_are_made_of(self):
        for name, truth in TRUTH.items():
            with self.subTest(name):
                self.write(self.x, VALUES[name](self.x, *truth))
                found, text = self.parameters("--model", name)
                np.testing.assert_allclose(found, truth, rtol=1e-6)
                self.assertIn("force (N) = " + fitting.FORMULAS[name][0], text)
                self.assertIn("x = time (s)", text)
                self.assertIn("R^2 1\n", text)
        self.write(self.x, 1 - 2 * self.x + 0.25 * self.x**3)
        np.testing.assert_allclose(self.parameters("--model", "polynomial", "--order", 3)[0],
                                   [1, -2, 0, 0.25], atol=1e-10)
        np.testing.assert_allclose(
            self.parameters("--model", "polynomial", "--order", 3, "--fix", "c1=-2", "--fix", "c2=0")[0],
            [1, -2, 0, 0.25], atol=1e-10)

    def test_the_residual_is_that_of_the_data(self):
        noise = np.random.default_rng(1).normal(size=80)
        self.write(self.x, 3 * self.x - 1 + noise)
        _, text = self.parameters("--model", "line")
        slope, intercept = np.polyfit(self.x, 3 * self.x - 1 + noise, 1)
        rest = 3 * self.x - 1 + noise - slope * self.x - intercept
        self.assertIn(f"standard deviation of the residuals {np.sqrt(sum(rest**2) / 78):.6g},", text)
        self.assertIn(f"mean absolute residual {np.mean(abs(rest)):.6g}, ", text)

    def test_errors_are_those_of_the_estimate_and_doubts_are_told(self):
        rng, found = np.random.default_rng(5), []
        for _ in range(200):
            columns = fitting.Columns(self.x, 3 * self.x - 1 + 0.5 * rng.normal(size=80), np.empty(0), "x", "y")
            found.append(fitting.fit("line", columns).fit.parameters["a"])
        self.write(self.x, 3 * self.x - 1 + 0.5 * rng.normal(size=80))
        _, text = self.parameters("--model", "line")
        error = float(text.split("±")[1].split()[0])
        self.assertLess(abs(error / np.std(found) - 1), 0.25)
        self.assertNotIn("Warning", text)
        self.write(self.x, np.exp(-self.x) + 0.001 * rng.normal(size=80))
        _, text = self.parameters("--model", "gaussian")
        self.assertRegex(text, "Warning: (m is outside the data|a is )")
        self.write(self.x, rng.normal(size=80))
        self.assertRegex(self.parameters("--model", "exponential")[1], "Warning: .*(standard error|only together|data)")
        self.write([0, 1.0], [1, 3.0])
        self.assertIn("no more samples than parameters", self.parameters("--model", "line")[1])

    def test_the_plot_goes_where_it_is_wanted(self):
        self.write(self.x, VALUES["gaussian"](self.x, *TRUTH["gaussian"]))
        for name, start in (("new/fit.svg", b"<?xml"), ("fit.png", b"\x89PNG")):
            path = self.folder / name
            code, text = self.run_command("--model", "gaussian", "--plot", path, plots=True)
            self.assertEqual(code, 0, text)
            self.assertIn(f"Data, fit and residuals: {path}\n", text)
            self.assertEqual(path.read_bytes()[:len(start)], start)
        code, text = self.run_command("--model", "gaussian", "--plot", self.folder / "fit.abc", plots=True)
        self.assertEqual(code, command.EXIT_WRONG)
        self.assertIn("abc", text.splitlines()[-1])

    def test_bounds_and_methods(self):
        y = VALUES["exponential"](self.x, *TRUTH["exponential"])
        self.write(self.x, y)
        found, _ = self.parameters("--model", "exponential", "--fix", "c=0", "--lower", "b=-0.5",
                                   "--guess", "a=2", "--guess", "b=-0.1", "--guess", "c=0")
        self.assertEqual(found[2], 0)
        self.assertGreaterEqual(found[1], -0.5)
        y = 0.7 * self.x + 2
        y[::9] += 5
        self.write(self.x, y)
        for method, bound in (("squares", None), ("absolute", 1e-3), ("bisquare", 1e-6)):
            found, _ = self.parameters("--model", "line", "--method", method)
            error = np.abs(np.subtract(found, TRUTH["line"])).max()
            self.assertTrue(error < bound if bound else error > 0.1, f"{method} {error}")

    def test_columns_are_chosen_by_name_number_or_place(self):
        weights = np.ones(80)
        weights[5] = 0
        y = 2 * self.x + 1
        y[5] = 1000
        self.write(weights, y, self.x, header="trust,y [V],x")
        found, text = self.parameters("--model", "line", "--x", "x", "--y", 2, "--weights", "trust")
        np.testing.assert_allclose(found, [2, 1], rtol=1e-9)
        self.write(np.arange(1, 11) ** 2, header="value")
        found, text = self.parameters("--model", "polynomial")
        np.testing.assert_allclose(found, [0, 0, 1], atol=1e-9)
        self.assertIn("x = row", text)

    def test_what_cannot_be_is_one_line(self):
        self.write([1, 2, 3, 4.0], [1, 2, 4, 7.0])
        for arguments, part in ((("--model", "banana"), "no model 'banana'; there are line, "),
                                (("--model", "line", "--y", "z"), "no column 'z'"),
                                (("--model", "line", "--fix", "a"), "'a' is not NAME=NUMBER"),
                                (("--model", "line", "--lower", "d=3"), "no parameter d"),
                                (("--model", "line", "--lower", "a=3", "--upper", "a=2"), "ErrBoundsCrossed"),
                                (("--model", "power", "--guess", "a=3"), "no value for b, c"),
                                (("--model", "gaussian", "--x", "2", "--y", "2", "--fix", "s=0",
                                  "--guess", "a=1", "--guess", "m=1", "--guess", "s=0", "--guess", "c=0"),
                                 "ErrFitStartValues"),
                                (("--model", "polynomial", "--order", "-1"), "no polynomial of order -1"),
                                (("--model", "polynomial", "--method", "bisquare"), "least squares only")):
            code, text = self.run_command(*arguments)
            self.assertEqual((code, text.count("\n")), (command.EXIT_WRONG, 1), text)
            self.assertIn(part, text)
        for content, part in (("x,y\n1,2\n2,oops\n3,4\n", "oops"), ("", "empty"), ("hello\n", "numbers")):
            self.table.write_text(content)
            code, text = self.run_command("--model", "line")
            self.assertEqual((code, text.count("\n")), (command.EXIT_WRONG, 1), text)
            self.assertIn(part, text)
        self.table.unlink()
        code, text = self.run_command("--model", "line")
        self.assertEqual((code, text), (command.EXIT_WRONG, f"qx: {self.table}: no such file\n"))


if __name__ == "__main__":
    unittest.main()
