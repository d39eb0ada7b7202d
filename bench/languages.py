"""The cost of a call from each language: Mean_head on 10 values.

"kept" calls with an existing array; "made" makes the array, calls, and releases it, as the topic functions of C++
and Python and the function of Octave always do. Each is the best of many rounds. The last column is the ratio to
C called in the same way. Languages that are not installed are listed.
"""

import os
import re
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "tools"))
import bindings  # noqa: E402

BUILD = Path(os.environ.get("QX_LIBRARY_DIR", ROOT / "build/release")).resolve()
PATH = "/usr/sbin:/usr/bin:/sbin:/bin"
ROUNDS, CALLS = 200, 1000

C = r"""
#define _POSIX_C_SOURCE 199309L
#include "qx/basic_statistics.h"
#include "qx/host.h"
#include <stdio.h>
#include <time.h>
static double now(void) { struct timespec t; clock_gettime(CLOCK_MONOTONIC, &t); return t.tv_sec + 1e-9 * t.tv_nsec; }
int main(void) {
    double values[10] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9}, mean, best[2] = {1, 1};
    ErrorCode err;
    DBL1D x = QXHostCopy1D(QXTypeDBL, 10, values);
    for (int round = 0; round < ROUNDS; ++round) {
        double start = now();
        for (int i = 0; i < CALLS; ++i) Mean_head(x, &mean, &err);
        double between = now();
        for (int i = 0; i < CALLS; ++i) {
            DBL1D made = QXHostCopy1D(QXTypeDBL, 10, values);
            Mean_head(made, &mean, &err);
            QXHostFree(made);
        }
        double end = now();
        if ((between - start) / CALLS < best[0]) best[0] = (between - start) / CALLS;
        if ((end - between) / CALLS < best[1]) best[1] = (end - between) / CALLS;
    }
    printf("kept %.1f\nmade %.1f\n", 1e9 * best[0], 1e9 * best[1]);
    return 0;
}
"""
CPP = r"""
#include "qx/qx.hpp"
#include <algorithm>
#include <chrono>
#include <cstdio>
int main() {
    const std::vector<double> x{0, 1, 2, 3, 4, 5, 6, 7, 8, 9};
    double best = 1, sum = 0;
    for (int round = 0; round < ROUNDS; ++round) {
        const auto start = std::chrono::steady_clock::now();
        for (int i = 0; i < CALLS; ++i) sum += qx::stats::mean(x);
        best = std::min(best, std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count() / CALLS);
    }
    std::printf("made %.1f\n", 1e9 * best + 0 * sum);
}
"""
RUST = r"""
use qxanalysis_sys::*;
use std::time::Instant;
fn main() {
    let values = [0.0, 1.0, 2.0, 3.0, 4.0, 5.0, 6.0, 7.0, 8.0, 9.0];
    let (x, mut mean, mut err, mut best) = (array(&values), 0.0, 0, [1.0f64; 2]);
    for _ in 0..ROUNDS {
        let start = Instant::now();
        for _ in 0..CALLS { unsafe { Mean_head(x, &mut mean, &mut err); } }
        let between = Instant::now();
        for _ in 0..CALLS {
            let made = array(&values);
            unsafe { Mean_head(made, &mut mean, &mut err); QXHostFree(made.cast()); }
        }
        best[0] = best[0].min((between - start).as_secs_f64() / CALLS as f64);
        best[1] = best[1].min(between.elapsed().as_secs_f64() / CALLS as f64);
    }
    println!("kept {:.1}\nmade {:.1}", 1e9 * best[0], 1e9 * best[1]);
}
"""
CSHARP = r"""
using System;
using System.Diagnostics;
using QX;
static class Program {
    static void Main() {
        double[] values = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9}, best = {1, 1};
        IntPtr x = Host.Array(values);
        double mean; int err;
        double tick = 1.0 / Stopwatch.Frequency / CALLS;
        for (int round = 0; round < ROUNDS; ++round) {
            long start = Stopwatch.GetTimestamp();
            for (int i = 0; i < CALLS; ++i) Exports.Mean_head(x, out mean, out err);
            long between = Stopwatch.GetTimestamp();
            for (int i = 0; i < CALLS; ++i) {
                IntPtr made = Host.Array(values);
                Exports.Mean_head(made, out mean, out err);
                Host.QXHostFree(made);
            }
            long end = Stopwatch.GetTimestamp();
            best[0] = Math.Min(best[0], (between - start) * tick);
            best[1] = Math.Min(best[1], (end - between) * tick);
        }
        Console.WriteLine(FormattableString.Invariant($"kept {1e9 * best[0]:F1}\nmade {1e9 * best[1]:F1}"));
    }
}
"""
PYTHON = r"""
import time, numpy, qx
x = numpy.arange(10.0)
for name, function in (("export", qx.exports.Mean_head), ("topic", qx.stats.mean)):
    best = 1.0
    for _ in range(ROUNDS // 10):
        start = time.perf_counter()
        for _ in range(CALLS): function(x)
        best = min(best, (time.perf_counter() - start) / CALLS)
    print(name, f"{1e9 * best:.1f}")
"""
OCTAVE = r"""
x = 0:9; best = 1;
for round = 1:10
  start = tic (); for i = 1:CALLS qx ("Mean_head", x); end
  best = min (best, toc (start) / CALLS);
end
printf ("made %.1f\n", 1e9 * best);
"""
JULIA = r"""
import QXAnalysis
const QX = QXAnalysis
function measured()
    values, mean, err, best = collect(0.0:9.0), Ref(0.0), Ref(Int32(0)), [1.0, 1.0]
    x = QX.array(values)
    for round in 1:ROUNDS
        best[1] = min(best[1], @elapsed(for i in 1:CALLS QX.Mean_head(x, mean, err) end) / CALLS)
        best[2] = min(best[2], @elapsed(for i in 1:CALLS
            made = QX.array(values); QX.Mean_head(made, mean, err); QX.release(made) end) / CALLS)
    end
    println("kept ", 1e9 * best[1], "\nmade ", 1e9 * best[2])
end
measured()
"""


def run(folder, *command):
    environment = {**os.environ, "PATH": PATH, "LD_LIBRARY_PATH": str(BUILD), "QX_LIBRARY_DIR": str(BUILD),
                   "PYTHONPATH": str(ROOT / "python")}
    return subprocess.run(list(map(str, command)), cwd=folder, env=environment, check=True, stdout=subprocess.PIPE,
                          text=True).stdout


def languages():
    """Language, what must be installed, its source, and the commands; the last one measures."""
    linked = (f"-I{ROOT}/include", f"-I{BUILD}/include", f"-L{BUILD}", "-lqxanalysis", "-lqxrt", "-o", "program")
    rustc = ("rustc", "-O", "--edition", "2021", "-L", BUILD)
    yield "C", "gcc", "c.c", C, [["gcc", "-O2", "c.c", *linked], ["./program"]]
    yield "C++", "g++", "cpp.cpp", CPP, [["g++", "-O2", "-std=c++20", "cpp.cpp", *linked], ["./program"]]
    yield "Rust", "rustc", "rust_call.rs", RUST, [
        [*rustc, "--crate-type", "lib", "--crate-name", "qxanalysis_sys", "rust/src/lib.rs"],
        [*rustc, "rust_call.rs", "--extern", "qxanalysis_sys=libqxanalysis_sys.rlib"], ["./rust_call"]]
    yield "C#", "mcs", "Program.cs", CSHARP, [
        ["mcs", "-optimize", "Program.cs", "csharp/Exports.cs", "csharp/Host.cs"], ["mono", "Program.exe"]]
    yield "Julia", "julia", "julia.jl", JULIA, [["julia", "--project=julia", "julia.jl"]]
    yield "Octave", "mkoctfile", "octave.m", OCTAVE, [
        ["mkoctfile", "-std=c++20", "-O1", "octave/qx.cc", f"-I{ROOT}/include", f"-I{BUILD}/include", f"-L{BUILD}",
         "-lqxanalysis", "-lqxrt"], ["octave-cli", "octave.m"]]
    yield "Python", "python3", "python.py", PYTHON, [["python3", "python.py"]]


def main():
    first = {}
    with tempfile.TemporaryDirectory() as folder:
        bindings.main(BUILD / "catalogue.json", folder)
        for language, needed, file, text, commands in languages():
            if not shutil.which(needed, path=PATH):
                print(f"{language:8} is not installed ({needed})")
                continue
            text = re.sub(r"\bCALLS\b", str(CALLS), re.sub(r"\bROUNDS\b", str(ROUNDS), text))
            Path(folder, file).write_text(text, "utf-8")
            for command in commands:
                shown = run(folder, *command)
            for line in shown.splitlines():
                way, nanoseconds = line.split()
                first.setdefault(way, float(nanoseconds))
                beside = first["kept" if way == "kept" else "made"]
                print(f"{language:8} {way:8} {float(nanoseconds):10.1f} ns {float(nanoseconds) / beside:8.2f}", flush=True)


if __name__ == "__main__":
    main()
