#ifndef QX_MULTIRATE_POLYPHASE_H
#define QX_MULTIRATE_POLYPHASE_H

#include "multirate/samples.h"
#include "qx/errors.h"

#include <algorithm>
#include <cstdint>

namespace qx {

// FIR filters at a changed rate for streams in blocks, with the caller's state. Instances for SGL,
// DBL, CSG and CDB.

// A block of input and the taps, at least one.
template <ElementType Code>
struct FIRBlock {
    const typename Element<Code>::type *x;
    int32_t n;
    const RealOf<Code> *h;
    int32_t taps;
};

// The outputs of a block: those at positions first, first + step, ... below `positions`. The
// earliest of them are dropped while a delay is left.
struct OutputRange {
    int64_t dropped;
    int64_t count; // after those dropped
    int32_t delayLeft;

    OutputRange(int64_t positions, int32_t first, int32_t step, int32_t delay) {
        const int64_t due = first < positions ? (positions - first - 1) / step + 1 : 0;
        dropped = std::min<int64_t>(due, delay);
        count = due - dropped;
        delayLeft = static_cast<int32_t>(delay - dropped);
    }
};

// y[i] = gain * sum over k of h[k] u[i + dropped - k], summed from the oldest sample to the newest;
// u is the input preceded by the taps - 1 samples of the state. Updates the state.
template <ElementType Code>
ErrorCode PolyphaseSameRate(const FIRBlock<Code> &block, RealOf<Code> gain, OutputRange outputs,
                            typename Element<Code>::type *state, typename Element<Code>::type *y);

// The same with taps `spacing` samples apart, summed from the newest sample to the oldest; the
// state has (taps - 1) spacing samples.
template <ElementType Code>
ErrorCode PolyphaseSpaced(const FIRBlock<Code> &block, int32_t spacing, RealOf<Code> gain,
                          OutputRange outputs, typename Element<Code>::type *state,
                          typename Element<Code>::type *y);

// Outputs at positions first + m M of the input stuffed with L - 1 zeros after each sample,
// gain * L times the filter's sum, added up from the newest sample to the oldest. The state has
// ceil(taps / L) elements; the last is not used.
template <ElementType Code>
ErrorCode PolyphaseRational(const FIRBlock<Code> &block, int32_t L, int32_t M, int32_t first,
                            RealOf<Code> gain, OutputRange outputs,
                            typename Element<Code>::type *state, typename Element<Code>::type *y);

template <ElementType Code>
ErrorCode PolyphaseInterpolate(const FIRBlock<Code> &block, int32_t L, RealOf<Code> gain,
                               OutputRange outputs, typename Element<Code>::type *state,
                               typename Element<Code>::type *y) {
    return PolyphaseRational<Code>(block, L, 1, 0, gain, outputs, state, y);
}

// Outputs at inputs first + m M, without scaling, summed from the oldest sample to the newest.
// `sums` contains the ceil(taps / M) outputs in progress, the next output first.
template <ElementType Code>
ErrorCode PolyphaseDecimate(const FIRBlock<Code> &block, int32_t M, int32_t first,
                            OutputRange outputs, typename Element<Code>::type *sums,
                            typename Element<Code>::type *y);

} // namespace qx

#endif
