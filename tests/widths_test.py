#!/usr/bin/python3
"""widths_test.py NM OBJDUMP OBJECT...: the objects compiled for AVX2 define no function that the linker could
take for another build of the same function: every global or weak one has its width in its name. On 64-bit
Windows, where the stack is aligned to 16 bytes only, they expect no better alignment of a vector of 32."""

import re
import subprocess
import sys
import unittest

NM = OBJDUMP = None
OBJECTS = []
OF_THIS_WIDTH = ("4avx2", "6lanes4")  # the namespaces, as names are mangled
ALIGNED = re.compile(r"\tvmov(?:ap[sd]|dqa|ntp[sd]|ntdqa?)\s+(?=.*\().*%ymm")
PLACED_BY_LINKER = set("TWi")  # functions that are global, weak or chosen at run time


def shared_functions(listing):
    """The functions of one object, as `nm -P` lists them, that may stand in for another's."""
    rows = [line.split() for line in listing.splitlines()]
    return [name for name, kind, *_ in rows
            if kind in PLACED_BY_LINKER and not any(width in name for width in OF_THIS_WIDTH)]


class Widths(unittest.TestCase):
    def test_shares_no_function(self):
        self.assertTrue(OBJECTS)
        for path in OBJECTS:
            with self.subTest(path):
                listing = subprocess.run([NM, "-P", "--defined-only", path], check=True,
                                         capture_output=True, text=True).stdout
                self.assertIn("4avx2", listing)
                self.assertEqual(shared_functions(listing), [])

    def test_expects_no_alignment_that_64_bit_windows_does_not_give(self):
        for path in OBJECTS:
            code = subprocess.run([OBJDUMP, "-d", "--no-show-raw-insn", path], check=True, capture_output=True,
                                  text=True).stdout
            if "pe-x86-64" not in code:
                self.skipTest("not for 64-bit Windows")
            self.assertEqual(ALIGNED.findall(code), [], path)

    def test_knows_an_aligned_move(self):
        self.assertTrue(ALIGNED.search("  2f:\tvmovapd %ymm6,0x20(%rsp)"))
        self.assertFalse(ALIGNED.search("  2f:\tvmovapd %ymm6,%ymm7\n  34:\tvmovupd %ymm6,0x20(%rsp)"))

    def test_knows_a_shared_function(self):
        self.assertEqual(shared_functions("_ZSt3minIiERKT_S2_S2_ W 0 6\n_ZN2qx4avx21fEv T 0 6\n_ZL1f t 8 1\n"),
                         ["_ZSt3minIiERKT_S2_S2_"])


if __name__ == "__main__":
    NM, OBJDUMP, *OBJECTS = sys.argv[1:]
    unittest.main(argv=sys.argv[:1])
