#include "special/reciprocal_gamma.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/tables/reciprocal_gamma.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kELow = 1.4456468917292502e-16;
constexpr double kStirlingFrom = 20;

// ln gamma(v) - ((v - 1/2) ln v - v + ln sqrt(2 pi)) for v >= 20, to full precision.
double StirlingCorrection(double v) {
    constexpr double c[] = {1.0 / 12,   -1.0 / 360,      1.0 / 1260, -1.0 / 1680,
                            1.0 / 1188, -691.0 / 360360, 1.0 / 156};
    const double z = 1 / (v * v);
    return Horner(c, z) / v;
}

// (e y / v)^v / sqrt(2 pi v). The quotient is raised to the power in two parts, because the power
// multiplies its rounding error by v.
double StirlingPower(double y, double v) {
    const Extended base = Extended{kE, kELow} * Extended{y, 0} / Extended{v, 0};
    if (!(base.high > 0) || std::isinf(base.high))
        return base.high > 0 ? base.high : 0.0;
    const double power = std::pow(base.high, v) * (1 + v * (base.low / base.high));
    return power / std::sqrt(2 * kPi * v) * std::exp(-StirlingCorrection(v));
}

} // namespace

double ReciprocalGamma(double x) {
    if (std::isnan(x))
        return x;
    if (x <= 0 && IsInteger(x))
        return 0;
    if (x >= kStirlingFrom) // v / gamma(v + 1), v = x
        return x > 200 ? 0.0 : StirlingPower(1, x) * x;
    if (x < -kStirlingFrom) { // reflection
        const double rest = x < -200 ? 0.0 : StirlingPower(1, -x);
        return SinPi(x) / (kPi * rest);
    }
    double product = 1;
    double y = x;
    for (; y >= 3; y -= 1)
        product *= y - 1;
    double divisor = 1;
    for (; y < 2; y += 1)
        divisor *= y;
    return divisor / (product * table::gammaTwoToThree(y));
}

double PowerOverGamma(double y, double order) {
    if (order >= kStirlingFrom)
        return StirlingPower(y, order);
    if (order <=
        -kStirlingFrom) { // by reflection, 1 / gamma(1 - a) = gamma(a + 1) sin(pi a) / (pi a)
        const double sine = SinPi(-order);
        return sine == 0 ? 0.0 : sine / (-kPi * order) / StirlingPower(y, -order);
    }
    return std::pow(y, order) * ReciprocalGamma(order + 1);
}

} // namespace qx
