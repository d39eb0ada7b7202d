#include "fit/line.h"

#include "fit/residuals.h"
#include "fit/weights.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// Products stand in arrays of their own, which the compiler vectorises.
LineSums WeightedSums(const FitSamples &samples) {
    constexpr int32_t chunk = 64;
    const auto &[x, y, w] = samples;
    const int32_t n = samples.n();
    const double largest = LargestWeight(w.data(), n);
    LineSums sums = {};
    double v[chunk], vx[chunk], vy[chunk], vxy[chunk], vxx[chunk];
    for (int32_t from = 0; from < n; from += chunk) {
        const int32_t count = std::min(chunk, n - from);
        for (int32_t i = 0; i < count; ++i) {
            v[i] = std::fabs(w[from + i]) / largest;
            vx[i] = v[i] * x[from + i];
            vy[i] = v[i] * y[from + i];
            vxy[i] = vx[i] * y[from + i];
            vxx[i] = vx[i] * x[from + i];
        }
        for (int32_t i = 0; i < count; ++i) {
            sums.weight += v[i];
            sums.x += vx[i];
            sums.y += vy[i];
            sums.xy += vxy[i];
            sums.xx += vxx[i];
        }
    }
    return sums;
}

} // namespace

LineSums SumsOfLine(const FitSamples &samples) {
    if (!samples.w.isEmpty())
        return WeightedSums(samples);
    const DBL *const x = samples.x.data(), *const y = samples.y.data();
    LineSums sums = {};
    for (int32_t i = 0; i < samples.n(); ++i) {
        sums.x += x[i];
        sums.y += y[i];
        sums.xx += x[i] * x[i];
        sums.xy += x[i] * y[i];
    }
    sums.weight = samples.n();
    return sums;
}

Line LineThrough(const FitSamples &samples) {
    const LineSums s = SumsOfLine(samples);
    const double determinant = s.x * s.x - s.xx * s.weight;
    const double a = (s.y * s.x - s.xy * s.weight) / determinant;
    // kept: two forms of the same number, which differ in their last bits
    const double b =
        samples.w.isEmpty() ? (s.x * s.xy - s.xx * s.y) / determinant : (s.y - a * s.x) / s.weight;
    return {a, b};
}

ErrorCode FitLine(FitSamples samples, Line *line, const FitOutput &out) {
    if (const ErrorCode failed = SettleWeights(&samples, 2))
        return failed;
    const Line found = LineThrough(samples);
    EvaluateFit(samples, out, [&](int32_t i) { return found.at(samples.x[i]); });
    *line = found;
    return 0;
}

} // namespace qx
