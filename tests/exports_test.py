"""The boundary of the module file: it exports exactly the names that its headers declare, and imports only what
every process of its platform has."""

import json
import re
import subprocess
import sys
import unittest

LIBRARY, CATALOGUE, NM, OBJDUMP, READELF = (sys.argv.pop(1) for _ in range(5))
ON_WINDOWS = LIBRARY.endswith(".dll")
MATHEMATICS = {name + kind for kind in ("", "f", "l") for name in """sin cos sincos tan asin acos atan atan2 sinh
    cosh tanh asinh acosh atanh exp exp2 expm1 log log2 log10 log1p pow sqrt cbrt hypot fmod remainder floor ceil
    trunc round rint nearbyint lround lrint fma fmax fmin fabs copysign nextafter ldexp frexp scalbn modf ilogb logb
    tgamma lgamma erf erfc""".split()} | set("__powidf2 __muldc3 __divdc3 __multf3 __divtf3".split())
# Fused multiply-add instructions of x86 and of ARM, by the names of the disassembler.
FUSED = re.compile(r"^ +[0-9a-f]+:\t(vfn?m(?:add|sub)\w*|fn?m(?:add|sub)|fml[as]\w*|fcmla)\s", re.MULTILINE)


def output(*command):
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def windows_tables():
    """Exported names, and imported names by DLL."""
    exports, imports, table, dll = set(), {}, None, None
    for line in output(OBJDUMP, "-p", LIBRARY).splitlines():
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
            names = output(NM, "-D", LIBRARY).splitlines()
            fields = [line.split() for line in names]
            self.shown = {f[-1].split("@")[0] for f in fields if f[-2] not in "Uwv"}
            self.taken = {f[-1].split("@")[0] for f in fields if f[-2] in "Uwv"}
            dynamic = output(READELF, "-dW", LIBRARY)
            self.libraries = re.findall(r"\(NEEDED\).*\[(.*)\]", dynamic)

    def test_shows_exactly_the_declared_exports(self):
        with open(CATALOGUE, encoding="utf-8") as file:
            declared = {export["name"] for export in json.load(file)["exports"]}
        self.assertEqual(sorted(declared - self.shown), [], "declared, but not in the module")
        self.assertEqual(sorted(self.shown - declared), [], "shown, but not declared")

    def test_takes_no_mathematics_from_the_process(self):
        """Their last bits would differ from machine to machine. The sanitizers put their own versions of two exact
        functions in front of the module's."""
        self.assertTrue(self.taken)
        intercepted = {"frexp", "modf"} if self.taken & {"__asan_init", "__tsan_init"} else set()
        self.assertEqual(sorted(self.taken & MATHEMATICS - intercepted), [])

    def test_fuses_no_product_with_a_sum(self):
        """Bits would depend on the compiler, and a processor may lack such instructions. Libraries linked into the
        module are checked as well."""
        if self.taken & {"__asan_init", "__tsan_init"}:
            self.skipTest("an instrumented module is three times as large, and the flags are the same")
        code = output(OBJDUMP, "-d", "--no-show-raw-insn", LIBRARY)
        self.assertGreater(len(re.findall(r"\tv?(?:mulpd|fmul)\s", code)), 100, "not disassembled")
        self.assertEqual(sorted(set(FUSED.findall(code))), [])

    def test_knows_fused_instructions(self):
        for line in ("  40:\tfmadd\td0, d1, d2, d3", "  40:\tfnmsub\td0, d1, d2, d3", "  4:\tfmla\tv0.2d, v1.2d, v2.2d",
                     " 400:\tvfmadd213sd %xmm0,%xmm1,%xmm2", " 400:\tvfnmsub231pd (%rax),%ymm1,%ymm2"):
            self.assertTrue(FUSED.search(line), line)
        self.assertFalse(FUSED.search("  40:\tfmul\tv0.2d, v1.2d, v2.2d\n  44:\tfmov\td0, d1\n"))

    @unittest.skipUnless(ON_WINDOWS, "the run-times are linked in on Windows")
    def test_needs_only_the_system(self):
        self.assertEqual(self.libraries, ["kernel32.dll", "msvcrt.dll", "user32.dll"])


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
