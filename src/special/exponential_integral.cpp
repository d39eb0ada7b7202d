#include "special/exponential_integral.h"

#include "frame/constants.h"
#include "special/gamma.h"
#include "special/tables/exponential_integral.h"

#include <array>
#include <cmath>
#include <cstddef>

namespace qx {

namespace {

constexpr double kBig = 1.4411518807585587e+17;       // 2^57
constexpr double kInverseBig = 6.938893903907228e-18; // 2^-57
constexpr int32_t kLargeOrder = 5001;
constexpr int32_t kWithoutLogarithm = 170; // (n - 1)! overflows

double Expansion(double x, double n) {
    const double k = n + x;
    const double y = 1 / (k * k);
    const double last = y * n * (n * n + 6 * x * x - 8 * n * x);
    return std::exp(-x) * (1 + y * (n + y * ((n - 2 * x) * n + last))) / k;
}

// The convergents of x + n / (1 + 1 / (x + (n + 1) / (1 + 2 / (x + ...)))), inverted.
struct Convergents {
    double p1, q1, p2, q2;
    double value;
    double difference;

    void take(double p, double q) { // both positive, as all terms are
        const double next = p / q;
        difference = std::fabs(value - next);
        value = next;
        p1 = p2;
        q1 = q2;
        p2 = p;
        q2 = q;
        if (p > kBig) {
            p1 *= kInverseBig;
            q1 *= kInverseBig;
            p2 *= kInverseBig;
            q2 *= kInverseBig;
        }
    }
    bool haveSettled() const { return difference <= kEpsilon * value; }
};

double ContinuedFraction(double x, double n) {
    Convergents c = {1, x, 1, n + x, 1 / (n + x), 0};
    for (double k = 1;; k += 1) {
        c.take(c.p1 * k + c.p2 * x, c.q1 * k + c.q2 * x);
        if (c.haveSettled())
            break;
        const double v = n + k;
        c.take(c.p1 * v + c.p2, c.q1 * v + c.q2);
        if (c.haveSettled())
            break;
    }
    return c.value * std::exp(-x);
}

// 1 + 1 / 2 + ... + 1 / k, indexed by k.
constexpr auto kHarmonic = [] {
    std::array<double, kWithoutLogarithm> sums = {};
    for (std::size_t k = 1; k < sums.size(); ++k)
        sums[k] = sums[k - 1] + 1.0 / static_cast<double>(k);
    return sums;
}();

// (-x)^(n - 1) (psi(n) - ln x) / (n - 1)!, n < 170.
double LogarithmicTerm(double x, int32_t n) {
    const double psi = -kEuler - std::log(x) + kHarmonic[static_cast<std::size_t>(n - 1)];
    if (n <= 2)
        return n == 1 ? psi : -x * psi;
    return std::pow(-x, n - 1) * psi / GammaFunction(n);
}

double PowerSeries(double x, int32_t n) {
    double k = 0;
    double term = 1;
    double p = 1.0 - n;
    double sum = n == 1 ? 0 : 1 / p;
    do {
        k += 1;
        term *= -x / k;
        p += 1;
        if (p != 0)
            sum += term / p;
    } while (sum == 0 || std::fabs(term) > kEpsilon * std::fabs(sum));
    if (n >= kWithoutLogarithm)
        return -sum; // kept: the first term is negligible
    return LogarithmicTerm(x, n) - sum;
}

// E_1, x > 0.
double First(double x) {
    constexpr double smallTo = 0.4, nearTo = 2.0, midTo = 10.0, farTo = 700.0;
    if (x < smallTo)
        return x * table::e1Small(x) - kEuler - std::log(x);
    const double scaled = x < nearTo  ? table::e1Near(x)
                          : x < midTo ? table::e1Mid(x)
                                      : table::e1Far(1 / x);
    if (x < farTo)
        return std::exp(-x) * (scaled / x);
    const double root = std::exp(-0.5 * x); // exp(-x) itself would lose digits as it underflows
    return root * (scaled / x) * root;
}

} // namespace

double FastExponentialIntegral(double x, int32_t n) {
    return n == 1 && x > 0 && std::isfinite(x) ? First(x) : ExponentialIntegral(x, n);
}

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
