#include "fit/bounded_fits.h"
#include "fit/line.h"
#include "fit/weights.h"
#include "frame/constants.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

double WeightOf(const DBL *w, int32_t i) { return w == nullptr ? 1.0 : std::fabs(w[i]); }

struct Line {
    double slope, intercept;
    double at(double x) const { return slope * x + intercept; }
};

struct Interval {
    double lower, upper;
    double project(double v) const { return v <= lower ? lower : v >= upper ? upper : v; }
    double margin(double v) const { return std::min(upper - v, v - lower); }
    bool contains(double v) const { return v >= lower && v <= upper; }
};

// Half the sum of squares as a function of the line, less what no line changes.
struct Quadratic {
    LineSums s;
    double at(const Line &line) const {
        const double a = line.slope, b = line.intercept;
        return 0.5 * s.xx * a * a + 0.5 * s.weight * b * b + s.x * a * b - s.xy * a - s.y * b;
    }
    Line lowest() const {
        const double a = (s.y * s.x - s.xy * s.weight) / (s.x * s.x - s.xx * s.weight);
        return {a, (s.y - a * s.x) / s.weight};
    }
};

// Newton steps on the quadratic function, held back near the bounds by a barrier on the diagonal
// of its second derivatives, whose weight falls from round to round.
class Barrier {
public:
    Barrier(const Quadratic &q, const Interval &slopes, const Interval &intercepts, Line start)
        : q_(q), slopes_(slopes), intercepts_(intercepts), line_(start), best_(start),
          value_(q.at(start)), bestValue_(value_) {}

    Line run() {
        double weight = std::max(value_ / 1.414, 1.0);
        double change = 1.000000000001;
        for (int32_t round = 0; change > 1e-12 && round < mostRounds; ++round) {
            const double before = value_;
            weight /= 10.0;
            if (!findBetter(weight))
                break;
            change = std::fabs(before - value_) / (std::fabs(before) + kEpsilon);
        }
        return best_;
    }

private:
    // More are never needed where the steps are finite.
    static constexpr int32_t mostRounds = 400, mostSteps = 400;

    bool findBetter(double &weight) {
        const double edge = std::sqrt(kEpsilon);
        double g1 = 1.0 / (slopes_.margin(line_.slope) + edge);
        double g2 = 1.0 / (intercepts_.margin(line_.intercept) + edge);
        for (int32_t i = 0; i < mostSteps; ++i) {
            const Line step = newtonStep(g1 * g1 * weight, g2 * g2 * weight);
            const Line next = {slopes_.project(line_.slope + step.slope),
                               intercepts_.project(line_.intercept + step.intercept)};
            const double value = q_.at(next);
            if (!std::isfinite(value))
                return false;
            line_ = next;
            if (value < bestValue_) {
                best_ = next;
                bestValue_ = value;
            }
            const double margin =
                std::min(slopes_.margin(next.slope), intercepts_.margin(next.intercept)) + edge;
            weight *= 2.0;
            if (std::min(margin, value_ - value + edge) >= 0.0) {
                value_ = value;
                return true;
            }
            // kept: the step itself serves as the barrier of the next one
            g1 = step.slope;
            g2 = step.intercept;
        }
        return false;
    }

    Line newtonStep(double barrier1, double barrier2) const {
        const LineSums &s = q_.s;
        const double a = line_.slope, b = line_.intercept;
        const double h11 = barrier1 + s.xx, h22 = barrier2 + s.weight;
        const double e1 = -(b * s.x + a * s.xx - s.xy);
        const double e2 = -(b * s.weight + a * s.x - s.y);
        const double determinant = s.x * s.x - h22 * h11;
        return {(e2 * s.x - e1 * h22) / determinant, (e1 * s.x - e2 * h11) / determinant};
    }

    const Quadratic &q_;
    const Interval &slopes_, &intercepts_;
    Line line_, best_;
    double value_, bestValue_;
};

// The barrier method stalls in a corner that it has entered from outside. The lowest points of the
// four edges have closed forms.
Line BestOfEdges(const Quadratic &q, const Interval &slopes, const Interval &intercepts,
                 Line best) {
    double lowest = q.at(best);
    const auto consider = [&](const Line &line) {
        const double value = q.at(line);
        if (value < lowest || (std::isfinite(value) && !std::isfinite(lowest))) {
            lowest = value;
            best = line;
        }
    };
    for (const double a : {slopes.lower, slopes.upper})
        if (std::isfinite(a))
            consider({a, intercepts.project((q.s.y - a * q.s.x) / q.s.weight)});
    for (const double b : {intercepts.lower, intercepts.upper})
        if (std::isfinite(b))
            consider({slopes.project((q.s.xy - b * q.s.x) / q.s.xx), b});
    return best;
}

Line LineWithin(const FitSamples &samples, const FitBounds &bounds) {
    const Quadratic q = {SumsOfLine(samples.x, samples.y, samples.n, samples.w)};
    const Interval slopes = {bounds.lower[0], bounds.upper[0]};
    const Interval intercepts = {bounds.lower[1], bounds.upper[1]};
    const Line plain = q.lowest();
    if (slopes.contains(plain.slope) && intercepts.contains(plain.intercept))
        return plain;
    const Line start = {slopes.project(plain.slope), intercepts.project(plain.intercept)};
    return BestOfEdges(q, slopes, intercepts, Barrier(q, slopes, intercepts, start).run());
}

// The mean of |w r|, or of |w| r^2.
double Norm(const FitSamples &samples, const Line &line, int32_t method) {
    double sum = 0.0;
    for (int32_t i = 0; i < samples.n; ++i) {
        const double r = samples.y[i] - line.at(samples.x[i]);
        sum += WeightOf(samples.w, i) * (method == leastAbsolute ? std::fabs(r) : r * r);
    }
    return sum / samples.n;
}

// The line of least squares again and again, with the weights that follow from the last one.
class Reweighting {
public:
    Reweighting(const FitSamples &samples, const FitBounds &bounds)
        : samples_(samples), bounds_(bounds) {}

    ErrorCode allocate() { return memory_.allocate(3 * int64_t{samples_.n}); }

    // From *line on. *rounds is the limit, and then the count. Least absolute residuals have a norm
    // by which the best line is known; bisquare has come to rest where it ends.
    ErrorCode run(int32_t method, double tolerance, int32_t *rounds, Line *line) {
        const int32_t limit = *rounds;
        if (method == bisquare)
            findLeverageFactors();
        Line last = *line;
        double lowest = Norm(samples_, last, method);
        // A line follows from the one before, so lines that come back come back for ever (R. P.
        // Brent, "An improved Monte Carlo factorization algorithm", 1980, finds them so).
        Line earlier = last;
        int32_t noted = 0;
        for (*rounds = 1; *rounds <= limit; ++*rounds) {
            if (const ErrorCode failed = findWeights(last, method))
                return failed;
            const Line next = LineWithin({samples_.x, samples_.y, weights(), samples_.n}, bounds_);
            const double norm = Norm(samples_, next, method);
            if (method == bisquare || norm < lowest) {
                lowest = norm;
                *line = next;
            }
            if (isSettled(last, next, tolerance))
                return 0;
            if (next.slope == earlier.slope && next.intercept == earlier.intercept)
                return ErrIterationLimit;
            if (*rounds / 2 >= noted) {
                earlier = next;
                noted = *rounds;
            }
            last = next;
        }
        *rounds = limit;
        return ErrIterationLimit;
    }

private:
    DBL *residuals() const { return memory_.data(); }
    DBL *weights() const { return memory_.data() + samples_.n; }
    DBL *factors() const { return memory_.data() + 2 * std::ptrdiff_t{samples_.n}; }

    ErrorCode findWeights(const Line &line, int32_t method) {
        for (int32_t i = 0; i < samples_.n; ++i) {
            const double r = samples_.y[i] - line.at(samples_.x[i]);
            residuals()[i] = method == bisquare ? r * factors()[i] : r;
        }
        return method == bisquare
                   ? BisquareWeights(residuals(), samples_.w, samples_.n, 2, weights())
                   : LeastAbsoluteWeights(residuals(), samples_.w, samples_.n, weights());
    }

    void findLeverageFactors() {
        double weight = 0.0, mean = 0.0, spread = 0.0;
        for (int32_t i = 0; i < samples_.n; ++i) {
            weight += WeightOf(samples_.w, i);
            mean += WeightOf(samples_.w, i) * samples_.x[i];
        }
        mean /= weight;
        for (int32_t i = 0; i < samples_.n; ++i) {
            const double d = samples_.x[i] - mean;
            spread += WeightOf(samples_.w, i) * (d * d);
        }
        for (int32_t i = 0; i < samples_.n; ++i) {
            const double d = samples_.x[i] - mean;
            const double ofSlope = spread > 0.0 ? d * d / spread : 0.0;
            factors()[i] = WeightOf(samples_.w, i) * (1.0 / weight + ofSlope);
        }
        LeverageFactors(factors(), samples_.w, samples_.n, factors());
    }

    // The line moves by a part of the residuals, or within the rounding of the data.
    bool isSettled(const Line &last, const Line &next, double tolerance) const {
        double moved = 0.0, size = 0.0, rest = 0.0;
        for (int32_t i = 0; i < samples_.n; ++i) {
            const double f = next.at(samples_.x[i]);
            moved += std::fabs(f - last.at(samples_.x[i]));
            size += std::fabs(samples_.y[i]);
            rest += std::fabs(samples_.y[i] - f);
        }
        return moved <= tolerance * rest || moved <= 8.0 * kEpsilon * size;
    }

    const FitSamples &samples_;
    const FitBounds &bounds_;
    Scratch<ElementType::DBL> memory_;
};

// One sample and a second one that the fixed parameter puts beside it.
struct TwoSamples {
    DBL x[2], y[2], w[2];
    FitSamples make(const FitSamples &samples, const FitBounds &bounds) {
        const double x0 = samples.x[0], y0 = samples.y[0];
        const double upperSlope = bounds.upper[0], upperIntercept = bounds.upper[1];
        x[0] = x0;
        x[1] = x0 + 1.0;
        y[0] = y0;
        if (bounds.lower[0] == upperSlope)
            y[1] = y0 + upperSlope;
        else
            y[1] = x0 == 0.0 ? y0 + 1.0 : ((x0 + 1.0) * y0 - upperIntercept) / x0;
        w[0] = w[1] = samples.w == nullptr ? 1.0 : samples.w[0];
        return {x, y, samples.w == nullptr ? nullptr : w, 2};
    }
};

} // namespace

void BoundLine(const FitSamples &samples, const FitBounds &bounds, DBL *slope, DBL *intercept) {
    const Line line = LineWithin(samples, bounds);
    *slope = line.slope;
    *intercept = line.intercept;
}

ErrorCode FitLineRobustly(const FitSamples &samples, const FitBounds &bounds, int32_t method,
                          double tolerance, int32_t *iterations, DBL *p, double *norm) {
    Reweighting reweighting(samples, bounds);
    if (const ErrorCode failed = reweighting.allocate())
        return failed;
    Line line = LineWithin(samples, bounds);
    const int32_t limit = std::clamp(*iterations, 1, mostIterations);
    int32_t done = 0;
    // Samples that all lie on one side of the plain line would take its place as the bulk of the
    // data; the line of least absolute residuals goes through the bulk.
    if (method == bisquare) {
        constexpr double nearEnough = 0.01;
        done = limit / 2;
        const ErrorCode status = reweighting.run(leastAbsolute, nearEnough, &done, &line);
        if (status != 0 && status != ErrIterationLimit)
            return status;
    }
    *iterations = limit - done;
    const ErrorCode status = reweighting.run(method, tolerance, iterations, &line);
    *iterations += done;
    p[0] = line.slope;
    p[1] = line.intercept;
    *norm = Norm(samples, line, method);
    return status;
}

ErrorCode FitBoundedLine(const BoundedFit &request) {
    if (request.samples.n < FreeParameters(request.bounds, 2))
        return ErrFitPointsTooFew;
    if (request.samples.n == 0) {
        TakeUpperBounds(request, 2);
        return 0;
    }
    TwoSamples two;
    FitSamples samples = request.samples;
    if (samples.n == 1)
        samples = two.make(samples, request.bounds);
    if (samples.w != nullptr && CheckFinite(samples.w, samples.n) != 0)
        return ErrNonFiniteInput;
    if (const ErrorCode failed = SettleWeights(samples.n, 2, &samples.w))
        return failed;
    for (int32_t i = 0; i < 2; ++i)
        if (request.bounds.lower[i] > request.bounds.upper[i])
            return ErrBoundsCrossed;

    ErrorCode status = 0;
    if (request.method == leastSquares) {
        BoundLine(samples, request.bounds, &request.p[0], &request.p[1]);
    } else {
        const double tolerance = request.tolerance <= 0.0 ? 0.0001 : request.tolerance;
        status = FitLineRobustly(samples, request.bounds, request.method, tolerance,
                                 request.iterations, request.p, request.mse);
        if (status != 0 && status != ErrIterationLimit)
            return status;
    }
    const Line line = {request.p[0], request.p[1]};
    const FitSamples given = {request.samples.x, request.samples.y,
                              samples.w == nullptr ? nullptr : request.samples.w,
                              request.samples.n};
    *request.mse = Norm(given, line, request.method);
    for (int32_t i = 0; i < given.n; ++i)
        request.fit[i] = line.at(given.x[i]);
    return status;
}

} // namespace qx
