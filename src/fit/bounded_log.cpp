#include "fit/bounded_fits.h"
#include "fit/logarithm.h"
#include "fit/models.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

struct LogConstants {
    LogBase base;
    double ofE; // the logarithm of e
    explicit LogConstants(double number) : base(number), ofE(base.log(kE)) {}
};

// a log_base(b x)
struct LogModel {
    static constexpr int32_t count = 2;
    static const LogConstants &Of(const void *user) {
        return *static_cast<const LogConstants *>(user);
    }
    static double value(double x, const DBL *p, const void *user) {
        return p[0] * Of(user).base.log(p[1] * x);
    }
    static double evaluate(double x, const DBL *p, const void *user, double *d) {
        d[0] = Of(user).base.log(p[1] * x);
        d[1] = p[0] * Of(user).ofE / p[1];
        return p[0] * d[0];
    }
};

// One sample, and a second one at twice the abscissa that the fixed parameter puts beside it.
struct TwoSamples {
    DBL x[2], y[2], w[2];
    ErrorCode make(const FitSamples &samples, const FitBounds &bounds, const LogBase &base,
                   FitSamples *made) {
        const double y0 = samples.y[0];
        x[0] = samples.x[0];
        x[1] = 2.0 * x[0];
        y[0] = y0;
        w[0] = w[1] = samples.w == nullptr ? 1.0 : samples.w[0];
        *made = {x, y, samples.w == nullptr ? nullptr : w, 2};
        if (bounds.lower[0] == bounds.upper[0]) {
            y[1] = y0 + bounds.upper[0] * base.log(2.0);
            return 0;
        }
        const double v = x[0] * bounds.upper[1];
        if (v <= 0.0)
            return ErrNonFiniteInput;
        y[1] = v == 1.0 ? 1.0 + y0 : (std::log(2.0) / std::log(v) + 1.0) * y0;
        return 0;
    }
};

ErrorCode SettleLogWeights(FitSamples &samples) {
    if (samples.w == nullptr)
        return 0;
    if (CheckFinite(samples.w, samples.n) != 0)
        return ErrNonFiniteInput;
    int32_t zeros = 0;
    for (int32_t i = 0; i < samples.n; ++i)
        zeros += samples.w[i] == 0.0;
    if (zeros == samples.n)
        samples.w = nullptr;
    return zeros < samples.n && zeros > samples.n - 2 ? ErrTooFewWeights : 0;
}

// The logarithm in a robust norm is a line over the logarithms of x.
ErrorCode FitLogRobustly(const FitSamples &samples, double base, int32_t method, double tolerance,
                         int32_t *iterations, DBL *p, double *norm) {
    if (base <= 0.0)
        return ErrNotStrictlyPositive;
    const LogBase logarithm(base);
    Scratch<ElementType::DBL> t;
    if (const ErrorCode failed = t.allocate(samples.n))
        return failed;
    for (int32_t i = 0; i < samples.n; ++i)
        t[i] = logarithm.log(samples.x[i]);
    const DBL lowest[2] = {-kInfinity, -kInfinity}, highest[2] = {kInfinity, kInfinity};
    const ErrorCode status =
        FitLineRobustly({t.data(), samples.y, samples.w, samples.n}, {lowest, highest}, method,
                        tolerance, iterations, p, norm);
    p[1] = p[0] == 0.0 ? 1.0 : logarithm.power(p[1] / p[0]);
    return status == ErrIterationLimit ? 0 : status;
}

// Without bounds; *iterations is the limit, and then the count.
ErrorCode FitFreeLog(const BoundedFit &request, const FitSamples &samples, double base,
                     double tolerance, int32_t *iterations) {
    if (request.method != leastSquares)
        return FitLogRobustly(samples, base, request.method, tolerance, iterations, request.p,
                              request.mse);
    *iterations = 0;
    return FitLog(samples.x, samples.y, samples.w, samples.n, nullptr, base, &request.p[0],
                  &request.p[1], request.mse);
}

} // namespace

ErrorCode FitBoundedLog(const BoundedFit &request, double base) {
    if (request.samples.n < FreeParameters(request.bounds, 2))
        return ErrFitPointsTooFew;
    if (request.samples.n == 0) {
        TakeUpperBounds(request, 2);
        return 0;
    }
    const LogConstants constants(base);
    TwoSamples two;
    FitSamples samples = request.samples;
    if (samples.n == 1)
        if (const ErrorCode failed =
                two.make(request.samples, request.bounds, constants.base, &samples))
            return failed;
    const double tolerance = request.tolerance <= 0.0 ? 0.0001 : request.tolerance;
    if (request.method < leastSquares || request.method > bisquare)
        return ErrInvalidSelector;
    for (int32_t i = 0; i < samples.n; ++i)
        if (samples.x[i] <= 0.0)
            return ErrMixedSigns;
    if (const ErrorCode failed = SettleLogWeights(samples))
        return failed;

    int32_t first = *request.iterations, second = std::max(first, 1);
    if (const ErrorCode failed = FitFreeLog(request, samples, base, tolerance, &first))
        return failed;
    if (IsWithin(request.bounds, request.p, 2)) {
        second = 0;
    } else {
        double lambda = 1.0;
        const ErrorCode status =
            BoundedLM(FitModelOf<LogModel>(&constants), samples, request.method, request.bounds,
                      request.p, &second, tolerance, &lambda, nullptr, request.mse);
        if (status != 0 && status != ErrIterationLimit)
            return status;
    }
    *request.iterations = StepsOfBoth(first, second);
    for (int32_t i = 0; i < request.samples.n; ++i)
        request.fit[i] = LogModel::value(request.samples.x[i], request.p, &constants);
    return 0;
}

} // namespace qx
