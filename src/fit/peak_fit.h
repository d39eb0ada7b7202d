#ifndef QX_FIT_PEAK_FIT_H
#define QX_FIT_PEAK_FIT_H

#include "fit/bounded_fits.h"
#include "fit/nonlinear.h"

namespace qx {

// y = a exp(-((x - m) / s)^2 / 2) + c within bounds, as in the bounded fits, from starts at every
// scale (PeakSearch): several of them are fitted, and the one with the lowest cost is the result. A
// guess, if given, is the only start. *end is that of the resulting fit; in the robust norms it is
// always Converged, since those have a tolerance on the cost. tolerance is that of FitNonlinear for
// least squares.
//
// The codes of FitInFrame, ErrBoundsCrossed, ErrNonFiniteInput (x or y is not finite),
// ErrFitStartValues (s is fixed at 0, or is 0 in the guess), ErrNonFiniteFunction, and in the
// robust norms those of BoundedLM.
ErrorCode FitPeak(const BoundedFit &request, FitEnd *end);

} // namespace qx

#endif
