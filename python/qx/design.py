"""Designs filters by the functions of qx.filters, from the words and edges that the command design takes."""

import dataclasses

import numpy as np

from . import filters
from .topical import served

TYPES = ("lowpass", "highpass", "bandpass", "bandstop")
FAMILIES = {  # the function, and the levels that it takes
    "butterworth": ("butterworth", ()), "chebyshev": ("chebyshev1", ("ripple",)),
    "inverse-chebyshev": ("chebyshev2", ("attenuation",)),
    "elliptic": ("elliptic", ("ripple", "attenuation")), "bessel": ("bessel", ())}
WINDOWS = {"hanning": "hann", "hamming": "hamming", "blackman": "blackman"}


@dataclasses.dataclass
class Design:
    """A filter, and how it was designed."""
    filter: filters.Filter
    python: str  # the expression that makes it
    edges: list  # in the unit of the rate
    note: str = ""
    numbers: dict = dataclasses.field(default_factory=dict)  # for design.json


def check_edges(kind, edges, rate):
    """Refuses edges that no filter can have, in the unit in which they were given."""
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


def cutoff_of(kind, edges):
    """The edge, or the two edges of a band."""
    needed = 1 if kind in ("lowpass", "highpass") else 2
    if len(edges) != needed:
        raise ValueError(f"a {kind} needs {needed} edge{'s' * (needed > 1)}, not {len(edges)}")
    return edges[0] if needed == 1 else tuple(edges)


def made(name, edges, *arguments, **words):
    """The Design of a function of qx.filters and its arguments."""
    text = ", ".join([*map(repr, arguments), *(f"{word}={value!r}" for word, value in words.items())])
    return Design(getattr(filters, name)(*arguments, **words), f"qx.filters.{name}({text})", list(edges))


def iir(family, kind, edges, rate, order, ripple=1.0, attenuation=60.0, fourth=False):
    name, levels = FAMILIES[family]
    values = [{"ripple": ripple, "attenuation": attenuation}[level] for level in levels]
    design = made(name, edges, order, *values, cutoff_of(kind, edges), kind=kind, fs=rate)
    sos = design.filter.sos
    a, b = in_fourth_order(sos) if fourth else (sos[:, 4:], sos[:, :3])
    design.numbers = {"form": int(fourth), "a": a.ravel().tolist(), "b": b.ravel().tolist(), "sos": sos.tolist()}
    return design


def in_fourth_order(sos):
    """Pairs of sections combined into one each: a, without its leading 1, and b."""
    if len(sos) % 2:
        sos = np.vstack([sos, [1, 0, 0, 1, 0, 0]])
    pairs = list(zip(sos[::2], sos[1::2]))
    return (np.array([np.convolve(one[3:], other[3:])[1:] for one, other in pairs]),
            np.array([np.convolve(one[:3], other[:3]) for one, other in pairs]))


def _of_taps(design):
    design.numbers = {"taps": design.filter.taps.tolist()}
    return design


def windowed(kind, edges, rate, taps, window=None):
    return _of_taps(made("windowed", edges, taps, cutoff_of(kind, edges), kind=kind,
                         window=WINDOWS[window] if window else "boxcar", fs=rate))


def equiripple(kind, edges, rate, taps, weight=1.0):
    """Takes the edges of the bands in ascending order. A deviation in the stop band has `weight` times the
    weight of one in the pass band."""
    gains = {"lowpass": (1, 0), "highpass": (0, 1), "bandpass": (0, 1, 0), "bandstop": (1, 0, 1)}[kind]
    if len(edges) != 2 * len(gains) - 2:
        raise ValueError(f"an equiripple {kind} needs {2 * len(gains) - 2} edges, not {len(edges)}")
    weights = [1.0 if gain else weight for gain in gains]
    design = _of_taps(made("equiripple", edges, taps, [0.0, *edges, rate / 2], list(gains), weights, fs=rate))
    ripple = design.filter.ripple
    design.note = f"within {ripple:.4g} of 1 and {ripple / weight:.4g} of 0"
    return design


def narrow(kind, edges, rate, ripple=1.0, attenuation=60.0):
    """Takes the edges of the pass and the stop band: two for a lowpass or highpass, for the others four in
    ascending order, symmetric about a common centre."""
    needed = 2 if kind in ("lowpass", "highpass") else 4
    if len(edges) != needed:
        raise ValueError(f"a narrow {kind} needs {needed} edges, not {len(edges)}")
    design = made("narrow", edges, list(edges), kind=kind, ripple=ripple, attenuation=attenuation, fs=rate)
    stages = stages_of(kind, edges, rate, ripple, attenuation)
    work = len(stages["model"]) + len(stages["interpolator"])
    in_stages = f"two stages, stretched by {stages['M']}" if stages["M"] > 1 else "one stage"
    design.note = f"{work} multiplications in {in_stages}"
    design.numbers = {name: list(value) if name in ("model", "interpolator") else value
                      for name, value in stages.items()}
    return design


def stages_of(kind, edges, rate, ripple, attenuation):
    """The two stages of a narrow filter, for programs that apply them."""
    if len(edges) == 2:
        (passed, stopped), center = edges if kind == "lowpass" else edges[::-1], 0.0
    else:
        outer, inner, center = edges[3] - edges[0], edges[2] - edges[1], sum(edges) / 4
        passed, stopped = (inner, outer) if kind == "bandpass" else (outer, inner)
    return served("filters").narrow(rate, passed, stopped, center, 10 ** (ripple / 20) - 1, attenuation,
                                    TYPES.index(kind), {})
