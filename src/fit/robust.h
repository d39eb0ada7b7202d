#ifndef QX_FIT_ROBUST_H
#define QX_FIT_ROBUST_H

#include "fit/limits.h"
#include "fit/model_rows.h"
#include "fit/robust_weights.h"
#include "qx/errors.h"

namespace qx {

inline constexpr int32_t robustIterations = 500;

// The c of a linear model in a robust norm, by reweighted least squares that start from the
// least-squares solution; for leastSquares this is the result. The limits apply to the mean of the
// absolute values of the residuals. The leverages of bisquare are those of the rows with the
// weights of the model.
//
// The codes of SolveLinearModel by singular values, and ErrNaNInData.
ErrorCode SolveRobustly(const LinearModel &model, FitNorm norm, const FitLimits &limits, DBL *c);

} // namespace qx

#endif
