"""Which export serves which function of a topic: the one place where revisions are chosen.

A key is the name of a topic's function or class, or begins with it and an underscore (`fft_real`).
"""

from __future__ import annotations

import difflib
import functools
import importlib
import sys
from collections.abc import Iterable
from typing import Any, NoReturn

from ..calls import export, hint
from ..library import library

# Up to this order, a least-squares polynomial over [-1, 1] by PolyFit81_head differs from that of PolyFit2026_head by
# 6 eps of the largest value, under a Blackman window by 85, and takes a sixteenth (100000 samples) to six tenths (100
# samples) of the time. At order 10 it loses two digits, at order 25 eight.
LOW_ORDER = 5

# In the order in which they are shown.
TOPICS = ("filters", "fft", "windows", "spectra", "signals", "noise", "multirate", "linalg", "poly", "fit",
          "interpolate", "calculus", "stats", "special", "measure", "coordinates")

NEWEST = {
    "filters": {
        "narrow": "FIRNarrowCoef_head", "narrow_filter": "FIRnarrowFilter_head",
        "butterworth": "BWCoefs2026", "chebyshev1": "ChebyshevCoefs2026", "chebyshev2":
        "InvChebyshevCoefs2026", "elliptic": "EllipticCoefs2026", "bessel": "BesselCoefs2026",
        "windowed": "FIRCoefs", "equiripple": "Parks",
        "Filter_cascade": "IIR_Filter2", "Filter_cascade_complex": "CxSigIIR_Filter2",
        "Filter_direct": "IIR_Filter", "Filter_direct_complex": "CxSigIIR_Filter",
        "Filter_complex": "CxIIR_Filter_H", "Filter_complex_of_real": "CxIIRReSig_Filter_H",
        "Filter_roots": "EigenValueVector2026_head",
        "Filter_roots_complex": "CxEigenValueVector2026_head",
        "Filter_polynomial": "CxPolyEv",
        "savgol": "SavitzkyGolayFiltH", "savgol_coefficients": "SavitzkyGolayCoefH",
        "median": "MedianFilter81_H",
    },
    "fft": {
        "fft": "CxOXFFTH", "fft_real": "ReOXFFTH", "fft_sized": "CxOXFFTH80",
        "fft_real_sized": "ReOXFFTH80", "ifft": "InvCxOXFFTH", "rfft": "ReOXFFTH", "rfft_long": "ReOXFFTHCH",
        "rfft_sized": "ReOXFFTH80", "irfft": "InvReOXFFTH", "fft2": "CxFFT2D_H", "fft2_real": "ReFFT2D_H",
        "ifft2": "CxInvFFT2D_H", "dct": "DCT_1DH", "idct": "InvDCT_1DH", "dst": "DST_1DH",
        "idst": "InvDST_1DH", "hartley": "FHTH", "ihartley": "InvFHTH",
        "hilbert": "FastHilbertTransformH", "ihilbert": "InvFastHilbertTransformH",
        "dzt": "ReDZTH", "dzt_complex": "CxDZTH",
        "czt": "ChirpZT_head", "czt_complex": "CxChirpZT_head", "iczt": "InvChirpZT_head",
        "half_complex": "ReOXFFTHCH", "ihalf_complex": "InvReOXFFTHCH",
    },
    "windows": {
        "get": "AllWinH", "apply": "AllWinH", "apply_complex": "CxAllWinH", "cosine_sum": "GenCosWinH",
        "constants": "NumWinConstH",
    },
    "spectra": {
        "welch": "ReOXFFTH", "welch_sized": "ReOXFFTH80", "welch_complex": "CxOXFFTH",
        "welch_complex_sized": "CxOXFFTH80", "welch_power": "CxSpectrumH", "power": "SpectrumH",
        "power_complex": "CxSpectrumH",
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
        "detrend": "PolyFit81_head", "detrend_high": "PolyFit2026_head", "correlation_matrix": "AutoCorrMtrxH",
        "correlation_matrix_complex": "CxAutoCorrMtrxH",
        "standardize": "Norm1", "rescale": "Scale1DCIN",
    },
    "noise": {
        "uniform": "White2026", "gaussian": "Gauss2026", "periodic": "PeriodNoise", "gamma": "Gamma2026",
        "poisson": "Poisson2026", "binomial": "Binomial2026", "permutation": "RiffleIntNum2026_head",
    },
    "multirate": {
        "respace": "Resample_Const", "respace_complex": "CxResample_Const",
        "resample_at": "Resample_Variable", "resample_at_complex": "CxResample_Variable",
        "InterpolatedFIR": "InterpolatedFIRH",
        "resample": "ppMultiRateFIRH_DBL", "resample_single": "ppMultiRateFIRH_SGL",
        "resample_complex": "ppMultiRateFIRH_CDB", "resample_complex_single": "ppMultiRateFIRH_CSG",
        "decimate": "DecimateContinuous_H", "decimate_complex": "CxDecimateContinuous_H",
        "moving_sum": "ReCascadedMovingAverageH", "moving_sum_complex": "CxCascadedMovingAverageH",
        "cic_decimate": "CICDecimatorByMovH", "cic_interpolate": "CICInterpolatorByMovH",
        "shift_frequency": "ReComplexModulatorH", "shift_frequency_complex": "CxComplexModulatorH",
    },
    "linalg": {
        "balance_back": "EigenVBack_head", "balance_back_complex": "CxEigenVBack_head", "gsvd": "GSVD_head",
        "gsvd_complex": "CxGSVD_head",
        "is_symmetric": "CheckSym_head", "is_symmetric_complex": "CxCheckSym_head", "balance": "MatrixBalance_head",
        "balance_complex": "CxMatrixBalance_head",
        "lu": "LU_head", "lu_complex": "CxLU_head", "solve": "EqsSetByLU2026_head", "solve_complex":
        "CxEqsSetByLU2026_head", "solve_inverse": "LUInvMatrix_head", "solve_inverse_complex":
        "CxLUInvMatrix_head", "solve_triangular": "TriEqsSetDri_head", "solve_triangular_complex":
        "CxTriEqsSetDri_head", "solve_positive": "EqsSetByCholeskyDri_head",
        "solve_positive_complex": "CxEqsSetByCholeskyDri_head", "lstsq": "EqsSetBySVD2026_head",
        "lstsq_complex": "CxEqsSetBySVD2026_head", "pinv": "PseudoInverse2026_head", "pinv_complex":
        "CxPseudoInverse2026_head", "det": "Determinant_head", "det_complex": "CxDeterminant_head",
        "trace": "Trace_head", "trace_complex": "CxTrace_head", "norm": "Norm2026_head",
        "norm_complex": "CxNorm2026_head", "norm_vector": "vectorNormH", "norm_vector_complex":
        "CxVectorNormH", "cond": "CondNumber2026_head", "cond_complex": "CxCondNumber2026_head",
        "matrix_rank": "Rank2026_head", "matrix_rank_complex": "CxRank2026_head", "eig":
        "EigenValueVector2026_head", "eig_complex": "CxEigenValueVector2026_head", "eig_general":
        "GenEigenEx_head", "eig_general_complex": "CxGenEigenEx_head", "eigh":
        "SymEvectorEvalue2026_head", "svd": "SVD2026_head", "svd_complex": "CxSVD2026_head", "svdvals":
        "SVDS2026_head", "svdvals_complex": "CxSVDS2026_head", "qr": "QRDec2026H", "qr_complex": "CxQRDec2026H",
        "cholesky": "FullCholesky_head", "cholesky_complex": "CxFullCholesky_head", "schur":
        "Schur2026_head", "schur_complex": "CxSchur80_head", "qz": "QZ80_head", "qz_complex":
        "CxQZ80_head", "hessenberg": "Hessenberg_head", "hessenberg_complex": "CxHessenberg_head",
        "expm": "MatrixExp2026_head", "expm_complex": "CxMatrixExp2026_head", "logm":
        "MatrixLn2026_head", "logm_complex": "CxMatrixLn2026_head", "sqrtm": "MatrixSqrt2026_head",
        "sqrtm_complex": "CxMatrixSqrt2026_head", "matrix_power": "MatrixPower2026_head",
        "matrix_power_complex": "CxMatrixPower2026_head", "solve_sylvester": "Sylvester2011_head",
        "solve_sylvester_complex": "CxSylvester2011_head", "solve_lyapunov": "Lyapunov2011_head",
        "solve_lyapunov_complex": "CxLyapunov2011_head", "solve_banded": "BandEqsDriH", "solve_banded_complex":
        "CxBandEqsDriH", "solve_banded_many": "BandEqsSetDriH", "solve_banded_many_complex":
        "CxBandEqsSetDriH", "charpoly": "MatrixCharacteristicPoly_head", "charpoly_complex":
        "CxMatrixCharacteristicPoly_head", "is_positive_definite": "CheckPosdef_head",
        "is_positive_definite_complex": "CxCheckPosdef_head",
        "is_positive_semidefinite": "CheckPosSemiDef_head", "is_positive_semidefinite_complex":
        "CxCheckPosSemiDef_head", "from_eigenvalues": "CreateMatrixFromEVs_head", "kron": "KroneckerProd_H",
        "kron_complex": "CxKroneckerProd_H", "toeplitz": "SpecialMatrix_head", "toeplitz_complex":
        "CxSpecialMatrix_head",
    },
    "poly": {
        "add": "AddPolyH", "add_complex": "CxAddPolyH", "subtract": "SubtractPolyH",
        "subtract_complex": "CxSubtractPolyH", "multiply": "MultiplyPolyH",
        "multiply_complex": "CxMultiplyPolyH", "divide": "DividePolyH",
        "divide_complex": "CxDividePolyH", "gcd": "PolyGCD_H", "gcd_complex": "CxPolyGCD_H",
        "compose": "PolyComposeH", "compose_complex": "CxPolyComposeH",
        "derivative": "PolyDerivativeH", "derivative_complex": "CxPolyDerivativeH",
        "integral": "PolyIntegralH", "integral_complex": "CxPolyIntegralH",
        "roots": "PolyRoots2026_head", "roots_complex": "CxPolyRoots2026_head",
        "multiple_roots": "MultPolyRoots_head", "multiple_roots_complex": "CxMultPolyRoots_head",
        "lcm": "PolyLCM_H", "evaluate": "PolyEv", "evaluate_complex": "CxPolyEv",
        "evaluate_matrix": "EvPoly2D", "evaluate_matrix_complex": "CxEvPoly2D",
        "from_roots": "PolyFromRootsH", "from_roots_complex": "CxPolyFromRootsH",
        "partial_fractions": "PartialFractionsH",
    },
    "interpolate": {
        "CubicSpline": "Spline_head", "polynomial": "PolyInterp_head",
        "rational": "RatInterp_head",
    },
    "calculus": {
        "integrate3": "NumerIntegration3D_2017_head",
        "integrate": "NumerIntegration_2017_head", "integrate2": "NumerIntegration2D_2017_head",
        "cumulative": "Integral_2017", "derivative": "Derivative85",
        "velocity": "PolyFit81_head", "velocity_high": "PolyFit2026_head",
    },
    "special": {
        "gamma": "QX_Gamma_85", "gammaln": "QX_LnGamma", "gammainc": "QX_Gamma_85",
        "gammainc_large": "ChiSquare2026_head", "gammaincc_large": "ChiSquare2026_head",
        "gammaincc": "QX_GammaC", "beta": "QX_Beta_85", "betainc": "QX_Beta_85",
        "factorial": "QX_Fact", "factorialln": "QX_LnFact", "digamma": "QX_Psi",
        "zeta": "QX_Zeta", "stirling": "QX_Stirling", "erf": "QX_Erf", "erfc": "QX_ErfC",
        "expn": "QX_ExpI_2026", "sici": "QX_SinI", "sici_cosine": "QX_CosI", "shichi": "QX_SinhI",
        "shichi_cosine": "QX_CoshI", "spence": "QX_Diln", "dawsn": "QX_Dawson",
        "fresnel": "QX_FresnelIntegrals", "ellipk": "QX_Elliptic1_2026",
        "ellipkinc": "QX_Elliptic1_2026", "ellipe": "QX_Elliptic2_85",
        "ellipeinc": "QX_Elliptic2_85", "ellipj": "QX_EllipticJ", "hyp2f1": "QX_Gauss_2026",
        "hyp1f1": "QX_Kummer_2026", "hyperu": "QX_Tricomi_2026", "jv": "QX_BesselJr",
        "jv_complex": "QX_CxBesselJr", "yv": "QX_BesselYr", "yv_complex": "QX_CxBesselYr",
        "iv": "QX_BesselIr", "iv_complex": "QX_CxBesselIr", "kn": "QX_BesselKn",
        "kv": "QX_CxBesselKr", "hankel1": "QX_CxBesselH1r", "hankel2": "QX_CxBesselH2r",
        "spherical_jn": "QX_BesselJs", "spherical_yn": "QX_BesselYs", "airy": "QX_Airy",
        "airy_ai": "QX_CxAiryAi", "airy_aip": "QX_CxAiryAiP", "airy_bi": "QX_CxAiryBi",
        "airy_bip": "QX_CxAiryBiP", "kelvin": "QX_KelvinI", "kelvin_k": "QX_KelvinK",
        "struve": "QX_Struve", "pbdv": "QX_ParabolicCylinder",
    },
    "coordinates": {
        "rotate2": "CoordRotation2D_head", "rotate": "CoordRotationDirection_head",
        "rotate_euler": "CoordRotationEuler2011_head",
        "euler_to_matrix": "Euler2Direction2011_head",
        "matrix_to_euler": "Direction2Euler2011_head", "convert": "CoordConversion_head",
    },
    "fit": {
        "line": "BoundLinearFit_head", "line_absolute": "BoundLinearFitLAR_head",
        "line_bisquare": "BoundLinearFitBi_head", "polynomial": "PolyFit2026_head",
        "exponential": "BoundExpFit_head", "power": "BoundPowerFit_head",
        "logarithm": "BoundLogFit_head", "gaussian": "BoundGaussianFit2026_head",
        "gaussian_peak": "GaussianPeakFit2026_head",
        "linear": "GenLSFit2026_head", "curve": "NonlinearFit2026",
        "nonlinear": "NonlinearFit2026",
        "Fit_covariance": "GenLSFit2026_head", "Fit_confidence": "ConfBndGenLS_head",
        "Fit_prediction": "PredBndGenLS_head", "SmoothingSpline": "CubicSplineFit_head",
        "BSpline": "BSplineFit_head",
    },
    "stats": {
        "mean": "Mean_head", "rms": "RMS_head", "rms_complex": "CxRMS_head",
        "moment": "Moment_head", "median": "Median_head", "mode": "ModeH", "mse": "MSE_head",
        "histogram": "histgran_head", "histogram_intervals": "GenHistH",
        "contingency": "Contingency2026_head", "anova": "Anova1Way_head_2026", "anova2": "Anova2Way_head_2017",
        "anova3": "ANOVA3Way_head_2017", "norm": "NormDist2026_head", "norm_point": "InvNdist2026_head",
        "t": "TDist2026_head", "t_point": "InvTdist2026_head", "chi2": "ChiSquare2026_head",
        "chi2_point": "InvChiSquare2026_head", "f": "FDist2026_head", "f_point": "InvFDist2026_head",
    },
    "measure": {
        "cycles": "CycleRMSAverage",
        "PeakFinder": "PeakD", "levels": "StateLevels", "pulses": "PulseMeasEx",
        "pulses_transition": "TransMeas", "tone": "SingleToneMeasurement",
        "tones": "MultipleToneMeasurements", "harmonics": "HarmonicAnalysis",
        "trigger": "Triggerh_86", "delay": "Rxy80", "delay_spectrum": "ReOXFFTH80",
        "sound_level": "RMS_head",
    },
}


class Served:
    """The exports of a topic by the keys of the table; each is created when it is first used."""

    def __init__(self, topic: str) -> None:
        self._topic = topic

    def __getattr__(self, key: str) -> Any:
        try:
            name = NEWEST[self._topic][key]
        except KeyError:
            raise AttributeError(f"the table has no {self._topic}.{key}") from None
        function = export(name)
        setattr(self, key, function)
        return function


def served(topic: str) -> Served:
    """The exports of a topic. Its module then also answers wrong names. Type checkers do not see this, since
    they would then accept any name in the module."""
    module = sys.modules.get(f"{__package__.rpartition('.')[0]}.{topic}")
    if module:
        vars(module).setdefault("__getattr__", functools.partial(missing, module.__name__))
    return Served(topic)


def missing(module: str, name: str) -> NoReturn:
    """Raises the error for a wrong name in the module of a topic."""
    if name.startswith("_"):
        raise AttributeError(f"module {module!r} has no attribute {name!r}")
    raise AttributeError(f"{module} has no function {name}{answer(name, inner=module.rpartition('.')[2])}")


def function_of(topic: Any, key: str) -> Any:
    """The public function or class that a key of the table belongs to."""
    public = importlib.import_module(f"..{topic}", __package__).__all__
    fitting = [name for name in public if key == name or key.startswith(f"{name}_")]
    if not fitting:
        raise LookupError(f"the key {topic}.{key} belongs to no function")
    return max(fitting, key=len)


def public_names() -> dict[str, list[str]]:
    """The public names of all topics, each with the topics that have it."""
    found = {}
    for topic in TOPICS:
        for name in importlib.import_module(f"..{topic}", __package__).__all__:
            found.setdefault(name, []).append(topic)
    return found


def answer(name: str, more: Iterable[str] = (), inner: str = "") -> str:
    """The end of a message that says where to find a name that was looked for in the wrong place. If it was
    looked for in the topic `inner`, similar names of that topic come first."""
    places = public_names()
    if inner and name not in places:
        own = [known for known, topics in places.items() if inner in topics]
        if near := hint(name, own):
            return near
    lower = {known.lower(): known for known in places}
    known = lower.get(name.lower())
    if known is None and name not in library().entries:
        near = difflib.get_close_matches(name.lower(), lower, 1, 0.85)
        known = lower[near[0]] if near else None
    if known:
        return "; it is " + " or ".join(f"qx.{topic}.{known}" for topic in places[known])
    return hint(name, [*library().entries, *more])
