#ifndef QX_FIT_MODEL_FIT_H
#define QX_FIT_MODEL_FIT_H

#include "fit/limits.h"
#include "fit/samples.h"
#include "qx/errors.h"

namespace qx {

// The request of a fit without bounds: inputs, and, from `p` on, outputs.
struct ModelFit {
    FitSamples samples;
    const DBL *guess; // one value per parameter, or null
    FitLimits limits; // of the MSE
    DBL *p;
    int32_t *steps; // the number of steps tried
    FitOutput out;
};

} // namespace qx

#endif
