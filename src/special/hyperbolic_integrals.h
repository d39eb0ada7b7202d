#ifndef QX_SPECIAL_HYPERBOLIC_INTEGRALS_H
#define QX_SPECIAL_HYPERBOLIC_INTEGRALS_H

namespace qx {

// Shi(x), the integral of sinh(t) / t from 0 to x; odd, an infinity for |x| > 880.
double HyperbolicSineIntegral(double x);

// Chi(x) = gamma + ln |x| + the integral of (cosh(t) - 1) / t from 0 to |x|; even, -infinity at 0,
// +infinity for |x| > 880.
double HyperbolicCosineIntegral(double x);

// Both by their power series up to |x| = 8 and by Chebyshev series in 1 / |x| beyond. Source:
// M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, 5.2.3, 5.2.4, 5.2.17;
// C. W. Clenshaw, A note on the summation of Chebyshev series, 1955.

} // namespace qx

#endif
