#include "special/hyperbolic_integrals.h"

#include "frame/constants.h"
#include "special/tables/hyperbolic_integrals.h"

#include <cmath>
#include <cstddef>

namespace qx {

namespace {

constexpr double kSeriesTo = 8;
constexpr double kMidTo = 18;
constexpr double kLargest = 880;
constexpr double kSplitFrom = 700; // above it exp(x) may overflow before exp(x) / x does

// The sum of x^(k+step) / ((k + step) (k + step)!), step 2, from the given exponent on; `term` is
// the preceding term without its first divisor.
double SeriesOnward(double square, double term, double exponent) {
    double sum = 0;
    double added;
    do {
        term *= square / ((exponent - 1) * exponent);
        added = term / exponent;
        sum += added;
        exponent += 2;
    } while (added > kEpsilon * sum);
    return sum;
}

// Clenshaw's recurrence: the sum of c[k] T_k(t / 2), with the first term halved.
template <std::size_t N>
double ChebyshevSum(const double (&c)[N], double t) {
    double b0 = c[N - 1];
    double b1 = 0;
    double b2 = 0;
    for (std::size_t i = N - 1; i-- > 0;) {
        b2 = b1;
        b1 = b0;
        b0 = t * b1 - b2 + c[i];
    }
    return 0.5 * (b0 - b2);
}

double MidArgument(double x) { return (576 / x - 52) / 10; }
double FarArgument(double x) { return (6336 / x - 212) / 70; }

// exp(x) / (2 x) times a factor near 1.
double ExpOverTwice(double x, double factor) {
    if (x < kSplitFrom)
        return factor * std::exp(x) / (2 * x);
    const double root = std::exp(0.5 * x);
    return factor * root / (2 * x) * root;
}

} // namespace

double HyperbolicSineIntegral(double x) {
    const double a = std::fabs(x);
    if (a <= kSeriesTo)
        return x * (1 + SeriesOnward(x * x, 1, 3));
    if (a > kLargest)
        return std::copysign(kInfinity, x);
    const double scaled = a <= kMidTo ? ChebyshevSum(table::hyperbolicSineMid, MidArgument(a))
                                      : ChebyshevSum(table::hyperbolicSineFar, FarArgument(a));
    return std::copysign(ExpOverTwice(a, scaled), x);
}

double HyperbolicCosineIntegral(double x) {
    const double a = std::fabs(x);
    if (a == 0)
        return -kInfinity;
    if (a <= kSeriesTo)
        return std::log(a) + kEuler + SeriesOnward(x * x, 1, 2);
    if (a > kLargest)
        return kInfinity;
    const double scaled = a <= kMidTo ? ChebyshevSum(table::hyperbolicCosineMid, MidArgument(a))
                                      : ChebyshevSum(table::hyperbolicCosineFar, FarArgument(a));
    return ExpOverTwice(a, scaled) + (std::log(a) + kEuler);
}

} // namespace qx
