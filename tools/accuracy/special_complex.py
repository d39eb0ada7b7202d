#!/usr/bin/python3
"""Errors of the complex Bessel and Airy functions beside SciPy's on the same points, against mpmath:
writes docs/accuracy/special_complex.md. Needs python3-mpmath and python3-scipy.

usage: special_complex.py [SECONDS]   (of measuring; 300 where none are given)

The points are random and the same in every run; a longer time takes more of them.
"""

import math
import pathlib
import random
import sys
import time
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
BESSEL = ("J", "Y", "I", "K", "H1", "H2")
PEERS = ((special.jv, special.jve), (special.yv, special.yve), (special.iv, special.ive),
         (special.kv, special.kve), (special.hankel1, special.hankel1e),
         (special.hankel2, special.hankel2e))


def references(order, z):
    """The six functions from I and K of |order| in the right half-plane; on a cut the side is that
    of the sign of zero."""
    below = math.copysign(1, z.imag) < 0
    u, z = mpf(abs(order)), mpc(z.real, abs(z.imag))
    w = mpc(z.imag, -z.real)
    j = mpmath.expjpi(u / 2) * mpmath.besseli(u, w)
    h1 = -2j / mp.pi * mpmath.expjpi(-u / 2) * mpmath.besselk(u, w)
    y, h2 = 1j * (j - h1), 2 * j - h1
    side = -z if z.real < 0 else z
    i, k = mpmath.besseli(u, side), mpmath.besselk(u, side)
    if z.real < 0:
        i, k = mpmath.expjpi(u) * i, mpmath.expjpi(-u) * k - 1j * mp.pi * i
    if order < 0:
        c, s = mpmath.cospi(u), mpmath.sinpi(u)
        j, y = c * j - s * y, s * j + c * y
        h1, h2 = h1 * mpmath.expjpi(u), h2 * mpmath.expjpi(-u)
        i += 2 / mp.pi * s * k
    found = [j, y, i, k, h1, h2]
    if below:
        found = [mpmath.conj(v) for v in found]
        found[4], found[5] = found[5], found[4]
    return found


def modulus(one, other):
    larger, smaller = max(abs(one), abs(other)), min(abs(one), abs(other))
    return larger if larger < 100 * smaller else None


def point(region, r):
    """Order and argument."""
    size, order = 10**r.uniform(-1, 3), 10**r.uniform(-1, 3)
    angle = r.uniform(-math.pi, math.pi)
    if region == "orders and moduli to 30":
        size = r.uniform(0.1, 30)
        order = r.choice([r.uniform(0, 30), float(r.randint(0, 10)), r.randint(0, 9) + 0.5])
    elif region == "turning line, |z| near the order":
        size = order = 10**r.uniform(0, 3)
        size += r.uniform(-4, 4) * order**(1 / 3)
        angle = r.choice([angle, math.pi / 2, r.gauss(0, 0.05), math.pi + r.gauss(0, 0.03)])
    elif region == "next to the cut":
        angle = math.pi - 10**r.uniform(-8, -1)
    elif region == "imaginary axis":
        angle = r.choice([1, -1]) * math.pi / 2 + r.gauss(0, 0.01)
    elif region == "|z| from 1e-12 to 0.1":
        size = 10**r.uniform(-12, -1)
        order = r.choice([r.uniform(0, 20), float(r.randint(0, 8))])
    elif region == "|z| from 1e3 to 1e6":
        size = 10**r.uniform(3, 6)
    elif region == "orders and moduli from 500 to 1000":
        size, order = r.uniform(500, 1000), r.uniform(500, 1000)
    if r.random() < 0.3:
        order = -order
    if region == "positive axis":
        return order, complex(size, 0.0)
    if region == "negative axis":
        return order, complex(-size, r.choice([0.0, -0.0]))
    return order, complex(size * math.cos(angle), size * math.sin(angle))


REGIONS = ("orders and moduli to 30", "orders and moduli to 1000",
           "orders and moduli from 500 to 1000", "turning line, |z| near the order",
           "positive axis", "negative axis", "next to the cut", "imaginary axis",
           "|z| from 1e-12 to 0.1", "|z| from 1e3 to 1e6")


def error(found, value, scale):
    return float(abs(mpc(complex(found)) - value) / scale) / EPS if np.isfinite(found) else math.inf


def measure_bessel(order, z, add):
    exact = mpc(z)
    values = references(order, z)
    decay = mpmath.exp(-abs(exact.imag))
    scales = (decay, decay, mpmath.exp(-abs(exact.real)), mpmath.exp(exact),
              mpmath.exp(-1j * exact), mpmath.exp(1j * exact))
    pair = modulus(values[0], values[1])
    for k, name in enumerate(BESSEL):
        for scaled in (0, 1):
            value = values[k] * scales[k] if scaled else values[k]
            if not 1e-290 < abs(value) < 1e305:
                continue
            size = abs(value)
            if pair and name not in "IK":
                size = pair * (abs(scales[k]) if scaled else 1)
            ours = qx.call(f"QX_CxBessel{name}r", order, z, scaled)
            peer = PEERS[k][scaled](order, z)
            mine = error(ours, value, size)
            if mine > 1e6 and abs(ours - peer) < 1e-9 * abs(ours):
                add(None)  # mpmath's own value is wrong, as next to z = i order at times
                continue
            add((name, mine, error(peer, value, size), 100 * (1 + max(abs(order), abs(z)) / 10)))


AIRY = ("AiryAi", "AiryAiP", "AiryBi", "AiryBiP")


def measure_airy(z, add):
    exact = mpc(z)
    values = [f(exact, derivative=d) for f in (mpmath.airyai, mpmath.airybi) for d in (0, 1)]
    zeta = mpf(2) / 3 * exact * mpmath.sqrt(exact)
    peers = special.airy(z), special.airye(z)
    for k, name in enumerate(AIRY):
        size = modulus(values[k], values[k ^ 2]) or abs(values[k])
        for scaled in (0, 1):
            factor = (mpmath.exp(zeta) if k < 2 else mpmath.exp(-abs(zeta.real))) if scaled else 1
            if 1e-290 < abs(values[k] * factor) < 1e305:
                add((name[4:].replace("P", "'"), error(qx.call("QX_Cx" + name, z, scaled),
                                                       values[k] * factor, size * abs(factor)),
                     error(peers[scaled][k], values[k] * factor, size * abs(factor)),
                     100 * (1 + abs(z) / 10) + abs(z)**1.5))


def table(title, rows, names, left_out):
    print_ = [f"### {title}", "", "| Function | Values | Median | Peak | Peak over the bound | "
              "SciPy's median | SciPy's peak |", "|---|--:|--:|--:|--:|--:|--:|"]
    for name in names:
        ours = sorted(r[1] for r in rows if r[0] == name)
        peer = sorted(r[2] for r in rows if r[0] == name)
        if not ours:
            continue
        share = max(r[1] / r[3] for r in rows if r[0] == name)
        worst = f"{peer[-1]:.3g}" if math.isfinite(peer[-1]) else "fails"
        print_.append(f"| {name} | {len(ours)} | {ours[len(ours) // 2]:.2f} | {ours[-1]:.3g} | "
                      f"{share:.2g} | {peer[len(peer) // 2]:.2f} | {worst} |")
    if left_out:
        print_ += ["", f"{left_out} values are left out, of which both agree to 9 digits and mpmath's "
                   "is another."]
    return print_ + [""]


def main():
    seconds = float(sys.argv[1]) if len(sys.argv) > 1 else 300
    warnings.simplefilter("ignore")
    lines = ["# Accuracy: complex Bessel and Airy functions", "",
             "Errors in units of eps = 2.2e-16 against mpmath at 40 digits, unscaled and scaled values",
             "together, at random points of each region, orders of both signs. An error is relative to the",
             "modulus: the larger of |J| and |Y| (Ai and Bi) where they are within 100 of each other, else",
             "the value itself; for I and K always the value, zeros of I included. The bound is 100 (1 +",
             "max(|order|, |z|) / 10), and |z|^1.5 more for Airy functions. Made by",
             "`tools/accuracy/special_complex.py`.", ""]
    for region in REGIONS + ("Airy functions, |z| to 100",):
        random_, rows, end = random.Random(1), [], time.time() + seconds / (len(REGIONS) + 1)
        while time.time() < end:
            try:
                if region.startswith("Airy"):
                    size, angle = 10**random_.uniform(-1, 2), random_.uniform(-math.pi, math.pi)
                    measure_airy(complex(size * math.cos(angle), size * math.sin(angle)), rows.append)
                else:
                    measure_bessel(*point(region, random_), rows.append)
            except (mpmath.NoConvergence, qx.QxError, ValueError):
                continue
        names = [name[4:].replace("P", "'") for name in AIRY] if "Airy" in region else BESSEL
        lines += table(region, [r for r in rows if r], names, sum(r is None for r in rows))
    (ROOT / "docs/accuracy/special_complex.md").write_text("\n".join(lines).rstrip() + "\n")


if __name__ == "__main__":
    main()
