#ifndef QX_MEASURE_TRIGGER_H
#define QX_MEASURE_TRIGGER_H

#include "qx/errors.h"
#include "qx/trigger.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

enum TriggerSlope : int32_t { RisingSlope = 0, FallingSlope = 1, EitherSlope = 2 };

struct TriggerSettings {
    double level, hysteresis; // finite, the latter not negative
    TriggerSlope slope;
    int32_t holdoff; // not negative
};

struct TriggerHit {
    int32_t index; // -1: none
    double position;
};

// Finds the first trigger from sample `from` on; state moves past it, or past the end of the block.
// ErrNonFiniteInput leaves the state unchanged.
ErrorCode FindTrigger(const DBL *y, int32_t n, int32_t from, const TriggerSettings &settings,
                      TriggerState &state, TriggerHit &hit);

} // namespace qx

#endif
