#!/usr/bin/python3
"""Writes the reference: one page per family of exports, with examples that are run for it.

    reference.py --library BUILD_DIR --output FOLDER

Declarations and documentation come from the catalogue. The examples are the Python files in
examples/reference, cut at lines "#%% title"; each part is shown with what it prints and plots. A
file stands on the page of the family of the first export that it calls. An example that fails ends
the run.
"""

import argparse
import contextlib
import html
import io
import os
import re
import sys
import textwrap
import traceback
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "python"))
from qx.pages import COMMON_STYLE, HEAD  # noqa: E402

STYLE = """
h1 { font-size: 1.6em; } h2 { font-size: 1.2em; border-bottom: 1px solid var(--line); margin-top: 2em; }
h3 { font-size: 1.02em; margin: 2em 0 .3em; overflow-wrap: anywhere; } a { color: var(--link);
     text-decoration: none; }
code, pre { font-family: "DejaVu Sans Mono", Consolas, monospace; font-size: .86em; }
pre { background: var(--shade); padding: .6em .9em; overflow-x: auto; margin: .4em 0; }
pre.out { background: none; border-left: 3px solid var(--line); color: var(--quiet); }
table { border-collapse: collapse; } td, th { padding: .15em 1.2em .15em 0; text-align: left;
       vertical-align: top; border-bottom: 1px solid var(--line); overflow-wrap: anywhere; }
.as { border-left: 3px solid var(--line); padding-left: .9em; }
table.index { width: 100%; font-size: .92em; } table.index td:first-child { width: 17em; }
input { font: inherit; width: 100%; box-sizing: border-box; padding: .4em .6em; color: inherit;
       background: var(--shade); border: 1px solid var(--line); border-radius: .3em; }
@media (max-width: 640px) { table.index td { display: block; width: auto; border: 0; }
  table.index td + td { border-bottom: 1px solid var(--line); } }
"""
# Shows the rows that have all the words of the box, and the families that still have rows.
SEARCH = """<script>
document.getElementById("search").addEventListener("input", function () {
  const words = this.value.toLowerCase().split(/\\s+/);
  for (const family of document.querySelectorAll("section")) {
    let some = false;
    for (const row of family.querySelectorAll("tr")) {
      const text = (row.textContent + " " + row.dataset.more).toLowerCase();
      row.hidden = !words.every(word => text.includes(word));
      some = some || !row.hidden;
    }
    family.hidden = !some;
  }
});
</script>"""
KINDS = {"array1d": "array of {}", "array2d": "matrix of {}", "array3d": "array of {}, three dimensions", "value": "{}",
         "reference": "{} by reference", "output": "{}", "inout": "{}", "error": "code",
         "record": "record {}", "slot": "plan slot", "instance": "instance data",
         "opaque": "pointer", "buffer": "pointer to {}", "procedure": "procedure"}


def marked(text):
    return re.sub(r"`([^`]+)`", r"<code>\1</code>", html.escape(text, quote=False))


def prose(text):
    """Paragraphs; blocks of indented lines keep their layout, and codes begin a paragraph."""
    parts, lines, table = [], [], False

    def close():
        if lines and table:
            parts.append(f"<pre>{html.escape(textwrap.dedent(chr(10).join(lines)))}</pre>")
        elif lines:
            parts.append(f"<p>{marked(' '.join(map(str.strip, lines)))}</p>")
        lines.clear()

    for line in text.split("\n"):
        indented = line.startswith("  " if lines and table else "    ")
        if not line or indented != table or line.startswith("Codes:"):
            close()
        if line:
            table = indented
            lines.append(line)
    close()
    return "".join(parts)


def page(title, body, up=True):
    back = '<p><a href="index.html">All families</a></p>' if up else ""
    return (f'<!DOCTYPE html>\n<html lang="en"><head>{HEAD}'
            f"<title>{html.escape(title)}</title><style>{COMMON_STYLE}{STYLE}</style></head><body>{back}"
            f"<h1>{html.escape(title)}</h1>{body}</body></html>\n")


def export_text(entry, catalogue, library, signature):
    rows = "".join(
        f"<tr><td><code>{a['name']}</code></td><td>{a['direction']}</td>"
        f"<td>{html.escape(KINDS[a['kind']].format(a.get('element', '')))}</td></tr>"
        for a in entry["arguments"])
    codes = "".join(
        f"<tr><td>{catalogue['codes'][name]}</td><td><code>{name}</code></td>"
        f"<td>{html.escape(library.error_text(catalogue['codes'][name]))}</td></tr>"
        for name in entry["codes"])
    declaration = html.escape(re.sub(r"QX_(IN|OUT|INOUT) ", "", entry["declaration"]))
    taken_over = "".join(
        f'<div class="as"><a href="{library.entries[name]["family"]}.html#{name}">{name}</a>: '
        f"{prose(library.entries[name]['documentation'])}</div>" for name in entry["inherited"])
    return (f'<h3 id="{entry["name"]}">{entry["name"]}</h3><pre>{declaration};</pre>'
            f"<pre>{html.escape(signature)}</pre>{prose(entry['documentation'])}"
            + taken_over + (f"<table>{rows}</table>" if rows else "")
            + (f"<table>{codes}</table>" if codes else ""))


class ExampleError(Exception):
    """An example that does not run."""


def examples(path):
    """The parts of an example file, what stands before the first one included: title, source,
    output, figures as SVG."""
    from qx import drawing
    plt = drawing.pyplot()
    pieces = re.split(r"^#%% *(.*)\n", path.read_text("utf-8"), flags=re.MULTILINE)
    names = {"__name__": "example"}
    line = 0
    for title, source in zip(["", *pieces[1::2]], pieces[::2]):
        output = io.StringIO()
        try:
            with contextlib.redirect_stdout(output):
                exec(compile("\n" * line + source, str(path), "exec"), names)
        except Exception as error:
            raise ExampleError(f"{path}: '{title}': {traceback.format_exc()}") from error
        figures = [drawing.svg(plt, plt.figure(number)) for number in plt.get_fignums()]
        yield title, source.strip(), output.getvalue().rstrip(), figures
        line += source.count("\n") + 1


def examples_of(family, catalogue):
    """The example files of a family."""
    families = {entry["name"]: entry["family"] for entry in catalogue["exports"]}
    for path in sorted((ROOT / "examples" / "reference").glob("*.py")):
        called = re.findall(r'qx\.(?:call\(\s*")?(\w+)', path.read_text("utf-8"))
        if next((families[name] for name in called if name in families), None) == family:
            yield path


def examples_text(path):
    out = ["<h2>Examples</h2>"]
    for title, source, output, figures in examples(path):
        if title:
            out.append(f"<h3>{html.escape(title)}</h3>")
        shown = re.sub(r"^.*# hidden\n?", "", source, flags=re.MULTILINE)
        out.append(f"<pre>{html.escape(shown)}</pre>")
        if output:
            out.append(f'<pre class="out">{html.escape(output)}</pre>')
        out += [f"<figure>{figure}</figure>" for figure in figures]
    return "".join(out)


def index_of(entries, prefix=""):
    """A table of names and summaries; what can be searched beside these is in data-more."""
    from qx.catalogue import summary
    rows = []
    for entry in entries:
        name = entry["name"]
        more = html.escape(" ".join([entry["family"], *entry["inherited"],
                                     *entry["documentation"].split()]), quote=True)
        rows.append(f'<tr data-more="{more}"><td><a href="{prefix}#{name}">{name}</a></td>'
                    f"<td>{marked(summary(entry))}</td></tr>")
    return f'<table class="index">{"".join(rows)}</table>'


def write(output):
    from qx.functions import signature_text
    from qx.library import library
    lib = library()
    catalogue = lib.catalogue
    output.mkdir(parents=True, exist_ok=True)
    index = ["<p>Every export of the module, by family. <code>python3 -m qx show NAME</code> tells "
             "the same on the terminal.</p>",
             '<p><input id="search" type="search" placeholder="Words of a name or a text" autofocus></p>']
    shown = set()
    for family in catalogue["families"]:
        entries = [e for e in catalogue["exports"] if e["family"] == family["name"]]
        if not entries:
            continue
        name = family["name"]
        body = [f"<p>Header <code>{family['header']}</code></p>", prose(family["introduction"]),
                index_of(entries)]
        for path in examples_of(name, catalogue):
            shown.add(path.name)
            body.append(examples_text(path))
        body.append("<h2>Exports</h2>")
        body += [export_text(e, catalogue, lib, signature_text(e)) for e in entries]
        (output / f"{name}.html").write_text(page(name, "".join(body)), "utf-8")
        first = re.split(r"(?<=\.)\s", " ".join(family["introduction"].split()))[0]
        index.append(f'<section><h2><a href="{name}.html">{name}</a></h2><p>{marked(first)}</p>'
                     f"{index_of(entries, f'{name}.html')}</section>")
    for path in sorted((ROOT / "examples" / "reference").glob("*.py")):
        if path.name not in shown:
            print(f"not shown: {path}, whose first export is not in this build")
    (output / "index.html").write_text(page("Reference", "".join([*index, SEARCH]), up=False), "utf-8")


def main(arguments=None):
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("--library", required=True, help="folder of the built libraries")
    parser.add_argument("--output", required=True, type=Path)
    options = parser.parse_args(arguments)
    os.environ["QX_LIBRARY_DIR"] = options.library
    try:
        write(options.output)
    except ExampleError as error:
        print(error, file=sys.stderr)
        return 1
    print(f"The reference: {options.output / 'index.html'}")
    return 0


if __name__ == "__main__":
    sys.exit(main())
