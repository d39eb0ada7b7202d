#include "fit/residuals.h"

#include "frame/constants.h"
#include "stats/basic.h"

namespace qx {

ErrorCode GoodnessOfFit(ConstRealVector y, ConstRealVector fit, ConstRealVector w, int32_t dof,
                        FitScores *scores) {
    const auto n = static_cast<int32_t>(y.size());
    if (n < 2)
        return ErrFewerThanTwo;
    if (n <= dof)
        return ErrTooFewForParameters;
    double mean;
    ArrayMean(y, &mean);
    double residuals = 0.0, total = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        const double residual = y[i] * y[i] + (fit[i] - 2.0 * y[i]) * fit[i];
        const double deviation = (y[i] - 2.0 * mean) * y[i];
        // kept: weighted with its sign, unlike in the fits
        residuals += w.isEmpty() ? residual : w[i] * residual;
        total += w.isEmpty() ? deviation : w[i] * (deviation + mean * mean);
    }
    if (w.isEmpty())
        total += n * (mean * mean);
    const double rSquare = total != 0.0       ? 1.0 - residuals / total
                           : residuals == 0.0 ? 1.0
                                              : kInfinity;
    *scores = {residuals, rSquare, std::sqrt(residuals / (dof <= 0 ? n - 2 : dof))};
    return 0;
}

} // namespace qx
