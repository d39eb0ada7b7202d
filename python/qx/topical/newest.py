"""Which export serves which function of a topic: the one place where revisions are chosen.

A key is the name of a topic's function or class, or begins with it and an underscore (`fft_real`).
"""

import difflib
import importlib

from ..calls import export, hint
from ..library import library

TOPICS = ("filters", "fft", "windows", "spectra", "signals", "noise", "multirate")  # in the order in which they are shown

NEWEST = {
    "filters": {
        "butterworth": "BWCoefs90", "chebyshev1": "ChebyshevCoefs90",
        "chebyshev2": "InvChebyshevCoefs90", "elliptic": "EllipticCoefs90", "bessel": "BesselCoefs90",
        "windowed": "FIRCoefs", "windowed_window": "AllWinH", "equiripple": "Parks",
        "Filter_cascade": "IIR_Filter2", "Filter_cascade_complex": "CxSigIIR_Filter2",
        "Filter_direct": "IIR_Filter", "Filter_direct_complex": "CxSigIIR_Filter",
        "Filter_roots": "EigenValueVector_head", "Filter_polynomial": "CxPolyEv",
        "savgol": "SavitzkyGolayFiltH", "savgol_coefficients": "SavitzkyGolayCoefH",
        "median": "MedianFilter81_H",
    },
    "fft": {
        "fft": "CxOXFFTH", "fft_real": "ReOXFFTH", "fft_sized": "CxOXFFTH80",
        "fft_real_sized": "ReOXFFTH80", "ifft": "InvCxOXFFTH", "rfft": "ReOXFFTH",
        "rfft_sized": "ReOXFFTH80", "irfft": "InvReOXFFTH", "fft2": "CxFFT2D_H", "fft2_real": "ReFFT2D_H",
        "ifft2": "CxInvFFT2D_H", "dct": "DCT_1DH", "idct": "InvDCT_1DH", "dst": "DST_1DH",
        "idst": "InvDST_1DH", "hartley": "FHTH", "ihartley": "InvFHTH",
        "hilbert": "FastHilbertTransformH", "ihilbert": "InvFastHilbertTransformH",
        "czt": "ChirpZT_head", "czt_complex": "CxChirpZT_head", "iczt": "InvChirpZT_head",
        "half_complex": "ReOXFFTHCH", "ihalf_complex": "InvReOXFFTHCH",
    },
    "windows": {
        "get": "AllWinH", "apply": "AllWinH", "apply_complex": "CxAllWinH", "cosine_sum": "GenCosWinH",
        "constants": "NumWinConstH",
    },
    "spectra": {
        "welch": "ReOXFFTH", "welch_sized": "ReOXFFTH80", "welch_complex": "CxOXFFTH",
        "welch_complex_sized": "CxOXFFTH80", "power": "SpectrumH", "power_complex": "CxSpectrumH",
        "analytic": "FastHilbertTransformH", "instantaneous_phase": "unWrap85",
    },
    "signals": {
        "sine": "SineWaveCIN", "square": "SquareWaveCIN", "triangle": "TriangleWaveCIN",
        "sawtooth": "SawtoothWaveCIN", "arbitrary": "ArbitraryWaveCIN", "chirp": "ChirpCIN",
        "pulse": "PulsePtrn", "impulse": "ImpulsePtrn", "ramp": "RampPtrn85", "sinc": "SincWave",
        "gauss_pulse": "GaussPulseH", "gauss_monopulse": "GaussMonopulseH",
        "triangle_pulse": "AperiodTriangleH", "periodic_sinc": "PeriodicSincH",
        "phase_modulated": "PhasMod", "frequency_modulated": "FreqMod", "unwrap": "unWrap85",
        "convolve": "Convolution", "convolve_complex": "CxConvolution", "correlate": "Rxy80",
        "autocorrelate": "AutoCorrelation80", "deconvolve": "Deconvolution",
        "convolve2": "Convolve_2DH", "convolve2_complex": "CxConvolve_2DH",
        "correlate2": "Correlation_2DH", "correlate2_complex": "CxCorrelation_2DH",
        "detrend": "PolyFit81_head", "standardize": "Norm1", "rescale": "Scale1DCIN",
    },
    "noise": {
        "uniform": "white", "gaussian": "Gauss", "periodic": "PeriodNoise", "gamma": "GammaNoiseH",
        "poisson": "PoissonNoiseH", "binomial": "BinomialNoiseH", "permutation": "RiffleIntNum2012_head",
    },
    "multirate": {
        "resample": "ppMultiRateFIRH_DBL", "resample_single": "ppMultiRateFIRH_SGL",
        "resample_complex": "ppMultiRateFIRH_CDB", "resample_complex_single": "ppMultiRateFIRH_CSG",
        "decimate": "DecimateContinuous_H", "decimate_complex": "CxDecimateContinuous_H",
        "moving_sum": "ReCascadedMovingAverageH", "moving_sum_complex": "CxCascadedMovingAverageH",
        "cic_decimate": "CICDecimatorByMovH", "cic_interpolate": "CICInterpolatorByMovH",
        "shift_frequency": "ReComplexModulatorH", "shift_frequency_complex": "CxComplexModulatorH",
    },
}


class Served:
    """The exports of a topic by the keys of the table; each is written at its first use."""

    def __init__(self, topic):
        self._topic = topic

    def __getattr__(self, key):
        try:
            name = NEWEST[self._topic][key]
        except KeyError:
            raise AttributeError(f"the table has no {self._topic}.{key}") from None
        function = export(name)
        setattr(self, key, function)
        return function


def served(topic):
    return Served(topic)


def public_names():
    """Where the public names of all topics are: name to topics."""
    found = {}
    for topic in TOPICS:
        for name in importlib.import_module(f"..{topic}", __package__).__all__:
            found.setdefault(name, []).append(topic)
    return found


def answer(name, more=()):
    """Where a name is that somebody looked for in another place, as the end of a message."""
    places = public_names()
    lower = {known.lower(): known for known in places}
    known = lower.get(name.lower())
    if known is None and name not in library().entries:
        near = difflib.get_close_matches(name.lower(), lower, 1, 0.85)
        known = lower[near[0]] if near else None
    if known:
        return "; it is " + " or ".join(f"qx.{topic}.{known}" for topic in places[known])
    return hint(name, [*library().entries, *more])
