#ifndef QX_POLY_COMPLEX_ARITHMETIC_H
#define QX_POLY_COMPLEX_ARITHMETIC_H

#include "linalg/scalar.h"

#include <cmath>

namespace qx {

// The quotient of this family. Like the operator of frame/complex.h it avoids premature overflow
// and underflow, but it forms its denominator in another order.
inline CDB Quotient(CDB a, CDB b) {
    if (std::fabs(b.re) >= std::fabs(b.im)) {
        const double ratio = b.im / b.re;
        const double denominator = (ratio * ratio + 1.0) * b.re;
        return {(a.re + ratio * a.im) / denominator, (a.im - ratio * a.re) / denominator};
    }
    const double ratio = b.re / b.im;
    const double denominator = (ratio * ratio + 1.0) * b.im;
    return {(ratio * a.re + a.im) / denominator, (ratio * a.im - a.re) / denominator};
}

inline double Quotient(double a, double b) { return a / b; }

inline double ScaledHypot(double a, double b) {
    a = std::fabs(a);
    b = std::fabs(b);
    const double larger = a > b ? a : b, smaller = a > b ? b : a;
    if (!(larger > 0.0))
        return larger + smaller; // 0, or NaN
    const double ratio = smaller / larger;
    return larger * std::sqrt(ratio * ratio + 1.0);
}
inline double ScaledHypot(CDB z) { return ScaledHypot(z.re, z.im); }

inline bool IsZero(double x) { return x == 0.0; }
inline bool IsZero(CDB z) { return z.re == 0.0 && z.im == 0.0; }
inline bool IsNaN(CDB z) { return z.re != z.re || z.im != z.im; }
inline bool IsFinite(double x) { return std::isfinite(x); }
inline bool IsFinite(CDB z) { return std::isfinite(z.re) && std::isfinite(z.im); }

} // namespace qx

#endif
