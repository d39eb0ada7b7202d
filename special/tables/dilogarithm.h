#ifndef QX_SPECIAL_TABLES_DILOGARITHM_H
#define QX_SPECIAL_TABLES_DILOGARITHM_H

#include "special/rational.h"

// Made by tools/approximations/integrals.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment tells
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// -Li2(-w) / w in w; degree 7 over 7 on [-0.5, 0.5]: 5.1e-18, 4.0e-17
inline constexpr Rational<8, 8> dilogarithm = {
    0.0,
    {
        1.0, 3.3017253520843575, 4.268155189304587, 2.7231211539306246, 0.8852104296232652,
        0.13501362965047473, 0.007402254206559935, 4.726593738570873e-05
    },
    {
        1.0, 3.5517253520843575, 5.044975416214567, 3.652228857752687, 1.419697654542816,
        0.28515456407635936, 0.0256628726420844, 0.0007001079025531724
    }
};

} // namespace qx::table

#endif
