#include "fit/bounded_fits.h"

#include "fit/models.h"
#include "fit/start_estimates.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {

int32_t FreeParameters(const FitBounds &bounds, int32_t count) {
    int32_t free = 0;
    for (int32_t i = 0; i < count; ++i)
        free += bounds.lower[i] != bounds.upper[i];
    return free;
}

bool IsWithin(const FitBounds &bounds, const DBL *p, int32_t count) {
    for (int32_t i = 0; i < count; ++i)
        if (!(p[i] >= bounds.lower[i] && p[i] <= bounds.upper[i]))
            return false;
    return true;
}

void TakeUpperBounds(const BoundedFit &request, int32_t count) {
    for (int32_t i = 0; i < count; ++i)
        request.p[i] = request.bounds.upper[i];
    *request.mse = 0.0;
    *request.iterations = 0;
}

namespace {

// What sets a model apart from the others that go through the same frame.
struct ModelFrame {
    FitModel model;
    ErrorCode (*start)(const FitSamples &samples, DBL *p);
    int32_t mostInFirstPass;
    bool isOverLogarithm; // the model takes ln x, and x must be above 0
    int32_t divisor;      // the parameter that must not start at 0, or -1
};

// The samples, or copies of them where they are fewer than the parameters: no sum is moved by that
// but for a factor.
class EnoughSamples {
public:
    ErrorCode take(const FitSamples &samples, int32_t count) {
        samples_ = samples;
        isPadded_ = samples.n < count;
        if (!isPadded_)
            return 0;
        const int32_t copies = samples.n == 1 ? count : 2;
        const int32_t n = samples.n * copies;
        if (const ErrorCode failed = memory_.allocate(3 * int64_t{n}))
            return failed;
        DBL *const x = memory_.data(), *const y = x + n, *const w = y + n;
        for (int32_t i = 0; i < n; ++i) {
            x[i] = samples.x[i % samples.n];
            y[i] = samples.y[i % samples.n];
            w[i] = samples.w == nullptr ? 1.0 : samples.w[i % samples.n];
        }
        samples_ = {x, y, samples.w == nullptr ? nullptr : w, n};
        return 0;
    }
    bool isPadded() const { return isPadded_; }

    // ln x in place of x, which must be above 0.
    ErrorCode takeLogarithms() {
        for (int32_t i = 0; i < samples_.n; ++i)
            if (samples_.x[i] <= 0.0)
                return ErrNotStrictlyPositive;
        if (const ErrorCode failed = logarithms_.allocate(samples_.n))
            return failed;
        for (int32_t i = 0; i < samples_.n; ++i)
            logarithms_[i] = std::log(samples_.x[i]);
        samples_.x = logarithms_.data();
        return 0;
    }

    // Without weights where all are 0.
    ErrorCode settleWeights(int32_t fewest) {
        if (samples_.w == nullptr)
            return 0;
        if (CheckFinite(samples_.w, samples_.n) != 0)
            return ErrNonFiniteInput;
        int32_t used = 0;
        for (int32_t i = 0; i < samples_.n; ++i)
            used += samples_.w[i] != 0.0;
        if (used == 0)
            samples_.w = nullptr;
        return used > 0 && used < fewest ? ErrTooFewWeights : 0;
    }
    const FitSamples &samples() const { return samples_; }

private:
    FitSamples samples_ = {};
    bool isPadded_ = false;
    Scratch<ElementType::DBL> memory_, logarithms_;
};

// A bound, or 0 where there is none.
void StartAtBounds(const FitBounds &bounds, int32_t count, DBL *p) {
    for (int32_t i = 0; i < count; ++i) {
        const double lower = bounds.lower[i], upper = bounds.upper[i];
        p[i] = upper != kInfinity ? upper : lower != -kInfinity ? lower : 0.0;
    }
}

ErrorCode Start(const ModelFrame &frame, const BoundedFit &request, const EnoughSamples &samples) {
    const int32_t count = frame.model.count;
    if (request.guess != nullptr)
        for (int32_t i = 0; i < count; ++i)
            request.p[i] = request.guess[i];
    else if (samples.isPadded())
        StartAtBounds(request.bounds, count, request.p);
    else if (const ErrorCode failed = frame.start(samples.samples(), request.p))
        return failed;
    const bool isUseless = frame.divisor >= 0 && request.p[frame.divisor] == 0.0;
    return isUseless ? ErrFitStartValues : 0;
}

ErrorCode Pass(const ModelFrame &frame, const FitSamples &samples, int32_t method,
               const FitBounds &bounds, double tolerance, int32_t *iterations, DBL *p,
               double *mse) {
    double lambda = 0.1;
    *iterations = std::max(*iterations, 1);
    const ErrorCode status = BoundedLM(frame.model, samples, method, bounds, p, iterations,
                                       tolerance, &lambda, nullptr, mse);
    return status == ErrIterationLimit ? 0 : status;
}

// First without bounds by least squares, then within the bounds in the norm asked for.
ErrorCode Iterate(const ModelFrame &frame, const BoundedFit &request, const FitSamples &samples,
                  double tolerance) {
    const int32_t limit = *request.iterations;
    int32_t first = std::min(limit / 2, frame.mostInFirstPass);
    int32_t second = limit - first;
    // kept: a power law by least squares has all iterations without bounds, and one within them
    const bool allInFirst = frame.isOverLogarithm && request.method == leastSquares;
    if (allInFirst)
        first = limit;
    if (const ErrorCode failed = Pass(frame, samples, leastSquares, {nullptr, nullptr},
                                      std::sqrt(tolerance), &first, request.p, request.mse))
        return failed;
    // Where a bound cuts that answer off, one iteration would not find the best point within.
    if (allInFirst)
        second = IsWithin(request.bounds, request.p, frame.model.count) ? 0 : limit;
    if (const ErrorCode failed = Pass(frame, samples, request.method, request.bounds, tolerance,
                                      &second, request.p, request.mse))
        return failed;
    *request.iterations = StepsOfBoth(first, second);
    return 0;
}

ErrorCode FitInFrame(const ModelFrame &frame, const BoundedFit &request) {
    const int32_t n = request.samples.n, count = frame.model.count;
    if (n < FreeParameters(request.bounds, count))
        return ErrFitPointsTooFew;
    if (n == 0) {
        TakeUpperBounds(request, count);
        return 0;
    }
    EnoughSamples samples;
    if (const ErrorCode failed = samples.take(request.samples, count))
        return failed;
    const double tolerance = request.tolerance <= 0.0 ? 0.0001 : request.tolerance;
    if (request.method < leastSquares || request.method > bisquare)
        return ErrInvalidSelector;
    if (const ErrorCode failed = samples.settleWeights(count))
        return failed;
    if (frame.isOverLogarithm)
        if (const ErrorCode failed = samples.takeLogarithms())
            return failed;
    if (const ErrorCode failed = Start(frame, request, samples))
        return failed;
    if (const ErrorCode failed = Iterate(frame, request, samples.samples(), tolerance))
        return failed;
    return 0;
}

template <class Model>
void Evaluate(const BoundedFit &request) {
    for (int32_t i = 0; i < request.samples.n; ++i)
        request.fit[i] = Model::value(request.samples.x[i], request.p, nullptr);
}

} // namespace

ErrorCode FitBoundedExponential(const BoundedFit &request) {
    const ErrorCode status =
        FitInFrame({FitModelOf<ExponentialModel>(), StartExponential, 20, false, -1}, request);
    if (status == 0)
        Evaluate<ExponentialModel>(request);
    return status;
}

// A power of x is an exponential of ln x.
ErrorCode FitBoundedPower(const BoundedFit &request) {
    const ErrorCode status =
        FitInFrame({FitModelOf<ExponentialModel>(), StartExponential, 30, true, -1}, request);
    if (status == 0)
        Evaluate<PowerModel>(request);
    return status;
}

ErrorCode FitBoundedGaussian(const BoundedFit &request) {
    const ErrorCode status =
        FitInFrame({FitModelOf<GaussianModel>(), StartGaussian, 20, false, 2}, request);
    request.p[2] = std::fabs(request.p[2]);
    if (status == 0)
        Evaluate<GaussianModel>(request);
    return status;
}

} // namespace qx
