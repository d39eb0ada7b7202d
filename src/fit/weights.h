#ifndef QX_FIT_WEIGHTS_H
#define QX_FIT_WEIGHTS_H

#include "fit/samples.h"
#include "frame/widths.h"
#include "qx/errors.h"

namespace qx {

// The common rule for the weights of a fit: if all are zero, they count as absent. At least
// `fewest` samples and nonzero weights are needed, where `fewest` is 2 or more.
//
// ErrFewerThanTwo or ErrFewerThanThree (by `fewest`), ErrNonFiniteInput (a weight is NaN),
// ErrTooFewWeights, in this order.
ErrorCode SettleWeights(FitSamples *samples, int32_t fewest);
// The same, and the largest |w| in *largest if there are weights.
ErrorCode SettleWeights(FitSamples *samples, int32_t fewest, double *largest);
// As the first, but ErrNonFiniteInput for an infinite weight, too.
ErrorCode SettleFiniteWeights(FitSamples *samples, int32_t fewest);

// Standard deviations as weights: 1 / sd^2, and 1 for a standard deviation of 0.
void WeightsOfDeviations(ConstRealVector deviations, RealVector w);

// The number of weights that are not 0, whether some are NaN, and the largest |w| of the others.
struct WeightCounts {
    int32_t used;
    bool hasNaN;
    double largest;
};
QX_BY_WIDTH(void, CountWeights, (const DBL *w, int32_t n, WeightCounts *counts))
// The largest |w|; no weight may be NaN.
QX_BY_WIDTH(double, LargestWeight, (const DBL *w, int32_t n))

} // namespace qx

#endif
