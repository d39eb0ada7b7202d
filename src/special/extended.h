#ifndef QX_SPECIAL_EXTENDED_H
#define QX_SPECIAL_EXTENDED_H

#include "frame/constants.h"

#include <cmath>

namespace qx {

// A number as the unevaluated sum of two doubles, about 32 digits; for sums that lose digits to
// cancellation and for phases of many turns.
// Source: T. J. Dekker, A floating-point technique for extending the available precision, 1971.
struct Extended {
    double high;
    double low;
};

inline Extended QuickSum(double a, double b) { // |a| >= |b|
    const double s = a + b;
    return {s, b - (s - a)};
}

inline Extended ExactSum(double a, double b) {
    const double s = a + b;
    const double t = s - a;
    return {s, (a - (s - t)) + (b - t)};
}

// Exact; the low part is NaN where a factor exceeds 2^996.
inline Extended ExactProduct(double a, double b) {
    constexpr double splitter = 134217729.0; // 2^27 + 1
    const double p = a * b;
    const double ta = splitter * a;
    const double ah = ta - (ta - a);
    const double al = a - ah;
    const double tb = splitter * b;
    const double bh = tb - (tb - b);
    const double bl = b - bh;
    return {p, ((ah * bh - p) + ah * bl + al * bh) + al * bl};
}

inline Extended operator+(Extended a, Extended b) {
    const Extended s = ExactSum(a.high, b.high);
    return QuickSum(s.high, s.low + (a.low + b.low));
}

inline Extended operator*(Extended a, Extended b) {
    const Extended p = ExactProduct(a.high, b.high);
    return QuickSum(p.high, p.low + (a.high * b.low + a.low * b.high));
}

inline Extended operator/(Extended a, Extended b) {
    const double q = a.high / b.high;
    const Extended p = ExactProduct(q, b.high);
    const double r = ((a.high - p.high) - p.low + a.low - q * b.low) / b.high;
    return QuickSum(q, r);
}

inline Extended SquareRoot(Extended a) {
    const double root = std::sqrt(a.high);
    if (!(root > 0))
        return {root, 0};
    const Extended square = ExactProduct(root, root);
    return QuickSum(root, ((a.high - square.high) - square.low + a.low) / (2 * root));
}

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
