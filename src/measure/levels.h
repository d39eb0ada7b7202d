#ifndef QX_MEASURE_LEVELS_H
#define QX_MEASURE_LEVELS_H

#include "qx/errors.h"
#include "qx/pulses.h"

#include <cstdint>

namespace qx {

struct Waveform {
    const DBL *y;
    int32_t n;
    double t0, dt;
};

// The method by which levels are found, with the counters of the histogram.
struct LevelSearch {
    int32_t method;
    int32_t bins;
    uint32_t *counts;
    int32_t limit;
    bool isStrict() const { return limit == 1; }
};

// The levels of the two states, and the data they were computed from.
struct StateLevelsFound {
    int32_t chosen; // the method that determined the levels
    double high, low, amplitude;
    double min, range; // of the samples
};

// ErrMeasureEmpty, ErrMeasureLevelsReversed (dt), ErrInvalidSelector (limit).
ErrorCode CheckWaveform(const Waveform &waveform, int32_t limit);

// The codes of CheckWaveform, ErrMeasureTooManyChannels (method), ErrMeasureNotPositive;
// WarnMeasurePartial.
ErrorCode ComputeLevels(const Waveform &waveform, const LevelSearch &search,
                        StateLevelsFound *levels);

// Replaces the levels by those of the histogram, which is built first unless isBuilt. 0 or
// WarnMeasurePartial.
ErrorCode TakeHistogramLevels(const Waveform &waveform, const LevelSearch &search, bool isBuilt,
                              StateLevelsFound *levels);

// Converts references in percent to absolute values.
void MakeAbsolute(const StateLevelsFound &levels, ReferenceLevels *references);

} // namespace qx

#endif
