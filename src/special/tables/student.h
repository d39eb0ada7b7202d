#ifndef QX_SPECIAL_TABLES_STUDENT_H
#define QX_SPECIAL_TABLES_STUDENT_H

#include "special/rational.h"

// Made by tools/approximations/student.py. Each set: the centre, then numerator and
// denominator in ascending powers of the distance from the centre. The comment gives
// the degrees, the interval, and the largest relative error measured there, first with
// exact coefficients, then with these doubles.

namespace qx::table {

// 1 - gamma((n + 1) / 2) / (gamma(n / 2) sqrt(n / 2)) in n; degree 7 over 7 on [1.0, 3.0]:
// 3.6e-17, 7.1e-17
inline constexpr Rational<8, 8> studentFirst = {
    0.0,
    {
        0.9044365091282336, 16.69696292403378, 63.55580864379188, 76.57310948577718,
        43.72981304894917, 12.414980742678825, 1.5393909434902915, -2.6584732048935244e-08
    },
    {
        1.0, 24.425658863363815, 143.53429349396083, 321.3570452515868, 336.71179517374526,
        182.18324988515366, 50.42974165890029, 6.157558499141735
    }
};

// 1 - gamma((n + 1) / 2) / (gamma(n / 2) sqrt(n / 2)) in n; degree 7 over 7 on [3.0, 10.0]:
// 2.2e-17, 3.9e-17
inline constexpr Rational<8, 8> studentSecond = {
    0.0,
    {
        0.8473443240877746, 5.508350670603151, 8.47917476464824, 6.154928004513231,
        2.4567457815911644, 0.5320722148321255, 0.05693800523519664, 4.4857845994354285e-13
    },
    {
        1.0, 10.41090266571571, 30.13462563766154, 38.64387015774391, 26.21387744159231,
        10.132164432054603, 2.156757851921026, 0.22775202113689144
    }
};

// 1 - gamma((n + 1) / 2) / (gamma(n / 2) sqrt(n / 2)) in n; degree 5 over 5 on [10.0, 40.0]:
// 1.4e-15, 1.4e-15
inline constexpr Rational<6, 6> studentThird = {
    0.0,
    {
        0.8197008159868118, 1.2182250042964222, 1.1888760368463107, 0.3577531482622212,
        0.12129581552370926, -8.079136190619612e-16
    },
    {
        1.0, 4.621271276451061, 5.713293731442264, 5.017771586325555, 1.4916605009237867,
        0.4851832620939334
    }
};

// the same by n in 1 / n; degree 4 over 4 on [0.0, 0.025]: 8.2e-20, 1.3e-18
inline constexpr Rational<5, 5> studentMany = {
    0.0,
    {
        0.25, -0.27682014713714015, 1.6263575147480365, -0.8918854810730125, 0.8430215503757957
    },
    {
        1.0, -0.982280588548561, 6.538894985424101, -2.944677018289729, 3.871168593142751
    }
};

} // namespace qx::table

#endif
