#ifndef QX_STATS_HISTOGRAM_H
#define QX_STATS_HISTOGRAM_H

#include "frame/elements.h"
#include "qx/errors.h"
#include "qx/histogram.h"

namespace qx {

// Equal-width counts of x between min and max. The last bin takes x = max; what lies outside
// and NaN are dropped. The centres are accumulated bin by bin, so their rounding drifts.
// ErrRangeReversed, ErrEmptyInput (no data or no bins).
ErrorCode ArrayHistogram(const DBL *x, int32_t n, double min, double max, I32 *counts, DBL *centres,
                         int32_t bins);

// An interval of the general histogram, without the padding of the host's record.
struct PackedInterval {
    DBL lower, upper;
    I32 closure;
};

// 0 if x lies in the interval, -1 below it, +1 above it.
int32_t IntervalTest(const PackedInterval &interval, double x);

// Counts x in each of `intervals` intervals, which are expected in ascending order and may
// overlap. ErrEmptyInput for n < 1.
ErrorCode GeneralHistogram(const DBL *x, int32_t n, const PackedInterval *interval,
                           int32_t intervals, I32 *counts, HistSummary *summary);

} // namespace qx

#endif
