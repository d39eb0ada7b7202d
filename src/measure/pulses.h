#ifndef QX_MEASURE_PULSES_H
#define QX_MEASURE_PULSES_H

#include "measure/crossings.h"
#include "measure/levels.h"

namespace qx {

// Each function takes the references as the caller has them and replaces them by absolute ones.
// Codes: those of CheckWaveform and ComputeLevels, and those listed here.

struct PulseFound {
    double period, duration, dutyCycle, center;
};
// With the direction `either`, the pulse begins with whichever edge has its place in the list.
// ErrMeasureBadCount, ErrInvalidSelector (direction), ErrMeasureRangeReversed,
// ErrMeasureOutOfMemory, ErrMeasureSearchShort.
ErrorCode MeasurePulse(const Waveform &waveform, const LevelSearch &search, int32_t direction,
                       bool mayBePartial, int32_t number, ReferenceLevels *references,
                       PulseFound *found);

struct CycleFound {
    double mean, rms, start, end;
};
// The codes of MeasurePulse, ErrMeasureNotFound.
ErrorCode MeasureCycle(const Waveform &waveform, const LevelSearch &search, int32_t number,
                       ReferenceLevels *references, CycleFound *found);

struct TransitionFound {
    double slewRate, duration, start, end;
    double preUndershoot, preOvershoot, postUndershoot, postOvershoot;
};
// ErrMeasureBadCount, ErrInvalidSelector (direction), ErrMeasureRangeReversed,
// ErrMeasureOutOfMemory, ErrMeasureTooFewPoints, ErrMeasureOutOfRange.
ErrorCode MeasureTransition(const Waveform &waveform, const LevelSearch &search, int32_t direction,
                            int32_t number, ReferenceLevels *references, TransitionFound *found);

} // namespace qx

#endif
