#ifndef QX_LINEAR_FITS_H
#define QX_LINEAR_FITS_H

/* Least-squares fits of models that are linear in their coefficients: a line, a polynomial, and any
   matrix of terms. Weights are empty or one per sample and count by their absolute values; a mean
   squared error (MSE) is the sum of |w| (y - fit)^2 over the number of samples, formed as
   y^2 + (fit - 2 y) fit, so that a fit without residuals may leave one of the size of 2.2e-16 times
   y^2 of either sign. A failure empties the arrays and makes the numbers NaN.

   Overflow is not looked for: coefficients and values that pass the largest number become infinite
   or NaN, with the code 0. The MSE does so for y from 1e154 on, covariances for columns of H below
   1e-154. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The line y = slope x + intercept; its values take the place of y. In closed form with plain
    sums, so abscissae that are all equal give NaN or infinities and no failure, abscissae far from
    0 cost digits, and those whose squares leave the range, from 1e154 on or all below 1e-162, give
    NaN or infinities, too. Weights that are all 0 count as none.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrOutOfMemory (no memory where x or w is y).
    NaN: y, x in all results; w refused with ErrNonFiniteInput. */
QX_API ErrorCode LinFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, QX_OUT double *slope,
                             QX_OUT double *intercept, QX_OUT double *mse);
/** As LinFit_head, for the coefficients alone and without weights. The function result is 0 and the
    code stands in *err.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two
    samples). */
QX_API int32_t LinFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_OUT double *slope,
                               QX_OUT double *intercept, QX_OUT ErrorCode *err);
/** As LinFitCoef_head, with weights as in LinFit_head.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0).
    NaN: y, x in all results; w refused with ErrNonFiniteInput. */
QX_API int32_t LinFitCoef80_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, QX_OUT double *slope,
                                 QX_OUT double *intercept, QX_OUT ErrorCode *err);

/** The polynomial sum of coefficients[j] x^j, j = 0 to `order`, and its values. In raw powers of x:
    for a high order bring x to the size of 1 beforehand, since powers beyond the range fail and
    those below it make coefficients infinite. algorithm: as GenLSFit80_head. At most 26
    coefficients are fitted; those of orders above 25 are 0, with a warning.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrPolynomialOrderNegative (order is
    negative), ErrPolynomialOrderTooHigh (not more samples than `order`), ErrOutOfMemory (no memory,
    or the host refused a resize), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput (a
    power of x, or with algorithm 5 a y, is not finite), ErrSingularMatrix (algorithms 1 to 5 met a
    singular system), ErrIterationLimit (the singular values do not converge),
    WarnPolynomialOrderCapped (order is above 25).
    NaN: x refused with ErrNonFiniteInput or refused with ErrSingularMatrix; y refused with
    ErrNonFiniteInput or in all results or in some results. */
QX_API ErrorCode PolyFit_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, int32_t algorithm,
                              QX_OUT DBL1D fit, QX_OUT DBL1D coefficients, QX_OUT double *mse);
/** As PolyFit_head, with coefficients that are given: that of order fixedOrders[i] is
    fixedValues[i]. The last one of equal orders counts, and orders beyond the polynomial's do not.
    Where all are given nothing is solved. Above order 25 the free ones among the first 26 are
    fitted, or if these are less than two, the first two free ones of all.
    Codes: ErrSizeMismatch (x and y, or orders and values, differ in length),
    ErrPolynomialOrderNegative (order is negative), ErrPolynomialOrderTooHigh (not more samples than
    `order` less the number of fixed orders, or less samples than free terms), ErrOutOfMemory (no
    memory, or the host refused a resize), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput
    (a power of x, or with algorithm 5 a y, is not finite), ErrSingularMatrix (algorithms 1 to 5 met
    a singular system), ErrIterationLimit (the singular values do not converge), ErrEmptyInput (no
    sample, with all coefficients given), WarnPolynomialOrderCapped (order is above 25).
    NaN: x refused with ErrNonFiniteInput; y in some results; fixedValues in all results. */
QX_API ErrorCode PolyFit80_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, int32_t algorithm,
                                QX_IN I32_1D fixedOrders, QX_IN DBL1D fixedValues, QX_OUT DBL1D fit,
                                QX_OUT DBL1D coefficients, QX_OUT double *mse);
/** As PolyFit80_head, with weights. Of NIST's set Filip the coefficients keep 8.8 digits, of Wampler5
    6.6; PolyFit2026_head keeps 14 and 15.
    Codes: ErrSizeMismatch (x, y and weights, or orders and values, differ in length),
    ErrPolynomialOrderNegative (order is negative), ErrPolynomialOrderTooHigh (not more samples than
    `order` less the number of fixed orders, or less samples than free terms), ErrOutOfMemory (no
    memory, or the host refused a resize), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput
    (a weight or a power of x, or with algorithm 5 a y, is not finite), ErrSingularMatrix
    (algorithms 1 to 5 met a singular system), ErrIterationLimit (the singular values do not
    converge), ErrEmptyInput (no sample, with all coefficients given), WarnPolynomialOrderCapped
    (order is above 25).
    NaN: x, w refused with ErrNonFiniteInput; y, fixedValues in some results. */
QX_API ErrorCode PolyFit81_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, QX_IN DBL1D w,
                                int32_t algorithm, QX_IN I32_1D fixedOrders,
                                QX_IN DBL1D fixedValues, QX_OUT DBL1D fit,
                                QX_OUT DBL1D coefficients, QX_OUT double *mse);

/** As PolyFit81_head, with coefficients that are exact to nearly the last digit for x, y and weights
    as they are given, in place of an algorithm a tolerance, and up to order 50. Without fixed orders
    Chebyshev polynomials of x brought to [-1, 1] are fitted, else the free powers of x over a power
    of two, and improved as in GenLSFit2026_head; the coefficients of powers follow in pairs of
    doubles. Singular values up to n times the tolerance times the largest one count as 0; a
    tolerance below 0, or NaN, is 2.2e-16. fit has the values before the coefficients are rounded,
    and *mse is the mean of |w| r^2 of the residuals r = y - fit. What overflows is infinite or NaN.
    Codes: ErrSizeMismatch (x, y and weights, or orders and values, differ in length), ErrEmptyInput
    (no samples), ErrPolynomialOrderNegative (order is negative), ErrPolynomialOrderTooHigh (order is
    above 50, or there are not more samples than `order` less the number of fixed orders, or less
    samples than free terms), ErrOutOfMemory (no memory, or the host refused a resize),
    ErrNonFiniteInput (x, y, a weight or a fixed value is not finite), ErrIterationLimit (the
    singular values do not converge), WarnRankDeficient (singular values count as 0; the results
    are valid).
    NaN: x, y, w, fixedValues refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PolyFit2026_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, QX_IN DBL1D w,
                                  double tolerance, QX_IN I32_1D fixedOrders,
                                  QX_IN DBL1D fixedValues, QX_OUT DBL1D fit,
                                  QX_OUT DBL1D coefficients, QX_OUT double *mse);

/** The coefficients c that minimise the weighted squares of y - H c, for a matrix with one row per
    sample, and fit = H c. algorithm: 0 singular values; 1 to 3 Householder QR; 4 LU
    factorisation of the normal equations, which square the condition of H; 5 Cholesky factorisation
    of these; 6 singular
    values without those up to n times 2.2e-16 of the largest. Where columns depend on each other, 6
    gives the shortest of the solutions, and 0 one that rounding errors decide. Where wantCovariance
    is not 0, `covariance` is the inverse of H^T |W| H (not scaled by the MSE), else 0 by 0.
    Algorithms 1 to 5 invert that matrix by its singular values, with loss of digits where its norm
    is below 1 (SVD_head): for a condition number of H of 30 measured 2e-10 of the largest element
    at a norm of 1e-4, 3e-6 at 1e-8 and 4e-2 at 1e-12; 0 and 6 lose none. Of NIST's set Wampler5 the
    coefficients keep 6.6 digits, of Longley 11.7; GenLSFit2026_head keeps all that the data determine.
    Codes: ErrSizeMismatch (H, y and weights differ in length), ErrOutOfMemory (no memory, or the
    host refused a resize), ErrOrderNotPositive (H has no columns), ErrPolynomialOrderTooHigh (less
    rows than columns), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput (H or a weight, or
    with algorithm 5 a y, is not finite, where the method tests it), ErrSingularMatrix (algorithms 1
    to 5 met a singular system), ErrIterationLimit (the singular values do not converge).
    NaN: H, w refused with ErrNonFiniteInput; y refused with ErrNonFiniteInput or in some
    results. */
QX_API ErrorCode GenLSFit80_head(QX_IN DBL2D H, QX_IN DBL1D y, QX_IN DBL1D w, int32_t algorithm,
                                 int32_t wantCovariance, QX_OUT DBL1D coefficients,
                                 QX_OUT DBL1D fit, QX_OUT DBL2D covariance, QX_OUT double *mse);
/** As GenLSFit80_head, with coefficients that are exact to nearly the last digit for H, y and weights
    as they are given, where the condition number of H with columns of one length is below 1e13. A
    solution by the singular values of SVD2026_head is improved by residuals and their products with
    H in pairs of doubles (A. Bjorck, "Stability analysis of the method of seminormal equations for
    linear least squares problems", 1987). Columns and y are scaled by powers of two first. Singular
    values up to n times the tolerance times the largest one count as 0, and of all solutions the one
    with the shortest scaled coefficients is taken; a tolerance below 0, or NaN, is 2.2e-16. fit has
    the values before the coefficients are rounded, and *mse is the mean of |w| r^2 of the residuals
    r = y - fit. What overflows is infinite.
    Codes: ErrSizeMismatch (H, y and weights differ in length), ErrOrderNotPositive (H has no
    columns), ErrPolynomialOrderTooHigh (less rows than columns), ErrOutOfMemory (no memory, or the
    host refused a resize), ErrNonFiniteInput (H, y or a weight is not finite), ErrIterationLimit
    (the singular values do not converge), WarnRankDeficient (singular values count as 0; the results
    are valid).
    NaN: H, y, w refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode GenLSFit2026_head(QX_IN DBL2D H, QX_IN DBL1D y, QX_IN DBL1D w, double tolerance,
                                   int32_t wantCovariance, QX_OUT DBL1D coefficients,
                                   QX_OUT DBL1D fit, QX_OUT DBL2D covariance, QX_OUT double *mse);
/** As GenLSFit80_head, with standard deviations: the weights are 1 / sd^2, and 1 where sd is 0.
    NaN: H, deviations refused with ErrNonFiniteInput or refused with ErrSingularMatrix; y refused
    with ErrNonFiniteInput or in all results or in some results. */
QX_API ErrorCode GenLSFit_head(QX_IN DBL2D H, QX_IN DBL1D y, QX_IN DBL1D deviations,
                               int32_t algorithm, int32_t wantCovariance, QX_OUT DBL1D coefficients,
                               QX_OUT DBL1D fit, QX_OUT DBL2D covariance, QX_OUT double *mse);

/** How well `fit` describes y: *sse, the weighted sum of squared residuals; *rSquare, 1 less its
    ratio to the squares of y about its mean; *rmse, sqrt(sse / dof). The weights count with their
    signs, and the mean is the plain one. dof, the residual degrees of freedom, becomes n - 2 where
    it is not above 0; with two samples that is 0, and *rmse NaN or infinite. Where all y are equal,
    *rSquare is 1 without residuals, else infinite. Where rounding leaves *sse below 0, as it may
    for a fit without residuals, *rmse is NaN. From 1e154 on y and fit overflow: all three are
    infinite or NaN.
    Codes: ErrEmptyInput (y is empty), ErrSizeMismatch (the arrays differ in length),
    ErrFewerThanTwo (one sample), ErrTooFewForParameters (not more samples than dof).
    NaN: y, fit, w in all results. */
QX_API ErrorCode GoodnessOfFit_head(QX_IN DBL1D y, QX_IN DBL1D fit, QX_IN DBL1D w, int32_t dof,
                                    QX_OUT double *sse, QX_OUT double *rSquare,
                                    QX_OUT double *rmse);

/** One damped step of a fit: solves for d the system a d = gradient, in which the diagonal of a is
    multiplied by 1 + *lambda, and adds d to the coefficients. A step that overflows makes a
    coefficient infinite, with the code 0. The code stands in *err and is the function result, too.
    Codes: ErrEmptyInput (the sizes are 0 or disagree), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (a diagonal element is not finite), ErrSingularMatrix (the system is singular,
    or a new coefficient is NaN).
    NaN: coefficients, gradient refused with ErrSingularMatrix; a refused with ErrNonFiniteInput or
    refused with ErrSingularMatrix; lambda refused with ErrNonFiniteInput. */
QX_API ErrorCode GetNewCoef_head(QX_INOUT DBL1D coefficients, QX_IN DBL2D a, QX_IN DBL1D gradient,
                                 QX_IN const double *lambda, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
