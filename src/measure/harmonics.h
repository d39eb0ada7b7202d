#ifndef QX_MEASURE_HARMONICS_H
#define QX_MEASURE_HARMONICS_H

#include "measure/tone_search.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The largest tone of the band, which becomes the last of the search's tones; larger ones outside
// it stand before it. ErrMeasureNotFound, ErrOutOfMemory.
ErrorCode FindToneInBand(ToneSearch &search, const Band &band);

// Frequencies are in cycles per sample, amplitudes in the unit of the search.
struct HarmonicSums {
    double thd, sinad, snr, sfdr, noiseFloor; // as HarmonicAnalysis has them
    double amplitude;                         // of the fundamental
};

// The harmonics of the tone that is given, 1 to `highest`, at most n / 2 - 1: fitted together, in
// the place of the search's tones. `harmonics` has `highest` elements; those that cannot be told
// are NaN. ErrOutOfMemory.
ErrorCode MeasureHarmonics(ToneSearch &search, const Line &fundamental, int32_t n, int32_t highest,
                           Line *harmonics, HarmonicSums &sums);

} // namespace qx

#endif
