#include "filters/elliptic_functions.h"

#include "frame/constants.h"

#include <cmath>

namespace qx {

namespace {
// Means converge quadratically, so a few iterations are enough unless a modulus is NaN.
constexpr int mostRounds = 25;
constexpr double tolerance = 1e-15;
constexpr double halfOfTheDigits = 1.2e-07;
} // namespace

double CompleteEllipticK(double kc) {
    double a = 1.0, b = kc;
    for (int round = 0; round < mostRounds; ++round) {
        const double mean = (a + b) * 0.5;
        b = std::sqrt(a * b);
        a = mean;
        if ((a - b) / a < tolerance)
            break;
    }
    return kPi / a * 0.5;
}

// By theta functions: k = (theta2 / theta3)^2 at the nome q.
double ModulusFromNomeRatio(double ratio) {
    const double q = std::exp(-kPi * ratio);
    double T = 1.0, C = 1.0; // sums of theta3 and theta2
    double t = 1.0, p = q;
    for (int round = 0; round < mostRounds && !(t < tolerance); ++round) {
        T += 2.0 * t * p;
        t *= p * p;
        C += t;
        p *= q;
    }
    const double k = 4.0 * std::sqrt(q) * (C * C) / (T * T);
    return k >= 1.0 ? 0.99999999999999 : k;
}

// Descending Landen transformation.
JacobiFunctions JacobiElliptic(double u, double kc) {
    if (u == 0.0)
        return {0.0, 1.0, 1.0};
    double as[mostRounds], bs[mostRounds];
    double a = 1.0, b = kc, c = 0.0;
    int rounds = 0;
    while (rounds < mostRounds) {
        as[rounds] = a;
        bs[rounds] = b;
        ++rounds;
        c = (a + b) * 0.5;
        const double mean = std::sqrt(a * b);
        if ((c - mean) / c < tolerance)
            break;
        a = c;
        b = mean;
    }
    double d = c / std::tan(c * u), f = 1.0, r = c;
    for (int round = rounds - 1; round >= 0; --round) {
        const double t = d * d / r;
        d *= f;
        r = as[round];
        f = (bs[round] + t) / (t + r);
    }
    const double sn = 1.0 / std::sqrt(d * d + 1.0);
    return {sn, sn * d, f};
}

double InverseSc(double x, double kc) {
    double a = 1.0, b = kc, y = 1.0 / x;
    double branch = 0.0; // of the arc tangent
    for (int round = 0; round < mostRounds; ++round) {
        const double product = a * b;
        const double gap = std::fabs(a - b);
        const bool isLast = a * halfOfTheDigits > gap; // this iteration's means have all digits
        a += b;
        const double s = std::sqrt(product);
        y -= product / y;
        if (y == 0.0)
            y = s * tolerance;
        if (isLast) {
            branch += y < 0.0 ? 1.0 : 0.0;
            break;
        }
        branch = 2.0 * branch + (y < 0.0 ? 1.0 : 0.0);
        b = 2.0 * s;
    }
    return (std::atan(a / y) + branch * kPi) / a;
}

EllipticParameters::EllipticParameters(double ripple, double attenuation, int32_t n) {
    e = std::sqrt(std::pow(10.0, 0.1 * ripple) - 1.0);
    const double k1 = e / std::sqrt(std::pow(10.0, 0.1 * attenuation) - 1.0);
    const double k1c = std::sqrt(1.0 - k1 * k1);
    const double K1 = CompleteEllipticK(k1c), K1c = CompleteEllipticK(k1);
    k = ModulusFromNomeRatio(K1c / K1 / n);
    kc = std::sqrt(1.0 - k * k);
    K = CompleteEllipticK(kc);
    at0 = JacobiElliptic(InverseSc(1.0 / e, k1) * (K / n) / K1, k);
}

} // namespace qx
