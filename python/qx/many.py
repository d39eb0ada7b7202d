"""Reports on many recordings: a page for each, and an index with the main figures. The work is done by
processes on this machine, or by the workers of a Dask scheduler. A recording that cannot be read costs only
its own line."""

import concurrent.futures
import contextlib
import dataclasses
import glob
import html
import multiprocessing
import os
import signal
import sys
import threading
from pathlib import Path

from . import outputs
from .audio import ENDINGS as AUDIO
from .files import COMPRESSED, InputError, printable
from .stored import ENDINGS as STORED

TABLES = (".csv", ".txt", ".tsv", ".tab", ".dat", ".asc", ".prn")
QUIET = "ignore:resource_tracker"  # which warns about semaphores when Ctrl-C ends this process immediately
MAIN = ("Mean", "Root mean square", "Standard deviation", "Strongest part at", "Resolution")


@dataclasses.dataclass
class Outcome:
    """The outcome for one recording: a page with figures, or the reason why there is none."""

    name: str
    page: str = ""
    cells: tuple = ()  # cells of the table in the index
    thumbnail: str = ""  # a small plot, as SVG
    failure: str = ""


def is_many(paths):
    return len(paths) > 1 or os.path.isdir(paths[0]) or is_pattern(paths[0])


def is_pattern(path):
    return not os.path.exists(path) and glob.has_magic(path)


def is_recording(path):
    """Whether a file of a folder has the extension of a recording, compressed or not."""
    endings = [ending.lower() for ending in path.suffixes[-2:]]
    if endings and endings[-1] in COMPRESSED:
        return endings[-1] == ".zip" or len(endings) > 1 and endings[0] in (*TABLES, *AUDIO, *STORED)
    return bool(endings) and endings[-1] in (*TABLES, *AUDIO, *STORED)


def left_out(paths):
    """The files of folders that are not read, except hidden files."""
    return sorted(str(path) for given in paths if os.path.isdir(given) for path in Path(given).rglob("*")
                  if path.is_file() and not path.name.startswith(".") and not is_recording(path))


def files_of(paths):
    """Pairs of a name and a path, for the files in folders, those that match patterns, and those named directly."""
    found = {}
    for given in paths:
        if os.path.isdir(given):
            inside = [path for path in Path(given).rglob("*") if path.is_file() and is_recording(path)]
            found |= {str(path): path.relative_to(given) for path in inside if not outputs.UNFINISHED.match(path.name)}
        elif is_pattern(given):
            found |= {path: Path(path) for path in glob.glob(given, recursive=True) if os.path.isfile(path)}
        else:
            found[given] = Path(given)
    named = {path: "_".join(part for part in name.parts if part not in ("/", ".."))
             for path, name in found.items()}
    pairs, seen = [], {"index": 1}  # the name of the index page
    for path, name in sorted(named.items(), key=lambda pair: (pair[1], pair[0])):
        seen[name] = seen.get(name, 0) + 1
        pairs.append((name if seen[name] == 1 else f"{name} ({seen[name]})", path))
    return pairs


def report_on(name, path, options):
    """The outcome of one recording; runs in a worker."""
    try:
        from . import pages, recording, report, sections_recording
        read = recording.read(path, **options)
        sections = report.sections_of(read)
        rows = {row.label: " ".join(filter(None, (row.value, row.error and f"± {row.error}", row.unit)))
                for section in sections for row in section.rows}
        rate = f"{read.rate:.6g}" if read.rate else ""
        return Outcome(name, report.page(read, sections),
                       (str(sections_recording.count_of(read)), rate, *(rows.get(label, "") for label in MAIN)),
                       pages.thumbnail(sections_recording.outline(read, "").curves[0]))
    except InputError as error:
        return Outcome(name, failure=str(error))
    except Exception as error:  # of any kind: the other recordings go on
        return Outcome(name, failure=printable(f"{path}: {type(error).__name__}: {error}"))


@contextlib.contextmanager
def _local(workers):
    """Processes that end immediately if the work is interrupted, or if this process ends for any reason: each
    watches a pipe whose other end is held here."""
    if QUIET not in sys.warnoptions:  # inherited by the processes that are started
        sys.warnoptions.append(QUIET)
    context = multiprocessing.get_context("spawn")
    watched, held = context.Pipe(duplex=False)
    with watched, held:
        executor = concurrent.futures.ProcessPoolExecutor(workers, context, _end_with, (watched,))
        try:
            yield executor
        except BaseException:
            held.close()
            executor.shutdown(wait=False, cancel_futures=True)
            raise
        executor.shutdown()


def _end_with(watched):
    """Runs in a worker: ends it when the other end of the pipe is closed."""
    def wait():
        with contextlib.suppress(EOFError, OSError):
            watched.recv()
        os._exit(1)

    threading.Thread(target=wait, daemon=True).start()


@contextlib.contextmanager
def _without_interruption():
    """Processes that are started meanwhile ignore Ctrl-C. It is meant for this process, and reaches it
    afterwards."""
    before = signal.pthread_sigmask(signal.SIG_BLOCK, {signal.SIGINT})
    try:
        yield
    finally:
        signal.pthread_sigmask(signal.SIG_SETMASK, before)


def outcomes(pairs, options, workers=None, scheduler=None):
    """The outcomes, as they become ready."""
    if scheduler:
        import distributed
        with distributed.Client(scheduler) as client, client.get_executor(pure=False) as executor:
            yield from _finished(executor, pairs, options, [])
        return
    left = []
    with _local(workers) as executor:
        yield from _finished(executor, pairs, options, left)
    for pair in left:  # a process that died took the others along: now each gets its own
        with _local(1) as executor:
            died = []
            yield from _finished(executor, [pair], options, died)
        for name, path in died:
            yield Outcome(name, failure=printable(f"{path}: its process died, perhaps for lack of memory"))


def _finished(executor, pairs, options, left):
    with _without_interruption():
        waiting = {executor.submit(report_on, name, path, options): (name, path) for name, path in pairs}
    for future in concurrent.futures.as_completed(list(waiting)):
        pair = waiting.pop(future)
        try:
            yield future.result()
        except concurrent.futures.BrokenExecutor:
            left.append(pair)


def index(found, left=()):
    """The page that links to the others."""
    from . import pages

    def escape(text, quote=True):
        return html.escape(printable(text), quote)

    header = "".join(f'<th><button type="button">{label}</button></th>' for label in (
        "Recording", "Samples", "Per second", *MAIN))
    rows = "".join(
        f'<tr><td>{outcome.thumbnail}</td>'
        f'<td><a href="{escape(_link(outcome.name), quote=True)}">{escape(outcome.name)}</a></td>'
        + "".join(f'<td class="value">{escape(cell)}</td>' for cell in outcome.cells) + "</tr>\n"
        for outcome in found if not outcome.failure)
    failed = "".join(f"<li>{escape(outcome.failure)}</li>\n" for outcome in found if outcome.failure)
    others = "".join(f"<li>{escape(path)}</li>\n" for path in left)
    read = sum(not outcome.failure for outcome in found)
    inner = (f"<p>{read} of {len(found)} recordings were read. Click on the name of a column to sort by it.</p>"
             f'<div class="wide"><table class="sorted"><thead><tr><th></th>{header}</tr></thead>\n'
             f"<tbody>{rows}</tbody></table></div>"
             + (f"<h2>Not read</h2><ul>{failed}</ul>" if failed else "")
             + (f"<h2>Skipped because of their extensions</h2><ul>{others}</ul>" if others else ""))
    return pages.page("report", "Recordings", inner, scripts=pages.own_script("index.js"), kind="index")


def _link(name):
    from urllib.parse import quote
    return quote(os.fsencode(f"{name}.html"))


def _check(pairs, folder, force):
    inputs = outputs.identities(path for _, path in pairs)
    for name in ("index", *(name for name, _ in pairs)):
        outputs.check(os.path.join(folder, f"{name}.html"), force, "report", inputs)


def write(paths, folder, options, workers=None, scheduler=None, tell=lambda outcome: None, start=None,
          force=False):
    """Writes the pages and the index. `start` is called with their number, `tell` with each outcome. Returns
    the outcomes in the order of their names."""
    pairs = files_of(paths)
    if not pairs:
        raise InputError(f"{', '.join(paths)}: holds no text table and no audio file")
    _check(pairs, folder, force)
    if start:
        start(len(pairs))
    outputs.make_folder(folder)
    found = []
    for outcome in outcomes(pairs, options, workers, scheduler):
        if not outcome.failure:
            outputs.write_text(os.path.join(folder, f"{outcome.name}.html"), outcome.page)
            outcome.page = ""
        found.append(outcome)
        tell(outcome)
    order = {name: i for i, (name, _) in enumerate(pairs)}
    found.sort(key=lambda outcome: order[outcome.name])
    outputs.write_text(os.path.join(folder, "index.html"), index(found, left_out(paths)))
    return found
