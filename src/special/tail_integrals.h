#ifndef QX_SPECIAL_TAIL_INTEGRALS_H
#define QX_SPECIAL_TAIL_INTEGRALS_H

#include "special/incomplete_beta.h"

namespace qx {

// factor * exp(exponent), separate so that the product overflows or underflows only when its value
// does.
struct Scaled {
    double factor;
    Extended exponent;

    double value() const; // rounded once, even if the result is subnormal
    double logarithm() const;
    Scaled operator*(double by) const { return {factor * by, exponent}; }
};

// Two parts whose sum is 1, represented by the smaller one, or by one that is hardly above a half;
// the other follows from it. `slope` is the derivative of the lower part in ln x (gamma) or
// ln(x / y) (beta).
struct Tails {
    Scaled smaller;
    bool isLower;
    Scaled slope;

    double part(bool lower) const;
    double logarithm(bool lower) const;
};

// The regularised incomplete gamma functions P(a, x) and Q(a, x), and the beta function I_x(a, b)
// with its complement, each part within 4 eps where it is the smaller one, for a and b up to 1e25.
//
// In the variable u = ln t, or ln(t / (1 - t)), the integrand is the exponential of a concave
// function without singularities nearby, for parameters of any size. Therefore one Gauss-Legendre
// rule on intervals of length at most 5.5 serves all of them: its terms are positive, and its
// prefactor, the integrand at x, is computed in twice the precision (C. Loader's deviance). A
// parameter below 8 is first raised by the recurrence, whose terms are also positive.
Tails GammaTails(double a, double x);
Tails BetaTails(double a, double b, const UnitPoint &point);

} // namespace qx

#endif
