#include "measure/pulses.h"

#include "frame/export.h"
#include "measure/histogram_slot.h"
#include "measure/pulse_parameters.h"
#include "qx/pulses.h"

namespace qx {
namespace {

// Measured numbers that are returned together; a failure sets them to 0.
template <std::size_t N>
class OutMeasured {
public:
    template <class... Address>
    explicit OutMeasured(Address *...addresses) : addresses_{addresses...} {}

    bool hasNull() const {
        for (const double *address : addresses_)
            if (address == nullptr)
                return true;
        return false;
    }
    template <class... Value>
    void set(Value... values) const {
        static_assert(sizeof...(Value) == N);
        std::size_t i = 0;
        ((*addresses_[i++] = values), ...);
    }
    void settleFailure() const {
        for (double *address : addresses_)
            if (address != nullptr)
                *address = 0;
    }

private:
    double *addresses_[N];
};
template <class... Address>
OutMeasured(Address *...) -> OutMeasured<sizeof...(Address)>;

// In the order of the exports' arguments.
void SetLevels(const OutMeasured<3> &levels, const ReferenceLevels &ref) {
    levels.set(ref.low, ref.mid, ref.high);
}

template <class Keep, class... Outputs>
ErrorCode CheckSearch(const void *ref, const HistogramOptions *hist, const Keep &keep,
                      const Outputs &...outputs) {
    if (ref == nullptr || hist == nullptr || keep.isNull() || (outputs.hasNull() || ...))
        return ErrMeasureNullState;
    if (const ErrorCode bad =
            FirstFailed({{hist->bins < 1, ErrMeasureEmptyChannel},
                         {hist->method > QXLevelsAutomatic, ErrMeasureTooManyChannels}}))
        return bad;
    return keep.acquire(hist->bins);
}

template <class Keep>
LevelSearch SearchOf(const HistogramOptions &hist, const Keep &keep, int32_t limit) {
    return {static_cast<int32_t>(hist.method), hist.bins, keep.counts(), limit};
}

template <class Keep>
ErrorCode MeasureLevels(In<DBL1D> y, double t0, double dt, int32_t method, int32_t bins, Keep keep,
                        OutMeasured<3> levels, int32_t limit) {
    const HistogramOptions hist = {static_cast<uint32_t>(method), bins};
    if (const ErrorCode bad = CheckSearch(&hist, &hist, keep, levels))
        return bad;
    StateLevelsFound found;
    const ErrorCode status =
        ComputeLevels({y.data(), y.size(), t0, dt}, SearchOf(hist, keep, limit), &found);
    if (status >= 0)
        levels.set(found.high, found.low, found.amplitude);
    return status;
}

template <class Keep>
ErrorCode Pulse(In<DBL1D> y, double t0, double dt, uint16_t polarity, uint16_t partial,
                int32_t number, const ReferenceLevels *ref, const HistogramOptions *hist, Keep keep,
                OutMeasured<4> pulse, OutMeasured<3> levels, int32_t limit) {
    if (const ErrorCode bad = CheckSearch(ref, hist, keep, pulse, levels))
        return bad;
    ReferenceLevels absolute = *ref;
    PulseFound found;
    const ErrorCode status =
        MeasurePulse({y.data(), y.size(), t0, dt}, SearchOf(*hist, keep, limit), polarity,
                     partial != 0, number, &absolute, &found);
    if (status < 0)
        return status;
    pulse.set(found.period, found.duration, found.dutyCycle, found.center);
    SetLevels(levels, absolute);
    return status;
}

template <class Keep>
ErrorCode Transitions(In<DBL1D> y, double t0, double dt, uint16_t polarity, int32_t number,
                      ReferenceLevels *ref, const HistogramOptions *hist, Keep keep,
                      OutMeasured<4> transition, OutMeasured<3> levels, OutMeasured<4> aberrations,
                      int32_t limit) {
    if (const ErrorCode bad = CheckSearch(ref, hist, keep, transition, levels, aberrations))
        return bad;
    ReferenceLevels absolute = *ref;
    TransitionFound found;
    const ErrorCode status =
        MeasureTransition({y.data(), y.size(), t0, dt}, SearchOf(*hist, keep, limit), polarity,
                          number, &absolute, &found);
    if (status < 0)
        return status;
    *ref = absolute;
    transition.set(found.slewRate, found.duration, found.start, found.end);
    SetLevels(levels, absolute);
    aberrations.set(found.preUndershoot, found.preOvershoot, found.postUndershoot,
                    found.postOvershoot);
    return status;
}

template <class Keep>
ErrorCode Cycle(In<DBL1D> y, double t0, double dt, int32_t number, ReferenceLevels *ref,
                const HistogramOptions *hist, Keep keep, OutMeasured<4> cycle,
                OutMeasured<3> levels, int32_t limit) {
    if (const ErrorCode bad = CheckSearch(ref, hist, keep, cycle, levels))
        return bad;
    ReferenceLevels absolute = *ref;
    CycleFound found;
    const ErrorCode status = MeasureCycle({y.data(), y.size(), t0, dt},
                                          SearchOf(*hist, keep, limit), number, &absolute, &found);
    if (status < 0)
        return status;
    *ref = absolute;
    cycle.set(found.mean, found.rms, found.start, found.end);
    SetLevels(levels, absolute);
    return status;
}

ErrorCode FirstPulse(In<DBL1D> y, OutMeasured<10> outputs) {
    PulseParametersFound found;
    if (const ErrorCode bad = MeasureFirstPulse(y.data(), y.size(), &found))
        return bad;
    outputs.set(found.top, found.base, found.amplitude, found.delay, found.width, found.slewRate,
                found.fallTime, found.riseTime, found.overshoot, found.undershoot);
    return 0;
}

} // namespace
} // namespace qx

using qx::KeepHistogramInInstance;
using qx::KeepHistogramInSlot;
using qx::OutMeasured;
using qx::Returned;

ErrorCode StateLevels(DBL1D y, double t0, double dt, int32_t method, int32_t bins,
                      MeasurementSlot *slot, double *high, double *low, double *amplitude,
                      int32_t limit) {
    return Returned(qx::MeasureLevels<KeepHistogramInSlot>, y, t0, dt, method, bins,
                    KeepHistogramInSlot(slot), OutMeasured(high, low, amplitude), limit);
}

ErrorCode StateLevels_IDP(DBL1D y, double t0, double dt, int32_t method, int32_t bins,
                          MeasurementInstanceWord *instance, double *high, double *low,
                          double *amplitude, int32_t limit) {
    return Returned(qx::MeasureLevels<KeepHistogramInInstance>, y, t0, dt, method, bins,
                    KeepHistogramInInstance(instance), OutMeasured(high, low, amplitude), limit);
}

ErrorCode PulseMeasEx(DBL1D y, double t0, double dt, uint16_t polarity, uint16_t partial,
                      int32_t pulseNumber, const ReferenceLevels *ref, const HistogramOptions *hist,
                      MeasurementSlot *slot, double *period, double *duration, double *dutyCycle,
                      double *center, double *lowRef, double *midRef, double *highRef,
                      int32_t limit) {
    return Returned(qx::Pulse<KeepHistogramInSlot>, y, t0, dt, polarity, partial, pulseNumber, ref,
                    hist, KeepHistogramInSlot(slot),
                    OutMeasured(period, duration, dutyCycle, center),
                    OutMeasured(lowRef, midRef, highRef), limit);
}

ErrorCode PulseMeasEx_IDP(DBL1D y, double t0, double dt, uint16_t polarity, uint16_t partial,
                          int32_t pulseNumber, const ReferenceLevels *ref,
                          const HistogramOptions *hist, MeasurementInstanceWord *instance,
                          double *period, double *duration, double *dutyCycle, double *center,
                          double *lowRef, double *midRef, double *highRef, int32_t limit) {
    return Returned(qx::Pulse<KeepHistogramInInstance>, y, t0, dt, polarity, partial, pulseNumber,
                    ref, hist, KeepHistogramInInstance(instance),
                    OutMeasured(period, duration, dutyCycle, center),
                    OutMeasured(lowRef, midRef, highRef), limit);
}

ErrorCode PulseMeas(DBL1D y, double t0, double dt, uint16_t polarity, int32_t pulseNumber,
                    const ReferenceLevels *ref, const HistogramOptions *hist, MeasurementSlot *slot,
                    double *period, double *duration, double *dutyCycle, double *center,
                    double *lowRef, double *midRef, double *highRef, int32_t limit) {
    return PulseMeasEx(y, t0, dt, polarity, 0, pulseNumber, ref, hist, slot, period, duration,
                       dutyCycle, center, lowRef, midRef, highRef, limit);
}

ErrorCode TransMeas(DBL1D y, double t0, double dt, uint16_t polarity, int32_t number,
                    ReferenceLevels *ref, const HistogramOptions *hist, MeasurementSlot *slot,
                    double *slewRate, double *duration, double *start, double *end, double *lowRef,
                    double *midRef, double *highRef, double *preUndershoot, double *preOvershoot,
                    double *postUndershoot, double *postOvershoot, int32_t limit) {
    return Returned(qx::Transitions<KeepHistogramInSlot>, y, t0, dt, polarity, number, ref, hist,
                    KeepHistogramInSlot(slot), OutMeasured(slewRate, duration, start, end),
                    OutMeasured(lowRef, midRef, highRef),
                    OutMeasured(preUndershoot, preOvershoot, postUndershoot, postOvershoot), limit);
}

ErrorCode TransMeas_IDP(DBL1D y, double t0, double dt, uint16_t polarity, int32_t number,
                        ReferenceLevels *ref, const HistogramOptions *hist,
                        MeasurementInstanceWord *instance, double *slewRate, double *duration,
                        double *start, double *end, double *lowRef, double *midRef, double *highRef,
                        double *preUndershoot, double *preOvershoot, double *postUndershoot,
                        double *postOvershoot, int32_t limit) {
    return Returned(qx::Transitions<KeepHistogramInInstance>, y, t0, dt, polarity, number, ref,
                    hist, KeepHistogramInInstance(instance),
                    OutMeasured(slewRate, duration, start, end),
                    OutMeasured(lowRef, midRef, highRef),
                    OutMeasured(preUndershoot, preOvershoot, postUndershoot, postOvershoot), limit);
}

ErrorCode CycleRMSAverage(DBL1D y, double t0, double dt, int32_t cycleNumber, ReferenceLevels *ref,
                          const HistogramOptions *hist, MeasurementSlot *slot, double *mean,
                          double *rms, double *start, double *end, double *lowRef, double *midRef,
                          double *highRef, int32_t limit) {
    return Returned(qx::Cycle<KeepHistogramInSlot>, y, t0, dt, cycleNumber, ref, hist,
                    KeepHistogramInSlot(slot), OutMeasured(mean, rms, start, end),
                    OutMeasured(lowRef, midRef, highRef), limit);
}

ErrorCode CycleRMSAverage_IDP(DBL1D y, double t0, double dt, int32_t cycleNumber,
                              ReferenceLevels *ref, const HistogramOptions *hist,
                              MeasurementInstanceWord *instance, double *mean, double *rms,
                              double *start, double *end, double *lowRef, double *midRef,
                              double *highRef, int32_t limit) {
    return Returned(qx::Cycle<KeepHistogramInInstance>, y, t0, dt, cycleNumber, ref, hist,
                    KeepHistogramInInstance(instance), OutMeasured(mean, rms, start, end),
                    OutMeasured(lowRef, midRef, highRef), limit);
}

int32_t PulseParameters(DBL1D y, double *top, double *base, double *amplitude, double *delay,
                        double *width, double *slewRate, double *fallTime, double *riseTime,
                        double *overshoot, double *undershoot, ErrorCode *err) {
    return qx::InErr(err, qx::FirstPulse, y,
                     OutMeasured(top, base, amplitude, delay, width, slewRate, fallTime, riseTime,
                                 overshoot, undershoot));
}

ErrorCode MeasurementUnreserveProc(MeasurementInstanceWord *instance) {
    return qx::MeasurementInstanceRelease(instance);
}

void measurements_create() {}
void measurements_destroy() {}
void measurements_clear() {}
