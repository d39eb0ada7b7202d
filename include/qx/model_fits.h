#ifndef QX_MODEL_FITS_H
#define QX_MODEL_FITS_H

/* Least-squares fits of an exponential, a power, a logarithm and a Gaussian peak. Weights are empty
   or one per sample, count by their absolute values, and count as none where all are 0; the mean
   squared error (MSE) is that of qx/linear_fits.h. `tolerance` ends an iteration when the MSE
   changes by less than this part of itself, `floor` when it is no larger; 0 or below select 0.0001
   and 1e-12. *iterations is the limit on entry, of which a negative one allows no step, and the
   number of steps on return. A step takes time in proportion to the samples, and with a tolerance
   that it cannot reach a fit makes as many as the limit allows. A guess has one value for each
   coefficient; of a longer one the first values count, a shorter one counts as none, and both give
   a warning. A failure empties y where it is an output and makes the numbers NaN.

   Overflow is not looked for: where a coefficient or a value of the model passes the largest
   number, as with the exponential of 710, it is infinite and what depends on it infinite or NaN,
   with the code 0. The MSE is so for y from 1e154 on. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** y = a exp(b x) by the line through (x, ln |y|) with weights w y^2, which make up for the
    logarithm; its values take the place of y. Samples without the sign of most do not count. The
    weights are 1 / sd^2, and 1 where sd is 0. Where the x that count are all equal, no exponential
    is determined: rounding decides between those through the mean of ln |y|, and most are so steep
    that a or b is infinite or 0 and the values are infinite or NaN, with the code 0. b overflows,
    too, where the x lie within some 1e-306.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrPolynomialOrderTooHigh (less than two values have the sign of most), ErrNonFiniteInput (a
    sample is not finite), ErrOutOfMemory (no memory), ErrIterationLimit (singular values do not
    converge).
    NaN: y in some results; x, deviations refused with ErrNonFiniteInput. */
QX_API ErrorCode ExpFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D deviations,
                             QX_OUT double *a, QX_OUT double *b, QX_OUT double *mse);
/** y = a exp(b x), with weights as they are. Method 0 is that of ExpFit_head, which leaves
    *iterations; any other goes on from there, or from the guess (a, b), by Gauss-Newton steps and
    takes the best. A guess that is not finite gives NaN. Steps that come back in a cycle, as
    rounding makes them do with a small tolerance, are counted but not repeated.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrPolynomialOrderTooHigh (less than two values have the sign of most), ErrNonFiniteInput (a
    sample or a step's exponential is not finite), ErrOutOfMemory (no memory), ErrIterationLimit
    (singular values do not converge), WarnFitIncomplete (the guess has neither no values nor
    two).
    NaN: y in some results; x, w refused with ErrNonFiniteInput; tolerance, floor in no result. */
QX_API ErrorCode ExpFit80_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                               QX_IN DBL1D guess, uint16_t method, QX_OUT double *a,
                               QX_OUT double *b, QX_OUT double *mse, QX_INOUT int32_t *iterations,
                               double floor);
/** As ExpFit_head, for the coefficients alone and without weights.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two samples),
    ErrPolynomialOrderTooHigh (less than two values have the sign of most), ErrNonFiniteInput (a
    sample is not finite), ErrOutOfMemory (no memory), ErrIterationLimit (singular values do not
    converge).
    NaN: y in no result; x refused with ErrNonFiniteInput. */
QX_API ErrorCode ExpFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_OUT double *a, QX_OUT double *b);
/** As ExpFit80_head, for the coefficients alone.
    NaN: y, x, tolerance, floor in no result; w refused with ErrNonFiniteInput; guess in some
    results. */
QX_API ErrorCode ExpFitCoef80_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, int32_t method,
                                   double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                   QX_OUT double *b, QX_INOUT int32_t *iterations, double floor);

/** y = a x^b for x above 0, by Gauss-Newton steps from the guess (a, b), or from the line through
    (ln x, ln |y|) with weights w y^2; the best step wins and its values take the place of y. A
    guess that is not finite gives NaN. Steps in a cycle are those of ExpFit80_head. Where the x
    that count are all equal, rounding decides, and a or b may be infinite or 0, with the code 0; a
    step may also carry b to an infinity where x^b stays finite.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanTwo (less than two samples),
    ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (all weights but one are 0),
    ErrNotStrictlyPositive (an x is not above 0), ErrPolynomialOrderTooHigh (less than two values
    have the sign of most), ErrNonFiniteInput (a sample or a step's power is not finite),
    ErrOutOfMemory (no memory), ErrIterationLimit (singular values do not converge),
    WarnFitIncomplete (the guess has neither no values nor two).
    NaN: y in some results; x refused with ErrNotStrictlyPositive; w refused with ErrNonFiniteInput;
    tolerance, floor in no result. */
QX_API ErrorCode PowerFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                               QX_IN DBL1D guess, QX_OUT double *a, QX_OUT double *b,
                               QX_OUT double *mse, QX_INOUT int32_t *iterations, double floor);
/** As PowerFit_head, for the coefficients alone.
    NaN: y, tolerance, floor in no result; x refused with ErrNotStrictlyPositive; w refused with
    ErrNonFiniteInput; guess in some results. */
QX_API ErrorCode PowerFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                                   QX_IN DBL1D guess, QX_OUT double *a, QX_OUT double *b,
                                   QX_INOUT int32_t *iterations, double floor);

/** y = a log(b x) to the given base, for x of one sign, which b takes; its values take the place of
    y. In closed form by the line through (log |x|, y). The base 2.71828, these six digits, stands
    for e; e in all its digits is a base like any other and differs in the last bits. Where all x
    are equal, and with a base of 1, a and b are NaN, infinite or arbitrary, with the code 0. Where
    y hardly depends on x, b is the base to a power that overflows to infinity or vanishes, and the
    values are infinite.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrNotStrictlyPositive (the base is 0 or
    below), ErrFewerThanTwo (less than two samples), ErrNonFiniteInput (a weight is NaN),
    ErrTooFewWeights (all weights but one are 0), ErrMixedSigns (the x are neither all above nor all
    below 0), ErrOutOfMemory (no memory).
    NaN: y, base in all results; x refused with ErrMixedSigns; w refused with ErrNonFiniteInput. */
QX_API ErrorCode LogFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double base,
                             QX_OUT double *a, QX_OUT double *b, QX_OUT double *mse);
/** As LogFit_head, for the coefficients alone. */
QX_API ErrorCode LogFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double base,
                                 QX_OUT double *a, QX_OUT double *b);

/** y = a exp(-((x - c) / s)^2 / 2), a peak up or down, by steepest descent with halved steps from
    the guess (a, c, s), or from the logarithms of what lies above a tenth of the peak; its values
    take the place of y. *iterations counts the trials. Steepest descent converges slowly where the
    sizes of a, c and s differ much, and ends by the tolerance then; with a tolerance of nearly 0
    it may creep on for millions of trials, up to the limit. x from 1e154 on overflow: s is
    infinite, with the code 0. A guess that is not finite counts as none. A peak that alone lies
    above a tenth of its height is taken through three points, and *iterations is 0. Of 510 exact
    peaks and dips of all widths 242 are missed by more than 1e-6 of a coefficient;
    GaussianPeakFit2026_head finds all of them.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFewerThanThree (less than three
    samples), ErrNonFiniteInput (a weight is NaN), ErrTooFewWeights (less than three weights are
    not 0), ErrNonFiniteInput (an x is not finite), ErrFitStartValues (the deviation to start from
    is 0, or a lone peak has no neighbour of its sign on a side), ErrOutOfMemory (no memory),
    WarnFitIncomplete (the guess has neither no values nor three).
    NaN: y refused with ErrFitStartValues or in some results; x, w refused with ErrNonFiniteInput;
    tolerance, floor in no result. */
QX_API ErrorCode GaussianPeakFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                      double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                      QX_OUT double *c, QX_OUT double *s, QX_OUT double *mse,
                                      QX_INOUT int32_t *iterations, double floor);
/** As GaussianPeakFit_head, for the coefficients alone.
    NaN: y, tolerance, guess, floor in no result; x, w refused with ErrNonFiniteInput. */
QX_API ErrorCode GaussianPeakFitCoef_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                          double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                          QX_OUT double *c, QX_OUT double *s,
                                          QX_INOUT int32_t *iterations, double floor);

/** As GaussianPeakFit_head, from starts at every scale and by the trust region of
    BoundGaussianFit2026_head, whose tolerance and limit of the iterations this one has. A guess of
    another length than three is as the elder's, and one of three the only start. floor is not
    looked at.
    Codes: ErrSizeMismatch (the arrays differ in length), ErrFitPointsTooFew (less than three
    samples), ErrNonFiniteInput (x, y, w or guess is not finite), ErrTooFewWeights (less than three
    weights are not 0), ErrFitStartValues (the guess of s is 0), ErrOutOfMemory (no memory),
    ErrNoUsableFit (no start has finite squares), ErrNonFiniteFunction (the squares at the guess
    are not finite), ErrIterationLimit (the limit is reached; all outputs are valid),
    WarnRankDeficient (the samples do not determine each coefficient), WarnLowAccuracy (the fit
    ends before the coefficients are at rest to 7 digits), WarnFitIncomplete (the guess has neither
    no values nor three).
    NaN: y, x, w, guess refused with ErrNonFiniteInput; tolerance, floor in no result. */
QX_API ErrorCode GaussianPeakFit2026_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                          double tolerance, QX_IN DBL1D guess, QX_OUT double *a,
                                          QX_OUT double *c, QX_OUT double *s, QX_OUT double *mse,
                                          QX_INOUT int32_t *iterations, double floor);

QX_END_DECLS

#endif
