#ifndef QX_FIT_BOUNDED_FITS_H
#define QX_FIT_BOUNDED_FITS_H

#include "fit/bounded_lm.h"

namespace qx {

// A bounded fit as all models take it: in, and from `p` on, out.
struct BoundedFit {
    FitSamples samples = {};
    const DBL *guess = nullptr;    // one value per parameter, or null
    FitBounds bounds = {};         // one per parameter, infinite where there is none
    int32_t method = leastSquares; // FitNorm
    double tolerance = 0.0;        // of the cost, relative; 0 or below is 0.0001
    int32_t *iterations = nullptr; // the limit, and then how many were needed
    DBL *p = nullptr;
    double *mse = nullptr;
    RealVector values = {}; // of the model at all x; may be samples.y
};

// The models of include/qx/bounded_fits.h, which has the method and the codes. Fixed parameters
// need no samples; fewer samples than parameters are enough where the rest are fixed.
ErrorCode FitBoundedExponential(const BoundedFit &request);
ErrorCode FitBoundedPower(const BoundedFit &request);
ErrorCode FitBoundedGaussian(const BoundedFit &request);
ErrorCode FitBoundedLog(const BoundedFit &request, double base);

// Parameters: slope, intercept. By least squares, that is the plain line where it lies within the
// bounds, else a barrier method on the quadratic function of slope and intercept; neither tolerance
// nor iterations are looked at. In the other norms ErrIterationLimit leaves the best line so far.
ErrorCode FitBoundedLine(const BoundedFit &request);

// The line by least absolute residuals or bisquare, by least squares with weights from the
// residuals (fit/robust_weights.h) until the line moves by no more than the tolerance times the
// residuals. The weights are settled; *mse becomes the mean of |w r| or of |w| r^2, and no values
// are given. ErrNaNInData, ErrOutOfMemory; ErrIterationLimit, with the best line so far.
ErrorCode FitLineRobustly(const BoundedFit &request);

} // namespace qx

#endif
