#ifndef QX_SIGNAL_PATTERNS_H
#define QX_SIGNAL_PATTERNS_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Patterns of n samples, where n >= 1 is the size of y; codes are returned before anything is
// written.

void GenSinePattern(double amp, double phase, double cycles, RealVector y);
// ErrWaveParameterRange (cycles is not above 0 or exceeds n).
ErrorCode GenSquarePattern(double amp, double duty, double cycles, RealVector y);
// ErrPulseOutOfRange.
ErrorCode GenPulsePattern(double amp, int32_t delay, int32_t width, RealVector y);
// ErrIndexOutOfRange.
ErrorCode GenImpulsePattern(double amp, int32_t delay, RealVector y);
// ErrSamplingNotPositive.
ErrorCode GenSinc(double amp, double delay, double dt, RealVector y);
// From start to end, which is sample n - 1 or, with excludeEnd, sample n; with scale 1 in equal
// ratios. ErrNotStrictlyPositive.
ErrorCode GenRamp(double start, double end, int32_t excludeEnd, RealVector y, int32_t scale);

// The times at which a pulse is evaluated: i dt - delay, or the times that the output array holds
// on entry.
struct TimeGrid {
    bool isUniform;
    double dt;
    double delay;
    double at(ConstRealVector y, int32_t i) const {
        return isUniform ? i * dt - delay : static_cast<double>(y[i]);
    }
};
ErrorCode GenGaussPulse(double amp, const TimeGrid &grid, double fc, double bandwidth,
                        double dBReference, RealVector y);
ErrorCode GenGaussMonopulse(double amp, const TimeGrid &grid, double fc, RealVector y);
ErrorCode GenAperiodicTriangle(double amp, const TimeGrid &grid, double width, double skew,
                               RealVector y);
ErrorCode GenPeriodicSinc(double amp, const TimeGrid &grid, int32_t order, RealVector y);

// Modulators: y is the modulating signal on entry and the output on return. `peak` and `phase` are
// updated; the result is the phase of the carrier in degrees.
double ModulatePhase(double dt, double fc, RealVector y, double &peak, double &phase);
double ModulateFrequency(double dt, double fc, RealVector y, double &peak, double &phase);

} // namespace qx

#endif
