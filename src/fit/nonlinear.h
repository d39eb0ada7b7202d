#ifndef QX_FIT_NONLINEAR_H
#define QX_FIT_NONLINEAR_H

#include "fit/bounded_lm.h"
#include "fit/loss.h"

namespace qx {

// A model over all samples at once. Either function returns 0, or ends the fit by any other number.
struct SampledModel {
    int32_t count; // of parameters
    // The value at each sample.
    int32_t (*values)(const void *user, const DBL *p, DBL *out);
    // The derivatives, a row of `count` for each sample; null for differences.
    int32_t (*jacobian)(const void *user, const DBL *p, DBL *out);
    const void *user;
};

// Why an iteration has ended.
enum class FitEnd : int32_t {
    Limit,        // of the iterations
    Converged,    // no parameter would move by more than a part of itself
    Exact,        // all residuals are 0
    Undetermined, // the residuals do not depend on each free parameter for itself
    NoLowerCost   // no step lowers the cost, but there is no minimum to the digits that are claimed
};

struct NonlinearFit {
    SampledModel model;
    ConstRealVector y, w; // w counts by its absolute values, or is empty
    FitBounds bounds;     // both empty, or one for each parameter
    Loss loss = Loss::Linear;
    double scale = 1.0;     // of the loss
    double tolerance = 0.0; // on the part of itself by which a parameter may still move
    int32_t limit = 0;      // of the iterations
};

// What comes back; p holds the start on entry. covariance and residuals, y less the model, may be
// empty.
struct NonlinearResult {
    RealVector p;
    RealMatrix covariance;
    RealVector residuals;
    double cost = 0.0;
    int32_t iterations = 0;
    FitEnd end = FitEnd::Limit;
};

// Least squares of nonlinear models, or the robust losses of B. Triggs, P. McLauchlan, R. Hartley
// and A. Fitzgibbon, "Bundle adjustment - a modern synthesis", 2000, by a trust region (J. J. More,
// "The Levenberg-Marquardt algorithm: implementation and theory", 1978), and by steps of Gauss and
// Newton at the end, where the cost has no digits left to decide. Bounds are those of
// TrustRegionStep. Without derivatives these are differences of the second order, near the end of
// the fourth; the model is asked for values within the bounds alone.
//
// The cost is half the sum of C^2 rho(|w| r^2 / C^2) for the scale C. The covariance is the inverse
// of J^T J, where J are the weighted derivatives as the loss counts them, times twice the cost over
// the degrees of freedom; 0 for fixed parameters, and infinite where it does not exist.
//
// ErrOutOfMemory, ErrNonFiniteFunction (no finite cost or derivatives at the start),
// ErrNotAvailable (the model has ended the fit).
ErrorCode FitNonlinear(const NonlinearFit &fit, NonlinearResult *result);

} // namespace qx

#endif
