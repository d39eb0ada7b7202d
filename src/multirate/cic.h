#ifndef QX_MULTIRATE_CIC_H
#define QX_MULTIRATE_CIC_H

#include "frame/elements.h"
#include "multirate/moving_sums.h"

#include <cstdint>

namespace qx {

// Cascaded integrator-comb filters, implemented as cascades of moving averages over `width` samples
// at the high rate.

struct CICShape {
    int32_t stages;
    int32_t factor;
    int32_t width;
    bool alternate; // shifted by half of the high sampling rate

    // The state of a stage consists of its latest `width` inputs, oldest first, and its running
    // value.
    int64_t stateSize() const { return (int64_t{width} + 1) * stages; }
};

// Runs the n samples of x through the filter. y receives the outputs at first, first + factor, ...
void CICDecimate(const CICShape &shape, DBL *state, const DBL *x, int32_t n, int64_t first, DBL *y);

// Runs each sample of x, multiplied by factor and followed by factor - 1 zeros, through the filter.
// y receives the outputs from `dropped` on.
void CICInterpolate(const CICShape &shape, DBL *state, const DBL *x, int32_t n, int64_t dropped,
                    DBL *y);

} // namespace qx

#endif
