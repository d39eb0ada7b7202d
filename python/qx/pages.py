"""The common parts of all pages: their style, their plots, and the frame of a page.

Plots are drawn in the page by dygraphs, from Debian's package libjs-dygraphs, which is included in the page so that
it needs no other files. If the package is missing, the plots are static drawings.
"""

import functools
import html
import json
import re
from datetime import datetime, timezone
from pathlib import Path

from . import drawing, figures, outputs

HERE = Path(__file__).parent
DYGRAPHS = Path("/usr/share/javascript/dygraphs")
POINTS = 300_000  # points of all curves of a page, as lowest and highest values of four bytes each
STILL = "The plots are static: to zoom in them, install Debian's package libjs-dygraphs and create the page again."
HEAD = ('<meta charset="utf-8"><meta name="viewport" content="width=device-width, initial-scale=1">'
        '<meta http-equiv="Content-Security-Policy" content="default-src \'none\'; style-src \'unsafe-inline\'; '
        'script-src \'unsafe-inline\'; img-src data:; connect-src \'self\'">')


@functools.cache
def style():
    return (HERE / "page.css").read_text("utf-8")


@functools.cache
def dygraphs():
    """The text of dygraphs and of its style; None if it is not installed."""
    try:
        return ((DYGRAPHS / "dygraph.min.js").read_text("utf-8").rpartition("//# sourceMappingURL")[0],
                (DYGRAPHS / "dygraph.min.css").read_text("utf-8").rpartition("/*# sourceMappingURL")[0])
    except OSError:
        return None


def script(text):
    """A script element of a page, which no text in the script can end."""
    return "<script>" + text.replace("</script", "<\\/script") + "</script>"


def data(value):
    """A value for the scripts of a page, written so that no text in it can end the element."""
    return json.dumps(value, allow_nan=False).replace("<", "\\u003c").replace(">", "\\u003e")


def plots_of(sections):
    return [figure for section in sections for figure in section.figures if isinstance(figure, figures.Plot)]


def parts(sections):
    """The sections as HTML, and their plots in the form that pages take; no plots if they are drawn here."""
    curves = sum(len(plot.curves) for plot in plots_of(sections))
    most = max(1 << 9, min(figures.MOST_POINTS, POINTS // max(1, curves)))
    text, described = [], []
    for section in sections:
        text.append(f"<section><h2>{html.escape(section.title)}</h2><p>{html.escape(section.text)}</p>")
        text += table(section.rows)
        for figure in section.figures:
            if isinstance(figure, figures.Plot) and dygraphs():
                text.append(f'<figure class="plot" data-plot="{len(described)}"></figure>')
                described.append(figures.described(figure, most))
            elif isinstance(figure, figures.Plot):
                text.append(f'<figure class="still">{drawing.svg(figure)}</figure>')
            else:
                text.append(figure)
        text.append("</section>")
    return "\n".join(text), described


def body(sections):
    """The sections with their plots, and the data that the page needs to draw them."""
    text, described = parts(sections)
    if not described:
        return text
    return (f'{text}\n<script type="application/json" id="plots">{data(described)}</script>'
            "<noscript><p>The plots are drawn by scripts, which this browser has switched off.</p></noscript>")


def table(rows):
    if not rows:
        return []
    # Names of functions may be broken after a punctuation mark.
    sources = [re.sub(r"([._,(])", r"\1<wbr>", html.escape(row.source)) for row in rows]
    cells = "".join(f'<tr><td>{html.escape(row.label)}</td><td class="value">{html.escape(row.value)}'
                    + (f' <span class="error">± {html.escape(row.error)}</span>' if row.error else "")
                    + f'</td><td>{html.escape(row.unit)}</td><td class="source">{source}</td></tr>\n'
                    for row, source in zip(rows, sources))
    return [f'<div class="wide"><table><thead><tr><th>Quantity</th><th>Value</th><th></th><th>From</th></tr></thead>'
            f"<tbody>{cells}</tbody></table></div>"]


def own_script(name):
    return script((HERE / name).read_text("utf-8"))


def page(command, title, inner, sections=None, scripts="", moving=False, kind=""):
    """A whole page. `inner` is HTML below the title, before the sections. `scripts` are elements for its end, which
    have their own plots if the page is `moving`. `kind` is a class of the style."""
    library = dygraphs()
    made = datetime.now(timezone.utc).strftime("%Y-%m-%d %H:%M UTC")
    drawn = body(sections) if sections is not None else ""
    moves = bool(library) and (moving or "data-plot=" in drawn)
    if not moves and sections is not None and plots_of(sections):
        inner += f"<p class=\"quiet\">{html.escape(STILL)}</p>"
    return (f'<!DOCTYPE html>\n<html lang="en"><head>{HEAD}{outputs.generator(command)}'
            f"<title>{html.escape(title)}</title><style>{library[1] if moves else ''}{style()}</style></head>"
            f'<body class="{kind}">\n'
            f"<h1>{html.escape(title)}</h1>\n{inner}\n{drawn}\n"
            f"<footer>Made {made} by python3 -m qx {command}.</footer>"
            f"{script(library[0]) + own_script('page.js') if moves else ''}{scripts}</body></html>\n")


def thumbnail(curve):
    """A small drawing of a curve, without axes."""
    lows, highs = figures.extremes(curve.values, -(-len(curve.values) // 120), curve.highs)
    least, span = float(lows.min()), float(highs.max() - lows.min()) or 1.0
    points = [f"{i * 160 / max(1, len(lows) - 1):.1f},{39 - 38 * (value - least) / span:.1f}"
              for i, pair in enumerate(zip(lows, highs)) for value in pair if value == value]
    return ('<svg class="thumbnail" viewBox="0 0 160 40" role="img" aria-label="outline">'
            f'<polyline points="{" ".join(points)}"/></svg>')
