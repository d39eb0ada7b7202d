#ifndef QX_FIT_PEAK_FIT_H
#define QX_FIT_PEAK_FIT_H

#include "fit/bounded_fits.h"
#include "fit/nonlinear.h"

namespace qx {

// y = a exp(-((x - m) / s)^2 / 2) + c within bounds, as the bounded fits have it, from starts at
// every scale (PeakSearch): several of them are fitted and the least cost counts. A guess is the
// only start. *end is that of the fit that counts; in the robust norms it has converged, since those
// have a tolerance on the cost. tolerance is that of FitNonlinear for least squares.
//
// The codes of FitInFrame, ErrBoundsCrossed, ErrNonFiniteInput (x or y is not finite),
// ErrFitStartValues (s is fixed at 0, or the guess has it), ErrNonFiniteFunction, and in the robust
// norms those of BoundedLM.
ErrorCode FitPeak(const BoundedFit &request, FitEnd *end);

} // namespace qx

#endif
