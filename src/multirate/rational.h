#ifndef QX_MULTIRATE_RATIONAL_H
#define QX_MULTIRATE_RATIONAL_H

#include "multirate/samples.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Change of the rate by L / M with a filter centred on each output. Positions count on the grid of
// the input stuffed with L - 1 zeros after each sample, from the first sample in hand.

// The outputs whose window ends within n samples in hand; ErrOverflow if their grid may exceed the
// range of int32.
ErrorCode RationalOutputCount(int64_t n, int32_t L, int32_t M, const int32_t *offset, int32_t nh,
                              int32_t *count);

// The filter and the place in the stream, which moves on with each block.
struct RationalStream {
    int32_t L;
    int32_t M;
    const DBL *h;
    int32_t nh;
    int32_t stateCapacity;
    int32_t *offset;
    int32_t *stateCount;
};

// y[m] = L * sum over j of h[t + j L] s[first + j], from the first sample that the window of output
// m meets; s are the samples of the state and the block. What later outputs need goes to the state.
// All channels share the positions: x, state and y hold them one behind the other, `n`,
// stateCapacity and `count` apart. Instances for DBL and CDB.
template <ElementType Code>
ErrorCode RationalResample(const RationalStream &stream, const typename Element<Code>::type *x,
                           int32_t n, int32_t channels, typename Element<Code>::type *state,
                           typename Element<Code>::type *y, int32_t count);

} // namespace qx

#endif
