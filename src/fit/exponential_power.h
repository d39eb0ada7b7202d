#ifndef QX_FIT_EXPONENTIAL_POWER_H
#define QX_FIT_EXPONENTIAL_POWER_H

#include "fit/model_fit.h"

namespace qx {

// Parameters: a, b. The iteration starts even from a guess that is not finite; the result is then
// NaN, without a failure.
//
// Codes of SettleWeights, then ErrNotStrictlyPositive (FitPower: an abscissa is not above 0),
// ErrPolynomialOrderTooHigh (fewer than two values have the sign of the majority),
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit (of the singular values).

enum class ExponentialMethod { LogarithmicLine, GaussNewton };

// y = a exp(b x). Fitted by a line through ln |y|, with weights |w| y^2 that compensate for the
// logarithm, or by Gauss-Newton steps that start from this line or from the guess; the best
// parameters are returned. The method of the line uses no guess and leaves *steps unchanged.
ErrorCode FitExponential(const ModelFit &request, ExponentialMethod method);

// y = a x^b, always by Gauss-Newton steps, starting from the line through (ln x, ln |y|) or from
// the guess.
ErrorCode FitPower(const ModelFit &request);

} // namespace qx

#endif
