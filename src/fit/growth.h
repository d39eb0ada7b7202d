#ifndef QX_FIT_GROWTH_H
#define QX_FIT_GROWTH_H

#include "qx/errors.h"
#include "qx/types.h"

#include <algorithm>
#include <cstdint>
#include <limits>

namespace qx {

// When the iteration of a model fit ends: the MSE changes by no more than `tolerance` of itself, or
// is at most `floor`; or after about `iterations` steps, of which a negative count allows none. 0
// or below select 0.0001 and 1e-12.
struct FitLimits {
    double tolerance;
    double floor;
    int32_t iterations;
    FitLimits settled() const {
        constexpr int32_t most = std::numeric_limits<int32_t>::max() - 1; // one beyond is counted
        return {tolerance <= 0.0 ? 0.0001 : tolerance, floor <= 0.0 ? 1e-12 : floor,
                std::min(iterations, most)};
    }
};

// In FitExponential and FitPower `fit` gets the model's values and may be y; it may be null, and so
// may mse. `guess` holds a and b, or is null. A guess that is not finite starts the iteration all
// the same, which then gives NaN and no failure. Weights: SettleWeights. *steps is the number of
// steps done.
//
// Codes of SettleWeights, then ErrNotStrictlyPositive (FitPower: an abscissa is not above 0),
// ErrPolynomialOrderTooHigh (fewer than two values have the sign of most), ErrNonFiniteInput,
// ErrOutOfMemory, ErrIterationLimit (of the singular values).

// y = a exp(b x). Method 0 is the line through ln |y|, with the weights |w| y^2 that make up for
// the logarithm; all others go on from it or from the guess by Gauss-Newton steps, and the best
// step wins. Method 0 leaves *steps.
ErrorCode FitExponential(const DBL *x, const DBL *y, const DBL *w, int32_t n, DBL *fit, DBL *a,
                         DBL *b, DBL *mse, int32_t method, const DBL *guess,
                         const FitLimits &limits, int32_t *steps);

// y = a x^b, always by Gauss-Newton steps, from the line through (ln x, ln |y|) or the guess on.
ErrorCode FitPower(const DBL *x, const DBL *y, const DBL *w, int32_t n, DBL *fit, DBL *a, DBL *b,
                   DBL *mse, const DBL *guess, const FitLimits &limits, int32_t *steps);

} // namespace qx

#endif
