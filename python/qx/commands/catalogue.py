"""The commands list and show."""

import fnmatch
import textwrap


def first_sentence(documentation):
    text = " ".join(documentation.split())
    end = text.find(". ")
    return text if end < 0 else text[:end + 1]


def list_exports(options):
    from ..library import library
    pattern = options.pattern.lower()
    if not any(mark in pattern for mark in "*?["):
        pattern = f"*{pattern}*"
    found = [entry for entry in library().catalogue["exports"]
             if fnmatch.fnmatch(entry["name"].lower(), pattern)]
    if not found:
        raise LookupError(f"no export is called like {options.pattern!r}")
    family = None
    for entry in found:
        if entry["family"] != family:
            family = entry["family"]
            print(f"{family} (qx/{family}.h)")
        summary = textwrap.shorten(first_sentence(entry["documentation"]), 90, placeholder=" ...")
        print(f"  {entry['name']:<30} {summary}")


def show_export(options):
    from ..calls import export
    from ..library import library
    entry = export(options.name).entry
    entries, families = library().entries, library().catalogue["families"]
    print(textwrap.fill(entry["declaration"], 96, subsequent_indent="    "))
    print(f"    C header {entry['header']}")
    print(f"    Python   {export(options.name).signature()}\n")
    print(entry["documentation"])
    for name in entry["inherited"]:
        print(f"\n{name}: {entries[name]['documentation']}")
    introduction = next(f["introduction"] for f in families if f["name"] == entry["family"])
    if introduction:
        print(f"\nAll of {entry['header']}\n{introduction}")
    if entry["codes"]:
        print("\nMessages")
        for name in entry["codes"]:
            code = library().catalogue["codes"][name]
            print(textwrap.fill(f"{code:>7}  {name}: {library().error_text(code)}", 96,
                                subsequent_indent=" " * 9))


def add(commands):
    command = commands.add_parser("list", help="names and first sentences of the exports")
    command.add_argument("pattern", nargs="?", default="*", help="a part of a name, or * and ?")
    command.set_defaults(run=list_exports)
    command = commands.add_parser("show", help="declaration and documentation of an export")
    command.add_argument("name")
    command.set_defaults(run=show_export)
