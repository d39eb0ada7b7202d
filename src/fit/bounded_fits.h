#ifndef QX_FIT_BOUNDED_FITS_H
#define QX_FIT_BOUNDED_FITS_H

#include "fit/bounded_lm.h"

#include <algorithm>

namespace qx {

// A bounded fit as all models take it: in, and from `p` on, out.
struct BoundedFit {
    FitSamples samples;
    const DBL *guess;    // one value per parameter, or null
    FitBounds bounds;    // one per parameter, infinite where there is none
    int32_t method;      // FitNorm
    double tolerance;    // of the cost, relative; 0 or below is 0.0001
    int32_t *iterations; // the limit, and then how many were needed
    DBL *p;
    DBL *fit; // the model at all x; may be samples.y
    double *mse;
};

// The models of include/qx/bounded_fits.h, which tells the method and the codes. Fixed parameters
// need no samples; fewer samples than parameters are enough where the rest are fixed.
ErrorCode FitBoundedExponential(const BoundedFit &request);
ErrorCode FitBoundedPower(const BoundedFit &request);
ErrorCode FitBoundedGaussian(const BoundedFit &request);
ErrorCode FitBoundedLog(const BoundedFit &request, double base);

// Parameters: slope, intercept. By least squares neither tolerance nor iterations are looked at; in
// the other norms ErrIterationLimit leaves the best line so far.
ErrorCode FitBoundedLine(const BoundedFit &request);

// The line of least squares within finite or infinite bounds: the plain one where it lies between
// them, else by a barrier method on the quadratic function of slope and intercept. Weights count
// by their absolute values. No code; NaN where no line is determined.
void BoundLine(const FitSamples &samples, const FitBounds &bounds, DBL *slope, DBL *intercept);

// The same by least absolute residuals or bisquare, by least squares with weights from the
// residuals (fit/robust_weights.h) until the line moves by no more than the tolerance times the
// residuals. *iterations is the limit, and then the count; p takes slope and intercept, *norm the
// mean of |w r| or of |w| r^2. ErrNaNInData, ErrOutOfMemory; ErrIterationLimit, with the best line
// so far.
ErrorCode FitLineRobustly(const FitSamples &samples, const FitBounds &bounds, int32_t method,
                          double tolerance, int32_t *iterations, DBL *p, double *norm);

// What the models share.

// The steps of two passes, as far as they can be counted.
inline int32_t StepsOfBoth(int32_t first, int32_t second) {
    return static_cast<int32_t>(
        std::min(int64_t{first} + second, int64_t{std::numeric_limits<int32_t>::max()}));
}

// How many parameters have room between their bounds.
int32_t FreeParameters(const FitBounds &bounds, int32_t count);
bool IsWithin(const FitBounds &bounds, const DBL *p, int32_t count);

// Where no parameter is free and there is no sample: the upper bounds.
void TakeUpperBounds(const BoundedFit &request, int32_t count);

} // namespace qx

#endif
