"""The commands of python3 -m qx. Every module here that has a function add(commands) defines one or more.

`add` declares the parsers, each of which sets `run` to the function that takes the options. Modules import
what they need inside that function, so that a command does not load what only others need."""

import importlib
import pkgutil


def add_all(commands):
    for module in sorted(entry.name for entry in pkgutil.iter_modules(__path__)):
        add = getattr(importlib.import_module(f"{__name__}.{module}"), "add", None)
        if add:
            add(commands)
