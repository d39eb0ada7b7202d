#include "fit/robust_weights.h"

#include "stats/basic.h"
#include "stats/order.h"

#include <cmath>

namespace qx {

namespace {

double WeightOr1(ConstRealVector w, std::ptrdiff_t i) {
    return w.isEmpty() ? 1.0 : std::fabs(w[i]);
}

// The distances of the adjusted residuals from their median, or from 0 if no residual is farther
// from the median than 0 is. *scale is the median of the distances, or their mean if that is 0.
ErrorCode ScaleOfResiduals(ConstRealVector residuals, ConstRealVector factors, RealVector distances,
                           double *scale) {
    const std::ptrdiff_t n = distances.size();
    for (std::ptrdiff_t i = 0; i < n; ++i)
        distances[i] = residuals[i] * factors[i];
    double middle, largest = 0.0;
    if (const ErrorCode failed = ArrayMedian(distances, &middle))
        return failed;
    for (DBL &distance : distances) {
        distance = std::fabs(distance - middle);
        largest = distance > largest ? distance : largest;
    }
    for (std::ptrdiff_t i = 0; largest <= std::fabs(middle) && i < n; ++i)
        distances[i] = std::fabs(residuals[i] * factors[i]);
    if (const ErrorCode failed = ArrayMedian(distances, scale))
        return failed;
    return *scale == 0.0 ? ArrayMean(distances, scale) : 0;
}

} // namespace

ErrorCode LeastAbsoluteWeights(ConstRealVector residuals, ConstRealVector w, RealVector out) {
    for (std::ptrdiff_t i = 0; i < out.size(); ++i)
        out[i] = std::fabs(residuals[i]);
    double middle;
    if (const ErrorCode failed = ArrayMedian(out, &middle))
        return failed;
    const double least = middle == 0.0 ? 1e-07 : 0.01 * middle;
    for (std::ptrdiff_t i = 0; i < out.size(); ++i)
        out[i] = WeightOr1(w, i) / (out[i] > least ? out[i] : least);
    return 0;
}

void LeverageFactors(ConstRealVector leverage, ConstRealVector w, RealVector factors) {
    for (std::ptrdiff_t i = 0; i < factors.size(); ++i) {
        const double h = leverage[i];
        // kept: two constants beyond the limit, which differ in their last digits
        const double rest = h <= 0.9999 ? 1.0 - h : 9.999999999998899e-05;
        const double v = !w.isEmpty() || h <= 0.9999 ? WeightOr1(w, i) / rest : 10000.0000000011;
        factors[i] = std::sqrt(std::fabs(v));
    }
}

ErrorCode BisquareWeights(ConstRealVector residuals, ConstRealVector factors, ConstRealVector w,
                          int32_t parameters, RealVector out) {
    double scale;
    if (const ErrorCode failed = ScaleOfResiduals(residuals, factors, out, &scale))
        return failed;
    const double factor = 0.6745 / (4.685 * scale);
    int32_t left = 0;
    for (std::ptrdiff_t i = 0; i < out.size(); ++i) {
        const double q = residuals[i] * factors[i] * factor;
        const double weight = std::fabs(q) < 1.0 ? (1.0 - q * q) * (1.0 - q * q) : 0.0;
        left += weight != 0.0;
        out[i] = weight;
    }
    const bool areUsable = scale != 0.0 && left >= parameters;
    for (std::ptrdiff_t i = 0; i < out.size(); ++i)
        out[i] = areUsable ? out[i] * WeightOr1(w, i) : WeightOr1(w, i);
    return 0;
}

} // namespace qx
