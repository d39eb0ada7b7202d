#!/usr/bin/python3
"""Writes docs/topics.md: each export with the topic functions that call it, or the reason why none does.

    topics_table.py [--check]

With --check, nothing is written, and the exit status is 0 if the page is up to date.
"""

import fnmatch
import sys
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "python"))
from qx.library import library  # noqa: E402
from qx.topical.newest import NEWEST, TOPICS, function_of  # noqa: E402

PAGE = ROOT / "docs/topics.md"
NOT_CALLED, TWIN, HOST = "not called, for comparison", "for hosts: plan in instance data", "for hosts"
# Exports that the table of topical/newest.py does not name: patterns, tried in order, with the function that does
# the same through another export, or a remark.
OTHERS = (
    ("*_IDP", TWIN), ("*UnreserveProc measurements_* *AnalysisWorkspaceH SetQXRTModule *_oxfft_table", HOST),
    ("InitialMatrixH CxInitialMatrixH *Aligned*", HOST),
    ("BWCoefs BWCoefs90", "filters.butterworth"), ("ChebyshevCoefs ChebyshevCoefs90", "filters.chebyshev1"),
    ("InvChebyshevCoefs*", "filters.chebyshev2"), ("EllipticCoefs*", "filters.elliptic"),
    ("BesselCoefs*", "filters.bessel"), ("MedianFilterCIN", "filters.median"),
    ("zeroPhase*", "filters.Filter.zero_phase"), ("*IIR_Filter_PtbyPt *IIR_Filter_OneState", "filters.Filter.stream"),
    ("CxSigFIRnarrowFilter_head", "filters.narrow"),
    ("InvCxOXFFTH80", "fft.ifft"), ("InvReOXFFTH80", "fft.irfft"), ("ReInvFFT2D_H", "fft.ifft2"),
    ("DCT_2DH", "fft.dct over both axes"), ("InvDCT_2DH", "fft.idct over both axes"),
    ("DST_2DH", "fft.dst over both axes"), ("InvDST_2DH", "fft.idst over both axes"),
    ("*WinH *Wind* Kaiser* CxKaiser* *CosTapered* TriangleWin", "windows.get, windows.apply"),
    ("WinConstByNameH*", "windows.constants"), ("*CrossSpectrumH", "spectra.csd"),
    ("white", "noise.uniform"), ("Gauss", "noise.gaussian"), ("GammaNoiseH", "noise.gamma"),
    ("PoissonNoiseH", "noise.poisson"), ("BinomialNoiseH", "noise.binomial"),
    ("SinePtrn", "signals.sine"), ("Square", "signals.square"), ("RampPtrn*", "signals.ramp"),
    ("unWrap", "signals.unwrap"), ("Rxy AutoCorrelation", "signals.correlate"), ("Norm2", "signals.standardize"),
    ("Scale QScale QS1D", "signals.rescale"), ("Line1 LinEv", "NumPy: a * x + b"),
    ("Riffle*Num_head Riffle*Num2012_head", "noise.permutation"), ("RiffleArray*", "noise.shuffle"),
    ("Decimate* CxDecimate_H *DecimatedMovingAverageH", "multirate.decimate"),
    ("*RationalResample* InterpolatorFIRH DecimatorFIRH", "multirate.resample"),
    ("*Resample_Variable_MultiCh", "multirate.resample_at of several channels"),
    ("*EqsSetBySVD*", "linalg.lstsq"),
    ("*EqsBy* *EqsSetBy* *LULinEqs_head *LinEqs TriLinEqs_head *CholeskyLinEqs_head CxTriLinEqs_head",
     "linalg.solve"),
    ("*GenLinEqs*", "linalg.lstsq"), ("*InvMatrix* PreallocInv*", "linalg.inv"),
    ("Cholesky_head CxCholesky_head", "linalg.cholesky"), ("*qrd_head *QRDecH", "linalg.qr"),
    ("*EigenValueVector_head", "linalg.eig"), ("SymEvectorEvalue_head", "linalg.eigh"),
    ("*SVD_head *SVDEx_head", "linalg.svd"),
    ("*SVDS_head", "linalg.svdvals"), ("*MatrixExp_head", "linalg.expm"), ("*PseudoInverse_head", "linalg.pinv"),
    ("Norm_head CxNorm_head", "linalg.norm"),
    ("*CondNumber_head", "linalg.cond"), ("Rank_head CxRank_head", "linalg.matrix_rank"),
    ("TriDiag*", "linalg.solve_banded"), ("*Schur_head Schur80_head", "linalg.schur"), ("*QZ_head", "linalg.qz"),
    ("MatrixSqrt* CxMatrixSqrt_head", "linalg.sqrtm"), ("*MatrixLn_head", "linalg.logm"),
    ("*MatrixPower_head", "linalg.matrix_power"), ("*Sylvester_head", "linalg.solve_sylvester"),
    ("*Lyapunov_head", "linalg.solve_lyapunov"), ("*nitVector*", "x / linalg.norm(x)"),
    ("MatrixMul_head AxBCxCIN AxVect_head AxVectorCx *vectxA_head CxVectxA_head DotP* Dotprod*", "NumPy: a @ b"),
    ("*ranspose_head *Compact* OuterProd*", "NumPy: a.T, numpy.tril, numpy.outer"),
    ("CxPolyRoots_head PolyRootsNtBst_head", "poly.roots"),
    ("LinFit*", "fit.line"), ("PolyFit*", "fit.polynomial"), ("GenLSFit*", "fit.linear"),
    ("ExpFit*", "fit.exponential"),
    ("PowerFit*", "fit.power"), ("LogFit*", "fit.logarithm"), ("GaussianPeakFit* BoundGaussianFit*", "fit.gaussian"),
    ("GetNewCoef_head", "fit.curve"),
    ("ConfBnd*", "fit.Fit.confidence"), ("PredBnd*", "fit.Fit.prediction"), ("GoodnessOfFit_head", "fit.Fit"),
    ("SpInterp_head", "interpolate.CubicSpline"),
    ("NumerIntegration_head", "calculus.integrate"), ("NumerIntegration2D_head", "calculus.integrate2"),
    ("NumerIntegration3D_head", "calculus.integrate3"), ("Integral*", "calculus.cumulative"),
    ("Derivative", "calculus.derivative"),
    ("NormDist* InvNdist*", "stats.norm"), ("TDist* InvTdist*", "stats.t"), ("FDist* InvFDist*", "stats.f"),
    ("ChiSquare* InvChiSquare*", "stats.chi2"),
    ("Contingency_head", "stats.contingency"),
    ("Anova1Way*", "stats.anova"), ("Anova2Way*", "stats.anova2"), ("ANOVA3Way*", "stats.anova3"),
    ("QX_Gamma", "special.gamma"), ("QX_ExpI", "special.expn"), ("QX_Beta", "special.beta"), ("QX_Gauss*", "special.hyp2f1"),
    ("QX_Kummer", "special.hyp1f1"), ("QX_Tricomi", "special.hyperu"),
    ("QX_Elliptic1 QX_Elliptic1_85", "special.ellipk"), ("QX_Elliptic2", "special.ellipe"),
    ("PeakD20*", "measure.PeakFinder"), ("PeakDetector", "measure.trigger"), ("PulseMeas PulseParameters", "measure.pulses"),
    ("Triggerh", "measure.trigger"),
    ("CoordRotationEuler_head", "coordinates.rotate_euler"), ("Euler2Direction_head", "coordinates.euler_to_matrix"),
)


def served():
    """The topic functions that call each export."""
    found = {}
    for topic in TOPICS:
        for key, export in NEWEST.get(topic, {}).items():
            function = f"{topic}.{function_of(topic, key)}"
            if function not in found.setdefault(export, []):
                found[export].append(function)
    return found


def remark(name):
    for patterns, text in OTHERS:
        if any(fnmatch.fnmatchcase(name, pattern) for pattern in patterns.split()):
            return text if text in (TWIN, HOST) else f"{text} ({NOT_CALLED})" if "." in text and "NumPy" not in text \
                else text
    raise LookupError(f"no topic function calls {name}: add it to topical/newest.py or to {Path(__file__).name}")


def page():
    functions = served()
    lines = ["# Exports and topics", "",
             'Each export, with the functions of the Python topics that call it. Exports marked "not called, for',
             'comparison" are other revisions or forms of those that the topics call; `qx.exports` has all exports. Written',
             "by `tools/topics_table.py` from `python/qx/topical/newest.py`.", ""]
    for family in library().catalogue["families"]:
        names = [name for name, entry in library().entries.items() if entry["family"] == family["name"]]
        if names:
            lines += [f"## {family['name']}", "", "| export | function |", "|---|---|"]
            lines += [f"| `{name}` | {', '.join(functions[name]) if name in functions else remark(name)} |"
                      for name in names]
            lines.append("")
    return "\n".join(lines)


if __name__ == "__main__":
    if "--check" in sys.argv:
        sys.exit(PAGE.read_text("utf-8") != page())
    PAGE.write_text(page(), "utf-8")
