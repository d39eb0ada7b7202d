#ifndef QX_MULTIRATE_RATIONAL_H
#define QX_MULTIRATE_RATIONAL_H

#include "multirate/samples.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Change of the rate by L / M with a filter centred on each output. Positions count on the grid of
// the input with L - 1 zeros inserted after each sample, from the first available sample.

// The number of outputs whose window ends within n available samples; ErrOverflow if their grid may
// exceed the range of int32.
ErrorCode RationalOutputCount(int64_t n, int32_t L, int32_t M, const int32_t *offset, int32_t nh,
                              int32_t *count);

// The filter and the position in the stream, which advances with each block.
struct RationalStream {
    int32_t L;
    int32_t M;
    const DBL *h;
    int32_t nh;
    int32_t stateCapacity;
    int32_t *offset;
    int32_t *stateCount;
};

// y[m] = L * sum over j of h[t + j L] s[first + j], from the first sample in the window of output
// m; s are the samples of the state followed by the block. The samples that later outputs need are
// stored in the state. All channels have the same positions: x, state and y contain one channel
// after the other, at distances of `n`, stateCapacity and `count`. Instances for DBL and CDB.
template <ElementType Code>
ErrorCode RationalResample(const RationalStream &stream, const typename Element<Code>::type *x,
                           int32_t n, int32_t channels, typename Element<Code>::type *state,
                           typename Element<Code>::type *y, int32_t count);

} // namespace qx

#endif
