"""make_thunks.py CATALOGUE OUTPUT: generates, from the catalogue, calls of each export with
untyped arguments, so that the fuzzer attacks an export as soon as it is declared."""

import json
import sys

KINDS = {"array1d": "Array1D", "array2d": "Array2D", "value": "Value", "reference": "Reference",
         "output": "Output", "inout": "InOut", "record": "Record", "slot": "Slot",
         "instance": "Instance", "error": "Error"}


def is_driven(export, records):
    """False for exports that take pointers whose target the catalogue does not describe, and for those that change
    the process: the fuzzer itself calls the exports of the workspace."""
    return "*" not in export["returns"] and all(
        a["kind"] in KINDS and "byAddress" not in a and a.get("element") != "WorkspaceStatus"
        and all("*" not in f["type"] and "element" in f
                for f in records.get(a.get("element"), {"fields": []})["fields"])
        for a in export["arguments"]) and not is_release(export)


def is_release(export):
    return [a["kind"] for a in export["arguments"]] == ["instance"]


def release_of(export, exports):
    """The export that releases what an instance word holds: that of the same header, else that of the transforms."""
    if not any(a["kind"] == "instance" for a in export["arguments"]):
        return "nullptr"
    releases = [e for e in exports if is_release(e)]
    same = [e["name"] for e in releases if e["header"] == export["header"]]
    return same[0] if same else "TransformUnreserveProc"


def argument(a, number):
    if a["kind"] == "value":
        return f"static_cast<{a['type']}>(v[{number}].{'real' if a['element'] in ('DBL', 'SGL') else 'whole'})"
    return f"static_cast<{a['type']}>(v[{number}].pointer)"


def thunk(export):
    call = ", ".join(argument(a, i) for i, a in enumerate(export["arguments"]))
    call = f"{export['name']}({call})"
    body = f"{call}; return 0;" if export["returns"] == "void" else f"return static_cast<int32_t>({call});"
    return f"int32_t Thunk_{export['name']}([[maybe_unused]] const Value *v) {{ {body} }}\n"


def parameters(export):
    rows = "".join(
        f'    {{"{a["name"]}", Kind::{KINDS[a["kind"]]}, {str(a["direction"] != "in").lower()},'
        f' {str(a["direction"] != "out").lower()}, "{a["element"] if "element" in a else ""}"}},\n'
        for a in export["arguments"])
    return f"constexpr Parameter parametersOf{export['name']}[] = {{\n{rows}}};\n" if rows else ""


def row(export, exports):
    table = f"parametersOf{export['name']}" if export["arguments"] else "{}"
    return (f'    {{"{export["name"]}", Thunk_{export["name"]}, {release_of(export, exports)},'
            f' {str(export["returns"] == "ErrorCode").lower()}, {table}}},\n')


def fields(name, of_record):
    rows = "".join(f'    {{offsetof({name}, {f["name"]}), {f.get("count", 1)}, "{f["element"]}"}},\n'
                   for f in of_record)
    return f"constexpr RecordField fieldsOf{name}[] = {{\n{rows}}};\n"


def main(catalogue_file, output):
    with open(catalogue_file, encoding="utf-8") as file:
        catalogue = json.load(file)
    exports, records = catalogue["exports"], catalogue["records"]
    driven = [e for e in exports if is_driven(e, records)]
    used = sorted({a["element"] for e in driven for a in e["arguments"] if a.get("element") in records})
    text = ('#include "tests/fuzz/thunk.h"\n\n#include "qx/qx.h"\n\n#include <cstddef>\n\n'
            "namespace qx::test {\n\nnamespace {\n\n" + "".join(map(thunk, driven)) + "\n" +
            "".join(map(parameters, driven)) +
            "const Thunk thunks[] = {\n" + "".join(row(e, exports) for e in driven) + "};\n\n" +
            "".join(fields(name, records[name]["fields"]) for name in used) +
            "constexpr RecordType records[] = {\n" +
            "".join(f'    {{"{name}", sizeof({name}), fieldsOf{name}}},\n' for name in used) + "};\n\n" +
            "constexpr const char *notDriven[] = {" +
            ", ".join(f'"{e["name"]}"' for e in exports if e not in driven) + "};\n\n} // namespace\n\n" +
            "std::span<const Thunk> AllThunks() { return thunks; }\n\n"
            "const RecordType *FindRecord(std::string_view name) {\n"
            "    for (const RecordType &record : records)\n        if (record.name == name)\n"
            "            return &record;\n    return nullptr;\n}\n\n"
            "std::span<const char *const> NotDriven() { return notDriven; }\n\n} // namespace qx::test\n")
    with open(output, "w", encoding="utf-8") as file:
        file.write(text)


if __name__ == "__main__":
    main(*sys.argv[1:])
