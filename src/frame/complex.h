#ifndef QX_FRAME_COMPLEX_H
#define QX_FRAME_COMPLEX_H

#include "frame/elements.h"

#include <cmath>

namespace qx {

// Complex arithmetic, written out, because the standard library's may call helper functions that
// round differently on another target.

inline CDB operator+(CDB a, CDB b) { return {a.re + b.re, a.im + b.im}; }
inline CDB operator+(CDB a, double b) { return {a.re + b, a.im}; }
inline CDB operator-(CDB a, CDB b) { return {a.re - b.re, a.im - b.im}; }
inline CDB operator-(CDB a) { return {-a.re, -a.im}; }
inline CDB operator*(CDB a, CDB b) {
    return {a.re * b.re - a.im * b.im, a.re * b.im + a.im * b.re};
}
inline CDB operator*(CDB a, double b) { return {a.re * b, a.im * b}; }
inline CDB operator/(CDB a, double b) { return {a.re / b, a.im / b}; }
inline CDB &operator+=(CDB &a, CDB b) { return a = a + b; }
inline CDB &operator-=(CDB &a, CDB b) { return a = a - b; }

// Does not overflow or underflow unless the quotient does (R. L. Smith, "Algorithm 116: Complex
// division", 1962).
inline CDB operator/(CDB a, CDB b) {
    if (std::fabs(b.re) >= std::fabs(b.im)) {
        const double ratio = b.im / b.re;
        const double denominator = b.re + b.im * ratio;
        return {(a.re + a.im * ratio) / denominator, (a.im - a.re * ratio) / denominator};
    }
    const double ratio = b.re / b.im;
    const double denominator = b.im + b.re * ratio;
    return {(a.re * ratio + a.im) / denominator, (a.im * ratio - a.re) / denominator};
}

} // namespace qx

#endif
