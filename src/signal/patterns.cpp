#include "signal/patterns.h"

#include "frame/constants.h"
#include "frame/outcome.h"
#include "mathlib/elementary.h"
#include "signal/waves.h"

#include <cmath>

namespace qx {

void GenSinePattern(double amp, double phase, double cycles, RealVector y) {
    const int32_t n = Count(y);
    GenSineWave(amp, cycles / n, phase, y);
}

ErrorCode GenSquarePattern(double amp, double duty, double cycles, RealVector y) {
    const int32_t n = Count(y);
    if (cycles > n || !(cycles > 0.0))
        return ErrWaveParameterRange;
    if (duty == 100.0) {
        Fill(y.data(), n, amp);
        return 0;
    }
    // Both may exceed every integer, and remain doubles because they are compared with positions in
    // the period.
    const double period = std::trunc(n / cycles + 0.5);
    const double high = std::trunc(0.5 + duty * 0.01 * period);
    double place = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        y[i] = place < high ? amp : 0.0;
        place += 1.0;
        if (place >= period)
            place = 0.0;
    }
    return 0;
}

ErrorCode GenPulsePattern(double amp, int32_t delay, int32_t width, RealVector y) {
    const int32_t n = Count(y);
    if (delay < 0 || width < 0 || int64_t{delay} + width > n)
        return ErrPulseOutOfRange;
    Fill(y.data(), n, 0.0);
    Fill(&y[delay], width, amp);
    return 0;
}

ErrorCode GenImpulsePattern(double amp, int32_t delay, RealVector y) {
    const int32_t n = Count(y);
    if (delay < 0 || delay >= n)
        return ErrIndexOutOfRange;
    Fill(y.data(), n, 0.0);
    y[delay] = amp;
    return 0;
}

ErrorCode GenSinc(double amp, double delay, double dt, RealVector y) {
    const int32_t n = Count(y);
    if (!(dt > 0.0))
        return ErrSamplingNotPositive;
    for (int32_t i = 0; i < n; ++i) {
        const double x = (i * dt - delay) * kPi;
        y[i] = x == 0.0 ? amp : amp * std::sin(x) / x;
    }
    return 0;
}

ErrorCode GenRamp(double start, double end, int32_t excludeEnd, RealVector y, int32_t scale) {
    const int32_t n = Count(y);
    const double divider = excludeEnd == 0 ? n - 1.0 : n;
    if (scale == 1) {
        if (!(start > 0.0) || !(end > 0.0))
            return ErrNotStrictlyPositive;
        const double from = std::log10(start);
        const double step = (std::log10(end) - from) / divider;
        for (int32_t i = 1; i < n; ++i)
            y[i] = std::pow(10.0, i * step + from);
    } else {
        const double step = (end - start) / divider;
        for (int32_t i = 1; i < n; ++i)
            y[i] = i * step + start;
    }
    y[0] = start;
    if (excludeEnd == 0)
        y[n - 1] = end;
    return 0;
}

namespace {

// y becomes shape(t) at the times of the grid.
template <class Shape>
void Evaluate(const TimeGrid &grid, RealVector y, const Shape &shape) {
    const int32_t n = Count(y);
    for (int32_t i = 0; i < n; ++i)
        y[i] = shape(grid.at(y, i));
}

// The checks that all pulses share, and that of their own parameters.
ErrorCode CheckPulse(const TimeGrid &grid, bool parametersArePositive) {
    return FirstFailed({{!parametersArePositive, ErrNotStrictlyPositive},
                        {!(grid.dt > 0.0), ErrSamplingNotPositive}});
}

} // namespace

ErrorCode GenGaussPulse(double amp, const TimeGrid &grid, double fc, double bandwidth,
                        double dBReference, RealVector y) {
    const bool arePositive = fc > 0.0 && bandwidth > 0.0 && dBReference > 0.0;
    if (const ErrorCode bad = CheckPulse(grid, arePositive))
        return bad;
    constexpr double ln10 = 2.302585092994046;
    const double c = bandwidth * (-5.0 * bandwidth) / ln10 / dBReference;
    Evaluate(grid, y, [=](double t) {
        const double u = t * kPi * fc;
        return amp * std::exp(u * u * c) * std::cos(2.0 * u);
    });
    return 0;
}

ErrorCode GenGaussMonopulse(double amp, const TimeGrid &grid, double fc, RealVector y) {
    if (const ErrorCode bad = CheckPulse(grid, fc > 0.0))
        return bad;
    const double height = 2.0 * amp * std::sqrt(2.718281828459045);
    Evaluate(grid, y, [=](double t) {
        const double u = t * kPi * fc;
        return height * u * std::exp(-2.0 * u * u);
    });
    return 0;
}

ErrorCode GenAperiodicTriangle(double amp, const TimeGrid &grid, double width, double skew,
                               RealVector y) {
    if (const ErrorCode bad = CheckPulse(grid, width > 0.0))
        return bad;
    if (skew < 0.0 || skew > 1.0)
        return ErrProbabilityOutOfRange;
    // kept: times of the caller are shifted by half a width, uniform times are not.
    const double shift = grid.isUniform ? 0.0 : 0.5 * width;
    const double top = skew * width;
    Evaluate(grid, y, [=](double time) {
        const double t = time + shift;
        if (t < 0.0 || t > width)
            return 0.0;
        if (skew == 0.0)
            return (width - t) * amp / width;
        if (skew == 1.0)
            return t * amp / width;
        return t <= top ? t * amp / top : (width - t) * amp / (width - top);
    });
    return 0;
}

ErrorCode GenPeriodicSinc(double amp, const TimeGrid &grid, int32_t order, RealVector y) {
    if (const ErrorCode bad = CheckPulse(grid, order >= 1))
        return bad;
    Evaluate(grid, y, [=](double t) {
        const double x = 0.5 * t;
        const double sine = std::sin(x);
        if (!(std::fabs(sine) > 2.220446049250313e-16)) {
            // The limit at x = k pi is 1 or -1, by the parity of k (order - 1).
            const bool isOpposite = (std::cos(order * x) < 0.0) != (std::cos(x) < 0.0);
            return isOpposite ? -amp : amp;
        }
        return amp * std::sin(order * x) / (order * sine);
    });
    return 0;
}

namespace {

// kept: peaks are compared by their integer parts.
void FollowPeak(double value, double &peak) {
    if (std::fabs(std::trunc(value)) > std::fabs(std::trunc(peak)))
        peak = value;
}

// A full turn is a change of `limit`. kept: below it a turn is added, so the accumulator does not
// settle between 0 and the limit.
double Wrapped(double phase, double limit) {
    return !(phase < limit) ? phase - limit : phase + limit;
}

double Degrees(double phase, double dt) { return phase * dt * 180.0 / kPi; }

} // namespace

double ModulatePhase(double dt, double fc, RealVector y, double &peak, double &phase) {
    const int32_t n = Count(y);
    const double limit = 2.0 * kPi / dt;
    const double step = 2.0 * kPi * fc;
    for (int32_t i = 0; i < n; ++i) {
        FollowPeak(y[i], peak);
        phase = Wrapped(phase + step, limit);
        y[i] = y[i] * kPi / 180.0 + phase * dt;
    }
    Sines(y.data(), n, y.data());
    // kept: the last output, a sine, is added to degrees.
    return Degrees(phase, dt) + (n > 0 ? static_cast<double>(y[n - 1]) : 0.0);
}

double ModulateFrequency(double dt, double fc, RealVector y, double &peak, double &phase) {
    const int32_t n = Count(y);
    const double limit = 2.0 * kPi / dt;
    const double step = 2.0 * kPi * fc;
    for (int32_t i = 0; i < n; ++i) {
        FollowPeak(y[i], peak);
        phase = Wrapped(y[i] * 2.0 * kPi + step + phase, limit);
        y[i] = phase * dt;
    }
    Sines(y.data(), n, y.data());
    return Degrees(phase, dt);
}

} // namespace qx
