"""Filters by the design exports, with what they do to a signal: gain, phase and group delay."""

import dataclasses
import math

import numpy as np

from .calls import call

TYPES = ("lowpass", "highpass", "bandpass", "bandstop")
SECOND_ORDER, FOURTH_ORDER = 0, 1  # forms of sections
FAMILIES = {  # export, and which levels it takes
    "butterworth": ("BWCoefs90", ()), "chebyshev": ("ChebyshevCoefs90", ("ripple",)),
    "inverse-chebyshev": ("InvChebyshevCoefs90", ("attenuation",)),
    "elliptic": ("EllipticCoefs90", ("ripple", "attenuation")), "bessel": ("BesselCoefs90", ())}
WINDOWS = {"hanning": 1, "hamming": 2, "blackman": 4}
DEFAULT = math.nan  # window parameter


@dataclasses.dataclass
class Filter:
    """A product of rational functions of z^-1: pairs of numerator and denominator, each with its
    coefficients in ascending powers."""
    sections: list
    export: str
    note: str = ""

    def response(self, frequencies):
        """The complex gain at frequencies in cycles per sample."""
        gain = np.ones(len(frequencies), complex)
        for b, a in self.sections:
            gain *= polynomial(b, frequencies) / polynomial(a, frequencies)
        return gain

    def group_delay(self, frequencies):
        """In samples; NaN where the gain is 0."""
        delay = np.zeros(len(frequencies))
        with np.errstate(divide="ignore", invalid="ignore"):
            for b, a in self.sections:
                delay += delay_of(b, frequencies) - delay_of(a, frequencies)
        delay[np.abs(self.response(frequencies)) < 1e-12] = math.nan
        return delay

    def is_stable(self):
        return all(np.abs(np.roots(a)).max(initial=0) < 1 for _, a in self.sections)

    def is_fir(self):
        return all(len(a) == 1 for _, a in self.sections)


def polynomial(coefficients, frequencies):
    return np.polynomial.polynomial.polyval(np.exp(-2j * math.pi * frequencies), coefficients)


def delay_of(coefficients, frequencies):
    """Minus the slope of the phase of a polynomial in z^-1."""
    weighted = coefficients * np.arange(len(coefficients))
    return (polynomial(weighted, frequencies) / polynomial(coefficients, frequencies)).real


def cascade(a, b, form):
    """The sections of two arrays as the exports have them."""
    order = 4 if form == FOURTH_ORDER else 2
    return [(np.trim_zeros(above, "b"), np.trim_zeros(np.append(1.0, below), "b")) for above, below in
            zip(np.reshape(b, (-1, order + 1)), np.reshape(a, (-1, order)))]


def check_edges(kind, edges, rate):
    """Refuses what no filter can have, in words that the edges were given in."""
    half = rate / 2
    unit = " Hz" if rate != 1 else ""
    for edge, following in zip(edges, edges[1:]):
        if not edge < following:
            raise ValueError(f"the edges are in the wrong order: {edge:g} comes before {following:g}; "
                             "they must ascend")
    highest = edges[-1]
    alone = kind in ("lowpass", "highpass") and len(edges) == 1
    if highest > half or alone and highest == half:
        relation = "is not below" if highest == half else "is above"
        raise ValueError(f"the edge {highest:g}{unit} {relation} half the sampling rate, {half:g}{unit}"
                         + ("; without --rate the edges are in cycles per sample" if rate == 1 else ""))


def edges_of(kind, edges):
    """fl and fh; a lowpass and a highpass take no notice of the second."""
    needed = 1 if kind in ("lowpass", "highpass") else 2
    if len(edges) != needed:
        raise ValueError(f"a {kind} needs {needed} edge{'s' * (needed > 1)}, not {len(edges)}")
    return edges[0], edges[-1]


def iir(family, kind, edges, rate, order, ripple=1.0, attenuation=60.0, form=SECOND_ORDER):
    """Coefficients a and b of a cascade, and the Filter."""
    export, levels = FAMILIES[family]
    values = [{"ripple": ripple, "attenuation": attenuation}[level] for level in levels]
    fl, fh = edges_of(kind, edges)
    a, b = call(export, rate, fl, fh, *values, order, TYPES.index(kind), form)
    return a, b, Filter(cascade(a, b, form), export)


def fir(taps, export, note=""):
    return Filter([(np.asarray(taps), np.ones(1))], export, note)


def windowed(kind, edges, rate, taps, window=None):
    fl, fh = edges_of(kind, edges)
    h, _ = call("FIRCoefs", rate, fl, fh, taps, TYPES.index(kind))
    if window is None:
        return fir(h, "FIRCoefs")
    h = call("AllWinH", h, WINDOWS[window], DEFAULT, 0, 0)
    return fir(h, "FIRCoefs, AllWinH", f"under a {window.capitalize()} window")


def equiripple(kind, edges, rate, taps, weight=1.0):
    """The edges of the bands in ascending order; a deviation in the stop band counts `weight` times."""
    gains = {"lowpass": (1, 0), "highpass": (0, 1), "bandpass": (0, 1, 0), "bandstop": (1, 0, 1)}[kind]
    if len(edges) != 2 * len(gains) - 2:
        raise ValueError(f"an equiripple {kind} needs {2 * len(gains) - 2} edges, not {len(edges)}")
    bounds = [0.0, *edges, rate / 2]
    bands = [(gain, bounds[2 * i], bounds[2 * i + 1], 1.0 if gain else weight)
             for i, gain in enumerate(gains)]
    h, ripple = call("Parks", taps, rate, bands, 0, 0)
    return fir(h, "Parks", f"within {ripple:.4g} of 1 and {ripple / weight:.4g} of 0")


def narrow(kind, edges, rate, ripple=1.0, attenuation=60.0):
    """The record of the design, and the Filter. The edges of the pass and the stop band are two of a
    lowpass or highpass; of the others the four in ascending order, about one centre."""
    if kind in ("lowpass", "highpass"):
        if len(edges) != 2:
            raise ValueError(f"a narrow {kind} needs 2 edges, not {len(edges)}")
        fpass, fstop = edges if kind == "lowpass" else edges[::-1]
        center = 0.0
    else:
        if len(edges) != 4:
            raise ValueError(f"a narrow {kind} needs 4 edges, not {len(edges)}")
        center = sum(edges) / 4
        outer, inner = edges[3] - edges[0], edges[2] - edges[1]
        fpass, fstop = (inner, outer) if kind == "bandpass" else (outer, inner)
    linear = 10 ** (ripple / 20) - 1
    made = call("FIRNarrowCoef_head", rate, fpass, fstop, center, linear, attenuation,
                TYPES.index(kind), {})
    taps = call("FIRnarrowFilter_head", [1.0], made)
    work = len(made["model"]) + len(made["interpolator"])
    stages = f"two stages, stretched by {made['M']}" if made["M"] > 1 else "one stage"
    return made, fir(taps, "FIRNarrowCoef_head", f"{work} multiplications in {stages}")
