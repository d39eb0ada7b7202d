#ifndef QX_FIT_ROBUST_H
#define QX_FIT_ROBUST_H

#include "fit/model_rows.h"
#include "fit/robust_weights.h"
#include "qx/errors.h"

namespace qx {

// When reweighting ends: a step changes the residuals, in the mean of their absolute values, by no
// more than `tolerance` of them; or that mean is at most `floor`; or after `iterations` steps. 0
// or below select 0.0001 and 1e-12.
struct RobustLimits {
    double tolerance, floor;
    int32_t iterations;
};
inline constexpr int32_t robustIterations = 500;

// The c of a linear model in a robust norm, by reweighted least squares from the least-squares
// solution on; leastSquares ends with that. The leverages of bisquare are those of the rows with
// the weights of the model.
//
// As SolveLinearModel by singular values, and ErrNaNInData.
ErrorCode SolveRobustly(const LinearModel &model, FitNorm norm, RobustLimits limits, DBL *c);

} // namespace qx

#endif
