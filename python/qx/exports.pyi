"""Every export as a function. Written by qx.stubs from the catalogue."""

from collections.abc import Callable, Mapping
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .pointers import Pointer


def Contingency_head(table: ArrayLike) -> tuple[float, float]:
    """Pearson's chi-square test of independence on a table of counts: the statistic, the sum of (O - ..."""


def Contingency2026_head(table: ArrayLike) -> tuple[float, float]:
    """As Contingency_head, with both numbers accurate to the last digits: the statistic from exact ..."""


def Anova1Way_head(y: ArrayLike, labels: ArrayLike, k: int) -> tuple[float, float, float, float, float, float, float]:
    """One-way analysis of variance of y, where element i belongs to the level labels[i], with *k ..."""


def Anova1Way_head_2017(y: ArrayLike, labels: ArrayLike, k: int, alpha: float) -> tuple[float, float, float, float, float, float, float, float]:
    """As Anova1Way_head, and with *fCritical, the value that f exceeds with probability alpha, by ..."""


def Anova1Way_head_2026(y: ArrayLike, labels: ArrayLike, k: int, alpha: float) -> tuple[float, float, float, float, float, float, float, float]:
    """As Anova1Way_head_2017, by two passes over the exact differences from one observation, in twice ..."""


def Anova2Way_head(y: ArrayLike, labelsA: ArrayLike, labelsB: ArrayLike, levelsA: int, levelsB: int, observations: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Analysis of variance of y in two crossed factors: observation i belongs to the levels labelsA[i] ..."""


def Anova2Way_head_2017(y: ArrayLike, labelsA: ArrayLike, labelsB: ArrayLike, levelsA: int, levelsB: int, observations: int, significance: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As Anova2Way_head, and with the critical values that f exceeds with probability `significance`, ..."""


def ANOVA3Way_head(y: ArrayLike, labelsA: ArrayLike, labelsB: ArrayLike, labelsC: ArrayLike, levelsA: int, levelsB: int, levelsC: int, observations: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As Anova2Way_head, with three factors. Analysis of variance of y in two crossed factors: ..."""


def ANOVA3Way_head_2017(y: ArrayLike, labelsA: ArrayLike, labelsB: ArrayLike, labelsC: ArrayLike, levelsA: int, levelsB: int, levelsC: int, observations: int, significance: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As Anova2Way_head_2017, with three factors; sources and denominators are those of ..."""


def Mean_head(x: ArrayLike) -> float:
    """Arithmetic mean, sum(x) / n, summed from the first element to the last."""


def RMS_head(x: ArrayLike) -> float:
    """Root mean square, sqrt(sum(x^2) / n)."""


def CxRMS_head(z: ArrayLike) -> float:
    """Root mean square of complex values, sqrt(sum(im^2 + re^2) / n), with the limits of RMS_head."""


def MSE_head(x: ArrayLike, y: ArrayLike) -> float:
    """Mean squared difference over the shorter of the two lengths, m: sum(x x + y (y - 2 x)) / m."""


def Moment_head(x: ArrayLike, order: int) -> float:
    """Central population moment, sum((x - mean)^order) / n; order 2 is the population variance."""


def BoundLinearFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, lower: ArrayLike, upper: ArrayLike) -> tuple[NDArray[np.float64], float, float, float]:
    """The line y = a x + b within bounds by least squares."""


def BoundLinearFitLAR_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, iterations: int, lower: ArrayLike, upper: ArrayLike) -> tuple[NDArray[np.float64], int, float, float, float]:
    """As BoundLinearFit_head, by least absolute residuals: least-squares lines with the weights 1 / ..."""


def BoundLinearFitBi_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, iterations: int, lower: ArrayLike, upper: ArrayLike) -> tuple[NDArray[np.float64], int, float, float, float]:
    """As BoundLinearFitLAR_head, by bisquare weights: (1 - u^2)^2 for |u| < 1 and 0 beyond, where u is ..."""


def BoundExpFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, iterations: int, guess: ArrayLike, lower: ArrayLike, upper: ArrayLike, method: int) -> tuple[NDArray[np.float64], int, float, float, float, float]:
    """y = a exp(b x) + c within bounds, by Levenberg-Marquardt steps: at most 20 of them, and no more ..."""


def BoundPowerFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, iterations: int, guess: ArrayLike, lower: ArrayLike, upper: ArrayLike, method: int) -> tuple[NDArray[np.float64], int, float, float, float, float]:
    """As BoundExpFit_head, for y = a x^b + c with x above 0, with at most 30 steps without bounds. y = ..."""


def BoundLogFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, base: float, iterations: int, guess: ArrayLike, lower: ArrayLike, upper: ArrayLike, method: int, tolerance: float) -> tuple[NDArray[np.float64], int, float, float, float]:
    """y = a log(b x) to the given base, with x above 0, within bounds: the line over log(x) if that is ..."""


def BoundGaussianFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, iterations: int, guess: ArrayLike, lower: ArrayLike, upper: ArrayLike, method: int) -> tuple[NDArray[np.float64], int, float, float, float, float, float]:
    """As BoundExpFit_head, for the peak or dip y = a exp(-0.5 ((x - m) / s)^2) + c; s is returned as ..."""


def BoundGaussianFit2026_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, iterations: int, guess: ArrayLike, lower: ArrayLike, upper: ArrayLike, method: int) -> tuple[NDArray[np.float64], int, float, float, float, float, float]:
    """As BoundGaussianFit_head, with start values at every scale, of which the best are fitted and the ..."""


def NumerIntegration_head(x: ArrayLike, dt: float, rule: int) -> float:
    """Definite integral of x."""


def NumerIntegration_2017_head(x: ArrayLike, dt: float, rule: int) -> float:
    """As NumerIntegration_head. Definite integral of x."""


def NumerIntegration2D_head(x: ArrayLike, dts: ArrayLike, rule: int) -> float:
    """Definite integral of x over both dimensions."""


def NumerIntegration2D_2017_head(x: ArrayLike, dts: ArrayLike, rule: int) -> float:
    """As NumerIntegration2D_head, by the formulas of NumerIntegration_2017_head; rules 4 and 5 are ..."""


def NumerIntegration3D_head(x: ArrayLike, dts: ArrayLike, rule: int) -> float:
    """Definite integral of x over three dimensions d0, d1, d2."""


def NumerIntegration3D_2017_head(x: ArrayLike, dts: ArrayLike, rule: int) -> float:
    """As NumerIntegration3D_head, by the formulas of NumerIntegration_2017_head; rules 4 and 5 are ..."""


def Integral(x: ArrayLike, initial: float, final: float, dt: float) -> NDArray[np.float64]:
    """Running integral by Simpson's rule around each sample, y[i] = y[i-1] + (x[i-1] + 4 x[i] + ..."""


def Integral90(x: ArrayLike, initial: ArrayLike, final: ArrayLike, dt: float, rule: int) -> NDArray[np.float64]:
    """Running integral y[i] = y[i-1] + p, y[-1] = 0, with p by rule: 0 (x[i-1] + x[i]) dt/2 one ..."""


def Integral_2017(x: ArrayLike, dt: float, rule: int) -> NDArray[np.float64]:
    """Running integral from y[0] = 0 without values beyond the data: the first values by one-sided ..."""


def Derivative(x: ArrayLike, initial: float, final: float, dt: float) -> NDArray[np.float64]:
    """Central derivative (x[i+1] - x[i-1]) / (2 dt), with *initial before and *final after the data."""


def Derivative85(x: ArrayLike, initial: ArrayLike, final: ArrayLike, dt: float, rule: int) -> NDArray[np.float64]:
    """Derivative by rule: 0 (x[i+1] - x[i-1]) / (2 dt) one initial, one final 1 (x[i-2] - 8 x[i-1] + 8 ..."""


def ChirpZT_head(in_: ArrayLike, a: complex, w: complex, count: int, method: int) -> NDArray[np.complex128]:
    """out[m] = sum over k from 0 to n-1 of in[k] a^(-k) w^(k m), for m from 0 to count-1; a count ..."""


def CxChirpZT_head(in_: ArrayLike, a: complex, w: complex, count: int, method: int) -> NDArray[np.complex128]:
    """As ChirpZT_head, for complex data. out[m] = sum over k from 0 to n-1 of in[k] a^(-k) w^(k m), ..."""


def InvChirpZT_head(in_: ArrayLike, a: complex, w: complex, count: int) -> NDArray[np.complex128]:
    """The inverse: the sequence of n values whose transform is `in`."""


def Convolution(x: ArrayLike, y: ArrayLike, algorithm: int) -> NDArray[np.float64]:
    """out[t] = sum over i of x[i] y[t - i], nx + ny - 1 values."""


def CxConvolution(x: ArrayLike, y: ArrayLike, algorithm: int, correlate: int, normalization: int) -> NDArray[np.complex128]:
    """Complex convolution or, with `correlate` non-zero, correlation: out[t] = sum over i of conj(x[nx ..."""


def Rxy80(x: ArrayLike, y: ArrayLike, algorithm: int, normalization: int) -> NDArray[np.float64]:
    """Cross-correlation: out[t] = sum over j of x[nx - 1 - t + j] y[j], nx + ny - 1 values, element nx ..."""


def Rxy(x: ArrayLike, y: ArrayLike, algorithm: int) -> NDArray[np.float64]:
    """As Rxy80, without a normalization. Cross-correlation: out[t] = sum over j of x[nx - 1 - t + j] ..."""


def AutoCorrelation80(x: ArrayLike, normalization: int) -> NDArray[np.float64]:
    """Replaces x by its autocorrelation, 2 n - 1 values with lag zero in the middle, always by transforms."""


def AutoCorrelation(x: ArrayLike) -> NDArray[np.float64]:
    """As AutoCorrelation80, without a normalization. Replaces x by its autocorrelation, 2 n - 1 values ..."""


def Deconvolution(xy: ArrayLike, y: ArrayLike) -> NDArray[np.float64]:
    """Replaces xy by q, nxy - ny + 1 values, with xy = q convolved with y: by division of the spectra, ..."""


def Convolve_2DH(x: ArrayLike, y: ArrayLike, outputSize: int, algorithm: int) -> NDArray[np.float64]:
    """out[r][c] = sum over i and j of x[i][j] y[r - i][c - j]."""


def CxConvolve_2DH(x: ArrayLike, y: ArrayLike, outputSize: int, algorithm: int) -> NDArray[np.complex128]:
    """As Convolve_2DH, for complex data. out[r][c] = sum over i and j of x[i][j] y[r - i][c - j]."""


def Correlation_2DH(x: ArrayLike, y: ArrayLike, algorithm: int) -> NDArray[np.float64]:
    """The convolution of x, rotated by 180 degrees, with y, in full size."""


def CxCorrelation_2DH(x: ArrayLike, y: ArrayLike, algorithm: int) -> NDArray[np.complex128]:
    """As Correlation_2DH, for complex data; x is conjugated. The convolution of x, rotated by 180 ..."""


def CoordRotation2D_head(x: ArrayLike, y: ArrayLike, angle: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Coordinates of points in the plane in a system rotated by `angle`: newX = x cos(angle) + y ..."""


def CoordRotationDirection_head(x: ArrayLike, y: ArrayLike, z: ArrayLike, direction: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Coordinates of points in space in the system given by a direction matrix: (newX, newY, newZ)' = ..."""


def CoordRotationEuler2011_head(x: ArrayLike, y: ArrayLike, z: ArrayLike, angle1: float, angle2: float, angle3: float, sequence: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Coordinates of points in space in the system rotated by three Euler angles (see above)."""


def CoordRotationEuler_head(x: ArrayLike, y: ArrayLike, z: ArrayLike, angle1: float, angle2: float, angle3: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As CoordRotationEuler2011_head, with sequence 10 (ZYX). Coordinates of points in space in the ..."""


def Euler2Direction2011_head(angle1: float, angle2: float, angle3: float, sequence: int) -> NDArray[np.float64]:
    """The direction matrix R = R3 R2 R1 of three Euler angles (see above), each element within 2.2e-16 ..."""


def Euler2Direction_head(angle1: float, angle2: float, angle3: float) -> NDArray[np.float64]:
    """As Euler2Direction2011_head, with sequence 10 (ZYX). The direction matrix R = R3 R2 R1 of three ..."""


def Direction2Euler2011_head(direction: ArrayLike, sequence: int) -> tuple[float, float, float]:
    """The Euler angles of a direction matrix."""


def CoordConversion_head(from_: int, to: int, first: ArrayLike, second: ArrayLike, third: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Converts points between kinds of coordinates."""


def DCT_1DH(in_: ArrayLike, size: int) -> NDArray[np.float64]:
    """Cosine transform, type II, orthonormal, of `size` values: the first elements of the input, zero- ..."""


def DCT_1DH_IDP(in_: ArrayLike, size: int) -> NDArray[np.float64]:
    """As DCT_1DH, with its plan in the host's instance data. Cosine transform, type II, orthonormal, ..."""


def DST_1DH(in_: ArrayLike, size: int) -> NDArray[np.float64]:
    """Sine transform, type I, unscaled, of `size` values (as in DCT_1DH): X[k] = sum over j of x[j] ..."""


def DST_1DH_IDP(in_: ArrayLike, size: int) -> NDArray[np.float64]:
    """As DST_1DH, with its plan in the host's instance data. Sine transform, type I, unscaled, of ..."""


def InvDCT_1DH(in_: ArrayLike) -> NDArray[np.float64]:
    """The inverse of DCT_1DH: type III, orthonormal, of the whole input."""


def InvDCT_1DH_IDP(in_: ArrayLike) -> NDArray[np.float64]:
    """As InvDCT_1DH, with its plan in the host's instance data. The inverse of DCT_1DH: type III, ..."""


def InvDST_1DH(in_: ArrayLike) -> NDArray[np.float64]:
    """The inverse of DST_1DH: x[j] = 2/(n+1) sum over k of X[k] sin(pi (j+1) (k+1) / (n+1))."""


def InvDST_1DH_IDP(in_: ArrayLike) -> NDArray[np.float64]:
    """As InvDST_1DH, with its plan in the host's instance data. The inverse of DST_1DH: x[j] = 2/(n+1) ..."""


def DCT_2DH(in_: ArrayLike, rows: int, cols: int) -> NDArray[np.float64]:
    """As DCT_1DH, of all rows, then of all columns, of the upper left rows by cols values, zero-padded ..."""


def DCT_2DH_IDP(in_: ArrayLike, rows: int, cols: int) -> NDArray[np.float64]:
    """As DCT_2DH, with its plans in the host's instance data. Cosine transform, type II, orthonormal, ..."""


def DST_2DH(in_: ArrayLike, rows: int, cols: int) -> NDArray[np.float64]:
    """As DST_1DH, of all rows, then of all columns; sizes and slots as in DCT_2DH. Sine transform, ..."""


def DST_2DH_IDP(in_: ArrayLike, rows: int, cols: int) -> NDArray[np.float64]:
    """As DST_2DH, with its plans in the host's instance data. Sine transform, type I, unscaled, of ..."""


def InvDCT_2DH(in_: ArrayLike) -> NDArray[np.float64]:
    """The inverse of DCT_2DH on the whole input, columns first."""


def InvDCT_2DH_IDP(in_: ArrayLike) -> NDArray[np.float64]:
    """As InvDCT_2DH, with its plans in the host's instance data. The inverse of DCT_2DH on the whole ..."""


def InvDST_2DH(in_: ArrayLike) -> NDArray[np.float64]:
    """The inverse of DST_2DH on the whole input, rows first."""


def InvDST_2DH_IDP(in_: ArrayLike) -> NDArray[np.float64]:
    """As InvDST_2DH, with its plans in the host's instance data. The inverse of DST_2DH on the whole ..."""


def DecimateCIN(x: ArrayLike, factor: int, average: int) -> NDArray[np.float64]:
    """Keeps every *factor-th value of x, starting with the first, or, if *average is non-zero, the ..."""


def CxDecimate_H(x: ArrayLike, factor: int, average: int) -> NDArray[np.complex128]:
    """As DecimateCIN, for complex data, with scalars by value; the code is the function result. Keeps ..."""


def DecimateContinuous_H(x: ArrayLike, factor: int, average: int, start: int, reset: int, partialCount: int, partialSum: float) -> tuple[NDArray[np.float64], int, int, float]:
    """Decimates a stream: x becomes every factor-th sample, after *start samples that are skipped, or, ..."""


def CxDecimateContinuous_H(x: ArrayLike, factor: int, average: int, start: int, reset: int, partialCount: int, partialSum: complex) -> tuple[NDArray[np.complex128], int, int, complex]:
    """As DecimateContinuous_H, for complex data. Decimates a stream: x becomes every factor-th sample, ..."""


def InterpolatedFIRH(x: ArrayLike, L: int, gain: float, h: ArrayLike, state: ArrayLike, reset: int, delay: int) -> tuple[NDArray[np.float64], NDArray[np.float64], int]:
    """Filters a stream with taps that are L samples apart: y[i] = gain sum over k of h[k] x[i - k L]."""


def InterpolatorFIRH(x: ArrayLike, gain: float, L: int, h: ArrayLike, state: ArrayLike, reset: int, delay: int) -> tuple[NDArray[np.float64], NDArray[np.float64], int]:
    """Interpolates a stream by L: y[i L + p] = gain L sum over k of h[p + k L] x[i - k]."""


def DecimatorFIRH(x: ArrayLike, gain: float, M: int, h: ArrayLike, state: ArrayLike, reset: int, firstPhase: int, delay: int) -> tuple[NDArray[np.float64], NDArray[np.float64], int]:
    """Decimates a stream by M: y[m] = sum over k of h[k] x[firstPhase + m M - k]."""


def CICDecimatorByMovH(x: ArrayLike, state: ArrayLike, stages: int, factor: int, differentialDelay: int, alternate: int, reset: int, delay: int) -> tuple[NDArray[np.float64], NDArray[np.float64], int]:
    """Decimates a stream by `factor` after a cascade of `stages` moving averages over w = factor ..."""


def CICInterpolatorByMovH(x: ArrayLike, state: ArrayLike, stages: int, factor: int, differentialDelay: int, alternate: int, reset: int, delay: int) -> tuple[NDArray[np.float64], NDArray[np.float64], int]:
    """Interpolates a stream by `factor`: the input, multiplied by factor and with factor - 1 zeros ..."""


def ReDecimatedMovingAverageH(x: ArrayLike, factor: int, sum: float, count: int, reset: int) -> tuple[NDArray[np.float64], float, int, int]:
    """Sums of groups of `factor` samples of a stream, in the first *outCount elements of x, which ..."""


def CxDecimatedMovingAverageH(x: ArrayLike, factor: int, sum: complex, count: int, reset: int) -> tuple[NDArray[np.complex128], complex, int, int]:
    """As ReDecimatedMovingAverageH, for complex data. Sums of groups of `factor` samples of a stream, ..."""


def ReCascadedMovingAverageH(x: ArrayLike, stages: int, width: int, sums: ArrayLike, buffers: ArrayLike, position: int, reset: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], int]:
    """Filters x by a cascade of moving sums over `width` samples, v + x[i] - x[i - width], without ..."""


def CxCascadedMovingAverageH(x: ArrayLike, stages: int, width: int, sums: ArrayLike, buffers: ArrayLike, position: int, reset: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], int]:
    """As ReCascadedMovingAverageH, for complex data. Filters x by a cascade of moving sums over ..."""


def CxComplexModulatorH(x: ArrayLike, frequency: float, sampleRate: float, phase: float) -> tuple[NDArray[np.complex128], float]:
    """Shifts a stream in frequency: x[i] becomes x[i] exp(i (*phase + 2 pi i frequency / sampleRate)), ..."""


def ReComplexModulatorH(x: ArrayLike, frequency: float, sampleRate: float, phase: float) -> tuple[float, NDArray[np.complex128]]:
    """As CxComplexModulatorH, for real data, with the result in y. Shifts a stream in frequency: x[i] ..."""


def NormDist_head(x: float | ArrayLike) -> float | NDArray[Any]:
    """P(X <= x) of the standard normal distribution, by the approximation 26.2.16: absolute error ..."""


def TDist_head(t: float | ArrayLike, dof: int | ArrayLike) -> float | NDArray[Any]:
    """P(T <= t) of Student's distribution with *dof degrees of freedom: q = I_z(dof / 2, 1 / 2) / 2 ..."""


def FDist_head(f: float | ArrayLike, n: int | ArrayLike, d: int | ArrayLike) -> float | NDArray[Any]:
    """P(F <= f) of Fisher's distribution with *n and *d degrees of freedom, 1 - I_z(d / 2, n / 2) with ..."""


def ChiSquare_head(x: float | ArrayLike, dof: int | ArrayLike) -> float | NDArray[Any]:
    """P(X <= x) of the chi-square distribution with *dof degrees of freedom, the regularised ..."""


def InvNdist_head(p: float | ArrayLike) -> float | NDArray[Any]:
    """The quantile of the standard normal distribution, by the approximation 26.2.23: absolute error ..."""


def InvTdist_head(p: float | ArrayLike, dof: int | ArrayLike) -> float | NDArray[Any]:
    """The quantile of Student's distribution, by bisection on [-10000, 10000] to an absolute error of ..."""


def InvFDist_head(p: float | ArrayLike, n: int | ArrayLike, d: int | ArrayLike) -> float | NDArray[Any]:
    """The quantile of Fisher's distribution, by bisection on [1e-6, 10000] to an absolute error of ..."""


def InvChiSquare_head(p: float | ArrayLike, dof: int | ArrayLike) -> float | NDArray[Any]:
    """The quantile of the chi-square distribution, by bisection to an absolute error of 1e-4, from ..."""


def NormDist2026_head(x: float | ArrayLike, what: int | ArrayLike) -> float | NDArray[Any]:
    """A value of the standard normal distribution at *x, within 3 eps down to the smallest numbers: ..."""


def TDist2026_head(t: float | ArrayLike, dof: float | ArrayLike, what: int | ArrayLike) -> float | NDArray[Any]:
    """As NormDist2026_head, of Student's distribution with *dof degrees of freedom, which need not be ..."""


def FDist2026_head(f: float | ArrayLike, n: float | ArrayLike, d: float | ArrayLike, what: int | ArrayLike) -> float | NDArray[Any]:
    """As TDist2026_head, of Fisher's distribution with *n and *d degrees of freedom: 0 for f below 0. ..."""


def ChiSquare2026_head(x: float | ArrayLike, dof: float | ArrayLike, what: int | ArrayLike) -> float | NDArray[Any]:
    """As TDist2026_head, of the chi-square distribution: 0 for x below 0. A value of the standard ..."""


def InvNdist2026_head(p: float | ArrayLike, tail: int | ArrayLike) -> float | NDArray[Any]:
    """The point below which, or above which, the standard normal distribution has the probability *p, ..."""


def InvTdist2026_head(p: float | ArrayLike, tail: int | ArrayLike, dof: float | ArrayLike) -> float | NDArray[Any]:
    """As InvNdist2026_head, of Student's distribution with *dof degrees of freedom, which need not be ..."""


def InvFDist2026_head(p: float | ArrayLike, tail: int | ArrayLike, n: float | ArrayLike, d: float | ArrayLike) -> float | NDArray[Any]:
    """As InvTdist2026_head, of Fisher's distribution; the lower end is 0, which is also the result for ..."""


def InvChiSquare2026_head(p: float | ArrayLike, tail: int | ArrayLike, dof: float | ArrayLike) -> float | NDArray[Any]:
    """As InvFDist2026_head, of the chi-square distribution with *dof degrees of freedom. The point ..."""


def ReDZTH(in_: ArrayLike, S: int, N: int, start: int, size: int) -> tuple[NDArray[np.float64], NDArray[np.complex128]]:
    """A band of bins of a transform of length L = S N from S transforms of length N: out[i] = sum over ..."""


def ReDZTH_IDP(in_: ArrayLike, S: int, N: int, start: int, size: int) -> tuple[NDArray[np.float64], NDArray[np.complex128]]:
    """As ReDZTH, with its plan in the host's instance data. A band of bins of a transform of length L ..."""


def CxDZTH(in_: ArrayLike, S: int, N: int, start: int, size: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As ReDZTH, of complex data. A band of bins of a transform of length L = S N from S transforms of ..."""


def CxDZTH_IDP(in_: ArrayLike, S: int, N: int, start: int, size: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As CxDZTH, with its plan in the host's instance data. A band of bins of a transform of length L ..."""


def EigenValueVector_head(a: ArrayLike, output: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """Eigenvalues and eigenvectors of the square matrix a."""


def CxEigenValueVector_head(a: ArrayLike, matrixType: int, output: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As EigenValueVector_head, for complex elements. Eigenvalues and eigenvectors of the square matrix a."""


def EigenValueVector2026_head(a: ArrayLike, output: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As EigenValueVector_head, with a block algorithm from order 160 on, in half the time at order ..."""


def CxEigenValueVector2026_head(a: ArrayLike, matrixType: int, output: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As CxEigenValueVector_head, with the block algorithms of EigenValueVector2026_head for general ..."""


def SymEvectorEvalue_head(a: ArrayLike, output: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Eigenvalues, in ascending order, of the symmetric matrix whose lower triangle is in a."""


def SymEvectorEvalue2026_head(a: ArrayLike, output: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As SymEvectorEvalue_head, with a block algorithm from order 64 on: reduction to tridiagonal form ..."""


def Schur_head(a: ArrayLike, wantVectors: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128]]:
    """Schur form a = u t u^T of the square matrix a, which becomes t: u is orthogonal and t upper ..."""


def CxSchur_head(a: ArrayLike, wantVectors: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As Schur_head, for complex elements: a = u t u^H with a triangular t. Schur form a = u t u^T of ..."""


def Schur80_head(a: ArrayLike, wantVectors: int, order: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128]]:
    """As Schur_head, with the eigenvalues in order. Schur form a = u t u^T of the square matrix a, ..."""


def CxSchur80_head(a: ArrayLike, wantVectors: int, order: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As Schur80_head, for complex elements: a = u t u^H with a triangular t. Schur form a = u t u^T ..."""


def Schur2026_head(a: ArrayLike, wantVectors: int, order: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128]]:
    """As Schur80_head, with the eigenvalues in w guaranteed to be in order: blocks are sorted, in up ..."""


def create_oxfft_table(length: int) -> Pointer:
    """Returns the plan for transforms of `length` values, which is built on the first request and then ..."""


def destroy_oxfft_table(plan: Pointer | None) -> None:
    """Releases a plan, which is freed when its last holder releases it."""


def CxOXFFTH(in_: ArrayLike) -> NDArray[np.complex128]:
    """As CxOXFFTH80, of the whole input, not shifted. The transform X[k] = sum over j of x[j] exp(-2 ..."""


def CxOXFFTH80(in_: ArrayLike, offset: int, size: int, shift: int) -> NDArray[np.complex128]:
    """The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n), k from 0 to n-1, unscaled, of the ..."""


def CxOXFFTH80_IDP(in_: ArrayLike, offset: int, size: int, shift: int) -> NDArray[np.complex128]:
    """As CxOXFFTH80, with its plan in the host's instance data. The transform X[k] = sum over j of ..."""


def InvCxOXFFTH(in_: ArrayLike) -> NDArray[np.complex128]:
    """As InvCxOXFFTH80, of a spectrum that is not shifted. The inverse transform x[j] = 1/n sum over k ..."""


def InvCxOXFFTH80(in_: ArrayLike, shift: int) -> NDArray[np.complex128]:
    """The inverse transform x[j] = 1/n sum over k of X[k] exp(2 pi i j k / n) of the n values X of ..."""


def InvCxOXFFTH80_IDP(in_: ArrayLike, shift: int) -> NDArray[np.complex128]:
    """As InvCxOXFFTH80, with its plan in the host's instance data. The inverse transform x[j] = 1/n ..."""


def ReOXFFTH(in_: ArrayLike) -> NDArray[np.complex128]:
    """As ReOXFFTH80, of the whole input, not shifted. The transform X[k] = sum over j of x[j] exp(-2 ..."""


def ReOXFFTH80(in_: ArrayLike, offset: int, size: int, shift: int) -> NDArray[np.complex128]:
    """The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n), unscaled, of the n = `size` values ..."""


def ReOXFFTH80_IDP(in_: ArrayLike, offset: int, size: int, shift: int) -> NDArray[np.complex128]:
    """As ReOXFFTH80, with its plan in the host's instance data. The transform X[k] = sum over j of ..."""


def ReOXFFTHCH(in_: ArrayLike) -> NDArray[np.float64]:
    """The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n) of real data, unscaled, in half- ..."""


def ReOXFFTHCH_IDP(in_: ArrayLike) -> NDArray[np.float64]:
    """As ReOXFFTHCH, with its plan in the host's instance data. The transform X[k] = sum over j of ..."""


def InvReOXFFTH(in_: ArrayLike) -> NDArray[np.float64]:
    """As InvReOXFFTH80, of a spectrum that is not shifted. The inverse transform x[j] = 1/n sum over k ..."""


def InvReOXFFTH80(in_: ArrayLike, shift: int) -> NDArray[np.float64]:
    """The inverse transform x[j] = 1/n sum over k of X[k] exp(2 pi i j k / n) of the spectrum of real ..."""


def InvReOXFFTH80_IDP(in_: ArrayLike, shift: int) -> NDArray[np.float64]:
    """As InvReOXFFTH80, with its plan in the host's instance data. The inverse transform x[j] = 1/n ..."""


def InvReOXFFTHCH(in_: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """The inverse of ReOXFFTHCH, with the factor 1/n, of a half-complex spectrum."""


def InvReOXFFTHCH_IDP(in_: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As InvReOXFFTHCH, with its plan in the host's instance data. The inverse of ReOXFFTHCH, with the ..."""


def TransformUnreserveProc() -> None:
    """Releases the plans of an _IDP node and clears its instance-data word."""


def CxFFT2D_H(in_: ArrayLike, rowStart: int, colStart: int, rows: int, cols: int, shift: int) -> NDArray[np.complex128]:
    """X[r][c] = sum over a and b of x[a][b] exp(-2 pi i (r a / rows + c b / cols)), with x the rows by ..."""


def CxFFT2D_H_IDP(in_: ArrayLike, rowStart: int, colStart: int, rows: int, cols: int, shift: int) -> NDArray[np.complex128]:
    """As CxFFT2D_H, with its plans in the host's instance data. X[r][c] = sum over a and b of x[a][b] ..."""


def ReFFT2D_H(in_: ArrayLike, rowStart: int, colStart: int, rows: int, cols: int, shift: int) -> NDArray[np.complex128]:
    """As CxFFT2D_H, of a real matrix. X[r][c] = sum over a and b of x[a][b] exp(-2 pi i (r a / rows + ..."""


def ReFFT2D_H_IDP(in_: ArrayLike, rowStart: int, colStart: int, rows: int, cols: int, shift: int) -> NDArray[np.complex128]:
    """As ReFFT2D_H, with its plans in the host's instance data. X[r][c] = sum over a and b of x[a][b] ..."""


def CxInvFFT2D_H(in_: ArrayLike, shift: int) -> NDArray[np.complex128]:
    """The inverse transform of a rows by cols matrix X, which is in shifted order if `shift` is non- ..."""


def CxInvFFT2D_H_IDP(in_: ArrayLike, shift: int) -> NDArray[np.complex128]:
    """As CxInvFFT2D_H, with its plans in the host's instance data. The inverse transform of a rows by ..."""


def ReInvFFT2D_H(in_: ArrayLike, shift: int) -> NDArray[np.float64]:
    """As CxInvFFT2D_H, of the spectrum of a real matrix: the rows of negative row frequency are not ..."""


def ReInvFFT2D_H_IDP(in_: ArrayLike, shift: int) -> NDArray[np.float64]:
    """As ReInvFFT2D_H, with its plans in the host's instance data. The inverse transform of a rows by ..."""


def IIR_Filter(x: ArrayLike, a: ArrayLike, b: ArrayLike, xState: ArrayLike, yState: ArrayLike, keepState: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Filters x in place, in direct form."""


def CxSigIIR_Filter(x: ArrayLike, a: ArrayLike, b: ArrayLike, xState: ArrayLike, yState: ArrayLike, keepState: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As IIR_Filter, for a complex signal: its parts run through the same coefficients. Filters x in ..."""


def CxIIR_Filter_H(x: ArrayLike, a: ArrayLike, b: ArrayLike, xState: ArrayLike, yState: ArrayLike, keepState: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As IIR_Filter, for a complex signal and complex coefficients. Filters x in place, in direct form."""


def CxIIRReSig_Filter_H(x: ArrayLike, a: ArrayLike, b: ArrayLike, xState: ArrayLike, yState: ArrayLike, keepState: int) -> tuple[NDArray[np.complex128], NDArray[np.float64], NDArray[np.complex128]]:
    """Filters a real signal x by a filter with complex coefficients, in direct form; without any ..."""


def IIR_Filter_OneState(x: ArrayLike, a: ArrayLike, b: ArrayLike, state: ArrayLike, keepState: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Filters x in place, in direct form, with the state of x, followed by that of y, in one array."""


def CxSigIIR_Filter_OneState(x: ArrayLike, a: ArrayLike, b: ArrayLike, state: ArrayLike, keepState: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As IIR_Filter_OneState, for a complex signal: its parts run through the same coefficients. ..."""


def IIR_Filter2(x: ArrayLike, form: int, a: ArrayLike, b: ArrayLike, state: ArrayLike, keepState: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Filters x in place by a cascade."""


def CxSigIIR_Filter2(x: ArrayLike, form: int, a: ArrayLike, b: ArrayLike, state: ArrayLike, keepState: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As IIR_Filter2, for a complex signal: its parts run through the same coefficients. Filters x in ..."""


def IIR_Filter_PtbyPt(x: float, mode: int, a: ArrayLike, b: ArrayLike, state: ArrayLike, reset: int) -> tuple[float, NDArray[np.float64]]:
    """Filters one sample in place."""


def CxSigIIR_Filter_PtbyPt(x: complex, mode: int, a: ArrayLike, b: ArrayLike, state: ArrayLike, reset: int) -> tuple[complex, NDArray[np.complex128]]:
    """As IIR_Filter_PtbyPt, for a complex sample: its parts run through the same coefficients. Filters ..."""


def FIRCoefs(fs: float, fl: float, fh: float, taps: int, type: int) -> tuple[NDArray[np.float64], int]:
    """The ideal lowpass (*type 0) or highpass (1) with the cut-off fl, or bandpass (2) or bandstop (3) ..."""


def Parks(n: int, fs: float, bands: ArrayLike, type: int, maxIterations: int) -> tuple[NDArray[np.float64], float]:
    """Designs an equiripple filter of n taps: the one with the smallest maximum of the weighted ..."""


def FIRNarrowCoef_head(fs: float, fPass: float, fStop: float, fCenter: float, passRipple: float, stopAttenuation: float, type: int, design: Mapping[str, Any]) -> dict[str, Any]:
    """Designs a filter for a narrow band, whose response stays within passRipple (linear) of 1 in the ..."""


def FIRnarrowFilter_head(x: ArrayLike, design: Mapping[str, Any]) -> NDArray[np.float64]:
    """Filters x by a filter of FIRNarrowCoef_head."""


def CxSigFIRnarrowFilter_head(x: ArrayLike, design: Mapping[str, Any]) -> NDArray[np.complex128]:
    """As FIRnarrowFilter_head, for a complex signal, whose real and imaginary parts are filtered ..."""


def ConfBndLinear_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Bounds of the line y = slope x + intercept; coefficients: slope, intercept (LinFit_head)."""


def PredBndLinear_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLinear_head, with prediction bounds for the curve, and without bounds for the ..."""


def ConfBndExp_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLinear_head, of y = a exp(b x); coefficients: a, b (ExpFit80_head). Bounds of the line ..."""


def PredBndExp_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndExp_head, with prediction bounds for the curve, and without bounds for the ..."""


def ConfBndPower_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLinear_head, of y = a x^b, x above 0; coefficients: a, b (PowerFit_head). Bounds of ..."""


def PredBndPower_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndPower_head, with prediction bounds for the curve, and without bounds for the ..."""


def ConfBndLog_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, base: float, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndPower_head, of y = a log(b x) to the given base; coefficients: a, b (LogFit_head). ..."""


def PredBndLog_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, base: float, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLog_head, with prediction bounds for the curve, and without bounds for the ..."""


def ConfBndGauss_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLinear_head, of y = a exp(-((x - c) / s)^2 / 2); coefficients: a, c, s ..."""


def PredBndGauss_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndGauss_head, with prediction bounds for the curve, and without bounds for the ..."""


def ConfBndPoly_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLinear_head, of the polynomial sum of coefficients[j] x^j, with any number of ..."""


def PredBndPoly_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndPoly_head, with prediction bounds for the curve, and without bounds for the ..."""


def ConfBndGenLS_head(H: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndLinear_head, of y = H c for a matrix with one row per sample and one column per ..."""


def PredBndGenLS_head(H: ArrayLike, y: ArrayLike, w: ArrayLike, coefficients: ArrayLike, confidence: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ConfBndGenLS_head, with prediction bounds for the curve, and without bounds for the ..."""


def InitializeAnalysisWorkspaceH(size: int, status: Mapping[str, Any]) -> dict[str, Any]:
    """Reserves the analysis workspace: one region of `size` bytes from which scratch memory can be ..."""


def EnableAnalysisWorkspaceH(status: Mapping[str, Any]) -> dict[str, Any]:
    """Enables the workspace: from now on scratch memory is taken from the region."""


def DisableAnalysisWorkspaceH(status: Mapping[str, Any]) -> dict[str, Any]:
    """Disables the workspace: from now on scratch memory is taken from the heap again."""


def UninitializeAnalysisWorkspaceH(status: Mapping[str, Any]) -> dict[str, Any]:
    """Releases the region to the heap; a no-op without a region."""


def SetQXRTModule(module: Pointer | None, reserved: int) -> Pointer:
    """Sets the module of the process in which the host's run-time functions are looked up first; then ..."""


def QZ80_head(a: ArrayLike, b: ArrayLike, wantVectors: int, order: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.float64]]:
    """Generalised Schur form of two square matrices: a = q s z^T and b = q t z^T with orthogonal q and z."""


def CxQZ80_head(a: ArrayLike, b: ArrayLike, wantVectors: int, order: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As QZ80_head, for complex elements: a = q s z^H and b = q t z^H with triangular s and t. ..."""


def QZ_head(a: ArrayLike, b: ArrayLike, wantVectors: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.float64]]:
    """As QZ80_head, without a choice of the order of the eigenvalues. Generalised Schur form of two ..."""


def CxQZ_head(a: ArrayLike, b: ArrayLike, wantVectors: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As QZ_head, for complex elements: a = q s z^H and b = q t z^H with triangular s and t. ..."""


def TmiQZ_head(a: ArrayLike, b: ArrayLike, order: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.float64], NDArray[np.complex128]]:
    """As QZ80_head, always with q and z. Generalised Schur form of two square matrices: a = q s z^T ..."""


def CxTmiQZ_head(a: ArrayLike, b: ArrayLike, order: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128]]:
    """As TmiQZ_head, for complex elements. Generalised Schur form of two square matrices: a = q s z^T ..."""


def GenEigenEx_head(a: ArrayLike, b: ArrayLike, output: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """Generalised eigenvalues of two square matrices, a v = value b v, and eigenvectors."""


def CxGenEigenEx_head(a: ArrayLike, b: ArrayLike, output: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As GenEigenEx_head, for complex elements. Generalised eigenvalues of two square matrices, a v = ..."""


def GSVD_head(a: ArrayLike, b: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], int, int]:
    """Generalised singular values of a (m by n) and b (p by n): u^T a q = d1 (0 r) and v^T b q = d2 (0 ..."""


def CxGSVD_head(a: ArrayLike, b: ArrayLike) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], int, int]:
    """As GSVD_head, for complex elements and unitary u, v and q. Generalised singular values of a (m ..."""


def FHTH(x: ArrayLike) -> NDArray[np.float64]:
    """Replaces x by its Hartley transform: H[k] = sum over j of x[j] (cos(2 pi j k / n) + sin(2 pi j k ..."""


def FHTH_IDP(x: ArrayLike) -> NDArray[np.float64]:
    """As FHTH, with its plan in the host's instance data. Replaces x by its Hartley transform: H[k] = ..."""


def InvFHTH(x: ArrayLike) -> NDArray[np.float64]:
    """The inverse of FHTH: the same transform with the factor 1/n."""


def InvFHTH_IDP(x: ArrayLike) -> NDArray[np.float64]:
    """As InvFHTH, with its plan in the host's instance data. The inverse of FHTH: the same transform ..."""


def FastHilbertTransformH(x: ArrayLike) -> NDArray[np.float64]:
    """Replaces x by its Hilbert transform: the spectrum times -i for positive and i for negative ..."""


def FastHilbertTransformH_IDP(x: ArrayLike) -> NDArray[np.float64]:
    """As FastHilbertTransformH, with its plan in the host's instance data. Replaces x by its Hilbert ..."""


def InvFastHilbertTransformH(x: ArrayLike) -> NDArray[np.float64]:
    """The negative of FastHilbertTransformH."""


def InvFastHilbertTransformH_IDP(x: ArrayLike) -> NDArray[np.float64]:
    """As InvFastHilbertTransformH, with its plan in the host's instance data. The negative of ..."""


def histgran_head(x: ArrayLike, bins: int) -> tuple[NDArray[np.int32], NDArray[np.float64]]:
    """Histogram of x over its own range in *bins bins of equal width, with their centres."""


def GenHistH(x: ArrayLike, intervals: ArrayLike) -> tuple[NDArray[np.int32], dict[str, Any]]:
    """Counts the samples of x in each of the given intervals, which are expected in ascending order."""


def BWCoefs(fs: float, fl: float, fh: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Butterworth filter: |H|^2 = 1 / (1 + w^(2 order)), 3 dB down at the cut-offs."""


def BWCoefs90(fs: float, fl: float, fh: float, order: int, type: int, form: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As BWCoefs, with a choice of the form. Butterworth filter: |H|^2 = 1 / (1 + w^(2 order)), 3 dB ..."""


def ChebyshevCoefs(fs: float, fl: float, fh: float, ripple: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Chebyshev filter: |H|^2 = 1 / (1 + e^2 T(w)^2) with the Chebyshev polynomial T of that order and ..."""


def ChebyshevCoefs90(fs: float, fl: float, fh: float, ripple: float, order: int, type: int, form: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As ChebyshevCoefs, with a choice of the form. Chebyshev filter: |H|^2 = 1 / (1 + e^2 T(w)^2) ..."""


def InvChebyshevCoefs(fs: float, fl: float, fh: float, attenuation: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Inverse Chebyshev filter: |H|^2 = 1 / (1 + 1 / (e^2 T(1/w)^2)) with e^2 = 1 / (10^(attenuation / ..."""


def InvChebyshevCoefs90(fs: float, fl: float, fh: float, attenuation: float, order: int, type: int, form: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As InvChebyshevCoefs, with a choice of the form. Inverse Chebyshev filter: |H|^2 = 1 / (1 + 1 / ..."""


def EllipticCoefs(fs: float, fl: float, fh: float, ripple: float, attenuation: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Elliptic filter: |H|^2 = 1 / (1 + e^2 R(w)^2) with the elliptic rational function R of that ..."""


def EllipticCoefs90(fs: float, fl: float, fh: float, ripple: float, attenuation: float, order: int, type: int, form: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As EllipticCoefs, with a choice of the form. Elliptic filter: |H|^2 = 1 / (1 + e^2 R(w)^2) with ..."""


def BesselCoefs(fs: float, fl: float, fh: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Bessel filter, whose group delay is maximally flat at 0 Hz before the bilinear transform, 3 dB ..."""


def BesselCoefs90(fs: float, fl: float, fh: float, order: int, type: int, form: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As BesselCoefs, with a choice of the form. Bessel filter, whose group delay is maximally flat at ..."""


def BWCoefs2026(fs: float, fl: float, fh: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], float]:
    """Butterworth filter, defined as in BWCoefs, designed from its poles and zeros."""


def ChebyshevCoefs2026(fs: float, fl: float, fh: float, ripple: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], float]:
    """Chebyshev filter as in ChebyshevCoefs, with the outputs of BWCoefs2026."""


def InvChebyshevCoefs2026(fs: float, fl: float, fh: float, attenuation: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], float]:
    """Inverse Chebyshev filter as in InvChebyshevCoefs, with the outputs of BWCoefs2026."""


def EllipticCoefs2026(fs: float, fl: float, fh: float, ripple: float, attenuation: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], float]:
    """Elliptic filter as in EllipticCoefs, with the outputs of BWCoefs2026, by theta functions of the ..."""


def BesselCoefs2026(fs: float, fl: float, fh: float, order: int, type: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], float]:
    """Bessel filter as in BesselCoefs, with the outputs of BWCoefs2026."""


def PolyInterp_head(y: ArrayLike, x: ArrayLike, xi: float) -> tuple[float, float]:
    """The polynomial through the points (x, y) at *xi, by Neville's tableau."""


def RatInterp_head(y: ArrayLike, x: ArrayLike, xi: float) -> tuple[float, float]:
    """As PolyInterp_head, by the diagonal rational function: R. The polynomial through the points (x, ..."""


def Spline_head(y: ArrayLike, x: ArrayLike, firstSlope: float, lastSlope: float) -> NDArray[np.float64]:
    """The second derivatives, at the points, of the cubic spline through (x, y) with the given slopes ..."""


def SpInterp_head(y: ArrayLike, x: ArrayLike, secondDerivatives: ArrayLike, xi: float) -> float:
    """The cubic spline of Spline_head at *xi; beyond the table the first or last segment is extrapolated."""


def LinFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike) -> tuple[NDArray[np.float64], float, float, float]:
    """The line y = slope x + intercept; its values replace y."""


def LinFitCoef_head(y: ArrayLike, x: ArrayLike) -> tuple[float, float]:
    """As LinFit_head, for the coefficients only and without weights. The line y = slope x + intercept; ..."""


def LinFitCoef80_head(y: ArrayLike, x: ArrayLike, w: ArrayLike) -> tuple[float, float]:
    """As LinFitCoef_head, with weights as in LinFit_head. The line y = slope x + intercept; its values ..."""


def PolyFit_head(x: ArrayLike, y: ArrayLike, order: int, algorithm: int) -> tuple[NDArray[np.float64], NDArray[np.float64], float]:
    """The polynomial sum of coefficients[j] x^j, j = 0 to `order`, and its values."""


def PolyFit80_head(x: ArrayLike, y: ArrayLike, order: int, algorithm: int, fixedOrders: ArrayLike, fixedValues: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], float]:
    """As PolyFit_head, with some coefficients fixed: that of order fixedOrders[i] is fixedValues[i]. ..."""


def PolyFit81_head(x: ArrayLike, y: ArrayLike, order: int, w: ArrayLike, algorithm: int, fixedOrders: ArrayLike, fixedValues: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], float]:
    """As PolyFit80_head, with weights. The polynomial sum of coefficients[j] x^j, j = 0 to `order`, ..."""


def PolyFit2026_head(x: ArrayLike, y: ArrayLike, order: int, w: ArrayLike, tolerance: float, fixedOrders: ArrayLike, fixedValues: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], float]:
    """As PolyFit81_head, with coefficients that are accurate to nearly the last digit for the given x, ..."""


def GenLSFit80_head(H: ArrayLike, y: ArrayLike, w: ArrayLike, algorithm: int, wantCovariance: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float]:
    """The coefficients c that minimise the weighted sum of squares of y - H c, for a matrix with one ..."""


def GenLSFit2026_head(H: ArrayLike, y: ArrayLike, w: ArrayLike, tolerance: float, wantCovariance: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float]:
    """As GenLSFit80_head, with coefficients that are accurate to nearly the last digit for the given ..."""


def GenLSFit_head(H: ArrayLike, y: ArrayLike, deviations: ArrayLike, algorithm: int, wantCovariance: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float]:
    """As GenLSFit80_head, with standard deviations: the weights are 1 / sd^2, and 1 where sd is 0. The ..."""


def GoodnessOfFit_head(y: ArrayLike, fit: ArrayLike, w: ArrayLike, dof: int) -> tuple[float, float, float]:
    """Goodness of a fit: *sse, the weighted sum of squared residuals; *rSquare, 1 minus the ratio of ..."""


def GetNewCoef_head(coefficients: ArrayLike, a: ArrayLike, gradient: ArrayLike, lambda_: float) -> NDArray[np.float64]:
    """One damped step of a fit: solves for d the system a d = gradient, in which the diagonal of a is ..."""


def EqsByLUDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Solves a x = b for a square a by LU factorisation with row exchanges."""


def CxEqsByLUDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As EqsByLUDri_head, for complex data. Solves a x = b for a square a by LU factorisation with row ..."""


def EqsSetByLUDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Not available: it checks its arguments, sizes x, empties it and fails."""


def CxEqsSetByLUDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As EqsSetByLUDri_head, for complex data. Not available: it checks its arguments, sizes x, ..."""


def EqsSetByLU2026_head(a: ArrayLike, b: ArrayLike) -> tuple[NDArray[np.float64], float]:
    """Solves a x = b for all columns of b by LU factorisation with row exchanges, for a square matrix ..."""


def CxEqsSetByLU2026_head(a: ArrayLike, b: ArrayLike) -> tuple[NDArray[np.complex128], float]:
    """As EqsSetByLU2026_head, for complex data. Solves a x = b for all columns of b by LU ..."""


def LULinEqs_head(lu: ArrayLike, pivots: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Solves a x = b with the factors and pivots of LU_head; x replaces b."""


def CxLULinEqs_head(lu: ArrayLike, pivots: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As LULinEqs_head, for complex data. Solves a x = b with the factors and pivots of LU_head; x ..."""


def InvMatrixLUDri_head(a: ArrayLike) -> NDArray[np.float64]:
    """Replaces a by its inverse, by LU factorisation."""


def CxInvMatrixLUDri_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As InvMatrixLUDri_head, for complex data. Replaces a by its inverse, by LU factorisation."""


def LUInvMatrix_head(lu: ArrayLike, pivots: ArrayLike) -> NDArray[np.float64]:
    """Replaces the factors of LU_head by the inverse of the matrix, from the factors and pivots."""


def CxLUInvMatrix_head(lu: ArrayLike, pivots: ArrayLike) -> NDArray[np.complex128]:
    """As LUInvMatrix_head, for complex data. Replaces the factors of LU_head by the inverse of the ..."""


def GenLinEqs_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Least-squares solution of smallest norm of a x = b for an m by n matrix, by the singular value ..."""


def CxGenLinEqs_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As GenLinEqs_head, for complex data. Least-squares solution of smallest norm of a x = b for an m ..."""


def GenLinEqs82_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """As GenLinEqs_head, with `tolerance` in place of 2.2e-16. Least-squares solution of smallest norm ..."""


def CxGenLinEqs82_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.complex128]:
    """As GenLinEqs82_head, for complex data. Least-squares solution of smallest norm of a x = b for an ..."""


def GenLinEqs2010_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Least-squares solution with the method of GenLinEqs82_head, which loses digits at small norms."""


def GenLinEqsbySVD2011_head(a: ArrayLike, b: ArrayLike, tolerance: float, refinements: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As GenLinEqs2010_head, with iterative refinement and m + n more elements in `work`: starting ..."""


def EqsSetBySVDDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Least-squares solutions of smallest norm of a x = b for all columns of b, by the method of ..."""


def CxEqsSetBySVDDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As EqsSetBySVDDri_head, for complex data. Least-squares solutions of smallest norm of a x = b ..."""


def EqsSetBySVDDri82_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """As EqsSetBySVDDri_head, with `tolerance` in place of 2.2e-16. Least-squares solutions of ..."""


def CxEqsSetBySVDDri82_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.complex128]:
    """As EqsSetBySVDDri82_head, for complex data. Least-squares solutions of smallest norm of a x = b ..."""


def GenLinEqs2026_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """Least-squares solution of smallest norm of a x = b for an m by n matrix of any norm, by the ..."""


def CxGenLinEqs2026_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.complex128]:
    """As GenLinEqs2026_head, for complex data. Least-squares solution of smallest norm of a x = b for ..."""


def EqsSetBySVD2026_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """As GenLinEqs2026_head, for all columns of b, each scaled separately. Least-squares solution of ..."""


def CxEqsSetBySVD2026_head(a: ArrayLike, b: ArrayLike, tolerance: float) -> NDArray[np.complex128]:
    """As EqsSetBySVD2026_head, for complex data. Least-squares solution of smallest norm of a x = b ..."""


def EqsByCholeskyDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Solves a x = b for a positive definite a by Cholesky factorisation."""


def CxEqsByCholeskyDri_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As EqsByCholeskyDri_head, for a Hermitian matrix. Solves a x = b for a positive definite a by ..."""


def EqsSetByCholeskyDri_head(a: ArrayLike, useUpper: int, b: ArrayLike) -> NDArray[np.float64]:
    """As EqsByCholeskyDri_head, for all columns of b, from the upper triangle of a if useUpper is not ..."""


def CxEqsSetByCholeskyDri_head(a: ArrayLike, useUpper: int, b: ArrayLike) -> NDArray[np.complex128]:
    """As EqsSetByCholeskyDri_head, for a Hermitian matrix. Solves a x = b for a positive definite a by ..."""


def CholeskyLinEqs_head(packedFactor: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Solves L L^T x = b with a packed lower factor of Cholesky_head; x replaces b."""


def CxCholeskyLinEqs_head(packedFactor: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As CholeskyLinEqs_head, for complex data: L L^H x = b. Solves L L^T x = b with a packed lower ..."""


def TriEqsSetDri_head(a: ArrayLike, triangle: int, b: ArrayLike) -> NDArray[np.float64]:
    """Solves a x = b for all columns of b, where a is triangular; the other triangle of a is not read."""


def CxTriEqsSetDri_head(a: ArrayLike, triangle: int, b: ArrayLike) -> NDArray[np.complex128]:
    """As TriEqsSetDri_head, for complex data. Solves a x = b for all columns of b, where a is ..."""


def TriLinEqs_head(a: Mapping[str, Any], b: ArrayLike) -> NDArray[np.float64]:
    """As TriEqsSetDri_head, for a packed triangle and one right-hand side; x replaces b. Solves a x = ..."""


def CxTriLinEqs_head(a: Mapping[str, Any], b: ArrayLike) -> NDArray[np.complex128]:
    """As TriLinEqs_head, for complex data. Solves a x = b for all columns of b, where a is triangular; ..."""


def BandEqsDriH(band: ArrayLike, b: ArrayLike, lowerBands: int, upperBands: int) -> NDArray[np.float64]:
    """Solves a x = b for a band matrix a; x replaces b."""


def CxBandEqsDriH(band: ArrayLike, b: ArrayLike, lowerBands: int, upperBands: int) -> NDArray[np.complex128]:
    """As BandEqsDriH, for complex data. Solves a x = b for a band matrix a; x replaces b."""


def BandEqsSetDriH(band: ArrayLike, b: ArrayLike, lowerBands: int, upperBands: int) -> NDArray[np.float64]:
    """As BandEqsDriH, for all columns of b. Solves a x = b for a band matrix a; x replaces b."""


def CxBandEqsSetDriH(band: ArrayLike, b: ArrayLike, lowerBands: int, upperBands: int) -> NDArray[np.complex128]:
    """As BandEqsSetDriH, for complex data. Solves a x = b for a band matrix a; x replaces b."""


def TriDiagLU_head(lower: ArrayLike, diag: ArrayLike, upper: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.int32]]:
    """LU factorisation with row exchanges of a tridiagonal matrix of order n, in place: lower, diag ..."""


def TriDiagEqsByLU_head(transposed: int, lower: ArrayLike, diag: ArrayLike, upper: ArrayLike, upper2: ArrayLike, pivots: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Solves a x = b with the factors of TriDiagLU_head, or a^T x = b if `transposed` is not 0; x ..."""


def TriDiagEqsSetByLU_head(transposed: int, lower: ArrayLike, diag: ArrayLike, upper: ArrayLike, upper2: ArrayLike, pivots: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """As TriDiagEqsByLU_head, for all columns of b. Solves a x = b with the factors of TriDiagLU_head, ..."""


def Sylvester2011_head(a: ArrayLike, b: ArrayLike, c: ArrayLike, equation: int) -> NDArray[np.float64]:
    """Solves for x (m by n), with a m by m, b n by n and c m by n."""


def CxSylvester2011_head(a: ArrayLike, b: ArrayLike, c: ArrayLike, equation: int) -> NDArray[np.complex128]:
    """As Sylvester2011_head, for complex elements. Solves for x (m by n), with a m by m, b n by n and ..."""


def Sylvester_head(a: ArrayLike, b: ArrayLike, c: ArrayLike) -> NDArray[np.float64]:
    """As Sylvester2011_head, with equation 0: a x + x b = c. Solves for x (m by n), with a m by m, b n ..."""


def CxSylvester_head(a: ArrayLike, b: ArrayLike, c: ArrayLike) -> NDArray[np.complex128]:
    """As Sylvester_head, for complex elements. Solves for x (m by n), with a m by m, b n by n and c m ..."""


def Lyapunov2011_head(a: ArrayLike, q: ArrayLike, equation: int) -> NDArray[np.float64]:
    """Solves for x, all matrices n by n."""


def CxLyapunov2011_head(a: ArrayLike, q: ArrayLike, equation: int) -> NDArray[np.complex128]:
    """As Lyapunov2011_head, for complex elements. Solves for x, all matrices n by n."""


def Lyapunov_head(a: ArrayLike, q: ArrayLike) -> NDArray[np.float64]:
    """As Lyapunov2011_head, with equation 0: a x + x a' = q. Solves for x, all matrices n by n."""


def CxLyapunov_head(a: ArrayLike, q: ArrayLike) -> NDArray[np.complex128]:
    """As Lyapunov_head, for complex elements. Solves for x, all matrices n by n."""


def LU_head(a: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.int32], int]:
    """Factors the m by n matrix a in place, P a = L U, by Crout's method with partial pivoting: L, ..."""


def CxLU_head(a: ArrayLike) -> tuple[NDArray[np.complex128], NDArray[np.int32], int]:
    """As LU_head, for complex elements. Factors the m by n matrix a in place, P a = L U, by Crout's ..."""


def Cholesky_head(packed: ArrayLike) -> NDArray[np.float64]:
    """Cholesky factor L of the symmetric positive definite a = L L^T; it replaces the lower triangle ..."""


def CxCholesky_head(packed: ArrayLike) -> NDArray[np.complex128]:
    """As Cholesky_head, for a Hermitian a = L L^H; only the real parts of its diagonal are used. ..."""


def FullCholesky_head(a: ArrayLike) -> NDArray[np.float64]:
    """Replaces a square matrix by its Cholesky factor (Cholesky_head): the lower triangle is read and ..."""


def CxFullCholesky_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As FullCholesky_head, for a Hermitian matrix. Replaces a square matrix by its Cholesky factor ..."""


def Cholesky_InvMatrix_head(packedFactor: ArrayLike) -> NDArray[np.float64]:
    """Replaces the packed factor of Cholesky_head by the packed lower triangle of the inverse of L L^T."""


def CxCholesky_InvMatrix_head(packedFactor: ArrayLike) -> NDArray[np.complex128]:
    """As Cholesky_InvMatrix_head, for L L^H. Replaces the packed factor of Cholesky_head by the packed ..."""


def InvMatrixChoDri_head(a: ArrayLike) -> NDArray[np.float64]:
    """Replaces a symmetric positive definite matrix by its inverse."""


def CxInvMatrixChoDri_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As InvMatrixChoDri_head, for a Hermitian matrix. Replaces a symmetric positive definite matrix ..."""


def PreallocInvMatrixChoDri_H(a: ArrayLike, packedWork: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """As InvMatrixChoDri_head, without allocating memory: packedWork, of at least n(n+1)/2 elements, ..."""


def Tri_InvMatrix_head(a: Mapping[str, Any]) -> dict[str, Any]:
    """Replaces a packed triangle by its inverse."""


def CxTri_InvMatrix_head(a: Mapping[str, Any]) -> dict[str, Any]:
    """As Tri_InvMatrix_head, for complex elements. Replaces a packed triangle by its inverse."""


def InvMatrixTriDri_head(a: ArrayLike, triangle: int) -> NDArray[np.float64]:
    """Replaces a triangular matrix by its inverse."""


def CxInvMatrixTriDri_head(a: ArrayLike, triangle: int) -> NDArray[np.complex128]:
    """As InvMatrixTriDri_head, for complex elements. Replaces a triangular matrix by its inverse."""


def qrd_head(a: ArrayLike, algorithm: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """a = q r with q (m by m) unitary and r (m by n) upper triangular, for an m by n matrix a."""


def Cxqrd_head(a: ArrayLike, algorithm: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As qrd_head, for complex elements; the diagonal of r is real. a = q r with q (m by m) unitary ..."""


def QRDecH(a: ArrayLike, pivoting: int, economy: int) -> tuple[NDArray[np.int32], NDArray[np.float64], NDArray[np.float64]]:
    """QR factors by Householder reflections of the m by n matrix a, k = min(m, n)."""


def CxQRDecH(a: ArrayLike, pivoting: int, economy: int) -> tuple[NDArray[np.int32], NDArray[np.complex128], NDArray[np.complex128]]:
    """As QRDecH, for complex elements; the diagonal of r is real. QR factors by Householder ..."""


def QRDec2026H(a: ArrayLike, pivoting: int, economy: int) -> tuple[NDArray[np.int32], NDArray[np.float64], NDArray[np.float64]]:
    """As QRDecH, with blocks of reflections if min(m, n) is at least 160: with q, it takes half the ..."""


def CxQRDec2026H(a: ArrayLike, pivoting: int, economy: int) -> tuple[NDArray[np.int32], NDArray[np.complex128], NDArray[np.complex128]]:
    """As QRDec2026H, for complex elements; the diagonal of r is real. QR factors by Householder ..."""


def SVD_head(a: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Singular value decomposition a = u diag(s) v^T of the m by n matrix a, k = min(m, n): a becomes ..."""


def CxSVD_head(a: ArrayLike) -> tuple[NDArray[np.complex128], NDArray[np.float64], NDArray[np.complex128]]:
    """As SVD_head, for complex elements: a = u diag(s) v^H. Singular value decomposition a = u diag(s) ..."""


def SVDEx_head(a: ArrayLike, fullSize: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """As SVD_head, but u is a separate output and the code is the function result; if fullSize is not ..."""


def CxSVDEx_head(a: ArrayLike, fullSize: int) -> tuple[NDArray[np.complex128], NDArray[np.float64], NDArray[np.complex128]]:
    """As SVDEx_head, for complex elements: a = u diag(s) v^H. Singular value decomposition a = u ..."""


def SVDS_head(a: ArrayLike) -> NDArray[np.float64]:
    """As SVD_head, for the values only, which are the same, to the bit, as with the vectors. Singular ..."""


def CxSVDS_head(a: ArrayLike) -> NDArray[np.float64]:
    """As SVDS_head, for complex elements; CxSVDS2026_head scales by itself. Singular value ..."""


def SVD2026_head(a: ArrayLike, fullSize: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Singular value decomposition a = u diag(s) v^T of the m by n matrix a, k = min(m, n), of any ..."""


def CxSVD2026_head(a: ArrayLike, fullSize: int) -> tuple[NDArray[np.complex128], NDArray[np.float64], NDArray[np.complex128]]:
    """As SVD2026_head, for complex elements: a = u diag(s) v^H. Singular value decomposition a = u ..."""


def SVDS2026_head(a: ArrayLike) -> NDArray[np.float64]:
    """As SVD2026_head, for the values only, which are the same, to the bit, as with the vectors. ..."""


def CxSVDS2026_head(a: ArrayLike) -> NDArray[np.float64]:
    """As SVDS2026_head, for complex elements. Singular value decomposition a = u diag(s) v^T of the m ..."""


def Hessenberg_head(a: ArrayLike, low: int, high: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Replaces the square matrix a by its Hessenberg form h = q^T a q, which is zero below the first ..."""


def CxHessenberg_head(a: ArrayLike, low: int, high: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As Hessenberg_head, for complex elements: h = q^H a q. Replaces the square matrix a by its ..."""


def MatrixBalance_head(a: ArrayLike, job: int) -> tuple[NDArray[np.float64], int, int, NDArray[np.float64]]:
    """Balances the square matrix a in place."""


def CxMatrixBalance_head(a: ArrayLike, job: int) -> tuple[NDArray[np.complex128], int, int, NDArray[np.float64]]:
    """As MatrixBalance_head, for complex elements, whose magnitude is taken as |re| + |im|. Balances ..."""


def EigenVBack_head(job: int, side: int, low: int, high: int, scale: ArrayLike, v: ArrayLike) -> NDArray[np.float64]:
    """Transforms eigenvectors of a matrix balanced by MatrixBalance_head, the columns of v, into those ..."""


def CxEigenVBack_head(job: int, side: int, low: int, high: int, scale: ArrayLike, v: ArrayLike) -> NDArray[np.complex128]:
    """As EigenVBack_head, for complex vectors. Transforms eigenvectors of a matrix balanced by ..."""


def MatrixExp_head(a: ArrayLike) -> NDArray[np.float64]:
    """Replaces the square matrix a by exp(a), by scaling, a Pade approximant and repeated squaring; ..."""


def CxMatrixExp_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixExp_head, for complex elements. Replaces the square matrix a by exp(a), by scaling, a ..."""


def MatrixExp2026_head(a: ArrayLike) -> NDArray[np.float64]:
    """exp(a) of the square matrix a by scaling, a Pade approximant of degree 3 to 13 and repeated ..."""


def CxMatrixExp2026_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixExp2026_head, for complex elements. exp(a) of the square matrix a by scaling, a Pade ..."""


def MatrixLn_head(a: ArrayLike) -> NDArray[np.complex128]:
    """The principal logarithm of the square matrix a."""


def CxMatrixLn_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixLn_head, for complex elements and in place. The principal logarithm of the square matrix a."""


def MatrixLn2026_head(a: ArrayLike) -> NDArray[np.complex128]:
    """The principal logarithm of the square matrix a, whose exponential is a and whose eigenvalues ..."""


def CxMatrixLn2026_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixLn2026_head, for complex elements. The principal logarithm of the square matrix a, ..."""


def MatrixSqrt_head(a: ArrayLike) -> NDArray[np.float64]:
    """Replaces the square matrix a by the real part of its principal square root; imaginary parts, ..."""


def MatrixSqrtH(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixSqrt_head, with the whole complex root in `out`; the code is the function result. ..."""


def CxMatrixSqrt_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixSqrt_head, for complex elements; nothing is dropped. Replaces the square matrix a by ..."""


def MatrixSqrt2026_head(a: ArrayLike) -> NDArray[np.complex128]:
    """The principal square root of the square matrix a, whose eigenvalues have no negative real part."""


def CxMatrixSqrt2026_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixSqrt2026_head, for complex elements. The principal square root of the square matrix a, ..."""


def MatrixPower_head(a: ArrayLike, power: int) -> NDArray[np.float64]:
    """Replaces the square matrix a by a^power, by repeated squaring."""


def CxMatrixPower_head(a: ArrayLike, power: int) -> NDArray[np.complex128]:
    """As MatrixPower_head, for complex elements. Replaces the square matrix a by a^power, by repeated ..."""


def MatrixPower2026_head(a: ArrayLike, power: int) -> NDArray[np.float64]:
    """a^power of the square matrix a by repeated squaring; a negative power is a power of the inverse ..."""


def CxMatrixPower2026_head(a: ArrayLike, power: int) -> NDArray[np.complex128]:
    """As MatrixPower2026_head, for complex elements. a^power of the square matrix a by repeated ..."""


def PseudoInverse_head(a: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """Replaces the m by n matrix a by its pseudo-inverse (E."""


def CxPseudoInverse_head(a: ArrayLike, tolerance: float) -> NDArray[np.complex128]:
    """As PseudoInverse_head, for complex elements. Replaces the m by n matrix a by its pseudo-inverse (E."""


def PseudoInverse2026_head(a: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """The pseudo-inverse (E."""


def CxPseudoInverse2026_head(a: ArrayLike, tolerance: float) -> NDArray[np.complex128]:
    """As PseudoInverse2026_head, for complex elements. The pseudo-inverse (E."""


def MatrixMulAligned_head(a: ArrayLike, b: ArrayLike, alignedCopy: int) -> NDArray[np.float64]:
    """Matrix product c = a b, where a is m by k and b is k by n."""


def MatrixMul_head(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """As MatrixMulAligned_head, with alignedCopy 0. Matrix product c = a b, where a is m by k and b is ..."""


def AxBCxAlignedCIN(a: ArrayLike, b: ArrayLike, alignedCopy: int) -> NDArray[np.complex128]:
    """As MatrixMulAligned_head, for complex data. Matrix product c = a b, where a is m by k and b is k ..."""


def AxBCxCIN(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As AxBCxAlignedCIN, with alignedCopy 0. Matrix product c = a b, where a is m by k and b is k by n."""


def AxVectAligned_head(a: ArrayLike, x: ArrayLike, alignedCopy: int) -> NDArray[np.float64]:
    """y = a x, where a is a matrix and x a vector, with one sum per row, from the first column to the ..."""


def AxVect_head(a: ArrayLike, x: ArrayLike) -> NDArray[np.float64]:
    """As AxVectAligned_head, with alignedCopy 0. y = a x, where a is a matrix and x a vector, with one ..."""


def AxVectorCxAligned(a: ArrayLike, x: ArrayLike, alignedCopy: int) -> NDArray[np.complex128]:
    """As AxVectAligned_head, for complex data. y = a x, where a is a matrix and x a vector, with one ..."""


def AxVectorCx(a: ArrayLike, x: ArrayLike) -> NDArray[np.complex128]:
    """As AxVectorCxAligned, with alignedCopy 0. y = a x, where a is a matrix and x a vector, with one ..."""


def vectxAAligned_head(x: ArrayLike, a: ArrayLike, alignedCopy: int) -> NDArray[np.float64]:
    """y = x a, with x as a matrix of one row, computed as a matrix product."""


def vectxA_head(x: ArrayLike, a: ArrayLike) -> NDArray[np.float64]:
    """As vectxAAligned_head, with alignedCopy 0. y = x a, with x as a matrix of one row, computed as a ..."""


def CxVectxAAligned_head(x: ArrayLike, a: ArrayLike, alignedCopy: int) -> NDArray[np.complex128]:
    """As vectxAAligned_head, for complex data. y = x a, with x as a matrix of one row, computed as a ..."""


def CxVectxA_head(x: ArrayLike, a: ArrayLike) -> NDArray[np.complex128]:
    """As CxVectxAAligned_head, with alignedCopy 0. y = x a, with x as a matrix of one row, computed as ..."""


def Determinant_head(a: ArrayLike, matrixType: int) -> float:
    """Determinant of a square matrix."""


def CxDeterminant_head(a: ArrayLike, matrixType: int) -> complex:
    """As Determinant_head, for complex data. Determinant of a square matrix."""


def Rank_head(a: ArrayLike, tolerance: float) -> int:
    """Numerical rank: the number of singular values above *tolerance."""


def CxRank_head(a: ArrayLike, tolerance: float) -> int:
    """As Rank_head, for complex data. Numerical rank: the number of singular values above *tolerance."""


def CondNumber_head(a: ArrayLike, normType: int) -> float:
    """Condition number."""


def CxCondNumber_head(a: ArrayLike, normType: int) -> float:
    """As CondNumber_head, for complex data. Condition number."""


def Norm_head(a: ArrayLike, normType: int) -> float:
    """Norm of a matrix."""


def CxNorm_head(a: ArrayLike, normType: int) -> float:
    """As Norm_head, for complex data. Norm of a matrix."""


def Rank2026_head(a: ArrayLike, tolerance: float) -> int:
    """Numerical rank of a matrix of any norm: the number of singular values above the tolerance."""


def CxRank2026_head(a: ArrayLike, tolerance: float) -> int:
    """As Rank2026_head, for complex data. Numerical rank of a matrix of any norm: the number of ..."""


def CondNumber2026_head(a: ArrayLike, normType: int) -> float:
    """Condition number of a matrix of any norm."""


def CxCondNumber2026_head(a: ArrayLike, normType: int) -> float:
    """As CondNumber2026_head, for complex data. Condition number of a matrix of any norm."""


def Norm2026_head(a: ArrayLike, normType: int) -> float:
    """Norm of a matrix."""


def CxNorm2026_head(a: ArrayLike, normType: int) -> float:
    """As Norm2026_head, for complex data. Norm of a matrix."""


def Trace_head(a: ArrayLike) -> float:
    """Sum of the diagonal of a square matrix."""


def CxTrace_head(a: ArrayLike) -> complex:
    """As Trace_head, for complex data. Sum of the diagonal of a square matrix."""


def DotProduct_head(x: ArrayLike, y: ArrayLike) -> float:
    """Sum of x[i] y[i], in ascending order."""


def DotprodCx(x: ArrayLike, y: ArrayLike) -> complex:
    """As DotProduct_head, for complex data; nothing is conjugated. Sum of x[i] y[i], in ascending order."""


def vectorNormH(x: ArrayLike, p: float) -> float:
    """p-norm (sum of |x[i]|^p)^(1/p), also for negative p; the largest |x[i]| for p = +infinity, the ..."""


def CxVectorNormH(x: ArrayLike, p: float) -> float:
    """As vectorNormH, for complex data. p-norm (sum of |x[i]|^p)^(1/p), also for negative p; the ..."""


def unitVector_head(x: ArrayLike) -> tuple[NDArray[np.float64], float]:
    """Scales x to a 2-norm of 1 and returns its previous norm."""


def CxUnitVector_head(x: ArrayLike) -> tuple[NDArray[np.complex128], float]:
    """As unitVector_head, for complex data. Scales x to a 2-norm of 1 and returns its previous norm."""


def unitVector80_head(x: ArrayLike, p: float) -> tuple[NDArray[np.float64], float]:
    """As unitVector_head, for the p-norm of vectorNormH. Scales x to a 2-norm of 1 and returns its ..."""


def CxUnitVector80_head(x: ArrayLike, p: float) -> tuple[NDArray[np.complex128], float]:
    """As unitVector80_head, for complex data. Scales x to a 2-norm of 1 and returns its previous norm."""


def CheckSym_head(a: ArrayLike, tolerance: float, relative: int) -> int:
    """Tests whether a is symmetric: no |a[i][j] - a[j][i]| is above a limit."""


def CxCheckSym_head(a: ArrayLike, tolerance: float, relative: int, hermitian: int) -> int:
    """As CheckSym_head, for complex data. Tests whether a is symmetric: no |a[i][j] - a[j][i]| is ..."""


def CheckPosdef_head(a: ArrayLike) -> int:
    """Tests whether a is positive definite: exactly symmetric, with all eigenvalues above 2.2e-16 ..."""


def CxCheckPosdef_head(a: ArrayLike) -> int:
    """As CheckPosdef_head, for complex data: exactly Hermitian. Tests whether a is positive definite: ..."""


def CheckPosSemiDef_head(a: ArrayLike, tolerance: float) -> tuple[int, int]:
    """Sets *isSemiDefinite to 1 if a is positive semi-definite, otherwise to 0, and *rank to its rank, ..."""


def CxCheckPosSemiDef_head(a: ArrayLike, tolerance: float) -> tuple[int, int]:
    """As CheckPosSemiDef_head, for complex data: Hermitian within t. Sets *isSemiDefinite to 1 if a is ..."""


def MatrixCharacteristicPoly_head(a: ArrayLike) -> NDArray[np.float64]:
    """Coefficients of the characteristic polynomial det(t I - a), in ascending powers: poly has one ..."""


def CxMatrixCharacteristicPoly_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As MatrixCharacteristicPoly_head, for complex data. Coefficients of the characteristic ..."""


def ExpFit_head(y: ArrayLike, x: ArrayLike, deviations: ArrayLike) -> tuple[NDArray[np.float64], float, float, float]:
    """y = a exp(b x) by the line through (x, ln |y|) with weights w y^2, which compensate for the ..."""


def ExpFit80_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, guess: ArrayLike, method: int, iterations: int, floor: float) -> tuple[NDArray[np.float64], float, float, float, int]:
    """y = a exp(b x), with the weights w as given."""


def ExpFitCoef_head(y: ArrayLike, x: ArrayLike) -> tuple[float, float]:
    """As ExpFit_head, for the coefficients only and without weights. y = a exp(b x) by the line ..."""


def ExpFitCoef80_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, method: int, tolerance: float, guess: ArrayLike, iterations: int, floor: float) -> tuple[float, float, int]:
    """As ExpFit80_head, for the coefficients only. y = a exp(b x), with the weights w as given."""


def PowerFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, guess: ArrayLike, iterations: int, floor: float) -> tuple[NDArray[np.float64], float, float, float, int]:
    """y = a x^b for x above 0, by Gauss-Newton steps from the guess (a, b), or from the line through ..."""


def PowerFitCoef_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, guess: ArrayLike, iterations: int, floor: float) -> tuple[float, float, int]:
    """As PowerFit_head, for the coefficients only; if a y is NaN, as in ExpFitCoef80_head. y = a x^b ..."""


def LogFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, base: float) -> tuple[NDArray[np.float64], float, float, float]:
    """y = a log(b x) to the given base, for x of one sign; b has the same sign."""


def LogFitCoef_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, base: float) -> tuple[float, float]:
    """As LogFit_head, for the coefficients only. y = a log(b x) to the given base, for x of one sign; ..."""


def GaussianPeakFit_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, guess: ArrayLike, iterations: int, floor: float) -> tuple[NDArray[np.float64], float, float, float, float, int]:
    """y = a exp(-((x - c) / s)^2 / 2), a peak up or down, by steepest descent with halved steps from ..."""


def GaussianPeakFitCoef_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, guess: ArrayLike, iterations: int, floor: float) -> tuple[float, float, float, int]:
    """As GaussianPeakFit_head, for the coefficients only; if a y is NaN, as in ExpFitCoef80_head. y = ..."""


def GaussianPeakFit2026_head(y: ArrayLike, x: ArrayLike, w: ArrayLike, tolerance: float, guess: ArrayLike, iterations: int, floor: float) -> tuple[NDArray[np.float64], float, float, float, float, int]:
    """As GaussianPeakFit_head, with start values at every scale and the trust region of ..."""


def white(n: int, amplitude: float, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.float64], dict[str, Any]]:
    """Uniform white noise: x[i] = (u - 0.5) (2 amplitude), *n samples in [-amplitude, amplitude)."""


def Gauss(n: int, sigma: float, seed: int, state: Mapping[str, Any], spare: Mapping[str, Any]) -> tuple[NDArray[np.float64], dict[str, Any], dict[str, Any]]:
    """Gaussian white noise of mean 0 and standard deviation *sigma, by the polar method: G."""


def PeriodNoise(n: int, amplitude: float, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.float64], dict[str, Any]]:
    """One period of a sum of cosines at 1, 2, ..."""


def GammaNoiseH(n: int, order: int, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.float64], dict[str, Any]]:
    """Gamma noise: waiting times for `order` events of a Poisson process of rate 1; mean and variance ..."""


def PoissonNoiseH(n: int, mean: float, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.float64], dict[str, Any]]:
    """Poisson noise: numbers of events with the given mean."""


def BinomialNoiseH(n: int, trials: int, p: float, seed: int, state: Mapping[str, Any], cache: Mapping[str, Any]) -> tuple[NDArray[np.uint32], dict[str, Any], dict[str, Any]]:
    """Binomial noise: numbers of successes in `trials` trials of probability p."""


def White2026(n: int, amplitude: float, key: int, stream: int, position: float) -> NDArray[np.float64]:
    """Uniform white noise: x[i] = amplitude (2 u - 1), n samples in (-amplitude, amplitude); u is (m + ..."""


def Gauss2026(n: int, sigma: float, key: int, stream: int, position: float) -> NDArray[np.float64]:
    """Gaussian white noise of mean 0 and standard deviation sigma: the quantile of a uniform number, ..."""


def Gamma2026(n: int, shape: float, key: int, stream: int, position: float) -> NDArray[np.float64]:
    """Gamma noise of any shape above 0, with density x^(shape - 1) exp(-x) / Gamma(shape), by ..."""


def Poisson2026(n: int, mean: float, key: int, stream: int, position: float) -> NDArray[np.float64]:
    """Poisson noise with means up to 1e15: below a mean of 10 by summing probabilities, otherwise by ..."""


def Binomial2026(n: int, trials: float, p: float, key: int, stream: int, position: float) -> NDArray[np.float64]:
    """Binomial noise: numbers of successes in `trials` trials of probability p, where trials is an ..."""


def NonlinearFit2026(x: ArrayLike, y: ArrayLike, w: ArrayLike, model: Callable[..., Any] | None, jacobian: Callable[..., Any] | None, context: Pointer | None, guess: ArrayLike, lower: ArrayLike, upper: ArrayLike, loss: int, scale: float, tolerance: float, iterations: int) -> tuple[int, NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float, int]:
    """Finds the parameters p of a model f(x, p) with the smallest cost = 1/2 sum over i of scale^2 ..."""


def Median_head(x: ArrayLike) -> float:
    """Median: the middle value, or the mean of the two middle values."""


def ModeH(x: ArrayLike, intervals: int) -> NDArray[np.float64]:
    """The most frequent values of x in ascending order."""


def PeakDetector(x: ArrayLike, threshold: float, width: int) -> tuple[NDArray[np.int32], int]:
    """Finds the runs of samples at or above *threshold that are at least *width samples long: indices ..."""


def PeakD(request: Mapping[str, Any], state: Mapping[str, Any], buffer: ArrayLike) -> tuple[dict[str, Any], dict[str, Any], NDArray[np.float64]]:
    """As PeakD2014, with mode 0. The peaks or valleys of the next block of a stream."""


def PeakD2010(request: Mapping[str, Any], state: Mapping[str, Any], buffer: ArrayLike, mode: int) -> tuple[dict[str, Any], dict[str, Any], NDArray[np.float64]]:
    """As PeakD2014, without a source, so that mode 2 has no data. The peaks or valleys of the next ..."""


def PeakD2014(source: ArrayLike, request: Mapping[str, Any], state: Mapping[str, Any], buffer: ArrayLike, mode: int) -> tuple[dict[str, Any], dict[str, Any], NDArray[np.float64]]:
    """The peaks or valleys of the next block of a stream."""


def AddPolyH(p: ArrayLike, q: ArrayLike) -> NDArray[np.float64]:
    """The sum r = p + q, as long as the longer of the two."""


def CxAddPolyH(p: ArrayLike, q: ArrayLike) -> NDArray[np.complex128]:
    """As AddPolyH, for complex coefficients. The sum r = p + q, as long as the longer of the two."""


def SubtractPolyH(p: ArrayLike, q: ArrayLike) -> NDArray[np.float64]:
    """The difference r = p - q, as long as the longer of the two."""


def CxSubtractPolyH(p: ArrayLike, q: ArrayLike) -> NDArray[np.complex128]:
    """As SubtractPolyH, for complex coefficients. The difference r = p - q, as long as the longer of ..."""


def MultiplyPolyH(p: ArrayLike, q: ArrayLike) -> NDArray[np.float64]:
    """The product r = p q of m + n - 1 coefficients, or a single 0 if p or q is empty: r[k] = sum over ..."""


def CxMultiplyPolyH(p: ArrayLike, q: ArrayLike) -> NDArray[np.complex128]:
    """As MultiplyPolyH, for complex coefficients. The product r = p q of m + n - 1 coefficients, or a ..."""


def DividePolyH(p: ArrayLike, q: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """Quotient and remainder of polynomial division, p = quotient q + remainder."""


def CxDividePolyH(p: ArrayLike, q: ArrayLike) -> tuple[NDArray[np.complex128], NDArray[np.complex128]]:
    """As DividePolyH, for complex coefficients. Quotient and remainder of polynomial division, p = ..."""


def PolyGCD_H(p: ArrayLike, q: ArrayLike, tolerance: float) -> tuple[NDArray[np.float64], float]:
    """The approximate greatest common divisor of p and q."""


def CxPolyGCD_H(p: ArrayLike, q: ArrayLike, tolerance: float) -> tuple[NDArray[np.complex128], float]:
    """As PolyGCD_H, for complex coefficients. The approximate greatest common divisor of p and q."""


def PolyLCM_H(p: ArrayLike, q: ArrayLike, tolerance: float) -> NDArray[np.float64]:
    """The least common multiple of polynomials near p and q, monic: p times the cofactor that ..."""


def PolyEv(p: ArrayLike, x: ArrayLike) -> NDArray[np.float64]:
    """Values y[i] = p(x[i]) by Horner's rule with compensation, as accurate as if computed in twice ..."""


def CxPolyEv(p: ArrayLike, x: ArrayLike) -> NDArray[np.complex128]:
    """As PolyEv, for complex coefficients and points (S. Values y[i] = p(x[i]) by Horner's rule with ..."""


def EvPoly2D(p: ArrayLike, a: ArrayLike, mode: int) -> NDArray[np.float64]:
    """A polynomial of a matrix; y has the size of a."""


def CxEvPoly2D(p: ArrayLike, a: ArrayLike, mode: int) -> NDArray[np.complex128]:
    """As EvPoly2D, for complex coefficients and elements, with the values of CxPolyEv. A polynomial of ..."""


def PolyDerivativeH(p: ArrayLike, order: int) -> NDArray[np.float64]:
    """The derivative q of the given order, q[k] = p[k + order] (k + 1) (k + 2) ..."""


def CxPolyDerivativeH(p: ArrayLike, order: int) -> NDArray[np.complex128]:
    """As PolyDerivativeH, for complex coefficients. The derivative q of the given order, q[k] = p[k + ..."""


def PolyIntegralH(p: ArrayLike, constant: float) -> NDArray[np.float64]:
    """The integral q with q[0] = constant and q[k + 1] = p[k] / (k + 1)."""


def CxPolyIntegralH(p: ArrayLike, constant: complex) -> NDArray[np.complex128]:
    """As PolyIntegralH, for complex coefficients and constant. The integral q with q[0] = constant and ..."""


def PolyComposeH(p: ArrayLike, q: ArrayLike) -> NDArray[np.float64]:
    """The composition r(x) = p(q(x)) of (m - 1) (n - 1) + 1 coefficients by Horner's rule; leading ..."""


def CxPolyComposeH(p: ArrayLike, q: ArrayLike) -> NDArray[np.complex128]:
    """As PolyComposeH, for complex coefficients. The composition r(x) = p(q(x)) of (m - 1) (n - 1) + 1 ..."""


def PolyFromRootsH(roots: ArrayLike) -> NDArray[np.float64]:
    """The monic real polynomial with the given roots, each as often as it occurs in `roots`; no roots ..."""


def CxPolyFromRootsH(roots: ArrayLike) -> NDArray[np.complex128]:
    """The monic complex polynomial with the given roots, each as often as it occurs in `roots`; no ..."""


def PartialFractionsH(numerator: ArrayLike, denominator: ArrayLike, tolerance: float) -> tuple[NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128]]:
    """The partial fractions of a rational function, numerator / denominator = polynomial + sum over ..."""


def PolyRootsNtBst_head(coef: ArrayLike, realGuesses: ArrayLike, newtonMaxIterations: int, newtonTolerance: float, complexGuesses: ArrayLike, bairstowMaxIterations: int, bairstowTolerance: float) -> NDArray[np.complex128]:
    """Improves approximate roots: each real guess by Newton steps, keeping the point with the smallest ..."""


def CxPolyRoots_head(coef: ArrayLike, maxIterations: int) -> NDArray[np.complex128]:
    """Replaces the coefficients of a complex polynomial by all of its roots, in the order in which ..."""


def PolyRoots2026_head(coef: ArrayLike) -> tuple[NDArray[np.complex128], NDArray[np.float64]]:
    """All roots of a real polynomial, found simultaneously: each repeated according to its ..."""


def CxPolyRoots2026_head(coef: ArrayLike) -> tuple[NDArray[np.complex128], NDArray[np.float64]]:
    """As PolyRoots2026_head, for complex coefficients, without pairs. All roots of a real polynomial, ..."""


def MultPolyRoots_head(coef: ArrayLike, refine: int, tolerance: float) -> tuple[NDArray[np.float64], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.int32]]:
    """Distinct roots of a real polynomial and their multiplicities."""


def CxMultPolyRoots_head(coef: ArrayLike, refine: int, tolerance: float) -> tuple[NDArray[np.complex128], NDArray[np.complex128], NDArray[np.complex128], NDArray[np.int32]]:
    """As MultPolyRoots_head, for complex coefficients. Distinct roots of a real polynomial and their ..."""


def ppMultiRateFIRH_DBL(x: ArrayLike, state: ArrayLike, mode: int, L: int, M: int, h: ArrayLike, gain: float, reset: int, removeDelay: int, delayLeft: int, phase: int) -> tuple[NDArray[np.float64], NDArray[np.float64], int, int]:
    """Filters a block at one of four rates."""


def ppMultiRateFIRH_SGL(x: ArrayLike, state: ArrayLike, mode: int, L: int, M: int, h: ArrayLike, gain: float, reset: int, removeDelay: int, delayLeft: int, phase: int) -> tuple[NDArray[np.float32], NDArray[np.float32], int, int]:
    """As ppMultiRateFIRH_DBL, in single precision throughout. Filters a block at one of four rates."""


def ppMultiRateFIRH_CDB(x: ArrayLike, state: ArrayLike, mode: int, L: int, M: int, h: ArrayLike, gain: float, reset: int, removeDelay: int, delayLeft: int, phase: int) -> tuple[NDArray[np.complex128], NDArray[np.complex128], int, int]:
    """As ppMultiRateFIRH_DBL, for complex data and real taps. Filters a block at one of four rates."""


def ppMultiRateFIRH_CSG(x: ArrayLike, state: ArrayLike, mode: int, L: int, M: int, h: ArrayLike, gain: float, reset: int, removeDelay: int, delayLeft: int, phase: int) -> tuple[NDArray[np.complex64], NDArray[np.complex64], int, int]:
    """As ppMultiRateFIRH_DBL, for complex data and real taps, in single precision throughout. Filters ..."""


def SpectrumH(x: ArrayLike) -> NDArray[np.float64]:
    """Replaces x by its power spectrum: S[k] = |X[k]|^2 / n^2 for k from 0 to n-1, with X the unscaled ..."""


def SpectrumH_IDP(x: ArrayLike) -> NDArray[np.float64]:
    """As SpectrumH, with its plan in the host's instance data. Replaces x by its power spectrum: S[k] ..."""


def CxSpectrumH(x: ArrayLike) -> NDArray[np.float64]:
    """The power spectrum of complex data: spectrum[k] = |X[k]|^2 / n^2, n values."""


def CxSpectrumH_IDP(x: ArrayLike) -> NDArray[np.float64]:
    """As CxSpectrumH, with its plan in the host's instance data. The power spectrum of complex data: ..."""


def CrossSpectrumH(x: ArrayLike, y: ArrayLike) -> NDArray[np.complex128]:
    """The cross spectrum: cross[k] = conj(X[k]) Y[k] / n^2, n values."""


def CrossSpectrumH_IDP(x: ArrayLike, y: ArrayLike) -> NDArray[np.complex128]:
    """As CrossSpectrumH, with its plan in the host's instance data. The cross spectrum: cross[k] = ..."""


def CxCrossSpectrumH(x: ArrayLike, y: ArrayLike) -> NDArray[np.complex128]:
    """The cross spectrum of complex data: cross[k] = conj(X[k]) Y[k] / n^2, n values."""


def CxCrossSpectrumH_IDP(x: ArrayLike, y: ArrayLike) -> NDArray[np.complex128]:
    """As CxCrossSpectrumH, with its plan in the host's instance data. The cross spectrum of complex ..."""


def StateLevels(y: ArrayLike, t0: float, dt: float, method: int, bins: int, limit: int) -> tuple[float, float, float]:
    """The levels of the two states and their difference."""


def StateLevels_IDP(y: ArrayLike, t0: float, dt: float, method: int, bins: int, limit: int) -> tuple[float, float, float]:
    """As StateLevels, with its counters in the host's instance data. The levels of the two states and ..."""


def PulseMeasEx(y: ArrayLike, t0: float, dt: float, polarity: int, partial: int, pulseNumber: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[float, float, float, float, float, float, float]:
    """Measures pulse number `pulseNumber` (from 1) among those whose first edge has the given polarity."""


def PulseMeasEx_IDP(y: ArrayLike, t0: float, dt: float, polarity: int, partial: int, pulseNumber: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[float, float, float, float, float, float, float]:
    """As PulseMeasEx, with its counters in the host's instance data. Measures pulse number ..."""


def PulseMeas(y: ArrayLike, t0: float, dt: float, polarity: int, pulseNumber: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[float, float, float, float, float, float, float]:
    """As PulseMeasEx, of whole periods only. Measures pulse number `pulseNumber` (from 1) among those ..."""


def TransMeas(y: ArrayLike, t0: float, dt: float, polarity: int, number: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[dict[str, Any], float, float, float, float, float, float, float, float, float, float, float]:
    """Measures transition number `number` (from 1) of the given polarity between the low and the high ..."""


def TransMeas_IDP(y: ArrayLike, t0: float, dt: float, polarity: int, number: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[dict[str, Any], float, float, float, float, float, float, float, float, float, float, float]:
    """As TransMeas, with its counters in the host's instance data. Measures transition number `number` ..."""


def CycleRMSAverage(y: ArrayLike, t0: float, dt: float, cycleNumber: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[dict[str, Any], float, float, float, float, float, float, float]:
    """Mean and root mean square over cycle number `cycleNumber` (from 1), over the samples between the ..."""


def CycleRMSAverage_IDP(y: ArrayLike, t0: float, dt: float, cycleNumber: int, ref: Mapping[str, Any], hist: Mapping[str, Any], limit: int) -> tuple[dict[str, Any], float, float, float, float, float, float, float]:
    """As CycleRMSAverage, with its counters in the host's instance data. Mean and root mean square ..."""


def PulseParameters(y: ArrayLike) -> tuple[float, float, float, float, float, float, float, float, float, float]:
    """Measures the first pulse of a waveform in units of samples: base and top, the fullest bins from ..."""


def MeasurementUnreserveProc() -> None:
    """Releases the counters of an _IDP node and clears its instance-data word."""


def measurements_create() -> None:
    """Has no effect: the measurements need no preparation."""


def measurements_destroy() -> None:
    """As measurements_create. Has no effect: the measurements need no preparation."""


def measurements_clear() -> None:
    """As measurements_create. Has no effect: the measurements need no preparation."""


def RationalResample_H(x: ArrayLike, L: int, M: int, reset: int, offset: int, h: ArrayLike, state: ArrayLike, stateCount: int) -> tuple[int, NDArray[np.float64], int, NDArray[np.float64]]:
    """Resamples a block by L / M: the output at position p, beginning at *offset in steps of M, is y = ..."""


def CxRationalResample_H(x: ArrayLike, L: int, M: int, reset: int, offset: int, h: ArrayLike, state: ArrayLike, stateCount: int) -> tuple[int, NDArray[np.complex128], int, NDArray[np.complex128]]:
    """As RationalResample_H, for complex data and real taps. Resamples a block by L / M: the output at ..."""


def RationalResampleMultiCh_H(x: ArrayLike, L: int, M: int, reset: int, offset: int, h: ArrayLike, state: ArrayLike, stateCount: int) -> tuple[int, NDArray[np.float64], int, NDArray[np.float64]]:
    """As RationalResample_H, for channels in the rows of matrices, which share their positions. ..."""


def CxRationalResampleMCh_H(x: ArrayLike, L: int, M: int, reset: int, offset: int, h: ArrayLike, state: ArrayLike, stateCount: int) -> tuple[int, NDArray[np.complex128], int, NDArray[np.complex128]]:
    """As RationalResampleMultiCh_H, for complex data and real taps. Resamples a block by L / M: the ..."""


def Resample_Const(x: ArrayLike, state: Mapping[str, Any], design: Mapping[str, Any], reset: int, antiAlias: int) -> tuple[dict[str, Any], NDArray[np.float64], int]:
    """The values of a stream at times start, start + ratio, start + 2 ratio ..."""


def CxResample_Const(x: ArrayLike, state: Mapping[str, Any], design: Mapping[str, Any], reset: int, antiAlias: int) -> tuple[dict[str, Any], NDArray[np.complex128], int]:
    """As Resample_Const, for complex data. The values of a stream at times start, start + ratio, start ..."""


def Resample_Variable(x: ArrayLike, t: ArrayLike, design: Mapping[str, Any], lastTime: float) -> tuple[NDArray[np.float64], float, int, int]:
    """The values at the times in t, given in input samples from x[0], as far as x extends."""


def CxResample_Variable(x: ArrayLike, t: ArrayLike, design: Mapping[str, Any], lastTime: float) -> tuple[NDArray[np.complex128], float, int, int]:
    """As Resample_Variable, for complex data; times are the real parts of t. The values at the times ..."""


def Resample_Variable_MultiCh(x: ArrayLike, t: ArrayLike, design: Mapping[str, Any], lastTime: float) -> tuple[NDArray[np.float64], NDArray[np.float64], float, int, int]:
    """As Resample_Variable, for channels in the rows of x. The values at the times in t, given in ..."""


def CxResample_Variable_MultiCh(x: ArrayLike, t: ArrayLike, design: Mapping[str, Any], lastTime: float) -> tuple[NDArray[np.complex128], NDArray[np.float64], float, int, int]:
    """As Resample_Variable_MultiCh, for complex data. The values at the times in t, given in input ..."""


def Scale(x: ArrayLike) -> tuple[NDArray[np.float64], float, float]:
    """Maps x to the range -1 to 1: (x - offset) / scale with scale = (max - min) / 2 and offset = min ..."""


def Scale1DCIN(x: ArrayLike) -> tuple[NDArray[np.float64], float, float]:
    """As Scale, for one dimension, and with the two numbers in the other order. Maps x to the range -1 ..."""


def QScale(x: ArrayLike) -> tuple[NDArray[np.float64], float]:
    """Divides x by its largest magnitude, which is returned in `scale`."""


def QS1D(x: ArrayLike) -> tuple[NDArray[np.float64], float]:
    """As QScale, for one dimension. Divides x by its largest magnitude, which is returned in `scale`."""


def Norm1(x: ArrayLike) -> tuple[NDArray[np.float64], float, float]:
    """Standardises x: (x - mean) / sd with the mean and the population standard deviation sqrt(sum((x ..."""


def Norm2(x: ArrayLike) -> tuple[NDArray[np.float64], float, float]:
    """As Norm1, over all elements of a matrix. Standardises x: (x - mean) / sd with the mean and the ..."""


def Line1(x: ArrayLike, a: float, b: float) -> NDArray[np.float64]:
    """Replaces x by a x + b, which is infinite or NaN where that overflows."""


def LinEv(x: ArrayLike, a: float, b: float) -> NDArray[np.float64]:
    """As Line1, for a matrix. Replaces x by a x + b, which is infinite or NaN where that overflows."""


def unWrap(x: ArrayLike) -> NDArray[np.float64]:
    """Unwraps a phase in radians: from the second element on, each is moved by whole turns to within ..."""


def unWrap85(x: ArrayLike, mode: int) -> NDArray[np.float64]:
    """As unWrap, with a choice of units. Unwraps a phase in radians: from the second element on, each ..."""


def RiffleArrayDBL2012_head(x: ArrayLike, seed: int, state: Mapping[str, Any], unbiased: int) -> tuple[NDArray[np.float64], NDArray[np.int32], dict[str, Any]]:
    """Shuffles x; without bias if `unbiased` is non-zero."""


def RiffleArrayDBL_head(x: ArrayLike, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.float64], NDArray[np.int32], dict[str, Any]]:
    """As RiffleArrayDBL2012_head, biased. Shuffles x; without bias if `unbiased` is non-zero."""


def RiffleArrayCDB2012_head(x: ArrayLike, seed: int, state: Mapping[str, Any], unbiased: int) -> tuple[NDArray[np.complex128], NDArray[np.int32], dict[str, Any]]:
    """As RiffleArrayDBL2012_head, for complex elements. Shuffles x; without bias if `unbiased` is non- ..."""


def RiffleArrayCDB_head(x: ArrayLike, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.complex128], NDArray[np.int32], dict[str, Any]]:
    """As RiffleArrayCDB2012_head, biased. Shuffles x; without bias if `unbiased` is non-zero."""


def RiffleArrayInt2012_head(x: ArrayLike, seed: int, state: Mapping[str, Any], unbiased: int) -> tuple[NDArray[np.int32], NDArray[np.int32], dict[str, Any]]:
    """As RiffleArrayDBL2012_head, for integers. Shuffles x; without bias if `unbiased` is non-zero."""


def RiffleArrayInt_head(x: ArrayLike, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.int32], NDArray[np.int32], dict[str, Any]]:
    """As RiffleArrayInt2012_head, biased. Shuffles x; without bias if `unbiased` is non-zero."""


def RiffleIntNum2012_head(count: int, seed: int, state: Mapping[str, Any], unbiased: int) -> tuple[NDArray[np.int32], dict[str, Any]]:
    """A random permutation of 0 to count - 1; without bias if `unbiased` is non-zero."""


def RiffleIntNum_head(count: int, seed: int, state: Mapping[str, Any]) -> tuple[NDArray[np.int32], dict[str, Any]]:
    """As RiffleIntNum2012_head, biased. A random permutation of 0 to count - 1; without bias if ..."""


def RiffleArrayDBL2026_head(x: ArrayLike, key: int, stream: int, position: float) -> tuple[NDArray[np.float64], NDArray[np.int32]]:
    """Shuffles x without bias."""


def RiffleArrayCDB2026_head(x: ArrayLike, key: int, stream: int, position: float) -> tuple[NDArray[np.complex128], NDArray[np.int32]]:
    """As RiffleArrayDBL2026_head, for complex elements. Shuffles x without bias."""


def RiffleArrayInt2026_head(x: ArrayLike, key: int, stream: int, position: float) -> tuple[NDArray[np.int32], NDArray[np.int32]]:
    """As RiffleArrayDBL2026_head, for integers. Shuffles x without bias."""


def RiffleIntNum2026_head(count: int, key: int, stream: int, position: float) -> NDArray[np.int32]:
    """A random permutation of 0 to count - 1, as RiffleArrayDBL2026_head makes it."""


def SavitzkyGolayCoefH(order: int, frame: int, weights: ArrayLike, wantDifferentiators: int) -> tuple[NDArray[np.float64], NDArray[np.float64]]:
    """The matrices of the least-squares fit of a polynomial of degree `order` to a frame of samples at ..."""


def SavitzkyGolayFiltH(x: ArrayLike, order: int, frame: int, weights: ArrayLike) -> NDArray[np.float64]:
    """y[i] is the value at i of the polynomial of degree `order` that best fits the `frame` samples of ..."""


def MedianFilterCIN(x: ArrayLike, rank: int) -> NDArray[np.float64]:
    """Running median in place: x[i] becomes the median of x[i - *rank] to x[i + *rank], with zeros ..."""


def MedianFilter81_H(x: ArrayLike, leftRank: int, rightRank: int) -> NDArray[np.float64]:
    """Running median in place, of x[i - leftRank] to x[i + rightRank]."""


def CubicSplineFit_head(x: ArrayLike, y: ArrayLike, deviations: ArrayLike, method: int, parameter: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float, float]:
    """The natural cubic spline s that minimises sum of ((y - s(x)) / deviation)^2 + lambda times the ..."""


def BSplineFit_head(x: ArrayLike, y: ArrayLike, w: ArrayLike, degree: int, interior: int, interiorKnots: ArrayLike) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float]:
    """The spline of a degree of 1 to 9 that minimises the sum of |w| (y - s(x))^2, by orthogonal ..."""


def QX_Airy(x: float | ArrayLike) -> tuple[float, float, float, float]:
    """Airy functions Ai(x), Ai'(x), Bi(x), Bi'(x), the solutions of w'' = x w (10.4): Maclaurin series ..."""


def QX_BesselJr(order: float | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Bessel function J of real order, a solution of x^2 w'' + x w' + (x^2 - order^2) w = 0 (9.1): the ..."""


def QX_BesselYr(order: float | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Bessel function Y of real order: kernels and upward recurrence for integers, otherwise ..."""


def QX_BesselJs(n: int | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Spherical Bessel function j_n(x) = sqrt(pi / (2 x)) J_(n+1/2)(x)."""


def QX_BesselYs(n: int | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Spherical Bessel function y_n(x) = sqrt(pi / (2 x)) Y_(n+1/2)(x)."""


def QX_BesselIr(order: float | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Modified Bessel function I of real order, (x/2)^v exp(-x) M(v + 1/2, 2 v + 1, 2 x) / gamma(v + ..."""


def QX_BesselKn(n: int | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Modified Bessel function K of order |n|, by upward recurrence from K_0 and K_1 by K_(k+1) = ..."""


def QX_KelvinI(x: float | ArrayLike, n: int | ArrayLike) -> tuple[float, float]:
    """Kelvin functions ber and bei of order n, ber + i bei = J_n(x exp(3 pi i / 4)) (9.9.1)."""


def QX_KelvinK(x: float | ArrayLike, n: int | ArrayLike) -> tuple[float, float]:
    """Kelvin functions ker and kei of order n, ker + i kei = i^-n K_n(x exp(i pi / 4)) (9.9.2)."""


def QX_Struve(x: float | ArrayLike, v: float | ArrayLike) -> float | NDArray[Any]:
    """Struve function H of order v: the ascending series (12.1.3) or the asymptotic one added to Y_v ..."""


def QX_ParabolicCylinder(x: float | ArrayLike, v: float | ArrayLike) -> float | NDArray[Any]:
    """Parabolic cylinder function D of order v, the solution of w'' = (x^2 / 4 - v - 1 / 2) w that ..."""


def QX_CxBesselJr(order: float | ArrayLike, z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Bessel function J of real order, a solution of z^2 w'' + z w' + (z^2 - order^2) w = 0 (9.1)."""


def QX_CxBesselYr(order: float | ArrayLike, z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Bessel function Y of real order, (cos(order pi) J_order(z) - J_-order(z)) / sin(order pi), for ..."""


def QX_CxBesselIr(order: float | ArrayLike, z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Modified Bessel function I of real order, a solution of z^2 w'' + z w' - (z^2 + order^2) w = 0 ..."""


def QX_CxBesselKr(order: float | ArrayLike, z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Modified Bessel function K of real order, pi / 2 (I_-order(z) - I_order(z)) / sin(order pi), for ..."""


def QX_CxBesselH1r(order: float | ArrayLike, z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Hankel function of the first kind and real order, J + i Y (9.1.3)."""


def QX_CxBesselH2r(order: float | ArrayLike, z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Hankel function of the second kind and real order, J - i Y (9.1.4)."""


def QX_CxAiryAi(z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Airy function Ai, the solution of w'' = z w that decays along the positive axis (10.4)."""


def QX_CxAiryAiP(z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """As QX_CxAiryAi, the derivative of Ai. Airy function Ai, the solution of w'' = z w that decays ..."""


def QX_CxAiryBi(z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """Airy function Bi, the solution of w'' = z w that is in quadrature to Ai on the negative axis (10.4)."""


def QX_CxAiryBiP(z: complex | ArrayLike, scaled: int | ArrayLike) -> complex | NDArray[Any]:
    """As QX_CxAiryBi, the derivative of Bi. Airy function Bi, the solution of w'' = z w that is in ..."""


def QX_Elliptic1(m: float | ArrayLike, phi: float | ArrayLike) -> float | NDArray[Any]:
    """Elliptic integral of the first kind by its parameter m = k^2: complete, K(m) = F(pi / 2, m), ..."""


def QX_Elliptic1_85(m: float | ArrayLike, phi: float | ArrayLike, selector: int | ArrayLike) -> float | NDArray[Any]:
    """As QX_Elliptic1, with a selector in place of the NaN: 1 complete, otherwise incomplete. Elliptic ..."""


def QX_Elliptic1_2026(m: float | ArrayLike, phi: float | ArrayLike, selector: int | ArrayLike) -> float | NDArray[Any]:
    """As QX_Elliptic1_85, with F(phi, 1) = ln((1 + sin phi) / cos phi) within 1 eps: below a quarter ..."""


def QX_Elliptic2(m: float | ArrayLike, phi: float | ArrayLike) -> float | NDArray[Any]:
    """Elliptic integral of the second kind: complete, E(m), where phi is NaN, else E(phi, m), the ..."""


def QX_Elliptic2_85(m: float | ArrayLike, phi: float | ArrayLike, selector: int | ArrayLike) -> float | NDArray[Any]:
    """As QX_Elliptic2, with a selector in place of the NaN: 1 complete, otherwise incomplete. Elliptic ..."""


def QX_EllipticJ(u: float | ArrayLike, m: float | ArrayLike) -> tuple[float, float, float, float]:
    """Jacobian elliptic functions sn = sin(phi), cn = cos(phi), dn = (1 - m sn^2)^(1/2) of u with ..."""


def QX_Beta(a: float | ArrayLike, b: float | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Beta function."""


def QX_Beta_85(a: float | ArrayLike, b: float | ArrayLike, x: float | ArrayLike, selector: int | ArrayLike) -> float | NDArray[Any]:
    """As QX_Beta, with a selector in place of the NaN: 1 complete, otherwise I_x(a, b). Beta function."""


def QX_Fact(n: int | ArrayLike) -> float | NDArray[Any]:
    """n factorial: a table up to 33, correctly rounded products up to 50, gamma(n + 1) beyond."""


def QX_LnFact(n: int | ArrayLike) -> float | NDArray[Any]:
    """ln n! = ln gamma(n + 1)."""


def QX_Gamma(a: float | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Gamma function."""


def QX_Gamma_85(a: float | ArrayLike, x: float | ArrayLike, selector: int | ArrayLike) -> float | NDArray[Any]:
    """As QX_Gamma, with a selector in place of the NaN: 1 complete, otherwise P(a, x). Gamma function."""


def QX_GammaC(a: float | ArrayLike, x: float | ArrayLike) -> float | NDArray[Any]:
    """Regularised upper incomplete gamma function Q(a, x) = 1 - P(a, x): 1 at x = 0, 0 at x = ..."""


def QX_LnGamma(x: float | ArrayLike) -> float | NDArray[Any]:
    """ln gamma(x), x >= 0: by a rational function on [2, 3] and the recurrence up to 33, by the ..."""


def QX_Stirling(x: float | ArrayLike) -> float | NDArray[Any]:
    """Gamma(x) by Stirling's formula, sqrt(2 pi) x^(x - 1/2) exp(-x) (1 + 1 / (12 x) + ...), meant for ..."""


def QX_Psi(x: float | ArrayLike) -> float | NDArray[Any]:
    """Digamma function psi(x), the derivative of ln gamma(x) (6.3.2, 6.3.5, 6.3.7, 6.3.18)."""


def QX_Zeta(x: float | ArrayLike) -> float | NDArray[Any]:
    """Riemann's zeta function, the sum of k^-x for x > 1 (23.2.1) and its continuation: rational forms ..."""


def QX_Gauss(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike, c: float | ArrayLike) -> float | NDArray[Any]:
    """Gauss's hypergeometric function F(a, b; c; x) = 2F1, the sum of (a)_k (b)_k / ((c)_k k!) x^k, on ..."""


def QX_Gauss_2011(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike, c: float | ArrayLike) -> float | NDArray[Any]:
    """As QX_Gauss, with Pfaff's transformation for all x < 0.2, where its argument is in [-0.25, 0.5]. ..."""


def QX_Gauss_2026(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike, c: float | ArrayLike) -> float | NDArray[Any]:
    """As QX_Gauss_2011, for all x <= 1 and with a method for each region. Gauss's hypergeometric ..."""


def QX_Kummer(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike) -> float | NDArray[Any]:
    """Kummer's confluent hypergeometric function M(a, b, x) = 1F1, the sum of (a)_k / ((b)_k k!) x^k."""


def QX_Kummer_2026(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike) -> float | NDArray[Any]:
    """As QX_Kummer, with a method for each region: for |x| >= 30 both sums of the asymptotic form if ..."""


def QX_Tricomi(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike) -> float | NDArray[Any]:
    """Tricomi's confluent hypergeometric function U(a, b, x)."""


def QX_Tricomi_2026(x: float | ArrayLike, a: float | ArrayLike, b: float | ArrayLike) -> float | NDArray[Any]:
    """As QX_Tricomi, with a method for each region: the asymptotic sum where its smallest term is ..."""


def QX_Erf(x: float | ArrayLike) -> float | NDArray[Any]:
    """Error function erf(x), 2 / sqrt(pi) times the integral of exp(-t^2) from 0 to x: a rational ..."""


def QX_ErfC(x: float | ArrayLike) -> float | NDArray[Any]:
    """Complementary error function erfc(x) = 1 - erf(x): by QX_Erf below |x| = 1, as exp(-x^2) times a ..."""


def QX_ExpI(x: float | ArrayLike, n: int | ArrayLike) -> float | NDArray[Any]:
    """Exponential integral E_n(x), the integral of exp(-x t) / t^n from 1 to infinity: the expansion ..."""


def QX_ExpI_2026(x: float | ArrayLike, n: int | ArrayLike) -> float | NDArray[Any]:
    """As QX_ExpI, with E_1 by rational functions on four intervals, divided at 0.4, 2 and 10, with an ..."""


def QX_SinI(x: float | ArrayLike) -> float | NDArray[Any]:
    """Sine integral Si(x), the integral of sin(t) / t from 0 to x: a rational function up to |x| = 4, ..."""


def QX_CosI(x: float | ArrayLike) -> float | NDArray[Any]:
    """Cosine integral Ci(x) = gamma + ln |x| + the integral of (cos(t) - 1) / t from 0 to |x|, by the ..."""


def QX_SinhI(x: float | ArrayLike) -> float | NDArray[Any]:
    """Hyperbolic sine integral Shi(x), the integral of sinh(t) / t from 0 to x: its power series up to ..."""


def QX_CoshI(x: float | ArrayLike) -> float | NDArray[Any]:
    """Hyperbolic cosine integral Chi(x) = gamma + ln |x| + the integral of (cosh(t) - 1) / t from 0 to ..."""


def QX_Diln(x: float | ArrayLike) -> float | NDArray[Any]:
    """Dilogarithm Li2(1 - x), minus the integral of ln(t) / (t - 1) from 1 to x: a rational function ..."""


def QX_Dawson(x: float | ArrayLike) -> float | NDArray[Any]:
    """Dawson's integral, exp(-x^2) times the integral of exp(t^2) from 0 to x, by rational functions ..."""


def QX_FresnelIntegrals(x: float | ArrayLike) -> tuple[float, float]:
    """Fresnel integrals C(x) and S(x): of cos(pi t^2 / 2) and sin(pi t^2 / 2) from 0 to x (7.3.1, ..."""


def SpecialMatrix_head(kind: int, size: int, x: ArrayLike, y: ArrayLike) -> NDArray[np.float64]:
    """Creates a matrix of a named kind."""


def CxSpecialMatrix_head(kind: int, size: int, x: ArrayLike, y: ArrayLike) -> NDArray[np.complex128]:
    """As SpecialMatrix_head, for complex data. Creates a matrix of a named kind."""


def OuterProd_head(x: ArrayLike, y: ArrayLike) -> NDArray[np.float64]:
    """out[i][j] = x[i] y[j]."""


def OuterProdCx_head(x: ArrayLike, y: ArrayLike) -> NDArray[np.complex128]:
    """As OuterProd_head, for complex data; nothing is conjugated. out[i][j] = x[i] y[j]."""


def KroneckerProd_H(a: ArrayLike, b: ArrayLike) -> NDArray[np.float64]:
    """Kronecker product: the block in place of a[i][j] is a[i][j] b."""


def CxKroneckerProd_H(a: ArrayLike, b: ArrayLike) -> NDArray[np.complex128]:
    """As KroneckerProd_H, for complex data. Kronecker product: the block in place of a[i][j] is a[i][j] b."""


def Compact_to_Matrix_head(a: Mapping[str, Any]) -> NDArray[np.float64]:
    """Unpacks a packed triangle into a full square matrix."""


def CxCompact_to_Matrix_head(a: Mapping[str, Any]) -> NDArray[np.complex128]:
    """As Compact_to_Matrix_head, for complex data; the mirror image is not conjugated. Unpacks a ..."""


def Matrix_to_Compact_head(a: ArrayLike, triangle: int) -> NDArray[np.float64]:
    """Packs a triangle of a square matrix."""


def CxMatrix_to_Compact_head(a: ArrayLike, triangle: int) -> NDArray[np.complex128]:
    """As Matrix_to_Compact_head, for complex data. Packs a triangle of a square matrix."""


def CompactToMatrix_H(packed: ArrayLike) -> NDArray[np.float64]:
    """Unpacks a symmetric matrix in packed storage, as returned by fits, into a full square matrix."""


def MatrixToCompact_H(a: ArrayLike) -> NDArray[np.float64]:
    """Packs the lower triangle of a square matrix, as fits expect it."""


def Transpose_head(a: ArrayLike) -> NDArray[np.float64]:
    """Transpose."""


def CxTranspose_head(a: ArrayLike) -> NDArray[np.complex128]:
    """As Transpose_head, for complex data, without conjugation and with the code in *err. Transpose."""


def InitialMatrixH(rows: int, cols: int) -> NDArray[np.float64]:
    """Creates a matrix of zeros."""


def CxInitialMatrixH(rows: int, cols: int) -> NDArray[np.complex128]:
    """As InitialMatrixH, for complex data. Creates a matrix of zeros."""


def CreateMatrixFromEVs_head(values: ArrayLike) -> NDArray[np.float64]:
    """A full symmetric matrix with the given eigenvalues: Q diag(values) Q with the reflection Q = 1 - ..."""


def AutoCorrMtrxH(x: ArrayLike, y: ArrayLike, maxLag: int, normalization: int) -> NDArray[np.float64]:
    """Correlation matrix of order maxLag + 1, out[i][j] = r(i - j): r(k) is the sum over i of x[i + k] ..."""


def CxAutoCorrMtrxH(x: ArrayLike, y: ArrayLike, maxLag: int, normalization: int) -> NDArray[np.complex128]:
    """As AutoCorrMtrxH, for complex data. Correlation matrix of order maxLag + 1, out[i][j] = r(i - ..."""


def MultipleToneMeasurements(y: ArrayLike, dt: float, count: int, order: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float]:
    """Finds the `count` largest tones of y, or fewer, with their frequencies, amplitudes and phases."""


def SingleToneMeasurement(y: ArrayLike, dt: float, centre: float, halfWidth: float) -> tuple[float, float, float, float, float]:
    """Measures the largest tone whose frequency is within halfWidth of `centre`; if halfWidth is not ..."""


def HarmonicAnalysis(y: ArrayLike, dt: float, fundamental: float, highestHarmonic: int, fullScale: float) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], float, float, float, float, float, float]:
    """Measures a tone, its harmonics and the residual, by the definitions of IEEE Std 1241-2010 and ..."""


def Triggerh_86(y: ArrayLike, level: float, hysteresis: float, slope: int, start: int, holdoff: int, state: Mapping[str, Any]) -> tuple[dict[str, Any], int, float]:
    """Finds the next trigger in a block of a stream, from sample `start` on."""


def Triggerh(y: ArrayLike, level: float, slope: int, start: int) -> tuple[int, float]:
    """As Triggerh_86, with hysteresis 0, holdoff 0 and a state of zeros. Finds the next trigger in a ..."""


def SineWaveCIN(n: int, amp: float, f: float, phase: float) -> tuple[NDArray[np.float64], float]:
    """Sine wave amp sin(p), by the recurrence y[i] = y[i-2] + 2 sin(w) c[i-1] of sine and cosine with ..."""


def SquareWaveCIN(n: int, amp: float, f: float, phase: float, duty: float) -> tuple[NDArray[np.float64], float]:
    """Square wave: amp while p is below 3.6 duty, else -amp; duty is in per cent, clamped to 0 to 100."""


def TriangleWaveCIN(n: int, amp: float, f: float, phase: float) -> tuple[NDArray[np.float64], float]:
    """Triangle wave: 0 at p = 0, amp at 90, 0 at 180, -amp at 270 degrees."""


def SawtoothWaveCIN(n: int, amp: float, f: float, phase: float) -> tuple[NDArray[np.float64], float]:
    """Sawtooth wave: amp p / 180 below 180 degrees, from there amp (p / 180 - 2); it jumps from amp to ..."""


def ArbitraryWaveCIN(n: int, amp: float, f: float, phase: float, table: ArrayLike, interpolate: int) -> tuple[NDArray[np.float64], float]:
    """A wave whose period is given by a table, multiplied by amp: the table value at or before the ..."""


def ChirpCIN(n: int, amp: float, f1: float, f2: float) -> NDArray[np.float64]:
    """Linear chirp amp sin(i ((f2 - f1) pi/n i + 2 pi f1)): the frequency changes from f1 at the first ..."""


def SinePtrn(n: int, amp: float, phase: float, cycles: float) -> NDArray[np.float64]:
    """`cycles` periods (not necessarily an integer) of a sine over the array, starting at the phase in ..."""


def Square(n: int, amp: float, duty: float, cycles: float) -> NDArray[np.float64]:
    """Rectangular pattern between amp and 0: each period of round(n / cycles) samples begins with ..."""


def PulsePtrn(n: int, amp: float, delay: int, width: int) -> NDArray[np.float64]:
    """A rectangular pulse: `width` samples of amp from sample `delay` on, the others 0."""


def ImpulsePtrn(n: int, amp: float, delay: int) -> NDArray[np.float64]:
    """An impulse: sample `delay` is amp, the others are 0."""


def SincWave(n: int, amp: float, delay: float, dt: float) -> NDArray[np.float64]:
    """amp sin(x) / x at x = pi (i dt - delay)."""


def RampPtrn(n: int, start: float, end: float) -> NDArray[np.float64]:
    """A straight line from start to end, both included."""


def RampPtrn80(n: int, start: float, end: float, excludeEnd: int) -> NDArray[np.float64]:
    """A straight line from start to end; if `excludeEnd` is non-zero, end would be reached at sample n."""


def RampPtrn85(n: int, start: float, end: float, excludeEnd: int, scale: int) -> NDArray[np.float64]:
    """As RampPtrn80, with a choice of scale. A straight line from start to end; if `excludeEnd` is ..."""


def GaussPulseH(x: ArrayLike, n: int, amp: float, delay: float, dt: float, fc: float, bandwidth: float, dBReference: float) -> NDArray[np.float64]:
    """Gaussian pulse amp exp(-k (pi fc t)^2) cos(2 pi fc t) with k = 5 bandwidth^2 / (ln(10) ..."""


def GaussMonopulseH(x: ArrayLike, n: int, dt: float, delay: float, fc: float, amp: float) -> NDArray[np.float64]:
    """As GaussPulseH, the derivative of a Gaussian: 2 amp sqrt(e) u exp(-2 u^2) with u = pi fc t, with ..."""


def AperiodTriangleH(x: ArrayLike, n: int, amp: float, delay: float, dt: float, width: float, skew: float) -> NDArray[np.float64]:
    """As GaussPulseH, a single triangle of the given width, with its peak of amp at skew times width ..."""


def PeriodicSincH(x: ArrayLike, n: int, amp: float, order: int, dt: float, delay: float) -> NDArray[np.float64]:
    """As GaussPulseH, the periodic sinc amp sin(order t/2) / (order sin(t/2)), with its limit where ..."""


def PhasMod(n: int, dt: float, fc: float, y: ArrayLike, peak: float, phase: float) -> tuple[float, NDArray[np.float64], float, float]:
    """Phase modulation: y[i], in degrees, becomes sin(y[i] pi/180 + *phase dt), where *phase advances ..."""


def FreqMod(n: int, dt: float, fc: float, y: ArrayLike, peak: float, phase: float) -> tuple[float, NDArray[np.float64], float, float]:
    """As PhasMod, frequency modulation: y[i], in the unit of fc, becomes sin(*phase dt), where *phase ..."""


def NumWinConstH(window: ArrayLike) -> dict[str, Any]:
    """The constants of a window given as an array, computed in one pass."""


def WinConstByNameH(n: int, selector: int, param: float) -> dict[str, Any]:
    """The constants of a named window of n samples."""


def WinConstByNameH_2016(n: int, selector: int, param: float) -> dict[str, Any]:
    """As WinConstByNameH, with the parameter as in AllWinH: NaN, or a negative value for selectors 61 ..."""


def KaiserH(x: ArrayLike, beta: float) -> NDArray[np.float64]:
    """Kaiser window: I0(beta sqrt(1 - u^2)) / I0(beta) with u = 1 - 2i/n."""


def CxKaiserH(x: ArrayLike, beta: float) -> NDArray[np.complex128]:
    """As KaiserH, for complex samples. Kaiser window: I0(beta sqrt(1 - u^2)) / I0(beta) with u = 1 - 2i/n."""


def DolChebyWinH(x: ArrayLike, ratio: float, symmetric: int) -> NDArray[np.float64]:
    """Dolph-Chebyshev window with side lobes `ratio` (linear) below the main lobe and a peak of 1; ..."""


def CxDolChebyWinH(x: ArrayLike, ratio: float, symmetric: int) -> NDArray[np.complex128]:
    """As DolChebyWinH, for complex samples. Dolph-Chebyshev window with side lobes `ratio` (linear) ..."""


def GaussWinH(x: ArrayLike, sigma: float, symmetric: int) -> NDArray[np.float64]:
    """Gaussian window exp(-t^2 / (2 sigma^2)): t = (i - n/2) / (n + 1), or (i - (n-1)/2) / n if ..."""


def CxGaussWinH(x: ArrayLike, sigma: float, symmetric: int) -> NDArray[np.complex128]:
    """As GaussWinH, for complex samples. Gaussian window exp(-t^2 / (2 sigma^2)): t = (i - n/2) / (n + ..."""


def ForceWinH(x: ArrayLike, percent: float) -> NDArray[np.float64]:
    """Force window: keeps the first `percent` per cent of the samples and sets the rest to 0."""


def CxForceWinH(x: ArrayLike, percent: float) -> NDArray[np.complex128]:
    """As ForceWinH, for complex samples. Force window: keeps the first `percent` per cent of the ..."""


def ExpWinH(x: ArrayLike, finalValue: float) -> NDArray[np.float64]:
    """Exponential window, from 1 at the first to `finalValue` at the last sample."""


def CxExpWinH(x: ArrayLike, finalValue: float) -> NDArray[np.complex128]:
    """As ExpWinH, for complex samples. Exponential window, from 1 at the first to `finalValue` at the ..."""


def CosTaperedH(x: ArrayLike, taperRatio: float) -> NDArray[np.float64]:
    """Cosine tapered window: sin^2 tapers over `taperRatio` of the samples, half at each end, in ..."""


def CxCosTaperedH(x: ArrayLike, taperRatio: float) -> NDArray[np.complex128]:
    """As CosTaperedH, for complex samples. Cosine tapered window: sin^2 tapers over `taperRatio` of ..."""


def TriangleWinH(x: ArrayLike) -> NDArray[np.float64]:
    """Triangle window 2i/n up to the middle."""


def CxTriangleWinH(x: ArrayLike) -> NDArray[np.complex128]:
    """As TriangleWinH, for complex samples. Triangle window 2i/n up to the middle."""


def WelchWinH(x: ArrayLike) -> NDArray[np.float64]:
    """Welch window 1 - ((i - n/2) / (n/2))^2."""


def CxWelchWinH(x: ArrayLike) -> NDArray[np.complex128]:
    """As WelchWinH, for complex samples. Welch window 1 - ((i - n/2) / (n/2))^2."""


def BartHannWinH(x: ArrayLike) -> NDArray[np.float64]:
    """Bartlett-Hanning window 0.62 - 0.48 |i/n - 1/2| - 0.38 cos(2 pi i / n)."""


def CxBartHannWinH(x: ArrayLike) -> NDArray[np.complex128]:
    """As BartHannWinH, for complex samples. Bartlett-Hanning window 0.62 - 0.48 |i/n - 1/2| - 0.38 ..."""


def BohmanWinH(x: ArrayLike) -> NDArray[np.float64]:
    """Bohman window sin(theta)/pi - (2i/n) cos(theta), theta = 2 pi i / n, up to the middle."""


def CxBohmanWinH(x: ArrayLike) -> NDArray[np.complex128]:
    """As BohmanWinH, for complex samples. Bohman window sin(theta)/pi - (2i/n) cos(theta), theta = 2 ..."""


def ParzenWinH(x: ArrayLike) -> NDArray[np.float64]:
    """Parzen window: with t = |i - n/2| / (n/2), 1 - 6 t^2 + 6 t^3 for t up to 1/2, and 2 (1 - t)^3 above."""


def CxParzenWinH(x: ArrayLike) -> NDArray[np.complex128]:
    """As ParzenWinH, for complex samples. Parzen window: with t = |i - n/2| / (n/2), 1 - 6 t^2 + 6 t^3 ..."""


def GenCosWinH(x: ArrayLike, coefs: ArrayLike) -> NDArray[np.float64]:
    """Cosine sum with the coefficients a = `coefs`: sum over k of (-1)^k a[k] cos(2 pi k i / n)."""


def CxGenCosWinH(x: ArrayLike, coefs: ArrayLike) -> NDArray[np.complex128]:
    """As GenCosWinH, for complex samples. Cosine sum with the coefficients a = `coefs`: sum over k of ..."""


def ScaledGenCosWinH(x: ArrayLike, coefs: ArrayLike) -> NDArray[np.float64]:
    """The cosine sum of GenCosWinH divided by its coherent gain, coefs[0]."""


def ScaledCxGenCosWinH(x: ArrayLike, coefs: ArrayLike) -> NDArray[np.complex128]:
    """As ScaledGenCosWinH, for complex samples. The cosine sum of GenCosWinH divided by its coherent ..."""


def AllCosWinH(x: ArrayLike, selector: int, scaled: int) -> NDArray[np.float64]:
    """The windows that are cosine sums; divided by the coherent gain if `scaled` is non-zero."""


def CxAllCosWinH(x: ArrayLike, selector: int, scaled: int) -> NDArray[np.complex128]:
    """As AllCosWinH, for complex samples. The windows that are cosine sums; divided by the coherent ..."""


def SymmWinH(x: ArrayLike, selector: int, param: float) -> NDArray[np.float64]:
    """Any window that has a symmetric form."""


def CxSymmWinH(x: ArrayLike, selector: int, param: float) -> NDArray[np.complex128]:
    """As SymmWinH, for complex samples. Any window that has a symmetric form."""


def ScaledWinH(x: ArrayLike, selector: int, param: float) -> tuple[NDArray[np.float64], dict[str, Any]]:
    """A window divided by its coherent gain."""


def CxScaledWinH(x: ArrayLike, selector: int, param: float) -> tuple[NDArray[np.complex128], dict[str, Any]]:
    """As ScaledWinH, for complex samples. A window divided by its coherent gain."""


def AllWinH(x: ArrayLike, selector: int, param: float, scaled: int, symmetric: int) -> NDArray[np.float64]:
    """Any window in any form: divided by its coherent gain if `scaled` is non-zero, symmetric if ..."""


def CxAllWinH(x: ArrayLike, selector: int, param: float, scaled: int, symmetric: int) -> NDArray[np.complex128]:
    """As AllWinH, for complex samples. Any window in any form: divided by its coherent gain if ..."""


def Kaiser_Bessel(x: ArrayLike, beta: float) -> NDArray[np.float64]:
    """As KaiserH, with its code in *err; the function result is 0. Kaiser window: I0(beta sqrt(1 - ..."""


def ForceWindCIN(x: ArrayLike, percent: float) -> NDArray[np.float64]:
    """As ForceWinH, with its code in *err; the function result is 0. Force window: keeps the first ..."""


def ExpWindCIN(x: ArrayLike, finalValue: float) -> NDArray[np.float64]:
    """As ExpWinH, with its code in *err; the function result is 0. Exponential window, from 1 at the ..."""


def TriangleWin(x: ArrayLike) -> NDArray[np.float64]:
    """As TriangleWinH, with its code in *err; the function result is 0. Triangle window 2i/n up to the ..."""


def CosTapered(x: ArrayLike) -> NDArray[np.float64]:
    """As CosTaperedH, with a taper ratio of 0.2 and its code in *err; the function result is 0. Cosine ..."""


def zeroPhaseFiltH(x: ArrayLike, a: ArrayLike, b: ArrayLike, xStateForward: ArrayLike, xStateBackward: ArrayLike, yStateForward: ArrayLike, yStateBackward: ArrayLike, keepState: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Filters x in place by the filter with the coefficients a and b in direct form, as in IIR_Filter."""


def zeroPhaseCascadeFiltH(x: ArrayLike, form: int, a: ArrayLike, b: ArrayLike, stateForward: ArrayLike, stateBackward: ArrayLike, keepState: int) -> tuple[NDArray[np.float64], NDArray[np.float64], NDArray[np.float64]]:
    """Filters x in place by a cascade with the coefficients a and b."""
