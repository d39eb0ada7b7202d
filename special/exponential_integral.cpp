#include "special/exponential_integral.h"

#include "stats/gamma.h"

#include <cmath>
#include <limits>

namespace qx {

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kEps = 2.220446049250313e-16;
constexpr double kEuler = 0.5772156649015329;
constexpr double kBig = 1.4411518807585587e+17;       // 2^57
constexpr double kInverseBig = 6.938893903907228e-18; // 2^-57
constexpr double kLogOfLargest = 709.782712893384;
constexpr int32_t kLargeOrder = 5001;
constexpr int32_t kWithoutLogarithm = 170; // (n - 1)! has left the range

double Expansion(double x, double n) {
    const double k = n + x;
    const double y = 1 / (k * k);
    const double last = y * n * (n * n + 6 * x * x - 8 * n * x);
    return std::exp(-x) * (1 + y * (n + y * ((n - 2 * x) * n + last))) / k;
}

// x + n / (1 + 1 / (x + (n + 1) / (1 + 2 / (x + ...)))), inverted.
double ContinuedFraction(double x, double n) {
    double p1 = 1, q1 = x;
    double p2 = 1, q2 = n + x;
    double value = 1 / (n + x);
    double change = 1;
    for (int i = 2; change > kEps; ++i) {
        const bool isEven = i % 2 == 0;
        const double v = isEven ? i / 2 : n + (i - 1) / 2;
        const double factor = isEven ? x : 1;
        const double p = p1 * v + p2 * factor;
        const double q = q2 * factor + v * q1;
        change = 1;
        if (q != 0) {
            const double next = p / q;
            change = std::fabs((value - next) / next);
            value = next;
        }
        p1 = p2;
        q1 = q2;
        p2 = p;
        q2 = q;
        if (std::fabs(p) > kBig) {
            p1 *= kInverseBig;
            q1 *= kInverseBig;
            p2 *= kInverseBig;
            q2 *= kInverseBig;
        }
    }
    return value * std::exp(-x);
}

double PowerSeries(double x, int32_t n) {
    double k = 0;
    double term = 1;
    double p = 1.0 - n;
    double sum = n == 1 ? 0 : 1 / p;
    do {
        k += 1;
        term = term * -x / k;
        p += 1;
        if (p != 0)
            sum += term / p;
    } while (sum == 0 || std::fabs(term / sum) > kEps);
    if (n >= kWithoutLogarithm)
        return -sum; // kept: the first term no longer counts
    double psi = -kEuler - std::log(x);
    for (int32_t i = 1; i < n; ++i)
        psi += 1.0 / i;
    return std::pow(-x, n - 1) * psi / GammaFunction(n) - sum;
}

} // namespace

double ExponentialIntegral(double x, int32_t n) {
    if (!std::isfinite(x) || n < 0 || x < 0)
        return kNaN;
    if (x > kLogOfLargest)
        return 0;
    if (x == 0)
        return n > 1 ? 1.0 / (n - 1) : kInfinity;
    if (n == 0)
        return std::exp(-x) / x;
    if (n >= kLargeOrder)
        return Expansion(x, n);
    return x > 1 ? ContinuedFraction(x, n) : PowerSeries(x, n);
}

} // namespace qx
