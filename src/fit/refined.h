#ifndef QX_FIT_REFINED_H
#define QX_FIT_REFINED_H

#include "fit/polynomial.h"
#include "linalg/matrix.h"

namespace qx {

// Least squares whose coefficients are accurate to nearly the last digit. A first solution comes
// from the singular values of the triangle to which the rows are reduced. Then residuals and their
// products with the columns, computed in pairs of doubles (T. J. Dekker, "A floating-point technique
// for extending the available precision", 1971), give corrections by the same singular values: the
// seminormal equations (A. Bjorck, "Stability analysis of the method of seminormal equations for
// linear least squares problems", 1987). Each correction multiplies the error by about the condition
// number times eps.
//
// Columns, y and the weights are scaled by powers of two first. Singular values of the scaled
// weighted rows up to n times the tolerance times the largest one count as 0, and of all solutions
// the one that is shortest in the scaled columns is returned; a tolerance that is negative or NaN
// means eps, and a tolerance of 0 is used as it is. The values are those of the coefficients before
// rounding, and the MSE is the mean of |w| r^2 for the residuals r of these values. Results that
// overflow are infinite.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit; WarnRankDeficient if singular values count
// as 0.

// Above this order of a polynomial the conversion to powers would lose the digits that pairs hold.
constexpr int32_t highestRefined = 50;

// For a matrix h of n rows and 1 <= k <= n columns, with the inverse of H^T |W| H (over the singular
// values that count) if `covariance` is not empty.
ErrorCode FitGeneralRefined(const ConstRealMatrix &h, const FitSamples &samples, double tolerance,
                            RealVector c, const RealMatrix &covariance, const FitOutput &out);

// For a polynomial of order c.size() - 1, at most highestRefined, with at least as many samples as free
// terms. Without fixed terms it is fitted in Chebyshev polynomials of x mapped to [-1, 1], otherwise in the
// free powers of x divided by a power of two.
ErrorCode FitPolynomialRefined(const FitSamples &samples, const FixedTerms &fixed, double tolerance,
                               RealVector c, const FitOutput &out);

} // namespace qx

#endif
