#ifndef QX_SPECIAL_TABLES_RECIPROCAL_GAMMA_H
#define QX_SPECIAL_TABLES_RECIPROCAL_GAMMA_H

#include "special/rational.h"

// Made by tools/approximations/gamma.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment gives
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// gamma(x) in x; degree 7 over 6 on [2.0, 3.0]: 1.2e-17, 1.6e-17
inline constexpr Rational<8, 7> gammaTwoToThree = {
    2.5,
    {
        1.329340388179137, 0.8771402691716382, 0.37678087223144263, 0.10430591195185979,
        0.022291799920772994, 0.0033057251095178096, 0.0003653891074916176, 1.866972121859094e-05
    },
    {
        1.0, -0.04332543640935861, -0.17849448251441485, 0.0343318056752705, 0.006290051255175323,
        -0.002512903326043631, 0.00022088263202679634
    }
};

} // namespace qx::table

#endif
