#ifndef QX_FIT_GAUSSIAN_H
#define QX_FIT_GAUSSIAN_H

#include "fit/model_fit.h"

namespace qx {

// y = a exp(-((x - c) / s)^2 / 2), parameters a, c, s, by steepest descent with halved steps, from
// the guess on, or where that is null or not finite, from an estimate; the first parameters return
// if no step was better. A peak that stands alone above a tenth of its height is taken through
// three points, without steps. s is not negative.
//
// ErrFewerThanThree, ErrNonFiniteInput (a weight is NaN or x not finite), ErrTooFewWeights (less
// than three are not 0), ErrOutOfMemory, ErrFitStartValues (a lone peak without two neighbours of
// its sign, or a deviation of 0).
ErrorCode FitGaussian(const ModelFit &request);

} // namespace qx

#endif
