#ifndef QX_FIT_MODEL_FIT_H
#define QX_FIT_MODEL_FIT_H

#include "fit/limits.h"
#include "fit/samples.h"
#include "qx/errors.h"

namespace qx {

// A fit of a model without bounds: in, and from `p` on, out.
struct ModelFit {
    FitSamples samples;
    const DBL *guess; // one value per parameter, or null
    FitLimits limits; // of the MSE
    DBL *p;
    int32_t *steps; // how many were tried
    FitOutput out;
};

} // namespace qx

#endif
