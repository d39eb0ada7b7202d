#include "special/dilogarithm.h"

#include "frame/constants.h"
#include "special/tables/dilogarithm.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kPiSquareOver6 = 1.6449340668482264;

} // namespace

double Dilogarithm(double x) {
    if (!(x >= 0))
        return kNaN;
    if (x == 1)
        return 0;
    if (x == 0)
        return kPiSquareOver6;
    if (x == kInfinity)
        return -kInfinity;

    const bool isInverted = x > 1.5;
    const double argument = x;
    double w;
    if (x > 2)
        x = 1 / x;
    const bool isReflected = x < 0.5;
    if (x > 1.5)
        w = 1 / x - 1;
    else
        w = isReflected ? -x : x - 1;
    double y = -w * table::dilogarithm(w);
    if (isReflected)
        y = kPiSquareOver6 - std::log(x) * std::log1p(-x) - y;
    if (isInverted) {
        const double logarithm = std::log(argument);
        y = -0.5 * logarithm * logarithm - y;
    }
    return y;
}

} // namespace qx
