#include "fit/start_estimates.h"

#include "fit/exponential_power.h"
#include "fit/gaussian.h"
#include "fit/general.h"
#include "fit/polynomial.h"
#include "frame/constants.h"
#include "frame/scratch.h"
#include "stats/histogram.h"
#include "stats/order.h"

#include <cmath>

namespace qx {

namespace {

ErrorCode OffsetOfParabola(const FitSamples &samples, double *offset) {
    DBL c[3];
    const ErrorCode status = FitPolynomial(samples, {}, bySVD, {c, 3}, {});
    if (status < 0)
        return status;
    const bool bends = std::isfinite(c[2]) && std::fabs(c[2]) > kEpsilon;
    *offset = bends ? c[0] - c[1] * c[1] / (4.0 * c[2]) : 0.0;
    return 0;
}

void Lower(ConstRealVector y, double by, RealVector out) {
    for (std::ptrdiff_t i = 0; i < y.size(); ++i)
        out[i] = y[i] - by;
}

constexpr int32_t levelCount = 10;

struct LevelHistogram {
    I32 counts[levelCount];
    DBL centres[levelCount];
    double halfWidth;
    double max, min, atMax, atMin; // the extremes of y, and their abscissae
};

ErrorCode CountByLevel(const FitSamples &samples, LevelHistogram *found) {
    Extremes range;
    if (const ErrorCode failed = ArrayMaxMin(samples.y, &range))
        return failed;
    if (range.maxIndex < 0) // all are NaN
        return ErrNoUsableFit;
    *found = {};
    found->halfWidth = 0.5 * ((range.max - range.min) / levelCount);
    found->max = range.max;
    found->min = range.min;
    found->atMax = samples.x[range.maxIndex];
    found->atMin = samples.x[range.minIndex];
    return ArrayHistogram(samples.y, range.min, range.max, {found->counts, levelCount},
                          {found->centres, levelCount});
}

// The outermost level, from below or from above, that holds more than a tenth of the samples.
int32_t BaseLevel(const LevelHistogram &found, int32_t n, bool fromBelow) {
    for (int32_t i = 0; i < levelCount; ++i) {
        const int32_t level = fromBelow ? i : levelCount - 1 - i;
        if (found.counts[level] > n / levelCount)
            return level;
    }
    return fromBelow ? 0 : levelCount - 1;
}

// Half the longer of the distances, on either side, from the extreme to where the data return to
// their level.
double Deviation(const FitSamples &samples, double extremeAt, double level, double halfWidth) {
    double left = std::fabs(samples.x[0] - extremeAt);
    double right = std::fabs(samples.x[samples.n() - 1] - extremeAt);
    for (int32_t i = 0; i < samples.n(); ++i) {
        if (!(samples.y[i] > level - halfWidth && samples.y[i] < level + halfWidth))
            continue;
        const double distance = std::fabs(samples.x[i] - extremeAt);
        if (samples.x[i] < extremeAt)
            left = distance < left ? distance : left;
        else if (samples.x[i] > extremeAt)
            right = distance < right ? distance : right;
    }
    return (left > right ? left : right) / 2.0;
}

// A peak or a dip, fitted above or below its level; mse is below 0 if the fit failed.
struct Candidate {
    DBL p[4];
    DBL mse = -1.0;

    ErrorCode fit(const FitSamples &samples, const LevelHistogram &found, bool isPeak,
                  RealVector y) {
        const double level = found.centres[BaseLevel(found, samples.n(), isPeak)];
        const double extremeAt = isPeak ? found.atMax : found.atMin;
        const DBL guess[3] = {(isPeak ? found.max : found.min) - level, extremeAt,
                              Deviation(samples, extremeAt, level, found.halfWidth)};
        Lower(samples.y, level, y);
        int32_t steps;
        const FitLimits limits = {0.0001, 0.0001, 20};
        const ErrorCode status =
            FitGaussian({{samples.x, y, samples.w}, guess, limits, p, &steps, {{}, &mse}});
        p[3] = level;
        if (status == ErrOutOfMemory)
            return status;
        // Rounding may make the expanded mean square slightly negative.
        const bool isUsable = status >= 0 && std::isfinite(mse);
        mse = !isUsable ? -1.0 : mse < 0.0 ? 0.0 : mse;
        return 0;
    }
};

// The samples whose weight is not 0.
class Counting {
public:
    ErrorCode take(const FitSamples &samples) {
        samples_ = samples;
        if (samples.w.isEmpty())
            return 0;
        RealVector x, y, w;
        const int32_t n = samples.n();
        if (const ErrorCode failed = memory_.take(Sized(x, n), Sized(y, n), Sized(w, n)))
            return failed;
        int32_t count = 0;
        for (int32_t i = 0; i < samples.n(); ++i) {
            if (samples.w[i] == 0.0)
                continue;
            x[count] = samples.x[i];
            y[count] = samples.y[i];
            w[count++] = samples.w[i];
        }
        samples_ = {x.part(0, count), y.part(0, count), w.part(0, count)};
        return 0;
    }
    const FitSamples &samples() const { return samples_; }

private:
    FitSamples samples_ = {};
    ScratchParts memory_;
};

} // namespace

ErrorCode StartExponential(const FitSamples &samples, DBL *p) {
    Scratch<ElementType::DBL> memory;
    if (const ErrorCode failed = memory.allocate(samples.n()))
        return failed;
    const RealVector above(memory.data(), samples.n());
    double offset;
    if (const ErrorCode failed = OffsetOfParabola(samples, &offset))
        return failed;
    Lower(samples.y, offset, above);
    int32_t steps;
    const ErrorCode status =
        FitExponential({{samples.x, above, samples.w}, nullptr, {}, p, &steps, {}},
                       ExponentialMethod::LogarithmicLine);
    p[2] = offset;
    return status < 0 ? status : 0;
}

ErrorCode StartGaussian(const FitSamples &samples, DBL *p) {
    Counting counting;
    if (const ErrorCode failed = counting.take(samples))
        return failed;
    const FitSamples &used = counting.samples();
    Scratch<ElementType::DBL> memory;
    if (const ErrorCode failed = memory.allocate(used.n()))
        return failed;
    const RealVector above(memory.data(), used.n());
    LevelHistogram found;
    if (const ErrorCode failed = CountByLevel(used, &found))
        return failed;
    Candidate peak, dip;
    if (const ErrorCode failed = peak.fit(used, found, true, above))
        return failed;
    if (const ErrorCode failed = dip.fit(used, found, false, above))
        return failed;
    if (peak.mse < 0.0 && dip.mse < 0.0)
        return ErrNoUsableFit;
    const bool takesPeak = dip.mse < 0.0 || (peak.mse >= 0.0 && peak.mse <= dip.mse);
    for (int32_t i = 0; i < 4; ++i)
        p[i] = takesPeak ? peak.p[i] : dip.p[i];
    return 0;
}

} // namespace qx
