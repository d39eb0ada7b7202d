#ifndef QX_SPECIAL_ZETA_H
#define QX_SPECIAL_ZETA_H

namespace qx {

// Riemann's zeta function for real x. +infinity at 1 and (kept) at +infinity; NaN for NaN,
// -infinity and x < -30.8148.
//
//   x < 0           reflection from 1 - x
//   0, 2 ... 30     integers from a table of zeta - 1
//   x < 1           1 + R(x) / (1 - x), the pole divided out
//   1 < x <= 10     1 + x R(1/x) / (2^x (x - 1)), degree 8 over 8
//   10 < x <= 50    1 + 2^-x + exp(R(x)), degree 10 over 10
//   50 < x < 127    (1 + 3^-x + 5^-x + ...) / (1 - 2^-x)
//   127 <= x        1
double Zeta(double x);

} // namespace qx

#endif
