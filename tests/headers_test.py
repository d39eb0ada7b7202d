"""The public C headers compile without GNU attributes, and their records have the same layout as with them; the
C++ headers compile without warnings.

    headers_test.py SOURCE BUILD
"""

import re
import shutil
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

SOURCE, BUILD = (Path(name).resolve() for name in sys.argv[1:3])
del sys.argv[1:3]
sys.path.insert(0, str(SOURCE / "tools"))
import catalogue  # noqa: E402

# Makes any GNU attribute a syntax error.
NO_ATTRIBUTES = ("-D__attribute__(x)=@", "-U__GNUC__")
PROCESSORS = ("x86_64", "i686")


def compiled(target, sources, *options):
    """The output of clang for a target, each source compiled alone, without system headers."""
    ran = subprocess.run(["clang", f"--target={target}", "-std=c11", "-ffreestanding", "-Wall", "-Wextra", "-Werror",
                          "-Wno-unused-function", "-I", SOURCE / "include", *options, *sources],
                         capture_output=True, text=True)
    if ran.returncode:
        raise AssertionError(f"{target}: {ran.stderr[-3000:]}")
    return ran.stdout


def probe():
    """A source with the size, the alignment and the field offsets of every record."""
    records = catalogue.read_headers(SOURCE / "include")["records"]
    includes = "".join(f'#include "qx/{path.name}"\n' for path in sorted((SOURCE / "include/qx").glob("*.h")))
    lines = []
    for name, record in records.items():
        places = ", ".join(f"offsetof({name}, {field['name']})" for field in record["fields"])
        lines.append(f"const unsigned of_{name}[] = {{sizeof({name}), _Alignof({name}), {places}}};\n")
    return includes + "#include <stddef.h>\n" + "".join(lines)


@unittest.skipUnless(shutil.which("clang"), "clang is not installed")
class WithoutAttributes(unittest.TestCase):
    def test_each_header_alone(self):
        headers = sorted((SOURCE / "include/qx").glob("*.h"))
        self.assertGreater(len(headers), 50)
        compiled("x86_64-pc-windows-msvc", headers, "-fsyntax-only", "-xc", *NO_ATTRIBUTES)

    def test_records_are_laid_out_alike(self):
        with tempfile.TemporaryDirectory() as folder:
            source = Path(folder) / "probe.c"
            source.write_text(probe(), "utf-8")
            for processor in PROCESSORS:
                with self.subTest(processor):
                    layouts = [re.findall(r"^@(of_\w+) = .*?(?:\[(i32 .*)\]|(zeroinitializer))", text, re.MULTILINE)
                               for text in (compiled(f"{processor}-{system}", [source], "-S", "-emit-llvm", "-o", "-",
                                                     *options)
                                            for system, options in (("w64-windows-gnu", ()),
                                                                    ("pc-windows-msvc", NO_ATTRIBUTES)))]
                    self.assertIn(("of_WorkspaceStatus", "i32 5, i32 1, i32 0, i32 1", ""), layouts[0])
                    self.assertEqual(*layouts)


class Cpp(unittest.TestCase):
    def test_no_compiler_warns(self):
        """Compiles everything in qx/qx.hpp, with and without exceptions."""
        for compiler in ("g++", "clang++", "i686-w64-mingw32-g++-posix"):
            with self.subTest(compiler):
                if not shutil.which(compiler):
                    self.skipTest(f"{compiler} is not installed")
                for options in ([], ["-fno-exceptions"]):
                    ran = subprocess.run(
                        [compiler, "-std=c++20", "-Wall", "-Wextra", "-Wshadow", "-Wpedantic", "-Wconversion", "-Werror",
                         "-fsyntax-only", *options, "-I", BUILD / "include", "-I", SOURCE / "include", "-xc++", "-"],
                        input='#include "qx/qx.hpp"\nint main() {}\n', capture_output=True, text=True)
                    self.assertEqual(ran.returncode, 0, ran.stderr[-3000:])


if __name__ == "__main__":
    ran = unittest.main(exit=False, verbosity=2).result
    sys.exit(77 if ran.wasSuccessful() and ran.skipped else not ran.wasSuccessful())
