#ifndef QX_MODEL_FITS_H
#define QX_MODEL_FITS_H

/* Least-squares fits of an exponential, a power, a logarithm and a Gaussian peak. The weights are
   empty, or there is one per sample. Only their absolute values count, and weights that are all 0
   count as no weights. The mean squared error (MSE) is that of qx/linear_fits.h. An iteration ends
   when the relative change of the MSE is below `tolerance` or the MSE is not above `floor`; values
   of 0 or below select 0.0001 and 1e-12. *iterations is the limit on entry (a negative limit allows
   no step) and the number of steps on return. The time of a step is proportional to the number of
   samples; if the tolerance cannot be reached, a fit makes as many steps as the limit allows. A
   guess has one value for each coefficient. Of a longer guess, only the first values are used; a
   shorter one is ignored; both give a warning. A failure empties y where it is an output and sets
   the numbers to NaN.

   Overflow is not checked for: if a coefficient or a value of the model overflows, as the
   exponential of 710 does, it is infinite and the results that depend on it are infinite or NaN,
   with the code 0. The MSE overflows for y of 1e154 and above. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** y = a exp(b x) by the line through (x, ln |y|) with weights w y^2, which compensate for the
    logarithm; the values of the fit replace y. Samples that do not have the sign of the majority
    are ignored. deviations holds the standard deviations of the samples: the weights w are 1 /
    deviations^2, and 1 where a deviation is 0. If all x that count are equal, the exponential is
    not determined: rounding errors select one of those that pass through the mean of ln |y|, and
    most are so steep that a or b is infinite or 0 and the values are infinite or NaN, with the code
    0. b also overflows if the x are within about 1e-306 of each other.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrPolynomialOrderTooHigh (fewer than two values have the sign of the majority),
    ErrNonFiniteInput (a sample is not finite), ErrOutOfMemory (no memory), ErrIterationLimit
    (singular values do not converge).
    NaN: y in some results; x, deviations refused with ErrNonFiniteInput. */
QX_API ErrorCode ExpFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D deviations,
                             QX_OUT double *a, QX_OUT double *b, QX_OUT double *mse);
/** y = a exp(b x), with the weights w as given. With method 0 the fit is that of ExpFit_head, and
    *iterations is unchanged; any other method continues from there, or from the guess (a, b), with
    Gauss-Newton steps and returns the best result. A guess that is not finite gives NaN. Steps that
    repeat in a cycle, as rounding errors cause with a small tolerance, are counted but not computed
    again.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrPolynomialOrderTooHigh (fewer than two values have the sign of the majority),
    ErrNonFiniteInput (a sample or the exponential of a step is not finite), ErrOutOfMemory (no
    memory), ErrIterationLimit (singular values do not converge), WarnFitIncomplete (the guess is
    neither empty nor two values long).
    NaN: y in some results; x, w refused with ErrNonFiniteInput; tolerance, floor in no result. */
QX_API ErrorCode ExpFit80_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                               QX_IN DBL1D guess, uint16_t method, QX_OUT double *a,
                               QX_OUT double *b, QX_OUT double *mse, QX_INOUT int32_t *iterations,
                               double floor);
/** As ExpFit_head, for the coefficients only and without weights.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two samples),
    ErrPolynomialOrderTooHigh (fewer than two values have the sign of the majority),
    ErrNonFiniteInput (a sample is not finite), ErrOutOfMemory (no memory), ErrIterationLimit
    (singular values do not converge).
    NaN: y skipped; x refused with ErrNonFiniteInput. */
QX_API ErrorCode ExpFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_OUT double *a, QX_OUT double *b);
/** As ExpFit80_head, for the coefficients only. If a y is NaN, these are the start values, from the
    other samples, and no step is made.
    NaN: y, x, tolerance, floor in no result; w refused with ErrNonFiniteInput; guess in some
    results. */
QX_API ErrorCode ExpFitCoef80_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, int32_t method,
                                   double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                   QX_OUT double *b, QX_INOUT int32_t *iterations, double floor);

/** y = a x^b for x above 0, by Gauss-Newton steps from the guess (a, b), or from the line through
    (ln x, ln |y|) with weights w y^2. The best step is returned, and its values replace y. A guess
    that is not finite gives NaN. Steps in a cycle are treated as in ExpFit80_head. If all x that
    count are equal, rounding errors determine the result, and a or b may be infinite or 0, with the
    code 0; a step may also make b infinite while x^b stays finite.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (fewer than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrNotStrictlyPositive (an x is not above 0), ErrPolynomialOrderTooHigh (fewer than two values
    have the sign of the majority), ErrNonFiniteInput (a sample or the power of a step is not
    finite), ErrOutOfMemory (no memory), ErrIterationLimit (singular values do not converge),
    WarnFitIncomplete (the guess is neither empty nor two values long).
    NaN: y in some results; x refused with ErrNotStrictlyPositive; w refused with ErrNonFiniteInput;
    tolerance, floor in no result. */
QX_API ErrorCode PowerFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                               QX_IN DBL1D guess, QX_OUT double *a, QX_OUT double *b,
                               QX_OUT double *mse, QX_INOUT int32_t *iterations, double floor);
/** As PowerFit_head, for the coefficients only; if a y is NaN, as in ExpFitCoef80_head.
    NaN: y, tolerance, floor in no result; x refused with ErrNotStrictlyPositive; w refused with
    ErrNonFiniteInput; guess in some results. */
QX_API ErrorCode PowerFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                                   QX_IN DBL1D guess, QX_OUT double *a, QX_OUT double *b,
                                   QX_INOUT int32_t *iterations, double floor);

/** y = a log(b x) to the given base, for x of one sign; b has the same sign. The values of the fit
    replace y. The solution is in closed form, by the line through (log |x|, y). The base 2.71828,
    exactly these six digits, means e; e with all its digits is treated as any other base, and the
    results differ in the last bits. If all x are equal, or the base is 1, a and b are NaN, infinite
    or arbitrary, with the code 0. If y hardly depends on x, b is a power of the base that overflows
    to infinity or underflows to 0, and the values are infinite.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrNotStrictlyPositive (the base is 0 or
    below), ErrFewerThanTwo (fewer than two samples), ErrNonFiniteInput (a weight is NaN),
    ErrTooFewWeights (all weights but one are 0), ErrMixedSigns (the x are neither all above nor all
    below 0), ErrOutOfMemory (no memory).
    NaN: y, base in all results; x refused with ErrMixedSigns; w refused with ErrNonFiniteInput. */
QX_API ErrorCode LogFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double base,
                             QX_OUT double *a, QX_OUT double *b, QX_OUT double *mse);
/** As LogFit_head, for the coefficients only. */
QX_API ErrorCode LogFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double base,
                                 QX_OUT double *a, QX_OUT double *b);

/** y = a exp(-((x - c) / s)^2 / 2), a peak up or down, by steepest descent with halved steps from
    the guess (a, c, s), or from a fit to the logarithms of the samples above a tenth of the peak;
    the values of the fit replace y. *iterations counts the trials. Steepest descent converges
    slowly if the magnitudes of a, c and s differ much, and then ends by the tolerance; with a
    tolerance of nearly 0 it may continue for millions of trials, up to the limit. For x of 1e154
    and above, squares overflow: s is infinite, with the code 0. A guess that is not finite is
    ignored. If only the peak sample is above a tenth of its height, the curve goes through three
    points, and *iterations is 0. Of 510 exact peaks and dips of all widths, 242 are missed by more
    than 1e-6 of a coefficient; GaussianPeakFit2026_head finds all of them.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanThree (fewer than three
    samples), ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (fewer than three weights are
    not 0), ErrNonFiniteInput (an x is not finite), ErrFitStartValues (the start value of s is 0, or
    a single-sample peak has no neighbour of its sign on one side), ErrOutOfMemory (no memory),
    WarnFitIncomplete (the guess is neither empty nor three values long).
    NaN: y refused with ErrFitStartValues or in some results; x, w refused with ErrNonFiniteInput;
    tolerance, floor in no result. */
QX_API ErrorCode GaussianPeakFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                      double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                      QX_OUT double *c, QX_OUT double *s, QX_OUT double *mse,
                                      QX_INOUT int32_t *iterations, double floor);
/** As GaussianPeakFit_head, for the coefficients only; if a y is NaN, as in ExpFitCoef80_head.
    NaN: y refused with ErrFitStartValues or in no result; x, w refused with ErrNonFiniteInput;
    tolerance, guess, floor in no result. */
QX_API ErrorCode GaussianPeakFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                          double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                          QX_OUT double *c, QX_OUT double *s,
                                          QX_INOUT int32_t *iterations, double floor);

/** As GaussianPeakFit_head, with start values at every scale and the trust region of
    BoundGaussianFit2026_head, with the same meaning of tolerance and the same iteration limit. A
    guess of three values is the only start; a guess of another length is treated as in
    GaussianPeakFit_head. floor is not used.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFitPointsTooFew (fewer than three
    samples), ErrNonFiniteInput (x, y, w or guess is not finite), ErrTooFewWeights (fewer than three
    weights are not 0), ErrFitStartValues (the guess of s is 0), ErrOutOfMemory (no memory),
    ErrNoUsableFit (the sum of squares is not finite at any start), ErrNonFiniteFunction (the sum of
    squares at the guess is not finite), ErrIterationLimit (the limit is reached; all outputs are
    valid), WarnRankDeficient (the samples do not determine every coefficient), WarnLowAccuracy (the
    fit ends before the coefficients have settled to 7 digits), WarnFitIncomplete (the guess is
    neither empty nor three values long).
    NaN: y, x, w, guess refused with ErrNonFiniteInput; tolerance, floor in no result. */
QX_API ErrorCode GaussianPeakFit2026_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                          double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                          QX_OUT double *c, QX_OUT double *s, QX_OUT double *mse,
                                          QX_INOUT int32_t *iterations, double floor);

QX_END_DECLS

#endif
