#!/usr/bin/python3
"""Writes docs/accuracy/special_complex.md: errors of the complex Bessel and Airy functions, next to SciPy's
at the same points. The references come from complex_bessel_reference.cpp, by ball
arithmetic; some of them are first compared with mpmath's values. Needs g++, libflint-arb-dev,
python3-mpmath and python3-scipy.

usage: special_complex.py [POINTS]             writes the page, by default with 400 points per region
       special_complex.py --worst POINTS SEED  prints the worst points of all regions, first by error
                                               over max(2 SciPy's, 8 eps), then by error over the bound
"""

import collections
import math
import pathlib
import random
import subprocess
import sys
import warnings

import mpmath
import numpy as np
from mpmath import mp, mpc, mpf
from scipy import special

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "python"))
import qx  # noqa: E402

mp.dps = 40
EPS = 2.0**-52
FLOOR = 8  # eps; an error above it must be at most twice SciPy's
BESSEL = ("J", "Y", "I", "K", "H1", "H2")
AIRY = ("Ai", "Ai'", "Bi", "Bi'")
PEERS = ((special.jv, special.jve), (special.yv, special.yve), (special.iv, special.ive),
         (special.kv, special.kve), (special.hankel1, special.hankel1e),
         (special.hankel2, special.hankel2e))
AIRY_REGION = "Airy functions, |z| to 200"

# One value: the point, the function, its errors here and in SciPy, and the bound, in eps.
Row = collections.namedtuple("Row", "order z name scaled mine peer bound")


def size_and_order(region, r):
    if region == "orders and moduli to 30":
        return r.uniform(0.1, 30), r.uniform(0, 30)
    if region == "orders and moduli from 500 to 1000":
        return r.uniform(500, 1000), r.uniform(500, 1000)
    if region.startswith("turning line"):
        order = 10**r.uniform(0, 3)
        return abs(order + r.uniform(-6, 6) * order**(1 / 3)), order
    if region == "|z| from 1e-12 to 0.1":
        return 10**r.uniform(-12, -1), r.uniform(0, 20)
    if region == "|z| from 1e3 to 1e6":
        return 10**r.uniform(3, 6), 10**r.uniform(-1, 3)
    if region == "orders from 1e-14 to 0.1":
        return 10**r.uniform(-3, 2), 10**r.uniform(-14, -1)
    return 10**r.uniform(-1, 3), 10**r.uniform(-1, 3)


def angle_of(region, r):
    if region == "turning line, next to the axes":
        return r.choice([0, math.pi / 2, math.pi, -math.pi / 2]) + r.gauss(0, 0.05)
    if region == "next to the cut":
        return math.pi - 10**r.uniform(-8, -1)
    if region == "next to the imaginary axis":
        return r.choice([1, -1]) * (math.pi / 2 + r.gauss(0, 0.01) * r.choice([1, 1e-4, 1e-8]))
    return r.uniform(-math.pi, math.pi)


def point(region, r):
    """Order and argument: integer, half-integer and other orders of both signs."""
    size, order = size_and_order(region, r)
    form = r.randrange(5)
    if form == 0:
        order = float(round(order))
    elif form == 1:
        order = math.floor(order) + 0.5
    elif form == 2 and r.random() < 0.3:
        order = round(order) + r.choice([1, -1]) * 10**r.uniform(-12, -2)
    if r.random() < 0.4:
        order = -order
    if region == "positive axis":
        return order, complex(size, 0.0)
    if region == "negative axis":
        return order, complex(-size, r.choice([0.0, -0.0]))
    if region == "imaginary axis":
        return order, complex(0.0, r.choice([size, -size]))
    angle = angle_of(region, r)
    return order, complex(size * math.cos(angle), size * math.sin(angle))


REGIONS = ("orders and moduli to 30", "orders and moduli to 1000",
           "orders and moduli from 500 to 1000", "turning line, |z| near the order",
           "turning line, next to the axes", "positive axis", "negative axis", "next to the cut",
           "imaginary axis", "next to the imaginary axis", "orders from 1e-14 to 0.1",
           "|z| from 1e-12 to 0.1", "|z| from 1e3 to 1e6")


class References:
    def __init__(self):
        folder = ROOT / "build/release"
        self.program = folder / "complex_bessel_reference"
        source = pathlib.Path(__file__).with_name("complex_bessel_reference.cpp")
        subprocess.run(["g++", "-std=c++20", "-O2", "-o", self.program, source, "-lflint-arb", "-lflint"],
                       check=True)

    def __call__(self, lines, functions):
        """An array with the axes point, function, numbers in a line of the program's output."""
        text = subprocess.run([self.program], input="\n".join(lines), text=True, check=True,
                              capture_output=True).stdout
        return np.array(text.split(), dtype=float).reshape(len(lines), functions, 9)


def check_against_mpmath(references):
    r = random.Random(5)
    points = [point("orders and moduli to 30", r) for _ in range(40)]
    found = references([f"bessel {order!r} {z.real!r} {z.imag!r}" for order, z in points], 6)
    for (order, z), values in zip(points, found):
        for k, function in enumerate((mpmath.besselj, mpmath.bessely, mpmath.besseli,
                                      mpmath.besselk, mpmath.hankel1, mpmath.hankel2)):
            with mp.workdps(80):  # the Hankel functions of mpmath cancel
                value = function(mpf(order), mpc(z))
            ours = mpc(mpf(values[k][0]) + mpf(values[k][1]), mpf(values[k][2]) + mpf(values[k][3]))
            assert abs(ours - value) < 1e-28 * abs(value), (order, z, k)


def error(found, parts, size):
    """The errors of an array, in eps."""
    distance = np.hypot((found.real - parts[:, 0]) - parts[:, 1], (found.imag - parts[:, 2]) - parts[:, 3])
    return np.where(np.isfinite(found), distance / size / EPS, np.inf)


def called(name, *arguments):
    """The results of the calls; NaN for a call that fails."""
    def one(*a):
        try:
            return qx.call(name, *a)
        except qx.QxError:
            return complex(math.nan, math.nan)
    return np.array([one(*(v.item() for v in a)) for a in zip(*arguments)])


def rows_of(values, k, partner, scaled, mine, peer, where, bound):
    """The rows of one function, for values in the range of a double."""
    parts = values[:, k, 4 * scaled:4 * scaled + 4]
    size = np.hypot(parts[:, 0], parts[:, 2])
    inside = np.isfinite(size) & (size > 1e-290) & (size < 1e305)
    modulus = size * np.maximum(1, values[:, k, 8])
    if partner is not None:  # the modulus of the pair, and the scale of the function
        one, two = (np.hypot(*values[:, p, [0, 2]].T) for p in partner)
        larger, smaller = np.maximum(one, two), np.minimum(one, two)
        own = np.hypot(*values[:, k, [0, 2]].T)
        near = (larger < 100 * smaller) & (own > 0)
        modulus = np.where(near, np.maximum(modulus, larger * size / np.where(near, own, 1)), modulus)
    ours, theirs = error(mine, parts, modulus), error(peer, parts, modulus)
    return [Row(*where(i), scaled, ours[i], theirs[i], bound[i]) for i in np.nonzero(inside)[0]]


def bessel_rows(points, references):
    order, z = np.array([p[0] for p in points]), np.array([p[1] for p in points])
    values = references([f"bessel {v!r} {w.real!r} {w.imag!r}" for v, w in points], 6)
    bound = 100 * (1 + np.maximum(abs(order), abs(z)) / 10)
    rows = []
    for k, name in enumerate(BESSEL):
        for scaled in (0, 1):
            mine = called(f"QX_CxBessel{name}r", order, z, np.full(len(z), scaled))
            rows += rows_of(values, k, None if name in "IK" else (0, 1), scaled, mine,
                            PEERS[k][scaled](order, z), lambda i: (order[i], z[i], name), bound)
    return rows


def airy_rows(z, references):
    values = references([f"airy {float(w.real)!r} {float(w.imag)!r}" for w in z], 4)
    peers = special.airy(z), special.airye(z)
    rows = []
    for k, name in enumerate(AIRY):
        for scaled in (0, 1):
            bound = 100 * (1 + abs(z) / 10) + (0 if scaled else abs(z)**1.5)
            mine = called("QX_CxAiry" + name.replace("'", "P"), z, np.full(len(z), scaled))
            rows += rows_of(values, k, (k, k ^ 2), scaled, mine, peers[scaled][k],
                            lambda i: (None, z[i], name), bound)
    return rows


def airy_points(count, r):
    angles = [r.choice([r.uniform(-math.pi, math.pi), math.pi, 0, math.pi / 3 + r.gauss(0, 0.01)])
              for _ in range(count)]
    return np.array([10**r.uniform(-1.5, 2.3) * complex(math.cos(a), math.sin(a) if a % math.pi else 0)
                     for a in angles])


def measured(region, count, references, seed=1):
    r = random.Random(f"{region} {seed}")
    if region == AIRY_REGION:
        return airy_rows(airy_points(count, r), references)
    return bessel_rows([point(region, r) for _ in range(count)], references)


def over_peer(row):
    return row.mine / max(2 * row.peer, FLOOR)


def figure(x):
    return f"{x:.3g}" if math.isfinite(x) else "fails"


def table(title, rows):
    lines = [f"### {title}", "", "| Function | Values | Median | Peak | Peak over the bound | Peak over "
             "max(2 SciPy's, 8) | SciPy's median | SciPy's peak |", "|---|--:|--:|--:|--:|--:|--:|--:|"]
    for name in AIRY if title == AIRY_REGION else BESSEL:
        of_name = [row for row in rows if row.name == name]
        ours, peer = np.array([row.mine for row in of_name]), np.array([row.peer for row in of_name])
        lines.append(f"| {name} | {len(of_name)} | {np.median(ours):.2f} | {figure(ours.max())} | "
                     f"{max(row.mine / row.bound for row in of_name):.2g} | "
                     f"{max(map(over_peer, of_name)):.2f} | {figure(np.median(peer))} | {figure(peer.max())} |")
    return lines + [""]


HEAD = f"""# Accuracy: complex Bessel and Airy functions

Errors in units of eps = 2.2e-16 against ball arithmetic with at least 110 bits, for unscaled and scaled
values together, at random points of each region, with integer, half-integer and other orders of both signs. An
error is relative to the modulus: the larger of |J| and |Y| (Ai and Bi) where they are within a factor of 100 of
each other, otherwise the value itself; for I and K always the value. Next to a zero of a function, the modulus
is the amplitude of its oscillation there, |f'| |z| / sqrt |order^2 - z^2| (with + for I and K).
Relative to the value itself, an error would grow without bound towards a zero.

The bound is 100 (1 + max(|order|, |z|) / 10), and |z|^1.5 more for unscaled Airy functions. The errors should also
be at most twice SciPy's; because SciPy's error at a single point can be anything down to 0, this comparison starts
at {FLOOR} eps: the column "Peak over max(2 SciPy's, {FLOOR})" stays below 1. Written by
`tools/accuracy/special_complex.py`, with SciPy {{}}; `--worst` searches for the worst points.
"""


def write_page(count, references):
    import scipy
    lines = HEAD.format(scipy.__version__).splitlines() + [""]
    for region in REGIONS + (AIRY_REGION,):
        lines += table(region, measured(region, count, references))
        print(region, flush=True)
    (ROOT / "docs/accuracy/special_complex.md").write_text("\n".join(lines).rstrip() + "\n")


def print_worst(count, seed, references):
    rows = []
    for region in REGIONS + (AIRY_REGION,):
        rows += measured(region, count, references, seed)
    print(f"{len(rows)} values, peak {max(row.mine for row in rows):.3g} eps")
    for title, share in (("over max(2 SciPy's, 8 eps)", over_peer),
                         ("over the bound", lambda row: row.mine / row.bound)):
        print(title)
        for row in sorted(rows, key=share)[:-13:-1]:
            print(f"  {share(row):8.3g}  {row.name}{' scaled' if row.scaled else ''}, order {row.order!r}, "
                  f"z {row.z!r}: {row.mine:.3g} eps, SciPy's {row.peer:.3g}")


def main():
    warnings.simplefilter("ignore")
    references = References()
    check_against_mpmath(references)
    if sys.argv[1:2] == ["--worst"]:
        print_worst(int(sys.argv[2]), sys.argv[3], references)
    else:
        write_page(int(sys.argv[1]) if len(sys.argv) > 1 else 400, references)


if __name__ == "__main__":
    main()
