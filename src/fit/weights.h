#ifndef QX_FIT_WEIGHTS_H
#define QX_FIT_WEIGHTS_H

#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// The common rule for the weights of a fit, which count by their absolute values. `w` may be null,
// and becomes null where all weights are zero: the fit is then unweighted. `fewest` points and
// weights other than zero are needed, 2 or 3.
//
// ErrFewerThanTwo or ErrFewerThanThree (by `fewest`), ErrNonFiniteInput (a weight is NaN),
// ErrTooFewWeights, in this order.
ErrorCode SettleWeights(int32_t n, int32_t fewest, const DBL **w);

// Standard deviations as weights: 1 / sd^2, and 1 for a standard deviation of 0.
void WeightsOfDeviations(const DBL *deviations, int32_t n, DBL *w);

// How many weights are not 0, and how many are NaN.
struct WeightCounts {
    double used, broken;
};
QX_BY_WIDTH(void, CountWeights, (const DBL *w, int32_t n, WeightCounts *counts))
// The largest |w|; none of them is NaN.
QX_BY_WIDTH(double, LargestWeight, (const DBL *w, int32_t n))

} // namespace qx

#endif
