#include "fit/exponential_power.h"

#include "fit/general.h"
#include "fit/residuals.h"
#include "fit/weights.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"

#include <cmath>
#include <cstring>

namespace qx {

namespace {

// The common form of exponential and power law: y = a g(b), g = exp(b t), with t = x or t = ln x.
// The derivatives are g and a t g.
struct GrowthData : FitSamples {
    ConstRealVector t;
};
double Exponential(const GrowthData &data, double b, int32_t i) { return std::exp(b * data.x[i]); }
double Power(const GrowthData &data, double b, int32_t i) { return std::pow(data.x[i], b); }

struct Parameters {
    double a, b, mse;
};

// +1, or -1 if more values are negative than positive.
double DataSign(ConstRealVector y) {
    int32_t balance = 0;
    for (const double v : y)
        balance += (v > 0.0) - (v < 0.0);
    return balance < 0 ? -1.0 : 1.0;
}

// Fits the line ln(sign y) = p + q t to the values of that sign, in rows that include their weights
// |w| y^2; the rows of the other values are zeros.
ErrorCode FitLogarithms(const GrowthData &data, double sign, DBL *pq) {
    int32_t count = 0;
    for (int32_t i = 0; i < data.n(); ++i)
        count += sign * data.y[i] > 0.0;
    if (count < 2)
        return ErrPolynomialOrderTooHigh;
    const auto writeRows = [&](const RowBlock &block) {
        for (int32_t k = 0; k < block.count; ++k) {
            const int32_t i = block.first + k;
            const double size = sign * data.y[i];
            const bool isUsed = size > 0.0;
            const double root = data.w.isEmpty() ? size : size * std::sqrt(std::fabs(data.w[i]));
            block.column(0)[k] = isUsed ? root : 0.0;
            block.column(1)[k] = isUsed ? root * data.t[i] : 0.0;
            block.column(2)[k] = isUsed ? root * std::log(size) : 0.0;
        }
    };
    return SolveLinearModel({writeRows, data.n(), 2, nullptr}, bySVD, pq, nullptr);
}

// If a step depends only on the parameters, parameters that recur start a cycle: with a small
// tolerance, rounding leads most iterations into one. The method of R. P. Brent, "An improved Monte
// Carlo factorization algorithm", 1980, finds it in a few times the number of steps that lead into
// it and once around.
class Cycle {
public:
    // Returns the number of steps after as many whole rounds of the cycle as fit below `limit`,
    // counted on from `count`: the parameters are the same then.
    int32_t skipRounds(const Parameters &at, int32_t count, int32_t limit) {
        if (count > noted_ && count < limit && isSame(at))
            return count + (limit - count) / (count - noted_) * (count - noted_);
        if (count / 2 >= noted_) {
            earlier_ = at;
            noted_ = count;
        }
        return count;
    }

private:
    bool isSame(const Parameters &at) const { // to the bit
        return std::memcmp(&at, &earlier_, sizeof at) == 0;
    }

    Parameters earlier_ = {};
    int32_t noted_ = 0;
};

// Gauss-Newton iteration. `values` has g of all samples for the latest parameters.
template <double (*G)(const GrowthData &, double, int32_t)>
class Iteration {
public:
    Iteration(const GrowthData &data, RealVector values) : data_(data), values_(values) {}

    double mseAt(double a, double b) {
        SquaredResiduals squares(data_);
        for (int32_t i = 0; i < data_.n(); ++i) {
            values_[i] = G(data_, b, i);
            squares.add(i, a * values_[i]);
        }
        return squares.mean();
    }

    ErrorCode step(Parameters *at) {
        const auto writeRows = [&](const RowBlock &block) {
            for (int32_t k = 0; k < block.count; ++k) {
                const int32_t i = block.first + k;
                block.column(0)[k] = values_[i];
                block.column(1)[k] = at->a * data_.t[i] * values_[i];
                block.column(2)[k] = data_.y[i] - at->a * values_[i];
            }
        };
        DBL change[2];
        const LinearModel model = {writeRows, data_.n(), 2, data_.weights()};
        if (const ErrorCode failed = SolveLinearModel(model, bySVD, change, nullptr))
            return failed;
        at->a += change[0];
        at->b += change[1];
        at->mse = mseAt(at->a, at->b);
        return 0;
    }

    // On entry *best holds the start parameters.
    ErrorCode run(const FitLimits &limits, Parameters *best, int32_t *steps) {
        best->mse = mseAt(best->a, best->b);
        Parameters latest = *best;
        double earlier = 2.0 * latest.mse;
        int32_t count = 0;
        Cycle cycle;
        *steps = 0;
        while (limits.iterations >= 0 &&
               std::fabs(earlier - latest.mse) > earlier * limits.tolerance &&
               latest.mse > limits.floor) {
            // Up to this limit a worse step does not end the iteration, and the best parameters are
            // known.
            count = cycle.skipRounds(latest, count, limits.iterations / 10);
            earlier = latest.mse;
            if (const ErrorCode failed = step(&latest))
                return failed;
            *steps = ++count;
            const bool isWorse = latest.mse > earlier && latest.mse > best->mse;
            if (!std::isfinite(latest.mse) || (count > limits.iterations / 10 && isWorse))
                break;
            if (latest.mse < best->mse)
                *best = latest;
            if (count > limits.iterations)
                break;
        }
        return 0;
    }

private:
    const GrowthData &data_;
    const RealVector values_;
};

// The start is the guess, or, without one, the line through the logarithms. If the guess is not
// finite, the line is fitted as well, for its codes.
ErrorCode FindStart(const GrowthData &data, const DBL *guess, Parameters *start) {
    if (guess == nullptr || CheckFinite(guess, 2) != 0) {
        const double sign = DataSign(data.y);
        DBL pq[2];
        if (const ErrorCode failed = FitLogarithms(data, sign, pq))
            return failed;
        *start = {sign * std::exp(pq[0]), pq[1], 0.0};
    }
    // kept: even a guess that is not finite is the start
    if (guess != nullptr)
        *start = {guess[0], guess[1], 0.0};
    return 0;
}

template <double (*G)(const GrowthData &, double, int32_t)>
ErrorCode Iterate(const GrowthData &data, const ModelFit &request, RealVector values,
                  Parameters *found) {
    return Iteration<G>(data, values).run(request.limits.settled(), found, request.steps);
}

template <double (*G)(const GrowthData &, double, int32_t)>
void Return(const GrowthData &data, const ModelFit &request, const Parameters &found) {
    EvaluateFit(data, request.out, [&](int32_t i) { return found.a * G(data, found.b, i); });
    request.p[0] = found.a;
    request.p[1] = found.b;
}

} // namespace

ErrorCode FitExponential(const ModelFit &request, ExponentialMethod method) {
    GrowthData data = {request.samples, request.samples.x};
    if (const ErrorCode failed = SettleWeights(&data, 2))
        return failed;
    const bool isIterated = method == ExponentialMethod::GaussNewton;
    Parameters found = {};
    if (const ErrorCode failed = FindStart(data, isIterated ? request.guess : nullptr, &found))
        return failed;
    if (isIterated) {
        Scratch<ElementType::DBL> values;
        if (const ErrorCode failed = values.allocate(data.n()))
            return failed;
        if (const ErrorCode failed =
                Iterate<Exponential>(data, request, {values.data(), data.n()}, &found))
            return failed;
    }
    Return<Exponential>(data, request, found);
    return 0;
}

ErrorCode FitPower(const ModelFit &request) {
    GrowthData data = {request.samples, {}};
    if (const ErrorCode failed = SettleWeights(&data, 2))
        return failed;
    for (const double x : data.x)
        if (!(x > 0.0))
            return ErrNotStrictlyPositive;
    RealVector values, logarithms;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(values, data.n()), Sized(logarithms, data.n())))
        return failed;
    for (int32_t i = 0; i < data.n(); ++i)
        logarithms[i] = std::log(data.x[i]);
    data.t = logarithms;
    Parameters found = {};
    if (const ErrorCode failed = FindStart(data, request.guess, &found))
        return failed;
    if (const ErrorCode failed = Iterate<Power>(data, request, values, &found))
        return failed;
    Return<Power>(data, request, found);
    return 0;
}

} // namespace qx
