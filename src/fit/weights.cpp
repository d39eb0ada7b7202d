#include "fit/weights.h"

namespace qx {

ErrorCode SettleWeights(int32_t n, int32_t fewest, const DBL **w) {
    if (n < fewest)
        return fewest == 2 ? ErrFewerThanTwo : ErrFewerThanThree;
    if (*w == nullptr)
        return 0;
    int32_t used = 0;
    for (int32_t i = 0; i < n; ++i) {
        const double weight = (*w)[i];
        if (weight != weight)
            return ErrNonFiniteInput;
        used += weight != 0.0;
    }
    if (used == 0)
        *w = nullptr;
    else if (used < fewest)
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
