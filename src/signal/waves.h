#ifndef QX_SIGNAL_WAVES_H
#define QX_SIGNAL_WAVES_H

#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Continuous waves of n samples, n >= 1: f in cycles per sample, `phase` in degrees, in and out.
void GenSineWave(int32_t n, double amp, double f, double &phase, DBL *y);
void GenSquareWave(int32_t n, double amp, double f, double &phase, double duty, DBL *y);
void GenTriangleWave(int32_t n, double amp, double f, double &phase, DBL *y);
void GenSawtoothWave(int32_t n, double amp, double f, double &phase, DBL *y);
// m values of a table; ErrNonFiniteInput before anything is written.
ErrorCode GenArbitraryWave(int32_t n, double amp, double f, double &phase, const DBL *table,
                           int32_t m, int32_t interpolate, DBL *y);
void GenChirp(int32_t n, double amp, double f1, double f2, DBL *y);

// The phases of a wave: fmod(i 360 f + start, 360), raised by 360 where negative; or, `inPlace`,
// what stands in the output, for where the lanes' own remainder is not exact.
struct WavePhases {
    double f;
    double start;
    bool inPlace;
};
QX_BY_WIDTH(void, SquareSamples,
            (WavePhases phases, int32_t n, double amp, double threshold, DBL *y))
QX_BY_WIDTH(void, TriangleSamples, (WavePhases phases, int32_t n, double amp, DBL *y))
QX_BY_WIDTH(void, SawtoothSamples, (WavePhases phases, int32_t n, double amp, DBL *y))

} // namespace qx

#endif
