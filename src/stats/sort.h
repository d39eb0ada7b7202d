#ifndef QX_STATS_SORT_H
#define QX_STATS_SORT_H

#include "frame/views.h"

namespace qx {

// No element is smaller, or none greater, than the one before it; false where NaN is among them.
bool IsAscending(ConstRealVector a);
bool IsDescending(ConstRealVector a);

// Sorts elements of which none is NaN, ascending: quicksort with a partition free of branches
// (S. Edelkamp, A. Weiss: BlockQuicksort, 2016), insertion sort for short ranges, heapsort where
// the pivots turn out badly (D. Musser: Introspective sorting and selection algorithms, 1997).
void SortRange(RealVector a);

// Heapsort: n log n whatever the data.
void HeapSort(RealVector a);

} // namespace qx

#endif
