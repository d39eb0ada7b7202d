#include "fit/line.h"

#include "fit/residuals.h"
#include "fit/weights.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// Products stand in arrays of their own, which the compiler vectorises.
LineSums WeightedSums(const DBL *x, const DBL *y, int32_t n, const DBL *w) {
    constexpr int32_t chunk = 64;
    const double largest = LargestWeight(w, n);
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

LineSums SumsOfLine(const DBL *x, const DBL *y, int32_t n, const DBL *w) {
    if (w != nullptr)
        return WeightedSums(x, y, n, w);
    LineSums sums = {};
    for (int32_t i = 0; i < n; ++i) {
        sums.x += x[i];
        sums.y += y[i];
        sums.xx += x[i] * x[i];
        sums.xy += x[i] * y[i];
    }
    sums.weight = n;
    return sums;
}

ErrorCode FitLine(const DBL *x, const DBL *y, int32_t n, const DBL *w, DBL *fit, DBL *slope,
                  DBL *intercept, DBL *mse) {
    if (const ErrorCode failed = SettleWeights(n, 2, &w))
        return failed;
    const LineSums s = SumsOfLine(x, y, n, w);
    const double determinant = s.x * s.x - s.xx * s.weight;
    const double a = (s.y * s.x - s.xy * s.weight) / determinant;
    // kept: two forms of the same number, which differ in their last bits
    const double b =
        w == nullptr ? (s.x * s.xy - s.xx * s.y) / determinant : (s.y - a * s.x) / s.weight;
    *slope = a;
    *intercept = b;
    if (fit == nullptr && mse == nullptr)
        return 0;
    SquaredResiduals squares(w);
    for (int32_t i = 0; i < n; ++i) {
        const double f = x[i] * a + b;
        squares.add(i, y[i], f);
        if (fit != nullptr)
            fit[i] = f;
    }
    if (mse != nullptr)
        *mse = squares.mean(n);
    return 0;
}

} // namespace qx
