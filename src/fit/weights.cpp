#include "fit/weights.h"

namespace qx {

ErrorCode SettleWeights(int32_t n, int32_t fewest, const DBL **settled) {
    const DBL *const w = *settled;
    if (n < fewest)
        return fewest == 2 ? ErrFewerThanTwo : ErrFewerThanThree;
    if (w == nullptr)
        return 0;
    WeightCounts counts;
    CountWeights(w, n, &counts);
    if (counts.broken != 0.0)
        return ErrNonFiniteInput;
    if (counts.used == 0.0)
        *settled = nullptr;
    else if (counts.used < fewest)
        return ErrTooFewWeights;
    return 0;
}

void WeightsOfDeviations(const DBL *deviations, int32_t n, DBL *w) {
    for (int32_t i = 0; i < n; ++i) {
        const double deviation = deviations[i];
        w[i] = deviation == 0.0 ? 1.0 : 1.0 / (deviation * deviation);
    }
}

} // namespace qx
