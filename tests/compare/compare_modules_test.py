"""The comparison of modules finds every planted difference, and none in a copy."""

import json
import os
import re
import shutil
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

ROOT, DRIVER, MODULE, PLANTED = (Path(argument).resolve() for argument in sys.argv[1:5])
del sys.argv[1:5]
# The differences planted in tests/compare/planted.cpp, with their kinds.
DIFFERENCES = {"RMS_head": "elements", "Mean_head": "code", "Convolution": "resizes",
               "DCT_1DH": "sizes", "CxRMS_head": "end", "MSE_head": "end"}


def compare(old, new, *options):
    done = subprocess.run([sys.executable, ROOT / "tools/compare_modules", old, new, "--driver", DRIVER,
                           *options], capture_output=True, text=True,
                          env=dict(os.environ, QX_ORIGINAL_MODULE=str(MODULE)))
    found = dict(re.findall(r"^DIFFERS: (\w+): (\w+)", done.stdout, re.M))
    return done.returncode, found, done.stdout + done.stderr


class CompareModules(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.folder = tempfile.TemporaryDirectory()
        cls.planted = Path(cls.folder.name) / "planted"
        cls.planted.mkdir()
        shutil.copy(PLANTED, cls.planted / "libqxanalysis.so")
        catalogue = json.loads((MODULE.parent / "catalogue.json").read_text("utf-8"))
        changed = next(e for e in catalogue["exports"] if e["name"] == "Norm_head")
        changed["arguments"][1]["direction"] = "inout"
        (cls.planted / "catalogue.json").write_text(json.dumps(catalogue), "utf-8")

    @classmethod
    def tearDownClass(cls):
        cls.folder.cleanup()

    def test_every_planted_difference_and_no_other_is_found(self):
        status, found, text = compare(MODULE, self.planted, "--calls", "8000", "--seconds", "1")
        self.assertEqual(found, {**DIFFERENCES, "TDist_head": "missing", "Norm_head": "its"}, text)
        self.assertEqual(status, 1)
        for name, how in (("CxRMS_head", "ended by SIGSEGV"), ("MSE_head", "ended by too much time")):
            self.assertRegex(text, rf"DIFFERS: {name}: end in .*{how}")
        # The printed options repeat the call.
        words = re.search(r"--only (RMS_head) --seed (\d+) --round (\d+)", text).groups()
        status, _, shown = compare(MODULE, self.planted, "--only", words[0], "--seed", words[1],
                                   "--round", words[2])
        self.assertEqual(status, 1)
        self.assertRegex(shown, r"(?m)^-  (rms|scalar 0)\[0\] = ")
        self.assertRegex(shown, r"(?m)^\+  (rms|scalar 0)\[0\] = ")

    def test_allowed_differences_are_not_reported(self):
        few = ("--only", "RMS_head", "--only", "CxRMS_head", "--calls", "300", "--seconds", "1")
        status, found, text = compare(MODULE, self.planted, *few, "--allow", "CxRMS_head:end")
        self.assertEqual((status, found), (1, {"RMS_head": "elements"}), text)
        status, found, text = compare(MODULE, self.planted, *few, "--allow", "CxRMS_head",
                                      "--allow", "RMS_head:elements")
        self.assertEqual((status, found), (0, {}), text)

    def test_a_copy_is_equal_and_a_new_export_is_not_reported(self):
        status, found, text = compare(MODULE, MODULE, "--calls", "4000")
        self.assertEqual((status, found), (0, {}), text)
        status, found, text = compare(self.planted, MODULE, "--only", "TDist_head")
        self.assertEqual((status, found), (0, {}), text)
        self.assertIn("TDist_head: new", text)

    def test_what_cannot_be_compared_has_its_own_status(self):
        for arguments in ((MODULE, self.planted / "no"), (MODULE, DRIVER.parent / "catalogue.json"),
                          (MODULE, MODULE, "--only", "No_such"), (MODULE, MODULE, "--allow", "A:b")):
            self.assertEqual(compare(*arguments)[0], 2, arguments)


if __name__ == "__main__":
    unittest.main()
