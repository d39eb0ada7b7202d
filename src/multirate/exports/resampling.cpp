#include "multirate/fractional.h"

#include "frame/export.h"
#include "multirate/samples.h"
#include "qx/resampling.h"

#include <cmath>
#include <limits>

namespace qx {
namespace {

// The caller's design, whose table is an input of the call.
template <class Design>
class InDesign {
public:
    InDesign(const Design *design) : design_(design), proto_(design->proto) {}

    const Design *operator->() const { return design_; }
    ResampleFilter filter(int32_t mode) const {
        return {proto_.data(), proto_.size(), design_->oversample, mode == 1};
    }
    int32_t protoSize() const { return proto_.size(); }
    auto inputs() { return std::tie(proto_); }

private:
    const Design *design_;
    In<DBL1D> proto_;
};
typedef InDesign<ResampleDesign> ConstantDesign;
typedef InDesign<VariableDesign> DesignForTimes;

// The caller's record: its arrays are outputs of the call, and a failure clears its numbers.
template <class State>
class InOutState {
    typedef decltype(State::history) Array;

public:
    InOutState(State *state) : state_(state), history_(state->history), taps_(state->taps) {}

    static constexpr ElementType code = HandleTraits<Array>::code;
    State *operator->() const { return state_; }
    InOut<Array> &history() { return history_; }
    InOut<DBL1D> &taps() { return taps_; }

    void settleFailure() {
        history_.empty();
        taps_.empty();
        const State empty{state_->history, 0, state_->taps, 0, 0, 0, 0, 0, 0, 0};
        *state_ = empty;
    }
    auto outputs() const { return std::tuple(history_.identity(), taps_.identity()); }

private:
    State *state_;
    InOut<Array> history_;
    InOut<DBL1D> taps_;
};

template <class State>
Outcome BeginStream(InOutState<State> &state, const ConstantDesign &design) {
    constexpr ElementType code = InOutState<State>::code;
    const TapSpan span = ComputeTapSpan(design.protoSize(), design->oversample, design->ratio, 0);
    const int64_t size = std::max<int64_t>(span.taps() + 1, 0);
    if (size > std::numeric_limits<int32_t>::max())
        return ErrBufferOverrun;
    if (const Outcome bad = state.history().resize(static_cast<int32_t>(size)))
        return bad;
    if (const Outcome bad = state.taps().resize(static_cast<int32_t>(size)))
        return bad;
    ClearSamples<code>(state.history().data(), size);
    ClearSamples<ElementType::DBL>(state.taps().data(), size);
    state->historyCount = 0;
    state->tapScale = span.step;
    state->mode = design->mode;
    state->ratio = design->ratio;
    state->position = Truncated(design->start);
    state->fraction = design->start - std::trunc(design->start);
    return 0;
}

template <class Array, class State>
Outcome Constant(In<Array> x, InOutState<State> state, ConstantDesign design, int32_t reset,
                 Out<Array> y, OutI32 outCount, int32_t antiAlias) {
    constexpr ElementType code = HandleTraits<Array>::code;
    if (reset != 0)
        if (const Outcome bad = BeginStream(state, design))
            return bad;

    ResampleCore<code> core{state.history().data(), state.history().size(), state->historyCount,
                            state.taps().data(),    state.taps().size(),    state->tapScale,
                            state->leftTaps,        state->rightTaps,       state->position,
                            state->fraction};
    if (core.historyCount < 0 || core.historyCount > core.historyCapacity)
        return ErrBufferOverrun;
    const int32_t n = x.size();
    const double room = std::ceil((double{1} * n + core.historyCount) / state->ratio);
    if (!(room <= std::numeric_limits<int32_t>::max()))
        return ErrOutOfMemory;
    if (const Outcome bad = y.resize(room > 0 ? static_cast<int32_t>(room) : 0))
        return bad;

    if (const ErrorCode bad =
            ResampleConstant(design.filter(state->mode), core, state->ratio, antiAlias != 0,
                             x.view(), y.view(), outCount.address()))
        return bad;
    ClearSamples<code>(y.data() + *outCount.address(), y.size() - *outCount.address());
    state->historyCount = core.historyCount;
    state->tapScale = core.tapScale;
    state->leftTaps = core.leftTaps;
    state->rightTaps = core.rightTaps;
    state->position = core.position;
    state->fraction = core.fraction;
    return 0;
}

// The outputs replace the times at which they are computed.
template <class Array>
ErrorCode Variable(In<Array> x, InOut<Array> t, DesignForTimes design, double *lastTime,
                   OutI32 outCount, OutI32 consumed) {
    constexpr ElementType code = HandleTraits<Array>::code;
    return ResampleAtTimes<code, code>(
        design.filter(design->mode), design->antiAlias != 0, {x.data(), 1, x.size()}, t.view(),
        lastTime, {t.data(), 1, t.size()}, outCount.address(), consumed.address());
}

template <class Matrix>
Outcome VariableOfChannels(In<Matrix> x, Out<Matrix> y, InOut<DBL1D> t, DesignForTimes design,
                           double *lastTime, OutI32 outCount, OutI32 consumed) {
    constexpr ElementType code = HandleTraits<Matrix>::code;
    const int32_t channels = x.rows();
    const int32_t m = t.size();
    Scratch<code> results;
    if (const ErrorCode failed = results.allocate(int64_t{channels} * m))
        return failed;
    if (const ErrorCode failed = ResampleAtTimes<code, ElementType::DBL>(
            design.filter(design->mode), design->antiAlias != 0, x.view(), t.view(), lastTime,
            {results.data(), channels, m}, outCount.address(), consumed.address()))
        return failed;
    const int32_t served = *outCount.address();
    if (const Outcome bad = y.resize(channels, served))
        return bad;
    for (int64_t c = 0; c < channels; ++c)
        CopySamples<code>(y.data() + c * served, results.data() + c * m, served);
    return 0;
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode Resample_Const(DBL1D x, ResampleState *state, const ResampleDesign *design, int32_t reset,
                         DBL1D y, int32_t *outCount, int32_t antiAlias) {
    return Returned(qx::Constant<DBL1D, ResampleState>, x, state, design, reset, y, outCount,
                    antiAlias);
}

ErrorCode CxResample_Const(CDB1D x, CxResampleState *state, const ResampleDesign *design,
                           int32_t reset, CDB1D y, int32_t *outCount, int32_t antiAlias) {
    return Returned(qx::Constant<CDB1D, CxResampleState>, x, state, design, reset, y, outCount,
                    antiAlias);
}

ErrorCode Resample_Variable(DBL1D x, DBL1D t, const VariableDesign *design, double *lastTime,
                            int32_t *outCount, int32_t *consumed) {
    return Returned(qx::Variable<DBL1D>, x, t, design, lastTime, outCount, consumed);
}

ErrorCode CxResample_Variable(CDB1D x, CDB1D t, const VariableDesign *design, double *lastTime,
                              int32_t *outCount, int32_t *consumed) {
    return Returned(qx::Variable<CDB1D>, x, t, design, lastTime, outCount, consumed);
}

ErrorCode Resample_Variable_MultiCh(DBL2D x, DBL2D y, DBL1D t, const VariableDesign *design,
                                    double *lastTime, int32_t *outCount, int32_t *consumed) {
    return Returned(qx::VariableOfChannels<DBL2D>, x, y, t, design, lastTime, outCount, consumed);
}

ErrorCode CxResample_Variable_MultiCh(CDB2D x, CDB2D y, DBL1D t, const VariableDesign *design,
                                      double *lastTime, int32_t *outCount, int32_t *consumed) {
    return Returned(qx::VariableOfChannels<CDB2D>, x, y, t, design, lastTime, outCount, consumed);
}
