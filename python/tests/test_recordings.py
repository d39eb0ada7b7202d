"""How recordings are read: what people write (data/recordings.txt), and what instruments and programs keep."""

import contextlib
import io
import re
import sys
import tempfile
import unittest
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import __main__ as command  # noqa: E402
from qx import recording  # noqa: E402
from qx.commands import reading  # noqa: E402

CASES = Path(__file__).resolve().parent / "data/recordings.txt"


def cases():
    """Name, statements and text of each case."""
    for part in re.split(r"^== ", CASES.read_text("utf-8"), flags=re.MULTILINE)[1:]:
        head, _, text = part.partition("\n---\n")
        name, *lines = head.split("\n")
        statements = [tuple(map(str.strip, line.split(":", 1))) for line in lines]
        yield name, statements, "".join(map(repeated, text.splitlines(keepends=True)))


def repeated(line):
    """A line, or the lines that "@COUNT RATE TEXT" stands for."""
    if not (match := re.match(r"@(\d+) (\S+) (.*\n)", line)):
        return line
    return "".join(_formatted(match[3], i, i / float(match[2])) for i in range(int(match[1])))


def _formatted(text, i, t):
    def field(match):
        value = i if match[2] == "i" else t
        return format(value + float(match[1] or 0), match[3] or "g") if match[2] == "t" else str(i)
    return re.sub(r"\{(?:([\d.]+)\+)?([it])(?::([^}]*))?\}", field, text)


def read(path, *options):
    """A recording read with options of the command line."""
    return recording.read(path, **reading.of(command.arguments(["report", str(path), *options])))


class InFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def refuses(self, path, fragment, *options):
        with self.assertRaises(recording.InputError) as caught:
            read(path, *options)
        self.assertIn(fragment, str(caught.exception))
        self.assertNotIn("\n", str(caught.exception))


class WhatPeopleWrite(InFolder):
    def test_every_case(self):
        known = {"options", "file", "rate", "column", "values", "says", "refused"}
        names = set()
        for name, statements, text in cases():
            with self.subTest(name):
                self.assertNotIn(name, names)
                names.add(name)
                said = dict(statements)
                self.assertLessEqual(set(said), known)
                self.assertTrue(set(said) - {"options", "file"}, "states nothing")
                path = self.folder / said.get("file", "data.csv")
                path.write_text(text, "utf-8")
                options = said.get("options", "").split()
                if "refused" in said:
                    self.refuses(path, said["refused"], *options)
                    continue
                self.holds(read(path, *options), statements)
        self.assertGreater(len(names), 200)

    def holds(self, found, statements):
        for what, expected in statements:
            if what == "rate" and expected == "none":
                self.assertIsNone(found.rate, found.choice)
            elif what == "rate":
                value, _, doubt = expected.partition("+-")
                self.assertIsNotNone(found.rate, found.choice)
                self.assertAlmostEqual(found.rate, float(value), delta=float(doubt or 1e-9 * float(value)))
            elif what == "column":
                self.assertIn(f"column {expected} of", found.choice)
            elif what == "values":
                values = list(map(float, expected.split()))
                self.assertEqual(found.values[:len(values)].tolist(), values)
            elif what == "says":
                self.assertIn(expected, found.choice)


if __name__ == "__main__":
    unittest.main()
