"""The packages that tools/package makes, used as their recipients use them.

    package_test.py SOURCE [TEST...]
"""

import base64
import csv
import functools
import hashlib
import os
import re
import shutil
import subprocess
import sys
import tarfile
import unittest
import zipfile
from pathlib import Path

from in_a_folder import InAFolder, run

SOURCE = Path(sys.argv.pop(1)).resolve()
PACKAGES = SOURCE / "build/package"
ALL = "QX_TEST_ALL" in os.environ

# Compiled as by Visual C++, without its run-time library: the return value is the exit status of the process.
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
    EnableAnalysisWorkspaceH(&status); /* a record without gaps; no region is reserved */
    return status.status == 1 && status.code < 0 ? 42 : 2;
}
"""


LOADS = r"""
#include "qx/types.h"
#include <stdio.h>
#include <windows.h>
int main(void) {
    HMODULE host = LoadLibraryA("site\\qx\\qxrt.dll"), module = LoadLibraryA("site\\qx\\qxanalysis.dll");
    if (host == NULL || module == NULL)
        return 1;
    DBL1D (*copy)(int32_t, int32_t, const void *) = (void *)GetProcAddress(host, "QXHostCopy1D");
    ErrorCode (*mean)(DBL1D, double *, ErrorCode *) = (void *)GetProcAddress(module, "Mean_head");
    const double samples[] = {1, 2, 6};
    double found = 0;
    ErrorCode err = 1;
    mean(copy(10, 3, samples), &found, &err);
    printf("%g %d\n", found, (int)err);
    return 0;
}
"""


@functools.cache
def make_windows_packages():
    run(SOURCE / "tools/package", "windows")


class Windows:
    """The zip and the wheel for one of the two Windows targets."""

    @classmethod
    def setUpClass(cls):
        if not shutil.which("llvm-dlltool"):
            raise unittest.SkipTest("llvm is not installed")
        make_windows_packages()

    def setUp(self):
        super().setUp()
        with zipfile.ZipFile(next(PACKAGES.glob(f"*-{self.platform}.zip"))) as archive:
            archive.extractall(self.folder)
        self.place = next(self.folder.iterdir())

    def in_wine(self, program):
        ran = subprocess.run([SOURCE / "tools/wine-run", program], cwd=self.place, capture_output=True, text=True)
        if ran.returncode == 77:
            self.skipTest("there is no Wine here")
        return ran

    def test_first_programs(self):
        for compiler, source in (("gcc -std=c11", "first_call.c"), ("g++ -std=c++20 -static", "first_call.cpp")):
            run("sh", "-c", f"{self.processor}-w64-mingw32-{compiler} -Iinclude examples/{source}"
                " lib/qxanalysis.lib lib/qxrt.lib -o first_call.exe", cwd=self.place)
            self.assertRegex(self.in_wine("first_call.exe").stdout, r"mean +5(?s:.*)ErrOrderNotPositive")

    def test_import_libraries_of_visual_cpp(self):
        for tool in ("clang", "lld-link"):
            if not shutil.which(tool):
                self.skipTest(f"{tool} is not installed")
        (self.place / "start.c").write_text(WITHOUT_RUN_TIME, "utf-8")
        run("clang", f"--target={self.processor}-pc-windows-msvc", "-ffreestanding", "-Iinclude", "-c", "start.c",
            cwd=self.place)
        run("lld-link", "/subsystem:console", "/entry:start", "/nodefaultlib", *self.options, "start.o",
            "lib/qxanalysis.lib", "lib/qxrt.lib", "/out:start.exe", cwd=self.place)
        self.assertEqual(self.in_wine("start.exe").returncode, 42)

    def test_wheel(self):
        wheel = next(PACKAGES.glob(f"*-py3-none-{self.platform}.whl"))
        with zipfile.ZipFile(wheel) as archive:
            files = {name: archive.read(name) for name in archive.namelist()}
        information = next(name for name in files if name.endswith(".dist-info/WHEEL")).rpartition("/")[0]
        self.assertIn(f"Tag: py3-none-{self.platform}\n", files[f"{information}/WHEEL"].decode())
        self.assertIn("Root-Is-Purelib: false\n", files[f"{information}/WHEEL"].decode())
        self.assertIn("Name: qxanalysis\n", files[f"{information}/METADATA"].decode())
        recorded = {name: digest for name, digest, _ in csv.reader(files[f"{information}/RECORD"].decode().splitlines())}
        self.assertEqual(recorded.pop(f"{information}/RECORD"), "")
        self.assertEqual(recorded, {name: f"sha256={base64.urlsafe_b64encode(hashlib.sha256(content).digest()).decode()}"
                                    .rstrip("=") for name, content in files.items() if not name.endswith("/RECORD")})
        self.assertLessEqual({"qx/qxanalysis.dll", "qx/qxrt.dll", "qx/catalogue.json", "qx/exports.pyi"}, set(files))
        self.assertFalse([name for name in files if name.endswith(".so")])

    def test_libraries_of_the_wheel(self):
        """Loaded by their paths, as the Python package loads them, without their folder on the search path."""
        with zipfile.ZipFile(next(PACKAGES.glob(f"*-py3-none-{self.platform}.whl"))) as archive:
            archive.extractall(self.place / "site")
        for name in ("qxanalysis.dll", "qxrt.dll"):
            needed = re.findall(r"DLL Name: (\S+)", run("objdump", "-p", self.place / "site/qx" / name))
            self.assertLessEqual({one.lower() for one in needed}, {"kernel32.dll", "msvcrt.dll", "user32.dll"}, name)
            (self.place / name).unlink()
        (self.place / "load.c").write_text(LOADS, "utf-8")
        run(f"{self.processor}-w64-mingw32-gcc", "-std=c11", "-Iinclude", "load.c", "-o", "load.exe", cwd=self.place)
        self.assertEqual(self.in_wine("load.exe").stdout.split(), ["3", "0"])


@unittest.skipUnless(ALL, "builds for Windows: ./test --all")
class Windows32(Windows, InAFolder):
    platform, processor, options = "win32", "i686", ["/safeseh:no"]


@unittest.skipUnless(ALL, "builds for Windows: ./test --all")
class Windows64(Windows, InAFolder):
    platform, processor, options = "win_amd64", "x86_64", []


THROWS = """
#include <cstdio>
#include <stdexcept>
#include <string>
static void f(int n) { std::string s(40, 'x'); if (n == 0) throw std::runtime_error("caught"); f(n - 1); }
int main() { try { f(9); } catch (const std::exception &e) { std::puts(e.what()); } }
"""


MEAN = """
import ctypes
host, module = (ctypes.CDLL("/opt/qx/qx/" + name) for name in ("libqxrt.so", "libqxanalysis.so"))
host.QXHostCopy1D.restype = ctypes.c_void_p
x = ctypes.c_void_p(host.QXHostCopy1D(10, 3, (ctypes.c_double * 3)(1, 2, 6)))
mean, err = ctypes.c_double(), ctypes.c_int(1)
module.Mean_head(x, ctypes.byref(mean), ctypes.byref(err))
print(mean.value, err.value)
"""


def unpacked(wheel, folder):
    """Unpacks a wheel as pip does, with the permissions of executable files."""
    with zipfile.ZipFile(wheel) as archive:
        for entry in archive.infolist():
            path = Path(archive.extract(entry, folder))
            if entry.external_attr >> 16 & 0o100:
                path.chmod(0o755)


def python_files():
    """The files of the Python package that every package must contain; the stubs are made anew."""
    place = SOURCE / "python/qx"
    found = {str(path.relative_to(place)) for path in place.rglob("*")
             if path.is_file() and "__pycache__" not in path.parts and path.suffix != ".pyi"}
    assert {"page.css", "commands/report.py"} <= found
    return found


def made_wheel():
    return Path(run(SOURCE / "tools/package", "wheel").strip())


@unittest.skipUnless(ALL, "links the libraries anew: ./test --all")
class Wheel(InAFolder):
    def test_it_is_verified_where_it_is_installed(self):
        wheel = made_wheel()
        version = re.search(r"-py3-none-manylinux_2_(\d+)_x86_64\.whl$", wheel.name)
        self.assertLessEqual(int(version[1]), 17)
        unpacked(wheel, self.folder)
        self.assertEqual({name for name in python_files() if not (self.folder / "qx" / name).exists()}, set())
        for name in ("libqxanalysis.so", "libqxrt.so", "print_hashes"):
            paths = re.findall(r"(?:RUNPATH|RPATH) +(\S+)", run("objdump", "-p", self.folder / "qx" / name))
            self.assertEqual(paths, ["$ORIGIN"], name)
        environment = {**os.environ, "PYTHONPATH": str(self.folder)}
        environment.pop("QX_LIBRARY_DIR", None)
        shown = run("/usr/bin/python3", "-m", "qx", "verify", env=environment, cwd="/")
        published = (SOURCE / "tests/conformance/hashes.txt").read_text("utf-8").splitlines()
        self.assertIn(f"{len(published)} of {len(published)} exports give the published bits", shown)
        # A differing bit and an export that is not published are reported.
        hashes = self.folder / "qx/hashes.txt"
        lines = [line.replace("Mean_head ", "Mean_head 0") for line in published if not line.startswith("Gauss ")]
        hashes.write_text("\n".join(lines), "utf-8")
        ran = subprocess.run(["/usr/bin/python3", "-m", "qx", "verify"], env=environment, capture_output=True, text=True)
        self.assertEqual(ran.returncode, 2)
        self.assertRegex(ran.stdout, r"^Gauss: \w+, published nothing\nMean_head: ")
        self.assertIn("2 exports give other results", ran.stderr)

    def test_exceptions_are_caught_without_help_of_the_c_library(self):
        (self.folder / "throws.cpp").write_text(THROWS, "utf-8")
        wrapped = ",".join(f"--wrap={name}" for name in ("dlopen", "dlsym", "dladdr1", "dlinfo", "pthread_once",
                                                         "__pthread_key_create"))
        run("g++", "-std=c++20", "throws.cpp", SOURCE / "src/frame/portable_linux.cpp", "-static-libstdc++",
            "-static-libgcc", "-Wl,--gc-sections", f"-Wl,{wrapped}", "-o", "throws", cwd=self.folder)
        self.assertEqual(run(self.folder / "throws"), "caught\n")
        self.assertNotRegex(run("objdump", "-T", self.folder / "throws"), "_dl_find_object.*GLIBC")


class DebianRules(InAFolder):
    def test_the_python_package_is_complete(self):
        if not Path("/usr/share/dpkg/architecture.mk").exists():
            self.skipTest("dpkg-dev is not installed")
        run("make", "-f", "debian/rules", "python-files", f"PYTHON={self.folder}", cwd=SOURCE)
        self.assertEqual({str(path.relative_to(self.folder)) for path in self.folder.rglob("*") if path.is_file()},
                         python_files())


@unittest.skipUnless("QX_TEST_OTHER_DEBIAN" in os.environ, "needs a network and minutes: QX_TEST_OTHER_DEBIAN=1")
class OtherDebian(InAFolder):
    """The wheel on a system with only Python and NumPy installed, and the Debian package."""

    def root_of(self, release):
        made = subprocess.run([SOURCE / "tools/setup/other-root", release], stdout=subprocess.PIPE, text=True)
        if made.returncode == 77:
            self.skipTest(f"a root of {release} cannot be made here")
        self.assertEqual(made.returncode, 0)
        return Path(made.stdout.strip())

    def inside(self, root, command):
        return run("chroot", root, "/usr/bin/env", "-i", "PATH=/usr/sbin:/usr/bin:/sbin:/bin", "sh", "-ec", command)

    def with_wheel(self, root):
        place = root / "opt/qx"
        shutil.rmtree(place, ignore_errors=True)
        unpacked(made_wheel(), place)

    def test_wheel_on_the_next_release(self):
        root = self.root_of("trixie")
        self.with_wheel(root)
        shown = self.inside(root, """cd / && export PYTHONPATH=/opt/qx
            python3 -c 'import qx; print(qx.stats.mean([1.0, 3.0]), qx.linalg.solve([[2, 1], [1, 3]], [3, 5]))'
            python3 -m qx verify""")
        self.assertRegex(shown, r"^2\.0 \[0\.8 1\.4\]\n(\d+) of \1 exports give the published bits")

    def test_libraries_on_the_release_before(self):
        # Its NumPy is too old for the package, so only the libraries are tested.
        root = self.root_of("bullseye")
        self.with_wheel(root)
        self.assertEqual(self.inside(root, f"python3 -c '{MEAN}'"), "3.0 0\n")

    def debian_package_on(self, release):
        run(SOURCE / "tools/package", "deb")
        root = self.root_of(release)
        package = next(PACKAGES.glob("qxanalysis_*.deb"))
        shutil.copy(package, root / "opt")
        shutil.copy("/etc/resolv.conf", root / "etc/resolv.conf")
        self.addCleanup(self.inside, root, "dpkg -P qxanalysis")
        self.inside(root, f"""export DEBIAN_FRONTEND=noninteractive; apt-get update -qq
            apt-get install -y --no-install-recommends /opt/{package.name}
            dpkg --verify qxanalysis""")
        place = "/usr/lib/python3/dist-packages/qx/"
        listed = self.inside(root, "dpkg -L qxanalysis").split("\n")
        self.assertEqual({place + name for name in python_files()} - set(listed), set())
        shown = self.inside(root, """cd / && python3 -c 'import qx; print(qx.stats.mean([1.0, 3.0]), qx.__version__)'
            ls /usr/include/qx/qx.hpp /usr/include/qx/qx.h /usr/lib/*/pkgconfig/qxanalysis.pc
            ls /usr/share/doc/qxanalysis/licences/NOTICE.md /usr/share/doc/qxanalysis/README.md""")
        self.assertRegex(shown, r"^2\.0 \d")
        self.assertRegex(self.inside(root, "cd / && python3 -m qx verify"), r"^(\d+) of \1 exports give the published bits")
        left = self.inside(root, """DEBIAN_FRONTEND=noninteractive apt-get remove -y qxanalysis >/dev/null 2>&1
            find / -xdev -name '*qxanalysis*' ! -path '/opt/*' ! -path '/var/*' ! -path '/proc/*'
            ls -d /usr/include/qx /usr/lib/python3/dist-packages/qx /usr/lib/*/libqx* 2>/dev/null || true""")
        self.assertEqual(left, "")

    def test_debian_package_on_its_release(self):
        self.debian_package_on("bookworm")

    def test_debian_package_on_the_next_release(self):
        self.debian_package_on("trixie")


@unittest.skipUnless(ALL, "builds from the archive: ./test --all")
class Source(InAFolder):
    def test_it_has_what_a_build_needs(self):
        archives = [Path(run(SOURCE / "tools/package", "source").strip()).read_bytes() for _ in range(2)]
        self.assertEqual(*archives, "the same files give the same archive")
        archive = next(PACKAGES.glob("*.tar.gz"))
        with tarfile.open(archive) as tar:
            tar.extractall(self.folder)
        place = next(self.folder.iterdir())
        run("cmake", "--preset", "release", "-DQX_TESTS=OFF", cwd=place)
        run("cmake", "--build", "build/release", "--target", "qxrt", cwd=place)


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
