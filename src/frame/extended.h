#ifndef QX_FRAME_EXTENDED_H
#define QX_FRAME_EXTENDED_H

#include <cmath>

namespace qx {

// A number as the unevaluated sum of two doubles, about 32 digits. For sums that lose digits to
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

inline Extended operator-(Extended a) { return {-a.high, -a.low}; }
inline Extended operator-(Extended a, Extended b) { return a + -b; }

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

} // namespace qx

#endif
