"""Filter design against SciPy, and the IIR design of 2026 also against its elder, in one process.

Ours is the export, called through the binding. SciPy's results have the same form: second-order sections for IIR
filters, taps for FIR filters.
"""

import sys
import time
from pathlib import Path

import numpy as np

try:
    from scipy import signal
except ImportError:
    sys.exit("SciPy is missing: apt-get install python3-scipy")

sys.path.insert(0, str(Path(__file__).resolve().parent.parent / "python"))
import qx  # noqa: E402
from summary import print_summary  # noqa: E402

BAND = (0.11, 0.23)
ROUNDS = 9


def seconds(function, repeats):
    start = time.perf_counter()
    for _ in range(repeats):
        function()
    return (time.perf_counter() - start) / repeats


def compare(what, peer, cases):
    """The minima of interleaved rounds, which a busy machine disturbs least."""
    ratios = []
    for name, ours, theirs in cases:
        repeats = max(1, int(0.01 / seconds(theirs, 1)))
        rounds = [(seconds(ours, repeats), seconds(theirs, repeats)) for _ in range(ROUNDS)]
        mine, other = (min(column) for column in zip(*rounds))
        ratios.append((mine / other, name))
        print(f"{what}, {name:28} {1e6 * mine:10.1f} us  ratio {mine / other:5.2f}", flush=True)
    print_summary(what, peer, ratios)


def elder(export, levels, order, type_):
    return qx.call(export + "90", 1.0, *BAND, *levels, order, type_, 0)


def newest(export, levels, order, type_):
    return qx.call(export + "2026", 1.0, *BAND, *levels, order, type_)


def iir_cases(ours):
    families = [("Butterworth", "BWCoefs", (), signal.butter, {}),
                ("Chebyshev", "ChebyshevCoefs", (1.0,), signal.cheby1, {"rp": 1.0}),
                ("inverse Chebyshev", "InvChebyshevCoefs", (60.0,), signal.cheby2, {"rs": 60.0}),
                ("elliptic", "EllipticCoefs", (1.0, 60.0), signal.ellip, {"rp": 1.0, "rs": 60.0}),
                ("Bessel", "BesselCoefs", (), signal.bessel, {"norm": "mag"})]
    for name, export, levels, design, options in families:
        for order in (4, 12):
            for type_, kind in ((0, "lowpass"), (2, "bandpass")):
                edges = BAND[0] if type_ == 0 else BAND
                yield (f"{name} {kind}, order {order}", lambda: ours(export, levels, order, type_),
                       lambda: design(order, Wn=edges, btype=kind, fs=1.0, output="sos", **options))


def remez_cases():
    for taps in (31, 101, 301, 1001, 2001):
        width = min(2.2 / taps, 0.1)
        edges = [0, 0.2, 0.2 + width, 0.5]
        bands = [(1, 0, 0.2, 1), (0, 0.2 + width, 0.5, 1)]
        yield (f"lowpass, {taps} taps", lambda: qx.call("Parks", taps, 1.0, bands, 0, 100),
               lambda: signal.remez(taps, edges, [1, 0], fs=1, maxiter=100))


def narrow_cases():
    """A signal filtered by a bandpass of a hundredth of the sampling rate: two stages against the
    equiripple filter with the same ripples, by the same routine."""
    x = np.random.default_rng(1).normal(size=20000)
    for center in (0.07, 0.23, 0.4):
        staged = qx.call("FIRNarrowCoef_head", 1.0, 0.008, 0.014, center, 0.02, 50.0, 2, {})
        taps = len(staged["model"]) + len(staged["interpolator"])
        length = (len(staged["model"]) - 1) * staged["M"] + len(staged["interpolator"])
        plain = {"kind": 2, "M": 1, "model": np.ones(length), "interpolator": []}
        yield (f"centre {center}, {taps} for {length} taps",
               lambda: qx.call("FIRnarrowFilter_head", x, staged),
               lambda: qx.call("FIRnarrowFilter_head", x, plain))


def main():
    compare("IIR design", "scipy.signal, sections of second order", iir_cases(elder))
    compare("IIR design of 2026", "scipy.signal, sections of second order", iir_cases(newest))
    compare("IIR design of 2026", "elder",
            ((name, ours, theirs) for (name, ours, _), (_, theirs, _) in zip(iir_cases(newest), iir_cases(elder))))
    compare("equiripple design", "scipy.signal.remez", remez_cases())
    compare("narrow-band filter", "our FIR filter of the same length", narrow_cases())


if __name__ == "__main__":
    main()
