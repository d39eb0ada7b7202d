#!/usr/bin/python3
"""Poles, zeros and gains of IIR filters at 50 digits for iir_design_test, by the reference of
tools/accuracy/filter_poles.py: family, order, type, fl, fh, ripple, attenuation, what (0 a pole, 1 a zero, 2
the gain), real part, imaginary part; of a conjugate pair, the one above the real axis.

usage: make_pole_zero_designs.py > pole_zero_designs.dat
"""

import sys
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[4] / "tools/accuracy"))
from filter_poles import FAMILIES, digital  # noqa: E402

NAMES = {"BW": "Butterworth", "Chebyshev": "Chebyshev", "InvChebyshev": "inverse Chebyshev",
         "Elliptic": "elliptic", "Bessel": "Bessel"}
RIPPLE, ATTENUATION = 0.5, 70.0
WIDE, NARROW, HIGH = (0.01, 0.45), (1e-4, 1.01e-4), (0.4, 0.4999)
CASES = ((1, 0, HIGH), (2, 1, WIDE), (3, 0, WIDE), (3, 1, HIGH), (3, 2, WIDE), (3, 3, WIDE), (3, 3, HIGH),
         (12, 1, NARROW), (12, 2, HIGH), (30, 0, NARROW), (30, 2, NARROW), (30, 3, HIGH))

for name, family in NAMES.items():
    for order, type_, (fl, fh) in CASES:
        zeros, poles, gain = digital(FAMILIES[family](order, RIPPLE, ATTENUATION), order, type_, fl, fh)
        at_edges = name not in ("InvChebyshev", "Elliptic")  # then all zeros lie at one or two points
        for what, values in enumerate((poles, zeros[:0] if at_edges else zeros, [gain])):
            for value in map(complex, values):
                if value.imag > -1e-25:
                    print(name, order, type_, fl, fh, RIPPLE, ATTENUATION, what, repr(value.real),
                          repr(max(value.imag, 0.0) if value.imag > 1e-25 else 0.0))
