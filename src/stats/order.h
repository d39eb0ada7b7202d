#ifndef QX_STATS_ORDER_H
#define QX_STATS_ORDER_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// The middle value, or the mean of the two middle ones, by selection in a scratch copy.
// ErrEmptyInput; ErrNaNInData; ErrOutOfMemory.
ErrorCode ArrayMedian(const DBL *x, int32_t n, DBL *median);

// Puts the element of rank k (from 0) in place k of a[0..n-1], everything before it smaller or
// equal, everything behind it greater or equal.
void SelectKth(DBL *a, int32_t n, int32_t k);

// The extremes among the elements that are no NaN, each with its first index; NaN and -1 if
// there is none. ErrEmptyInput.
ErrorCode ArrayMaxMin(const DBL *x, int32_t n, DBL *maxValue, int32_t *maxIndex, DBL *minValue,
                      int32_t *minIndex);

// Sorts into `out`, or in place if `out` is null or x itself: NaNs first, then the rest
// ascending, or descending if `descending` is non-zero. Not stable.
ErrorCode SortAscending(const DBL *x, int32_t n, int32_t descending, DBL *out);

} // namespace qx

#endif
