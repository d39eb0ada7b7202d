#ifndef QX_SPECIAL_FACTORIAL_H
#define QX_SPECIAL_FACTORIAL_H

#include <cstdint>

namespace qx {

// n!: from a table up to 33, by a running product in extended precision up to 50, by GammaFunction
// above. NaN for n < 0; +infinity from 171 on.
double Factorial(int32_t n);

// ln n! by LnGammaFunction. NaN for n < 0.
double LnFactorial(int32_t n);

} // namespace qx

#endif
