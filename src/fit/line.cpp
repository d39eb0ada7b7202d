#include "fit/line.h"

#include "fit/residuals.h"
#include "fit/weights.h"

namespace qx {

namespace {

LineSums WeightedSums(const FitSamples &samples, double largestWeight) {
    const auto &[x, y, w] = samples;
    LineSums sums;
    WeightedLineSums(x.data(), y.data(), w.data(), samples.n(), largestWeight, &sums);
    return sums;
}

} // namespace

LineSums SumsOfLine(const FitSamples &samples) {
    const bool isWeighted = !samples.w.isEmpty();
    return SumsOfLine(samples, isWeighted ? LargestWeight(samples.w.data(), samples.n()) : 1.0);
}

LineSums SumsOfLine(const FitSamples &samples, double largestWeight) {
    if (!samples.w.isEmpty())
        return WeightedSums(samples, largestWeight);
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

Line LineThrough(const FitSamples &samples, double largestWeight) {
    const LineSums s = SumsOfLine(samples, largestWeight);
    const double determinant = s.x * s.x - s.xx * s.weight;
    const double a = (s.y * s.x - s.xy * s.weight) / determinant;
    // kept: two forms of the same number, which differ in the last bits
    const double b =
        samples.w.isEmpty() ? (s.x * s.xy - s.xx * s.y) / determinant : (s.y - a * s.x) / s.weight;
    return {a, b};
}

ErrorCode FitLine(FitSamples samples, Line *line, const FitOutput &out) {
    double largestWeight = 1.0;
    if (const ErrorCode failed = SettleWeights(&samples, 2, &largestWeight))
        return failed;
    const Line found = LineThrough(samples, largestWeight);
    EvaluateFit(samples, out, [&](int32_t i) { return found.at(samples.x[i]); });
    *line = found;
    return 0;
}

} // namespace qx
