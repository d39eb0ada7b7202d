#include "fit/bounded_lm.h"

#include "fit/damped_step.h"
#include "frame/constants.h"
#include "linalg/matrix.h"
#include "linalg/systems/least_squares.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace qx {

namespace {

// Central differences; `moved` is p except for the one parameter that moves.
void NumericGradient(const FitModel &model, double x, RealVector p, RealVector moved,
                     RealVector out) {
    const double leastSize = std::sqrt(kEpsilon);
    for (int32_t i = 0; i < model.count; ++i) {
        const double size = std::fabs(p[i]);
        const double h = 3e-06 * (size > leastSize ? size : leastSize);
        moved[i] = p[i] + h;
        const double above = model.value(x, moved.data(), model.count, model.user);
        moved[i] = p[i] - h;
        const double below = model.value(x, moved.data(), model.count, model.user);
        out[i] = (above - below) / (2.0 * h);
        moved[i] = p[i];
    }
}

void FindResiduals(const FitModel &model, const FitSamples &samples, RealVector p, RealVector r) {
    for (int32_t i = 0; i < samples.n(); ++i)
        r[i] = samples.y[i] - model.value(samples.x[i], p.data(), model.count, model.user);
}

void MirrorLowerTriangle(const RealMatrix &a) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < i; ++j)
            a(j, i) = a(i, j);
}

// row^T inverse row.
double Leverage(const DBL *row, const RealMatrix &inverse) {
    double sum = 0.0;
    for (int32_t i = 0; i < inverse.rows(); ++i) {
        double product = 0.0;
        for (int32_t j = 0; j < inverse.cols(); ++j)
            product += inverse(i, j) * row[j];
        sum += row[i] * product;
    }
    return sum;
}

} // namespace

ErrorCode EvaluationMemory::take(int32_t n) {
    const int32_t count = state.parameters, leverages = state.norm == bisquare ? count : 0;
    if (const ErrorCode failed = memory_.take(Sized(gradient, count), Sized(moved, count),
                                              Sized(inverse, leverages, leverages),
                                              Sized(jacobian, leverages > 0 ? n : 0, leverages)))
        return failed;
    return state.norm == leastSquares ? 0 : state.take(n);
}

void EvalLeastSquares(const FitModel &model, const FitSamples &samples, FitPoint &at,
                      EvaluationMemory &memory, const RealMatrix &jacobian) {
    const auto &[p, a, g, cost] = at;
    const int32_t count = model.count;
    if (model.normal != nullptr) {
        model.normal(samples, p.data(), count, &at.cost, a.data(), jacobian.data(), g.data(),
                     model.user);
        return;
    }
    const RealVector d = memory.gradient;
    Copy<ElementType::DBL>(p, memory.moved);
    Fill(a.data(), std::ptrdiff_t{count} * count, 0.0);
    Fill(g.data(), count, 0.0);
    double sum = 0.0;
    for (int32_t k = 0; k < samples.n(); ++k) {
        const double x = samples.x[k];
        const double weight = samples.weight(k);
        const double r = samples.y[k] - model.value(x, p.data(), count, model.user);
        sum += weight * (r * r);
        if (model.gradient != nullptr)
            model.gradient(x, p.data(), count, d.data(), model.user);
        else
            NumericGradient(model, x, p, memory.moved, d);
        for (int32_t i = 0; i < count; ++i) {
            const double weighted = weight * d[i];
            for (int32_t j = 0; j <= i; ++j)
                a(i, j) += weighted * d[j];
            g[i] += weighted * r;
        }
        if (!jacobian.isEmpty())
            Copy<ElementType::DBL>(d, {jacobian.row(k), count});
    }
    at.cost = sum / samples.n();
    MirrorLowerTriangle(a);
}

ErrorCode EvalLeastAbsolute(const FitModel &model, const FitSamples &samples, FitPoint &at,
                            EvaluationMemory &memory) {
    const Reweighting &state = memory.state;
    FindResiduals(model, samples, at.p, state.residuals);
    if (const ErrorCode failed = state.findWeights())
        return failed;
    EvalLeastSquares(model, {samples.x, samples.y, state.weights}, at, memory);
    double sum = 0.0;
    for (int32_t i = 0; i < samples.n(); ++i)
        sum += samples.weight(i) * std::fabs(state.residuals[i]);
    at.cost = sum / samples.n();
    return 0;
}

ErrorCode EvalBisquare(const FitModel &model, const FitSamples &samples, FitPoint &at,
                       EvaluationMemory &memory) {
    Reweighting &state = memory.state;
    EvalLeastSquares(model, samples, at, memory, memory.jacobian);
    if (const ErrorCode failed = PseudoInverseMatrix<ElementType::DBL>(at.a, -1.0, memory.inverse))
        return failed;
    for (int32_t i = 0; i < samples.n(); ++i)
        state.factors[i] = samples.weight(i) * Leverage(memory.jacobian.row(i), memory.inverse);
    state.setLeverages();
    FindResiduals(model, samples, at.p, state.residuals);
    if (const ErrorCode failed = state.findWeights())
        return failed;
    EvalLeastSquares(model, {samples.x, samples.y, state.weights}, at, memory);
    return 0;
}

namespace {

class Iteration {
public:
    Iteration(const FitModel &model, const FitSamples &samples, FitNorm norm,
              const FitBounds &bounds)
        : model_(model), samples_(samples), bounds_(bounds), norm_(norm), count_(model.count),
          evaluation_(model, samples, norm) {}

    ErrorCode allocate() {
        if (const ErrorCode failed = memory_.take(
                Sized(current_.p, count_), Sized(current_.a, count_, count_),
                Sized(current_.g, count_), Sized(trial_.p, count_), Sized(trial_.a, count_, count_),
                Sized(trial_.g, count_), Sized(damped_.p, count_), Sized(damped_.a, count_, count_),
                Sized(damped_.g, count_), Sized(pivots_, count_)))
            return failed;
        return evaluation_.take(samples_.n());
    }

    // Afterwards point() is the best point, even after a failure.
    ErrorCode run(const DBL *start, int32_t limit, double tolerance, double *lambda,
                  int32_t *steps) {
        const double startLambda = *lambda;
        Copy<ElementType::DBL>({start, count_}, current_.p);
        project(current_.p);
        *steps = 0;
        if (const ErrorCode failed = evaluate(current_))
            return failed;
        if (current_.hasFailed)
            return ErrNaNInData;
        for (int32_t &k = *steps; limit < 0 || k <= limit; ++k) {
            if (const ErrorCode failed = propose(*lambda))
                return failed;
            if (norm_ == bisquare && std::isfinite(current_.cost) && largestChange() <= tolerance)
                return 0;
            if (const ErrorCode failed = evaluate(trial_))
                return failed;
            const double before = current_.cost, after = trial_.cost;
            if (!std::isfinite(before) && !std::isfinite(after))
                return ErrNonFiniteInput;
            if (before < after || std::isnan(after)) {
                *lambda *= 10.0;
                if (*lambda == 0.0) { // it cannot grow again: all further steps would be the same
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
            // An unchanged cost, such as 0, ends the iteration whatever the tolerance.
            if (before - after < before * tolerance || before == after)
                return 0;
            *lambda *= 0.4;
            if (k == limit)
                return ErrIterationLimit;
        }
        return 0;
    }

    ConstRealVector point() const { return current_.p; }
    double cost() const { return current_.cost; }

private:
    struct Point : FitPoint {
        bool hasFailed; // no residuals, or no weights from them: the cost is NaN
    };

    void project(RealVector p) const {
        for (int32_t i = 0; i < count_; ++i) {
            if (isAtLower(p, i))
                p[i] = bounds_.lower[i];
            else if (isAtUpper(p, i))
                p[i] = bounds_.upper[i];
        }
    }
    bool isAtLower(RealVector p, int32_t i) const {
        return !bounds_.lower.isEmpty() && p[i] <= bounds_.lower[i];
    }
    bool isAtUpper(RealVector p, int32_t i) const {
        return !bounds_.upper.isEmpty() && p[i] >= bounds_.upper[i];
    }

    // Of the failures only a lack of memory is returned, which ends the iteration.
    ErrorCode evaluate(Point &at) {
        ErrorCode status = 0;
        if (norm_ == leastSquares)
            EvalLeastSquares(model_, samples_, at, evaluation_);
        else if (norm_ == leastAbsolute)
            status = EvalLeastAbsolute(model_, samples_, at, evaluation_);
        else
            status = EvalBisquare(model_, samples_, at, evaluation_);
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

    // Lets the parameters at a bound from which the cost falls inwards take part in the equations
    // from now on: a step along the gradient alone may be so long, given the curvature, that no
    // damping makes the cost fall. Returns false if there are none, or if they already take part.
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
        return !bounds_.lower.isEmpty() && !bounds_.upper.isEmpty() &&
               bounds_.lower[i] == bounds_.upper[i];
    }
    void freeze(Point &at, int32_t i) const {
        for (int32_t j = 0; j < count_; ++j) {
            at.a(i, j) = 0.0;
            at.a(j, i) = 0.0;
        }
        at.a(i, i) = 1.0;
        if (isAtLower(at.p, i) ? at.g[i] < 0.0 : at.g[i] > 0.0)
            at.g[i] = 0.0;
    }

    // The next point to try; the current point if the equations are not finite.
    ErrorCode propose(double lambda) {
        const RealVector a = damped_.a.elements(), g = damped_.g;
        Copy<ElementType::DBL>(current_.a.elements(), a);
        Copy<ElementType::DBL>(current_.g, g);
        for (int32_t i = 0; i < count_; ++i)
            damped_.a(i, i) = damped_.a(i, i) * (1.0 + lambda) + lambda;
        Copy<ElementType::DBL>(current_.p, trial_.p);
        if (CheckFinite(a.data(), a.size()) != 0 || CheckFinite(g.data(), count_) != 0)
            return 0;
        if (const ErrorCode failed = SolveRowScaled(damped_.a, damped_.g, pivots_, damped_.p))
            return failed;
        for (int32_t i = 0; i < count_; ++i)
            trial_.p[i] += damped_.p[i];
        project(trial_.p);
        return 0;
    }

    // The largest change relative to the parameter; a parameter that stays at 0 has not changed.
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
    const FitNorm norm_;
    const int32_t count_;
    bool isReleasing_ = false;
    Point current_ = {}, trial_ = {}, damped_ = {};
    VectorView<ElementType::I32> pivots_;
    EvaluationMemory evaluation_;
    ScratchParts memory_;
};

ErrorCode CheckArguments(const FitModel &model, const FitSamples &samples, int32_t method,
                         const FitBounds &bounds, const DBL *p) {
    if (samples.n() < 1)
        return ErrEmptyInput;
    if (samples.n() < model.count)
        return ErrPolynomialOrderTooHigh;
    if (method < leastSquares || method > bisquare)
        return ErrInvalidSelector;
    if (p == nullptr)
        return ErrEmptyInput;
    const bool areBoth = !bounds.lower.isEmpty() && !bounds.upper.isEmpty();
    for (int32_t i = 0; areBoth && i < model.count; ++i)
        if (bounds.upper[i] < bounds.lower[i])
            return ErrBoundsCrossed;
    return 0;
}

} // namespace

ErrorCode BoundedLM(const FitModel &model, const FitSamples &samples, int32_t method,
                    const FitBounds &bounds, DBL *p, int32_t *iterations, double tolerance,
                    double *lambda, double *mse) {
    if (const ErrorCode failed = CheckArguments(model, samples, method, bounds, p))
        return failed;
    Iteration iteration(model, samples, static_cast<FitNorm>(method), bounds);
    if (const ErrorCode failed = iteration.allocate())
        return failed;
    if (tolerance <= 0.0)
        tolerance = 1e-8;
    if (*lambda <= 0.0)
        *lambda = 1.0;
    const int32_t limit = std::min(*iterations, mostIterations);
    const ErrorCode status = iteration.run(p, limit, tolerance, lambda, iterations);
    Copy<ElementType::DBL>(iteration.point(), {p, model.count});
    if (status != 0 && status != ErrIterationLimit)
        return status;
    *mse = iteration.cost();
    if (method != bisquare)
        return status;
    double squares = 0.0;
    for (int32_t i = 0; i < samples.n(); ++i) {
        const double r = samples.y[i] - model.value(samples.x[i], p, model.count, model.user);
        squares += samples.weight(i) * (r * r);
    }
    *mse = squares / samples.n();
    return status;
}

} // namespace qx
