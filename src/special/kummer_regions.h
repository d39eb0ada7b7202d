#ifndef QX_SPECIAL_KUMMER_REGIONS_H
#define QX_SPECIAL_KUMMER_REGIONS_H

#include "special/hypergeometric_terms.h"

namespace qx {

// The relative error that a value may have; one whose estimate is larger becomes a NaN.
constexpr double kHyperAccepted = 1e-12;

// M(a, b, x): from |x| = 30 on both sums of the asymptotic form (13.7.2 of the DLMF), where their
// smallest terms are below 9e-15 of the value; else BestForm of the power series and of exp(x) times
// that of (b - a, b, -x).
//
// x = +infinity gives the infinity of the limit, x = -infinity 0 for a > 0 or an infinity; NaN for
// a, b that are not finite and for b = 0, -1, -2, ... unless the series ends before.
// Source: J. W. Pearson, S. Olver and M. A. Porter, Numerical methods for the computation of the
// confluent and Gauss hypergeometric functions, 2017.
double KummerByRegion(double x, double a, double b);

// A sum of (p)_n (q)_n / n! y^n for small |y|, which first falls: cut at its smallest term.
struct AsymptoticResult {
    double sum;
    double error; // of the sum, relative
};
AsymptoticResult AsymptoticSum(double p, double q, double y);

} // namespace qx

#endif
