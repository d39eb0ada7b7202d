#include "fit/bounded_fits.h"

#include "fit/bounded_frame.h"
#include "fit/models.h"
#include "fit/start_estimates.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// The properties that distinguish the models which are fitted by iteration.
struct SteppedModel {
    FitModel model;
    ErrorCode (*start)(const FitSamples &samples, DBL *p);
    int32_t mostInFirstPass;
    bool isOverLogarithm; // the model takes ln x, and x must be above 0
    int32_t divisor;      // the parameter that must not start at 0, or -1
};

// Starts each parameter at one of its bounds, or at 0 if it has none.
void StartAtBounds(const FitBounds &bounds, DBL *p) {
    for (std::ptrdiff_t i = 0; i < bounds.lower.size(); ++i) {
        const double lower = bounds.lower[i], upper = bounds.upper[i];
        p[i] = upper != kInfinity ? upper : lower != -kInfinity ? lower : 0.0;
    }
}

template <class Model>
class SteppedFit {
public:
    explicit SteppedFit(const SteppedModel &model) : model_(model) {}

    // Repeats the samples, which changes the sums only by a factor.
    ErrorCode pad(const BoundedFit &request, FitSamples *samples) {
        const auto [x, y, w] = request.samples;
        const int32_t given = request.samples.n(),
                      n = given * (given == 1 ? model_.model.count : 2);
        RealVector xs, ys, ws;
        if (const ErrorCode failed =
                copies_.take(Sized(xs, n), Sized(ys, n), Sized(ws, w.isEmpty() ? 0 : n)))
            return failed;
        for (int32_t i = 0; i < n; ++i) {
            xs[i] = x[i % given];
            ys[i] = y[i % given];
            if (!w.isEmpty())
                ws[i] = w[i % given];
        }
        *samples = {xs, ys, ws};
        return 0;
    }

    ErrorCode checkAbscissae(const FitSamples &) const { return 0; }

    ErrorCode fit(const BoundedFit &request, FitSamples samples) {
        if (model_.isOverLogarithm)
            if (const ErrorCode failed = takeLogarithms(&samples))
                return failed;
        if (const ErrorCode failed = findStart(request, samples))
            return failed;
        return iterate(request, samples);
    }

    double value(double x, const DBL *p) const { return Model::value(x, p, nullptr); }

private:
    // Replaces x, which must be above 0, by ln x.
    ErrorCode takeLogarithms(FitSamples *samples) {
        for (const double x : samples->x)
            if (x <= 0.0)
                return ErrNotStrictlyPositive;
        RealVector logarithms;
        if (const ErrorCode failed = logarithms_.take(Sized(logarithms, samples->n())))
            return failed;
        for (int32_t i = 0; i < samples->n(); ++i)
            logarithms[i] = std::log(samples->x[i]);
        samples->x = logarithms;
        return 0;
    }

    ErrorCode findStart(const BoundedFit &request, const FitSamples &samples) const {
        const int32_t count = model_.model.count;
        if (request.guess != nullptr)
            for (int32_t i = 0; i < count; ++i)
                request.p[i] = request.guess[i];
        else if (request.samples.n() < count)
            StartAtBounds(request.bounds, request.p);
        else if (const ErrorCode failed = model_.start(samples, request.p))
            return failed;
        const bool isUseless = model_.divisor >= 0 && request.p[model_.divisor] == 0.0;
        return isUseless ? ErrFitStartValues : 0;
    }

    // First without bounds by least squares, then within the bounds in the requested norm.
    ErrorCode iterate(const BoundedFit &request, const FitSamples &samples) const {
        const int32_t limit = *request.iterations;
        int32_t first = std::min(limit / 2, model_.mostInFirstPass);
        int32_t second = limit - first;
        // kept: a power law by least squares uses all iterations without bounds, and one within
        // them
        const bool allInFirst = model_.isOverLogarithm && request.method == leastSquares;
        if (allInFirst)
            first = limit;
        BoundedFit free = request;
        free.method = leastSquares;
        free.bounds = {};
        free.tolerance = std::sqrt(request.tolerance);
        if (const ErrorCode failed = pass(free, samples, &first))
            return failed;
        // If that result is out of bounds, one iteration would not find the best point within them.
        if (allInFirst)
            second = IsWithin(request.bounds, request.p) ? 0 : limit;
        if (const ErrorCode failed = pass(request, samples, &second))
            return failed;
        *request.iterations = StepsOfBoth(first, second);
        return 0;
    }

    ErrorCode pass(const BoundedFit &request, const FitSamples &samples,
                   int32_t *iterations) const {
        double lambda = 0.1;
        *iterations = std::max(*iterations, 1);
        const ErrorCode status =
            BoundedLM(model_.model, samples, request.method, request.bounds, request.p, iterations,
                      request.tolerance, &lambda, request.mse);
        return status == ErrIterationLimit ? 0 : status;
    }

    const SteppedModel model_;
    ScratchParts copies_, logarithms_;
};

} // namespace

ErrorCode FitBoundedExponential(const BoundedFit &request) {
    const SteppedModel model = {FitModelOf<ExponentialModel>(), StartExponential, 20, false, -1};
    return FitInFrame(request, SteppedFit<ExponentialModel>(model));
}

// A power of x is an exponential of ln x.
ErrorCode FitBoundedPower(const BoundedFit &request) {
    const SteppedModel model = {FitModelOf<ExponentialModel>(), StartExponential, 30, true, -1};
    return FitInFrame(request, SteppedFit<PowerModel>(model));
}

ErrorCode FitBoundedGaussian(const BoundedFit &request) {
    const SteppedModel model = {FitModelOf<GaussianModel>(), StartGaussian, 20, false, 2};
    const ErrorCode status = FitInFrame(request, SteppedFit<GaussianModel>(model));
    request.p[2] = std::fabs(request.p[2]);
    return status;
}

} // namespace qx
