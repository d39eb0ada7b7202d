#!/usr/bin/python3
"""Gains computed by SciPy for iir_design_test: family, order, type, fl, fh, ripple, attenuation, frequency, gain
in decibels. Frequencies are in units of the sampling rate and lie in the pass band.

usage: make_iir_design.py > iir_design.dat
"""

import numpy as np
from scipy import signal

KINDS = ["lowpass", "highpass", "bandpass", "bandstop"]
BANDS = {"lowpass": [0.07, 0.2, 0.41], "highpass": [0.07, 0.2, 0.41],
         "bandpass": [(0.06, 0.11), (0.1, 0.31), (0.3, 0.42)],
         "bandstop": [(0.06, 0.11), (0.1, 0.31), (0.3, 0.42)]}
RIPPLES = [0.01, 0.1, 1.0, 3.0]
ATTENUATIONS = [60.0, 25.0, 40.0, 80.0]  # 25 only with room between the bands


def designed(family, order, kind, band, ripple, attenuation):
    options = {"btype": kind, "output": "zpk", "fs": 1.0}
    if family == "BW":
        return signal.butter(order, band, **options)
    if family == "Chebyshev":
        return signal.cheby1(order, ripple, band, **options)
    if family == "InvChebyshev":
        return signal.cheby2(order, attenuation, band, **options)
    if family == "Elliptic":
        return signal.ellip(order, ripple, attenuation, band, **options)
    return signal.bessel(order, band, norm="mag", **options)


def gain(z, p, k, frequency):
    at = np.exp(2j * np.pi * frequency)
    return 20 * (np.log10(abs(k)) + np.sum(np.log10(abs(at - z))) - np.sum(np.log10(abs(at - p))))


def pass_band(kind, band):
    if kind == "lowpass":
        return [0.0, 0.37 * band, 0.93 * band, band]
    if kind == "highpass":
        return [0.5, band + 0.61 * (0.5 - band), band + 0.04 * (0.5 - band), band]
    low, high = band
    if kind == "bandpass":
        return [low, low + 0.06 * (high - low), low + 0.5 * (high - low), high]
    return [0.0, 0.96 * low, high, 0.5]


for family in ["BW", "Chebyshev", "InvChebyshev", "Elliptic", "Bessel"]:
    for order in range(1, 13):
        for type_, kind in enumerate(KINDS):
            band = BANDS[kind][order % 3]
            ripple, attenuation = RIPPLES[(order + type_) % 4], ATTENUATIONS[order % 4]
            attenuation = max(attenuation, 40.0) if order > 8 else attenuation
            z, p, k = designed(family, order, kind, band, ripple, attenuation)
            low, high = np.atleast_1d(band)[0], np.atleast_1d(band)[-1]
            for frequency in pass_band(kind, band):
                level = gain(z, p, k, frequency)
                # The edge of an inverse Chebyshev filter is the edge of its stop band.
                if level > -6:
                    print(family, order, type_, *(float(v).hex() for v in (
                        low, high, ripple, attenuation, frequency, level)))
