"""The report on a recording: figures in a table, plots in a page. The analysis is done by the topics.

A section is a function that takes a recording and returns a Section (sections.py), or None if the
recording is too short for it. SECTIONS lists them in the order of the page.
"""

import html
from collections.abc import Callable

from . import outputs, pages
from .outcomes import QxError
from .sections import Section
from .sections_cleaning import cleaned
from .sections_measuring import events
from .sections_recording import histogram, overview, statistics
from .sections_spectra import amplitudes, over_time, power

SECTIONS: list[Callable[..., Section | None]] = [
    overview, statistics, histogram, amplitudes, power, over_time, cleaned, events]


def page(recording, sections):
    inner = f'<p class="quiet">{html.escape(recording.choice)}.</p>' if recording.choice else ""
    if recording.notes:
        inner += f'<p class="quiet">{html.escape(" ".join(recording.notes))}</p>'
    return pages.page("report", recording.name, inner, sections)


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
            error = f"± {row.error}" if row.error else ""
            yield f"  {row.label:<{width}}  {row.value:>14} {error:<10} {row.unit:<6} {row.source}".rstrip()
        yield from (f"  {line}" for line in section.terminal)


OF_A_PART = (cleaned, events)  # sections that only use the samples in memory


def sections_of(recording):
    found = []
    for make in SECTIONS:
        try:
            section = make(recording)
        except QxError as error:
            section = Section(make.__name__.replace("_", " ").capitalize(),
                              f"Not possible for this recording: {error}.")
        if section and recording.whole and make in OF_A_PART:
            section.text += f" This is about the first {len(recording.values)} of these samples."
        if section:
            found.append(section)
    return found


def write(recording, path):
    """Writes the page and returns the lines for the terminal."""
    sections = sections_of(recording)
    outputs.write_text(path, page(recording, sections))
    return list(lines(recording, sections))
