"""The command line: python3 -m qx list, show and report."""

import argparse
import fnmatch
import os
import sys
import textwrap

EXIT_WRONG = 2


def first_sentence(documentation):
    text = " ".join(documentation.split())
    end = text.find(". ")
    return text if end < 0 else text[:end + 1]


def list_exports(options):
    from .library import library
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
    from .calls import export
    from .library import library
    entry = export(options.name).entry
    print(textwrap.fill(entry["declaration"], 96, subsequent_indent="    "))
    print(f"    C header qx/{entry['family']}.h")
    print(f"    Python   {export(options.name).signature()}\n")
    print(entry["documentation"])
    if entry["codes"]:
        print("\nMessages")
        for name in entry["codes"]:
            code = library().catalogue["codes"][name]
            print(textwrap.fill(f"{code:>7}  {name}: {library().error_text(code)}", 96,
                                subsequent_indent=" " * 9))


def report_on(options):
    from . import recording, report
    read = recording.read(options.file, options.rate, options.column)
    path = os.path.join(options.output, "report.html")
    for line in report.write(read, path):
        print(line)
    print(f"\nThe report with plots: {path}")


def positive(text):
    value = float(text)
    if not 0 < value < float("inf"):
        raise argparse.ArgumentTypeError(f"{text} is not above 0")
    return value


def arguments(argv):
    parser = argparse.ArgumentParser(prog="python3 -m qx", description="The analysis library.")
    commands = parser.add_subparsers(dest="command", required=True)
    command = commands.add_parser("list", help="names and first sentences of the exports")
    command.add_argument("pattern", nargs="?", default="*", help="a part of a name, or * and ?")
    command.set_defaults(run=list_exports)
    command = commands.add_parser("show", help="declaration and documentation of an export")
    command.add_argument("name")
    command.set_defaults(run=show_export)
    command = commands.add_parser("report", help="analyses a recording, CSV or WAV")
    command.add_argument("file")
    command.add_argument("--rate", type=positive, metavar="HZ", help="samples per second")
    command.add_argument("--column", metavar="NAME", help="column or channel, a name or a number")
    command.add_argument("--output", default="out", metavar="FOLDER",
                         help="where report.html goes, out by default")
    command.set_defaults(run=report_on)
    return parser.parse_args(argv)


def main(argv=None):
    options = arguments(argv)
    for stream in (sys.stdout, sys.stderr):
        stream.reconfigure(errors="replace")
    try:
        options.run(options)
    except BrokenPipeError:
        os.dup2(os.open(os.devnull, os.O_WRONLY), sys.stdout.fileno())
    except Exception as error:  # every failure is one line for the user
        if os.environ.get("QX_TRACEBACK"):
            raise
        message = str(error.args[0]) if isinstance(error, LookupError) and error.args else str(error)
        print(f"qx: {message or type(error).__name__}", file=sys.stderr)
        return EXIT_WRONG
    return 0


if __name__ == "__main__":
    sys.exit(main())
