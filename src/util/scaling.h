#ifndef QX_UTIL_SCALING_H
#define QX_UTIL_SCALING_H

#include "frame/views.h"
#include "frame/widths.h"

namespace qx {

// In place, over at least one element; include/qx/scaling.h documents what they compute.
void ScaleToUnitRange(RealVector x, double &scale, double &offset);
void ScaleByMagnitude(RealVector x, double &scale);
void Standardise(RealVector x, double &mean, double &deviation);
enum class UnwrapMode : int32_t { Radians, RadiansToDegrees, Degrees, DegreesToRadians };
void UnwrapPhase(RealVector x, UnwrapMode mode);

// The extremes of all elements that are not NaN; crossed infinities if there are none.
struct Range {
    double lowest;
    double highest;
};
QX_BY_WIDTH(Range, RangeOf, (const DBL *x, int32_t n))
// max |x|, at least 0; NaN is ignored.
QX_BY_WIDTH(double, LargestMagnitude, (const DBL *x, int32_t n))
// sum(x) and sum((x - centre)^2): by sixteen partial sums, each over elements i, i + 16, ..., which
// are added by halves.
QX_BY_WIDTH(double, SumOf, (const DBL *x, int32_t n))
QX_BY_WIDTH(double, SumOfSquares, (const DBL *x, int32_t n, double centre))

QX_BY_WIDTH(void, ShiftAndMultiply, (DBL * x, int32_t n, double shift, double factor))
QX_BY_WIDTH(void, MultiplyAndShift, (DBL * x, int32_t n, double factor, double shift))
QX_BY_WIDTH(void, MultiplyAndDivide, (DBL * x, int32_t n, double factor, double divisor))
// Moves each element by whole periods to within half a period of the one before.
QX_BY_WIDTH(void, Unwrap, (DBL * x, int32_t n, double period))

} // namespace qx

#endif
