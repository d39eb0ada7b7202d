#include "special/trigonometric_integrals.h"

#include "frame/constants.h"
#include "special/tables/trigonometric_integrals.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kSmallTo = 4;
constexpr double kFarFrom = 8;

struct Auxiliary {
    double f, g;
};

Auxiliary AuxiliaryFunctions(double x) { // x > 4
    const double z = 1 / (x * x);
    if (x < kFarFrom)
        return {table::auxiliaryFMid(z) / x, z * table::auxiliaryGMid(z)};
    return {table::auxiliaryFFar(z) / x, z * table::auxiliaryGFar(z)};
}

} // namespace

double SineIntegral(double x) {
    const double a = std::fabs(x);
    if (a <= kSmallTo)
        return x * table::sineIntegralSmall(x * x);
    if (a == kInfinity)
        return std::copysign(kHalfPi, x);
    const Auxiliary v = AuxiliaryFunctions(a);
    return std::copysign(kHalfPi - v.f * std::cos(a) - v.g * std::sin(a), x);
}

double CosineIntegral(double x) {
    const double a = std::fabs(x);
    if (a == 0)
        return -kInfinity;
    if (a <= kSmallTo) {
        const double z = a * a;
        return std::log(a) + kEuler + z * table::cosineIntegralSmall(z);
    }
    if (a == kInfinity)
        return 0;
    const Auxiliary v = AuxiliaryFunctions(a);
    return v.f * std::sin(a) - v.g * std::cos(a);
}

} // namespace qx
