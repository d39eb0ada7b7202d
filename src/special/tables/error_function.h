#ifndef QX_SPECIAL_TABLES_ERROR_FUNCTION_H
#define QX_SPECIAL_TABLES_ERROR_FUNCTION_H

#include "special/rational.h"

// Made by tools/approximations/integrals.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment gives
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// erf(x) / x in x^2; degree 5 over 5 on [0.0, 1.0]: 9.2e-19, 1.5e-17
inline constexpr Rational<6, 6> erfSmall = {
    0.0,
    {
        1.1283791670955126, 0.14365581715028763, 0.0455033341653278, 0.0018829155471563983,
        0.00019709588069752516, 8.625602445726376e-08
    },
    {
        1.0, 0.46064498648983654, 0.0938746087651241, 0.010705251871973175, 0.0006937362332349159,
        2.0866484101019162e-05
    }
};

// exp(x^2) erfc(x) in x; degree 8 over 8 on [1.0, 8.0]: 6.6e-18, 2.6e-17
inline constexpr Rational<9, 9> erfcMid = {
    0.0,
    {
        0.9999999908058698, 1.8440123617815711, 1.6777726582095431, 0.9455018892325453,
        0.353085125933982, 0.08741654693936876, 0.013418132857014866, 0.0010145567332721002,
        4.1740752017863974e-13
    },
    {
        1.0, 2.9723914294259126, 4.031757741275386, 3.2747129465600677, 1.7524391755385071,
        0.6377178574793044, 0.1558409692613541, 0.023783019204919747, 0.0017982550455688793
    }
};

// exp(x^2) erfc(x) in x; degree 5 over 6 on [8.0, 26.65]: 2.4e-17, 1.6e-17
inline constexpr Rational<6, 7> erfcFar = {
    0.0,
    {
        0.8942757825833094, 2.1807318710494883, 1.8298242576981274, 1.4529063664720585,
        0.37539978434358673, 0.16013734879453143
    },
    {
        1.0, 2.8740030481588463, 5.010933673536251, 3.5759684393268483, 2.717127514695279,
        0.6653787933871684, 0.2838360605446752
    }
};

} // namespace qx::table

#endif
