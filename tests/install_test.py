"""The installed tree, as another project uses it.

    install_test.py SOURCE BUILD [TEST...]
"""

import json
import os
import re
import shutil
import subprocess
import sys
import unittest
from pathlib import Path

from in_a_folder import InAFolder, run

SOURCE, BUILD = (Path(name).resolve() for name in sys.argv[1:3])
del sys.argv[1:3]
EXAMPLES = SOURCE / "examples"
CONSUMER = SOURCE / "tests/install"


class Using(InAFolder):
    def holds(self, output):
        self.assertRegex(output, r"mean +5(?s:.*)ErrOrderNotPositive")

    def built(self, build, *options):
        run("cmake", "-S", CONSUMER, "-B", build, "-G", "Ninja", f"-DQX_EXAMPLES={EXAMPLES}", *options)
        run("cmake", "--build", build, "--target", "first_call_c", "first_call_cpp")
        for language in ("c", "cpp"):
            self.holds(run(build / f"first_call_{language}"))


class Installed(Using):
    def setUp(self):
        super().setUp()
        first = self.folder / "first"
        run("cmake", "--install", BUILD, "--prefix", first)
        self.prefix = self.folder / "a place with blanks"
        shutil.move(first, self.prefix)  # the tree may be moved

    def test_find_package(self):
        self.built(self.folder / "build", f"-DCMAKE_PREFIX_PATH={self.prefix}",
                   "-DCMAKE_BUILD_TYPE=Release")

    def test_pkg_config(self):
        library = next(self.prefix.rglob("libqxanalysis.so")).parent
        environment = {**os.environ, "PKG_CONFIG_PATH": str(library / "pkgconfig")}
        program = self.folder / "first_call"
        for compiler, source in (("cc -std=c11", "first_call.c"), ("c++ -std=c++20", "first_call.cpp")):
            run("sh", "-c", f'eval {compiler} "{EXAMPLES / source}" -o "{program}" '
                "$(pkg-config --cflags --libs qxanalysis)", env=environment)
            self.holds(run(program, cwd="/", env={}))
        version = run("pkg-config", "--modversion", "qxanalysis", env=environment).strip()
        catalogue = json.loads((self.prefix / "share/qxanalysis/catalogue.json").read_text("utf-8"))
        self.assertEqual(version, catalogue["version"])

    def test_programs_require_the_module_by_its_major_version(self):
        library = next(self.prefix.rglob("libqxanalysis.so"))
        catalogue = json.loads((self.prefix / "share/qxanalysis/catalogue.json").read_text("utf-8"))
        first = f"libqxanalysis.so.{catalogue['version'].split('.')[0]}"
        self.assertRegex(run("readelf", "-d", library), rf"SONAME.*\[{re.escape(first)}\]")
        self.assertEqual(library.resolve().name, f"libqxanalysis.so.{catalogue['version']}")
        self.assertEqual((library.parent / first).resolve(), library.resolve())
        # The name by which the module looks for its host has no version.
        self.assertRegex(run("readelf", "-d", library.parent / "libqxrt.so"), r"SONAME.*\[libqxrt\.so\]")

    def test_notices_of_what_the_module_carries(self):
        licences = self.prefix / "share/doc/qxanalysis/licences"
        notice = (licences / "NOTICE.md").read_text("utf-8")
        lock = (SOURCE / "tools/setup/sources.lock").read_text("utf-8")
        carried = set(re.findall(r"^([a-z]\S*) (\S+) [0-9a-f]{64} ", lock, re.MULTILINE))
        self.assertEqual(set(re.findall(r"^\| (\w+) \| ([\w.+-]*\d[\w.+-]*) \|", notice.lower(), re.MULTILINE)), carried)
        named = re.findall(r"`((?:musl|lapack)-[^`]+)`", notice)
        self.assertEqual(sorted(named), sorted(path.name for path in licences.iterdir() if path.name != "NOTICE.md"))
        for name in named:
            self.assertRegex((licences / name).read_text("utf-8"), "(?i)copyright")

    def test_headers_stand_alone_and_are_all_there(self):
        names = sorted(path.name for path in (self.prefix / "include/qx").iterdir())
        expected = {path.name for path in (SOURCE / "include/qx").iterdir()} | {"qx.h", "qx.hpp"}
        self.assertEqual(names, sorted(expected))
        includes = "".join(f'#include "qx/{name}"\n' for name in names if name.endswith(".h"))
        run("cc", "-std=c11", "-Wall", "-Wextra", "-Werror", "-fsyntax-only", "-x", "c", "-I",
            self.prefix / "include", "-", input=includes)

    def test_python_finds_the_installed_module(self):
        library = next(self.prefix.rglob("libqxanalysis.so")).parent
        self.assertEqual(run("/usr/bin/python3", "-c", "import qx; print(qx.Mean_head([1.0, 3.0]))",
                             env={"QX_LIBRARY_DIR": str(library), "PYTHONPATH": str(SOURCE / "python")}),
                         "2.0\n")


@unittest.skipUnless("QX_TEST_ALL" in os.environ, "links the whole library once more: ./test --all")
class AsFolder(Using):
    def test_add_subdirectory(self):
        # Every source must have the same options as in this build, so that its objects serve again.
        same = re.findall(r"^(CMAKE_BUILD_TYPE|CMAKE_C(?:XX)?_FLAGS\w*):\w+=(.*)",
                          (BUILD / "CMakeCache.txt").read_text("utf-8"), re.MULTILINE)
        folder = self.folder / "build"
        launcher = ";".join(map(str, ("/usr/bin/python3", CONSUMER / "compiled_before.py", BUILD, folder / "qxanalysis")))
        self.built(folder, f"-DQX_SOURCE={SOURCE}", *(f"-D{name}={value}" for name, value in same),
                   f"-DCMAKE_C_COMPILER_LAUNCHER={launcher}", f"-DCMAKE_CXX_COMPILER_LAUNCHER={launcher}")


class Readme(Using):
    """The blocks of the README do what they say."""

    TEXT = (SOURCE / "README.md").read_text("utf-8")

    def block(self, language):
        """The blocks of a language, each of which continues the previous one."""
        return "".join(re.findall(rf"```{language}\n(.*?)```", self.TEXT, re.DOTALL))

    def compiled(self, start):
        """Runs the compile line that begins with `start`, with this build; returns the program's output."""
        line = re.search(rf"^    ({re.escape(start)} .*)$", self.TEXT, re.MULTILINE)[1]
        line = re.sub(r"(\$PWD/)?build/release", str(BUILD), line)
        line = line.replace("-Iinclude", f"-I{SOURCE}/include")
        run("sh", "-c", line.replace(" examples/", f" {EXAMPLES}/"), cwd=self.folder)
        return run(self.folder / "a.out", cwd=self.folder)

    def test_c_and_cpp(self):
        (self.folder / "first.c").write_text(self.block("c"), "utf-8")
        self.assertRegex(self.compiled("cc"), r"^2\.33333 \(")
        self.holds(self.compiled("c++ -std=c++20"))

    def test_python(self):
        ran = subprocess.run(["/usr/bin/python3", "-c", self.block("python")], capture_output=True, text=True,
                             env={"PYTHONPATH": str(SOURCE / "python"), "QX_LIBRARY_DIR": str(BUILD)})
        self.assertRegex(ran.stderr.strip().split("\n")[-1], "Error: Mean_head.*ErrEmptyInput")
        self.assertIn("Gives moment.", ran.stdout)

    def test_packages_are_those_that_are_installed(self):
        script = (SOURCE / "tools/setup/native").read_text("utf-8")
        installed = re.search(r'^packages="(.*?)"', script, re.MULTILINE | re.DOTALL)[1].split()
        told = re.search(r"^Packages: `(.*?)`", self.TEXT, re.MULTILINE | re.DOTALL)[1].split()
        self.assertEqual(told, installed)


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
