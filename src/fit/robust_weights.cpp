#include "fit/robust_weights.h"

#include "stats/basic.h"
#include "stats/order.h"

#include <cmath>

namespace qx {

namespace {

double WeightOr1(const DBL *w, int32_t i) { return w == nullptr ? 1.0 : std::fabs(w[i]); }

// The distances of the adjusted residuals from their median, or from 0 where that is farther off
// than any of them. *scale is their median, or their mean where that is 0.
ErrorCode ScaleOfResiduals(const DBL *adjusted, int32_t n, DBL *distances, double *scale) {
    double middle, largest = 0.0;
    if (const ErrorCode failed = ArrayMedian(adjusted, n, &middle))
        return failed;
    for (int32_t i = 0; i < n; ++i) {
        distances[i] = std::fabs(adjusted[i] - middle);
        largest = distances[i] > largest ? distances[i] : largest;
    }
    for (int32_t i = 0; largest <= std::fabs(middle) && i < n; ++i)
        distances[i] = std::fabs(adjusted[i]);
    if (const ErrorCode failed = ArrayMedian(distances, n, scale))
        return failed;
    return *scale == 0.0 ? ArrayMean(distances, n, scale) : 0;
}

} // namespace

ErrorCode LeastAbsoluteWeights(const DBL *residuals, const DBL *w, int32_t n, DBL *out) {
    for (int32_t i = 0; i < n; ++i)
        out[i] = std::fabs(residuals[i]);
    double middle;
    if (const ErrorCode failed = ArrayMedian(out, n, &middle))
        return failed;
    const double least = middle == 0.0 ? 1e-07 : 0.01 * middle;
    for (int32_t i = 0; i < n; ++i)
        out[i] = WeightOr1(w, i) / (out[i] > least ? out[i] : least);
    return 0;
}

void LeverageFactors(const DBL *leverage, const DBL *w, int32_t n, DBL *factors) {
    for (int32_t i = 0; i < n; ++i) {
        const double h = leverage[i];
        // kept: beyond the limit two constants, which differ in their last digits
        const double rest = h <= 0.9999 ? 1.0 - h : 9.999999999998899e-05;
        const double v = w != nullptr || h <= 0.9999 ? WeightOr1(w, i) / rest : 10000.0000000011;
        factors[i] = std::sqrt(std::fabs(v));
    }
}

ErrorCode BisquareWeights(DBL *adjusted, const DBL *w, int32_t n, int32_t parameters, DBL *out) {
    double scale;
    if (const ErrorCode failed = ScaleOfResiduals(adjusted, n, out, &scale))
        return failed;
    const double factor = 0.6745 / (4.685 * scale);
    int32_t left = 0;
    for (int32_t i = 0; i < n; ++i) {
        const double q = adjusted[i] * factor;
        const double weight = std::fabs(q) < 1.0 ? (1.0 - q * q) * (1.0 - q * q) : 0.0;
        left += weight != 0.0;
        out[i] = weight;
    }
    const bool areUsable = scale != 0.0 && left >= parameters;
    for (int32_t i = 0; i < n; ++i)
        out[i] = areUsable ? out[i] * WeightOr1(w, i) : WeightOr1(w, i);
    return 0;
}

} // namespace qx
