#ifndef QX_STATS_SORT_H
#define QX_STATS_SORT_H

#include "frame/elements.h"

#include <cstddef>

namespace qx {

// No element is smaller, or none greater, than the one before it; false where NaN is among them.
bool IsAscending(const DBL *a, std::ptrdiff_t n);
bool IsDescending(const DBL *a, std::ptrdiff_t n);

// Sorts a[0..n-1], which holds no NaN, ascending: quicksort with a partition free of branches
// (S. Edelkamp, A. Weiss: BlockQuicksort, 2016), insertion sort for short ranges, heapsort where
// the pivots turn out badly (D. Musser: Introspective sorting and selection algorithms, 1997).
void SortRange(DBL *a, std::ptrdiff_t n);

// Heapsort: n log n whatever the data.
void HeapSort(DBL *a, std::ptrdiff_t n);

} // namespace qx

#endif
