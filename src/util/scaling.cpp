#include "util/scaling.h"

#include "frame/constants.h"

#include <cmath>

namespace qx {

void ScaleToUnitRange(DBL *x, int32_t n, double &scale, double &offset) {
    const Range range = RangeOf(x, n);
    if (range.highest < range.lowest) { // nothing but NaN
        scale = offset = kNaN;
        return;
    }
    scale = (range.highest - range.lowest) * 0.5;
    offset = range.lowest + scale;
    if (std::isfinite(1.0 / scale)) {
        ShiftAndMultiply(x, n, offset, 1.0 / scale);
    } else {
        scale = 1.0;
        ShiftAndMultiply(x, n, offset, 1.0);
    }
}

void ScaleByMagnitude(DBL *x, int32_t n, double &scale) {
    scale = LargestMagnitude(x, n);
    if (scale > 0.0)
        ShiftAndMultiply(x, n, 0.0, 1.0 / scale);
}

void Standardise(DBL *x, int32_t n, double &mean, double &deviation) {
    mean = SumOf(x, n) / n;
    deviation = std::sqrt(SumOfSquares(x, n, mean) / n);
    ShiftAndMultiply(x, n, mean, 1.0 / deviation);
}

ErrorCode UnwrapPhase(DBL *x, int32_t n, int32_t mode) {
    enum Mode : int32_t { Radians, RadiansToDegrees, Degrees, DegreesToRadians };
    constexpr double degrees = 360.0;
    if (mode < Radians || mode > DegreesToRadians)
        return ErrInvalidSelector;
    Unwrap(x, n, mode == Radians || mode == RadiansToDegrees ? kTwoPi : degrees);
    if (mode == RadiansToDegrees)
        MultiplyAndDivide(x, n, degrees, kTwoPi);
    if (mode == DegreesToRadians)
        MultiplyAndDivide(x, n, kTwoPi, degrees);
    return 0;
}

} // namespace qx
