#ifndef QX_SPECIAL_GAMMA_QUOTIENT_H
#define QX_SPECIAL_GAMMA_QUOTIENT_H

#include <initializer_list>

namespace qx {

// The product of gamma over the numerators, divided by the product of gamma over the denominators,
// times exp(scale). A pole among the denominators gives 0, a pole among the numerators NaN.
// Computed from the gamma functions themselves while these are in range, otherwise from logarithms:
// parameters of some hundreds then cost about as many eps, but the value is not lost.
double GammaQuotient(std::initializer_list<double> numerators,
                     std::initializer_list<double> denominators, double scale = 0);

} // namespace qx

#endif
