#include "special/zeta.h"

#include "special/extended.h"
#include "special/reciprocal_gamma.h"
#include "special/tables/zeta.h"

#include <cmath>
#include <limits>

namespace qx {

double Zeta(double x) {
    constexpr double infinity = std::numeric_limits<double>::infinity();
    constexpr double nan = std::numeric_limits<double>::quiet_NaN();
    constexpr double pi = 3.141592653589793;
    if (x == infinity)
        return infinity; // kept: results are compared across revisions; the limit is 1
    if (std::isnan(x) || x < -30.8148)
        return nan;
    if (x < 0) {
        // (2 pi)^x sin(pi x / 2) gamma(s) zeta(s) / pi, s = 1 - x
        const double s = 1 - x;
        if (s == 1)
            return -0.5;
        const double pole = (s - 1) / -x; // what s has rounded away counts next to the pole only
        return Zeta(s) * pole * std::pow(2 * pi, x) * SinPi(0.5 * x) / (ReciprocalGamma(s) * pi);
    }
    if (x >= 127)
        return 1;
    if (x == 1)
        return infinity;
    if (x < 31 && IsInteger(x))
        return 1 + table::zetaIntegersLessOne[static_cast<int>(x)];
    if (x < 1)
        return 1 + table::zetaLow(x) / (1 - x);
    const double power = std::exp2(-x);
    if (x <= 10)
        return 1 + x * power * table::zetaMid(1 / x) / (x - 1);
    if (x <= 50)
        return 1 + power + std::exp(table::zetaHigh(x - 30));
    double sum = 1;
    for (double n = 3; n < 100; n += 2) { // one term is enough: 3^-50 is 1e-24
        const double term = std::pow(n, -x);
        sum += term;
        if (term <= 2.220446049250313e-16 * sum)
            break;
    }
    return sum / (1 - power);
}

} // namespace qx
