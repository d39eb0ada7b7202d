#!/usr/bin/python3
"""speed_page.py LOG...: the page docs/speed.md from what the benchmarks have printed."""

import datetime
import os
import platform
import subprocess
import sys
from pathlib import Path

HEAD = """# Speed

Written by `bench/run --all`. Each row is a geometric mean of the ratios time of ours / time of the
peer, one thread, plans and the like made outside the timed loop; below 1 is faster than the peer.
The shortest of interleaved runs; on a machine with a load of its own (below) single worst cases say
little, and FFTW_MEASURE, which plans by timing and for ten seconds at most, chooses badly for the
longest transforms.
"""


def machine():
    """What the figures were measured on."""
    facts = dict(line.split(":", 1) for line in
                 subprocess.run(["lscpu"], capture_output=True, text=True,
                                check=True).stdout.splitlines() if ":" in line)
    caches = ", ".join(f"{name} {facts[name + ' cache'].strip()}" for name in ("L1d", "L2", "L3")
                       if name + " cache" in facts)
    return (f"{facts['Model name'].strip()} (family {facts['CPU family'].strip()}, model "
            f"{facts['Model'].strip()}), {os.cpu_count()} processors, {caches}; "
            f"{platform.system()} {platform.release()}, {datetime.date.today().isoformat()}, load "
            f"average {os.getloadavg()[2]:.1f}")


def main():
    family, rows, builds, absent, stopped = None, [], set(), [], []
    for line in (line for log in sys.argv[1:] for line in Path(log).read_text().splitlines()):
        if line.startswith("== "):
            family = line[3:]
        elif line.startswith("missing peer: "):
            absent.append(f"- `{family}`: {line.removeprefix('missing peer: ')}")
        elif line.startswith("stopped: "):
            stopped.append(f"- `{family}`, {line.removeprefix('stopped: ')}")
        elif line.startswith("summary | "):
            what, peer, mean, worst, case, count, width, compiler = [
                cell.strip() for cell in line.split(" |")[1:]]
            builds.add((width, compiler))
            rows.append(f"| {family} | {what} | {peer} | {mean} | {worst} | {case} | {count} |")
    print(HEAD)
    print(f"Machine: {machine()}.\n")
    for width, compiler in sorted(builds):
        print(f"Width {width}, {compiler}.\n")
    print("| Family | What | Peer | Mean | Worst | At | Cases |\n|---|---|---|---|---|---|---|")
    print("\n".join(rows))
    if stopped:
        print("\nStopped before their end, so that groups of cases are missing:\n")
        print("\n".join(stopped))
    if absent:
        print("\nPeers that were not installed:\n")
        print("\n".join(absent))


if __name__ == "__main__":
    main()
