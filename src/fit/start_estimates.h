#ifndef QX_FIT_START_ESTIMATES_H
#define QX_FIT_START_ESTIMATES_H

#include "fit/bounded_lm.h"

namespace qx {

// Where the iteration of a bounded fit begins if the caller has no guess. p takes the parameters of
// the model of that name (fit/models.h). Codes are those of the fits that they call.

// The vertex of the parabola through the data is the offset c, or 0 where the data do not bend; a
// and b are the exponential through what is left. Over ln x it is the start of a power law.
ErrorCode StartExponential(const FitSamples &samples, DBL *p);

// A peak that stands on the lowest level at which the data stay, or a dip in the highest one,
// whichever fits better. A level is a tenth of the range of y with more than a tenth of the
// samples, or the outermost one where there is none. Samples of weight 0 do not count.
// ErrNoUsableFit where neither fits, ErrOutOfMemory, ErrEmptyInput.
ErrorCode StartGaussian(const FitSamples &samples, DBL *p);

} // namespace qx

#endif
