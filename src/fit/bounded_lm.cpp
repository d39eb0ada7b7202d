#include "fit/bounded_lm.h"

#include "fit/damped_step.h"
#include "frame/constants.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"
#include "linalg/systems/least_squares.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <utility>

namespace qx {

namespace {

double WeightOf(const DBL *w, int32_t i) { return w == nullptr ? 1.0 : std::fabs(w[i]); }

void Copy(DBL *to, const DBL *from, std::ptrdiff_t count) {
    std::memcpy(to, from, sizeof(DBL) * static_cast<std::size_t>(count));
}

// Central differences; `moved` is p but for the one parameter that moves.
void NumericGradient(const FitModel &model, double x, const DBL *p, DBL *moved, DBL *out) {
    const double leastSize = std::sqrt(kEpsilon);
    for (int32_t i = 0; i < model.count; ++i) {
        const double size = std::fabs(p[i]);
        const double h = 3e-06 * (size > leastSize ? size : leastSize);
        moved[i] = p[i] + h;
        const double above = model.value(x, moved, model.count, model.user);
        moved[i] = p[i] - h;
        const double below = model.value(x, moved, model.count, model.user);
        out[i] = (above - below) / (2.0 * h);
        moved[i] = p[i];
    }
}

void Residuals(const FitModel &model, const FitSamples &samples, const DBL *p, DBL *r) {
    for (int32_t i = 0; i < samples.n; ++i)
        r[i] = samples.y[i] - model.value(samples.x[i], p, model.count, model.user);
}

FitSamples Weighted(const FitSamples &samples, const DBL *weights) {
    return {samples.x, samples.y, weights, samples.n};
}

void MirrorLowerTriangle(DBL *a, int32_t count) {
    for (int32_t i = 0; i < count; ++i)
        for (int32_t j = 0; j < i; ++j)
            a[j * count + i] = a[i * count + j];
}

// row^T inverse row.
double Leverage(const DBL *row, const DBL *inverse, int32_t count) {
    double sum = 0.0;
    for (int32_t i = 0; i < count; ++i) {
        double product = 0.0;
        for (int32_t j = 0; j < count; ++j)
            product += inverse[i * count + j] * row[j];
        sum += row[i] * product;
    }
    return sum;
}

} // namespace

int64_t EvaluationWork(int32_t n, int32_t count, int32_t method) {
    const int64_t gradient = 2 * int64_t{count};
    if (method == leastSquares)
        return gradient;
    const int64_t residualsAndWeights = 2 * int64_t{n};
    if (method == leastAbsolute)
        return gradient + residualsAndWeights;
    const int64_t leverages = n;
    return gradient + residualsAndWeights + leverages + int64_t{n} * count + int64_t{count} * count;
}

void EvalLeastSquares(const FitModel &model, const FitSamples &samples, const DBL *p, DBL *a,
                      DBL *jacobian, DBL *g, double *cost, DBL *work) {
    const int32_t count = model.count;
    if (model.normal != nullptr) {
        model.normal(samples, p, count, cost, a, jacobian, g, model.user);
        return;
    }
    DBL *const d = work;
    DBL *const moved = d + count;
    Copy(moved, p, count);
    Fill(a, std::ptrdiff_t{count} * count, 0.0);
    Fill(g, count, 0.0);
    double sum = 0.0;
    for (int32_t k = 0; k < samples.n; ++k) {
        const double x = samples.x[k];
        const double weight = WeightOf(samples.w, k);
        const double r = samples.y[k] - model.value(x, p, count, model.user);
        sum += weight * (r * r);
        if (model.gradient != nullptr)
            model.gradient(x, p, count, d, model.user);
        else
            NumericGradient(model, x, p, moved, d);
        for (int32_t i = 0; i < count; ++i) {
            const double weighted = weight * d[i];
            for (int32_t j = 0; j <= i; ++j)
                a[i * count + j] += weighted * d[j];
            g[i] += weighted * r;
        }
        if (jacobian != nullptr)
            Copy(jacobian + std::ptrdiff_t{k} * count, d, count);
    }
    *cost = sum / samples.n;
    MirrorLowerTriangle(a, count);
}

ErrorCode EvalLeastAbsolute(const FitModel &model, const FitSamples &samples, const DBL *p, DBL *a,
                            DBL *g, double *cost, DBL *work) {
    const int32_t n = samples.n;
    DBL *const r = work + 2 * std::ptrdiff_t{model.count};
    DBL *const weights = r + n;
    Residuals(model, samples, p, r);
    if (const ErrorCode failed = LeastAbsoluteWeights(r, samples.w, n, weights))
        return failed;
    double squares;
    EvalLeastSquares(model, Weighted(samples, weights), p, a, nullptr, g, &squares, work);
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += WeightOf(samples.w, i) * std::fabs(r[i]);
    *cost = sum / n;
    return 0;
}

ErrorCode EvalBisquare(const FitModel &model, const FitSamples &samples, const DBL *p, DBL *a,
                       DBL *g, double *cost, DBL *work) {
    const int32_t n = samples.n, count = model.count;
    DBL *const r = work + 2 * std::ptrdiff_t{count};
    DBL *const weights = r + n;
    DBL *const factors = weights + n;
    DBL *const inverse = factors + n;
    DBL *const jacobian = inverse + std::ptrdiff_t{count} * count;
    EvalLeastSquares(model, samples, p, a, jacobian, g, cost, work);
    if (const ErrorCode failed = PseudoInverseMatrix(a, count, count, -1.0, inverse))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        factors[i] =
            WeightOf(samples.w, i) * Leverage(jacobian + std::ptrdiff_t{i} * count, inverse, count);
    LeverageFactors(factors, samples.w, n, factors);
    Residuals(model, samples, p, r);
    for (int32_t i = 0; i < n; ++i)
        r[i] *= factors[i];
    if (const ErrorCode failed = BisquareWeights(r, samples.w, n, count, weights))
        return failed;
    EvalLeastSquares(model, Weighted(samples, weights), p, a, nullptr, g, cost, work);
    return 0;
}

namespace {

class Iteration {
public:
    Iteration(const FitModel &model, const FitSamples &samples, int32_t method,
              const FitBounds &bounds)
        : model_(model), samples_(samples), bounds_(bounds), method_(method), count_(model.count) {}

    ErrorCode allocate() {
        const int64_t count = count_;
        const int64_t ofPoint = count + count * count + count;
        if (const ErrorCode failed =
                memory_.allocate(3 * ofPoint + EvaluationWork(samples_.n, count_, method_)))
            return failed;
        DBL *next = memory_.data();
        for (Point *const point : {&current_, &trial_, &damped_}) {
            point->p = next;
            point->a = point->p + count;
            point->g = point->a + count * count;
            next += ofPoint;
        }
        work_ = next;
        return pivots_.allocate(count);
    }

    // The best point stands at point() afterwards, also after a failure.
    ErrorCode run(const DBL *start, int32_t limit, double tolerance, double *lambda,
                  int32_t *steps) {
        const double startLambda = *lambda;
        Copy(current_.p, start, count_);
        project(current_.p);
        *steps = 0;
        if (const ErrorCode failed = evaluate(current_))
            return failed;
        if (current_.hasFailed)
            return ErrNaNInData;
        for (int32_t &k = *steps; limit < 0 || k <= limit; ++k) {
            if (const ErrorCode failed = propose(*lambda))
                return failed;
            if (method_ == bisquare && std::isfinite(current_.cost) && largestChange() <= tolerance)
                return 0;
            if (const ErrorCode failed = evaluate(trial_))
                return failed;
            const double before = current_.cost, after = trial_.cost;
            if (!std::isfinite(before) && !std::isfinite(after))
                return ErrNonFiniteInput;
            if (before < after || std::isnan(after)) {
                *lambda *= 10.0;
                if (*lambda == 0.0) { // no damping grows from it: the rest repeats this step
                    if (limit >= 0)
                        k = limit + 1;
                    return 0;
                }
                if (*lambda <= 10000.0)
                    continue;
                if (!release())
                    return 0;
                *lambda = startLambda;
                if (const ErrorCode failed = evaluate(current_))
                    return failed;
                continue;
            }
            std::swap(current_, trial_);
            // A cost that stays, as 0 does, falls by no part of itself, however small.
            if (before - after < before * tolerance || before == after)
                return 0;
            *lambda *= 0.4;
            if (k == limit)
                return ErrIterationLimit;
        }
        return 0;
    }

    const DBL *point() const { return current_.p; }
    double cost() const { return current_.cost; }

private:
    struct Point {
        DBL *p, *a, *g;
        double cost;
        bool hasFailed; // no residuals, or no weights from them: the cost is NaN
    };

    void project(DBL *p) const {
        for (int32_t i = 0; i < count_; ++i) {
            if (isAtLower(p, i))
                p[i] = bounds_.lower[i];
            else if (isAtUpper(p, i))
                p[i] = bounds_.upper[i];
        }
    }
    bool isAtLower(const DBL *p, int32_t i) const {
        return bounds_.lower != nullptr && p[i] <= bounds_.lower[i];
    }
    bool isAtUpper(const DBL *p, int32_t i) const {
        return bounds_.upper != nullptr && p[i] >= bounds_.upper[i];
    }

    // Only a lack of memory ends the iteration.
    ErrorCode evaluate(Point &at) {
        ErrorCode status = 0;
        if (method_ == leastSquares)
            EvalLeastSquares(model_, samples_, at.p, at.a, nullptr, at.g, &at.cost, work_);
        else if (method_ == leastAbsolute)
            status = EvalLeastAbsolute(model_, samples_, at.p, at.a, at.g, &at.cost, work_);
        else
            status = EvalBisquare(model_, samples_, at.p, at.a, at.g, &at.cost, work_);
        if (status == ErrOutOfMemory)
            return status;
        at.hasFailed = status != 0;
        if (at.hasFailed)
            at.cost = kNaN;
        for (int32_t i = 0; i < count_; ++i)
            if ((isAtLower(at.p, i) || isAtUpper(at.p, i)) && !(isReleasing_ && leadsInside(at, i)))
                freeze(at, i);
        return 0;
    }

    // A parameter at a bound that the cost would fall from. Its step along the gradient alone may
    // be so long, against the curvature, that no damping makes it fall: from then on such
    // parameters take part in the equations. False where there is none, or all do.
    bool release() {
        bool any = false;
        for (int32_t i = 0; !isReleasing_ && i < count_; ++i)
            any = any || leadsInside(current_, i);
        isReleasing_ = isReleasing_ || any;
        return any;
    }
    bool leadsInside(const Point &at, int32_t i) const {
        return (isAtLower(at.p, i) && at.g[i] > 0.0 && !isFixed(i)) ||
               (isAtUpper(at.p, i) && at.g[i] < 0.0 && !isFixed(i));
    }
    bool isFixed(int32_t i) const {
        return bounds_.lower != nullptr && bounds_.upper != nullptr &&
               bounds_.lower[i] == bounds_.upper[i];
    }
    void freeze(Point &at, int32_t i) const {
        for (int32_t j = 0; j < count_; ++j) {
            at.a[i * count_ + j] = 0.0;
            at.a[j * count_ + i] = 0.0;
        }
        at.a[i * count_ + i] = 1.0;
        if (isAtLower(at.p, i) ? at.g[i] < 0.0 : at.g[i] > 0.0)
            at.g[i] = 0.0;
    }

    // The next point to try; the point itself where the equations are not finite.
    ErrorCode propose(double lambda) {
        Copy(damped_.a, current_.a, std::ptrdiff_t{count_} * count_);
        Copy(damped_.g, current_.g, count_);
        for (int32_t i = 0; i < count_; ++i) {
            DBL &diagonal = damped_.a[i * count_ + i];
            diagonal = diagonal * (1.0 + lambda) + lambda;
        }
        Copy(trial_.p, current_.p, count_);
        if (CheckFinite(damped_.a, int64_t{count_} * count_) != 0 ||
            CheckFinite(damped_.g, count_) != 0)
            return 0;
        if (const ErrorCode failed =
                SolveRowScaled(damped_.a, damped_.g, count_, pivots_.data(), damped_.p))
            return failed;
        for (int32_t i = 0; i < count_; ++i)
            trial_.p[i] += damped_.p[i];
        project(trial_.p);
        return 0;
    }

    // Relative to the parameter; one that stays at 0 has not changed.
    double largestChange() const {
        double largest = 0.0;
        for (int32_t i = 0; i < count_; ++i) {
            const double change = std::fabs(current_.p[i] - trial_.p[i]) / std::fabs(current_.p[i]);
            largest = change > largest ? change : largest;
        }
        return largest;
    }

    const FitModel &model_;
    const FitSamples &samples_;
    const FitBounds &bounds_;
    const int32_t method_, count_;
    bool isReleasing_ = false;
    Point current_ = {}, trial_ = {}, damped_ = {};
    DBL *work_ = nullptr;
    Scratch<ElementType::DBL> memory_;
    Scratch<ElementType::I32> pivots_;
};

ErrorCode CheckArguments(const FitModel &model, const FitSamples &samples, int32_t method,
                         const FitBounds &bounds, const DBL *p) {
    if (samples.n < 1)
        return ErrEmptyInput;
    if (samples.n < model.count)
        return ErrPolynomialOrderTooHigh;
    if (method < leastSquares || method > bisquare)
        return ErrInvalidSelector;
    if (p == nullptr)
        return ErrEmptyInput;
    for (int32_t i = 0; bounds.lower != nullptr && bounds.upper != nullptr && i < model.count; ++i)
        if (bounds.upper[i] < bounds.lower[i])
            return ErrBoundsCrossed;
    return 0;
}

} // namespace

ErrorCode BoundedLM(const FitModel &model, const FitSamples &samples, int32_t method,
                    const FitBounds &bounds, DBL *p, int32_t *iterations, double tolerance,
                    double *lambda, DBL *fit, double *mse) {
    if (const ErrorCode failed = CheckArguments(model, samples, method, bounds, p))
        return failed;
    Iteration iteration(model, samples, method, bounds);
    if (const ErrorCode failed = iteration.allocate())
        return failed;
    if (tolerance <= 0.0)
        tolerance = 1e-8;
    if (*lambda <= 0.0)
        *lambda = 1.0;
    const int32_t limit = std::min(*iterations, mostIterations);
    const ErrorCode status = iteration.run(p, limit, tolerance, lambda, iterations);
    Copy(p, iteration.point(), model.count);
    if (status != 0 && status != ErrIterationLimit)
        return status;
    double squares = 0.0;
    for (int32_t i = 0; (method == bisquare || fit != nullptr) && i < samples.n; ++i) {
        const double f = model.value(samples.x[i], p, model.count, model.user);
        const double r = samples.y[i] - f;
        squares += WeightOf(samples.w, i) * (r * r);
        if (fit != nullptr)
            fit[i] = f;
    }
    *mse = method == bisquare ? squares / samples.n : iteration.cost();
    return status;
}

} // namespace qx
