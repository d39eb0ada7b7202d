"""The commands list and show."""

import textwrap

from .values import add_command

LIST_EXAMPLES = """\
examples:
  python3 -m qx list variance
  python3 -m qx list "Bessel*"
  python3 -m qx list peaks stream"""

SHOW_EXAMPLES = """\
examples:
  python3 -m qx show Moment_head"""


def list_exports(options):
    from ..catalogue import find, summary
    from ..library import library
    entries = library().entries
    family = None
    for name in find(" ".join(options.pattern) or "*"):
        entry = entries[name]
        if entry["family"] != family:
            family = entry["family"]
            print(f"{family} (qx/{family}.h)")
        print(f"  {name:<30} {summary(entry)}")


def show_export(options):
    from ..calls import entry as entry_of
    from ..functions import documentation, signature_text, surroundings
    from ..library import library
    entry = entry_of(options.name)
    print(textwrap.fill(entry["declaration"], 96, subsequent_indent="    "))
    print(f"    C header {entry['header']}")
    print(f"    Python   {signature_text(entry)}\n")
    print("\n\n".join(filter(None, [documentation(entry), surroundings(entry)])))
    if entry["codes"]:
        print("\nMessages")
        for name in entry["codes"]:
            code = library().catalogue["codes"][name]
            print(textwrap.fill(f"{code:>7}  {name}: {library().error_text(code)}", 96,
                                subsequent_indent=" " * 9))


def add(commands):
    command = add_command(commands, "list", LIST_EXAMPLES, help="finds exports by words in their names and texts")
    command.add_argument("pattern", nargs="*", help="words, or a name with * and ?")
    command.set_defaults(run=list_exports)
    command = add_command(commands, "show", SHOW_EXAMPLES, help="shows the declaration and the documentation of an export")
    command.add_argument("name")
    command.set_defaults(run=show_export)
