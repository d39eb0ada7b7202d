#ifndef QX_FIT_BOUNDED_FRAME_H
#define QX_FIT_BOUNDED_FRAME_H

#include "fit/bounded_fits.h"
#include "fit/weights.h"

#include <algorithm>

namespace qx {

// The number of steps of two passes, at most the largest int32_t.
inline int32_t StepsOfBoth(int32_t first, int32_t second) {
    return static_cast<int32_t>(
        std::min(int64_t{first} + second, int64_t{std::numeric_limits<int32_t>::max()}));
}

inline int32_t FreeParameters(const FitBounds &bounds) {
    int32_t free = 0;
    for (std::ptrdiff_t i = 0; i < bounds.lower.size(); ++i)
        free += bounds.lower[i] != bounds.upper[i];
    return free;
}

inline bool IsWithin(const FitBounds &bounds, const DBL *p) {
    for (std::ptrdiff_t i = 0; i < bounds.lower.size(); ++i)
        if (!(p[i] >= bounds.lower[i] && p[i] <= bounds.upper[i]))
            return false;
    return true;
}

// One sample and a second one of the same weight.
struct TwoSamples {
    DBL x[2], y[2], w[2];
    FitSamples make(const FitSamples &one, double secondX, double secondY) {
        x[0] = one.x[0];
        y[0] = one.y[0];
        x[1] = secondX;
        y[1] = secondY;
        w[0] = w[1] = one.w.isEmpty() ? 1.0 : one.w[0];
        return {{x, 2}, {y, 2}, {w, one.w.isEmpty() ? 0 : 2}};
    }
};

// The frame of every bounded fit around the model's own method. A model has
//     pad(request, &samples)          samples for a request that has fewer than parameters
//     checkAbscissae(samples)         the codes that come before those of the weights
//     fit(request, samples)           p, *mse and *iterations from the samples with settled weights
//     value(x, p)
template <class Model>
ErrorCode FitInFrame(BoundedFit request, Model &&model) {
    const auto count = static_cast<int32_t>(request.bounds.lower.size());
    const int32_t n = request.samples.n();
    if (n < FreeParameters(request.bounds))
        return ErrFitPointsTooFew;
    if (n == 0) { // no parameter is free
        for (int32_t i = 0; i < count; ++i)
            request.p[i] = request.bounds.upper[i];
        *request.mse = 0.0;
        *request.iterations = 0;
        return 0;
    }
    FitSamples samples = request.samples;
    if (n < count)
        if (const ErrorCode failed = model.pad(request, &samples))
            return failed;
    request.tolerance = ToleranceOrDefault(request.tolerance);
    if (request.method < leastSquares || request.method > bisquare)
        return ErrInvalidSelector;
    if (const ErrorCode failed = model.checkAbscissae(samples))
        return failed;
    if (const ErrorCode failed = SettleFiniteWeights(&samples, count))
        return failed;
    const ErrorCode status = model.fit(request, samples);
    if (status != 0 && status != ErrIterationLimit)
        return status;
    for (int32_t i = 0; i < n; ++i)
        request.values[i] = model.value(request.samples.x[i], request.p);
    return status;
}

} // namespace qx

#endif
