#ifndef QX_FIT_EXPONENTIAL_POWER_H
#define QX_FIT_EXPONENTIAL_POWER_H

#include "fit/model_fit.h"

namespace qx {

// Parameters: a, b. A guess that is not finite starts the iteration all the same, which then gives
// NaN and no failure.
//
// Codes of SettleWeights, then ErrNotStrictlyPositive (FitPower: an abscissa is not above 0),
// ErrPolynomialOrderTooHigh (fewer than two values have the sign of most), ErrNonFiniteInput,
// ErrOutOfMemory, ErrIterationLimit (of the singular values).

enum class ExponentialMethod { LogarithmicLine, GaussNewton };

// y = a exp(b x). By a line through ln |y|, with the weights |w| y^2 that make up for the
// logarithm; or by Gauss-Newton steps from it or from the guess on, of which the best wins. The
// line takes no guess and leaves *steps.
ErrorCode FitExponential(const ModelFit &request, ExponentialMethod method);

// y = a x^b, always by Gauss-Newton steps, from the line through (ln x, ln |y|) or the guess on.
ErrorCode FitPower(const ModelFit &request);

} // namespace qx

#endif
