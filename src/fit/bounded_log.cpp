#include "fit/bounded_frame.h"
#include "fit/logarithm.h"
#include "fit/models.h"
#include "frame/scratch.h"

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

class LogFit {
public:
    explicit LogFit(double base) : base_(base), constants_(base) {}

    // Adds a second sample at twice the abscissa, on the curve that the first sample and the fixed
    // parameter determine.
    ErrorCode pad(const BoundedFit &request, FitSamples *samples) {
        const FitBounds &bounds = request.bounds;
        const double x0 = samples->x[0], y0 = samples->y[0];
        double y1;
        if (bounds.lower[0] == bounds.upper[0]) {
            y1 = y0 + bounds.upper[0] * constants_.base.log(2.0);
        } else {
            const double v = x0 * bounds.upper[1];
            if (v <= 0.0)
                return ErrNonFiniteInput;
            y1 = v == 1.0 ? 1.0 + y0 : (std::log(2.0) / std::log(v) + 1.0) * y0;
        }
        *samples = two_.make(*samples, 2.0 * x0, y1);
        return 0;
    }

    ErrorCode checkAbscissae(const FitSamples &samples) const {
        for (const double x : samples.x)
            if (x <= 0.0)
                return ErrMixedSigns;
        return 0;
    }

    ErrorCode fit(const BoundedFit &request, const FitSamples &samples) const {
        int32_t first = *request.iterations, second = std::max(first, 1);
        if (const ErrorCode failed = fitFree(request, samples, &first))
            return failed;
        if (IsWithin(request.bounds, request.p)) {
            second = 0;
        } else {
            double lambda = 1.0;
            const ErrorCode status = BoundedLM(FitModelOf<LogModel>(&constants_), samples,
                                               request.method, request.bounds, request.p, &second,
                                               request.tolerance, &lambda, request.mse);
            if (status != 0 && status != ErrIterationLimit)
                return status;
        }
        *request.iterations = StepsOfBoth(first, second);
        return 0;
    }

    double value(double x, const DBL *p) const { return LogModel::value(x, p, &constants_); }

private:
    // Fits without bounds; *iterations is the limit on entry and the count on return.
    ErrorCode fitFree(const BoundedFit &request, const FitSamples &samples,
                      int32_t *iterations) const {
        if (request.method != leastSquares)
            return fitRobustly(request, samples, iterations);
        *iterations = 0;
        return FitLog(samples, base_, request.p, {{}, request.mse});
    }

    // The logarithm in a robust norm is a line over the logarithms of x.
    ErrorCode fitRobustly(const BoundedFit &request, const FitSamples &samples,
                          int32_t *iterations) const {
        if (base_ <= 0.0)
            return ErrNotStrictlyPositive;
        const LogBase &logarithm = constants_.base;
        Scratch<ElementType::DBL> t;
        if (const ErrorCode failed = t.allocate(samples.n()))
            return failed;
        for (int32_t i = 0; i < samples.n(); ++i)
            t[i] = logarithm.log(samples.x[i]);
        const DBL lowest[2] = {-kInfinity, -kInfinity}, highest[2] = {kInfinity, kInfinity};
        BoundedFit line = request;
        line.samples = {{t.data(), samples.n()}, samples.y, samples.w};
        line.bounds = {{lowest, 2}, {highest, 2}};
        line.iterations = iterations;
        const ErrorCode status = FitLineRobustly(line);
        DBL *const p = request.p;
        p[1] = p[0] == 0.0 ? 1.0 : logarithm.power(p[1] / p[0]);
        return status == ErrIterationLimit ? 0 : status;
    }

    const double base_;
    const LogConstants constants_;
    TwoSamples two_;
};

} // namespace

ErrorCode FitBoundedLog(const BoundedFit &request, double base) {
    return FitInFrame(request, LogFit(base));
}

} // namespace qx
