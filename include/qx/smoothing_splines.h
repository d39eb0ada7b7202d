#ifndef QX_SMOOTHING_SPLINES_H
#define QX_SMOOTHING_SPLINES_H

/* Splines through noisy data: the smoothing spline with a piece between every two samples, and
   least-squares splines of any degree with fewer knots. Time and memory grow with the number of
   samples. NaN and infinities are refused; overflow is not checked for. A failure empties the
   arrays and sets the numbers to NaN. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The natural cubic spline s that minimises sum of ((y - s(x)) / deviation)^2 + lambda times
    the integral of s''^2. x ascends; deviations are empty (all 1) or one per sample. method: 0
    lambda by generalised cross validation, to about 5 digits (parameter is not used); 1 lambda is
    `parameter`; 2 the smoothest spline with a sum of squares of at most `parameter`. values and
    secondDerivatives are at each x; row i of `coefficients`, n - 1 by 4, has the ascending powers
    of x - x[i] between x[i] and x[i + 1]. *effectiveParameters is the trace of the matrix from y to
    the values. lambda 0 interpolates. One sample gives a constant and two give a line, with lambda
    0. If the result of method 0 or 2 is the straight line, *lambda is infinite; method 0 takes the
    line unless the score of some lambda is below that of the line by more than 1e-7 of it. Method 0
    searches from 1e-6 to 100 n^4, in units of the cube of the mean spacing over the square of the
    largest deviation. It therefore does not find smaller values, as samples far closer than the
    mean spacing may need, and may miss the lowest of several minima. The sum of squares contains
    the rounding errors of y: if the `parameter` of method 2 is below them, lambda is 0 or has no
    correct digit. Sources: C. H. Reinsch, Smoothing by spline functions, 1967; P. Craven, G. Wahba,
    Smoothing noisy data with spline functions, 1979; G. Wahba, Improper priors, spline smoothing
    and the problem of guarding against model errors in regression, 1978; G. J. Bierman,
    Factorization Methods for Discrete Sequential Estimation, 1977.
    Codes: ErrEmptyInput (x or y is empty), ErrSizeMismatch (x, y and deviations differ in
    length), ErrInvalidSelector (method), ErrNonFiniteInput (an array or parameter),
    ErrNotStrictlyPositive (a deviation), ErrNegativeSetting (parameter of methods 1 and 2 below
    0 or NaN), ErrAbscissaeOrder (x does not ascend), ErrOutOfMemory (no memory, more than 29
    million samples, or an array cannot be resized).
    NaN: x, y, deviations refused with ErrNonFiniteInput; parameter refused with ErrNegativeSetting
    or in no result. */
QX_API ErrorCode CubicSplineFit_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D deviations,
                                     int32_t method, double parameter, QX_OUT DBL1D values,
                                     QX_OUT DBL2D coefficients, QX_OUT DBL1D secondDerivatives,
                                     QX_OUT double *lambda, QX_OUT double *effectiveParameters);

/** The spline of a degree of 1 to 9 that minimises the sum of |w| (y - s(x))^2, by orthogonal
    factors of the banded matrix of B-splines. x does not descend; weights are empty (all 1) or one
    per sample. The interior knots are interiorKnots, of which at most degree + 1 may be equal. If
    interiorKnots is empty, they are `interior` knots at the quantiles (i + 1) / (interior + 1) of
    x, with linear interpolation between samples. knots: x[0] degree + 1 times, the interior knots,
    x[n - 1] degree + 1 times. coefficients: those of the B-splines of these knots (C. de Boor, A
    Practical Guide to Splines, 1978), degree + 1 more than there are interior knots. values: the
    spline at each x. *mse: the minimum over n.
    Codes: ErrEmptyInput (x or y is empty), ErrSizeMismatch (x, y and weights differ in length),
    ErrOrderNotPositive (degree is outside 1 to 9), ErrNegativeCount (interior), ErrNonFiniteInput
    (an array), ErrAbscissaeOrder (x descends; interiorKnots descend, repeat too often or are not
    strictly inside x[0] to x[n - 1]), ErrPolynomialOrderTooHigh (more coefficients than samples, or
    too few different x with non-zero weight in the support of a B-spline), ErrOutOfMemory (no
    memory, or an array cannot be resized).
    NaN: x, y, w, interiorKnots refused with ErrNonFiniteInput. */
QX_API ErrorCode BSplineFit_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w, int32_t degree,
                                 int32_t interior, QX_IN DBL1D interiorKnots, QX_OUT DBL1D knots,
                                 QX_OUT DBL1D coefficients, QX_OUT DBL1D values,
                                 QX_OUT double *mse);

QX_END_DECLS

#endif
