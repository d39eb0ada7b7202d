"""The output of scripts does not depend on the iteration order of Python sets, which changes from run to run.

    repeatable_test.py SOURCE BUILD [TEST...]
"""

import json
import os
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

SOURCE, BUILD = (Path(name).resolve() for name in sys.argv[1:3])
del sys.argv[1:3]
SEEDS = [str(seed) for seed in range(8)]
PYTHON = "/usr/bin/python3"


def output(seed, *command):
    environment = {**os.environ, "PYTHONHASHSEED": seed, "PYTHONPATH": str(SOURCE / "python"),
                   "QX_LIBRARY_DIR": str(BUILD)}
    ran = subprocess.run(list(map(str, command)), capture_output=True, text=True, env=environment)
    if ran.returncode:
        raise AssertionError(f"{command}\n{ran.stdout[-2000:]}{ran.stderr[-2000:]}")
    return ran.stdout


class Case(unittest.TestCase):
    def same(self, make, seeds=SEEDS):
        """Checks that `make(seed, folder)` gives the same result for all seeds, and returns it."""
        made = []
        for seed in seeds:
            with tempfile.TemporaryDirectory() as name:
                shown = make(seed, Path(name))
                files = {str(path.relative_to(name)): re.sub(r"\d{4}-\d\d-\d\d \d\d:\d\d", "",
                                                             path.read_text("utf-8"))
                         for path in sorted(Path(name).rglob("*")) if path.is_file()}
                made.append((shown.replace(name, "FOLDER"), files))
        for seed, (shown, files) in zip(seeds[1:], made[1:]):
            self.assertEqual(shown, made[0][0], f"seed {seed}")
            self.assertEqual(list(files), list(made[0][1]))
            for name, text in files.items():
                self.assertTrue(text == made[0][1][name], f"{name} differs with seed {seed}")
        return made[0]


class OrderOfFortran(Case):
    # Misleading names: in alphabetical order, users precede what they use.
    FILES = {
        "top.f": "      SUBROUTINE TOP\n      CALL A_USER\n*     CALL UNUSED\n      END\n",
        "a_user.f90": "subroutine a_user\n use, intrinsic :: ieee_arithmetic\n"
                      " use b_middle, only: x ! use unused\nend subroutine\n",
        "b_middle.F90": "MODULE B_Middle\n  use :: Z_CONSTANTS; use y_other\n"
                        "interface f\n module procedure g\nend interface\nEND MODULE\n",
        "y_other.f90": "module other_name\nend module\nmodule y_other\n use other_name\nend module\n",
        "z_constants.f90": "module z_constants\nend module\n",
        "unused.f": "      SUBROUTINE UNUSED\n      END\n"}

    def order(self, seed, folder, text=FILES):
        (folder / "SRC").mkdir()
        for name, lines in text.items():
            (folder / "SRC" / name).write_text(lines, "utf-8")
        return output(seed, PYTHON, SOURCE / "tools/setup/fortran_order.py", folder, "top")

    def test_modules_come_before_their_users(self):
        shown, _ = self.same(self.order)
        self.assertEqual([line.replace("FOLDER/SRC/", "") for line in shown.splitlines()],
                         ["0 top.f", "0 y_other.f90", "0 z_constants.f90", "1 b_middle.F90", "2 a_user.f90"])
        with tempfile.TemporaryDirectory() as name, self.assertRaisesRegex(AssertionError, "that use it"):
            self.order("0", Path(name), {**self.FILES, "z_constants.f90": "module z_constants\n"
                                         " use b_middle\nend module\n"})

    def test_the_order_of_lapack_can_be_compiled(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        shown, _ = self.same(lambda seed, _: output(seed, SOURCE / "tools/setup/lapack", "order", folder.name),
                             SEEDS[:4])
        compiled, stages, users = set(), {}, 0
        for stage, path in (line.split(" ", 1) for line in shown.splitlines()):
            stages.setdefault(int(stage), []).append(Path(path).read_text("utf-8", errors="replace"))
        self.assertEqual(list(stages), sorted(stages))
        for files in stages.values():
            for text in files:
                used = set(re.findall(r"^ *use +(la_\w+)", text.lower(), re.MULTILINE))
                own = set(re.findall(r"^module +(\w+)", text.lower(), re.MULTILINE))
                self.assertEqual(used - compiled - own, set())
                users += bool(used)
            compiled |= {name for text in files
                         for name in re.findall(r"^module +(la_\w+)", text.lower(), re.MULTILINE)}
        self.assertGreater(users, 3, "some files use modules")


class Written(Case):
    def test_the_catalogue(self):
        options = ("json", "map", "def", "codes", "umbrella")
        _, files = self.same(lambda seed, folder: output(
            seed, PYTHON, SOURCE / "tools/catalogue.py", SOURCE / "include",
            *(part for option in options for part in (f"--{option}", folder / option))), SEEDS[:4])
        self.assertEqual(len(files), len(options))

    def test_stubs_and_what_commands_write(self):
        recording = SOURCE / "examples/data/ecg_208_360hz.csv"
        for command in (("qx.stubs", "{}"), ("qx", "list", "filter"),
                        ("qx", "report", recording, "--output", "{}/out"),
                        ("qx", "design", "elliptic", "bandstop", "48", "52", "--rate", "1000", "--output",
                         "{}/out")):
            self.same(lambda seed, folder: output(
                seed, PYTHON, "-m", *(str(part).replace("{}", str(folder)) for part in command)), SEEDS[:2])

    def test_the_page_of_speed(self):
        def page(seed, folder):
            for family in "stats", "fft":
                for width in range(9):
                    run = {"family": family, "time": f"{width}", "commit": "", "machine": "", "load": 0,
                           "width": f"{width}", "compiler": "", "missing": [], "stopped": None,
                           "rows": [{"what": "", "peer": "", "mean": 1, "worst": 1, "case": "", "count": 1}]}
                    (folder / f"{family}{width}.json").write_text(json.dumps(run))
            return output(seed, PYTHON, SOURCE / "bench/speed_page.py", folder, folder / "page.md")

        _, files = self.same(page, SEEDS[:4])
        self.assertIn("page.md", files)

    def test_the_pages_of_the_documentation(self):
        _, files = self.same(lambda seed, folder: output(
            seed, PYTHON, SOURCE / "docs/site/pages.py", folder), SEEDS[:2])
        self.assertIn("exports/index.rst", files)


if __name__ == "__main__":
    unittest.main()
