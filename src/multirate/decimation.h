#ifndef QX_MULTIRATE_DECIMATION_H
#define QX_MULTIRATE_DECIMATION_H

#include "frame/elements.h"

#include <cstdint>

namespace qx {

// Decimation by picking samples and by means and sums of groups. All functions work in place, leave
// the outputs at the front of x, and return their number. Instances for DBL and CDB.

// Samples 0, factor, 2 factor, ..., or the means of the `factor` samples from each of these on. n
// is at least `factor`; samples after the last whole group are ignored.
template <ElementType Code>
int32_t DecimateBlock(typename Element<Code>::type *x, int32_t n, int32_t factor, bool average);

// The same for a stream. *start samples are skipped before the next output or the next group.
template <ElementType Code>
int32_t PickFromStream(typename Element<Code>::type *x, int32_t n, int32_t factor, int32_t *start);
// A group that the block does not complete continues as a partial sum; *start is then the number of
// samples that it still needs.
template <ElementType Code>
int32_t AverageStream(typename Element<Code>::type *x, int32_t n, int32_t factor, int32_t *start,
                      int32_t *partialCount, typename Element<Code>::type *partialSum);

// The sums of groups of a stream, factor at least 2. *sum is the sum of the *count samples of the
// current group.
template <ElementType Code>
int32_t SumGroups(typename Element<Code>::type *x, int32_t n, int32_t factor,
                  typename Element<Code>::type *sum, int32_t *count);

} // namespace qx

#endif
