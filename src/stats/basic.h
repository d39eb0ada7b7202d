#ifndef QX_STATS_BASIC_H
#define QX_STATS_BASIC_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Each function computes one number from an array. Every sum runs from the first element to the
// last in one double accumulator that starts at 0; NaN and infinity propagate. n is the number of
// elements; ErrEmptyInput if it is 0.

// sum(x) / n.
ErrorCode ArrayMean(ConstRealVector x, DBL *mean);
// sqrt(sum(x^2) / n); the squares may overflow.
ErrorCode ArrayRMS(ConstRealVector x, DBL *rms);
// sqrt(sum(im^2 + re^2) / n) over the complex elements.
ErrorCode ArrayCxRMS(ConstComplexVector z, DBL *rms);
// The mean of (x - y)^2 over the shorter length m, as sum(x x + y (y - 2 x)) / m.
// WarnLengthsDiffer if the lengths differ.
ErrorCode ArrayMSE(ConstRealVector x, ConstRealVector y, DBL *mse);
// sum((x - mean)^order) / n. ErrOrderNotPositive after ErrEmptyInput.
ErrorCode ArrayMoment(ConstRealVector x, int32_t order, DBL *moment);

} // namespace qx

#endif
