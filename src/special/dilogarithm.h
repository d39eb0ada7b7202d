#ifndef QX_SPECIAL_DILOGARITHM_H
#define QX_SPECIAL_DILOGARITHM_H

namespace qx {

// Li2(1 - x), the integral of -ln t / (t - 1) from 1 to x. NaN for x < 0; -infinity at +infinity.
//
// A rational function of 1 - x on [0.5, 1.5]; outside, the reflections
// Li2(1 - x) = pi^2 / 6 - ln(x) ln(1 - x) - Li2(x) and Li2(1 - x) = -ln(x)^2 / 2 - Li2(1 - 1 / x).
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, 27.7.
double Dilogarithm(double x);

} // namespace qx

#endif
