#ifndef QX_FILTERS_MEDIAN_FILTER_H
#define QX_FILTERS_MEDIAN_FILTER_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// y[i] is the median of x[i - leftRank] to x[i + rightRank], with zeros before and after x; for an
// even number of values it is the mean of the two middle ones. No rank may be negative, and x must
// be longer than rightRank, or empty. y may be x.
//
// Zeros of either sign are equal, and among them the older one comes first. A NaN permanently
// disturbs the order of the window: see SortedWindow in the source. ErrOutOfMemory.
ErrorCode MedianFilterRun(ConstRealVector x, int32_t leftRank, int32_t rightRank, RealVector y);

// The number of stretches of a signal that are filtered together.
inline constexpr int32_t medianStretches = 8;

// Filters `steps` samples of each stretch. Row t of `samples` contains one sample of each stretch,
// starting with the first sample of the first window, and is replaced by the medians; there are
// steps + width rows. Row k of `window` contains the value of rank k in the first window of each
// stretch, and row `width` is infinite. There must be no NaN.
QX_BY_WIDTH(void, MedianSteps, (DBL * window, int32_t width, DBL *samples, int32_t steps))

} // namespace qx

#endif
