#include "special/bessel_real.h"

#include "frame/constants.h"
#include "special/bessel_integer.h"
#include "special/bessel_uniform.h"
#include "special/extended.h"
#include "special/reciprocal_gamma.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kLowestOrder = -200;
constexpr double kLargeOrder = 200;
constexpr int kMostTerms = 1000;

// The sum of q^k / (k! (order + 1)_k), q = -x^2/4 or x^2/4, in two doubles, because terms of both
// signs may exceed the sum by many orders of magnitude.
double CarefulSum(double order, Extended q) {
    Extended term = {1, 0};
    Extended sum = term;
    for (int k = 1; k < kMostTerms; ++k) {
        const Extended divisor = Extended{static_cast<double>(k), 0} * ExactSum(order, k);
        term = term * q / divisor;
        sum = sum + term;
        if (std::fabs(term.high) <= 1e-18 * std::fabs(sum.high) && k + order > 0 &&
            std::fabs(q.high) < std::fabs(divisor.high))
            break;
    }
    return sum.high;
}

// The same sum where the terms fall from the first on or have one sign.
double PlainSum(double order, double q) {
    double term = 1;
    double sum = 1;
    for (int k = 1; k < kMostTerms; ++k) {
        term *= q / (k * (order + k));
        sum += term;
        if (std::fabs(term) <= 1e-17 * std::fabs(sum))
            break;
    }
    return sum;
}

// Ascending series of J.
double BesselJSeries(double order, double x) {
    const double q = -0.25 * x * x;
    const double factor = PowerOverGamma(0.5 * x, order);
    if (factor == 0 || std::isinf(factor))
        return factor;
    if (order > 0 && -q < 0.5 * (order + 1))
        return factor * PlainSum(order, q);
    const Extended square = ExactProduct(x, x);
    return factor * CarefulSum(order, {-0.25 * square.high, -0.25 * square.low});
}

// The two sums of Hankel's form, truncated at the smallest term.
struct HankelSums {
    double p, q;
};

HankelSums SumHankel(double order, double x, double sign) {
    const double square = 4 * order * order;
    double p = 1;
    double q = 0;
    double term = 1;
    for (int k = 1; k < 200; ++k) {
        const double odd = 2 * k - 1;
        const double next = term * ((square - odd * odd) / (8 * k * x));
        // where the order is large the terms grow at first; the sum ends when they grow beyond that
        if (std::fabs(next) >= std::fabs(term) && odd * odd > square)
            break;
        term = next;
        if (k % 2 != 0)
            q += k % 4 == 1 ? term : sign * term;
        else
            p += k % 4 == 0 ? term : sign * term;
        if (std::fabs(term) <= 0.25 * kEpsilon)
            break;
    }
    return {p, q};
}

OscillatingPair Hankel(double order, double x) {
    const HankelSums sums = SumHankel(order, x, -1);
    // the phase x - (order / 2 + 1 / 4) pi, with each part reduced separately
    const double turn = 0.5 * order + 0.25;
    const double st = SinPi(turn);
    const double ct = CosPi(turn);
    const double s = std::sin(x);
    const double c = std::cos(x);
    const double sine = s * ct - c * st;
    const double cosine = c * ct + s * st;
    const double scale = std::sqrt(kTwoOverPi / x);
    return {scale * (cosine * sums.p - sine * sums.q), scale * (sine * sums.p + cosine * sums.q)};
}

double HankelFrom(double order) {
    const double a = std::fabs(order);
    return a < 26 ? (a * 0.0083 + 0.09) * a + 12.9 : 0.9 * a;
}

double UnshiftedJ(double order, double x) {
    return x <= HankelFrom(order) ? BesselJSeries(order, x) : Hankel(order, x).j;
}

// J_order / J_(order-1), order > x > 0.
double RatioAbove(double order, double x) {
    double c = 2 * order / x;
    double d = 0;
    double f = c;
    for (int i = 1; i < 2000; ++i) {
        const double b = 2 * (order + i) / x;
        d = 1 / (b - d);
        c = b - 1 / c;
        const double factor = c * d;
        f *= factor;
        if (std::fabs(factor - 1) <= 0.5 * kEpsilon)
            break;
    }
    return 1 / f;
}

// The recurrence away from order 0, J_(m+1) + J_(m-1) = (2 m / x) J_m. `value` is J of order
// `from`, `next` is J of the following order in the direction of `step`, 1 or -1; the result is J
// of `order`.
double Recur(double order, double from, double step, double x, double value, double next) {
    const int steps = static_cast<int>(std::lround(std::fabs(order - from)));
    double mu = from + step;
    for (int i = 0; i < steps; ++i) {
        const double following = 2 * mu / x * next - value;
        value = next;
        next = following;
        mu += step;
    }
    return value;
}

// For an order above both the shifted order and x: downward from the continued fraction.
double DownwardJ(double order, double from, double x) {
    double above = RatioAbove(order, x);
    const double start = above;
    double value = 1; // J of order - 1, up to scale
    const int steps = static_cast<int>(std::lround(order - 1 - from));
    for (int i = 0; i < steps; ++i) {
        const double below = 2 * (order - 1 - i) / x * value - above;
        above = value;
        value = below;
    }
    // normalised by the larger of the two final orders, which is away from its zero
    return std::fabs(value) > std::fabs(above) ? start / value * UnshiftedJ(from, x)
                                               : start / above * UnshiftedJ(from + 1, x);
}

// The order near 3.6 sqrt(x) with the same fractional part.
double ShiftedOrder(double order, double x) {
    const double a = std::fabs(order);
    return std::floor(std::clamp(3.6 * std::sqrt(x), 2.0, 17.0)) + (a - std::floor(a));
}

// J for x > 0 and an order that is not an integer and not below -200.
double NonIntegerJ(double order, double x) {
    if (std::isinf(x))
        return 0;
    const double a = std::fabs(order);
    if (a > 17 && x < 3.6 * std::sqrt(a))
        return BesselJSeries(order, x);
    if (a >= kLargeOrder)
        return x / order / order <= 0.3 ? BesselLargeOrder(order, x).j : Hankel(order, x).j;
    const double shifted = ShiftedOrder(order, x);
    if (a <= shifted + 3)
        return UnshiftedJ(order, x);
    if (order < 0)
        return Recur(order, -shifted, -1, x, UnshiftedJ(-shifted, x), UnshiftedJ(-shifted - 1, x));
    if (order <= x)
        return Recur(order, shifted, 1, x, UnshiftedJ(shifted, x), UnshiftedJ(shifted + 1, x));
    return DownwardJ(order, shifted, x);
}

double NonIntegerY(double order, double x) {
    if (std::isinf(x))
        return 0;
    if (order >= kLargeOrder)
        return x / order / order <= 0.3 ? BesselLargeOrder(order, x).y : Hankel(order, x).y;
    // Where J would come from Hankel's form, Y comes from the same sums, without the difference of
    // J(order) and J(-order).
    const double shifted = ShiftedOrder(order, x);
    if (order > 0 && x > HankelFrom(std::min(order, shifted + 1) + 3)) {
        if (order <= shifted + 3)
            return Hankel(order, x).y;
        return Recur(order, shifted, 1, x, Hankel(shifted, x).y, Hankel(shifted + 1, x).y);
    }
    const double sine = SinPi(order);
    const double cosine = CosPi(order);
    const double second = NonIntegerJ(-order, x);
    if (std::isinf(second))
        return -second / sine;
    return cosine == 0 ? -second / sine : (cosine * NonIntegerJ(order, x) - second) / sine;
}

// Orders above the range of int32 take the same path; BesselJn uses the expansion for large order.
double IntegerJ(double n, double x) {
    const double order = std::fabs(n);
    const bool negative = IsOdd(order) && (n < 0) != (x < 0);
    const double value = BesselJn(order, std::fabs(x));
    return negative ? -value : value;
}

} // namespace

double BesselJ(double order, double x) {
    if (std::isnan(order) || std::isnan(x) || (order < kLowestOrder && !IsInteger(order)))
        return kNaN;
    if (std::isinf(order))
        return 0;
    if (IsInteger(order))
        return IntegerJ(order, x);
    if (x < 0)
        return kNaN;
    if (x < kEpsilon)
        return 0; // kept: also if the order is negative or below 1
    return NonIntegerJ(order, x);
}

double BesselY(double order, double x) {
    if (std::isnan(order) || !(x > 0) || order < kLowestOrder)
        return kNaN;
    if (std::isinf(order))
        return -kInfinity;
    if (IsInteger(order)) {
        const double value = BesselYn(std::fabs(order), x);
        return order < 0 && IsOdd(order) ? -value : value;
    }
    const double value = NonIntegerY(order, x);
    if (std::isnan(value)) // the recurrence in the order has overflowed
        return order > 0 || CosPi(order) > 0 ? -kInfinity : kInfinity;
    return value;
}

double SphericalBesselJ(int32_t n, double x) {
    if (!(x >= 0))
        return kNaN;
    if (std::isinf(x))
        return 0;
    if (x == 0)
        return n == 0 ? 1 : 0;
    const double order = n + 0.5;
    if (order < kLowestOrder)
        return kNaN;
    if (n >= 0 && std::isinf(kHalfPi / x))
        return n == 0 ? 1 : 0;
    return std::sqrt(kHalfPi / x) * NonIntegerJ(order, x);
}

double SphericalBesselY(int32_t n, double x) {
    if (!(x >= 0))
        return kNaN;
    if (x == 0)
        return -kInfinity;
    if (std::isinf(x))
        return 0;
    if (n < 0 && n + 0.5 >= kLowestOrder && std::isinf(kHalfPi / x))
        return n == -1 ? 1 : 0; // up to sign, j of order -n - 1
    return std::sqrt(kHalfPi / x) * BesselY(n + 0.5, x);
}

double BesselI(double order, double x) {
    if (std::isnan(order) || std::isnan(x))
        return kNaN;
    if (IsInteger(order)) {
        const double value = BesselIn(std::fabs(order), std::fabs(x));
        return x < 0 && IsOdd(order) ? -value : value;
    }
    if (x < 0 || order < kLowestOrder || (std::isinf(order) && std::isinf(x)))
        return kNaN;
    if (std::isinf(order))
        return 0;
    if (x == 0) {
        if (order > 0)
            return 0;
        return IsOdd(std::floor(order)) ? kInfinity : -kInfinity;
    }
    const double a = std::fabs(order);
    if (a >= kModifiedUniformFrom) {
        const ModifiedPair pair = ModifiedBesselLargeOrder(a, x);
        return order > 0 ? pair.i : pair.i + kTwoOverPi * SinPi(a) * pair.k;
    }
    if (x > 1000)
        return kInfinity;
    if (x >= 40 && x >= 0.5 * a * a) {
        const HankelSums sums = SumHankel(order, x, 1);
        const double half = std::exp(0.5 * x);
        return half * (half * ((sums.p - sums.q) / std::sqrt(kTwoPi * x)));
    }
    const double factor = PowerOverGamma(0.5 * x, order);
    if (order > 0)
        return factor * PlainSum(order, 0.25 * x * x);
    const Extended square = ExactProduct(x, x);
    if (std::isinf(factor))
        return factor;
    return factor * CarefulSum(order, {0.25 * square.high, 0.25 * square.low});
}

} // namespace qx
