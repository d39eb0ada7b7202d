#!/usr/bin/python3
"""widths_test.py NM OBJDUMP MODULE --baseline OBJECT... --avx2 OBJECT... --avx512 OBJECT...: the objects
of a wider build define no function that the linker could take for another build of the same function: every
global or weak one has its width in its name. No object has an instruction above its width, and the
module has none that fuses a multiplication with an addition. On 64-bit Windows, where the stack is aligned to 16
bytes only, no object assumes a larger alignment of a 32-byte vector. Without OBJDUMP (a dash) only names are
checked."""

import re
import subprocess
import sys
import unittest

NM = OBJDUMP = MODULE = None
OBJECTS = {}
# The namespaces as they appear in mangled names.
NAMES = {"avx2": ("4avx2", "6lanes4"), "avx512": ("6avx512", "6lanes8")}
ALIGNED = re.compile(r"^vmov(?:ap[sd]|dqa|ntp[sd]|ntdqa?)\s+(?=.*\().*%ymm")
INSTRUCTION = re.compile(r" *[0-9a-f]+:\s+(.*)")
PLACED_BY_LINKER = set("TWi")  # functions that are global, weak or selected at run time
FUSED = re.compile(r"^v?f?n?m(add|sub|addsub|subadd)[1-3]*[ps][sdh]$|^vf(n?m(add|sub)|maddsub|msubadd)|^vfc?maddc")
# Matches a disassembly line with an instruction or register that only a wider processor has.
ABOVE = {"baseline": re.compile(r"^v(?!err|erw)[a-z]|%ymm|%zmm|%k[0-7]"),
         "avx2": re.compile(r"%zmm|%[xy]mm(1[6-9]|2\d|3[01])|%k[0-7]"),
         "avx512": re.compile(r"^v4|^vp2intersect|^vpdp|^vpopcnt|^vpshld|^vaes|%tmm")}
X87 = re.compile(r"^f(?!ence|xsave|xrstor|emms)[a-z]")


def shared_functions(listing, width):
    """The functions of one object, as listed by `nm -P`, that the linker may replace by another object's."""
    rows = [line.split() for line in listing.splitlines()]
    return [name for name, kind, *_ in rows
            if kind in PLACED_BY_LINKER and not any(part in name for part in NAMES[width])]


def instructions(path):
    """The instructions of an object or a library, each from its mnemonic on."""
    listing = subprocess.run([OBJDUMP, "-d", "--no-show-raw-insn", path], check=True, capture_output=True,
                             text=True).stdout
    return [match[1] for match in map(INSTRUCTION.match, listing.splitlines()) if match]


def found(pattern, lines):
    return sorted({line.split()[0] for line in lines if pattern.search(line)})


class Widths(unittest.TestCase):
    def test_share_no_function(self):
        for width in NAMES:
            for path in OBJECTS[width]:
                with self.subTest(path):
                    listing = subprocess.run([NM, "-P", "--defined-only", path], check=True,
                                             capture_output=True, text=True).stdout
                    self.assertIn(NAMES[width][0], listing)
                    self.assertEqual(shared_functions(listing, width), [])

    def test_know_a_shared_function(self):
        listing = "_ZSt3minIiERKT_S2_S2_ W 0 6\n_ZN2qx4avx21fEv T 0 6\n_ZL1f t 8 1\n"
        self.assertEqual(shared_functions(listing, "avx2"), ["_ZSt3minIiERKT_S2_S2_"])
        self.assertIn("_ZN2qx4avx21fEv", shared_functions(listing, "avx512"))

    def test_have_no_instruction_above_them(self):
        if OBJDUMP == "-":
            self.skipTest("names only")
        wider = set(OBJECTS["avx2"] + OBJECTS["avx512"])
        for width, above in ABOVE.items():
            for path in OBJECTS[width]:
                if width != "baseline" or path not in wider:
                    with self.subTest(path):
                        self.assertEqual(found(above, instructions(path)), [])

    def test_fuse_nothing_and_leave_x87_alone(self):
        if OBJDUMP == "-":
            self.skipTest("names only")
        lines = instructions(MODULE)
        self.assertGreater(len(lines), 100000)
        self.assertEqual(found(FUSED, lines), [])
        if MODULE.endswith(".dll"):
            self.skipTest("on 32-bit processors results are returned through x87")
        self.assertEqual(found(X87, lines), [])

    def test_know_the_instructions(self):
        for line in ("vfmadd231pd %zmm1,%zmm0,%zmm2", "vfnmsub132sd %xmm1,%xmm0,%xmm2",
                     "vfmaddsub213pd %ymm1,%ymm0,%ymm2", "vfmsubadd213ps (%rax),%ymm0,%ymm2"):
            self.assertTrue(FUSED.search(line.split()[0]), line)
        for line in ("vmulpd %ymm1,%ymm0,%ymm2", "vaddsubpd %ymm1,%ymm0,%ymm2"):
            self.assertFalse(FUSED.search(line.split()[0]), line)
            self.assertFalse(ABOVE["avx2"].search(line))
            self.assertTrue(ABOVE["baseline"].search(line))
        self.assertTrue(ABOVE["avx2"].search("vaddpd %ymm17,%ymm0,%ymm2"))
        self.assertTrue(ABOVE["avx2"].search("vaddpd (%rax),%ymm0,%ymm2{%k1}"))
        self.assertTrue(X87.search("fldl 0x8(%rsp)"))

    def test_expect_no_alignment_that_64_bit_windows_does_not_give(self):
        if OBJDUMP == "-":
            self.skipTest("names only")
        for path in OBJECTS["avx2"]:
            head = subprocess.run([OBJDUMP, "-f", path], check=True, capture_output=True, text=True).stdout
            if "pe-x86-64" not in head:
                self.skipTest("not for 64-bit Windows")
            self.assertEqual(found(ALIGNED, instructions(path)), [], path)

    def test_know_an_aligned_move(self):
        self.assertTrue(ALIGNED.search("vmovapd %ymm6,0x20(%rsp)"))
        self.assertFalse(ALIGNED.search("vmovapd %ymm6,%ymm7"))
        self.assertFalse(ALIGNED.search("vmovupd %ymm6,0x20(%rsp)"))


def lists(words):
    """The arguments of each option."""
    by_width = {width: [] for width in ABOVE}
    for word in words:
        if word.startswith("--"):
            width = word[2:]
        else:
            by_width[width].append(word)
    return by_width


if __name__ == "__main__":
    NM, OBJDUMP, MODULE, *words = sys.argv[1:]
    OBJECTS = lists(words)
    unittest.main(argv=sys.argv[:1], verbosity=2)  # ./test names what is skipped
