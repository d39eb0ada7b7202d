#include "stats/distributions.h"

#include "frame/constants.h"
#include "special/gamma.h"

#include <cmath>

namespace qx {

namespace {

// NaN is not refused.
bool IsNoProbability(double p) { return p < 0.0 || p > 1.0; }

// A probability of 0 or 1 has a known quantile: the lower end of the range, or +infinity.
bool IsCertain(double p, double lowerEnd, DBL *quantile) {
    if (p != 0.0 && p != 1.0)
        return false;
    *quantile = p == 0.0 ? lowerEnd : kInfinity;
    return true;
}

// The point at which the distribution reaches p, from below, within 1e-4. For a NaN probability
// every point counts as reached, so the result is the lower end of the bracket.
// kept: the tolerance is absolute, whatever the scale of the result
template <class Distribution>
double Bisect(double p, double lo, double hi, Distribution distribution) {
    do {
        const double mid = (lo + hi) * 0.5;
        const bool isReached = std::isnan(p) || p <= distribution(mid);
        (isReached ? hi : lo) = mid;
    } while (std::fabs(hi - lo) > 0.0001);
    return lo;
}

} // namespace

ErrorCode NormalCDF(double x, DBL *p) {
    const double u = std::fabs(x);
    const double t = 1.0 / (1.0 + 0.33267 * u);
    const double tail =
        0.3989422 * std::exp(-0.5 * (u * u)) * (t * (t * (0.937298 * t - 0.1201676) + 0.4361836));
    *p = x < 0.0 ? tail : 1.0 - tail;
    return 0;
}

ErrorCode StudentCDF(double t, int32_t dof, DBL *p) {
    if (dof < 1)
        return ErrTooFewForParameters;
    if (std::isnan(t))
        return ErrNaNInData;
    const double u = std::fabs(t);
    const double tail = u == 0.0 ? 0.5 : 0.5 * IncompleteBeta(dof / 2.0, 0.5, dof / (u * u + dof));
    *p = t < 0.0 ? tail : 1.0 - tail;
    return 0;
}

ErrorCode FisherCDF(double f, int32_t n, int32_t d, DBL *p) {
    if (n < 1 || d < 1)
        return ErrTooFewForParameters;
    if (std::isnan(f))
        return ErrNaNInData;
    *p = f <= 0.0 ? 0.0 : 1.0 - IncompleteBeta(d / 2.0, n / 2.0, d / (f * n + d));
    return 0;
}

ErrorCode ChiSquareCDF(double x, int32_t dof, DBL *p) {
    if (dof < 0)
        return ErrTooFewForParameters;
    *p = x <= 0.0 ? 0.0 : IncompleteGammaP(0.5 * dof, 0.5 * x);
    return 0;
}

ErrorCode NormalQuantile(double p, DBL *x) {
    if (IsNoProbability(p))
        return ErrProbabilityOutOfRange;
    if (IsCertain(p, -kInfinity, x))
        return 0;
    const auto ratio = [](double u) {
        return ((0.010328 * u + 0.802853) * u + 2.515517) /
               (((0.001308 * u + 0.189269) * u + 1.432788) * u + 1.0);
    };
    if (p >= 0.5) {
        const double u = std::sqrt(-2.0 * std::log(1.0 - p));
        *x = u - ratio(u);
    } else {
        const double u = std::sqrt(-2.0 * std::log(p));
        *x = ratio(u) - u;
    }
    return 0;
}

ErrorCode StudentQuantile(double p, int32_t dof, DBL *t) {
    if (dof < 1)
        return ErrTooFewForParameters;
    if (IsNoProbability(p))
        return ErrProbabilityOutOfRange;
    if (IsCertain(p, -kInfinity, t))
        return 0;
    *t = Bisect(p, -10000.0, 10000.0, [dof](double mid) {
        double value = 0.0;
        StudentCDF(mid, dof, &value);
        return value;
    });
    return 0;
}

ErrorCode FisherQuantile(double p, int32_t n, int32_t d, DBL *f) {
    if (n < 1 || d < 1)
        return ErrTooFewForParameters;
    if (IsNoProbability(p))
        return ErrProbabilityOutOfRange;
    if (IsCertain(p, 0.0, f))
        return 0;
    *f = Bisect(p, 1e-06, 10000.0, [n, d](double mid) {
        double value = 0.0;
        FisherCDF(mid, n, d, &value);
        return value;
    });
    return 0;
}

ErrorCode ChiSquareQuantile(double p, int32_t dof, DBL *x) {
    // kept: here the probability is tested before the degrees of freedom
    if (IsNoProbability(p))
        return ErrProbabilityOutOfRange;
    if (dof < 1)
        return ErrTooFewForParameters;
    if (IsCertain(p, 0.0, x))
        return 0;
    const auto distribution = [dof](double mid) {
        double value = 0.0;
        ChiSquareCDF(mid, dof, &value);
        return value;
    };
    double hi = 5000.0;
    while (p > distribution(hi))
        hi += 5000.0;
    *x = Bisect(p, 0.0, hi, distribution);
    return 0;
}

} // namespace qx
