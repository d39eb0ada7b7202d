"""The commands of python3 -m qx: every module here with a function add(commands) is one or more.

`add` declares parsers, and each sets `run` to the function that takes the options. Modules import
what they need inside that function, so that one command does not pay for the others."""

import importlib
import pkgutil


def add_all(commands):
    for module in sorted(entry.name for entry in pkgutil.iter_modules(__path__)):
        add = getattr(importlib.import_module(f"{__name__}.{module}"), "add", None)
        if add:
            add(commands)
