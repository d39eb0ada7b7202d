#ifndef QX_SIGNAL_WAVES_H
#define QX_SIGNAL_WAVES_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

namespace qx {

inline int32_t Count(ConstRealVector y) { return static_cast<int32_t>(y.size()); }

// Continuous waves of n samples, where n >= 1 is the size of y; f is in cycles per sample, and
// `phase`, in degrees, is updated.
void GenSineWave(double amp, double f, double &phase, RealVector y);
void GenSquareWave(double amp, double f, double &phase, double duty, RealVector y);
void GenTriangleWave(double amp, double f, double &phase, RealVector y);
void GenSawtoothWave(double amp, double f, double &phase, RealVector y);
// A wave whose period is a table. ErrNonFiniteInput is returned before anything is written.
ErrorCode GenArbitraryWave(double amp, double f, double &phase, ConstRealVector table,
                           int32_t interpolate, RealVector y);
void GenChirp(double amp, double f1, double f2, RealVector y);

// The phases of a wave: fmod(i 360 f + start, 360), increased by 360 if negative; or, with
// `inPlace`, the phases that the output holds, for which the remainder in lanes would not be exact.
struct WavePhases {
    double f;
    double start;
    bool inPlace;
};
QX_BY_WIDTH_TO_8(void, SquareSamples,
                 (WavePhases phases, int32_t n, double amp, double threshold, DBL *y))
QX_BY_WIDTH_TO_8(void, TriangleSamples, (WavePhases phases, int32_t n, double amp, DBL *y))
QX_BY_WIDTH_TO_8(void, SawtoothSamples, (WavePhases phases, int32_t n, double amp, DBL *y))
// i (step i + slope) from i = first on.
QX_BY_WIDTH_TO_8(void, ChirpPhases, (double step, double slope, int32_t first, int32_t n, DBL *y))
QX_BY_WIDTH_TO_8(void, ScaleSamples, (double amp, int32_t n, DBL *y))

} // namespace qx

#endif
