#include "fit/weights.h"

#include "linalg/matrix.h"

namespace qx {

ErrorCode SettleWeights(FitSamples *samples, int32_t fewest) {
    double largest;
    return SettleWeights(samples, fewest, &largest);
}

ErrorCode SettleWeights(FitSamples *samples, int32_t fewest, double *largest) {
    const int32_t n = samples->n();
    if (n < fewest)
        return fewest == 2 ? ErrFewerThanTwo : ErrFewerThanThree;
    if (samples->w.isEmpty())
        return 0;
    WeightCounts counts;
    CountWeights(samples->w.data(), n, &counts);
    if (counts.hasNaN)
        return ErrNonFiniteInput;
    *largest = counts.largest;
    if (counts.used == 0)
        samples->w = {};
    else if (counts.used < fewest)
        return ErrTooFewWeights;
    return 0;
}

ErrorCode SettleFiniteWeights(FitSamples *samples, int32_t fewest) {
    if (!samples->w.isEmpty() && CheckFinite(samples->w.data(), samples->n()) != 0)
        return ErrNonFiniteInput;
    return SettleWeights(samples, fewest);
}

void WeightsOfDeviations(ConstRealVector deviations, RealVector w) {
    for (std::ptrdiff_t i = 0; i < w.size(); ++i) {
        const double deviation = deviations[i];
        w[i] = deviation == 0.0 ? 1.0 : 1.0 / (deviation * deviation);
    }
}

} // namespace qx
