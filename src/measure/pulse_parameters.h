#ifndef QX_MEASURE_PULSE_PARAMETERS_H
#define QX_MEASURE_PULSE_PARAMETERS_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The first pulse of a waveform; all times in samples.
struct PulseParametersFound {
    double top, base, amplitude;
    double delay, width, slewRate, fallTime, riseTime;
    double overshoot, undershoot;
};

// ErrEmptyInput.
ErrorCode MeasureFirstPulse(const DBL *y, int32_t n, PulseParametersFound *found);

} // namespace qx

#endif
