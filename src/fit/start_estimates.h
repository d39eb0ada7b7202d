#ifndef QX_FIT_START_ESTIMATES_H
#define QX_FIT_START_ESTIMATES_H

#include "fit/bounded_lm.h"

namespace qx {

// The start of the iteration of a bounded fit if the caller has no guess. p receives the parameters
// of the model of that name (fit/models.h). Codes are those of the fits that they call.

// The vertex of the parabola through the data is the offset c, or 0 if the data have no curvature;
// a and b are those of the exponential through the remainder. With ln x for x, this is the start of
// a power law.
ErrorCode StartExponential(const FitSamples &samples, DBL *p);

// A peak above the lowest level of the data, or a dip below the highest one, whichever fits better.
// A level is a tenth of the range of y that holds more than a tenth of the samples, or the
// outermost tenth if there is none. Samples of weight 0 do not count. ErrNoUsableFit if neither can
// be fitted, ErrOutOfMemory, ErrEmptyInput.
ErrorCode StartGaussian(const FitSamples &samples, DBL *p);

} // namespace qx

#endif
