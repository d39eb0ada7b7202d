#include "fit/peak_search.h"

#include "frame/constants.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double farthest = 4.0; // in deviations; farther out a peak counts as 0

double Clamped(double value, const FitBounds &bounds, int32_t j) {
    return std::min(std::max(value, double{bounds.lower[j]}), double{bounds.upper[j]});
}

} // namespace

ErrorCode PeakSearch::run() {
    if (const ErrorCode failed = fillBins())
        return failed;
    addExtreme(true);
    addExtreme(false);
    Level level = finest_;
    for (const double narrow : {0.25, 0.5, 0.75, 1.0, 1.4})
        searchLevel(level, narrow);
    searchLevel(level, 2.0);
    searchLevel(level, 2.0 * kRootTwo);
    while (level.weights.size() > fewestBins) {
        const std::ptrdiff_t bins = level.weights.size() / 2;
        level = halved(level, level.weights.part(0, bins), level.products.part(0, bins));
        searchLevel(level, 2.0);
        searchLevel(level, 2.0 * kRootTwo);
    }
    // Includes peaks far wider than the range of the samples, of which only the top or a flank is
    // visible.
    for (double wide = 4.0; wide < 8.0 * fewestBins; wide *= kRootTwo)
        searchLevel(level, wide);
    // Insertion sort: there are few.
    for (int32_t i = 1; i < count_; ++i)
        for (int32_t k = i; k > 0 && starts_[k].rest < starts_[k - 1].rest; --k)
            std::swap(starts_[k], starts_[k - 1]);
    return 0;
}

// The number of bins is the first power of two not below the number of samples, but at most 2^16.
ErrorCode PeakSearch::fillBins() {
    const int32_t n = samples_.n();
    int32_t bins = fewestBins;
    while (bins < n && bins < 65536)
        bins *= 2;
    if (const ErrorCode failed =
            memory_.take(Sized(finest_.weights, bins), Sized(finest_.products, bins)))
        return failed;
    first_ = last_ = samples_.x[0];
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        first_ = std::min(first_, double{samples_.x[i]});
        last_ = std::max(last_, double{samples_.x[i]});
        weight_ += samples_.weight(i);
        sum += samples_.weight(i) * samples_.y[i];
    }
    mean_ = sum / weight_;
    const double range = last_ - first_;
    finest_.width =
        range < kInfinity ? range / (bins - 1) : last_ / (bins - 1) - first_ / (bins - 1);
    if (!(finest_.width > 0.0)) // all x are equal, or as close as numbers can be
        finest_.width = range > 0.0 ? range : 1.0;
    Fill(finest_.weights.data(), bins, 0.0);
    Fill(finest_.products.data(), bins, 0.0);
    for (int32_t i = 0; i < n; ++i) {
        const double place = (samples_.x[i] - first_) / finest_.width + 0.5;
        const int32_t bin = place < bins - 1 ? static_cast<int32_t>(place) : bins - 1;
        const double w = samples_.weight(i), y = samples_.y[i] - mean_;
        finest_.weights[bin] += w;
        finest_.products[bin] += w * y;
        squares_ += w * y * y;
    }
    return 0;
}

// Adds pairs of bins; the sums overwrite the first half of the bins.
PeakSearch::Level PeakSearch::halved(const Level &level, RealVector weights, RealVector products) {
    for (std::ptrdiff_t i = 0; i < weights.size(); ++i) {
        weights[i] = level.weights[2 * i] + level.weights[2 * i + 1];
        products[i] = level.products[2 * i] + level.products[2 * i + 1];
    }
    return {weights, products, 2.0 * level.width};
}

// The middle of bin i of a level is at first_ + (i + 1/2) width - half the finest width.
void PeakSearch::searchLevel(const Level &level, double widthsPerScale) {
    const double s = Clamped(widthsPerScale * level.width, bounds_, 2);
    const bool isOnGrid = s == widthsPerScale * level.width && s > 0.0;
    if (!(s > 0.0) || s >= kInfinity)
        return;
    const double origin = first_ + 0.5 * (level.width - finest_.width);
    const auto bins = static_cast<int32_t>(level.weights.size());
    const double lowest = bounds_.lower[1], highest = bounds_.upper[1];
    PeakStart peak = {}, dip = {};
    peak.rest = dip.rest = kInfinity;
    const auto consider = [&](const ShapeSums &sums, double m) {
        const PeakStart start = bestHeight(sums, m, s);
        PeakStart &best = start.a < 0.0 ? dip : peak;
        if (start.rest < best.rest)
            best = start;
    };
    if (isOnGrid) {
        const auto beyond = static_cast<int32_t>(3.0 * widthsPerScale) + 1;
        const int32_t stride = std::max(1, static_cast<int32_t>(0.25 * widthsPerScale));
        const int32_t far = static_cast<int32_t>(farthest * widthsPerScale) + 1;
        reach_ = std::min(far, std::min(bins + beyond, widest));
        for (int32_t i = 0; i <= reach_; ++i)
            shape_[i] = std::exp(-0.5 * (i / widthsPerScale) * (i / widthsPerScale));
        for (int32_t bin = -beyond; bin < bins + beyond; bin += stride) {
            const double m = origin + bin * level.width;
            if (m >= lowest && m <= highest)
                consider(sumsOnBin(level, bin), m);
        }
    } else { // a scale that the bounds require
        constexpr int32_t places = 64;
        const double from = Clamped(first_ - 3.0 * s, bounds_, 1);
        const double to = Clamped(last_ + 3.0 * s, bounds_, 1);
        for (int32_t i = 0; i <= places; ++i) {
            const double m = from + (to - from) / places * i;
            consider(sumsAt(level, m, s), m);
        }
    }
    for (const double bound : {lowest, highest})
        if (std::fabs(bound) < kInfinity)
            consider(sumsAt(level, bound, s), bound);
    keep(peak);
    keep(dip);
}

PeakSearch::ShapeSums PeakSearch::sumsOnBin(const Level &level, int32_t bin) const {
    const auto bins = static_cast<int32_t>(level.weights.size());
    const int32_t from = std::max(bin - reach_, 0), to = std::min(bin + reach_, bins - 1);
    ShapeSums sums = {};
    for (int32_t i = from; i <= to; ++i) {
        const double g = shape_[i < bin ? bin - i : i - bin];
        sums.g += level.weights[i] * g;
        sums.gg += level.weights[i] * (g * g);
        sums.gy += level.products[i] * g;
    }
    return sums;
}

PeakSearch::ShapeSums PeakSearch::sumsAt(const Level &level, double m, double s) const {
    const double origin = first_ + 0.5 * (level.width - finest_.width);
    ShapeSums sums = {};
    for (std::ptrdiff_t i = 0; i < level.weights.size(); ++i) {
        if (level.weights[i] == 0.0)
            continue;
        const double z = (origin + static_cast<double>(i) * level.width - m) / s;
        const double g = std::exp(-0.5 * (z * z));
        sums.g += level.weights[i] * g;
        sums.gg += level.weights[i] * (g * g);
        sums.gy += level.products[i] * g;
    }
    return sums;
}

// The residual sum of squares for the height a above c, where c is relative to the mean.
double PeakSearch::restOf(double a, double c, const ShapeSums &sums) const {
    return squares_ + a * (a * sums.gg + 2.0 * (c * sums.g - sums.gy)) + c * c * weight_;
}

// The best a and c within their bounds, by least squares: the free solution, or the best on an
// edge.
PeakStart PeakSearch::bestHeight(const ShapeSums &sums, double m, double s) const {
    const double aLow = bounds_.lower[0], aHigh = bounds_.upper[0];
    const double cLow = bounds_.lower[3] - mean_, cHigh = bounds_.upper[3] - mean_;
    const auto heightFor = [&](double c) {
        const double a = sums.gg > 0.0 ? (sums.gy - c * sums.g) / sums.gg : 0.0;
        return std::min(std::max(a, aLow), aHigh);
    };
    const auto levelFor = [&](double a) {
        return std::min(std::max(-a * sums.g / weight_, cLow), cHigh);
    };
    const double determinant = sums.gg - sums.g * sums.g / weight_;
    double a = 0.0, c = 0.0;
    bool isWithin = determinant > 1e-9 * sums.gg;
    if (isWithin) {
        a = sums.gy / determinant;
        c = -a * sums.g / weight_;
        isWithin = a >= aLow && a <= aHigh && c >= cLow && c <= cHigh;
    }
    PeakStart best = {a, m, s, c, isWithin ? restOf(a, c, sums) : kInfinity};
    const auto consider = [&](double height, double level) {
        const double rest = restOf(height, level, sums);
        if (std::isfinite(rest) && rest < best.rest)
            best = {height, m, s, level, rest};
    };
    for (const double edge : {cLow, cHigh})
        if (!isWithin && std::fabs(edge) < kInfinity)
            consider(heightFor(edge), edge);
    for (const double edge : {aLow, aHigh})
        if (!isWithin && std::fabs(edge) < kInfinity)
            consider(edge, levelFor(edge));
    best.c += mean_;
    return best;
}

void PeakSearch::keep(const PeakStart &start) {
    if (count_ < mostStarts && start.rest < kInfinity)
        starts_[count_++] = start;
}

// Adds the highest or lowest sample as a start; its width follows from the nearest sample that is
// below half its height.
void PeakSearch::addExtreme(bool isPeak) {
    int32_t at = 0;
    for (int32_t i = 1; i < samples_.n(); ++i)
        if (isPeak ? samples_.y[i] > samples_.y[at] : samples_.y[i] < samples_.y[at])
            at = i;
    const double level = std::isfinite(bounds_.lower[3]) && bounds_.lower[3] == bounds_.upper[3]
                             ? bounds_.lower[3]
                             : mean_;
    const double half = 0.5 * (samples_.y[at] - level);
    double nearest = last_ - first_;
    for (int32_t i = 0; i < samples_.n(); ++i) {
        const double distance = std::fabs(samples_.x[i] - samples_.x[at]);
        if (distance > 0.0 && std::fabs(samples_.y[i] - level) < std::fabs(half))
            nearest = std::min(nearest, distance);
    }
    const double s = Clamped(0.85 * nearest, bounds_, 2), m = Clamped(samples_.x[at], bounds_, 1);
    if (s > 0.0)
        keep(bestHeight(sumsAt(finest_, m, s), m, s));
}

} // namespace qx
