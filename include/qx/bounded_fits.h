#ifndef QX_BOUNDED_FITS_H
#define QX_BOUNDED_FITS_H

/* Fits of models whose coefficients stay between bounds, by least squares, by least absolute
   residuals or by the bisquare method, which leaves out what lies far off. y is replaced by the
   best fit. w holds a weight per sample, which counts by its absolute value, or is empty; if all
   are 0 the fit is unweighted.

   lower and upper hold a bound per coefficient, in the order in which the coefficients are given
   back, infinite where there is none; both empty for no bounds at all. A coefficient whose bounds
   are equal is fixed. There must be at least as many samples as free coefficients; without samples
   the bounds of the fixed ones come back.

   method: 0 least squares; 1 least absolute residuals; 2 bisquare. mse is the mean of |w| r^2 over
   the residuals r, for least absolute residuals the mean of |w r|. tolerance
   is relative, 0 or below for 0.0001. *iterations is the limit and becomes the number of steps
   done; a step takes time in proportion to the samples, by bisquare twice and more, and with a
   tolerance that they cannot reach the steps go on to the limit. guess holds start values for the
   coefficients; where it is empty or too short the fit makes its own. The function result is the
   code. A failure makes numbers NaN, *iterations 0 and y empty.

   An mse beyond the range of numbers, as for y from 1e154 on, is infinite or NaN, with the code 0,
   of a line and a logarithm; the other models refuse it. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The line y = a x + b within bounds by least squares. A plain line that lies within them is the
    answer; else a barrier method and the closed forms on the edges of the bounds find the best one.
    Equal x give NaN or infinities, with the code 0, and so do x and y whose squares and products
    leave the range of numbers. Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree
    (lower or upper have one element, or they differ in length), ErrNaNInData (a bound is NaN),
    ErrFitPointsTooFew (fewer samples than free coefficients), ErrNonFiniteInput (a weight is NaN or
    infinite), ErrTooFewWeights (only one weight is not 0), ErrBoundsCrossed (a lower bound is above
    its upper one), ErrOutOfMemory (no memory where an input is y).
    NaN: y, x in all results; w refused with ErrNonFiniteInput; lower, upper refused with
    ErrNaNInData. */
QX_API ErrorCode BoundLinearFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                     QX_IN DBL1D lower, QX_IN DBL1D upper, QX_OUT double *a,
                                     QX_OUT double *b, QX_OUT double *mse);

/** As BoundLinearFit_head, by least absolute residuals: lines of least squares with the weights 1
    / |r| of the line before, where |r| counts as no less than a hundredth of the median of all,
    until the line moves by no more than tolerance times the residuals. The best of them counts. So
    the sum is about that much above the least one. E. J. Schlossmacher, "An iterative technique
    for absolute deviations curve fitting", 1973. A bound array of bad length is left out, with the
    warning. Codes: ErrSizeMismatch (x or w does not fit y), ErrNaNInData (a bound or a residual is
    NaN), ErrFitPointsTooFew (fewer samples than free coefficients), ErrNonFiniteInput (a weight is
    NaN or infinite), ErrTooFewWeights (only one weight is not 0), ErrBoundsCrossed (a lower bound
    is above its upper one), ErrOutOfMemory (no memory), ErrIterationLimit (the limit is reached,
    or lines come back without rest; all outputs are valid), WarnFitIncomplete (lower or upper have
    one element, or they differ in length).
    NaN: y, x, lower, upper refused with ErrNaNInData; w refused with ErrNonFiniteInput; tolerance
    in no result. */
QX_API ErrorCode BoundLinearFitLAR_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                        double tolerance, QX_INOUT int32_t *iterations,
                                        QX_IN DBL1D lower, QX_IN DBL1D upper, QX_OUT double *a,
                                        QX_OUT double *b, QX_OUT double *meanAbsResidual);

/** As BoundLinearFitLAR_head, by bisquare weights: (1 - u^2)^2 for |u| < 1 and 0 beyond, u being
    the residual, divided by sqrt(1 - leverage), by 4.685 and by the median distance of all from
    their median over 0.6745. The lines may wander without end among some that fit about as well:
    they use up any limit then. P. W. Holland and R. E. Welsch, "Robust regression using iteratively
    reweighted least-squares", 1977. */
QX_API ErrorCode BoundLinearFitBi_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                       double tolerance, QX_INOUT int32_t *iterations,
                                       QX_IN DBL1D lower, QX_IN DBL1D upper, QX_OUT double *a,
                                       QX_OUT double *b, QX_OUT double *mse);

/** y = a exp(b x) + c within bounds, by Levenberg-Marquardt steps: at most 20 of them, and at most
    half of all, by least squares without bounds, then the rest within the bounds by the method. A
    step counts that lowers the cost; when that is by less than tolerance times the cost, the fit
    ends. It ends in the minimum that its start leads to, with some 8 digits of the coefficients
    where the tolerance is 1e-14. D. W. Marquardt, "An algorithm for least-squares estimation of
    nonlinear parameters", 1963. Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree
    (lower or upper are too short, or they differ in length), ErrNaNInData (a bound is NaN),
    ErrFitPointsTooFew (fewer samples than free coefficients), ErrOutOfMemory (no memory),
    ErrInvalidSelector (method is above 2), ErrNonFiniteInput (a weight is NaN or infinite),
    ErrTooFewWeights (fewer weights other than 0 than coefficients), ErrPolynomialOrderTooHigh
    (fewer than two values lie on one side of the estimated c, so that there is no start),
    ErrNonFiniteInput (a sample is NaN or infinite), ErrIterationLimit (the singular values of the
    start do not converge), ErrNaNInData (the residuals at the start are NaN), ErrNonFiniteInput
    (the cost is NaN or infinite at the start and at the next point), ErrSingularMatrix (a step is
    not determined), ErrBoundsCrossed (a lower bound is above its upper one), WarnFitIncomplete
    (guess is too short).
    NaN: y, x, w refused with ErrNonFiniteInput; tolerance in no result; lower, upper refused with
    ErrNaNInData. */
QX_API ErrorCode BoundExpFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double tolerance,
                                  QX_INOUT int32_t *iterations, QX_IN DBL1D guess,
                                  QX_IN DBL1D lower, QX_IN DBL1D upper, uint16_t method,
                                  QX_OUT double *a, QX_OUT double *b, QX_OUT double *c,
                                  QX_OUT double *mse);

/** As BoundExpFit_head, for y = a x^b + c with x above 0, with at most 30 steps without bounds. By
    least squares all steps are made without bounds first; where a bound cuts off the answer, up to
    as many follow within the bounds. Codes: ErrSizeMismatch (x or w does not fit y),
    ErrSizesDisagree (lower or upper are too short, or they differ in length), ErrNaNInData (a bound
    is NaN), ErrFitPointsTooFew (fewer samples than free coefficients), ErrOutOfMemory (no memory),
    ErrInvalidSelector (method is above 2), ErrNonFiniteInput (a weight is NaN or infinite),
    ErrTooFewWeights (fewer weights other than 0 than coefficients), ErrNotStrictlyPositive (an x
    is 0 or below), ErrPolynomialOrderTooHigh (fewer than two values lie on one side of the
    estimated c, so that there is no start), ErrNonFiniteInput (a sample is NaN or infinite),
    ErrIterationLimit (the singular values of the start do not converge), ErrNaNInData (the
    residuals at the start are NaN), ErrNonFiniteInput (the cost is NaN or infinite at the start
    and at the next point), ErrSingularMatrix (a step is not determined), ErrBoundsCrossed (a lower
    bound is above its upper one), WarnFitIncomplete (guess is too short).
    NaN: y, x, w, guess refused with ErrNonFiniteInput; tolerance in no result; lower, upper refused
    with ErrNaNInData. */
QX_API ErrorCode BoundPowerFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                    double tolerance, QX_INOUT int32_t *iterations,
                                    QX_IN DBL1D guess, QX_IN DBL1D lower, QX_IN DBL1D upper,
                                    uint16_t method, QX_OUT double *a, QX_OUT double *b,
                                    QX_OUT double *c, QX_OUT double *mse);

/** y = a log(b x) to the base, with x above 0, within bounds: the line over log(x) where that lies
    within them, else Levenberg-Marquardt steps from there. A base of 2.71828, these six digits,
    stands for e. guess is not needed. What leaves the range of numbers is infinite or NaN, with the
    code 0: the mse for y from 1e154 on, and b and the values, as in LogFit_head, where x are equal,
    the base is 1 or y hardly depends on x. Codes: ErrSizeMismatch (x or w does not fit y),
    ErrSizesDisagree (lower or upper have one element, or they differ in length), ErrNaNInData (a
    bound is NaN), ErrFitPointsTooFew (fewer samples than free coefficients), ErrNonFiniteInput (a
    single x times the fixed b is 0 or below), ErrInvalidSelector (method is above 2), ErrMixedSigns
    (an x is 0 or below), ErrNonFiniteInput (a weight is NaN or infinite), ErrTooFewWeights (only
    one weight is not 0), ErrNotStrictlyPositive (base is 0 or below), ErrOutOfMemory (no memory),
    ErrBoundsCrossed (a lower bound is above its upper one), ErrNaNInData (a residual is NaN),
    ErrNonFiniteInput (the cost is NaN or infinite at the start and at the next point),
    ErrSingularMatrix (a step is not determined), WarnFitIncomplete (guess has one element).
    NaN: y, base refused with ErrNaNInData or refused with ErrNonFiniteInput; x refused with
    ErrNaNInData or refused with ErrMixedSigns; w refused with ErrNonFiniteInput; lower, upper
    refused with ErrNaNInData; tolerance in no result. */
QX_API ErrorCode BoundLogFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w, double base,
                                  QX_INOUT int32_t *iterations, QX_IN DBL1D guess,
                                  QX_IN DBL1D lower, QX_IN DBL1D upper, uint16_t method,
                                  double tolerance, QX_OUT double *a, QX_OUT double *b,
                                  QX_OUT double *mse);

/** As BoundExpFit_head, for the peak or dip y = a exp(-0.5 ((x - m) / s)^2) + c; s comes back
    without its sign. Bounds of bad length are left out without a word, and so is a guess that does
    not begin with a finite value. Without a guess the fit starts at the peak on the lowest level
    of the data or at the dip in the highest: of 510 exact peaks and dips of all widths, within
    bounds that hold them, 90 are missed, with the code 0 or a failure. BoundGaussianFit2026_head
    finds all of them. Codes: ErrSizeMismatch (x or w does not fit y), ErrNaNInData (a bound is
    NaN), ErrFitPointsTooFew (fewer samples than free coefficients), ErrOutOfMemory (no memory),
    ErrInvalidSelector (method is above 2), ErrNonFiniteInput (a weight is NaN or infinite),
    ErrTooFewWeights (fewer weights other than 0 than coefficients), ErrNoUsableFit (no guess, and
    neither a peak nor a dip to start from), ErrFitStartValues (s starts at 0), ErrNaNInData (the
    residuals at the start are NaN), ErrNonFiniteInput (the cost is NaN or infinite at the start
    and at the next point), ErrSingularMatrix (a step is not determined), ErrBoundsCrossed (a lower
    bound is above its upper one), WarnFitIncomplete (guess is too short).
    NaN: y, x refused with ErrNonFiniteInput or refused with ErrNoUsableFit; w refused with
    ErrNonFiniteInput; tolerance in no result; guess refused with ErrNonFiniteInput or in no
    result; lower, upper refused with ErrNaNInData. */
QX_API ErrorCode BoundGaussianFit_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                       double tolerance, QX_INOUT int32_t *iterations,
                                       QX_IN DBL1D guess, QX_IN DBL1D lower, QX_IN DBL1D upper,
                                       uint16_t method, QX_OUT double *a, QX_OUT double *m,
                                       QX_OUT double *s, QX_OUT double *c, QX_OUT double *mse);

/** As BoundGaussianFit_head, from starts at every scale, of which the best are fitted and the
    least cost counts: peaks and dips from a fraction of the distance of two samples to several
    times the range of x, inside and beyond it, with the best height and level of each in closed
    form (G. H. Golub, V. Pereyra, "The differentiation of pseudo-inverses and nonlinear least
    squares problems whose variables separate", 1973). A guess is the only start. Least squares go
    by the trust region of NonlinearFit2026, within the bounds from the first step on: tolerance is
    the part of itself by which a coefficient may still move at the end, 0 or below for as far as
    rounding errors allow. In the other norms the elder's steps start from there and from the least
    squares of the medians of each five neighbours, by bisquare from the least absolute residuals;
    the least sum counts, by bisquare the least median (P. J. Rousseeuw, "Least median of squares
    regression", 1984), and the tolerance is the elder's. *iterations is the limit from a start,
    2000 where it is 0 or below. Bounds of bad length are refused. Where x determine no peak, one
    of those that fit as well comes back with the warning.
    Codes: ErrSizeMismatch (x or w does not fit y), ErrSizesDisagree (lower or upper have one to
    three elements, or they differ in length), ErrNaNInData (a bound is NaN), ErrFitPointsTooFew
    (fewer samples than free coefficients), ErrInvalidSelector (method is above 2),
    ErrBoundsCrossed (a lower bound is above its upper one), ErrNonFiniteInput (x, y, w or guess is
    not finite), ErrTooFewWeights (fewer weights other than 0 than free coefficients),
    ErrFitStartValues (s is fixed at 0, or its guess is 0), ErrOutOfMemory (no memory),
    ErrNoUsableFit (no start has finite squares), ErrNonFiniteFunction (the squares at the guess
    are not finite), ErrIterationLimit (least squares reach the limit; all outputs are valid),
    ErrNaNInData (a residual is NaN in another norm), ErrNonFiniteInput (a cost in another norm is
    not finite), ErrSingularMatrix (a step in another norm is not determined), WarnRankDeficient
    (least squares do not determine each free coefficient), WarnLowAccuracy (they end before the
    coefficients are at rest to 7 digits), WarnFitIncomplete (guess is too short).
    NaN: y, x, w, guess refused with ErrNonFiniteInput; tolerance in no result; lower, upper
    refused with ErrNaNInData. */
QX_API ErrorCode BoundGaussianFit2026_head(QX_INOUT DBL1D y, QX_IN DBL1D x, QX_IN DBL1D w,
                                           double tolerance, QX_INOUT int32_t *iterations,
                                           QX_IN DBL1D guess, QX_IN DBL1D lower, QX_IN DBL1D upper,
                                           uint16_t method, QX_OUT double *a, QX_OUT double *m,
                                           QX_OUT double *s, QX_OUT double *c, QX_OUT double *mse);

QX_END_DECLS

#endif
