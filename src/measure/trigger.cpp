#include "measure/trigger.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The position at which the line between two neighbours crosses the level; the second one if both
// lie on the same side. Halving keeps the differences finite.
double Passage(const TriggerState &state, double value, int32_t index, double level) {
    if (!state.hasLast)
        return index;
    const double behind = 0.5 * value - 0.5 * level;
    const double both = 0.5 * value - 0.5 * state.last;
    const double part = behind / both;
    return part > 0 && part <= 1 ? index - part : index;
}

} // namespace

ErrorCode FindTrigger(const DBL *y, int32_t n, int32_t from, const TriggerSettings &settings,
                      TriggerState &state, TriggerHit &hit) {
    hit = {-1, kNaN};
    TriggerState now = state;
    const double level = settings.level;
    const bool rises = settings.slope != FallingSlope;
    const bool falls = settings.slope != RisingSlope;
    const double low = level - settings.hysteresis;
    const double high = level + settings.hysteresis;
    for (int32_t i = from; i < n; ++i) {
        const double value = y[i];
        if (!std::isfinite(value))
            return ErrNonFiniteInput;
        if (now.holdoffLeft > 0) {
            --now.holdoffLeft;
        } else {
            const bool triggers = (rises && now.armedRising && value >= level) ||
                                  (falls && now.armedFalling && value <= level);
            if (triggers) {
                hit = {i, Passage(now, value, i, level)};
                if (value >= level)
                    now.armedRising = 0;
                if (value <= level)
                    now.armedFalling = 0;
                now.holdoffLeft = settings.holdoff;
            }
            now.armedRising = rises && (now.armedRising || value < low);
            now.armedFalling = falls && (now.armedFalling || value > high);
        }
        now.last = value;
        now.hasLast = 1;
        if (hit.index >= 0)
            break;
    }
    state = now;
    return 0;
}

} // namespace qx
