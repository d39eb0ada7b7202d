"""What type checkers and editors see of the package when it is used from the tree, as the README suggests first."""

import os
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

PYTHON = Path(__file__).resolve().parent.parent
CACHE = Path(os.environ.get("QX_LIBRARY_DIR", PYTHON.parent / "build/release")) / "mypy_of_users"

RIGHT = """
import numpy as np
import qx

lowpass = qx.filters.butterworth(4, 40, fs=1000)
stream = lowpass.stream(channels=8)
stream.copy()(np.zeros((8, 3)))
fit = qx.fit.line([0.0, 1.0], [1.0, 3.0])
slope: float = fit.parameters["slope"]
order: int = qx.signals.sine(100, 0.1).ndim
level, mean = qx.measure.levels([0.0, 1.0]).high, qx.Mean_head([1.0])
found = qx.exports.Moment_head([1.0, 2.0], 2)
names: "list[str]" = qx.names()
try:
    qx.linalg.solve(np.eye(2), [3, 5])
except qx.QxError as error:
    print(error.name)
"""

# Lines of a program, each with the error in it.
WRONG = {
    'qx.filters.butterworth(4, 40, "lowpas")': "Literal.'lowpas'",
    "qx.filters.butterworth()": "Missing positional argument",
    "qx.filters.butterwort(4, 40)": "has no attribute",
    "qx.fft.rfft([1.0]).frequencies": "has no attribute",
    'qx.Moment_head([1.0], "2")': "incompatible type",
    "qx.exports.Moment_head([1.0])": "Missing positional argument",
    "qx.Moment_tail([1.0], 2)": "has no attribute",
    "qx.spectra.welch([1.0], fs=1000).heights": "has no attribute",
}


def checked(text):
    """The lines of the output of mypy --strict for a program."""
    with tempfile.TemporaryDirectory() as name:
        program = Path(name) / "program.py"
        program.write_text(text, "utf-8")
        ran = subprocess.run(["mypy", "--strict", "--ignore-missing-imports", "--follow-imports=silent",
                              "--no-error-summary", "--config-file", os.devnull, "--cache-dir", CACHE,
                              "--python-executable", sys.executable, program],
                             capture_output=True, text=True, env={**os.environ, "MYPYPATH": str(PYTHON)})
    return {int(re.match(r".*?:(\d+):", line)[1]): line for line in ran.stdout.splitlines() if "error:" in line}


class Types(unittest.TestCase):
    def test_the_stubs_in_the_tree_are_up_to_date(self):
        self.assertEqual(subprocess.run(
            [sys.executable, "-m", "qx.stubs", "--check"],
            env={**os.environ, "PYTHONPATH": str(PYTHON)}).returncode, 0, "python3 -m qx.stubs writes them")

    def test_right_calls_pass_and_wrong_ones_are_found(self):
        found = checked("\n".join(["import qx", *WRONG]) + RIGHT)
        for line, (call, reason) in enumerate(WRONG.items(), 2):
            self.assertRegex(found.pop(line, ""), reason, call)
        self.assertEqual(found, {})


if __name__ == "__main__":
    sys.exit(unittest.main())
