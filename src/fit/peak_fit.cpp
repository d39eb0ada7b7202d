#include "fit/peak_fit.h"

#include "fit/bounded_frame.h"
#include "fit/models.h"
#include "fit/peak_search.h"
#include "frame/constants.h"
#include "linalg/matrix.h"
#include "stats/order.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr int32_t count = 4;

// The model over all samples.
SampledModel PeakOver(const ConstRealVector &x) {
    return {count,
            [](const void *user, const DBL *p, DBL *out) {
                const auto &at = *static_cast<const ConstRealVector *>(user);
                for (std::ptrdiff_t i = 0; i < at.size(); ++i)
                    out[i] = GaussianModel::value(at[i], p, nullptr);
                return int32_t{0};
            },
            [](const void *user, const DBL *p, DBL *out) {
                const auto &at = *static_cast<const ConstRealVector *>(user);
                for (std::ptrdiff_t i = 0; i < at.size(); ++i, out += count) {
                    double d[count];
                    GaussianModel::evaluate(at[i], p, nullptr, d);
                    for (int32_t j = 0; j < count; ++j)
                        out[j] = d[j];
                }
                return int32_t{0};
            },
            &x};
}

// The point that a fit from one start has reached.
struct FoundPeak {
    DBL p[count];
    double cost = kInfinity;
    int32_t iterations = 0;
    FitEnd end = FitEnd::NoLowerCost;

    bool isAtRest() const { return end == FitEnd::Converged || end == FitEnd::Exact; }
    // Whether the start has the same place and about the same width.
    bool explains(const PeakStart &start) const {
        const double s = std::fabs(p[2]);
        return std::fabs(start.m - p[1]) < 0.5 * s && start.s < 1.5 * s && s < 1.5 * start.s;
    }
    bool isBetterThan(const FoundPeak &other) const {
        return cost < other.cost * (1.0 - 1e-9) ||
               (cost <= other.cost * (1.0 + 1e-9) && isAtRest() && !other.isAtRest());
    }
};

class PeakFit {
public:
    PeakFit(const BoundedFit &request, const FitSamples &samples)
        : request_(request), samples_(samples), limit_(std::max(*request.iterations, 0)) {
        for (int32_t j = 0; j < count; ++j) {
            lower_[j] = request.bounds.lower[j];
            upper_[j] = request.bounds.upper[j];
        }
        // The model depends only on the square of s: s is taken to be positive if the bounds allow
        // it.
        const double low = lower_[2], high = upper_[2];
        isReflected_ = high <= 0.0 && low < 0.0;
        lower_[2] = isReflected_ ? -high : std::max(low, 0.0);
        upper_[2] = isReflected_ ? -low : high;
        if (limit_ == 0)
            limit_ = 2000;
    }

    ErrorCode run(FoundPeak *best) {
        if (request_.guess != nullptr) {
            const DBL *const g = request_.guess;
            return descend({g[0], g[1], isReflected_ ? -g[2] : double{g[2]}, g[3], 0.0}, limit_,
                           best);
        }
        PeakSearch search(samples_, {{lower_, count}, {upper_, count}});
        if (const ErrorCode failed = search.run())
            return failed;
        return race(search, best);
    }

private:
    // The best start is fitted to the end. Starts that lead elsewhere take a few steps, and
    // continue if they are then ahead.
    ErrorCode race(const PeakSearch &search, FoundPeak *best) const {
        constexpr int32_t enough = 6, enoughOfSign = 3, most = 24, firstSteps = 12;
        constexpr double exact = 1e-24;
        int32_t tried[2] = {}; // peaks and dips
        for (int32_t i = 0; i < search.count(); ++i) {
            const PeakStart &start = search[i];
            const int32_t sum = tried[0] + tried[1];
            int32_t &alike = tried[start.a < 0.0];
            if ((best->isAtRest() && best->cost <= exact * search.squares()) || sum >= most)
                break;
            if (best->isAtRest() &&
                (best->explains(start) || (sum >= enough && alike >= enoughOfSign)))
                continue;
            FoundPeak found;
            const bool isFirst = best->cost == kInfinity;
            ErrorCode failed =
                descend(start, isFirst ? limit_ : std::min(firstSteps, limit_), &found);
            if (failed == 0 && !isFirst && found.end == FitEnd::Limit && limit_ > firstSteps &&
                found.cost < 1.05 * best->cost)
                failed = descend({found.p[0], found.p[1], found.p[2], found.p[3], 0.0},
                                 limit_ - firstSteps, &found);
            if (failed == ErrOutOfMemory)
                return failed;
            ++alike;
            if (failed == 0 && found.isBetterThan(*best))
                *best = found;
        }
        return best->cost < kInfinity ? 0 : ErrNoUsableFit;
    }

    ErrorCode descend(const PeakStart &start, int32_t limit, FoundPeak *found) const {
        const ConstRealVector x = samples_.x;
        NonlinearFit fit = {PeakOver(x),
                            samples_.y,
                            samples_.w,
                            {{lower_, count}, {upper_, count}},
                            Loss::Linear,
                            1.0,
                            std::max(request_.tolerance, 0.0),
                            limit};
        found->p[0] = start.a;
        found->p[1] = start.m;
        found->p[2] = start.s;
        found->p[3] = start.c;
        NonlinearResult result;
        result.p = {found->p, count};
        if (const ErrorCode failed = FitNonlinear(fit, &result))
            return failed;
        found->cost = result.cost;
        found->iterations += result.iterations;
        found->end = result.end;
        return 0;
    }

    const BoundedFit &request_;
    const FitSamples &samples_;
    DBL lower_[count], upper_[count];
    int32_t limit_;
    bool isReflected_;
};

// If all weights are 0, they count as absent.
ErrorCode SettleWeightsOf(FitSamples *samples, int32_t free) {
    if (CheckFinite(samples->w.data(), samples->w.size()) != 0)
        return ErrNonFiniteInput;
    int32_t counting = 0;
    for (const double w : samples->w)
        counting += w != 0.0;
    if (counting == 0)
        samples->w = {};
    return counting > 0 && counting < free ? ErrTooFewWeights : 0;
}

ErrorCode Check(const BoundedFit &request, FitSamples *samples, int32_t free) {
    const FitBounds &bounds = request.bounds;
    if (samples->n() < free)
        return ErrFitPointsTooFew;
    if (request.method < leastSquares || request.method > bisquare)
        return ErrInvalidSelector;
    for (int32_t j = 0; j < count; ++j)
        if (bounds.lower[j] > bounds.upper[j])
            return ErrBoundsCrossed;
    if (CheckFinite(samples->x.data(), samples->n()) != 0 ||
        CheckFinite(samples->y.data(), samples->n()) != 0 ||
        (request.guess != nullptr && CheckFinite(request.guess, count) != 0))
        return ErrNonFiniteInput;
    if (const ErrorCode failed = SettleWeightsOf(samples, free))
        return failed;
    const bool isFlat = bounds.lower[2] == 0.0 && bounds.upper[2] == 0.0;
    return isFlat || (request.guess != nullptr && request.guess[2] == 0.0) ? ErrFitStartValues : 0;
}

// Repeats the samples until there are at least as many as parameters, which changes the sums only
// by a factor.
ErrorCode Repeat(const FitSamples &given, ScratchParts &memory, FitSamples *samples) {
    const int32_t n = given.n(), times = (count + n - 1) / n;
    RealVector x, y, w;
    if (const ErrorCode failed =
            memory.take(Sized(x, int64_t{times} * n), Sized(y, int64_t{times} * n),
                        Sized(w, given.w.isEmpty() ? 0 : int64_t{times} * n)))
        return failed;
    for (int32_t i = 0; i < times * n; ++i) {
        x[i] = given.x[i % n];
        y[i] = given.y[i % n];
        if (!w.isEmpty())
            w[i] = given.w[i % n];
    }
    *samples = {x, y, w};
    return 0;
}

typedef VectorView<ElementType::I32> Places;

// Orders the samples by ascending x, merging runs whose length doubles each time.
void OrderBy(ConstRealVector x, Places order, Places merged) {
    const std::ptrdiff_t n = x.size();
    for (std::ptrdiff_t i = 0; i < n; ++i)
        order[i] = static_cast<int32_t>(i);
    for (std::ptrdiff_t run = 1; run < n; run *= 2) {
        for (std::ptrdiff_t from = 0; from < n; from += 2 * run) {
            const std::ptrdiff_t middle = std::min(from + run, n), end = std::min(middle + run, n);
            std::ptrdiff_t left = from, right = middle;
            for (std::ptrdiff_t k = from; k < end; ++k) {
                const bool takesLeft =
                    right >= end || (left < middle && x[order[left]] <= x[order[right]]);
                merged[k] = order[takesLeft ? left++ : right++];
            }
        }
        std::swap(order, merged);
    }
    for (std::ptrdiff_t i = 0; i < n; ++i)
        merged[i] = order[i]; // `merged` may be either of the caller's two arrays
}

// Medians of five neighbours each, for a start that single outliers do not determine.
ErrorCode SmoothByMedians(const FitSamples &samples, RealVector smooth) {
    constexpr int32_t reach = 2;
    const int32_t n = samples.n();
    Places order, spare;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(order, n), Sized(spare, n)))
        return failed;
    OrderBy(samples.x, order, spare);
    for (int32_t k = 0; k < n; ++k) {
        double window[2 * reach + 1];
        int32_t size = 0;
        for (int32_t i = std::max(k - reach, 0); i <= std::min(k + reach, n - 1); ++i) {
            int32_t at = size++;
            for (; at > 0 && window[at - 1] > samples.y[order[i]]; --at)
                window[at] = window[at - 1];
            window[at] = samples.y[order[i]];
        }
        smooth[order[k]] = window[size / 2];
    }
    return 0;
}

// The least-squares peak of the samples, with the sign of s that the bounds require.
ErrorCode LeastSquaresPeak(const BoundedFit &request, const FitSamples &samples, FoundPeak *peak) {
    if (const ErrorCode failed = PeakFit(request, samples).run(peak))
        return failed;
    if (request.bounds.upper[2] <= 0.0)
        peak->p[2] = -peak->p[2];
    return 0;
}

// Continues from a peak in another norm.
ErrorCode FollowNorm(FitNorm norm, const BoundedFit &request, const FitSamples &samples,
                     FoundPeak *peak) {
    int32_t iterations = *request.iterations > 0 ? *request.iterations : 2000;
    double lambda = 0.1;
    const ErrorCode status =
        BoundedLM(FitModelOf<GaussianModel>(), samples, norm, request.bounds, peak->p, &iterations,
                  ToleranceOrDefault(request.tolerance), &lambda, &peak->cost);
    peak->iterations += iterations;
    peak->end = FitEnd::Converged;
    return status == ErrIterationLimit ? 0 : status;
}

// Continues by least absolute residuals, and from there by bisquare.
ErrorCode FollowNorms(const BoundedFit &request, const FitSamples &samples, FoundPeak *peak) {
    if (const ErrorCode failed = FollowNorm(leastAbsolute, request, samples, peak))
        return failed;
    return request.method == bisquare ? FollowNorm(bisquare, request, samples, peak) : 0;
}

// The measure by which peaks in a robust norm are compared: the cost, or for bisquare, whose
// weights differ, the median of the absolute residuals (P. J. Rousseeuw, "Least median of squares
// regression", 1984).
ErrorCode RobustCost(const BoundedFit &request, const FitSamples &samples, const FoundPeak &peak,
                     RealVector residuals, double *cost) {
    *cost = peak.cost;
    if (request.method != bisquare)
        return 0;
    for (int32_t i = 0; i < samples.n(); ++i)
        residuals[i] =
            std::fabs(samples.y[i] - GaussianModel::value(samples.x[i], peak.p, nullptr));
    DBL median;
    const ErrorCode failed = ArrayMedian(residuals, &median);
    *cost = median;
    return failed;
}

// Starts from the least squares of the samples, and from those of their medians, in which single
// outliers disappear.
ErrorCode FitRobustly(const BoundedFit &request, FitSamples samples, FoundPeak *best) {
    ScratchParts copies, memory;
    if (samples.n() < count)
        if (const ErrorCode failed = Repeat(samples, copies, &samples))
            return failed;
    RealVector smooth, residuals;
    if (const ErrorCode failed =
            memory.take(Sized(smooth, samples.n()), Sized(residuals, samples.n())))
        return failed;
    if (const ErrorCode failed = SmoothByMedians(samples, smooth))
        return failed;
    ErrorCode status = ErrNoUsableFit;
    double least = kInfinity;
    for (const bool isSmooth : {false, true}) {
        FoundPeak peak;
        const ConstRealVector y = isSmooth ? ConstRealVector(smooth) : samples.y;
        double cost = kInfinity;
        ErrorCode failed = LeastSquaresPeak(request, {samples.x, y, samples.w}, &peak);
        if (failed == 0)
            failed = FollowNorms(request, samples, &peak);
        if (failed == 0)
            failed = RobustCost(request, samples, peak, residuals, &cost);
        if (failed == ErrOutOfMemory)
            return failed;
        status = status == 0 ? 0 : failed;
        if (cost < least || best->cost == kInfinity)
            *best = peak;
        least = std::min(least, cost);
    }
    return status;
}

} // namespace

ErrorCode FitPeak(const BoundedFit &request, FitEnd *end) {
    FitSamples samples = request.samples;
    *end = FitEnd::Exact;
    if (const ErrorCode failed = Check(request, &samples, FreeParameters(request.bounds)))
        return failed;
    if (samples.n() == 0) { // no parameter is free
        for (int32_t j = 0; j < count; ++j)
            request.p[j] = request.bounds.upper[j];
        *request.mse = 0.0;
        *request.iterations = 0;
        return 0;
    }
    FoundPeak best;
    const bool isSquares = request.method == leastSquares;
    if (const ErrorCode failed = isSquares ? LeastSquaresPeak(request, samples, &best)
                                           : FitRobustly(request, samples, &best))
        return failed;
    for (int32_t j = 0; j < count; ++j)
        request.p[j] = j == 2 ? std::fabs(best.p[j]) : double{best.p[j]};
    *request.mse = isSquares ? 2.0 * best.cost / samples.n() : best.cost;
    *request.iterations = best.iterations;
    *end = best.end;
    for (int32_t i = 0; i < samples.n(); ++i)
        request.values[i] = GaussianModel::value(request.samples.x[i], request.p, nullptr);
    return 0;
}

} // namespace qx
