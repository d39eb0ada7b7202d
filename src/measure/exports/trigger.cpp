#include "measure/trigger.h"

#include "frame/constants.h"
#include "frame/export.h"
#include "qx/trigger.h"

#include <cmath>

namespace qx {
namespace {

// A failure sets it to -1.
class OutIndex {
public:
    OutIndex(int32_t *address) : address_(address) {}
    void operator=(int32_t index) const { *address_ = index; }
    void settleFailure() const { *address_ = -1; }

private:
    int32_t *address_;
};

Outcome Triggered(In<DBL1D> y, const TriggerSettings &settings, int32_t start, TriggerState *state,
                  OutIndex index, OutDBL position) {
    const int32_t n = y.isEmpty() ? 0 : y.size();
    if (const ErrorCode bad = FirstFailed(
            {{n == 0, ErrMeasureEmpty},
             {settings.slope < RisingSlope || settings.slope > EitherSlope, ErrInvalidSelector},
             {start < 0 || start > n, ErrIndexOutOfRange},
             {!(settings.hysteresis >= 0) || settings.holdoff < 0, ErrNegativeSetting},
             {!std::isfinite(settings.level) || !std::isfinite(settings.hysteresis),
              ErrNonFiniteInput}}))
        return bad;
    TriggerHit hit;
    if (const ErrorCode bad = FindTrigger(y.data(), n, start, settings, *state, hit))
        return bad;
    index = hit.index;
    position = hit.position;
    return 0;
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode Triggerh_86(DBL1D y, double level, double hysteresis, int32_t slope, int32_t start,
                      int32_t holdoff, TriggerState *state, int32_t *index, double *position) {
    const qx::TriggerSettings settings = {level, hysteresis, static_cast<qx::TriggerSlope>(slope),
                                          holdoff};
    return Returned(qx::Triggered, y, settings, start, state, index, position);
}

ErrorCode Triggerh(DBL1D y, double level, int32_t slope, int32_t start, int32_t *index,
                   double *position) {
    TriggerState fresh = {};
    return Triggerh_86(y, level, 0.0, slope, start, 0, &fresh, index, position);
}
