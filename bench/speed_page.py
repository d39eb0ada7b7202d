#!/usr/bin/python3
"""speed_page.py FOLDER PAGE: writes the page of speeds, and its figures next to it (PAGE with .json), from the
runs that bench/record.py has written to FOLDER.

For each family and width, the page uses the two latest runs on the same machine with the same compiler and state
of the sources. A row is their geometric mean; it is marked if they differ by more than 3 %, if there is only
one, or if the mean has changed by more than 5 % since the previous page on the same machine. A family without
new runs keeps the figures of the previous page.
"""

import itertools
import json
import math
import sys
from pathlib import Path

AGREE, MOVED = 0.03, 0.05
HEAD = """# Speed

Written by `bench/run --all`, not by hand. Each row is a geometric mean of the ratios of our time to that of the
peer, with one thread, and with plans and the like made outside the timed loop; below 1 is faster than the peer.
Times are the minima of interleaved runs. On a loaded machine (see below), single worst cases say little, and
FFTW_MEASURE, which plans by timing for at most ten seconds, chooses badly for the longest transforms.
Since 23 November 2026 OpenBLAS, under LAPACK, NumPy and SciPy, runs its kernels of the same width (SkylakeX, Haswell
or Nehalem); the first two fuse products and sums, which the guarantee of equal bits excludes here.
The peer "elder" is our own older export, of which the row measures the revision ([revisions.md](revisions.md)).

"Runs" is empty if two runs of the benchmark agree within 3 %, and otherwise gives their difference, or says that
there was only one run. "Mean" is the geometric mean of the two, "Worst" the larger. "Before" is the mean on the
previous version of this page, if it has changed by more than 5 % on the same machine and width.
"""
SAME = ("machine", "width", "compiler", "commit")


def latest(folder):
    """The runs to use: {(family, width): [the latest, and the one before it if that is comparable]}."""
    runs = {}
    for path in sorted(Path(folder).glob("*.json")):
        run = json.loads(path.read_text("utf-8"))
        runs.setdefault((run["family"], run["width"]), []).append(run)
    chosen = {}
    for key, all_ in runs.items():
        newest = sorted(all_, key=lambda run: run["time"])[::-1]
        chosen[key] = [run for run in newest[:2] if all(run[name] == newest[0][name] for name in SAME)]
    return chosen


def merged(runs):
    """The figures of a family from its runs."""
    first = runs[0]
    rows = {}
    for row in itertools.chain(*(run["rows"] for run in reversed(runs))):
        rows.setdefault((row["what"], row["peer"]), []).append(row)
    figures = []
    for (what, peer), found in rows.items():
        means = [row["mean"] for row in found]
        worst = max(found, key=lambda row: row["worst"])
        figures.append({"what": what, "peer": peer, "mean": math.prod(means)**(1 / len(means)),
                        "apart": max(means) / min(means) - 1 if len(means) > 1 else None,
                        "worst": worst["worst"], "case": worst["case"], "count": worst["count"]})
    return {**{name: first[name] for name in ("family", "time", *SAME, "missing", "stopped")},
            "load": max(run["load"] for run in runs),
            "rows": figures}


def compared(now, before):
    """The figures, with the mean of the previous page in each row that has changed."""
    old = {}
    if before and before["machine"] == now["machine"]:
        old = {(row["what"], row["peer"]): row["mean"] for row in before["rows"]}
    rows = []
    for row in now["rows"]:
        was = old.get((row["what"], row["peer"]))
        moved = was is not None and max(row["mean"] / was, was / row["mean"]) > 1 + MOVED
        rows.append({**row, "before": was if moved else None})
    return {**now, "rows": rows}


def number(value):
    return f"{value:.2f}" if value >= 0.095 else f"{value:.2g}"


def line(family, row):
    apart = "one run" if row["apart"] is None else "" if row["apart"] <= AGREE else f"{100 * row['apart']:.0f} % apart"
    before = number(row["before"]) if row["before"] else ""
    return (f"| {family} | {row['what']} | {row['peer']} | {number(row['mean'])} | {apart} | {before} | "
            f"{number(row['worst'])} | {row['case']} | {row['count']} |")


def page(figures):
    lines = [HEAD]
    build = {name: lambda one, name=name: one[name] for name in ("machine", "width", "compiler")}
    for key, families in itertools.groupby(
            sorted(figures, key=lambda one: (*(get(one) for get in build.values()), one["family"])),
            key=lambda one: tuple(get(one) for get in build.values())):
        families = list(families)
        machine, width, compiler = key
        dates = sorted({one["time"][:10] for one in families})
        when = f"on {dates[0]}" if len(dates) == 1 else f"from {dates[0]} to {dates[-1]}"
        lines += [f"## Width {width}, {compiler}\n", f"Machine: {machine}.\n",
                  f"Measured {when}, load average up to {max(one['load'] or 0 for one in families):.1f}.\n",
                  "| Family | What | Peer | Mean | Runs | Before | Worst | At | Cases |\n"
                  "|---|---|---|---|---|---|---|---|---|"]
        lines += [line(one["family"], row) for one in families for row in one["rows"]]
        stopped = [f"- `{one['family']}`, {one['stopped']}" for one in families if one["stopped"]]
        missing = [f"- `{one['family']}`: {peer}" for one in families for peer in one["missing"]]
        if stopped:
            lines += ["\nStopped before their end, so that groups of cases are missing:\n", *stopped]
        if missing:
            lines += ["\nPeers that were not installed:\n", *missing]
        lines.append("")
    return "\n".join(lines)


def main(folder, target):
    target = Path(target)
    kept = target.with_suffix(".json")
    before = {(one["family"], one["width"]): one
              for one in (json.loads(kept.read_text("utf-8")) if kept.exists() else [])}
    now = {key: compared(merged(runs), before.get(key)) for key, runs in latest(folder).items()}
    # If there is no new run, the page keeps its earlier comparison.
    for key, one in now.items():
        if key in before and before[key]["time"] == one["time"]:
            now[key] = before[key]
    figures = [now.get(key, before.get(key)) for key in sorted(before.keys() | now.keys())]
    kept.write_text(json.dumps(figures, indent=1, ensure_ascii=False) + "\n", "utf-8")
    target.write_text(page(figures), "utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
