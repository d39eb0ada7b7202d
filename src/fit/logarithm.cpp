#include "fit/logarithm.h"

#include "fit/line.h"
#include "fit/residuals.h"
#include "fit/weights.h"
#include "frame/scratch.h"

#include <cmath>

namespace qx {

LogBase::LogBase(double base)
    // kept: e is told by its first six digits
    : kind_(base == 2.71828 ? Kind::Natural
            : base == 10.0  ? Kind::Common
                            : Kind::Other),
      base_(base), logOfBase_(std::log(base)) {}

double LogBase::log(double v) const {
    switch (kind_) {
    case Kind::Natural:
        return std::log(v);
    case Kind::Common:
        return std::log10(v);
    default:
        return std::log(v) / logOfBase_;
    }
}

double LogBase::power(double exponent) const {
    return kind_ == Kind::Natural ? std::exp(exponent) : std::pow(base_, exponent);
}

double SameSign(const DBL *x, int32_t n) {
    int32_t positive = 0, negative = 0;
    for (int32_t i = 0; i < n; ++i) {
        positive += x[i] > 0.0;
        negative += x[i] < 0.0;
    }
    if (positive == n)
        return 1.0;
    return negative == n ? -1.0 : 0.0;
}

ErrorCode FitLog(const DBL *x, const DBL *y, const DBL *w, int32_t n, DBL *fit, double base, DBL *a,
                 DBL *b, DBL *mse) {
    if (base <= 0.0)
        return ErrNotStrictlyPositive;
    if (const ErrorCode failed = SettleWeights(n, 2, &w))
        return failed;
    const double sign = SameSign(x, n);
    if (sign == 0.0)
        return ErrMixedSigns;
    const LogBase logarithm(base);
    Scratch<ElementType::DBL> t;
    if (const ErrorCode failed = t.allocate(n))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        t[i] = logarithm.log(sign * x[i]);
    DBL slope, intercept;
    if (const ErrorCode failed = FitLine(t.data(), y, n, w, nullptr, &slope, &intercept, nullptr))
        return failed;
    *a = slope;
    *b = slope == 0.0 ? sign : sign * logarithm.power(intercept / slope);
    if (fit == nullptr && mse == nullptr)
        return 0;
    const double factor = *b;
    SquaredResiduals squares(w);
    for (int32_t i = 0; i < n; ++i) {
        const double f = slope * logarithm.log(factor * x[i]);
        squares.add(i, y[i], f);
        if (fit != nullptr)
            fit[i] = f;
    }
    if (mse != nullptr)
        *mse = squares.mean(n);
    return 0;
}

} // namespace qx
