#ifndef QX_SPECIAL_EXTENDED_H
#define QX_SPECIAL_EXTENDED_H

#include "frame/constants.h"
#include "frame/extended.h"

#include <cmath>

namespace qx {

// sin(pi x) and cos(pi x), exact zeros and ones included.
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

inline bool IsInteger(double x) { return std::floor(x) == x && !std::isinf(x); }
inline bool IsOdd(double x) { return std::fmod(x, 2.0) != 0; } // of an integer

} // namespace qx

#endif
