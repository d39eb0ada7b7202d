#ifndef QX_LINALG_COMPLEX_FUNCTIONS_H
#define QX_LINALG_COMPLEX_FUNCTIONS_H

#include "linalg/scalar.h"

#include <cmath>

namespace qx {

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
inline double Exponential(double x) { return std::exp(x); }
inline CDB Exponential(CDB z) {
    const double modulus = std::exp(z.re);
    return {modulus * std::cos(z.im), modulus * std::sin(z.im)};
}

} // namespace qx

#endif
