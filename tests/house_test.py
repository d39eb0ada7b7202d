"""Rules for every source of the tree that no compiler checks."""

import os
import re
import sys
import unittest
from pathlib import Path

ROOT = Path(sys.argv.pop(1))
SOURCES = sorted(path for folder in ("bench", "examples", "host", "include", "src", "tests")
                 for path in (ROOT / folder).rglob("*") if path.suffix in (".c", ".cpp", ".h", ".hpp"))


def lines_that(pattern, paths):
    """The locations of the lines in which the pattern occurs outside a comment."""
    return [f"{path.relative_to(ROOT)}:{number}" for path in paths
            for number, line in enumerate(path.read_text("utf-8").split("\n"), 1)
            if re.search(pattern, line.split("//")[0])]


class House(unittest.TestCase):
    def test_no_source_opens_a_whole_namespace(self):
        self.assertIn("src/frame/export.h:4", lines_that(r"^#include", SOURCES), "the search works")
        self.assertEqual(lines_that(r"\busing\s+namespace\b", SOURCES), [])

    def test_instruction_sets_are_in_the_headers_of_lanes_only(self):
        pattern = r"__AVX|__SSE|__ARM_NEON|\b_mm\d*_|__builtin_(ia32|shufflevector|convertvector)|vector_size"
        sources = [path for path in SOURCES if path.is_relative_to(ROOT / "src")]
        of_lanes = [path for path in sources if path.match("src/frame/lane*.h")]
        self.assertTrue(lines_that(pattern, of_lanes), "the search works")
        self.assertEqual(lines_that(pattern, [path for path in sources if path not in of_lanes]), [])

    def test_no_guard_serves_two_headers(self):
        guards = {}
        for path in SOURCES:
            if guard := re.match(r"#ifndef (\w+)\n", path.read_text("utf-8")):
                self.assertNotIn(guard[1], guards, path)
                guards[guard[1]] = path

    def test_a_topic_has_one_name(self):
        """Header, exports, test and recipe of a topic carry the same name."""
        topics = sorted((ROOT / "src").glob("*/exports/*.cpp"))
        self.assertTrue(topics)
        for exports in topics:
            family, topic = exports.parent.parent, exports.stem
            test = family / f"tests/{topic}_test.cpp"
            for path in (ROOT / f"include/qx/{topic}.h", family / f"recipes/{topic}.cpp", test):
                self.assertTrue(path.exists(),
                                f"{path.relative_to(ROOT)} for {exports.relative_to(ROOT)}")

    def test_scripts_can_be_called_as_they_are_documented(self):
        folders = ("bench", "debian", "docs", "src", "tests", "tools")
        scripts = [path for place in (ROOT.glob("*"), *((ROOT / name).rglob("*") for name in folders)) for path in place
                   if path.is_file() and path.open("rb").read(2) == b"#!"]
        self.assertIn(ROOT / "tools/bindings.py", scripts)
        self.assertEqual([str(path) for path in scripts if not os.access(path, os.X_OK)], [])

    def test_tests_left_out_under_emulators_exist(self):
        tests = {f"{suite}.{name}" for path in (ROOT / "src").glob("*/tests/*.cpp")
                 for suite, name in re.findall(r"^(?:TYPED_)?TEST(?:_F|_P)?\((\w+),\s*(\w+)\)",
                                               path.read_text("utf-8"), re.MULTILINE)}
        left_out = (ROOT / "tests/slow_emulated.txt").read_text("utf-8").split("\n")[:-1]
        self.assertEqual(left_out, sorted(set(left_out)))
        for line in left_out:
            self.assertIn(re.sub(r"/\*\.", ".", line), tests, "tests/slow_emulated.txt")


if __name__ == "__main__":
    unittest.main()
