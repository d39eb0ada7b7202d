#include "fit/bounded_frame.h"
#include "fit/line.h"
#include "frame/constants.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

struct Interval {
    double lower, upper;
    double project(double v) const { return v <= lower ? lower : v >= upper ? upper : v; }
    double margin(double v) const { return std::min(upper - v, v - lower); }
    bool contains(double v) const { return v >= lower && v <= upper; }
};

// Half the sum of squares as a function of the line, without the part that does not depend on it.
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

// Newton steps on the quadratic function, shortened near the bounds by a barrier on the diagonal of
// its second derivatives, whose weight decreases from round to round.
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
    // More are never needed if the steps are finite.
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

// The barrier method stalls in a corner that it enters from outside, so the lowest points of the
// four edges are compared as well; they have closed forms.
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
    const Quadratic q = {SumsOfLine(samples)};
    const Interval slopes = {bounds.lower[0], bounds.upper[0]};
    const Interval intercepts = {bounds.lower[1], bounds.upper[1]};
    const Line plain = q.lowest();
    if (slopes.contains(plain.slope) && intercepts.contains(plain.intercept))
        return plain;
    const Line start = {slopes.project(plain.slope), intercepts.project(plain.intercept)};
    return BestOfEdges(q, slopes, intercepts, Barrier(q, slopes, intercepts, start).run());
}

// The mean of |w r|, or of |w| r^2.
double Cost(const FitSamples &samples, const Line &line, int32_t norm) {
    double sum = 0.0;
    for (int32_t i = 0; i < samples.n(); ++i) {
        const double r = samples.y[i] - line.at(samples.x[i]);
        sum += samples.weight(i) * (norm == leastAbsolute ? std::fabs(r) : r * r);
    }
    return sum / samples.n();
}

// Repeats the line of least squares, each time with the weights that follow from the last line.
class RobustLine {
public:
    RobustLine(const FitSamples &samples, const FitBounds &bounds, FitNorm norm)
        : samples_(samples), bounds_(bounds), state_{norm, 2, samples.w} {}

    ErrorCode allocate() { return state_.take(samples_.n()); }

    // Iterates from *line. *rounds is the limit on entry and the count on return. For least
    // absolute residuals the norm identifies the best line, which is returned; for bisquare the
    // last line is the result.
    ErrorCode run(FitNorm norm, double tolerance, int32_t *rounds, Line *line) {
        const int32_t limit = *rounds;
        state_.norm = norm;
        if (norm == bisquare)
            findLeverageFactors();
        Line last = *line;
        double lowest = Cost(samples_, last, norm);
        // Each line depends only on the one before, so once a line recurs, the iteration is in a
        // cycle. It is detected as by R. P. Brent, "An improved Monte Carlo factorization
        // algorithm", 1980.
        Line earlier = last;
        int32_t noted = 0;
        for (*rounds = 1; *rounds <= limit; ++*rounds) {
            if (const ErrorCode failed = findWeights(last))
                return failed;
            const Line next = LineWithin({samples_.x, samples_.y, state_.weights}, bounds_);
            const double cost = Cost(samples_, next, norm);
            if (norm == bisquare || cost < lowest) {
                lowest = cost;
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
    ErrorCode findWeights(const Line &line) const {
        for (int32_t i = 0; i < samples_.n(); ++i)
            state_.residuals[i] = samples_.y[i] - line.at(samples_.x[i]);
        return state_.findWeights();
    }

    void findLeverageFactors() {
        double weight = 0.0, mean = 0.0, spread = 0.0;
        for (int32_t i = 0; i < samples_.n(); ++i) {
            weight += samples_.weight(i);
            mean += samples_.weight(i) * samples_.x[i];
        }
        mean /= weight;
        for (int32_t i = 0; i < samples_.n(); ++i) {
            const double d = samples_.x[i] - mean;
            spread += samples_.weight(i) * (d * d);
        }
        for (int32_t i = 0; i < samples_.n(); ++i) {
            const double d = samples_.x[i] - mean;
            const double ofSlope = spread > 0.0 ? d * d / spread : 0.0;
            state_.factors[i] = samples_.weight(i) * (1.0 / weight + ofSlope);
        }
        state_.setLeverages();
    }

    // Whether the line moves by at most the tolerance times the residuals, or within the rounding
    // errors of the data.
    bool isSettled(const Line &last, const Line &next, double tolerance) const {
        double moved = 0.0, size = 0.0, rest = 0.0;
        for (int32_t i = 0; i < samples_.n(); ++i) {
            const double f = next.at(samples_.x[i]);
            moved += std::fabs(f - last.at(samples_.x[i]));
            size += std::fabs(samples_.y[i]);
            rest += std::fabs(samples_.y[i] - f);
        }
        return moved <= tolerance * rest || moved <= 8.0 * kEpsilon * size;
    }

    const FitSamples &samples_;
    const FitBounds &bounds_;
    Reweighting state_;
};

class LineFit {
public:
    // Adds a second sample, on the line that the first sample and the fixed parameter determine.
    ErrorCode pad(const BoundedFit &request, FitSamples *samples) {
        const FitBounds &bounds = request.bounds;
        const double x0 = samples->x[0], y0 = samples->y[0];
        double y1 = y0 + bounds.upper[0];
        if (bounds.lower[0] != bounds.upper[0])
            y1 = x0 == 0.0 ? y0 + 1.0 : ((x0 + 1.0) * y0 - bounds.upper[1]) / x0;
        *samples = two_.make(*samples, x0 + 1.0, y1);
        return 0;
    }

    ErrorCode checkAbscissae(const FitSamples &) const { return 0; }

    ErrorCode fit(const BoundedFit &request, const FitSamples &samples) const {
        for (std::ptrdiff_t i = 0; i < 2; ++i)
            if (request.bounds.lower[i] > request.bounds.upper[i])
                return ErrBoundsCrossed;
        ErrorCode status = 0;
        if (request.method == leastSquares) {
            const Line line = LineWithin(samples, request.bounds);
            request.p[0] = line.slope;
            request.p[1] = line.intercept;
        } else {
            BoundedFit settled = request;
            settled.samples = samples;
            status = FitLineRobustly(settled);
        }
        FitSamples given = request.samples;
        if (samples.w.isEmpty())
            given.w = {};
        *request.mse = Cost(given, {request.p[0], request.p[1]}, request.method);
        return status;
    }

    double value(double x, const DBL *p) const { return Line{p[0], p[1]}.at(x); }

private:
    TwoSamples two_;
};

} // namespace

ErrorCode FitLineRobustly(const BoundedFit &request) {
    const FitSamples &samples = request.samples;
    const auto norm = static_cast<FitNorm>(request.method);
    RobustLine robust(samples, request.bounds, norm);
    if (const ErrorCode failed = robust.allocate())
        return failed;
    Line line = LineWithin(samples, request.bounds);
    const int32_t limit = std::clamp(*request.iterations, 1, mostIterations);
    int32_t done = 0;
    // Samples that all lie on one side of the plain line could be mistaken for the bulk of the
    // data; the line of least absolute residuals goes through the bulk.
    if (norm == bisquare) {
        constexpr double nearEnough = 0.01;
        done = limit / 2;
        const ErrorCode status = robust.run(leastAbsolute, nearEnough, &done, &line);
        if (status != 0 && status != ErrIterationLimit)
            return status;
    }
    *request.iterations = limit - done;
    const ErrorCode status = robust.run(norm, request.tolerance, request.iterations, &line);
    *request.iterations += done;
    request.p[0] = line.slope;
    request.p[1] = line.intercept;
    *request.mse = Cost(samples, line, norm);
    return status;
}

ErrorCode FitBoundedLine(const BoundedFit &request) { return FitInFrame(request, LineFit()); }

} // namespace qx
