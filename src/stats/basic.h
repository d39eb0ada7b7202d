#ifndef QX_STATS_BASIC_H
#define QX_STATS_BASIC_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// One number from one array. Every sum runs from the first element to the last in one double
// accumulator that starts at 0; NaN and infinity propagate. ErrEmptyInput for n < 1.

// sum(x) / n.
ErrorCode ArrayMean(const DBL *x, int32_t n, DBL *mean);
// sqrt(sum(x^2) / n); the squares may overflow.
ErrorCode ArrayRMS(const DBL *x, int32_t n, DBL *rms);
// sqrt(sum(im^2 + re^2) / n) over n complex elements.
ErrorCode ArrayCxRMS(const CDB *z, int32_t n, DBL *rms);
// The mean of (x - y)^2 over the shorter length m, as sum(x x + y (y - 2 x)) / m.
// WarnLengthsDiffer if the lengths differ.
ErrorCode ArrayMSE(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *mse);
// sum((x - mean)^order) / n. ErrOrderNotPositive after ErrEmptyInput.
ErrorCode ArrayMoment(const DBL *x, int32_t n, int32_t order, DBL *moment);

} // namespace qx

#endif
