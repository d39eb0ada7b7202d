"""The command view."""

import sys

from . import reading
from .values import add_command

EXAMPLES = """\
examples:
  python3 -m qx view examples/data/ecg_208_360hz.csv
  python3 -m qx view --port 8800 examples/data/ecg_208_360hz.csv

The page is served to this machine only, at the address that is printed, until Ctrl-C. It shows all samples of
recordings of any length. They are kept in temporary files, 8 bytes each."""


def port(text):
    value = int(text)
    if not 0 <= value <= 65535:
        raise ValueError(text)
    return value


def view(options):
    import asyncio

    from .. import serving, viewing
    opened = []
    for path in options.files:
        print(f"reading {path}", file=sys.stderr, flush=True)
        opened.append(viewing.Opened(path, reading.of(options)))

    def ready(address):
        print(address, flush=True)
        if options.open:
            import webbrowser
            webbrowser.open(address)

    asyncio.run(serving.serve(opened, options.port, ready))


def add(commands):
    command = add_command(commands, "view", EXAMPLES, help="shows recordings in a browser, with all their samples",
                          description="Serves pages of recordings to a browser on this machine.")
    command.add_argument("files", nargs="+", metavar="FILE")
    reading.missing(reading.add_options(command), "skip", "interpolate")
    command.add_argument("--port", type=port, default=0, help="port of the address; any free port by default")
    command.add_argument("--open", action="store_true", help="opens the page in a browser")
    command.set_defaults(run=view)
