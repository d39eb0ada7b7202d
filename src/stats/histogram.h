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

    // The bin of x, the last one for x = max; -1 for values outside and for NaN.
    int32_t of(double x) const {
        // Tested as a double, because NaN and far outliers have no integer value. For nonnegative
        // values the conversion is the floor.
        const double position = (x * unit_ - low_) * perUnit_;
        if (position >= 0.0 && position < bins_)
            return static_cast<int32_t>(position);
        return x == max_ ? bins_ - 1 : -1;
    }

    // The centres in ascending order: that of bin 0, then each from the previous one.
    class Centre {
    public:
        explicit Centre(const EqualBins &bins)
            : unit_(bins.unit_), width_(bins.width_), at_(bins.low_ + 0.5 * bins.width_) {}
        void next() { at_ += width_; } // kept: rounded at each step, so that the centres drift
        double value() const { return at_ / unit_; }

    private:
        double unit_, width_, at_;
    };

private:
    double max_, unit_, low_, width_, perUnit_;
    int32_t bins_;
};

// Counts x in bins of equal width between min and max. The last bin includes x = max; values
// outside and NaN are ignored. The centres are accumulated bin by bin, so they drift by rounding.
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

// Counts x in each of counts.size() intervals, which should be in ascending order and may overlap.
// ErrEmptyInput.
ErrorCode GeneralHistogram(ConstRealVector x, const PackedInterval *interval,
                           VectorView<ElementType::I32> counts, HistSummary *summary);

} // namespace qx

#endif
