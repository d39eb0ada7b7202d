#ifndef QX_SPECIAL_GAMMA_QUOTIENT_H
#define QX_SPECIAL_GAMMA_QUOTIENT_H

#include <initializer_list>

namespace qx {

// The product of gamma over the numerators, divided by the product of gamma over the denominators
// and times exp(scale). A pole among the denominators gives 0, one among the numerators NaN.
// By the functions themselves while these stay in range, by logarithms beyond: parameters of some
// hundreds then cost about as many eps, instead of the value.
double GammaQuotient(std::initializer_list<double> numerators,
                     std::initializer_list<double> denominators, double scale = 0);

} // namespace qx

#endif
