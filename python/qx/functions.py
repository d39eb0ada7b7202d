"""Every export as a Python function.

The source of a function is generated from the catalogue, with a line for what each argument needs before
the call and a line for what it returns after it, and is compiled at its first use. The result is a plain
function with a signature, named arguments and the header's text, and a call does nothing that the export
does not need.
"""

import ctypes
import functools
import keyword
import linecache
import math
import re
import textwrap

import numpy as np

from . import arrays, plans
from .library import library
from .outcomes import at, tell
from .pointers import GIVES_BACK, address, pointer
from .procedures import FIT, Procedure
from .records import Record
from .scalars import C_TYPES, COMPLEX, LIMITS, c_number, chosen, real, shown, whole

RESULTS = {"ErrorCode": "I32", "int32_t": "I32", "uint32_t": "U32", "uint8_t": "U8", "double": "DBL",
           "DBL": "DBL", "float": "SGL"}
CALLERS_WORDS = ("slot", "instance")


def python_name(argument):
    return argument["name"] + "_" * keyword.iskeyword(argument["name"])


def is_given(argument):
    return argument["direction"] != "out" and argument["kind"] not in CALLERS_WORDS


def is_taken(argument):
    return argument["direction"] != "in" and argument["kind"] not in (*CALLERS_WORDS, "error")


def gives_value(entry):
    """Whether the function result is a value rather than a status."""
    return (not any(map(is_taken, entry["arguments"])) and entry["returns"] not in ("ErrorCode", "void")
            and not any(a["kind"] == "error" for a in entry["arguments"]))


def is_of_scalars(entry):
    """Whether the export is a function of numbers, which is mapped over arrays."""
    arguments = entry["arguments"]
    return any(map(is_given, arguments)) and entry["returns"] in (*RESULTS, "void") and all(
        a["kind"] in ("value", "reference", "output", "error") for a in arguments)


def plain_type(element):
    return "_complex" if element in COMPLEX else "_int" if element in LIMITS else "_float"


def annotation(argument):
    """The type of an argument or a result, for readers and type checkers."""
    kind, element, given = argument["kind"], argument.get("element"), argument["direction"] != "out"
    if kind.startswith("array") or kind == "buffer":
        if given:
            return "ArrayLike"
        return f"NDArray[np.{arrays.element_dtype(element).name}]"
    if kind == "record":
        return "Mapping[str, Any]" if given else "dict[str, Any]"
    if kind == "opaque":
        return "Pointer | None"
    if kind == "procedure":
        return "Callable[..., Any] | None"
    return "complex" if element in COMPLEX else "int" if element in LIMITS else "float"


def result_annotation(entry):
    taken = [annotation({**a, "direction": "out"}) for a in entry["arguments"] if is_taken(a)]
    if not taken and gives_value(entry):
        element = RESULTS.get(entry["returns"])
        taken = [annotation({"kind": "value", "element": element, "direction": "out"}) if element
                 else "Pointer"]
    if not taken:
        return "None"
    return taken[0] if len(taken) == 1 else f"tuple[{', '.join(taken)}]"


def parameters(entry):
    """The parameters of the Python function as text."""
    mapped = " | ArrayLike" * is_of_scalars(entry)
    return ", ".join(f"{python_name(a)}: '{annotation(a)}{mapped}'"
                     for a in entry["arguments"] if is_given(a))


def returned(entry):
    text = result_annotation(entry)
    return f"{text} | NDArray[Any]" if is_of_scalars(entry) and "tuple" not in text else text


def documentation(entry):
    """The documentation of an export, and of the exports whose documentation it shares."""
    entries = library().entries
    parts = [entry["documentation"]]
    parts += [f"{name}: {entries[name]['documentation']}" for name in entry["inherited"]]
    names = [a["name"] for a in entry["arguments"] if is_taken(a)]
    if names:
        parts.append(f"Gives {', '.join(names)}.")
    return "\n\n".join(parts)


def surroundings(entry):
    """Documentation shared by several exports: the records and enumerations that this one takes, and the text of
    its family."""
    catalogue = library().catalogue
    names = dict.fromkeys(a["element"] for a in entry["arguments"]
                          if a.get("element") in catalogue["records"] and a["element"] not in COMPLEX)
    parts = [_record_text(name, library().records[name]) for name in names]
    text = "\n".join([documentation(entry), *parts])
    parts += [_enumeration_text(name, one) for name, one in catalogue["enumerations"].items()
              if re.search(rf"\b{name}\b", text)]
    introduction = next(f["introduction"] for f in catalogue["families"] if f["name"] == entry["family"])
    return "\n\n".join([*parts, f"All of {entry['header']}\n{introduction}"] if introduction else parts)


def _filled(text, first):
    return textwrap.fill(text, 96, initial_indent=first, subsequent_indent=" " * (len(first) + 2))


def _record_text(name, record):
    lines = [_filled(f"{name}, a dictionary. {record.get('documentation', '')}".rstrip(), "")]
    for field in record["fields"]:
        if field["type"].endswith("*"):
            continue  # set by the export in every call
        kind = f"array of {field['array']}, {field['dimensions']}D" if "array" in field else field["type"]
        count = f" [{field['count']}]" if "count" in field else ""
        said = f": {field['documentation']}" if field.get("documentation") else ""
        lines.append(_filled(f"{field['name']} ({kind}{count}){said}", "    "))
    return "\n".join(lines)


def _enumeration_text(name, one):
    lines = [_filled(f"{name}. {one['documentation']}".rstrip(), "")]
    return "\n".join(lines + [_filled(f"{number} {text}", "    ") for number, text in one["values"]])


def values_of(argument):
    """The values of a selector, each with a text: that of its enumeration, if the header names one."""
    values = dict(argument.get("values", ()))
    for text in set(values.values()):
        named = re.fullmatch(r"those of (\w+)", text)
        if named and named[1] in library().catalogue["enumerations"]:
            texts = dict(library().catalogue["enumerations"][named[1]]["values"])
            values = {value: texts.get(value, text) for value in values}
    return values


class Writer:
    """The source of one function and the names that it uses, which begin with an underscore."""

    def __init__(self, entry):
        self.entry, self.name = entry, entry["name"]
        self.before, self.given, self.after, self.results = [], [], [], []
        self.status = "_result" if entry["returns"] == "ErrorCode" else None
        self.types = []  # the C types of the arguments
        self.names = {"__name__": "qx", "_byref": ctypes.byref, "_c_void_p": ctypes.c_void_p, "_tell": tell, "_whole": whole,
                      "_real": real, "_chosen": chosen, "_c_number": c_number, "_word": plans.word,
                      "_Record": Record,
                      "_address": address, "_pointer": pointer, "_buffer": buffer, "_many": many,
                      "_mapped": mapped, "_Procedure": Procedure,
                      # An argument may have the name of a type.
                      "_type": type, "_int": int, "_float": float, "_complex": complex}
        for i, argument in enumerate(entry["arguments"]):
            kind = argument["kind"]
            getattr(self, "_array" if kind.startswith("array") else f"_{kind}")(i, argument)

    def _place(self, argument):
        return repr(f"{self.name}: {argument['name']}")

    def _array(self, i, argument):
        self.names[f"_kind{i}"] = arrays.kind(argument["element"], int(argument["kind"][5]))
        place, name = self._place(argument), python_name(argument)
        if argument["direction"] == "out":
            self.names[f"_spare{i}"] = []
            self.before.append(f"_{i} = _kind{i}.output(_spare{i})")
            self.results.append(f"_kind{i}.result(_{i}, _spare{i})")
        elif argument["direction"] == "inout":
            self.before.append(f"_{i} = _kind{i}.given({name}, {place}, False)")
            self.results.append(f"_kind{i}.changed(_{i})")
        else:
            self.before.append(f"_{i} = _kind{i}.given({name}, {place})")
            self.after.append(f"_kind{i}.give_back(_{i})")
        if argument.get("byAddress"):
            self.before.append(f"_handle{i} = _c_void_p(_{i}.handle)")
        self._pass(f"_byref(_handle{i})" if argument.get("byAddress") else f"_{i}.handle")

    def _pass(self, text, c_type=ctypes.c_void_p):
        self.given.append(text)
        self.types.append(c_type)

    def _number(self, argument):
        """Checks a real or whole number against its limits; the usual types need no call."""
        name, element, place = python_name(argument), argument["element"], self._place(argument)
        if values := values_of(argument):
            held = f"_values_of_{name}"
            first, last = min(values), max(values)
            known = f"{first} <= {name} <= {last}" if len(values) == last - first + 1 else f"{name} in {held}"
            self.names[held] = values
            self.before += [f"if _type({name}) is not _int or not {known}:",
                            f"    {name} = _chosen({name}, {held}, {place})"]
        elif element in LIMITS:
            lowest, highest = LIMITS[element]
            self.before += [f"if _type({name}) is not _int or not {lowest} <= {name} <= {highest}:",
                            f"    {name} = _whole({name}, '{element}', {place})"]
        else:
            self.before += [f"if _type({name}) is not _float:", f"    {name} = _real({name}, {place})"]

    def _value(self, i, argument):
        if argument["element"] in COMPLEX:
            raise TypeError(f"{self.name} takes a complex number by value")
        self._number(argument)
        self._pass(python_name(argument), C_TYPES[argument["element"]])

    def _reference(self, i, argument):
        name, element = python_name(argument), argument["element"]
        if element in COMPLEX:
            self.before.append(f"_{i} = _c_number({name}, '{element}', {self._place(argument)})")
        else:
            self._number(argument)
            self.names[f"_type{i}"] = C_TYPES[element]
            self.before.append(f"_{i} = _type{i}({name})")
        self._pass(f"_byref(_{i})")
        if argument["direction"] == "inout":
            self._take(i, element)

    _inout = _reference

    def _take(self, i, element):
        self.results.append(f"_complex(*_{i})" if element in COMPLEX else f"_{i}.value")

    def _output(self, i, argument):
        self.names[f"_type{i}"] = C_TYPES[argument["element"]]
        self.before.append(f"_{i} = _type{i}()")
        self._pass(f"_byref(_{i})")
        self._take(i, argument["element"])

    def _error(self, i, argument):
        self._output(i, argument)
        self.status = self.results.pop()

    def _slot(self, i, argument):
        """The values on which the length of a plan may depend: the shapes of arrays, and whole numbers."""
        key = [repr(self.name), str(i)]
        for j, other in enumerate(self.entry["arguments"]):
            if is_given(other) and other["kind"].startswith("array"):
                key.append(f"_{j}.shape")
            elif is_given(other) and other.get("element") == "I32" and other["kind"] != "buffer":
                key.append(python_name(other))
        kinds = f"{argument['kind'] == 'instance'}, {'Measure' in argument['type']}"
        self._pass(f"_word(({', '.join(key)}), {kinds})")

    _instance = _slot

    def _record(self, i, argument):
        contents = "{}" if argument["direction"] == "out" else python_name(argument)
        self.before.append(
            f"_{i} = _Record('{argument['element']}', {contents}, {self._place(argument)})")
        self._pass(f"_byref(_{i}.record)")
        if argument["direction"] != "in":
            self.results.append(f"_{i}.contents()")

    def _buffer(self, i, argument):
        count = next(python_name(a) for a in self.entry["arguments"] if a["name"] == argument["length"])
        self.before.append(f"_{i} = _buffer({python_name(argument)}, '{argument['element']}', {count}, "
                           f"{self._place(argument)})")
        self._pass(f"_{i}.ctypes.data")
        if argument["direction"] != "in":
            self.results.append(f"_{i}")

    def _opaque(self, i, argument):
        if argument["direction"] != "in":
            raise TypeError(f"{self.name} gives a pointer in an argument")
        self.before.append(f"_{i} = _address({python_name(argument)}, {argument['type']!r}, "
                           f"{self._place(argument)}, {self.name in GIVES_BACK})")
        self._pass(f"_{i}")

    def _procedure(self, i, argument):
        self.before.append(f"_{i} = _Procedure({python_name(argument)}, {argument['name'] == 'jacobian'}, "
                           f"{self._place(argument)})")
        self.after.append(f"_{i}.raise_again()")
        self._pass(f"_{i}.address", FIT)

    def _mapping(self):
        """The branch of a function of numbers that is called with arrays."""
        given = [a for a in self.entry["arguments"] if is_given(a)]
        plain = " and ".join(f"_type({python_name(a)}) is {plain_type(a['element'])}" for a in given)
        values = ", ".join(map(python_name, given)) + ","
        self.names["_entry"] = self.entry
        return [f"if not ({plain}) and _many({values}):",
                f"    return _mapped(_entry, _function, ({values}))"]

    def source(self):
        entry = self.entry
        lines = self._mapping() if is_of_scalars(entry) else []
        lines += self.before
        lines.append(f"_result = _function({', '.join(self.given)})")
        lines += self.after
        taken = [a["name"] for a in entry["arguments"] if is_taken(a)]
        values = [f"_taken{i}" for i in range(len(taken))]
        if self.status:
            lines += [f"{value} = {text}" for value, text in zip(values, self.results)]
            pairs = ", ".join(f"'{name}': {value}" for name, value in zip(taken, values))
            lines += [f"_status = {self.status}"]
            if self.status != "_result" and entry["returns"] == "int32_t":
                lines += ["if _status == 0:", "    _status = _result"]
            lines += ["if _status != 0:", f"    _tell('{self.name}', _status, {{{pairs}}})"]
        else:
            values = self.results
        if not taken and gives_value(entry):
            pointed = entry["returns"] not in RESULTS
            values = [f"_pointer({entry['returns']!r}, _result)" if pointed else "_result"]
        if values:
            lines.append(f"return {', '.join(values)}")
        return f"def {self.name}({parameters(entry)}) -> '{returned(entry)}':\n" + "".join(
            f"    {line}\n" for line in lines)

    def function(self):
        c_function = getattr(library().module, self.name)
        element = RESULTS.get(self.entry["returns"])
        c_function.restype = (C_TYPES[element] if element else
                              None if self.entry["returns"] == "void" else ctypes.c_void_p)
        c_function.argtypes = self.types
        self.names["_function"] = c_function
        place, text = f"<qx {self.name}>", self.source()
        linecache.cache[place] = (len(text), None, text.splitlines(True), place)
        exec(compile(text, place, "exec"), self.names)
        function = self.names[self.name]
        text = "\n\n".join(filter(None, [documentation(self.entry), surroundings(self.entry)]))
        function.__module__, function.__doc__ = "qx", text
        return function


def buffer(value, element, count, place):
    """A copy of an array for a plain pointer. A pointer has no length, so the size of the array is checked against
    the count."""
    kind = arrays.kind(element, 1)
    array = np.array(kind.checked(value, place), kind.dtype)
    if array.size < count:
        raise ValueError(f"{at(place)}: {count} elements are needed; got {array.size}")
    return array


def many(*values):
    """Whether one of the values is not a single number."""
    for value in values:
        if type(value) is np.ndarray:
            if value.ndim:
                return True
        elif type(value) is not float and type(value) is not int and np.ndim(value):
            return True
    return False


SEVERAL = 1 << 15  # number of elements from which a function is mapped by several threads
LETTERS = {"DBL": "d", "I32": "i", "CDB": "z"}  # for arguments by value; capitals are pointers


def form_of(entry):
    """The return and argument types of a function of numbers, in the notation of the stand-in host's QXHostCalls."""
    letters = [LETTERS.get(a["element"], "?") for a in entry["arguments"]]
    return ("v" if entry["returns"] == "void" else "e") + "".join(
        letter if a["kind"] == "value" else letter.upper() for letter, a in zip(letters, entry["arguments"]))


@functools.cache
def _of_columns(name):
    """The form of an export, and for each argument whether it is given, its type, whether it is a result, and its
    name in messages."""
    entry = library().entries[name]
    return form_of(entry).encode(), [
        (is_given(a), arrays.element_dtype(a["element"]), a["element"], a["kind"] == "error", f"{name}: {a['name']}")
        for a in entry["arguments"]]


def _spread(values, columns):
    """The values, checked and broadcast to a common shape, each as consecutive elements of its type."""
    checked, shape = [], None
    for value, (_, dtype, element, _, place) in zip(values, (column for column in columns if column[0])):
        if isinstance(value, (str, bytes)):
            raise TypeError(f"{at(place)}: a number is needed; got {shown(value)}")
        is_single = type(value) is float and element == "DBL" or type(value) is int and (
            element == "I32" and -2**31 <= value < 2**31)
        if not is_single:
            if type(value) is not np.ndarray or value.dtype != dtype:
                value = arrays.kind(element, np.ndim(value)).checked(value, place)
            if shape is None or value.shape != shape:
                shape = value.shape if shape is None else np.broadcast_shapes(shape, value.shape)
        checked.append((value, dtype, is_single))
    return shape, [np.ascontiguousarray(value, dtype) if not is_single and value.shape == shape else
                   np.full(shape, value, dtype) for value, dtype, is_single in checked]


FEW = 512  # number of elements up to which the memory of a call is kept for the next one
KEPT_CALLS, KEPT_EACH = 64, 4


class _Few:
    """The columns for calls with few elements: the memory for arguments and results, and its addresses."""

    def __init__(self, name, function, shape):
        form, columns = _of_columns(name)
        memory, found = [np.zeros(shape, dtype) for _, dtype, *_ in columns], np.zeros(shape, np.int32)
        self.given = [(array, array.dtype, element) for array, (is_input, _, element, *_) in zip(memory, columns)
                      if is_input]
        self.results = [array for array, column in zip(memory, columns) if not (column[0] or column[3])]
        self.codes = [found, *(array for array, column in zip(memory, columns) if not column[0] and column[3])]
        self.none = bytes(found.nbytes)
        self.call = functools.partial(
            library().host.QXHostCalls, function, form, found.size,
            (ctypes.c_void_p * len(memory))(*(array.ctypes.data for array in memory)), found.ctypes.data)

    def results_for(self, values):
        """Copies of the results; None if an argument is neither an array of this shape nor a plain number of the
        type of its column, or if an element has a code."""
        for (array, dtype, element), value in zip(self.given, values):
            if type(value) is np.ndarray:
                if value.dtype is not dtype or value.shape != array.shape:
                    return None
                array[...] = value
            elif type(value) is float and element == "DBL" or type(value) is int and element == "I32" and (
                    -2**31 <= value < 2**31):
                array.fill(value)
            else:
                return None
        if self.call():
            return None
        for codes in self.codes:
            if codes.tobytes() != self.none:
                codes.fill(0)
                return None
        return self.results[0].copy() if len(self.results) == 1 else tuple([array.copy() for array in self.results])


_few = {}  # (export, shape) -> the columns of earlier calls


def _of_few(name, function, values):
    """The results for few elements, or None if more than a plain call is needed."""
    for value in values:
        if type(value) is np.ndarray:
            break
    else:
        return None
    key = name, value.shape
    try:
        few = _few[key].pop()
    except (KeyError, IndexError):
        if not value.ndim or not 0 < value.size <= FEW:
            return None
        few = _Few(name, function, value.shape)
    results = few.results_for(values)
    kept = _few.get(key)
    if kept is None:
        if len(_few) >= KEPT_CALLS:
            _few.clear()
        kept = _few.setdefault(key, [])
    if len(kept) < KEPT_EACH:
        kept.append(few)
    return results


def mapped(entry, function, values):
    """A function of scalars, applied to arrays element by element with NumPy's broadcasting. The stand-in host
    calls the function, which writes directly into the elements of the result, in several threads if there are
    many elements."""
    few = _of_few(entry["name"], function, values)
    if few is not None:
        return few
    form, columns = _of_columns(entry["name"])
    shape, given = _spread(values, columns)
    n, codes, results, all_, given = math.prod(shape), None, [], [], iter(given)
    for is_input, dtype, _, is_code, _ in columns:
        all_.append(next(given) if is_input else np.zeros(shape, dtype))
        if is_code:
            codes = all_[-1]
        elif not is_input:
            results.append(all_[-1])
    found = np.zeros(n, np.int32)
    steps = [(array.__array_interface__["data"][0], array.itemsize) for array in (*all_, found)]

    def calls(first, last):
        addresses = [start + first * size for start, size in steps]
        if library().host.QXHostCalls(function, form, last - first, (ctypes.c_void_p * len(all_))(*addresses[:-1]),
                                      addresses[-1]):
            raise TypeError(f"{entry['name']} takes single numbers only: the stand-in host has no form {form}")

    if n < SEVERAL:
        calls(0, n)
    else:
        from .topical import axes
        each = -(-n // (4 * axes.processors()))
        axes.many(lambda first: calls(first, min(first + each, n)), range(0, n, each), n)
    if entry["returns"] == "ErrorCode":
        codes = found
    if codes is not None:
        _tell_first(entry["name"], codes.ravel())
    return results[0] if len(results) == 1 else tuple(results)


def _tell_first(name, codes):
    failed = np.flatnonzero(codes < 0)
    if len(failed):
        tell(name, int(codes[failed[0]]), None, f" at element {failed[0]}")
    for code in np.unique(codes[codes > 0]):
        tell(name, int(code), None)


def signature_text(entry):
    """The call of the export in Python, for readers."""
    results = [a["name"] for a in entry["arguments"] if is_taken(a)] or (
        ["value"] if gives_value(entry) else [])
    names = ", ".join(python_name(a) for a in entry["arguments"] if is_given(a))
    return (", ".join(results) + " = " if results else "") + f"qx.{entry['name']}({names})"
