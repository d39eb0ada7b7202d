"""The report on a recording: figures in a table, plots in a page. The analysis is done by exports;
NumPy carries arrays and scales them for display.

A section is a function that takes a recording and gives a Section (sections.py), or None where the
recording is too short for it; SECTIONS lists them in the order of the page.
"""

import html
from datetime import datetime, timezone

from . import outputs
from .outcomes import QxError
from .pages import HEAD, STYLE
from .sections import Section
from .sections_cleaning import cleaned
from .sections_filtering import filtered
from .sections_measuring import events
from .sections_recording import histogram, overview, statistics
from .sections_spectra import amplitudes, power

SECTIONS = [overview, statistics, histogram, amplitudes, power, filtered, cleaned, events]


def page(recording, sections):
    escape = html.escape
    title = recording.name
    out = ["<!DOCTYPE html>", f'<html lang="en"><head>{HEAD}{outputs.generator("report")}',
           f"<title>{escape(title)}</title><style>{STYLE}</style></head><body>",
           f"<h1>{escape(title)}</h1>"]
    if recording.choice:
        out.append(f'<p class="source">{escape(recording.choice)}.</p>')
    if recording.notes:
        out.append(f'<p class="source">{escape(" ".join(recording.notes))}</p>')
    for section in sections:
        out.append(f"<h2>{escape(section.title)}</h2><p>{escape(section.text)}</p>")
        if section.rows:
            out.append("<table><tr><th>Quantity</th><th>Value</th><th></th><th>From</th></tr>")
            out += [f'<tr><td>{escape(row.label)}</td><td class="value">{escape(row.value)}</td>'
                    f'<td>{escape(row.unit)}</td><td class="export">{escape(row.export)}</td></tr>'
                    for row in section.rows]
            out.append("</table>")
        out += [f"<figure>{figure}</figure>" for figure in section.figures]
    made = datetime.now(timezone.utc).strftime("%Y-%m-%d %H:%M UTC")
    out.append(f"<footer>Made {made} by python3 -m qx report.</footer></body></html>")
    return "\n".join(out) + "\n"


def lines(recording, sections):
    """The report for the terminal."""
    yield recording.name
    if recording.choice:
        yield recording.choice
    for section in sections:
        yield ""
        yield f"{section.title}: {section.text}"
        width = max((len(row.label) for row in section.rows), default=0)
        for row in section.rows:
            yield (f"  {row.label:<{width}}  {row.value:>14} {row.unit:<6} {row.export}").rstrip()
        yield from (f"  {line}" for line in section.terminal)


def sections_of(recording):
    found = []
    for make in SECTIONS:
        try:
            section = make(recording)
        except QxError as error:
            section = Section(make.__name__.replace("_", " ").capitalize(),
                              f"Not possible for this recording: {error}.")
        if section:
            found.append(section)
    return found


def write(recording, path):
    """Writes the page and gives the lines for the terminal."""
    sections = sections_of(recording)
    outputs.write_text(path, page(recording, sections))
    return list(lines(recording, sections))
