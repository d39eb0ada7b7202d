#!/usr/bin/python3
"""Copies the packages of bindings/ to OUTPUT and adds the declarations of all exports, from the catalogue.

    bindings.py CATALOGUE.json OUTPUT

Creates the folders rust, csharp, julia and octave in OUTPUT.
"""

import json
import re
import shutil
import sys
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent
PACKAGES = ROOT / "bindings"
WARNING = "Written by tools/bindings.py from the headers. Do not edit."

# Element types that need not be aligned.
UNALIGNED = {"DBL", "SGL", "I32", "U32", "CDB", "CSG"}

KEYWORDS = {language: set(words.split()) for language, words in {
    "rust": """abstract as async await become box break const continue crate do dyn else enum extern false final fn for if
        impl in let loop macro match mod move mut override priv pub ref return self static struct super trait true try
        type typeof unsafe unsized use virtual where while yield""",
    "csharp": """abstract as base bool break byte case catch char checked class const continue decimal default delegate do
        double else enum event explicit extern false finally fixed float for foreach goto if implicit in int interface
        internal is lock long namespace new null object operator out override params private protected public readonly
        ref return sbyte sealed short sizeof stackalloc static string struct switch this throw true try typeof uint ulong
        unchecked unsafe ushort using virtual void volatile while""",
    "julia": """baremodule begin break catch ccall const continue do else elseif end export false finally for function global
        if import in isa let local macro module quote return struct true try using where while""",
}.items()}


def is_unaligned(record):
    """Whether a record has no padding and no alignment: it is marked as packed, or has only elements."""
    return record["packed"] or all(field["type"] in UNALIGNED for field in record["fields"])


def safe(language, name):
    return name + "_" if name in KEYWORDS[language] else name


def fields_of(record):
    """Name, type (as in the catalogue) and number of elements of each field."""
    return [(field["name"], field["type"].replace("const ", ""), int(field.get("count", 1))) for field in record["fields"]]


# Rust

RUST = {"int32_t": "i32", "I32": "i32", "ErrorCode": "ErrorCode", "uint8_t": "u8", "U8": "u8", "int16_t": "i16",
        "uint16_t": "u16", "uint32_t": "u32", "U32": "u32", "float": "f32", "SGL": "f32", "double": "f64", "DBL": "f64"}


def rust_type(text):
    text = text.replace("struct ", "")
    constant, text = text.startswith("const "), text.replace("const ", "")
    stars = text.count("*")
    base = text.replace("*", "").strip()
    base = RUST.get(base, "std::os::raw::c_void" if base == "void" else base)
    if stars == 0:
        return base
    return ("*const " if constant else "*mut ") + "*mut " * (stars - 1) + base


def rust(catalogue):
    yield f"// {WARNING}\n\n"
    for code, number in catalogue["codes"].items():
        yield f"pub const {code}: ErrorCode = {number};\n"
    arrays, opaque = handles_of(catalogue), opaque_of(catalogue)
    for name, (dimensions, element) in arrays.items():
        yield f"\n/// The head of a block: {'its size' if dimensions == 1 else 'its sizes'}, which the elements" \
              f" follow.\n#[repr(C)]\npub struct Block_{name} {{\n    pub sizes: [i32; {dimensions}],\n}}\n" \
              f"/// An array of {element}, {dimensions}-dimensional.\npub type {name} = *mut *mut Block_{name};\n"
    for name in opaque:
        yield f"pub type {name} = *mut std::os::raw::c_void;\n"
    for name, record in catalogue["records"].items():
        if name.startswith("Array"):
            continue
        packed = ", packed" if is_unaligned(record) else ""
        yield "\n" + "".join(f"/// {line}\n" for line in record.get("documentation", name).split("\n"))
        yield f"#[repr(C{packed})]\n#[derive(Clone, Copy)]\npub struct {name} {{\n"
        for field, kind, count in fields_of(record):
            kind = rust_type(kind)
            yield f"    pub {safe('rust', field)}: {kind if count == 1 else f'[{kind}; {count}]'},\n"
        yield "}\n"
    yield '\nextern "C" {\n'
    for export in catalogue["exports"]:
        yield "".join(f"    /// {line}".rstrip() + "\n" for line in export["documentation"].split("\n"))
        arguments = ", ".join(f"{safe('rust', one['name'])}: {rust_type(one['type'])}" for one in export["arguments"])
        result = "" if export["returns"] == "void" else f" -> {rust_type(export['returns'])}"
        yield f"    pub fn {export['name']}({arguments}){result};\n"
    yield "}\n"


def handles_of(catalogue):
    """Handle types by name: dimensions and element."""
    found = {}
    for export in catalogue["exports"]:
        for one in export["arguments"]:
            if one["kind"].startswith("array"):
                found[one["type"].replace("*", "").strip()] = (int(one["kind"][5]), one["element"])
    for record in catalogue["records"].values():
        for field in record["fields"]:
            if "dimensions" in field:
                found[field["type"]] = (field["dimensions"], field["array"])
    return dict(sorted(found.items()))


def opaque_of(catalogue):
    """Opaque types: words that the caller keeps, and pointers that an export returns."""
    known = {*RUST, "void", *catalogue["records"], *handles_of(catalogue)}
    types = [one["type"] for export in catalogue["exports"] for one in export["arguments"]]
    types += [export["returns"] for export in catalogue["exports"]]
    bases = {re.sub(r"\b(const|struct)\b|\*", "", text).strip() for text in types}
    return sorted(bases - known)


# C#

CSHARP = {"int32_t": "int", "I32": "int", "ErrorCode": "int", "uint8_t": "byte", "U8": "byte", "int16_t": "short",
          "uint16_t": "ushort", "uint32_t": "uint", "U32": "uint", "float": "float", "SGL": "float", "double": "double",
          "DBL": "double"}


def xml(text):
    return text.replace("&", "&amp;").replace("<", "&lt;").replace(">", "&gt;")


def csharp_argument(catalogue, one):
    base = one["type"].replace("const ", "").replace("*", "").strip()
    name = safe("csharp", one["name"])
    if one["kind"] in ("slot", "instance") or one.get("byAddress"):
        return f"ref IntPtr {name}"
    if one["kind"] in ("output", "error"):
        return f"out {CSHARP.get(base, base)} {name}"
    if one["kind"] in ("reference", "inout", "record"):
        return f"{'out' if one['direction'] == 'out' else 'ref'} {CSHARP.get(base, base)} {name}"
    if one["kind"] == "value":
        return f"{CSHARP[base]} {name}"
    if one["kind"] == "buffer":
        return f"[In, Out] {CSHARP[base]}[] {name}"
    return f"IntPtr {name}"


def csharp(catalogue):
    yield f"// {WARNING}\n\nusing System;\nusing System.Runtime.InteropServices;\n\nnamespace QX\n{{\n"
    yield "    /// <summary>Negative codes are failures, positive ones warnings.</summary>\n" \
          "    public static class Code\n    {\n"
    for code, number in catalogue["codes"].items():
        yield f"        public const int {code} = {number};\n"
    yield "    }\n\n"
    for name, record in catalogue["records"].items():
        if name.startswith("Array"):
            continue
        pack = ", Pack = 1" if is_unaligned(record) else ""
        yield f"    /// <summary>{xml(' '.join(record.get('documentation', name).split()))}</summary>\n" \
              f"    [StructLayout(LayoutKind.Sequential{pack})]\n    public struct {name}\n    {{\n"
        for field, kind, count in fields_of(record):
            base = CSHARP.get(kind, "IntPtr")
            for i in range(count):
                yield f"        public {base} {safe('csharp', field)}{i if count > 1 else ''};\n"
        yield "    }\n\n"
    yield "    /// <summary>The exports. Arrays are handles, created by Host.</summary>\n" \
          "    public static class Exports\n    {\n"
    for export in catalogue["exports"]:
        lines = ["<summary>", *xml(export["documentation"]).split("\n"), "</summary>"]
        yield "".join(f"        /// {line}".rstrip() + "\n" for line in lines)
        arguments = ", ".join(csharp_argument(catalogue, one) for one in export["arguments"])
        returns = export["returns"]
        result = "void" if returns == "void" else CSHARP.get(returns, "IntPtr")
        yield "        [DllImport(\"qxanalysis\", CallingConvention = CallingConvention.Cdecl)]\n" \
              f"        public static extern {result} {export['name']}({arguments});\n\n"
    yield "    }\n}\n"


# Julia

JULIA = {"int32_t": "Int32", "I32": "Int32", "ErrorCode": "Int32", "uint8_t": "UInt8", "U8": "UInt8", "int16_t": "Int16",
         "uint16_t": "UInt16", "uint32_t": "UInt32", "U32": "UInt32", "float": "Float32", "SGL": "Float32",
         "double": "Float64", "DBL": "Float64", "CDB": "ComplexF64", "CSG": "ComplexF32", "void": "Cvoid"}


def julia_type(text, records):
    base = re.sub(r"\b(const|struct)\b|\*", "", text).strip()
    if "*" not in text:
        return JULIA.get(base, "Ptr{Cvoid}")
    return f"Ptr{{{JULIA.get(base, base if base in records else 'Ptr{Cvoid}')}}}"


def julia_record(name, record):
    fields = [(safe("julia", field), JULIA.get(kind) or julia_type(kind, {}) if count == 1 else
               f"NTuple{{{count}, {JULIA[kind]}}}") for field, kind, count in fields_of(record)]
    text = record.get("documentation", name).replace("\\", "\\\\").replace('"', '\\"').replace("$", "\\$")
    yield f'\n"""\n    {name}({", ".join(field for field, _ in fields)})\n\n{text}\n"""\n'
    if not record["packed"]:
        yield f"struct {name}\n" + "".join(f"    {field}::{kind}\n" for field, kind in fields) + "end\n"
        return
    # Julia has no packed structures.
    sizes = [f"sizeof({kind})" for _, kind in fields]
    yield f"struct {name}\n    bytes::NTuple{{{' + '.join(sizes)}, UInt8}}\nend\n"
    yield f"{name}({', '.join(field for field, _ in fields)}) =\n    {name}(packed(" \
          + ", ".join(f"convert({kind}, {field})" for field, kind in fields) + "))\n"
    yield f"function Base.getproperty(record::{name}, name::Symbol)\n    bytes = getfield(record, :bytes)\n"
    for i, (field, kind) in enumerate(fields):
        yield f"    name == :{field} && return part(bytes, {kind}, {' + '.join(sizes[:i]) or 0})\n"
    yield "    getfield(record, name)\nend\n"


def julia(catalogue):
    yield f"# {WARNING}\n\n"
    for code, number in catalogue["codes"].items():
        yield f"const {code} = Int32({number})\n"
    for name, record in catalogue["records"].items():
        if not name.startswith("Array") and name not in JULIA:
            yield from julia_record(name, record)
    for export in catalogue["exports"]:
        names = [safe("julia", one["name"]) for one in export["arguments"]]
        kinds = [julia_type(one["type"], catalogue["records"]) for one in export["arguments"]]
        text = export["documentation"].replace("\\", "\\\\").replace('"', '\\"').replace("$", "\\$")
        signature = f"{export['name']}({', '.join(names)})"
        tuple_text = f"({', '.join(kinds)}{',' if len(kinds) == 1 else ''})"
        yield f'\n"""\n    {signature}\n\n{text}\n"""\nfunction {signature}\n' \
              f"    ccall((:{export['name']}, libqxanalysis), {julia_type(export['returns'], {})}, {tuple_text}" \
              + "".join(f", {name}" for name in names) + ")\nend\n"


# Octave

OCTAVE = {"DBL": "double", "CDB": "std::complex<double>", "I32": "int32_t", "U32": "uint32_t", "SGL": "float",
          "CSG": "std::complex<float>", "U8": "uint8_t", "I16": "int16_t", "U16": "uint16_t"}


def octave_wrapper(export):
    """A function from the values of the inputs to those of the outputs; None if an argument is not a value."""
    lines, handed, outputs, count = [], [], [], 0
    for one in export["arguments"]:
        name, kind, element = one["name"] + "_", one["kind"], OCTAVE.get(one.get("element"))
        goes_in, goes_out = one["direction"] != "out", one["direction"] != "in"
        if kind in ("slot", "error"):
            lines.append(f"static qx::detail::Plan {name};" if kind == "slot" else f"ErrorCode {name} = 0;")
            base = one["type"].split()[0]
            handed.append(f"{name}.address<{base}>()" if kind == "slot" else f"&{name}")
            continue
        if element is None or one.get("byAddress") or kind not in (
                "array1d", "array2d", "value", "reference", "output", "inout"):
            return None
        if kind.startswith("array"):
            made = f"in.array{kind[5]}<{element}>({count})" if goes_in else f"In::empty{kind[5]}<{element}>()"
            lines.append(f"const auto {name} = {made};")
            handed.append(f"{name}.handle()")
            outputs.append(f"out.add({name});" if goes_out else None)
        else:
            held = "CDB" if one["element"] == "CDB" else element
            value = (f"qx::detail::ToC(in.complex({count}))" if held == "CDB" else f"in.number<{element}>({count})") \
                if goes_in else "{}"
            lines.append(f"{held} {name} = {value};" if goes_in else f"{held} {name}{{}};")
            handed.append(name if kind == "value" else f"&{name}")
            outputs.append((f"out.add(qx::detail::FromC({name}));" if held == "CDB" else f"out.add({name});")
                           if goes_out else None)
        count += goes_in
    call = f"::{export['name']}({', '.join(handed)})"
    error = next((one["name"] + "_" for one in export["arguments"] if one["kind"] == "error"), None)
    if error:
        lines.append(f"const ErrorCode status = {call};\n    check(\"{export['name']}\", {error} != 0 ? {error} : status);")
    elif export["returns"] == "ErrorCode":
        lines.append(f"check(\"{export['name']}\", {call});")
    elif export["returns"] in ("void", "int32_t"):
        lines.append(f"{call};")
    elif export["returns"] == "double":
        lines.append(f"out.add({call});")
    else:
        return None
    lines += filter(None, outputs)
    body = "".join(f"    {line}\n" for line in lines)
    unused = "" if count else "    (void)in;\n"
    return f"void Call_{export['name']}(const In &in, Out &out) {{\n{unused}    (void)out;\n{body}}}\n", count


def octave(catalogue):
    yield f"// {WARNING}\n\n"
    rows = []
    for export in catalogue["exports"]:
        made = octave_wrapper(export)
        if made:
            yield made[0]
            rows.append(f'    {{"{export["name"]}", {{Call_{export["name"]}, {made[1]}}}}},\n')
    yield "const std::map<std::string, Entry> entries = {\n" + "".join(rows) + "};\n"


FILES = {"rust/src/exports.rs": rust, "csharp/Exports.cs": csharp, "julia/src/exports.jl": julia,
         "octave/exports.inc": octave}


def main(source, target):
    catalogue = json.loads(Path(source).read_text("utf-8"))
    shutil.copytree(PACKAGES, target, dirs_exist_ok=True)
    for name, write in FILES.items():
        place = Path(target) / name
        place.parent.mkdir(parents=True, exist_ok=True)
        place.write_text("".join(write(catalogue)), "utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
