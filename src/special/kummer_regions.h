#ifndef QX_SPECIAL_KUMMER_REGIONS_H
#define QX_SPECIAL_KUMMER_REGIONS_H

#include "special/hypergeometric_terms.h"

namespace qx {

// The largest accepted relative error; a value with a larger estimate is replaced by NaN.
constexpr double kHyperAccepted = 1e-12;

// M(a, b, x): from |x| = 30 on both sums of the asymptotic form (13.7.2 of the DLMF), if their
// smallest terms are below 9e-15 of the value; otherwise BestForm of the power series and of exp(x)
// times that of (b - a, b, -x).
//
// x = +infinity gives the infinity of the limit; x = -infinity gives 0 for a > 0, otherwise an
// infinity. NaN if a or b is not finite and for b = 0, -1, -2, ..., unless the series ends before
// the pole.
// Source: J. W. Pearson, S. Olver and M. A. Porter, Numerical methods for the computation of the
// confluent and Gauss hypergeometric functions, 2017.
double KummerByRegion(double x, double a, double b);

// A sum of (p)_n (q)_n / n! y^n for small |y|, whose terms fall at first: truncated at its smallest
// term.
struct AsymptoticResult {
    double sum;
    double error; // relative error of the sum
};
AsymptoticResult AsymptoticSum(double p, double q, double y);

} // namespace qx

#endif
