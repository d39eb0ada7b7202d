#include "filters/fir_design.h"

#include "filters/narrow_band.h"
#include "frame/constants.h"
#include "frame/export.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx {

template <>
struct HandleTraits<RemezBand1D> : RecordHandle<RemezBand> {};

namespace {

Outcome CutOff(FilterBand band, int32_t taps, Out<DBL1D> h, int32_t *type) {
    if (taps < 1)
        return ErrOrderNotPositive;
    *type = std::clamp<int32_t>(*type, Lowpass, Bandstop);
    if (const Outcome bad = h.resize(taps))
        return bad;
    return DesignFIRWindowless(static_cast<FilterType>(*type), band, h.view());
}

bool HasInfinity(const In<RemezBand1D> &bands) {
    for (std::ptrdiff_t b = 0; b < bands.size(); ++b) {
        const RemezBand &band = bands.data()[b];
        if (std::isinf(band.desired) || std::isinf(band.fLow) || std::isinf(band.fHigh) ||
            std::isinf(band.weight))
            return true;
    }
    return false;
}

// kept: if the iteration limit is reached, *ripple is the last deviation, so it is not an OutDBL.
// The function result says whether the design itself ran out of memory.
Outcome Equiripple(int32_t n, double fs, In<RemezBand1D> bands, int32_t type, Out<DBL1D> h,
                   double *ripple, int32_t maxIterations) {
    constexpr int32_t designHasNoMemory = 2;
    *ripple = kNaN;
    if (const Outcome bad = FirstFailed({{std::isinf(fs), ErrBadDesignField},
                                         {HasInfinity(bands), ErrBadDesignField},
                                         {n < 1, ErrOrderNotPositive},
                                         {bands.isEmpty(), ErrBadCutoff}}))
        return bad;
    if (const Outcome bad = h.resize(n))
        return bad;
    const ErrorCode status =
        DesignEquiripple(bands.size(), bands.data(), fs, type, h.view(), ripple, maxIterations);
    return status == ErrOutOfMemory ? Outcome::OfHost(designHasNoMemory) : Outcome(status);
}

// The caller's record, with arrays that are outputs of the call.
class OutDesign {
public:
    OutDesign(NarrowFIRDesign *design)
        : design_(design), model_(design->model), interpolator_(design->interpolator) {}

    Outcome take(const NarrowFIRBlock &block) {
        design_->kind = block.kind;
        design_->M = block.M;
        if (const Outcome bad = copy(block.model.data(), block.modelCount, model_))
            return bad;
        return copy(block.interpolator.data(), block.interpolatorCount, interpolator_);
    }
    void settleFailure() {
        design_->M = 0;
        model_.empty();
        interpolator_.empty();
    }
    auto outputs() const { return std::tuple(model_.identity(), interpolator_.identity()); }

private:
    static Outcome copy(const DBL *taps, int32_t count, Out<DBL1D> &array) {
        if (const Outcome bad = array.resize(count))
            return bad;
        for (int32_t i = 0; i < count; ++i)
            array.data()[i] = taps[i];
        return 0;
    }
    NarrowFIRDesign *design_;
    Out<DBL1D> model_, interpolator_;
};

Outcome Narrow(NarrowFIRGoal goal, OutDesign design) {
    NarrowFIRBlock block;
    if (const ErrorCode failed = DesignNarrowFIR(goal, block))
        return failed;
    return design.take(block);
}

// The same record as an input.
class InDesign {
public:
    InDesign(const NarrowFIRDesign *design)
        : design_(design), model_(design->model), interpolator_(design->interpolator) {}

    NarrowFIRFilter filter() const {
        return {design_->kind, design_->M, model_.view(), interpolator_.view()};
    }
    auto inputs() { return std::tie(model_, interpolator_); }

private:
    const NarrowFIRDesign *design_;
    In<DBL1D> model_, interpolator_;
};

template <class Signal>
Outcome RunNarrow(const NarrowFIRFilter &filter, const In<Signal> &x,
                  Out<Signal, OnFailure::Keep> &y) {
    if (!filter.isComplete())
        return ErrEmptyInput;
    const int64_t count = filter.outputCount(x.size());
    if (count > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const Outcome bad = y.resize(static_cast<int32_t>(count)))
        return bad;
    return FilterNarrowFIR<HandleTraits<Signal>::code>(x.view(), filter, y.view());
}

// kept: an empty x leaves y unchanged.
template <class Signal>
Outcome FilterNarrow(In<Signal> x, InDesign design, Out<Signal, OnFailure::Keep> y) {
    if (x.isEmpty())
        return ErrEmptyInput;
    const Outcome outcome = RunNarrow(design.filter(), x, y);
    if (outcome.failed())
        y.empty();
    return outcome;
}

} // namespace
} // namespace qx

using qx::InErrWithHost;

int32_t FIRCoefs(const double *fs, const double *fl, const double *fh, const int32_t *taps, DBL1D h,
                 int32_t *type, ErrorCode *err) {
    return InErrWithHost(err, qx::CutOff, qx::FilterBand{*fs, *fl, *fh}, *taps, h, type);
}

int32_t Parks(const int32_t *n, const double *fs, RemezBand1D bands, const int32_t *type, DBL1D h,
              double *ripple, const int32_t *maxIterations, ErrorCode *err) {
    return InErrWithHost(err, qx::Equiripple, *n, *fs, bands, *type, h, ripple, *maxIterations);
}

int32_t FIRNarrowCoef_head(const double *fs, const double *fPass, const double *fStop,
                           const double *fCenter, const double *passRipple,
                           const double *stopAttenuation, const int32_t *type,
                           NarrowFIRDesign *design, ErrorCode *err) {
    const qx::NarrowFIRGoal goal{*fs,         *fPass,           *fStop, *fCenter,
                                 *passRipple, *stopAttenuation, *type};
    return InErrWithHost(err, qx::Narrow, goal, design);
}

int32_t FIRnarrowFilter_head(DBL1D x, const NarrowFIRDesign *design, DBL1D y, ErrorCode *err) {
    return InErrWithHost(err, qx::FilterNarrow<DBL1D>, x, design, y);
}

int32_t CxSigFIRnarrowFilter_head(CDB1D x, const NarrowFIRDesign *design, CDB1D y, ErrorCode *err) {
    return InErrWithHost(err, qx::FilterNarrow<CDB1D>, x, design, y);
}
