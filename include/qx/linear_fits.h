#ifndef QX_LINEAR_FITS_H
#define QX_LINEAR_FITS_H

/* Least-squares fits of models that are linear in their coefficients: a line, a polynomial, and any
   matrix of terms. The weights are empty, or there is one per sample; only their absolute values
   count. A mean squared error (MSE) is the sum of |w| (y - fit)^2 divided by the number of samples.
   Each square is computed as y^2 + (fit - 2 y) fit, so an exact fit may have an MSE of about
   2.2e-16 times y^2, of either sign. A failure empties the arrays and sets the numbers to NaN.

   Overflow is not checked for: coefficients and values that overflow become infinite or NaN, with
   the code 0. The MSE overflows for y of 1e154 and above, and covariances overflow for columns of H
   below 1e-154. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The line y = slope x + intercept; its values replace y. The closed form is evaluated with plain
    sums, so abscissae that are all equal give NaN or infinities without a failure, abscissae far
    from 0 lose digits, and those whose squares leave the range of double, at 1e154 and above or all
    below 1e-162, give NaN or infinities, too. Weights that are all 0 count as no weights.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrOutOfMemory (no memory to copy x or w where it is the same array as y).
    NaN: y, x in all results; w refused with ErrNonFiniteInput. */
QX_API ErrorCode LinFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, QX_OUT double *slope,
                             QX_OUT double *intercept, QX_OUT double *mse);
/** As LinFit_head, for the coefficients only and without weights. The function result is 0 and the
    code is in *err.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two
    samples). */
QX_API int32_t LinFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_OUT double *slope,
                               QX_OUT double *intercept, QX_OUT ErrorCode *err);
/** As LinFitCoef_head, with weights as in LinFit_head.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0).
    NaN: y, x in all results; w refused with ErrNonFiniteInput. */
QX_API int32_t LinFitCoef80_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, QX_OUT double *slope,
                                 QX_OUT double *intercept, QX_OUT ErrorCode *err);

/** The polynomial sum of coefficients[j] x^j, j = 0 to `order`, and its values. The fit is in plain
    powers of x: for a high order, scale x to a magnitude of about 1, since powers that overflow
    give a failure and powers that underflow make coefficients infinite. algorithm: as
    GenLSFit80_head. At most 26 coefficients are fitted; those of orders above 25 are 0, with a
    warning.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrPolynomialOrderNegative (order is
    negative), ErrPolynomialOrderTooHigh (no more samples than `order`), ErrOutOfMemory (no memory,
    or the host refused a resize), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput (a
    power of x or, with algorithm 5, an element of y is not finite), ErrSingularMatrix (algorithms 1
    to 5: the system is singular), ErrIterationLimit (the singular values do not converge),
    WarnPolynomialOrderCapped (order is above 25).
    NaN: x refused with ErrNonFiniteInput or refused with ErrSingularMatrix; y refused with
    ErrNonFiniteInput or in all results or in some results. */
QX_API ErrorCode PolyFit_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, int32_t algorithm,
                              QX_OUT DBL1D fit, QX_OUT DBL1D coefficients, QX_OUT double *mse);
/** As PolyFit_head, with some coefficients fixed: that of order fixedOrders[i] is fixedValues[i].
    If an order occurs more than once, its last value counts, and orders above that of the
    polynomial are ignored. If all coefficients are fixed, nothing is solved. Above order 25 the
    free coefficients among the first 26 are fitted or, if there are fewer than two of these, the
    first two free coefficients of all.
    Codes: ErrSizeMismatch (x and y, or orders and values, differ in length),
    ErrPolynomialOrderNegative (order is negative), ErrPolynomialOrderTooHigh (no more samples than
    `order` minus the number of fixed orders, or fewer samples than free terms), ErrOutOfMemory (no
    memory, or the host refused a resize), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput
    (a power of x or, with algorithm 5, an element of y is not finite), ErrSingularMatrix
    (algorithms 1 to 5: the system is singular), ErrIterationLimit (the singular values do not
    converge), ErrEmptyInput (there are no samples, and all coefficients are fixed),
    WarnPolynomialOrderCapped (order is above 25).
    NaN: x refused with ErrNonFiniteInput; y in some results; fixedValues in all results. */
QX_API ErrorCode PolyFit80_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, int32_t algorithm,
                                QX_IN I32_1D fixedOrders, QX_IN DBL1D fixedValues, QX_OUT DBL1D fit,
                                QX_OUT DBL1D coefficients, QX_OUT double *mse);
/** As PolyFit80_head, with weights. The coefficients have 8.8 correct digits for NIST's data set
    Filip and 6.6 for Wampler5; those of PolyFit2026_head have 14 and 15.
    Codes: ErrSizeMismatch (x, y and weights, or orders and values, differ in length),
    ErrPolynomialOrderNegative (order is negative), ErrPolynomialOrderTooHigh (no more samples than
    `order` minus the number of fixed orders, or fewer samples than free terms), ErrOutOfMemory (no
    memory, or the host refused a resize), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput
    (a weight, a power of x or, with algorithm 5, an element of y is not finite), ErrSingularMatrix
    (algorithms 1 to 5: the system is singular), ErrIterationLimit (the singular values do not
    converge), ErrEmptyInput (there are no samples, and all coefficients are fixed),
    WarnPolynomialOrderCapped (order is above 25).
    NaN: x, w refused with ErrNonFiniteInput; y, fixedValues in some results. */
QX_API ErrorCode PolyFit81_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, QX_IN DBL1D w,
                                int32_t algorithm, QX_IN I32_1D fixedOrders,
                                QX_IN DBL1D fixedValues, QX_OUT DBL1D fit,
                                QX_OUT DBL1D coefficients, QX_OUT double *mse);

/** As PolyFit81_head, with coefficients that are accurate to nearly the last digit for the given x,
    y and weights, with a tolerance in place of the algorithm, and up to order 50. Without fixed
    orders Chebyshev polynomials of x mapped to [-1, 1] are fitted, otherwise the free powers of x
    divided by a power of two. The fit is refined as in GenLSFit2026_head, and the coefficients of
    powers are computed from it in double-double precision. Singular values up to n times the
    tolerance times the largest one count as 0; a tolerance that is negative or NaN selects 2.2e-16.
    fit holds the values before the coefficients are rounded, and *mse is the mean of |w| r^2 of the
    residuals r = y - fit. Results that overflow are infinite or NaN.
    Codes: ErrSizeMismatch (x, y and weights, or orders and values, differ in length), ErrEmptyInput
    (no samples), ErrPolynomialOrderNegative (order is negative), ErrPolynomialOrderTooHigh (order
    is above 50, or there are no more samples than `order` minus the number of fixed orders, or
    fewer samples than free terms), ErrOutOfMemory (no memory, or the host refused a resize),
    ErrNonFiniteInput (x, y, a weight or a fixed value is not finite), ErrIterationLimit (the
    singular values do not converge), WarnRankDeficient (singular values count as 0; the results are
    valid).
    NaN: x, y, w, fixedValues refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PolyFit2026_head(QX_IN DBL1D x, QX_IN DBL1D y, int32_t order, QX_IN DBL1D w,
                                  double tolerance, QX_IN I32_1D fixedOrders,
                                  QX_IN DBL1D fixedValues, QX_OUT DBL1D fit,
                                  QX_OUT DBL1D coefficients, QX_OUT double *mse);

/** The coefficients c that minimise the weighted sum of squares of y - H c, for a matrix with one
    row per sample, and fit = H c. algorithm: 0 singular values; 1 to 3 Householder QR; 4 LU
    factorisation of the normal equations, whose condition number is the square of that of H; 5
    Cholesky factorisation of the normal equations; 6 singular values, of which those up to n times
    2.2e-16 times the largest are left out. If columns are linearly dependent, 6 gives the solution
    of smallest norm, and 0 one that is determined by rounding errors. If wantCovariance is not 0,
    `covariance` is the inverse of H^T |W| H (not scaled by the MSE), otherwise 0 by 0. Algorithms 1
    to 5 invert that matrix by its singular values, which loses digits if its norm is below 1
    (SVD_head): for a condition number of H of 30 the error was 2e-10 of the largest element at a
    norm of 1e-4, 3e-6 at 1e-8 and 4e-2 at 1e-12; algorithms 0 and 6 lose none. The coefficients
    have 6.6 correct digits for NIST's data set Wampler5 and 11.7 for Longley; those of
    GenLSFit2026_head have all digits that the data determine.
    Codes: ErrSizeMismatch (H, y and weights differ in length), ErrOutOfMemory (no memory, or the
    host refused a resize), ErrOrderNotPositive (H has no columns), ErrPolynomialOrderTooHigh (fewer
    rows than columns), ErrInvalidSelector (no such algorithm), ErrNonFiniteInput (H, a weight or,
    with algorithm 5, an element of y is not finite, if the method checks it), ErrSingularMatrix
    (algorithms 1 to 5: the system is singular), ErrIterationLimit (the singular values do not
    converge).
    NaN: H, w refused with ErrNonFiniteInput; y refused with ErrNonFiniteInput or in some
    results. */
QX_API ErrorCode GenLSFit80_head(QX_IN DBL2D H, QX_IN DBL1D y, QX_IN DBL1D w, int32_t algorithm,
                                 int32_t wantCovariance, QX_OUT DBL1D coefficients,
                                 QX_OUT DBL1D fit, QX_OUT DBL2D covariance, QX_OUT double *mse);
/** As GenLSFit80_head, with coefficients that are accurate to nearly the last digit for the given
    H, y and weights, if the condition number of H with columns of equal length is below 1e13. A
    solution by the singular value decomposition of SVD2026_head is refined with residuals, and
    their products with H, in double-double precision (A. Bjorck, "Stability analysis of the method
    of seminormal equations for linear least squares problems", 1987). Columns and y are first
    scaled by powers of two. Singular values up to n times the tolerance times the largest one count
    as 0, and of all solutions the one whose scaled coefficients have the smallest norm is returned;
    a tolerance that is negative or NaN selects 2.2e-16. fit holds the values before the
    coefficients are rounded, and *mse is the mean of |w| r^2 of the residuals r = y - fit. Results
    that overflow are infinite.
    Codes: ErrSizeMismatch (H, y and weights differ in length), ErrOrderNotPositive (H has no
    columns), ErrPolynomialOrderTooHigh (fewer rows than columns), ErrOutOfMemory (no memory, or the
    host refused a resize), ErrNonFiniteInput (H, y or a weight is not finite), ErrIterationLimit
    (the singular values do not converge), WarnRankDeficient (singular values count as 0; the
    results are valid).
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

/** Goodness of a fit: *sse, the weighted sum of squared residuals; *rSquare, 1 minus the ratio of
    *sse to the sum of squares of y about its mean; *rmse, sqrt(sse / dof). The weights count with
    their signs, and the mean is unweighted. If dof, the residual degrees of freedom, is not above
    0, n - 2 is used; with two samples that is 0, and *rmse is NaN or infinite. If all y are equal,
    *rSquare is 1 for residuals of 0 and infinite otherwise. If rounding errors make *sse negative,
    as may happen for an exact fit, *rmse is NaN. The squares of y and fit overflow at 1e154 and
    above: all three are then infinite or NaN.
    Codes: ErrEmptyInput (y is empty), ErrSizeMismatch (the arrays differ in length),
    ErrFewerThanTwo (one sample), ErrTooFewForParameters (no more samples than dof).
    NaN: y, fit, w in all results. */
QX_API ErrorCode GoodnessOfFit_head(QX_IN DBL1D y, QX_IN DBL1D fit, QX_IN DBL1D w, int32_t dof,
                                    QX_OUT double *sse, QX_OUT double *rSquare,
                                    QX_OUT double *rmse);

/** One damped step of a fit: solves for d the system a d = gradient, in which the diagonal of a is
    multiplied by 1 + *lambda, and adds d to the coefficients. A step that overflows makes a
    coefficient infinite, with the code 0. A fit by such steps has neither bounds nor a covariance;
    NonlinearFit2026 makes the whole fit, with both. The code is in *err and is the function result.
    Codes: ErrEmptyInput (the sizes are 0 or disagree), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (a diagonal element is not finite), ErrSingularMatrix (the system is singular,
    or a new coefficient is NaN).
    NaN: coefficients, gradient refused with ErrSingularMatrix; a refused with ErrNonFiniteInput or
    refused with ErrSingularMatrix; lambda refused with ErrNonFiniteInput. */
QX_API ErrorCode GetNewCoef_head(QX_INOUT DBL1D coefficients, QX_IN DBL2D a, QX_IN DBL1D gradient,
                                 QX_IN const double *lambda, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
