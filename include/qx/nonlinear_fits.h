#ifndef QX_NONLINEAR_FITS_H
#define QX_NONLINEAR_FITS_H

/* Fits of a model that the caller defines by a procedure. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* Computes a model, or its derivatives, at all samples. p holds the `count` parameters, x the array
   that was passed to the fit, and `n` is the number of samples. A model writes n values to out; a
   procedure for derivatives writes n rows of `count` values: the derivative of value i with respect
   to p[j] goes to out[i * count + j]. The function result is 0, or any other number to end the fit.
   It is called on the thread of the fit, may call exports, and must neither throw nor touch the
   arrays of the fit. */
typedef int32_t (*FitProcedure)(void *context, const DBL *x, int32_t xCount, const DBL *p,
                                int32_t count, DBL *out, int32_t n);

/** Finds the parameters p of a model f(x, p) with the smallest

        cost = 1/2 sum over i of scale^2 rho(|w[i]| r[i]^2 / scale^2),  r = y - f,

    within bounds, by a trust region with the scaling of J. J. More, "The Levenberg-Marquardt
    algorithm: implementation and theory", 1978, on QR factors of the derivatives. Final
    Gauss-Newton steps determine the digits that the cost does not resolve.

        loss: 0 linear, rho(z) = z, which is least squares and has no scale; 1 soft, 2 (sqrt(1 + z)
        - 1); 2 Huber's, z up to 1 and 2 sqrt(z) - 1 beyond; 3 Cauchy's, ln(1 + z); 4 arctan z.

    x is passed on to the procedures without being examined, NaN included: it has one number for
    each sample, or several, as the model requires, or it is empty. w holds a weight per sample,
    such as 1 / sd^2, or is empty. model computes the values and jacobian the derivatives; if
    jacobian is null, the derivatives are central differences, of second order at first and of
    fourth order near the end, and one-sided at bounds. context is passed to the procedures. guess
    holds the start values. lower and upper hold a bound for each parameter (infinite for none) or
    are empty; equal bounds fix a parameter. The model is evaluated only within the bounds.

    tolerance is the relative change of a parameter at which the fit ends; if it is 0 or below, the
    fit continues as long as rounding errors allow. *iterations is the limit, 2000 if it is 0 or
    below, and receives the number of steps tried.

    p receives the parameters and residuals y - f at each sample. covariance is that of the
    parameters, to first order: the inverse of J^T J, where J holds the derivatives times the square
    root of the weights as modified by the loss (B. Triggs and others, "Bundle adjustment - a modern
    synthesis", 2000), times 2 cost / (samples - free parameters). It is 0 for fixed parameters, and
    infinite if the free parameters are not determined or there are not more samples than free
    parameters.

    *reason is why the fit ended: 1 it has converged, and no parameter would change by more than
    1e-7 of its value; 2 all residuals are 0; 0 the iteration limit was reached; 3 the residuals do
    not determine every free parameter, as in a valley that extends to infinity; 4 no step lowers
    the cost, but the parameters have not settled to 7 digits: the model is not smooth, the
    derivatives do not belong to it, or it is too sensitive to rounding errors. The minimum may be a
    local one.

    Sums of squares that overflow, as for residuals of 1e154 and above, are not finite.
    Codes: ErrSizeMismatch (w is neither empty nor as long as y, or the size of x is not a multiple
    of that of y), ErrEmptyInput (y or guess is empty), ErrSizesDisagree (lower or upper is neither
    empty nor as long as guess), ErrNotAvailable (model is null), ErrInvalidSelector (loss is not 0
    to 4), ErrNotStrictlyPositive (scale is not above 0, with a loss other than 0), ErrNaNInData (a
    bound is NaN), ErrBoundsCrossed (a lower bound is above its upper one), ErrFitPointsTooFew
    (fewer samples than free parameters), ErrNonFiniteInput (y, w or guess is not finite),
    ErrTooFewWeights (fewer non-zero weights than free parameters), ErrOutOfMemory (no memory),
    ErrNonFiniteFunction (the cost or the derivatives at the start are not finite), ErrNotAvailable
    (a procedure ended the fit), ErrIterationLimit (the limit is reached; the outputs are valid),
    WarnRankDeficient (reason 3), WarnLowAccuracy (reason 4).
    NaN: x refused with ErrNonFiniteFunction; y, w, guess refused with ErrNonFiniteInput; lower,
    upper refused with ErrNaNInData; scale refused with ErrNotStrictlyPositive or in no result;
    tolerance in no result. */
QX_API ErrorCode NonlinearFit2026(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D w, FitProcedure model,
                                  FitProcedure jacobian, QX_IN void *context, QX_IN DBL1D guess,
                                  QX_IN DBL1D lower, QX_IN DBL1D upper, int32_t loss, double scale,
                                  double tolerance, QX_INOUT int32_t *iterations, QX_OUT DBL1D p,
                                  QX_OUT DBL2D covariance, QX_OUT DBL1D residuals,
                                  QX_OUT double *cost, QX_OUT int32_t *reason);

QX_END_DECLS

#endif
