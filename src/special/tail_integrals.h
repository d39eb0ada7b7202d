#ifndef QX_SPECIAL_TAIL_INTEGRALS_H
#define QX_SPECIAL_TAIL_INTEGRALS_H

#include "special/incomplete_beta.h"

namespace qx {

// factor * exp(exponent), so that neither overflows nor underflows before its time.
struct Scaled {
    double factor;
    Extended exponent;

    double value() const; // rounded once, subnormal numbers included
    double logarithm() const;
    Scaled operator*(double by) const { return {factor * by, exponent}; }
};

// The two parts of a whole of 1: the smaller one, or one that is hardly above a half, from which the
// other follows. `slope` is the derivative of the lower part in ln x (gamma) or ln(x / y) (beta).
struct Tails {
    Scaled smaller;
    bool isLower;
    Scaled slope;

    double part(bool lower) const;
    double logarithm(bool lower) const;
};

// The regularised incomplete gamma functions P(a, x) and Q(a, x), and the beta function I_x(a, b)
// with its complement: each part within 4 eps where it is the smaller one, for a and b up to 1e25.
//
// In the variable u = ln t, or ln(t / (1 - t)), the integrand is the exponential of a concave function
// without singularities nearby, at every size of the parameters. So one rule of Gauss and Legendre
// on intervals of length 3 serves all: its terms are positive and its front, the integrand at x, is
// formed in twice the precision (C. Loader's deviance). A parameter below 8 is first raised by
// the recurrence, whose terms are positive too.
Tails GammaTails(double a, double x);
Tails BetaTails(double a, double b, const UnitPoint &point);

} // namespace qx

#endif
