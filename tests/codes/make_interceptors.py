#!/usr/bin/python3
"""make_interceptors.py CATALOGUE OUTPUT: writes, for each export of the catalogue, a function of the same
name that lets the interceptor change the arguments and then calls the module."""

import json
import sys

KINDS = {"array1d": "Array1D", "array2d": "Array2D", "array3d": "Array3D", "value": "Number",
         "reference": "Number", "output": "Number", "inout": "Number", "record": "Record",
         "error": "Error", "slot": "Word", "instance": "Word"}


def is_whole(argument):
    return argument["element"] not in ("DBL", "SGL")


def to_value(a):
    if a["kind"] == "value":
        return f"{{nullptr, {a['name']}, 0}}" if is_whole(a) else f"{{nullptr, 0, {a['name']}}}"
    return f"{{Untyped({a['name']}), 0, 0}}"


def from_value(a, place):
    if a["kind"] == "value":
        return f"static_cast<{a['type']}>(v[{place}].{'whole' if is_whole(a) else 'real'})"
    return f"Typed<{a['type']}>(v[{place}].pointer)"


def real(e, place):
    call = ", ".join(from_value(a, i) for i, a in enumerate(e["arguments"]))
    call = f"reinterpret_cast<decltype(&{e['name']})>(qxExportTargets[{place}])({call})"
    body = f"{call}; return 0;" if e["returns"] == "void" else f"return {call};"
    return f"int32_t Real{place}([[maybe_unused]] const Value *v) {{ {body} }}\n"


def function(e, place):
    arguments = ", ".join(f"{a['type']} {a['name']}" for a in e["arguments"])
    head = f'__asm__(".hidden {e["name"]}");\n{e["returns"]} {e["name"]}({arguments}) {{\n'
    if "*" in e["returns"]:
        names = ", ".join(a["name"] for a in e["arguments"])
        return f"{head}    return reinterpret_cast<decltype(&{e['name']})>(qxExportTargets[{place}])({names});\n}}\n"
    values = ", ".join(to_value(a) for a in e["arguments"]) or "{}"
    call = f"qx::test::Intercepted(qx::test::AllInterceptable()[{place}], passed)"
    return (f"{head}    qx::test::Value passed[] = {{{values}}};\n"
            f"    {'' if e['returns'] == 'void' else 'return '}{call};\n}}\n")


def tables(e, place, codes):
    arguments = "".join(
        f'    {{"{a["name"]}", ArgumentKind::{kind_of(a)}, '
        f'{str(a["kind"] == "value").lower()}, {str(a["direction"] == "in").lower()}, '
        f'{str(a["direction"] == "out").lower()}, '
        f'"{a.get("element", "")}"}},\n' for a in e["arguments"])
    nan = "".join(f'    {{"{of}", "{" or ".join(words)}"}},\n' for of, words in e["nan"].items())
    return (constants("ErrorCode", f"codesOf{place}", ", ".join(str(codes[c]) for c in e["codes"])) +
            constants("ErrorCode", f"checksOf{place}", ", ".join(str(codes[c]) for c in e["checks"])) +
            constants("InterceptedArgument", f"argumentsOf{place}", arguments) +
            constants("EffectOfNaN", f"nanOf{place}", nan))


def constants(kind, name, rows):
    """An array, or an empty span."""
    return f"constexpr {kind} {name}[] = {{\n{rows}}};\n" if rows else f"constexpr std::span<const {kind}> {name};\n"


def row(e, place):
    real_ = "nullptr" if "*" in e["returns"] else f"Real{place}"
    return (f'    {{"{e["name"]}", {real_}, {str(e["returns"] == "ErrorCode").lower()}, '
            f"codesOf{place}, checksOf{place}, argumentsOf{place}, nanOf{place}}},\n")


def kind_of(a):
    if "byAddress" in a or a.get("element") == "WorkspaceStatus":
        return "Other"
    return KINDS.get(a["kind"], "Other")


def fields(name, of_record):
    rows = ""
    for f in of_record:
        if "element" in f and "count" not in f:
            rows += f'    {{"{f["name"]}", offsetof({name}, {f["name"]}), 0, "{f["element"]}"}},\n'
        elif "array" in f:
            rows += (f'    {{"{f["name"]}", offsetof({name}, {f["name"]}), {f["dimensions"]},'
                     f' "{f["array"]}"}},\n')
    return constants("LayoutField", f"fieldsOf{name}", rows)


def main(catalogue_file, output):
    with open(catalogue_file, encoding="utf-8") as file:
        catalogue = json.load(file)
    exports, codes = catalogue["exports"], catalogue["codes"]
    callable_ = [(e, i) for i, e in enumerate(exports) if "*" not in e["returns"]]
    used = sorted({a["element"] for e in exports for a in e["arguments"]
                   if a.get("element") in catalogue["records"]})
    text = ('#include "tests/codes/intercept.h"\n\n#include "qx/qx.h"\n\n#include <cstddef>\n\n'
            f"void *qxExportTargets[{len(exports)}];\n\nnamespace qx::test {{\n\nnamespace {{\n\n"
            + "".join(real(e, i) for e, i in callable_) +
            "\n" + "".join(tables(e, i, codes) for i, e in enumerate(exports)) +
            "constexpr Interceptable interceptable[] = {\n" + "".join(row(e, i) for i, e in enumerate(exports)) +
            "};\n\n" + "".join(fields(name, catalogue["records"][name]["fields"]) for name in used) +
            "constexpr RecordLayout layouts[] = {\n" +
            "".join(f'    {{"{name}", sizeof({name}), fieldsOf{name}}},\n' for name in used) +
            "};\n\n} // namespace\n\nstd::span<const Interceptable> AllInterceptable() { return interceptable; }\n"
            "std::span<const RecordLayout> AllLayouts() { return layouts; }\n\n"
            "const std::vector<const char *> &ExportNames() {\n"
            "    static const std::vector<const char *> all = {"
            + ", ".join(f'"{e["name"]}"' for e in exports) +
            "};\n    return all;\n}\n\nconst std::map<std::string, ErrorCode> &AllCodes() {\n"
            "    static const std::map<std::string, ErrorCode> all = {\n"
            + "".join(f'        {{"{name}", {number}}},\n' for name, number in codes.items()) +
            "    };\n    return all;\n}\n\n} // namespace qx::test\n\n"
            'using qx::test::Untyped;\n\nextern "C" {\n'
            + "".join(function(e, i) for i, e in enumerate(exports)) + "}\n")
    with open(output, "w", encoding="utf-8") as file:
        file.write(text)


if __name__ == "__main__":
    main(*sys.argv[1:])
