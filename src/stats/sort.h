#ifndef QX_STATS_SORT_H
#define QX_STATS_SORT_H

#include "frame/views.h"

namespace qx {

// No element is smaller, or none greater, than the one before it; false where NaN is among them.
bool IsAscending(ConstRealVector a);
bool IsDescending(ConstRealVector a);

// Where the elements rise, none being smaller than the one before it, at least three times, and then
// fall to the end: the place of the first that falls or, if none does, their count. Else 0, as where
// NaN is among them.
std::ptrdiff_t StartOfFall(ConstRealVector a);
// Such elements in ascending order; there is one that falls. Zeros of both signs come in any order.
void MergeRiseAndFall(ConstRealVector a, std::ptrdiff_t fall, RealVector out);

// Sorts elements of which none is NaN, ascending: quicksort with a partition free of branches
// (S. Edelkamp, A. Weiss: BlockQuicksort, 2016), insertion sort for short ranges, heapsort where
// the pivots turn out badly (D. Musser: Introspective sorting and selection algorithms, 1997).
void SortRange(RealVector a);

// Heapsort: n log n whatever the data.
void HeapSort(RealVector a);

} // namespace qx

#endif
