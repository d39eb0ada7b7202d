#ifndef QX_BOUNDED_FITS_H
#define QX_BOUNDED_FITS_H

/* Fits of models whose coefficients stay between bounds, by least squares, by least absolute
   residuals or by the bisquare method, which disregards outliers. The values of the best fit
   replace y. w holds a weight per sample, of which only the absolute value counts, or is empty; if
   all weights are 0, the fit is unweighted.

   lower and upper hold a bound per coefficient, in the order of the output coefficients, infinite
   for none; both are empty for no bounds at all. A coefficient whose bounds are equal is fixed.
   There must be at least as many samples as free coefficients; without samples the bounds of the
   fixed coefficients are returned.

   method: 0 least squares; 1 least absolute residuals; 2 bisquare. mse is the mean of |w| r^2 over
   the residuals r or, for least absolute residuals, the mean of |w r|. tolerance is relative; 0 or
   below selects 0.0001. *iterations is the limit on entry and the number of steps on return. The
   time of a step is proportional to the number of samples, and at least twice as long for bisquare;
   if the tolerance cannot be reached, the steps continue up to the limit. guess holds start values
   for the coefficients; if it is empty or too short, the fit determines its own. The function
   result is the code. A failure sets numbers to NaN and *iterations to 0 and empties y.

   An mse that overflows, as for y of 1e154 and above, is infinite or NaN, with the code 0, for a
   line and a logarithm; for the other models it is a failure. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The line y = a x + b within bounds by least squares. If the line of plain least squares is
    within the bounds, it is the result; otherwise a barrier method and the closed forms on the
    edges of the bounds find the best one. Equal x give NaN or infinities, with the code 0, and so
    do x and y whose squares and products overflow.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree (lower or upper have one
    element, or they differ in length), ErrNaNInData (a bound is NaN), ErrFitPointsTooFew (fewer
    samples than free coefficients), ErrNonFiniteInput (a weight is NaN or infinite),
    ErrTooFewWeights (only one weight is not 0), ErrBoundsCrossed (a lower bound is above its upper
    one), ErrOutOfMemory (no memory to copy an input that is the same array as y).
    NaN: y, x in all results; w refused with ErrNonFiniteInput; lower, upper refused with
    ErrNaNInData. */
QX_API ErrorCode BoundLinearFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                     QX_IN DBL1D lower, QX_IN DBL1D upper, QX_OUT double *a,
                                     QX_OUT double *b, QX_OUT double *mse);

/** As BoundLinearFit_head, by least absolute residuals: least-squares lines with the weights 1 /
    |r| of the previous line, where |r| counts as at least a hundredth of the median of all, until
    the line moves by no more than tolerance times the residuals. The best of these lines is
    returned, so that the sum of absolute residuals is above its minimum by about that relative
    amount. E. J. Schlossmacher, "An iterative technique for absolute deviations curve fitting",
    1973. A bound array of the wrong length is ignored, with the warning.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrNaNInData (a bound or a residual is NaN),
    ErrFitPointsTooFew (fewer samples than free coefficients), ErrNonFiniteInput (a weight is NaN or
    infinite), ErrTooFewWeights (only one weight is not 0), ErrBoundsCrossed (a lower bound is above
    its upper one), ErrOutOfMemory (no memory), ErrIterationLimit (the limit is reached, or the
    lines repeat in a cycle; all outputs are valid), WarnFitIncomplete (lower or upper have one
    element, or they differ in length).
    NaN: y, x, lower, upper refused with ErrNaNInData; w refused with ErrNonFiniteInput; tolerance
    in no result. */
QX_API ErrorCode BoundLinearFitLAR_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                        double tolerance, QX_INOUT int32_t *iterations,
                                        QX_IN DBL1D lower, QX_IN DBL1D upper, QX_OUT double *a,
                                        QX_OUT double *b, QX_OUT double *meanAbsResidual);

/** As BoundLinearFitLAR_head, by bisquare weights: (1 - u^2)^2 for |u| < 1 and 0 beyond, where u is
    the residual divided by sqrt(1 - leverage), by 4.685 and by the median absolute deviation of all
    residuals over 0.6745. The lines may move endlessly among several that fit about equally well,
    and then reach any limit. P. W. Holland and R. E. Welsch, "Robust regression using iteratively
    reweighted least-squares", 1977. */
QX_API ErrorCode BoundLinearFitBi_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                       double tolerance, QX_INOUT int32_t *iterations,
                                       QX_IN DBL1D lower, QX_IN DBL1D upper, QX_OUT double *a,
                                       QX_OUT double *b, QX_OUT double *mse);

/** y = a exp(b x) + c within bounds, by Levenberg-Marquardt steps: at most 20 of them, and no more
    than half, by least squares without bounds, then the rest within the bounds by the selected
    method. Only steps that lower the cost are accepted; when the reduction is less than tolerance
    times the cost, the fit ends. The minimum is the one that the start leads to, with about 8
    correct digits in the coefficients for a tolerance of 1e-14. D. W. Marquardt, "An algorithm for
    least-squares estimation of nonlinear parameters", 1963.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree (lower or upper are too short,
    or they differ in length), ErrNaNInData (a bound is NaN), ErrFitPointsTooFew (fewer samples than
    free coefficients), ErrOutOfMemory (no memory), ErrInvalidSelector (method is above 2),
    ErrNonFiniteInput (a weight is NaN or infinite), ErrTooFewWeights (fewer non-zero weights than
    coefficients), ErrPolynomialOrderTooHigh (fewer than two values are on one side of the estimated
    c, so that there is no start), ErrNonFiniteInput (a sample is NaN or infinite),
    ErrIterationLimit (the singular values of the start do not converge), ErrNaNInData (the
    residuals at the start are NaN), ErrNonFiniteInput (the cost is NaN or infinite at the start and
    at the next point), ErrSingularMatrix (a step is not determined), ErrBoundsCrossed (a lower
    bound is above its upper one), WarnFitIncomplete (guess is too short).
    NaN: y, x, w refused with ErrNonFiniteInput; tolerance in no result; lower, upper refused with
    ErrNaNInData. */
QX_API ErrorCode BoundExpFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                                  QX_INOUT int32_t *iterations, QX_IN DBL1D guess,
                                  QX_IN DBL1D lower, QX_IN DBL1D upper, uint16_t method,
                                  QX_OUT double *a, QX_OUT double *b, QX_OUT double *c,
                                  QX_OUT double *mse);

/** As BoundExpFit_head, for y = a x^b + c with x above 0, with at most 30 steps without bounds. For
    least squares all steps are first made without bounds; if the result is outside a bound, up to
    the same number of steps follow within the bounds.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree (lower or upper are too short,
    or they differ in length), ErrNaNInData (a bound is NaN), ErrFitPointsTooFew (fewer samples than
    free coefficients), ErrOutOfMemory (no memory), ErrInvalidSelector (method is above 2),
    ErrNonFiniteInput (a weight is NaN or infinite), ErrTooFewWeights (fewer non-zero weights than
    coefficients), ErrNotStrictlyPositive (an x is 0 or below), ErrPolynomialOrderTooHigh (fewer
    than two values are on one side of the estimated c, so that there is no start),
    ErrNonFiniteInput (a sample is NaN or infinite), ErrIterationLimit (the singular values of the
    start do not converge), ErrNaNInData (the residuals at the start are NaN), ErrNonFiniteInput
    (the cost is NaN or infinite at the start and at the next point), ErrSingularMatrix (a step is
    not determined), ErrBoundsCrossed (a lower bound is above its upper one), WarnFitIncomplete
    (guess is too short).
    NaN: y, x, w, guess refused with ErrNonFiniteInput; tolerance in no result; lower, upper refused
    with ErrNaNInData. */
QX_API ErrorCode BoundPowerFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                    double tolerance, QX_INOUT int32_t *iterations,
                                    QX_IN DBL1D guess, QX_IN DBL1D lower, QX_IN DBL1D upper,
                                    uint16_t method, QX_OUT double *a, QX_OUT double *b,
                                    QX_OUT double *c, QX_OUT double *mse);

/** y = a log(b x) to the given base, with x above 0, within bounds: the line over log(x) if that is
    within them, otherwise Levenberg-Marquardt steps from there. A base of 2.71828, exactly these
    six digits, means e. guess is not needed. Results that overflow are infinite or NaN, with the
    code 0: the mse for y of 1e154 and above, and b and the values, as in LogFit_head, if the x are
    equal, the base is 1 or y hardly depends on x.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree (lower or upper have one
    element, or they differ in length), ErrNaNInData (a bound is NaN), ErrFitPointsTooFew (fewer
    samples than free coefficients), ErrNonFiniteInput (a single x times the fixed b is 0 or below),
    ErrInvalidSelector (method is above 2), ErrMixedSigns (an x is 0 or below), ErrNonFiniteInput (a
    weight is NaN or infinite), ErrTooFewWeights (only one weight is not 0), ErrNotStrictlyPositive
    (base is 0 or below), ErrOutOfMemory (no memory), ErrBoundsCrossed (a lower bound is above its
    upper one), ErrNaNInData (a residual is NaN), ErrNonFiniteInput (the cost is NaN or infinite at
    the start and at the next point), ErrSingularMatrix (a step is not determined),
    WarnFitIncomplete (guess has one element).
    NaN: y, base refused with ErrNaNInData or refused with ErrNonFiniteInput; x refused with
    ErrNaNInData or refused with ErrMixedSigns; w refused with ErrNonFiniteInput; lower, upper
    refused with ErrNaNInData; tolerance in no result. */
QX_API ErrorCode BoundLogFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double base,
                                  QX_INOUT int32_t *iterations, QX_IN DBL1D guess,
                                  QX_IN DBL1D lower, QX_IN DBL1D upper, uint16_t method,
                                  double tolerance, QX_OUT double *a, QX_OUT double *b,
                                  QX_OUT double *mse);

/** As BoundExpFit_head, for the peak or dip y = a exp(-0.5 ((x - m) / s)^2) + c; s is returned as
    its absolute value. Bounds of the wrong length are ignored without a warning, and so is a guess
    that does not begin with a finite value. Without a guess the fit starts with a peak above the
    lowest value of the data or a dip below the highest: of 510 exact peaks and dips of all widths,
    within bounds that contain them, 90 are missed, with the code 0 or a failure.
    BoundGaussianFit2026_head finds all of them.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrNaNInData (a bound is NaN),
    ErrFitPointsTooFew (fewer samples than free coefficients), ErrOutOfMemory (no memory),
    ErrInvalidSelector (method is above 2), ErrNonFiniteInput (a weight is NaN or infinite),
    ErrTooFewWeights (fewer non-zero weights than coefficients), ErrNoUsableFit (there is no guess,
    and neither a peak nor a dip to start from), ErrFitStartValues (s starts at 0), ErrNaNInData
    (the residuals at the start are NaN), ErrNonFiniteInput (the cost is NaN or infinite at the
    start and at the next point), ErrSingularMatrix (a step is not determined), ErrBoundsCrossed (a
    lower bound is above its upper one), WarnFitIncomplete (guess is too short).
    NaN: y, x refused with ErrNonFiniteInput or refused with ErrNoUsableFit; w refused with
    ErrNonFiniteInput; tolerance in no result; guess refused with ErrNonFiniteInput or in no
    result; lower, upper refused with ErrNaNInData. */
QX_API ErrorCode BoundGaussianFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                       double tolerance, QX_INOUT int32_t *iterations,
                                       QX_IN DBL1D guess, QX_IN DBL1D lower, QX_IN DBL1D upper,
                                       uint16_t method, QX_OUT double *a, QX_OUT double *m,
                                       QX_OUT double *s, QX_OUT double *c, QX_OUT double *mse);

/** As BoundGaussianFit_head, with start values at every scale, of which the best are fitted and the
    fit of smallest cost is returned: peaks and dips with widths from a fraction of the distance
    between two samples to several times the range of x, inside and outside it, with the best height
    and level of each in closed form (G. H. Golub, V. Pereyra, "The differentiation of
    pseudo-inverses and nonlinear least squares problems whose variables separate", 1973). If a
    guess is given, it is the only start. The least-squares fit uses the trust region of
    NonlinearFit2026, within the bounds from the first step on; tolerance is the relative change of
    a coefficient at which the fit ends, and 0 or below continues as far as rounding errors allow.
    For the other methods the steps of BoundGaussianFit_head, with its tolerance, start from that
    result and from the least-squares fit to the running medians of five samples, for bisquare from
    the least absolute residuals; the fit with the smallest sum is returned or, for bisquare, the
    one with the smallest median (P. J. Rousseeuw, "Least median of squares regression", 1984).
    *iterations is the limit for each start, 2000 if it is 0 or below. Bounds of the wrong length
    are refused. If the x do not determine a peak, one of those that fit equally well is returned
    with the warning.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree (lower or upper have one to
    three elements, or they differ in length), ErrNaNInData (a bound is NaN), ErrFitPointsTooFew
    (fewer samples than free coefficients), ErrInvalidSelector (method is above 2), ErrBoundsCrossed
    (a lower bound is above its upper one), ErrNonFiniteInput (x, y, w or guess is not finite),
    ErrTooFewWeights (fewer non-zero weights than free coefficients), ErrFitStartValues (s is fixed
    at 0, or its guess is 0), ErrOutOfMemory (no memory), ErrNoUsableFit (the sum of squares is not
    finite at any start), ErrNonFiniteFunction (the sum of squares at the guess is not finite),
    ErrIterationLimit (the least-squares fit reaches the limit; all outputs are valid), ErrNaNInData
    (a residual of the robust fits is NaN), ErrNonFiniteInput (a cost of the robust fits is not
    finite), ErrSingularMatrix (a step of the robust fits is not determined), WarnRankDeficient (the
    least-squares fit does not determine every free coefficient), WarnLowAccuracy (the least-squares
    fit ends before the coefficients have settled to 7 digits), WarnFitIncomplete (guess is too
    short).
    NaN: y, x, w, guess refused with ErrNonFiniteInput; tolerance in no result; lower, upper
    refused with ErrNaNInData. */
QX_API ErrorCode BoundGaussianFit2026_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                           double tolerance, QX_INOUT int32_t *iterations,
                                           QX_IN DBL1D guess, QX_IN DBL1D lower, QX_IN DBL1D upper,
                                           uint16_t method, QX_OUT double *a, QX_OUT double *m,
                                           QX_OUT double *s, QX_OUT double *c, QX_OUT double *mse);

QX_END_DECLS

#endif
