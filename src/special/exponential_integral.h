#ifndef QX_SPECIAL_EXPONENTIAL_INTEGRAL_H
#define QX_SPECIAL_EXPONENTIAL_INTEGRAL_H

#include <cstdint>

namespace qx {

// E_n(x), the integral of exp(-x t) / t^n from 1 to infinity. NaN for n < 0, x < 0, NaN and
// infinities; 0 for x > 709.78. At x = 0 it is 1 / (n - 1), or +infinity for n = 0 and 1.
//
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964: the expansion
// 5.1.52 for n > 5000, the continued fraction 5.1.22 for x > 1, the power series 5.1.12 below.
double ExponentialIntegral(double x, int32_t n);

// The same with E_1 by rational functions, accurate for x down to the smallest numbers.
double FastExponentialIntegral(double x, int32_t n);

} // namespace qx

#endif
