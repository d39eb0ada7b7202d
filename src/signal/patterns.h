#ifndef QX_SIGNAL_PATTERNS_H
#define QX_SIGNAL_PATTERNS_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Patterns of n samples, n >= 1; the codes come before anything is written.

void GenSinePattern(int32_t n, double amp, double phase, double cycles, DBL *y);
// ErrWaveParameterRange: cycles is not above 0 or exceeds n.
ErrorCode GenSquarePattern(int32_t n, double amp, double duty, double cycles, DBL *y);
// ErrPulseOutOfRange.
ErrorCode GenPulsePattern(int32_t n, double amp, int32_t delay, int32_t width, DBL *y);
// ErrIndexOutOfRange.
ErrorCode GenImpulsePattern(int32_t n, double amp, int32_t delay, DBL *y);
// ErrSamplingNotPositive.
ErrorCode GenSinc(int32_t n, double amp, double delay, double dt, DBL *y);
// From start to end, which is sample n - 1, or with excludeEnd sample n; scale 1 in equal ratios.
// ErrNotStrictlyPositive.
ErrorCode GenRamp(int32_t n, double start, double end, int32_t excludeEnd, DBL *y, int32_t scale);

// Where a pulse is evaluated: at i dt - delay, or at the times that stand in the output.
struct TimeGrid {
    bool isUniform;
    double dt;
    double delay;
    double at(const DBL *y, int32_t i) const {
        return isUniform ? i * dt - delay : static_cast<double>(y[i]);
    }
};
ErrorCode GenGaussPulse(int32_t n, double amp, const TimeGrid &grid, double fc, double bandwidth,
                        double dBReference, DBL *y);
ErrorCode GenGaussMonopulse(int32_t n, double amp, const TimeGrid &grid, double fc, DBL *y);
ErrorCode GenAperiodicTriangle(int32_t n, double amp, const TimeGrid &grid, double width,
                               double skew, DBL *y);
ErrorCode GenPeriodicSinc(int32_t n, double amp, const TimeGrid &grid, int32_t order, DBL *y);

// Modulators: y is the modulating signal and becomes the output. `peak` and `phase` are in and out;
// the result is the carrier's phase in degrees.
double ModulatePhase(int32_t n, double dt, double fc, DBL *y, double &peak, double &phase);
double ModulateFrequency(int32_t n, double dt, double fc, DBL *y, double &peak, double &phase);

} // namespace qx

#endif
