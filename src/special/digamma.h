#ifndef QX_SPECIAL_DIGAMMA_H
#define QX_SPECIAL_DIGAMMA_H

namespace qx {

// psi(x), the derivative of ln gamma(x). +infinity at +infinity and at the poles 0, -1, -2, ...;
// NaN at NaN and -infinity.
//
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964: the sum 6.3.2
// for integers up to 10, the recurrence 6.3.5 up to 10, the asymptotic series 6.3.18 from there,
// the reflection 6.3.7 for x <= 0.
double Digamma(double x);

} // namespace qx

#endif
