"""Peak and RMS errors of the special functions, and of the other libraries that have them.

Each file *_points.py in this folder has PAGE, TITLE and a list FUNCTIONS of Function. The error
of a value is |value - reference| / max(|reference|, scale) in units of eps = 2^-52, where the
scale is 0, a number or a function of the arguments: for functions with zeros it is the modulus,
so that the error is absolute near a zero.
"""

import ctypes
import glob
import importlib
import math
import os
import random
import sys

import mpmath
from mpmath import mp, mpf

mp.dps = 50
EPS = 2.0**-52


class Function:
    """name: the export. signature: a letter for each argument: d double, i int32, D and I the same
    by reference, o an output, e an error code, n a null output. output: the index of the output that
    is measured. rows: (interval, list of argument tuples). reference: a function of the arguments as
    mpf. peers: {"GSL": callable, ...} over floats. note: a remark above the table."""

    def __init__(self, name, signature, reference, rows, peers=None, scale=None, output=0, title=None,
                 note=""):
        self.name, self.signature, self.reference = name, signature, reference
        self.rows, self.peers, self.scale = rows, peers or {}, scale
        self.output, self.title, self.note = output, title or name, note


# Points. Each function returns a list of floats that includes the ends, and therefore both sides of a threshold at
# which two intervals meet.
def linear(a, b, n=40, seed=1):
    r = random.Random(seed)
    return [a, b] + [r.uniform(a, b) for _ in range(n - 2)]


def logarithmic(a, b, n=40, seed=1):
    r = random.Random(seed)
    return [a, b] + [math.exp(r.uniform(math.log(a), math.log(b))) for _ in range(n - 2)]


def around(x, n=6):
    """A threshold and the n doubles on either side of it."""
    points = [x]
    low = high = x
    for i in range(n):
        low, high = math.nextafter(low, -math.inf), math.nextafter(high, math.inf)
        points += [low, high]
    return points


def pairs(first, second):
    """Each element of first with one element of second, cyclically."""
    return [(f, second[i % len(second)]) for i, f in enumerate(first)]


def product(first, second):
    return [(f, s) for f in first for s in second]


def single(points):
    return [(p,) for p in points]


class Library:
    def __init__(self, path):
        self.library = ctypes.CDLL(path)

    def call(self, function, arguments):
        out = []
        values = list(arguments)
        passed = []
        for letter in function.signature:
            if letter == "d":
                passed.append(ctypes.c_double(values.pop(0)))
            elif letter == "i":
                passed.append(ctypes.c_int32(int(values.pop(0))))
            elif letter == "D":
                passed.append(ctypes.byref(ctypes.c_double(values.pop(0))))
            elif letter == "I":
                passed.append(ctypes.byref(ctypes.c_int32(int(values.pop(0)))))
            elif letter == "e":
                passed.append(ctypes.byref(ctypes.c_int32()))
            elif letter == "n":
                passed.append(None)
            else:
                out.append(ctypes.c_double(math.nan))
                passed.append(ctypes.byref(out[-1]))
        entry = getattr(self.library, function.name)
        entry.restype = None
        entry(*passed)
        return out[function.output].value


def peer_library(path):
    return ctypes.CDLL(path) if os.path.exists(path) else None


def plain(library, name, signature):
    """A peer's C function of doubles (d) and int32 (i), or None if the library does not have it."""
    if library is None or not hasattr(library, name):
        return None
    types = {"d": ctypes.c_double, "i": ctypes.c_int32, "u": ctypes.c_uint32, "m": ctypes.c_uint}
    entry = getattr(library, name)
    entry.restype = ctypes.c_double
    entry.argtypes = [types[letter] for letter in signature]
    extra = [0] * signature.count("m")  # GSL's precision mode

    def call(*arguments):
        cast = [int(a) if t in "iu" else float(a) for a, t in zip(arguments, signature.replace("m", ""))]
        return entry(*cast, *extra)
    return call


def gsl():
    for name in ("libgsl.so.27", "libgsl.so"):
        try:
            library = ctypes.CDLL(name, mode=ctypes.RTLD_GLOBAL)
        except OSError:
            try:
                ctypes.CDLL("libgslcblas.so.0", mode=ctypes.RTLD_GLOBAL)
                library = ctypes.CDLL(name)
            except OSError:
                continue
        library.gsl_set_error_handler_off()
        return library
    return None


GSL = gsl()
STD = peer_library(os.path.join(sys.argv[1] if len(sys.argv) > 1 else "build/release", "accuracy_peers.so"))


def from_gsl(name, signature):
    return plain(GSL, name, signature)


def from_std(name, signature):
    return plain(STD, name, signature)


def from_scipy(name, output=None):
    try:
        from scipy import special
    except ImportError:
        return None
    entry = getattr(special, name)
    return lambda *a: float(entry(*a)) if output is None else float(entry(*a)[output])


def error(value, reference, scale):
    if not math.isfinite(value):
        return math.inf
    size = max(abs(reference), scale)
    difference = abs(mpf(value) - reference)
    return float(difference / size / EPS) if difference else 0.0


def measure(call, points, references, scales):
    peak = squares = 0.0
    where = None
    for point, reference, scale in zip(points, references, scales):
        try:
            e = error(call(*point), reference, scale)
        except (ValueError, OverflowError, ZeroDivisionError):
            e = math.inf
        squares += e * e
        if e >= peak:
            peak, where = e, point
    return peak, math.sqrt(squares / len(points)), where


def text(value):
    if math.isinf(value) or math.isnan(value):
        return "fails"
    return f"{value:.2f}" if value < 100 else f"{value:.1e}"


PEERS = ("GSL", "C++", "SciPy")


def table(function, library, verbose):
    lines = [f"### {function.title}", ""] + ([function.note, ""] if function.note else []) + [
             "| Interval | Points | Peak | RMS | " + " | ".join(PEERS) + " |",
             "|---|--:|--:|--:|" + "--:|" * len(PEERS)]
    for interval, points in function.rows:
        kept, references, scales = [], [], []
        for point in points:
            exact = [mpf(p) for p in point]
            try:
                reference = function.reference(*exact)
            except (ValueError, ZeroDivisionError, mpmath.libmp.NoConvergence):
                print(f"{function.title}: no reference at {point}", file=sys.stderr)
                continue
            reference = mpmath.re(reference)
            if not mpmath.isfinite(reference) or not 1e-300 < abs(reference) < 1e308:
                continue  # outside the range of doubles, where a relative error means nothing
            kept.append(point)
            references.append(reference)
            scale = function.scale
            scales.append(abs(scale(*exact)) if callable(scale) else mpf(scale or 0))
        if not kept:
            continue
        peak, rms, where = measure(lambda *a: library.call(function, a), kept, references, scales)
        columns = []
        for name in PEERS:
            peer = function.peers.get(name)
            columns.append(text(measure(peer, kept, references, scales)[0]) if peer else "")
        cell = interval.replace("|", "\\|")  # a bar would end the cell
        lines.append(f"| {cell} | {len(kept)} | {text(peak)} | {text(rms)} | " + " | ".join(columns) + " |")
        if verbose:
            print(f"{function.title:22} {interval:38} {text(peak):>9} {text(rms):>9}  " +
                  " ".join(f"{c or '-':>9}" for c in columns) + f"  at {where}", flush=True)
    return lines + [""]


HEADING = """Errors in units of eps = 2.2e-16, relative to the value or, for functions with zeros, to the modulus
given there, against mpmath at 50 digits. Peak and RMS are ours; the other columns are the peak errors
of other libraries at the same points. Written by `tools/accuracy/run`.
"""


def main():
    library = Library(os.path.join(sys.argv[1], "libqxanalysis.so"))
    chosen = [name for name in sys.argv[2:] if not name.endswith(".md")]
    pages = [name for name in sys.argv[2:] if name.endswith(".md")]
    folder = os.path.dirname(os.path.abspath(__file__))
    sys.path.insert(0, folder)
    sys.modules["accuracy"] = sys.modules["__main__"]
    for path in sorted(glob.glob(os.path.join(folder, "*_points.py"))):
        module = importlib.import_module(os.path.basename(path)[:-3])
        if pages and module.PAGE not in pages:
            continue
        lines = [f"# {module.TITLE}", "", HEADING]
        for function in module.FUNCTIONS:
            if not chosen or function.name in chosen:
                lines += table(function, library, verbose=True)
        if not chosen:
            with open(os.path.join(folder, "../../docs/accuracy", module.PAGE), "w") as file:
                file.write("\n".join(lines))


if __name__ == "__main__":
    main()
