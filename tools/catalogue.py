#!/usr/bin/python3
"""Reads the public headers and writes the catalogue of the exports.

    catalogue.py INCLUDE_DIR --json FILE      names, arguments, documentation
    catalogue.py INCLUDE_DIR --map FILE       linker version script of exactly the exports
    catalogue.py INCLUDE_DIR --def FILE       module definition file of exactly the exports
    catalogue.py INCLUDE_DIR --codes FILE     a line for each export with a status: its name and codes
    catalogue.py INCLUDE_DIR --umbrella FILE  qx/qx.h, which includes all headers

Exports are declared only in the headers. A declaration that cannot be read, an export without
documentation, a name declared twice, an export with a status but without codes, or an unknown code
ends the run with file, line and reason, and so fails the build.

Codes are documented in one form, the sentence "Codes:", which ends at its full stop. It lists the codes
by name, in the order in which they are raised, with the reason in brackets:

    Codes: ErrEmptyInput (x is empty), the host's status (it refuses the output), those of SortH,
    WarnSingular (a pivot is 0). This sentence is no longer part of it.
    Codes: none.

The sentence "NaN:" states the effect of a NaN in each input that can hold one, by arguments and fields
of records, in these words; tests/codes checks it with the recipes of the export:

    NaN: x, w refused with ErrNonFiniteInput; y in all results; z.level in some results or in no result;
    v skipped; u in some results or by position (kept).

"In all results" means in every number of the outputs that can be NaN. If no result is NaN, the words say
why: "skipped", the other elements give the result that they give without this one; "by position (kept)",
the element takes part, every comparison with it fails, and the effect depends on where it stands; "in no
result", it is not read, or a comparison that fails takes a path on which it is not used, which the text
describes if it matters.

The values of an argument that selects one of a few choices are listed in a sentence that begins with its
name and a colon, or in an indented table after such a colon. In a sentence the values ascend, separated
by semicolons; a range has one text:

    type: 0 lowpass; 1 highpass, with its cut-off fl; 2 to 5 reserved.
    from, to: 0 Cartesian; 1 spherical.
    form: as IIR_Filter2.

In the introduction of a header, such a list applies to all exports of the header that have the argument;
a value without a text takes the text of the introduction.

A comment that begins "As NAME, ..." or "As NAME." inherits the text of that export, and its "Codes:" and
"NaN:" sentences unless it has its own.
"""

import argparse
import json
import re
import sys
from pathlib import Path

NOT_A_FAMILY = {"types.h", "errors.h", "host.h"}

# C type of a scalar -> element name.
SCALARS = {
    "int32_t": "I32", "I32": "I32", "ErrorCode": "I32", "uint8_t": "U8", "U8": "U8",
    "int16_t": "I16",
    "uint16_t": "U16", "uint32_t": "U32", "U32": "U32", "float": "SGL", "SGL": "SGL", "double": "DBL", "DBL": "DBL",
    "CSG": "CSG", "CDB": "CDB",
}
WHOLE = ("I32", "I16", "U8", "U16", "U32")
DIRECTIONS = {"QX_IN": "in", "QX_OUT": "out", "QX_INOUT": "inout"}
HANDLE_DIMENSIONS = {"QX_ARRAY_1D": 1, "QX_ARRAY_2D": 2, "QX_ARRAY_3D": 3}
ATTRIBUTES = {"QX_ANY_ALIGNMENT", "QX_MAY_ALIAS", "QX_PACKED"}  # of types.h
UNTYPED_HANDLES = {"Array1DHandle", "Array2DHandle", "Array3DHandle"}

TOKEN = re.compile(
    r"(?P<comment>/\*.*?\*/|//[^\n]*)|(?P<directive>^[ \t]*\#(?:\\\n|[^\n])*)"
    r"|(?P<word>[A-Za-z_]\w*)|(?P<number>\d\w*)|(?P<string>\"[^\"\n]*\")|(?P<mark>\.\.\.|[^\s\w])",
    re.DOTALL | re.MULTILINE)


class HeaderError(Exception):
    def __init__(self, path, line, reason):
        super().__init__(f"{path}:{line}: {reason}")


class Token:
    def __init__(self, text, line):
        self.text, self.line = text, line


class Statement:
    """The tokens of one declaration up to its semicolon, the comment right before it, and the comments inside
    it, each with the number of tokens before it."""

    def __init__(self, tokens, comment, inside):
        self.tokens, self.comment, self.inside = tokens, comment, inside
        self.words = [token.text for token in tokens]
        self.line = tokens[0].line

    def remarks(self):
        """The comments that follow a field or a value of an enumeration on its line, by its name."""
        is_enumeration, found = self.words[0] == "enum", {}
        for count, comment in self.inside:
            names = [token.text for i, token in enumerate(self.tokens[:count])
                     if token.line == comment.line and re.match(r"[A-Za-z_]", token.text)
                     and (not is_enumeration or self.words[i - 1] in ("{", ","))]
            if names:
                found[names[-1]] = " ".join(documentation_of(comment).split())
        return found


def tokens_of(text):
    position, line = 0, 1
    for match in TOKEN.finditer(text):
        line += text.count("\n", position, match.start())
        position = match.start()
        if match.lastgroup != "directive":
            yield Token(match.group(), line)


def statements_of(path, text):
    tokens, comment, inside, depth = [], None, [], 0
    for token in tokens_of(text):
        if token.text.startswith(("/*", "//")):
            if tokens:
                inside.append((len(tokens), token))
            else:
                comment = token
            continue
        if not tokens and token.text in ("QX_BEGIN_DECLS", "QX_END_DECLS"):
            comment = None
            continue
        depth += (token.text in "({[") - (token.text in ")}]")
        if token.text == ";" and depth == 0:
            if tokens:
                yield Statement(tokens, comment, inside)
            tokens, comment, inside = [], None, []
        else:
            tokens.append(token)
    if tokens:
        raise HeaderError(path, tokens[0].line, "a declaration that does not end")


def split(words, separator=","):
    """Splits at the separators outside brackets."""
    parts, depth = [[]], 0
    for word in words:
        depth += (word in ("(", "{", "[")) - (word in (")", "}", "]"))
        if word == separator and depth == 0:
            parts.append([])
        else:
            parts[-1].append(word)
    return parts


def without_attributes(words):
    return [word for word in words if word not in ATTRIBUTES]


def spelled(words):
    return re.sub(r" ?\* ?", " *", " ".join(words)).replace("* *", "**").strip()


class Types:
    """The types that the headers define."""

    def __init__(self):
        self.records = {}  # name -> {"packed": bool, "fields": [...]}
        self.handles = {}  # name -> (dimensions, element)
        self.opaque = set()  # pointers, or structs behind pointers, that the caller only keeps
        self.procedures = set()
        self.enumerations = {}  # name -> {"documentation": text, "values": [[number, text]...]}

    def read(self, path, statement):
        words = statement.words
        if "{" in words and words[1:2] != ["enum"]:
            self._record(path, statement)
        elif words[1] in HANDLE_DIMENSIONS:
            self._handle(path, statement.line, words)
        elif "(" in without_attributes(words):
            match = re.search(r"\( \* (\w+) \)", " ".join(words))
            if not match:
                raise HeaderError(path, statement.line, "a typedef that cannot be read")
            self.procedures.add(match.group(1))
        elif words[1:3] == ["void", "*"] or (words[1] == "struct" and len(words) == 4):
            self.opaque.add(words[3])

    def read_enumeration(self, statement):
        words, remarks, values = statement.words, statement.remarks(), []
        for part in split(words[words.index("{") + 1:-1]):
            if part:
                number = int(part[2], 0) if part[1:2] == ["="] else values[-1][0] + 1 if values else 0
                values.append([number, remarks.get(part[0], "")])
        self.enumerations[words[1]] = {
            "documentation": documentation_of(statement.comment) if statement.comment else "", "values": values}

    def _handle(self, path, line, words):
        dimensions = HANDLE_DIMENSIONS[words[1]]
        match = re.fullmatch(r"QX_ARRAY_\dD \( (\w+) \) (\w+)", " ".join(words[1:]))
        element, name = match.groups() if match else (None, spelled(words[1:]))
        if (element not in SCALARS and element not in self.records) or (
                name not in (f"{element}{dimensions}D", f"{element}_{dimensions}D")):
            raise HeaderError(path, line, f"handle type {name}: its name must be a known"
                              f" element or record and {dimensions}D")
        self.handles[name] = (dimensions, element)

    def _record(self, path, statement):
        words = statement.words
        plain = without_attributes(words)
        opening = plain.index("{")
        closing = len(plain) - 1 - plain[::-1].index("}")
        names = plain[closing + 1:]
        if plain[1] != "struct" or len(names) != 1:
            raise HeaderError(path, statement.line, "a record that cannot be read")
        fields = []
        for declaration in split(plain[opening + 1:closing], ";"):
            if declaration:
                fields += self._fields(path, statement.line, declaration)
        remarks = statement.remarks()
        for field in fields:
            if field["name"] in remarks:
                field["documentation"] = remarks[field["name"]]
        self.records[names[0]] = {"packed": "QX_PACKED" in words, "fields": fields}
        if statement.comment:
            self.records[names[0]]["documentation"] = documentation_of(statement.comment)

    def _fields(self, path, line, declaration):
        declaration = [word for word in declaration if word not in ("const", "struct")]
        base = declaration[0]
        fields = []
        for part in split(declaration[1:]):
            match = re.fullmatch(r"(\**)(\w+)(?:\[(\w+)\])?", "".join(part))
            if not match:
                raise HeaderError(path, line, f"a field that cannot be read: {spelled(part)}")
            stars, name, count = match.groups()
            field = {"name": name, "type": base + (" " + stars if stars else "")}
            if not stars and base in SCALARS:
                field["element"] = SCALARS[base]
            if not stars and base in self.handles:
                field["dimensions"], field["array"] = self.handles[base]
            if count:
                field["count"] = count
            fields.append(field)
        return fields


def documentation_of(comment):
    lines = re.sub(r"^/\*+", "", comment.text)[:-2].split("\n")
    lines = [lines[0].strip()] + [re.sub(r"^\s*\*(?: |$)", "", line).rstrip() for line in lines[1:]]
    margins = [len(line) - len(line.lstrip()) for line in lines[1:] if line.strip()]
    margin = min(margins, default=0)
    return "\n".join([lines[0]] + [line[margin:] for line in lines[1:]]).strip()


def argument_of(words, types):
    """One argument as a dictionary; raises ValueError with the reason if it cannot be read."""
    text = spelled(words)
    direction = DIRECTIONS.get(words[0])
    words = words[1:] if direction else words
    length = None
    if words[:2] == ["QX_LENGTH", "("] and words[3:4] == [")"]:
        length, words = words[2], words[4:]
    if any(word in DIRECTIONS for word in words):
        raise ValueError(f"argument '{text}': a direction mark must come first and only once")
    if len(words) < 2 or not re.fullmatch(r"[A-Za-z_]\w*", words[-1]):
        raise ValueError(f"argument '{text}': a type and a name are needed")
    name, kind_words = words[-1], words[:-1]
    constant = "const" in kind_words
    base = [word for word in kind_words if word not in ("const", "struct")]
    stars = base.count("*")
    base = [word for word in base if word != "*"]
    if len(base) != 1:
        raise ValueError(f"argument '{text}': its type cannot be read")
    base = base[0]
    argument = {"name": name, "type": spelled(kind_words), "direction": direction or "in"}

    if base in UNTYPED_HANDLES:
        raise ValueError(f"argument '{text}': a handle type that names its element is needed")
    if base in types.handles and stars <= 1:
        dimensions, argument["element"] = types.handles[base]
        argument["kind"] = f"array{dimensions}d"
        if stars == 1:
            argument["byAddress"] = True
    elif stars == 0 and base in SCALARS:
        if direction not in (None, "in"):
            raise ValueError(f"argument '{text}': a scalar by value is an input")
        argument.update(kind="value", element=SCALARS[base])
        return argument
    elif stars == 0 and base in types.procedures:
        argument["kind"] = "procedure"
        return argument
    elif stars == 1 and base in types.opaque and re.search(r"Slot$|InstanceWord$", base):
        argument["kind"] = "instance" if base.endswith("InstanceWord") else "slot"
        if direction != "inout":
            raise ValueError(f"argument '{text}': the caller's word must be QX_INOUT")
    elif (stars == 1 and (base in types.opaque or base == "void")) or (
            stars == 0 and base in types.opaque):
        argument["kind"] = "opaque"
    elif stars == 1 and base == "ErrorCode":
        argument.update(kind="error", element="I32")
        if direction != "out":
            raise ValueError(f"argument '{text}': an error out-parameter must be QX_OUT")
    elif stars == 1 and base in SCALARS and length:
        argument.update(kind="buffer", element=SCALARS[base], length=length)
    elif stars == 1 and base in SCALARS:
        argument["kind"] = {"in": "reference", "out": "output", "inout": "inout"}.get(direction)
        argument["element"] = SCALARS[base]
    elif stars == 1 and base in types.records:
        argument.update(kind="record", element=base)
    else:
        raise ValueError(f"argument '{text}': unknown type {spelled(kind_words)}")
    if direction is None:
        raise ValueError(f"argument '{text}': QX_IN, QX_OUT or QX_INOUT is missing")
    if length and argument["kind"] != "buffer":
        raise ValueError(f"argument '{text}': QX_LENGTH belongs to a pointer to elements")
    if argument["kind"] in ("reference", "output", "inout", "record", "buffer"):
        if constant != (direction == "in"):
            raise ValueError(f"argument '{text}': a pointer is const exactly if it is QX_IN")
    return argument


HOST_STATUS = "the host's status"


def unknown_code(documentation, codes):
    """A fault in the codes of a text: a name that errors.h does not have, or a number; otherwise None."""
    for name in re.findall(r"\b(?:Err|Warn)[A-Z]\w*", documentation):
        if name not in codes and name != "ErrorCode":
            return f"names {name}, which errors.h does not have"
    numbers = {str(number) for number in codes.values()}
    for word in re.findall(r"(?<![\w.])[-+]?2[0-4]\d{3}(?!\w|\.\d)", documentation):
        if word[0] == "-" or word.lstrip("+") in numbers:
            return f"gives a code by its number, {word}: its name and 'Codes:' are needed"
    return None


def codes_sentence(text):
    """The text between "Codes:" and the full stop that ends it, not counting full stops in brackets;
    None if there is no such sentence."""
    match = re.search(r"\bCodes:", text)
    if not match:
        return None
    depth = 0
    for position in range(match.end(), len(text)):
        depth += (text[position] == "(") - (text[position] == ")")
        if text[position] == "." and depth == 0:
            return " ".join(text[match.end():position].split())
    raise ValueError("the sentence 'Codes:' does not end in a full stop")


def raised_by(documentation):
    """The items of the sentence "Codes:" as pairs of a kind and a name: ("code", "ErrX"),
    ("host", ""), ("those of", "NAME")."""
    sentence = codes_sentence(documentation)
    if sentence is None or sentence == "none":
        return [] if sentence else None
    items = []
    for item in re.findall(r"(?:\((?:[^()]|\((?:[^()]|\([^()]*\))*\))*\)|[^,;()])+", sentence):
        reason = r"(?: \(.+\))?"
        if match := re.fullmatch(r"((?:Err|Warn)\w+) \(.+\)", item.strip()):
            items.append(("code", match[1]))
        elif re.fullmatch(HOST_STATUS + reason, item.strip()):
            items.append(("host", ""))
        elif match := re.fullmatch(r"those of (\w+)" + reason, item.strip()):
            items.append(("those of", match[1]))
        else:
            raise ValueError(f"'{item.strip()}' under 'Codes:' is none of: a name with its reason in"
                             f" brackets, {HOST_STATUS}, those of another export")
    return items


NAN_WORD = re.compile(r"refused with (Err\w+)|in (?:all results|some results|no result)|skipped|by position \(kept\)")


def nan_of(documentation):
    """The places in the sentence "NaN:" with the words for their effect; None if there is no such sentence."""
    match = re.search(r"(?:^|\.\s+)NaN: ((?:[^.]|\.(?=\w))*)\.(?:\s|$)", documentation)
    if not match:
        return None
    found = {}
    for item in " ".join(match[1].split()).split("; "):
        parts = re.fullmatch(r"([\w.]+(?:, [\w.]+)*) ((?:refused|in|by) .+|skipped\b.*)", item)
        words = parts[2].split(" or ") if parts else []
        if not parts or not all(NAN_WORD.fullmatch(word) for word in words):
            raise ValueError(f"'{item}' under 'NaN:' does not list places with the effect of a NaN there")
        found.update((place, words) for place in parts[1].split(", "))
    return found


FULL_STOP = re.compile(r"(?<!\.)\.(?= |$)")  # not the dots of "x[1], x[2] ... x[n]"
VALUE = re.compile(r"(\d+)(?: to (\d+))?(?:\s+(\S.*))?", re.DOTALL)


def add_value(values, item, name):
    """Adds an item such as "2 bandpass" or "3 to 5" to a dictionary of texts by values."""
    match = VALUE.fullmatch(item.strip())
    if not match:
        raise ValueError(f"'{item.strip()}' under '{name}:' does not begin with a value")
    first, last, text = int(match[1]), int(match[2] or match[1]), " ".join((match[3] or "").split())
    if last < first or any(value in values for value in range(first, last + 1)):
        raise ValueError(f"the values under '{name}:' do not ascend or occur twice, at {match[1]}")
    values.update(dict.fromkeys(range(first, last + 1), text))


def values_in_table(table, name):
    values = {}
    for cell in re.split(r" {3,}|\n", table):
        if re.match(r"\s*\d", cell):
            add_value(values, cell, name)
    return values


def values_of(documentation, name):
    """The values that a text lists for an argument, with their texts; or the name of the export whose
    text lists them; or None."""
    if match := re.search(rf"\b{name}:\n\n((?: {{3,}}\S.*\n?)+)", documentation):
        return values_in_table(match[1], name)
    text = " ".join(documentation.split())
    match = re.search(rf"(?:^|[.)] )(?:\w+, )*{name}(?:, \w+)*: (as (\w+)\.|(?=\d))", text)
    if not match:
        return None
    if match[2]:
        return match[2]
    items, depth = [""], 0
    for position in range(match.end(), len(text)):
        character = text[position]
        depth += (character in "([") - (character in ")]")
        if depth == 0 and FULL_STOP.match(text, position):
            break
        if depth == 0 and character == ";":
            items.append("")
        else:
            items[-1] += character
    else:
        raise ValueError(f"the sentence '{name}:' does not end in a full stop")
    values = {}
    for item in items:
        if values and not int((re.match(r"\s*(\d+)", item) or [0, -1])[1]) > max(values):
            raise ValueError(f"'{item.strip()}' under '{name}:' is not the next value")
        add_value(values, item, name)
    return values


def find_values(export, by_name, introductions):
    """Adds "values", pairs of a value and its text, to the arguments for which they are listed."""
    def found(export, name, path=()):
        if export["name"] in path or all(a["name"] != name for a in export["arguments"]):
            raise ValueError(f"has no values for {name}: {' from '.join(path) or export['name']}")
        path = (*path, export["name"])
        general = values_of(introductions[export["family"]], name)
        own = values_of(export["documentation"], name)
        if isinstance(own, str):
            if own not in by_name:
                raise ValueError(f"takes the values of {name} from {own}, which is no export")
            return found(by_name[own], name, path)
        if own:
            return {value: text or (general or {}).get(value, "") for value, text in own.items()}
        like = by_name.get(export["as"] or "")
        if like and any(a["name"] == name for a in like["arguments"]):
            return found(like, name, path)
        return general

    for argument in export["arguments"]:
        if argument["direction"] != "in" or argument.get("element") not in WHOLE \
                or argument["kind"] not in ("value", "reference"):
            continue
        if values := found(export, argument["name"]):
            argument["values"] = sorted(values.items())


def resolve(export, by_name, path=()):
    """Adds to an export the entries that depend on other exports: "inherited", the names from which it takes
    text, nearest first, "codes", "checks" (the codes in the order in which they are raised, repeated if
    raised in several places) and "hostStatus"."""
    if "codes" in export:
        return
    if export["name"] in path:
        raise ValueError("takes over from itself")

    def other(name):
        if name not in by_name:
            raise ValueError(f"takes over from {name}, which is no export")
        resolve(by_name[name], by_name, (*path, export["name"]))
        return by_name[name]

    like = other(export["as"]) if export["as"] else None
    raised = export.pop("raised")
    if raised is None:
        raised = [("those of", export["as"])] if like else []
    export["inherited"] = [like["name"], *like["inherited"]] if like else []
    codes = []
    export["hostStatus"] = False
    for kind, name in raised:
        export["hostStatus"] |= kind == "host" or kind == "those of" and other(name)["hostStatus"]
        codes += [name] if kind == "code" else other(name)["checks"] if kind == "those of" else []
    export["codes"] = list(dict.fromkeys(codes))
    export["checks"] = codes
    if export["hasStatus"] and not (codes or export["hostStatus"] or export["saysNone"]):
        raise ValueError("has a status, but its documentation has no sentence 'Codes: ...'")
    export.pop("saysNone")
    names = {a["name"] for a in export["arguments"]}
    own = export["nan"]
    for place in own or {}:
        if place.split(".")[0] not in names:
            raise ValueError(f"states the effect of a NaN in {place}, which is no argument")
    if own is None:
        inherited = like["nan"] if like else {}
        names -= {a["name"] for a in export["arguments"] if a.get("element") in WHOLE}
        export["nan"] = {p: words for p, words in inherited.items() if p.split(".")[0] in names}


def export_of(path, statement, types, codes):
    def fail(reason):
        raise HeaderError(path, statement.line, reason)

    words = statement.words[1:]
    if "(" not in words or words[-1] != ")":
        fail(f"an export that cannot be read: {spelled(words)}")
    opening = words.index("(")
    name = words[opening - 1] if opening > 1 else ""
    returns = words[:opening - 1]
    if not re.fullmatch(r"[A-Za-z_]\w*", name):
        fail(f"an export that cannot be read: {spelled(words)}")
    if statement.comment is None or not re.match(r"/\*\*[^/]", statement.comment.text):
        fail(f"{name}: no documentation comment /** ... */ right before it")
    documentation = documentation_of(statement.comment)
    if not documentation:
        fail(f"{name}: its documentation is empty")
    known = set(SCALARS) | types.opaque | {"void"}
    if not returns or not {word for word in returns if word != "*"} <= known:
        fail(f"{name}: unknown result type {spelled(returns)}")
    if unknown := unknown_code(documentation, codes):
        fail(f"{name}: the documentation {unknown}")
    try:
        raised = raised_by(documentation)
        nan = nan_of(documentation)
    except ValueError as error:
        fail(f"{name}: {error}")

    arguments = []
    parts = split(words[opening + 1:-1])
    for part in [] if parts in ([[]], [["void"]]) else parts:
        try:
            arguments.append(argument_of(part, types))
        except ValueError as error:
            fail(f"{name}: {error}")
        if [a["name"] for a in arguments].count(arguments[-1]["name"]) > 1:
            fail(f"{name}: two arguments are called {arguments[-1]['name']}")
    if [a["kind"] for a in arguments].count("error") > 1:
        fail(f"{name}: two error out-parameters")
    counts = {a["name"] for a in arguments if a["kind"] == "value" and a["element"] == "I32"}
    for argument in arguments:
        if argument.get("length", None) not in counts | {None}:
            fail(f"{name}: the length of {argument['name']} is no int32_t argument")
    return {
        "name": name, "family": path.stem, "header": f"qx/{path.name}", "line": statement.line,
        "returns": spelled(returns), "declaration": spelled(words).replace(" ,", ",")
        .replace("( ", "(").replace(" (", "(").replace(" )", ")"),
        "arguments": arguments, "documentation": documentation,
        "hasStatus": spelled(returns) == "ErrorCode" or any(
            a["kind"] == "error" or a.get("element") == "WorkspaceStatus" for a in arguments),
        # Completed by resolve().
        "as": like[1] if (like := re.match(r"As (\w+)[,.]", documentation)) else None,
        "raised": raised, "saysNone": raised == [], "nan": nan,
    }


def codes_of(path):
    pairs = re.findall(r"\b((?:Err|Warn)\w+|QXSuccess)\s*=\s*(-?\d+)", path.read_text("utf-8"))
    return {name: int(number) for name, number in pairs}


def read_headers(include):
    """The whole catalogue; `include` is the folder that contains qx/."""
    folder = Path(include) / "qx"
    codes = codes_of(folder / "errors.h")
    types, exports, seen = Types(), [], {}
    introductions = []
    families = sorted(p for p in folder.glob("*.h") if p.name not in NOT_A_FAMILY)
    parsed = [(path, list(statements_of(path, path.read_text("utf-8"))))
              for path in [folder / "types.h", *families]]
    for path, statements in parsed:
        for statement in statements:
            if statement.words[0] == "typedef":
                types.read(path, statement)
            elif statement.words[0] == "enum" and path.name != "types.h":
                types.read_enumeration(statement)
    for path, statements in parsed[1:]:
        first = next((t for t in tokens_of(path.read_text("utf-8")) if t.text.startswith("/*")), None)
        introductions.append({"name": path.stem, "header": f"qx/{path.name}",
                              "introduction": documentation_of(first) if first else ""})
        for statement in statements:
            if statement.words[0] == "QX_API":
                export = export_of(path, statement, types, codes)
                name, place = export["name"], f"{path}:{statement.line}"
                if name in seen:
                    raise HeaderError(path, statement.line, f"{name} is declared before, {seen[name]}")
                seen[name] = place
                exports.append(export)
            elif "QX_API" in statement.words:
                raise HeaderError(path, statement.line, "QX_API must begin the declaration")
            elif "(" in statement.words and statement.words[0] not in ("typedef", "enum"):
                raise HeaderError(path, statement.line, "a function that is not marked QX_API")
    by_name = {export["name"]: export for export in exports}
    texts = {family["name"]: family["introduction"] for family in introductions}
    for export in exports:
        try:
            resolve(export, by_name)
            find_values(export, by_name, texts)
        except ValueError as error:
            raise HeaderError(folder.parent / export["header"], export["line"],
                              f"{export['name']} {error}") from error
    return {"codes": codes, "records": types.records, "enumerations": types.enumerations, "families": introductions,
            "exports": exports}


def version_script(catalogue):
    names = "".join(f"    {export['name']};\n" for export in catalogue["exports"])
    return "{\n" + (f"  global:\n{names}" if names else "") + "  local:\n    *;\n};\n"


def definition_file(catalogue):
    return "EXPORTS\n" + "".join(f"    {export['name']}\n" for export in catalogue["exports"])


def code_list(catalogue):
    """For the conformance tests: name, "host" if the export can return the host's status, codes."""
    return "".join(" ".join([export["name"], *["host"] * export["hostStatus"],
                             *(str(catalogue["codes"][code]) for code in export["codes"])]) + "\n"
                   for export in catalogue["exports"] if export["hasStatus"])


def umbrella(catalogue):
    """qx/qx.h, which includes all headers."""
    headers = sorted(["qx/errors.h", "qx/types.h", *(f["header"] for f in catalogue["families"])])
    includes = "".join(f'#include "{header}"\n' for header in headers)
    return ("#ifndef QX_QX_H\n#define QX_QX_H\n\n/* Every export of the module. Written by the build. */"
            f"\n\n{includes}\n#endif\n")


def write_if_changed(path, text):
    """Leaves an unchanged file alone, so that it keeps its time and nothing is linked again."""
    path = Path(path)
    if not path.exists() or path.read_text("utf-8") != text:
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(text, "utf-8")


def main(arguments=None):
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("include", help="the folder that contains qx/")
    parser.add_argument("--json", metavar="FILE")
    parser.add_argument("--map", metavar="FILE")
    parser.add_argument("--def", metavar="FILE", dest="definition")
    parser.add_argument("--codes", metavar="FILE")
    parser.add_argument("--umbrella", metavar="FILE")
    parser.add_argument("--version", default="", help="of the library, for the catalogue")
    options = parser.parse_args(arguments)
    try:
        catalogue = read_headers(options.include)
    except (HeaderError, OSError) as error:
        print(error, file=sys.stderr)
        return 1
    if options.json:
        write_if_changed(options.json, json.dumps({"version": options.version, **catalogue}, indent=1) + "\n")
    if options.map:
        write_if_changed(options.map, version_script(catalogue))
    if options.definition:
        write_if_changed(options.definition, definition_file(catalogue))
    if options.codes:
        write_if_changed(options.codes, code_list(catalogue))
    if options.umbrella:
        write_if_changed(options.umbrella, umbrella(catalogue))
    return 0


if __name__ == "__main__":
    sys.exit(main())
