#!/usr/bin/python3
"""Writes the pages of the topics and of the exports, from the Python package and the catalogue.

    pages.py FOLDER

As an extension of Sphinx it does so before the sources are read. An export gets its declaration, the call
from Python, its text, its arguments with their meaning, its codes with their messages and reasons, and
what it is: used by a topic, an elder kept for comparison, or a revision.
"""

import importlib
import inspect
import re
import sys
import textwrap
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent.parent
sys.path[:0] = [str(ROOT / "python"), str(ROOT / "tools"), str(ROOT / "docs/site")]
import topics_table  # noqa: E402
from arguments import MEANINGS, TEXTS  # noqa: E402
from catalogue import FULL_STOP  # noqa: E402
from qx.catalogue import summary  # noqa: E402
from qx.functions import signature_text  # noqa: E402
from qx.library import library  # noqa: E402
from qx.topical.newest import TOPICS  # noqa: E402

ELEMENTS = {"DBL": "double", "SGL": "float", "CDB": "complex double", "CSG": "complex float", "I32": "int32",
            "I16": "int16", "U8": "uint8", "U16": "uint16", "U32": "uint32"}
DIRECTIONS = {"in": "input", "out": "output", "inout": "changed in place"}
# What arguments of these kinds are, whatever their name.
KINDS = {"error": "The code of the call.",
         "slot": "Where the call site keeps its plan between calls; null before the first.",
         "instance": "Instance data of the call site, null before the first call."}
# Sentences that say what a failure does to an argument, not what the argument is.
FAILURE = re.compile(r"(?:A|Every|After a) (?:failure|negative status)\b|Every code\b|The last block and every\b")


# Texts of the headers as reStructuredText

def link(name):
    return f"\\ :ref:`{name} <export-{name}>`\\ "


def escaped(text):
    return re.sub(r"([\\*_|`])", r"\\\1", text)


def marked(text):
    """One paragraph: names of exports become links, what is between backticks code."""
    known = library().entries
    out = []
    for part in re.findall(r"`[^`]+`|\w+|\W", text):
        if part[0] == "`" and len(part) > 1:
            out.append(link(part[1:-1]) if part[1:-1] in known else f"\\ ``{part[1:-1].strip()}``\\ ")
        else:
            out.append(link(part) if part in known else escaped(part))
    return re.sub(r"^([-+]|\d+\.) ", r"\\\1 ", "".join(out))


def prose(text):
    """Paragraphs, and as they are the blocks of indented lines."""
    parts, lines, block = [], [], False

    def close():
        if lines and block:
            parts.append("::\n\n" + textwrap.indent(textwrap.dedent("\n".join(lines)), "   "))
        elif lines:
            parts.append(marked(" ".join(map(str.strip, lines))))
        lines.clear()

    for line in text.split("\n"):
        indented = line.startswith("  " if lines and block else "    ")
        if not line.strip() or indented != block:
            close()
        if line.strip():
            block = indented
            lines.append(line)
    close()
    return "\n\n".join(parts)


def end_of_sentence(text, start):
    depth = 0
    for position in range(start, len(text)):
        depth += (text[position] == "(") - (text[position] == ")")
        if text[position] == "." and depth == 0:
            return position
    return len(text)


def without_codes(text):
    """The text without the sentence of the codes, and that sentence."""
    match = re.search(r"\n?\s*\bCodes:", text)
    if not match:
        return text, ""
    end = end_of_sentence(text, match.end())
    return f"{text[:match.start()]}\n{text[end + 1:].strip()}".strip(), " ".join(text[match.end():end].split())


def reasons(entry):
    """Why each code is raised, as the text says it, including codes inherited from other exports."""
    entries = library().entries
    found = {}
    sentence = without_codes(entry["documentation"])[1]
    if not sentence and entry["as"]:
        return reasons(entries[entry["as"]])
    for item in re.findall(r"(?:\((?:[^()]|\((?:[^()]|\([^()]*\))*\))*\)|[^,;()])+", sentence):
        if match := re.fullmatch(r"((?:Err|Warn)\w+) \((.+)\)", item.strip()):
            found.setdefault(match[1], []).append(match[2])
        elif match := re.match(r"those of (\w+)", item.strip()):
            for code, texts in reasons(entries[match[1]]).items():
                found.setdefault(code, []).extend(texts)
    return {code: list(dict.fromkeys(texts)) for code, texts in found.items()}


# Arguments

def sentences(text):
    text = " ".join(text.split())
    places = [match.end() for match in FULL_STOP.finditer(text)]
    return [text[start:end].strip() for start, end in zip([0, *places], [*places, len(text)])
            if text[start:end].strip()]


def mentions(name):
    """A pattern for the argument in a text; "a" and "I" are words too, unless something shows them to be a
    name."""
    word = rf"(?<![\w`-])\*?`?{re.escape(name)}`?(?![\w-])"
    return re.compile(word if name not in ("a", "I", "A") else
                      rf"{word}(?= ?[-+*/=,;:.)^\[]| (?:is|are|has|and|by|in|=)\b)")


def clipped(sentence, pattern, enough=70):
    """The sentence, of a long one the clauses around what the pattern finds."""
    if len(sentence) <= 2 * enough:
        return sentence
    clauses = re.split(r"(?<=[,;:]) ", sentence)
    first = next((i for i, clause in enumerate(clauses) if pattern.search(clause)), None)
    if first is None:
        return sentence
    last = first
    while last + 1 < len(clauses) and len(" ".join(clauses[first:last + 1])) < enough:
        last += 1
    found = " ".join(clauses[first:last + 1])
    return ("... " if first else "") + (found if last + 1 == len(clauses) else found.rstrip(",;:") + " ...")


def keys(entry, argument):
    """The keys of MEANINGS for an argument: of the export, of those whose text it takes over, and of its header."""
    return [f"{name}.{argument['name']}" for name in (entry["name"], *entry["inherited"], entry["family"])]


def texts_of(entry):
    """The texts that describe an export: its own, those it takes over, and that of its header. What is said of
    codes and of NaN does not describe its arguments."""
    entries = library().entries
    family = next(one for one in library().catalogue["families"] if one["name"] == entry["family"])
    texts = [entry["documentation"], *(entries[name]["documentation"] for name in entry["inherited"])]
    described = (re.split(r"(?:^|\n)\s*NaN: ", text)[0] for text in texts)
    return [*(without_codes(text)[0] for text in described), family["introduction"]]


def meaning(entry, argument):
    """What an argument is: its values, what arguments.py says of it, or the sentence in which it is first named.
    Sentences about failures do not count."""
    if values := argument.get("values"):
        return "; ".join(f"{value}: {text}" if text else f"{value}" for value, text in values) + "."
    if argument["kind"] in KINDS:
        return KINDS[argument["kind"]]
    for key in keys(entry, argument):
        if key in MEANINGS:
            return MEANINGS[key]
    pattern = mentions(argument["name"])
    for text in texts_of(entry):
        for sentence in sentences(text):
            if pattern.search(sentence) and not FAILURE.match(sentence):
                return clipped(sentence, pattern)
    if found := TEXTS.get(entry["family"], {}).get(argument["name"]):
        return found
    outputs = [a for a in entry["arguments"] if a["direction"] != "in" and a["kind"] != "error"]
    if argument["direction"] == "out" and len(outputs) == 1:
        return "The result."
    return ""


def type_text(argument):
    element = ELEMENTS.get(argument.get("element"), argument.get("element", ""))
    kind = argument["kind"]
    shapes = {"array1d": f"array of {element}", "array2d": f"matrix of {element}",
              "array3d": f"array of {element}, three dimensions", "buffer": f"pointer to {element}",
              "record": f"record {element}", "error": "code", "slot": "plan slot", "instance": "instance data",
              "opaque": "pointer", "procedure": "procedure"}
    return shapes.get(kind, element)


def table(header, rows, widths):
    lines = [".. list-table::", "   :header-rows: 1", f"   :widths: {' '.join(map(str, widths))}",
             "   :class: wide", ""]
    for row in [header, *rows]:
        for i, cell in enumerate(row):
            lines.append(f"   {'* -' if i == 0 else '  -'} {cell}")
    return "\n".join(lines)


def arguments_table(entry):
    rows = [[f"``{a['name']}``", f"{DIRECTIONS[a['direction']]}, {type_text(a)}", marked(meaning(entry, a))]
            for a in entry["arguments"]]
    return table(["Argument", "Direction, type", "Meaning"], rows, [20, 25, 55]) if rows else ""


def codes_table(entry):
    lib = library()
    why = reasons(entry)
    rows = [[f"{lib.catalogue['codes'][name]}", f"``{name}``", escaped(lib.error_text(lib.catalogue["codes"][name])),
             marked("; ".join(why.get(name, [])))] for name in entry["codes"]]
    found = table(["Code", "Name", "Message", "When"], rows, [10, 25, 35, 30]) if rows else ""
    if entry["hostStatus"]:
        found += "\n\nIf the host refuses an array, its own status is passed on."
    return found


def records_text(entry):
    records = library().catalogue["records"]
    out = []
    for name in dict.fromkeys(a["element"] for a in entry["arguments"] if a.get("element") in records):
        fields = [f"{field['type']} {field['name']}" + (f"[{field['count']}]" if field.get("count") else "")
                  for field in records[name]["fields"]]
        out.append(f"Record ``{name}``:\n\n.. code-block:: c\n\n" + "\n".join(f"   {f};" for f in fields))
    return "\n\n".join(out)


# What an export is

def functions_linked(functions):
    return ", ".join(f":py:obj:`qx.{name}`" for name in functions)


def revisions():
    """Pairs of elders and revisions of docs/revisions.md of which this build has both."""
    known = library().entries
    pairs = []
    for line in (ROOT / "docs/revisions.md").read_text("utf-8").split("\n"):
        cells = [re.findall(r"`(\w+)`", cell) for cell in line.split("|")[1:3]]
        if len(cells) == 2 and all(cells):
            pairs += [(elder, new) for elder in cells[0] for new in cells[1]
                      if elder in known and new in known and elder.startswith("Cx") == new.startswith("Cx")]
    return pairs


def standing(entry, served, pairs):
    """What calls the export, or what has replaced it."""
    name, out = entry["name"], []
    if name in served:
        out.append(f"In Python: {functions_linked(served[name])}.")
    else:
        text = topics_table.remark(name)
        functions = re.findall(r"\b(?:" + "|".join(TOPICS) + r")\.[\w.]+", text)
        if text.endswith(f"({topics_table.NOT_CALLED})"):
            newest = [other for other, names in served.items() if set(names) & set(functions)]
            through = f", through {', '.join(map(link, newest))}" if 0 < len(newest) < 4 else ""
            out.append(f"An older or alternative form, kept for comparison; in Python "
                       f"{functions_linked(functions)} does the same{through}.")
        elif text == topics_table.TWIN:
            out.append("A twin for hosts that keep the plan in their instance data.")
        elif text == topics_table.HOST:
            out.append("For hosts.")
        else:
            out.append(f"In Python: {functions_linked(functions) if functions else escaped(text)}.")
    if newer := [new for elder, new in pairs if elder == name]:
        out.append(f"Its revision: {', '.join(map(link, newer))}.")
    if elder := [old for old, new in pairs if new == name]:
        out.append(f"A revision of {', '.join(map(link, elder))}.")
    return " ".join(out)


# Pages

def declaration(entry):
    text = entry["declaration"] + ";"
    if len(text) <= 80:
        return text
    opening = text.index("(") + 1
    arguments = re.split(r", (?![^(]*\)\s*\w)", text[opening:-2])
    return text[:opening] + "\n    " + ",\n    ".join(arguments) + ");"


def title(text, mark):
    return f"{text}\n{mark * len(text)}"


def export_text(entry, served, pairs):
    taken_over = [f"{link(name)}:\n\n" + textwrap.indent(prose(
        without_codes(library().entries[name]["documentation"])[0]), "   ") for name in entry["inherited"]]
    parts = [f".. _export-{entry['name']}:", title(escaped(entry["name"]), "-"),
             ".. code-block:: c\n\n" + textwrap.indent(declaration(entry), "   "),
             ".. code-block:: python\n\n   " + signature_text(entry),
             prose(without_codes(entry["documentation"])[0]), *taken_over, standing(entry, served, pairs),
             arguments_table(entry), records_text(entry), codes_table(entry)]
    return "\n\n".join(part for part in parts if part)


# Names of families whose words are abbreviations.
HEADINGS = {"anova": "Analysis of variance", "chirp_z": "Chirp-z transform",
            "convolution_2d": "Convolution in two dimensions",
            "dct_dst": "Cosine and sine transforms", "dzt": "Narrow band of a long transform", "fft": "Fourier transform",
            "fft2d": "Fourier transform in two dimensions", "fir_design": "FIR filter design",
            "frame": "Workspace and host", "hartley_hilbert": "Hartley and Hilbert transforms",
            "iir_design": "IIR filter design"}


def heading(family):
    return HEADINGS.get(family, family.replace("_", " ").capitalize())


def rows_of(entries):
    return [[link(entry["name"]), marked(summary(entry))] for entry in entries]


def exports_pages():
    """The texts of the pages of the exports by their paths."""
    catalogue = library().catalogue
    served, pairs = topics_table.served(), revisions()
    pages, listed = {}, []
    for family in catalogue["families"]:
        name = family["name"]
        entries = [entry for entry in catalogue["exports"] if entry["family"] == name]
        if not entries:
            continue
        listed.append(name)
        example = f"Examples with their output: :doc:`/examples/{name}`." \
            if (ROOT / f"examples/exports/{name}.py").exists() else ""
        parts = [title(heading(name), "="), f"Header ``{family['header']}``. {example}",
                 prose(family["introduction"]), table(["Export", "Effect"], rows_of(entries), [35, 65]),
                 *(export_text(entry, served, pairs) for entry in entries)]
        pages[f"exports/{name}.rst"] = "\n\n".join(part for part in parts if part) + "\n"
    by_name = sorted(catalogue["exports"], key=lambda entry: entry["name"].lower())
    pages["exports/all.rst"] = "\n\n".join([
        title("All exports by name", "="), table(["Export", "Effect"], rows_of(by_name), [35, 65])]) + "\n"
    families = [[f":doc:`{heading(name)} <{name}>`",
                 str(sum(entry["family"] == name for entry in catalogue["exports"])), marked(sentences(
                     next(f["introduction"] for f in catalogue["families"] if f["name"] == name))[0])]
                for name in listed]
    pages["exports/index.rst"] = "\n\n".join([
        title("Reference of the exports", "="),
        f"The {len(by_name)} C functions of the module by family, each with its declaration, its call from Python, "
        "its arguments and its codes. :doc:`all` lists them by name, and the search of this site finds them. "
        "``python3 -m qx show NAME`` prints the same on the terminal.",
        table(["Family", "Exports", "Content"], families, [30, 10, 60]),
        ".. toctree::\n   :hidden:\n\n   all\n" + "".join(f"   {name}\n" for name in listed)])
    return pages


def topic_page(topic):
    module = importlib.import_module(f"qx.{topic}")
    parts = [title(f"qx.{topic}", "="), f".. automodule:: qx.{topic}", f".. currentmodule:: qx.{topic}",
             title("Contents", "-"), ".. autosummary::\n\n" + "".join(f"   {name}\n" for name in module.__all__)]
    for name in module.__all__:
        thing = getattr(module, name)
        parts.append(title(name, "-"))
        if inspect.isclass(thing):
            own = [member for member in vars(thing) if not member.startswith("_")
                   and not re.search(rf"^\s*{member} : ", thing.__doc__ or "", re.MULTILINE)]
            inherited = [member for member in ("reset", "copy", "finish") if hasattr(thing, member)]
            members = ", ".join(dict.fromkeys([*own, *inherited]))
            extra = "   :special-members: __call__\n" if "__call__" in dir(thing) and not name == "Distribution" else ""
            parts.append(f".. autoclass:: {name}\n" + (f"   :members: {members}\n" if members else "")
                         + "   :inherited-members:\n" * bool(inherited) + extra)
        elif callable(thing):
            parts.append(f".. autofunction:: {name}")
        else:
            parts.append(f".. autodata:: {name}\n   :no-value:")
    return "\n\n".join(parts) + "\n"


def topics_pages():
    pages = {f"topics/{topic}.rst": topic_page(topic) for topic in TOPICS}
    rows = []
    for topic in TOPICS:
        first = sentences(importlib.import_module(f"qx.{topic}").__doc__)[0]
        rows.append([f":doc:`qx.{topic} <{topic}>`", re.sub(r"(?<!:)`([^`]+)`", r"``\1``", first)])
    pages["topics/index.rst"] = "\n\n".join([
        title("Reference of the topics", "="),
        "The functions of the Python package by topic, with the names, the order of arguments and the defaults of "
        "NumPy and SciPy.", table(["Topic", "Content"], rows, [25, 75]),
        ".. toctree::\n   :hidden:\n\n" + "".join(f"   {topic}\n" for topic in TOPICS)])
    return pages


def write(folder):
    for path, text in {**exports_pages(), **topics_pages()}.items():
        target = Path(folder) / path
        target.parent.mkdir(parents=True, exist_ok=True)
        target.write_text(text, "utf-8")


def plot_style(gallery_conf, file):
    """The look of the plots of the examples."""
    import matplotlib.pyplot as plt
    plt.rcParams.update({"figure.constrained_layout.use": True, "savefig.bbox": "tight", "figure.dpi": 110,
                         "axes.spines.top": False, "axes.spines.right": False, "axes.axisbelow": True,
                         "axes.grid": True, "grid.color": "0.9", "legend.frameon": False})


def thumbnail(folder):
    """The picture of the examples without plots; its path."""
    import matplotlib.figure
    figure = matplotlib.figure.Figure(figsize=(4, 2.8))
    axes = figure.add_axes([0, 0, 1, 1])
    axes.text(0.5, 0.5, ">>> qx", size=30, family="monospace", color="0.5", ha="center", va="center")
    axes.axis("off")
    figure.savefig(folder / "thumbnail.png", facecolor="white")
    return str(folder / "thumbnail.png")


def settle(app, what, name, thing, options, lines):
    """Indented blocks of the text of a module are code, and a name such as "M. Abramowitz" begins no list."""
    text = re.sub(r"^( *)([A-Z])\. ", r"\1\\\2. ", "\n".join(lines), flags=re.MULTILINE)
    if what == "module":
        text = re.sub(r"(^|\n)\n(?=    \S)", r"\1\n.. code-block:: python\n\n", text)
    lines[:] = text.split("\n")


def setup(app):
    app.connect("autodoc-process-docstring", settle)
    app.connect("builder-inited", lambda app: write(app.srcdir))
    return {"parallel_read_safe": True}


if __name__ == "__main__":
    write(sys.argv[1])
