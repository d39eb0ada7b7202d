#ifndef QX_FIT_BOUNDS_H
#define QX_FIT_BOUNDS_H

/* Confidence and prediction bounds of the coefficients, the curve and further observations of a
   fit. The inputs are the samples, as passed to the fit, and its coefficients. With J the
   derivatives of the model with respect to the p coefficients at each x (row j), W the absolute
   weights, n the number of non-zero weights and s^2 = (sum of |w| (y - f)^2) / (n - p), the bounds
   at a confidence, 0 < confidence < 1, are

       coefficient i:   c[i] -+ t s sqrt((J' W J)^-1[i, i])
       confidence:      f(x) -+ t s sqrt(j' (J' W J)^-1 j)
       prediction:      f(x) -+ t s sqrt(j' (J' W J)^-1 j + 1)

   where t is the (1 + confidence) / 2 quantile of Student's distribution with n - p degrees of
   freedom. Confidence bounds are for the curve itself at one x (not for all x simultaneously),
   prediction bounds for one more observation of weight 1 there. Weights are inverse variances up to
   a factor; if the array is empty, they are all 1. If all weights are 0, no sample counts.

   A sample of weight 0 has bounds, too: to obtain bounds at other x, append these x with any y and
   the weight 0.

   The bounds hold exactly for models that are linear in the coefficients with normal errors; other
   models are linearised at the coefficients, which are used as they are: coefficients that do not
   minimise the sum of squares give wider bounds, since s^2 is computed from them. J is factored
   (QR, in blocks of rows), never J' W J. J is taken to have full rank if no weighted column depends
   on those before it within (16 + p) times 2.2e-16. The bounds lose digits according to the
   condition of J with columns scaled to equal length, so centre the x of polynomials. If the
   residuals are as small as the rounding errors of y, so are the widths. Bounds that overflow are
   infinite; confidences below 1e-140 give a width of 0.

   A failure empties the outputs.

   Sources: N. R. Draper, H. Smith, Applied Regression Analysis, 3rd edition, 1998; for models not
   linear in their coefficients, D. M. Bates, D. G. Watts, Nonlinear Regression Analysis and Its
   Applications, 1988. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Bounds of the line y = slope x + intercept; coefficients: slope, intercept (LinFit_head).
    lowerCoefficients and upperCoefficients have a value per coefficient, lowerCurve and upperCurve
    the confidence bounds at each sample.
    Codes: ErrEmptyInput (x, y or the coefficients are empty), ErrSizeMismatch (x, y and weights
    differ in length, or the number of coefficients is not that of the model), ErrFewerThanThree
    (fewer than three samples), ErrNonFiniteInput (an input is NaN or infinite, or, later, a value,
    derivative or weighted residual of the model overflows), ErrTooFewForParameters (no more
    non-zero weights than coefficients), ErrProbabilityOutOfRange (confidence), ErrSingularMatrix (J
    does not have full rank, for example because all x are equal), ErrOutOfMemory (no memory, or an
    array cannot be resized).
    NaN: x, y, w, coefficients refused with ErrNonFiniteInput; confidence refused with
    ErrProbabilityOutOfRange. */
QX_API ErrorCode ConfBndLinear_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                    QX_IN DBL1D coefficients, double confidence,
                                    QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                    QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndLinear_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndLinear_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                    QX_IN DBL1D coefficients, double confidence,
                                    QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

/** As ConfBndLinear_head, of y = a exp(b x); coefficients: a, b (ExpFit80_head). J also lacks full
    rank if a is 0. */
QX_API ErrorCode ConfBndExp_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                 QX_IN DBL1D coefficients, double confidence,
                                 QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                 QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndExp_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndExp_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                 QX_IN DBL1D coefficients, double confidence,
                                 QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

/** As ConfBndLinear_head, of y = a x^b, x above 0; coefficients: a, b (PowerFit_head). J also lacks
    full rank if a is 0.
    Codes: ErrEmptyInput (x, y or the coefficients are empty), ErrSizeMismatch (x, y and weights
    differ in length, or there are not two coefficients), ErrFewerThanThree (fewer than three
    samples), ErrNonFiniteInput (an input is NaN or infinite, or, later, a value, derivative or
    weighted residual of the model overflows), ErrNotStrictlyPositive (an x is not above 0),
    ErrTooFewForParameters (no more non-zero weights than coefficients), ErrProbabilityOutOfRange
    (confidence), ErrSingularMatrix (J does not have full rank: a is 0, or all x are equal),
    ErrOutOfMemory (no memory, or an array cannot be resized). */
QX_API ErrorCode ConfBndPower_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                   QX_IN DBL1D coefficients, double confidence,
                                   QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                   QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndPower_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndPower_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                   QX_IN DBL1D coefficients, double confidence,
                                   QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

/** As ConfBndPower_head, of y = a log(b x) to the given base; coefficients: a, b (LogFit_head). A
    base of 2.71828, exactly these six digits, means e. ErrNotStrictlyPositive means here that b x
    is not above 0 for all x, or that the base is not above 0, or is 1.
    NaN: x, y, w, coefficients refused with ErrNonFiniteInput; base refused with
    ErrNotStrictlyPositive; confidence refused with ErrProbabilityOutOfRange. */
QX_API ErrorCode ConfBndLog_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                 QX_IN DBL1D coefficients, double base, double confidence,
                                 QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                 QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndLog_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndLog_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                 QX_IN DBL1D coefficients, double base, double confidence,
                                 QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

/** As ConfBndLinear_head, of y = a exp(-((x - c) / s)^2 / 2); coefficients: a, c, s
    (GaussianPeakFit_head). J does not have full rank if a or s is 0, or if the curve is 0 at all
    samples of non-zero weight. */
QX_API ErrorCode ConfBndGauss_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                   QX_IN DBL1D coefficients, double confidence,
                                   QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                   QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndGauss_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndGauss_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                   QX_IN DBL1D coefficients, double confidence,
                                   QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

/** As ConfBndLinear_head, of the polynomial sum of coefficients[j] x^j, with any number of
    coefficients (PolyFit_head). As in the fit, at most the first 26 are parameters; the others are
    taken as given and have no width. J does not have full rank if there are fewer different x than
    parameters. */
QX_API ErrorCode ConfBndPoly_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                  QX_IN DBL1D coefficients, double confidence,
                                  QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                  QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndPoly_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndPoly_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w,
                                  QX_IN DBL1D coefficients, double confidence,
                                  QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

/** As ConfBndLinear_head, of y = H c for a matrix with one row per sample and one column per
    coefficient (GenLSFit80_head); any number of samples above the number of columns is allowed.
    Codes: ErrEmptyInput (H, y or the coefficients are empty), ErrSizeMismatch (H, y and weights
    differ in length, or there are not as many coefficients as columns), ErrNonFiniteInput (an input
    is NaN or infinite, or, later, a value, derivative or weighted residual of the model overflows),
    ErrTooFewForParameters (no more non-zero weights than coefficients), ErrProbabilityOutOfRange
    (confidence), ErrSingularMatrix (J does not have full rank: its columns are linearly dependent),
    ErrOutOfMemory (no memory, or an array cannot be resized).
    NaN: H, y, w, coefficients refused with ErrNonFiniteInput; confidence refused with
    ErrProbabilityOutOfRange. */
QX_API ErrorCode ConfBndGenLS_head(QX_IN DBL2D H, QX_IN DBL1D y, QX_IN DBL1D w,
                                   QX_IN DBL1D coefficients, double confidence,
                                   QX_OUT DBL1D lowerCoefficients, QX_OUT DBL1D upperCoefficients,
                                   QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);
/** As ConfBndGenLS_head, with prediction bounds for the curve, and without bounds for the
    coefficients. */
QX_API ErrorCode PredBndGenLS_head(QX_IN DBL2D H, QX_IN DBL1D y, QX_IN DBL1D w,
                                   QX_IN DBL1D coefficients, double confidence,
                                   QX_OUT DBL1D lowerCurve, QX_OUT DBL1D upperCurve);

QX_END_DECLS

#endif
