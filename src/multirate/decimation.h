#ifndef QX_MULTIRATE_DECIMATION_H
#define QX_MULTIRATE_DECIMATION_H

#include "frame/elements.h"

#include <cstdint>

namespace qx {

// Decimation by picking samples and by means and sums of groups. All work in place, x holding the
// outputs in front afterwards, and return the count of these. Instances for DBL and CDB.

// Sample 0, factor, 2 factor ..., or the means of the `factor` samples from there on; n is at least
// `factor`, and what is behind the last whole group is left out.
template <ElementType Code>
int32_t DecimateBlock(typename Element<Code>::type *x, int32_t n, int32_t factor, bool average);

// The same for a stream. Before the next output or the next group *start samples are skipped.
template <ElementType Code>
int32_t PickFromStream(typename Element<Code>::type *x, int32_t n, int32_t factor, int32_t *start);
// A group that the block does not end goes on as a partial sum; *start then tells how many samples
// it still needs.
template <ElementType Code>
int32_t AverageStream(typename Element<Code>::type *x, int32_t n, int32_t factor, int32_t *start,
                      int32_t *partialCount, typename Element<Code>::type *partialSum);

// The sums of groups of a stream, factor at least 2; *count samples are in *sum.
template <ElementType Code>
int32_t SumGroups(typename Element<Code>::type *x, int32_t n, int32_t factor,
                  typename Element<Code>::type *sum, int32_t *count);

} // namespace qx

#endif
