"""The declarations for other languages (tools/bindings.py): the first program of each, and the records as C
lays them out. A language that is not installed is skipped.

    bindings_test.py SOURCE BUILD
"""

import json
import os
import shutil
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

SOURCE, BUILD = (Path(name).resolve() for name in sys.argv[1:3])
del sys.argv[1:3]
sys.path.insert(0, str(SOURCE / "tools"))
import bindings  # noqa: E402

DUE = ["mean 5", "modes [4] (code 0)"]
CATALOGUE = json.loads((BUILD / "catalogue.json").read_text("utf-8"))
RECORDS = [name for name in CATALOGUE["records"] if not name.startswith("Array")]
DEBIAN_PATH = "/usr/sbin:/usr/bin:/sbin:/bin"
ENVIRONMENT = {**os.environ, "PATH": DEBIAN_PATH, "LD_LIBRARY_PATH": str(BUILD), "QX_LIBRARY_DIR": str(BUILD)}


def installed(*commands):
    return all(shutil.which(command, path=DEBIAN_PATH) for command in commands)


class Language(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        bindings.main(BUILD / "catalogue.json", self.folder)

    def run_in(self, *command):
        ran = subprocess.run([str(part) for part in command], cwd=self.folder, env=ENVIRONMENT, text=True,
                             stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
        self.assertEqual(ran.returncode, 0, f"{command}\n{ran.stdout[-3000:]}")
        return ran.stdout.strip().split("\n")

    def sizes_in_c(self):
        includes = "".join(f'#include "{family["header"]}"\n' for family in CATALOGUE["families"])
        lines = "".join(f'printf("{name} %zu\\n", sizeof({name}));\n' for name in RECORDS)
        (self.folder / "sizes.c").write_text(f"#include <stdio.h>\n{includes}int main(void) {{\n{lines}}}\n", "utf-8")
        self.run_in("cc", "-I", SOURCE / "include", "sizes.c", "-o", "sizes_in_c")
        return self.run_in("./sizes_in_c")


class AllLanguages(Language):
    def test_every_export_is_declared_with_its_text(self):
        for file, mark in (("rust/src/exports.rs", "pub fn {}("), ("csharp/Exports.cs", " {}("),
                           ("julia/src/exports.jl", "ccall((:{},")):
            text = (self.folder / file).read_text("utf-8")
            missing = [one["name"] for one in CATALOGUE["exports"] if mark.format(one["name"]) not in text]
            self.assertEqual(missing, [], file)
            self.assertIn("Arithmetic mean, sum(x) / n", text, file)


@unittest.skipUnless(installed("rustc"), "Debian's rustc is not installed")
class Rust(Language):
    def test_first_call_and_records(self):
        lines = "".join(f'    println!("{name} {{}}", size_of::<qxanalysis_sys::{name}>());\n' for name in RECORDS)
        (self.folder / "sizes.rs").write_text(f"use std::mem::size_of;\nfn main() {{\n{lines}}}\n", "utf-8")
        rustc = ("rustc", "--edition", "2021", "-D", "warnings", "-L", BUILD)
        self.run_in(*rustc, "--crate-type", "lib", "--crate-name", "qxanalysis_sys", "rust/src/lib.rs")
        for program in ("rust/examples/first_call.rs", "sizes.rs"):
            self.run_in(*rustc, program, "--extern", "qxanalysis_sys=libqxanalysis_sys.rlib")
        self.assertEqual(self.run_in("./first_call"), ["mean 5", "modes [4.0] (code 0)", "order 0: ErrOrderNotPositive"])
        self.assertEqual(self.run_in("./sizes"), self.sizes_in_c())


@unittest.skipUnless(installed("mcs", "mono"), "Debian's C# compiler, mono-mcs, is not installed")
class CSharp(Language):
    def test_first_call_and_records(self):
        lines = "".join(f'Console.WriteLine("{name} {{0}}", Marshal.SizeOf(typeof(QX.{name})));\n' for name in RECORDS)
        (self.folder / "Sizes.cs").write_text("using System;\nusing System.Runtime.InteropServices;\nstatic class Sizes"
                                              f" {{ static void Main() {{\n{lines}}} }}\n", "utf-8")
        for program in ("csharp/FirstCall.cs", "Sizes.cs"):
            self.run_in("mcs", "-warnaserror", f"-out:{Path(program).stem}.exe", "csharp/Exports.cs", "csharp/Host.cs",
                        program)
        self.assertEqual(self.run_in("mono", "FirstCall.exe"), [*DUE, "order 0: ErrOrderNotPositive"])
        self.assertEqual(self.run_in("mono", "Sizes.exe"), self.sizes_in_c())


# A record that a call changes, and one without gaps.
JULIA_RECORDS = """
import QXAnalysis
const QX = QXAnalysis
x, state = QX.array([0.0, 1, 0]), Ref(QX.TriggerState(0, 0, 0, 0, 0.0))
index, position = Ref(Int32(0)), Ref(0.0)
QX.Triggerh_86(x, 0.5, 0.0, 0, 0, 0, state, index, position)
println("trigger ", index[], " ", state[].hasLast)
status = Ref(QX.WorkspaceStatus(1, QX.ErrOutOfMemory))
QX.EnableAnalysisWorkspaceH(status)
println("status ", status[].status, " ", QX.error_name(status[].code))
"""


class Julia(Language):
    DUE = ["mean 5.0", "modes [4.0] (code 0)", "order 0: ErrOrderNotPositive", "trigger 1 1", "status 1 ErrOutOfMemory"]

    def setUp(self):
        super().setUp()
        names = [name for name in RECORDS if name not in bindings.JULIA]  # complex numbers are Julia's own
        (self.folder / "records.jl").write_text(JULIA_RECORDS + "".join(
            f'println("{name} ", sizeof(QX.{name}))\n' for name in names), "utf-8")
        self.due = self.DUE + [line for line in self.sizes_in_c() if line.split()[0] in names]

    @unittest.skipUnless(installed("julia"), "julia is not installed; Debian 12 has no package")
    def test_first_call_and_records(self):
        found = [*self.run_in("julia", "--project=julia", "julia/first_call.jl"),
                 *self.run_in("julia", "--project=julia", "records.jl")]
        self.assertEqual(found, self.due)

    @unittest.skipUnless("QX_TEST_OTHER_DEBIAN" in os.environ, "needs a network and minutes: QX_TEST_OTHER_DEBIAN=1")
    def test_with_the_julia_of_debian_11(self):
        made = subprocess.run([SOURCE / "tools/setup/other-root", "bullseye"], stdout=subprocess.PIPE, text=True)
        if made.returncode:
            self.skipTest("a bullseye root cannot be made here")
        root = Path(made.stdout.strip())
        subprocess.run(["cmake", "--build", BUILD, "--target", "portable"], check=True, stdout=subprocess.DEVNULL)
        for source, name in ((self.folder, "bindings"), (BUILD / "portable", "libraries")):
            shutil.copytree(source, root / "opt" / name, dirs_exist_ok=True)
        shutil.copy("/etc/resolv.conf", root / "etc/resolv.conf")
        inside = """which julia >/dev/null || { apt-get update -qq && apt-get install -y -qq --no-install-recommends julia
            } >/tmp/julia.log 2>&1
            cd /opt/bindings && export HOME=/tmp QX_LIBRARY_DIR=/opt/libraries
            for program in julia/first_call.jl records.jl; do julia --project=julia $program; done"""
        # Julia needs /proc. What is mounted in a separate namespace disappears with it.
        shown = self.run_in("unshare", "--mount", "--propagation", "private", "sh", "-ec", f"""
            mount -t proc proc {root}/proc && mount --bind /dev {root}/dev
            DEBIAN_FRONTEND=noninteractive exec env -u LD_LIBRARY_PATH chroot {root} sh -ec '{inside}'""")
        self.assertEqual(shown[-len(self.due):], self.due)


@unittest.skipUnless("QX_TEST_OCTAVE" in os.environ and installed("mkoctfile", "octave-cli"),
                     "compiles for a minute and needs Debian's octave-dev: QX_TEST_OCTAVE=1")
class Octave(Language):
    def test_first_call(self):
        self.run_in("mkoctfile", "-std=c++20", "-O0", "octave/qx.cc", f"-I{SOURCE}/include", f"-I{BUILD}/include",
                    f"-L{BUILD}", "-lqxanalysis", "-lqxrt")
        found = self.run_in("octave-cli", "--path", self.folder, "octave/first_call.m")
        self.assertEqual(found, ["mean 5", "modes [4]", "Moment_head: The order, degree or number of taps is out of "
                                 "range; it must be at least 1. (ErrOrderNotPositive)", "residual 0"])
        for call, message in (('"Mean_head", 1, 2', "Mean_head: 1 inputs are needed"),
                              ('"Moment_head", [1 2], 1.5', "qx: input 2: 1.5 is not an integer of 32 bits"),
                              ('"Moment_head", [1 2], NaN', "qx: input 2: nan is not an integer of 32 bits"),
                              ('"Moment_head", [1 2], 1e12', "qx: input 2: 1000000000000 is not an integer of 32 bits"),
                              ('"Moment_head", [1 2], 2i', "qx: input 2: a real number is needed"),
                              ('"Moment_head", [1 2], [1 2]', "qx: input 2: one number is needed"),
                              ('"Mean_head", [1 2i]', "qx: input 1: real numbers are needed")):
            refused = subprocess.run(["octave-cli", "--path", self.folder, "--eval", f"qx ({call})"],
                                     env=ENVIRONMENT, capture_output=True, text=True)
            self.assertIn(message, refused.stderr, call)


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
