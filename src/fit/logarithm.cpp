#include "fit/logarithm.h"

#include "fit/line.h"
#include "fit/residuals.h"
#include "fit/weights.h"
#include "frame/scratch.h"

#include <cmath>

namespace qx {

LogBase::LogBase(double base)
    // kept: e is recognised by its first six digits
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

double SameSign(ConstRealVector x) {
    std::ptrdiff_t positive = 0, negative = 0;
    for (const double v : x) {
        positive += v > 0.0;
        negative += v < 0.0;
    }
    if (positive == x.size())
        return 1.0;
    return negative == x.size() ? -1.0 : 0.0;
}

ErrorCode FitLog(FitSamples samples, double base, DBL *p, const FitOutput &out) {
    if (base <= 0.0)
        return ErrNotStrictlyPositive;
    double largestWeight = 1.0;
    if (const ErrorCode failed = SettleWeights(&samples, 2, &largestWeight))
        return failed;
    const double sign = SameSign(samples.x);
    if (sign == 0.0)
        return ErrMixedSigns;
    const LogBase logarithm(base);
    Scratch<ElementType::DBL> t;
    if (const ErrorCode failed = t.allocate(samples.n()))
        return failed;
    for (int32_t i = 0; i < samples.n(); ++i)
        t[i] = logarithm.log(sign * samples.x[i]);
    const Line line = LineThrough({{t.data(), samples.n()}, samples.y, samples.w}, largestWeight);
    const double slope = line.slope;
    const double factor = slope == 0.0 ? sign : sign * logarithm.power(line.intercept / slope);
    EvaluateFit(samples, out,
                [&](int32_t i) { return slope * logarithm.log(factor * samples.x[i]); });
    p[0] = slope;
    p[1] = factor;
    return 0;
}

} // namespace qx
