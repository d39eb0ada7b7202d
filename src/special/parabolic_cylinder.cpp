#include "special/parabolic_cylinder.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/reciprocal_gamma.h"

#include <cmath>

namespace qx {

namespace {

// Below 40 other methods are available, so there the asymptotic series has to be as accurate as
// they are.
constexpr double kAsymptoticLimit = 1e-12;
constexpr double kAsymptoticLimitBelow40 = 1e-15;
constexpr double kMostSteps = 1000; // D overflows near order 340 unless x is large

// exp(sign x^2 / 4); the square is exact, because the exponential multiplies its rounding error.
double Gaussian(double x, double sign) {
    const Extended square = ExactProduct(x, x);
    if (!std::isfinite(square.high) || std::isnan(square.low))
        return sign < 0 ? 0.0 : kInfinity;
    const double e = std::exp(0.25 * sign * square.high);
    return e + e * (0.25 * sign * square.low);
}

// sum of sign^k (a)_2k / (k! (2 x^2)^k); false if it does not reach the limit.
bool AsymptoticSum(double a, double x, double sign, double *sum) {
    const double inverse = 0.5 / x / x;
    double term = 1;
    *sum = 1;
    for (int k = 0; k < 100; ++k) {
        const double next = sign * term * (a + 2 * k) * (a + 2 * k + 1) / (k + 1) * inverse;
        if (std::fabs(next) >= std::fabs(term) && a + 2 * k > 0)
            break;
        term = next;
        *sum += term;
        if (std::fabs(term) <= 0.1 * kEpsilon * std::fabs(*sum))
            break;
    }
    // a sum far below its terms has lost digits to cancellation
    const double limit = x < 40 ? kAsymptoticLimitBelow40 : kAsymptoticLimit;
    return std::fabs(term) <= limit * std::fabs(*sum) && std::fabs(*sum) > 1e-2;
}

bool ParabolicAsymptotic(double x, double v, double *value) {
    const double size = std::fabs(x);
    double falling = 0;
    if (!AsymptoticSum(-v, size, -1, &falling))
        return false;
    falling *= std::pow(size, v) * Gaussian(size, -1);
    if (x > 0) {
        *value = falling;
        return true;
    }
    double growing = 0;
    if (!AsymptoticSum(v + 1, size, 1, &growing))
        return false;
    const double factor = ReciprocalGamma(-v);
    *value = CosPi(v) * falling;
    if (factor != 0)
        *value += kRootTwoPi * factor * std::pow(size, -v - 1) * Gaussian(size, 1) * growing;
    return true;
}

// M(a, b, z) in two doubles, because for orders above 0 its terms have both signs.
double KummerSum(double a, double b, Extended z) {
    Extended term = {1, 0};
    Extended sum = term;
    for (int k = 0; k < 2000 && term.high != 0; ++k) {
        const Extended divisor = {(b + k) * (k + 1), 0};
        term = term * ExactSum(a, k) * z / divisor;
        sum = sum + term;
        if (std::fabs(term.high) <= 1e-18 * std::fabs(sum.high) && a + k > 0 && z.high < k)
            break;
    }
    return sum.high;
}

double TwoSeries(double x, double v) {
    const Extended square = ExactProduct(x, x);
    const Extended z = {0.5 * square.high, 0.5 * square.low};
    const double even = ReciprocalGamma(0.5 * (1 - v));
    const double odd = ReciprocalGamma(-0.5 * v);
    double sum = even == 0 ? 0 : even * KummerSum(-0.5 * v, 0.5, z);
    if (odd != 0)
        sum -= kRootTwo * x * odd * KummerSum(0.5 * (1 - v), 1.5, z);
    return std::exp2(0.5 * v) * kRootPi * Gaussian(x, -1) * sum;
}

struct Pair {
    double value;
    double above; // for the order one higher
};

// v < 0, x >= 1: Miller's algorithm.
Pair NegativeOrder(double x, double v) {
    const double zero = std::exp2(0.5 * v) * kRootPi * ReciprocalGamma(0.5 * (1 - v)); // D_v(0)
    if (zero == 0) // D decreases from there
        return {0, 0};
    const double start = 60 + 400 / (x * x) + 3 * x * x + 4 * x * std::sqrt(-v);
    double above = 0; // w_(k+1), where w_k is proportional to D_(v-k)
    double value = 1e-300;
    double total = value; // the normalising sum from k on, divided by its first coefficient
    for (double k = std::floor(start); k > 0; k -= 1) {
        const double below = x * value + (k - v) * above;
        above = value;
        value = below;
        total = value + (k - 1 - v) * x / k * total;
        if (total > 1e200) {
            above *= 1e-200;
            value *= 1e-200;
            total *= 1e-200;
        }
    }
    const double scale = zero / total * Gaussian(x, -1);
    return {scale * value, scale * (x * value - v * above)};
}

// Upward recurrence to the order v from two neighbouring orders: D_(m+1) = x D_m - m D_(m-1).
double Upward(double x, double v, double from, Pair pair) {
    if (v - from > kMostSteps)
        return kNaN;
    for (double m = from + 1; m < v + 0.5; m += 1) {
        const double next = x * pair.above - m * pair.value;
        pair = {pair.above, next};
    }
    return pair.value;
}

} // namespace

double ParabolicCylinder(double x, double v) {
    if (std::isnan(x) || std::isnan(v) || std::isinf(v))
        return kNaN;
    const bool isPolynomial = v >= 0 && IsInteger(v);
    if (std::isinf(x)) {
        if (x > 0 || isPolynomial)
            return 0;
        return ReciprocalGamma(-std::fmax(v, -1)) < 0 ? -kInfinity : kInfinity;
    }
    double value = 0;
    if (std::fabs(x) > 5 && ParabolicAsymptotic(x, v, &value))
        return value;
    if (isPolynomial) {
        const double d0 = Gaussian(x, -1);
        return Upward(x, v, 0, {d0, x * d0});
    }
    if (x < 1 || x > 40) // for x > 40 only orders remain that overflow or underflow
        return TwoSeries(x, v);
    if (v < 0)
        return NegativeOrder(x, v).value;
    const double base = v - std::floor(v) - 2;
    return Upward(x, v, base, NegativeOrder(x, base));
}

} // namespace qx
