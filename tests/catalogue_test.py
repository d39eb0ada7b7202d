"""The reader of the public headers: what it extracts from good headers and which bad headers it rejects."""

import json
import re
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "tools"))
import catalogue  # noqa: E402

SHAPES = """#ifndef GUARD
#define GUARD
/* Shapes of all kinds: QX_API in a comment does not count.
     Indented. */
#include "qx/types.h"
QX_BEGIN_DECLS
/* Which ends
   belong to it. */
enum Ends { Neither, Lower = 4, /* that one,
                                   the first */
            Upper /* the other */ };
/** A pair. */
typedef struct Interval {
    double lower, upper;
    int32_t closure; /* of Ends,
                        or 0 */
    DBL1D edges;
    int32_t packed[2];
} Interval;
typedef QX_ARRAY_1D(Interval) Interval1D;
typedef struct Plan Plan;
typedef void *PlanSlot;
typedef void *InstanceWord;
typedef double (*Function)(double x, void *context);

/** One line, 20000 points, and in
    *order another.
    Codes: ErrEmptyInput (f(x, y) is empty, or a), the host's status, ErrOutOfMemory (no memory),
    ErrEmptyInput (counts (those) is empty), WarnLengthsDiffer (a warning). A sentence. */
QX_API ErrorCode Everything(QX_IN DBL1D x, QX_INOUT CDB2D m, QX_IN Interval1D intervals,
                            QX_OUT I32_1D counts, int32_t n, QX_IN const int32_t *order,
                            QX_OUT DBL *value, QX_INOUT DBL *level, QX_INOUT PlanSlot *slot,
                            QX_INOUT InstanceWord *instance, QX_INOUT Interval *record,
                            Function function, QX_INOUT DBL1D *kept, QX_OUT ErrorCode *err);
/**
 * Stars in the margin
 *   and an indented line.
 */
QX_API Plan *
make_plan(int32_t n);

/** A second comment counts, not the first. */
/** No arguments. */
QX_API void forget(void);

QX_END_DECLS
#endif
"""


def tree(folder, **headers):
    """A folder of public headers: the project's own types.h and errors.h beside the given ones."""
    target = Path(folder) / "qx"
    target.mkdir()
    for name in ("types.h", "errors.h"):
        (target / name).write_text((ROOT / "include/qx" / name).read_text())
    for name, text in headers.items():
        (target / f"{name}.h").write_text(text)
    return folder


class Reading(unittest.TestCase):
    def test_every_kind_of_argument(self):
        with tempfile.TemporaryDirectory() as folder:
            result = catalogue.read_headers(tree(folder, shapes=SHAPES))
        everything, make, forget = result["exports"]
        self.assertEqual([(a["name"], a["kind"], a.get("element"), a["direction"])
                          for a in everything["arguments"]], [
            ("x", "array1d", "DBL", "in"), ("m", "array2d", "CDB", "inout"),
            ("intervals", "array1d", "Interval", "in"), ("counts", "array1d", "I32", "out"),
            ("n", "value", "I32", "in"), ("order", "reference", "I32", "in"),
            ("value", "output", "DBL", "out"), ("level", "inout", "DBL", "inout"),
            ("slot", "slot", None, "inout"), ("instance", "instance", None, "inout"),
            ("record", "record", "Interval", "inout"), ("function", "procedure", None, "in"),
            ("kept", "array1d", "DBL", "inout"), ("err", "error", "I32", "out")])
        self.assertEqual([a["name"] for a in everything["arguments"] if a.get("byAddress")], ["kept"])
        self.assertIn("and in\n*order another.", everything["documentation"])
        self.assertEqual(everything["codes"], ["ErrEmptyInput", "ErrOutOfMemory", "WarnLengthsDiffer"])
        self.assertTrue(everything["hostStatus"] and everything["hasStatus"])
        self.assertFalse(forget["hasStatus"])
        self.assertEqual((everything["family"], everything["returns"]), ("shapes", "ErrorCode"))
        self.assertEqual(everything["line"], SHAPES[:SHAPES.index("QX_API ErrorCode")].count("\n") + 1)
        self.assertEqual((make["returns"], make["documentation"]),
                         ("Plan *", "Stars in the margin\n  and an indented line."))
        self.assertEqual((forget["arguments"], forget["documentation"]), ([], "No arguments."))
        self.assertEqual([f["name"] for f in result["records"]["Interval"]["fields"]],
                         ["lower", "upper", "closure", "edges", "packed"])
        self.assertEqual([(f.get("element"), f.get("array"), f.get("dimensions"))
                          for f in result["records"]["Interval"]["fields"]][2:4],
                         [("I32", None, None), (None, "DBL", 1)])
        self.assertTrue(result["records"]["WorkspaceStatus"]["packed"])
        self.assertFalse(result["records"]["Interval"]["packed"], "the name of a field")
        self.assertEqual(result["records"]["Interval"]["documentation"], "A pair.")
        self.assertEqual([f.get("documentation") for f in result["records"]["Interval"]["fields"]],
                         [None, None, "of Ends, or 0", None, None])
        self.assertEqual(result["enumerations"], {"Ends": {
            "documentation": "Which ends\nbelong to it.",
            "values": [[0, ""], [4, "that one, the first"], [5, "the other"]]}})
        self.assertEqual(result["families"], [{
            "name": "shapes", "header": "qx/shapes.h",
            "introduction": "Shapes of all kinds: QX_API in a comment does not count.\nIndented."}])
        self.assertEqual(result["codes"]["ErrOutOfMemory"], -20001)

    def test_files_written(self):
        with tempfile.TemporaryDirectory() as folder:
            tree(folder, shapes=SHAPES)
            out = Path(folder) / "made"
            command = [sys.executable, str(ROOT / "tools/catalogue.py"), folder, "--json",
                       str(out / "c.json"), "--map", str(out / "c.map"), "--def", str(out / "c.def"), "--codes",
                       str(out / "c.codes")]
            subprocess.run(command, check=True)
            self.assertEqual(len(json.loads((out / "c.json").read_text())["exports"]), 3)
            self.assertEqual((out / "c.map").read_text().split(),
                             "{ global: Everything; make_plan; forget; local: *; };".split())
            self.assertEqual((out / "c.def").read_text().split(),
                             "EXPORTS Everything make_plan forget".split())
            self.assertEqual((out / "c.codes").read_text(), "Everything host -20003 -20001 20004\n")
            before = (out / "c.map").stat().st_mtime_ns
            subprocess.run(command, check=True)
            self.assertEqual((out / "c.map").stat().st_mtime_ns, before, "an unchanged file was touched")


class TakingOver(unittest.TestCase):
    def test_codes_and_text_come_from_the_export_that_is_named(self):
        text = """
/** As Second, for complex data. */ QX_API ErrorCode Third(void);
/** As First. Differs.
    Codes: those of First (all), ErrOverflow (too large). */ QX_API ErrorCode Second(void);
/** The formula.
    Codes: ErrEmptyInput (x is empty), the host's status (x). */ QX_API ErrorCode First(void);
/** As First, without codes.
    Codes: none. */ QX_API ErrorCode None_(void);
/** As simple as that. */ QX_API void Other(void);
"""
        with tempfile.TemporaryDirectory() as folder:
            exports = catalogue.read_headers(tree(folder, taking=text))["exports"]
        self.assertEqual([(e["name"], e["codes"], e["hostStatus"], e["inherited"]) for e in exports], [
            ("Third", ["ErrEmptyInput", "ErrOverflow"], True, ["Second", "First"]),
            ("Second", ["ErrEmptyInput", "ErrOverflow"], True, ["First"]),
            ("First", ["ErrEmptyInput"], True, []),
            ("None_", [], False, ["First"]),
            ("Other", [], False, [])])


class NaN(unittest.TestCase):
    def test_is_read_and_inherited_with_the_argument(self):
        text = """/** As x is NaN: 0.
    NaN: x, in.level refused with ErrEmptyInput or
    in no result; in in some results. More. */ QX_API void first(double x, double in);
/** As first, elsewhere. */ QX_API void second(double in, double y, int32_t x);
/** As first. NaN: y in all results. */ QX_API void third(double y);
/** Sorts. NaN: x skipped; y in some results or by position (kept). */ QX_API void sort(double x, double y);
/** Not above 0 or NaN: 1e-10. */ QX_API void fourth(double y);
"""
        with tempfile.TemporaryDirectory() as folder:
            exports = catalogue.read_headers(tree(folder, nan=text))["exports"]
        refused, some = ["refused with ErrEmptyInput", "in no result"], ["in some results"]
        self.assertEqual([e["nan"] for e in exports], [
            {"x": refused, "in.level": refused, "in": some}, {"in.level": refused, "in": some},
            {"y": ["in all results"]}, {"x": ["skipped"], "y": ["in some results", "by position (kept)"]}, {}])


class Values(unittest.TestCase):
    def test_are_read_from_sentences_and_tables(self):
        text = """/* All of them. kind: 0 plain; 1 round, or (2; 3) so; 7 as x[1] ... x[n].

   Shapes by shape:

       0  (x[i] - 1) / 2.5      one value      12 wide
       1  x[i]                  none */
/** kind: 1; 7. Others are (kind: 5. no). */ QX_API void first(int32_t kind, QX_IN const int32_t *shape);
/** As first, at a place. place, end: 2 to 3 both; 5 last. */
QX_API void second(int32_t kind, uint16_t place, int32_t end);
/** kind: as second. shape: one of many. */ QX_API void third(int32_t kind, double shape);
/** Of a kind. */ QX_API void fourth(int32_t kind, QX_OUT int32_t *shape);
"""
        with tempfile.TemporaryDirectory() as folder:
            exports = catalogue.read_headers(tree(folder, values=text))["exports"]
        kinds = [(0, "plain"), (1, "round, or (2; 3) so"), (7, "as x[1] ... x[n]")]
        self.assertEqual([[a.get("values") for a in e["arguments"]] for e in exports], [
            [kinds[1:], [(0, "(x[i] - 1) / 2.5"), (1, "x[i]"), (12, "wide")]],
            [kinds[1:], *2 * [[(2, "both"), (3, "both"), (5, "last")]]], [kinds[1:], None], [kinds, None]])


class Refusing(unittest.TestCase):
    BAD = {
        "no documentation": "\nQX_API void f(void);",
        "documentation is empty": "\n/** */ QX_API void f(void);",
        "declared before": "/** A. */ QX_API void f(void);\n/** A. */ QX_API void f(void);",
        "names its element": "\n/** A. */ QX_API void f(QX_IN Array1DHandle x);",
        "QX_IN, QX_OUT or QX_INOUT is missing": "\n/** A. */ QX_API void f(DBL1D x);",
        "is an input": "\n/** A. */ QX_API void f(QX_OUT double x);",
        "const exactly": "\n/** A. */ QX_API void f(QX_IN DBL *x);",
        "const exactly if": "\n/** A. */ QX_API void f(QX_OUT const DBL *x);",
        "two error out-parameters":
            "\n/** Codes: none. */ QX_API void f(QX_OUT ErrorCode *err, QX_OUT ErrorCode *again);",
        "the length of x is no int32_t":
            "\n/** Codes: none. */ QX_API void f(double n, QX_INOUT QX_LENGTH(n) DBL *x);",
        "belongs to a pointer":
            "\n/** Codes: none. */ QX_API void f(int32_t n, QX_INOUT QX_LENGTH(n) DBL1D x);",
        "out-parameter must be QX_OUT": "\n/** A. */ QX_API void f(QX_INOUT ErrorCode *err);",
        "word must be QX_INOUT":
            "\ntypedef void *PlanSlot; /** A. */ QX_API void f(QX_IN PlanSlot *slot);",
        "unknown type long": "\n/** A. */ QX_API void f(long n);",
        "unknown result type": "\n/** A. */ QX_API long f(int32_t n);",
        "a type and a name": "\n/** A. */ QX_API void f(int32_t);",
        "two arguments are called n": "\n/** A. */ QX_API void f(int32_t n, double n);",
        "does not have": "\n/** Codes: ErrNoSuchThing (x). */ QX_API void f(void);",
        "by its number, -20003": "\n/** -20003 x is empty. */ QX_API void f(void);",
        "reason in brackets": "\n/** Codes: ErrEmptyInput. */ QX_API void f(void);",
        "does not end in a full stop": "\n/** Codes: ErrEmptyInput (x) */ QX_API void f(void);",
        "no sentence": "\n/** A. */ QX_API ErrorCode f(void);",
        "has a status": "\n/** A. */ QX_API void f(QX_OUT ErrorCode *err);",
        "which is no export": "\n/** As g, of x. */ QX_API void f(void);",
        "from itself": "\n/** As g. */ QX_API void f(void);\n/** As f. */ QX_API void g(void);",
        "is not the next value": "\n/** n: 0 a; 2 b; 1 c. */ QX_API void f(int32_t n);",
        "not the next value": "\n/** n: 0 a; b. */ QX_API void f(int32_t n);",
        "'n:' does not end": "\n/** n: 0 a; 1 b */ QX_API void f(int32_t n);",
        "from g, which is no export": "\n/** n: as g. */ QX_API void f(int32_t n);",
        "has no values for n": "\n/** n: as f. */ QX_API void f(int32_t n);",
        "under 'NaN:'": "\n/** A. NaN: n in three results. */ QX_API void f(double n);",
        "which is no argument": "\n/** A. NaN: m in no result. */ QX_API void f(double n);",
        "must begin": "\n/** A. */ extern QX_API void f(void);",
        "not marked QX_API": "\n/** A. */ void f(void);",
        "does not end": "\n/** A. */ QX_API void f(void)",
        "cannot be read": "\n/** A. */ QX_API void (*f)(void)[2];",
        "a known element or record": "\ntypedef QX_ARRAY_1D(Thing) Thing1D;",
    }

    def test_bad_headers_are_named_with_file_and_line(self):
        for reason, text in self.BAD.items():
            with self.subTest(reason), tempfile.TemporaryDirectory() as folder:
                with self.assertRaises(catalogue.HeaderError) as caught:
                    catalogue.read_headers(tree(folder, bad=text))
                self.assertIn(reason, str(caught.exception))
                self.assertRegex(str(caught.exception), r"bad\.h:2: ")

    def test_the_umbrella_includes_every_header(self):
        with tempfile.TemporaryDirectory() as folder:
            text = catalogue.umbrella(catalogue.read_headers(tree(folder, shapes=SHAPES, more="")))
        self.assertEqual(re.findall(r'#include "(.*)"', text),
                         ["qx/errors.h", "qx/more.h", "qx/shapes.h", "qx/types.h"])

    def test_the_command_fails(self):
        with tempfile.TemporaryDirectory() as folder:
            tree(folder, bad=self.BAD["no documentation"])
            ran = subprocess.run([sys.executable, str(ROOT / "tools/catalogue.py"), folder, "--json",
                                  f"{folder}/c.json"], capture_output=True, text=True)
            self.assertEqual(ran.returncode, 1)
            self.assertIn("bad.h:2", ran.stderr)
            self.assertFalse((Path(folder) / "c.json").exists())


if __name__ == "__main__":
    unittest.main()
