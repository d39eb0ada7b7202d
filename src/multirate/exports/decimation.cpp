#include "multirate/decimation.h"

#include "frame/export.h"
#include "multirate/cic.h"
#include "multirate/fractional.h"
#include "multirate/modulator.h"
#include "multirate/moving_sums.h"
#include "multirate/polyphase.h"
#include "qx/decimation.h"

#include <limits>

namespace qx {
namespace {

template <class Array>
Outcome Decimate(InOut<Array> x, int32_t factor, bool average) {
    if (const ErrorCode bad =
            FirstFailed({{x.isEmpty(), ErrEmptyInput},
                         {factor < 1 || factor > x.size(), ErrDecimationOutOfRange}}))
        return bad;
    return x.resize(DecimateBlock<HandleTraits<Array>::code>(x.data(), x.size(), factor, average));
}

template <class Array>
Outcome DecimateContinuous(InOut<Array> x, int32_t factor, bool average, int32_t *start, bool reset,
                           int32_t *partialCount, typename HandleTraits<Array>::T *partialSum) {
    constexpr ElementType code = HandleTraits<Array>::code;
    if (const ErrorCode bad =
            FirstFailed({{factor < 1, ErrNotStrictlyPositive}, {*start < 0, ErrNegativeSetting}}))
        return bad;
    if (reset) {
        *partialCount = 0;
        *partialSum = {};
    }
    const int32_t n = x.size();
    return x.resize(average
                        ? AverageStream<code>(x.data(), n, factor, start, partialCount, partialSum)
                        : PickFromStream<code>(x.data(), n, factor, start));
}

// The state of a stream: resized and cleared by a reset; otherwise it must have the right size.
Outcome PrepareState(InOut<DBL1D> &state, int64_t size, bool reset) {
    if (size > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (!reset)
        return state.size() == size ? 0 : ErrMultirateStateSize;
    if (const Outcome bad = state.resize(static_cast<int32_t>(size)))
        return bad;
    Fill(state.data(), size, 0.0);
    return 0;
}

// Resizes the output. Unlike that of the state, its refusal is returned as a code by all exports.
ErrorCode ResizeOutput(Out<DBL1D> &y, int64_t size) {
    if (size > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    return y.resize(static_cast<int32_t>(size)).code();
}

ErrorCode CheckFIR(In<DBL1D> h, int32_t factor) {
    return FirstFailed({{h.isEmpty(), ErrOrderNotPositive}, {factor < 1, ErrNotStrictlyPositive}});
}

FIRBlock<ElementType::DBL> BlockOf(In<DBL1D> x, In<DBL1D> h) {
    return {x.data(), x.size(), h.data(), h.size()};
}

Outcome InterpolatedFIR(In<DBL1D> x, Out<DBL1D> y, int32_t L, double gain, In<DBL1D> h,
                        InOut<DBL1D> state, bool reset, int32_t *delay) {
    if (const ErrorCode bad = CheckFIR(h, L))
        return bad;
    if (const Outcome bad = PrepareState(state, int64_t{L} * (h.size() - 1), reset))
        return bad;
    const OutputRange outputs(x.size(), 0, 1, std::max(0, *delay));
    if (const ErrorCode bad = ResizeOutput(y, outputs.count))
        return bad;
    *delay = outputs.delayLeft;
    return PolyphaseSpaced<ElementType::DBL>(BlockOf(x, h), L, gain, outputs, state.data(),
                                             y.data());
}

Outcome Interpolator(In<DBL1D> x, Out<DBL1D> y, double gain, int32_t L, In<DBL1D> h,
                     InOut<DBL1D> state, bool reset, int32_t *delay) {
    if (const ErrorCode bad = CheckFIR(h, L))
        return bad;
    if (const Outcome bad = PrepareState(state, (h.size() - 1) / L + 1, reset))
        return bad;
    const int64_t positions = int64_t{x.size()} * L;
    const OutputRange outputs(positions, 0, 1, std::max(0, *delay));
    if (const ErrorCode bad = ResizeOutput(y, outputs.count))
        return bad;
    *delay = outputs.delayLeft;
    return PolyphaseInterpolate<ElementType::DBL>(BlockOf(x, h), L, gain, outputs, state.data(),
                                                  y.data());
}

// kept: the gain is an argument but is never applied; a caller scales the taps.
Outcome Decimator(In<DBL1D> x, Out<DBL1D> y, double, int32_t M, In<DBL1D> h, InOut<DBL1D> state,
                  bool reset, int32_t firstPhase, int32_t *delay) {
    if (const ErrorCode bad = CheckFIR(h, M))
        return bad;
    const int32_t underWay = (h.size() - 1) / M + 1;
    if (const Outcome bad = PrepareState(state, int64_t{underWay} + 1, reset))
        return bad;
    if (reset)
        state.data()[underWay] = Modulo(-int64_t{firstPhase}, M);

    const int32_t n = x.size();
    const int32_t phase = Modulo(Truncated(state.data()[underWay]), M);
    const int32_t first = Modulo(-int64_t{phase}, M);
    const OutputRange outputs(n, first, M, std::max(0, *delay));
    if (const ErrorCode bad = ResizeOutput(y, outputs.count))
        return bad;
    *delay = outputs.delayLeft;
    state.data()[underWay] = Modulo(int64_t{phase} + n, M);
    return PolyphaseDecimate<ElementType::DBL>(BlockOf(x, h), M, first, outputs, state.data(),
                                               y.data());
}

ErrorCode CheckCIC(int32_t stages, int32_t factor, int32_t differentialDelay, CICShape *shape,
                   bool alternate) {
    const int64_t width = int64_t{factor} * differentialDelay;
    if (stages < 1 || factor < 1 || differentialDelay < 1)
        return ErrNotStrictlyPositive;
    if (width >= std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    *shape = {stages, factor, static_cast<int32_t>(width), alternate};
    return 0;
}

Outcome CICDecimator(In<DBL1D> x, Out<DBL1D> y, InOut<DBL1D> state, int32_t stages, int32_t factor,
                     int32_t differentialDelay, int16_t alternate, bool reset, int32_t *delay) {
    CICShape shape;
    if (const ErrorCode bad = CheckCIC(stages, factor, differentialDelay, &shape, alternate != 0))
        return bad;
    const int64_t phaseAt = shape.stateSize();
    if (const Outcome bad = PrepareState(state, phaseAt + 1, reset))
        return bad;

    const int32_t n = x.size();
    const int32_t phase = std::max(0, Truncated(state.data()[phaseAt]));
    const int64_t first = *delay > 0 ? *delay : phase;
    const OutputRange outputs(n, static_cast<int32_t>(first), factor, 0);
    if (const ErrorCode bad = ResizeOutput(y, outputs.count))
        return bad;
    CICDecimate(shape, state.data(), x.data(), n, first, y.data());
    if (*delay > 0 && *delay >= n) {
        *delay -= n;
    } else {
        state.data()[phaseAt] = static_cast<double>(first + outputs.count * factor - n);
        *delay = 0;
    }
    return n > 0 ? 0 : WarnMultirateEmpty;
}

Outcome CICInterpolator(In<DBL1D> x, Out<DBL1D> y, InOut<DBL1D> state, int32_t stages,
                        int32_t factor, int32_t differentialDelay, int16_t alternate, bool reset,
                        int32_t *delay) {
    CICShape shape;
    if (const ErrorCode bad = CheckCIC(stages, factor, differentialDelay, &shape, alternate != 0))
        return bad;
    if (const Outcome bad = PrepareState(state, shape.stateSize(), reset))
        return bad;

    const int32_t n = x.size();
    const OutputRange outputs(int64_t{n} * factor, 0, 1, std::max(0, *delay));
    if (const ErrorCode bad = ResizeOutput(y, outputs.count))
        return bad;
    CICInterpolate(shape, state.data(), x.data(), n, outputs.dropped, y.data());
    *delay = outputs.delayLeft;
    return n > 0 ? 0 : WarnMultirateEmpty;
}

// The array keeps its size; its elements after the outputs are unspecified.
template <class Array>
ErrorCode DecimatedMovingAverage(InOut<Array> x, int32_t factor,
                                 typename HandleTraits<Array>::T *sum, int32_t *count, bool reset,
                                 OutI32 outCount) {
    if (reset) {
        *sum = {};
        *count = 0;
    }
    const int32_t n = x.size();
    outCount =
        factor < 2 ? n : SumGroups<HandleTraits<Array>::code>(x.data(), n, factor, sum, count);
    return 0;
}

template <class Array, class Matrix>
ErrorCode CascadedMovingAverage(InOut<Array> x, int32_t stages, int32_t width, InOut<Array> sums,
                                InOut<Matrix> buffers, int32_t *position, bool reset) {
    constexpr ElementType code = HandleTraits<Array>::code;
    if ((width < 2 && !reset) || stages < 1)
        return 0;
    const auto fits = [&] {
        return sums.size() == stages && buffers.rows() == stages &&
               buffers.cols() == std::max(0, width);
    };
    if (reset || !fits() || *position < 0 || *position > width) {
        // kept: the size after the call decides, not the host's status.
        (void)sums.resize(stages);
        (void)buffers.resize(stages, std::max(0, width));
        if (!fits())
            return ErrOutOfMemory;
        ClearSamples<code>(sums.data(), stages);
        ClearSamples<code>(buffers.data(), int64_t{stages} * buffers.cols());
        *position = 0;
    }
    if (width < 1)
        return 0;
    MovingSumState<code> state{buffers.data(), width, sums.data(),      1,
                               stages,         width, *position % width};
    MovingSumStages<code>(state, MovingSum::Plain, 1.0, x.data(), x.size());
    *position = state.position;
    return 0;
}

ErrorCode CxModulator(InOut<CDB1D> x, double frequency, double sampleRate, double *phase) {
    Modulate<ElementType::CDB>(x.data(), x.size(), frequency / sampleRate, phase, x.data());
    return 0;
}

ErrorCode ReModulator(In<DBL1D> x, double frequency, double sampleRate, double *phase,
                      Out<CDB1D> y) {
    if (x.isEmpty())
        return 0;
    // kept: the size after the call decides, not the host's status.
    (void)y.resize(x.size());
    if (y.size() != x.size())
        return ErrOutOfMemory;
    Modulate<ElementType::DBL>(x.data(), x.size(), frequency / sampleRate, phase, y.data());
    return 0;
}

} // namespace
} // namespace qx

using qx::InErrWithHost;
using qx::Returned;
using qx::ReturnedWithHost;

int32_t DecimateCIN(DBL1D x, const int32_t *factor, const uint8_t *average, ErrorCode *err) {
    return InErrWithHost(err, qx::Decimate<DBL1D>, x, *factor, *average != 0);
}
ErrorCode CxDecimate_H(CDB1D x, int32_t factor, int32_t average) {
    return Returned(qx::Decimate<CDB1D>, x, factor, average != 0);
}

ErrorCode DecimateContinuous_H(DBL1D x, int32_t factor, int32_t average, int32_t *start,
                               int32_t reset, int32_t *partialCount, double *partialSum) {
    return Returned(qx::DecimateContinuous<DBL1D>, x, factor, average != 0, start, reset != 0,
                    partialCount, partialSum);
}
ErrorCode CxDecimateContinuous_H(CDB1D x, int32_t factor, int32_t average, int32_t *start,
                                 int32_t reset, int32_t *partialCount, CDB *partialSum) {
    return Returned(qx::DecimateContinuous<CDB1D>, x, factor, average != 0, start, reset != 0,
                    partialCount, partialSum);
}

ErrorCode InterpolatedFIRH(DBL1D x, DBL1D y, int32_t L, double gain, DBL1D h, DBL1D state,
                           uint8_t reset, int32_t *delay) {
    return ReturnedWithHost(qx::InterpolatedFIR, x, y, L, gain, h, state, reset != 0, delay);
}
ErrorCode InterpolatorFIRH(DBL1D x, DBL1D y, double gain, int32_t L, DBL1D h, DBL1D state,
                           uint8_t reset, int32_t *delay) {
    return Returned(qx::Interpolator, x, y, gain, L, h, state, reset != 0, delay);
}
ErrorCode DecimatorFIRH(DBL1D x, DBL1D y, double gain, int32_t M, DBL1D h, DBL1D state,
                        uint8_t reset, int32_t firstPhase, int32_t *delay) {
    return Returned(qx::Decimator, x, y, gain, M, h, state, reset != 0, firstPhase, delay);
}

ErrorCode CICDecimatorByMovH(DBL1D x, DBL1D y, DBL1D state, int32_t stages, int32_t factor,
                             int32_t differentialDelay, int16_t alternate, uint8_t reset,
                             int32_t *delay) {
    return ReturnedWithHost(qx::CICDecimator, x, y, state, stages, factor, differentialDelay,
                            alternate, reset != 0, delay);
}
ErrorCode CICInterpolatorByMovH(DBL1D x, DBL1D y, DBL1D state, int32_t stages, int32_t factor,
                                int32_t differentialDelay, int16_t alternate, uint8_t reset,
                                int32_t *delay) {
    return ReturnedWithHost(qx::CICInterpolator, x, y, state, stages, factor, differentialDelay,
                            alternate, reset != 0, delay);
}

ErrorCode ReDecimatedMovingAverageH(DBL1D x, int32_t factor, double *sum, int32_t *count,
                                    int32_t reset, int32_t *outCount) {
    return Returned(qx::DecimatedMovingAverage<DBL1D>, x, factor, sum, count, reset != 0, outCount);
}
ErrorCode CxDecimatedMovingAverageH(CDB1D x, int32_t factor, CDB *sum, int32_t *count,
                                    int32_t reset, int32_t *outCount) {
    return Returned(qx::DecimatedMovingAverage<CDB1D>, x, factor, sum, count, reset != 0, outCount);
}

ErrorCode ReCascadedMovingAverageH(DBL1D x, int32_t stages, int32_t width, DBL1D sums,
                                   DBL2D buffers, int32_t *position, int32_t reset) {
    return Returned(qx::CascadedMovingAverage<DBL1D, DBL2D>, x, stages, width, sums, buffers,
                    position, reset != 0);
}
ErrorCode CxCascadedMovingAverageH(CDB1D x, int32_t stages, int32_t width, CDB1D sums,
                                   CDB2D buffers, int32_t *position, int32_t reset) {
    return Returned(qx::CascadedMovingAverage<CDB1D, CDB2D>, x, stages, width, sums, buffers,
                    position, reset != 0);
}

ErrorCode CxComplexModulatorH(CDB1D x, double frequency, double sampleRate, double *phase) {
    return Returned(qx::CxModulator, x, frequency, sampleRate, phase);
}
ErrorCode ReComplexModulatorH(DBL1D x, double frequency, double sampleRate, double *phase,
                              CDB1D y) {
    return Returned(qx::ReModulator, x, frequency, sampleRate, phase, y);
}
