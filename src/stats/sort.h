#ifndef QX_STATS_SORT_H
#define QX_STATS_SORT_H

#include "frame/views.h"

namespace qx {

// Whether no element is smaller (or larger) than the one before it; false if there is NaN among
// them.
bool IsAscending(ConstRealVector a);
bool IsDescending(ConstRealVector a);

// For elements that rise (none smaller than the one before) at least three times and then fall to
// the end: the index of the first one that falls, or their count if none does. Otherwise 0, also if
// there is NaN among them.
std::ptrdiff_t StartOfFall(ConstRealVector a);
// Writes such elements in ascending order; at least one must fall. Zeros of both signs come in any
// order.
void MergeRiseAndFall(ConstRealVector a, std::ptrdiff_t fall, RealVector out);

// Sorts elements without NaN in ascending order: quicksort with a branch-free partition (S.
// Edelkamp, A. Weiss: BlockQuicksort, 2016), insertion sort for short ranges, heapsort if the
// pivots are bad (D. Musser: Introspective sorting and selection algorithms, 1997).
void SortRange(RealVector a);

// Heapsort: n log n whatever the data.
void HeapSort(RealVector a);

} // namespace qx

#endif
