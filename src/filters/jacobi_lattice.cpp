#include "filters/jacobi_lattice.h"

#include "frame/constants.h"

#include <cmath>

namespace qx {

namespace {

// Terms of a theta series: the nome is at most exp(-pi), and its 16th power is below 1e-21.
constexpr int terms = 5;

double Sign(int m) { return m % 2 == 0 ? 1.0 : -1.0; }

} // namespace

JacobiLattice::JacobiLattice(double periodRatio)
    : periodRatio_(periodRatio),
      lnNome_(-kPi * (periodRatio >= 1.0 ? periodRatio : 1.0 / periodRatio)) {
    theta2_ = theta3_ = theta4_ = 1.0;
    for (int m = 1; m < terms; ++m) {
        theta2_ += std::exp(m * (m + 1) * lnNome_);
        const double term = 2.0 * std::exp(m * m * lnNome_);
        theta3_ += term;
        theta4_ += Sign(m) * term;
    }
    const double small = 4.0 * std::exp(0.5 * lnNome_) * (theta2_ / theta3_) * (theta2_ / theta3_);
    const double large = (theta4_ / theta3_) * (theta4_ / theta3_);
    k = periodRatio >= 1.0 ? small : large;
    kc = periodRatio >= 1.0 ? large : small;
}

JacobiFunctions JacobiLattice::at(double fraction, double complement) const {
    if (periodRatio_ >= 1.0)
        return byTrigonometric(fraction, complement);
    if (fraction <= 0.5)
        return byHyperbolic(fraction);
    const JacobiFunctions mirrored = byHyperbolic(complement);
    return {mirrored.cn / mirrored.dn, kc * mirrored.sn / mirrored.dn, kc / mirrored.dn};
}

JacobiFunctions JacobiLattice::byTrigonometric(double fraction, double complement) const {
    const double v = kHalfPi * fraction, mirrored = kHalfPi * complement;
    double sine = std::sin(v), cosine = std::sin(mirrored), theta3 = 1.0, theta4 = 1.0;
    for (int m = 1; m < terms; ++m) {
        const double power = std::exp(m * (m + 1) * lnNome_);
        sine += Sign(m) * power * std::sin((2 * m + 1) * v);
        cosine += Sign(m) * power * std::sin((2 * m + 1) * mirrored); // cos((2 m + 1) v)
        const double term = 2.0 * std::exp(m * m * lnNome_) * std::cos(2 * m * v);
        theta3 += term;
        theta4 += Sign(m) * term;
    }
    return {theta3_ * sine / (theta2_ * theta4), theta4_ * cosine / (theta2_ * theta4),
            theta4_ * theta3 / (theta3_ * theta4)};
}

// By the functions of modulus kc at an imaginary argument, for fractions up to 1/2. theta1 and
// theta2 are multiplied by exp(-v), so that nothing overflows.
JacobiFunctions JacobiLattice::byHyperbolic(double fraction) const {
    const double v = kHalfPi * fraction / periodRatio_;
    double sine = 0.0, cosine = 0.0, theta3 = 1.0, theta4 = 1.0;
    for (int m = 0; m < terms; ++m) {
        const double power = 0.5 * std::exp(m * (m + 1) * lnNome_ + 2 * m * v);
        const double mirrored = -(4 * m + 2) * v;
        sine -= Sign(m) * power * std::expm1(mirrored);
        cosine += power * (1.0 + std::exp(mirrored));
        if (m == 0)
            continue;
        const double term =
            std::exp(m * m * lnNome_ + 2 * m * v) + std::exp(m * m * lnNome_ - 2 * m * v);
        theta3 += term;
        theta4 += Sign(m) * term;
    }
    const double shrunk = std::exp(-v);
    return {theta3_ * sine / (theta4_ * cosine), theta2_ * theta4 * shrunk / (theta4_ * cosine),
            theta2_ * theta3 * shrunk / (theta3_ * cosine)};
}

double EllipticFOfTangent(double t, double kc) {
    double x = 1.0, y = 1.0 + kc * t * (kc * t), z = 1.0 + t * t;
    double mean = (x + y + z) / 3.0;
    if (!std::isfinite(mean))
        return kNaN;
    // 408 = (3 2^-53)^(-1/6): the truncation error of the series below is then less than the
    // rounding.
    double spread = 408.0 * std::fmax(z - mean, mean - x);
    while (spread >= mean) {
        const double rootX = std::sqrt(x), rootY = std::sqrt(y), rootZ = std::sqrt(z);
        const double lambda = rootX * rootY + rootX * rootZ + rootY * rootZ;
        x = 0.25 * (x + lambda);
        y = 0.25 * (y + lambda);
        z = 0.25 * (z + lambda);
        mean = (x + y + z) / 3.0;
        spread *= 0.25;
    }
    const double X = 1.0 - x / mean, Y = 1.0 - y / mean, Z = -(X + Y);
    const double E2 = X * Y - Z * Z, E3 = X * Y * Z;
    const double series = 1.0 - E2 / 10.0 + E3 / 14.0 + E2 * E2 / 24.0 - 3.0 * E2 * E3 / 44.0;
    return t * series / std::sqrt(mean);
}

} // namespace qx
