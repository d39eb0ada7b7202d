#include "stats/histogram.h"

#include <cmath>

namespace qx {

namespace {

// 1, or a power of two, which causes no rounding, for ranges at the ends of the range of exponents.
double UnitOfRange(double min, double max, int32_t bins) {
    if (std::isinf(max - min))
        return std::isinf(max) || std::isinf(min) ? 1.0 : 0x1p-2;
    return std::isinf(bins / (max - min)) ? 0x1p512 : 1.0;
}

void Clear(VectorView<ElementType::I32> counts) {
    for (I32 &count : counts)
        count = 0;
}

} // namespace

// All members are in units in which the range and its reciprocal are finite.
EqualBins::EqualBins(double min, double max, int32_t bins)
    : max_(max), unit_(UnitOfRange(min, max, bins)), low_(min * unit_), bins_(bins) {
    const double range = max * unit_ - low_;
    width_ = range / bins;
    perUnit_ = bins / range;
}

ErrorCode ArrayHistogram(ConstRealVector x, double min, double max,
                         VectorView<ElementType::I32> counts, RealVector centres) {
    const auto n = static_cast<int32_t>(x.size()), bins = static_cast<int32_t>(counts.size());
    QX_EXPECTS(centres.size() == bins);
    if (max < min)
        return ErrRangeReversed;
    if (n < 1 || bins < 1)
        return ErrEmptyInput;
    Clear(counts);
    if (max == min) {
        for (int32_t k = 0; k < bins; ++k)
            centres[k] = min;
        counts[bins - 1] = n;
        return 0;
    }

    const EqualBins equal(min, max, bins);
    EqualBins::Centre centre(equal);
    for (int32_t k = 0; k < bins; ++k) {
        centres[k] = centre.value();
        centre.next();
    }
    for (int32_t i = 0; i < n; ++i) {
        const int32_t k = equal.of(x[i]);
        if (k >= 0)
            ++counts[k];
    }
    return 0;
}

int32_t IntervalTest(const PackedInterval &interval, double x) {
    const bool takesLower = interval.closure == 0 || interval.closure == 2;
    const bool takesUpper = interval.closure == 1 || interval.closure == 2;
    if (interval.closure > 3)
        return 0;
    const bool aboveLower = takesLower ? interval.lower <= x : interval.lower < x;
    const bool belowUpper = takesUpper ? x <= interval.upper : x < interval.upper;
    if (aboveLower && belowUpper)
        return 0;
    const bool isBelow = takesLower ? x < interval.lower : x <= interval.lower;
    return isBelow ? -1 : 1;
}

ErrorCode GeneralHistogram(ConstRealVector x, const PackedInterval *interval,
                           VectorView<ElementType::I32> counts, HistSummary *summary) {
    const auto intervals = static_cast<int32_t>(counts.size());
    *summary = {0, 0, 0};
    if (x.isEmpty())
        return ErrEmptyInput;
    Clear(counts);
    for (const double v : x) {
        bool isPlaced = false;
        for (int32_t j = 0; j < intervals; ++j) {
            const int32_t position = IntervalTest(interval[j], v);
            if (position == 0) {
                ++counts[j];
                isPlaced = true;
            } else if (j == 0 && position < 0) {
                // Only the first interval decides whether a sample lies below all of them.
                ++summary->outside;
                ++summary->below;
                break;
            }
            if (j == intervals - 1 && !isPlaced) {
                ++summary->outside;
                if (position > 0)
                    ++summary->above;
            }
        }
    }
    return 0;
}

} // namespace qx
