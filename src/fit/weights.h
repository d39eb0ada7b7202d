#ifndef QX_FIT_WEIGHTS_H
#define QX_FIT_WEIGHTS_H

#include "fit/samples.h"
#include "frame/widths.h"
#include "qx/errors.h"

namespace qx {

// The common rule for the weights of a fit: none where all are zero. `fewest` samples and weights
// other than zero are needed, 2 or more.
//
// ErrFewerThanTwo or ErrFewerThanThree (by `fewest`), ErrNonFiniteInput (a weight is NaN),
// ErrTooFewWeights, in this order.
ErrorCode SettleWeights(FitSamples *samples, int32_t fewest);
// The same where a weight that is infinite is ErrNonFiniteInput, too.
ErrorCode SettleFiniteWeights(FitSamples *samples, int32_t fewest);

// Standard deviations as weights: 1 / sd^2, and 1 for a standard deviation of 0.
void WeightsOfDeviations(ConstRealVector deviations, RealVector w);

// How many weights are not 0, and how many are NaN.
struct WeightCounts {
    double used, broken;
};
QX_BY_WIDTH(void, CountWeights, (const DBL *w, int32_t n, WeightCounts *counts))
// The largest |w|; none of them is NaN.
QX_BY_WIDTH(double, LargestWeight, (const DBL *w, int32_t n))

} // namespace qx

#endif
