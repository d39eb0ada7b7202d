#include "special/bessel_integer.h"

#include "frame/constants.h"
#include "special/bessel_uniform.h"
#include "special/extended.h"
#include "special/reciprocal_gamma.h"
#include "special/tables/bessel.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kSmall = 8;
constexpr double kLowTo = 16; // in x^2, for Y without its logarithm
constexpr double kFar = 20;
constexpr double kUniformFrom = 200;
constexpr double kTiny = 1e-8; // x^2 / 4 is below half an ulp of 1

// x - zero, with the square of the zero in two doubles, so that (x^2 - zero^2) keeps its digits
// near the zero.
double FromZero(Extended square, const double (&zero)[2]) {
    return (square.high - zero[0]) + (square.low - zero[1]);
}

struct Wave {
    double j, y;
};

// Modulus and phase for x >= 8. The phase x - (2 n + 1) pi / 4 is never formed; its sine and cosine
// are sums of those of x.
Wave Wave0(double x) {
    const double z = 1 / (x * x);
    const bool far = x >= kFar;
    const double p = far ? table::j0PhaseFarCos(z) : table::j0PhaseMidCos(z);
    const double q = (far ? table::j0PhaseFarSin(z) : table::j0PhaseMidSin(z)) / x;
    const double s = std::sin(x);
    const double c = std::cos(x);
    const double scale = kInverseRootPi / std::sqrt(x);
    return {scale * ((c + s) * p - (s - c) * q), scale * ((s - c) * p + (c + s) * q)};
}

Wave Wave1(double x) {
    const double z = 1 / (x * x);
    const bool far = x >= kFar;
    const double p = far ? table::j1PhaseFarCos(z) : table::j1PhaseMidCos(z);
    const double q = (far ? table::j1PhaseFarSin(z) : table::j1PhaseMidSin(z)) / x;
    const double s = std::sin(x);
    const double c = std::cos(x);
    const double scale = kInverseRootPi / std::sqrt(x);
    return {scale * ((s - c) * p + (c + s) * q), scale * ((s - c) * q - (c + s) * p)};
}

double I0Scaled(double x) { // x >= 8: sqrt(x) exp(-x) I0(x)
    return x < 24 ? table::i0Mid(1 / x) : table::i0Far(1 / x);
}
double I1Scaled(double x) { return x < 24 ? table::i1Mid(1 / x) : table::i1Far(1 / x); }

double I0(double x) {
    if (x < kTiny)
        return 1;
    if (x <= kSmall)
        return table::i0Small(x * x);
    const double half = std::exp(0.5 * x); // exp(x) would overflow before I0 does
    return half * (half * I0Scaled(x) / std::sqrt(x));
}

double I1(double x) {
    if (x <= kSmall)
        return x * table::i1Small(x * x);
    const double half = std::exp(0.5 * x);
    return half * (half * I1Scaled(x) / std::sqrt(x));
}

// exp(x) K0(x) and exp(x) K1(x).
struct ScaledK {
    double k0, k1;
};

ScaledK KScaled(double x) {
    if (x <= 1) {
        const double e = std::exp(x);
        const double l = std::log(x);
        const double z = x * x;
        return {e * (table::k0Small(z) - l * I0(x)),
                e * (1 / x + (x * table::k1Small(z) + l * I1(x)))};
    }
    const double u = 1 / x;
    const double root = std::sqrt(x);
    if (x < 5)
        return {table::k0Mid(u) / root, table::k1Mid(u) / root};
    return {table::k0Far(u) / root, table::k1Far(u) / root};
}

// f_(k+1) = (2 k / x) f_k - f_(k-1) for k below 2^20, upward; or downward, with f_(k-1) and f_(k+1)
// exchanged. Two hundred steps would lose a digit to rounding, so the rounding error of each step
// is carried along in a recurrence of its own.
class Recurrence {
public:
    Recurrence(double x, double before, double value) : before_(before), value_(value) {
        constexpr double splitter = 134217729.0; // 2^27 + 1
        const Extended ratio = Extended{2, 0} / Extended{x, 0};
        const double t = splitter * ratio.high;
        ratio_ = ratio.high;
        ratioHead_ = t - (t - ratio.high);
        ratioRest_ = (ratio.high - ratioHead_) + ratio.low;
    }

    void step(double k) {
        const double c = k * ratio_;
        const double restOfC = (k * ratioHead_ - c) + k * ratioRest_;
        const Extended product = ExactProduct(c, value_);
        const Extended next = ExactSum(product.high, -before_);
        const double rest =
            (product.low + next.low) + ((restOfC * value_ + c * restOfValue_) - restOfBefore_);
        before_ = value_;
        restOfBefore_ = restOfValue_;
        value_ = next.high;
        restOfValue_ = rest;
    }

    double before() const { return Corrected(before_, restOfBefore_); }
    double value() const { return Corrected(value_, restOfValue_); }

private:
    // Near the ends of the range the correction overflows, but the value does not.
    static double Corrected(double value, double rest) {
        return std::isfinite(rest) ? value + rest : value;
    }

    double ratio_, ratioHead_, ratioRest_; // 2 / x
    double before_, value_;
    double restOfBefore_ = 0, restOfValue_ = 0;
};

double BesselJ0(double x) {
    if (std::isinf(x))
        return 0;
    if (x < kTiny)
        return 1;
    if (x >= kSmall)
        return Wave0(x).j;
    const Extended z = ExactProduct(x, x);
    return FromZero(z, table::j0Zero1Squared) * FromZero(z, table::j0Zero2Squared) *
           table::j0Small(z.high);
}

double BesselJ1(double x) {
    if (std::isinf(x))
        return 0;
    if (x < kTiny)
        return 0.5 * x;
    if (x >= kSmall)
        return Wave1(x).j;
    const Extended z = ExactProduct(x, x);
    return x * FromZero(z, table::j1Zero1Squared) * FromZero(z, table::j1Zero2Squared) *
           table::j1Small(z.high);
}

double BesselY0(double x) {
    if (std::isinf(x))
        return 0;
    if (x >= kSmall)
        return Wave0(x).y;
    const double z = x * x;
    const double low = z < kLowTo ? table::y0Low(z) : table::y0Mid(z);
    return low + kTwoOverPi * std::log(x) * BesselJ0(x);
}

double BesselY1(double x) {
    if (std::isinf(x))
        return 0;
    if (x >= kSmall)
        return Wave1(x).y;
    const double z = x * x;
    const double low = z < kLowTo ? table::y1Low(z) : table::y1Mid(z);
    return x * low + kTwoOverPi * (std::log(x) * BesselJ1(x) - 1 / x);
}

} // namespace

double BesselJn(double n, double x) {
    if (std::isinf(x))
        return 0;
    if (n == 0)
        return BesselJ0(x);
    if (n == 1)
        return BesselJ1(x);
    if (x == 0)
        return 0;
    if (n >= kUniformFrom)
        return BesselLargeOrder(n, x).j;
    if (n <= x) {
        Recurrence j(x, BesselJ0(x), BesselJ1(x));
        for (double k = 1; k < n; k += 1)
            j.step(k);
        return j.value();
    }
    if (x * x < n + 1) { // the terms of the ascending series fall from the first on
        const double quarter = -0.25 * x * x;
        double term = 1;
        double sum = 1;
        for (double k = 1; k < 60 && std::fabs(term) > 1e-17; k += 1) {
            term *= quarter / (k * (n + k));
            sum += term;
        }
        return PowerOverGamma(0.5 * x, n) * sum;
    }
    // Downward from an order at which J is so small that the trial values 0 and 1 leave 1e-18
    // of Y at n. The decay is slowest, that of Airy's function, near n = x.
    const double start = n + std::floor(10 * std::cbrt(0.5 * x)) + 3;
    Recurrence j(x, 0, 1);
    double k = start - 1;
    for (; k > n; k -= 1)
        j.step(k);
    const double wanted = j.value();
    for (; k > 0; k -= 1)
        j.step(k);
    return std::fabs(j.value()) > std::fabs(j.before()) ? wanted / j.value() * BesselJ0(x)
                                                        : wanted / j.before() * BesselJ1(x);
}

double BesselYn(double n, double x) {
    if (std::isinf(x))
        return 0;
    if (x == 0)
        return -kInfinity;
    if (n == 0)
        return BesselY0(x);
    if (n == 1)
        return BesselY1(x);
    if (n >= kUniformFrom)
        return BesselLargeOrder(n, x).y;
    const double scale = n > x ? 0x1p-512 : 1; // where Y grows: away from the overflow limit
    Recurrence y(x, scale * BesselY0(x), scale * BesselY1(x));
    for (double k = 1; k < n && std::isfinite(y.value()); k += 1)
        y.step(k);
    const double value = y.value() / scale;
    return std::isfinite(value) ? value : -kInfinity;
}

double BesselIn(double n, double x) {
    if (n == 0)
        return std::isinf(x) ? kInfinity : I0(x);
    if (n == 1)
        return std::isinf(x) ? kInfinity : I1(x);
    if (x == 0)
        return 0;
    if (std::isinf(x))
        return std::isinf(n) ? kNaN : kInfinity;
    if (n >= kModifiedUniformFrom)
        return ModifiedBesselLargeOrder(n, x).i;
    if (x > 800)
        return kInfinity;
    if (0.25 * x * x < 10 * (n + 1)) {
        const double quarter = 0.25 * x * x;
        double term = 1;
        double sum = 1;
        for (double k = 1; k < 200 && term > 1e-17 * sum; k += 1) {
            term *= quarter / (k * (n + k));
            sum += term;
        }
        return PowerOverGamma(0.5 * x, n) * sum;
    }
    // Downward from an order at which I is 1e-17 times I_n. The trial values are positive, so the
    // recurrence is stable, and the values cannot overflow: they grow by I0 / I_start.
    const double start = n + std::sqrt(80 * (n + x)) + 20;
    double above = 0;
    double value = 1e-290;
    double wanted = 0;
    for (double k = std::floor(start); k > 0; k -= 1) {
        const double below = 2 * k / x * value + above;
        above = value;
        value = below;
        if (k - 1 == n)
            wanted = value;
    }
    return wanted / value * I0(x);
}

double BesselKn(double n, double x) {
    if (std::isnan(x))
        return x;
    if (x < 0)
        return kNaN;
    if (x == 0)
        return kInfinity;
    if (std::isinf(x))
        return 0;
    if (n > 1000) // the recurrence would work, but its cost has no bound
        return ModifiedBesselLargeOrder(n, x).k;
    const ScaledK scaled = KScaled(x);
    const double half = std::exp(-0.5 * x);
    if (n == 0)
        return half * (scaled.k0 * half);
    double before = scaled.k0;
    double value = scaled.k1;
    for (double k = 1; k < n && std::isfinite(value); k += 1) {
        const double next = 2 * k / x * value + before;
        before = value;
        value = next;
    }
    if (!std::isfinite(value)) // exp(x) K overflows, K itself may not
        return ModifiedBesselLargeOrder(n, x).k;
    return half * (value * half);
}

} // namespace qx
