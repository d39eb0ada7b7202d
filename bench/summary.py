"""The summary line of a benchmark in Python, in the form that bench/timing.h prints for those in C++."""

import math
import os
import re
import subprocess
from pathlib import Path


def width():
    if os.uname().machine == "aarch64":
        return "NEON"
    flags, most = Path("/proc/cpuinfo").read_text().split(), os.environ.get("QX_WIDTH")
    if most not in ("2", "4") and {"avx512f", "avx512dq", "avx512bw", "avx512vl"} <= set(flags):
        return "AVX-512"
    return "AVX2" if most != "2" and "avx2" in flags else "SSE2"


def compiler():
    """The compiler that the module itself names."""
    module = Path(os.environ.get("QX_LIBRARY_DIR", "build/release")) / "libqxanalysis.so"
    comment = subprocess.run(["readelf", "-p", ".comment", module], capture_output=True, text=True)
    found = re.search(r"(GCC|clang).*?(\d+\.\d+\.\d+)", comment.stdout)
    return f"{'g++' if found[1] == 'GCC' else 'clang++'} {found[2]}" if found else "unknown compiler"


def print_summary(what, peer, ratios):
    """Prints the summary of `ratios`, pairs of ours/peer and the name of the case."""
    mean = math.exp(sum(math.log(ratio) for ratio, _ in ratios) / len(ratios))
    worst, case = max(ratios)
    print(f"summary | {what} | {peer} | {mean:.4g} | {worst:.4g} | {case} | {len(ratios)} | "
          f"{width()} | {compiler()}")
