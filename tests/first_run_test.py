"""What a new user is told on a machine where something is missing.

    first_run_test.py SOURCE [TEST...]
"""

import os
import stat
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

SOURCE = Path(sys.argv.pop(1))


class Told(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.programs = self.folder / "bin"
        self.programs.mkdir()

    def program(self, name, text):
        """A program of this name that stands before the machine's."""
        path = self.programs / name
        path.write_text(f"#!/bin/bash\n{text}\n", "utf-8")
        path.chmod(path.stat().st_mode | stat.S_IXUSR)

    def run_script(self, *command):
        environment = {**os.environ, "PATH": f"{self.programs}:{os.environ['PATH']}",
                       "QX_CACHE": str(self.folder / "cache")}
        return subprocess.run(list(map(str, command)), capture_output=True, text=True, env=environment)

    def test_missing_packages_without_root(self):
        self.program("dpkg-query", "exit 1")
        self.program("id", "echo 1000")
        ran = self.run_script(SOURCE / "tools/setup/native")
        self.assertEqual((ran.returncode, ran.stderr.count("\n")), (1, 1), ran.stderr)
        self.assertRegex(ran.stderr, "As root: apt-get update && apt-get install build-essential .*python3")

    def test_no_network(self):
        self.program("apt-get", "echo 'Could not resolve'; exit 100")
        ran = self.run_script(SOURCE / "tools/setup/libm", "linux")
        self.assertEqual(ran.returncode, 1)
        self.assertRegex(ran.stderr.strip().split("\n")[-1],
                         r"source package musl is needed and cannot be fetched.*source-musl\.log")
        self.program("dpkg-query", "exit 1")
        self.program("id", "echo 0")
        ran = self.run_script(SOURCE / "tools/setup/native")
        self.assertEqual(ran.returncode, 1)
        self.assertRegex(ran.stderr.strip().split("\n")[-1], r"apt-get install .* failed: .*apt-install\.log")

    def test_progress_and_the_end_of_a_command_are_told(self):
        script = f'. "{SOURCE}/tools/setup/common.sh"; watched work "{self.folder}/log" '
        slow = "bash -c 'echo [1/3]; sleep 1.2; echo [2/3]; exit 3'"
        ran = self.run_script("script", "-qec", f"bash -c {self.quoted(script + slow)}", "/dev/null")
        self.assertEqual(ran.returncode, 3)
        self.assertRegex(ran.stdout, r"work: \d s \[1/3\]")
        self.assertRegex(ran.stdout, r"work: done in \d s")
        ran = self.run_script("bash", "-c", script + "true")
        self.assertEqual((ran.returncode, ran.stdout, ran.stderr), (0, "", ""))

    @staticmethod
    def quoted(text):
        return "'" + text.replace("'", "'\\''") + "'"


if __name__ == "__main__":
    unittest.main()
