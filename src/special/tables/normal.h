#ifndef QX_SPECIAL_TABLES_NORMAL_H
#define QX_SPECIAL_TABLES_NORMAL_H

#include "special/rational.h"

// Made by tools/approximations/normal.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment gives
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// (P(X <= x) - 1/2) / x in x^2; degree 4 over 4 on [0.0, 1.0]: 1.7e-17, 7.2e-17
inline constexpr Rational<5, 5> centralNormal = {
    0.5,
    {
        0.36804899320837464, 0.02493302997275959, 0.0032712434843198833, 5.181007188470011e-05,
        1.2788203766305618e-06
    },
    {
        1.0, 0.22357203612188561, 0.02102745737350842, 0.001001071050475398,
        2.0737564944687085e-05
    }
};

// P(X > x) exp(x^2 / 2) in x; degree 7 over 7 on [0.0, 2.0]: 1.5e-18, 9.1e-18
inline constexpr Rational<8, 8> millsNear = {
    0.0,
    {
        0.5, 0.46829358693599965, 0.22590214468722447, 0.06470000728373303, 0.011485868160599665,
        0.0011820808190538738, 5.5228942618520315e-05, -4.703055247416153e-10
    },
    {
        1.0, 1.734471734674865, 1.3357125076204739, 0.5938700549995287, 0.16525796993171377,
        0.02891738329288631, 0.0029639403172047074, 0.000138392379288631
    }
};

// P(X > x) exp(x^2 / 2) in x; degree 8 over 8 on [2.0, 10.0]: 1.4e-19, 3.8e-17
inline constexpr Rational<9, 9> millsMid = {
    0.0,
    {
        0.4999999742487788, 0.6624307017349121, 0.43245074995187854, 0.17502929059965047,
        0.04703683726615445, 0.008408394913923785, 0.0009368443385377597, 5.209853477990599e-05,
        9.495344582302225e-15
    },
    {
        1.0, 2.122745622785067, 2.0586085618121914, 1.1971769585625973, 0.45955064197061957,
        0.12025208668600253, 0.0212073164400986, 0.0023483203743646657, 0.00013059166293642168
    }
};

// x P(X > x) exp(x^2 / 2) in 1 / x^2; degree 4 over 4 on [0.0, 0.01]: 1.3e-18, 1.4e-17
inline constexpr Rational<5, 5> millsFar = {
    0.005,
    {
        0.3969767667170171, 11.985786639407804, 103.35701928720074, 258.80525473109907,
        91.21877895233693
    },
    {
        1.0, 31.16854854031805, 287.9737682060107, 858.7670671351692, 586.0694291785389
    }
};

} // namespace qx::table

#endif
