"""What tools/package makes, as those use it who get it.

    package_test.py SOURCE [TEST...]
"""

import os
import shutil
import subprocess
import sys
import tempfile
import unittest
import zipfile
from pathlib import Path

SOURCE = Path(sys.argv.pop(1)).resolve()
PACKAGES = SOURCE / "build/package"
ALL = "QX_TEST_ALL" in os.environ

# Compiled as by Visual C++, without its run-time library: what it returns is what its process ends with.
WITHOUT_RUN_TIME = r"""
#include "qx/basic_statistics.h"
#include "qx/frame.h"
#include "qx/host.h"
int _fltused = 1;
int start(void) {
    double samples[3];
    double mean = 0;
    ErrorCode err = 1;
    WorkspaceStatus status;
    DBL1D x;
    samples[0] = 1;
    samples[1] = 2;
    samples[2] = 6;
    x = QXHostCopy1D(QXTypeDBL, 3, samples);
    Mean_head(x, &mean, &err);
    if (err != 0 || mean != 3 || (*x)->dimSize != 3 || ((DBL *)QXHostElements1D(x))[2] != 6)
        return 1;
    QXHostFree(x);
    status.status = 0;
    status.code = 1;
    InitializeAnalysisWorkspaceH(-1, &status); /* a record without gaps */
    return status.status == 1 && status.code < 0 ? 42 : 2;
}
"""


def run(*command, **more):
    """The output of a command; a failure shows all of it."""
    ran = subprocess.run([str(part) for part in command], text=True, stdout=subprocess.PIPE,
                         stderr=subprocess.STDOUT, **more)
    if ran.returncode != more.get("status", 0):
        raise AssertionError(f"{' '.join(map(str, command))}\n{ran.stdout[-3000:]}")
    return ran.stdout


class InAFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)


@unittest.skipUnless(ALL, "builds for Windows: ./test --all")
class Windows(InAFolder):
    @classmethod
    def setUpClass(cls):
        if not shutil.which("llvm-dlltool"):
            raise unittest.SkipTest("llvm is not installed")
        run(SOURCE / "tools/package", "windows")

    def setUp(self):
        super().setUp()
        with zipfile.ZipFile(next(PACKAGES.glob("*-win32.zip"))) as archive:
            archive.extractall(self.folder)
        self.place = next(self.folder.iterdir())

    def in_wine(self, program):
        ran = subprocess.run([SOURCE / "tools/wine-run", program], cwd=self.place, capture_output=True, text=True)
        if ran.returncode == 77:
            self.skipTest("there is no Wine here")
        return ran

    def test_first_programs(self):
        for compiler, source in (("gcc -std=c11", "first_call.c"), ("g++ -std=c++20 -static", "first_call.cpp")):
            run("sh", "-c", f"i686-w64-mingw32-{compiler} -Iinclude examples/{source} lib/qxanalysis.lib lib/qxrt.lib"
                " -o first_call.exe", cwd=self.place)
            self.assertRegex(self.in_wine("first_call.exe").stdout, r"mean +5(?s:.*)ErrOrderNotPositive")

    def test_import_libraries_of_visual_cpp(self):
        for tool in ("clang", "lld-link"):
            if not shutil.which(tool):
                self.skipTest(f"{tool} is not installed")
        (self.place / "start.c").write_text(WITHOUT_RUN_TIME, "utf-8")
        run("clang", "--target=i686-pc-windows-msvc", "-ffreestanding", "-Iinclude", "-c", "start.c", cwd=self.place)
        run("lld-link", "/subsystem:console", "/entry:start", "/nodefaultlib", "/safeseh:no", "start.o",
            "lib/qxanalysis.lib", "lib/qxrt.lib", "/out:start.exe", cwd=self.place)
        self.assertEqual(self.in_wine("start.exe").returncode, 42)

    def test_wheel_has_the_libraries(self):
        with zipfile.ZipFile(next(PACKAGES.glob("*-py3-none-win32.whl"))) as wheel:
            names = set(wheel.namelist())
        self.assertLessEqual({"qx/qxanalysis.dll", "qx/qxrt.dll", "qx/catalogue.json", "qx/exports.pyi"}, names)
        self.assertFalse([name for name in names if name.endswith(".so")])


if __name__ == "__main__":
    unittest.main()
