#ifndef QX_SPECIAL_DIAGONAL_H
#define QX_SPECIAL_DIAGONAL_H

#include "frame/complex.h"

#include <cmath>

namespace qx {

// The few complex operations that the Kelvin functions need, with a fixed order of arithmetic.
// Arguments must be far from overflow.
typedef CDB Complex;

inline Complex RootOfRightHalf(Complex a) {
    const double re = std::sqrt(0.5 * (std::hypot(a.re, a.im) + a.re));
    return {re, a.im / (2 * re)};
}
inline Complex Log(Complex a) { return {std::log(std::hypot(a.re, a.im)), std::atan2(a.im, a.re)}; }
inline Complex Exp(Complex a) {
    const double e = std::exp(a.re);
    return {e * std::cos(a.im), e * std::sin(a.im)};
}
inline double Size(Complex a) { return std::fabs(a.re) + std::fabs(a.im); }

} // namespace qx

#endif
