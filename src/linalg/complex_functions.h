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
    const double t = std::sqrt(0.5 * std::fabs(z.re) + 0.5 * modulus);
    if (z.re >= 0.0)
        return {t, z.im / (2.0 * t)};
    return {std::fabs(z.im) / (2.0 * t), std::copysign(t, z.im)};
}

} // namespace qx

#endif
