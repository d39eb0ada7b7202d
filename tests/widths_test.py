#!/usr/bin/python3
"""widths_test.py NM OBJECT...: the objects compiled for AVX2 define no function that the linker could
take for another build of the same function: every global or weak one has its width in its name."""

import subprocess
import sys
import unittest

NM = None
OBJECTS = []
OF_THIS_WIDTH = ("4avx2", "6lanes4")  # the namespaces, as names are mangled
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

    def test_knows_a_shared_function(self):
        self.assertEqual(shared_functions("_ZSt3minIiERKT_S2_S2_ W 0 6\n_ZN2qx4avx21fEv T 0 6\n_ZL1f t 8 1\n"),
                         ["_ZSt3minIiERKT_S2_S2_"])


if __name__ == "__main__":
    NM, *OBJECTS = sys.argv[1:]
    unittest.main(argv=sys.argv[:1])
