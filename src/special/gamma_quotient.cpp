#include "special/gamma_quotient.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/gamma.h"
#include "special/reciprocal_gamma.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kDirectTo = 50; // the product of six gammas stays in range

bool IsPole(double x) { return x <= 0 && IsInteger(x); }

// ln |gamma(x)| away from poles, and the sign of gamma(x).
double LnGamma(double x, double &sign) {
    if (x > 0)
        return LnGammaFunction(x);
    const double sine = SinPi(x);
    if (sine < 0)
        sign = -sign;
    return std::log(kPi / std::fabs(sine)) - LnGammaFunction(1 - x);
}

} // namespace

double GammaQuotient(std::initializer_list<double> numerators,
                     std::initializer_list<double> denominators, double scale) {
    bool direct = std::fabs(scale) <= 600;
    for (const double x : numerators) {
        if (IsPole(x) || std::isnan(x))
            return kNaN;
        direct = direct && std::fabs(x) <= kDirectTo;
    }
    for (const double x : denominators) {
        if (IsPole(x))
            return 0;
        direct = direct && std::fabs(x) <= kDirectTo;
    }
    if (direct) {
        double quotient = scale == 0 ? 1.0 : std::exp(scale);
        for (const double x : numerators)
            quotient *= GammaFunction(x);
        for (const double x : denominators)
            quotient *= ReciprocalGamma(x);
        if (std::isfinite(quotient) && quotient != 0)
            return quotient;
    }
    double sign = 1;
    double logarithm = scale;
    for (const double x : numerators)
        logarithm += LnGamma(x, sign);
    for (const double x : denominators)
        logarithm -= LnGamma(x, sign);
    return sign * std::exp(logarithm);
}

} // namespace qx
