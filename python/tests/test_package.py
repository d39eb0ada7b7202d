"""The package as pip installs it: without a path to the tree, from any folder."""

import os
import sys
import unittest
import venv
import zipfile
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent.parent
sys.path.insert(0, str(ROOT / "tests"))
from in_a_folder import InAFolder, run  # noqa: E402

PROGRAM = """
import inspect, pathlib, sys, qx
assert pathlib.Path(qx.__file__).is_relative_to(sys.prefix), qx.__file__
assert pathlib.Path(qx.library.library().folder).is_relative_to(sys.prefix)
print(qx.__version__, qx.Mean_head([1.0, 3.0]), inspect.signature(qx.Moment_head))
"""


class Package(InAFolder):
    def test_a_wheel_has_all_that_it_needs(self):
        run("/usr/bin/python3", "-m", "pip", "wheel", "--no-build-isolation", "--no-index",
            "--no-deps", "--wheel-dir", self.folder, ROOT)
        wheel = next(self.folder.glob("qxanalysis-*.whl"))
        self.assertRegex(wheel.name, r"-py3-none-linux_\w+\.whl$")
        inside = set(zipfile.ZipFile(wheel).namelist())
        package = ROOT / "python/qx"
        expected = {f"qx/{path.relative_to(package)}" for path in package.rglob("*.py")}
        expected |= {f"qx/{file}" for file in ("libqxanalysis.so", "libqxrt.so", "catalogue.json",
                                               "__init__.pyi", "exports.pyi", "py.typed",
                                               "licences/NOTICE.md",
                                               "licences/musl-COPYRIGHT", "licences/lapack-LICENSE")}
        self.assertEqual(expected - inside, set())
        venv.create(self.folder / "venv", system_site_packages=True)
        python = self.folder / "venv/bin/python3"
        run("/usr/bin/python3", "-m", "pip", "--python", python, "install", "--no-index",
            "--no-deps", wheel)
        environment = {name: value for name, value in os.environ.items()
                       if name not in ("PYTHONPATH", "QX_LIBRARY_DIR")}
        shown = run(python, "-c", PROGRAM, cwd=self.folder, env=environment)
        self.assertRegex(shown, r"^\d+\.\d+\.\d+ 2\.0 \(x: .*, order: .*\)")
        found = run(python, "-m", "qx", "list", "Moment_head", cwd="/", env=environment)
        self.assertIn("Moment_head", found)


if __name__ == "__main__":
    sys.exit(unittest.main())
