#!/usr/bin/python3
"""Poles, zeros and gain of IIR filters at 50 digits from the definitions of their families, and the distances of
computed designs from them. Prints the tables of poles in docs/accuracy/filter_design.md.

Elliptic poles come from the inverse of sn and from cd at complex arguments, Bessel poles are the roots of the
polynomial; edges and levels are exactly the doubles that a design is given.

usage: QX_LIBRARY_DIR=build/release PYTHONPATH=python tools/accuracy/filter_poles.py
"""

import itertools
import warnings

import mpmath as mp

mp.mp.dps = 50
TYPES = ("lowpass", "highpass", "bandpass", "bandstop")


def angles(n):
    """The angles of the poles of a Butterworth filter, from the positive imaginary axis to the negative one."""
    return [mp.pi * (n + 1 + 2 * i) / (2 * n) for i in range(n)]


def butterworth(n, _ripple, _attenuation):
    return [], [mp.expjpi((n + 1 + 2 * i) / mp.mpf(2 * n)) for i in range(n)], mp.mpf(1)


def chebyshev(n, ripple, _attenuation):
    e = mp.sqrt(mp.mpf(10) ** (mp.mpf(ripple) / 10) - 1)
    u = mp.asinh(1 / e) / n
    return ([], [mp.mpc(mp.sinh(u) * mp.cos(t), mp.cosh(u) * mp.sin(t)) for t in angles(n)],
            1 if n % 2 else 1 / mp.sqrt(1 + e * e))


def inverse_chebyshev(n, _ripple, attenuation):
    u = mp.asinh(mp.sqrt(mp.mpf(10) ** (mp.mpf(attenuation) / 10) - 1)) / n
    zeros = [mp.mpc(0, 1 / mp.sin(t)) for t in angles(n) if abs(mp.sin(t)) > mp.mpf(10) ** -30]
    return zeros, [1 / mp.mpc(mp.sinh(u) * mp.cos(t), mp.cosh(u) * mp.sin(t)) for t in angles(n)], mp.mpf(1)


def elliptic(n, ripple, attenuation):
    with mp.workdps(80):
        e, es = (mp.sqrt(mp.mpf(10) ** (mp.mpf(x) / 10) - 1) for x in (ripple, attenuation))
        m1 = (e / es) ** 2
        K1 = mp.ellipk(m1)
        nome = mp.exp(-mp.pi * mp.ellipk(1 - m1) / (K1 * n))
        m = (mp.jtheta(2, 0, nome) / mp.jtheta(3, 0, nome)) ** 4
        K = mp.ellipk(m)
        v = mp.mpc(0, -1) * mp.ellipf(mp.asin(mp.mpc(0, 1) / e), m1) / (n * K1)
        halves = [mp.mpf(2 * i + 1) / n for i in range(n // 2)]
        zeros, poles = [], []
        for u in halves:
            zero = mp.mpc(0, 1) / (mp.sqrt(m) * mp.ellipfun("cd", u * K, m=m).real)
            pole = mp.mpc(0, 1) * mp.ellipfun("cd", (u - mp.mpc(0, 1) * v) * K, m=m)
            zeros += [zero, -zero]
            poles += [pole, mp.conj(pole)]
        if n % 2:
            poles.append(mp.mpc((mp.mpc(0, 1) * mp.ellipfun("sn", mp.mpc(0, 1) * v * K, m=m)).real, 0))
        return zeros, poles, 1 if n % 2 else 1 / mp.sqrt(1 + e * e)


def bessel(n, _ripple, _attenuation):
    with mp.workdps(60 + 2 * n):
        c = [mp.factorial(2 * n - k) / (mp.mpf(2) ** (n - k) * mp.factorial(k) * mp.factorial(n - k))
             for k in range(n, -1, -1)]
        edge = mp.findroot(lambda w: mp.log(abs(mp.polyval(c, mp.mpc(0, w)) / c[-1]) ** 2 / 2),
                           (mp.mpf(1) / 2, mp.mpf(2 * n)), solver="illinois", maxsteps=2000, tol=mp.mpf(10) ** -80)
        return [], [root / edge for root in mp.polyroots(c, maxsteps=1000, extraprec=20 * n + 100)], mp.mpf(1)


FAMILIES = {"Butterworth": butterworth, "Chebyshev": chebyshev, "inverse Chebyshev": inverse_chebyshev,
            "elliptic": elliptic, "Bessel": bessel}


def digital(analog, order, type_, fl, fh):
    """Zeros, poles and gain in z; zeros of the prototype at infinity are mapped according to the type."""
    zeros, poles, gain = analog
    low, high = (mp.tan(mp.pi * mp.mpf(f)) for f in (fl, fh or fl))

    def to_band(s):
        if type_ == 0:
            return [s * low]
        if type_ == 1:
            return [low / s]
        q = s * (high - low) / 2 if type_ == 2 else (high - low) / s / 2
        root = mp.sqrt(q * q - low * high)
        return [q + root, q - root]

    def to_z(s):
        return (1 + s) / (1 - s)
    at_infinity = {0: [mp.mpf(-1)], 1: [mp.mpf(1)], 2: [mp.mpf(-1), mp.mpf(1)],
                   3: [to_z(mp.mpc(0, 1) * mp.sqrt(low * high)), to_z(mp.mpc(0, -1) * mp.sqrt(low * high))]}[type_]
    z = [to_z(s) for zero in zeros for s in to_band(zero)] + at_infinity * (order - len(zeros))
    p = [to_z(s) for pole in poles for s in to_band(pole)]
    middle = {0: mp.mpc(1), 1: mp.mpc(-1), 2: to_z(mp.mpc(0, 1) * mp.sqrt(low * high)), 3: mp.mpc(1)}[type_]
    k = gain * abs(mp.fprod(middle - x for x in p) / mp.fprod(middle - x for x in z))
    return z, p, k


def farthest(found, exact):
    """The largest distance of a computed pole or zero from its exact partner, in units of 2^-53."""
    left, worst = list(exact), mp.mpf(0)
    for one in found:
        one = mp.mpmathify(complex(one))
        nearest = min(left, key=lambda x: abs(x - one))
        worst = max(worst, abs(nearest - one))
        left.remove(nearest)
    return float(worst * 2 ** 53)


def main():
    import numpy as np
    from scipy import signal

    import qx
    ripple, attenuation = 1.0, 60.0
    ours = {"Butterworth": ("BWCoefs2026", ()), "Chebyshev": ("ChebyshevCoefs2026", (ripple,)),
            "inverse Chebyshev": ("InvChebyshevCoefs2026", (attenuation,)),
            "elliptic": ("EllipticCoefs2026", (ripple, attenuation)), "Bessel": ("BesselCoefs2026", ())}
    theirs = {"Butterworth": (signal.butter, {}), "Chebyshev": (signal.cheby1, {"rp": ripple}),
              "inverse Chebyshev": (signal.cheby2, {"rs": attenuation}),
              "elliptic": (signal.ellip, {"rp": ripple, "rs": attenuation}), "Bessel": (signal.bessel, {"norm": "mag"})}
    elders = {"Butterworth": "BWCoefs90", "Chebyshev": "ChebyshevCoefs90", "inverse Chebyshev": "InvChebyshevCoefs90",
              "elliptic": "EllipticCoefs90", "Bessel": "BesselCoefs90"}
    bands = ((0.2, 0.21), (1e-4, 1.1e-4), (0.499, 0.4999))
    orders = (3, 12, 24, 30)
    for (fl, fh), type_ in itertools.product(bands, range(4)):
        where = f"{TYPES[type_]} {fl:g}" + (f" to {fh:g}" if type_ > 1 else "")
        print(f"\n| {where} | " + " | ".join(f"order {n}" for n in orders) + " |\n" + "|---" * (len(orders) + 1) + "|")
        for family, prototype in FAMILIES.items():
            cells = []
            for order in orders:
                z, p, k = digital(prototype(order, ripple, attenuation), order, type_, fl, fh)
                export, levels = ours[family]
                edges = fl if type_ < 2 else (fl, fh)
                design, options = theirs[family]
                with warnings.catch_warnings():
                    warnings.simplefilter("ignore")
                    peer = design(order, Wn=edges, fs=1.0, btype=TYPES[type_], output="zpk", **options)
                    elder_a, _ = qx.call(elders[family], 1.0, fl, fh, *levels, order, type_, 0)
                _, _, zeros, poles, gain = qx.call(export, 1.0, fl, fh, *levels, order, type_)
                elder = np.concatenate([np.roots(np.trim_zeros(np.r_[1.0, a], "b")) for a in elder_a.reshape(-1, 2)])
                error = [f"{farthest(elder, p):.0e}" if len(elder) == len(p) else "-"]
                for found_z, found_p, found_k in ((zeros, poles, gain), peer):
                    worst = max(farthest(found_p, p), farthest(found_z, z))
                    error.append(f"{worst:.0e} ({float(abs(found_k / k - 1) * 2 ** 53):.0e})")
                cells.append("; ".join(error))
            print(f"| {family} | " + " | ".join(cells) + " |", flush=True)


if __name__ == "__main__":
    main()
