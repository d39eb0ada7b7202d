#ifndef QX_STATS_ORDER_H
#define QX_STATS_ORDER_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// The middle value, or the mean of the two middle ones, by selection in a scratch copy.
// ErrEmptyInput; ErrNaNInData; ErrOutOfMemory.
ErrorCode ArrayMedian(ConstRealVector x, DBL *median);

// Puts the element of rank k (from 0) at index k, with no larger element before it and no smaller
// element after it.
void SelectKth(RealVector a, int32_t k);

struct Extremes {
    double max, min;
    int32_t maxIndex, minIndex;
};

// The extremes of the elements that are not NaN, each with its first index; NaN and -1 if there are
// none. ErrEmptyInput.
ErrorCode ArrayMaxMin(ConstRealVector x, Extremes *found);

enum class SortOrder { Ascending, Descending };

// Sorts into `out`, which may be x: NaNs first, then the rest in order. Not stable.
void SortNaNsFirst(ConstRealVector x, SortOrder order, RealVector out);

} // namespace qx

#endif
