#include "util/scaling.h"

#include "frame/constants.h"

#include <cmath>

namespace qx {

namespace {
int32_t Count(RealVector x) { return static_cast<int32_t>(x.size()); }
} // namespace

void ScaleToUnitRange(RealVector x, double &scale, double &offset) {
    const Range range = RangeOf(x.data(), Count(x));
    if (range.highest < range.lowest) { // only NaN
        scale = offset = kNaN;
        return;
    }
    scale = (range.highest - range.lowest) * 0.5;
    offset = range.lowest + scale;
    if (!std::isfinite(1.0 / scale))
        scale = 1.0;
    ShiftAndMultiply(x.data(), Count(x), offset, 1.0 / scale);
}

void ScaleByMagnitude(RealVector x, double &scale) {
    scale = LargestMagnitude(x.data(), Count(x));
    if (scale > 0.0)
        ShiftAndMultiply(x.data(), Count(x), 0.0, 1.0 / scale);
}

void Standardise(RealVector x, double &mean, double &deviation) {
    const int32_t n = Count(x);
    mean = SumOf(x.data(), n) / n;
    deviation = std::sqrt(SumOfSquares(x.data(), n, mean) / n);
    ShiftAndMultiply(x.data(), n, mean, 1.0 / deviation);
}

void UnwrapPhase(RealVector x, UnwrapMode mode) {
    constexpr double degrees = 360.0;
    const bool areRadians = mode == UnwrapMode::Radians || mode == UnwrapMode::RadiansToDegrees;
    Unwrap(x.data(), Count(x), areRadians ? kTwoPi : degrees);
    if (mode == UnwrapMode::RadiansToDegrees)
        MultiplyAndDivide(x.data(), Count(x), degrees, kTwoPi);
    if (mode == UnwrapMode::DegreesToRadians)
        MultiplyAndDivide(x.data(), Count(x), kTwoPi, degrees);
}

} // namespace qx
