#ifndef QX_SPECIAL_INCOMPLETE_BETA_H
#define QX_SPECIAL_INCOMPLETE_BETA_H

#include "frame/extended.h"

namespace qx {

// A point between 0 and 1 and its distance from 1, both to full relative precision.
struct UnitPoint {
    Extended x;
    Extended y; // 1 - x

    // p / (p + q) of positive numbers (one may be 0) whose sum does not overflow.
    static UnitPoint Share(Extended p, Extended q) {
        const Extended sum = p + q;
        return {p / sum, q / sum};
    }
};

// The two parts, whose sum is 1, each to full relative precision where it is the smaller one:
// within 21 eps on 500 points with parameters 1/2 to 20000 (median 0.7), more where a parameter is
// below 1/2.
struct BothTails {
    double lower;
    double upper;
};

// The regularised incomplete beta function I_x(a, b) and 1 - I_x(a, b), for a, b from 1e-3 to 1e10
// or so and 0 <= x <= 1. By A. R. DiDonato and A. H. Morris (Significant digit computation of the
// incomplete beta function ratios, 1992): their continued fraction, and the power series where it
// is short. The power in front, x^a (1 - x)^b / beta(a, b), is formed in twice the precision (C.
// Loader's deviance).
BothTails IncompleteBeta(double a, double b, UnitPoint point);

// The power x^a y^b / beta(a, b): x y times the density of the beta distribution.
double BetaPower(double a, double b, UnitPoint point);

// The point whose lower part is `tail`, or whose upper part is `tail` if `isUpper`; 0 < tail < 1. A
// coordinate below 1e-290 is returned as 0.
UnitPoint InverseIncompleteBeta(double a, double b, double tail, bool isUpper);

} // namespace qx

#endif
