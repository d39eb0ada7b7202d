#ifndef QX_SPECIAL_TABLES_EXPONENTIAL_INTEGRAL_H
#define QX_SPECIAL_TABLES_EXPONENTIAL_INTEGRAL_H

#include "special/rational.h"

// Made by tools/approximations/integrals.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment gives
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// (E_1(x) + ln x + gamma) / x in x; degree 4 over 4 on [0.0, 0.4]: 2.6e-19, 2.2e-18
inline constexpr Rational<5, 5> e1Small = {
    0.0,
    {
        1.0, 0.1570889217612963, 0.022793137228392473, 0.000796653158702257,
        1.0134696571307377e-05
    },
    {
        1.0, 0.4070889217612962, 0.06900981211316795, 0.005849721644519018, 0.00021252959434746774
    }
};

// x exp(x) E_1(x) in x; degree 8 over 8 on [0.4, 2.0]: 4.7e-18, 9.8e-18
inline constexpr Rational<9, 9> e1Near = {
    0.0,
    {
        0.00872947411821896, 4.2235760006478005, 120.69218662851823, 968.8067222855801,
        2987.540271517975, 3989.7676150126654, 2380.1002550569983, 602.1903891381908,
        51.01943160183615
    },
    {
        1.0, 46.310130067529975, 567.1682731047456, 2691.4975898007033, 5759.940118894691,
        5919.075392871763, 2931.3912578378377, 653.2034642674319, 51.01961176796179
    }
};

// x exp(x) E_1(x) in x; degree 7 over 7 on [2.0, 10.0]: 1.8e-17, 2.0e-17
inline constexpr Rational<8, 8> e1Mid = {
    0.0,
    {
        0.035708291779591096, 2.855587047852946, 16.945742765195767, 29.747618297547707,
        20.860674449496514, 6.476152588774541, 0.8756194392715191, 0.04140927014894518
    },
    {
        1.0, 11.638287769549654, 36.81197461422881, 46.22096927290951, 26.58542421132884,
        7.310363081298274, 0.9170287032690253, 0.04140927020611775
    }
};

// x exp(x) E_1(x) in 1 / x; degree 7 over 7 on [0.0, 0.1]: 5.1e-19, 2.4e-17
inline constexpr Rational<8, 8> e1Far = {
    0.0,
    {
        1.0, 37.610869435432086, 516.7090967030763, 3253.2533656156693, 9629.82681278417,
        12225.170852742005, 5007.465402227364, 187.18390899360853
    },
    {
        1.0, 38.610869435432086, 553.3199661385104, 3735.3515928826578, 12466.203690119797,
        19733.930274159175, 12854.724049934794, 2361.3396467536268
    }
};

} // namespace qx::table

#endif
