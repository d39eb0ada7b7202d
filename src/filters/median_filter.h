#ifndef QX_FILTERS_MEDIAN_FILTER_H
#define QX_FILTERS_MEDIAN_FILTER_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// y[i] is the median of x[i - leftRank] to x[i + rightRank], with zeros before and behind x; of an
// even number of values it is the mean of the two in the middle. No rank is below 0, and x is
// longer than rightRank or empty. y may be x.
//
// Zeros of either sign are equal, and among them the older one comes first. A NaN puts the window
// into disorder for good: see SortedWindow in the source. ErrOutOfMemory.
ErrorCode MedianFilterRun(ConstRealVector x, int32_t leftRank, int32_t rightRank, RealVector y);

// So many stretches of a signal are filtered at once.
inline constexpr int32_t medianStretches = 8;

// Filters `steps` samples of each stretch. Row t of `samples` holds one sample of each, beginning
// with the first of the first window, and gets their medians; there are steps + width rows. Row k
// of `window` holds the value of rank k in the first window of each stretch, and row `width` is
// infinite. There is no NaN.
QX_BY_WIDTH(void, MedianSteps, (DBL * window, int32_t width, DBL *samples, int32_t steps))

} // namespace qx

#endif
