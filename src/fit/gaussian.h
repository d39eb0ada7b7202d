#ifndef QX_FIT_GAUSSIAN_H
#define QX_FIT_GAUSSIAN_H

#include "fit/model_fit.h"

namespace qx {

// y = a exp(-((x - c) / s)^2 / 2), parameters a, c, s, by steepest descent with halved steps,
// starting from the guess, or from an estimate if the guess is null or not finite; if no step is
// better, the start is returned. A peak that is the only sample above a tenth of its height is
// taken through three points, without steps. s is not negative.
//
// ErrFewerThanThree, ErrNonFiniteInput (a weight is NaN or x not finite), ErrTooFewWeights (fewer
// than three are not 0), ErrOutOfMemory, ErrFitStartValues (a single peak sample without two
// neighbours of its sign, or a deviation of 0).
ErrorCode FitGaussian(const ModelFit &request);

} // namespace qx

#endif
