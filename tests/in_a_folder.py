"""Shared by tests of commands: a temporary folder, and running a command that must succeed."""

import subprocess
import tempfile
import unittest
from pathlib import Path


def run(*command, **more):
    """Returns the output of a command; a failure shows all of it."""
    ran = subprocess.run([str(part) for part in command], text=True, stdout=subprocess.PIPE,
                         stderr=subprocess.STDOUT, **more)
    if ran.returncode:
        raise AssertionError(f"{' '.join(map(str, command))}\n{ran.stdout[-3000:]}")
    return ran.stdout


class InAFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
