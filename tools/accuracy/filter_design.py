#!/usr/bin/python3
"""Compares the gains of designed IIR filters with the definition of their families: the largest
difference over the pass band, for the elders' sections of second and fourth order, the sections of the
revisions of 2026 and SciPy's sections. Prints tables of docs/accuracy/filter_design.md. mpmath evaluates the
response of the stored coefficients and the definition at 40 digits.

usage: QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/filter_design.py
"""

import warnings

import mpmath as mp
import numpy as np
from scipy import signal

import qx

mp.mp.dps = 40
RIPPLE, ATTENUATION = 1.0, 60.0
FAMILIES = {
    "Butterworth": ("BWCoefs90", (), signal.butter, {}),
    "Chebyshev": ("ChebyshevCoefs90", (RIPPLE,), signal.cheby1, {"rp": RIPPLE}),
    "inverse Chebyshev": ("InvChebyshevCoefs90", (ATTENUATION,), signal.cheby2, {"rs": ATTENUATION}),
    "elliptic": ("EllipticCoefs90", (RIPPLE, ATTENUATION), signal.ellip,
                 {"rp": RIPPLE, "rs": ATTENUATION}),
    "Bessel": ("BesselCoefs90", (), signal.bessel, {"norm": "mag"}),
}
ORDERS = (4, 8, 12, 24, 40)
BANDS = ((0, 0.2, None), (0, 0.01, None), (0, 0.003, None), (0, 0.0005, None), (2, 0.1, 0.31),
         (2, 0.01, 0.02), (2, 0.0005, 0.001), (2, 0.1, 0.101))


def excess_of(family, order):
    """1 / |H|^2 - 1 as a function of the prototype's frequency."""
    ripple2, attenuation2 = (mp.mpf(10) ** (mp.mpf(x) / 10) - 1 for x in (RIPPLE, ATTENUATION))
    if family == "Butterworth":
        return lambda w: w ** (2 * order)
    if family == "Chebyshev":
        return lambda w: ripple2 * mp.chebyt(order, w) ** 2
    if family == "inverse Chebyshev":
        return lambda w: attenuation2 / mp.chebyt(order, 1 / w) ** 2 if w else mp.mpf(0)
    if family == "Bessel":
        c = [mp.factorial(2 * order - k) / (mp.mpf(2) ** (order - k) * mp.factorial(k)
                                            * mp.factorial(order - k)) for k in range(order + 1)]
        power = lambda w: abs(mp.polyval(c[::-1], mp.mpc(0, w)) / c[0]) ** 2  # noqa: E731
        edge = mp.findroot(lambda w: mp.log(power(w) / 2), (mp.mpf(1) / 2, mp.mpf(2 * order)),
                           solver="illinois", maxsteps=500)
        return lambda w: power(w * edge) - 1
    m1 = ripple2 / attenuation2
    nome = mp.exp(-mp.pi * mp.ellipk(1 - m1) / mp.ellipk(m1) / order)
    m = (mp.jtheta(2, 0, nome) / mp.jtheta(3, 0, nome)) ** 4
    K, K1 = mp.ellipk(m), mp.ellipk(m1)
    return lambda w: ripple2 * mp.ellipfun("cd", order * K1 * (1 - mp.ellipf(mp.asin(w), m) / K),
                                           m=m1) ** 2


def prototype_frequency(type_, fl, fh, f):
    at, low = mp.tan(mp.pi * f), mp.tan(mp.pi * mp.mpf(fl))
    if type_ == 0:
        return at / low
    high = mp.tan(mp.pi * mp.mpf(fh))
    return abs((at * at - low * high) / (at * (high - low)))


def gain(sections, f):
    z = mp.exp(mp.mpc(0, -2) * mp.pi * f)
    h = mp.mpf(1)
    for b, a in sections:
        h *= (mp.polyval([mp.mpf(float(x)) for x in b[::-1]], z)
              / mp.polyval([mp.mpf(float(x)) for x in a[::-1]], z))
    return abs(h)


def of_arrays(a, b, order):
    return list(zip(b.reshape(-1, order + 1),
                    np.insert(a.reshape(-1, order), 0, 1.0, axis=1)))


def designs(family, order, type_, fl, fh):
    export, levels, theirs, options = FAMILIES[family]
    yield of_arrays(*qx.call(export, 1.0, fl, fh or 0.0, *levels, order, type_, 0), 2)
    yield of_arrays(*qx.call(export, 1.0, fl, fh or 0.0, *levels, order, type_, 1), 4)
    newest = export.replace("90", "2026")
    yield of_arrays(*qx.call(newest, 1.0, fl, fh or 0.0, *levels, order, type_)[:2], 2)
    with warnings.catch_warnings():
        warnings.simplefilter("ignore")
        sos = theirs(order, Wn=fl if type_ == 0 else (fl, fh), fs=1.0, output="sos",
                     btype="lowpass" if type_ == 0 else "bandpass", **options)
    yield [(row[:3], row[3:]) for row in sos]


def main():
    for type_, fl, fh in BANDS:
        print(f"\n| {'lowpass ' + str(fl) if type_ == 0 else f'bandpass {fl} to {fh}'} | "
              + " | ".join(f"order {n}" for n in ORDERS) + " |")
        print("|---" * (len(ORDERS) + 1) + "|")
        for family in FAMILIES:
            cells = []
            for order in ORDERS:
                excess = excess_of(family, order)
                # In the pass band, whose edge an inverse Chebyshev design does not specify.
                share = 0.5 if family == "inverse Chebyshev" else 1
                if type_ == 0:
                    points = [mp.mpf(fl) * share * k / 24 for k in range(1, 25)]
                else:
                    middle, half = mp.mpf(fl + fh) / 2, mp.mpf(fh - fl) / 2 * share
                    points = [middle + half * mp.mpf(k) / 12 for k in range(-12, 13)]
                exact = [1 / mp.sqrt(1 + excess(prototype_frequency(type_, fl, fh, f)))
                         for f in points]
                cells.append(", ".join(f"{float(max(abs(gain(s, f) - g) for f, g in zip(points, exact))):.0e}"
                                       for s in designs(family, order, type_, fl, fh)))
            print(f"| {family} | " + " | ".join(cells) + " |", flush=True)


if __name__ == "__main__":
    main()
