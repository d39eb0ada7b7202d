#ifndef QX_MEASURE_HARMONICS_H
#define QX_MEASURE_HARMONICS_H

#include "measure/tone_search.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Finds the largest tone in the band and makes it the last of the search's tones, after the larger
// tones outside the band. ErrMeasureNotFound, ErrOutOfMemory.
ErrorCode FindToneInBand(ToneSearch &search, const Band &band);

// Frequencies are in cycles per sample, amplitudes in the unit of the search.
struct HarmonicSums {
    double thd, sinad, snr, sfdr, noiseFloor; // as in HarmonicAnalysis
    double amplitude;                         // of the fundamental
};

// Fits the harmonics 1 to `highest` (at most n / 2 - 1) of the given tone together; they replace
// the tones of the search. `harmonics` has `highest` elements; those that cannot be distinguished
// are NaN. ErrOutOfMemory.
ErrorCode MeasureHarmonics(ToneSearch &search, const Line &fundamental, int32_t n, int32_t highest,
                           Line *harmonics, HarmonicSums &sums);

} // namespace qx

#endif
