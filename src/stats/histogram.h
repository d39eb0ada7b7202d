#ifndef QX_STATS_HISTOGRAM_H
#define QX_STATS_HISTOGRAM_H

#include "frame/views.h"
#include "qx/errors.h"
#include "qx/histogram.h"

namespace qx {

// Bins of equal width between min and max, min < max.
class EqualBins {
public:
    EqualBins(double min, double max, int32_t bins);

    // The bin of x, of x = max the last one; -1 for what lies outside and NaN.
    int32_t of(double x) const {
        // Tested as a double, since NaN and far outliers have no integer value. From 0 on the
        // conversion is the floor.
        const double position = (x * unit_ - low_) * perUnit_;
        if (position >= 0.0 && position < bins_)
            return static_cast<int32_t>(position);
        return x == max_ ? bins_ - 1 : -1;
    }

    // The centres in ascending order: that of bin 0, and from each the next.
    class Centre {
    public:
        explicit Centre(const EqualBins &bins)
            : unit_(bins.unit_), width_(bins.width_), at_(bins.low_ + 0.5 * bins.width_) {}
        void next() { at_ += width_; } // kept: rounded each time, so that they drift
        double value() const { return at_ / unit_; }

    private:
        double unit_, width_, at_;
    };

private:
    double max_, unit_, low_, width_, perUnit_;
    int32_t bins_;
};

// Equal-width counts of x between min and max. The last bin takes x = max; what lies outside
// and NaN are dropped. The centres are accumulated bin by bin, so their rounding drifts.
// ErrRangeReversed, ErrEmptyInput (no data or no bins).
ErrorCode ArrayHistogram(ConstRealVector x, double min, double max,
                         VectorView<ElementType::I32> counts, RealVector centres);

// An interval of the general histogram, without the padding of the host's record.
struct PackedInterval {
    DBL lower, upper;
    I32 closure;
};

// 0 if x lies in the interval, -1 below it, +1 above it.
int32_t IntervalTest(const PackedInterval &interval, double x);

// Counts x in each interval, as many as counts, which are expected in ascending order and may
// overlap. ErrEmptyInput.
ErrorCode GeneralHistogram(ConstRealVector x, const PackedInterval *interval,
                           VectorView<ElementType::I32> counts, HistSummary *summary);

} // namespace qx

#endif
