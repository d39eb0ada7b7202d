#ifndef QX_FIT_GENERAL_H
#define QX_FIT_GENERAL_H

#include "fit/model_rows.h"
#include "fit/samples.h"
#include "qx/errors.h"

namespace qx {

// How a linear least-squares problem is solved.
enum LeastSquaresMethod : int32_t {
    bySVD = 0, // leaves out only singular values that are exactly 0
    byQR = 1,  // kept: 1, 2 and 3 are one method
    byQR2 = 2,
    byQR3 = 3,
    byLU = 4,       // on the normal equations
    byCholesky = 5, // on the normal equations
    byCutSVD = 6    // without singular values up to n eps times the largest one
};

// The c that minimises sum of |w| (y - H c)^2. The covariance, k by k or null, is the (pseudo-)
// inverse of H^T |W| H.
//
// ErrOrderNotPositive (k < 1), ErrPolynomialOrderTooHigh (n < k), ErrInvalidSelector,
// ErrOutOfMemory, ErrNonFiniteInput, ErrSingularMatrix (not by singular values),
// ErrIterationLimit.
ErrorCode SolveLinearModel(const LinearModel &model, int32_t method, DBL *c, DBL *covariance);

// The same for a matrix h of n rows and k columns, with the covariance, if that is not empty, the
// values h c and their MSE.
ErrorCode FitGeneral(const ConstRealMatrix &h, const FitSamples &samples, int32_t algorithm,
                     RealVector c, const RealMatrix &covariance, const FitOutput &out);

// Solves r x = v for the upper triangle of a square matrix; x may be v. ErrSingularMatrix if a
// diagonal element is 0 or NaN.
ErrorCode SolveUpperTriangular(const ConstRealMatrix &r, ConstRealVector v, RealVector x);

} // namespace qx

#endif
