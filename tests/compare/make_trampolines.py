#!/usr/bin/python3
"""make_trampolines.py CATALOGUE OUTPUT [--show] [--modes] [--but NAME...]: writes, for each export of the
catalogue, a function of the same name that jumps to its address in a loaded module, so that one program can
call the exports of any module. --show: the functions are visible to other modules. --modes: each function first
sets the arithmetic modes in qxModesOfCalls, unless that is 0 (x86). --but: omits these exports."""

import argparse
import json

SETS_MODES = '''        "cmpl $0, qxModesOfCalls(%rip)\\n"
        "je 1f\\n"
        "ldmxcsr qxModesOfCalls(%rip)\\n"
        "1:\\n"
'''


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("catalogue")
    parser.add_argument("output")
    parser.add_argument("--show", action="store_true")
    parser.add_argument("--modes", action="store_true")
    parser.add_argument("--but", nargs="*", default=[])
    options = parser.parse_args()
    with open(options.catalogue, encoding="utf-8") as file:
        names = [export["name"] for export in json.load(file)["exports"]]
    jumps = "".join(
        f'        ".globl {name}\\n"\n'
        + ("" if options.show else f'        ".hidden {name}\\n"\n')
        + f'        ".type {name}, @function\\n"\n'
        f'        "{name}:\\n"\n'
        + (SETS_MODES if options.modes else "") +
        f'        JUMP_BY("qxExportTargets+{8 * place}") "\\n"\n'
        for place, name in enumerate(names) if name not in options.but)
    text = ('#include "tests/compare/trampolines.h"\n\n'
            f'void *qxExportTargets[{len(names)}];\n\n'
            "#ifdef __aarch64__\n"
            '#define JUMP_BY(word) "adrp x16, " word "; ldr x16, [x16, :lo12:" word "]; br x16"\n'
            "#else\n"
            '#define JUMP_BY(word) "jmp *" word "(%rip)"\n'
            "#endif\n\n"
            '__asm__(".text\\n"\n' + jumps + ");\n\n"
            "namespace qx::test {\n\nconst std::vector<const char *> &ExportNames() {\n"
            "    static const std::vector<const char *> all = {"
            + ", ".join(f'"{name}"' for name in names) +
            "};\n    return all;\n}\n\n} // namespace qx::test\n")
    with open(options.output, "w", encoding="utf-8") as file:
        file.write(text)


if __name__ == "__main__":
    main()
