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

// How levels are found, with the counters of the histogram.
struct LevelSearch {
    int32_t method;
    int32_t bins;
    uint32_t *counts;
    int32_t limit;
    bool isStrict() const { return limit == 1; }
};

// The levels of the two states, and what they were found from.
struct StateLevelsFound {
    int32_t chosen; // the method that has decided
    double high, low, amplitude;
    double min, range; // of the samples
};

// ErrMeasureEmpty, ErrMeasureLevelsReversed (dt), ErrInvalidSelector (limit).
ErrorCode CheckWaveform(const Waveform &waveform, int32_t limit);

// Those of CheckWaveform, ErrMeasureTooManyChannels (method), ErrMeasureNotPositive;
// WarnMeasurePartial.
ErrorCode ComputeLevels(const Waveform &waveform, const LevelSearch &search,
                        StateLevelsFound *levels);

// The levels replaced by those of the histogram, which is built first where no method has done so.
// 0 or WarnMeasurePartial.
ErrorCode TakeHistogramLevels(const Waveform &waveform, const LevelSearch &search, bool isBuilt,
                              StateLevelsFound *levels);

// References in percent as absolute values.
void MakeAbsolute(const StateLevelsFound &levels, ReferenceLevels *references);

} // namespace qx

#endif
