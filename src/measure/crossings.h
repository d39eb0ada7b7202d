#ifndef QX_MEASURE_CROSSINGS_H
#define QX_MEASURE_CROSSINGS_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Directions of crossings and transitions.
enum Direction : int32_t { falling = 0, rising = 1, either = -1 };

struct Crossing {
    DBL position; // in samples
    I32 direction;
};

struct Transition {
    DBL startPosition, endPosition; // in samples
    I32 startIndex, endIndex;       // the first samples after them
    I32 direction;
};

// The crossings of `mid`. Each counts once the waveform has reached mid + h or mid - h, on the
// other side than the last time. Positions are shifted by t0. The search ends after `limit`
// entries; returns their number.
int32_t FindMidCrossings(double t0, const DBL *y, int32_t n, double mid, double h, Crossing *list,
                         int32_t limit);

// The transitions between low and high. ErrMeasureRangeReversed if low is not below high.
ErrorCode FindTransitions(const DBL *y, int32_t n, double low, double high, Transition *list,
                          int32_t limit, int32_t *count);

} // namespace qx

#endif
