#include "measure/pulse_parameters.h"

#include "measure/search.h"
#include "stats/histogram.h"
#include "stats/order.h"

#include <limits>

namespace qx {

namespace {

constexpr int32_t pulseBins = 101;
constexpr double none = std::numeric_limits<double>::quiet_NaN();

// Base and top: the fullest bins between each end and the middle; the outermost one if several are
// equally full. The middle bin belongs to the top.
void FindBaseAndTop(const DBL *y, int32_t n, double min, double max, PulseParametersFound *found) {
    I32 counts[pulseBins];
    DBL centres[pulseBins];
    found->base = min;
    found->top = max;
    // cannot fail: n > 0, min <= max
    ArrayHistogram({y, n}, min, max, {counts, pulseBins}, {centres, pulseBins});
    int32_t baseCount = 0, topCount = 0;
    for (int32_t low = 0, high = pulseBins - 1; low <= high; ++low, --high) {
        if (low < high && counts[low] > baseCount) {
            baseCount = counts[low];
            found->base = centres[low];
        }
        if (counts[high] > topCount) {
            topCount = counts[high];
            found->top = centres[high];
        }
    }
}

// A waveform that begins below its pulse: the given waveform, or its negative. All samples are read
// through this class.
class RisingFirst {
public:
    RisingFirst(const DBL *y, int32_t n, bool isTurned) : y_(y), n_(n), isTurned_(isTurned) {}
    int32_t size() const { return n_; }

    // The first sample from `from` on that is at or above a level, or at or below it; n if there is
    // none.
    int32_t firstAbove(int32_t from, double level) const {
        return isTurned_ ? FirstBeyond(y_, from, n_, -level, none)
                         : FirstBeyond(y_, from, n_, none, level);
    }
    int32_t firstBelow(int32_t from, double level) const {
        return isTurned_ ? FirstBeyond(y_, from, n_, none, -level)
                         : FirstBeyond(y_, from, n_, level, none);
    }
    // The last sample before `before` that is below, or above, a level; `fallback` if there is
    // none.
    int32_t lastBelow(int32_t before, double level, int32_t fallback) const {
        while (--before > fallback && !(at(before) < level)) {
        }
        return before > fallback ? before : fallback;
    }
    int32_t lastAbove(int32_t before, double level, int32_t fallback) const {
        while (--before > fallback && !(at(before) > level)) {
        }
        return before > fallback ? before : fallback;
    }
    // The position at which the waveform crosses the level on its way to sample i.
    double crossing(int32_t i, double level) const {
        if (i == 0)
            return 0;
        const double step = at(i) - at(i - 1);
        return step == 0 ? i : i - (at(i) - level) / step;
    }

private:
    double at(int32_t i) const { return isTurned_ ? -y_[i] : y_[i]; }

    const DBL *y_;
    int32_t n_;
    bool isTurned_;
};

void MeasureTimes(const RisingFirst &y, double base, double amplitude,
                  PulseParametersFound *found) {
    const int32_t n = y.size();
    const double level10 = base + 0.1 * amplitude;
    const double level50 = base + 0.5 * amplitude;
    const double level90 = base + 0.9 * amplitude;

    // A waveform that is never below 10% rises from its first sample on.
    const int32_t at50 = y.firstAbove(0, level50);
    const int32_t below10 = y.lastBelow(at50, level10, -1);
    found->delay = at50 < n ? y.crossing(at50, level50) : n - 1;

    const int32_t at90 = y.firstAbove(at50, level90);
    const int32_t rises = below10 < 0 ? 0 : below10;
    found->riseTime =
        at90 < n ? y.crossing(at90, level90) - y.crossing(below10 + 1, level10) : n - rises;

    const int32_t back50 = y.firstBelow(at90, level50);
    const int32_t above90 = y.lastAbove(back50, level90, at90 < n ? at90 : n - 1);
    found->width = (back50 < n ? y.crossing(back50, level50) : n - 1) - found->delay;

    // The fall begins after above90, unless the pulse never exceeds 50%.
    const int32_t back10 = y.firstBelow(back50, level10);
    found->fallTime =
        back10 < n ? y.crossing(back10, level10) - y.crossing(above90 + (back50 > at90), level90)
                   : n - above90;
}

} // namespace

ErrorCode MeasureFirstPulse(const DBL *y, int32_t n, PulseParametersFound *found) {
    *found = {};
    Extremes extremes;
    if (const ErrorCode failed = ArrayMaxMin({y, n}, &extremes))
        return failed;
    const double max = extremes.max, min = extremes.min;
    if (max == min) {
        found->top = found->base = min;
    } else {
        FindBaseAndTop(y, n, min, max, found);
        found->amplitude = found->top - found->base;
        found->overshoot = max - found->top;
        found->undershoot = found->base - min;
    }
    const bool isNegative = y[0] > found->base + 0.5 * found->amplitude;
    const RisingFirst pulse(y, n, isNegative);
    MeasureTimes(pulse, isNegative ? -found->top : found->base, found->amplitude, found);
    if (isNegative) {
        const double top = found->top;
        found->top = found->base;
        found->base = top;
        found->amplitude = -found->amplitude;
    }
    found->slewRate = found->riseTime == 0 ? 1e30 : 0.8 * found->amplitude / found->riseTime;
    return 0;
}

} // namespace qx
