#ifndef QX_SPECIAL_EXTENDED_H
#define QX_SPECIAL_EXTENDED_H

#include "frame/complex.h"
#include "frame/constants.h"
#include "frame/extended.h"

#include <cmath>

namespace qx {

// sin(pi x) and cos(pi x), with exact zeros and ones.
inline double SinPi(double x) {
    const double r = std::fmod(std::fabs(x), 2.0);
    const double s = r >= 1 ? -1.0 : 1.0;
    const double t = r >= 1 ? r - 1 : r;
    double value;
    if (t <= 0.25)
        value = std::sin(kPi * t);
    else if (t <= 0.75)
        value = std::cos(kPi * (0.5 - t));
    else
        value = std::sin(kPi * (1 - t));
    return x < 0 ? -s * value : s * value;
}

inline double CosPi(double x) {
    double r = std::fmod(std::fabs(x), 2.0);
    if (r > 1)
        r = 2 - r;
    if (r <= 0.25)
        return std::cos(kPi * r);
    if (r <= 0.75)
        return r == 0.5 ? 0.0 : std::sin(kPi * (0.5 - r));
    return -std::cos(kPi * (1 - r));
}

// exp(i pi turns), with exact zeros and ones; |turns| up to 2^52.
inline CDB TurnByPi(double turns) {
    const double x = turns - 2 * std::floor(0.5 * turns + 0.5); // -1 to 1
    const double quarters = std::floor(2 * x + 0.5);
    const double rest = x - 0.5 * quarters;
    const double sine = rest == 0 ? 0 : std::sin(kPi * rest);
    const double cosine = rest == 0 ? 1 : std::cos(kPi * rest);
    if (quarters == 0)
        return {cosine, sine};
    if (quarters == 1)
        return {-sine, cosine};
    return quarters == -1 ? CDB{sine, -cosine} : CDB{-cosine, -sine};
}

// For series that are summed in doubles or in pairs of doubles: the leading double, and a pair
// converted to Number.
inline double Leading(double x) { return x; }
inline double Leading(Extended x) { return x.high; }

template <class Number>
Number Of(Extended x);
template <>
inline double Of<double>(Extended x) {
    return x.high;
}
template <>
inline Extended Of<Extended>(Extended x) {
    return x;
}

inline bool IsInteger(double x) { return std::floor(x) == x && !std::isinf(x); }
inline bool IsOdd(double x) { return std::fmod(x, 2.0) != 0; } // x is an integer

} // namespace qx

#endif
