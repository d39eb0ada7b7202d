#include "qx/waveforms.h"
#include "frame/export.h"
#include "signal/patterns.h"
#include "signal/waves.h"

#include <algorithm>

namespace qx {
namespace {

// The frame of all with an error out-parameter: n samples that `generate(samples)` computes. With
// `badArgument` the array is not resized.
template <class Generate>
Outcome Generated(Out<DBL1D> &x, int32_t n, ErrorCode badArgument, const Generate &generate) {
    if (const Outcome bad = FirstFailed({{n < 1, ErrEmptyInput}, {badArgument != 0, badArgument}}))
        return bad;
    if (const Outcome bad = x.resize(n))
        return bad;
    return generate(x.view());
}

template <class Generate>
int32_t Wave(DBL1D x, const int32_t *n, ErrorCode *err, const Generate &generate) {
    const auto body = [&](Out<DBL1D> samples, int32_t count) {
        return Generated(samples, count, 0, [&](RealVector y) {
            generate(y);
            return 0;
        });
    };
    return InErrWithHost(err, body, x, *n);
}

template <class Generate>
int32_t Pattern(DBL1D x, const int32_t *n, ErrorCode *err, const Generate &generate) {
    const auto body = [&](Out<DBL1D> samples, int32_t count) {
        return Generated(samples, count, 0, generate);
    };
    return InErrWithHost(err, body, x, *n);
}

Outcome Arbitrary(Out<DBL1D> x, int32_t n, double amp, double f, double *phase, In<DBL1D> table,
                  int32_t interpolate) {
    return Generated(x, n, 0, [&](RealVector y) {
        return GenArbitraryWave(amp, f, *phase, table.view(), interpolate, y);
    });
}

Outcome SquarePattern(Out<DBL1D> x, int32_t n, double amp, double duty, double cycles) {
    const ErrorCode badArgument =
        FirstFailed({{!(duty > 0.0), ErrWaveParameterNotPositive},
                     {cycles > n / 2 || !(cycles > 0.0), ErrWaveParameterRange}});
    return Generated(x, n, badArgument,
                     [&](RealVector y) { return GenSquarePattern(amp, duty, cycles, y); });
}

// An excludeEnd other than 0 and 1 counts as 1 everywhere.
ErrorCode CheckRamp(int32_t n, double start, double end, int32_t excludeEnd, int32_t scale) {
    const bool isPoint = n == 1 && start == end;
    return FirstFailed({{excludeEnd != 0 && n < 1, ErrCountNotPositive},
                        {excludeEnd == 0 && n < 2 && !isPoint, ErrFewerThanTwo},
                        {scale > 1, ErrInvalidSelector}});
}

Outcome RampByReference(Out<DBL1D> x, int32_t n, double start, double end) {
    return Generated(x, n, CheckRamp(n, start, end, 0, 0),
                     [&](RealVector y) { return GenRamp(start, end, 0, y, 0); });
}

Outcome Ramp(Out<DBL1D> x, int32_t n, double start, double end, int32_t excludeEnd, int32_t scale) {
    if (const Outcome bad = CheckRamp(n, start, end, excludeEnd, scale))
        return bad;
    if (const Outcome bad = x.resize(n))
        return bad;
    return GenRamp(start, end, excludeEnd, x.view(), scale);
}

// The samples of a caller that passes no array; none if n is negative.
RealVector Given(DBL *y, int32_t n) { return {y, std::max(n, 0)}; }

// The times of a pulse are the content of its array or, if that is empty, n uniform times.
template <class Generate>
ErrorCode Pulse(DBL1D x, int32_t n, double dt, double delay, const Generate &generate) {
    const auto body = [&](InOut<DBL1D> samples) -> Outcome {
        const bool isUniform = samples.isEmpty();
        if (isUniform) {
            if (n < 1)
                return ErrEmptyInput;
            if (const Outcome bad = samples.resize(n))
                return bad;
        }
        return generate(TimeGrid{isUniform, dt, delay}, samples.view());
    };
    return Returned(body, x);
}

} // namespace
} // namespace qx

using qx::InErrWithHost;
using qx::Returned;

int32_t SineWaveCIN(DBL1D x, const int32_t *n, const double *amp, const double *f, double *phase,
                    ErrorCode *err) {
    return qx::Wave(x, n, err, [=](qx::RealVector y) { qx::GenSineWave(*amp, *f, *phase, y); });
}

int32_t SquareWaveCIN(DBL1D x, const int32_t *n, const double *amp, const double *f, double *phase,
                      const double *duty, ErrorCode *err) {
    return qx::Wave(x, n, err,
                    [=](qx::RealVector y) { qx::GenSquareWave(*amp, *f, *phase, *duty, y); });
}

int32_t TriangleWaveCIN(DBL1D x, const int32_t *n, const double *amp, const double *f,
                        double *phase, ErrorCode *err) {
    return qx::Wave(x, n, err, [=](qx::RealVector y) { qx::GenTriangleWave(*amp, *f, *phase, y); });
}

int32_t SawtoothWaveCIN(DBL1D x, const int32_t *n, const double *amp, const double *f,
                        double *phase, ErrorCode *err) {
    return qx::Wave(x, n, err, [=](qx::RealVector y) { qx::GenSawtoothWave(*amp, *f, *phase, y); });
}

int32_t ArbitraryWaveCIN(DBL1D x, const int32_t *n, const double *amp, const double *f,
                         double *phase, DBL1D table, const int32_t *interpolate, ErrorCode *err) {
    return InErrWithHost(err, qx::Arbitrary, x, *n, *amp, *f, phase, table, *interpolate);
}

int32_t ChirpCIN(DBL1D x, const int32_t *n, const double *amp, const double *f1, const double *f2,
                 ErrorCode *err) {
    return qx::Wave(x, n, err, [=](qx::RealVector y) { qx::GenChirp(*amp, *f1, *f2, y); });
}

int32_t SinePtrn(DBL1D x, const int32_t *n, const double *amp, const double *phase,
                 const double *cycles, ErrorCode *err) {
    return qx::Wave(x, n, err,
                    [=](qx::RealVector y) { qx::GenSinePattern(*amp, *phase, *cycles, y); });
}

int32_t Square(DBL1D x, const int32_t *n, const double *amp, const double *duty,
               const double *cycles, ErrorCode *err) {
    return InErrWithHost(err, qx::SquarePattern, x, *n, *amp, *duty, *cycles);
}

int32_t PulsePtrn(DBL1D x, const int32_t *n, const double *amp, const int32_t *delay,
                  const int32_t *width, ErrorCode *err) {
    return qx::Pattern(
        x, n, err, [=](qx::RealVector y) { return qx::GenPulsePattern(*amp, *delay, *width, y); });
}

int32_t ImpulsePtrn(DBL1D x, const int32_t *n, const double *amp, const int32_t *delay,
                    ErrorCode *err) {
    return qx::Pattern(x, n, err,
                       [=](qx::RealVector y) { return qx::GenImpulsePattern(*amp, *delay, y); });
}

int32_t SincWave(DBL1D x, const int32_t *n, const double *amp, const double *delay,
                 const double *dt, ErrorCode *err) {
    return qx::Pattern(x, n, err,
                       [=](qx::RealVector y) { return qx::GenSinc(*amp, *delay, *dt, y); });
}

int32_t RampPtrn(DBL1D x, const int32_t *n, const double *start, const double *end,
                 ErrorCode *err) {
    return InErrWithHost(err, qx::RampByReference, x, *n, *start, *end);
}

ErrorCode RampPtrn80(DBL1D x, int32_t n, double start, double end, int32_t excludeEnd) {
    return RampPtrn85(x, n, start, end, excludeEnd, 0);
}

ErrorCode RampPtrn85(DBL1D x, int32_t n, double start, double end, int32_t excludeEnd,
                     int32_t scale) {
    return Returned(qx::Ramp, x, n, start, end, excludeEnd, scale);
}

ErrorCode GaussPulseH(DBL1D x, int32_t n, double amp, double delay, double dt, double fc,
                      double bandwidth, double dBReference) {
    return qx::Pulse(x, n, dt, delay, [=](const qx::TimeGrid &grid, qx::RealVector y) {
        return qx::GenGaussPulse(amp, grid, fc, bandwidth, dBReference, y);
    });
}

ErrorCode GaussMonopulseH(DBL1D x, int32_t n, double dt, double delay, double fc, double amp) {
    return qx::Pulse(x, n, dt, delay, [=](const qx::TimeGrid &grid, qx::RealVector y) {
        return qx::GenGaussMonopulse(amp, grid, fc, y);
    });
}

ErrorCode AperiodTriangleH(DBL1D x, int32_t n, double amp, double delay, double dt, double width,
                           double skew) {
    return qx::Pulse(x, n, dt, delay, [=](const qx::TimeGrid &grid, qx::RealVector y) {
        return qx::GenAperiodicTriangle(amp, grid, width, skew, y);
    });
}

ErrorCode PeriodicSincH(DBL1D x, int32_t n, double amp, int32_t order, double dt, double delay) {
    return qx::Pulse(x, n, dt, delay, [=](const qx::TimeGrid &grid, qx::RealVector y) {
        return qx::GenPeriodicSinc(amp, grid, order, y);
    });
}

int32_t PhasMod(int32_t n, double dt, double *phaseOut, double fc, DBL *y, double *peak,
                double *phase) {
    const qx::DefaultArithmetic arithmetic;
    *phaseOut = qx::ModulatePhase(dt, fc, qx::Given(y, n), *peak, *phase);
    return 0;
}

int32_t FreqMod(int32_t n, double dt, double *phaseOut, double fc, DBL *y, double *peak,
                double *phase) {
    const qx::DefaultArithmetic arithmetic;
    *phaseOut = qx::ModulateFrequency(dt, fc, qx::Given(y, n), *peak, *phase);
    return 0;
}
