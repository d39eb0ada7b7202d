#ifndef QX_MULTIRATE_CIC_H
#define QX_MULTIRATE_CIC_H

#include "frame/elements.h"
#include "multirate/moving_sums.h"

#include <cstdint>

namespace qx {

// Cascaded integrator-comb filters as cascades of moving averages over width samples at the high
// rate.

struct CICShape {
    int32_t stages;
    int32_t factor;
    int32_t width;
    bool alternate; // shifted by half of the high sampling rate

    // In the state a stage has its latest `width` inputs, oldest first, and its running value.
    int64_t stateSize() const { return (int64_t{width} + 1) * stages; }
};

// Runs the n samples of x through the filter. y gets the outputs first, first + factor, ...
void CICDecimate(const CICShape &shape, DBL *state, const DBL *x, int32_t n, int64_t first, DBL *y);

// Runs x, factor - 1 zeros after each sample and each sample times factor, through the filter. y
// gets the outputs from `dropped` on.
void CICInterpolate(const CICShape &shape, DBL *state, const DBL *x, int32_t n, int64_t dropped,
                    DBL *y);

} // namespace qx

#endif
