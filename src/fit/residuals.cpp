#include "fit/residuals.h"

#include "frame/constants.h"
#include "stats/basic.h"

namespace qx {

ErrorCode WeightedMSE(const DBL *y, const DBL *fit, const DBL *w, int32_t n, DBL *mse) {
    if (n < 1)
        return ErrEmptyInput;
    SquaredResiduals squares(w);
    for (int32_t i = 0; i < n; ++i)
        squares.add(i, y[i], fit[i]);
    *mse = squares.mean(n);
    return 0;
}

ErrorCode GoodnessOfFit(const DBL *y, const DBL *fit, const DBL *w, int32_t n, int32_t dof,
                        DBL *sse, DBL *rSquare, DBL *rmse) {
    if (n < 2)
        return ErrFewerThanTwo;
    if (n <= dof)
        return ErrTooFewForParameters;
    double mean;
    ArrayMean(y, n, &mean);
    double residuals = 0.0, total = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        const double residual = y[i] * y[i] + (fit[i] - 2.0 * y[i]) * fit[i];
        const double deviation = (y[i] - 2.0 * mean) * y[i];
        // kept: with the sign of the weight, unlike in the fits
        residuals += w == nullptr ? residual : w[i] * residual;
        total += w == nullptr ? deviation : w[i] * (deviation + mean * mean);
    }
    if (w == nullptr)
        total += n * (mean * mean);
    *sse = residuals;
    *rmse = std::sqrt(residuals / (dof <= 0 ? n - 2 : dof));
    if (total == 0.0)
        *rSquare = residuals == 0.0 ? 1.0 : kInfinity;
    else
        *rSquare = 1.0 - residuals / total;
    return 0;
}

} // namespace qx
