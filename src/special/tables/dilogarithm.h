#ifndef QX_SPECIAL_TABLES_DILOGARITHM_H
#define QX_SPECIAL_TABLES_DILOGARITHM_H

#include "special/rational.h"

// Made by tools/approximations/integrals.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment gives
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// -Li2(-w) / w in w; degree 7 over 7 on [-0.5, 0.5]: 5.1e-18, 8.8e-17
inline constexpr Rational<8, 8> dilogarithm = {
    -0.5,
    {
        1.164481052930025, 6.180677735229261, 12.37236713465723, 11.660898534664474,
        5.27402589835489, 1.0365542820048053, 0.06635141686839639, 0.00043336167413032735
    },
    {
        1.0, 5.688632146432228, 12.49984933974039, 13.414501317856791, 7.33472018240129,
        1.9422865100139008, 0.21282568892183365, 0.006418997474794069
    }
};

} // namespace qx::table

#endif
