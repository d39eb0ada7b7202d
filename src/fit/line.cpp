#include "fit/line.h"

#include "fit/residuals.h"
#include "fit/weights.h"

#include <cmath>

namespace qx {

LineSums SumsOfLine(const DBL *x, const DBL *y, int32_t n, const DBL *w) {
    LineSums sums = {};
    if (w == nullptr) {
        for (int32_t i = 0; i < n; ++i) {
            sums.x += x[i];
            sums.y += y[i];
            sums.xx += x[i] * x[i];
            sums.xy += x[i] * y[i];
        }
        sums.weight = n;
        return sums;
    }
    double largest = 0.0;
    for (int32_t i = 0; i < n; ++i)
        largest = std::fabs(w[i]) > largest ? std::fabs(w[i]) : largest;
    for (int32_t i = 0; i < n; ++i) {
        const double v = std::fabs(w[i]) / largest;
        const double vx = v * x[i];
        sums.weight += v;
        sums.x += vx;
        sums.y += v * y[i];
        sums.xy += vx * y[i];
        sums.xx += vx * x[i];
    }
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
