#!/usr/bin/python3
"""record.py LOG FOLDER COMMIT: writes the output of a benchmark (LOG) as figures to FOLDER/FAMILY-TIME.json,
with the machine, the width and the state of the sources."""

import datetime
import json
import os
import platform
import subprocess
import sys
from pathlib import Path


def machine():
    """The machine of the measurement, described by names that do not change from run to run."""
    shown = subprocess.run(["lscpu"], capture_output=True, text=True, check=True).stdout
    facts = dict(line.split(":", 1) for line in shown.splitlines() if ":" in line)
    caches = ", ".join(f"{name} {facts[name + ' cache'].strip()}" for name in ("L1d", "L2", "L3")
                       if name + " cache" in facts)
    return (f"{facts['Model name'].strip()} (family {facts['CPU family'].strip()}, model "
            f"{facts['Model'].strip()}), {os.cpu_count()} processors, {caches}; "
            f"{platform.system()} {platform.release()}")


def read(text):
    """The figures of a run: rows, missing peers, and where it was stopped."""
    rows, missing, stopped, builds = [], [], None, set()
    for line in text.splitlines():
        if line.startswith("missing peer: "):
            missing.append(line.removeprefix("missing peer: "))
        elif line.startswith("stopped: "):
            stopped = line.removeprefix("stopped: ")
        elif line.startswith("summary | "):
            cells = [cell.strip() for cell in line.split("|")[1:]]
            if len(cells) != 8:
                raise SystemExit(f"a name in a summary holds a bar, which ends a cell: {line}")
            what, peer, mean, worst, case, count, width, compiler = cells
            builds.add((width, compiler))
            if mean != "missing":
                rows.append({"what": what, "peer": peer, "mean": float(mean), "worst": float(worst),
                             "case": case, "count": int(count)})
    names = [(row["what"], row["peer"]) for row in rows]
    if len(builds) > 1 or len(names) > len(set(names)):
        raise SystemExit("a run of one build, with a name of its own for each row, is needed")
    width, compiler = builds.pop() if builds else ("", "")
    return {"width": width, "compiler": compiler, "rows": rows, "missing": missing, "stopped": stopped}


def main(log, folder, commit):
    log = Path(log)
    now = datetime.datetime.now(datetime.timezone.utc)
    run = {"family": log.stem, "time": now.isoformat(timespec="seconds"), "commit": commit, "machine": machine(),
           "load": round(os.getloadavg()[0], 1), **read(log.read_text("utf-8"))}
    path = Path(folder) / f"{log.stem}-{now:%Y%m%dT%H%M%S}.json"
    path.write_text(json.dumps(run, indent=1, ensure_ascii=False) + "\n", "utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
