"""What the module shows is what its headers declare: no name more, no name less."""

import json
import subprocess
import sys
import unittest

LIBRARY, CATALOGUE = sys.argv.pop(1), sys.argv.pop(1)


class Exports(unittest.TestCase):
    def test_dynamic_symbols(self):
        lines = subprocess.run(["nm", "-D", "--defined-only", LIBRARY], check=True,
                               capture_output=True, text=True).stdout.splitlines()
        shown = {line.split()[-1].split("@")[0] for line in lines}
        with open(CATALOGUE, encoding="utf-8") as file:
            declared = {export["name"] for export in json.load(file)["exports"]}
        self.assertEqual(sorted(declared - shown), [], "declared, but not in the module")
        self.assertEqual(sorted(shown - declared), [], "shown, but not declared")


if __name__ == "__main__":
    unittest.main()
