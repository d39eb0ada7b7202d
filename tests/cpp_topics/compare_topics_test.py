"""Compares every function of qx/qx.hpp with the function of the Python topics. On the same inputs, both pass the
export the same values for defaulted arguments, and the export returns the same bits.

    compare_topics_test.py SOURCE BUILD

A row of rows.txt is `key: arguments in C++ | call in Python`; without the bar both take the same arguments. With
`~` in place of the bar, Python calls another export, or the same one with other inputs: its value, or a
dictionary of values by result name, must agree to rounding. `its` is the namespace of the topic in C++.
"""

import inspect
import json
import os
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

SOURCE, BUILD = (Path(name).resolve() for name in sys.argv[1:3])
del sys.argv[1:3]
os.environ["QX_LIBRARY_DIR"] = str(BUILD)
sys.path[:0] = [str(SOURCE / "tools"), str(SOURCE / "python")]
import numpy as np  # noqa: E402
import cpp_topics  # noqa: E402
import qx  # noqa: E402
from qx.measuring import HISTOGRAM, REFERENCES  # noqa: E402
from qx.topical import newest  # noqa: E402

CATALOGUE = json.loads((BUILD / "catalogue.json").read_text("utf-8"))
# Arguments for which two values mean the same: 0 for the size of the input, empty for no bounds, and values
# that a lowpass, a window without a parameter or a natural spline ignores.
ALIKE = ("fh", "rows", "cols", "size", "param", "firstSlope", "lastSlope", "lower", "upper")
ROWS = (Path(__file__).parent / "rows.txt").read_text("utf-8")

GENERATOR = np.random.default_rng(5)
X, Y = GENERATOR.normal(size=(2, 24))
SQUARE, OTHER = GENERATOR.normal(size=(2, 4, 4))
COMPLEX, SECOND = GENERATOR.normal(size=(2, 4, 4)) + 1j * GENERATOR.normal(size=(2, 4, 4))
T = np.arange(1, 25) / 10
INPUTS = {
    "x": X, "y": Y, "z": X + 1j * Y, "v": Y - 0.5j * X, "t": T, "empty": np.empty(0),
    "a": SQUARE, "b": OTHER, "positive": SQUARE @ SQUARE.T + np.eye(4), "rhs": X[:4], "singles": X.astype(np.float32),
    "za": COMPLEX, "zb": SECOND, "hermitian": COMPLEX @ COMPLEX.conj().T + np.eye(4), "zrhs": X[:4] + 1j * Y[:4],
    "zsingles": (X + 1j * Y).astype(np.complex64), "taps": np.hanning(9)[1:-1], "p": np.array([2.0, -3.0, 1.0]),
    "q": np.array([-1.0, 0.5, 2.0, 1.0]), "zp": np.array([2.0, -3.0j, 1.0]), "zq": np.array([-1.0 + 1j, 0.5, 1.0]),
    "decay": 3 * np.exp(-T) + 1 + 0.01 * X, "bump": 2 * np.exp(-(T - 1.1) ** 2 / 0.18) + 0.01 * X,
    "pulses": np.tanh(20 * np.sin(2 * np.pi * np.arange(96) / 32 + 0.1)), "tones": np.sin(np.arange(256) * 0.37),
    "labels": np.arange(24, dtype=np.int32) % 3, "pairs": np.arange(24, dtype=np.int32) // 3 % 2,
    "fours": np.arange(24, dtype=np.int32) // 6, "counts": np.array([[3, 5], [7, 2]], np.int32),
    "rotation": np.array([[0.8, -0.6, 0], [0.6, 0.8, 0], [0, 0, 1.0]]), "tall": np.column_stack([np.ones(24), T]),
    "whole": np.arange(1.0, 25), "unit": np.eye(4), "zunit": np.eye(4) + 0j, "steps": np.ones(2), "three": np.ones(3),
    "cube": GENERATOR.normal(size=(5, 5, 5)), "wide": GENERATOR.normal(size=(5, 5)),
}


def rows():
    """Topic, key, arguments in C++, call in Python and whether the values must be those of the export."""
    topic = None
    for line in ROWS.splitlines():
        if line.startswith("["):
            topic = line.strip("[]")
        elif line and not line.startswith("#"):
            key, rest = line.split(": ", 1)
            arguments, mark, call = re.match(r"(.*?)(?: ([|~]) (.*))?$", rest).groups()
            call = call or f"{key}({arguments})"
            whole = call if call[0] in "({" else f"qx.{topic}.{call}"
            yield topic, key, arguments, whole, mark != "~"


def functions():
    """The functions that the header generator makes from each key of the table."""
    cpp_topics.text(CATALOGUE)
    by_name = {export["name"]: export for export in CATALOGUE["exports"]}
    for name, keys in cpp_topics.table().items():
        topic = cpp_topics.Topic(name)
        for key, export in keys.items():
            base = next((key[:-len(end)] for end in cpp_topics.ENDINGS
                         if key.endswith(end) and key[:-len(end)] in keys), key)
            try:
                yield name, key, cpp_topics.Function(topic, key, base, by_name[export])
            except LookupError:
                pass  # the header lists them as omitted


FUNCTIONS = {(topic, key): function for topic, key, function in functions()}


def in_cpp(name, values):
    values = np.asarray(values)
    kind = {"float64": "double", "complex128": "std::complex<double>", "int32": "int32_t", "float32": "float",
            "complex64": "std::complex<float>"}[values.dtype.name]
    one = (lambda v: f"{{{float(v.real).hex()}, {float(v.imag).hex()}}}") if "complex" in kind else \
        (lambda v: str(v)) if "int" in kind else (lambda v: float(v).hex())
    elements = "{" + ", ".join(map(one, values.ravel())) + "}"
    if values.ndim == 2:
        return f"const qx::Matrix<{kind}> {name}({values.shape[0]}, {values.shape[1]}, {elements});\n"
    if values.ndim == 3:
        return f"const std::vector<double> {name}_all{elements};\nconst qx::CubeView<double> {name}{{{name}_all.data(), " \
               f"{', '.join(map(str, values.shape))}}};\n"
    return f"const std::vector<{kind}> {name}{elements};\n"


HEAD = r"""
#include "qx/qx.hpp"
#include <cstdio>
template <class T> requires std::is_arithmetic_v<T> void Show(T x) { std::printf(" %a", static_cast<double>(x)); }
template <class T> void Show(const std::complex<T> &z) { Show(z.real()); Show(z.imag()); }
template <class T> void Show(const std::vector<T> &all) { for (const T &one : all) Show(one); }
template <class T> void Show(const qx::Matrix<T> &all) { Show(all.values); }
"""


def program():
    text = HEAD + "".join(in_cpp(*one) for one in INPUTS.items())
    shown = "template <> void Show(const {0} &r) {{ {1} }}\n"
    records = {one.element for function in FUNCTIONS.values() for one in function.outputs if one.kind == "record"}
    text += "template <class R> void Show(const R &r) requires std::is_class_v<R>;\n" + "".join(
        shown.format(name, " ".join(f"Show({field['type']}(r.{field['name']}));"
                                    for field in CATALOGUE["records"][name]["fields"])) for name in sorted(records))
    lines = []
    for number, (topic, key, arguments, _, _) in enumerate(rows()):
        function = FUNCTIONS[topic, key]
        fields = ["r"] if len(function.outputs) == 1 else [f"r.{one.name}" for one in function.outputs]
        lines.append(f"static void Call{number}() {{\n    namespace its = qx::{topic};\n"
                     f"    const auto r = its::{function.name}({arguments});\n" + "".join(
                         f'    std::printf("{topic}.{key}.{one.name}");\n    Show({field});\n    std::puts("");\n'
                         for one, field in zip(function.outputs, fields)) + "}\n")
    calls = "".join(f'    try {{ Call{i}(); }} catch (const qx::Error &e) {{ std::printf("%s\\n", e.what()); }}\n'
                    for i in range(len(lines)))
    return text + "".join(lines) + f"int main() {{\n{calls}}}\n"


def flat(value):
    """All numbers of a result, as the C++ program shows them."""
    if isinstance(value, dict):
        return [one for part in value.values() for one in flat(part)]
    if isinstance(value, (tuple, list)):
        return [one for part in value for one in flat(part)]
    values = np.atleast_1d(np.asarray(value)).ravel()
    if values.dtype.kind == "c":
        values = np.column_stack([values.real, values.imag]).ravel()
    return [float(one) for one in values]


class Watched:
    """Records the exports that a call in Python calls: name, inputs by name, results by name."""

    def __init__(self):
        self.calls = []
        self.made = newest.export
        self.by_name = {export["name"]: export for export in CATALOGUE["exports"]}

    def export(self, name):
        function, arguments = self.made(name), self.by_name[name]["arguments"]
        outputs = [one["name"] for one in arguments if one["direction"] != "in" and one["kind"] not in ("slot", "error")]
        signature = inspect.signature(function)

        def called(*positional, **named):
            found = function(*positional, **named)
            bound = signature.bind(*positional, **named)
            bound.apply_defaults()
            results = found if len(outputs) > 1 else (found,)
            self.calls.append((name, dict(bound.arguments), dict(zip(outputs, results))))
            return found
        return called


def default_of(function, argument):
    """The number that the header gives an argument, or an empty list."""
    if argument.enumeration:
        values = dict(zip(function.topic.enumerators(argument.enumeration), (one for one, _ in argument.raw["values"])))
        return values[argument.default.split("::")[1]]
    if argument.default.startswith("{"):
        return [float(one) for one in re.findall(r"[\d.]+", argument.default)]
    return float(argument.default)


def as_default(value):
    """A value that Python passes, in the form of default_of."""
    if value is None:
        return []
    if isinstance(value, dict):
        return [float(one) for one in value.values() if one] and flat(value)
    if np.ndim(value):
        return flat(value)
    return -1.0 if value == np.finfo(float).eps else float(value)  # the exports take -1 for eps


class Topics(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        with tempfile.TemporaryDirectory() as folder:
            source, made = Path(folder, "calls.cpp"), Path(folder, "calls")
            source.write_text(program(), "utf-8")
            subprocess.run(["c++", "-std=c++20", "-O0", f"-I{SOURCE}/include", f"-I{BUILD}/include", source, "-o", made,
                            f"-L{BUILD}", "-lqxanalysis", "-lqxrt", f"-Wl,-rpath,{BUILD}"], check=True)
            shown = subprocess.run([made], stdout=subprocess.PIPE, text=True, check=True).stdout
        cls.found = {}
        for line in shown.splitlines():
            name, *values = line.split(" ")
            cls.found[name] = [float.fromhex(one) for one in values] if "(Err" not in line else line

    def test_every_function_has_a_row(self):
        self.assertEqual(sorted({(topic, key) for topic, key, *_ in rows()}), sorted(FUNCTIONS))

    def test_every_default_belongs_to_an_argument(self):
        taken = {(place, one.name) for (topic, _), function in FUNCTIONS.items() for one in function.inputs
                 for place in (topic, f"{topic}.{function.name}", f"{topic}.{function.base}")}
        for place, defaults in cpp_topics.DEFAULTS.items():
            with self.subTest(place):
                self.assertEqual([name for name in defaults if (place, name) not in taken], [])

    def called(self, call):
        watched = Watched()
        newest.export = watched.export
        for topic in newest.TOPICS:  # removes the functions that were generated before
            served = getattr(qx, topic).core
            for name in list(vars(served)):
                if name != "_topic":
                    delattr(served, name)
        try:
            value = eval(call, {"qx": qx, "np": np, "HISTOGRAM": HISTOGRAM, "REFERENCES": REFERENCES, **INPUTS})
        finally:
            newest.export = watched.made
        return watched.calls, value

    def test_results_and_defaults(self):
        for topic, key, arguments, call, exact in rows():
            function = FUNCTIONS[topic, key]
            with self.subTest(f"{topic}.{key}"):
                calls, value = self.called(call)
                names = [f"{topic}.{key}.{one.name}" for one in function.outputs]
                for name in names:
                    self.assertIn(name, self.found, [line for line in self.found if line.startswith(f"{topic}::")])
                if not exact:
                    due = value if isinstance(value, dict) else {
                        one.name: part for one, part in zip(function.outputs, [value] if len(names) == 1 else value)}
                    for name, part in due.items():
                        found = self.found[f"{topic}.{key}.{name}"]
                        np.testing.assert_allclose(found, flat(part), 1e-12, 1e-13, err_msg=name)
                    continue
                mine = [one for one in calls if one[0] == function.export["name"]]
                self.assertTrue(mine, [one[0] for one in calls])
                _, inputs, results = mine[0]
                for one, name in zip(function.outputs, names):
                    np.testing.assert_array_equal(self.found[name], flat(results[one.name]), name)
                given = len(re.findall(r"(?:[^,(){}]|\([^()]*\)|\{[^{}]*\})+", arguments))
                for one in (one for one in function.inputs[given:] if one.name not in ALIKE):
                    self.assertEqual(default_of(function, one), as_default(inputs[one.name]), one.name)


if __name__ == "__main__":
    unittest.main()
