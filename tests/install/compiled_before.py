"""compiled_before.py BUILD FOLDER COMPILER ARGUMENT...: a compiler launcher that takes the object of a source from
BUILD. FOLDER stands in for BUILD in the project that compiles. A source that BUILD has not compiled, or with other
options, is an error, which names them; what does not belong into FOLDER is compiled.
"""

import json
import os
import shlex
import shutil
import sys
from pathlib import Path


def options(arguments):
    """Those that decide about the object, and the object."""
    kept, target, rest = [], None, iter(arguments)
    for argument in rest:
        if argument == "-o":
            target = next(rest)
        elif argument in ("-MF", "-MT"):
            next(rest)
        elif argument != "-MD":
            kept.append(argument)
    return kept, target


def main(build, folder, *command):
    mine, place = options([argument.replace(folder, build) for argument in command[1:]])
    if not Path(place).absolute().is_relative_to(folder):
        os.execvp(command[0], command)
    depends = next((command[i + 1] for i, argument in enumerate(command) if argument == "-MF"), None)
    source = os.path.abspath(command[-1]).replace(folder, build)  # as some sources are generated
    others = []
    for entry in json.loads(Path(build, "compile_commands.json").read_text("utf-8")):
        if entry["file"] != source:
            continue
        words = shlex.split(entry["command"])
        start = next(i for i, word in enumerate(words) if word.startswith("-"))
        theirs, made = options(words[start:])
        if theirs == mine:
            shutil.copyfile(Path(entry["directory"], made), place)
            if depends:
                Path(depends).write_text(f"{place}: {source}\n", "utf-8")
            return 0
        others.append(sorted(set(theirs) ^ set(mine)) or ["the order of the options"])
    print(f"{source}: differs from {build} by", *min(others, key=len, default=["being here"]), file=sys.stderr)
    return 1


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
