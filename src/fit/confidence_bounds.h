#ifndef QX_FIT_CONFIDENCE_BOUNDS_H
#define QX_FIT_CONFIDENCE_BOUNDS_H

#include "fit/model_rows.h"
#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Confidence and prediction bounds of a fitted model, from its Jacobian at the coefficients.

// The t such that a variable with Student's distribution of `dof` degrees of freedom lies between
// -t and t with the probability `confidence`, 0 < confidence < 1; 0 for confidences below 1e-140.
double TwoSidedT(double confidence, double dof);

// Where a model is linearised. Its rows hold the derivatives of the model with respect to its k
// parameters and, as the target, the value of the model; w are the weights, of which `used` are not
// 0.
struct FittedModel {
    LinearModel linear;
    ConstRealVector y;
    int32_t used;
};

enum class BoundsOf { Curve, Observation };

// lower and upper = f -+ t s sqrt(j' (J' W J)^-1 j [+ 1 for an observation]) at each sample, with
// s^2 = sum of |w| (y - f)^2 / (used - k), and likewise halfWidths (k elements, or none) = t s sqrt
// of the diagonal of (J' W J)^-1. Computed from the triangle R of J, without Q: j' (J' W J)^-1 j is
// the square of R^-T j. Needs used > k.
//
// ErrNonFiniteInput (a derivative, value or weighted residual of the model), ErrSingularMatrix (a
// column of the weighted J depends on those before it within a few eps), ErrOutOfMemory.
ErrorCode BoundsOfFit(const FittedModel &model, double confidence, BoundsOf what,
                      RealVector halfWidths, RealVector lower, RealVector upper);

} // namespace qx

#endif
