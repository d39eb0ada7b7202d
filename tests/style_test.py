"""Layout and common faults that tools find: clang-format for C and C++, flake8 and mypy for Python.

    style_test.py SOURCE BUILD [TEST...]

The exclusions and their reasons are in the .clang-format files, in .flake8 and in pyproject.toml.
"""

import subprocess
import sys
import unittest
from pathlib import Path

SOURCE, BUILD = (Path(name).resolve() for name in sys.argv[1:3])
del sys.argv[1:3]
VERSION = 14  # of clang-format: other versions format differently


def sources(*endings):
    """Tracked files and new ones that are not ignored; without a repository, all files except build output."""
    if (SOURCE / ".git").exists():
        names = subprocess.run(["git", "-C", SOURCE, "ls-files", "-co", "--exclude-standard", "-z"],
                               capture_output=True, text=True, check=True).stdout.split("\0")
    else:
        names = [str(path.relative_to(SOURCE)) for path in SOURCE.rglob("*")]
    return sorted(name for name in names if name.endswith(endings) and (SOURCE / name).is_file()
                  and name.split("/")[0] not in ("build", "out"))


def scripts():
    """Python scripts without a file extension."""
    return [str(path.relative_to(SOURCE)) for path in sorted((SOURCE / "tools").iterdir())
            if path.is_file() and "python3" in path.read_text("utf-8").split("\n")[0] and not path.suffix]


def findings(*command):
    ran = subprocess.run(list(map(str, command)), cwd=SOURCE, capture_output=True, text=True)
    return ran.returncode, (ran.stdout + ran.stderr)[-4000:]


class Layout(unittest.TestCase):
    def test_c_and_cpp(self):
        _, version = findings("clang-format", "--version")
        self.assertIn(f"version {VERSION}.", version)
        files = sources(".c", ".cpp", ".h", ".hpp")
        self.assertIn("src/frame/export.h", files)
        status, found = findings("clang-format", "--dry-run", "-Werror", *files)
        self.assertEqual((status, found), (0, ""), "run clang-format -i on them")


class Python(unittest.TestCase):
    def test_flake8(self):
        files = sources(".py") + scripts()
        self.assertIn("tools/compare_hashes", files)
        self.assertIn("python/qx/calls.py", files)
        self.assertEqual(findings("flake8", *files), (0, ""))

    def test_mypy(self):
        status, found = findings("mypy", "--cache-dir", BUILD / "mypy", "--python-executable", "/usr/bin/python3")
        self.assertEqual(status, 0, found)
        self.assertRegex(found, r"no issues found in \d\d+ source files")


if __name__ == "__main__":
    unittest.main()
