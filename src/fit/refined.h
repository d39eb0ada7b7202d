#ifndef QX_FIT_REFINED_H
#define QX_FIT_REFINED_H

#include "fit/polynomial.h"
#include "linalg/matrix.h"

namespace qx {

// Least squares whose coefficients are exact to nearly their last digit. A first solution comes from
// the singular values of the triangle that the rows reduce to. Then residuals and their products
// with the columns, in pairs of doubles (T. J. Dekker, "A floating-point technique for extending
// the available precision", 1971), give corrections by the same singular values, the seminormal
// equations (A. Bjorck, "Stability analysis of the method of seminormal equations for linear least
// squares problems", 1987): each leaves an error smaller by the condition number times eps.
//
// Columns, y and the weights are scaled by powers of two first. Singular values of the scaled
// weighted rows up to n times the tolerance times the largest one count as 0, and of all solutions
// the one that is shortest in the scaled columns is taken; a tolerance below 0 or NaN is eps, and
// one of 0 stays. The values are those of the coefficients before these are rounded, and the MSE is
// the mean of |w| r^2 for the residuals r of these values. What overflows is infinite.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit; WarnRankDeficient where singular values
// count as 0.

// Above this order of a polynomial the coefficients of powers would lose what pairs hold.
constexpr int32_t highestRefined = 50;

// For a matrix h of n rows and 1 <= k <= n columns, with the inverse of H^T |W| H (over the singular
// values that count) where `covariance` is not empty.
ErrorCode FitGeneralRefined(const ConstRealMatrix &h, const FitSamples &samples, double tolerance,
                            RealVector c, const RealMatrix &covariance, const FitOutput &out);

// For a polynomial of order c.size() - 1, at most highestRefined, with at least as many samples as free terms. Without
// fixed terms it is fitted in Chebyshev polynomials of x brought to [-1, 1], else in the free powers
// of x over a power of two.
ErrorCode FitPolynomialRefined(const FitSamples &samples, const FixedTerms &fixed, double tolerance,
                               RealVector c, const FitOutput &out);

} // namespace qx

#endif
