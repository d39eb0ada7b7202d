#include "special/error_function.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/tables/error_function.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kFarFrom = 8;

// exp(-x^2) with the square in two doubles: the exponential multiplies its rounding error by x^2.
double ExpOfMinusSquare(double x) {
    const Extended square = ExactProduct(x, x);
    return std::exp(-square.high) * (1 - square.low);
}

} // namespace

double Erf(double x) { return std::fabs(x) > 1 ? 1 - ErfC(x) : x * table::erfSmall(x * x); }

double ErfC(double x) {
    const double a = std::fabs(x);
    if (a < 1)
        return 1 - Erf(x);
    if (-x * x < -kLogOfLargest)
        return x < 0 ? 2.0 : 0.0;
    const double y = ExpOfMinusSquare(a) * (a < kFarFrom ? table::erfcMid(a) : table::erfcFar(a));
    return x < 0 ? 2 - y : y;
}

} // namespace qx
