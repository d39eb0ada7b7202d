#ifndef QX_FIT_BOUNDED_FITS_H
#define QX_FIT_BOUNDED_FITS_H

#include "fit/bounded_lm.h"

namespace qx {

// The request of a bounded fit, the same for all models: inputs, and, from `p` on, outputs.
struct BoundedFit {
    FitSamples samples = {};
    const DBL *guess = nullptr;    // one value per parameter, or null
    FitBounds bounds = {};         // one per parameter, infinite if there is none
    int32_t method = leastSquares; // FitNorm
    double tolerance = 0.0;        // of the cost, relative; 0 or below means 0.0001
    int32_t *iterations = nullptr; // the limit on entry, and the number used on return
    DBL *p = nullptr;
    double *mse = nullptr;
    RealVector values = {}; // of the model at all x; may be samples.y
};

// The models of include/qx/bounded_fits.h, which documents the method and the codes. Fixed
// parameters need no samples: as many samples as free parameters are enough.
ErrorCode FitBoundedExponential(const BoundedFit &request);
ErrorCode FitBoundedPower(const BoundedFit &request);
ErrorCode FitBoundedGaussian(const BoundedFit &request);
ErrorCode FitBoundedLog(const BoundedFit &request, double base);

// Parameters: slope, intercept. By least squares, the result is the plain line if it lies within
// the bounds, and otherwise that of a barrier method on the quadratic function of slope and
// intercept; tolerance and iterations are ignored. In the other norms ErrIterationLimit returns the
// best line so far.
ErrorCode FitBoundedLine(const BoundedFit &request);

// The line by least absolute residuals or bisquare, by repeated least squares with weights from the
// residuals (fit/robust_weights.h) until the line moves by no more than the tolerance times the
// residuals. The weights must be settled (fit/weights.h); *mse becomes the mean of |w r| or of |w|
// r^2, and no values are computed. ErrNaNInData, ErrOutOfMemory; ErrIterationLimit, with the best
// line so far.
ErrorCode FitLineRobustly(const BoundedFit &request);

} // namespace qx

#endif
