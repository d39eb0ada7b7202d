#include "measure/crossings.h"

#include "measure/search.h"

#include <limits>

namespace qx {

namespace {

constexpr double none = std::numeric_limits<double>::quiet_NaN();

// Compares the signs and not the product of the distances, which underflows for small ones.
bool Crosses(double here, double next, double level) {
    return (here <= level && next >= level) || (here >= level && next <= level);
}

// The fraction of the way from sample i to the next one at which the level is crossed.
double Fraction(const DBL *y, int32_t i, double level) {
    const double d = y[i] - y[i + 1];
    return (y[i] - level) / (d == 0 ? 1.0 : d);
}

// The side of a band on which the waveform was last, and the bounds at which it would change sides.
class Side {
public:
    Side(double lower, double upper) : lower_(lower), upper_(upper) {}
    double lower() const { return side_ == low ? none : lower_; }
    double upper() const { return side_ == high ? none : upper_; }
    // Takes a sample; returns whether it lies on another side than the previous ones.
    bool changesTo(double y) {
        const int32_t found = y >= upper() ? high : y <= lower() ? low : side_;
        const bool isOther = found != side_;
        side_ = found;
        return isOther;
    }
    // A waveform that leaves the upper side is falling.
    Direction direction() const { return side_ == high ? falling : rising; }

private:
    enum Sides : int32_t { high, low, unknown };
    double lower_, upper_;
    int32_t side_ = unknown;
};

} // namespace

int32_t FindMidCrossings(double t0, const DBL *y, int32_t n, double mid, double h, Crossing *list,
                         int32_t limit) {
    Side side(mid - h, mid + h);
    bool isArmed = false;
    int32_t count = 0;
    for (int32_t i = 0; count < limit; ++i) {
        i = isArmed ? FirstBeyondOrCrossing(y, i, n - 1, side.lower(), side.upper(), mid, none)
                    : FirstBeyond(y, i, n - 1, side.lower(), side.upper());
        if (i >= n - 1)
            break;
        isArmed |= side.changesTo(y[i]);
        if (Crosses(y[i], y[i + 1], mid)) {
            list[count++] = {Fraction(y, i, mid) + i + t0, side.direction()};
            isArmed = false;
        }
    }
    return count;
}

ErrorCode FindTransitions(const DBL *y, int32_t n, double low, double high, Transition *list,
                          int32_t limit, int32_t *count) {
    *count = 0;
    if (!(low < high))
        return ErrMeasureRangeReversed;
    struct Place {
        double position;
        int32_t index;
        bool isMet;
    };
    Side side(low, high);
    bool isUnderWay = false;
    Place atLow{}, atHigh{};
    for (int32_t i = 0; *count < limit; ++i) {
        i = isUnderWay ? FirstBeyondOrCrossing(y, i, n - 1, side.lower(), side.upper(), low, high)
                       : FirstBeyond(y, i, n - 1, side.lower(), side.upper());
        if (i >= n - 1)
            break;
        isUnderWay |= side.changesTo(y[i]);
        if (Crosses(y[i], y[i + 1], low))
            atLow = {Fraction(y, i, low) + i, i + 1, true};
        if (Crosses(y[i], y[i + 1], high))
            atHigh = {Fraction(y, i, high) + i, i + 1, true};
        if (!atLow.isMet || !atHigh.isMet)
            continue;
        const bool falls = side.direction() == falling;
        const Place &start = falls ? atHigh : atLow;
        const Place &end = falls ? atLow : atHigh;
        list[(*count)++] = {start.position, end.position, start.index, end.index, side.direction()};
        isUnderWay = false;
        atLow = atHigh = {};
    }
    return 0;
}

} // namespace qx
