#ifndef QX_LINALG_COMPLEX_FUNCTIONS_H
#define QX_LINALG_COMPLEX_FUNCTIONS_H

#include "linalg/scalar.h"

#include <cmath>

namespace qx {

inline double SquareRoot(double x) { return std::sqrt(x); }
// The principal square root; its real part is not negative.
inline CDB SquareRoot(CDB z) {
    const double modulus = Modulus(z);
    if (modulus == 0.0)
        return {0.0, z.im};
    if (std::isinf(modulus) && std::isfinite(z.re) && std::isfinite(z.im)) {
        const CDB half = SquareRoot(z * 0.25);
        return half * 2.0;
    }
    const double t = std::sqrt(0.5 * std::fabs(z.re) + 0.5 * modulus);
    if (z.re >= 0.0)
        return {t, z.im / (2.0 * t)};
    return {std::fabs(z.im) / (2.0 * t), std::copysign(t, z.im)};
}

// log |z| + i arg z; -infinity for 0.
inline CDB Logarithm(CDB z) {
    return {std::log(z.re * z.re + z.im * z.im) * 0.5, std::atan2(z.im, z.re)};
}
// The same for every finite z other than 0, with few rounding errors where z is close to 1; the
// imaginary part is +pi on the negative axis.
inline double PrincipalLogarithm(double x) { return std::log(x); }
inline CDB PrincipalLogarithm(CDB z) {
    const double larger = std::fmax(std::fabs(z.re), std::fabs(z.im));
    const double smaller = std::fmin(std::fabs(z.re), std::fabs(z.im));
    const double angle = std::atan2(z.im + 0.0, z.re); // no negative zero
    if (larger > 0.5 && larger < 2.0)
        return {0.5 * std::log1p((larger - 1.0) * (larger + 1.0) + smaller * smaller), angle};
    const double ratio = smaller / larger;
    return {std::log(larger) + 0.5 * std::log1p(ratio * ratio), angle};
}
inline double Exponential(double x) { return std::exp(x); }
inline CDB Exponential(CDB z) {
    const double modulus = std::exp(z.re);
    return {modulus * std::cos(z.im), modulus * std::sin(z.im)};
}
// exp(z) - 1, sinh(z) and, for a modulus below 1, artanh(z), with few rounding errors where z is
// small.
inline double ExpMinusOne(double x) { return std::expm1(x); }
inline CDB ExpMinusOne(CDB z) {
    const double growth = std::expm1(z.re), sine = std::sin(0.5 * z.im);
    return {growth * std::cos(z.im) - 2.0 * sine * sine, std::exp(z.re) * std::sin(z.im)};
}
inline double HyperbolicSine(double x) { return std::sinh(x); }
inline CDB HyperbolicSine(CDB z) {
    return {std::sinh(z.re) * std::cos(z.im), std::cosh(z.re) * std::sin(z.im)};
}
inline double AreaTangent(double x) { return 0.5 * std::log1p(2.0 * x / (1.0 - x)); }
inline CDB AreaTangent(CDB z) {
    const double x = z.re, y = z.im;
    return {0.25 * std::log1p(4.0 * x / ((1.0 - x) * (1.0 - x) + y * y)),
            0.5 * std::atan2(2.0 * y, (1.0 - x) * (1.0 + x) - y * y)};
}

} // namespace qx

#endif
