#!/usr/bin/python3
"""Writes qx/qx.hpp: the functions of the topics for C++, from the catalogue and the table of exports that
the Python topics call.

    cpp_topics.py CATALOGUE.json OUTPUT

A key of the table is a function; keys that end in _complex and _single become overloads. The plans, states and
lengths that an export needs are hidden from the caller.
"""

import ast
import json
import re
import sys
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent
TABLE = ROOT / "python/qx/topical/newest.py"

# Functions that are one call here, and that Python builds from several calls or has under another name. A key with
# None is no function here; if no other function calls its export, the top of the header says so.
INSTEAD = {
    "linalg": {"solve": "EqsByLUDri_head", "solve_complex": "CxEqsByLUDri_head", "lu_solve": "LULinEqs_head",
               "lu_solve_complex": "CxLULinEqs_head", "inv": "InvMatrixLUDri_head", "inv_complex": "CxInvMatrixLUDri_head",
               "solve_many": "EqsSetByLU2026_head", "solve_many_complex": "CxEqsSetByLU2026_head",
               "solve_inverse": None, "solve_inverse_complex": None, "lu_inv": "LUInvMatrix_head",
               "lu_inv_complex": "CxLUInvMatrix_head"},
    "filters": {"zero_phase": "zeroPhaseCascadeFiltH", "Filter_roots": None, "Filter_roots_complex": None,
                "Filter_polynomial": None},
    "windows": {"get": None},
    "spectra": {"welch": None, "welch_sized": None, "welch_complex": None, "welch_complex_sized": None,
                "welch_power": None, "analytic": None, "instantaneous_phase": None},
    "signals": {"detrend": None, "detrend_high": None}, "calculus": {"velocity": None, "velocity_high": None},
    "fit": {"Fit_covariance": None, "Fit_confidence": None, "Fit_prediction": None, "curve": None,
            "nonlinear": None,
            "confidence": "ConfBndGenLS_head", "prediction": "PredBndGenLS_head"},
    "measure": {"delay": None, "delay_spectrum": None, "sound_level": None},
    "fft": {"rfft_long": None, "fft_real": None, "fft_real_sized": None},
}
# Exports that a hand-written class calls.
BY_HAND = {"PeakD": "peak_finder.hpp"}
ENDINGS = ("_complex_single", "_complex", "_single")

# Streams: the name of the class; hidden arguments, with their values in the first and in later calls (the plain
# function makes a first call); arrays and numbers that are kept from call to call.
STREAMS = {
    "Filter_cascade": ("CascadeStream", {"keepState": (0, 1)}, ("state",)),
    "Filter_direct": ("DirectStream", {"keepState": (0, 1)}, ("xState", "yState")),
    "Filter_complex": ("ComplexFilterStream", {"keepState": (0, 1)}, ("xState", "yState")),
    "Filter_complex_of_real": ("ComplexFilterOfRealStream", {"keepState": (0, 1)}, ("xState", "yState")),
    "InterpolatedFIR": ("InterpolatedFIRStream", {"reset": (1, 0)}, ("state", "delay")),
    "resample": ("ResampleStream", {"reset": (1, 0)}, ("state", "delayLeft", "phase")),
    "decimate": ("DecimateStream", {"reset": (1, 0)}, ("start", "partialCount", "partialSum")),
    "moving_sum": ("MovingSumStream", {"reset": (1, 0)}, ("sums", "buffers", "position")),
    "cic_decimate": ("CICDecimateStream", {"reset": (1, 0)}, ("state", "delay")),
    "cic_interpolate": ("CICInterpolateStream", {"reset": (1, 0)}, ("state", "delay")),
    "shift_frequency": ("FrequencyShiftStream", {}, ("phase",)),
    "zero_phase": (None, {"keepState": (0, 0)}, ("stateForward", "stateBackward")),
}

# Streams whose calls return more elements than their block has: the most for n elements.
MOST = {
    "resample": "mode_ == 1 ? detail::MostFrom(n, L_) : mode_ == 3 ? detail::MostFrom(n, L_, M_) : n",
    "cic_interpolate": "detail::MostFrom(n, factor_)",
}
# Streams that restart a recurrence with each block.
TO_ROUNDING = {"shift_frequency"}

# Functions that are a special case of an export: the arguments with fixed values.
FIXED = {
    "special.gamma": {"x": 0, "selector": 1}, "special.gammainc": {"selector": 0},
    "special.beta": {"x": 0, "selector": 1}, "special.betainc": {"selector": 0},
    "special.ellipk": {"phi": 0, "selector": 1}, "special.ellipkinc": {"selector": 0},
    "special.ellipe": {"phi": 0, "selector": 1}, "special.ellipeinc": {"selector": 0},
}

# Defaults by topic and argument, or by function and argument: the values that the Python topics pass by
# default. Arguments with a default come after those without one.
DEFAULTS = {
    "filters": {"fs": "1.0", "fh": "0.0", "type": 0, "form": 0, "weights": "{}"},
    "filters.windowed": {"type": "0"},
    "filters.equiripple": {"maxIterations": "0"},
    "filters.savgol_coefficients": {"wantDifferentiators": "1"},
    "fft": {"offset": "0", "shift": "0", "rowStart": "0", "colStart": "0", "rows": "0", "cols": "0", "size": "0",
            "method": 1, "start": "0"},
    "fft.dzt": {"size": None},
    "windows": {"param": "NAN", "scaled": "0", "symmetric": "0"},
    "signals": {"amp": "1.0", "phase": "0.0", "duty": "50.0", "interpolate": "1", "delay": "0", "dt": "1.0",
                "algorithm": 1, "normalization": 0, "outputSize": 0, "mode": 0, "correlate": "0", "excludeEnd": "0",
                "scale": 0, "dBReference": "6.0"},
    "noise": {"state": "{}", "amplitude": "1.0", "sigma": "1.0", "stream": "0", "position": "0.0"},
    "multirate": {"mode": 3, "gain": "1", "removeDelay": "0", "average": "0", "alternate": "0", "differentialDelay": "1",
                  "sampleRate": "1.0"},
    "linalg.is_symmetric": {"tolerance": "0.0"}, "linalg.norm": {"normType": 2},
    "linalg": {"matrixType": 0, "output": 1, "tolerance": "-1.0", "normType": 0, "p": "2.0", "relative": "0",
               "hermitian": "1", "fullSize": "1", "economy": 1, "pivoting": "0", "wantVectors": "1", "order": 0,
               "job": 3, "useUpper": "0", "triangle": 0, "y": "{}"},
    "poly": {"order": "1", "constant": "0.0", "tolerance": "1e-10", "mode": 1, "refine": "1"},
    "special": {"scaled": "0"},
    "fit": {"w": "{}", "lower": "{}", "upper": "{}", "guess": "{}", "fixedOrders": "{}", "fixedValues": "{}",
            "tolerance": "1e-12", "iterations": "2000", "floor": "0.0", "method": 0, "wantCovariance": "1",
            "confidence": "0.95", "deviations": "{}", "parameter": "0.0", "interiorKnots": "{}", "base": "2.71828"},
    "fit.linear": {"tolerance": "-1.0"}, "fit.polynomial": {"tolerance": "-1.0"},
    "interpolate": {"firstSlope": "1e30", "lastSlope": "1e30"},
    "calculus": {"dt": "1.0", "rule": 1}, "calculus.integrate": {"rule": 3},
    "calculus.derivative": {"rule": 0},
    "stats.mode": {"intervals": "0"},
    "stats": {"alpha": "0.05", "significance": "0.05", "what": 0, "tail": 0},
    "measure": {"t0": "0.0", "dt": "1.0", "limit": 0, "bins": "256", "method": 2, "hist": "{2, 100}", "order": 0,
                "ref": "{90, 50, 10, 1}", "centre": "0.0", "halfWidth": "0.0", "hysteresis": "0.0", "slope": 0,
                "start": "0", "holdoff": "0", "state": "{}", "polarity": 1, "partial": "0",
                "fundamental": "0.0", "fullScale": "0.0"},
    "coordinates": {"sequence": 10},
}

# Sizes whose default, 0, means the size of the input.
SIZES = {"fft.fft2": {"rows": "in.rows", "cols": "in.cols"}, "fft.fft2_real": {"rows": "in.rows", "cols": "in.cols"}}

TYPES = {"DBL": "double", "CDB": "std::complex<double>", "I32": "int32_t", "U32": "uint32_t", "SGL": "float",
         "CSG": "std::complex<float>", "U8": "uint8_t", "I16": "int16_t", "U16": "uint16_t"}
KEYWORDS = {"and", "or", "not", "xor", "default", "double", "float", "new", "delete", "auto", "union", "this", "void"}
# Enumerators for choices whose text does not yield a name, by the beginning of the text.
NAMES = {
    "second-order sections": "second_order", "sections of second order": "second_order",
    "fourth-order sections": "fourth_order", "sections of fourth order": "fourth_order",
    "a filter with symmetric taps": "filter", "Bluestein": "bluestein",
    "Blackman-Harris, three": "blackman_harris3", "Blackman-Harris, four": "blackman_harris4",
    "Blackman-Harris, seven": "blackman_harris7", "in equal ratios": "logarithmic",
    "radians in and": "radians_to_degrees", "degrees in and": "degrees_to_radians",
    "the full result": "full", "the size of x": "size_of_x", "the part where y": "valid",
    "L times the rate": "interpolate", "every M-th output of mode 0": "decimate", "every M-th output of mode 1": "rational",
    "does nothing": "none", "permutes rows": "permute", "multiplies rows": "scale", "does both": "both",
    "right eigenvectors": "right", "left eigenvectors": "left",
    "the largest singular value": "two", "the largest column sum": "one", "the root of the sum": "frobenius",
    "the largest row sum": "infinity", "the quotient of the largest": "two",
    "vectors of unit length": "vectors", "no vectors": "values_only", "a is unchanged": "values_only",
    "a becomes": "vectors",
    "a general matrix": "general", "a Hermitian matrix": "hermitian",
    "q is m by m": "full", "q is m by k": "economy", "r is k by n": "r_only", "unsorted": "as_they_come",
    "with ascending real": "ascending_real", "with descending real": "descending_real",
    "with ascending mod": "ascending_modulus", "with descending mod": "descending_modulus",
    "a x + x b = c": "sylvester", "a x - x b = c": "difference", "a x b - x = c": "stein",
    "a x + x a'": "continuous", "a x a' - x": "discrete",
    "identity of": "identity", "diagonal with": "diagonal", "Toeplitz with": "toeplitz", "companion of": "companion",
    "y[i][j] =": "elements", "y = p[0] I": "matrix",
    "LU factorisation": "lu", "Cholesky factorisation": "cholesky", "singular values, of": "rank_revealing",
    "lambda by": "cross_validation", "lambda is": "given_lambda", "the smoothest": "given_residual",
    "(x[i+1] - x[i-1])": "central2", "(x[i-2] - 8": "central4", "(x[i+1] - x[i]) /": "forward",
    "(x[i] - x[i-1]) /": "backward",
    "the probability P(X <= x)": "cdf", "the survival P(X > x)": "sf", "the logarithm of the probability": "logcdf",
    "the logarithm of the survival": "logsf", "the density": "pdf",
    "the automatic method takes": "both_or_neither", "by falling amp": "amplitude", "by rising freq": "frequency",
}
# Enumerators of choices that the header describes elsewhere.
NUMBERED = {
    "rule": ["trapezoid", "simpson", "simpson38", "bode", "left_rectangles", "right_rectangles"],
    ("measure", "method"): ["histogram", "peak", "automatic"],
    ("linalg", "normType"): ["two", "one", "frobenius", "infinity"],
}


def snake(name):
    return re.sub(r"(?<=[a-z0-9])(?=[A-Z])|(?<=[A-Z])(?=[A-Z][a-z])", "_", name).lower()


def camel(name):
    return "".join(part[:1].upper() + part[1:] for part in re.split(r"_", name))


def enumerator(topic, argument, value, text):
    name = next((name for start, name in NAMES.items() if text.startswith(start)), None)
    numbered = NUMBERED.get((topic, argument), NUMBERED.get(argument, []))
    if name is None and value < len(numbered):
        name = numbered[value]
    if name is None:
        words = re.findall(r"[A-Za-z0-9]+", re.split(r"[,;:(=]", text)[0])
        name = "_".join(word for word in words if word.lower() not in ("the", "a", "an")).lower()
    return name if re.match(r"[a-z]", name) and name not in KEYWORDS else f"{snake(argument)}_{value}"


class Topic:
    """The text of a topic: enumerations first, then functions and streams."""

    def __init__(self, name):
        self.name, self.enumerations, self.signatures = name, {}, {}

    def enumeration(self, function, argument):
        """The name of the enumeration of an argument; equal choices share an enumeration."""
        kind, values, enumerators = TYPES[argument["element"]], argument["values"], []
        for value, text in values:
            one = enumerator(self.name, argument["name"], value, text)
            enumerators.append(one if one not in enumerators else f"{one}_{value}")
        choices = (kind, [value for value, _ in values], enumerators)
        for name in (camel(argument["name"]), camel(function) + camel(argument["name"])):
            known = self.enumerations.setdefault(name, (choices, [text for _, text in values]))
            if known[0] == choices:
                return name
        raise ValueError(f"{self.name}.{function}: two enumerations are called {name}")

    def enumerators(self, name):
        return self.enumerations[name][0][2]

    def enumeration_text(self, name):
        (kind, values, enumerators), texts = self.enumerations[name]
        lines = [f"enum class {name} : {kind} {{\n"]
        lines += [f"    {one} = {value}, {'// ' + text if text else ''}".rstrip() + "\n"
                  for one, value, text in zip(enumerators, values, texts)]
        return "".join(lines) + "};\n"


class Argument:
    """An argument of an export in C++: the type of its parameter and how it is passed on."""

    def __init__(self, topic, function, argument):
        self.raw, self.name, self.kind = argument, argument["name"], argument["kind"]
        self.element = argument.get("element")
        self.type = TYPES.get(self.element, self.element)
        self.direction = argument["direction"]
        self.is_array = self.kind.startswith("array")
        self.dimensions = int(self.kind[5]) if self.is_array else 0
        self.is_records = self.is_array and self.element not in TYPES
        self.enumeration = topic.enumeration(function, argument) if argument.get("values") else None
        self.default = None
        self.goes_in = self.direction != "out" and self.kind not in ("slot", "error")
        self.goes_out = self.direction != "in" and self.kind not in ("slot", "error")

    @property
    def parameter(self):
        """Its type as a parameter."""
        if self.is_records:
            return f"std::span<const {self.element}>"
        if self.dimensions:
            return {1: f"std::span<const {self.type}>", 2: f"const MatrixView<{self.type}> &",
                    3: f"const CubeView<{self.type}> &"}[self.dimensions]
        if self.enumeration:
            return self.enumeration
        if self.kind == "record" or self.element == "CDB":
            return f"const {self.type} &"
        return self.type

    @property
    def owner(self):
        """The type that owns the array of the host."""
        if self.is_records:
            return f"detail::Records<{self.element}, {self.raw['type']}>"
        return {1: f"detail::Array1<{self.type}>", 2: f"detail::Array2<{self.type}>",
                3: f"detail::Array3<{self.type}, {self.raw['type']}>"}[self.dimensions]

    @property
    def result(self):
        """Its type as a result."""
        return {1: f"std::vector<{self.type}>", 2: f"Matrix<{self.type}>"}.get(self.dimensions, self.type)

    def declared(self, value):
        """The declaration of the local variable that is passed to the export."""
        name = self.name
        if self.is_array:
            inside = f', "{name}", {value}' if value is not None else ""
            return f"const {self.owner} {name}_(call{inside});"
        if self.kind == "slot":
            return f"static thread_local detail::Plan {name}_;"
        if self.element == "CDB":
            return f"CDB {name}_ = detail::ToC({value});" if value is not None else f"CDB {name}_{{}};"
        kind = self.type if self.kind == "record" else TYPES[self.element]
        cast = f"static_cast<{kind}>({value})" if self.enumeration and value is not None else value
        return f"{kind} {name}_ = {cast};" if value is not None else f"{kind} {name}_{{}};"

    @property
    def handed(self):
        """The argument in the call of the export."""
        if self.is_array:
            return f"{self.name}_.handle()"
        if self.kind == "slot":
            return f"{self.name}_.address<{self.raw['type'].split()[0]}>()"
        return f"{self.name}_" if self.kind == "value" else f"&{self.name}_"

    @property
    def found(self):
        """The value after the call, of an argument that is not an array."""
        return f"detail::FromC({self.name}_)" if self.element == "CDB" else f"{self.name}_"


def blames(export, names):
    """Pairs of a code and the first argument that its reason names."""
    sentence = re.search(r"\bCodes:(.*)", " ".join(export["text"].split()))
    found = {}
    for code, reason in re.findall(r"((?:Err|Warn)\w+) \(((?:[^()]|\([^()]*\))*)\)", sentence[1] if sentence else ""):
        words = re.findall(r"\w+", reason)
        named = [word for word in words if word in names]
        if code in found or not named:
            found[code] = None
        else:
            is_first = named[0] == words[0] and "or" not in words
            found[code] = named[0] if len(set(named)) == 1 or is_first else None
    return {code: name for code, name in found.items() if name and code.startswith("Err")}


class Function:
    def __init__(self, topic, key, base, export):
        self.topic, self.key, self.base, self.export, self.name = topic, key, base, export, snake(base)
        stream = STREAMS.get(base)
        self.stream, begins, kept = stream if stream else (None, {}, ())
        # Overloads have the same name, unless their arguments are the same.
        self.ending = camel(key[len(base):]) if key != base else ""
        if self.stream:
            self.stream = self.stream.replace("Stream", f"{self.ending}Stream")
        self.fixed = FIXED.get(f"{topic.name}.{base}", {})
        self.begins, self.kept = {**begins, **{name: (value, value) for name, value in self.fixed.items()}}, kept
        for one in export["arguments"]:
            if one["kind"] in ("opaque", "procedure", "buffer", "instance") or one.get("byAddress"):
                form = {"opaque": "a pointer", "procedure": "a function", "buffer": "memory without a size",
                        "instance": "instance data"}.get(one["kind"], "a handle by its address")
                raise LookupError(f"its argument {one['name']} is {form}")
            if one["kind"] == "record" and any("dimensions" in field for field in RECORDS[one["element"]]["fields"]):
                raise LookupError(f"its record {one['element']} holds arrays")
        self.arguments = [Argument(topic, base, one) for one in export["arguments"] if one["kind"] != "error"]
        hidden = {*self.begins, *kept}
        self.inputs = [one for one in self.arguments if one.goes_in and one.name not in hidden]
        self.outputs = [one for one in self.arguments if one.goes_out and one.name not in hidden]
        for one in self.inputs:
            one.default = self._default(topic.name, base, one)
        self.inputs.sort(key=lambda one: one.default is not None)
        self.by_name = {one.name: one for one in self.arguments}
        signature = tuple(one.parameter for one in self.inputs)
        if signature in topic.signatures.setdefault(self.name, []):
            self.name = snake(key)
        topic.signatures.setdefault(self.name, []).append(signature)

    def _default(self, topic, base, argument):
        value = DEFAULTS.get(f"{topic}.{base}", {}).get(argument.name, DEFAULTS.get(topic, {}).get(argument.name))
        if isinstance(value, int) and argument.enumeration:
            values = [number for number, _ in argument.raw["values"]]
            if value not in values:
                return None
            return f"{argument.enumeration}::{self.topic.enumerators(argument.enumeration)[values.index(value)]}"
        if isinstance(value, int) or argument.enumeration:
            return None
        return value if value != "{}" or argument.is_array or argument.kind == "record" else None

    # Pieces of the text.

    def parameters(self, defaults=True, of=None):
        return ", ".join(f"{one.parameter}{'' if one.parameter.endswith('&') else ' '}{one.name}"
                         + (f" = {one.default}" if defaults and one.default else "") for one in of or self.inputs)

    def result_type(self):
        if len(self.outputs) == 1:
            return self.outputs[0].result
        return f"{camel(self.name)}{self.ending}Result"

    def record(self):
        if len(self.outputs) == 1:
            return ""
        fields = "".join(f"    {one.result} {one.name}{{}};\n" for one in self.outputs)
        return f"struct {self.result_type()} {{\n{fields}}};\n"

    def call(self, handed):
        """The call of the export, with its code in `code`."""
        arguments = ["&code" if one["kind"] == "error" else handed[one["name"]] for one in self.export["arguments"]]
        call = f"::{self.export['name']}({', '.join(arguments)})"
        has_error = any(one["kind"] == "error" for one in self.export["arguments"])
        if has_error:
            # The function itself returns the host's status, if that is not 0.
            return f"ErrorCode code = QXSuccess;\n    const int32_t status = {call};\n" \
                   "    code = code == QXSuccess ? status : code;\n"
        if self.export["returns"] == "ErrorCode" or self.export["hasStatus"]:
            return f"const ErrorCode code = {call};\n"
        return f"{call};\n    const ErrorCode code = QXSuccess;\n"

    def ended(self):
        found = blames(self.export, {one.name for one in self.inputs})
        if not found:
            return "call.ended(code, {});"
        pairs = ", ".join(f'{{{code}, "{name}"}}' for code, name in found.items())
        return f"static constexpr detail::Blame blames[] = {{{pairs}}};\n    call.ended(code, blames);"

    def body(self, into):
        lines = [f'detail::Call call("{self.topic.name}::{self.name}");']
        for one in self.arguments:
            if one.name in self.begins:
                value = str(self.begins[one.name][0])
            elif one in self.inputs:
                size = SIZES.get(f"{self.topic.name}.{self.name}", {}).get(one.name)
                value = f"{one.name} == 0 ? static_cast<int32_t>({size}) : {one.name}" if size else one.name
            else:
                value = None
            lines.append(one.declared(value))
        lines.append("ResultType result{};" if not into else "ResultType result = place.elements;")
        nothing = "ResultType{}" if into else "std::move(result)"
        lines.append(f"if (!call.ready())\n        return call.with({nothing});")
        lines.append(self.call({one.name: one.handed for one in self.arguments}).rstrip())
        lines.append(self.ended())
        for one in self.outputs:
            place = "result" if len(self.outputs) == 1 else f"result.{one.name}"
            take = "TakeInto" if into else "Take"
            lines.append(f"detail::{take}(call, {place}, {one.name}_);" if one.is_array else f"{place} = {one.found};")
        lines.append("return call.with(std::move(result));")
        return "\n    ".join(lines)

    def documentation(self):
        lines = self.export["documentation"].split("\n")
        margin = min((len(line) - len(line.lstrip()) for line in lines[1:] if line.strip()), default=0)
        text = [lines[0], *(line[margin:] for line in lines[1:])]
        return "".join(f"// {line}".rstrip() + "\n" for line in text) + (
            f"// Calls {self.export['name']}" + "".join(
                f"{' with' if i == 0 else ','} {name} = {value}" for i, (name, value) in enumerate(self.fixed.items()))
            + ".\n")

    def text(self):
        name, result = self.name, self.result_type()
        names = "".join(f", {one.name}" for one in self.inputs)
        parameters = self.parameters()
        rest = f", {parameters}" if parameters else ""
        made = [self.record(), self.documentation(),
                f"inline Returned<{result}> {name}(Returning{rest}) {{\n"
                f"    typedef {result} ResultType;\n    {self.body(False)}\n}}\n",
                f"inline {result} {name}({parameters}) {{ return {self.topic.name}::{name}(returned{names}).value(); }}\n"]
        if len(self.outputs) == 1 and self.outputs[0].is_array:
            kind = self.outputs[0].type
            made += [f"inline Returned<std::span<{kind}>> {name}(Returning, Into<{kind}> place{rest}) {{\n"
                     f"    typedef std::span<{kind}> ResultType;\n    {self.body(True)}\n}}\n",
                     f"inline std::span<{kind}> {name}(Into<{kind}> place{rest}) {{\n"
                     f"    return {self.topic.name}::{name}(returned, place{names}).value();\n}}\n"]
        return "".join(made)

    # Streams

    def stream_text(self):
        x = self.outputs[0] if self.outputs[0].goes_in else next(one for one in self.inputs if one.is_array)
        y = self.outputs[0]
        fixed = [one for one in self.inputs if one is not x]
        kept = [self.by_name[name] for name in self.kept]
        members, making, reserving = [], [], []
        handed = {x.name: "x_.handle()", y.name: "x_.handle()" if y is x else "y_.handle()"}
        for one in fixed:
            if one.is_array:
                members.append(f"{one.owner} {one.name}_;")
                making.append(f"{one.name}_ = {one.owner}(call, \"{one.name}\", {one.name});")
                handed[one.name] = f"{one.name}_.handle()"
            else:
                kind = TYPES[one.element]
                members.append(f"{kind} {one.name}_{{}};")
                cast = f"static_cast<{kind}>({one.name})" if one.enumeration else one.name
                making.append(f"{one.name}_ = {cast};")
                handed[one.name] = one.handed
        for one in kept:
            if one.is_array:
                members.append(f"{one.owner} {one.name}_;")
                making.append(f"{one.name}_ = {one.owner}(call);")
                handed[one.name] = f"{one.name}_.handle()"
            else:
                kind = "CDB" if one.element == "CDB" else TYPES[one.element]
                members.append(f"{kind} {one.name}_{{}};")
                handed[one.name] = f"&{one.name}_"
        flags = []
        for name, (first, later) in self.begins.items():
            one = self.by_name[name]
            kind = TYPES[one.element]
            flags.append(f"const {kind} {name}_ = begun_ ? {kind}{{{later}}} : {kind}{{{first}}};")
            handed[name] = one.handed
        reset = "".join(f"        {one.name}_ = {{}};\n" for one in kept if not one.is_array)
        most = MOST.get(self.base)
        for name, one in [("x_", x)] + [("y_", y)] * (y is not x):
            making.append(f"{name} = detail::Array1<{one.type}>(call);")
            members.append(f"detail::Array1<{one.type}> {name};")
            count = "most(longest)" if most and one is y else "longest"
            reserving.append(f"        if (call.ready())\n            {name}.reserve(call, \"longest\", {count});\n")
        parameters = self.parameters(of=fixed)
        made = "\n        ".join(making)
        flag_lines = "".join(f"        {line}\n" for line in flags)
        call = self.call(handed).replace("\n    ", "\n        ").rstrip()
        ended = self.ended().replace("\n    ", "\n        ")
        source = "x_" if y is x else "y_"
        count = "most(block.size())" if most else "block.size()"
        room = "" if y is x else f"        y_.reserve(call, \"block\", {count});\n" \
            "        if (!call.ready())\n            return call.with(Found());\n"
        most_text = "    // The most elements that a call returns for n elements.\n" \
            f"    std::size_t most(std::size_t n) const {{\n        return {most};\n    }}\n" if most else ""
        promise = "the results of all blocks together agree with those of one block to rounding" \
            if self.base in TO_ROUNDING else \
            "the results do not depend on the division into blocks, to the bit"
        aliased = " `out` may be the block itself." if y.type == x.type else ""
        state = "// The first block also allocates the state.\n" if any(one.is_array for one in kept) else ""
        member_lines = "".join(f"    {one}\n" for one in members)
        place = f"{self.topic.name}::{self.stream}"
        return f"""// {self.name} for blocks of any size; {promise}.
// A block that is not longer than the longest before it, or than `longest`, allocates no memory except the scratch
// memory of the export, which is taken from the workspace if that is enabled (qx/frame.h). A stream may be used by
// only one thread at a time.
{state}class {self.stream} {{
public:
    explicit {self.stream}({parameters}{', ' if parameters else ''}std::size_t longest = 0) {{
        detail::Call call("{place}");
        {made}
{''.join(reserving)}        made_ = call.status();
    }}

    // Processes the next block and returns the part of `out` that is filled.{aliased}
    Returned<std::span<{y.type}>> operator()(Returning, std::span<const {x.type}> block, std::span<{y.type}> out) {{
        const Returned<std::span<const {y.type}>> found = step(block);
        detail::Call call("{place}");
        call.ended(found.code(), {{}});
        if (!found)
            return {{{{}}, found.status()}};
        const std::span<{y.type}> filled = detail::CopiedInto(call, out, *found);
        return call.with(filled);
    }}
    std::span<{y.type}> operator()(std::span<const {x.type}> block, std::span<{y.type}> out) {{
        return (*this)(returned, block, out).value();
    }}
    std::vector<{y.type}> operator()(std::span<const {x.type}> block) {{
        const std::span<const {y.type}> found = step(block).value();
        return std::vector<{y.type}>(found.begin(), found.end());
    }}
    // Restarts the stream.
    void reset() {{
        begun_ = false;
{reset}    }}

private:
{most_text}    Returned<std::span<const {y.type}>> step(std::span<const {x.type}> block) {{
        typedef std::span<const {y.type}> Found;
        detail::Call call("{place}");
        if (made_.failed() || block.empty())
            return {{Found(), made_}};
        x_.assign(call, "block", block);
        if (!call.ready())
            return call.with(Found());
{room}{flag_lines}        {call}
        {ended}
        if (!call.ready()) {{
            reset();
            return call.with(Found());
        }}
        begun_ = true;
        return call.with(Found({source}.span()));
    }}

{member_lines}    Status made_;
    bool begun_ = false;
}};
"""


def everything():
    """The exports of the Python topics by topic and key."""
    tree = ast.parse(TABLE.read_text("utf-8"))
    values = {node.targets[0].id: node.value for node in tree.body
              if isinstance(node, ast.Assign) and isinstance(node.targets[0], ast.Name)}
    found = ast.literal_eval(values["NEWEST"])
    return {topic: found[topic] for topic in ast.literal_eval(values["TOPICS"]) if topic in found}


def table():
    """The exports of the functions here."""
    return {topic: {key: name for key, name in {**keys, **INSTEAD.get(topic, {})}.items() if name}
            for topic, keys in everything().items()}


RECORDS = {}


def text(catalogue):
    RECORDS.update(catalogue["records"])
    by_name = {export["name"]: export for export in catalogue["exports"]}
    for export in by_name.values():  # with the codes of the export that it is documented as
        export["text"] = export["documentation"]
        if "Codes:" not in export["text"] and export["as"]:
            export["text"] += " " + by_name[export["as"]]["documentation"]
    bodies, reasons, called = [], {}, set(BY_HAND)
    for name, keys in table().items():
        topic, written = Topic(name), []
        for key, export in keys.items():
            base = next((key[:-len(ending)] for ending in ENDINGS
                         if key.endswith(ending) and key[:-len(ending)] in keys), key)
            try:
                function = Function(topic, key, base, by_name[export])
                written.append(function.text())
                if function.stream:
                    written.append(function.stream_text())
                called.add(export)
            except LookupError as error:
                reasons[export] = str(error)
        enumerations = "\n".join(map(topic.enumeration_text, topic.enumerations))
        bodies.append(f"namespace {name} {{\n\n{enumerations}\n" + "\n".join(written) + f"\n}} // namespace {name}\n")
    return HEAD + missing(called, reasons, by_name) + "\nnamespace qx {\n\n" + "\n".join(bodies) + \
        "\n} // namespace qx\n\n#endif\n"


def missing(called, reasons, by_name):
    """The list of the exports of the Python topics that no function here calls."""
    lines = []
    for name, keys in everything().items():
        for key, export in keys.items():
            if export not in called:
                reason = reasons.get(export) or reason_of(by_name[export])
                lines.append(f"//   {name}.{key}, {export}: {reason}\n")
    return "// Exports that Python's topics call and that no function here calls:\n" + "".join(lines)


def reason_of(export):
    try:
        Function(Topic(""), "", "", export)
    except LookupError as error:
        return str(error)
    return "one step of a longer computation"


HEAD = """#ifndef QX_QX_HPP
#define QX_QX_HPP

// The functions of the library by topics. Written by tools/cpp_topics.py from the headers.
//
//     std::vector<double> x = ...;
//     double mean = qx::stats::mean(x);                           // a failure is thrown, qx::Error
//     auto mean = qx::stats::mean(qx::returned, x);               // a failure is returned: if (!mean) ...
//     qx::fft::fft(qx::into(spectrum), x);                        // into memory of the caller
//     qx::filters::CascadeStream stream(a, b);                    // stream(block, out), block by block
//
// Arrays are passed as spans of contiguous elements, matrices as MatrixView, stored row by row; both are copied
// once, into an array of the host. An array that an export changes in place is returned as a result. Several
// results are returned as a record with the names of the export's arguments. Selectors are enumerations.
// Warnings (positive codes) are in the returned status and do not throw.
//
// All functions may be called from any thread. Plans of transforms are kept for each function and thread.

#include "qx/calls.hpp"
#include "qx/peak_finder.hpp"
#include "qx/qx.h"
#include "qx/streams.hpp"

#include <cmath>

"""


def main(source, target):
    made = text(json.loads(Path(source).read_text("utf-8")))
    place = Path(target)
    if not place.exists() or place.read_text("utf-8") != made:
        place.parent.mkdir(parents=True, exist_ok=True)
        place.write_text(made, "utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
