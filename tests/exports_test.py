"""The boundary of the module file: it shows what its headers declare, no name more and no name
less, and takes from outside only what every process of its platform has."""

import json
import re
import subprocess
import sys
import unittest

LIBRARY, CATALOGUE = sys.argv.pop(1), sys.argv.pop(1)
ON_WINDOWS = LIBRARY.endswith(".dll")
MATHEMATICS = """sin cos sincos tan asin acos atan atan2 sinh cosh tanh exp exp2 expm1 log log2
    log10 log1p pow cbrt hypot fmod floor ceil trunc round rint tgamma lgamma erf erfc""".split()


def output(*command):
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def windows_tables():
    """Exported names, and imported names by DLL."""
    exports, imports, table, dll = set(), {}, None, None
    for line in output("i686-w64-mingw32-objdump", "-p", LIBRARY).splitlines():
        if line.startswith("[Ordinal/Name Pointer] Table"):
            table = exports
        elif line.strip().startswith("DLL Name:"):
            dll = line.split(":")[1].strip()
            table = imports.setdefault(dll, set())
        elif table is exports and (match := re.match(r"\s+\[ *\d+\] (\S+)$", line)):
            exports.add(match[1])
        elif dll and table is not exports and (match := re.match(r"\s+[0-9a-f]+\s+\d+\s+(\S+)$", line)):
            table.add(match[1])
    return exports, imports


class Boundary(unittest.TestCase):
    def setUp(self):
        if ON_WINDOWS:
            self.shown, by_dll = windows_tables()
            self.libraries = sorted(name.lower() for name in by_dll)
            self.taken = set().union(*by_dll.values())
        else:
            names = output("nm", "-D", LIBRARY).splitlines()
            fields = [line.split() for line in names]
            self.shown = {f[-1].split("@")[0] for f in fields if f[-2] not in "Uwv"}
            self.taken = {f[-1].split("@")[0] for f in fields if f[-2] in "Uwv"}
            dynamic = output("readelf", "-dW", LIBRARY)
            self.libraries = re.findall(r"\(NEEDED\).*\[(.*)\]", dynamic)

    def test_shows_exactly_the_declared_exports(self):
        with open(CATALOGUE, encoding="utf-8") as file:
            declared = {export["name"] for export in json.load(file)["exports"]}
        self.assertEqual(sorted(declared - self.shown), [], "declared, but not in the module")
        self.assertEqual(sorted(self.shown - declared), [], "shown, but not declared")

    def test_takes_no_mathematics_from_the_process(self):
        """Their last bits would differ from machine to machine."""
        self.assertTrue(self.taken)
        self.assertEqual(sorted(self.taken & set(MATHEMATICS)), [])

    @unittest.skipUnless(ON_WINDOWS, "the run-times are linked in on Windows")
    def test_needs_only_the_system(self):
        self.assertEqual(self.libraries, ["kernel32.dll", "msvcrt.dll", "user32.dll"])


if __name__ == "__main__":
    unittest.main()
