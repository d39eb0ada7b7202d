#ifndef QX_SPECIAL_ERROR_FUNCTION_H
#define QX_SPECIAL_ERROR_FUNCTION_H

namespace qx {

// erf(x), 2 / sqrt(pi) times the integral of exp(-t^2) from 0 to x, and erfc(x) = 1 - erf(x). Each
// has its own form where it is the smaller one, erf up to |x| = 1 and erfc beyond, with the
// rational approximations of special/tables/error_function.h.
double Erf(double x);
double ErfC(double x);

} // namespace qx

#endif
