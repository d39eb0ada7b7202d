#ifndef QX_SPECIAL_NORMAL_TAIL_H
#define QX_SPECIAL_NORMAL_TAIL_H

#include "special/tables/normal.h"

namespace qx {

// P(X > x) exp(x^2 / 2) of the normal distribution, x >= 0, within 1.5 eps: to x = 10 a polynomial
// of degree 10 on intervals of length 1/4.
inline double ScaledNormalTail(double x) {
    constexpr double far = 10.0;
    if (!(x < far))
        return table::millsFar(1.0 / x / x) / x;
    return Piece(table::mills, 4.0, x);
}

} // namespace qx

#endif
