#ifndef QX_FIT_GAUSSIAN_H
#define QX_FIT_GAUSSIAN_H

#include "fit/growth.h"

namespace qx {

struct GaussianPeak {
    double amplitude, centre, deviation;
};

// y = a exp(-((x - c) / s)^2 / 2) by steepest descent with halved steps, from the guess on, or
// where that is null or not finite, from an estimate; the first parameters return if no step was
// better. A peak that stands alone above a tenth of its height is taken through three points,
// without steps. s is not negative. `fit` may be y; it may be null, and so may mse. *steps counts
// the trials.
//
// ErrFewerThanThree, ErrNonFiniteInput (a weight is NaN or x not finite), ErrTooFewWeights (less
// than three are not 0), ErrOutOfMemory, ErrFitStartValues (a lone peak without two neighbours of
// its sign, or a deviation of 0).
ErrorCode FitGaussian(const DBL *x, const DBL *y, const DBL *w, int32_t n, DBL *fit, DBL *a, DBL *c,
                      DBL *s, DBL *mse, const DBL *guess, const FitLimits &limits, int32_t *steps);

} // namespace qx

#endif
