#include "stats/histogram.h"

#include <cmath>
#include <cstring>

namespace qx {

namespace {

// 1, or a power of two, which rounds nothing, for ranges at the ends of the exponents.
double UnitOfRange(double min, double max, int32_t bins) {
    if (std::isinf(max - min))
        return std::isinf(max) || std::isinf(min) ? 1.0 : 0x1p-2;
    return std::isinf(bins / (max - min)) ? 0x1p512 : 1.0;
}

} // namespace

// Everything in units in which the range and its reciprocal stay finite.
EqualBins::EqualBins(double min, double max, int32_t bins)
    : max_(max), unit_(UnitOfRange(min, max, bins)), low_(min * unit_), bins_(bins) {
    const double range = max * unit_ - low_;
    width_ = range / bins;
    perUnit_ = bins / range;
}

ErrorCode ArrayHistogram(const DBL *x, int32_t n, double min, double max, I32 *counts, DBL *centres,
                         int32_t bins) {
    if (max < min)
        return ErrRangeReversed;
    if (n < 1 || bins < 1)
        return ErrEmptyInput;
    std::memset(counts, 0, static_cast<std::size_t>(bins) * sizeof(I32));
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

ErrorCode GeneralHistogram(const DBL *x, int32_t n, const PackedInterval *interval,
                           int32_t intervals, I32 *counts, HistSummary *summary) {
    *summary = {0, 0, 0};
    if (n < 1)
        return ErrEmptyInput;
    std::memset(counts, 0, static_cast<std::size_t>(intervals) * sizeof(I32));
    for (int32_t i = 0; i < n; ++i) {
        bool isPlaced = false;
        for (int32_t j = 0; j < intervals; ++j) {
            const int32_t position = IntervalTest(interval[j], x[i]);
            if (position == 0) {
                ++counts[j];
                isPlaced = true;
            } else if (j == 0 && position < 0) {
                // Only the first interval decides that a sample lies below all.
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
