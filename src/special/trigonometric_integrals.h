#ifndef QX_SPECIAL_TRIGONOMETRIC_INTEGRALS_H
#define QX_SPECIAL_TRIGONOMETRIC_INTEGRALS_H

namespace qx {

// Si(x), the integral of sin(t) / t from 0 to x; odd, +-pi / 2 at the infinities.
double SineIntegral(double x);

// Ci(x) = gamma + ln |x| + the integral of (cos(t) - 1) / t from 0 to |x|; -infinity at 0, 0 at the
// infinities.
double CosineIntegral(double x);

// Both by rational functions of x^2 up to |x| = 4 and by the auxiliary functions f and g beyond.
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, 5.2.6 to 5.2.9.

} // namespace qx

#endif
