#ifndef QX_FIT_NONLINEAR_H
#define QX_FIT_NONLINEAR_H

#include "fit/bounded_lm.h"
#include "fit/loss.h"

namespace qx {

// A model over all samples at once. Either function returns 0, or any other number to end the fit.
struct SampledModel {
    int32_t count; // of parameters
    // The value at each sample.
    int32_t (*values)(const void *user, const DBL *p, DBL *out);
    // The derivatives, a row of `count` for each sample; null to use differences.
    int32_t (*jacobian)(const void *user, const DBL *p, DBL *out);
    const void *user;
};

// Why an iteration has ended.
enum class FitEnd : int32_t {
    Limit,        // of the iterations
    Converged,    // no parameter would change by more than the relative tolerance
    Exact,        // all residuals are 0
    Undetermined, // the residuals do not determine each free parameter
    NoLowerCost   // no step lowers the cost, but it is not a minimum to the accuracy that
                  // convergence claims
};

struct NonlinearFit {
    SampledModel model;
    ConstRealVector y, w; // the absolute values of w count; w may be empty
    FitBounds bounds;     // both empty, or one for each parameter
    Loss loss = Loss::Linear;
    double scale = 1.0;     // of the loss
    double tolerance = 0.0; // limit of the relative change of a parameter
    int32_t limit = 0;      // of the iterations
};

// The outputs; p holds the start on entry. covariance and residuals, y minus the model, may be
// empty.
struct NonlinearResult {
    RealVector p;
    RealMatrix covariance;
    RealVector residuals;
    double cost = 0.0;
    int32_t iterations = 0;
    FitEnd end = FitEnd::Limit;
};

// Fits nonlinear models by least squares, or with the robust losses of B. Triggs, P. McLauchlan, R.
// Hartley and A. Fitzgibbon, "Bundle adjustment - a modern synthesis", 2000, by a trust region (J.
// J. More, "The Levenberg-Marquardt algorithm: implementation and theory", 1978), and by
// Gauss-Newton steps at the end, where the cost has no digits left to decide. Bounds are treated as
// in TrustRegionStep. If the model has no derivatives, differences of second order replace them,
// and near the end of fourth order; the model is evaluated only within the bounds.
//
// The cost is half the sum of C^2 rho(|w| r^2 / C^2) for the scale C. The covariance is the inverse
// of J^T J, where J holds the derivatives, weighted by the samples' weights and the loss, times
// twice the cost divided by the degrees of freedom; it is 0 for fixed parameters, and infinite if
// it does not exist.
//
// ErrOutOfMemory, ErrNonFiniteFunction (no finite cost or derivatives at the start),
// ErrNotAvailable (the model has ended the fit).
ErrorCode FitNonlinear(const NonlinearFit &fit, NonlinearResult *result);

} // namespace qx

#endif
